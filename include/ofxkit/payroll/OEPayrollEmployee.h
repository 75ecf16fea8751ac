// Employees: personal and payroll data, taxes, sick and vacation hours,
// direct deposit, custom fields, the modification form, and the quarterly
// totals that a payroll service reports for each employee.
#pragma once

#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/payroll/OEPayrollByType.h"
#include "ofxkit/payroll/OEPayrollCompany.h"

#define OE_CUSTOMFIELD_FIELDS(X)                        \
  X(PTEXT, FieldName, V_FLDNAME, OEString32)            \
  X(PTEXT, FieldValue, V_FLDVALUE, OEString64)

class OECustomField : public OEAggregate {
  OE_AGGREGATE(OECustomField, OE_CUSTOMFIELD_FIELDS)
};

// The payroll item that a wage, adjustment or line refers to.
#define OE_PAYROLL_ITEMREF_FIELDS(X)                    \
  X(PTEXT, PayrollItemID, V_PITEMID, OEString32)        \
  X(PTEXT, PayrollItemName, V_PITEMNAME, OEString64)

#define OE_WAGE_FIELDS(X)                               \
  OE_PAYROLL_ITEMREF_FIELDS(X)                          \
  X(VALUE, Rate, V_RATE, OEPayrollAmount)

class OEWage : public OEAggregate {
  OE_AGGREGATE(OEWage, OE_WAGE_FIELDS)
};

#define OE_PAYROLLADJUSTMENT_FIELDS(X)                  \
  OE_PAYROLL_ITEMREF_FIELDS(X)                          \
  X(VALUE, Rate, V_RATE, OEPayrollAmount)               \
  X(VALUE, Limit, V_LIMIT, OEPayrollAmount)

class OEPayrollAdjustment : public OEAggregate {
  OE_AGGREGATE(OEPayrollAdjustment, OE_PAYROLLADJUSTMENT_FIELDS)
};

#define OE_HEALTHCARE_FIELDS(X)                                 \
  X(VALUE, Provider, V_PROVIDER, OEHealthCareProvider)          \
  X(VALUE, Level, V_LEVEL, OEHealthCareLevel)

class OEHealthCare : public OEAggregate {
  OE_AGGREGATE(OEHealthCare, OE_HEALTHCARE_FIELDS)
};

// How an employee is paid.
#define OE_PAYROLL_FIELDS(X)                                    \
  X(VALUE, PayPeriod, V_PAYPD, OEPayrollFrequency)              \
  X(PTEXT, Class, V_CLASS, OEString64)                          \
  X(FLAG, UseTime, V_USETIME, unsigned short)                   \
  X(VALUE, HoursPerPeriod, V_HRSPERPD, OEPayrollAmount)         \
  X(LIST, Wage, V_WAGE, OEWage)                                 \
  X(LIST, Adjustment, V_ADJ, OEPayrollAdjustment)               \
  X(CHILD, HealthCare, V_HEALTHCARE, OEHealthCare)               \
  X(ALSO, HealthCare, V_HEALTHCARE_2, OEHealthCare)

// "V.HEALTHCARE" has two ids in the vocabulary; a lookup by name may give
// either, so the health care child stands under both.
class OEPayroll : public OEAggregate {
  OE_AGGREGATE(OEPayroll, OE_PAYROLL_FIELDS)
};

#define OE_DIRECTDEPOSITACCOUNT_FIELDS(X)                       \
  X(CHILD, BankAccountTo, BANKACCTTO, OEBankAccount)            \
  X(PTEXT, BankName, V_BANKNAME, OEString64)                    \
  X(VALUE, DirectDepositAmount, V_DDAMT, OEPayrollAmount)

class OEDirectDepositAccount : public OEAggregate {
  OE_AGGREGATE(OEDirectDepositAccount, OE_DIRECTDEPOSITACCOUNT_FIELDS)
};

