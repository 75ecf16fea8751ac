// Exact decimal numbers for OFX amounts, quantities, prices and rates: a
// 96-bit binary magnitude, a sign and a count of decimal places. The value is
// sign x magnitude x 10^-decimal.
#pragma once

#include <cstdint>

class OEPrecisionInteger {
 public:
  // Size of the block handed out by LockBuffer and reported by ExportBinary.
  static constexpr unsigned short m_binaryLen = 20;
  // Bytes of the binary record actually written (version, words, sign, decimal).
  static constexpr unsigned short kBinaryRecordLen = 18;
  static constexpr unsigned short kBinaryVersion = 1;
  // Largest decimal count of a valid value.
  static constexpr unsigned short kMaxDecimal = 29;
  // Size of the text block: sign, 29 digits, point and nul. Every 96-bit
  // magnitude has at most 29 decimal digits, so every value fits.
  static constexpr unsigned short kTextSize = 32;

  OEPrecisionInteger();
  explicit OEPrecisionInteger(int32_t value, unsigned short decimal = 0);
  // Parses text as ConvertStringToOEPrecisionInteger does.
  explicit OEPrecisionInteger(const char* text);
  OEPrecisionInteger(const OEPrecisionInteger& other);
  // Inline: amounts are destroyed by the million, and most never made either
  // block.
  virtual ~OEPrecisionInteger() {
    if (m_hasBlocks) FreeBlocks();
  }

  virtual OEPrecisionInteger& operator=(const char* text);
  // Magnitude |value|, its sign (+1 for 0), decimal 0.
  virtual OEPrecisionInteger& operator=(int32_t value);
  // Copies the value only (not the text or binary blocks).
  virtual OEPrecisionInteger& operator=(const OEPrecisionInteger& other);

  // Reads OFX text ("-1234.56", ".5", "1,25"). Malformed text is logged to the
  // parse log (OEPW_BADFORMAT, or OEPW_TOOLONG past 28 digits; one warning per
  // text) and whatever was read is kept. Returns 1 when the text was clean.
  virtual unsigned short ConvertStringToOEPrecisionInteger(const char* text);

  // Comparisons align decimal counts and compare exactly. Zero with sign -1
  // (from the text "-0") is neither equal to nor greater than zero.
  virtual unsigned short operator==(const OEPrecisionInteger& other) const;
  virtual unsigned short operator!=(const OEPrecisionInteger& other) const;
  virtual unsigned short operator>(const OEPrecisionInteger& other) const;
  virtual unsigned short operator>=(const OEPrecisionInteger& other) const;
  virtual unsigned short operator<(const OEPrecisionInteger& other) const;
  virtual unsigned short operator<=(const OEPrecisionInteger& other) const;

  // Bit shifts of the magnitude; bits shifted out are lost. All four change
  // the object itself.
  virtual OEPrecisionInteger& operator<<(unsigned short bits);
  virtual OEPrecisionInteger& operator>>(unsigned short bits);
  virtual OEPrecisionInteger& operator<<=(unsigned short bits);
  virtual OEPrecisionInteger& operator>>=(unsigned short bits);

  // Exact arithmetic; the result of + and - has the larger decimal count, of *
  // the sum of the counts, of / max(0, a.decimal - b.decimal) (truncated toward
  // zero). Division by a value below 1 in magnitude returns the dividend.
  // Magnitudes beyond 96 bits wrap.
  virtual OEPrecisionInteger& operator+=(const OEPrecisionInteger& other);
  virtual OEPrecisionInteger& operator-=(const OEPrecisionInteger& other);
  virtual OEPrecisionInteger operator+(const OEPrecisionInteger& other) const;
  virtual OEPrecisionInteger operator-(const OEPrecisionInteger& other) const;
  virtual OEPrecisionInteger operator/(const OEPrecisionInteger& other) const;
  virtual OEPrecisionInteger operator*(const OEPrecisionInteger& other) const;

