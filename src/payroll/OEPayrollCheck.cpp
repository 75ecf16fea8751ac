#include "ofxkit/payroll/OEPayrollCheck.h"

OE_DEFINE_AGGREGATE(OEPayCheckInfo, OEAggregate, OE_PAYCHECKINFO_FIELDS, V_PAYCHKINFO,
                    .Valid(OE_TAGS(V_CHKNUM, V_ISDD, V_TOTALWAGE, V_HRSWORKED)))

#define OE_WAGELINE_TAGS OE_TAGS(V_PITEMID, V_PITEMNAME, V_PAYTYPE, V_HRS, V_RATE, V_AMT, V_CLASS, V_JOB)
OE_DEFINE_AGGREGATE(OESalaryLine, OEAggregate, OE_WAGELINE_FIELDS, V_SALARYLINE,
                    .Valid(OE_WAGELINE_TAGS)
                    .Required(OE_TAGS(V_PITEMID, V_AMT)))
OE_DEFINE_AGGREGATE(OEHourlyWageLine, OEAggregate, OE_WAGELINE_FIELDS, V_HRLYWAGELINE,
                    .Valid(OE_WAGELINE_TAGS)
                    .Required(OE_TAGS(V_PITEMID, V_HRS, V_AMT)))
OE_DEFINE_AGGREGATE(OEAdjustmentLine, OEAggregate, OE_ADJUSTMENTLINE_FIELDS, V_ADJLINE,
                    .Valid(OE_TAGS(V_PITEMID, V_PITEMNAME, V_QTY, V_RATE, V_AMT, V_CLASS, V_JOB))
                    .Required(OE_TAGS(V_PITEMID, V_AMT)))
OE_DEFINE_AGGREGATE(OETaxLine, OEAggregate, OE_TAXLINE_FIELDS, V_TAXLINE,
                    .Valid(OE_TAGS(V_PITEMID, V_PITEMNAME, V_WB, V_AMT))
                    .Required(OE_TAGS(V_PITEMID, V_AMT)))
OE_DEFINE_AGGREGATE(OEDirectDepositLine, OEAggregate, OE_DIRECTDEPOSITLINE_FIELDS, V_DDLINE,
                    .Valid(OE_TAGS(BANKACCTTO, V_AMT))
                    .Required(OE_TAGS(BANKACCTTO, V_AMT)))

#define OE_PAYCHECK_TAGS                                                                                      \
  OE_TAGS(V_PAYCHKINFO, V_SALARYLINE, V_HRLYWAGELINE, V_ADJLINE, V_TAXLINE, V_DDLINE, V_PAYCHKID, V_EMPID, V_DTTX, \
          V_PAYCHKTYPE, V_EMPNAME, V_CLASS, V_ACCTNAME, V_AMT, V_VOID, V_ONSERVICE, V_DTPAYPDBEGIN, V_DTPAYPDEND,  \
          V_MEMO, V_CLEARED)
OE_DEFINE_AGGREGATE(OEPayCheck, OEAggregate, OE_PAYCHECK_FIELDS, V_PAYCHK,
                    .Valid(OE_PAYCHECK_TAGS)
                    .Required(OE_TAGS(V_PAYCHKID, V_EMPID, V_DTTX, V_PAYCHKTYPE, V_DTPAYPDBEGIN, V_DTPAYPDEND,
                                      V_CLEARED)))
OE_DEFINE_AGGREGATE(OEPayCheckMod, OEAggregate, OE_PAYCHECK_FIELDS, V_PAYCHKMOD,
                    .Valid(OE_PAYCHECK_TAGS)
                    .Required(OE_TAGS(V_PAYCHKID)))

OE_DEFINE_AGGREGATE(OEStateTaxDesc, OEAggregate, OE_STATETAXDESC_FIELDS, V_STATETAXDESC,
                    .Valid(OE_TAGS(V_STATE, V_STATETAX))
                    .Required(OE_TAGS(V_STATE, V_STATETAX)))
