// The process-wide log of soft errors (parse warnings).
#pragma once

#include <cstdint>

#include "ofxkit/core/OETagID.h"
#include "ofxkit/types/OEDynamicArray.h"
#include "ofxkit/types/OEString.h"

class OEParseException {
 public:
  OEParseException();
  OEParseException(const OEParseException& other) = default;
  OEParseException& operator=(const OEParseException& other) = default;
  virtual ~OEParseException();

  void WarningString(OEString& out) const;
  // The name of a warning code ("OEPW_BADFORMAT"); "" for a value out of range.
  static const char* WarningName(OEParseWarning warning);

  OEParseWarning GetWarning() const { return warning; }
  OEDataObj* GetObject() const { return object; }
  const OEString& GetTagName() const { return tagName; }
  OETagID GetTag() const { return tag; }
  const OEString& GetValue() const { return value; }
  int32_t GetPosition() const { return position; }

  OEParseWarning warning;
  OEDataObj* object;  // not owned
  OEString tagName;
  OETagID tag;
  OEString value;
  int32_t position;  // read offset of the parsed buffer, -1 when unknown
};

template <>
struct OEArrayElementTraits<OEParseException> {
  static OEParseException* New();
  static void Delete(OEParseException* p) { delete p; }
};

class OEDynamicArrayParseException : public OEDynamicArrayTyped<OEParseException> {
 public:
  using OEDynamicArrayTyped<OEParseException>::OEDynamicArrayTyped;
};

class OEParseLogger : public OEDynamicArrayParseException {
 public:
  // An empty, enabled log of the application's own, for instance to keep the
  // warnings of one parse (OEParser::CopyExceptionListTo) after the next
  // parse clears the shared one.
  OEParseLogger() : OEDynamicArrayParseException(1, 1) {}

  // The process-wide log, made on first use (null if it could not be made;
  // the next call tries again). Setters and conversions ask for it at every
  // value, so the common case is inline.
  static OEParseLogger* TheOEParseLogger() { return ms_theOEParseLogger ? ms_theOEParseLogger : MakeTheLogger(); }

  unsigned short AppendParseException(OEParseWarning warning, OEString value, OEString tagName, OETagID tag,
                                      OEDataObj* object);
  unsigned short AppendParseException(OEParseException* record);

  void EnableLogging(unsigned short on) { m_enabled = on; }
  unsigned short GetLoggingEnabled() const { return m_enabled; }
  unsigned short GetAnyParseExceptionsLogged() const { return m_anyLogged; }
  void SetBuffer(OEBuffer* buffer) { m_buffer = buffer; }
  OEBuffer* GetBuffer() const { return m_buffer; }
  void SetParser(OEParser* parser) { m_parser = parser; }
  OEParser* GetParser() const { return m_parser; }

  void DeleteAll() override;
  // Counts every warning reported since the log was made, kept or not, and
  // remembers the code of the last one: setters use it to tell whether a
  // conversion they ran quietly found a fault.
  uint32_t GetReportCount() const { return m_reportCount; }
  OEParseWarning GetLastReported() const { return m_lastReported; }
  unsigned short DeepCopyFrom(OEParseLogger* from);

 private:
  static OEParseLogger* MakeTheLogger();
  static OEParseLogger* ms_theOEParseLogger;
  unsigned short m_enabled = 1;
  unsigned short m_anyLogged = 0;
  uint32_t m_reportCount = 0;
  OEParseWarning m_lastReported = OEPW_UNKNOWNEXCEPTION;
  OEBuffer* m_buffer = nullptr;
  OEParser* m_parser = nullptr;
};

// Shorthand used by setters and conversions: logs a warning through the shared
// log when it exists.
void OELogWarning(OEParseWarning warning, const OEString& value, const OEString& tagName, OETagID tag,
                  OEDataObj* object = nullptr);
