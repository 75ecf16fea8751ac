#include "ofxkit/types/OEPrecisionInteger.h"

#include <cstring>
#include <new>

#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEUtility.h"
#include "OESideBlock.h"

// The magnitude is three 32-bit words, least significant first. The helpers
// below work on such word triples; every result is kept modulo 2^96.
namespace {

constexpr int kWords = 3;
constexpr unsigned kBits = 96;
constexpr uint32_t kChunk = 1000000000u;  // 10^9, the largest power of ten in 32 bits
constexpr unsigned kChunkDigits = 9;
// 10^29 exceeds 2^96, so a magnitude divided by 10^29 or more is always 0.
constexpr unsigned kMaxDigits = 29;

constexpr uint32_t kPow10Small[kChunkDigits + 1] = {1,      10,      100,      1000,      10000,
                                                   100000, 1000000, 10000000, 100000000, kChunk};

// 10^0 .. 10^28, the powers that fit in 96 bits.
struct Pow10Table {
  uint32_t w[kMaxDigits][kWords];
};
constexpr Pow10Table MakePow10Table() {
  Pow10Table t{};
  t.w[0][0] = 1;
  for (unsigned i = 1; i < kMaxDigits; ++i) {
    uint64_t carry = 0;
    for (int k = 0; k < kWords; ++k) {
      const uint64_t v = static_cast<uint64_t>(t.w[i - 1][k]) * 10 + carry;
      t.w[i][k] = static_cast<uint32_t>(v);
      carry = v >> 32;
    }
  }
  return t;
}
constexpr Pow10Table kPow10 = MakePow10Table();

inline bool IsZeroW(const uint32_t* w) { return (w[0] | w[1] | w[2]) == 0; }
inline bool IsOneW(const uint32_t* w) { return w[0] == 1 && (w[1] | w[2]) == 0; }
inline bool Fits32(const uint32_t* w) { return (w[1] | w[2]) == 0; }
inline uint64_t Low64(const uint32_t* w) { return (static_cast<uint64_t>(w[1]) << 32) | w[0]; }
inline void SetW(uint32_t* w, uint32_t lo, uint32_t mid, uint32_t hi) {
  w[0] = lo;
  w[1] = mid;
  w[2] = hi;
}

int CmpW(const uint32_t* a, const uint32_t* b) {
  for (int k = kWords - 1; k >= 0; --k) {
    if (a[k] != b[k]) return a[k] > b[k] ? 1 : -1;
  }
  return 0;
}

void AddW(uint32_t* a, const uint32_t* b) {
  uint64_t carry = 0;
  for (int k = 0; k < kWords; ++k) {
    const uint64_t v = static_cast<uint64_t>(a[k]) + b[k] + carry;
    a[k] = static_cast<uint32_t>(v);
    carry = v >> 32;
  }
}

// a -= b, modulo 2^96.
void SubW(uint32_t* a, const uint32_t* b) {
  uint32_t borrow = 0;
  for (int k = 0; k < kWords; ++k) {
    const uint64_t v = static_cast<uint64_t>(a[k]) - b[k] - borrow;
    a[k] = static_cast<uint32_t>(v);
    borrow = static_cast<uint32_t>(v >> 63);
  }
}

// w = w * m + add.
void MulAddSmall(uint32_t* w, uint32_t m, uint32_t add) {
  uint64_t carry = add;
  for (int k = 0; k < kWords; ++k) {
    const uint64_t v = static_cast<uint64_t>(w[k]) * m + carry;
    w[k] = static_cast<uint32_t>(v);
    carry = v >> 32;
  }
}

// w = w / d; returns the remainder.
uint32_t DivSmall(uint32_t* w, uint32_t d) {
  uint64_t rem = 0;
  for (int k = kWords - 1; k >= 0; --k) {
    const uint64_t cur = (rem << 32) | w[k];
    w[k] = static_cast<uint32_t>(cur / d);
    rem = cur % d;
  }
  return static_cast<uint32_t>(rem);
}

// w = w * 10^n. After 96 factors of ten every bit has been shifted out.
void ScaleUp(uint32_t* w, unsigned n) {
  if (n >= kBits) {
    SetW(w, 0, 0, 0);
    return;
  }
  for (; n > kChunkDigits; n -= kChunkDigits) MulAddSmall(w, kChunk, 0);
  MulAddSmall(w, kPow10Small[n], 0);
}

// w = w / 10^n truncated; returns true when a non-zero remainder was dropped.
bool ScaleDown(uint32_t* w, unsigned n) {
  bool dropped = false;
  for (; n > 0 && !IsZeroW(w);) {
    const unsigned step = n > kChunkDigits ? kChunkDigits : n;
    dropped |= DivSmall(w, kPow10Small[step]) != 0;
    n -= step;
  }
  return dropped;
}

void ShiftLeftW(uint32_t* w, unsigned bits) {
  if (bits >= kBits) {
    SetW(w, 0, 0, 0);
    return;
  }
  const unsigned words = bits / 32, rest = bits % 32;
  for (int k = kWords - 1; k >= 0; --k) {
    const int src = k - static_cast<int>(words);
    uint32_t v = src >= 0 ? w[src] << rest : 0;
    if (rest != 0 && src >= 1) v |= w[src - 1] >> (32 - rest);
    w[k] = v;
  }
}

void ShiftRightW(uint32_t* w, unsigned bits) {
  if (bits >= kBits) {
    SetW(w, 0, 0, 0);
    return;
  }
  const unsigned words = bits / 32, rest = bits % 32;
  for (int k = 0; k < kWords; ++k) {
    const int src = k + static_cast<int>(words);
    uint32_t v = src < kWords ? w[src] >> rest : 0;
    if (rest != 0 && src + 1 < kWords) v |= w[src + 1] << (32 - rest);
    w[k] = v;
  }
}

// out = a * b, the low 96 bits of the product.
void MulW(const uint32_t* a, const uint32_t* b, uint32_t* out) {
  uint32_t r[kWords] = {0, 0, 0};
  for (int i = 0; i < kWords; ++i) {
    if (a[i] == 0) continue;
    uint64_t carry = 0;
    for (int j = 0; i + j < kWords; ++j) {
      const uint64_t v = static_cast<uint64_t>(a[i]) * b[j] + r[i + j] + carry;
      r[i + j] = static_cast<uint32_t>(v);
      carry = v >> 32;
    }
  }
  SetW(out, r[0], r[1], r[2]);
}

int HighestBit(const uint32_t* w) {
  for (int k = kWords - 1; k >= 0; --k) {
    if (w[k] != 0) return k * 32 + 31 - __builtin_clz(w[k]);
  }
  return -1;
}

// q = a / b truncated, b non-zero: binary long division.
void DivW(const uint32_t* a, const uint32_t* b, uint32_t* q) {
  if (Fits32(b)) {
    SetW(q, a[0], a[1], a[2]);
    DivSmall(q, b[0]);
    return;
  }
  uint32_t rem[kWords] = {0, 0, 0};
  uint32_t quot[kWords] = {0, 0, 0};
  for (int bit = HighestBit(a); bit >= 0; --bit) {
    // A remainder below b < 2^96 doubled may need a 97th bit; when it does it
    // certainly exceeds b and the modular subtraction below is exact.
    const bool overflow = (rem[2] >> 31) != 0;
    ShiftLeftW(rem, 1);
    rem[0] |= (a[bit / 32] >> (bit % 32)) & 1u;
    if (overflow || CmpW(rem, b) >= 0) {
      SubW(rem, b);
      quot[bit / 32] |= 1u << (bit % 32);
    }
  }
  SetW(q, quot[0], quot[1], quot[2]);
}

// True when w x 10^-decimal is below 1.
bool BelowOne(const uint32_t* w, unsigned decimal) {
  return decimal >= kMaxDigits || CmpW(w, kPow10.w[decimal]) < 0;
}

// Writes the decimal digits of w (nothing for zero) ending just before end;
// returns the first digit. Values beyond 32 bits are cut into 9-digit chunks
// so that the digit loops run on 32-bit words.
char* DigitsBackward(const uint32_t* w, char* end) {
  char* p = end;
  uint32_t rest[kWords] = {w[0], w[1], w[2]};
  while (!Fits32(rest)) {
    uint32_t chunk;
    if (rest[2] == 0) {
      const uint64_t v = Low64(rest), q = v / kChunk;
      chunk = static_cast<uint32_t>(v - q * kChunk);
      SetW(rest, static_cast<uint32_t>(q), static_cast<uint32_t>(q >> 32), 0);
    } else {
      chunk = DivSmall(rest, kChunk);
    }
    for (unsigned i = 0; i < kChunkDigits; ++i, chunk /= 10) *--p = static_cast<char>('0' + chunk % 10);
  }
  for (uint32_t v = rest[0]; v != 0; v /= 10) *--p = static_cast<char>('0' + v % 10);
  return p;
}

void Warn(OEParseWarning warning, const char* text) {
  OELogWarning(warning, OEString(), OEString(text), OE_TAG_NONE);
}

}  // namespace

