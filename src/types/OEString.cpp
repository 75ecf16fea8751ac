#include "ofxkit/types/OEString.h"

#include <cctype>
#include <cstdlib>
#include <cstring>
#include <new>
#include <utility>

unsigned short g_allocFailed = 0;

namespace {
constexpr size_t kMaxBlock = 0xFFFF;  // a block holds at most 65535 bytes
}

OEString::OEString()
    : m_specLength(kNoLimit), m_text(nullptr), m_bufferSize(0), m_length(0), m_encoding(OE_ENCODE_PLAIN) {}

OEString::OEString(const char* text) : OEString() {
  if (text) Assign(text, strlen(text));
}

OEString::OEString(const char* text, size_t length) : OEString() {
  if (text) Assign(text, length);
}

OEString::OEString(const OEString& other) : OEString() {
  Assign(other.m_text, other.m_length);
  m_encoding = other.m_encoding;
  m_specLength = other.m_specLength;
}

OEString::OEString(OEString&& other) noexcept
    : m_specLength(other.m_specLength),
      m_text(other.m_text),
      m_bufferSize(other.m_bufferSize),
      m_length(other.m_length),
      m_encoding(other.m_encoding) {
  other.m_text = nullptr;
  other.m_bufferSize = 0;
  other.m_length = 0;
}

OEString::~OEString() { free(m_text); }

void OEString::Release() {
  free(m_text);
  m_text = nullptr;
  m_bufferSize = 0;
  m_length = 0;
}

// Grows the block to exactly n bytes when it is smaller; never shrinks it.
bool OEString::EnsureRoom(size_t n) {
  if (n <= m_bufferSize) return true;
  if (n > kMaxBlock) {  // the text would not fit the 16-bit length
    Release();
    return false;
  }
  char* block = static_cast<char*>(realloc(m_text, n));
  if (!block) {
    g_allocFailed = 1;
    Release();
    return false;
  }
  if (!m_text) memset(block, 0, n);
  m_text = block;
  m_bufferSize = static_cast<unsigned short>(n);
  return true;
}

void OEString::Assign(const char* text, size_t length) {
  if (!text || length == 0) {
    Release();
    return;
  }
  if (text >= m_text && text < m_text + m_bufferSize) {  // assigning part of ourselves
    OEString copy(text, length);
    Assign(copy.m_text, copy.m_length);
    return;
  }
  if (!EnsureRoom(length + 1)) return;
  memcpy(m_text, text, length);
  m_text[length] = '\0';
  m_length = static_cast<unsigned short>(length);
}

void OEString::Append(const char* text, size_t length) {
  if (!text || length == 0) return;
  if (m_text && text >= m_text && text < m_text + m_bufferSize) {
    OEString copy(text, length);
    Append(copy.m_text, copy.m_length);
    return;
  }
  size_t oldLength = m_length;
  if (!EnsureRoom(oldLength + length + 1)) return;
  memcpy(m_text + oldLength, text, length);
  m_text[oldLength + length] = '\0';
  m_length = static_cast<unsigned short>(oldLength + length);
}

OEString& OEString::operator=(const char* text) {
  Assign(text, text ? strlen(text) : 0);
  return *this;
}

OEString& OEString::operator=(const OEString& other) {
  if (this != &other) AssignTextAndEncoding(other);
  m_specLength = other.m_specLength;
  return *this;
}

OEString& OEString::operator=(OEString&& other) noexcept {
  if (this != &other) {
    free(m_text);
    m_text = other.m_text;
    m_bufferSize = other.m_bufferSize;
    m_length = other.m_length;
    m_encoding = other.m_encoding;
    m_specLength = other.m_specLength;
    other.m_text = nullptr;
    other.m_bufferSize = 0;
    other.m_length = 0;
  }
  return *this;
}

void OEString::AssignTextAndEncoding(const OEString& other) {
  if (this != &other) Assign(other.m_text, other.m_length);
  m_encoding = other.m_encoding;
}

OEString& OEString::operator+=(const char* text) {
  Append(text, text ? strlen(text) : 0);
  return *this;
}

OEString& OEString::operator+=(char c) {
  if (c != '\0') Append(&c, 1);
  return *this;
}

void OEString::Clear(char c) {
  if (!m_text) return;
  memset(m_text, c, m_bufferSize);
  m_text[m_bufferSize - 1] = '\0';
  m_length = static_cast<unsigned short>(strlen(m_text));
}

unsigned short OEString::IsValid() const { return m_specLength >= m_length; }

void OEString::Truncate(unsigned short n) {
  if (!m_text || n >= m_length) return;
  m_text[n] = '\0';
  m_length = static_cast<unsigned short>(strlen(m_text));
}

void OEString::TruncateToSpec() { Truncate(SpecLength()); }

void OEString::MakeUpper() {
  for (unsigned short i = 0; i < m_length; ++i)
    m_text[i] = static_cast<char>(toupper(static_cast<unsigned char>(m_text[i])));
}

