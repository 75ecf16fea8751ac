#include "ofxkit/payroll/OEPayrollTypes.h"

#include <cstdio>
#include <cstring>

#include "ofxkit/parse/OEParseLogger.h"

namespace {
constexpr size_t kMarkerLength = sizeof(OE_PAYROLL_EMPTY_TEXT) - 1;
}  // namespace

unsigned short OEIsPayrollEmptyText(const char* text) {
  return text && std::strcmp(text, OE_PAYROLL_EMPTY_TEXT) == 0;
}

// ---------------------------------------------------------------------------
// OEPayrollAmount

OEPayrollAmount::OEPayrollAmount() : m_percent(0), m_empty(0), m_dollarKind(0), m_payrollText{} {}

OEPayrollAmount::OEPayrollAmount(OEPayrollAmountType type) : OEPayrollAmount() {
  if (type == OE_PAYROLL_AMOUNT_DOLLAR) {
    m_dollarKind = 1;
    SetDecimal(2);
  } else {
    m_empty = 1;
  }
}

OEPayrollAmount::OEPayrollAmount(long value, unsigned short percent, unsigned short dollarKind) : OEPayrollAmount() {
  char digits[24];
  std::snprintf(digits, sizeof digits, "%ld", value);
  OEPrecisionInteger::ConvertStringToOEPrecisionInteger(digits);
  m_percent = percent ? 1 : 0;
  m_dollarKind = (dollarKind && !m_percent) ? 1 : 0;
  if (m_dollarKind) Decimal(2);
}

OEPayrollAmount::OEPayrollAmount(const char* text) : OEPayrollAmount() { ConvertStringToOEPrecisionInteger(text); }

OEPayrollAmount::OEPayrollAmount(const OEPayrollAmount& other)
    : OEPrecisionInteger(other),
      m_percent(other.m_percent),
      m_empty(other.m_empty),
      m_dollarKind(other.m_dollarKind),
      m_payrollText{} {}

OEPayrollAmount::~OEPayrollAmount() = default;

OEPayrollAmount& OEPayrollAmount::operator=(const OEPayrollAmount& other) {
  if (this == &other) return *this;
  OEPrecisionInteger::operator=(static_cast<const OEPrecisionInteger&>(other));
  m_percent = other.m_percent;
  m_empty = other.m_empty;
  m_dollarKind = other.m_dollarKind;
  return *this;
}

OEPayrollAmount& OEPayrollAmount::operator=(const OEPrecisionInteger& other) {
  if (const OEPayrollAmount* amount = dynamic_cast<const OEPayrollAmount*>(&other)) return *this = *amount;
  OEPrecisionInteger::operator=(other);
  m_empty = 0;
  return *this;
}

OEPayrollAmount& OEPayrollAmount::operator=(const char* text) {
  ConvertStringToOEPrecisionInteger(text);
  return *this;
}

OEPayrollAmount& OEPayrollAmount::operator=(int32_t value) {
  OEPrecisionInteger::operator=(value);
  m_empty = 0;
  return *this;
}

void OEPayrollAmount::SetPercent(unsigned short on) {
  m_percent = on ? 1 : 0;
  if (m_percent) m_dollarKind = 0;
}

void OEPayrollAmount::SetDollarKind(unsigned short on) {
  m_dollarKind = on ? 1 : 0;
  if (m_dollarKind) m_percent = 0;
}

unsigned short OEPayrollAmount::ConvertStringToOEPrecisionInteger(const char* text) {
  if (OEIsPayrollEmptyText(text)) {
    m_empty = 1;
    return 1;
  }
  const char* s = text ? text : "";
  size_t length = std::strlen(s);
  if (length > kMaxTextLength) {
    OELogWarning(OEPW_TOOLONG, OEString(s), OEString(), OE_TAG_NONE);
    return 0;
  }
  m_empty = 0;
  bool dollar = false;
  bool percent = false;
  if (*s == '$') {
    dollar = true;
    ++s;
    --length;
  }
  if (length > 0 && s[length - 1] == '%') {
    percent = true;
    --length;
  }
  char number[kMaxTextLength + 1];
  std::memcpy(number, s, length);
  number[length] = '\0';
  unsigned short clean = OEPrecisionInteger::ConvertStringToOEPrecisionInteger(number);
  // A text with both marks is malformed; the percent mark, read last, wins.
  if (dollar && percent) {
    OELogWarning(OEPW_BADFORMAT, OEString(text), OEString(), OE_TAG_NONE);
    clean = 0;
  }
  if (dollar) SetDollarKind(1);
  if (percent) SetPercent(1);
  return clean;
}

