#include "ofxkit/core/OEBuilder.h"

#include <cstdio>
#include <cstring>

#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/types/OEBuffer.h"
#include "ofxkit/types/OEDynamicArray.h"
#include "ofxkit/types/OEDataConversion.h"
#include "ofxkit/types/OEDateTime.h"
#include "ofxkit/types/OELanguage.h"
#include "ofxkit/types/OEPrecisionInteger.h"
#include "ofxkit/types/OEUtility.h"

OEBuilder::OEBuilder(OEBuildStringCrLfOpt option)
    : m_dictionary(OETagDictionary::TheOETagDictionary()),
      m_output(nullptr),
      m_stringOption(OE_BUILD_STRICT),
      m_lineEnd(option),
      m_objectInError(nullptr) {}

OEBuildStatus OEBuilder::Build(OEBuffer* output, OEDataObj* object, OEBuildStringOpt stringOption,
                               unsigned short checkRequired) {
  if (!output || !object) return OE_BUILD_NO_OUTPUT;
  g_allocFailed = 0;
  m_output = output;
  m_stringOption = stringOption;
  OEBuildStatus status = object->Build(this);
  if (status == OE_BUILD_OK && checkRequired) {
    OEDataObj* where = object;
    OETagID missing = OE_TAG_NONE;
    if (!OEUtility::AllRequiredPresent(&where, &missing)) {
      SetObjectInError(where);
      status = OE_BUILD_MISSING_REQUIRED;
    }
  }
  if (g_allocFailed) {
    SetObjectInError(object);
    status = OE_BUILD_NO_MEMORY;
  }
  return status;
}

OEBuildStatus OEBuilder::Put(const char* text, uint32_t n) {
  if (!m_output) return OE_BUILD_NO_OUTPUT;
  OEBufferResult r = m_output->WriteLarge(text, n);
  if (r == OEBUF_OK) return OE_BUILD_OK;
  if (r != OEBUF_NOBUFFER) g_allocFailed = 1;
  return r == OEBUF_NOBUFFER ? OE_BUILD_NO_OUTPUT : OE_BUILD_NO_MEMORY;
}

OEBuildStatus OEBuilder::PutLineEnd() {
  switch (m_lineEnd) {
    case 2:
    case 5:
      return Put("\r\n", 2);
    case 3:
    case 6:
      return Put("\n", 1);
    case 4:
    case 7:
      return Put("\r", 1);
    default:
      return OE_BUILD_OK;
  }
}

const char* OEBuilder::TagName(OETagID tag) const { return m_dictionary ? m_dictionary->GetTagString(tag) : nullptr; }

// "<NAME>", "</NAME>" with or without the line feed, in one write.
OEBuildStatus OEBuilder::WriteTag(const char* name, bool end, bool newline) {
  if (!m_output || !name) return OE_BUILD_NO_OUTPUT;
  char small[96];
  size_t length = strlen(name);
  if (length + 4 > sizeof small) {
    OEBuildStatus s = Put(end ? "</" : "<", end ? 2 : 1);
    if (s == OE_BUILD_OK) s = Put(name, static_cast<uint32_t>(length));
    if (s == OE_BUILD_OK) s = Put(newline ? ">\n" : ">", newline ? 2 : 1);
    return s;
  }
  size_t n = 0;
  small[n++] = OE_LEFT_BRACE;
  if (end) small[n++] = OE_END_MARKER;
  memcpy(small + n, name, length);
  n += length;
  small[n++] = OE_RIGHT_BRACE;
  if (newline) small[n++] = '\n';
  return Put(small, static_cast<uint32_t>(n));
}

OEBuildStatus OEBuilder::AddTag(OETagType kind, const char* name) {
  return WriteTag(name, kind == OE_TAG_END, kind != OE_TAG_ELEMENT);
}

OEBuildStatus OEBuilder::AddTagStart(OETagID tag) {
  if (!m_output) return OE_BUILD_NO_OUTPUT;
  return WriteTag(TagName(tag), false, true);
}

OEBuildStatus OEBuilder::AddTagEnd(OETagID tag) {
  if (!m_output) return OE_BUILD_NO_OUTPUT;
  return WriteTag(TagName(tag), true, true);
}

OEBuildStatus OEBuilder::AddTagElement(OETagID tag) {
  if (!m_output) return OE_BUILD_NO_OUTPUT;
  return WriteTag(TagName(tag), false, false);
}

OEBuildStatus OEBuilder::AddBlankLine() { return PutLineEnd(); }

