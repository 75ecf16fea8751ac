#include "ofxkit/payroll/OEPayrollEmployee.h"

OE_DEFINE_AGGREGATE(OECustomField, OEAggregate, OE_CUSTOMFIELD_FIELDS, V_CUSTOMFLD,
                    .Valid(OE_TAGS(V_FLDNAME, V_FLDVALUE))
                    .Required(OE_TAGS(V_FLDNAME)))
OE_DEFINE_AGGREGATE(OEWage, OEAggregate, OE_WAGE_FIELDS, V_WAGE,
                    .Valid(OE_TAGS(V_PITEMID, V_PITEMNAME, V_RATE))
                    .Required(OE_TAGS(V_PITEMID)))
OE_DEFINE_AGGREGATE(OEPayrollAdjustment, OEAggregate, OE_PAYROLLADJUSTMENT_FIELDS, V_ADJ,
                    .Valid(OE_TAGS(V_PITEMID, V_PITEMNAME, V_RATE, V_LIMIT))
                    .Required(OE_TAGS(V_PITEMID)))
OE_DEFINE_AGGREGATE(OEHealthCare, OEAggregate, OE_HEALTHCARE_FIELDS, V_HEALTHCARE,
                    .Valid(OE_TAGS(V_PROVIDER, V_LEVEL))
                    .Required(OE_TAGS(V_PROVIDER, V_LEVEL)))
OE_DEFINE_AGGREGATE(OEPayroll, OEAggregate, OE_PAYROLL_FIELDS, V_PAYROLL,
                    .Valid(OE_TAGS(V_PAYPD, V_CLASS, V_USETIME, V_HRSPERPD, V_WAGE, V_ADJ, V_HEALTHCARE, V_HEALTHCARE_2)))
OE_DEFINE_AGGREGATE(OEDirectDepositAccount, OEAggregate, OE_DIRECTDEPOSITACCOUNT_FIELDS, V_DDACCT,
                    .Valid(OE_TAGS(BANKACCTTO, V_BANKNAME, V_DDAMT))
                    .Required(OE_TAGS(BANKACCTTO)))
OE_DEFINE_AGGREGATE(OEEmployeeDirectDepositInfo, OEAggregate, OE_EMPLOYEEDDINFO_FIELDS, V_EMPDD,
                    .Valid(OE_TAGS(V_USEDD, V_DDACCT))
                    .Required(OE_TAGS(V_USEDD)))
// Family bases: never used alone; each member's valid tags choose its fields.
OE_DEFINE_AGGREGATE(OEEmployeeTaxBase, OEEnvelopeAggregate, OE_EMPLOYEETAXBASE_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OEEmployeeStateTaxBase, OEEmployeeTaxBase, OE_EMPLOYEESTATETAXBASE_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OEEmployeeFit, OEEmployeeTaxBase, OE_EMPLOYEEFIT_FIELDS, V_EMPFIT,
                    .Valid(OE_TAGS(V_FEDFILESTATUS, V_ALLOWANCES, V_EXTRAWITHHOLD, V_SUBJTOFIT, V_SUBJTOSS,
                                   V_SUBJTOMCARE, V_SUBJTOFUTA, V_QUALFORAEIC)))

OE_DEFINE_AGGREGATE(OEEmployeeSit, OEEmployeeStateTaxBase, OE_EMPLOYEESIT_FIELDS, V_EMPSIT,
                    .Valid(OE_TAGS(V_STATE, V_STATEFILESTATUS, V_ALLOWANCES, V_EXTRAWITHHOLD, V_TAXAFFECTED))
                    .Required(OE_TAGS(V_STATE)))
const OEAggregateInfo* OEEmployeeSit::TypeInfo(OETagID type) {
  static OETypeInfoCache cache(3);
  static const std::vector<OEPayrollTypeRow> rows = {
      {OE_TAG_V_EMPSIT, OE_TAGS(V_STATE, V_STATEFILESTATUS, V_ALLOWANCES, V_EXTRAWITHHOLD, V_TAXAFFECTED),
       OE_TAGS(V_STATE)},
      {OE_TAG_V_EMPSDI, OE_TAGS(V_STATE, V_TAXAFFECTED), OE_TAGS(V_STATE)},
      {OE_TAG_V_EMPSUI, OE_TAGS(V_STATE, V_TAXAFFECTED), OE_TAGS(V_STATE)},
  };
  return OEPayrollTypeInfo(cache, ClassInfo(), type, rows);
}

OE_DEFINE_AGGREGATE(OEEmployeeOtherTax, OEAggregate, OE_EMPLOYEEOTHERTAX_FIELDS, V_EMPOTHERTAX,
                    .Valid(OE_TAGS(V_PITEMID, V_PITEMNAME, V_TAXAFFECTED))
                    .Required(OE_TAGS(V_PITEMID)))
OE_DEFINE_AGGREGATE(OEEmployeeTaxInfo, OEAggregate, OE_EMPLOYEETAXINFO_FIELDS, V_EMPTAX,
                    .Valid(OE_TAGS(V_EMPFIT, V_STATELIVED, V_STATEWORKED, V_EMPSIT, V_EMPSDI, V_EMPSUI,
                                   V_EMPOTHERTAX, V_STATUTORY, V_PENSIONPLAN, V_DECEASED, V_SEASONAL)))

