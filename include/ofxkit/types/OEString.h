// Heap-backed 8-bit text with an advisory OFX length limit.
#pragma once

#include <cstddef>
#include <cstdint>
#include <cstdlib>
#include <cstring>

#include "ofxkit/types/OECommon.h"

enum OEStringEncode : int32_t {
  OE_ENCODE_PLAIN = 0,  // ordinary text
  OE_ENCODE_CDATA = 1   // written by the builder as a CDATA section
};

// The limit is advisory: a string keeps whatever it is given and only answers
// whether it fits (IsValid, ExceedsSpecLength). Texts of 65535 characters or
// more do not fit the 16-bit length and are refused (the string becomes null).
//
// Storage: the block (BufferSize bytes) lives inside the object while it is
// at most kInlineBlock bytes, which holds most OFX texts (identifiers, names,
// zone names), and on the heap beyond that; either way it behaves as one
// block that grows to exact fit and never shrinks while text is held.
class OEString {
 public:
  static constexpr unsigned short kNoLimit = 0xFFFF;

  OEString();
  OEString(const char* text);  // NOLINT: implicit by design, like a C string
  OEString(const char* text, size_t length);
  OEString(const OEString& other);
  OEString(OEString&& other) noexcept;
  // Inline: a short text (the common case) has nothing to free.
  virtual ~OEString() {
    if (!IsInline()) free(HeapBlock());
  }

  OEString& operator=(const char* text);
  virtual OEString& operator=(const OEString& other);
  OEString& operator=(OEString&& other) noexcept;
  OEString& operator+=(const char* text);
  OEString& operator+=(char c);
  // Replaces the text with the first `length` bytes at `text` (which need no
  // terminator). An empty text leaves a null string.
  void Assign(const char* text, size_t length);
  void Append(const char* text, size_t length);
  void Clear(char c);

  operator const char*() const { return m_bufferSize ? Block() : ""; }
  const char* c_str() const { return m_bufferSize ? Block() : ""; }
  unsigned short GetStrLength() const { return m_length; }
  unsigned short BufferSize() const { return m_bufferSize; }
  unsigned short IsNull() const { return m_bufferSize == 0; }
  unsigned short IsEmpty() const { return m_length == 0; }
  unsigned short SpecLength() const { return m_specLength; }
  unsigned short ExceedsSpecLength() const { return m_specLength < m_length; }
  OEStringEncode GetEncoding() const { return static_cast<OEStringEncode>(m_encoding); }
  void SetEncoding(OEStringEncode e) { m_encoding = static_cast<uint8_t>(e); }

  virtual void SetSpecLength(unsigned short specLength) { m_specLength = specLength; }
  virtual unsigned short IsValid() const;
  virtual void Truncate(unsigned short n);
  virtual void TruncateToSpec();

  void MakeUpper();
  void MakeLower();
  void TrimLeadingSpaces();
  void TrimTrailingSpaces();
  unsigned short IsWhiteSpace() const;

  bool operator==(const char* text) const;
  bool operator==(const OEString& other) const;
  bool operator!=(const char* text) const { return !(*this == text); }
  bool operator!=(const OEString& other) const { return !(*this == other); }
  bool Equal(const char* text) const { return *this == text; }
  bool Equal(const OEString& other) const { return *this == other; }
  unsigned short strcmpi(const char* text) const;

  char* LockBuffer(unsigned short n);
  void UnlockBuffer();

 protected:
  // Assignment of text and encoding without touching the spec length, for
  // the subclasses that keep their own limit.
  void AssignTextAndEncoding(const OEString& other);

 public:
  // Blocks of up to this many bytes are held inside the string.
  static constexpr unsigned short kInlineBlock = 32;

 private:
  bool EnsureRoom(size_t n);
  void Release();
  bool IsInline() const { return m_bufferSize <= kInlineBlock; }
  char* HeapBlock() const {
    char* p;
    memcpy(&p, m_store, sizeof p);
    return p;
  }
  void SetHeapBlock(char* p) { memcpy(m_store, &p, sizeof p); }
  // The block; meaningful only while BufferSize() is not 0.
  char* Block() { return IsInline() ? m_store : HeapBlock(); }
  const char* Block() const { return IsInline() ? m_store : HeapBlock(); }
  void TakeStorage(OEString& other);

  uint8_t m_encoding;  // an OEStringEncode; one byte keeps the string at 48 bytes
  unsigned short m_specLength;
  unsigned short m_bufferSize;  // 0: null string; up to kInlineBlock: inline
  unsigned short m_length;
  // The inline block, or the heap block's address once it is larger. Aligned
  // for a pointer, so that leak checkers (which look for pointers only at
  // aligned places) see the heap block as held.
  alignas(char*) char m_store[kInlineBlock];
};

