// OFX dates and times: the date-time form YYYYMMDDHHMMSS.XXX[offset:zone] and
// the time-of-day form HHMMSS.XXX[offset:zone], held as broken-down fields
// with a whole-hour offset east of GMT and an optional three-letter zone name.
//
// The fields are local time at the given offset: the instant in GMT is the
// fields minus the offset. Conversions report malformed texts to the parse log
// (OEPW_BADFORMAT, OEPW_OUTOFRANGE, OEPW_NULLPOINTER) and return 0; nothing
// throws. Reading a text allocates nothing: a zone name of up to seven
// characters (every name OFX text can carry) is kept inside the value.
#pragma once

#include <cstdint>
#include <cstdlib>
#include <cstring>

#include "ofxkit/types/OEPrecisionInteger.h"
#include "ofxkit/types/OEString.h"

class OEDateTimeBase {
 public:
  // Size of the block handed out by LockBuffer.
  static constexpr unsigned short kBinaryBlockSize = 30;
  // Version of the binary record written by ExportBinary (versions 1 to 3 are read).
  static constexpr unsigned short kBinaryVersion = 3;
  // Bytes of a version 3 record; ExportBinary also writes a closing nul and
  // reports kBinaryRecordLen + 1.
  static constexpr unsigned short kBinaryRecordLen = 18;
  // Zone name stored in a binary record whose value has no zone name.
  static const char* const m_timeZoneNotInitialized;

  OEDateTimeBase();
  OEDateTimeBase(const OEDateTimeBase& other);
  virtual ~OEDateTimeBase() {
    if (m_hasBinary) UnLockBuffer();
    if (m_zoneLength > kZoneInline) free(ZoneHeap());
  }

  // The base reads no text form: returns 0 and does nothing.
  virtual unsigned short operator=(const char* text);
  // The value as OFX text (date-time or time of day); 0 in the base.
  virtual unsigned short GetText(OEString& out) const;

  // Copies every field and the zone name (not the binary block); returns 1.
  unsigned short operator=(const OEDateTimeBase& other);
  // From time_t: the fields become that instant in GMT with offset 0 and no
  // milliseconds; the zone name is left as it was. Returns 0, changing
  // nothing, when the year would fall outside 0-9999.
  unsigned short operator=(int32_t t);
  // From a second count (see FromPrecInt).
  unsigned short operator=(const OEPrecisionInteger& seconds);

  // ---- Fields
  unsigned short GetYear() const { return m_year; }
  unsigned short GetMonth() const { return m_month; }
  unsigned short GetDay() const { return m_day; }
  unsigned short GetHour() const { return m_hour; }
  unsigned short GetMinute() const { return m_minute; }
  unsigned short GetSecond() const { return m_second; }
  unsigned short GetMilliseconds() const { return m_milliseconds; }
  short GetTimeZoneOffset() const { return m_timeZoneOffset; }
  // A copy of the zone name, limited to three characters like the names OFX
  // text carries ("" when there is none).
  OEString3 GetTimeZoneName() const;
  void SetYear(unsigned short year) { m_year = year; }
  void SetMonth(unsigned short month) { m_month = month; }
  void SetDayOfMonth(unsigned short day) { m_day = day; }
  void SetHour(unsigned short hour) { m_hour = hour; }
  void SetMinute(unsigned short minute) { m_minute = minute; }
  void SetSecond(unsigned short second) { m_second = second; }
  void SetMilliseconds(unsigned short milliseconds) { m_milliseconds = milliseconds; }

  // ---- Time zone
  // Stores both as given and returns 1. For offsets -4 to -8 a non-empty name
  // that is neither the standard nor the daylight name of that offset (EST or
  // CDT for -5, compared without regard to case) logs OEPW_BADFORMAT
  // "SetTimeZone (time zone mismatch". A null name counts as "".
  unsigned short SetTimeZone(const char* name, short offset);

