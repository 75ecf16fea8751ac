// Payroll aggregates read from and written to realistic fragments: an
// employee with tax data and direct deposit, a payroll run with paychecks,
// lines and tax liabilities, modification records with emptied fields, and
// whole OFX files with the payroll message set.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"
#include "support/ofx_text.h"

namespace {

#define T_PAYROLL_ROOT_FIELDS(X)                                \
  X(CHILD, Employee, V_EMP, OEEmployee)                         \
  X(CHILD, EmployeeMod, V_EMPMOD, OEEmployeeMod)                \
  X(CHILD, PayrollRun, V_PAYROLLRUN, OEPayrollRun)              \
  X(CHILD, PayCheckMod, V_PAYCHKMOD, OEPayCheckMod)             \
  X(CHILD, PayrollItem, V_PITEM, OEPayrollItem)                 \
  X(CHILD, PayrollTx, V_PAYROLLTX, OEPayrollTx)                 \
  X(CHILD, QtrTotals, V_EMPQTRTOTALS, OEEmployeeQtrTotals)      \
  X(CHILD, EnrollRq, V_PAYROLLENROLLRQ, OEPayrollEnrollRq)
class PayrollRoot : public OEAggregate {
  OE_AGGREGATE(PayrollRoot, T_PAYROLL_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(PayrollRoot, OEAggregate, T_PAYROLL_ROOT_FIELDS, NONE,
                    .Valid(OE_TAGS(V_EMP, V_EMPMOD, V_PAYROLLRUN, V_PAYCHKMOD, V_PITEM, V_PAYROLLTX, V_EMPQTRTOTALS,
                                   V_PAYROLLENROLLRQ)))

const char kEmployee[] =
    "<V.EMP>"
    "<V.ADDRINFO><V.FIRST>Maria<V.LAST>Lopez<V.ADDR1>12 Elm St<V.CITY>Springfield<V.STATE>IL"
    "<V.POSTALCODE>62701<V.PHONE>555-0100</V.ADDRINFO>"
    "<V.PAYROLL><V.PAYPD>BIWEEKLY<V.USETIME>N"
    "<V.WAGE><V.PITEMID>10<V.PITEMNAME>Salary<V.RATE>$52000.00</V.WAGE>"
    "<V.ADJ><V.PITEMID>21<V.PITEMNAME>401(k)<V.RATE>6%<V.LIMIT>$15000.00</V.ADJ>"
    "<V.HEALTHCARE><V.PROVIDER>COMPANY<V.LEVEL>SPOUSE</V.HEALTHCARE></V.PAYROLL>"
    "<V.EMPTAX><V.EMPFIT><V.FEDFILESTATUS>MARRIED<V.ALLOWANCES>2<V.EXTRAWITHHOLD>$25.00<V.SUBJTOSS>Y</V.EMPFIT>"
    "<V.STATELIVED>IL<V.STATEWORKED>IL"
    "<V.EMPSIT><V.STATE>IL<V.STATEFILESTATUS>MARRIED<V.ALLOWANCES>2</V.EMPSIT>"
    "<V.EMPSUI><V.STATE>IL<V.TAXAFFECTED>Y</V.EMPSUI></V.EMPTAX>"
    "<V.SICK><V.ACCRUALPD>PAYROLL<V.HRS>1.5<V.MAXHRS>40<V.SICKACCRUED>12.5</V.SICK>"
    "<V.VAC><V.ACCRUALPD>YEARLY<V.HRS>80<V.VACACCRUED>64</V.VAC>"
    "<V.EMPID>E-1001<V.SSN>123-45-6789<V.DTHIRE>20190301<V.INACTIVE>N<V.EMPNAME>Maria Lopez"
    "<V.EMPDD><V.USEDD>Y<V.DDACCT><BANKACCTTO><BANKID>121000248<ACCTID>555001<ACCTTYPE>CHECKING</BANKACCTTO>"
    "<V.BANKNAME>First Bank<V.DDAMT>100%</V.DDACCT></V.EMPDD>"
    "</V.EMP>";

const char kPayCheck[] =
    "<V.PAYCHK><V.PAYCHKINFO><V.CHKNUM>DD-0415<V.ISDD>Y</V.PAYCHKINFO>"
    "<V.SALARYLINE><V.PITEMID>10<V.PITEMNAME>Salary<V.PAYTYPE>REG<V.AMT>$2000.00</V.SALARYLINE>"
    "<V.ADJLINE><V.PITEMID>21<V.RATE>6%<V.AMT>$-120.00</V.ADJLINE>"
    "<V.TAXLINE><V.PITEMID>30<V.PITEMNAME>Federal Withholding<V.WB>$1880.00<V.AMT>$-182.40</V.TAXLINE>"
    "<V.TAXLINE><V.PITEMID>31<V.PITEMNAME>Social Security Employee<V.WB>$2000.00<V.AMT>$-124.00</V.TAXLINE>"
    "<V.DDLINE><BANKACCTTO><BANKID>121000248<ACCTID>555001<ACCTTYPE>CHECKING</BANKACCTTO>"
    "<V.AMT>$1573.60</V.DDLINE>"
    "<V.PAYCHKID>PC-77<V.EMPID>E-1001<V.DTTX>20240415<V.PAYCHKTYPE>PAYCHK<V.EMPNAME>Maria Lopez"
    "<V.AMT>$1573.60<V.VOID>N<V.ONSERVICE>Y<V.DTPAYPDBEGIN>20240401<V.DTPAYPDEND>20240414<V.CLEARED>N"
    "</V.PAYCHK>";

const char kDisburse[] =
    "<V.DISBURSEADVICE>"
    "<V.TAXLIAB><V.CURAMT>$364.80<V.QTRAMT>$364.80<V.YTDAMT>$4012.80<V.CURWB>$2000.00<V.QTRWB>$2000.00"
    "<V.YTDWB>$22000.00<V.TAXPMTTYPE>LIAB<V.PITEMID>31<V.FEDTAX>SS_EE<V.PITEMNAME>Social Security Employee"
    "</V.TAXLIAB>"
    "<V.TAXLIAB><V.STATETAXDESC><V.STATE>IL<V.STATETAX>SUI_ER</V.STATETAXDESC><V.CURAMT>$54.00<V.QTRAMT>$54.00"
    "<V.YTDAMT>$594.00<V.CURWB>$2000.00<V.QTRWB>$2000.00<V.YTDWB>$12960.00<V.TAXPMTTYPE>LIAB<V.PITEMID>40"
    "</V.TAXLIAB>"
    "<V.DISBURSEFUNDS>$418.80<V.LEADDAYS>2</V.DISBURSEADVICE>";

// The text as written, one tag a line, with the line breaks taken out.
std::string Flat(const std::string& text) {
  std::string flat;
  for (char c : text)
    if (c != '\n') flat += c;
  return flat;
}

class PayrollAggregateTest : public LogFixture {
 protected:
  std::string Write(const OEDataObj& obj, OEBuildStatus expected = OE_BUILD_OK, unsigned short check = 0) {
    WrittenText written = WriteUnderOwnTag(obj, OE_BUILD_STRICT, check);
    EXPECT_EQ(written.status, expected);
    inError = written.inError;
    return Flat(written.text);
  }
  PayrollRoot* Parse(const std::string& text, OEParseStatus expected = OE_PARSE_OK) {
    root_.reset(new PayrollRoot);
    EXPECT_EQ(ParseText(text, root_.get()), expected) << text;
    return root_.get();
  }
  static std::vector<OETagID> Missing(OEDataObj& obj) {
    std::vector<OETagID> tags;
    for (OETagID t = obj.GetFirstMissingRequiredTag(OE_TAG_NONE); t != OE_TAG_NONE;
         t = obj.GetFirstMissingRequiredTag(t))
      tags.push_back(t);
    return tags;
  }
  // The first object of the tree that lacks a required tag, or null.
  static OEDataObj* FirstLacking(OEDataObj* root) {
    OEDataObj* lacking = root;
    OETagID missing = OE_TAG_NONE;
    return OEUtility::AllRequiredPresent(&lacking, &missing) ? nullptr : lacking;
  }
  static std::string Text(const OEPayrollAmount& amount) {
    OEPayrollAmount copy(amount);
    const char* text = static_cast<char*>(copy);
    return text ? text : "<none>";
  }
  std::unique_ptr<PayrollRoot> root_;
  OEDataObj* inError = nullptr;
};

// ---------------------------------------------------------------------------

TEST_F(PayrollAggregateTest, EmployeeWithTaxDataAndDirectDeposit) {
  OEEmployee* emp = Parse(kEmployee)->GetEmployee();
  ASSERT_NE(emp, nullptr);
  EXPECT_EQ(log->Entries(), 0);
  EXPECT_EQ(emp->GetEmployeeID(), "E-1001");
  EXPECT_EQ(emp->GetSSN(), "123-45-6789");
  EXPECT_EQ(emp->GetDateHired().GetYear(), 2019);
  EXPECT_FALSE(emp->GetDateHired().IsEmpty());
  EXPECT_EQ(emp->GetInactive(), 0);
  ASSERT_NE(emp->GetAddrInfo(), nullptr);
  EXPECT_EQ(emp->GetAddrInfo()->GetCity(), "Springfield");

  OEPayroll* pay = emp->GetPayroll();
  ASSERT_NE(pay, nullptr);
  EXPECT_EQ(pay->GetPayPeriod(), OE_PAYFREQ_BIWEEKLY);
  ASSERT_EQ(pay->GetNumWage(), 1);
  EXPECT_TRUE(pay->GetWage(0)->GetRate().IsDollarKind());
  EXPECT_EQ(Text(pay->GetWage(0)->GetRate()), "$52000.00");
  ASSERT_EQ(pay->GetNumAdjustment(), 1);
  EXPECT_TRUE(pay->GetAdjustment(0)->GetRate().IsPercent());
  ASSERT_NE(pay->GetHealthCare(), nullptr);
  EXPECT_EQ(pay->GetHealthCare()->GetLevel(), OE_HCLEVEL_SPOUSE);

  OEEmployeeTaxInfo* tax = emp->GetTaxInfo();
  ASSERT_NE(tax, nullptr);
  ASSERT_NE(tax->GetFit(), nullptr);
  EXPECT_EQ(tax->GetFit()->GetFilingStatus(), OE_FEDFILE_MARRIED);
  EXPECT_EQ(tax->GetFit()->GetAllowances(), 2);
  EXPECT_EQ(tax->GetFit()->GetSubjectToSS(), 1);
  ASSERT_NE(tax->GetSit(), nullptr);
  EXPECT_EQ(tax->GetSit()->GetType(), OE_TAG_V_EMPSIT);
  EXPECT_EQ(tax->GetSdi(), nullptr);
  ASSERT_NE(tax->GetSui(), nullptr);
  EXPECT_EQ(tax->GetSui()->GetType(), OE_TAG_V_EMPSUI);
  EXPECT_EQ(tax->GetSui()->GetTaxAffected(), 1);

  ASSERT_NE(emp->GetSick(), nullptr);
  EXPECT_EQ(Text(emp->GetSick()->GetSickAccrued()), "12.5");
  ASSERT_NE(emp->GetVacation(), nullptr);
  EXPECT_EQ(emp->GetVacation()->GetAccrualPeriod(), OE_ACCRUAL_YEARLY);
  EXPECT_EQ(Text(emp->GetVacation()->GetVacationAccrued()), "64");

  OEEmployeeDirectDepositInfo* dd = emp->GetDirectDepositInfo();
  ASSERT_NE(dd, nullptr);
  ASSERT_EQ(dd->GetNumAccount(), 1);
  ASSERT_NE(dd->GetAccount(0)->GetBankAccountTo(), nullptr);
  EXPECT_EQ(dd->GetAccount(0)->GetBankAccountTo()->GetType(), OE_TAG_BANKACCTTO);
  EXPECT_EQ(Text(dd->GetAccount(0)->GetDirectDepositAmount()), "100%");

  EXPECT_EQ(emp->AllRequiredPresent(), 1);
  EXPECT_EQ(Write(*emp), kEmployee);

  // A deep copy is equal and independent.
  OEEmployee copy;
  ASSERT_EQ(copy.DeepCopyFrom(emp), 1);
  EXPECT_EQ(Write(copy), kEmployee);
  ASSERT_NE(copy.GetTaxInfo(), emp->GetTaxInfo());
  ASSERT_NE(copy.GetTaxInfo()->GetSui(), nullptr);
  EXPECT_EQ(copy.GetTaxInfo()->GetSui()->GetType(), OE_TAG_V_EMPSUI);
  copy.GetPayroll()->GetWage(0)->SetRate(OEPayrollAmount("$54000.00"));
  EXPECT_EQ(Text(emp->GetPayroll()->GetWage(0)->GetRate()), "$52000.00");
}

TEST_F(PayrollAggregateTest, EmployeeRequiredRules) {
  std::string text = kEmployee;
  for (const char* cut : {"<V.SSN>123-45-6789", "<V.INACTIVE>N"}) text.erase(text.find(cut), strlen(cut));
  OEEmployee* emp = Parse(text)->GetEmployee();
  ASSERT_NE(emp, nullptr);
  EXPECT_EQ(emp->AllRequiredPresent(), 0);
  EXPECT_EQ(Missing(*emp), (std::vector<OETagID>{OE_TAG_V_SSN, OE_TAG_V_INACTIVE}));
  // The whole-tree check names the employee.
  EXPECT_EQ(FirstLacking(root_.get()), emp);
  // The modification form needs only the id.
  OEEmployeeMod mod;
  EXPECT_EQ(Missing(mod), (std::vector<OETagID>{OE_TAG_V_EMPID}));
  mod.SetEmployeeID("E-1001");
  EXPECT_EQ(mod.AllRequiredPresent(), 1);
}

TEST_F(PayrollAggregateTest, TagsChosenByTheTagAnObjectStandsUnder) {
  auto valid = [](const OEDataObj& obj) {
    OEArrayOfTags tags{nullptr, 0};
    obj.GetArrayOfValidTags(tags);
    return std::vector<OETagID>(tags.tags, tags.tags + tags.count);
  };
  OESick sick;
  OEVacation vacation;
  EXPECT_EQ(valid(sick), (std::vector<OETagID>{OE_TAG_V_ACCRUALPD, OE_TAG_V_HRS, OE_TAG_V_MAXHRS,
                                               OE_TAG_V_NEWYRRESET, OE_TAG_V_SICKACCRUED}));
  EXPECT_EQ(valid(vacation).back(), OE_TAG_V_VACACCRUED);
  EXPECT_EQ(vacation.SetVacationAccrued(OEPayrollAmount("8")), 1);
  EXPECT_EQ(sick.SetVacationAccrued(OEPayrollAmount("8")), 0);  // not a tag of sick hours
  OEEmployeeSdi sdi;
  EXPECT_EQ(valid(sdi), (std::vector<OETagID>{OE_TAG_V_STATE, OE_TAG_V_TAXAFFECTED}));
  OEEmployeeSit sit;
  EXPECT_EQ(valid(sit).size(), 5u);
  OEEmployeeTaxYtd ytd;
  EXPECT_EQ(valid(ytd).size(), 5u);
  OEEmployeeTaxQtd qtd;
  EXPECT_EQ(valid(qtd).size(), 8u);
  OEHourlyItem hourly;
  OESalaryItem salary;
  EXPECT_EQ(valid(hourly).back(), OE_TAG_V_DEFRATE);
  EXPECT_EQ(valid(salary).back(), OE_TAG_V_EXPBYJOB);

  // A vacation tag inside sick hours is not taken.
  OEEmployee* emp =
      Parse("<V.EMP><V.SICK><V.HRS>2<V.VACACCRUED>5</V.SICK><V.EMPID>E-2</V.EMP>", OE_PARSE_WARNINGS)->GetEmployee();
  ASSERT_NE(emp, nullptr);
  ASSERT_NE(emp->GetSick(), nullptr);
  EXPECT_EQ(emp->GetSick()->ValidateTag(OE_TAG_V_VACACCRUED), 0);
  EXPECT_EQ(emp->GetEmployeeID(), "E-2");
  EXPECT_GT(log->Entries(), 0);

  // Quarter totals: the quarter has months, the year does not.
  const char totals[] =
      "<V.EMPQTRTOTALS><V.EMPID>E-1001<V.YR>2024<V.QTR>1<V.EMPTAXSUMMARY>"
      "<V.EMPTAXQTD><V.PITEMID>31<V.TAXAMT>$372.00<V.TAXABLEWAGE>$6000.00<V.MONTH1>$124.00<V.MONTH2>$124.00"
      "<V.MONTH3>$124.00</V.EMPTAXQTD>"
      "<V.EMPTAXYTD><V.PITEMID>31<V.TAXAMT>$372.00</V.EMPTAXYTD>"
      "<V.EMPRPTQTD><V.TOTALWAGE>$6000.00<V.WKSWORKED>13<V.MONTH1>Y<V.MONTH2>Y<V.MONTH3>Y</V.EMPRPTQTD>"
      "<V.EMPRPTYTD><V.TOTALWAGE>$6000.00<V.WKSWORKED>13</V.EMPRPTYTD>"
      "</V.EMPTAXSUMMARY></V.EMPQTRTOTALS>";
  log->DeleteAll();
  OEEmployeeQtrTotals* q = Parse(totals)->GetQtrTotals();
  ASSERT_NE(q, nullptr);
  EXPECT_EQ(log->Entries(), 0);
  ASSERT_EQ(q->GetNumTaxSummary(), 1);
  OEEmployeeTaxSummary* summary = q->GetTaxSummary(0);
  ASSERT_EQ(summary->GetNumTaxYtd(), 1);
  EXPECT_EQ(summary->GetTaxYtd(0)->GetType(), OE_TAG_V_EMPTAXYTD);
  EXPECT_EQ(Text(summary->GetTaxQtd(0)->GetMonth3()), "$124.00");
  EXPECT_EQ(summary->GetReportingQtd()->GetMonth2(), 1);
  EXPECT_EQ(Write(*q), totals);
  OEEmployeeQtrTotals copy;
  ASSERT_EQ(copy.DeepCopyFrom(q), 1);
  EXPECT_EQ(Write(copy), totals);
  EXPECT_EQ(copy.GetTaxSummary(0)->GetReportingYtd()->GetType(), OE_TAG_V_EMPRPTYTD);
}

// Federal and state withholding share their allowances and extra withholding
// through OEEmployeeTaxBase; every state tax has its state through
// OEEmployeeStateTaxBase. A caller holding the base reaches what was read.
TEST_F(PayrollAggregateTest, TaxFamiliesShareTheirFieldsThroughTheirBases) {
  OEEmployee* emp = Parse(
      "<V.EMP><V.EMPTAX><V.EMPFIT><V.FEDFILESTATUS>MARRIED<V.ALLOWANCES>3<V.EXTRAWITHHOLD>$25.00</V.EMPFIT>"
      "<V.EMPSIT><V.STATE>IL<V.ALLOWANCES>2<V.EXTRAWITHHOLD>$5.00</V.EMPSIT>"
      "<V.EMPSDI><V.STATE>CA<V.TAXAFFECTED>Y</V.EMPSDI></V.EMPTAX><V.EMPID>E-3</V.EMP>")
                      ->GetEmployee();
  ASSERT_NE(emp, nullptr);
  OEEmployeeTaxInfo* tax = emp->GetTaxInfo();
  ASSERT_NE(tax, nullptr);
  std::vector<const OEEmployeeTaxBase*> withholding = {tax->GetFit(), tax->GetSit()};
  ASSERT_NE(withholding[0], nullptr);
  ASSERT_NE(withholding[1], nullptr);
  EXPECT_EQ(withholding[0]->GetAllowances(), 3);
  EXPECT_EQ(Text(withholding[0]->GetExtraWithholding()), "$25.00");
  EXPECT_EQ(withholding[1]->GetAllowances(), 2);
  const OEEmployeeStateTaxBase* sdi = tax->GetSdi();
  ASSERT_NE(sdi, nullptr);
  EXPECT_EQ(sdi->GetState(), "CA");
  EXPECT_EQ(sdi->GetTaxAffected(), 1);
  // The insurance takes no allowances even though its base declares them.
  OEEmployeeSdi fresh;
  EXPECT_EQ(fresh.SetAllowances(static_cast<unsigned short>(1)), 0);
  EXPECT_EQ(fresh.SetState(OEString("NY")), 1);
}

// The named arrays own their elements and hand them back typed.
TEST(PayrollArrays, NamedArraysOwnTypedElements) {
  OEDynamicArrayEmployee employees;
  OEEmployee* first = new OEEmployee;
  first->SetEmployeeID(OEString("E-1"));
  ASSERT_EQ(employees.Append(first), 1);
  ASSERT_EQ(employees.Append(new OEEmployee), 1);
  EXPECT_EQ(employees.Entries(), 2);
  EXPECT_EQ(employees.Get(0)->GetEmployeeID(), "E-1");
  OEEmployee* taken = employees.Get(1);
  ASSERT_EQ(employees.UnSet(1), 1);  // ownership comes back to the caller
  delete taken;
  OEDynamicArrayVexaService services;
  ASSERT_EQ(services.SetVal(0, static_cast<OEVexaService>(1)), 1);
  EXPECT_EQ(*services.Get(0), static_cast<OEVexaService>(1));
}

TEST_F(PayrollAggregateTest, PayrollRunWithPaychecksLinesAndTaxLiabilities) {
  const std::string run = std::string("<V.PAYROLLRUN>") + kPayCheck + kPayCheck + kDisburse +
                          "<V.DTPAYCHKS>20240415</V.PAYROLLRUN>";
  OEPayrollRun* r = Parse(run)->GetPayrollRun();
  ASSERT_NE(r, nullptr);
  EXPECT_EQ(log->Entries(), 0);
  ASSERT_EQ(r->GetNumPayCheck(), 2);
  OEPayCheck* check = r->GetPayCheck(0);
  EXPECT_EQ(check->GetPayCheckID(), "PC-77");
  EXPECT_EQ(check->GetPayCheckType(), OE_PAYCHKTYPE_PAYCHK);
  EXPECT_EQ(check->GetPayCheckInfo()->GetIsDirectDeposit(), 1);
  ASSERT_EQ(check->GetNumTaxLine(), 2);
  // The lines add up to the net pay.
  OEPayrollAmount net = check->GetSalaryLine(0)->GetAmount();
  net += check->GetAdjustmentLine(0)->GetAmount();
  for (unsigned short i = 0; i < check->GetNumTaxLine(); ++i) net += check->GetTaxLine(i)->GetAmount();
  EXPECT_TRUE(net == check->GetAmount());
  EXPECT_TRUE(net == check->GetDirectDepositLine(0)->GetAmount());
  EXPECT_EQ(Text(net), "$1573.60");

  OEDisburseAdvice* advice = r->GetDisburseAdvice();
  ASSERT_NE(advice, nullptr);
  ASSERT_EQ(advice->GetNumTaxLiability(), 2);
  OETaxLiability* ss = advice->GetTaxLiability(0);
  EXPECT_EQ(ss->GetFederalTax(), OE_FEDTAX_SS_EE);
  EXPECT_EQ(ss->GetStateTaxDesc(), nullptr);
  OETaxLiability* sui = advice->GetTaxLiability(1);
  ASSERT_NE(sui->GetStateTaxDesc(), nullptr);
  EXPECT_EQ(sui->GetStateTaxDesc()->GetStateTax(), OE_STATETAX_SUI_ER);
  OEPayrollAmount owed = ss->GetCurrentAmount() + sui->GetCurrentAmount();
  EXPECT_TRUE(owed == advice->GetDisburseFunds());
  EXPECT_EQ(FirstLacking(r), nullptr);
  EXPECT_EQ(Write(*r), run);

  OEPayrollRun copy;
  ASSERT_EQ(copy.DeepCopyFrom(r), 1);
  EXPECT_EQ(Write(copy), run);
  EXPECT_NE(copy.GetPayCheck(1), r->GetPayCheck(1));

  // A paycheck without its cleared flag and type fails the check, and the
  // missing tags are walked in required order.
  std::string bad = kPayCheck;
  for (const char* cut : {"<V.PAYCHKTYPE>PAYCHK", "<V.CLEARED>N"}) bad.erase(bad.find(cut), strlen(cut));
  OEPayrollRun* r2 = Parse("<V.PAYROLLRUN>" + bad + "<V.DTPAYCHKS>20240415</V.PAYROLLRUN>")->GetPayrollRun();
  ASSERT_NE(r2, nullptr);
  EXPECT_EQ(Missing(*r2->GetPayCheck(0)), (std::vector<OETagID>{OE_TAG_V_PAYCHKTYPE, OE_TAG_V_CLEARED}));
  EXPECT_EQ(FirstLacking(r2), r2->GetPayCheck(0));
}

TEST_F(PayrollAggregateTest, PayrollTransactionsListRequiredTagsInTheirOwnOrder) {
  OEPayrollTx tx;
  EXPECT_EQ(Missing(tx), (std::vector<OETagID>{OE_TAG_V_TXLINE, OE_TAG_V_PAYROLLTXID, OE_TAG_V_DTTX, OE_TAG_V_REFNUM,
                                               OE_TAG_V_PAYROLLTXTYPE, OE_TAG_V_ONSERVICE, OE_TAG_V_CLEARED}));
  const char text[] =
      "<V.PAYROLLTX><V.TXLINE><V.PITEMID>30<V.PITEMNAME>Federal Withholding<V.AMT>$-182.40<V.TAXQTR>2</V.TXLINE>"
      "<V.PAYROLLTXID>TX-9<V.DTTX>20240430<V.PAYROLLTXTYPE>LIABCHK<V.NAME>US Treasury<V.REFNUM>EFTPS-1"
      "<V.AMT>$182.40<V.ONSERVICE>Y<V.CLEARED>N</V.PAYROLLTX>";
  OEPayrollTx* p = Parse(text)->GetPayrollTx();
  ASSERT_NE(p, nullptr);
  EXPECT_EQ(p->GetPayrollTxType(), OE_PAYROLLTX_LIABCHK);
  EXPECT_EQ(p->GetTxLine(0)->GetTaxQuarter(), 2);
  EXPECT_EQ(p->AllRequiredPresent(), 1);
  EXPECT_EQ(Write(*p), text);
}

TEST_F(PayrollAggregateTest, ModificationsWithEmptiedFields) {
  const char text[] =
      "<V.EMPMOD><V.ADDRINFO><V.ADDR1>40 Oak Ave<V.ADDR2>__OFX_EMPTY_STRING__</V.ADDRINFO>"
      "<V.EMPTAX><V.EMPFIT><V.EXTRAWITHHOLD>__OFX_EMPTY_STRING__</V.EMPFIT></V.EMPTAX>"
      "<V.EMPID>E-1001<V.DTRELEASE>__OFX_EMPTY_STRING__<V.BILLPAYACCT>__OFX_EMPTY_STRING__</V.EMPMOD>";
  OEEmployeeMod* mod = Parse(text)->GetEmployeeMod();
  ASSERT_NE(mod, nullptr);
  EXPECT_EQ(log->Entries(), 0);
  EXPECT_EQ(mod->AllRequiredPresent(), 1);
  // Emptied values read back as empty, never as the marker.
  OEAddrInfo* addr = mod->GetAddrInfo();
  EXPECT_TRUE(addr->IsAddress2Emptied());
  EXPECT_EQ(addr->GetAddress2().GetStrLength(), 0);
  EXPECT_FALSE(addr->IsAddress1Emptied());
  EXPECT_FALSE(addr->IsCityEmptied());  // absent is not emptied
  EXPECT_TRUE(mod->GetTaxInfo()->GetFit()->GetExtraWithholding().IsEmpty());
  EXPECT_TRUE(mod->GetDateReleased().IsEmpty());
  EXPECT_TRUE(mod->IsBillPayAccountEmptied());
  OEString shown;
  const OEFieldDesc* released = mod->FieldAt(OE_TAG_V_DTRELEASE);
  ASSERT_NE(released, nullptr);
  ASSERT_EQ(released->text(mod, 0, shown), 1);
  EXPECT_EQ(shown.GetStrLength(), 0);
  // And are written back as the marker.
  EXPECT_EQ(Write(*mod), text);
  OEEmployeeMod copy;
  ASSERT_EQ(copy.DeepCopyFrom(mod), 1);
  EXPECT_EQ(Write(copy), text);

  // A paycheck modification made by hand: memo, amount and date cleared.
  OEPayCheckMod check;
  check.SetPayCheckID("PC-77");
  EXPECT_EQ(check.EmptyMemo(), 1);
  check.SetAmount(OEPayrollAmount(OE_PAYROLL_AMOUNT_EMPTY));
  OEPayrollDateTime none;
  none.SetEmpty();
  check.SetDatePayPeriodEnd(none);
  EXPECT_EQ(check.SetEmployeeName("__OFX_EMPTY_STRING__"), 1);
  EXPECT_EQ(Write(check, OE_BUILD_OK, 1),
            "<V.PAYCHKMOD><V.PAYCHKID>PC-77<V.EMPNAME>__OFX_EMPTY_STRING__<V.AMT>__OFX_EMPTY_STRING__"
            "<V.DTPAYPDEND>__OFX_EMPTY_STRING__<V.MEMO>__OFX_EMPTY_STRING__</V.PAYCHKMOD>");
  // Setting a value again replaces the emptied state.
  check.SetMemo("Bonus");
  EXPECT_FALSE(check.IsMemoEmptied());
  check.SetAmount("$10.00");
  EXPECT_FALSE(check.GetAmount().IsEmpty());
}

TEST_F(PayrollAggregateTest, BadValuesAreLoggedAndLeftOut) {
  const char text[] =
      "<V.PAYCHKMOD><V.PAYCHKID>PC-1<V.DTTX>2024-04-15<V.PAYCHKTYPE>BONUS<V.AMT>12..5"
      "<V.VOID>maybe<V.DTPAYPDEND>20240414<V.MEMO>Hours & overtime</V.PAYCHKMOD>";
  OEPayCheckMod* mod = Parse(text, OE_PARSE_WARNINGS)->GetPayCheckMod();
  ASSERT_NE(mod, nullptr);
  EXPECT_EQ(log->Entries(), 4);
  for (unsigned short i = 0; i < log->Entries(); ++i) {
    EXPECT_EQ(log->Get(i)->warning, OEPW_BADFORMAT);
    EXPECT_EQ(log->Get(i)->object, mod);
  }
  for (OETagID absent : {OE_TAG_V_DTTX, OE_TAG_V_PAYCHKTYPE, OE_TAG_V_AMT, OE_TAG_V_VOID})
    EXPECT_EQ(mod->ValidateTag(absent), 0) << absent;
  EXPECT_EQ(mod->GetMemo(), "Hours & overtime");
  EXPECT_EQ(Write(*mod), "<V.PAYCHKMOD><V.PAYCHKID>PC-1<V.DTPAYPDEND>20240414<V.MEMO>Hours &amp; overtime"
                         "</V.PAYCHKMOD>");

  // Over-long amounts and texts.
  log->DeleteAll();
  OEPayCheckMod other;
  EXPECT_EQ(other.SetAmount("$1234567890123456789012345678.90"), 0);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_TOOLONG);
  EXPECT_EQ(other.ValidateTag(OE_TAG_V_AMT), 0);
  EXPECT_EQ(other.SetPayCheckID(std::string(40, '7').c_str()), 1);  // kept whole, logged
  EXPECT_EQ(log->Entries(), 2);
  EXPECT_EQ(log->Get(1)->warning, OEPW_TOOLONG);
  Write(other, OE_BUILD_TOO_LONG);
}

TEST_F(PayrollAggregateTest, PayrollItemsAndEnrolment) {
  const char item[] =
      "<V.PITEM><V.TAXITEM><V.CALCTYPE>TAXTABLE<V.STATETAXDESC><V.STATE>CA<V.STATETAX>SDI_EE</V.STATETAXDESC>"
      "<V.ONSERVICE>Y<V.LIABACCT>Payroll Liabilities<V.LIABAGENCY>EDD<V.RATE>1.1%<V.DEFLIMIT>$153164.00"
      "</V.TAXITEM><V.PITEMID>41<V.PITEMNAME>CA - Disability Employee<V.INACTIVE>N<V.ISEMP>Y</V.PITEM>";
  OEPayrollItem* p = Parse(item)->GetPayrollItem();
  ASSERT_NE(p, nullptr);
  ASSERT_NE(p->GetTaxItem(), nullptr);
  EXPECT_EQ(p->GetTaxItem()->GetCalculationType(), OE_CALCTYPE_TAXTABLE);
  EXPECT_EQ(Text(p->GetTaxItem()->GetRate()), "1.1%");
  EXPECT_EQ(p->AllRequiredPresent(), 1);
  EXPECT_EQ(Write(*p), item);

  const char hourly[] =
      "<V.PITEM><V.HRLYITEM><V.PAYTYPE>REG<V.EXPACCT>Payroll Expenses<V.DEFRATE>$18.50</V.HRLYITEM>"
      "<V.PITEMID>11<V.PITEMNAME>Hourly<V.INACTIVE>N<V.ISEMP>Y<V.SPECIALTYPE>SALARY</V.PITEM>";
  p = Parse(hourly)->GetPayrollItem();
  ASSERT_NE(p->GetHourlyItem(), nullptr);
  EXPECT_EQ(p->GetHourlyItem()->GetType(), OE_TAG_V_HRLYITEM);
  EXPECT_EQ(Write(*p), hourly);

  const char enroll[] =
      "<V.PAYROLLENROLLRQ><V.COINFO><V.LEGALNAME>Lopez Landscaping LLC<V.FEIN>36-1234567"
      "<V.ADDRINFO><V.ADDR1>1 Market St<V.CITY>Springfield<V.STATE>IL<V.POSTALCODE>62701</V.ADDRINFO>"
      "<V.CONTACT><V.FIRST>Ana<V.LAST>Lopez<V.OFFICER>Y<V.PHONE>555-0199</V.CONTACT>"
      "<V.PAYROLLTYPE>REG<V.FEDPMTFREQ>SEMIWKLY</V.COINFO>"
      "<V.TAXSERVICE>Y<V.DIRECTDEPOSIT>Y<V.DTNEXTPAYROLL>20240501<V.APPKEY>QB-7F3A</V.PAYROLLENROLLRQ>";
  OEPayrollEnrollRq* rq = Parse(enroll)->GetEnrollRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->GetCompanyInfo()->GetFederalPaymentFrequency(), OE_FEDPMTFREQ_SEMIWKLY);
  EXPECT_EQ(rq->GetAppKey(), "QB-7F3A");
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  EXPECT_EQ(Write(*rq, OE_BUILD_OK, 1), enroll);
  OEPayrollEnrollRq empty;
  EXPECT_EQ(Missing(empty), (std::vector<OETagID>{OE_TAG_V_COINFO, OE_TAG_V_TAXSERVICE, OE_TAG_V_DIRECTDEPOSIT,
                                                  OE_TAG_V_APPKEY}));
}

// ---------------------------------------------------------------------------
// Whole files.

const char kHeaders[] =
    "OFXHEADER:100\r\nDATA:OFXSGML\r\nVERSION:102\r\nSECURITY:NONE\r\nENCODING:USASCII\r\n"
    "CHARSET:1252\r\nCOMPRESSION:NONE\r\nOLDFILEUID:NONE\r\nNEWFILEUID:NONE\r\n\r\n";

std::string WrittenFile(OEDataObj& file, OEBuilder& builder) {
  OEBuffer out;
  EXPECT_EQ(builder.Build(&out, &file, OE_BUILD_STRICT, 1), OE_BUILD_OK);
  return out.GetBufferSize() ? std::string(out.GetBufferPtr(), out.GetBufferSize()) : std::string();
}

OEPayrollUpdateRs* UpdateOf(OEFileRs& file) {
  if (file.GetNumberOfResponse() != 1) return nullptr;
  OEResponse* ofx = file.GetResponse(0);
  for (unsigned short i = 0; i < ofx->GetNumMessage(); ++i) {
    OEMessageSetRs* set = ofx->GetMessageSet(i);
    if (set->GetType() != OE_TAG_V_PAYROLLMSGSRSV1 || set->GetNumSync() != 1) continue;
    return dynamic_cast<OEPayrollUpdateRs*>(set->GetSync(0));
  }
  return nullptr;
}

TEST_F(PayrollAggregateTest, UpdateResponseFileRoundTrip) {
  const std::string body =
      "<OFX>"
      "<SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20240415120000"
      "<LANGUAGE>ENG</SONRS></SIGNONMSGSRSV1>"
      "<V.PAYROLLMSGSRSV1><V.PAYROLLUPDATERS><TOKEN>118"
      "<V.TAXSERVSTATUS><V.TAXSERVMODE>ACTIVE<V.DTACTIVE>20230101</V.TAXSERVSTATUS>"
      "<V.DDSTATUS><V.DDMODE>ACTIVE<V.LIMIT>$25000.00</V.DDSTATUS>"
      "<V.PAYCHKNEXTID>PC-78<V.PAYROLLTXNEXTID>TX-10<V.EMPNEXTID>E-1002<V.PITEMNEXTID>42"
      "<V.PAYROLLTRNRS><TRNUID>1001<STATUS><CODE>0<SEVERITY>INFO</STATUS><V.PAYROLLRS>"
      "<V.PAYROLLTX><V.TXLINE><V.PITEMID>30<V.AMT>$-182.40</V.TXLINE><V.PAYROLLTXID>TX-9<V.DTTX>20240430"
      "<V.PAYROLLTXTYPE>LIABCHK<V.REFNUM>EFTPS-1<V.ONSERVICE>Y<V.CLEARED>N</V.PAYROLLTX>"
      "</V.PAYROLLRS></V.PAYROLLTRNRS>"
      "<V.PAYROLLUPDATEDATA>"
      "<V.PAYCHKMOD><V.PAYCHKID>PC-70<V.VOID>Y<V.MEMO>__OFX_EMPTY_STRING__</V.PAYCHKMOD>"
      "<V.EMPMOD><V.EMPID>E-0990<V.DTRELEASE>20240331</V.EMPMOD><V.EMPDELID>E-0991<V.EMPDELID>E-0992"
      "</V.PAYROLLUPDATEDATA>"
      "</V.PAYROLLUPDATERS>"
      "<V.PAYROLLENROLLTRNRS><TRNUID>1002<STATUS><CODE>0<SEVERITY>INFO</STATUS>"
      "<V.PAYROLLENROLLRS><V.USERID>lopez-llc</V.PAYROLLENROLLRS></V.PAYROLLENROLLTRNRS>"
      "</V.PAYROLLMSGSRSV1></OFX>";
  OEFileRs file;
  ASSERT_EQ(ParseText(std::string(kHeaders) + body, &file), OE_PARSE_OK);
  EXPECT_EQ(log->Entries(), 0);
  OEPayrollUpdateRs* update = UpdateOf(file);
  ASSERT_NE(update, nullptr);
  EXPECT_EQ(update->GetToken(), "118");
  EXPECT_EQ(update->GetEmployeeNextID(), "E-1002");
  EXPECT_EQ(update->GetPayrollItemNextID(), "42");
  EXPECT_EQ(update->GetTaxServiceStatus()->GetTaxServiceMode(), OE_TAXSERVMODE_ACTIVE);
  EXPECT_EQ(Text(update->GetDirectDepositStatus()->GetLimit()), "$25000.00");
  ASSERT_EQ(update->GetNumTrans(), 1);
  OEPayrollRs* rs = dynamic_cast<OEPayrollRs*>(update->GetTrans(0)->GetActualTrans());
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->GetPayrollTx(0)->GetPayrollTxID(), "TX-9");
  OEPayrollUpdateData* data = update->GetUpdateData();
  ASSERT_NE(data, nullptr);
  ASSERT_EQ(data->GetNumEmployeeDeleteID(), 2);
  EXPECT_EQ(*data->GetEmployeeDeleteID(1), "E-0992");
  EXPECT_TRUE(data->GetPayCheckMod(0)->IsMemoEmptied());
  EXPECT_EQ(update->AllRequiredPresent(), 1);
  OEDataObj* lacking = &file;
  OETagID missing = OE_TAG_NONE;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&lacking, &missing), 1);

  // Written back, through either builder, and read again: the same text.
  OEBuilder plain;
  OEPayrollBuilder payroll;
  std::string written = WrittenFile(file, plain);
  EXPECT_EQ(WrittenFile(file, payroll), written);
  EXPECT_EQ(Flat(written.substr(sizeof kHeaders - 1)), body);
  OEFileRs again;
  ASSERT_EQ(ParseText(written, &again), OE_PARSE_OK);
  EXPECT_EQ(WrittenFile(again, plain), written);

  // A deep copy of the update keeps its class and its wrappers.
  OEPayrollUpdateRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(update), 1);
  EXPECT_EQ(copy.GetNumTrans(), 1);
  EXPECT_EQ(Write(copy), Flat(WriteUnderOwnTag(*update).text));

  // The next ids are required.
  update->ClearTagQuietly(OE_TAG_V_EMPNEXTID);
  EXPECT_EQ(update->AllRequiredPresent(), 0);
  EXPECT_EQ(update->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_V_EMPNEXTID);
}

