#include <gtest/gtest.h>

#include <climits>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <new>
#include <string>

#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEDateTime.h"
#include "ofxkit/types/OEPrecisionInteger.h"

#include "support/log_fixture.h"

namespace {

struct Fields {
  int year, month, day, hour, minute, second, ms, offset;
  const char* name;
};

void ExpectFields(const OEDateTimeBase& v, const Fields& f) {
  EXPECT_EQ(v.GetYear(), f.year);
  EXPECT_EQ(v.GetMonth(), f.month);
  EXPECT_EQ(v.GetDay(), f.day);
  EXPECT_EQ(v.GetHour(), f.hour);
  EXPECT_EQ(v.GetMinute(), f.minute);
  EXPECT_EQ(v.GetSecond(), f.second);
  EXPECT_EQ(v.GetMilliseconds(), f.ms);
  EXPECT_EQ(v.GetTimeZoneOffset(), f.offset);
  EXPECT_STREQ(v.GetTimeZoneName().c_str(), f.name);
}

std::string Text(const OEDateTimeBase& v) {
  OEString out;
  if (!v.GetText(out)) return "<invalid>";
  return out.c_str();
}

std::string Seconds(OEPrecisionInteger v) { return static_cast<char*>(v); }

class DateTimeTest : public LogFixture {
 protected:

  // The log holds exactly one warning, with this code and these texts.
  void ExpectOneWarning(OEParseWarning code, const char* where, const char* value) {
    ASSERT_EQ(log->Entries(), 1) << where;
    const OEParseException* r = log->Get(0);
    EXPECT_EQ(r->warning, code);
    EXPECT_STREQ(r->tagName.c_str(), where);
    EXPECT_STREQ(r->value.c_str(), value);
    EXPECT_EQ(r->tag, OE_TAG_NONE);
    log->DeleteAll();
  }
  void ExpectNoWarning() {
    EXPECT_EQ(log->Entries(), 0);
    if (log->Entries() > 0) ADD_FAILURE() << log->Get(0)->tagName.c_str() << ": " << log->Get(0)->value.c_str();
    log->DeleteAll();
  }

};

// ---------------------------------------------------------------------------
// Reading and writing the text forms

TEST_F(DateTimeTest, DateTimeTextRoundTrips) {
  struct Case {
    const char* in;
    Fields fields;
    const char* out;
  };
  const Case cases[] = {
      {"19991231", {1999, 12, 31, 0, 0, 0, 0, 0, ""}, "19991231"},
      {"20000229", {2000, 2, 29, 0, 0, 0, 0, 0, ""}, "20000229"},
      {"20000101120000.5", {2000, 1, 1, 12, 0, 0, 500, 0, ""}, "20000101120000.500"},
      {"20000101120000.05", {2000, 1, 1, 12, 0, 0, 50, 0, ""}, "20000101120000.050"},
      {"20000101120000.", {2000, 1, 1, 12, 0, 0, 0, 0, ""}, "20000101120000"},
      {"20000101120000[-5:EST]", {2000, 1, 1, 12, 0, 0, 0, -5, "EST"}, "20000101120000.000[-5:EST]"},
      {"20000201093000.000[-5:EST]", {2000, 2, 1, 9, 30, 0, 0, -5, "EST"}, "20000201093000.000[-5:EST]"},
      {"20261123120000.123[-5:EST]", {2026, 11, 23, 12, 0, 0, 123, -5, "EST"}, "20261123120000.123[-5:EST]"},
      {"20000101[0:GMT]", {2000, 1, 1, 0, 0, 0, 0, 0, "GMT"}, "20000101"},  // a name at offset 0 is not written
      {"200001011230", {2000, 1, 1, 12, 30, 0, 0, 0, ""}, "20000101123000"},
      {"2000010112", {2000, 1, 1, 12, 0, 0, 0, 0, ""}, "20000101120000"},
      {"20000101000000[3]", {2000, 1, 1, 0, 0, 0, 0, 3, ""}, "20000101000000.000[3]"},
      {"00000101", {0, 1, 1, 0, 0, 0, 0, 0, ""}, "00000101"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.in);
    OEDateTime d;
    EXPECT_EQ(d.ConvertStringToOEDateTime(c.in), 1);
    ExpectFields(d, c.fields);
    EXPECT_EQ(Text(d), c.out);
  }
}

TEST_F(DateTimeTest, TimeTextRoundTrips) {
  struct Case {
    const char* in;
    int hour, minute, second, ms, offset;
    const char* out;
  };
  const Case cases[] = {
      {"1230", 12, 30, 0, 0, 0, "123000"},
      {"12", 12, 0, 0, 0, 0, "120000"},
      {"", 0, 0, 0, 0, 0, "000000"},
      {"235959.999", 23, 59, 59, 999, 0, "235959.999"},
      {"083000.5[-5:EST]", 8, 30, 0, 500, -5, "083000.500[-5:EST]"},
      {"0830[-5]", 8, 30, 0, 0, -5, "083000[-5]"},  // no fraction written for a time without milliseconds
      {"[12:NZS]", 0, 0, 0, 0, 12, "000000[12:NZS]"},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.in);
    OETime t;
    EXPECT_EQ(t.ConvertStringToOETime(c.in), 1);
    ExpectFields(t, {0, 0, 0, c.hour, c.minute, c.second, c.ms, c.offset, t.GetTimeZoneName().c_str()});
    EXPECT_EQ(Text(t), c.out);
  }
  log->DeleteAll();  // NZS at +12 is not checked, the table covers -4 to -8 only
}

