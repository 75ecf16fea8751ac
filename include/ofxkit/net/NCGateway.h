// The communications gateway: HTTP and HTTPS transfers into private
// temporary files, over libcurl and OpenSSL.
//
// It is a small C-style module with the calls the gateway transport
// (GXNNetAccess / GXNNetRequest) makes. Everything runs on the caller's
// thread: a transfer advances only inside NCPump, which the transport calls
// from its wait loop, and the status and certificate callbacks run from
// there too. Every call answers a result code, 0 for success.
//
// A transfer writes its reply body and the reply's header lines into two
// temporary files (mode 0600) in the folder given when it was created (the
// system's temporary folder when none is given). The gateway hands their
// paths over in the finished record and never deletes them: the receiver
// owns them from then on.
#pragma once

#include <cstdint>

// Result codes of the gateway, as the completion error of a transfer or the
// answer of a call. 1501-1522 mirror HTTP statuses (201-204, 301-304,
// 400-408, 500-504).
enum GXError : uint16_t {
  GX_OK = 0,
  GX_ERR_HTTP_FIRST = 1501,
  GX_ERR_HTTP_LAST = 1522,
  GX_ERR_HTTP_OTHER_4XX = 1524,     // a client error status outside 400-408
  GX_ERR_CANCELLED = 1530,          // NCCancel, or the session closed
  GX_ERR_CANNOT_CONNECT = 1531,     // the host cannot be resolved or reached
  GX_ERR_TEMP_FILE = 1540,          // a temporary file cannot be made
  GX_ERR_REPLY_TOO_LARGE = 1541,    // the reply is larger than a buffer can hold
  GX_ERR_BAD_URL = 1547,            // not an http: or https: URL, or malformed
  GX_ERR_CONNECTION_LOST = 1548,    // the connection failed during the transfer
  GX_ERR_BAD_ARGUMENT = 1549,       // unknown session or handle, missing argument
  GX_ERR_SSL_HANDSHAKE = 1602,      // the SSL handshake failed for another reason
  GX_ERR_BAD_CERTIFICATE = 1605,    // a trusted root that is not a certificate
  GX_ERR_CERT_UNTRUSTED = 1670,     // the server's chain does not verify
  GX_ERR_CERT_ROOT_REFUSED = 1671,  // the chain's root is not accepted
  GX_ERR_CERT_EXPIRED = 1672,       // a certificate is expired or not yet valid
  GX_ERR_CERT_NAME = 1673,          // the certificate does not name the host
  GX_ERR_CERT_WEAK = 1674,          // a key or signature digest is too weak
  GX_ERR_OTHER = 1699
};

enum GXCallbackStatus : int32_t { GX_CALLBACK_PROGRESS = 0, GX_CALLBACK_FINISHED = 1 };

// Progress kinds in a progress record.
enum GXProgressKind : uint32_t { GX_PROGRESS_SENDING = 2, GX_PROGRESS_RECEIVING = 3 };

// What the status callback receives. Progress records carry a kind and, for
// kinds 2 and 3, the bytes done (A) and the bytes expected (B, 0 when not
// known). Finished records carry the completion error and both file paths
// (empty when the files were not made).
struct GXStatusRecord {
  uint16_t error;
  void* context;  // given when the transfer was created
  uint32_t progressKind;
  uint32_t valueB3;
  uint32_t valueB2;
  uint32_t valueA3;
  uint32_t valueA2;
  char replyFile[1024];
  char headerFile[1024];
};

// The server's certificates, from its root to its own certificate (the last
// element); each holds the certificate's DER bytes.
struct SSLCertificateChain {
  SSLCertificateChain* next;
  uint16_t length;
  const unsigned char* der;
};

typedef struct NCSessionData* NCSession;
typedef uint32_t NCHandle;  // 0 is no transfer

