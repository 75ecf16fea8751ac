#include "ofxkit/types/OEString.h"

#include <cctype>
#include <cstdlib>
#include <cstring>
#include <new>
#include <typeinfo>
#include <utility>

unsigned short g_allocFailed = 0;

namespace {
constexpr size_t kMaxBlock = 0xFFFF;  // a block holds at most 65535 bytes
}

OEString::OEString()
    : m_encoding(static_cast<uint8_t>(OE_ENCODE_PLAIN)), m_specLength(kNoLimit), m_bufferSize(0), m_length(0), m_store() {}

OEString::OEString(const char* text) : OEString() {
  if (text) Assign(text, strlen(text));
}

OEString::OEString(const char* text, size_t length) : OEString() {
  if (text) Assign(text, length);
}

OEString::OEString(const OEString& other) : OEString() {
  Assign(other.c_str(), other.m_length);
  m_encoding = other.m_encoding;
  m_specLength = other.m_specLength;
}

OEString::OEString(OEString&& other) noexcept : OEString() {
  TakeStorage(other);
  m_encoding = other.m_encoding;
  m_specLength = other.m_specLength;
}

// Takes other's block (its address, or the inline bytes) and leaves other null.
void OEString::TakeStorage(OEString& other) {
  Release();
  memcpy(m_store, other.m_store, sizeof m_store);
  m_bufferSize = other.m_bufferSize;
  m_length = other.m_length;
  memset(other.m_store, 0, sizeof other.m_store);
  other.m_bufferSize = 0;
  other.m_length = 0;
}

void OEString::Release() {
  if (IsInline())
    memset(m_store, 0, m_bufferSize);  // no text (a password's) is left behind
  else
    free(HeapBlock());
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
  const bool first = m_bufferSize == 0;
  if (n <= kInlineBlock) {  // still fits inside: only the size changes
    if (first) memset(m_store, 0, n);
    m_bufferSize = static_cast<unsigned short>(n);
    return true;
  }
  char* block;
  if (IsInline()) {
    block = static_cast<char*>(malloc(n));
    if (block) {
      if (first) {
        memset(block, 0, n);
      } else {
        memcpy(block, m_store, m_bufferSize);
        memset(m_store, 0, sizeof m_store);
      }
    }
  } else {
    block = static_cast<char*>(realloc(HeapBlock(), n));
  }
  if (!block) {
    g_allocFailed = 1;
    Release();
    return false;
  }
  SetHeapBlock(block);
  m_bufferSize = static_cast<unsigned short>(n);
  return true;
}

void OEString::Assign(const char* text, size_t length) {
  if (!text || length == 0) {
    Release();
    return;
  }
  if (length < m_bufferSize) {
    // The block has room and stays where it is, so the text may even be a
    // part of it.
    char* block = Block();
    memmove(block, text, length);
    block[length] = '\0';
    m_length = static_cast<unsigned short>(length);
    return;
  }
  if (m_bufferSize && text >= Block() && text < Block() + m_bufferSize) {  // assigning part of ourselves
    OEString copy(text, length);
    Assign(copy.c_str(), copy.m_length);
    return;
  }
  if (m_bufferSize == 0 && length < kInlineBlock) {
    // A first short text: written straight into the inline block, which the
    // text and its terminator fill exactly.
    memcpy(m_store, text, length);
    m_store[length] = '\0';
    m_bufferSize = static_cast<unsigned short>(length + 1);
    m_length = static_cast<unsigned short>(length);
    return;
  }
  if (!EnsureRoom(length + 1)) return;
  char* block = Block();
  memcpy(block, text, length);
  block[length] = '\0';
  m_length = static_cast<unsigned short>(length);
}

