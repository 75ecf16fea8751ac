#include "ofxkit/types/OEDateTime.h"

#include <cstdlib>
#include <cstring>
#include <ctime>
#include <strings.h>

#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEUtility.h"
#include "OESideBlock.h"

const char* const OEDateTimeBase::m_timeZoneNotInitialized = "***";

namespace {

const char kDateWhere[] = "ConvertStringToOEDateTime";
const char kTimeWhere[] = "ConvertStringToOETime";
const char kZoneWhere[] = "ExtractTimeZone";
const char kMismatchWhere[] = "SetTimeZone (time zone mismatch";

constexpr int64_t kMillisPerDay = 86400000;
constexpr int64_t kDaysPer400Years = 146097;  // 400 Gregorian years of 365.2425 days
constexpr int kFirstYear = 0;
constexpr int kLastYear = 9999;

// Days before the first of each month (and the year's length at index 12),
// for a normal year and a leap year.
const unsigned short kDaysBefore[2][13] = {
    {0, 31, 59, 90, 120, 151, 181, 212, 243, 273, 304, 334, 365},
    {0, 31, 60, 91, 121, 152, 182, 213, 244, 274, 305, 335, 366}};

// Names accepted for the offsets -4 to -8: standard and daylight time.
struct ZoneNames {
  const char* standard;
  const char* daylight;
};
const ZoneNames kZoneNames[] = {{"AST", "EDT"}, {"EST", "CDT"}, {"CST", "MDT"}, {"MST", "PDT"}, {"PST", "YDT"}};
constexpr short kFirstNamedOffset = -4;
constexpr short kLastNamedOffset = -8;

// A fixed-position digit group of a text form and the field it fills.
struct DigitGroup {
  unsigned char position;
  unsigned char digits;
  unsigned short OEDateTimeBase::*field;
};

// Field layout of one version of the binary record: offsets of year, month,
// day, hour, minute, second, milliseconds, offset and the zone name, and the
// widths (1 or 2 bytes) of the first eight.
constexpr int kRecordFields = 8;
constexpr int kRecordNameLen = 5;
struct RecordLayout {
  unsigned short version;
  unsigned char offset[kRecordFields + 1];
  unsigned char width[kRecordFields];
};
const RecordLayout kLayouts[] = {
    {1, {2, 4, 6, 8, 10, 12, 14, 16, 18}, {2, 2, 2, 2, 2, 2, 2, 2}},
    {2, {2, 4, 5, 6, 7, 8, 9, 10, 12}, {2, 1, 1, 1, 1, 1, 1, 2}},
    {3, {2, 4, 5, 6, 7, 8, 9, 11, 13}, {2, 1, 1, 1, 1, 1, 2, 2}},
};

int64_t FloorDiv(int64_t a, int64_t b) { return a / b - ((a % b != 0) && ((a < 0) != (b < 0))); }

int LeapIndex(int64_t year) { return (year % 4 == 0 && (year % 100 != 0 || year % 400 == 0)) ? 1 : 0; }

// Leap years from year 1 through `year` (negative counts before year 1).
int64_t LeapsThrough(int64_t year) { return FloorDiv(year, 4) - FloorDiv(year, 100) + FloorDiv(year, 400); }

// Days from 1 January 1970 to 1 January of `year` (negative before 1970).
int64_t DaysBeforeYear(int64_t year) { return 365 * (year - 1970) + LeapsThrough(year - 1) - LeapsThrough(1969); }

void Warn(OEParseWarning warning, const char* where, const char* value) {
  OELogWarning(warning, OEString(value), OEString(where), OE_TAG_NONE);
}

unsigned short Fail(OEParseWarning warning, const char* where, const char* value) {
  Warn(warning, where, value);
  return 0;
}

// Reads the groups from the last to the first, cutting the work text after
// each, so that every group must be exactly its number of digits. A group
// beyond the end of the text is absent and leaves its field alone.
bool ReadDigitGroups(OEDateTimeBase& value, char* work, const DigitGroup* groups, size_t count) {
  for (size_t i = 0; i < count; ++i) {
    char* at = work + groups[i].position;
    if (*at == '\0') continue;
    if (OEUtility::AscToUInt(at, &(value.*groups[i].field), groups[i].digits, 0) != OE_PARSE_OK) return false;
    *at = '\0';
  }
  return true;
}

// Writes value in decimal, zero-padded to at least `width` digits.
char* PutDigits(char* p, unsigned value, unsigned width) {
  char digits[10];
  unsigned n = 0;
  do {
    digits[n++] = static_cast<char>('0' + value % 10);
    value /= 10;
  } while (value != 0);
  while (n < width) digits[n++] = '0';
  while (n > 0) *p++ = digits[--n];
  return p;
}

// A second count as milliseconds (truncated toward zero); false when it does
// not fit comfortably in 62 bits.
bool ToMillis(const OEPrecisionInteger& seconds, int64_t* millis) {
  OEPrecisionInteger v(seconds);
  if (v.Decimal() < 3 && (v.GetMSBytes() != 0 || v.GetSSBytes() >= (1u << 20))) return false;
  v.Decimal(3);
  if (v.GetMSBytes() != 0 || v.GetSSBytes() >= 0x40000000u) return false;
  const int64_t magnitude = static_cast<int64_t>((static_cast<uint64_t>(v.GetSSBytes()) << 32) | v.GetLSBytes());
  *millis = v.Sign() < 0 ? -magnitude : magnitude;
  return true;
}

// Milliseconds as a second count with 3 decimals.
OEPrecisionInteger FromMillis(int64_t millis) {
  const uint64_t magnitude = millis < 0 ? 0 - static_cast<uint64_t>(millis) : static_cast<uint64_t>(millis);
  OEPrecisionInteger result(static_cast<int32_t>(magnitude >> 31));
  result <<= 31;
  result += OEPrecisionInteger(static_cast<int32_t>(magnitude & 0x7FFFFFFFu));
  result.SetDecimal(3);
  if (millis < 0) result.Negate();
  return result;
}

}  // namespace