// ---------------------------------------------------------------------------
// Construction and assignment

OEPrecisionInteger::OEPrecisionInteger()
    : m_word{0, 0, 0}, m_sign(1), m_hasBlocks(0), m_decimal(0) {}

OEPrecisionInteger::OEPrecisionInteger(int32_t value, unsigned short decimal) : OEPrecisionInteger() {
  *this = value;
  m_decimal = decimal;
}

OEPrecisionInteger::OEPrecisionInteger(const char* text) : OEPrecisionInteger() {
  ConvertStringToOEPrecisionInteger(text);
}

OEPrecisionInteger::OEPrecisionInteger(const OEPrecisionInteger& other)
    : m_word{other.m_word[0], other.m_word[1], other.m_word[2]},
      m_sign(other.m_sign),
      m_hasBlocks(0),
      m_decimal(other.m_decimal) {}

void OEPrecisionInteger::FreeBlocks() {
  OEFreeSideBlock(this);
  m_hasBlocks = 0;
}

OEPrecisionInteger& OEPrecisionInteger::operator=(const char* text) {
  ConvertStringToOEPrecisionInteger(text);
  return *this;
}

OEPrecisionInteger& OEPrecisionInteger::operator=(int32_t value) {
  const uint32_t magnitude =
      value < 0 ? 0u - static_cast<uint32_t>(value) : static_cast<uint32_t>(value);
  SetW(m_word, magnitude, 0, 0);
  m_sign = value < 0 ? -1 : 1;
  m_decimal = 0;
  return *this;
}

