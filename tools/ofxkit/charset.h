// Text of an OFX file, in the character set its header names, as UTF-8 for
// the tool's output.
#pragma once

#include <cstddef>
#include <string>

class OEFileOFX;

namespace cli {

// The iconv name of the character set that an OFX header block names:
// "UTF-8" for ENCODING:UTF-8; "CP1252" for CHARSET:1252 (any code page
// number); ISO-8859-x names as they stand ("8859-1" and "LATIN1" too);
// "US-ASCII" for CHARSET:NONE or no CHARSET at all.
std::string CharsetName(const char* charset, const char* encoding);
// The same, from the headers of a parsed file.
std::string CharsetOf(const OEFileOFX& file);

// The tool writes requests with CHARSET:1252, so texts given to it as UTF-8
// (options, the body of a message) are written in Windows-1252. False, with
// out empty, for text that is not UTF-8 or holds a character that
// Windows-1252 lacks.
bool ToWindows1252(const char* text, size_t n, std::string& out);

// Converts text from one character set to UTF-8 with the C library's iconv.
// A byte that does not convert (undefined in the character set, or not part
// of a valid sequence) comes out as U+FFFD and is counted, so the caller can
// report it; nothing is dropped without a count.
class Utf8Converter {
 public:
  explicit Utf8Converter(const std::string& charset);
  ~Utf8Converter();
  Utf8Converter(const Utf8Converter&) = delete;
  Utf8Converter& operator=(const Utf8Converter&) = delete;

  // False when iconv does not know the character set (known once text that
  // is not ASCII came); text is then read as US-ASCII, every other byte
  // counted.
  bool Known() const { return m_known; }
  const std::string& Charset() const { return m_charset; }

  // Appends the UTF-8 form of n bytes at text to out; answers how many bytes
  // did not convert.
  size_t Convert(const char* text, size_t n, std::string& out);
  // The UTF-8 form of a nul-terminated text; bytes that did not convert are
  // added to Unconverted() and the first field that held one is remembered.
  std::string operator()(const char* text, const char* field = nullptr);
  // The same, appended to out.
  void Append(const char* text, size_t n, std::string& out, const char* field = nullptr);

  // Bytes that did not convert, over every call of operator().
  size_t Unconverted() const { return m_unconverted; }
  // The field named with the first such byte ("" when none was named).
  const std::string& FirstUnconvertedField() const { return m_firstField; }
  // One line for standard error about the bytes that did not convert, or ""
  // when every byte converted.
  std::string Report() const;

 private:
  void Open();

  std::string m_charset;
  void* m_cd;  // iconv_t
  bool m_opened = false;
  bool m_known;
  bool m_utf8;
  size_t m_unconverted = 0;
  std::string m_firstField;
};

}  // namespace cli
