// Payroll items: the company's list of wages, additions, deductions,
// contributions, commissions, taxes and direct deposit, each an item
// ("V.PITEM") holding the details of its kind; and the modification form.
#pragma once

#include "ofxkit/payroll/OEPayrollByType.h"
#include "ofxkit/payroll/OEPayrollCheck.h"

// Salary ("V.SALARYITEM") and hourly wage ("V.HRLYITEM") items; an hourly
// item also has a default rate.
#define OE_SALARYITEM_FIELDS(X)                                 \
  X(VALUE, PayType, V_PAYTYPE, OEPayType)                       \
  X(PTEXT, ExpenseAccount, V_EXPACCT, OEString64)               \
  X(FLAG, ExpenseByJob, V_EXPBYJOB, unsigned short)             \
  X(VALUE, DefaultRate, V_DEFRATE, OEPayrollAmount)

class OESalaryItem : public OEEnvelopeAggregate {
  OE_AGGREGATE_BY_TYPE(OESalaryItem, OE_SALARYITEM_FIELDS)
};
OE_PAYROLL_TYPED_SUBCLASS(OEHourlyItem, OESalaryItem, V_HRLYITEM)

// The fields of additions, deductions, contributions and commissions; each
// kind takes those that apply to it.
#define OE_ADJUSTMENTITEM_FIELDS(X)                                     \
  X(VALUE, CalculationType, V_CALCTYPE, OECalculationType)              \
  X(PTEXT, ExpenseAccount, V_EXPACCT, OEString64)                       \
  X(FLAG, ExpenseByJob, V_EXPBYJOB, unsigned short)                     \
  X(PTEXT, LiabilityAccount, V_LIABACCT, OEString64)                    \
  X(PTEXT, LiabilityAgency, V_LIABAGENCY, OEString64)                   \
  X(VALUE, DefaultRate, V_DEFRATE, OEPayrollAmount)                     \
  X(VALUE, DefaultLimit, V_DEFLIMIT, OEPayrollAmount)                   \
  X(FLAG, Prorate, V_PRORATE, unsigned short)                           \
  X(FLAG, TaxAffected, V_TAXAFFECTED, unsigned short)                   \
  X(VALUE, TaxFormLine, V_TAXFORMLINE, OETaxFormLine)

class OEAdditionItem : public OEAggregate {
  OE_AGGREGATE(OEAdditionItem, OE_ADJUSTMENTITEM_FIELDS)
};
class OEDeductionItem : public OEAggregate {
  OE_AGGREGATE(OEDeductionItem, OE_ADJUSTMENTITEM_FIELDS)
};
class OEContributionItem : public OEAggregate {
  OE_AGGREGATE(OEContributionItem, OE_ADJUSTMENTITEM_FIELDS)
};
class OECommissionItem : public OEAggregate {
  OE_AGGREGATE(OECommissionItem, OE_ADJUSTMENTITEM_FIELDS)
};

#define OE_TAXITEM_FIELDS(X)                                            \
  X(VALUE, CalculationType, V_CALCTYPE, OECalculationType)              \
  X(CHILD, StateTaxDesc, V_STATETAXDESC, OEStateTaxDesc)                \
  X(FLAG, OnService, V_ONSERVICE, unsigned short)                       \
  X(PTEXT, LiabilityAccount, V_LIABACCT, OEString64)                    \
  X(PTEXT, LiabilityAgency, V_LIABAGENCY, OEString64)                   \
  X(PTEXT, CompanyID, V_COMPID, OEString32)                             \
  X(VALUE, FederalTax, V_FEDTAX, OEFederalTax)                          \
  X(PTEXT, OtherTax, V_OTHERTAX, OEString64)                            \
  X(PTEXT, ExpenseAccount, V_EXPACCT, OEString64)                       \
  X(VALUE, Rate, V_RATE, OEPayrollAmount)                               \
  X(VALUE, DefaultLimit, V_DEFLIMIT, OEPayrollAmount)                   \
  X(VALUE, TaxFormLine, V_TAXFORMLINE, OETaxFormLine)

class OETaxItem : public OEAggregate {
  OE_AGGREGATE(OETaxItem, OE_TAXITEM_FIELDS)
};

// The direct deposit item: the accounts its funds pass through.
#define OE_DIRECTDEPOSITITEM_FIELDS(X)                          \
  X(PTEXT, LiabilityAccount, V_LIABACCT, OEString64)            \
  X(PTEXT, ExpenseAccount, V_EXPACCT, OEString64)

class OEDirectDepositItem : public OEAggregate {
  OE_AGGREGATE(OEDirectDepositItem, OE_DIRECTDEPOSITITEM_FIELDS)
};

#define OE_PAYROLLITEM_FIELDS(X)                                        \
  X(CHILD, SalaryItem, V_SALARYITEM, OESalaryItem)                      \
  X(CHILD, HourlyItem, V_HRLYITEM, OEHourlyItem)                        \
  X(CHILD, AdditionItem, V_ADDITEM, OEAdditionItem)                     \
  X(CHILD, DeductionItem, V_DEDUCTITEM, OEDeductionItem)                \
  X(CHILD, ContributionItem, V_CONTRIBITEM, OEContributionItem)         \
  X(CHILD, CommissionItem, V_COMMITEM, OECommissionItem)                \
  X(CHILD, TaxItem, V_TAXITEM, OETaxItem)                               \
  X(CHILD, DirectDepositItem, V_DDITEM, OEDirectDepositItem)            \
  X(PTEXT, PayrollItemID, V_PITEMID, OEString32)                        \
  X(PTEXT, PayrollItemName, V_PITEMNAME, OEString64)                    \
  X(FLAG, Inactive, V_INACTIVE, unsigned short)                         \
  X(FLAG, IsEmployee, V_ISEMP, unsigned short)                          \
  X(VALUE, SpecialType, V_SPECIALTYPE, OEPayrollItemSpecialType)

// A payroll item ("V.PITEM") and the changes to one ("V.PITEMMOD", which
// needs only the item's id).
class OEPayrollItem : public OEAggregate {
  OE_AGGREGATE(OEPayrollItem, OE_PAYROLLITEM_FIELDS)
};

class OEPayrollItemMod : public OEAggregate {
  OE_AGGREGATE(OEPayrollItemMod, OE_PAYROLLITEM_FIELDS)
};
