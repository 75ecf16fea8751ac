// The communications gateway over libcurl's multi interface. Transfers run
// on the caller's thread inside NCPump; OpenSSL verifies server chains in a
// verification callback of ours, which hands each chain to the transfer's
// certificate callback before the handshake may finish.
#include "ofxkit/net/NCGateway.h"

#include "ofxkit/types/OEBuffer.h"

#include <arpa/inet.h>
#include <curl/curl.h>
#include <fcntl.h>
#include <openssl/crypto.h>
#include <openssl/ssl.h>
#include <openssl/x509.h>
#include <openssl/x509_vfy.h>
#include <openssl/x509v3.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <mutex>
#include <string>
#include <unordered_map>
#include <unordered_set>
#include <vector>

struct NCSessionData {
  CURLM* multi = nullptr;
  std::vector<NCHandle> transfers;  // made on this session and not finished
};

namespace {

struct TrustedRoot {
  X509* cert;
  uint32_t id;
};

struct Transfer {
  NCHandle handle = 0;
  NCSessionData* session = nullptr;
  std::string url;
  bool post = false;
  std::string body;
  std::string folder;
  GXStatusCallback callback = nullptr;
  void* context = nullptr;
  // Settings.
  bool contentTypeSet = false;
  std::string contentType;
  int32_t timeout = 0;
  int32_t noVerify = 0;
  GXCertificateCallback certCallback = nullptr;
  int32_t handshakeSeconds = 0;
  std::vector<TrustedRoot> roots;
  // Running state.
  CURL* easy = nullptr;
  curl_slist* headers = nullptr;
  std::FILE* reply = nullptr;
  std::FILE* header = nullptr;
  std::string replyPath, headerPath;
  bool started = false;
  bool tooLarge = false;
  curl_off_t written = 0;
  uint16_t certVerdict = 0;
  curl_off_t sent = 0, toSend = 0, received = 0, toReceive = 0;
  curl_off_t sentReported = 0, receivedReported = 0;  // nothing to report until bytes move