typedef unsigned short (*GXStatusCallback)(GXCallbackStatus status, void* record);
// Called during the handshake with the chain, the root id under which the
// chain's trusted root was added (0 when none), and the gateway's own
// verification error (0 when the chain verifies or verification is off).
// Answers 0 to accept; any other value ends the transfer with that value as
// its completion error.
typedef unsigned short (*GXCertificateCallback)(SSLCertificateChain* chain, unsigned long rootID,
                                                 unsigned short error, void* context, unsigned long,
                                                 unsigned long);

// Opens a session (answers null with *error set when it cannot).
NCSession NCOpenInet(uint16_t* error);
// Closes the session; its unfinished transfers end as cancelled.
uint16_t NCCloseInet(NCSession session);
uint16_t NCConnect(NCSession session);
// Makes a POST of body (copied) or a GET of url; the transfer starts with
// NCInitiate. tempFolder may be null or empty.
NCHandle NCSendDataRequest(uint16_t* error, NCSession session, const char* url, const char* body,
                           uint32_t length, const char* tempFolder, GXStatusCallback callback, void* context);
NCHandle NCGetFileRequest(uint16_t* error, NCSession session, const char* url, const char* tempFolder,
                          GXStatusCallback callback, void* context);
// HTTP settings: with setContentType 1, the request's Content-Type (POSTs
// carry "application/x-ofx" otherwise); timeout > 0 bounds the whole
// transfer, in seconds.
uint16_t NCSetHTTPInfo(NCHandle handle, int32_t reserved1, int32_t setContentType, const char* contentType,
                       int32_t reserved2, int32_t reserved3, int32_t timeout);
// SSL settings: noVerify 0 verifies the server's chain against the added
// roots (the system's when none are added), its name against the URL's host,
// and its keys and signatures against the connection's security level (at
// least 2); 1 skips only the validity dates and the host name. A chain that
// does not verify reaches the callback with its error and root id 0.
// handshakeSeconds bounds the time to connect and shake hands.
uint16_t NCSetSSLInfo(NCHandle handle, int32_t noVerify, GXCertificateCallback callback, int32_t handshakeSeconds);
uint16_t NCInitiate(NCSession session, NCHandle handle);
// Cancels a transfer; its finished record (GX_ERR_CANCELLED) is delivered
// before this returns.
uint16_t NCCancel(NCSession session, NCHandle handle);
// Adds a trusted root certificate (DER) for the transfer, under rootID.
uint16_t NCAddTrustedRoot(NCHandle handle, const char* der, uint16_t length, uint32_t rootID);
// *needsConfiguring = 1 when the machine's internet access needs setting up
// (never, here).
uint16_t GX_IspConfig_NeedsToConfigure(uint32_t* needsConfiguring);
// Advances the session's transfers, waiting at most maxWaitMs for activity,
// and delivers their callbacks.
uint16_t NCPump(NCSession session, uint32_t maxWaitMs);

// The gateway as a table of its calls; the transport reaches the gateway
// only through one, so that another gateway can stand in for it.
struct GXNGateway {
  NCSession (*openInet)(uint16_t*);
  uint16_t (*closeInet)(NCSession);
  uint16_t (*connect)(NCSession);
  NCHandle (*sendDataRequest)(uint16_t*, NCSession, const char*, const char*, uint32_t, const char*,
                              GXStatusCallback, void*);
  NCHandle (*getFileRequest)(uint16_t*, NCSession, const char*, const char*, GXStatusCallback, void*);
  uint16_t (*setHTTPInfo)(NCHandle, int32_t, int32_t, const char*, int32_t, int32_t, int32_t);
  uint16_t (*setSSLInfo)(NCHandle, int32_t, GXCertificateCallback, int32_t);
  uint16_t (*initiate)(NCSession, NCHandle);
  uint16_t (*cancel)(NCSession, NCHandle);
  uint16_t (*addTrustedRoot)(NCHandle, const char*, uint16_t, uint32_t);
  uint16_t (*needsToConfigure)(uint32_t*);
  uint16_t (*pump)(NCSession, uint32_t);
};

// The libcurl gateway above.
const GXNGateway& GXNCurlGateway();