TEST_F(DateTimeTest, WritersRefuseInvalidValuesAndLeaveOutputAlone) {
  OEString out("keep");
  EXPECT_EQ(OEDateTime(2001, 2, 29).GetDateString(out), 0);
  EXPECT_EQ(OEDateTime(2000, 1, 1, 24).GetDateString(out), 0);
  EXPECT_EQ(OEDateTime(2000, 0, 1).GetDateString(out), 0);
  OEDateTime zoned(2000, 1, 1);
  zoned.SetTimeZone("", 13);
  EXPECT_EQ(zoned.GetDateString(out), 0);
  EXPECT_EQ(OETime(12, 60).GetTimeString(out), 0);
  EXPECT_EQ(OETime(0, 0, 0, 1000).GetTimeString(out), 0);
  EXPECT_STREQ(out.c_str(), "keep");
  // The text getter is virtual: a time of day writes its own form.
  const OETime time(1, 2, 3);
  const OEDateTimeBase& asBase = time;
  EXPECT_EQ(Text(asBase), "010203");
  OEDateTimeBase base;
  EXPECT_EQ(base.GetText(out), 0);
  EXPECT_EQ(base = "20000101", 0);
  ExpectNoWarning();
}

TEST_F(DateTimeTest, WrittenTextOverwritesALongerPreviousText) {
  OEString out("a much longer text than any date that will be written here");
  EXPECT_EQ(OEDateTime(2000, 1, 2).GetDateString(out), 1);
  EXPECT_STREQ(out.c_str(), "20000102");
  EXPECT_EQ(out.GetStrLength(), 8);
  OEDateTime d("20000102030405.006[-7:MST]");
  EXPECT_EQ(d.GetDateString(out), 1);
  EXPECT_STREQ(out.c_str(), "20000102030405.006[-7:MST]");
  EXPECT_GE(out.BufferSize(), 40);
}

// ---------------------------------------------------------------------------
// Malformed dates, times and zones: the warning and the state left behind