#define OE_EMPLOYEEDDINFO_FIELDS(X)                             \
  X(FLAG, UseDirectDeposit, V_USEDD, unsigned short)            \
  X(LIST, Account, V_DDACCT, OEDirectDepositAccount)

class OEEmployeeDirectDepositInfo : public OEAggregate {
  OE_AGGREGATE(OEEmployeeDirectDepositInfo, OE_EMPLOYEEDDINFO_FIELDS)
};

// What federal and state income tax withholding share: the allowances the
// employee claims and the extra amount withheld each pay period.
#define OE_EMPLOYEETAXBASE_FIELDS(X)                                    \
  X(VALUE, Allowances, V_ALLOWANCES, unsigned short)                    \
  X(VALUE, ExtraWithholding, V_EXTRAWITHHOLD, OEPayrollAmount)

class OEEmployeeTaxBase : public OEEnvelopeAggregate {
  OE_AGGREGATE(OEEmployeeTaxBase, OE_EMPLOYEETAXBASE_FIELDS)
};

// Withholding of the federal income tax and the federal taxes the employee
// is subject to.
#define OE_EMPLOYEEFIT_FIELDS(X)                                        \
  X(VALUE, FilingStatus, V_FEDFILESTATUS, OEFederalFilingStatus)        \
  X(FLAG, SubjectToFIT, V_SUBJTOFIT, unsigned short)                    \
  X(FLAG, SubjectToSS, V_SUBJTOSS, unsigned short)                      \
  X(FLAG, SubjectToMedicare, V_SUBJTOMCARE, unsigned short)             \
  X(FLAG, SubjectToFUTA, V_SUBJTOFUTA, unsigned short)                  \
  X(FLAG, QualifiesForAEIC, V_QUALFORAEIC, unsigned short)

class OEEmployeeFit : public OEEmployeeTaxBase {
  OE_AGGREGATE(OEEmployeeFit, OE_EMPLOYEEFIT_FIELDS)
};

// What every state tax of the employee has: the state, and whether the
// employee is subject to the tax.
#define OE_EMPLOYEESTATETAXBASE_FIELDS(X)                               \
  X(PTEXT, State, V_STATE, OEString5)                                   \
  X(FLAG, TaxAffected, V_TAXAFFECTED, unsigned short)

class OEEmployeeStateTaxBase : public OEEmployeeTaxBase {
  OE_AGGREGATE(OEEmployeeStateTaxBase, OE_EMPLOYEESTATETAXBASE_FIELDS)
};

// A state tax of the employee: income tax withholding ("V.EMPSIT"),
// disability insurance ("V.EMPSDI") or unemployment insurance ("V.EMPSUI").
// The withholding adds a filing status to the allowances and extra
// withholding of its base; the insurances have only the state and whether
// the employee is subject to it.
#define OE_EMPLOYEESIT_FIELDS(X)                                        \
  X(PTEXT, FilingStatus, V_STATEFILESTATUS, OEString32)

class OEEmployeeSit : public OEEmployeeStateTaxBase {
  OE_AGGREGATE_BY_TYPE(OEEmployeeSit, OE_EMPLOYEESIT_FIELDS)
};
OE_PAYROLL_TYPED_SUBCLASS(OEEmployeeSdi, OEEmployeeSit, V_EMPSDI)
OE_PAYROLL_TYPED_SUBCLASS(OEEmployeeSui, OEEmployeeSit, V_EMPSUI)

// Another tax item (local taxes and the like) that applies to the employee.
#define OE_EMPLOYEEOTHERTAX_FIELDS(X)                   \
  OE_PAYROLL_ITEMREF_FIELDS(X)                          \
  X(FLAG, TaxAffected, V_TAXAFFECTED, unsigned short)

class OEEmployeeOtherTax : public OEAggregate {
  OE_AGGREGATE(OEEmployeeOtherTax, OE_EMPLOYEEOTHERTAX_FIELDS)
};