// ---------------------------------------------------------------------------
// Construction and assignment

OEDateTimeBase::OEDateTimeBase() : OEDateTimeBase(0, 0, 0, 0, 0, 0, 0) {}

OEDateTimeBase::OEDateTimeBase(unsigned short year, unsigned short month, unsigned short day, unsigned short hour,
                               unsigned short minute, unsigned short second, unsigned short milliseconds)
    : m_year(year),
      m_month(month),
      m_day(day),
      m_hour(hour),
      m_minute(minute),
      m_second(second),
      m_milliseconds(milliseconds),
      m_timeZoneOffset(0),
      m_zoneLength(0),
      m_zone{},
      m_hasBinary(0) {
  static_assert(sizeof m_zone >= sizeof(char*), "a long zone name's address is kept in m_zone");
}

OEDateTimeBase::OEDateTimeBase(const OEDateTimeBase& other) : OEDateTimeBase() { operator=(other); }


unsigned short OEDateTimeBase::operator=(const char*) { return 0; }

unsigned short OEDateTimeBase::GetText(OEString&) const { return 0; }

unsigned short OEDateTimeBase::operator=(const OEDateTimeBase& other) {
  if (this == &other) return 1;
  m_year = other.m_year;
  m_month = other.m_month;
  m_day = other.m_day;
  m_hour = other.m_hour;
  m_minute = other.m_minute;
  m_second = other.m_second;
  m_milliseconds = other.m_milliseconds;
  m_timeZoneOffset = other.m_timeZoneOffset;
  if (other.m_zoneLength == 0)
    ClearTimeZoneName();
  else
    AssignTimeZoneName(other.ZoneName(), other.m_zoneLength);
  return 1;
}

unsigned short OEDateTimeBase::operator=(int32_t t) { return SetTimeT64(t); }

unsigned short OEDateTimeBase::operator=(const OEPrecisionInteger& seconds) { return FromPrecInt(seconds); }

void OEDateTimeBase::InitOEDateTime() {
  m_year = m_month = m_day = m_hour = m_minute = m_second = m_milliseconds = 0;
  m_timeZoneOffset = 0;
  ClearTimeZoneName();
}

