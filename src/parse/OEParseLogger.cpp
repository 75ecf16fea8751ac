#include "ofxkit/parse/OEParseLogger.h"

#include <new>
#include <utility>

#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OEDataObjFactory.h"
#include "ofxkit/parse/OEParser.h"
#include "ofxkit/types/OEBuffer.h"

namespace {
const char* const kWarningNames[] = {
    "OEPW_UNKNOWNEXCEPTION", "OEPW_UNKNOWNTAG", "OEPW_INVALIDAGG",    "OEPW_INVALIDELEM", "OEPW_BADFORMAT",
    "OEPW_OUTOFRANGE",       "OEPW_TOOLONG",    "OEPW_SKIPFAILED",    "OEPW_NULLPOINTER", "OEPW_INVALIDENDAGG",
    "OEPW_MISSINGTAG",       "OEPW_LOWERCASE",  "OEPW_EXTRAAGG"};
constexpr int32_t kWarningCount = sizeof kWarningNames / sizeof kWarningNames[0];

OEDataObjFactory* Factory() { return OEDataObj::GetFactory(); }
}  // namespace

OEParseException::OEParseException()
    : warning(OEPW_UNKNOWNEXCEPTION), object(nullptr), tag(OE_TAG_NONE), position(-1) {}

OEParseException::~OEParseException() { object = nullptr; }

const char* OEParseException::WarningName(OEParseWarning w) {
  return (w >= 0 && w < kWarningCount) ? kWarningNames[w] : "";
}

void OEParseException::WarningString(OEString& out) const { out = WarningName(warning); }

// ---------------------------------------------------------------------------

OEParseException* OEArrayElementTraits<OEParseException>::New() {
  OEDataObjFactory* factory = Factory();
  return factory ? factory->NewParseException() : nullptr;
}

OEParseLogger* OEParseLogger::ms_theOEParseLogger = nullptr;

OEParseLogger* OEParseLogger::MakeTheLogger() {
  if (!ms_theOEParseLogger) ms_theOEParseLogger = new (std::nothrow) OEParseLogger();
  return ms_theOEParseLogger;
}

unsigned short OEParseLogger::AppendParseException(OEParseWarning warning, OEString value, OEString tagName,
                                                   OETagID tag, OEDataObj* object) {
  m_anyLogged = 1;
  ++m_reportCount;
  m_lastReported = warning;
  if (!m_enabled) return 1;
  OEDataObjFactory* factory = Factory();
  OEParseException* record = factory ? factory->NewParseException() : nullptr;
  if (!record) {
    g_allocFailed = 1;
    return 0;
  }
  record->tagName = std::move(tagName);
  record->value = std::move(value);
  record->tag = tag;
  record->warning = warning;
  record->object = (!object && m_parser) ? m_parser->GetCurrentObj() : object;
  if (m_buffer) record->position = static_cast<int32_t>(m_buffer->GetBufferOffset());
  if (!Set(m_entries, record)) {
    delete record;
    return 0;
  }
  return 1;
}

unsigned short OEParseLogger::AppendParseException(OEParseException* record) {
  m_anyLogged = 1;
  if (!record) return 0;
  ++m_reportCount;
  m_lastReported = record->warning;
  if (!m_enabled) {
    delete record;  // the log keeps no reference, so it does not leak it either
    return 1;
  }
  if (m_buffer && record->position == -1) record->position = static_cast<int32_t>(m_buffer->GetBufferOffset());
  if (!Set(m_entries, record)) {
    delete record;
    return 0;
  }
  return 1;
}

void OEParseLogger::DeleteAll() {
  OEDynamicArrayParseException::DeleteAll();
  m_anyLogged = 0;
}

unsigned short OEParseLogger::DeepCopyFrom(OEParseLogger* from) {
  if (!from || from == this) return 0;
  m_anyLogged = from->m_anyLogged;
  m_enabled = from->m_enabled;
  for (unsigned short i = 0; i < from->Entries(); ++i) {
    const OEParseException* source = from->Get(i);
    if (!source) return 0;
    OEDataObjFactory* factory = Factory();
    OEParseException* record = factory ? factory->NewParseException() : nullptr;
    if (!record) {
      g_allocFailed = 1;
      return 0;
    }
    *record = *source;
    AppendParseException(record);
  }
  return 1;
}

void OELogWarning(OEParseWarning warning, const OEString& value, const OEString& tagName, OETagID tag,
                  OEDataObj* object) {
  if (OEParseLogger* log = OEParseLogger::TheOEParseLogger())
    log->AppendParseException(warning, value, tagName, tag, object);
}