OEPrecisionInteger& OEPrecisionInteger::operator=(const OEPrecisionInteger& other) {
  SetW(m_word, other.m_word[0], other.m_word[1], other.m_word[2]);
  m_sign = other.m_sign;
  m_decimal = other.m_decimal;
  return *this;
}

void OEPrecisionInteger::SetZero() {
  SetW(m_word, 0, 0, 0);
  m_sign = 1;
  m_decimal = 0;
}

// ---------------------------------------------------------------------------
// OFX text

unsigned short OEPrecisionInteger::ConvertStringToOEPrecisionInteger(const char* text) {
  SetZero();
  const char* s = text != nullptr ? text : "";
  bool warned = false;
  const auto fault = [&](OEParseWarning warning) {
    if (!warned) Warn(warning, s);
    warned = true;
  };

  bool pointSeen = false;
  size_t decimal = 0;
  short sign = 1;
  unsigned digits = 0;
  // Up to 19 digits accumulate in 64 bits; longer texts continue in 96.
  uint64_t fast = 0;
  for (size_t pos = 0; s[pos] != '\0'; ++pos) {
    const char c = s[pos];
    if (c >= '0' && c <= '9') {
      if (++digits == kMaxDigits) {
        fault(OEPW_TOOLONG);
        break;
      }
      const uint32_t digit = static_cast<uint32_t>(c - '0');
      if (digits < 20) {
        fast = fast * 10 + digit;
      } else {
        if (digits == 20) SetW(m_word, static_cast<uint32_t>(fast), static_cast<uint32_t>(fast >> 32), 0);
        MulAddSmall(m_word, 10, digit);
      }
    } else if (c == '.' || c == ',') {
      if (pointSeen) {
        fault(OEPW_BADFORMAT);
      } else {
        pointSeen = true;
        // Every character after the point counts, not only digits.
        decimal = std::strlen(s + pos + 1);
      }
    } else if (c == '-' || c == '+') {
      if (c == '-') sign = -1;
      if (pos != 0) fault(OEPW_BADFORMAT);
    } else {
      fault(OEPW_BADFORMAT);
    }
  }
  if (digits < 20) SetW(m_word, static_cast<uint32_t>(fast), static_cast<uint32_t>(fast >> 32), 0);

  m_decimal = static_cast<unsigned short>(decimal > 0xFFFF ? 0xFFFF : decimal);
  m_sign = sign;
  if (!IsValid() || s[0] == '\0') fault(OEPW_BADFORMAT);
  return warned ? 0 : 1;
}