void OEDateTimeBase::Invalidate() { m_year = m_month = m_day = m_hour = m_minute = m_second = 0; }

void OEDateTimeBase::ClearTimeZoneName() {
  if (m_zoneLength > kZoneInline) free(ZoneHeap());
  m_zoneLength = 0;
  m_zone[0] = '\0';
}

void OEDateTimeBase::AssignTimeZoneName(const char* name, unsigned short length) {
  if (length <= kZoneInline) {
    // Through a copy: name may be this value's own heap name.
    char inlineName[kZoneInline + 1];
    memcpy(inlineName, name, length);
    inlineName[length] = '\0';
    ClearTimeZoneName();
    memcpy(m_zone, inlineName, sizeof inlineName);
    m_zoneLength = length;
    return;
  }
  char* heap = static_cast<char*>(malloc(static_cast<size_t>(length) + 1));
  if (heap == nullptr) {
    g_allocFailed = 1;
    ClearTimeZoneName();
    return;
  }
  memcpy(heap, name, length);
  heap[length] = '\0';
  ClearTimeZoneName();
  memcpy(m_zone, &heap, sizeof heap);
  m_zoneLength = length;
}

OEString3 OEDateTimeBase::GetTimeZoneName() const {
  OEString3 name;
  if (m_zoneLength) name.Assign(ZoneName(), m_zoneLength);
  return name;
}

// ---------------------------------------------------------------------------
// Time zones

unsigned short OEDateTimeBase::SetTimeZone(const char* name, short offset) {
  return SetTimeZone(name, name ? static_cast<unsigned short>(strlen(name)) : 0, offset, true);
}

unsigned short OEDateTimeBase::SetTimeZone(const char* name, unsigned short nameLength, short offset,
                                           bool mayWarn) {
  m_timeZoneOffset = offset;
  if (nameLength == 0) {
    ClearTimeZoneName();
    return 1;
  }
  AssignTimeZoneName(name, nameLength);
  if (mayWarn && m_zoneLength && offset <= kFirstNamedOffset && offset >= kLastNamedOffset) {
    const ZoneNames& names = kZoneNames[kFirstNamedOffset - offset];
    if (strcasecmp(ZoneName(), names.standard) != 0 && strcasecmp(ZoneName(), names.daylight) != 0)
      Warn(OEPW_BADFORMAT, kMismatchWhere, ZoneName());
  }
  return 1;
}

unsigned short OEDateTimeBase::ExtractTimeZone(const char* text) {
  if (text == nullptr || *text == '\0') return 1;
  bool warned = false;
  auto warn = [&]() {
    if (!warned) Warn(OEPW_BADFORMAT, kZoneWhere, text);
    warned = true;
  };
  if (*text != '[') {
    warn();
    return 0;
  }
  const char* p = text + 1;
  if (*p == ']') warn();  // "[]": no zone at all, read as GMT
  if (*p == ':') {
    warn();
    return 0;
  }
  // Whole hours: digits with at most one '-' anywhere; no '+', no fraction.
  bool negative = false;
  int hours = 0;
  for (; *p != '\0' && *p != ':' && *p != ']'; ++p) {
    if (*p >= '0' && *p <= '9') {
      hours = hours * 10 + (*p - '0');
      if (hours > 9999) hours = 9999;  // far out of range already; keeps the sum bounded
    } else if (*p == '-' && !negative) {
      negative = true;
    } else {
      warn();
      return 0;
    }
  }
  const char* name = p;
  unsigned short nameLength = 0;
  if (*p == ':') {
    name = ++p;
    while (nameLength < 3 && p[nameLength] != '\0' && p[nameLength] != ']') ++nameLength;
    p += nameLength;
    if (nameLength != 3) warn();
  }
  if (*p != ']') warn();
  return SetTimeZone(name, nameLength, static_cast<short>(negative ? -hours : hours), !warned);
}

// ---------------------------------------------------------------------------
// Reading text