TEST_F(DateTimeTest, MalformedDateTimes) {
  const char* D = "ConvertStringToOEDateTime";
  const char* T = "ConvertStringToOETime";
  const char* Z = "ExtractTimeZone";
  struct Case {
    const char* in;
    OEParseWarning code;
    const char* where;
    const char* value;  // logged value
    Fields left;        // what the object holds afterwards
  };
  const Case cases[] = {
      {"2000010", OEPW_BADFORMAT, D, "2000010", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"", OEPW_BADFORMAT, D, "", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"19000229", OEPW_OUTOFRANGE, D, "19000229", {1900, 2, 29, 0, 0, 0, 0, 0, ""}},
      {"20001301", OEPW_OUTOFRANGE, D, "20001301", {2000, 13, 1, 0, 0, 0, 0, 0, ""}},
      {"20000100", OEPW_OUTOFRANGE, D, "20000100", {2000, 1, 0, 0, 0, 0, 0, 0, ""}},
      {"20000431", OEPW_OUTOFRANGE, D, "20000431", {2000, 4, 31, 0, 0, 0, 0, 0, ""}},
      {"2000AB01", OEPW_BADFORMAT, D, "2000AB01", {0, 0, 1, 0, 0, 0, 0, 0, ""}},
      {"2000-01-01", OEPW_BADFORMAT, D, "2000-01-01", {0, 0, 0, 1, 0, 0, 0, 0, ""}},
      // The time part reports under its own name, with its own text.
      {"20000101 ", OEPW_BADFORMAT, T, " ", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"20000101120", OEPW_BADFORMAT, T, "120", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"200001011200001", OEPW_BADFORMAT, T, "1200001", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"20000101120000.12a", OEPW_BADFORMAT, T, "120000.12a", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"20000101120000,5", OEPW_BADFORMAT, T, "120000,5", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"20000101250000", OEPW_OUTOFRANGE, T, "250000", {0, 0, 0, 25, 0, 0, 0, 0, ""}},
      {"20000101126000", OEPW_OUTOFRANGE, T, "126000", {0, 0, 0, 12, 60, 0, 0, 0, ""}},
      {"20000101120060", OEPW_OUTOFRANGE, T, "120060", {0, 0, 0, 12, 0, 60, 0, 0, ""}},
      {"20000101120000.1234", OEPW_OUTOFRANGE, T, "120000.1234", {0, 0, 0, 12, 0, 0, 1234, 0, ""}},
      {"20000101120000[-13:XXX]", OEPW_OUTOFRANGE, T, "120000[-13:XXX]", {0, 0, 0, 12, 0, 0, 0, -13, "XXX"}},
      {"20000101120000[99999999999]", OEPW_OUTOFRANGE, T, "120000[99999999999]", {0, 0, 0, 12, 0, 0, 0, 9999, ""}},
      // A failed zone ends the conversion with the zone's warning only.
      {"20000101120000[+5:IST]", OEPW_BADFORMAT, Z, "[+5:IST]", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"20000101[-3.5:NST]", OEPW_BADFORMAT, Z, "[-3.5:NST]", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"20000101[--5]", OEPW_BADFORMAT, Z, "[--5]", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"20000101[:EST]", OEPW_BADFORMAT, Z, "[:EST]", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
      {"20000101[EST]", OEPW_BADFORMAT, Z, "[EST]", {0, 0, 0, 0, 0, 0, 0, 0, ""}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.in);
    OEDateTime d("19990101010101.001[-5:EST]");  // every field set, to see the reset
    ExpectNoWarning();
    EXPECT_EQ(d.ConvertStringToOEDateTime(c.in), 0);
    ExpectOneWarning(c.code, c.where, c.value);
    ExpectFields(d, c.left);
  }
}

TEST_F(DateTimeTest, FractionDigitsBeyondMillisecondsAreOutOfRangeEvenWhenTheyWouldWrap) {
  OETime t;
  EXPECT_EQ(t.ConvertStringToOETime("120000.65999"), 0);  // 65999 does not fit 16 bits
  ExpectOneWarning(OEPW_OUTOFRANGE, "ConvertStringToOETime", "120000.65999");
  EXPECT_EQ(t.ConvertStringToOETime("120000.0999"), 1);  // leading zeros keep it below 1000
  EXPECT_EQ(t.GetMilliseconds(), 999);
  ExpectNoWarning();
}

TEST_F(DateTimeTest, MalformedTimes) {
  const char* T = "ConvertStringToOETime";
  struct Case {
    const char* in;
    OEParseWarning code;
  };
  const Case cases[] = {
      {"12:30:00", OEPW_BADFORMAT}, {"12-30", OEPW_BADFORMAT},   {"1", OEPW_BADFORMAT},
      {"123", OEPW_BADFORMAT},      {"12300", OEPW_BADFORMAT},   {"1230000", OEPW_BADFORMAT},
      {"1a30", OEPW_BADFORMAT},     {"1230.5", OEPW_BADFORMAT},  {"240000", OEPW_OUTOFRANGE},
      {"000000.1000", OEPW_OUTOFRANGE},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.in);
    OETime t("010101.001[-5:EST]");
    EXPECT_EQ(t.ConvertStringToOETime(c.in), 0);
    ExpectOneWarning(c.code, T, c.in);
    EXPECT_EQ(t.GetTimeZoneOffset(), 0);
    EXPECT_TRUE(t.GetTimeZoneName().IsEmpty());
  }
  OETime t;
  EXPECT_EQ(t.ConvertStringToOETime(nullptr), 0);
  ExpectOneWarning(OEPW_NULLPOINTER, T, "");
  OEDateTime d;
  EXPECT_EQ(d.ConvertStringToOEDateTime(nullptr), 0);
  ExpectOneWarning(OEPW_NULLPOINTER, "ConvertStringToOEDateTime", "");
  EXPECT_EQ(d = static_cast<const char*>(nullptr), 0);
  ExpectOneWarning(OEPW_NULLPOINTER, "ConvertStringToOEDateTime", "");
}

