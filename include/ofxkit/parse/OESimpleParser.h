// The driving loop of a parse: header lines to the root, then one tag at a
// time to the current object, with the recovery rules of the library.
#pragma once

#include "ofxkit/parse/OEParser.h"

class OEParseEngine;
struct OETagDictionaryEntry;

// Implemented by the file objects: the parser validates their header block
// before it reads the body.
class OEHeaderValidation {
 public:
  virtual ~OEHeaderValidation() = default;
  virtual unsigned short ValidateHeaders() const = 0;
};

class OESimpleParser : public OEParser {
 public:
  // Header lines kept from one file; the rest are read past with a warning.
  static constexpr uint32_t kMaxHeaderLines = 1000;

  OESimpleParser();

  // Parses buffer into root. Answers 0 for a clean parse, 7 when the text was
  // read to its end but warnings were logged, and otherwise the status that
  // ended the parse (3 memory, 4 unreadable or unfinished text and refused
  // headers, 5 a misplaced end tag, 6 nesting deeper than ten aggregates).
  OEParseStatus Parse(OEBuffer* buffer, OEDataObj* root, unsigned short checkRequired) override;
  OEDataObj* GetObjectWithError() const { return m_objectWithError; }
  // Accepted for compatibility; a parse always uses the engine's dictionary.
  unsigned short SetParseTable(OETagDictionaryEntry*) { return 1; }
  // Uses this engine, as it stands, for the next parses instead of one made
  // for the buffer (to parse a part of a text whose headers were read).
  unsigned short SetParseEngine(OEParseEngine* engine) {
    m_engine = engine;
    return 1;
  }

 private:
  OEParseStatus ReadHeaders(OEParseEngine& engine, OEDataObj* root);
  OEParseStatus ReadBody(OEParseEngine& engine, OEBuffer* buffer);
  unsigned short LogRecord(OEParseWarning warning, const OEString& value, const char* tagName, OETagID tag);

  OEParseEngine* m_engine;
  OEDataObj* m_objectWithError;
};