#define OE_EMPLOYEETAXINFO_FIELDS(X)                            \
  X(CHILD, Fit, V_EMPFIT, OEEmployeeFit)                        \
  X(PTEXT, StateLived, V_STATELIVED, OEString5)                 \
  X(PTEXT, StateWorked, V_STATEWORKED, OEString5)               \
  X(CHILD, Sit, V_EMPSIT, OEEmployeeSit)                        \
  X(CHILD, Sdi, V_EMPSDI, OEEmployeeSdi)                        \
  X(CHILD, Sui, V_EMPSUI, OEEmployeeSui)                        \
  X(LIST, OtherTax, V_EMPOTHERTAX, OEEmployeeOtherTax)          \
  X(FLAG, Statutory, V_STATUTORY, unsigned short)               \
  X(FLAG, PensionPlan, V_PENSIONPLAN, unsigned short)           \
  X(FLAG, Deceased, V_DECEASED, unsigned short)                 \
  X(FLAG, Seasonal, V_SEASONAL, unsigned short)

class OEEmployeeTaxInfo : public OEAggregate {
  OE_AGGREGATE(OEEmployeeTaxInfo, OE_EMPLOYEETAXINFO_FIELDS)
};

// Sick ("V.SICK") or vacation ("V.VAC") hours: how they accrue, and the
// hours accrued so far under the tag of their kind ("V.SICKACCRUED",
// "V.VACACCRUED").
#define OE_HOURS_FIELDS(X)                                      \
  X(VALUE, AccrualPeriod, V_ACCRUALPD, OEAccrualPeriod)         \
  X(VALUE, Hours, V_HRS, OEPayrollAmount)                       \
  X(VALUE, MaxHours, V_MAXHRS, OEPayrollAmount)                 \
  X(FLAG, NewYearReset, V_NEWYRRESET, unsigned short)           \
  X(VALUE, SickAccrued, V_SICKACCRUED, OEPayrollAmount)         \
  X(VALUE, VacationAccrued, V_VACACCRUED, OEPayrollAmount)

class OEHours : public OEEnvelopeAggregate {
  OE_AGGREGATE_BY_TYPE(OEHours, OE_HOURS_FIELDS)
};
OE_PAYROLL_TYPED_SUBCLASS(OESick, OEHours, V_SICK)
OE_PAYROLL_TYPED_SUBCLASS(OEVacation, OEHours, V_VAC)

// An employee ("V.EMP"), and the changes to one ("V.EMPMOD", which needs
// only the employee's id).
#define OE_EMPLOYEE_FIELDS(X)                                           \
  X(CHILD, AddrInfo, V_ADDRINFO, OEAddrInfo)                            \
  X(CHILD, Payroll, V_PAYROLL, OEPayroll)                               \
  X(CHILD, TaxInfo, V_EMPTAX, OEEmployeeTaxInfo)                        \
  X(CHILD, Sick, V_SICK, OESick)                                        \
  X(CHILD, Vacation, V_VAC, OEVacation)                                 \
  X(FLAG, HasCustomField, V_HASCUSTOMFLD, unsigned short)               \
  X(LIST, CustomField, V_CUSTOMFLD, OECustomField)                      \
  X(PTEXT, EmployeeID, V_EMPID, OEString32)                             \
  X(PTEXT, SSN, V_SSN, OEString11)                                      \
  X(VALUE, DateHired, V_DTHIRE, OEPayrollDateTime)                      \
  X(VALUE, DateReleased, V_DTRELEASE, OEPayrollDateTime)                \
  X(FLAG, Inactive, V_INACTIVE, unsigned short)                         \
  X(PTEXT, EmployeeName, V_EMPNAME, OEString64)                         \
  X(PTEXT, BillPayAccount, V_BILLPAYACCT, OEString32)                   \
  X(CHILD, DirectDepositInfo, V_EMPDD, OEEmployeeDirectDepositInfo)

class OEEmployee : public OEAggregate {
  OE_AGGREGATE(OEEmployee, OE_EMPLOYEE_FIELDS)
};