unsigned short OEPrecisionInteger::FormatText(char* out) const {
  char* o = out;
  if (m_decimal > kMaxDigits) {
    *o++ = '0';
    *o = '\0';
    return 1;
  }
  if (m_sign < 0) *o++ = '-';
  char digits[kMaxDigits];
  char* const end = digits + kMaxDigits;
  const char* first = DigitsBackward(m_word, end);
  const int count = static_cast<int>(end - first);
  const int intDigits = count - m_decimal;
  if (intDigits > 0) {
    std::memcpy(o, first, static_cast<size_t>(intDigits));
    o += intDigits;
    first += intDigits;
  }
  if (m_decimal > 0) {
    *o++ = '.';
    for (int pad = -intDigits; pad > 0; --pad) *o++ = '0';
    const size_t fracDigits = static_cast<size_t>(end - first);
    std::memcpy(o, first, fracDigits);
    o += fracDigits;
  } else if (intDigits <= 0) {
    *o++ = '0';
  }
  *o = '\0';
  return static_cast<unsigned short>(o - out);
}

// The text block (kTextSize bytes) followed by the binary block
// (m_binaryLen bytes), made together on the first use of either; null with
// g_allocFailed set when it cannot be had.
char* OEPrecisionInteger::Blocks() {
  char* blocks = OESideBlockFor(this, kTextSize + m_binaryLen);
  if (blocks == nullptr) g_allocFailed = 1;
  m_hasBlocks = blocks != nullptr;
  return blocks;
}

OEPrecisionInteger::operator char*() {
  char* text = Blocks();
  if (text) FormatText(text);
  return text;
}

// ---------------------------------------------------------------------------
// Comparison

int OEPrecisionInteger::CompareMagnitude(const OEPrecisionInteger& other) const {
  if (m_decimal == other.m_decimal) return CmpW(m_word, other.m_word);
  // Compare a x 10^k with b as a with b / 10^k (and its remainder), so that
  // aligning the decimal counts can never overflow.
  const bool thisFewer = m_decimal < other.m_decimal;
  const OEPrecisionInteger& fewer = thisFewer ? *this : other;
  const OEPrecisionInteger& more = thisFewer ? other : *this;
  uint32_t q[kWords] = {more.m_word[0], more.m_word[1], more.m_word[2]};
  const bool dropped = ScaleDown(q, static_cast<unsigned>(more.m_decimal - fewer.m_decimal));
  int c = CmpW(fewer.m_word, q);
  if (c == 0 && dropped) c = -1;
  return thisFewer ? c : -c;
}

unsigned short OEPrecisionInteger::operator==(const OEPrecisionInteger& other) const {
  return m_sign == other.m_sign && CompareMagnitude(other) == 0;
}

unsigned short OEPrecisionInteger::operator!=(const OEPrecisionInteger& other) const { return !(*this == other); }

unsigned short OEPrecisionInteger::operator>(const OEPrecisionInteger& other) const {
  if (m_sign != other.m_sign) return m_sign > 0;
  const int c = CompareMagnitude(other);
  return m_sign > 0 ? c > 0 : c < 0;
}

unsigned short OEPrecisionInteger::operator>=(const OEPrecisionInteger& other) const {
  return *this == other || *this > other;
}

unsigned short OEPrecisionInteger::operator<(const OEPrecisionInteger& other) const {
  return !(*this == other) && !(*this > other);
}

unsigned short OEPrecisionInteger::operator<=(const OEPrecisionInteger& other) const { return !(*this > other); }

// ---------------------------------------------------------------------------
// Shifts

OEPrecisionInteger& OEPrecisionInteger::operator<<(unsigned short bits) {
  ShiftLeftW(m_word, bits);
  return *this;
}

OEPrecisionInteger& OEPrecisionInteger::operator>>(unsigned short bits) {
  ShiftRightW(m_word, bits);
  return *this;
}

OEPrecisionInteger& OEPrecisionInteger::operator<<=(unsigned short bits) { return *this << bits; }

OEPrecisionInteger& OEPrecisionInteger::operator>>=(unsigned short bits) { return *this >> bits; }

// ---------------------------------------------------------------------------
// Arithmetic

void OEPrecisionInteger::AddSigned(const uint32_t* words, short sign, unsigned short decimal) {
  uint32_t b[kWords] = {words[0], words[1], words[2]};
  if (m_decimal < decimal) {
    ScaleUp(m_word, static_cast<unsigned>(decimal - m_decimal));
    m_decimal = decimal;
  } else if (decimal < m_decimal) {
    ScaleUp(b, static_cast<unsigned>(m_decimal - decimal));
  }
  if (m_sign == sign) {
    AddW(m_word, b);
  } else if (CmpW(m_word, b) >= 0) {
    SubW(m_word, b);
  } else {
    SubW(b, m_word);
    SetW(m_word, b[0], b[1], b[2]);
    m_sign = sign;
  }
  if (IsZeroW(m_word)) m_sign = 1;
}

