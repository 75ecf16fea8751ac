#include "charset.h"

#include <iconv.h>

#include <cctype>
#include <cerrno>
#include <cstring>

#include "cli.h"

namespace cli {
namespace {

const char kReplacement[] = "\xEF\xBF\xBD";  // U+FFFD

std::string Upper(const char* text) {
  std::string s(text ? text : "");
  while (!s.empty() && std::isspace(static_cast<unsigned char>(s.back()))) s.pop_back();
  size_t start = 0;
  while (start < s.size() && std::isspace(static_cast<unsigned char>(s[start]))) ++start;
  s.erase(0, start);
  for (char& c : s) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  return s;
}

bool AllDigits(const std::string& s) {
  if (s.empty()) return false;
  for (char c : s)
    if (!std::isdigit(static_cast<unsigned char>(c))) return false;
  return true;
}

// Length of the valid UTF-8 sequence at p (at most n bytes), 0 when invalid.
size_t Utf8Sequence(const unsigned char* p, size_t n) {
  unsigned char c = p[0];
  size_t len;
  unsigned min;
  unsigned cp;
  if (c < 0x80) return 1;
  if (c >= 0xC2 && c <= 0xDF) {
    len = 2, min = 0x80, cp = c & 0x1Fu;
  } else if (c >= 0xE0 && c <= 0xEF) {
    len = 3, min = 0x800, cp = c & 0x0Fu;
  } else if (c >= 0xF0 && c <= 0xF4) {
    len = 4, min = 0x10000, cp = c & 0x07u;
  } else {
    return 0;
  }
  if (n < len) return 0;
  for (size_t i = 1; i < len; ++i) {
    if ((p[i] & 0xC0) != 0x80) return 0;
    cp = (cp << 6) | (p[i] & 0x3Fu);
  }
  if (cp < min || cp > 0x10FFFF || (cp >= 0xD800 && cp <= 0xDFFF)) return 0;
  return len;
}

}  // namespace

std::string CharsetName(const char* charset, const char* encoding) {
  std::string enc = Upper(encoding), cs = Upper(charset);
  if (enc == "UTF-8" || enc == "UTF8" || cs == "UTF-8" || cs == "UTF8") return "UTF-8";
  if (cs.empty() || cs == "NONE") return "US-ASCII";
  if (AllDigits(cs)) return "CP" + cs;  // a Windows or DOS code page: 1252, 1250, 437, 850 ...
  if (cs.rfind("8859-", 0) == 0) return "ISO-" + cs;
  if (cs == "LATIN1" || cs == "LATIN-1") return "ISO-8859-1";
  return cs;
}

std::string CharsetOf(const OEFileOFX& file) {
  const OEString* charset = file.GetHeader(OE_HEADER_CHARSET);
  const OEString* encoding = file.GetHeader(OE_HEADER_ENCODING);
  return CharsetName(charset ? charset->c_str() : nullptr, encoding ? encoding->c_str() : nullptr);
}

Utf8Converter::Utf8Converter(const std::string& charset)
    : m_charset(charset), m_cd(nullptr), m_known(true), m_utf8(charset == "UTF-8") {}

// Opened at the first byte that is not ASCII: iconv loads the character
// set's module, which a file of plain ASCII never needs.
void Utf8Converter::Open() {
  if (m_opened || m_utf8) return;
  m_opened = true;
  iconv_t cd = iconv_open("UTF-8", m_charset.c_str());
  if (cd == reinterpret_cast<iconv_t>(-1)) {
    m_known = false;
    cd = iconv_open("UTF-8", "US-ASCII");
    if (cd == reinterpret_cast<iconv_t>(-1)) cd = nullptr;
  }
  m_cd = cd;
}

Utf8Converter::~Utf8Converter() {
  if (m_cd) iconv_close(static_cast<iconv_t>(m_cd));
}

size_t Utf8Converter::Convert(const char* text, size_t n, std::string& out) {
  const unsigned char* p = reinterpret_cast<const unsigned char*>(text);
  size_t ascii = 0;
  while (ascii < n && p[ascii] < 0x80) ++ascii;
  out.append(text, ascii);  // the common case: plain ASCII converts to itself
  if (ascii == n) return 0;
  Open();
  size_t bad = 0;
  if (m_utf8 || !m_cd) {
    // UTF-8 stands as it is, once checked; without iconv only ASCII passes.
    for (size_t i = ascii; i < n;) {
      size_t len = m_utf8 ? Utf8Sequence(p + i, n - i) : (p[i] < 0x80 ? 1 : 0);
      if (len == 0) {
        out += kReplacement;
        ++bad;
        ++i;
      } else {
        out.append(text + i, len);
        i += len;
      }
    }
    return bad;
  }
  iconv_t cd = static_cast<iconv_t>(m_cd);
  iconv(cd, nullptr, nullptr, nullptr, nullptr);
  char* in = const_cast<char*>(text + ascii);
  size_t inLeft = n - ascii;
  char chunk[256];
  while (inLeft > 0) {
    char* o = chunk;
    size_t outLeft = sizeof chunk;
    size_t r = iconv(cd, &in, &inLeft, &o, &outLeft);
    out.append(chunk, static_cast<size_t>(o - chunk));
    if (r != static_cast<size_t>(-1)) break;
    if (errno == E2BIG) continue;
    // EILSEQ or EINVAL: this byte has no character; show it and go on.
    out += kReplacement;
    ++bad;
    ++in;
    --inLeft;
    iconv(cd, nullptr, nullptr, nullptr, nullptr);
  }
  char* o = chunk;
  size_t outLeft = sizeof chunk;
  iconv(cd, nullptr, nullptr, &o, &outLeft);  // any shift back to the initial state
  out.append(chunk, static_cast<size_t>(o - chunk));
  return bad;
}

std::string Utf8Converter::operator()(const char* text, const char* field) {
  std::string out;
  if (text) Append(text, std::strlen(text), out, field);
  return out;
}

void Utf8Converter::Append(const char* text, size_t n, std::string& out, const char* field) {
  size_t bad = Convert(text, n, out);
  if (bad && m_unconverted == 0 && field) m_firstField = field;
  m_unconverted += bad;
}

std::string Utf8Converter::Report() const {
  if (m_unconverted == 0) return "";
  std::string line = std::to_string(m_unconverted) + " byte(s) of the file " +
                     (m_utf8    ? std::string("are not valid UTF-8")
                      : m_known ? "do not convert from " + m_charset + " to UTF-8"
                                : "are not ASCII, and " + m_charset + " is a character set this system does not know") +
                     " and are shown as U+FFFD";
  if (!m_firstField.empty()) line += " (the first in " + m_firstField + ")";
  return line;
}

bool ToWindows1252(const char* text, size_t n, std::string& out) {
  out.clear();
  iconv_t cd = iconv_open("CP1252", "UTF-8");
  if (cd == reinterpret_cast<iconv_t>(-1)) return false;
  out.assign(n, '\0');  // never longer than its UTF-8 form
  char* in = const_cast<char*>(text);
  char* to = &out[0];
  size_t left = n, room = n;
  bool ok = iconv(cd, &in, &left, &to, &room) != static_cast<size_t>(-1) && left == 0;
  iconv_close(cd);
  out.resize(ok ? n - room : 0);
  return ok;
}

}  // namespace cli