class OEEmployeeMod : public OEAggregate {
  OE_AGGREGATE(OEEmployeeMod, OE_EMPLOYEE_FIELDS)
};

// One tax of the employee over the quarter ("V.EMPTAXQTD", with the amounts
// of its three months) or the year to date ("V.EMPTAXYTD").
#define OE_EMPLOYEETAXQTD_FIELDS(X)                             \
  OE_PAYROLL_ITEMREF_FIELDS(X)                                  \
  X(VALUE, TaxAmount, V_TAXAMT, OEPayrollAmount)                \
  X(VALUE, TaxableWage, V_TAXABLEWAGE, OEPayrollAmount)         \
  X(VALUE, TotalWage, V_TOTALWAGE, OEPayrollAmount)             \
  X(VALUE, Month1, V_MONTH1, OEPayrollAmount)                   \
  X(VALUE, Month2, V_MONTH2, OEPayrollAmount)                   \
  X(VALUE, Month3, V_MONTH3, OEPayrollAmount)

class OEEmployeeTaxQtd : public OEEnvelopeAggregate {
  OE_AGGREGATE_BY_TYPE(OEEmployeeTaxQtd, OE_EMPLOYEETAXQTD_FIELDS)
};
OE_PAYROLL_TYPED_SUBCLASS(OEEmployeeTaxYtd, OEEmployeeTaxQtd, V_EMPTAXYTD)

// What the employee's tax forms report for the quarter ("V.EMPRPTQTD",
// with whether the employee was paid in each of its months) or the year
// ("V.EMPRPTYTD").
#define OE_EMPLOYEEREPORTINGQTD_FIELDS(X)                       \
  X(VALUE, TotalWage, V_TOTALWAGE, OEPayrollAmount)             \
  X(VALUE, HoursWorked, V_HRSWORKED, OEPayrollAmount)           \
  X(VALUE, WeeksWorked, V_WKSWORKED, unsigned short)            \
  X(FLAG, Month1, V_MONTH1, unsigned short)                     \
  X(FLAG, Month2, V_MONTH2, unsigned short)                     \
  X(FLAG, Month3, V_MONTH3, unsigned short)

class OEEmployeeReportingQtd : public OEEnvelopeAggregate {
  OE_AGGREGATE_BY_TYPE(OEEmployeeReportingQtd, OE_EMPLOYEEREPORTINGQTD_FIELDS)
};
OE_PAYROLL_TYPED_SUBCLASS(OEEmployeeReportingYtd, OEEmployeeReportingQtd, V_EMPRPTYTD)

#define OE_EMPLOYEETAXSUMMARY_FIELDS(X)                                 \
  X(LIST, TaxQtd, V_EMPTAXQTD, OEEmployeeTaxQtd)                        \
  X(LIST, TaxYtd, V_EMPTAXYTD, OEEmployeeTaxYtd)                        \
  X(CHILD, ReportingQtd, V_EMPRPTQTD, OEEmployeeReportingQtd)           \
  X(CHILD, ReportingYtd, V_EMPRPTYTD, OEEmployeeReportingYtd)

class OEEmployeeTaxSummary : public OEAggregate {
  OE_AGGREGATE(OEEmployeeTaxSummary, OE_EMPLOYEETAXSUMMARY_FIELDS)
};

#define OE_EMPLOYEEQTRTOTALS_FIELDS(X)                                  \
  X(PTEXT, EmployeeID, V_EMPID, OEString32)                             \
  X(VALUE, Year, V_YR, unsigned short)                                  \
  X(VALUE, Quarter, V_QTR, unsigned short)                              \
  X(LIST, TaxSummary, V_EMPTAXSUMMARY, OEEmployeeTaxSummary)

class OEEmployeeQtrTotals : public OEAggregate {
  OE_AGGREGATE(OEEmployeeQtrTotals, OE_EMPLOYEEQTRTOTALS_FIELDS)
};
