// The gateway transport's connection service: opens, connects and closes the
// gateway session (unless the application gave its own), makes requests
// bound to it, and formats the transport's log lines.
#include <dlfcn.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "ofxkit/net/GXNNet.h"

GXNNetAccess::GXNNetAccess()
    : m_session(nullptr),
      m_sessionGiven(0),
      m_connected(0),
      m_lastStatus(0),
      m_gateway(&GXNCurlGateway()),
      m_waitHook(nullptr),
      m_waitContext(nullptr) {}

GXNNetAccess::~GXNNetAccess() {
  // A session the access opened and the application never ended.
  if (m_session && !m_sessionGiven) m_gateway->closeInet(m_session);
}

unsigned short GXNNetAccess::IsNetworkSetup() {
  uint32_t needsConfiguring = 0;
  uint16_t result = m_gateway->needsToConfigure(&needsConfiguring);
  if (result) {
    LogFormatted(1, "***GXN: GX_IspConfig_NeedsToConfigure returns %d", result);
    m_lastStatus = result;
    return 0;
  }
  return needsConfiguring != 1;
}

OENetStatus GXNNetAccess::OpenInternetIfNeeded() {
  if (!m_sessionGiven && !m_session) {
    uint16_t error = 0;
    m_session = m_gateway->openInet(&error);
    if (!m_session || error) {
      m_lastStatus = error;
      LogFormatted(1, "***GXN: NCOpenInet returns %d", error);
      if (m_session) m_gateway->closeInet(m_session);
      m_session = nullptr;
      return OE_NET_SESSION_FAILED;
    }
  }
  if (m_session && !m_connected) {
    uint16_t result = m_gateway->connect(m_session);
    m_lastStatus = result;
    if (result) {
      LogFormatted(1, "***GXN: NCConnect returns %d", result);
      return result == 2200 ? OE_NET_NOT_CONNECTED : OE_NET_SESSION_FAILED;
    }
    m_connected = 1;
  }
  return OE_NET_OK;
}

OENetStatus GXNNetAccess::EndConnection() {
  OENetStatus status = OE_NET_OK;
  if (!m_sessionGiven && m_session) {
    uint16_t result = m_gateway->closeInet(m_session);
    m_lastStatus = result;
    if (result) {
      LogFormatted(1, "***GXN: NCCloseInet returns %d", result);
      status = OE_NET_CLOSE_FAILED;
    }
  }
  m_session = nullptr;
  m_sessionGiven = 0;
  m_connected = 0;
  return status;
}

OENetRequest* GXNNetAccess::NewNetRequest() {
  GXNNetRequest* request = new (std::nothrow) GXNNetRequest();
  if (request) request->SetAccess(this);
  return request;
}

OENetStatus GXNNetAccess::DeleteNetRequest(OENetRequest* request) {
  delete request;
  return OE_NET_OK;
}

unsigned short GXNNetAccess::SetGlobalState(void* session) {
  m_session = static_cast<NCSession>(session);
  m_sessionGiven = 1;
  return 1;
}

unsigned short GXNNetAccess::GetStatus(uint32_t& code) const {
  code = m_lastStatus;
  return 1;
}

void GXNNetAccess::SetupTempPathFromHInst(void* module, OEString& path) {
  Dl_info info;
  if (module && dladdr(module, &info) && info.dli_fname) {
    std::string file(info.dli_fname);
    if (file.size() < 1024) {
      size_t slash = file.rfind('/');
      if (slash != std::string::npos) {
        path = file.substr(0, slash ? slash : 1).c_str();
        return;
      }
    }
  }
  const char* tmp = std::getenv("TMPDIR");
  path = tmp && *tmp ? tmp : "/tmp";
}

void GXNNetAccess::LogFormattedV(unsigned short level, const char* format, va_list args) {
  char line[512];
  va_list copy;
  va_copy(copy, args);
  int n = std::vsnprintf(line, sizeof line, format, copy);
  va_end(copy);
  if (n < 0) return;
  if (static_cast<size_t>(n) < sizeof line) {
    LogMessage(line, level, nullptr);
    return;
  }
  std::string longer(static_cast<size_t>(n) + 1, '\0');
  std::vsnprintf(&longer[0], longer.size(), format, args);
  LogMessage(longer.c_str(), level, nullptr);
}

void GXNNetAccess::LogFormatted(unsigned short level, const char* format, ...) {
  va_list args;
  va_start(args, format);
  LogFormattedV(level, format, args);
  va_end(args);
}
