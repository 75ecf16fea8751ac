// The stack of open objects that a parse fills, and access to the parse log.
#pragma once

#include <cstdint>

#include "ofxkit/core/OETagID.h"
#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OECommon.h"

class OEParser {
 public:
  static constexpr int16_t kMaxDepth = 10;

  OEParser();
  OEParser(const OEParser&) = default;
  OEParser& operator=(const OEParser&) = default;
  virtual ~OEParser() = default;

  // Makes root current and prepares it; reads nothing.
  virtual OEParseStatus Parse(OEBuffer* buffer, OEDataObj* root, unsigned short checkRequired);
  virtual unsigned short PushObject(OEDataObj* obj);
  virtual unsigned short PopObject();
  virtual unsigned short SetValidTags(OEArrayOfTags& tags);
  virtual unsigned short IsValidTag(OETagID tag);

  OEDataObj* GetCurrentObj() const { return m_current; }
  int16_t GetDepth() const { return m_depth; }

  void EnableLogging(unsigned short on);
  unsigned short GetAnyParseExceptionsLogged() const;
  unsigned short GetNumberParseExceptions();
  OEParseException* GetParseException(unsigned short index) const;
  unsigned short CopyExceptionListTo(OEParseLogger* to);

 protected:
  unsigned short AppendParseException(OEParseException* record);
  unsigned short AppendParseException(OEParseWarning warning, OEString value, OEString tagName, OETagID tag,
                                      OEDataObj* object);
  void SetCurrentObj(OEDataObj* obj) { m_current = obj; }

 private:
  struct Saved {
    OEDataObj* object;
    OEArrayOfTags validTags;
  };
  OEDataObj* m_current;
  Saved m_stack[kMaxDepth];
  int16_t m_depth;
  OEArrayOfTags m_validTags;
  // Where in the valid tags each tag (by its low bits) was last found. Only a
  // guess, checked before it is believed, so it never goes stale: the same
  // few classes ask about the same few tags all through a statement.
  static constexpr unsigned kValidHints = 64;
  uint8_t m_validAt[kValidHints] = {};
};