unsigned short OEPayrollAmount::FormatPayrollText(char* out) const {
  if (m_empty) {
    std::memcpy(out, OE_PAYROLL_EMPTY_TEXT, kMarkerLength + 1);
    return static_cast<unsigned short>(kMarkerLength);
  }
  char number[kTextSize];
  size_t length = FormatText(number);
  size_t marks = (m_dollarKind ? 1 : 0) + (m_percent ? 1 : 0);
  // Too long: leave out the zeros that end the fraction, then the point.
  if (length + marks > kMaxTextLength && std::strchr(number, '.')) {
    while (length > 0 && number[length - 1] == '0') --length;
    if (length > 0 && number[length - 1] == '.') --length;
    number[length] = '\0';
  }
  if (length + marks > kMaxTextLength || length == 0) {
    out[0] = '\0';
    return 0;
  }
  // A fraction of a unit is written with its leading zero ("$0.50").
  const char* point = number[0] == '-' ? number + 1 : number;
  bool leadingZero = *point == '.';
  if (length + marks + (leadingZero ? 1 : 0) > kMaxTextLength) {
    out[0] = '\0';
    return 0;
  }
  char* o = out;
  if (m_dollarKind) *o++ = '$';
  size_t signLength = static_cast<size_t>(point - number);
  std::memcpy(o, number, signLength);
  o += signLength;
  if (leadingZero) *o++ = '0';
  std::memcpy(o, point, length - signLength);
  o += length - signLength;
  if (m_percent) *o++ = '%';
  *o = '\0';
  return static_cast<unsigned short>(o - out);
}

OEPayrollAmount::operator char*() { return FormatPayrollText(m_payrollText) ? m_payrollText : nullptr; }

unsigned short OEPayrollAmount::IsCompatible(const OEPayrollAmount& other) const {
  return !m_empty && !other.m_empty && m_dollarKind == other.m_dollarKind && m_percent == other.m_percent;
}

bool OEPayrollAmount::Meets(const OEPrecisionInteger& other) const {
  if (const OEPayrollAmount* amount = dynamic_cast<const OEPayrollAmount*>(&other)) return IsCompatible(*amount);
  return !m_empty;
}

unsigned short OEPayrollAmount::operator==(const OEPrecisionInteger& other) const {
  return Meets(other) && OEPrecisionInteger::operator==(other);
}
unsigned short OEPayrollAmount::operator!=(const OEPrecisionInteger& other) const { return !(*this == other); }
unsigned short OEPayrollAmount::operator>(const OEPrecisionInteger& other) const {
  return Meets(other) && OEPrecisionInteger::operator>(other);
}
unsigned short OEPayrollAmount::operator>=(const OEPrecisionInteger& other) const {
  return Meets(other) && OEPrecisionInteger::operator>=(other);
}
unsigned short OEPayrollAmount::operator<(const OEPrecisionInteger& other) const {
  return Meets(other) && OEPrecisionInteger::operator<(other);
}
unsigned short OEPayrollAmount::operator<=(const OEPrecisionInteger& other) const {
  return Meets(other) && OEPrecisionInteger::operator<=(other);
}

OEPayrollAmount& OEPayrollAmount::operator+=(const OEPrecisionInteger& other) {
  if (Meets(other)) OEPrecisionInteger::operator+=(other);
  return *this;
}

OEPayrollAmount& OEPayrollAmount::operator-=(const OEPrecisionInteger& other) {
  if (Meets(other)) OEPrecisionInteger::operator-=(other);
  return *this;
}

OEPayrollAmount OEPayrollAmount::Combine(const OEPayrollAmount& other, OEPrecisionInteger value) const {
  if (!IsCompatible(other)) return OEPayrollAmount(OE_PAYROLL_AMOUNT_EMPTY);
  OEPayrollAmount result(*this);
  result.OEPrecisionInteger::operator=(value);
  return result;
}

OEPayrollAmount OEPayrollAmount::operator+(const OEPayrollAmount& other) const {
  return Combine(other, OEPrecisionInteger::operator+(other));
}
OEPayrollAmount OEPayrollAmount::operator-(const OEPayrollAmount& other) const {
  return Combine(other, OEPrecisionInteger::operator-(other));
}
OEPayrollAmount OEPayrollAmount::operator*(const OEPayrollAmount& other) const {
  return Combine(other, OEPrecisionInteger::operator*(other));
}
OEPayrollAmount OEPayrollAmount::operator/(const OEPayrollAmount& other) const {
  return Combine(other, OEPrecisionInteger::operator/(other));
}

