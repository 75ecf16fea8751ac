// Enumerated OFX values and the conversions between typed values and their
// OFX texts. The builder writes element values through the ...ToString
// functions; the parsers and text setters read them through StringTo....
//
// Every enumeration, its numbering and its texts come from the single list in
// OEDataConversion.def; the enum types, the text tables, the per-enumeration
// conversions and OEEnumTraits are all generated from it.
#pragma once

#include <cstddef>
#include <cstdint>

#include "ofxkit/types/OECommon.h"
#include "ofxkit/types/OEDynamicArray.h"
#include "ofxkit/types/OEString.h"

class OEDateTime;
class OELanguage;
class OEPercent;
class OEPrecisionInteger;
class OETime;

// The enumerations: 32-bit, numbered from 0 in table order.
#define OE_ENUM(TYPE, NAME, TABLE, FIRST) enum TYPE : int32_t {
#define OE_ENUM_VALUE(SYM, TEXT) SYM,
#define OE_ENUM_EXTRA(SYM, NUMBER) SYM = NUMBER,
#define OE_ENUM_END(TYPE) };
#include "ofxkit/types/OEDataConversion.def"

// Static conversions between OFX texts and typed values. Every conversion
// answers 1 on success and 0 on failure (the identifier readers also answer 3
// for an empty text); failures are reported to the shared parse log.
class OEDataConversion {
 public:
  OEDataConversion() {}
  virtual ~OEDataConversion();

  // Generic forms over a table of texts indexed by value. EnumToString accepts
  // values first..last; StringToEnum matches texts first..last in order,
  // ignoring ASCII case.
  static unsigned short EnumToString(unsigned short value, OEString& out, unsigned short first, unsigned short last,
                                     const char* const* table);
  static unsigned short StringToEnum(const OEString& text, unsigned short& value, unsigned short first,
                                     unsigned short last, const char* const* table);
  // The index of the first of table[first..last] equal to the `length` bytes at
  // `text` ignoring ASCII case, or -1. Logs nothing and allocates nothing.
  static int32_t FindText(const char* text, size_t length, unsigned short first, unsigned short last,
                          const char* const* table);

  // Typed generic forms for any enumeration of the list (see OEEnumTraits).
  // Text() answers the OFX text of a value, or null when it has none.
  template <typename E>
  static const char* Text(E value);
  template <typename E>
  static unsigned short ToString(E value, OEString& out);
  template <typename E>
  static unsigned short FromString(const OEString& text, E& value);

  // NameToString(value, out) and StringToName(text, value) per enumeration,
  // and its table of texts.
#define OE_ENUM(TYPE, NAME, TABLE, FIRST)                                \
  static unsigned short NAME##ToString(TYPE value, OEString& out);       \
  static unsigned short StringTo##NAME(const OEString& text, TYPE& value); \
  static const char* const TABLE[];
#define OE_ENUM_VALUE(SYM, TEXT)
#define OE_ENUM_EXTRA(SYM, NUMBER)
#define OE_ENUM_END(TYPE)
#include "ofxkit/types/OEDataConversion.def"

  // Booleans: "N" is 0, "Y" is 1. Reading is case-sensitive.
  static const char* const m_booleanType[2];
  static unsigned short BooleanToString(unsigned short value, OEString& out);
  static unsigned short StringToBoolean(const OEString& text, unsigned short& value);

  // Integers, read as decimal amounts: a zero fraction is dropped, a non-zero
  // one is OEPW_BADFORMAT; a value that does not fit is OEPW_OUTOFRANGE. The
  // unsigned forms store the magnitude.
  static unsigned short StringToSShort(const OEString& text, short& value);
  static unsigned short StringToUShort(const OEString& text, unsigned short& value);
  static unsigned short StringToSLong(const OEString& text, int32_t& value);
  static unsigned short StringToULong(const OEString& text, uint32_t& value);

  static unsigned short StringToAmount(const OEString& text, OEPrecisionInteger& value);
  static unsigned short StringToRate(const OEString& text, OEPercent& value);

  static unsigned short DateTimeToString(const OEDateTime& value, OEString& out);
  static unsigned short TimeToString(const OETime& value, OEString& out);
  static unsigned short StringToDateTime(const OEString& text, OEDateTime& value);
  static unsigned short StringToTime(const OEString& text, OETime& value);

  static unsigned short LanguageToString(const OELanguage& value, OEString& out);
  // Answers whether the code fits its three characters; a longer code is kept
  // whole and logged as OEPW_TOOLONG.
  static unsigned short StringToLanguage(const OEString& text, OELanguage& value);

  // Payee and server identifiers (spec length 12). Reading an empty text
  // answers 3; a longer text is kept whole, logged as OEPW_TOOLONG, answer 1.
  static unsigned short PayeeIDToString(const OEString12& value, OEString& out);
  static unsigned short ServerIDToString(const OEString12& value, OEString& out);
  static unsigned short StringToPayeeID(const OEString& text, OEString12& value);
  static unsigned short StringToServerID(const OEString& text, OEString12& value);

 private:
  // Work of the enum conversions on the full 32-bit value, so that values
  // outside 0..65535 are refused rather than wrapped.
  static unsigned short ValueToString(int32_t value, OEString& out, int32_t first, int32_t last,
                                      const char* const* table);
  static unsigned short StringToValue(const OEString& text, int32_t& value, unsigned short first,
                                      unsigned short last, const char* const* table);
};

// Compile-time description of each enumeration: its number of texts, the first
// value that reading matches, and its table.
template <typename E>
struct OEEnumTraits;

#define OE_ENUM(TYPE, NAME, TABLE, FIRST)                                   \
  template <>                                                               \
  struct OEEnumTraits<TYPE> {                                               \
    static constexpr unsigned short kFirstMatched = FIRST;                  \
    static const char* const* Texts() { return OEDataConversion::TABLE; }  \
    static constexpr unsigned short kCount = 0
#define OE_ENUM_VALUE(SYM, TEXT) +1
#define OE_ENUM_EXTRA(SYM, NUMBER)
#define OE_ENUM_END(TYPE) \
  ;                       \
  }                       \
  ;
#include "ofxkit/types/OEDataConversion.def"

template <typename E>
inline const char* OEDataConversion::Text(E value) {
  const int32_t v = static_cast<int32_t>(value);
  return v >= 0 && v < OEEnumTraits<E>::kCount ? OEEnumTraits<E>::Texts()[v] : nullptr;
}

template <typename E>
inline unsigned short OEDataConversion::ToString(E value, OEString& out) {
  return ValueToString(static_cast<int32_t>(value), out, 0, OEEnumTraits<E>::kCount - 1, OEEnumTraits<E>::Texts());
}

template <typename E>
inline unsigned short OEDataConversion::FromString(const OEString& text, E& value) {
  int32_t v = 0;
  if (!StringToValue(text, v, OEEnumTraits<E>::kFirstMatched, OEEnumTraits<E>::kCount - 1, OEEnumTraits<E>::Texts()))
    return 0;
  value = static_cast<E>(v);
  return 1;
}

// Repeated day-of-week and account-type elements.
class OEDynamicArrayDayOfWeek : public OEDynamicArrayTyped<OEDayOfWeek> {
 public:
  using OEDynamicArrayTyped<OEDayOfWeek>::OEDynamicArrayTyped;
};

class OEDynamicArrayBankAccountType : public OEDynamicArrayTyped<OEBankAccountType> {
 public:
  using OEDynamicArrayTyped<OEBankAccountType>::OEDynamicArrayTyped;
};