unsigned short OEDateTimeBase::ReadTimeOfDay(const char* text) {
  InitOEDateTime();
  if (text == nullptr) return Fail(OEPW_NULLPOINTER, kTimeWhere, "");
  const char* end = text;
  bool separators = false;
  for (; *end != '\0' && *end != '['; ++end) separators |= (*end == '-' || *end == ':');
  if (*end == '[') {
    if (!ExtractTimeZone(end)) return 0;
  } else if (separators) {
    return Fail(OEPW_BADFORMAT, kTimeWhere, text);
  }

  // Only the first twelve characters are ever examined (HHMMSS.XXXXX); the
  // zero-filled work copy lets the groups be cut off one after another.
  char work[16] = {};
  const size_t length = static_cast<size_t>(end - text);
  memcpy(work, text, length < sizeof work - 1 ? length : sizeof work - 1);

  bool fractionTooLong = false;
  if (work[6] == '.') {
    const char* fraction = work + 7;
    if (OEUtility::AscToUInt(fraction, &m_milliseconds, 0, 3) != OE_PARSE_OK)
      return Fail(OEPW_BADFORMAT, kTimeWhere, text);
    // Of the (at most five) digits read, a non-zero one before the last three
    // makes a value of 1000 or more, which the 16-bit reader could wrap.
    size_t digitsRead = strlen(fraction);
    if (digitsRead > 5) digitsRead = 5;
    for (size_t i = 0; i + 3 < digitsRead; ++i) fractionTooLong |= fraction[i] != '0';
    work[6] = '\0';
  }
  static const DigitGroup kGroups[] = {
      {4, 2, &OEDateTimeBase::m_second}, {2, 2, &OEDateTimeBase::m_minute}, {0, 2, &OEDateTimeBase::m_hour}};
  if (!ReadDigitGroups(*this, work, kGroups, sizeof kGroups / sizeof kGroups[0]))
    return Fail(OEPW_BADFORMAT, kTimeWhere, text);
  if (fractionTooLong || !IsValidTime()) return Fail(OEPW_OUTOFRANGE, kTimeWhere, text);
  return 1;
}

namespace {
// n decimal digits at p; false at anything else.
inline bool ReadFixedDigits(const char* p, int n, unsigned short* out) {
  unsigned value = 0;
  for (int i = 0; i < n; ++i) {
    const unsigned digit = static_cast<unsigned char>(p[i]) - unsigned{'0'};
    if (digit > 9) return false;
    value = value * 10 + digit;
  }
  *out = static_cast<unsigned short>(value);
  return true;
}
}  // namespace

// Nearly every date of a file has one of three forms: YYYYMMDD,
// YYYYMMDDHHMMSS or YYYYMMDDHHMMSS.XXX, with or without a zone. These are
// read directly; -1 for any other text, which the general reader takes
// (as it does a value out of range, so that its warning is the one logged).
int OEDateTime::ReadCommonForm(const char* text) {
  size_t n = 0;
  while (n < 19 && text[n] != '\0' && text[n] != '[') ++n;
  if (n != 8 && n != 14 && !(n == 18 && text[14] == '.')) return -1;
  unsigned short year, month, day, hour = 0, minute = 0, second = 0, millis = 0;
  if (!ReadFixedDigits(text, 4, &year) || !ReadFixedDigits(text + 4, 2, &month) ||
      !ReadFixedDigits(text + 6, 2, &day))
    return -1;
  if (n >= 14 && (!ReadFixedDigits(text + 8, 2, &hour) || !ReadFixedDigits(text + 10, 2, &minute) ||
                  !ReadFixedDigits(text + 12, 2, &second)))
    return -1;
  if (n == 18 && !ReadFixedDigits(text + 15, 3, &millis)) return -1;
  if (text[n] != '\0' && text[n] != '[') return -1;
  InitOEDateTime();
  if (text[n] == '[' && !ExtractTimeZone(text + n)) return 0;  // it has logged its own warning
  m_year = year;
  m_month = month;
  m_day = day;
  m_hour = hour;
  m_minute = minute;
  m_second = second;
  m_milliseconds = millis;
  return IsValidTime() && IsValidDate() ? 1 : -1;
}

