// Writes a tree of data objects as OFX text in the SGML form.
#pragma once

#include <cstdint>

#include "ofxkit/core/OETagID.h"
#include "ofxkit/types/OECommon.h"
#include "ofxkit/types/OEString.h"

class OETagDictionary;

// 0: strings longer than their limit (or otherwise invalid) fail the build;
// any other value: they are cut to their limit (or written as they are).
typedef int32_t OEBuildStringOpt;
enum : int32_t { OE_BUILD_STRICT = 0, OE_BUILD_LENIENT = 1 };
// 0: characters as they are; 1: "<", ">" and "&" written as entities.
typedef int32_t OEBuildStringMacroOpt;
enum : int32_t { OE_MACRO_NONE = 0, OE_MACRO_REPLACE = 1 };
// As AddString's argument, 1 ends the value with a line feed. As the
// builder's option: 0/1 no line end, 2/5 CR LF, 3/6 LF, 4/7 CR for headers
// and blank lines.
typedef int32_t OEBuildStringCrLfOpt;

class OEBuilder {
 public:
  static constexpr char OE_LEFT_BRACE = '<';
  static constexpr char OE_RIGHT_BRACE = '>';
  static constexpr char OE_END_MARKER = '/';
  static constexpr const char* OE_NEW_LINE = "\n";
  static constexpr char OE_HEADER_SEP = ':';
  static constexpr const char* OE_BOOLEAN_TRUE = "Y";
  static constexpr const char* OE_BOOLEAN_FALSE = "N";

  explicit OEBuilder(OEBuildStringCrLfOpt option = 2);
  virtual ~OEBuilder() = default;

  virtual OEBuildStatus Build(OEBuffer* output, OEDataObj* object, OEBuildStringOpt stringOption,
                              unsigned short checkRequired);
  virtual OEBuildStatus AddTagStart(OETagID tag);
  virtual OEBuildStatus AddTagEnd(OETagID tag);
  virtual OEBuildStatus AddTagElement(OETagID tag);
  virtual OEBuildStatus AddBlankLine();
  virtual OEBuildStatus AddOESShort(short v);
  virtual OEBuildStatus AddOEUShort(unsigned short v, char fill, unsigned short width);
  virtual OEBuildStatus AddOEUShort(unsigned short v);
  virtual OEBuildStatus AddOESLong(int32_t v);
  virtual OEBuildStatus AddOEULong(uint32_t v);
  virtual OEBuildStatus AddOEChar(char c);
  virtual OEBuildStatus AddOEBoolean(unsigned short b);
  virtual OEBuildStatus AddString(const OEString& value, OEBuildStringMacroOpt macro, OEBuildStringCrLfOpt line);
  virtual OEBuildStatus AddString(const OEString* value, OEBuildStringMacroOpt macro, OEBuildStringCrLfOpt line);
  virtual OEBuildStatus AddTagOEBoolean(OETagID tag, unsigned short b);
  virtual OEBuildStatus AddTagOEUShort(OETagID tag, unsigned short v, char fill, unsigned short width);
  virtual OEBuildStatus AddTagOEUShort(OETagID tag, unsigned short v);
  virtual OEBuildStatus AddTagOESShort(OETagID tag, short v);
  virtual OEBuildStatus AddTagOEULong(OETagID tag, uint32_t v);
  virtual OEBuildStatus AddTagOESLong(OETagID tag, int32_t v);
  virtual OEBuildStatus AddTagOEString(OETagID tag, const OEString& value);
  virtual OEBuildStatus AddTagOEString(OETagID tag, const OEString* value);
  OEBuffer* GetBuffer() const { return m_output; }
  virtual OEBuildStatus AddBuffer(OEBuffer* other);

  void SetCRLFoption(OEBuildStringCrLfOpt option) { m_lineEnd = option; }
  OEBuildStringCrLfOpt GetCRLFoption() const { return m_lineEnd; }
  OEBuildStringOpt GetStringOption() const { return m_stringOption; }
  // The first object whose writing failed; kept until a caller clears it.
  OEDataObj* GetObjectInError() const { return m_objectInError; }
  void SetObjectInError(OEDataObj* obj) {
    if (!m_objectInError) m_objectInError = obj;
  }
  void ClearObjectInError() { m_objectInError = nullptr; }

 protected:
  OEBuildStatus AddTag(OETagType kind, const char* name);
  // Raw output helpers.
  OEBuildStatus Put(const char* text, uint32_t n);
  OEBuildStatus PutLineEnd();
  OEBuildStatus PutNewLine() { return Put("\n", 1); }
  const char* TagName(OETagID tag) const;

 private:
  OEBuildStatus WriteTag(const char* name, bool end, bool newline);

  OETagDictionary* m_dictionary;
  OEBuffer* m_output;
  OEBuildStringOpt m_stringOption;
  OEBuildStringCrLfOpt m_lineEnd;
  OEDataObj* m_objectInError;
};
