// The value types of the payroll message set and how aggregates hold them.
//
// A payroll modification record sends only the fields that change; a field
// to be cleared at the service is sent with the text "__OFX_EMPTY_STRING__".
// So every payroll amount, date and text can be "emptied": it is then
// present in its aggregate, written as that marker, and read back empty.
//
//   OEPayrollAmount    an exact decimal amount with a dollar ("$12.50") or
//                      percent ("7.5%") form and an empty state.
//   OEPayrollDateTime  an OFX date-time with an empty state.
//   PTEXT fields       texts whose emptied state is a present field with an
//                      empty text (see OE_DECLARE_PTEXT below).
//
// OEPayrollBuilder adds the two payroll adders to the builder, and
// OEPayrollDataConversion names the conversions of the payroll
// enumerations (which live with every other enumeration in
// OEDataConversion.def).
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/core/OEBuilder.h"
#include "ofxkit/types/OEDataConversion.h"
#include "ofxkit/types/OEDateTime.h"
#include "ofxkit/types/OEPrecisionInteger.h"

// The text that stands for a cleared field.
#define OE_PAYROLL_EMPTY_TEXT "__OFX_EMPTY_STRING__"

// 1 when text is exactly the empty-field marker.
unsigned short OEIsPayrollEmptyText(const char* text);

// How OEPayrollAmount(OEPayrollAmountType) starts: empty, or a dollar amount
// of 0 with two decimal places.
enum OEPayrollAmountType : int32_t { OE_PAYROLL_AMOUNT_EMPTY = 0, OE_PAYROLL_AMOUNT_DOLLAR = 1 };

// An amount of the payroll set. Three flags ride on the decimal value:
// percent (written with a trailing "%"), dollar kind (a leading "$") and
// empty (written as the marker; the value is then meaningless).
//
// Arithmetic and comparison are defined between compatible amounts only:
// neither empty, and the same dollar and percent flags. For incompatible
// operands == and the orderings answer 0 and != answers 1; +, -, * and /
// give an empty amount; += and -= leave the left amount unchanged.
//
// Text limit: the text of an amount has at most 30 characters. When the
// text would be longer, surplus zeros at the end of the fraction are left
// out (the value is unchanged); a value that still needs more than 30
// characters has no text: operator char* answers null and writing it
// fails with OE_BUILD_BAD_VALUE. Reading a text longer than 30 characters
// logs OEPW_TOOLONG and leaves the amount as it was.
class OEPayrollAmount : public OEPrecisionInteger {
 public:
  static constexpr unsigned short kMaxTextLength = 30;

  // Zero, neither dollar nor percent, not empty.
  OEPayrollAmount();
  explicit OEPayrollAmount(OEPayrollAmountType type);
  // value in whole units; a dollar amount gets two decimal places.
  OEPayrollAmount(long value, unsigned short percent, unsigned short dollarKind);
  // Reads text as ConvertStringToOEPrecisionInteger does.
  explicit OEPayrollAmount(const char* text);
  OEPayrollAmount(const OEPayrollAmount& other);
  ~OEPayrollAmount() override;

  OEPayrollAmount& operator=(const OEPayrollAmount& other);
  // Takes the value of a plain amount; the flags stay, the empty flag clears.
  OEPayrollAmount& operator=(const OEPrecisionInteger& other) override;
  OEPayrollAmount& operator=(const char* text) override;
  OEPayrollAmount& operator=(int32_t value) override;

  unsigned short IsPercent() const { return m_percent; }
  void SetPercent(unsigned short on);
  unsigned short IsDollarKind() const { return m_dollarKind; }
  void SetDollarKind(unsigned short on);
  unsigned short IsEmpty() const { return m_empty; }
  void SetEmpty(unsigned short on = 1) { m_empty = on ? 1 : 0; }

  // "__OFX_EMPTY_STRING__" makes the amount empty (the value untouched);
  // otherwise the empty flag clears, a leading "$" makes a dollar amount, a
  // trailing "%" a percent amount, and the rest reads as a decimal amount.
  // Answers 1 when the text was clean.
  unsigned short ConvertStringToOEPrecisionInteger(const char* text) override;

  // The text: the marker, or "$" number, number "%", or the number (a
  // fraction of a unit with its leading zero: "$0.50"); null when it would
  // not fit 30 characters. Kept in the object until the next call.
  operator char*() override;
  // The same text into out (at least kMaxTextLength + 1 bytes); its length,
  // or 0 when there is none.
  unsigned short FormatPayrollText(char* out) const;

