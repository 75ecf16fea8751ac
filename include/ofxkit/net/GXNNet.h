// The transport for real traffic: HTTP and HTTPS through the communications
// gateway (NCGateway.h), with trusted roots, expected server certificates,
// saved reply headers and a wait loop on the application's thread. "file:"
// addresses are served from the local disk by OENetRequest.
#pragma once

#include <cstdarg>
#include <cstdint>

#include "ofxkit/net/NCGateway.h"
#include "ofxkit/net/OENet.h"
#include "ofxkit/security/OECert.h"
#include "ofxkit/types/OEDynamicArray.h"  // OEDynamicArrayString

// What the wait hook tells the wait loop.
enum GXNWaitAction : int32_t {
  GXN_WAIT_CONTINUE = 0,
  GXN_WAIT_QUIT = 1  // stop waiting: the transfer is cancelled
};
// Called over and over (at least every 50 ms) while a transfer runs, on the
// thread that started it: the place to keep a user interface alive. It may
// call Abort on the request.
typedef GXNWaitAction (*GXNWaitHook)(void* context);

class GXNNetRequest;

class GXNNetAccess : public OENetAccess {
 public:
  GXNNetAccess();
  GXNNetAccess(const GXNNetAccess&) = delete;
  GXNNetAccess& operator=(const GXNNetAccess&) = delete;
  ~GXNNetAccess() override;

  unsigned short CanDoNetworkSetup() override { return 1; }
  unsigned short IsNetworkSetup() override;
  unsigned short DoNetworkSetup() override { return 0; }
  OENetStatus InitConnection() override { return OpenInternetIfNeeded(); }
  OENetStatus EndConnection() override;
  OENetRequest* NewNetRequest() override;
  OENetStatus DeleteNetRequest(OENetRequest* request) override;
  // Uses the application's gateway session, which the access then neither
  // opens nor closes.
  unsigned short SetGlobalState(void* session) override;
  unsigned short GetStatus(uint32_t& code) const override;

  // The folder of the file of the module that holds `module` (an address in
  // it), or the system's temporary folder when that cannot be told.
  static void SetupTempPathFromHInst(void* module, OEString& path);

  // The hook the wait loop calls; none by default.
  void SetWaitHook(GXNWaitHook hook, void* context) {
    m_waitHook = hook;
    m_waitContext = context;
  }
  // The gateway this access drives (the libcurl gateway by default); for
  // tests and for applications that bring their own. Set it before
  // InitConnection.
  void SetGateway(const GXNGateway& gateway) { m_gateway = &gateway; }
  const GXNGateway& Gateway() const { return *m_gateway; }
  GXNWaitAction CallWaitHook() { return m_waitHook ? m_waitHook(m_waitContext) : GXN_WAIT_CONTINUE; }
  // Formats and logs a line (level 1 for "***" lines unless given).
  void LogFormatted(unsigned short level, const char* format, ...) __attribute__((format(printf, 3, 4)));
  void LogFormattedV(unsigned short level, const char* format, va_list args);
  void TempFolder(OEString& path) const { GetTempFilePath(path); }

 protected:
  OENetStatus OpenInternetIfNeeded();
  NCSession GetGXNSession() const { return m_session; }
  friend class GXNNetRequest;

 private:
  NCSession m_session;
  unsigned short m_sessionGiven;
  unsigned short m_connected;
  unsigned short m_lastStatus;
  const GXNGateway* m_gateway;
  GXNWaitHook m_waitHook;
  void* m_waitContext;
};

class GXNNetRequest : public OENetRequest {
 public:
  static constexpr size_t kMaxPath = 1024;
  static constexpr uint32_t kBlockSize = 10000;

  GXNNetRequest();
  GXNNetRequest(const GXNNetRequest&) = delete;
  GXNNetRequest& operator=(const GXNNetRequest&) = delete;
  // Removes the reply's temporary files if LoadReply never did.
  ~GXNNetRequest() override;

  unsigned short AddTrustedRoot(const char* data, unsigned short length, OECallbackRootID id) override;
  unsigned short AddTrustedRootBER(const char* data, unsigned short length, OECallbackRootID id) override;
  unsigned short AddExpectedSSLCertID(const char* id, unsigned short length) override;
  unsigned short AddExpectedSSLCertName(const OEString& name) override;
  // 0 skips only the validity dates and the host name of the server's
  // certificate; its chain must still verify up to a trusted root.
  unsigned short SetSSLVerifyCert(unsigned short verify) override;
  OENetStatus Get(const OEString& url) override;
  OENetStatus Send(const OEString& url, OEBuffer* body) override;
  OENetStatus Abort() override;
  OENetStatus GetReplySize(uint32_t& size) override;
  OENetStatus LoadReply(OEBuffer* buffer) override;
  unsigned short SetSaveHeaders(unsigned short save) override;
  unsigned short GetHeader(OEString& name, OEString& value) override;
  unsigned short GetStatus(uint32_t& httpStatus, uint32_t& error) const override;
  unsigned short SetTimeout(int32_t timeout) override;
  virtual void SetAccess(GXNNetAccess* access) { m_access = access; }

  unsigned short IsAnExpectedSSLCertName(const OEString& name) const;

  // The gateway's callbacks; context / record name the request.
  static unsigned short GXNNetRequestCallback(GXCallbackStatus status, void* record);
  static unsigned short GXNSSLCertificateCallback(SSLCertificateChain* chain, unsigned long rootID,
                                                  unsigned short error, void* context, unsigned long,
                                                  unsigned long);
  // HTTP status that a gateway completion error stands for (200 when none).
  static uint32_t MapGXNErrorToHttpStatus(uint32_t error);
  static OENetStatus MapGXNErrorToNetStatus(uint32_t error) { return MapGatewayErrorToNetStatus(error); }

 protected:
  // Runs the wait loop until *flag is set; 0 when the wait hook said quit.
  unsigned short WaitForReply(unsigned short* flag);
  unsigned short DoCallback(GXCallbackStatus status, const GXStatusRecord* record);
  unsigned short LoadHeaders();
  unsigned short AddAllTrustedRoots(NCHandle handle);
  unsigned short IsATrustedRoot(unsigned long rootID) const;
  unsigned short AddExpectedCertID(const char* id, unsigned short length);
  unsigned short IsAnExpectedCertID(const OEBuffer& id) const;
  unsigned short SetSSLOptions(NCHandle handle, const char* operation, OENetStatus& status);
  unsigned short CheckCertificate(SSLCertificateChain* chain, unsigned long rootID, unsigned short error);

 private:
  OENetStatus RunTransfer(const OEString& url, OEBuffer* body, bool send);
  void Log(unsigned short level, const char* format, ...) __attribute__((format(printf, 3, 4)));
  void RemoveReplyFiles();
  unsigned short AddRoot(const char* data, unsigned short length, OECallbackRootID id, bool encoded);

  GXNNetAccess* m_access;
  char m_replyFile[kMaxPath];
  char m_headerFile[kMaxPath];
  unsigned short m_done;
  unsigned short m_error;
  uint32_t m_replySize;
  int32_t m_timeout;
  unsigned short m_sslVerify;
  NCHandle m_handle;
  OEDynamicArrayCert m_trustedRoots;
  OEDynamicArrayBuffer m_expectedCertIDs;
  OEDynamicArrayString m_expectedCertNames;
  OEBuffer m_savedHeaders;
  unsigned short m_saveHeaders;
  uint32_t m_httpStatus;
  bool m_initiated;  // the gateway has started the transfer in m_handle
  bool m_fileReply;  // the last Get named a "file:" address
};