namespace {
// Formats into a small local buffer and appends the value's line feed.
template <size_t N, class... Args>
int Format(char (&out)[N], const char* format, Args... args) {
  int n = snprintf(out, N - 1, format, args...);
  if (n < 0 || static_cast<size_t>(n) >= N - 1) return -1;
  out[n++] = '\n';
  return n;
}
}  // namespace

OEBuildStatus OEBuilder::AddOESShort(short v) {
  char text[8];
  int n = Format(text, "%d", static_cast<int>(v));
  return n < 0 ? OE_BUILD_BAD_VALUE : Put(text, static_cast<uint32_t>(n));
}

OEBuildStatus OEBuilder::AddOEUShort(unsigned short v) {
  char text[8];
  int n = Format(text, "%u", static_cast<unsigned>(v));
  return n < 0 ? OE_BUILD_BAD_VALUE : Put(text, static_cast<uint32_t>(n));
}

OEBuildStatus OEBuilder::AddOEUShort(unsigned short v, char fill, unsigned short width) {
  char format[16];
  snprintf(format, sizeof format, "%%%c%uu", fill, static_cast<unsigned>(width));
  char text[9];  // seven characters, the line feed and the terminator
  int n = snprintf(text, 8, format, static_cast<unsigned>(v));
  if (n < 0 || n > 7) return OE_BUILD_BAD_VALUE;
  text[n++] = '\n';
  return Put(text, static_cast<uint32_t>(n));
}

OEBuildStatus OEBuilder::AddOESLong(int32_t v) {
  char text[13];
  int n = Format(text, "%d", static_cast<int>(v));
  return n < 0 ? OE_BUILD_BAD_VALUE : Put(text, static_cast<uint32_t>(n));
}

OEBuildStatus OEBuilder::AddOEULong(uint32_t v) {
  char text[13];
  int n = Format(text, "%u", static_cast<unsigned>(v));
  return n < 0 ? OE_BUILD_BAD_VALUE : Put(text, static_cast<uint32_t>(n));
}

OEBuildStatus OEBuilder::AddOEChar(char c) {
  char text[2] = {c, '\n'};
  return Put(text, 2);
}

OEBuildStatus OEBuilder::AddOEBoolean(unsigned short b) { return Put(b ? "Y\n" : "N\n", 2); }

OEBuildStatus OEBuilder::AddString(const OEString* value, OEBuildStringMacroOpt macro, OEBuildStringCrLfOpt line) {
  if (!value) return OE_BUILD_NO_VALUE;
  return AddString(*value, macro, line);
}

// The written text: a CDATA section for encoding 1, entities for the three
// special characters with macro option 1, else the text itself. A lenient
// build cuts the written text to the value's limit. Plain values are written
// straight from the string, without a copy.
OEBuildStatus OEBuilder::AddString(const OEString& value, OEBuildStringMacroOpt macro, OEBuildStringCrLfOpt line) {
  if (!m_output) return OE_BUILD_NO_OUTPUT;
  uint32_t limit = UINT32_MAX;
  if (!value.IsValid()) {
    bool tooLong = value.SpecLength() < value.GetStrLength();
    if (m_stringOption == OE_BUILD_STRICT) return tooLong ? OE_BUILD_TOO_LONG : OE_BUILD_INVALID_STRING;
    if (tooLong) limit = value.SpecLength();
  }
  const char* text = value.c_str();
  uint32_t length = value.GetStrLength();
  OEBuildStatus status = OE_BUILD_OK;
  if (value.GetEncoding() == OE_ENCODE_CDATA) {
    OEString copy("<![CDATA[");
    copy.Append(text, length);
    copy += "]]>";
    uint32_t n = copy.GetStrLength() < limit ? copy.GetStrLength() : limit;
    status = Put(copy.c_str(), n);
  } else if (macro == OE_MACRO_REPLACE && OEUtility::ContainsMacro(text)) {
    uint32_t written = 0;
    const char* run = text;
    for (const char* p = text; status == OE_BUILD_OK && written < limit; ++p) {
      char c = *p;
      const char* entity = c ? OEUtility::GetMacroString(c) : nullptr;
      if (c && !entity) continue;
      uint32_t runLength = static_cast<uint32_t>(p - run);
      if (runLength > limit - written) runLength = limit - written;
      status = Put(run, runLength);
      written += runLength;
      if (!c || status != OE_BUILD_OK) break;
      char piece[8];
      int n = snprintf(piece, sizeof piece, "&%s;", entity);
      uint32_t pieceLength = static_cast<uint32_t>(n) < limit - written ? static_cast<uint32_t>(n) : limit - written;
      status = Put(piece, pieceLength);
      written += pieceLength;
      run = p + 1;
    }
  } else {
    status = Put(text, length < limit ? length : limit);
  }
  if (status == OE_BUILD_OK && line == 1) status = PutNewLine();
  return status;
}