OEPrecisionInteger& OEPrecisionInteger::operator+=(const OEPrecisionInteger& other) {
  AddSigned(other.m_word, other.m_sign, other.m_decimal);
  return *this;
}

OEPrecisionInteger& OEPrecisionInteger::operator-=(const OEPrecisionInteger& other) {
  AddSigned(other.m_word, static_cast<short>(-other.m_sign), other.m_decimal);
  return *this;
}

OEPrecisionInteger OEPrecisionInteger::operator+(const OEPrecisionInteger& other) const {
  OEPrecisionInteger result(*this);
  result += other;
  return result;
}

OEPrecisionInteger OEPrecisionInteger::operator-(const OEPrecisionInteger& other) const {
  OEPrecisionInteger result(*this);
  result -= other;
  return result;
}

OEPrecisionInteger OEPrecisionInteger::operator*(const OEPrecisionInteger& other) const {
  OEPrecisionInteger result;
  result.m_decimal = static_cast<unsigned short>(m_decimal + other.m_decimal);
  if (IsOneW(m_word)) {
    SetW(result.m_word, other.m_word[0], other.m_word[1], other.m_word[2]);
  } else if (IsOneW(other.m_word)) {
    SetW(result.m_word, m_word[0], m_word[1], m_word[2]);
  } else if (Fits32(m_word) && Fits32(other.m_word)) {
    const uint64_t p = static_cast<uint64_t>(m_word[0]) * other.m_word[0];
    SetW(result.m_word, static_cast<uint32_t>(p), static_cast<uint32_t>(p >> 32), 0);
  } else {
    MulW(m_word, other.m_word, result.m_word);
  }
  result.m_sign = IsZeroW(result.m_word) ? 1 : static_cast<short>(m_sign * other.m_sign);
  return result;
}

OEPrecisionInteger OEPrecisionInteger::operator/(const OEPrecisionInteger& other) const {
  OEPrecisionInteger result(*this);
  if (BelowOne(other.m_word, other.m_decimal) || IsZeroW(m_word)) return result;
  result.m_sign = static_cast<short>(m_sign * other.m_sign);
  if (IsOneW(other.m_word)) return result;

  result.m_decimal = m_decimal > other.m_decimal ? static_cast<unsigned short>(m_decimal - other.m_decimal) : 0;
  if (Fits32(m_word) && Fits32(other.m_word) && m_decimal == other.m_decimal) {
    SetW(result.m_word, m_word[0] / other.m_word[0], 0, 0);
  } else {
    uint32_t dividend[kWords] = {m_word[0], m_word[1], m_word[2]};
    if (other.m_decimal > m_decimal) ScaleUp(dividend, static_cast<unsigned>(other.m_decimal - m_decimal));
    DivW(dividend, other.m_word, result.m_word);
  }
  if (IsZeroW(result.m_word)) result.m_sign = 1;
  return result;
}

OEPrecisionInteger OEPrecisionInteger::Mul10() const {
  OEPrecisionInteger result(*this);
  result.Mul10InPlace();
  return result;
}

OEPrecisionInteger& OEPrecisionInteger::Mul10InPlace() {
  MulAddSmall(m_word, 10, 0);
  return *this;
}

OEPrecisionInteger OEPrecisionInteger::Div10() const {
  OEPrecisionInteger result(*this);
  DivSmall(result.m_word, 10);
  if (IsZeroW(result.m_word)) result.m_sign = 1;
  return result;
}

OEPrecisionInteger OEPrecisionInteger::abs() const {
  OEPrecisionInteger result(*this);
  result.m_sign = 1;
  return result;
}

void OEPrecisionInteger::Negate() {
  if (!IsZeroW(m_word)) m_sign = static_cast<short>(-m_sign);
}

OEPrecisionInteger OEPrecisionInteger::Integer() const {
  OEPrecisionInteger result(*this);
  result.Decimal(0);
  return result;
}

OEPrecisionInteger OEPrecisionInteger::Fraction() const { return *this - Integer(); }

