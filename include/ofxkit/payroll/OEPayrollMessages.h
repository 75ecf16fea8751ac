// The requests and responses of the payroll message set
// ("V.PAYROLLMSGSRQV1" / "V.PAYROLLMSGSRSV1"):
//
//   V.PAYROLLUPDATERQ   a synchronisation request (OESyncRq) of repeated
//                       V.PAYROLLTRNRQ, each holding an OEPayrollRq;
//   V.PAYROLLUPDATERS   OEPayrollUpdateRs: the service's state, the next ids
//                       to use, repeated V.PAYROLLTRNRS (each holding an
//                       OEPayrollRs) and the update data;
//   V.PAYROLLENROLLTRNRQ / V.PAYROLLENROLLTRNRS  enrolment for the tax and
//                       direct-deposit services.
#pragma once

#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/envelope/OETransWrapper.h"
#include "ofxkit/payroll/OEPayrollItem.h"

// What the application sends: new records, changes, deletions, payroll runs,
// quarterly totals, and leaving the services.
#define OE_PAYROLLRQ_FIELDS(X)                                          \
  X(LIST, PayrollItem, V_PITEM, OEPayrollItem)                          \
  X(LIST, Employee, V_EMP, OEEmployee)                                  \
  X(LIST, PayrollTx, V_PAYROLLTX, OEPayrollTx)                          \
  X(LIST, PayrollItemMod, V_PITEMMOD, OEPayrollItemMod)                 \
  X(LIST, EmployeeMod, V_EMPMOD, OEEmployeeMod)                         \
  X(LIST, PayrollTxMod, V_PAYROLLTXMOD, OEPayrollTxMod)                 \
  X(CHILD, CompanyInfoMod, V_COINFOMOD, OECompanyInfoMod)               \
  X(LIST, PayrollRun, V_PAYROLLRUN, OEPayrollRun)                       \
  X(LIST, EmployeeQtrTotals, V_EMPQTRTOTALS, OEEmployeeQtrTotals)       \
  X(VALUES, PayrollItemDeleteID, V_PITEMDELID, OEString32)              \
  X(VALUES, EmployeeDeleteID, V_EMPDELID, OEString32)                   \
  X(VALUES, PayrollTxDeleteID, V_PAYROLLTXDELID, OEString32)            \
  X(PTEXT, AnomalyText, V_ANOMALYTEXT, OEString2000)                    \
  X(CHILD, TaxServiceQuit, V_TAXSERVQUIT, OETaxServiceQuit)             \
  X(CHILD, DirectDepositQuit, V_DDQUIT, OEDirectDepositQuit)

class OEPayrollRq : public OETransBase {
  OE_AGGREGATE(OEPayrollRq, OE_PAYROLLRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_PAYROLLRS_FIELDS(X) X(LIST, PayrollTx, V_PAYROLLTX, OEPayrollTx)

class OEPayrollRs : public OETransBase {
  OE_AGGREGATE(OEPayrollRs, OE_PAYROLLRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

// What changed at the service since the client's token.
#define OE_PAYROLLUPDATEDATA_FIELDS(X)                                  \
  X(LIST, PayCheckMod, V_PAYCHKMOD, OEPayCheckMod)                      \
  X(LIST, PayrollTxMod, V_PAYROLLTXMOD, OEPayrollTxMod)                 \
  X(VALUES, PayrollTxDeleteID, V_PAYROLLTXDELID, OEString32)            \
  X(LIST, EmployeeMod, V_EMPMOD, OEEmployeeMod)                         \
  X(VALUES, EmployeeDeleteID, V_EMPDELID, OEString32)                   \
  X(LIST, PayrollItemMod, V_PITEMMOD, OEPayrollItemMod)                 \
  X(VALUES, PayrollItemDeleteID, V_PITEMDELID, OEString32)              \
  X(CHILD, CompanyInfoMod, V_COINFOMOD, OECompanyInfoMod)

class OEPayrollUpdateData : public OEAggregate {
  OE_AGGREGATE(OEPayrollUpdateData, OE_PAYROLLUPDATEDATA_FIELDS)
};

// The payroll update response: a synchronisation response (its TOKEN and
// its V.PAYROLLTRNRS wrappers are those of OESyncRs: GetToken, GetTrans,
// AppendTrans) with the payroll fields.
#define OE_PAYROLLUPDATERS_FIELDS(X)                                    \
  X(CHILD, TaxServiceStatus, V_TAXSERVSTATUS, OETaxServiceStatus)       \
  X(CHILD, DirectDepositStatus, V_DDSTATUS, OEDirectDepositStatus)      \
  X(TEXT, PayCheckNextID, V_PAYCHKNEXTID, OEString32)                   \
  X(TEXT, PayrollTxNextID, V_PAYROLLTXNEXTID, OEString32)               \
  X(TEXT, EmployeeNextID, V_EMPNEXTID, OEString32)                      \
  X(TEXT, PayrollItemNextID, V_PITEMNEXTID, OEString32)                 \
  X(CHILD, UpdateData, V_PAYROLLUPDATEDATA, OEPayrollUpdateData)

class OEPayrollUpdateRs : public OESyncRs {
 public:
  OEPayrollUpdateRs();
  ~OEPayrollUpdateRs() override;
  static const OEAggregateInfo& ClassInfo();
  const OEAggregateInfo& GetInfo() const override { return ClassInfo(); }
  unsigned short DeepCopyFrom(const OEPayrollUpdateRs* source) { return CopyAggregateFrom(source); }
  OE_PAYROLLUPDATERS_FIELDS(OE_FIELD_DECLARE)

 public:
  // The required tags (TOKEN and the four next ids).
  unsigned short AllRequiredPresent() override { return OEAggregate::AllRequiredPresent(); }
  // The children in valid order: the statuses, the wrappers, the update data.
  OEDataObj* GetChild(unsigned short index) const override { return OEAggregate::GetChild(index); }
  unsigned short GetNumberOfChildren() const override { return OEAggregate::GetNumberOfChildren(); }
};

#define OE_PAYROLLENROLLRQ_FIELDS(X)                                    \
  X(CHILD, CompanyInfo, V_COINFO, OECompanyInfo)                        \
  X(FLAG, TaxService, V_TAXSERVICE, unsigned short)                     \
  X(FLAG, DirectDeposit, V_DIRECTDEPOSIT, unsigned short)               \
  X(VALUE, DateNextPayroll, V_DTNEXTPAYROLL, OEPayrollDateTime)         \
  X(TEXT, AppKey, V_APPKEY, OEString255)

class OEPayrollEnrollRq : public OETransBase {
  OE_AGGREGATE(OEPayrollEnrollRq, OE_PAYROLLENROLLRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_PAYROLLENROLLRS_FIELDS(X) X(TEXT, UserID, V_USERID, OEString32)

class OEPayrollEnrollRs : public OETransBase {
  OE_AGGREGATE(OEPayrollEnrollRs, OE_PAYROLLENROLLRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};