OEBuildStatus OEBuilder::AddTagOEBoolean(OETagID tag, unsigned short b) {
  OEBuildStatus s = AddTagElement(tag);
  return s != OE_BUILD_OK ? s : AddOEBoolean(b);
}

OEBuildStatus OEBuilder::AddTagOEUShort(OETagID tag, unsigned short v, char fill, unsigned short width) {
  OEBuildStatus s = AddTagElement(tag);
  return s != OE_BUILD_OK ? s : AddOEUShort(v, fill, width);
}

OEBuildStatus OEBuilder::AddTagOEUShort(OETagID tag, unsigned short v) {
  OEBuildStatus s = AddTagElement(tag);
  return s != OE_BUILD_OK ? s : AddOEUShort(v);
}

OEBuildStatus OEBuilder::AddTagOESShort(OETagID tag, short v) {
  OEBuildStatus s = AddTagElement(tag);
  return s != OE_BUILD_OK ? s : AddOESShort(v);
}

OEBuildStatus OEBuilder::AddTagOEULong(OETagID tag, uint32_t v) {
  OEBuildStatus s = AddTagElement(tag);
  return s != OE_BUILD_OK ? s : AddOEULong(v);
}

OEBuildStatus OEBuilder::AddTagOESLong(OETagID tag, int32_t v) {
  OEBuildStatus s = AddTagElement(tag);
  return s != OE_BUILD_OK ? s : AddOESLong(v);
}

OEBuildStatus OEBuilder::AddTagOEString(OETagID tag, const OEString& value) {
  if (value.IsWhiteSpace()) return OE_BUILD_NO_VALUE;
  OEBuildStatus s = AddTagElement(tag);
  return s != OE_BUILD_OK ? s : AddString(value, OE_MACRO_REPLACE, 1);
}

OEBuildStatus OEBuilder::AddTagOEString(OETagID tag, const OEString* value) {
  if (!value) return OE_BUILD_NO_VALUE;
  return AddTagOEString(tag, *value);
}

OEBuildStatus OEBuilder::AddText(const char* text) {
  if (!text) return OE_BUILD_BAD_VALUE;
  OEBuildStatus s = Put(text, static_cast<uint32_t>(strlen(text)));
  return s != OE_BUILD_OK ? s : PutNewLine();
}

OEBuildStatus OEBuilder::AddTagOEText(OETagID tag, const char* text) {
  if (!text) return OE_BUILD_BAD_VALUE;
  OEBuildStatus s = AddTagElement(tag);
  return s != OE_BUILD_OK ? s : AddText(text);
}

OEBuildStatus OEBuilder::AddHeader(OEHeaderTag header, const OEString& value) {
  if (value.GetStrLength() == 0) return OE_BUILD_OK;
  const char* name = OEDataConversion::Text(header);
  if (!name) return OE_BUILD_BAD_VALUE;
  OEBuildStatus s = Put(name, static_cast<uint32_t>(strlen(name)));
  if (s == OE_BUILD_OK) s = Put(":", 1);
  if (s == OE_BUILD_OK) s = Put(value.c_str(), value.GetStrLength());
  if (s == OE_BUILD_OK) s = PutLineEnd();
  return s;
}

OEBuildStatus OEBuilder::AddPrecisionInteger(const OEPrecisionInteger& value) {
  if (!value.IsValid()) return OE_BUILD_BAD_VALUE;
  char text[OEPrecisionInteger::kTextSize + 1];
  if (!value.FormatText(text)) return g_allocFailed ? OE_BUILD_NO_MEMORY : OE_BUILD_BAD_VALUE;
  return AddText(text);
}

OEBuildStatus OEBuilder::AddAmount(const OEPrecisionInteger& value) { return AddPrecisionInteger(value); }
OEBuildStatus OEBuilder::AddQuantity(const OEPrecisionInteger& value) { return AddPrecisionInteger(value); }
OEBuildStatus OEBuilder::AddUnitPrice(const OEPosPrecisionInteger& value) { return AddPrecisionInteger(value); }
OEBuildStatus OEBuilder::AddRate(OEPercent value) { return AddPrecisionInteger(value); }