TEST_F(DateTimeTest, ZoneWarningsThatLetTheValueThrough) {
  const char* Z = "ExtractTimeZone";
  struct Case {
    const char* in;
    int offset;
    const char* name;
  };
  const Case cases[] = {
      {"20000101120000[-5:ES]", -5, "ES"},     // two-letter name kept
      {"20000101120000[-5:]", -5, ""},         // empty name
      {"20000101120000[-5:EDST]", -5, "EDS"},  // three letters taken, then no ']'
      {"20000101120000[-5:EST", -5, "EST"},    // no closing bracket
      {"20000101120000[-5", -5, ""},
      {"20000101120000[]", 0, ""},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.in);
    OEDateTime d;
    EXPECT_EQ(d.ConvertStringToOEDateTime(c.in), 1);
    ExpectOneWarning(OEPW_BADFORMAT, Z, strchr(c.in, '['));
    EXPECT_EQ(d.GetTimeZoneOffset(), c.offset);
    EXPECT_STREQ(d.GetTimeZoneName().c_str(), c.name);
    EXPECT_EQ(d.GetHour(), 12);
  }
}

TEST_F(DateTimeTest, ZoneNamesAreCheckedAgainstTheirOffset) {
  OEDateTime d;
  EXPECT_EQ(d.ConvertStringToOEDateTime("20000101120000[-5:PST]"), 1);
  ExpectOneWarning(OEPW_BADFORMAT, "SetTimeZone (time zone mismatch", "PST");
  EXPECT_STREQ(d.GetTimeZoneName().c_str(), "PST");  // kept as given
  const char* accepted[] = {"[-4:AST]", "[-4:EDT]", "[-5:EST]", "[-5:CDT]", "[-6:CST]", "[-6:MDT]",
                            "[-7:MST]", "[-7:PDT]", "[-8:PST]", "[-8:YDT]", "[-3:XYZ]", "[-9:AKS]",
                            "[1:CET]",  "[-5:est]", "[5-:EST]", "[-5]"};
  for (const char* zone : accepted) {
    SCOPED_TRACE(zone);
    EXPECT_EQ(d.ConvertStringToOEDateTime((std::string("20000101") + zone).c_str()), 1);
    ExpectNoWarning();
  }
  EXPECT_EQ(d.SetTimeZone("MST", -8), 1);
  ExpectOneWarning(OEPW_BADFORMAT, "SetTimeZone (time zone mismatch", "MST");
  EXPECT_EQ(d.SetTimeZone(nullptr, -8), 1);
  ExpectNoWarning();
  EXPECT_EQ(d.GetTimeZoneOffset(), -8);
  EXPECT_TRUE(d.GetTimeZoneName().IsEmpty());
}

// Names of up to seven characters are kept inside the value, longer ones on
// the heap; both must survive copies, replacement and writing.
TEST_F(DateTimeTest, LongZoneNamesAreKeptWhole) {
  OEDateTime d(2000, 1, 1, 12);
  const std::string longName = "Australia/Sydney";
  EXPECT_EQ(d.SetTimeZone(longName.c_str(), 10), 1);
  EXPECT_EQ(std::string(d.GetTimeZoneName().c_str()), longName);
  EXPECT_TRUE(d.GetTimeZoneName().ExceedsSpecLength());
  OEString text;
  ASSERT_EQ(d.GetDateString(text), 1);
  EXPECT_STREQ(text.c_str(), "20000101120000.000[10:Australia/Sydney]");

  OEDateTime copy(d);
  OEDateTime assigned;
  assigned = d;
  d.SetTimeZone("PACIFIC", 10);  // seven characters: back inside the value
  EXPECT_STREQ(d.GetTimeZoneName().c_str(), "PACIFIC");
  EXPECT_EQ(std::string(copy.GetTimeZoneName().c_str()), longName);
  EXPECT_EQ(std::string(assigned.GetTimeZoneName().c_str()), longName);
  const OEDateTime& same = assigned;
  assigned = same;
  EXPECT_EQ(std::string(assigned.GetTimeZoneName().c_str()), longName);

  char record[OEDateTimeBase::kBinaryRecordLen + 1];
  unsigned short len = 0;
  copy.ExportBinary(record, &len);
  OEDateTime back;
  ASSERT_EQ(back.ImportBinary(record), 1);
  EXPECT_STREQ(back.GetTimeZoneName().c_str(), "Austr");  // the record holds five characters
  EXPECT_EQ(copy.ConvertStringToOEDateTime("20000101"), 1);
  EXPECT_TRUE(copy.GetTimeZoneName().IsEmpty());
}

// ---------------------------------------------------------------------------
// Instants: comparison, time_t and the second count