TEST_F(PayrollAggregateTest, UpdateRequestFileRoundTrip) {
  const std::string body =
      std::string("<OFX><SIGNONMSGSRQV1><SONRQ><DTCLIENT>20240415120000<USERID>lopez-llc<USERPASS>secret9"
                  "<LANGUAGE>ENG<APPID>QBW<APPVER>1800</SONRQ></SIGNONMSGSRQV1>"
                  "<V.PAYROLLMSGSRQV1><V.PAYROLLUPDATERQ><TOKEN>117<REJECTIFMISSING>N"
                  "<V.PAYROLLTRNRQ><TRNUID>2001<V.PAYROLLRQ>") +
      kEmployee +
      "<V.EMPMOD><V.EMPID>E-0990<V.DTRELEASE>__OFX_EMPTY_STRING__</V.EMPMOD>"
      "<V.PAYROLLRUN>" + kPayCheck + "<V.DTPAYCHKS>20240415</V.PAYROLLRUN>"
      "<V.PITEMDELID>17<V.ANOMALYTEXT>Check PC-60 printed twice</V.PAYROLLRQ></V.PAYROLLTRNRQ>"
      "<V.PAYROLLTRNRQ><TRNUID>2002<V.PAYROLLRQ><V.DDQUIT><V.DTTERM>20240601<V.REASONTEXT>Changing banks"
      "</V.DDQUIT></V.PAYROLLRQ></V.PAYROLLTRNRQ>"
      "</V.PAYROLLUPDATERQ></V.PAYROLLMSGSRQV1></OFX>";
  OEFileRq file;
  ASSERT_EQ(ParseText(std::string(kHeaders) + body, &file), OE_PARSE_OK);
  EXPECT_EQ(log->Entries(), 0);
  OEBuilder plain;
  std::string written = WrittenFile(file, plain);
  // The password is written back as given: it is the application's request.
  EXPECT_EQ(Flat(written.substr(sizeof kHeaders - 1)), body);
  OEFileRq again;
  ASSERT_EQ(ParseText(written, &again), OE_PARSE_OK);
  EXPECT_EQ(WrittenFile(again, plain), written);
}

