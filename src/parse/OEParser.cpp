#include "ofxkit/parse/OEParser.h"

#include "ofxkit/core/OEDataObj.h"

OEParser::OEParser() : m_current(nullptr), m_stack{}, m_depth(0), m_validTags{nullptr, 0} {
  if (OEParseLogger* log = OEParseLogger::TheOEParseLogger()) {
    log->EnableLogging(1);
    log->DeleteAll();
  }
}

OEParseStatus OEParser::Parse(OEBuffer*, OEDataObj* root, unsigned short) {
  m_current = root;
  if (root) root->SetupForParsing(this);
  return OE_PARSE_OK;
}

unsigned short OEParser::PushObject(OEDataObj* obj) {
  if (m_depth >= kMaxDepth || !obj) return 0;
  m_stack[m_depth].object = m_current;
  m_stack[m_depth].validTags = m_validTags;
  ++m_depth;
  m_current = obj;
  OEArrayOfTags valid{nullptr, 0};
  obj->GetArrayOfValidTags(valid);
  m_validTags = valid;
  obj->SetupForParsing(this);
  return 1;
}

unsigned short OEParser::PopObject() {
  if (m_depth <= 0) return 0;
  --m_depth;
  m_current = m_stack[m_depth].object;
  m_validTags = m_stack[m_depth].validTags;
  if (m_current) m_current->SetupForParsing(this);
  return 1;
}

unsigned short OEParser::SetValidTags(OEArrayOfTags& tags) {
  m_validTags = tags;
  return 1;
}

unsigned short OEParser::IsValidTag(OETagID tag) {
  if (!m_validTags.tags) return 1;
  const unsigned short n = m_validTags.count;
  uint8_t& hint = m_validAt[static_cast<uint32_t>(tag) % kValidHints];
  if (hint < n && m_validTags.tags[hint] == tag) return 1;
  for (unsigned short i = 0; i < n; ++i) {
    if (m_validTags.tags[i] == tag) {
      if (i <= UINT8_MAX) hint = static_cast<uint8_t>(i);
      return 1;
    }
  }
  return 0;
}

void OEParser::EnableLogging(unsigned short on) {
  if (OEParseLogger* log = OEParseLogger::TheOEParseLogger()) log->EnableLogging(on);
}

unsigned short OEParser::GetAnyParseExceptionsLogged() const {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  return log ? log->GetAnyParseExceptionsLogged() : 0;
}

unsigned short OEParser::GetNumberParseExceptions() {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  return log ? log->Entries() : 0;
}

OEParseException* OEParser::GetParseException(unsigned short index) const {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  return log ? log->Get(index) : nullptr;
}

unsigned short OEParser::CopyExceptionListTo(OEParseLogger* to) {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  if (!log || !to || log == to) return 0;
  return to->DeepCopyFrom(log);
}

unsigned short OEParser::AppendParseException(OEParseException* record) {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  if (!log) {
    delete record;
    return 0;
  }
  return log->AppendParseException(record);
}

unsigned short OEParser::AppendParseException(OEParseWarning warning, OEString value, OEString tagName, OETagID tag,
                                              OEDataObj* object) {
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  return log ? log->AppendParseException(warning, value, tagName, tag, object) : 0;
}