OEPayrollAmount OEPayrollAmount::absval() const {
  OEPayrollAmount result(*this);
  if (!m_empty) result.OEPrecisionInteger::operator=(abs());
  return result;
}

// ---------------------------------------------------------------------------
// OEPayrollDateTime

OEPayrollDateTime& OEPayrollDateTime::operator=(const OEPayrollDateTime& other) {
  OEDateTime::operator=(other);
  m_empty = other.m_empty;
  return *this;
}

unsigned short OEPayrollDateTime::operator=(const char* text) { return ConvertStringToOEDateTime(text); }

unsigned short OEPayrollDateTime::ConvertStringToOEDateTime(const char* text) {
  if (OEIsPayrollEmptyText(text)) {
    m_empty = 1;
    return 1;
  }
  unsigned short ok = OEDateTime::ConvertStringToOEDateTime(text);
  if (ok) m_empty = 0;
  return ok;
}

unsigned short OEPayrollDateTime::GetDateString(OEString& out) const {
  if (m_empty) {
    out = OE_PAYROLL_EMPTY_TEXT;
    return 1;
  }
  return OEDateTime::GetDateString(out);
}

unsigned short OEPayrollDateTime::operator==(const OEPayrollDateTime& other) const {
  if (m_empty || other.m_empty) return m_empty && other.m_empty;
  return OEDateTime::operator==(other);
}

// ---------------------------------------------------------------------------
// Builder and fields

OEBuildStatus OEPayrollBuilder::AddPayrollDateTime(const OEPayrollDateTime& value) {
  OEString text;
  if (!value.GetDateString(text)) return OE_BUILD_BAD_VALUE;
  return AddText(text.c_str());
}

OEBuildStatus OEPayrollBuilder::AddPayrollAmount(const OEPayrollAmount& value) {
  char text[OEPayrollAmount::kMaxTextLength + 1];
  if (!value.FormatPayrollText(text)) return OE_BUILD_BAD_VALUE;
  return AddText(text);
}

OEBuildStatus OEWritePayrollAmount(OEBuilder* b, OETagID tag, const OEPayrollAmount& value) {
  char text[OEPayrollAmount::kMaxTextLength + 1];
  if (!value.FormatPayrollText(text)) return OE_BUILD_BAD_VALUE;
  if (OEPayrollBuilder* payroll = dynamic_cast<OEPayrollBuilder*>(b)) {
    OEBuildStatus s = payroll->AddTagElement(tag);
    return s != OE_BUILD_OK ? s : payroll->AddPayrollAmount(value);
  }
  return b->AddTagOEText(tag, text);
}

OEBuildStatus OEWritePayrollDateTime(OEBuilder* b, OETagID tag, const OEPayrollDateTime& value) {
  OEString text;
  if (!value.GetDateString(text)) return OE_BUILD_BAD_VALUE;
  if (OEPayrollBuilder* payroll = dynamic_cast<OEPayrollBuilder*>(b)) {
    OEBuildStatus s = payroll->AddTagElement(tag);
    return s != OE_BUILD_OK ? s : payroll->AddPayrollDateTime(value);
  }
  return b->AddTagOEText(tag, text.c_str());
}

bool OEValueTraits<OEPayrollAmount>::FromText(const OEString& text, OEPayrollAmount& value) {
  return value.ConvertStringToOEPrecisionInteger(text.c_str()) != 0;
}

unsigned short OEValueTraits<OEPayrollAmount>::ToText(const OEPayrollAmount& value, OEString& out) {
  if (value.IsEmpty()) {
    out = "";
    return 1;
  }
  char text[OEPayrollAmount::kMaxTextLength + 1];
  if (!value.FormatPayrollText(text)) return 0;
  out = text;
  return 1;
}

unsigned short OEValueTraits<OEPayrollDateTime>::ToText(const OEPayrollDateTime& value, OEString& out) {
  if (value.IsEmpty()) {
    out = "";
    return 1;
  }
  return value.OEDateTime::GetDateString(out);
}

unsigned short OESetPayrollText(OEAggregate* self, OEString& field, OETagID tag, const OEString& text) {
  if (!OEIsPayrollEmptyText(text.c_str())) return OESetTextField(self, field, tag, text);
  field = "";
  return self->SetTag(tag);
}

OEBuildStatus OEPayrollTextTraits::Write(OEBuilder* b, OETagID tag, const OEString& value) {
  if (value.GetStrLength() == 0) return b->AddTagOEText(tag, OE_PAYROLL_EMPTY_TEXT);
  return b->AddTagOEString(tag, value);
}