  // ---- Numbers
  // Seconds since 1 January 1970 GMT as a 32-bit time_t. Years before 1902
  // give INT32_MIN; instants beyond the 32-bit range are clamped to it.
  int32_t GetTimeT() const;
  // The same over the whole range of years, without the 1902 limit.
  int64_t GetTimeT64() const;
  // From a 64-bit time_t, as operator=(int32_t).
  unsigned short SetTimeT64(int64_t t);
  // Seconds since 1 January 1970 GMT (negative before), with 3 decimals.
  // The count follows the Gregorian calendar exactly, so differences and
  // comparisons are exact and FromPrecInt is its inverse.
  OEPrecisionInteger GetGMT() const;
  // Sets date and time (GMT fields) from a second count; fractions are
  // milliseconds (truncated). Offset and zone name are left unchanged. When the
  // count lies outside the years 0-9999 the date and time fields become 0 and
  // the result is 0.
  unsigned short FromPrecInt(const OEPrecisionInteger& seconds);
  // this.GetGMT() - other.GetGMT(), seconds with 3 decimals.
  OEPrecisionInteger SecondsBetween(const OEDateTimeBase& other) const;
  // The absolute difference as counts: whole days in the day field (at most
  // 65535), then hours, minutes, seconds and milliseconds; year, month and
  // offset 0, no zone name.
  OEDateTimeBase TimeBetween(const OEDateTimeBase& other) const;
  // The seconds that local time lies behind GMT (18000 in New York in winter),
  // from the C library's local time rules at 2 January 1970.
  static int32_t LocalTimeZoneOffset();

  // ---- Arithmetic
  // The instant moved by a count of seconds; the zone becomes GMT (offset 0,
  // no name). Returns 1, or 0 (nothing changed) outside the years 0-9999.
  unsigned short operator+=(int32_t seconds);
  // FromPrecInt(GetGMT() + seconds); the zone becomes GMT. Returns 1.
  unsigned short operator+=(const OEPrecisionInteger& seconds);
  // Adds the amount's fields as counts from milliseconds up, each carrying at
  // most once into the next larger field (a day beyond the current month's
  // length carries a month). A year above 9999 fails: result 0 with the year
  // unchanged (the smaller fields keep their sums).
  unsigned short operator+=(const OEDateTimeBase& amount);

  // ---- Comparison of instants (offsets applied)
  unsigned short operator==(const OEDateTimeBase& other) const { return compareDateTime(other) == 0; }
  unsigned short operator!=(const OEDateTimeBase& other) const { return compareDateTime(other) != 0; }
  unsigned short operator>(const OEDateTimeBase& other) const { return compareDateTime(other) > 0; }
  unsigned short operator<(const OEDateTimeBase& other) const { return compareDateTime(other) < 0; }
  unsigned short operator>=(const OEDateTimeBase& other) const { return compareDateTime(other) >= 0; }
  unsigned short operator<=(const OEDateTimeBase& other) const { return compareDateTime(other) <= 0; }

  // ---- Calendar
  static unsigned short IsLeapYear(unsigned short year);
  // 28-31, or 0 for a month outside 1-12.
  static unsigned short DaysInMonth(unsigned short month, unsigned short year);
  // Sets year, month and day from a day of the year (1 = 1 January). Returns 0,
  // changing nothing, for 0 or a day beyond the year's length.
  unsigned short SetDay(unsigned short dayOfYear, unsigned short year);
  // Hour <= 23, minute <= 59, second <= 59, milliseconds <= 999 and offset
  // from -12 to 12.
  unsigned short IsValidTime() const;
  // Sets year, month, day, hour, minute and second to 0.
  void Invalidate();

  // ---- Binary record (little-endian, version 3 written, 1 to 3 read)
  // A kBinaryBlockSize-byte block owned by the object, allocated once; null
  // with g_allocFailed set when it cannot be had.
  char* LockBuffer();
  void UnLockBuffer();
  // Writes the record and its closing nul to dest and sets *len to 19; with a
  // null dest sets *len to 0.
  void ExportBinary(void* dest, unsigned short* len) const;
  // Takes the fields of a version 1, 2 or 3 record and returns 1; any other
  // record (or null) changes nothing and returns 0. The zone name "***" reads
  // as no name.
  unsigned short ImportBinary(const void* src);

 protected:
  OEDateTimeBase(unsigned short year, unsigned short month, unsigned short day, unsigned short hour,
                 unsigned short minute, unsigned short second, unsigned short milliseconds);

  // Reads a zone "[offset:name]" into the offset and name. A null or empty
  // text succeeds unchanged. Returns 0 on a malformed zone.
  unsigned short ExtractTimeZone(const char* text);
  // Every field 0, zone name "", offset 0.
  void InitOEDateTime();
  // -1, 0 or 1 as this instant lies before, at or after the other.
  int compareDateTime(const OEDateTimeBase& other) const;

  // The time-of-day reader shared by both text forms.
  unsigned short ReadTimeOfDay(const char* text);
  // Appends "HHMMSS", the optional ".XXX" and the optional zone at p; returns
  // the end.
  char* WriteTimeOfDay(char* p, bool withFraction, bool withZone) const;
  // Room a text of this value needs, nul included, for `fixed` characters
  // before the zone.
  unsigned short TextRoom(unsigned short fixed) const;