  // Neither empty, same dollar and percent flags.
  unsigned short IsCompatible(const OEPayrollAmount& other) const;

  unsigned short operator==(const OEPrecisionInteger& other) const override;
  unsigned short operator!=(const OEPrecisionInteger& other) const override;
  unsigned short operator>(const OEPrecisionInteger& other) const override;
  unsigned short operator>=(const OEPrecisionInteger& other) const override;
  unsigned short operator<(const OEPrecisionInteger& other) const override;
  unsigned short operator<=(const OEPrecisionInteger& other) const override;

  OEPayrollAmount& operator+=(const OEPrecisionInteger& other) override;
  OEPayrollAmount& operator-=(const OEPrecisionInteger& other) override;
  using OEPrecisionInteger::operator+;
  using OEPrecisionInteger::operator-;
  using OEPrecisionInteger::operator*;
  using OEPrecisionInteger::operator/;
  OEPayrollAmount operator+(const OEPayrollAmount& other) const;
  OEPayrollAmount operator-(const OEPayrollAmount& other) const;
  OEPayrollAmount operator*(const OEPayrollAmount& other) const;
  OEPayrollAmount operator/(const OEPayrollAmount& other) const;
  // The magnitude, with the flags.
  OEPayrollAmount absval() const;

 private:
  // Whether other (a payroll amount or a plain one) may meet this one.
  bool Meets(const OEPrecisionInteger& other) const;
  OEPayrollAmount Combine(const OEPayrollAmount& other, OEPrecisionInteger value) const;

  unsigned short m_percent;
  unsigned short m_empty;
  unsigned short m_dollarKind;
  char m_payrollText[kMaxTextLength + 1];
};

// A date-time of the payroll set, which may be empty.
class OEPayrollDateTime : public OEDateTime {
 public:
  OEPayrollDateTime() = default;
  OEPayrollDateTime(short year, short month, short day, short hour = 0, short minute = 0, short second = 0)
      : OEDateTime(year, month, day, hour, minute, second) {}
  explicit OEPayrollDateTime(const OEDateTime& date) : OEDateTime(date) {}
  OEPayrollDateTime(const OEPayrollDateTime& other) = default;

  OEPayrollDateTime& operator=(const OEPayrollDateTime& other);
  // Reads as ConvertStringToOEDateTime.
  unsigned short operator=(const char* text) override;

  unsigned short IsEmpty() const { return m_empty; }
  void SetEmpty(unsigned short on = 1) { m_empty = on ? 1 : 0; }

  // "__OFX_EMPTY_STRING__" makes the date empty and answers 1; any other
  // text clears the flag and reads as an OFX date-time.
  unsigned short ConvertStringToOEDateTime(const char* text);
  // The marker for an empty date, else the OFX date-time text.
  unsigned short GetDateString(OEString& out) const;
  unsigned short GetText(OEString& out) const override { return GetDateString(out); }

  // Two empty dates are equal; an empty date equals no other, and no plain
  // date.
  unsigned short operator==(const OEPayrollDateTime& other) const;
  unsigned short operator!=(const OEPayrollDateTime& other) const { return !(*this == other); }
  unsigned short operator==(const OEDateTime& other) const { return !m_empty && OEDateTime::operator==(other); }
  unsigned short operator!=(const OEDateTime& other) const { return !(*this == other); }

 private:
  unsigned short m_empty = 0;
};

// The builder with the payroll adders. Aggregates write their payroll values
// through these when they are built by an OEPayrollBuilder, and through the
// same texts otherwise.
class OEPayrollBuilder : public OEBuilder {
 public:
  OEPayrollBuilder() : OEBuilder(2) {}
  // The value's text and a line feed; OE_BUILD_BAD_VALUE (nothing written)
  // for a date that cannot be formatted or an amount without a text.
  virtual OEBuildStatus AddPayrollDateTime(const OEPayrollDateTime& value);
  virtual OEBuildStatus AddPayrollAmount(const OEPayrollAmount& value);
};

// The conversions of the payroll enumerations (PayrollFrequencyToString,
// StringToFederalTax, ...), which OEDataConversion holds with the others.
class OEPayrollDataConversion : public OEDataConversion {};