TEST_F(DateTimeTest, ComparisonsApplyTheOffset) {
  const OEDateTime newYork("20000101100000[-5:EST]");
  const OEDateTime london("20000101140000");
  EXPECT_TRUE(newYork > london);
  EXPECT_TRUE(london < newYork);
  EXPECT_TRUE(newYork != london);
  EXPECT_TRUE(newYork >= london);
  EXPECT_FALSE(newYork <= london);
  const OEDateTime same("20000101150000[0:GMT]");
  EXPECT_TRUE(newYork == same);
  EXPECT_TRUE(newYork <= same);
  EXPECT_TRUE(newYork >= same);
  // Ordering holds across every year end and within the day.
  for (int year = 1899; year <= 2101; ++year) {
    OEDateTime lastEvening(static_cast<short>(year), 12, 31, 23, 0, 0);
    OEDateTime nextMorning(static_cast<short>(year + 1), 1, 1, 1, 0, 0);
    ASSERT_TRUE(lastEvening < nextMorning) << year;
    ASSERT_EQ(Seconds(nextMorning.SecondsBetween(lastEvening)), "7200.000") << year;
  }
  EXPECT_TRUE(OEDateTime(2000, 1, 1, 0, 0, 0, 1) > OEDateTime(2000, 1, 1));
  EXPECT_TRUE(OETime(10, 0) > OETime(9, 59, 59, 999));
}

TEST_F(DateTimeTest, TimeTConversions) {
  OEDateTime d;
  d.SetTimeZone("EST", -5);
  EXPECT_EQ(d = -1, 1);
  ExpectFields(d, {1969, 12, 31, 23, 59, 59, 0, 0, "EST"});  // offset cleared, name left
  d = 0;
  ExpectFields(d, {1970, 1, 1, 0, 0, 0, 0, 0, "EST"});
  d = INT32_MIN;
  ExpectFields(d, {1901, 12, 13, 20, 45, 52, 0, 0, "EST"});
  d = 951782400;
  ExpectFields(d, {2000, 2, 29, 0, 0, 0, 0, 0, "EST"});

  EXPECT_EQ(OEDateTime(2000, 1, 1).GetTimeT(), 946684800);
  EXPECT_EQ(OEDateTime("20000101000000.999[-5:EST]").GetTimeT(), 946684800 + 18000);
  EXPECT_EQ(OEDateTime(1969, 12, 31, 23, 59, 59, 500).GetTimeT(), -1);
  EXPECT_EQ(OEDateTime(1902, 1, 1).GetTimeT(), -2145916800);
  EXPECT_EQ(OEDateTime(1901, 12, 31).GetTimeT(), INT32_MIN);
  EXPECT_EQ(OEDateTime(2038, 1, 19, 3, 14, 7).GetTimeT(), INT32_MAX);
  EXPECT_EQ(OEDateTime(2100, 1, 1).GetTimeT(), INT32_MAX);
  EXPECT_EQ(OEDateTime(2100, 1, 1).GetTimeT64(), 4102444800LL);
  EXPECT_EQ(OEDateTime(1800, 1, 1).GetTimeT64(), -5364662400LL);

  OEDateTime far;
  EXPECT_EQ(far.SetTimeT64(4102444800LL), 1);
  EXPECT_EQ(Text(far), "21000101");
  EXPECT_EQ(far.SetTimeT64(253402300800LL), 0);  // 1 January 10000
  EXPECT_EQ(Text(far), "21000101");
  for (int64_t t : {-62167219200LL, -1LL, 0LL, 68169600LL, 253402300799LL}) {
    ASSERT_EQ(far.SetTimeT64(t), 1);
    EXPECT_EQ(far.GetTimeT64(), t);
  }
}

