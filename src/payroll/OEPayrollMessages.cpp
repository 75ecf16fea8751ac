#include "ofxkit/payroll/OEPayrollMessages.h"

#include <cstring>

OE_DEFINE_AGGREGATE(OEPayrollRq, OETransBase, OE_PAYROLLRQ_FIELDS, V_PAYROLLRQ,
                    .Valid(OE_TAGS(V_PITEM, V_EMP, V_PAYROLLTX, V_PITEMMOD, V_EMPMOD, V_PAYROLLTXMOD, V_COINFOMOD,
                                   V_PAYROLLRUN, V_EMPQTRTOTALS, V_PITEMDELID, V_EMPDELID, V_PAYROLLTXDELID,
                                   V_ANOMALYTEXT, V_TAXSERVQUIT, V_DDQUIT)))
OE_DEFINE_AGGREGATE(OEPayrollRs, OETransBase, OE_PAYROLLRS_FIELDS, V_PAYROLLRS, .Valid(OE_TAGS(V_PAYROLLTX)))
OE_DEFINE_AGGREGATE(OEPayrollUpdateData, OEAggregate, OE_PAYROLLUPDATEDATA_FIELDS, V_PAYROLLUPDATEDATA,
                    .Valid(OE_TAGS(V_PAYCHKMOD, V_PAYROLLTXMOD, V_PAYROLLTXDELID, V_EMPMOD, V_EMPDELID, V_PITEMMOD,
                                   V_PITEMDELID, V_COINFOMOD)))
OE_DEFINE_AGGREGATE(OEPayrollEnrollRq, OETransBase, OE_PAYROLLENROLLRQ_FIELDS, V_PAYROLLENROLLRQ,
                    .Valid(OE_TAGS(V_COINFO, V_TAXSERVICE, V_DIRECTDEPOSIT, V_DTNEXTPAYROLL, V_APPKEY))
                    .Required(OE_TAGS(V_COINFO, V_TAXSERVICE, V_DIRECTDEPOSIT, V_APPKEY)))
OE_DEFINE_AGGREGATE(OEPayrollEnrollRs, OETransBase, OE_PAYROLLENROLLRS_FIELDS, V_PAYROLLENROLLRS,
                    .Valid(OE_TAGS(V_USERID))
                    .Required(OE_TAGS(V_USERID)))

// The update response is a sync response with a description of its own: the
// sync's TOKEN and wrappers (the wrapper list taking "V.PAYROLLTRNRS") among
// the payroll fields.
OEPayrollUpdateRs::OEPayrollUpdateRs() { SetType(OE_TAG_V_PAYROLLUPDATERS); }
OEPayrollUpdateRs::~OEPayrollUpdateRs() { DestroyFields(ClassInfo()); }

namespace {
// The sync response's wrapper list under the payroll wrapper tag.
OEFieldDesc PayrollWrapperField() {
  for (const OEFieldDesc& field : OESyncRs::ClassInfo().fields) {
    if (field.alias || std::strcmp(static_cast<const char*>(field.member), "Trans") != 0) continue;
    OEFieldDesc wrappers = field;
    wrappers.tag = OE_TAG_V_PAYROLLTRNRS;
    wrappers.alias = true;
    return wrappers;
  }
  return OEFieldDesc{};
}
}  // namespace

const OEAggregateInfo& OEPayrollUpdateRs::ClassInfo() {
  using ThisClass [[maybe_unused]] = OEPayrollUpdateRs;
  static OEAggregateInfo info =
      OEAggregateInfo(&OESyncRs::ClassInfo(), {OE_PAYROLLUPDATERS_FIELDS(OE_FIELD_DESC) PayrollWrapperField()},
                      OE_TAG_V_PAYROLLUPDATERS)
          .Valid(OE_TAGS(TOKEN, V_TAXSERVSTATUS, V_DDSTATUS, V_PAYCHKNEXTID, V_PAYROLLTXNEXTID, V_EMPNEXTID,
                         V_PITEMNEXTID, V_PAYROLLTRNRS, V_PAYROLLUPDATEDATA))
          .Required(OE_TAGS(TOKEN, V_PAYCHKNEXTID, V_PAYROLLTXNEXTID, V_EMPNEXTID, V_PITEMNEXTID));
  static const OEAggregateInfo& finished = info.Finish();
  return finished;
}