OEString operator+(const OEString& a, const OEString& b);
const char* operator+(const OEString& s, unsigned short n);

// A string whose limit is fixed by its class and survives assignment.
template <unsigned short Limit>
class OEFixedString : public OEString {
 public:
  OEFixedString() { OEString::SetSpecLength(Limit); }
  OEFixedString(const char* text) : OEString(text) { OEString::SetSpecLength(Limit); }  // NOLINT
  OEFixedString(const OEFixedString& other) : OEString(other) { OEString::SetSpecLength(Limit); }
  OEFixedString& operator=(const OEString& other) override {
    AssignTextAndEncoding(other);
    return *this;
  }
  OEFixedString& operator=(const OEFixedString& other) {
    AssignTextAndEncoding(other);
    return *this;
  }
  OEFixedString& operator=(const char* text) {
    OEString::operator=(text);
    return *this;
  }
};

#define OE_FIXED_STRING(N)                                  \
  class OEString##N : public OEFixedString<N> {             \
   public:                                                  \
    using OEFixedString<N>::OEFixedString;                  \
    using OEFixedString<N>::operator=;                      \
    OEString##N() = default;                                \
    OEString##N(const OEString##N&) = default;              \
    OEString##N& operator=(const OEString##N& other) {      \
      OEFixedString<N>::operator=(other);                   \
      return *this;                                         \
    }                                                       \
  };
OE_FIXED_STRING(2)
OE_FIXED_STRING(3)
OE_FIXED_STRING(4)
OE_FIXED_STRING(5)
OE_FIXED_STRING(6)
OE_FIXED_STRING(7)
OE_FIXED_STRING(9)
OE_FIXED_STRING(10)
OE_FIXED_STRING(11)
OE_FIXED_STRING(12)
OE_FIXED_STRING(16)
OE_FIXED_STRING(22)
OE_FIXED_STRING(32)
OE_FIXED_STRING(36)
OE_FIXED_STRING(40)
OE_FIXED_STRING(60)
OE_FIXED_STRING(64)
OE_FIXED_STRING(80)
OE_FIXED_STRING(120)
OE_FIXED_STRING(171)
OE_FIXED_STRING(255)
OE_FIXED_STRING(360)
OE_FIXED_STRING(1000)
OE_FIXED_STRING(2000)
OE_FIXED_STRING(10000)
#undef OE_FIXED_STRING

// Unlimited until its owner sets a limit; keeps that limit across assignment.
class OEMultiLenString : public OEString {
 public:
  OEMultiLenString() = default;
  OEMultiLenString(const char* text) : OEString(text) {}  // NOLINT
  OEMultiLenString(const OEMultiLenString& other) = default;
  OEMultiLenString& operator=(const OEString& other) override;
  OEMultiLenString& operator=(const OEMultiLenString& other);
  OEMultiLenString& operator=(const char* text) {
    OEString::operator=(text);
    return *this;
  }
};

// A password: limit 171 (or 32), kept across assignment; its storage is
// overwritten with zeros before it is released.
class OEUserPassword : public OEString {
 public:
  OEUserPassword() { OEString::SetSpecLength(171); }
  OEUserPassword(const OEUserPassword& other);
  ~OEUserPassword() override;
  OEUserPassword& operator=(const OEString& other) override;
  OEUserPassword& operator=(const OEUserPassword& other);
  OEUserPassword& operator=(const char* text);
  void SetSpecLength32() { OEString::SetSpecLength(32); }
  void SetSpecLength171() { OEString::SetSpecLength(171); }

 private:
  void Wipe();
};

// An e-mail message body: limit 2000 (with a tolerance up to 2160) or 10000.
class OEEMailMsgBody : public OEString {
 public:
  OEEMailMsgBody() { OEString::SetSpecLength(2000); }
  OEEMailMsgBody(const OEEMailMsgBody& other) = default;
  OEEMailMsgBody& operator=(const OEString& other) override;
  OEEMailMsgBody& operator=(const OEEMailMsgBody& other);
  OEEMailMsgBody& operator=(const char* text) {
    OEString::operator=(text);
    return *this;
  }
  unsigned short IsValid() const override;
  void SetSpecLength2000() { OEString::SetSpecLength(2000); }
  void SetSpecLength10000() { OEString::SetSpecLength(10000); }
};
