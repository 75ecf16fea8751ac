#include "ofxkit/types/OEDataConversion.h"

#include <cstring>
#include <limits>
#include <type_traits>

#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEDateTime.h"
#include "ofxkit/types/OELanguage.h"
#include "ofxkit/types/OEPrecisionInteger.h"

// The text tables, indexed by enum value.
#define OE_ENUM(TYPE, NAME, TABLE, FIRST) const char* const OEDataConversion::TABLE[] = {
#define OE_ENUM_VALUE(SYM, TEXT) TEXT,
#define OE_ENUM_EXTRA(SYM, NUMBER)
#define OE_ENUM_END(TYPE) \
  }                       \
  ;
#include "ofxkit/types/OEDataConversion.def"

// The per-enumeration conversions, all through the typed generic forms.
#define OE_ENUM(TYPE, NAME, TABLE, FIRST)                                                \
  static_assert(FIRST < OEEnumTraits<TYPE>::kCount, "first matched value out of table"); \
  unsigned short OEDataConversion::NAME##ToString(TYPE value, OEString& out) {           \
    return ToString(value, out);                                                         \
  }                                                                                      \
  unsigned short OEDataConversion::StringTo##NAME(const OEString& text, TYPE& value) {   \
    return FromString(text, value);                                                      \
  }
#define OE_ENUM_VALUE(SYM, TEXT)
// Text-less enumerators must stay clear of the numbering of the texts.
#define OE_ENUM_EXTRA(SYM, NUMBER) static_assert(SYM < 0, "extra enumerators are negative");
#define OE_ENUM_END(TYPE)
#include "ofxkit/types/OEDataConversion.def"

const char* const OEDataConversion::m_booleanType[2] = {"N", "Y"};

namespace {

const OEString kNoText;

inline unsigned char FoldCase(unsigned char c) {
  return (c >= 'a' && c <= 'z') ? static_cast<unsigned char>(c - ('a' - 'A')) : c;
}

// Whether the `length` bytes at text spell entry, ignoring ASCII case.
inline bool SameTextIgnoringCase(const char* text, size_t length, const char* entry) {
  for (size_t i = 0; i < length; ++i) {
    const unsigned char e = static_cast<unsigned char>(entry[i]);
    if (e == '\0' || FoldCase(static_cast<unsigned char>(text[i])) != FoldCase(e)) return false;
  }
  return entry[length] == '\0';
}

// Copies text into out, keeping out's own spec length. Fails only when the
// copy cannot be allocated.
unsigned short CopyText(const char* text, size_t length, OEString& out) {
  out.Assign(text, length);
  return out.GetStrLength() == length;
}

inline void LogBadText(OEParseWarning warning, const OEString& text) {
  OELogWarning(warning, text, kNoText, OE_TAG_NONE);
}

// Reads text as a whole number whose magnitude fits T (for signed T the
// magnitude must be below 2^(bits-1), for unsigned below 2^bits). Signed forms
// receive the signed value, unsigned forms the magnitude.
template <typename T>
unsigned short ReadInteger(const OEString& text, T& value) {
  constexpr uint64_t kLimit = static_cast<uint64_t>(std::numeric_limits<T>::max()) + 1;
  OEPrecisionInteger amount;
  if (!amount.ConvertStringToOEPrecisionInteger(text.c_str())) return 0;  // already logged
  if (amount.Decimal() > 0) {
    if (!amount.Fraction().IsZero()) {
      LogBadText(OEPW_BADFORMAT, text);
      return 0;
    }
    amount = amount.Integer();
  }
  if (!amount.FitInAULong() || amount.GetOEULong() >= kLimit) {
    LogBadText(OEPW_OUTOFRANGE, text);
    return 0;
  }
  const uint32_t magnitude = amount.GetOEULong();
  if (std::is_signed<T>::value && amount.Sign() < 0)
    value = static_cast<T>(-static_cast<int64_t>(magnitude));
  else
    value = static_cast<T>(magnitude);
  return 1;
}

// Payee and server identifiers: the identifier keeps its spec length and
// takes the whole text.
unsigned short ReadIdentifier(const OEString& text, OEString12& value) {
  value = text;
  if (text.IsEmpty()) return 3;
  if (value.ExceedsSpecLength()) LogBadText(OEPW_TOOLONG, text);
  return 1;
}

}  // namespace

OEDataConversion::~OEDataConversion() = default;

int32_t OEDataConversion::FindText(const char* text, size_t length, unsigned short first, unsigned short last,
                                   const char* const* table) {
  if (!table || (length > 0 && !text)) return -1;
  // Most texts differ in their first letter: compare that before the rest.
  const unsigned char head = length > 0 ? FoldCase(static_cast<unsigned char>(text[0])) : 0;
  for (unsigned short i = first; i <= last; ++i) {
    const char* entry = table[i];
    if (entry && FoldCase(static_cast<unsigned char>(entry[0])) == head && SameTextIgnoringCase(text, length, entry))
      return i;
    if (i == last) break;  // last may be 65535
  }
  return -1;
}