TEST_F(DateTimeTest, SecondCount) {
  EXPECT_EQ(Seconds(OEDateTime(1970, 1, 1).GetGMT()), ".000");
  EXPECT_EQ(OEDateTime(1970, 1, 1).GetGMT().Decimal(), 3);
  EXPECT_EQ(Seconds(OEDateTime(1970, 1, 2, 0, 0, 1, 5).GetGMT()), "86401.005");
  EXPECT_EQ(Seconds(OEDateTime(1969, 12, 31, 23, 59, 59, 500).GetGMT()), "-.500");
  EXPECT_EQ(Seconds(OEDateTime("20000101000000[-5:EST]").GetGMT()), "946702800.000");
  EXPECT_EQ(Seconds(OEDateTime(9999, 12, 31, 23, 59, 59, 999).GetGMT()), "253402300799.999");
  EXPECT_EQ(Seconds(OEDateTime(1, 1, 1).GetGMT()), "-62135596800.000");
  EXPECT_EQ(Seconds(OEDateTime(2025, 1, 1).SecondsBetween(OEDateTime(2024, 12, 31))), "86400.000");
  EXPECT_EQ(Seconds(OEDateTime(2024, 12, 31).SecondsBetween(OEDateTime(2025, 1, 1))), "-86400.000");

  // FromPrecInt is the inverse of GetGMT on every first and last day of a
  // year and around the leap day, before and after 1970.
  for (int year = 1600; year <= 2400; year += 1) {
    const OEDateTime samples[] = {OEDateTime(static_cast<short>(year), 1, 1, 0, 0, 0, 1),
                                  OEDateTime(static_cast<short>(year), 2, 28, 12, 30, 15, 250),
                                  OEDateTime(static_cast<short>(year), 3, 1),
                                  OEDateTime(static_cast<short>(year), 12, 31, 23, 59, 59, 999)};
    for (const OEDateTime& sample : samples) {
      OEDateTime back(sample.GetGMT());
      ASSERT_EQ(Text(back), Text(sample)) << year;
    }
  }
}

TEST_F(DateTimeTest, FromPrecIntKeepsTheZoneAndFailsOutsideTheYears) {
  OEDateTime d("20000101120000[-5:EST]");
  EXPECT_EQ(d.FromPrecInt(OEPrecisionInteger("-0.25")), 1);
  ExpectFields(d, {1969, 12, 31, 23, 59, 59, 750, -5, "EST"});
  EXPECT_EQ(d = OEPrecisionInteger("951782400.0009"), 1);  // beyond milliseconds is cut off
  ExpectFields(d, {2000, 2, 29, 0, 0, 0, 0, -5, "EST"});
  EXPECT_EQ(d.FromPrecInt(OEPrecisionInteger("253402300800")), 0);
  ExpectFields(d, {0, 0, 0, 0, 0, 0, 0, -5, "EST"});
  d = OEPrecisionInteger(0);
  EXPECT_EQ(d.FromPrecInt(OEPrecisionInteger("-62167219201")), 0);
  EXPECT_EQ(d.GetYear(), 0);
  EXPECT_EQ(d.FromPrecInt(OEPrecisionInteger("99999999999999999999999")), 0);
  EXPECT_EQ(d.FromPrecInt(OEPrecisionInteger("-62167219200")), 1);
  EXPECT_EQ(Text(d), "00000101000000.000[-5:EST]");
  ExpectNoWarning();
}

// ---------------------------------------------------------------------------
// Additions

TEST_F(DateTimeTest, AddingSecondsMovesToGMT) {
  OEDateTime d("19991231");
  EXPECT_EQ(d += 86400, 1);
  EXPECT_EQ(Text(d), "20000101");
  OEDateTime zoned("19991231200000.250[-5:EST]");
  EXPECT_EQ(zoned += 3600, 1);
  ExpectFields(zoned, {2000, 1, 1, 2, 0, 0, 250, 0, ""});
  EXPECT_EQ(zoned += -7200, 1);
  EXPECT_EQ(Text(zoned), "20000101000000.250");
  OEDateTime last(9999, 12, 31, 23, 59, 59);
  EXPECT_EQ(last += 1, 0);
  EXPECT_EQ(Text(last), "99991231235959");

  OEDateTime precise("19991231235959.750[-5:EST]");
  EXPECT_EQ(precise += OEPrecisionInteger("0.5"), 1);
  ExpectFields(precise, {2000, 1, 1, 5, 0, 0, 250, 0, ""});
  EXPECT_EQ(precise += OEPrecisionInteger("-86400.25"), 1);
  EXPECT_EQ(Text(precise), "19991231050000");
  ExpectNoWarning();
}

TEST_F(DateTimeTest, AddingAnAmountCarriesFieldByField) {
  OEDateTime jan31(2000, 1, 31);
  EXPECT_EQ(jan31 += OEDateTime(0, 0, 1), 1);
  EXPECT_EQ(Text(jan31), "20000201");

  OEDateTime newYearsEve(1999, 12, 31, 23, 59, 59, 999);
  EXPECT_EQ(newYearsEve += OEDateTime(0, 0, 0, 0, 0, 0, 1), 1);
  EXPECT_EQ(Text(newYearsEve), "20000101");

  OEDateTime leap(2000, 2, 28, 12);
  EXPECT_EQ(leap += OEDateTime(1, 1, 1, 12), 1);  // 29 + 1 days overflow February 2000 into March
  EXPECT_EQ(Text(leap), "20010401");

  OEDateTime late(9999, 12, 31, 23);
  EXPECT_EQ(late += OEDateTime(0, 0, 0, 1), 0);  // the year would be 10000
  ExpectFields(late, {9999, 1, 1, 0, 0, 0, 0, 0, ""});
  OEDateTime big(9990, 1, 1);
  EXPECT_EQ(big += OEDateTime(9, 0, 0), 1);
  EXPECT_EQ(big += OEDateTime(1, 0, 0), 0);
  EXPECT_EQ(big.GetYear(), 9999);
}