TEST_F(PayrollAggregateTest, UpdateResponseBuiltByTheApplication) {
  OEPayrollUpdateRs* update = new OEPayrollUpdateRs;
  update->SetToken("7");
  update->SetPayCheckNextID("PC-1");
  update->SetPayrollTxNextID("TX-1");
  update->SetEmployeeNextID("E-1");
  EXPECT_EQ(update->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_V_PITEMNEXTID);
  update->SetPayrollItemNextID("1");
  OEDirectDepositStatus* dd = new OEDirectDepositStatus;
  dd->SetDirectDepositMode(OE_DDMODE_APPLIED);
  ASSERT_EQ(update->SetDirectDepositStatus(dd), 1);
  OETransRs* wrapper = new OETransRs;
  wrapper->SetType(OE_TAG_V_PAYROLLTRNRS);
  wrapper->SetTransUserID("5");
  OEStatus* status = new OEStatus;
  status->SetCode(int32_t{0});
  status->SetSeverity(OE_SEVERITY_INFO);
  wrapper->SetStatus(status);
  ASSERT_EQ(update->AppendTrans(wrapper), 1);
  OEPayrollUpdateData* data = new OEPayrollUpdateData;
  data->AppendEmployeeDeleteID(OEString32("E-9"));
  update->SetUpdateData(data);
  EXPECT_EQ(update->AllRequiredPresent(), 1);

  OEMessageSetRs set;
  set.SetType(OE_TAG_V_PAYROLLMSGSRSV1);
  ASSERT_EQ(set.AppendSync(update), 1);
  EXPECT_EQ(Write(set), "<V.PAYROLLMSGSRSV1><V.PAYROLLUPDATERS><TOKEN>7<V.DDSTATUS><V.DDMODE>APPLIED</V.DDSTATUS>"
                        "<V.PAYCHKNEXTID>PC-1<V.PAYROLLTXNEXTID>TX-1<V.EMPNEXTID>E-1<V.PITEMNEXTID>1"
                        "<V.PAYROLLTRNRS><TRNUID>5<STATUS><CODE>0<SEVERITY>INFO</STATUS></V.PAYROLLTRNRS>"
                        "<V.PAYROLLUPDATEDATA><V.EMPDELID>E-9</V.PAYROLLUPDATEDATA>"
                        "</V.PAYROLLUPDATERS></V.PAYROLLMSGSRSV1>");
  // The children are the statuses, the wrappers and the update data.
  EXPECT_EQ(update->GetNumberOfChildren(), 3);
  EXPECT_EQ(update->GetChild(0), dd);
  EXPECT_EQ(update->GetChild(1), wrapper);
  EXPECT_EQ(update->GetChild(2), data);
}