unsigned short OEDateTime::ConvertStringToOEDateTime(const char* text) {
  if (text) {
    const int common = ReadCommonForm(text);
    if (common >= 0) return static_cast<unsigned short>(common);
  }
  size_t dateLength = 0;
  while (text != nullptr && dateLength < 8 && text[dateLength] != '\0') ++dateLength;
  if (dateLength < 8) {
    InitOEDateTime();
    return text ? Fail(OEPW_BADFORMAT, kDateWhere, text) : Fail(OEPW_NULLPOINTER, kDateWhere, "");
  }
  if (!ReadTimeOfDay(text + 8)) return 0;  // it has logged its own warning

  char work[9];
  memcpy(work, text, 8);
  work[8] = '\0';
  static const DigitGroup kGroups[] = {
      {6, 2, &OEDateTime::m_day}, {4, 2, &OEDateTime::m_month}, {0, 4, &OEDateTime::m_year}};
  if (!ReadDigitGroups(*this, work, kGroups, sizeof kGroups / sizeof kGroups[0]))
    return Fail(OEPW_BADFORMAT, kDateWhere, text);
  if (!IsValidDate()) return Fail(OEPW_OUTOFRANGE, kDateWhere, text);
  return 1;
}

unsigned short OETime::ConvertStringToOETime(const char* text) { return ReadTimeOfDay(text); }

// ---------------------------------------------------------------------------
// Writing text

unsigned short OEDateTimeBase::TextRoom(unsigned short minimum) const {
  // The longest fixed part is a five-digit year, time, fraction and "[-12:]".
  const size_t room = 32u + m_zoneLength;
  if (room > 0xFFFFu) return 0;
  return room < minimum ? minimum : static_cast<unsigned short>(room);
}

char* OEDateTimeBase::WriteTimeOfDay(char* p, bool withFraction, bool withZone) const {
  p = PutDigits(p, m_hour, 2);
  p = PutDigits(p, m_minute, 2);
  p = PutDigits(p, m_second, 2);
  if (withFraction) {
    *p++ = '.';
    p = PutDigits(p, m_milliseconds, 3);
  }
  if (withZone) {
    *p++ = '[';
    if (m_timeZoneOffset < 0) *p++ = '-';
    p = PutDigits(p, static_cast<unsigned>(m_timeZoneOffset < 0 ? -m_timeZoneOffset : m_timeZoneOffset), 1);
    if (m_zoneLength) {
      *p++ = ':';
      memcpy(p, ZoneName(), m_zoneLength);
      p += m_zoneLength;
    }
    *p++ = ']';
  }
  return p;
}

unsigned short OEDateTime::GetDateString(OEString& out) const {
  if (!IsValidDate() || !IsValidTime()) return 0;
  const unsigned short room = TextRoom(40);
  char* text = room ? out.LockBuffer(room) : nullptr;
  if (text == nullptr) return 0;
  char* p = PutDigits(text, m_year, 4);
  p = PutDigits(p, m_month, 2);
  p = PutDigits(p, m_day, 2);
  const bool withZone = m_timeZoneOffset != 0;
  const bool withFraction = m_milliseconds != 0 || withZone;
  if (withFraction || m_hour != 0 || m_minute != 0 || m_second != 0) p = WriteTimeOfDay(p, withFraction, withZone);
  *p = '\0';
  out.UnlockBuffer();
  return 1;
}

unsigned short OETime::GetTimeString(OEString& out) const {
  if (!IsValidTime()) return 0;
  const unsigned short room = TextRoom(32);
  char* text = room ? out.LockBuffer(room) : nullptr;
  if (text == nullptr) return 0;
  *WriteTimeOfDay(text, m_milliseconds != 0, m_timeZoneOffset != 0) = '\0';
  out.UnlockBuffer();
  return 1;
}

// ---------------------------------------------------------------------------
// Calendar

unsigned short OEDateTimeBase::IsLeapYear(unsigned short year) { return static_cast<unsigned short>(LeapIndex(year)); }

