// Paychecks and payroll transactions: a payroll run with its paychecks and
// their lines, the advice of funds to disburse (tax liabilities) and of
// direct deposits, payroll transactions with their lines, and the
// modification forms.
#pragma once

#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/payroll/OEPayrollEmployee.h"

#define OE_PAYCHECKINFO_FIELDS(X)                               \
  X(PTEXT, CheckNumber, V_CHKNUM, OEString12)                   \
  X(FLAG, IsDirectDeposit, V_ISDD, unsigned short)              \
  X(VALUE, TotalWage, V_TOTALWAGE, OEPayrollAmount)             \
  X(VALUE, HoursWorked, V_HRSWORKED, OEPayrollAmount)

class OEPayCheckInfo : public OEAggregate {
  OE_AGGREGATE(OEPayCheckInfo, OE_PAYCHECKINFO_FIELDS)
};

// Where a line's amount is booked.
#define OE_PAYROLL_BOOKING_FIELDS(X)                            \
  X(PTEXT, Class, V_CLASS, OEString64)                          \
  X(PTEXT, Job, V_JOB, OEString64)

// Salary and hourly wage lines of a paycheck share their fields.
#define OE_WAGELINE_FIELDS(X)                                   \
  OE_PAYROLL_ITEMREF_FIELDS(X)                                  \
  X(VALUE, PayType, V_PAYTYPE, OEPayType)                       \
  X(VALUE, Hours, V_HRS, OEPayrollAmount)                       \
  X(VALUE, Rate, V_RATE, OEPayrollAmount)                       \
  X(VALUE, Amount, V_AMT, OEPayrollAmount)                      \
  OE_PAYROLL_BOOKING_FIELDS(X)

class OESalaryLine : public OEAggregate {
  OE_AGGREGATE(OESalaryLine, OE_WAGELINE_FIELDS)
};

class OEHourlyWageLine : public OEAggregate {
  OE_AGGREGATE(OEHourlyWageLine, OE_WAGELINE_FIELDS)
};

// Additions, deductions and company contributions on a paycheck.
#define OE_ADJUSTMENTLINE_FIELDS(X)                             \
  OE_PAYROLL_ITEMREF_FIELDS(X)                                  \
  X(VALUE, Quantity, V_QTY, OEPayrollAmount)                    \
  X(VALUE, Rate, V_RATE, OEPayrollAmount)                       \
  X(VALUE, Amount, V_AMT, OEPayrollAmount)                      \
  OE_PAYROLL_BOOKING_FIELDS(X)

class OEAdjustmentLine : public OEAggregate {
  OE_AGGREGATE(OEAdjustmentLine, OE_ADJUSTMENTLINE_FIELDS)
};

// A tax withheld or owed on a paycheck, with its wage base.
#define OE_TAXLINE_FIELDS(X)                                    \
  OE_PAYROLL_ITEMREF_FIELDS(X)                                  \
  X(VALUE, WageBase, V_WB, OEPayrollAmount)                     \
  X(VALUE, Amount, V_AMT, OEPayrollAmount)

class OETaxLine : public OEAggregate {
  OE_AGGREGATE(OETaxLine, OE_TAXLINE_FIELDS)
};

#define OE_DIRECTDEPOSITLINE_FIELDS(X)                          \
  X(CHILD, BankAccountTo, BANKACCTTO, OEBankAccount)            \
  X(VALUE, Amount, V_AMT, OEPayrollAmount)

class OEDirectDepositLine : public OEAggregate {
  OE_AGGREGATE(OEDirectDepositLine, OE_DIRECTDEPOSITLINE_FIELDS)
};