void OEString::MakeLower() {
  for (unsigned short i = 0; i < m_length; ++i)
    m_text[i] = static_cast<char>(tolower(static_cast<unsigned char>(m_text[i])));
}

void OEString::TrimLeadingSpaces() {
  if (!m_text) return;
  unsigned short skip = 0;
  while (skip < m_length && m_text[skip] == ' ') ++skip;
  if (skip == 0) return;
  memmove(m_text, m_text + skip, m_length - skip + 1u);
  m_length = static_cast<unsigned short>(strlen(m_text));
}

void OEString::TrimTrailingSpaces() {
  if (!m_text) return;
  while (m_length > 0 && m_text[m_length - 1] == ' ') m_text[--m_length] = '\0';
}

unsigned short OEString::IsWhiteSpace() const {
  for (unsigned short i = 0; i < m_length; ++i) {
    char c = m_text[i];
    if (c != ' ' && c != '\n' && c != '\r' && c != '\t') return 0;
  }
  return 1;
}

bool OEString::operator==(const char* text) const {
  bool mineEmpty = m_length == 0;
  bool theirsEmpty = !text || *text == '\0';
  if (mineEmpty || theirsEmpty) return mineEmpty == theirsEmpty;
  return strcmp(m_text, text) == 0;
}

bool OEString::operator==(const OEString& other) const {
  if (m_length != other.m_length) return false;
  if (m_length == 0) return true;
  return memcmp(m_text, other.m_text, m_length) == 0;
}

unsigned short OEString::strcmpi(const char* text) const {
  bool mineEmpty = m_length == 0;
  bool theirsEmpty = !text || *text == '\0';
  if (mineEmpty || theirsEmpty) return mineEmpty == theirsEmpty;
  const unsigned char* a = reinterpret_cast<const unsigned char*>(m_text);
  const unsigned char* b = reinterpret_cast<const unsigned char*>(text);
  for (;; ++a, ++b) {
    unsigned char ca = *a, cb = *b;
    if (ca >= 'A' && ca <= 'Z') ca = static_cast<unsigned char>(ca - 'A' + 'a');
    if (cb >= 'A' && cb <= 'Z') cb = static_cast<unsigned char>(cb - 'A' + 'a');
    if (ca != cb) return 0;
    if (ca == 0) return 1;
  }
}

char* OEString::LockBuffer(unsigned short n) {
  if (!EnsureRoom(n)) return nullptr;
  return m_text;
}

void OEString::UnlockBuffer() {
  if (!m_text) {
    m_length = 0;
    return;
  }
  m_text[m_bufferSize - 1] = '\0';
  m_length = static_cast<unsigned short>(strlen(m_text));
}

OEString operator+(const OEString& a, const OEString& b) {
  OEString result;
  result.Assign(a.c_str(), a.GetStrLength());
  result.Append(b.c_str(), b.GetStrLength());
  result.SetEncoding(a.GetEncoding() == OE_ENCODE_CDATA || b.GetEncoding() == OE_ENCODE_CDATA ? OE_ENCODE_CDATA
                                                                                              : a.GetEncoding());
  return result;
}

const char* operator+(const OEString& s, unsigned short n) { return s.c_str() + n; }

// ---------------------------------------------------------------------------

OEMultiLenString& OEMultiLenString::operator=(const OEString& other) {
  AssignTextAndEncoding(other);
  return *this;
}

OEMultiLenString& OEMultiLenString::operator=(const OEMultiLenString& other) {
  AssignTextAndEncoding(other);
  return *this;
}

OEUserPassword::OEUserPassword(const OEUserPassword& other) : OEString(other) {}

OEUserPassword::~OEUserPassword() { Wipe(); }

void OEUserPassword::Wipe() {
  char* block = const_cast<char*>(operator+(*this, static_cast<unsigned short>(0)));
  if (BufferSize() == 0) return;
  // volatile so the zeroing is not optimised away before the block is freed
  volatile char* p = block;
  for (unsigned short i = 0; i < BufferSize(); ++i) p[i] = 0;
}

OEUserPassword& OEUserPassword::operator=(const OEString& other) {
  if (this != &other) {
    Wipe();
    AssignTextAndEncoding(other);
  }
  return *this;
}

OEUserPassword& OEUserPassword::operator=(const OEUserPassword& other) {
  return operator=(static_cast<const OEString&>(other));
}

OEUserPassword& OEUserPassword::operator=(const char* text) {
  Wipe();
  OEString::operator=(text);
  return *this;
}

OEEMailMsgBody& OEEMailMsgBody::operator=(const OEString& other) {
  AssignTextAndEncoding(other);
  OEString::SetSpecLength(other.SpecLength() == 10000 ? 10000 : 2000);
  return *this;
}

OEEMailMsgBody& OEEMailMsgBody::operator=(const OEEMailMsgBody& other) {
  return operator=(static_cast<const OEString&>(other));
}

unsigned short OEEMailMsgBody::IsValid() const {
  if (IsEmpty()) return 0;
  if (SpecLength() == 2000) return GetStrLength() <= 2160;
  return SpecLength() >= GetStrLength();
}