// ---------------------------------------------------------------------------
// Fields.

// Writes the element tag with the value: the marker for an empty value.
OEBuildStatus OEWritePayrollAmount(OEBuilder* b, OETagID tag, const OEPayrollAmount& value);
OEBuildStatus OEWritePayrollDateTime(OEBuilder* b, OETagID tag, const OEPayrollDateTime& value);

// VALUE fields of the payroll types. Their display text (ToText) of an
// empty value is the empty text, not the marker.
template <>
struct OEValueTraits<OEPayrollAmount> {
  static constexpr bool kOwnFaultCode = true;  // an over-long text is OEPW_TOOLONG
  static bool FromText(const OEString& text, OEPayrollAmount& value);
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const OEPayrollAmount& value) {
    return OEWritePayrollAmount(b, tag, value);
  }
  static unsigned short ToText(const OEPayrollAmount& value, OEString& out);
};

template <>
struct OEValueTraits<OEPayrollDateTime> {
  static bool FromText(const OEString& text, OEPayrollDateTime& value) {
    return value.ConvertStringToOEDateTime(text.c_str()) != 0;
  }
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const OEPayrollDateTime& value) {
    return OEWritePayrollDateTime(b, tag, value);
  }
  static unsigned short ToText(const OEPayrollDateTime& value, OEString& out);
};

// PTEXT: X(PTEXT, Name, TAG, Type), a text field (Type an OEString class)
// that can be emptied. An emptied text is held as the field present with an
// empty text: Empty<Name>() marks it so (as does setting or reading the
// marker), Is<Name>Emptied() tells it, and it is written as the marker.
// Otherwise the field behaves as a TEXT field.
unsigned short OESetPayrollText(OEAggregate* self, OEString& field, OETagID tag, const OEString& text);

struct OEPayrollTextTraits {
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const OEString& value);
  static unsigned short ToText(const OEString& value, OEString& out) {
    out = value;
    return 1;
  }
};

template <class T, uint16_t Key>
struct OEPayrollTextOps {
  static unsigned short SetText(OEAggregate* self, OETagID tag, const OEString& text) {
    return OESetPayrollText(self, OEFieldRef<T>(self, Key), tag, text);
  }
  static OEBuildStatus Write(OEBuilder* b, const OEAggregate* self, OETagID tag) {
    return OEPayrollTextTraits::Write(b, tag, OEGetField<T>(self, Key));
  }
  static void Copy(OEAggregate* dst, const OEAggregate* src) { OECopyField<T>(dst, src, Key); }
  static unsigned short Text(const OEAggregate* self, unsigned short, OEString& out) {
    return OEPayrollTextTraits::ToText(OEGetField<T>(self, Key), out);
  }
};

#define OE_DECLARE_PTEXT(Name, TAG, Type)                                                                  \
 public:                                                                                                   \
  const Type& Get##Name() const { return OEGetField<Type>(this, OE_FIELD_KEY(Name)); }                     \
  unsigned short Set##Name(const OEString& text) { return OESetPayrollText(this, Field##Name(), OE_TAG_##TAG, text); } \
  unsigned short Empty##Name() { return OESetPayrollText(this, Field##Name(), OE_TAG_##TAG, OE_PAYROLL_EMPTY_TEXT); } \
  unsigned short Is##Name##Emptied() const { return ValidateTag(OE_TAG_##TAG) && Get##Name().IsEmpty(); }  \
                                                                                                           \
 protected:                                                                                                \
  Type& Field##Name() { return OEFieldRef<Type>(this, OE_FIELD_KEY(Name)); }

#define OE_DESC_PTEXT(Name, TAG, Type)                                                        \
  OEFieldDesc{OE_TAG_##TAG, OE_FIELD_ELEMENT, false,                                          \
              &OEPayrollTextOps<Type, OE_FIELD_KEY(Name)>::SetText,                           \
              &OEPayrollTextOps<Type, OE_FIELD_KEY(Name)>::Write,                             \
              &OEPayrollTextOps<Type, OE_FIELD_KEY(Name)>::Copy,                              \
              &OEPayrollTextOps<Type, OE_FIELD_KEY(Name)>::Text,                              \
              nullptr, nullptr, nullptr, nullptr, nullptr, #Name, nullptr,                     \
              OE_FIELD_KEY(Name), &OEDestroyValue<Type>},

