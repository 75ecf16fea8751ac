// The payroll value types: amounts with dollar, percent and empty forms,
// dates with an empty state, and the payroll builder's adders.
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"

namespace {

std::string Text(OEPayrollAmount&& amount) {
  const char* text = static_cast<char*>(amount);
  return text ? text : "<none>";
}
std::string Text(OEPayrollAmount& amount) { return Text(OEPayrollAmount(amount)); }

OEPayrollAmount Read(const char* text) {
  OEPayrollAmount amount;
  amount.ConvertStringToOEPrecisionInteger(text);
  return amount;
}

using PayrollAmountTest = LogFixture;

TEST_F(PayrollAmountTest, TextsReadAndWriteBackExactly) {
  struct Case {
    const char* text;
    unsigned short dollar, percent, empty;
  };
  const Case cases[] = {
      {"$12.50", 1, 0, 0},   {"7.5%", 0, 1, 0},    {"__OFX_EMPTY_STRING__", 0, 0, 1},
      {"1234.56", 0, 0, 0},  {"-$0.01", 0, 0, 0},  {"$-250.00", 1, 0, 0},
      {"0%", 0, 1, 0},       {"100", 0, 0, 0},     {"$0.50", 1, 0, 0},
      {"-0.25%", 0, 1, 0},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.text);
    log->DeleteAll();
    OEPayrollAmount amount;
    unsigned short clean = amount.ConvertStringToOEPrecisionInteger(c.text);
    if (std::string(c.text) == "-$0.01") {
      // A sign before the dollar mark is not an amount.
      EXPECT_EQ(clean, 0);
      EXPECT_TRUE(Logged(OEPW_BADFORMAT));
      continue;
    }
    EXPECT_EQ(clean, 1);
    EXPECT_EQ(amount.IsDollarKind(), c.dollar);
    EXPECT_EQ(amount.IsPercent(), c.percent);
    EXPECT_EQ(amount.IsEmpty(), c.empty);
    EXPECT_EQ(Text(amount), c.text);
    EXPECT_EQ(log->Entries(), 0);
  }
  OEPayrollAmount dollars = Read("$12.50");
  EXPECT_TRUE(dollars.OEPrecisionInteger::operator==(OEPrecisionInteger("12.5")));
  EXPECT_EQ(dollars.Decimal(), 2);
}

TEST_F(PayrollAmountTest, EmptyKeepsItsValueAndReadingANumberClearsIt) {
  OEPayrollAmount amount = Read("$40.00");
  EXPECT_EQ(amount.ConvertStringToOEPrecisionInteger("__OFX_EMPTY_STRING__"), 1);
  EXPECT_TRUE(amount.IsEmpty());
  EXPECT_EQ(amount.GetOESLong(), 4000);  // the value is untouched
  EXPECT_TRUE(amount.IsDollarKind());
  amount.ConvertStringToOEPrecisionInteger("12%");
  EXPECT_FALSE(amount.IsEmpty());
  EXPECT_TRUE(amount.IsPercent());
  EXPECT_FALSE(amount.IsDollarKind());  // the percent mark clears the dollar kind
  EXPECT_EQ(Text(amount), "12%");
  // The marker is matched exactly.
  EXPECT_EQ(amount.ConvertStringToOEPrecisionInteger("__ofx_empty_string__"), 0);
  EXPECT_FALSE(amount.IsEmpty());
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
}

TEST_F(PayrollAmountTest, ConstructorsAndFlags) {
  OEPayrollAmount empty(OE_PAYROLL_AMOUNT_EMPTY);
  EXPECT_TRUE(empty.IsEmpty());
  EXPECT_EQ(Text(empty), "__OFX_EMPTY_STRING__");
  OEPayrollAmount dollar(OE_PAYROLL_AMOUNT_DOLLAR);
  EXPECT_FALSE(dollar.IsEmpty());
  EXPECT_TRUE(dollar.IsDollarKind());
  EXPECT_EQ(Text(dollar), "$0.00");
  OEPayrollAmount wage(1500L, 0, 1);
  EXPECT_EQ(Text(wage), "$1500.00");
  OEPayrollAmount rate(6L, 1, 1);  // percent wins over the dollar kind
  EXPECT_TRUE(rate.IsPercent());
  EXPECT_FALSE(rate.IsDollarKind());
  EXPECT_EQ(Text(rate), "6%");
  OEPayrollAmount plain(-42L, 0, 0);
  EXPECT_EQ(Text(plain), "-42");
  rate.SetDollarKind(1);
  EXPECT_FALSE(rate.IsPercent());
  EXPECT_EQ(Text(rate), "$6");
  OEPayrollAmount copy(rate);
  EXPECT_TRUE(copy.IsDollarKind());
  OEPayrollAmount assigned;
  assigned = empty;
  EXPECT_TRUE(assigned.IsEmpty());
  assigned = OEPrecisionInteger("3.25");  // a plain value clears the empty state
  EXPECT_FALSE(assigned.IsEmpty());
  EXPECT_EQ(Text(assigned), "3.25");
}