TEST_F(DateTimeTest, TimeBetweenIsTheDifferenceAsCounts) {
  const OEDateTime a("20000301063000.500");
  const OEDateTime b("20000201");
  const OEDateTimeBase between = a.TimeBetween(b);
  EXPECT_EQ(between.GetDay(), 29);
  EXPECT_EQ(between.GetHour(), 6);
  EXPECT_EQ(between.GetMinute(), 30);
  EXPECT_EQ(between.GetMilliseconds(), 500);
  EXPECT_EQ(between.GetYear(), 0);
  EXPECT_EQ(b.TimeBetween(a).GetDay(), 29);
  OEDateTime back(b);
  back += between;
  EXPECT_TRUE(back == a);
}

// ---------------------------------------------------------------------------
// Calendar helpers, copying, binary records

TEST_F(DateTimeTest, CalendarHelpers) {
  EXPECT_EQ(OEDateTimeBase::IsLeapYear(1900), 0);
  EXPECT_EQ(OEDateTimeBase::IsLeapYear(2000), 1);
  EXPECT_EQ(OEDateTimeBase::IsLeapYear(2024), 1);
  EXPECT_EQ(OEDateTimeBase::IsLeapYear(2023), 0);
  EXPECT_EQ(OEDateTimeBase::DaysInMonth(2, 2000), 29);
  EXPECT_EQ(OEDateTimeBase::DaysInMonth(2, 1900), 28);
  EXPECT_EQ(OEDateTimeBase::DaysInMonth(12, 1900), 31);
  EXPECT_EQ(OEDateTimeBase::DaysInMonth(13, 1900), 0);
  EXPECT_EQ(OEDateTimeBase::DaysInMonth(0, 1900), 0);
  EXPECT_EQ(OEDateTime(2001, 4, 1).DaysInMonth(), 30);

  OEDateTime d(1999, 5, 5, 1, 2, 3);
  EXPECT_EQ(d.SetDay(60, 2000), 1);
  EXPECT_EQ(Text(d), "20000229010203");
  EXPECT_EQ(d.SetDay(366, 2000), 1);
  EXPECT_EQ(Text(d), "20001231010203");
  EXPECT_EQ(d.SetDay(366, 1999), 0);
  EXPECT_EQ(d.SetDay(0, 1999), 0);
  EXPECT_EQ(Text(d), "20001231010203");
  d.SetDay(32, 1999);
  EXPECT_EQ(Text(d), "19990201010203");

  d.SetMilliseconds(7);
  d.SetTimeZone("EST", -5);
  d.Invalidate();
  ExpectFields(d, {0, 0, 0, 0, 0, 0, 7, -5, "EST"});
  EXPECT_EQ(d.IsValidDate(), 0);
  ExpectNoWarning();
}

TEST_F(DateTimeTest, CopiesCarryEveryFieldAndTheName) {
  OEDateTime original("20000102030405.006[-7:MST]");
  OEDateTime copy(original);
  EXPECT_EQ(Text(copy), "20000102030405.006[-7:MST]");
  OEDateTime target("19990101[-5:EST]");
  EXPECT_EQ(target = original, 1);
  EXPECT_EQ(Text(target), Text(original));
  OEDateTime plain(2001, 1, 1);
  EXPECT_EQ(target = plain, 1);
  EXPECT_TRUE(target.GetTimeZoneName().IsEmpty());
  OETime time;
  EXPECT_EQ(time = static_cast<const OEDateTimeBase&>(original), 1);
  EXPECT_EQ(Text(time), "030405.006[-7:MST]");
  EXPECT_EQ(time = "1200", 1);
  EXPECT_EQ(Text(time), "120000");
}