OEBuildStatus OEBuilder::AddDateTime(const OEDateTime& value) {
  if (!value.GetDateString(m_scratch)) return OE_BUILD_BAD_VALUE;
  return AddText(m_scratch.c_str());
}

OEBuildStatus OEBuilder::AddTime(const OETime& value) {
  if (!value.GetTimeString(m_scratch)) return OE_BUILD_BAD_VALUE;
  return AddText(m_scratch.c_str());
}

OEBuildStatus OEBuilder::AddServerID(const OEString12& id) { return AddString(id, OE_MACRO_REPLACE, 1); }
OEBuildStatus OEBuilder::AddPayeeID(const OEString12& id) { return AddString(id, OE_MACRO_REPLACE, 1); }

OEBuildStatus OEBuilder::AddLanguage(const OELanguage& language) {
  OEString3 code;
  if (!OEDataConversion::LanguageToString(language, code)) return OE_BUILD_BAD_VALUE;
  return AddString(code, OE_MACRO_REPLACE, 1);
}

// These two write an empty value for a value without a text, and never fail.
OEBuildStatus OEBuilder::AddFidelityOptBuyType(const OEFidelityOptBuyType& value) {
  OEString text(OEDataConversion::Text(value));
  AddString(text, OE_MACRO_REPLACE, 1);
  return OE_BUILD_OK;
}

OEBuildStatus OEBuilder::AddFidelityOptSellType(const OEFidelityOptSellType& value) {
  OEString text(OEDataConversion::Text(value));
  AddString(text, OE_MACRO_REPLACE, 1);
  return OE_BUILD_OK;
}

#define OE_TAG_THEN(Adder, Type)                                       \
  OEBuildStatus OEBuilder::AddTagOE##Adder(OETagID tag, Type value) {  \
    OEBuildStatus s = AddTagElement(tag);                              \
    return s != OE_BUILD_OK ? s : Add##Adder(value);                   \
  }
OE_TAG_THEN(Amount, const OEPrecisionInteger&)
OE_TAG_THEN(Quantity, const OEPrecisionInteger&)
OE_TAG_THEN(UnitPrice, const OEPosPrecisionInteger&)
OE_TAG_THEN(Rate, const OEPercent&)
OE_TAG_THEN(DateTime, const OEDateTime&)
OE_TAG_THEN(Time, const OETime&)
OE_TAG_THEN(ServerID, const OEString12&)
OE_TAG_THEN(PayeeID, const OEString12&)
OE_TAG_THEN(Language, const OELanguage&)
#undef OE_TAG_THEN

// Enumerations: the value's text, checked before anything is written.
#define OE_ENUM_ADDERS(Name, Type)                                                 \
  OEBuildStatus OEBuilder::Add##Name(Type value) { return AddText(OEDataConversion::Text(value)); } \
  OEBuildStatus OEBuilder::AddTagOE##Name(OETagID tag, Type value) {               \
    return AddTagOEText(tag, OEDataConversion::Text(value));                       \
  }
OE_BUILDER_ENUMS(OE_ENUM_ADDERS)
#undef OE_ENUM_ADDERS

OEBuildStatus OEBuilder::AddBuffer(OEBuffer* other) {
  if (!m_output) return OE_BUILD_NO_OUTPUT;
  return m_output->Write(other) == OEBUF_OK ? OE_BUILD_OK : OE_BUILD_NO_MEMORY;
}

// ---------------------------------------------------------------------------
// Writing of the base data object and of string arrays.

OEBuildStatus OEDataObj::BuildObject(OEBuilder* builder, OETagID tag) const {
  if (!builder) return OE_BUILD_NO_OUTPUT;
  if (tag == OE_TAG_NONE) tag = GetType();
  OEBuildStatus status = builder->AddTagStart(tag);
  if (status == OE_BUILD_OK) status = Build(builder);
  if (status == OE_BUILD_OK) status = builder->AddTagEnd(tag);
  return status;
}

OEBuildStatus OEDynamicArrayString::Build(OEBuilder* builder, OETagID tag) const {
  if (!builder) return OE_BUILD_NO_OUTPUT;
  for (unsigned short i = 0; i < m_entries; ++i) {
    const OEString* s = Get(i);
    if (!s) continue;
    OEBuildStatus status = builder->AddTagOEString(tag, *s);
    if (status != OE_BUILD_OK) return status;
  }
  return OE_BUILD_OK;
}