  ~Transfer() {
    if (easy) curl_easy_cleanup(easy);
    // A request body usually holds the user's password.
    if (!body.empty()) OPENSSL_cleanse(&body[0], body.size());
    curl_slist_free_all(headers);
    if (reply) std::fclose(reply);
    if (header) std::fclose(header);
    for (TrustedRoot& root : roots) X509_free(root.cert);
  }
};

// Transfers by handle, and the live sessions. The gateway runs on the
// caller's thread; the lock only keeps the tables whole when several threads
// use sessions of their own.
struct Registry {
  std::mutex lock;
  std::unordered_map<NCHandle, std::unique_ptr<Transfer>> transfers;
  std::unordered_set<NCSessionData*> sessions;
  NCHandle next = 1;
};

Registry& TheRegistry() {
  static Registry* registry = new Registry;  // outlives every static that may close a session
  return *registry;
}

Transfer* FindTransfer(NCHandle handle) {
  Registry& r = TheRegistry();
  std::lock_guard<std::mutex> guard(r.lock);
  auto it = r.transfers.find(handle);
  return it == r.transfers.end() ? nullptr : it->second.get();
}

bool IsSession(NCSessionData* session) {
  Registry& r = TheRegistry();
  std::lock_guard<std::mutex> guard(r.lock);
  return session && r.sessions.count(session);
}

std::unique_ptr<Transfer> TakeTransfer(NCHandle handle) {
  Registry& r = TheRegistry();
  std::lock_guard<std::mutex> guard(r.lock);
  auto it = r.transfers.find(handle);
  if (it == r.transfers.end()) return nullptr;
  std::unique_ptr<Transfer> t = std::move(it->second);
  r.transfers.erase(it);
  auto& list = t->session->transfers;
  list.erase(std::remove(list.begin(), list.end(), handle), list.end());
  return t;
}

void GlobalInit() {
  static std::once_flag once;
  std::call_once(once, [] { curl_global_init(CURL_GLOBAL_DEFAULT); });
}

bool StartsWithNoCase(const std::string& text, const char* prefix) {
  size_t n = std::strlen(prefix);
  return text.size() >= n && strncasecmp(text.c_str(), prefix, n) == 0;
}

// The HTTP status of a completed exchange as a completion error: 200 and
// the other 2xx outside 201-204 are success.
uint16_t ErrorForHttpStatus(long status) {
  struct Range {
    long first, last;
    uint16_t base;
  };
  static const Range kRanges[] = {{201, 204, 1501}, {301, 304, 1505}, {400, 408, 1509}, {500, 504, 1518}};
  for (const Range& r : kRanges)
    if (status >= r.first && status <= r.last) return static_cast<uint16_t>(r.base + (status - r.first));
  if (status >= 200 && status < 300) return GX_OK;
  if (status >= 400 && status < 500) return GX_ERR_HTTP_OTHER_4XX;
  if (status >= 500) return 1518;  // like 500
  return 1505;                     // other redirections and informational ends, like 301
}

uint16_t ErrorForCurlResult(CURLcode result) {
  switch (result) {
    case CURLE_OK:
      return GX_OK;
    case CURLE_COULDNT_RESOLVE_PROXY:
    case CURLE_COULDNT_RESOLVE_HOST:
    case CURLE_COULDNT_CONNECT:
      return GX_ERR_CANNOT_CONNECT;
    case CURLE_OPERATION_TIMEDOUT:
      return 1517;  // as HTTP 408
    case CURLE_FILESIZE_EXCEEDED:
      return GX_ERR_REPLY_TOO_LARGE;
    case CURLE_UNSUPPORTED_PROTOCOL:
    case CURLE_URL_MALFORMAT:
      return GX_ERR_BAD_URL;
    case CURLE_PEER_FAILED_VERIFICATION:
      return GX_ERR_CERT_UNTRUSTED;
    case CURLE_SSL_CONNECT_ERROR:
    case CURLE_SSL_CERTPROBLEM:
    case CURLE_SSL_CIPHER:
    case CURLE_SSL_ENGINE_INITFAILED:
      return GX_ERR_SSL_HANDSHAKE;
    case CURLE_SEND_ERROR:
    case CURLE_RECV_ERROR:
    case CURLE_GOT_NOTHING:
    case CURLE_PARTIAL_FILE:
    case CURLE_WEIRD_SERVER_REPLY:
      return GX_ERR_CONNECTION_LOST;
    default:
      return GX_ERR_OTHER;
  }
}

// ---- Callbacks from libcurl -------------------------------------------

// A reply that no buffer of the library could hold is refused while it
// arrives, not after it has filled the disk.
constexpr curl_off_t kMaxReplyBytes = OEBuffer::kMaxBufferSize - 1;

size_t WriteBody(char* data, size_t size, size_t count, void* user) {
  Transfer* t = static_cast<Transfer*>(user);
  size_t n = size * count;
  if (t->written + static_cast<curl_off_t>(n) > kMaxReplyBytes) {
    t->tooLarge = true;
    return 0;
  }
  t->written += static_cast<curl_off_t>(n);
  return std::fwrite(data, 1, n, t->reply);
}

// Keeps the header lines of the last response only (a "100 Continue" comes
// before the real one), without its status line and closing blank line.
size_t WriteHeader(char* data, size_t size, size_t count, void* user) {
  Transfer* t = static_cast<Transfer*>(user);
  size_t n = size * count;
  if (n >= 5 && std::memcmp(data, "HTTP/", 5) == 0) {
    std::fflush(t->header);
    if (ftruncate(fileno(t->header), 0) != 0) return 0;
    std::rewind(t->header);
    return n;
  }
  if ((n == 2 && data[0] == '\r' && data[1] == '\n') || (n == 1 && data[0] == '\n')) return n;
  return std::fwrite(data, 1, n, t->header);
}

int Progress(void* user, curl_off_t dlTotal, curl_off_t dlNow, curl_off_t ulTotal, curl_off_t ulNow) {
  // Recorded here, reported from NCPump: the status callback may cancel the
  // transfer, which libcurl does not allow from inside its own callbacks.
  Transfer* t = static_cast<Transfer*>(user);
  t->received = dlNow;
  t->toReceive = dlTotal;
  t->sent = ulNow;
  t->toSend = ulTotal;
  return 0;
}

// The host the URL names, for the certificate's name check.
std::string HostOf(const std::string& url) {
  std::string host;
  CURLU* u = curl_url();
  char* part = nullptr;
  if (u && curl_url_set(u, CURLUPART_URL, url.c_str(), 0) == CURLUE_OK &&
      curl_url_get(u, CURLUPART_HOST, &part, 0) == CURLUE_OK && part) {
    host = part;
    if (host.size() > 2 && host.front() == '[' && host.back() == ']') host = host.substr(1, host.size() - 2);
  }
  curl_free(part);
  curl_url_cleanup(u);
  return host;
}

bool IsIPAddress(const std::string& host) {
  unsigned char buf[16];
  return inet_pton(AF_INET, host.c_str(), buf) == 1 || inet_pton(AF_INET6, host.c_str(), buf) == 1;
}

uint16_t ErrorForVerification(int x509Error) {
  switch (x509Error) {
    case X509_V_OK:
      return GX_OK;
    case X509_V_ERR_CERT_HAS_EXPIRED:
    case X509_V_ERR_CERT_NOT_YET_VALID:
      return GX_ERR_CERT_EXPIRED;
    case X509_V_ERR_HOSTNAME_MISMATCH:
    case X509_V_ERR_IP_ADDRESS_MISMATCH:
      return GX_ERR_CERT_NAME;
    case X509_V_ERR_EE_KEY_TOO_SMALL:
    case X509_V_ERR_CA_KEY_TOO_SMALL:
    case X509_V_ERR_CA_MD_TOO_WEAK:
      return GX_ERR_CERT_WEAK;
    default:
      return GX_ERR_CERT_UNTRUSTED;
  }
}

// Certificates are judged at the connection's security level, and never
// below level 2 (keys of at least 2048 bits, no MD5 or SHA-1 signatures).
constexpr int kMinSecurityLevel = 2;

struct StoreCtxDeleter {
  void operator()(X509_STORE_CTX* c) const { X509_STORE_CTX_free(c); }
};
struct StoreDeleter {
  void operator()(X509_STORE* s) const { X509_STORE_free(s); }
};
struct ChainDeleter {
  void operator()(STACK_OF(X509) * s) const { sk_X509_pop_free(s, X509_free); }
};

// Host name rules as strict as curl's: no partial wildcards ("b*.example"),
// and the subject's common name only for a certificate without any
// alternative name.
void SetHost(X509_VERIFY_PARAM* param, X509* leaf, const std::string& host) {
  if (host.empty()) return;
  unsigned int flags = X509_CHECK_FLAG_NO_PARTIAL_WILDCARDS;
  if (X509_get_ext_by_NID(leaf, NID_subject_alt_name, -1) >= 0) flags |= X509_CHECK_FLAG_NEVER_CHECK_SUBJECT;
  X509_VERIFY_PARAM_set_hostflags(param, flags);
  if (IsIPAddress(host))
    X509_VERIFY_PARAM_set1_ip_asc(param, host.c_str());
  else
    X509_VERIFY_PARAM_set1_host(param, host.c_str(), host.size());
}

// Verifies the server's chain against the system's roots and the
// transfer's own, then asks the transfer's certificate callback. The root id
// is that of the first certificate up the verified chain that was added as a
// trusted root, so a chain through an added intermediate authority is known
// by it. With verification off only the validity dates and the host name go
// unchecked: signatures, key sizes and the path to a root still count, and a
// chain that fails them has no root id.
uint16_t JudgeChain(Transfer* t, X509* leaf, STACK_OF(X509) * sent, int securityLevel) {
  std::unique_ptr<X509_STORE, StoreDeleter> store(X509_STORE_new());
  std::unique_ptr<X509_STORE_CTX, StoreCtxDeleter> vctx(X509_STORE_CTX_new());
  if (!store || !vctx || !leaf) return GX_ERR_CERT_UNTRUSTED;
  // The system's roots count only when the transfer adds none of its own.
  if (t->roots.empty()) X509_STORE_set_default_paths(store.get());
  for (const TrustedRoot& root : t->roots) X509_STORE_add_cert(store.get(), root.cert);
  if (!X509_STORE_CTX_init(vctx.get(), store.get(), leaf, sent)) return GX_ERR_CERT_UNTRUSTED;
  X509_STORE_CTX_set_purpose(vctx.get(), X509_PURPOSE_SSL_SERVER);
  X509_VERIFY_PARAM* param = X509_STORE_CTX_get0_param(vctx.get());
  X509_VERIFY_PARAM_set_flags(param, X509_V_FLAG_PARTIAL_CHAIN);
  X509_VERIFY_PARAM_set_auth_level(param, std::max(securityLevel, kMinSecurityLevel));
  if (t->noVerify)
    X509_VERIFY_PARAM_set_flags(param, X509_V_FLAG_NO_CHECK_TIME);
  else
    SetHost(param, leaf, HostOf(t->url));
  int verified = X509_verify_cert(vctx.get());
  uint16_t error = verified == 1 ? static_cast<uint16_t>(GX_OK) : ErrorForVerification(X509_STORE_CTX_get_error(vctx.get()));

  // The chain as built when it verified, else the server's certificate alone.
  std::unique_ptr<STACK_OF(X509), ChainDeleter> chain(verified == 1 ? X509_STORE_CTX_get1_chain(vctx.get())
                                                                    : nullptr);
  if (!chain || sk_X509_num(chain.get()) == 0) {
    chain.reset(sk_X509_new_null());
    if (!chain) return GX_ERR_CERT_UNTRUSTED;
    X509_up_ref(leaf);
    sk_X509_push(chain.get(), leaf);
  }
  uint32_t rootID = 0;
  int count = sk_X509_num(chain.get());
  for (int i = 0; verified == 1 && i < count && !rootID; ++i) {
    X509* c = sk_X509_value(chain.get(), i);
    for (const TrustedRoot& root : t->roots)
      if (X509_cmp(c, root.cert) == 0) {
        rootID = root.id;
        break;
      }
  }
  if (!t->certCallback) return error;

  // From the root down to the server's own certificate.
  std::vector<std::vector<unsigned char>> ders(static_cast<size_t>(count));
  std::vector<SSLCertificateChain> links(static_cast<size_t>(count));
  for (int i = 0; i < count; ++i) {
    X509* c = sk_X509_value(chain.get(), count - 1 - i);
    int n = i2d_X509(c, nullptr);
    if (n <= 0 || n > 0xFFFF) return GX_ERR_CERT_UNTRUSTED;
    std::vector<unsigned char>& der = ders[static_cast<size_t>(i)];
    der.resize(static_cast<size_t>(n));
    unsigned char* p = der.data();
    i2d_X509(c, &p);
    SSLCertificateChain& link = links[static_cast<size_t>(i)];
    link.next = i + 1 < count ? &links[static_cast<size_t>(i + 1)] : nullptr;
    link.length = static_cast<uint16_t>(n);
    link.der = der.data();
  }
  return t->certCallback(count ? links.data() : nullptr, rootID, error, t->context, 0, 0);
}

int VerifyServer(X509_STORE_CTX* sctx, void* arg) {
  Transfer* t = FindTransfer(static_cast<NCHandle>(reinterpret_cast<uintptr_t>(arg)));
  SSL* ssl = static_cast<SSL*>(X509_STORE_CTX_get_ex_data(sctx, SSL_get_ex_data_X509_STORE_CTX_idx()));
  int level = ssl ? SSL_get_security_level(ssl) : kMinSecurityLevel;
  uint16_t verdict = t ? JudgeChain(t, X509_STORE_CTX_get0_cert(sctx), X509_STORE_CTX_get0_untrusted(sctx), level)
                       : static_cast<uint16_t>(GX_ERR_CERT_UNTRUSTED);
  if (verdict) {
    if (t) t->certVerdict = verdict;
    X509_STORE_CTX_set_error(sctx, X509_V_ERR_APPLICATION_VERIFICATION);
    return 0;
  }
  X509_STORE_CTX_set_error(sctx, X509_V_OK);
  return 1;
}

CURLcode SetUpSSL(CURL*, void* sslctx, void* arg) {
  SSL_CTX* ctx = static_cast<SSL_CTX*>(sslctx);
  // The peer is always verified, by VerifyServer alone: libcurl's own checks
  // are off so that a chain the callback accepts is not refused afterwards.
  SSL_CTX_set_verify(ctx, SSL_VERIFY_PEER, nullptr);
  SSL_CTX_set_cert_verify_callback(ctx, VerifyServer, arg);
  return CURLE_OK;
}

// ---- Temporary files --------------------------------------------------

std::string TempFolder(const char* given) {
  if (given && *given) return given;
  const char* env = std::getenv("TMPDIR");
  return env && *env ? env : "/tmp";
}

// A new private file "<folder>/ofxkit-<kind>-XXXXXX", open for writing.
std::FILE* MakePrivateFile(const std::string& folder, const char* kind, std::string& path) {
  std::string pattern = folder;
  if (pattern.empty() || pattern.back() != '/') pattern += '/';
  pattern += "ofxkit-";
  pattern += kind;
  pattern += "-XXXXXX";
  if (pattern.size() >= sizeof(GXStatusRecord::replyFile)) return nullptr;
  std::vector<char> name(pattern.begin(), pattern.end());
  name.push_back('\0');
  int fd = mkostemp(name.data(), O_CLOEXEC);
  if (fd < 0) return nullptr;
  std::FILE* file = fchmod(fd, S_IRUSR | S_IWUSR) == 0 ? fdopen(fd, "wb") : nullptr;
  if (!file) {
    close(fd);
    unlink(name.data());
    return nullptr;
  }
  path = name.data();
  return file;
}

void CopyPath(char (&out)[1024], const std::string& path) {
  size_t n = std::min(path.size(), sizeof(out) - 1);
  std::memcpy(out, path.data(), n);
  out[n] = '\0';
}

// Ends a transfer: closes its files, forgets it, and delivers its finished
// record (after forgetting it, so the callback may start another).
void Finish(std::unique_ptr<Transfer> t, uint16_t error) {
  if (t->easy && t->started) curl_multi_remove_handle(t->session->multi, t->easy);
  bool filesOK = true;
  if (t->reply) filesOK = std::fclose(t->reply) == 0 && filesOK;
  if (t->header) filesOK = std::fclose(t->header) == 0 && filesOK;
  t->reply = t->header = nullptr;
  if (!error && !filesOK) error = GX_ERR_TEMP_FILE;
  if (!t->callback) {
    // Nobody to hand the files to.
    if (!t->replyPath.empty()) unlink(t->replyPath.c_str());
    if (!t->headerPath.empty()) unlink(t->headerPath.c_str());
    return;
  }
  std::unique_ptr<GXStatusRecord> record(new GXStatusRecord());
  record->error = error;
  record->context = t->context;
  CopyPath(record->replyFile, t->replyPath);
  CopyPath(record->headerFile, t->headerPath);
  GXStatusCallback callback = t->callback;
  t.reset();
  callback(GX_CALLBACK_FINISHED, record.get());
}

void ReportProgress(NCSessionData* session) {
  std::vector<NCHandle> handles = session->transfers;
  for (NCHandle h : handles) {
    for (uint32_t kind : {GX_PROGRESS_SENDING, GX_PROGRESS_RECEIVING}) {
      Transfer* t = FindTransfer(h);
      if (!t || !t->started || !t->callback) break;
      bool sending = kind == GX_PROGRESS_SENDING;
      curl_off_t done = sending ? t->sent : t->received;
      curl_off_t& reported = sending ? t->sentReported : t->receivedReported;
      if (done == reported || (sending && !t->post)) continue;
      reported = done;
      curl_off_t expected = sending ? t->toSend : t->toReceive;
      GXStatusRecord record{};
      record.context = t->context;
      record.progressKind = kind;
      uint32_t a = static_cast<uint32_t>(std::min<curl_off_t>(done, UINT32_MAX));
      uint32_t b = static_cast<uint32_t>(std::min<curl_off_t>(expected, UINT32_MAX));
      (sending ? record.valueA2 : record.valueA3) = a;
      (sending ? record.valueB2 : record.valueB3) = b;
      t->callback(GX_CALLBACK_PROGRESS, &record);
    }
  }
}

void CollectFinished(NCSessionData* session) {
  int left = 0;
  while (CURLMsg* msg = curl_multi_info_read(session->multi, &left)) {
    if (msg->msg != CURLMSG_DONE) continue;
    char* priv = nullptr;
    curl_easy_getinfo(msg->easy_handle, CURLINFO_PRIVATE, &priv);
    CURLcode result = msg->data.result;
    std::unique_ptr<Transfer> t = TakeTransfer(static_cast<NCHandle>(reinterpret_cast<uintptr_t>(priv)));
    if (!t) continue;
    uint16_t error = t->certVerdict;
    if (!error && t->tooLarge) error = GX_ERR_REPLY_TOO_LARGE;
    if (!error) error = ErrorForCurlResult(result);
    if (!error) {
      long status = 0;
      curl_easy_getinfo(t->easy, CURLINFO_RESPONSE_CODE, &status);
      error = ErrorForHttpStatus(status);
    }
    Finish(std::move(t), error);
  }
}

NCHandle MakeTransfer(uint16_t* error, NCSession session, const char* url, bool post, const char* body,
                      uint32_t length, const char* tempFolder, GXStatusCallback callback, void* context) {
  uint16_t dummy;
  if (!error) error = &dummy;
  *error = GX_OK;
  if (!IsSession(session) || !url || (post && !body && length)) {
    *error = GX_ERR_BAD_ARGUMENT;
    return 0;
  }
  std::unique_ptr<Transfer> t(new (std::nothrow) Transfer());
  if (!t) {
    *error = GX_ERR_OTHER;
    return 0;
  }
  t->url = url;
  if (!StartsWithNoCase(t->url, "http://") && !StartsWithNoCase(t->url, "https://")) {
    *error = GX_ERR_BAD_URL;
    return 0;
  }
  t->post = post;
  if (post && length) t->body.assign(body, length);
  t->folder = TempFolder(tempFolder);
  t->callback = callback;
  t->context = context;
  t->session = session;
  Registry& r = TheRegistry();
  std::lock_guard<std::mutex> guard(r.lock);
  NCHandle handle = r.next++;
  if (!r.next) r.next = 1;
  t->handle = handle;
  session->transfers.push_back(handle);
  r.transfers[handle] = std::move(t);
  return handle;
}

// Loopback addresses never go through a proxy; the environment's proxy
// settings apply to everything else.
std::string NoProxyList() {
  std::string list = "localhost,127.0.0.1,::1";
  for (const char* name : {"no_proxy", "NO_PROXY"}) {
    const char* env = std::getenv(name);
    if (env && *env) {
      list += ',';
      list += env;
      break;
    }
  }
  return list;
}

bool ConfigureEasy(Transfer* t) {
  CURL* e = t->easy;
  bool ok = true;
  auto set = [&ok](CURLcode c) { ok = ok && c == CURLE_OK; };
  set(curl_easy_setopt(e, CURLOPT_URL, t->url.c_str()));
  set(curl_easy_setopt(e, CURLOPT_PRIVATE, reinterpret_cast<char*>(static_cast<uintptr_t>(t->handle))));
  set(curl_easy_setopt(e, CURLOPT_NOSIGNAL, 1L));
  set(curl_easy_setopt(e, CURLOPT_PROTOCOLS_STR, "http,https"));
  set(curl_easy_setopt(e, CURLOPT_FOLLOWLOCATION, 0L));
  set(curl_easy_setopt(e, CURLOPT_USERAGENT, "ofxkit"));
  set(curl_easy_setopt(e, CURLOPT_NOPROXY, NoProxyList().c_str()));
  set(curl_easy_setopt(e, CURLOPT_WRITEFUNCTION, WriteBody));
  set(curl_easy_setopt(e, CURLOPT_WRITEDATA, t));
  set(curl_easy_setopt(e, CURLOPT_HEADERFUNCTION, WriteHeader));
  set(curl_easy_setopt(e, CURLOPT_HEADERDATA, t));
  set(curl_easy_setopt(e, CURLOPT_XFERINFOFUNCTION, Progress));
  set(curl_easy_setopt(e, CURLOPT_XFERINFODATA, t));
  set(curl_easy_setopt(e, CURLOPT_NOPROGRESS, 0L));
  // Every transfer makes its own connection and handshake, so that its own
  // trusted roots and certificate callback judge the server.
  set(curl_easy_setopt(e, CURLOPT_FRESH_CONNECT, 1L));
  set(curl_easy_setopt(e, CURLOPT_FORBID_REUSE, 1L));
  set(curl_easy_setopt(e, CURLOPT_SSL_SESSIONID_CACHE, 0L));
  set(curl_easy_setopt(e, CURLOPT_SSL_VERIFYPEER, 0L));
  set(curl_easy_setopt(e, CURLOPT_SSL_VERIFYHOST, 0L));
  set(curl_easy_setopt(e, CURLOPT_SSL_CTX_FUNCTION, SetUpSSL));
  set(curl_easy_setopt(e, CURLOPT_SSL_CTX_DATA, reinterpret_cast<void*>(static_cast<uintptr_t>(t->handle))));
  if (t->timeout > 0) set(curl_easy_setopt(e, CURLOPT_TIMEOUT, static_cast<long>(t->timeout)));
  set(curl_easy_setopt(e, CURLOPT_MAXFILESIZE_LARGE, kMaxReplyBytes));
  if (t->handshakeSeconds > 0)
    set(curl_easy_setopt(e, CURLOPT_CONNECTTIMEOUT, static_cast<long>(t->handshakeSeconds)));
  if (t->post) {
    set(curl_easy_setopt(e, CURLOPT_POST, 1L));
    set(curl_easy_setopt(e, CURLOPT_POSTFIELDSIZE_LARGE, static_cast<curl_off_t>(t->body.size())));
    set(curl_easy_setopt(e, CURLOPT_POSTFIELDS, t->body.data()));
  } else {
    set(curl_easy_setopt(e, CURLOPT_HTTPGET, 1L));
  }
  std::string type;
  if (t->contentTypeSet)
    type = t->contentType;
  else if (t->post)
    type = "application/x-ofx";
  for (const std::string& line : {type.empty() ? std::string() : "Content-Type: " + type, std::string("Expect:")}) {
    if (line.empty()) continue;
    curl_slist* more = curl_slist_append(t->headers, line.c_str());
    if (!more) return false;
    t->headers = more;
  }
  set(curl_easy_setopt(e, CURLOPT_HTTPHEADER, t->headers));
  return ok;
}

}  // namespace