void OEString::Append(const char* text, size_t length) {
  if (!text || length == 0) return;
  if (m_bufferSize && text >= Block() && text < Block() + m_bufferSize) {
    OEString copy(text, length);
    Append(copy.c_str(), copy.m_length);
    return;
  }
  size_t oldLength = m_length;
  if (!EnsureRoom(oldLength + length + 1)) return;
  char* block = Block();
  memcpy(block + oldLength, text, length);
  block[oldLength + length] = '\0';
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
  if (this == &other) return *this;
  // A string of a derived class keeps its own rules for the limit (a fixed
  // length keeps its own, an e-mail body picks one): assignment through an
  // OEString& goes to its copying assignment, as an lvalue's would.
  if (typeid(*this) != typeid(OEString)) {
    operator=(static_cast<const OEString&>(other));
    return *this;
  }
  TakeStorage(other);
  m_encoding = other.m_encoding;
  m_specLength = other.m_specLength;
  return *this;
}

void OEString::AssignTextAndEncoding(const OEString& other) {
  if (this != &other) Assign(other.c_str(), other.m_length);
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
  if (!m_bufferSize) return;
  char* block = Block();
  memset(block, c, m_bufferSize);
  block[m_bufferSize - 1] = '\0';
  m_length = static_cast<unsigned short>(strlen(block));
}

unsigned short OEString::IsValid() const { return m_specLength >= m_length; }

void OEString::Truncate(unsigned short n) {
  if (!m_bufferSize || n >= m_length) return;
  char* block = Block();
  block[n] = '\0';
  m_length = static_cast<unsigned short>(strlen(block));
}

void OEString::TruncateToSpec() { Truncate(SpecLength()); }

void OEString::MakeUpper() {
  char* block = Block();
  for (unsigned short i = 0; i < m_length; ++i)
    block[i] = static_cast<char>(toupper(static_cast<unsigned char>(block[i])));
}

void OEString::MakeLower() {
  char* block = Block();
  for (unsigned short i = 0; i < m_length; ++i)
    block[i] = static_cast<char>(tolower(static_cast<unsigned char>(block[i])));
}

void OEString::TrimLeadingSpaces() {
  if (!m_bufferSize) return;
  char* block = Block();
  unsigned short skip = 0;
  while (skip < m_length && block[skip] == ' ') ++skip;
  if (skip == 0) return;
  memmove(block, block + skip, m_length - skip + 1u);
  m_length = static_cast<unsigned short>(strlen(block));
}

void OEString::TrimTrailingSpaces() {
  if (!m_bufferSize) return;
  char* block = Block();
  while (m_length > 0 && block[m_length - 1] == ' ') block[--m_length] = '\0';
}

unsigned short OEString::IsWhiteSpace() const {
  const char* block = c_str();
  for (unsigned short i = 0; i < m_length; ++i) {
    char c = block[i];
    if (c != ' ' && c != '\n' && c != '\r' && c != '\t') return 0;
  }
  return 1;
}

bool OEString::operator==(const char* text) const {
  bool mineEmpty = m_length == 0;
  bool theirsEmpty = !text || *text == '\0';
  if (mineEmpty || theirsEmpty) return mineEmpty == theirsEmpty;
  return strcmp(Block(), text) == 0;
}

bool OEString::operator==(const OEString& other) const {
  if (m_length != other.m_length) return false;
  if (m_length == 0) return true;
  return memcmp(Block(), other.Block(), m_length) == 0;
}

unsigned short OEString::strcmpi(const char* text) const {
  bool mineEmpty = m_length == 0;
  bool theirsEmpty = !text || *text == '\0';
  if (mineEmpty || theirsEmpty) return mineEmpty == theirsEmpty;
  const unsigned char* a = reinterpret_cast<const unsigned char*>(Block());
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
  if (!EnsureRoom(n) || !m_bufferSize) return nullptr;
  return Block();
}

void OEString::UnlockBuffer() {
  if (!m_bufferSize) {
    m_length = 0;
    return;
  }
  char* block = Block();
  block[m_bufferSize - 1] = '\0';
  m_length = static_cast<unsigned short>(strlen(block));
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