// ---------------------------------------------------------------------------

TEST(PayrollFactory, CreatorsMakeTheirClassesWithTheirTags) {
  OEDataObjFactory factory;
  struct Made {
    std::unique_ptr<OEDataObj> obj;
    OETagID type;
  };
  std::vector<Made> made;
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewEmployee()), OE_TAG_V_EMP});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewEmployeeMod()), OE_TAG_V_EMPMOD});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewEmployeeSdi()), OE_TAG_V_EMPSDI});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewVacation()), OE_TAG_V_VAC});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewEmployeeReportingYtd()), OE_TAG_V_EMPRPTYTD});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewHourlyItem()), OE_TAG_V_HRLYITEM});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewPayrollUpdateRs()), OE_TAG_V_PAYROLLUPDATERS});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewPayrollUpdateData()), OE_TAG_V_PAYROLLUPDATEDATA});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewTerminationInfo()), OE_TAG_V_TERMINFO});
  made.push_back({std::unique_ptr<OEDataObj>(factory.NewStateTaxDesc()), OE_TAG_V_STATETAXDESC});
  for (const Made& m : made) {
    ASSERT_NE(m.obj, nullptr);
    EXPECT_EQ(m.obj->GetType(), m.type);
  }
  std::unique_ptr<OETransBase> inner(OENewInnerTrans(&factory, OE_TAG_V_PAYROLLENROLLRS));
  EXPECT_NE(dynamic_cast<OEPayrollEnrollRs*>(inner.get()), nullptr);
}

}  // namespace