NCSession NCOpenInet(uint16_t* error) {
  GlobalInit();
  std::unique_ptr<NCSessionData> s(new (std::nothrow) NCSessionData());
  if (s) s->multi = curl_multi_init();
  if (!s || !s->multi) {
    if (error) *error = GX_ERR_OTHER;
    return nullptr;
  }
  Registry& r = TheRegistry();
  std::lock_guard<std::mutex> guard(r.lock);
  r.sessions.insert(s.get());
  if (error) *error = GX_OK;
  return s.release();
}

uint16_t NCCloseInet(NCSession session) {
  if (!IsSession(session)) return GX_ERR_BAD_ARGUMENT;
  while (!session->transfers.empty()) NCCancel(session, session->transfers.front());
  {
    Registry& r = TheRegistry();
    std::lock_guard<std::mutex> guard(r.lock);
    r.sessions.erase(session);
  }
  curl_multi_cleanup(session->multi);
  delete session;
  return GX_OK;
}

uint16_t NCConnect(NCSession session) { return IsSession(session) ? GX_OK : GX_ERR_BAD_ARGUMENT; }

NCHandle NCSendDataRequest(uint16_t* error, NCSession session, const char* url, const char* body,
                           uint32_t length, const char* tempFolder, GXStatusCallback callback, void* context) {
  return MakeTransfer(error, session, url, true, body, length, tempFolder, callback, context);
}