  unsigned short m_year;
  unsigned short m_month;
  unsigned short m_day;
  unsigned short m_hour;
  unsigned short m_minute;
  unsigned short m_second;
  unsigned short m_milliseconds;
  short m_timeZoneOffset;
  // The zone name: its characters sit in m_zone while there are at most
  // kZoneInline of them (nul-terminated); a longer name given to SetTimeZone
  // is on the heap and m_zone holds its address. This keeps a date at 40
  // bytes, which matters in trees of many thousand transactions.
  static constexpr unsigned short kZoneInline = 7;
  unsigned short m_zoneLength;
  char m_zone[kZoneInline + 1];
  // Whether the block of LockBuffer exists. It is kept beside the value, so
  // that a date is 40 bytes.
  uint8_t m_hasBinary;

  const char* ZoneName() const { return m_zoneLength > kZoneInline ? ZoneHeap() : m_zone; }

 private:
  // Milliseconds since 1 January 1970 GMT of the fields at their offset.
  int64_t MillisSinceEpoch() const;
  // Sets the date and time fields from a GMT millisecond count; returns 0
  // (changing nothing) outside the years 0-9999.
  unsigned short SetFromMillis(int64_t millis);
  unsigned short SetTimeZone(const char* name, unsigned short nameLength, short offset, bool mayWarn);
  void ClearTimeZoneName();
  // Stores a name of length characters (not 0) at name.
  void AssignTimeZoneName(const char* name, unsigned short length);
  char* ZoneHeap() const {
    char* p;
    memcpy(&p, m_zone, sizeof p);
    return p;
  }
};

class OEDateTime : public OEDateTimeBase {
 public:
  OEDateTime() = default;
  OEDateTime(short year, short month, short day, short hour = 0, short minute = 0, short second = 0,
             short milliseconds = 0);
  explicit OEDateTime(const char* text);
  explicit OEDateTime(const OEPrecisionInteger& seconds);
  OEDateTime(const OEDateTime& other) = default;

  using OEDateTimeBase::operator=;
  // Reads the date-time form (ConvertStringToOEDateTime).
  unsigned short operator=(const char* text) override;
  unsigned short operator=(const OEDateTime& other) { return OEDateTimeBase::operator=(other); }
  unsigned short GetText(OEString& out) const override { return GetDateString(out); }

  // Reads YYYYMMDD followed by an optional time of day (see
  // OETime::ConvertStringToOETime), e.g. 20000201093000.000[-5:EST]. Returns 1,
  // or 0 after logging a warning.
  unsigned short ConvertStringToOEDateTime(const char* text);
  // Writes YYYYMMDD, then HHMMSS when any of the time or offset is non-zero,
  // then .XXX when the milliseconds or offset are non-zero, then [offset] or
  // [offset:name] when the offset is non-zero. Returns 0, leaving out
  // untouched, when the date or time is not valid.
  unsigned short GetDateString(OEString& out) const;

  using OEDateTimeBase::DaysInMonth;
  // Days of the value's own month.
  unsigned short DaysInMonth() const { return OEDateTimeBase::DaysInMonth(m_month, m_year); }
  // Month 1-12 and day 1 to the length of that month.
  unsigned short IsValidDate() const;

 private:
  int ReadCommonForm(const char* text);
};

class OETime : public OEDateTimeBase {
 public:
  OETime() = default;
  OETime(short hour, short minute, short second = 0, short milliseconds = 0);
  explicit OETime(const char* text);
  OETime(const OETime& other) = default;

  using OEDateTimeBase::operator=;
  // Reads the time-of-day form (ConvertStringToOETime).
  unsigned short operator=(const char* text) override;
  unsigned short operator=(const OETime& other) { return OEDateTimeBase::operator=(other); }
  unsigned short GetText(OEString& out) const override { return GetTimeString(out); }

  // Reads HH, HHMM, HHMMSS or HHMMSS.XXX (one to three fraction digits), each
  // with an optional zone [offset] or [offset:name], or an empty text
  // (midnight). Returns 1, or 0 after logging a warning.
  unsigned short ConvertStringToOETime(const char* text);
  // Writes HHMMSS, then .XXX when the milliseconds are non-zero, then the zone
  // when the offset is non-zero. Returns 0, leaving out untouched, when the
  // time is not valid.
  unsigned short GetTimeString(OEString& out) const;
};
