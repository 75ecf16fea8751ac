// The driving loop of a parse: header lines to the root, then one tag at a
// time to the current object, with the recovery rules of the library.
#pragma once

#include <cstdint>

#include "ofxkit/parse/OEParser.h"

class OEParseEngine;
struct OETagDictionaryEntry;

// Implemented by the file objects: the parser validates their header block
// before it reads the body.
class OEHeaderValidation {
 public:
  virtual ~OEHeaderValidation() = default;
  virtual unsigned short ValidateHeaders() const = 0;
  // The same for a tolerant reading (OE_READ_TOLERANT): values that real
  // servers send are accepted with a warning instead of refusing the file.
  virtual unsigned short ValidateHeadersTolerantly() const { return ValidateHeaders(); }
};

// Reading options of a parse (SetReadingOptions), OR-ed together.
enum OEReadingOption : uint32_t {
  // The recovery rules of the library and nothing more (the default).
  OE_READ_STRICT = 0,
  // What servers commonly send beside the OFX 1.x rules is read, each time
  // with a warning (so such a parse answers 7, never 0): blank lines before
  // the header block are passed over; "ENCODING:UTF-8" (or "UNICODE") does not
  // refuse the file; an element tag directly followed by another tag
  // ("<MEMO><NAME>x") is read as an empty element instead of ending the parse.
  OE_READ_TOLERANT = 1
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
  // OE_READ_STRICT (the default) or OE_READ_TOLERANT, for the next parses.
  void SetReadingOptions(uint32_t options) { m_options = options; }
  uint32_t GetReadingOptions() const { return m_options; }

 private:
  OEParseStatus ReadHeaders(OEParseEngine& engine, OEDataObj* root);
  OEParseStatus ReadBody(OEParseEngine& engine, OEBuffer* buffer);
  unsigned short LogRecord(OEParseWarning warning, const OEString& value, const char* tagName, OETagID tag);

  OEParseEngine* m_engine;
  bool ReadEmptyElement(const OETagDictionaryEntry& entry);

  OEDataObj* m_objectWithError;
  uint32_t m_options = OE_READ_STRICT;
};