NCHandle NCGetFileRequest(uint16_t* error, NCSession session, const char* url, const char* tempFolder,
                          GXStatusCallback callback, void* context) {
  return MakeTransfer(error, session, url, false, nullptr, 0, tempFolder, callback, context);
}

uint16_t NCSetHTTPInfo(NCHandle handle, int32_t, int32_t setContentType, const char* contentType, int32_t,
                       int32_t, int32_t timeout) {
  Transfer* t = FindTransfer(handle);
  if (!t || t->started || (setContentType && (!contentType || !*contentType))) return GX_ERR_BAD_ARGUMENT;
  if (setContentType) {
    t->contentTypeSet = true;
    t->contentType = contentType;
  }
  t->timeout = timeout;
  return GX_OK;
}

uint16_t NCSetSSLInfo(NCHandle handle, int32_t noVerify, GXCertificateCallback callback, int32_t handshakeSeconds) {
  Transfer* t = FindTransfer(handle);
  if (!t || t->started) return GX_ERR_BAD_ARGUMENT;
  t->noVerify = noVerify ? 1 : 0;
  t->certCallback = callback;
  t->handshakeSeconds = handshakeSeconds;
  return GX_OK;
}

uint16_t NCAddTrustedRoot(NCHandle handle, const char* der, uint16_t length, uint32_t rootID) {
  Transfer* t = FindTransfer(handle);
  if (!t || t->started || !der || !length) return GX_ERR_BAD_ARGUMENT;
  const unsigned char* p = reinterpret_cast<const unsigned char*>(der);
  X509* cert = d2i_X509(nullptr, &p, length);
  if (!cert) return GX_ERR_BAD_CERTIFICATE;
  t->roots.push_back({cert, rootID});
  return GX_OK;
}

