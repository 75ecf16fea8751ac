#include "ofxkit/types/OEPrecisionInteger.h"

#include <gtest/gtest.h>

#include <cstring>
#include <random>
#include <string>
#include <vector>

#include "ofxkit/parse/OEParseLogger.h"

namespace {

std::string Text(OEPrecisionInteger v) {
  const char* t = static_cast<char*>(v);
  return t != nullptr ? t : "<null>";
}

OEPrecisionInteger P(const char* text) { return OEPrecisionInteger(text); }

// Builds a value from raw fields through the binary record.
OEPrecisionInteger Raw(uint32_t lo, uint32_t mid, uint32_t hi, short sign, unsigned short decimal) {
  unsigned char rec[OEPrecisionInteger::m_binaryLen] = {1, 0};
  const uint32_t words[3] = {lo, mid, hi};
  for (int k = 0; k < 3; ++k)
    for (int b = 0; b < 4; ++b) rec[2 + 4 * k + b] = static_cast<unsigned char>(words[k] >> (8 * b));
  rec[14] = rec[15] = sign < 0 ? 0xFF : 0;
  if (sign > 0) rec[14] = 1;
  rec[16] = static_cast<unsigned char>(decimal);
  rec[17] = static_cast<unsigned char>(decimal >> 8);
  OEPrecisionInteger v;
  v.ImportBinary(rec);
  return v;
}

using u128 = unsigned __int128;
constexpr u128 kMask96 = (static_cast<u128>(1) << 96) - 1;

u128 Mag(const OEPrecisionInteger& v) {
  return (static_cast<u128>(v.GetMSBytes()) << 64) | (static_cast<u128>(v.GetSSBytes()) << 32) | v.GetLSBytes();
}
OEPrecisionInteger FromMag(u128 m, short sign = 1, unsigned short decimal = 0) {
  return Raw(static_cast<uint32_t>(m), static_cast<uint32_t>(m >> 32), static_cast<uint32_t>(m >> 64), sign,
             decimal);
}

class PrecisionIntegerTest : public ::testing::Test {
 protected:
  void SetUp() override { Log()->DeleteAll(); }
  void TearDown() override { Log()->DeleteAll(); }
  static OEParseLogger* Log() { return OEParseLogger::TheOEParseLogger(); }
};

// ---------------------------------------------------------------------------
// Text in and out

TEST_F(PrecisionIntegerTest, CleanTextRoundTrips) {
  struct Case {
    const char* in;
    const char* out;
  };
  const Case cases[] = {
      {"123.45", "123.45"},  {"-.5", "-.5"},       {"0.50", ".50"},       {"+12", "12"},
      {"0", "0"},            {"100", "100"},       {"-1234.56", "-1234.56"}, {"0.01", ".01"},
      {"1000000.0000", "1000000.0000"},            {"1,234", "1.234"},    {"10.50", "10.50"},
      {"-0", "-0"},          {"000123", "123"},    {".", "0"},            {"4294967296", "4294967296"},
      {"18446744073709551616", "18446744073709551616"},
      {"9999999999999999999999999999", "9999999999999999999999999999"},
      {"-.0000000000000000000000000001", "-.0000000000000000000000000001"},
  };
  for (const Case& c : cases) {
    OEPrecisionInteger v;
    EXPECT_EQ(v.ConvertStringToOEPrecisionInteger(c.in), 1) << c.in;
    EXPECT_EQ(Text(v), c.out) << c.in;
  }
  EXPECT_EQ(Log()->Entries(), 0);
}

TEST_F(PrecisionIntegerTest, ParsedFields) {
  OEPrecisionInteger v("123.45");
  EXPECT_EQ(v.GetLSBytes(), 12345u);
  EXPECT_EQ(v.Decimal(), 2);
  EXPECT_EQ(v.Sign(), 1);
  OEPrecisionInteger big("79228162514264337593543950");  // 26 digits, needs all three words
  EXPECT_EQ(Mag(big), static_cast<u128>(792281625142643375ULL) * 100000000ULL + 93543950ULL);
  OEPrecisionInteger negZero("-0");
  EXPECT_TRUE(negZero.IsZero());
  EXPECT_EQ(negZero.Sign(), -1);
}

TEST_F(PrecisionIntegerTest, MalformedTextLogsOneWarningAndKeepsWhatWasRead) {
  struct Case {
    const char* in;
    OEParseWarning warning;
    const char* out;
  };
  const std::string digits29(29, '7'), digits28(28, '7');
  const std::string point30 = "1." + std::string(30, '1');
  const Case cases[] = {
      {"1-2", OEPW_BADFORMAT, "-12"},
      {"1 000", OEPW_BADFORMAT, "1000"},
      {"1.2.3", OEPW_BADFORMAT, ".123"},  // the first point counts all three following characters
      {"-1,234.50", OEPW_BADFORMAT, "-.123450"},
      {"", OEPW_BADFORMAT, "0"},
      {"12a", OEPW_BADFORMAT, "12"},
      {"$5", OEPW_BADFORMAT, "5"},
      {" 5", OEPW_BADFORMAT, "5"},
      {"5+", OEPW_BADFORMAT, "5"},
      {"--5", OEPW_BADFORMAT, "-5"},
      {"1.5 ", OEPW_BADFORMAT, ".15"},
      {digits29.c_str(), OEPW_TOOLONG, digits28.c_str()},
      {point30.c_str(), OEPW_TOOLONG, "0"},  // decimal count 30 is invalid
  };
  for (const Case& c : cases) {
    Log()->DeleteAll();
    OEPrecisionInteger v;
    EXPECT_EQ(v.ConvertStringToOEPrecisionInteger(c.in), 0) << c.in;
    ASSERT_EQ(Log()->Entries(), 1) << c.in;
    const OEParseException* e = Log()->Get(0);
    EXPECT_EQ(e->GetWarning(), c.warning) << c.in;
    EXPECT_STREQ(e->GetValue().c_str(), "") << c.in;
    EXPECT_STREQ(e->GetTagName().c_str(), c.in) << c.in;
    EXPECT_EQ(e->GetTag(), OE_TAG_NONE);
    EXPECT_EQ(e->GetObject(), nullptr);
    EXPECT_EQ(Text(v), c.out) << c.in;
  }
  EXPECT_FALSE(OEPrecisionInteger(point30.c_str()).IsValid());
}

TEST_F(PrecisionIntegerTest, NullTextIsAnEmptyText) {
  OEPrecisionInteger v(5);
  EXPECT_EQ(v.ConvertStringToOEPrecisionInteger(nullptr), 0);
  EXPECT_TRUE(v.IsZero());
  ASSERT_EQ(Log()->Entries(), 1);
  EXPECT_EQ(Log()->Get(0)->GetWarning(), OEPW_BADFORMAT);
}

TEST_F(PrecisionIntegerTest, ParsingResetsThePreviousValue) {
  OEPrecisionInteger v("-98.765");
  v = "3";
  EXPECT_EQ(Text(v), "3");
  EXPECT_EQ(v.Sign(), 1);
}

TEST_F(PrecisionIntegerTest, FormattingExtremes) {
  const u128 max96 = kMask96;
  EXPECT_EQ(Text(FromMag(max96)), "79228162514264337593543950335");
  EXPECT_EQ(Text(FromMag(max96, -1, 29)), "-.79228162514264337593543950335");
  EXPECT_EQ(Text(FromMag(5, -1, 29)), "-.00000000000000000000000000005");
  EXPECT_EQ(Text(FromMag(max96, 1, 5)), "792281625142643375935439.50335");
  EXPECT_EQ(Text(FromMag(123, -1, 30)), "0");  // no text for an invalid decimal count
  EXPECT_EQ(Text(FromMag(0, 1, 2)), ".00");
  EXPECT_EQ(Text(OEPrecisionInteger(-5, 2)), "-.05");
  EXPECT_EQ(Text(OEPrecisionInteger(INT32_MIN)), "-2147483648");

  char buf[OEPrecisionInteger::kTextSize];
  EXPECT_EQ(FromMag(max96, -1, 29).FormatText(buf), 31);
}

TEST_F(PrecisionIntegerTest, TextBlockIsReusedAndNotShared) {
  OEPrecisionInteger a("1.5");
  char* first = static_cast<char*>(a);
  a = 42;
  EXPECT_EQ(static_cast<char*>(a), first);
  EXPECT_STREQ(first, "42");
  OEPrecisionInteger b(a);
  EXPECT_NE(static_cast<char*>(b), first);
}

// ---------------------------------------------------------------------------
// Arithmetic

OEPrecisionInteger Apply(const OEPrecisionInteger& a, char op, const OEPrecisionInteger& b) {
  switch (op) {
    case '+': return a + b;
    case '-': return a - b;
    case '*': return a * b;
    default: return a / b;
  }
}

TEST_F(PrecisionIntegerTest, ArithmeticOnTexts) {
  struct Case {
    const char* a;
    char op;
    const char* b;
    const char* result;
  };
  const Case cases[] = {
      // Sums take the larger decimal count; a zero result is positive.
      {"1.5", '+', "2.25", "3.75"},     {"1.5", '-', "2.25", "-.75"},     {"-1.5", '+', "-2.25", "-3.75"},
      {"-1.5", '-', "-2.25", ".75"},    {"2.25", '-', "2.25", ".00"},     {"-0", '+', "0", "0"},
      {"0.1", '+', "4294967295.9", "4294967296.0"},  // carry out of the low word
      {"18446744073709551616", '-', "1", "18446744073709551615"},  // borrow across words
      // Products add the decimal counts, without rounding.
      {"1.5", '*', "2.25", "3.375"},    {"-2", '*', "3", "-6"},           {"-2", '*', "-.3", ".6"},
      {"0", '*', "-5.5", ".0"},         {"1", '*', "-12.34", "-12.34"},   {".01", '*', "7", ".07"},
      {"4294967296", '*', "4294967296", "18446744073709551616"},
      {"18446744073709551616", '*', "4294967296", "0"},  // 2^96 wraps to 0
      // Quotients are truncated toward zero; a divisor below 1 returns the dividend.
      {"7", '/', "2", "3"},             {"7.0", '/', "2", "3.5"},         {"7", '/', "0", "7"},
      {"7", '/', "0.5", "7"},           {"7", '/', "-1", "-7"},           {"10", '/', "3", "3"},
      {"10.00", '/', "3", "3.33"},      {"3", '/', "1.5", "2"},           {"-1.5", '/', "3", "-.5"},
      {"7.5", '/', "2.5", "3"},         {"-1", '/', "3", "0"},            {"0", '/', "-3", "0"},
      {"1000000000000000000000000", '/', "18446744073709551617", "54210"},
  };
  for (const Case& c : cases) {
    EXPECT_EQ(Text(Apply(P(c.a), c.op, P(c.b))), c.result) << c.a << ' ' << c.op << ' ' << c.b;
  }
  EXPECT_EQ((P("1.5") * P("2.25")).Decimal(), 3);
  EXPECT_EQ((P("2.25") - P("2.25")).Sign(), 1);
  EXPECT_EQ((P("0") * P("-5.5")).Sign(), 1);

  OEPrecisionInteger acc("10");
  acc += P("0.5");
  acc -= P("20.25");
  EXPECT_EQ(Text(acc), "-9.75");
  // Divisors at the edge of "below 1": 10^-29, and exactly 1 written with 28 places.
  u128 ten28 = 1;
  for (int i = 0; i < 28; ++i) ten28 *= 10;
  EXPECT_EQ(Text(P("1") / FromMag(1, 1, 29)), "1");
  EXPECT_EQ(Text(P("5") / FromMag(ten28, 1, 28)), "5");
}

// Random 96-bit operands checked against 128-bit arithmetic.
TEST_F(PrecisionIntegerTest, WideArithmeticMatchesReference) {
  std::mt19937_64 rng(12345);
  const auto random96 = [&] {
    const u128 m = (static_cast<u128>(rng()) << 64 | rng()) & kMask96;
    return m >> (rng() % 96);  // spread the sizes
  };
  for (int i = 0; i < 2000; ++i) {
    const u128 a = random96(), b = random96();
    const OEPrecisionInteger pa = FromMag(a), pb = FromMag(b);
    EXPECT_EQ(Mag(pa + pb), (a + b) & kMask96);
    EXPECT_EQ(Mag(pa * pb), (a * b) & kMask96);
    if (b != 0) {
      EXPECT_EQ(Mag(pa / pb), a / b);
    }
    const u128 lo = a < b ? a : b, hi = a < b ? b : a;
    const OEPrecisionInteger diff = FromMag(lo) - FromMag(hi);
    EXPECT_EQ(Mag(diff), hi - lo);
    EXPECT_EQ(diff.Sign(), hi == lo ? 1 : -1);
    EXPECT_EQ(pa > pb, a > b);
    EXPECT_EQ(pa == pb, a == b);
    const unsigned shift = static_cast<unsigned>(rng() % 100);
    OEPrecisionInteger sl = pa, sr = pa;
    sl <<= static_cast<unsigned short>(shift);
    sr >>= static_cast<unsigned short>(shift);
    EXPECT_EQ(Mag(sl), shift >= 96 ? 0 : (a << shift) & kMask96);
    EXPECT_EQ(Mag(sr), shift >= 96 ? 0 : a >> shift);
  }
}

TEST_F(PrecisionIntegerTest, RescalingTruncatesTowardZero) {
  OEPrecisionInteger v("1.239");
  EXPECT_EQ(v.Decimal(2), 1);
  EXPECT_EQ(Text(v), "1.23");
  OEPrecisionInteger n("-1.239");
  n.Decimal(2);
  EXPECT_EQ(Text(n), "-1.23");
  OEPrecisionInteger up("1.2");
  up.Decimal(4);
  EXPECT_EQ(Text(up), "1.2000");
  OEPrecisionInteger small("-.001");
  small.Decimal(2);
  EXPECT_EQ(Text(small), ".00");
  EXPECT_EQ(small.Sign(), 1);
  EXPECT_EQ(up.Decimal(30), 0);
  EXPECT_EQ(Text(up), "1.2000");

  OEPrecisionInteger r("12345");
  EXPECT_EQ(r.SetDecimal(30), 0);
  EXPECT_EQ(r.Decimal(), 0);
  EXPECT_EQ(r.SetDecimal(2), 1);
  EXPECT_EQ(Text(r), "123.45");
}

TEST_F(PrecisionIntegerTest, UnaryOperations) {
  const OEPrecisionInteger v("-12.75");
  EXPECT_EQ(Text(v.Integer()), "-12");
  EXPECT_EQ(v.Integer().Decimal(), 0);
  EXPECT_EQ(Text(v.Fraction()), "-.75");
  EXPECT_EQ(Text(P("3.00").Fraction()), ".00");
  EXPECT_EQ(Text(P("-.5").Integer()), "0");
  EXPECT_EQ(P("-.5").Integer().Sign(), 1);
  EXPECT_EQ(Text(v.abs()), "12.75");
  EXPECT_EQ(Text(v.Mul10()), "-127.50");
  EXPECT_EQ(Text(v.Div10()), "-1.27");
  OEPrecisionInteger m(v);
  m.Negate();
  EXPECT_EQ(Text(m), "12.75");
  OEPrecisionInteger z;
  z.Negate();
  EXPECT_EQ(z.Sign(), 1);
  OEPrecisionInteger t(7);
  t.Mul10InPlace().Mul10InPlace();
  EXPECT_EQ(Text(t), "700");
  OEPrecisionInteger s(1);
  EXPECT_EQ(Mag(s << 95), static_cast<u128>(1) << 95);
  EXPECT_EQ(Mag(s), static_cast<u128>(1) << 95);  // << changes the object
  EXPECT_TRUE((s << 1).IsZero());
}

// ---------------------------------------------------------------------------
// Comparison

TEST_F(PrecisionIntegerTest, Comparisons) {
  struct Case {
    const char* a;
    const char* b;
    int order;  // -1: a < b, 0: a == b, 1: a > b
  };
  const Case cases[] = {
      {"1.50", "1.5", 0},    {"1.5", "1.50", 0},   {"1.51", "1.5", 1},   {"1.5", "1.51", -1},
      {"-1", "1", -1},       {"1", "-1", 1},       {"-2", "-1", -1},     {"-1.00", "-1", 0},
      {"0", "-0", 1},        {"-0", "0", -1},      {"0", "0.000", 0},    {"-2.5", "-2.49", -1},
      // aligning these decimal counts by multiplying would overflow 96 bits
      {"9999999999999999999999999999", "1.0000000000000000000", 1},
      {"1.0000000000000000000", "9999999999999999999999999999", -1},
      {"1.00000000000000000000000001", "1", 1},
  };
  for (const Case& c : cases) {
    const OEPrecisionInteger a(c.a), b(c.b);
    SCOPED_TRACE(std::string(c.a) + " vs " + c.b);
    EXPECT_EQ(a == b, c.order == 0);
    EXPECT_EQ(a != b, c.order != 0);
    EXPECT_EQ(a > b, c.order > 0);
    EXPECT_EQ(a >= b, c.order >= 0);
    EXPECT_EQ(a < b, c.order < 0);
    EXPECT_EQ(a <= b, c.order <= 0);
  }
}

// ---------------------------------------------------------------------------
// Range queries and narrowed kinds

TEST_F(PrecisionIntegerTest, RangeChecksLookAtTheMagnitudeOnly) {
  const OEPrecisionInteger neg("-70000.5");
  EXPECT_EQ(neg.GetOESLong(), -700005);
  EXPECT_EQ(neg.GetOESShort(), static_cast<short>(-700005));
  struct Case {
    const char* text;
    bool uLong, sLong, uShort, sShort;
  };
  const Case cases[] = {
      {"-32767", true, true, true, true},         {"32768", true, true, true, false},
      {"655.36", true, true, false, false},       {"4294967295", true, false, false, false},
      {"-4294967296", false, false, false, false},
  };
  for (const Case& c : cases) {
    const OEPrecisionInteger v(c.text);
    EXPECT_EQ(v.FitInAULong(), c.uLong) << c.text;
    EXPECT_EQ(v.FitInASLong(), c.sLong) << c.text;
    EXPECT_EQ(v.FitInAUShort(), c.uShort) << c.text;
    EXPECT_EQ(v.FitInASShort(), c.sShort) << c.text;
  }
}

TEST_F(PrecisionIntegerTest, NarrowedKindsValidity) {
  EXPECT_TRUE(OEPercent("100.00").IsValid());
  EXPECT_TRUE(OEPercent("0").IsValid());
  EXPECT_TRUE(OEPercent("37.5").IsValid());
  EXPECT_FALSE(OEPercent("100.01").IsValid());
  EXPECT_FALSE(OEPercent("-1").IsValid());
  EXPECT_FALSE(OEPercent(OEPrecisionInteger("-.001")).IsValid());
  EXPECT_TRUE(OEPosPrecisionInteger("0").IsValid());
  EXPECT_TRUE(OEPosPrecisionInteger("12.5").IsValid());
  EXPECT_FALSE(OEPosPrecisionInteger("-0.01").IsValid());
  EXPECT_TRUE(OEPrecisionInteger("-0.01").IsValid());

  // The narrowed check is virtual and survives assignment of a plain value.
  OEPosPrecisionInteger pos(5);
  pos = OEPrecisionInteger(-5);
  const OEPrecisionInteger& base = pos;
  EXPECT_FALSE(base.IsValid());
  OEPercent pct;
  pct = "250";
  EXPECT_FALSE(pct.IsValid());
}

// ---------------------------------------------------------------------------
// Binary record

TEST_F(PrecisionIntegerTest, BinaryRecordLayout) {
  const OEPrecisionInteger v("-12.34");
  unsigned char rec[OEPrecisionInteger::m_binaryLen];
  std::memset(rec, 0xAA, sizeof rec);
  unsigned short len = 0;
  v.ExportBinary(rec, &len);
  EXPECT_EQ(len, OEPrecisionInteger::m_binaryLen);
  const unsigned char expected[] = {0x01, 0x00, 0xD2, 0x04, 0x00, 0x00, 0x00, 0x00, 0x00, 0x00,
                                    0x00, 0x00, 0x00, 0x00, 0xFF, 0xFF, 0x02, 0x00, 0xAA, 0xAA};
  EXPECT_EQ(std::memcmp(rec, expected, sizeof expected), 0);

  OEPrecisionInteger back;
  back.ImportBinary(rec);
  EXPECT_EQ(Text(back), "-12.34");
  EXPECT_TRUE(back == v);
}

TEST_F(PrecisionIntegerTest, BinaryRecordEdges) {
  const OEPrecisionInteger wide = FromMag(kMask96 - 12345, 1, 7);
  char rec[OEPrecisionInteger::m_binaryLen] = {};
  wide.ExportBinary(rec, nullptr);
  OEPrecisionInteger back;
  back.ImportBinary(rec);
  EXPECT_EQ(Mag(back), kMask96 - 12345);
  EXPECT_EQ(back.Decimal(), 7);
  EXPECT_EQ(back.Sign(), 1);

  rec[0] = 2;  // unknown version: ignored
  OEPrecisionInteger untouched("5.5");
  untouched.ImportBinary(rec);
  EXPECT_EQ(Text(untouched), "5.5");
  untouched.ImportBinary(nullptr);
  unsigned short len = 0;
  untouched.ExportBinary(nullptr, &len);
  EXPECT_EQ(len, 0);

  char* block = untouched.LockBuffer();
  ASSERT_NE(block, nullptr);
  EXPECT_EQ(untouched.LockBuffer(), block);
  untouched.ExportBinary(block, &len);
  untouched.UnLockBuffer();
  untouched.UnLockBuffer();
}

}  // namespace