OE_DEFINE_AGGREGATE(OEHours, OEEnvelopeAggregate, OE_HOURS_FIELDS, V_SICK,
                    .Valid(OE_TAGS(V_ACCRUALPD, V_HRS, V_MAXHRS, V_NEWYRRESET, V_SICKACCRUED, V_VACACCRUED)))
const OEAggregateInfo* OEHours::TypeInfo(OETagID type) {
  static OETypeInfoCache cache(2);
  static const std::vector<OEPayrollTypeRow> rows = {
      {OE_TAG_V_SICK, OE_TAGS(V_ACCRUALPD, V_HRS, V_MAXHRS, V_NEWYRRESET, V_SICKACCRUED), {}},
      {OE_TAG_V_VAC, OE_TAGS(V_ACCRUALPD, V_HRS, V_MAXHRS, V_NEWYRRESET, V_VACACCRUED), {}},
  };
  return OEPayrollTypeInfo(cache, ClassInfo(), type, rows);
}

#define OE_EMPLOYEE_TAGS                                                                                      \
  OE_TAGS(V_ADDRINFO, V_PAYROLL, V_EMPTAX, V_SICK, V_VAC, V_HASCUSTOMFLD, V_CUSTOMFLD, V_EMPID, V_SSN, V_DTHIRE, \
          V_DTRELEASE, V_INACTIVE, V_EMPNAME, V_BILLPAYACCT, V_EMPDD)
OE_DEFINE_AGGREGATE(OEEmployee, OEAggregate, OE_EMPLOYEE_FIELDS, V_EMP,
                    .Valid(OE_EMPLOYEE_TAGS)
                    .Required(OE_TAGS(V_ADDRINFO, V_PAYROLL, V_EMPTAX, V_SICK, V_VAC, V_EMPID, V_SSN, V_DTHIRE,
                                      V_INACTIVE, V_EMPDD)))
OE_DEFINE_AGGREGATE(OEEmployeeMod, OEAggregate, OE_EMPLOYEE_FIELDS, V_EMPMOD,
                    .Valid(OE_EMPLOYEE_TAGS)
                    .Required(OE_TAGS(V_EMPID)))

OE_DEFINE_AGGREGATE(OEEmployeeTaxQtd, OEEnvelopeAggregate, OE_EMPLOYEETAXQTD_FIELDS, V_EMPTAXQTD,
                    .Valid(OE_TAGS(V_PITEMID, V_PITEMNAME, V_TAXAMT, V_TAXABLEWAGE, V_TOTALWAGE, V_MONTH1, V_MONTH2,
                                   V_MONTH3))
                    .Required(OE_TAGS(V_PITEMID, V_TAXAMT)))
const OEAggregateInfo* OEEmployeeTaxQtd::TypeInfo(OETagID type) {
  static OETypeInfoCache cache(2);
  static const std::vector<OEPayrollTypeRow> rows = {
      {OE_TAG_V_EMPTAXQTD,
       OE_TAGS(V_PITEMID, V_PITEMNAME, V_TAXAMT, V_TAXABLEWAGE, V_TOTALWAGE, V_MONTH1, V_MONTH2, V_MONTH3),
       OE_TAGS(V_PITEMID, V_TAXAMT)},
      {OE_TAG_V_EMPTAXYTD, OE_TAGS(V_PITEMID, V_PITEMNAME, V_TAXAMT, V_TAXABLEWAGE, V_TOTALWAGE),
       OE_TAGS(V_PITEMID, V_TAXAMT)},
  };
  return OEPayrollTypeInfo(cache, ClassInfo(), type, rows);
}

OE_DEFINE_AGGREGATE(OEEmployeeReportingQtd, OEEnvelopeAggregate, OE_EMPLOYEEREPORTINGQTD_FIELDS, V_EMPRPTQTD,
                    .Valid(OE_TAGS(V_TOTALWAGE, V_HRSWORKED, V_WKSWORKED, V_MONTH1, V_MONTH2, V_MONTH3)))
const OEAggregateInfo* OEEmployeeReportingQtd::TypeInfo(OETagID type) {
  static OETypeInfoCache cache(2);
  static const std::vector<OEPayrollTypeRow> rows = {
      {OE_TAG_V_EMPRPTQTD, OE_TAGS(V_TOTALWAGE, V_HRSWORKED, V_WKSWORKED, V_MONTH1, V_MONTH2, V_MONTH3), {}},
      {OE_TAG_V_EMPRPTYTD, OE_TAGS(V_TOTALWAGE, V_HRSWORKED, V_WKSWORKED), {}},
  };
  return OEPayrollTypeInfo(cache, ClassInfo(), type, rows);
}

OE_DEFINE_AGGREGATE(OEEmployeeTaxSummary, OEAggregate, OE_EMPLOYEETAXSUMMARY_FIELDS, V_EMPTAXSUMMARY,
                    .Valid(OE_TAGS(V_EMPTAXQTD, V_EMPTAXYTD, V_EMPRPTQTD, V_EMPRPTYTD)))
OE_DEFINE_AGGREGATE(OEEmployeeQtrTotals, OEAggregate, OE_EMPLOYEEQTRTOTALS_FIELDS, V_EMPQTRTOTALS,
                    .Valid(OE_TAGS(V_EMPID, V_YR, V_QTR, V_EMPTAXSUMMARY))
                    .Required(OE_TAGS(V_EMPID, V_YR, V_QTR)))