TEST_F(PayrollAmountTest, IncompatibleAmountsNeverCompareEqual) {
  OEPayrollAmount dollars = Read("$12.50");
  OEPayrollAmount percent = Read("12.50%");
  OEPayrollAmount plain = Read("12.50");
  OEPayrollAmount empty(OE_PAYROLL_AMOUNT_EMPTY);
  OEPayrollAmount alsoEmpty(OE_PAYROLL_AMOUNT_EMPTY);
  EXPECT_FALSE(Read("$12.50") == Read("7.5%"));
  EXPECT_FALSE(dollars == percent);
  EXPECT_FALSE(dollars == plain);
  EXPECT_FALSE(percent == plain);
  EXPECT_FALSE(empty == dollars);
  EXPECT_FALSE(dollars == empty);
  EXPECT_FALSE(empty == alsoEmpty);
  EXPECT_TRUE(dollars != percent);
  EXPECT_FALSE(dollars.IsCompatible(percent));
  EXPECT_FALSE(empty.IsCompatible(empty));
  // Nor do they order.
  EXPECT_FALSE(dollars < percent);
  EXPECT_FALSE(dollars > percent);
  EXPECT_FALSE(dollars <= percent);
  EXPECT_FALSE(dollars >= percent);
  // Compatible ones compare by value, whatever their decimal places.
  EXPECT_TRUE(dollars == Read("$12.5"));
  EXPECT_TRUE(dollars < Read("$12.51"));
  EXPECT_TRUE(Read("7.5%") >= Read("7.50%"));
  // An empty amount against a plain decimal value is not equal either.
  OEPrecisionInteger twelve("12.50");
  EXPECT_FALSE(empty == twelve);
  EXPECT_TRUE(plain == twelve);
}

TEST_F(PayrollAmountTest, ArithmeticOnCompatibleAmountsOnly) {
  OEPayrollAmount gross = Read("$1250.00");
  OEPayrollAmount tax = Read("$95.63");
  OEPayrollAmount net = gross - tax;
  EXPECT_EQ(Text(net), "$1154.37");
  EXPECT_EQ(Text(gross + tax), "$1345.63");
  EXPECT_EQ(Text(Read("$2.50") * Read("$4")), "$10.00");
  EXPECT_EQ(Text(Read("$10.00") / Read("$4")), "$2.50");
  OEPayrollAmount refund = Read("$-20.25");
  EXPECT_EQ(Text(refund.absval()), "$20.25");
  EXPECT_TRUE(refund.absval().IsDollarKind());

  // Incompatible operands give an empty result and leave += and -= alone.
  OEPayrollAmount mixed = gross + Read("7.5%");
  EXPECT_TRUE(mixed.IsEmpty());
  EXPECT_TRUE((gross - OEPayrollAmount(OE_PAYROLL_AMOUNT_EMPTY)).IsEmpty());
  OEPayrollAmount total = Read("$100");
  total += Read("5%");
  EXPECT_EQ(Text(total), "$100");
  total -= OEPayrollAmount(OE_PAYROLL_AMOUNT_EMPTY);
  EXPECT_EQ(Text(total), "$100");
  total += Read("$0.50");
  EXPECT_EQ(Text(total), "$100.50");
  total -= Read("$100");
  EXPECT_EQ(Text(total), "$0.50");
  OEPayrollAmount empty(OE_PAYROLL_AMOUNT_EMPTY);
  empty += Read("1");
  EXPECT_TRUE(empty.IsEmpty());
  EXPECT_EQ(Text(empty.absval()), "__OFX_EMPTY_STRING__");
}

TEST_F(PayrollAmountTest, ThirtyCharacterLimit) {
  // 30 characters read and write back.
  const char* longest = "$12345678901234567890.12345678";
  ASSERT_EQ(std::strlen(longest), 30u);
  OEPayrollAmount amount = Read(longest);
  EXPECT_EQ(log->Entries(), 0);
  EXPECT_EQ(Text(amount), longest);
  // A longer text is refused with OEPW_TOOLONG; the amount stays.
  EXPECT_EQ(amount.ConvertStringToOEPrecisionInteger("$123456789012345678901.12345678"), 0);
  EXPECT_TRUE(Logged(OEPW_TOOLONG));
  EXPECT_EQ(Text(amount), longest);
  // A value whose text would be longer loses the zeros that end its fraction...
  OEPayrollAmount big = Read("$1234567890123456789.123456780");
  OEPayrollAmount product = big * Read("$10");
  EXPECT_EQ(product.Decimal(), 9);
  EXPECT_EQ(Text(product), "$12345678901234567891.2345678");
  // ...and has no text at all when that is not enough.
  OEPayrollAmount huge = Read("$1234567890123456789.123456789") * Read("$10.0");
  EXPECT_EQ(Text(huge), "<none>");
  char out[OEPayrollAmount::kMaxTextLength + 1];
  EXPECT_EQ(huge.FormatPayrollText(out), 0);
}

