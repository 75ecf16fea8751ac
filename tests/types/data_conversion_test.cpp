#include <gtest/gtest.h>

#include <cctype>
#include <cstring>
#include <set>
#include <string>

#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEDataConversion.h"
#include "ofxkit/types/OEDateTime.h"
#include "ofxkit/types/OELanguage.h"
#include "ofxkit/types/OEPrecisionInteger.h"

namespace {

// One enumeration of the list, seen through its named conversions.
struct EnumCase {
  const char* type;
  unsigned short count;
  unsigned short firstMatched;
  const char* const* table;
  unsigned short (*toString)(int32_t, OEString&);
  unsigned short (*fromString)(const OEString&, int32_t&);
};

#define OE_ENUM(TYPE, NAME, TABLE, FIRST)                                                 \
  {#TYPE, OEEnumTraits<TYPE>::kCount, FIRST, OEDataConversion::TABLE,                     \
   [](int32_t v, OEString& out) { return OEDataConversion::NAME##ToString(static_cast<TYPE>(v), out); }, \
   [](const OEString& text, int32_t& v) {                                                 \
     TYPE e = static_cast<TYPE>(v);                                                       \
     const unsigned short ok = OEDataConversion::StringTo##NAME(text, e);                 \
     v = e;                                                                               \
     return ok;                                                                           \
   }},
#define OE_ENUM_VALUE(SYM, TEXT)
#define OE_ENUM_EXTRA(SYM, NUMBER)
#define OE_ENUM_END(TYPE)
const EnumCase kEnums[] = {
#include "ofxkit/types/OEDataConversion.def"
};

std::string Lower(std::string s) {
  for (char& c : s) c = static_cast<char>(tolower(static_cast<unsigned char>(c)));
  return s;
}

class DataConversionTest : public ::testing::Test {
 protected:
  void SetUp() override {
    Log()->EnableLogging(1);
    Log()->DeleteAll();
  }
  void TearDown() override { Log()->DeleteAll(); }

  static OEParseLogger* Log() { return OEParseLogger::TheOEParseLogger(); }
  static unsigned short Count() { return Log()->Entries(); }
  // Expects exactly one warning since the last check, with these texts.
  static void ExpectOneWarning(OEParseWarning warning, const char* value) {
    ASSERT_EQ(Count(), 1u);
    const OEParseException* e = Log()->Get(0);
    ASSERT_NE(e, nullptr);
    EXPECT_EQ(e->GetWarning(), warning);
    EXPECT_STREQ(e->GetValue().c_str(), value);
    EXPECT_STREQ(e->GetTagName().c_str(), "");
    EXPECT_EQ(e->GetTag(), OE_TAG_NONE);
    Log()->DeleteAll();
  }
};

TEST_F(DataConversionTest, EveryEnumerationOfTheListIsConverted) {
  EXPECT_EQ(sizeof kEnums / sizeof kEnums[0], 76u);  // 50 standard, 8 of the extension sets, 18 payroll
  for (const EnumCase& e : kEnums) {
    SCOPED_TRACE(e.type);
    ASSERT_GT(e.count, 0);
    std::set<std::string> seen;
    for (unsigned short i = 0; i < e.count; ++i) {
      const char* text = e.table[i];
      ASSERT_NE(text, nullptr);
      ASSERT_GT(strlen(text), 0u);
      EXPECT_TRUE(seen.insert(text).second) << "repeated text " << text;
      for (const char* p = text; *p; ++p) EXPECT_FALSE(islower(static_cast<unsigned char>(*p))) << text;
    }
  }
}

TEST_F(DataConversionTest, EveryValueRoundTripsInAnyCase) {
  for (const EnumCase& e : kEnums) {
    SCOPED_TRACE(e.type);
    for (int32_t v = 0; v < e.count; ++v) {
      OEString out("previous");
      ASSERT_EQ(e.toString(v, out), 1);
      EXPECT_STREQ(out.c_str(), e.table[v]);
      if (v < e.firstMatched) continue;
      const std::string upper = e.table[v];
      std::string mixed = Lower(upper);
      mixed[0] = upper[0];
      for (const std::string& text : {upper, Lower(upper), mixed}) {
        int32_t back = -7;
        EXPECT_EQ(e.fromString(OEString(text.c_str()), back), 1) << text;
        EXPECT_EQ(back, v) << text;
      }
    }
    EXPECT_EQ(Count(), 0u);
  }
}

TEST_F(DataConversionTest, ValuesOutsideTheTableFailAndClearTheOutput) {
  for (const EnumCase& e : kEnums) {
    SCOPED_TRACE(e.type);
    // 65536 + 1 would read as 1 if the value were narrowed to 16 bits.
    for (int32_t bad : {static_cast<int32_t>(e.count), -1, 65537}) {
      OEString out("before");
      EXPECT_EQ(e.toString(bad, out), 0) << bad;
      EXPECT_TRUE(out.IsEmpty());
      ExpectOneWarning(OEPW_BADFORMAT, "before");
    }
  }
}

TEST_F(DataConversionTest, UnknownTextsFailAndKeepTheValue) {
  for (const EnumCase& e : kEnums) {
    SCOPED_TRACE(e.type);
    const std::string text = e.table[e.count - 1];
    const std::string misses[] = {"", text + "X", text.substr(0, text.size() - 1), " " + text, text + " "};
    for (const std::string& miss : misses) {
      int32_t value = 1234;
      EXPECT_EQ(e.fromString(OEString(miss.c_str()), value), 0) << "'" << miss << "'";
      EXPECT_EQ(value, 1234);
      ExpectOneWarning(OEPW_BADFORMAT, miss.c_str());
    }
  }
}

TEST_F(DataConversionTest, TableEdgeCases) {
  OEBankAccountType account = OE_ACCTTYPE_UNKNOWN;
  EXPECT_EQ(OEDataConversion::StringToBankAccount("Savings", account), 1);
  EXPECT_EQ(account, OE_ACCTTYPE_SAVINGS);
  EXPECT_EQ(account, 2);

  OEBankTxType tx = OE_BANKTX_FEE;
  EXPECT_EQ(OEDataConversion::StringToBankTx("TRANSFER", tx), 0);
  EXPECT_EQ(tx, OE_BANKTX_FEE);
  ExpectOneWarning(OEPW_BADFORMAT, "TRANSFER");

  OEString out;
  EXPECT_EQ(OEDataConversion::BankTxToString(static_cast<OEBankTxType>(16), out), 1);
  EXPECT_STREQ(out.c_str(), "OTHER");
  EXPECT_EQ(OEDataConversion::BankTxToString(static_cast<OEBankTxType>(17), out), 0);
  EXPECT_STREQ(out.c_str(), "");
  ExpectOneWarning(OEPW_BADFORMAT, "OTHER");

  // The MIME header names are written but never read back.
  OEHeaderTag header = OE_HEADER_UNKNOWN;
  EXPECT_EQ(OEDataConversion::HeaderTagToString(static_cast<OEHeaderTag>(0), out), 1);
  EXPECT_STREQ(out.c_str(), "CONTENT-TYPE");
  for (const char* mime : {"CONTENT-TYPE", "content-length"}) {
    EXPECT_EQ(OEDataConversion::StringToHeaderTag(mime, header), 0);
    EXPECT_EQ(header, OE_HEADER_UNKNOWN);
    ExpectOneWarning(OEPW_BADFORMAT, mime);
  }
  EXPECT_EQ(OEDataConversion::StringToHeaderTag("newfileuid", header), 1);
  EXPECT_EQ(header, 10);
  EXPECT_EQ(OE_HEADER_UNKNOWN, -1);
  static_assert(sizeof(OEHeaderTag) == sizeof(int32_t), "header tags are 32-bit");

  // Several tables share texts; each resolves within its own table.
  OEOptType opt = OE_OPTTYPE_OTHER;
  OECallType call = OE_CALLTYPE_MATURITY;
  EXPECT_EQ(OEDataConversion::StringToOptType("CALL", opt), 1);
  EXPECT_EQ(OEDataConversion::StringToCallType("CALL", call), 1);
  EXPECT_EQ(opt, OE_OPTTYPE_CALL);
  EXPECT_EQ(call, OE_CALLTYPE_CALL);

  EXPECT_STREQ(OEDataConversion::Text(OE_OFXCHARSET_1252), "1252");
  EXPECT_EQ(OEDataConversion::Text(static_cast<OEDayOfWeek>(7)), nullptr);
  EXPECT_EQ(Count(), 0u);
}

TEST_F(DataConversionTest, GenericFormsHonourTheirRange) {
  const char* const* days = OEDataConversion::m_dayOfWeek;
  OEString out;
  EXPECT_EQ(OEDataConversion::EnumToString(3, out, 2, 4, days), 1);
  EXPECT_STREQ(out.c_str(), "THURSDAY");
  EXPECT_EQ(OEDataConversion::EnumToString(1, out, 2, 4, days), 0);
  EXPECT_TRUE(out.IsEmpty());
  ExpectOneWarning(OEPW_BADFORMAT, "THURSDAY");

  unsigned short value = 99;
  EXPECT_EQ(OEDataConversion::StringToEnum("friday", value, 2, 4, days), 1);
  EXPECT_EQ(value, 4);
  EXPECT_EQ(OEDataConversion::StringToEnum("SATURDAY", value, 2, 4, days), 0);
  EXPECT_EQ(value, 4);
  ExpectOneWarning(OEPW_BADFORMAT, "SATURDAY");

  // The raw lookup reads an unterminated slice and logs nothing.
  EXPECT_EQ(OEDataConversion::FindText("sundayXYZ", 6, 0, 6, days), 6);
  EXPECT_EQ(OEDataConversion::FindText("sun", 3, 0, 6, days), -1);
  EXPECT_EQ(OEDataConversion::FindText(nullptr, 0, 0, 6, days), -1);
  EXPECT_EQ(Count(), 0u);
}

TEST_F(DataConversionTest, Booleans) {
  OEString out("keep");
  EXPECT_EQ(OEDataConversion::BooleanToString(1, out), 1);
  EXPECT_STREQ(out.c_str(), "Y");
  EXPECT_EQ(OEDataConversion::BooleanToString(0, out), 1);
  EXPECT_STREQ(out.c_str(), "N");
  EXPECT_EQ(OEDataConversion::BooleanToString(2, out), 0);
  EXPECT_STREQ(out.c_str(), "N");
  ExpectOneWarning(OEPW_BADFORMAT, "N");

  unsigned short flag = 7;
  EXPECT_EQ(OEDataConversion::StringToBoolean("Y", flag), 1);
  EXPECT_EQ(flag, 1);
  EXPECT_EQ(OEDataConversion::StringToBoolean("N", flag), 1);
  EXPECT_EQ(flag, 0);
  for (const char* bad : {"y", "n", "YES", "", "1", "Y "}) {
    flag = 7;
    EXPECT_EQ(OEDataConversion::StringToBoolean(bad, flag), 0) << bad;
    EXPECT_EQ(flag, 7);
    ExpectOneWarning(OEPW_BADFORMAT, bad);
  }
}

TEST_F(DataConversionTest, IntegersAcceptWholeNumbersWithinRange) {
  short s = 0;
  EXPECT_EQ(OEDataConversion::StringToSShort("12.00", s), 1);
  EXPECT_EQ(s, 12);
  EXPECT_EQ(OEDataConversion::StringToSShort("-5", s), 1);
  EXPECT_EQ(s, -5);
  EXPECT_EQ(OEDataConversion::StringToSShort("32767", s), 1);
  EXPECT_EQ(s, 32767);
  EXPECT_EQ(OEDataConversion::StringToSShort("-32767", s), 1);
  EXPECT_EQ(s, -32767);

  unsigned short us = 0;
  EXPECT_EQ(OEDataConversion::StringToUShort("65535", us), 1);
  EXPECT_EQ(us, 65535);
  EXPECT_EQ(OEDataConversion::StringToUShort("-5", us), 1);  // the magnitude
  EXPECT_EQ(us, 5);

  int32_t sl = 0;
  EXPECT_EQ(OEDataConversion::StringToSLong("-2147483647", sl), 1);
  EXPECT_EQ(sl, -2147483647);
  EXPECT_EQ(OEDataConversion::StringToSLong("2147483647.000", sl), 1);
  EXPECT_EQ(sl, 2147483647);

  uint32_t ul = 0;
  EXPECT_EQ(OEDataConversion::StringToULong("4294967295", ul), 1);
  EXPECT_EQ(ul, 4294967295u);
  EXPECT_EQ(Count(), 0u);
}

TEST_F(DataConversionTest, IntegersRejectFractionsAndOverflow) {
  short s = 77;
  EXPECT_EQ(OEDataConversion::StringToSShort("12.5", s), 0);
  ExpectOneWarning(OEPW_BADFORMAT, "12.5");
  EXPECT_EQ(OEDataConversion::StringToSShort("-0.01", s), 0);
  ExpectOneWarning(OEPW_BADFORMAT, "-0.01");
  for (const char* big : {"40000", "32768", "-32768"}) {
    EXPECT_EQ(OEDataConversion::StringToSShort(big, s), 0) << big;
    ExpectOneWarning(OEPW_OUTOFRANGE, big);
  }
  EXPECT_EQ(s, 77);

  unsigned short us = 77;
  EXPECT_EQ(OEDataConversion::StringToUShort("65536", us), 0);
  ExpectOneWarning(OEPW_OUTOFRANGE, "65536");
  int32_t sl = 77;
  EXPECT_EQ(OEDataConversion::StringToSLong("2147483648", sl), 0);
  ExpectOneWarning(OEPW_OUTOFRANGE, "2147483648");
  uint32_t ul = 77;
  // Beyond 32 bits, and beyond 64 bits: neither may wrap into range.
  for (const char* big : {"4294967296", "18446744073709551617"}) {
    EXPECT_EQ(OEDataConversion::StringToULong(big, ul), 0) << big;
    ExpectOneWarning(OEPW_OUTOFRANGE, big);
  }
  EXPECT_EQ(us, 77);
  EXPECT_EQ(sl, 77);
  EXPECT_EQ(ul, 77u);

  // Malformed numbers fail with the amount reader's own warning.
  EXPECT_EQ(OEDataConversion::StringToSLong("12a", sl), 0);
  EXPECT_EQ(sl, 77);
  EXPECT_GE(Count(), 1u);
  EXPECT_EQ(Log()->Get(0)->GetWarning(), OEPW_BADFORMAT);
}

TEST_F(DataConversionTest, AmountsDatesAndTimesRoundTrip) {
  OEPrecisionInteger amount;
  EXPECT_EQ(OEDataConversion::StringToAmount("-1234.50", amount), 1);
  EXPECT_EQ(amount == OEPrecisionInteger(-12345, 1), 1);
  OEPercent rate;
  EXPECT_EQ(OEDataConversion::StringToRate("5.25", rate), 1);
  EXPECT_EQ(rate == OEPrecisionInteger(525, 2), 1);

  OEDateTime when;
  OEString out;
  EXPECT_EQ(OEDataConversion::StringToDateTime("20000201093000.250[-5:EST]", when), 1);
  EXPECT_EQ(OEDataConversion::DateTimeToString(when, out), 1);
  EXPECT_STREQ(out.c_str(), "20000201093000.250[-5:EST]");
  OETime time;
  EXPECT_EQ(OEDataConversion::StringToTime("235959", time), 1);
  EXPECT_EQ(OEDataConversion::TimeToString(time, out), 1);
  EXPECT_STREQ(out.c_str(), "235959");
  EXPECT_EQ(Count(), 0u);

  // Malformed texts fail with the readers' own warnings.
  EXPECT_EQ(OEDataConversion::StringToDateTime("20001301", when), 0);
  EXPECT_EQ(OEDataConversion::StringToTime("12:30", time), 0);
  ASSERT_EQ(Count(), 2u);
  EXPECT_EQ(Log()->Get(0)->GetWarning(), OEPW_OUTOFRANGE);
  EXPECT_EQ(Log()->Get(1)->GetWarning(), OEPW_BADFORMAT);
}

TEST_F(DataConversionTest, LanguagesKeepTheirThreeCharacterLimit) {
  OELanguage language;
  EXPECT_EQ(OEDataConversion::StringToLanguage("ENG", language), 1);
  EXPECT_STREQ(language.GetString().c_str(), "ENG");
  EXPECT_EQ(language.GetString().SpecLength(), 3);

  EXPECT_EQ(OEDataConversion::StringToLanguage("ENGL", language), 0);
  EXPECT_STREQ(language.GetString().c_str(), "ENGL");
  EXPECT_EQ(language.GetString().SpecLength(), 3);
  EXPECT_EQ(language.IsValid(), 0);
  ExpectOneWarning(OEPW_TOOLONG, "ENGL");

  OEString out;
  out.SetSpecLength(40);
  EXPECT_EQ(OEDataConversion::LanguageToString(OELanguage("FRA"), out), 1);
  EXPECT_STREQ(out.c_str(), "FRA");
  EXPECT_EQ(out.SpecLength(), 40);

  // Copies keep the code and its limit.
  OELanguage copy(language);
  EXPECT_TRUE(copy == language);
  copy = OEString("DEU");
  EXPECT_TRUE(copy != language);
  EXPECT_EQ(copy.GetString().SpecLength(), 3);
}

TEST_F(DataConversionTest, PayeeAndServerIdentifiers) {
  using Reader = unsigned short (*)(const OEString&, OEString12&);
  for (Reader read : {Reader(&OEDataConversion::StringToPayeeID), Reader(&OEDataConversion::StringToServerID)}) {
    OEString12 id("OLD");
    EXPECT_EQ(read("", id), 3);
    EXPECT_EQ(Count(), 0u);
    EXPECT_EQ(read("123456789012", id), 1);
    EXPECT_EQ(Count(), 0u);
    EXPECT_EQ(read("1234567890123", id), 1);
    EXPECT_STREQ(id.c_str(), "1234567890123");
    EXPECT_EQ(id.SpecLength(), 12);
    ExpectOneWarning(OEPW_TOOLONG, "1234567890123");
  }
  OEString out;
  EXPECT_EQ(OEDataConversion::PayeeIDToString(OEString12("P-17"), out), 1);
  EXPECT_STREQ(out.c_str(), "P-17");
  EXPECT_EQ(OEDataConversion::ServerIDToString(OEString12("S-9"), out), 1);
  EXPECT_STREQ(out.c_str(), "S-9");
}

TEST_F(DataConversionTest, EnumArraysHoldOwnedValues) {
  OEDynamicArrayDayOfWeek days;
  EXPECT_EQ(days.SetVal(2, OE_DAY_FRIDAY), 1);
  EXPECT_EQ(days.Entries(), 3);
  EXPECT_EQ(days.Get(0), nullptr);
  EXPECT_EQ(*days.Get(2), OE_DAY_FRIDAY);
  EXPECT_EQ(days[0], OE_DAY_MONDAY);  // made on demand as value 0

  OEDynamicArrayLanguage languages;
  EXPECT_EQ(languages.Append(new OELanguage("ENG")), 1);
  EXPECT_EQ(languages.SetVal(1, OELanguage("SPA")), 1);
  EXPECT_STREQ(languages.Get(1)->GetString().c_str(), "SPA");

  OEDynamicArrayBankAccountType types;
  EXPECT_EQ(types.SetVal(0, OE_ACCTTYPE_CREDITLINE), 1);
  EXPECT_EQ(*types.Get(0), OE_ACCTTYPE_CREDITLINE);
}

}  // namespace
