// Named arrays of the payroll classes, for applications that keep their own
// lists of employees, paychecks and the like (the aggregates hold their
// repeated children themselves).
#pragma once

#include "ofxkit/payroll/OEPayrollCheck.h"
#include "ofxkit/payroll/OEPayrollEmployee.h"
#include "ofxkit/payroll/OEPayrollItem.h"
#include "ofxkit/types/OEDynamicArray.h"

OE_TYPED_ARRAY(Wage, OEWage)
OE_TYPED_ARRAY(TxLine, OETxLine)
OE_TYPED_ARRAY(PayrollAdjustment, OEPayrollAdjustment)
OE_TYPED_ARRAY(EmployeeOtherTax, OEEmployeeOtherTax)
OE_TYPED_ARRAY(CustomField, OECustomField)
OE_TYPED_ARRAY(DirectDepositAccount, OEDirectDepositAccount)
OE_TYPED_ARRAY(SalaryLine, OESalaryLine)
OE_TYPED_ARRAY(HourlyWageLine, OEHourlyWageLine)
OE_TYPED_ARRAY(DirectDepositLine, OEDirectDepositLine)
OE_TYPED_ARRAY(AdjustmentLine, OEAdjustmentLine)
OE_TYPED_ARRAY(TaxLine, OETaxLine)
OE_TYPED_ARRAY(PayrollItem, OEPayrollItem)
OE_TYPED_ARRAY(Employee, OEEmployee)
OE_TYPED_ARRAY(PayrollTx, OEPayrollTx)
OE_TYPED_ARRAY(PayrollItemMod, OEPayrollItemMod)
OE_TYPED_ARRAY(EmployeeMod, OEEmployeeMod)
OE_TYPED_ARRAY(PayrollTxMod, OEPayrollTxMod)
OE_TYPED_ARRAY(PayrollRun, OEPayrollRun)
OE_TYPED_ARRAY(EmployeeQtrTotals, OEEmployeeQtrTotals)
OE_TYPED_ARRAY(PayCheck, OEPayCheck)
OE_TYPED_ARRAY(PayCheckMod, OEPayCheckMod)
OE_TYPED_ARRAY(TaxLiability, OETaxLiability)
OE_TYPED_ARRAY(DirectDeposit, OEDirectDeposit)
OE_TYPED_ARRAY(EmployeeTaxSummary, OEEmployeeTaxSummary)
OE_TYPED_ARRAY(EmployeeTaxQtd, OEEmployeeTaxQtd)
OE_TYPED_ARRAY(EmployeeTaxYtd, OEEmployeeTaxYtd)
OE_TYPED_ARRAY(EmployeeReportingQtd, OEEmployeeReportingQtd)
OE_TYPED_ARRAY(EmployeeReportingYtd, OEEmployeeReportingYtd)