TEST_F(PayrollAmountTest, DatesHaveAnEmptyState) {
  OEPayrollDateTime date;
  EXPECT_EQ(date.ConvertStringToOEDateTime("20240115"), 1);
  EXPECT_FALSE(date.IsEmpty());
  OEString text;
  ASSERT_EQ(date.GetDateString(text), 1);
  EXPECT_EQ(text, "20240115");
  EXPECT_EQ(date.ConvertStringToOEDateTime("__OFX_EMPTY_STRING__"), 1);
  EXPECT_TRUE(date.IsEmpty());
  ASSERT_EQ(date.GetDateString(text), 1);
  EXPECT_EQ(text, "__OFX_EMPTY_STRING__");
  EXPECT_EQ(date.GetYear(), 2024);  // the date is kept under the flag
  OEPayrollDateTime other(2024, 1, 15);
  EXPECT_FALSE(date == other);
  date.SetEmpty(0);
  EXPECT_TRUE(date == other);
  OEPayrollDateTime a, b;
  a.SetEmpty();
  b.SetEmpty();
  EXPECT_TRUE(a == b);
  // A bad date logs and leaves the value as it was.
  log->DeleteAll();
  EXPECT_EQ(a.ConvertStringToOEDateTime("2024-01-15"), 0);
  EXPECT_TRUE(a.IsEmpty());
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
  OEPayrollDateTime copy(a);
  EXPECT_TRUE(copy.IsEmpty());
  // Against a plain date, an empty date is never equal.
  OEDateTime plain(2024, 1, 15);
  EXPECT_FALSE(copy == plain);
  copy.SetEmpty(0);
  copy.ConvertStringToOEDateTime("20240115");
  EXPECT_TRUE(copy == plain);
}

TEST_F(PayrollAmountTest, PayrollBuilderWritesTheValuesOwnText) {
  struct Values : OEDataObj {
    OEBuildStatus Build(OEBuilder* b) const override {
      OEPayrollBuilder* payroll = dynamic_cast<OEPayrollBuilder*>(b);
      if (!payroll) return OE_BUILD_NO_OUTPUT;
      OEPayrollAmount dollars("$12.50");
      OEPayrollAmount empty(OE_PAYROLL_AMOUNT_EMPTY);
      OEPayrollDateTime date(2024, 3, 1);
      OEPayrollDateTime noDate;
      noDate.SetEmpty();
      OEBuildStatus s[] = {payroll->AddPayrollAmount(dollars), payroll->AddPayrollAmount(empty),
                           payroll->AddPayrollDateTime(date), payroll->AddPayrollDateTime(noDate)};
      for (OEBuildStatus one : s)
        if (one != OE_BUILD_OK) return one;
      return OE_BUILD_OK;
    }
  } values;
  OEPayrollBuilder builder;
  EXPECT_EQ(builder.GetCRLFoption(), 2);
  OEBuffer buffer;
  ASSERT_EQ(builder.Build(&buffer, &values, OE_BUILD_STRICT, 0), OE_BUILD_OK);
  EXPECT_EQ(std::string(buffer.GetBufferPtr(), buffer.GetBufferSize()),
            "$12.50\n__OFX_EMPTY_STRING__\n20240301\n__OFX_EMPTY_STRING__\n");
}

TEST(PayrollDataConversion, EveryEnumerationRoundTrips) {
  OEString text;
  EXPECT_EQ(OEPayrollDataConversion::PayrollFrequencyToString(OE_PAYFREQ_SEMIMONTHLY, text), 1);
  EXPECT_EQ(text, "SEMIMONTHLY");
  OETaxFormLine line;
  EXPECT_EQ(OEPayrollDataConversion::StringToTaxFormLine("401K", line), 1);
  EXPECT_EQ(line, OE_TAXFORMLINE_401K);
  EXPECT_EQ(OEEnumTraits<OETaxFormLine>::kCount, 23);
  EXPECT_EQ(OEEnumTraits<OEPayrollItemSpecialType>::kCount, 13);
  EXPECT_STREQ(OEDataConversion::Text(OE_STATETAX_SDI_EE), "SDI_EE");
  EXPECT_STREQ(OEDataConversion::Text(OE_FEDTAX_AEIC), "AEIC");
  EXPECT_STREQ(OEDataConversion::Text(OE_TAXSERVMODE_TERMINATED), "TERMINATED");
  EXPECT_STREQ(OEDataConversion::Text(OE_DDMODE_NO), "NO");
  EXPECT_STREQ(OEDataConversion::Text(OE_HCLEVEL_DEPENDENTS), "DEPENDENTS");
  OEHealthCareProvider provider;
  EXPECT_EQ(OEPayrollDataConversion::StringToHealthCareProvider("company", provider), 1);
  EXPECT_EQ(provider, OE_HCPROVIDER_COMPANY);
  OEPayrollTxType type;
  EXPECT_EQ(OEPayrollDataConversion::StringToPayrollTxType("PAYCHK", type), 0);
}

}  // namespace
