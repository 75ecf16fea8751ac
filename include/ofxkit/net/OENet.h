// Abstract transport: a connection service (OENetAccess) and one transfer
// (OENetRequest). The base request already serves "file:" URLs from the local
// disk; real HTTP and HTTPS traffic comes from a derived gateway transport.
#pragma once

#include <cstddef>
#include <cstdint>

#include "ofxkit/security/OESecStatus.h"  // OECallbackRootID
#include "ofxkit/types/OEBuffer.h"
#include "ofxkit/types/OEString.h"

// Result of a transfer or of a transport call.
enum OENetStatus : int32_t {
  OE_NET_OK = 0,
  OE_NET_SESSION_FAILED = 1,       // the session could not be opened or connected
  OE_NET_UNSUPPORTED_URL = 3,      // Get of an address this transport cannot serve
  OE_NET_NO_REPLY_SIZE = 5,        // the reply's size cannot be had
  OE_NET_NO_REPLY = 6,             // the reply cannot be read
  OE_NET_CLOSE_FAILED = 7,         // the session could not be closed
  OE_NET_REQUEST_FAILED = 8,       // the transfer could not be created
  OE_NET_START_FAILED = 10,        // the transfer could not be started
  OE_NET_NO_MEMORY = 12,           // no memory for the reply
  OE_NET_HTTP_CLIENT_ERROR = 14,   // the server refused the request (HTTP 400-407 and kin)
  OE_NET_SERVER_BUSY = 15,         // HTTP 503 or 504
  OE_NET_ROOT_REFUSED = 16,        // a trusted root was refused by the gateway
  OE_NET_SSL_SETUP_FAILED = 17,    // the SSL options were refused by the gateway
  OE_NET_CONNECTION_FAILED = 18,   // the connection failed
  OE_NET_NETWORK_ERROR = 19,       // the network or the host failed
  OE_NET_CERT_REJECTED = 21,       // the server's certificate was not accepted
  OE_NET_CERT_ERROR_1672 = 22,     // gateway certificate error 1672
  OE_NET_CERT_ERROR_1673 = 23,     // gateway certificate error 1673
  OE_NET_ABORT_UNSUPPORTED = 24,   // Abort is not supported by this transport
  OE_NET_ABORT_FAILED = 25,        // the gateway refused to cancel
  OE_NET_NOT_CONNECTED = 26,       // no connection to the internet
  OE_NET_TIMEOUT = 27,             // HTTP 408
  OE_NET_SERVER_ERROR = 28,        // HTTP 500 to 502
  OE_NET_OTHER_ERROR = 29          // any other gateway error
};

// Kind of a session-status report handed to the application's callback; the
// gateway transport reports progress kinds 2 and 3 with two values each and
// passes any other kind on unchanged.
enum OEOpCode : int32_t {
  OE_OP_NONE = 0,
  OE_OP_STATUS = 1,
  OE_OP_SEND_PROGRESS = 2,
  OE_OP_RECEIVE_PROGRESS = 3
};

typedef void (*OENetLogCallback)(const char* message, unsigned short level, const char* detail);
typedef void (*OESessionCallback)(OEOpCode operation, void* a, void* b);

class OENetRequest;

// A connection service; one lives for a session.
class OENetAccess {
 public:
  OENetAccess();
  OENetAccess(const OENetAccess&) = default;
  OENetAccess& operator=(const OENetAccess&) = default;
  virtual ~OENetAccess();

  virtual unsigned short CanDoNetworkSetup() = 0;
  virtual unsigned short IsNetworkSetup() = 0;
  virtual unsigned short DoNetworkSetup() = 0;
  virtual void SetAgentName(const OEString& name);
  virtual void SetTempFilePath(const OEString& path);
  virtual void SetLogCallback(OENetLogCallback callback);
  // Hands the line to the log callback, if one is set.
  virtual void LogMessage(const char* message, unsigned short level, const char* detail);
  virtual void SetSessionCallback(OESessionCallback callback);
  // Hands the report to the session callback, if one is set.
  virtual void UpdateSessionStatus(OEOpCode operation, void* a, void* b);
  virtual OENetStatus InitConnection() = 0;
  virtual OENetStatus EndConnection() = 0;
  virtual OENetRequest* NewNetRequest() = 0;
  virtual OENetStatus DeleteNetRequest(OENetRequest* request) = 0;
  virtual unsigned short SetGlobalState(void* session);
  virtual unsigned short GetStatus(uint32_t& code) const;