unsigned short OEDateTimeBase::DaysInMonth(unsigned short month, unsigned short year) {
  if (month < 1 || month > 12) return 0;
  const unsigned short* before = kDaysBefore[LeapIndex(year)];
  return static_cast<unsigned short>(before[month] - before[month - 1]);
}

unsigned short OEDateTimeBase::SetDay(unsigned short dayOfYear, unsigned short year) {
  const unsigned short* before = kDaysBefore[LeapIndex(year)];
  if (dayOfYear == 0 || dayOfYear > before[12]) return 0;
  unsigned short month = 1;
  while (before[month] < dayOfYear) ++month;
  m_year = year;
  m_month = month;
  m_day = static_cast<unsigned short>(dayOfYear - before[month - 1]);
  return 1;
}

unsigned short OEDateTimeBase::IsValidTime() const {
  return m_hour <= 23 && m_minute <= 59 && m_second <= 59 && m_milliseconds <= 999 && m_timeZoneOffset >= -12 &&
         m_timeZoneOffset <= 12;
}

unsigned short OEDateTime::IsValidDate() const { return m_day >= 1 && m_day <= DaysInMonth(); }

// ---------------------------------------------------------------------------
// Instants

int64_t OEDateTimeBase::MillisSinceEpoch() const {
  // A month outside 1-12 (an unset or damaged value) is carried into the year
  // so that every value still has a place in time.
  int64_t year = m_year;
  int64_t month = m_month;
  if (month < 1 || month > 12) {
    year += FloorDiv(month - 1, 12);
    month -= 12 * FloorDiv(month - 1, 12);
  }
  const int64_t days = DaysBeforeYear(year) + kDaysBefore[LeapIndex(year)][month - 1] + m_day - 1;
  const int64_t hours = days * 24 + m_hour - m_timeZoneOffset;
  return ((hours * 60 + m_minute) * 60 + m_second) * 1000 + m_milliseconds;
}

unsigned short OEDateTimeBase::SetFromMillis(int64_t millis) {
  const int64_t days = FloorDiv(millis, kMillisPerDay);
  if (days < DaysBeforeYear(kFirstYear) || days >= DaysBeforeYear(kLastYear + 1)) return 0;
  // Estimate the year from the mean Gregorian year, then settle it exactly.
  int64_t year = 1970 + FloorDiv(days * 400, kDaysPer400Years);
  while (DaysBeforeYear(year) > days) --year;
  while (DaysBeforeYear(year + 1) <= days) ++year;
  SetDay(static_cast<unsigned short>(days - DaysBeforeYear(year) + 1), static_cast<unsigned short>(year));
  int64_t rest = millis - days * kMillisPerDay;
  m_hour = static_cast<unsigned short>(rest / 3600000);
  rest %= 3600000;
  m_minute = static_cast<unsigned short>(rest / 60000);
  rest %= 60000;
  m_second = static_cast<unsigned short>(rest / 1000);
  m_milliseconds = static_cast<unsigned short>(rest % 1000);
  return 1;
}

int OEDateTimeBase::compareDateTime(const OEDateTimeBase& other) const {
  const int64_t a = MillisSinceEpoch();
  const int64_t b = other.MillisSinceEpoch();
  return (a > b) - (a < b);
}

int64_t OEDateTimeBase::GetTimeT64() const { return FloorDiv(MillisSinceEpoch() - m_milliseconds, 1000); }

int32_t OEDateTimeBase::GetTimeT() const {
  if (m_year < 1902) return INT32_MIN;
  const int64_t t = GetTimeT64();
  if (t > INT32_MAX) return INT32_MAX;
  return t < INT32_MIN ? INT32_MIN : static_cast<int32_t>(t);
}

unsigned short OEDateTimeBase::SetTimeT64(int64_t t) {
  constexpr int64_t kLimit = int64_t{1} << 50;  // far beyond the years 0-9999
  if (t <= -kLimit || t >= kLimit || !SetFromMillis(t * 1000)) return 0;
  m_timeZoneOffset = 0;
  return 1;
}