unsigned short OEPrecisionInteger::Decimal(unsigned short n) {
  if (n > kMaxDecimal) return 0;
  if (m_decimal < n) {
    ScaleUp(m_word, static_cast<unsigned>(n - m_decimal));
  } else if (m_decimal > n) {
    ScaleDown(m_word, static_cast<unsigned>(m_decimal - n));
    if (IsZeroW(m_word)) m_sign = 1;
  }
  m_decimal = n;
  return 1;
}

unsigned short OEPrecisionInteger::Decimal() const { return m_decimal; }

unsigned short OEPrecisionInteger::SetDecimal(unsigned short n) {
  if (n > kMaxDecimal) return 0;
  m_decimal = n;
  return 1;
}

// ---------------------------------------------------------------------------
// Queries

unsigned short OEPrecisionInteger::FitInAULong() const { return Fits32(m_word); }
unsigned short OEPrecisionInteger::FitInASLong() const { return Fits32(m_word) && (m_word[0] >> 31) == 0; }
unsigned short OEPrecisionInteger::FitInAUShort() const { return Fits32(m_word) && m_word[0] < 0x10000u; }
unsigned short OEPrecisionInteger::FitInASShort() const { return Fits32(m_word) && m_word[0] < 0x8000u; }

short OEPrecisionInteger::Sign() const { return m_sign; }
unsigned short OEPrecisionInteger::IsZero() const { return IsZeroW(m_word); }
unsigned short OEPrecisionInteger::IsValid() const { return m_decimal <= kMaxDecimal; }

uint32_t OEPrecisionInteger::GetOEULong() const { return m_word[0]; }
int32_t OEPrecisionInteger::GetOESLong() const {
  return static_cast<int32_t>(m_sign < 0 ? 0u - m_word[0] : m_word[0]);
}
unsigned short OEPrecisionInteger::GetOEUShort() const { return static_cast<unsigned short>(GetOEULong()); }
short OEPrecisionInteger::GetOESShort() const { return static_cast<short>(GetOESLong()); }
uint32_t OEPrecisionInteger::GetLSBytes() const { return m_word[0]; }
uint32_t OEPrecisionInteger::GetSSBytes() const { return m_word[1]; }
uint32_t OEPrecisionInteger::GetMSBytes() const { return m_word[2]; }

// ---------------------------------------------------------------------------
// Binary record

char* OEPrecisionInteger::LockBuffer() {
  char* blocks = Blocks();
  return blocks ? blocks + kTextSize : nullptr;
}

// The block shares its allocation with the text of operator char*, which
// may still be in use: both are released with the value.
void OEPrecisionInteger::UnLockBuffer() {}

namespace {
// Offsets of the fields in the binary record.
constexpr int kOffVersion = 0;
constexpr int kOffWords = 2;
constexpr int kOffSign = 14;
constexpr int kOffDecimal = 16;
constexpr unsigned short kNegativeSign = 0xFFFF;
}  // namespace

void OEPrecisionInteger::ExportBinary(void* dest, unsigned short* len) const {
  if (dest == nullptr) return;
  char* out = static_cast<char*>(dest);
  OEUtility::PackShort(out + kOffVersion, kBinaryVersion);
  for (int k = 0; k < kWords; ++k) OEUtility::PackLong(out + kOffWords + 4 * k, m_word[k]);
  OEUtility::PackShort(out + kOffSign, m_sign < 0 ? kNegativeSign : 1);
  OEUtility::PackShort(out + kOffDecimal, m_decimal);
  if (len != nullptr) *len = m_binaryLen;
}

void OEPrecisionInteger::ImportBinary(const void* src) {
  if (src == nullptr) return;
  const char* in = static_cast<const char*>(src);
  if (OEUtility::UnPackShort(in + kOffVersion) != kBinaryVersion) return;
  for (int k = 0; k < kWords; ++k) m_word[k] = OEUtility::UnPackLong(in + kOffWords + 4 * k);
  m_sign = OEUtility::UnPackShort(in + kOffSign) == kNegativeSign ? -1 : 1;
  m_decimal = OEUtility::UnPackShort(in + kOffDecimal);
}

// ---------------------------------------------------------------------------
// Narrowed kinds

unsigned short OEPercent::IsValid() const {
  static const OEPrecisionInteger kZero;
  static const OEPrecisionInteger kHundred(100);
  return *this >= kZero && *this <= kHundred && OEPrecisionInteger::IsValid();
}

unsigned short OEPosPrecisionInteger::IsValid() const { return Sign() > 0 && OEPrecisionInteger::IsValid(); }