  // Magnitude x 10 (decimal unchanged).
  virtual OEPrecisionInteger Mul10() const;
  virtual OEPrecisionInteger& Mul10InPlace();
  // Magnitude / 10 truncated (decimal unchanged).
  virtual OEPrecisionInteger Div10() const;
  virtual OEPrecisionInteger abs() const;
  // Flips the sign; zero stays positive.
  virtual void Negate();
  // The integer part (truncated toward zero), decimal 0.
  virtual OEPrecisionInteger Integer() const;
  // The part after the point: the value minus its integer part, with the
  // value's sign and decimal count (-1.25 gives -.25).
  virtual OEPrecisionInteger Fraction() const;

  // The value as OFX text, in the object's own block (valid until the next
  // call or destruction). Null, with g_allocFailed set, when the block cannot
  // be allocated.
  virtual operator char*();

  // Rescales to n decimal places: multiplies up, or divides down truncating
  // toward zero (1.239 -> 1.23). Returns 0 and changes nothing when n > 29.
  virtual unsigned short Decimal(unsigned short n);
  virtual unsigned short Decimal() const;

  // Magnitude-only range checks (the decimal count is not applied).
  virtual unsigned short FitInASLong() const;
  virtual unsigned short FitInAULong() const;
  virtual unsigned short FitInASShort() const;
  virtual unsigned short FitInAUShort() const;

  virtual short Sign() const;
  virtual unsigned short IsZero() const;
  // Decimal count at most 29.
  virtual unsigned short IsValid() const;

  // Low word of the magnitude, with or without the sign; the decimal count is
  // not applied.
  virtual uint32_t GetOEULong() const;
  virtual int32_t GetOESLong() const;
  virtual unsigned short GetOEUShort() const;
  virtual short GetOESShort() const;
  virtual uint32_t GetLSBytes() const;
  virtual uint32_t GetSSBytes() const;
  virtual uint32_t GetMSBytes() const;

  // Reinterprets the magnitude with n decimal places (no rescaling). Returns 0
  // and changes nothing when n > 29.
  unsigned short SetDecimal(unsigned short n);

  // Writes the OFX text into out (kTextSize bytes) without touching the
  // object's own block; returns the text's length.
  unsigned short FormatText(char* out) const;

  // Binary record, little-endian: version 1 (2 bytes), low, middle and high
  // words (4 bytes each), sign (+1 or 0xFFFF), decimal (2 bytes).
  // A m_binaryLen-byte block owned by the object, allocated once (with the
  // text block of operator char*) and released with the object; null with
  // g_allocFailed set when it cannot be had. UnLockBuffer keeps it.
  char* LockBuffer();
  void UnLockBuffer();
  // Writes the record to dest and sets *len to m_binaryLen; nothing happens
  // when dest is null.
  void ExportBinary(void* dest, unsigned short* len) const;
  // Takes the record's fields when its version is 1; ignores it otherwise.
  void ImportBinary(const void* src);

 private:
  void FreeBlocks();
  char* Blocks();
  void SetZero();
  // Adds sign x magnitude x 10^-decimal of another value (sign given apart so
  // that subtraction can pass the flipped one).
  void AddSigned(const uint32_t* words, short sign, unsigned short decimal);
  // -1, 0 or 1 as |this| compares with |other|, decimal counts aligned.
  int CompareMagnitude(const OEPrecisionInteger& other) const;

  uint32_t m_word[3];  // low, middle, high words of the magnitude
  int8_t m_sign;       // +1 or -1
  // Whether the text block of operator char* and the block of LockBuffer,
  // made together on first use, exist. They are kept beside the value (see
  // Blocks), so that an amount is 24 bytes.
  uint8_t m_hasBlocks;
  unsigned short m_decimal;
};

// A rate between 0 and 100 inclusive.
class OEPercent : public OEPrecisionInteger {
 public:
  using OEPrecisionInteger::OEPrecisionInteger;
  using OEPrecisionInteger::operator=;
  OEPercent() = default;
  explicit OEPercent(const OEPrecisionInteger& other) : OEPrecisionInteger(other) {}
  unsigned short IsValid() const override;
};

// A non-negative amount or quantity.
class OEPosPrecisionInteger : public OEPrecisionInteger {
 public:
  using OEPrecisionInteger::OEPrecisionInteger;
  using OEPrecisionInteger::operator=;
  OEPosPrecisionInteger() = default;
  explicit OEPosPrecisionInteger(const OEPrecisionInteger& other) : OEPrecisionInteger(other) {}
  unsigned short IsValid() const override;
};