TEST_F(DateTimeTest, BinaryRecordVersion3IsWritten) {
  OEDateTime d("20261123120000.123[-5:EST]");
  unsigned char record[OEDateTimeBase::kBinaryBlockSize];
  memset(record, 0xAA, sizeof record);
  unsigned short len = 99;
  d.ExportBinary(record, &len);
  EXPECT_EQ(len, 19);
  const unsigned char expected[19] = {3,    0,    0xEA, 0x07, 11,  23,  12,  0,   0,  123,
                                      0,    0xFB, 0xFF, 'E',  'S', 'T', 0,   0,   0};
  EXPECT_EQ(memcmp(record, expected, sizeof expected), 0);
  EXPECT_EQ(record[19], 0xAA);

  OEDateTime none(2000, 1, 1);
  none.ExportBinary(record, &len);
  EXPECT_EQ(memcmp(record + 13, "***\0\0", 5), 0);
  d.ExportBinary(nullptr, &len);
  EXPECT_EQ(len, 0);

  OEDateTime back;
  back.SetTimeZone("PST", -8);
  // A "***" record carries no name: the name the value held stays.
  EXPECT_EQ(back.ImportBinary(record), 1);
  ExpectFields(back, {2000, 1, 1, 0, 0, 0, 0, 0, "PST"});
  OEDateTime fresh;
  EXPECT_EQ(fresh.ImportBinary(record), 1);
  EXPECT_EQ(Text(fresh), "20000101");
  EXPECT_TRUE(fresh.GetTimeZoneName().IsEmpty());
  d.ExportBinary(record, &len);
  EXPECT_EQ(back.ImportBinary(record), 1);
  EXPECT_EQ(Text(back), "20261123120000.123[-5:EST]");

  char* block = d.LockBuffer();
  ASSERT_NE(block, nullptr);
  EXPECT_EQ(d.LockBuffer(), block);
  d.ExportBinary(block, &len);
  OETime t;
  EXPECT_EQ(t.ImportBinary(block), 1);
  EXPECT_EQ(Text(t), "120000.123[-5:EST]");
  d.UnLockBuffer();
  d.UnLockBuffer();
}

// The lock buffer is kept apart from the value, found by the value's place:
// a value made where another ended must not see that one's block.
TEST_F(DateTimeTest, LockBufferOfAValueMadeWhereAnotherEndedStartsEmpty) {
  alignas(OEDateTime) unsigned char place[sizeof(OEDateTime)];
  OEDateTime* first = new (place) OEDateTime(2000, 1, 1);
  memset(first->LockBuffer(), 'x', OEDateTimeBase::kBinaryBlockSize);
  first->~OEDateTime();
  OEDateTime* second = new (place) OEDateTime();
  const char* block = second->LockBuffer();
  ASSERT_NE(block, nullptr);
  EXPECT_EQ(std::string(block, OEDateTimeBase::kBinaryBlockSize), std::string(OEDateTimeBase::kBinaryBlockSize, '\0'));
  second->~OEDateTime();
}

TEST_F(DateTimeTest, BinaryRecordVersions1And2AreRead) {
  const unsigned char v1[23] = {1, 0, 0xD0, 0x07, 2, 0, 29, 0, 23, 0, 58, 0,
                                57, 0, 0xE7, 0x03, 0xF9, 0xFF, 'M', 'S', 'T', 0, 0};
  const unsigned char v2[17] = {2, 0, 0xD0, 0x07, 2, 29, 23, 58, 57, 99, 0x0C, 0x00, 'N', 'Z', 'S', 'T', 0};
  const unsigned char v4[19] = {4, 0, 0xD0, 0x07, 2, 29};
  OEDateTime d;
  EXPECT_EQ(d.ImportBinary(v1), 1);
  ExpectFields(d, {2000, 2, 29, 23, 58, 57, 999, -7, "MST"});
  EXPECT_EQ(d.ImportBinary(v2), 1);
  ExpectFields(d, {2000, 2, 29, 23, 58, 57, 99, 12, "NZST"});
  EXPECT_EQ(d.ImportBinary(v4), 0);
  EXPECT_EQ(d.ImportBinary(nullptr), 0);
  ExpectFields(d, {2000, 2, 29, 23, 58, 57, 99, 12, "NZST"});
}

#ifndef _WIN32
TEST_F(DateTimeTest, LocalTimeZoneOffsetFollowsTheProcessZone) {
  const char* saved = getenv("TZ");
  const std::string previous = saved ? saved : "";
  setenv("TZ", "EST5EDT", 1);
  tzset();
  EXPECT_EQ(OEDateTimeBase::LocalTimeZoneOffset(), 18000);
  setenv("TZ", "UTC0", 1);
  tzset();
  EXPECT_EQ(OEDateTimeBase::LocalTimeZoneOffset(), 0);
  if (saved)
    setenv("TZ", previous.c_str(), 1);
  else
    unsetenv("TZ");
  tzset();
}
#endif

}  // namespace