unsigned short OEDataConversion::ValueToString(int32_t value, OEString& out, int32_t first, int32_t last,
                                               const char* const* table) {
  if (table && value >= first && value <= last && table[value]) {
    const char* text = table[value];
    return CopyText(text, strlen(text), out);
  }
  LogBadText(OEPW_BADFORMAT, out);
  out.Assign(nullptr, 0);
  return 0;
}

unsigned short OEDataConversion::StringToValue(const OEString& text, int32_t& value, unsigned short first,
                                               unsigned short last, const char* const* table) {
  const int32_t found = FindText(text.c_str(), text.GetStrLength(), first, last, table);
  if (found < 0) {
    LogBadText(OEPW_BADFORMAT, text);
    return 0;
  }
  value = found;
  return 1;
}

unsigned short OEDataConversion::EnumToString(unsigned short value, OEString& out, unsigned short first,
                                              unsigned short last, const char* const* table) {
  return ValueToString(value, out, first, last, table);
}

unsigned short OEDataConversion::StringToEnum(const OEString& text, unsigned short& value, unsigned short first,
                                              unsigned short last, const char* const* table) {
  int32_t found = 0;
  if (!StringToValue(text, found, first, last, table)) return 0;
  value = static_cast<unsigned short>(found);
  return 1;
}

unsigned short OEDataConversion::BooleanToString(unsigned short value, OEString& out) {
  if (value > 1) {
    LogBadText(OEPW_BADFORMAT, out);
    return 0;
  }
  return CopyText(m_booleanType[value], 1, out);
}

unsigned short OEDataConversion::StringToBoolean(const OEString& text, unsigned short& value) {
  if (text.GetStrLength() == 1) {
    const char c = text.c_str()[0];
    if (c == m_booleanType[0][0] || c == m_booleanType[1][0]) {
      value = c == m_booleanType[1][0];
      return 1;
    }
  }
  LogBadText(OEPW_BADFORMAT, text);
  return 0;
}

unsigned short OEDataConversion::StringToSShort(const OEString& text, short& value) {
  return ReadInteger(text, value);
}

unsigned short OEDataConversion::StringToUShort(const OEString& text, unsigned short& value) {
  return ReadInteger(text, value);
}

unsigned short OEDataConversion::StringToSLong(const OEString& text, int32_t& value) {
  return ReadInteger(text, value);
}

unsigned short OEDataConversion::StringToULong(const OEString& text, uint32_t& value) {
  return ReadInteger(text, value);
}

unsigned short OEDataConversion::StringToAmount(const OEString& text, OEPrecisionInteger& value) {
  return value.ConvertStringToOEPrecisionInteger(text.c_str());
}

unsigned short OEDataConversion::StringToRate(const OEString& text, OEPercent& value) {
  return value.ConvertStringToOEPrecisionInteger(text.c_str());
}

unsigned short OEDataConversion::DateTimeToString(const OEDateTime& value, OEString& out) {
  return value.GetDateString(out);
}

unsigned short OEDataConversion::TimeToString(const OETime& value, OEString& out) { return value.GetTimeString(out); }

unsigned short OEDataConversion::StringToDateTime(const OEString& text, OEDateTime& value) {
  return value.ConvertStringToOEDateTime(text.c_str());
}

unsigned short OEDataConversion::StringToTime(const OEString& text, OETime& value) {
  return value.ConvertStringToOETime(text.c_str());
}

unsigned short OEDataConversion::LanguageToString(const OELanguage& value, OEString& out) {
  const OEString& code = value.GetString();
  CopyText(code.c_str(), code.GetStrLength(), out);
  return 1;
}

unsigned short OEDataConversion::StringToLanguage(const OEString& text, OELanguage& value) {
  value = text;
  if (value.IsValid()) return 1;
  LogBadText(OEPW_TOOLONG, text);
  return 0;
}

unsigned short OEDataConversion::PayeeIDToString(const OEString12& value, OEString& out) {
  return CopyText(value.c_str(), value.GetStrLength(), out);
}

unsigned short OEDataConversion::ServerIDToString(const OEString12& value, OEString& out) {
  return CopyText(value.c_str(), value.GetStrLength(), out);
}

unsigned short OEDataConversion::StringToPayeeID(const OEString& text, OEString12& value) {
  return ReadIdentifier(text, value);
}

unsigned short OEDataConversion::StringToServerID(const OEString& text, OEString12& value) {
  return ReadIdentifier(text, value);
}