// A paycheck ("V.PAYCHK"), and the changes to one ("V.PAYCHKMOD", which
// needs only the paycheck's id).
#define OE_PAYCHECK_FIELDS(X)                                           \
  X(CHILD, PayCheckInfo, V_PAYCHKINFO, OEPayCheckInfo)                        \
  X(LIST, SalaryLine, V_SALARYLINE, OESalaryLine)                       \
  X(LIST, HourlyWageLine, V_HRLYWAGELINE, OEHourlyWageLine)             \
  X(LIST, AdjustmentLine, V_ADJLINE, OEAdjustmentLine)                  \
  X(LIST, TaxLine, V_TAXLINE, OETaxLine)                                \
  X(LIST, DirectDepositLine, V_DDLINE, OEDirectDepositLine)             \
  X(PTEXT, PayCheckID, V_PAYCHKID, OEString32)                          \
  X(PTEXT, EmployeeID, V_EMPID, OEString32)                             \
  X(VALUE, DateTransaction, V_DTTX, OEPayrollDateTime)                  \
  X(VALUE, PayCheckType, V_PAYCHKTYPE, OEPayCheckType)                  \
  X(PTEXT, EmployeeName, V_EMPNAME, OEString64)                         \
  X(PTEXT, Class, V_CLASS, OEString64)                                  \
  X(PTEXT, AccountName, V_ACCTNAME, OEString64)                         \
  X(VALUE, Amount, V_AMT, OEPayrollAmount)                              \
  X(FLAG, Void, V_VOID, unsigned short)                                 \
  X(FLAG, OnService, V_ONSERVICE, unsigned short)                       \
  X(VALUE, DatePayPeriodBegin, V_DTPAYPDBEGIN, OEPayrollDateTime)       \
  X(VALUE, DatePayPeriodEnd, V_DTPAYPDEND, OEPayrollDateTime)           \
  X(PTEXT, Memo, V_MEMO, OEString255)                                   \
  X(FLAG, Cleared, V_CLEARED, unsigned short)

class OEPayCheck : public OEAggregate {
  OE_AGGREGATE(OEPayCheck, OE_PAYCHECK_FIELDS)
};

class OEPayCheckMod : public OEAggregate {
  OE_AGGREGATE(OEPayCheckMod, OE_PAYCHECK_FIELDS)
};

// The state tax an item or liability is for.
#define OE_STATETAXDESC_FIELDS(X)                       \
  X(PTEXT, State, V_STATE, OEString5)                   \
  X(VALUE, StateTax, V_STATETAX, OEStateTax)

class OEStateTaxDesc : public OEAggregate {
  OE_AGGREGATE(OEStateTaxDesc, OE_STATETAXDESC_FIELDS)
};

// What is owed (or was paid) for one tax: this payroll, the quarter and the
// year, with the wage bases.
#define OE_TAXLIABILITY_FIELDS(X)                                       \
  X(CHILD, StateTaxDesc, V_STATETAXDESC, OEStateTaxDesc)                \
  X(VALUE, CurrentAmount, V_CURAMT, OEPayrollAmount)                    \
  X(VALUE, QuarterAmount, V_QTRAMT, OEPayrollAmount)                    \
  X(VALUE, YearAmount, V_YTDAMT, OEPayrollAmount)                       \
  X(VALUE, CurrentWageBase, V_CURWB, OEPayrollAmount)                   \
  X(VALUE, QuarterWageBase, V_QTRWB, OEPayrollAmount)                   \
  X(VALUE, YearWageBase, V_YTDWB, OEPayrollAmount)                      \
  X(VALUE, TaxPaymentType, V_TAXPMTTYPE, OETaxPaymentType)              \
  X(PTEXT, PayrollItemID, V_PITEMID, OEString32)                        \
  X(VALUE, FederalTax, V_FEDTAX, OEFederalTax)                          \
  X(PTEXT, OtherTax, V_OTHERTAX, OEString64)                            \
  X(PTEXT, PayrollItemName, V_PITEMNAME, OEString64)

class OETaxLiability : public OEAggregate {
  OE_AGGREGATE(OETaxLiability, OE_TAXLIABILITY_FIELDS)
};

// The funds a payroll run needs for its tax liabilities.
#define OE_DISBURSEADVICE_FIELDS(X)                             \
  X(LIST, TaxLiability, V_TAXLIAB, OETaxLiability)              \
  X(VALUE, DisburseFunds, V_DISBURSEFUNDS, OEPayrollAmount)     \
  X(VALUE, LeadDays, V_LEADDAYS, unsigned short)

class OEDisburseAdvice : public OEAggregate {
  OE_AGGREGATE(OEDisburseAdvice, OE_DISBURSEADVICE_FIELDS)
};

