// Base connection service: agent name, temporary folder and the
// application's log and session-status callbacks.
#include "ofxkit/net/OENet.h"

OENetAccess::OENetAccess()
    : m_logCallback(nullptr), m_sessionCallback(nullptr), m_agentName("NONAME"), m_tempFilePath() {}

OENetAccess::~OENetAccess() = default;

void OENetAccess::SetAgentName(const OEString& name) { m_agentName = name; }

void OENetAccess::SetTempFilePath(const OEString& path) { m_tempFilePath = path; }

void OENetAccess::SetLogCallback(OENetLogCallback callback) { m_logCallback = callback; }

void OENetAccess::LogMessage(const char* message, unsigned short level, const char* detail) {
  if (m_logCallback) m_logCallback(message, level, detail);
}

void OENetAccess::SetSessionCallback(OESessionCallback callback) { m_sessionCallback = callback; }

void OENetAccess::UpdateSessionStatus(OEOpCode operation, void* a, void* b) {
  if (m_sessionCallback) m_sessionCallback(operation, a, b);
}

unsigned short OENetAccess::SetGlobalState(void*) { return 0; }

unsigned short OENetAccess::GetStatus(uint32_t&) const { return 0; }