int32_t OEDateTimeBase::LocalTimeZoneOffset() {
  const time_t day = 86400;
  struct tm broken;
#ifdef _WIN32
  if (gmtime_s(&broken, &day) != 0) return 0;
#else
  if (gmtime_r(&day, &broken) == nullptr) return 0;
#endif
  broken.tm_isdst = 0;
  const time_t local = mktime(&broken);
  return local == static_cast<time_t>(-1) ? 0 : static_cast<int32_t>(local - day);
}

OEPrecisionInteger OEDateTimeBase::GetGMT() const { return FromMillis(MillisSinceEpoch()); }

unsigned short OEDateTimeBase::FromPrecInt(const OEPrecisionInteger& seconds) {
  int64_t millis = 0;
  if (ToMillis(seconds, &millis) && SetFromMillis(millis)) return 1;
  m_year = m_month = m_day = m_hour = m_minute = m_second = m_milliseconds = 0;
  return 0;
}

OEPrecisionInteger OEDateTimeBase::SecondsBetween(const OEDateTimeBase& other) const {
  return FromMillis(MillisSinceEpoch() - other.MillisSinceEpoch());
}

OEDateTimeBase OEDateTimeBase::TimeBetween(const OEDateTimeBase& other) const {
  int64_t difference = MillisSinceEpoch() - other.MillisSinceEpoch();
  if (difference < 0) difference = -difference;
  const int64_t days = difference / kMillisPerDay;
  OEDateTimeBase result;
  result.SetFromMillis(difference - days * kMillisPerDay);  // the time of day of 1 January 1970
  result.m_year = result.m_month = 0;
  result.m_day = static_cast<unsigned short>(days > 0xFFFF ? 0xFFFF : days);
  return result;
}

// ---------------------------------------------------------------------------
// Arithmetic

unsigned short OEDateTimeBase::operator+=(int32_t seconds) {
  const unsigned short milliseconds = m_milliseconds;
  if (!SetTimeT64(GetTimeT64() + seconds)) return 0;
  m_milliseconds = milliseconds;
  ClearTimeZoneName();
  return 1;
}

unsigned short OEDateTimeBase::operator+=(const OEPrecisionInteger& seconds) {
  const unsigned short result = FromPrecInt(GetGMT() + seconds);
  m_timeZoneOffset = 0;
  ClearTimeZoneName();
  return result;
}

unsigned short OEDateTimeBase::operator+=(const OEDateTimeBase& amount) {
  // Adds one field; a sum above `length` - 1 (or, for days and months, above
  // `length`) carries one into the next field and has `length` taken off.
  unsigned carry = 0;
  auto add = [&carry](unsigned short& field, unsigned addend, unsigned largest, unsigned length) {
    const unsigned sum = field + addend + carry;
    carry = sum > largest ? 1 : 0;
    field = static_cast<unsigned short>(carry ? sum - length : sum);
  };
  add(m_milliseconds, amount.m_milliseconds, 999, 1000);
  add(m_second, amount.m_second, 59, 60);
  add(m_minute, amount.m_minute, 59, 60);
  add(m_hour, amount.m_hour, 23, 24);
  const unsigned monthLength = DaysInMonth(m_month, m_year);
  add(m_day, amount.m_day, monthLength ? monthLength : ~0u, monthLength);
  add(m_month, amount.m_month, 12, 12);
  const unsigned year = m_year + amount.m_year + carry;
  if (year > static_cast<unsigned>(kLastYear)) return 0;
  m_year = static_cast<unsigned short>(year);
  return 1;
}

// ---------------------------------------------------------------------------
// Binary record

char* OEDateTimeBase::LockBuffer() {
  char* block = OESideBlockFor(this, kBinaryBlockSize);
  if (block == nullptr) g_allocFailed = 1;
  m_hasBinary = block != nullptr;
  return block;
}

void OEDateTimeBase::UnLockBuffer() {
  if (!m_hasBinary) return;
  OEFreeSideBlock(this);
  m_hasBinary = 0;
}

