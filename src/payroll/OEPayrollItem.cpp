#include "ofxkit/payroll/OEPayrollItem.h"

OE_DEFINE_AGGREGATE(OESalaryItem, OEEnvelopeAggregate, OE_SALARYITEM_FIELDS, V_SALARYITEM,
                    .Valid(OE_TAGS(V_PAYTYPE, V_EXPACCT, V_EXPBYJOB, V_DEFRATE)))
const OEAggregateInfo* OESalaryItem::TypeInfo(OETagID type) {
  static OETypeInfoCache cache(2);
  static const std::vector<OEPayrollTypeRow> rows = {
      {OE_TAG_V_SALARYITEM, OE_TAGS(V_PAYTYPE, V_EXPACCT, V_EXPBYJOB), {}},
      {OE_TAG_V_HRLYITEM, OE_TAGS(V_PAYTYPE, V_EXPACCT, V_EXPBYJOB, V_DEFRATE), {}},
  };
  return OEPayrollTypeInfo(cache, ClassInfo(), type, rows);
}

OE_DEFINE_AGGREGATE(OEAdditionItem, OEAggregate, OE_ADJUSTMENTITEM_FIELDS, V_ADDITEM,
                    .Valid(OE_TAGS(V_CALCTYPE, V_EXPACCT, V_EXPBYJOB, V_DEFRATE, V_DEFLIMIT, V_PRORATE,
                                   V_TAXAFFECTED, V_TAXFORMLINE)))
OE_DEFINE_AGGREGATE(OEDeductionItem, OEAggregate, OE_ADJUSTMENTITEM_FIELDS, V_DEDUCTITEM,
                    .Valid(OE_TAGS(V_CALCTYPE, V_LIABACCT, V_LIABAGENCY, V_DEFRATE, V_DEFLIMIT, V_PRORATE,
                                   V_TAXAFFECTED, V_TAXFORMLINE)))
OE_DEFINE_AGGREGATE(OEContributionItem, OEAggregate, OE_ADJUSTMENTITEM_FIELDS, V_CONTRIBITEM,
                    .Valid(OE_TAGS(V_CALCTYPE, V_EXPACCT, V_EXPBYJOB, V_LIABACCT, V_LIABAGENCY, V_DEFRATE,
                                   V_DEFLIMIT, V_TAXAFFECTED, V_TAXFORMLINE)))
OE_DEFINE_AGGREGATE(OECommissionItem, OEAggregate, OE_ADJUSTMENTITEM_FIELDS, V_COMMITEM,
                    .Valid(OE_TAGS(V_EXPACCT, V_EXPBYJOB, V_DEFRATE, V_TAXAFFECTED, V_TAXFORMLINE)))

OE_DEFINE_AGGREGATE(OETaxItem, OEAggregate, OE_TAXITEM_FIELDS, V_TAXITEM,
                    .Valid(OE_TAGS(V_CALCTYPE, V_STATETAXDESC, V_ONSERVICE, V_LIABACCT, V_LIABAGENCY, V_COMPID,
                                   V_FEDTAX, V_OTHERTAX, V_EXPACCT, V_RATE, V_DEFLIMIT, V_TAXFORMLINE))
                    .Required(OE_TAGS(V_ONSERVICE, V_LIABACCT, V_LIABAGENCY)))
OE_DEFINE_AGGREGATE(OEDirectDepositItem, OEAggregate, OE_DIRECTDEPOSITITEM_FIELDS, V_DDITEM,
                    .Valid(OE_TAGS(V_LIABACCT, V_EXPACCT)))

#define OE_PAYROLLITEM_TAGS                                                                                    \
  OE_TAGS(V_SALARYITEM, V_HRLYITEM, V_ADDITEM, V_DEDUCTITEM, V_CONTRIBITEM, V_COMMITEM, V_TAXITEM, V_DDITEM,    \
          V_PITEMID, V_PITEMNAME, V_INACTIVE, V_ISEMP, V_SPECIALTYPE)
OE_DEFINE_AGGREGATE(OEPayrollItem, OEAggregate, OE_PAYROLLITEM_FIELDS, V_PITEM,
                    .Valid(OE_PAYROLLITEM_TAGS)
                    .Required(OE_TAGS(V_PITEMID, V_PITEMNAME, V_INACTIVE, V_ISEMP)))
OE_DEFINE_AGGREGATE(OEPayrollItemMod, OEAggregate, OE_PAYROLLITEM_FIELDS, V_PITEMMOD,
                    .Valid(OE_PAYROLLITEM_TAGS)
                    .Required(OE_TAGS(V_PITEMID)))