 protected:
  void GetAgentName(OEString& name) const { name = m_agentName; }
  void GetTempFilePath(OEString& path) const { path = m_tempFilePath; }

 private:
  OENetLogCallback m_logCallback;
  OESessionCallback m_sessionCallback;
  OEString m_agentName;
  OEString m_tempFilePath;
};

// One transfer at a time. The base serves "file:" URLs: Get remembers the
// address, GetReplySize and LoadReply read the local file it names.
class OENetRequest {
 public:
  // Size, terminator included, of the character arrays that the two-argument
  // name conversions write into. Longer results are refused.
  static constexpr size_t kMaxLocalPath = 1024;

  OENetRequest();
  OENetRequest(const OENetRequest&) = default;
  OENetRequest& operator=(const OENetRequest&) = default;
  virtual ~OENetRequest();

  virtual unsigned short AddTrustedRoot(const char* data, unsigned short length, OECallbackRootID id) = 0;
  virtual unsigned short AddTrustedRootBER(const char* data, unsigned short length, OECallbackRootID id) = 0;
  virtual unsigned short AddExpectedSSLCertID(const char* id, unsigned short length) = 0;
  virtual unsigned short AddExpectedSSLCertName(const OEString& name) = 0;
  virtual unsigned short AddVexariBrandingRoot();
  virtual unsigned short AddRSAServerRoot();
  virtual unsigned short AddVeriSignOFXCARoot();
  virtual unsigned short SetSSLVerifyCert(unsigned short verify);
  virtual OENetStatus Get(const OEString& url);
  virtual OENetStatus Send(const OEString& url, OEBuffer* body) = 0;
  virtual OENetStatus Abort();
  virtual OENetStatus GetReplySize(uint32_t& size);
  virtual OENetStatus LoadReply(OEBuffer* buffer);
  virtual unsigned short SetSaveHeaders(unsigned short save);
  virtual unsigned short GetHeader(OEString& name, OEString& value);
  virtual unsigned short GetStatus(uint32_t& httpStatus, uint32_t& error) const;
  virtual unsigned short SetTimeout(int32_t timeout);

  // 1 when url begins with "file:", ignoring case.
  static unsigned short HasFileScheme(const char* url);
  // "file://C|/data/reply.ofx" -> "C:\data\reply.ofx". Answers 0 with out
  // empty when url is not a "file:" URL or the name does not fit. The
  // two-argument forms take out to hold kMaxLocalPath bytes.
  static unsigned short ConvertFileURLToLocalFileName(char* out, const char* url);
  static unsigned short ConvertFileURLToLocalFileName(char* out, size_t outSize, const char* url);
  // "C:\data\reply.ofx" -> "file://C|/data/reply.ofx"; a "file:" URL is
  // copied unchanged. Answers 1, or 0 with out empty when it does not fit.
  static unsigned short ConvertLocalFileNameToFileURL(char* out, const char* name);
  static unsigned short ConvertLocalFileNameToFileURL(char* out, size_t outSize, const char* name);
  // The transfer status of a gateway completion error (0 gives OE_NET_OK).
  static OENetStatus MapGatewayErrorToNetStatus(uint32_t error);

 protected:
  const OEString& GetURL() const { return m_url; }
  // The built-in root certificate with that id (DER); 0 when the build
  // carries none.
  static unsigned short GetBuiltInRoot(OECallbackRootID id, const char*& data, unsigned short& length);

 private:
  unsigned short AddBuiltInRoot(OECallbackRootID id);

  OEString m_url;
};