OE_DEFINE_AGGREGATE(OETaxLiability, OEAggregate, OE_TAXLIABILITY_FIELDS, V_TAXLIAB,
                    .Valid(OE_TAGS(V_STATETAXDESC, V_CURAMT, V_QTRAMT, V_YTDAMT, V_CURWB, V_QTRWB, V_YTDWB,
                                   V_TAXPMTTYPE, V_PITEMID, V_FEDTAX, V_OTHERTAX, V_PITEMNAME))
                    .Required(OE_TAGS(V_CURAMT, V_QTRAMT, V_YTDAMT, V_CURWB, V_QTRWB, V_YTDWB, V_TAXPMTTYPE,
                                      V_PITEMID)))
OE_DEFINE_AGGREGATE(OEDisburseAdvice, OEAggregate, OE_DISBURSEADVICE_FIELDS, V_DISBURSEADVICE,
                    .Valid(OE_TAGS(V_TAXLIAB, V_DISBURSEFUNDS, V_LEADDAYS))
                    .Required(OE_TAGS(V_DISBURSEFUNDS)))
OE_DEFINE_AGGREGATE(OEDirectDeposit, OEAggregate, OE_DIRECTDEPOSIT_FIELDS, V_DIRECTDEPOSIT,
                    .Valid(OE_TAGS(BANKACCTTO, V_EMPID, V_SSN, V_AMT, V_EMPNAME))
                    .Required(OE_TAGS(BANKACCTTO, V_EMPID, V_SSN, V_AMT)))
OE_DEFINE_AGGREGATE(OEDirectDepositAdvice, OEAggregate, OE_DIRECTDEPOSITADVICE_FIELDS, V_DDADVICE,
                    .Valid(OE_TAGS(V_DIRECTDEPOSIT, V_DDAMT, V_LEADDAYS))
                    .Required(OE_TAGS(V_DDAMT)))
OE_DEFINE_AGGREGATE(OEPayrollRun, OEAggregate, OE_PAYROLLRUN_FIELDS, V_PAYROLLRUN,
                    .Valid(OE_TAGS(V_PAYCHK, V_PAYCHKMOD, V_DISBURSEADVICE, V_DDADVICE, V_DTPAYCHKS))
                    .Required(OE_TAGS(V_DTPAYCHKS)))

OE_DEFINE_AGGREGATE(OETxLine, OEAggregate, OE_TXLINE_FIELDS, V_TXLINE,
                    .Valid(OE_TAGS(V_PITEMID, V_PITEMNAME, V_ACCTNAME, V_CLASS, V_AMT, V_WB, V_TAXQTR))
                    .Required(OE_TAGS(V_PITEMID, V_AMT)))

#define OE_PAYROLLTX_TAGS                                                                                    \
  OE_TAGS(V_TXLINE, V_PAYROLLTXID, V_DTTX, V_PAYROLLTXTYPE, V_EMPID, V_EMPNAME, V_NAME, V_REFNUM, V_ACCTNAME, \
          V_AMT, V_MEMO, V_DTPAYPDEND, V_VOID, V_ONSERVICE, V_CLEARED)
// Its required tags are listed (and reported missing) in an order of their
// own: the reference number before the type.
OE_DEFINE_AGGREGATE(OEPayrollTx, OEAggregate, OE_PAYROLLTX_FIELDS, V_PAYROLLTX,
                    .Valid(OE_PAYROLLTX_TAGS)
                    .Required(OE_TAGS(V_TXLINE, V_PAYROLLTXID, V_DTTX, V_REFNUM, V_PAYROLLTXTYPE, V_ONSERVICE,
                                      V_CLEARED)))
OE_DEFINE_AGGREGATE(OEPayrollTxMod, OEAggregate, OE_PAYROLLTX_FIELDS, V_PAYROLLTXMOD,
                    .Valid(OE_PAYROLLTX_TAGS)
                    .Required(OE_TAGS(V_PAYROLLTXID)))