void OEDateTimeBase::ExportBinary(void* dest, unsigned short* len) const {
  if (dest == nullptr) {
    if (len) *len = 0;
    return;
  }
  char* record = static_cast<char*>(dest);
  const RecordLayout& layout = kLayouts[kBinaryVersion - 1];
  const unsigned short values[kRecordFields] = {m_year,   m_month,  m_day,          m_hour,
                                                m_minute, m_second, m_milliseconds,
                                                static_cast<unsigned short>(m_timeZoneOffset)};
  OEUtility::PackShort(record, kBinaryVersion);
  for (int i = 0; i < kRecordFields; ++i) {
    if (layout.width[i] == 1)
      OEUtility::PackByte(record + layout.offset[i], static_cast<char>(values[i]));
    else
      OEUtility::PackShort(record + layout.offset[i], values[i]);
  }
  const char* name = m_zoneLength == 0 ? m_timeZoneNotInitialized : ZoneName();
  char* nameField = record + layout.offset[kRecordFields];
  int copied = 0;
  for (; copied < kRecordNameLen && name[copied] != '\0'; ++copied) nameField[copied] = name[copied];
  memset(nameField + copied, 0, static_cast<size_t>(kRecordNameLen - copied));
  record[kBinaryRecordLen] = '\0';
  if (len) *len = kBinaryRecordLen + 1;
}

unsigned short OEDateTimeBase::ImportBinary(const void* src) {
  if (src == nullptr) return 0;
  const char* record = static_cast<const char*>(src);
  const unsigned short version = OEUtility::UnPackShort(record);
  const RecordLayout* layout = nullptr;
  for (const RecordLayout& candidate : kLayouts)
    if (candidate.version == version) layout = &candidate;
  if (layout == nullptr) return 0;
  unsigned short values[kRecordFields];
  for (int i = 0; i < kRecordFields; ++i) {
    const char* at = record + layout->offset[i];
    values[i] = layout->width[i] == 1 ? static_cast<unsigned char>(OEUtility::UnPackByte(at))
                                      : OEUtility::UnPackShort(at);
  }
  m_year = values[0];
  m_month = values[1];
  m_day = values[2];
  m_hour = values[3];
  m_minute = values[4];
  m_second = values[5];
  m_milliseconds = values[6];
  m_timeZoneOffset = static_cast<short>(values[7]);
  const char* name = record + layout->offset[kRecordFields];
  unsigned short nameLength = 0;
  while (nameLength < kRecordNameLen && name[nameLength] != '\0') ++nameLength;
  // "***" marks a record written from a value without a zone name: the name
  // this value already holds stays.
  if (nameLength == 3 && memcmp(name, m_timeZoneNotInitialized, 3) == 0) return 1;
  if (nameLength == 0)
    ClearTimeZoneName();
  else
    AssignTimeZoneName(name, nameLength);
  return 1;
}

// ---------------------------------------------------------------------------
// The two text forms

OEDateTime::OEDateTime(short year, short month, short day, short hour, short minute, short second,
                       short milliseconds)
    : OEDateTimeBase(static_cast<unsigned short>(year), static_cast<unsigned short>(month),
                     static_cast<unsigned short>(day), static_cast<unsigned short>(hour),
                     static_cast<unsigned short>(minute), static_cast<unsigned short>(second),
                     static_cast<unsigned short>(milliseconds)) {}

OEDateTime::OEDateTime(const char* text) { ConvertStringToOEDateTime(text); }

OEDateTime::OEDateTime(const OEPrecisionInteger& seconds) { FromPrecInt(seconds); }

unsigned short OEDateTime::operator=(const char* text) { return ConvertStringToOEDateTime(text); }

OETime::OETime(short hour, short minute, short second, short milliseconds)
    : OEDateTimeBase(0, 0, 0, static_cast<unsigned short>(hour), static_cast<unsigned short>(minute),
                     static_cast<unsigned short>(second), static_cast<unsigned short>(milliseconds)) {}

OETime::OETime(const char* text) { ConvertStringToOETime(text); }

unsigned short OETime::operator=(const char* text) { return ConvertStringToOETime(text); }