// One direct deposit to an employee's account.
#define OE_DIRECTDEPOSIT_FIELDS(X)                              \
  X(CHILD, BankAccountTo, BANKACCTTO, OEBankAccount)            \
  X(PTEXT, EmployeeID, V_EMPID, OEString32)                     \
  X(PTEXT, SSN, V_SSN, OEString11)                              \
  X(VALUE, Amount, V_AMT, OEPayrollAmount)                      \
  X(PTEXT, EmployeeName, V_EMPNAME, OEString64)

class OEDirectDeposit : public OEAggregate {
  OE_AGGREGATE(OEDirectDeposit, OE_DIRECTDEPOSIT_FIELDS)
};

#define OE_DIRECTDEPOSITADVICE_FIELDS(X)                        \
  X(LIST, DirectDeposit, V_DIRECTDEPOSIT, OEDirectDeposit)      \
  X(VALUE, DirectDepositAmount, V_DDAMT, OEPayrollAmount)       \
  X(VALUE, LeadDays, V_LEADDAYS, unsigned short)

class OEDirectDepositAdvice : public OEAggregate {
  OE_AGGREGATE(OEDirectDepositAdvice, OE_DIRECTDEPOSITADVICE_FIELDS)
};

#define OE_PAYROLLRUN_FIELDS(X)                                         \
  X(LIST, PayCheck, V_PAYCHK, OEPayCheck)                               \
  X(LIST, PayCheckMod, V_PAYCHKMOD, OEPayCheckMod)                      \
  X(CHILD, DisburseAdvice, V_DISBURSEADVICE, OEDisburseAdvice)          \
  X(CHILD, DirectDepositAdvice, V_DDADVICE, OEDirectDepositAdvice)      \
  X(VALUE, DatePayChecks, V_DTPAYCHKS, OEPayrollDateTime)

class OEPayrollRun : public OEAggregate {
  OE_AGGREGATE(OEPayrollRun, OE_PAYROLLRUN_FIELDS)
};

// One line of a payroll transaction (a liability adjustment, a tax payment).
#define OE_TXLINE_FIELDS(X)                                     \
  OE_PAYROLL_ITEMREF_FIELDS(X)                                  \
  X(PTEXT, AccountName, V_ACCTNAME, OEString64)                 \
  X(PTEXT, Class, V_CLASS, OEString64)                          \
  X(VALUE, Amount, V_AMT, OEPayrollAmount)                      \
  X(VALUE, WageBase, V_WB, OEPayrollAmount)                     \
  X(VALUE, TaxQuarter, V_TAXQTR, unsigned short)

class OETxLine : public OEAggregate {
  OE_AGGREGATE(OETxLine, OE_TXLINE_FIELDS)
};

// A payroll transaction other than a paycheck ("V.PAYROLLTX"), and the
// changes to one ("V.PAYROLLTXMOD", which needs only its id).
#define OE_PAYROLLTX_FIELDS(X)                                          \
  X(LIST, TxLine, V_TXLINE, OETxLine)                                   \
  X(PTEXT, PayrollTxID, V_PAYROLLTXID, OEString32)                      \
  X(VALUE, DateTransaction, V_DTTX, OEPayrollDateTime)                  \
  X(VALUE, PayrollTxType, V_PAYROLLTXTYPE, OEPayrollTxType)             \
  X(PTEXT, EmployeeID, V_EMPID, OEString32)                             \
  X(PTEXT, EmployeeName, V_EMPNAME, OEString64)                         \
  X(PTEXT, Name, V_NAME, OEString64)                                    \
  X(PTEXT, ReferenceNumber, V_REFNUM, OEString32)                       \
  X(PTEXT, AccountName, V_ACCTNAME, OEString64)                         \
  X(VALUE, Amount, V_AMT, OEPayrollAmount)                              \
  X(PTEXT, Memo, V_MEMO, OEString255)                                   \
  X(VALUE, DatePayPeriodEnd, V_DTPAYPDEND, OEPayrollDateTime)           \
  X(FLAG, Void, V_VOID, unsigned short)                                 \
  X(FLAG, OnService, V_ONSERVICE, unsigned short)                       \
  X(FLAG, Cleared, V_CLEARED, unsigned short)

class OEPayrollTx : public OEAggregate {
  OE_AGGREGATE(OEPayrollTx, OE_PAYROLLTX_FIELDS)
};

class OEPayrollTxMod : public OEAggregate {
  OE_AGGREGATE(OEPayrollTxMod, OE_PAYROLLTX_FIELDS)
};