uint16_t NCInitiate(NCSession session, NCHandle handle) {
  Transfer* t = FindTransfer(handle);
  if (!IsSession(session) || !t || t->session != session || t->started) return GX_ERR_BAD_ARGUMENT;
  uint16_t error = GX_OK;
  t->easy = curl_easy_init();
  if (!t->easy || !ConfigureEasy(t)) error = GX_ERR_OTHER;
  if (!error) {
    t->reply = MakePrivateFile(t->folder, "reply", t->replyPath);
    t->header = t->reply ? MakePrivateFile(t->folder, "headers", t->headerPath) : nullptr;
    if (!t->header) error = GX_ERR_TEMP_FILE;
  }
  if (!error && curl_multi_add_handle(session->multi, t->easy) != CURLM_OK) error = GX_ERR_OTHER;
  if (error) {
    // Not started: the transfer is dropped along with its files.
    std::unique_ptr<Transfer> dropped = TakeTransfer(handle);
    dropped->callback = nullptr;
    Finish(std::move(dropped), error);
    return error;
  }
  t->started = true;
  return GX_OK;
}

uint16_t NCCancel(NCSession session, NCHandle handle) {
  Transfer* t = FindTransfer(handle);
  if (!IsSession(session) || !t || t->session != session) return GX_ERR_BAD_ARGUMENT;
  std::unique_ptr<Transfer> taken = TakeTransfer(handle);
  // A transfer that never started has nothing to report.
  if (!taken->started) taken->callback = nullptr;
  Finish(std::move(taken), GX_ERR_CANCELLED);
  return GX_OK;
}

uint16_t GX_IspConfig_NeedsToConfigure(uint32_t* needsConfiguring) {
  if (!needsConfiguring) return GX_ERR_BAD_ARGUMENT;
  *needsConfiguring = 0;
  return GX_OK;
}

uint16_t NCPump(NCSession session, uint32_t maxWaitMs) {
  if (!IsSession(session)) return GX_ERR_BAD_ARGUMENT;
  int running = 0;
  if (curl_multi_perform(session->multi, &running) != CURLM_OK) return GX_ERR_OTHER;
  size_t before = session->transfers.size();
  ReportProgress(session);
  CollectFinished(session);
  if (session->transfers.empty() || session->transfers.size() != before) return GX_OK;
  if (curl_multi_poll(session->multi, nullptr, 0, static_cast<int>(std::min<uint32_t>(maxWaitMs, 60000)),
                      nullptr) != CURLM_OK)
    return GX_ERR_OTHER;
  if (curl_multi_perform(session->multi, &running) != CURLM_OK) return GX_ERR_OTHER;
  ReportProgress(session);
  CollectFinished(session);
  return GX_OK;
}

const GXNGateway& GXNCurlGateway() {
  static const GXNGateway gateway = {NCOpenInet,    NCCloseInet,  NCConnect,        NCSendDataRequest,
                                     NCGetFileRequest, NCSetHTTPInfo, NCSetSSLInfo,   NCInitiate,
                                     NCCancel,      NCAddTrustedRoot, GX_IspConfig_NeedsToConfigure, NCPump};
  return gateway;
}
