// One transfer through the gateway: sets it up (trusted roots, SSL and HTTP
// settings), waits for it on the application's thread, judges the server's
// certificate when the gateway asks, and reads the reply and its headers
// from the temporary files the gateway wrote.
#include <curl/curl.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <cstring>
#include <memory>
#include <string>

#include "ofxkit/net/GXNNet.h"

namespace {

constexpr uint32_t kWaitSliceMs = 50;

// The url as it may be logged: read the way libcurl reads it, with a
// password in its user part, its query and its fragment hidden. An address
// that libcurl cannot read is not shown at all: where its parts end is
// anybody's guess.
std::string LoggableURL(const char* url) {
  if (!url) return std::string();
  if (OENetRequest::HasFileScheme(url)) return url;
  std::string shown = "(malformed address)";
  CURLU* u = curl_url();
  char* text = nullptr;
  if (u && curl_url_set(u, CURLUPART_URL, url, CURLU_NON_SUPPORT_SCHEME) == CURLUE_OK) {
    bool ok = true;
    const CURLUPart hidden[] = {CURLUPART_PASSWORD, CURLUPART_QUERY, CURLUPART_FRAGMENT};
    for (CURLUPart part : hidden) {
      char* value = nullptr;
      if (curl_url_get(u, part, &value, 0) == CURLUE_OK && value)
        ok = ok && curl_url_set(u, part, "(hidden)", 0) == CURLUE_OK;
      curl_free(value);
    }
    if (ok && curl_url_get(u, CURLUPART_URL, &text, 0) == CURLUE_OK && text) shown = text;
  }
  curl_free(text);
  curl_url_cleanup(u);
  return shown;
}

// Why the gateway refused a certificate, for the log.
const char* CertificateErrorText(unsigned short error) {
  switch (error) {
    case GX_ERR_CERT_UNTRUSTED:
      return "the server's certificate chain does not verify up to a trusted root";
    case GX_ERR_CERT_EXPIRED:
      return "a certificate of the server's chain is expired or not yet valid";
    case GX_ERR_CERT_NAME:
      return "the server's certificate does not name the host";
    case GX_ERR_CERT_WEAK:
      return "a key or signature digest of the server's chain is too weak (RSA keys under 2048 bits, MD5, SHA-1)";
    default:
      return nullptr;
  }
}

const char* RootLabel(unsigned long rootID) {
  switch (rootID) {
    case OE_ROOT_NONE:
      return "none";
    case OE_ROOT_VEXA_BRANDING:
      return "Vexari Branding CA";
    case OE_ROOT_VERISIGN_OFX_CA:
      return "VeriSign OFX CA";
    case OE_ROOT_RSA_SECURE_SERVER:
      return "RSA Secure Server CA";
    default:
      return "unknown";
  }
}

void CopyPath(char (&out)[GXNNetRequest::kMaxPath], const char* path) {
  size_t n = strnlen(path, GXNNetRequest::kMaxPath);
  if (n >= GXNNetRequest::kMaxPath) n = 0;  // cut short: not a usable path
  std::memcpy(out, path, n);
  out[n] = '\0';
}

void RemoveFile(char (&path)[GXNNetRequest::kMaxPath]) {
  if (path[0]) unlink(path);
  path[0] = '\0';
}

void EmptyBuffer(OEBuffer& buffer) {
  buffer.SetBufferOffset(0);
  buffer.SetBufferSize(0);
}

// Text of an identity for the log: its bytes up to a terminator.
std::string IdentityText(const char* bytes, uint32_t length) {
  return std::string(bytes ? bytes : "", bytes ? strnlen(bytes, length) : 0);
}

}  // namespace

GXNNetRequest::GXNNetRequest()
    : m_access(nullptr),
      m_done(0),
      m_error(0),
      m_replySize(0),
      m_timeout(0),
      m_sslVerify(1),
      m_handle(0),
      m_trustedRoots(1, 5),
      m_expectedCertIDs(2, 1),
      m_expectedCertNames(2, 1),
      m_saveHeaders(0),
      m_httpStatus(0),
      m_initiated(false),
      m_fileReply(false) {
  m_replyFile[0] = m_headerFile[0] = '\0';
}

GXNNetRequest::~GXNNetRequest() {
  if (m_handle && m_access) m_access->Gateway().cancel(m_access->GetGXNSession(), m_handle);
  RemoveReplyFiles();
}

void GXNNetRequest::Log(unsigned short level, const char* format, ...) {
  if (!m_access) return;
  va_list args;
  va_start(args, format);
  m_access->LogFormattedV(level, format, args);
  va_end(args);
}

void GXNNetRequest::RemoveReplyFiles() {
  RemoveFile(m_replyFile);
  RemoveFile(m_headerFile);
}

// ---- Trusted roots and expected certificates ---------------------------

unsigned short GXNNetRequest::AddRoot(const char* data, unsigned short length, OECallbackRootID id, bool encoded) {
  std::unique_ptr<OECert> cert(new (std::nothrow) OECert());
  if (!cert) {
    g_allocFailed = 1;
    return 0;
  }
  OESecStatus made = encoded ? cert->SetEncodedCert(data, length) : cert->SetCertBER(data, length);
  if (made != OE_SEC_OK || cert->SetCallbackRootID(id) != OE_SEC_OK) return 0;
  if (!m_trustedRoots.Append(cert.get())) return 0;
  cert.release();
  return 1;
}

unsigned short GXNNetRequest::AddTrustedRoot(const char* data, unsigned short length, OECallbackRootID id) {
  return AddRoot(data, length, id, true);
}

unsigned short GXNNetRequest::AddTrustedRootBER(const char* data, unsigned short length, OECallbackRootID id) {
  return AddRoot(data, length, id, false);
}

unsigned short GXNNetRequest::AddAllTrustedRoots(NCHandle handle) {
  for (unsigned short i = 0; i < m_trustedRoots.Entries(); ++i) {
    const OECert* root = m_trustedRoots.Get(i);
    if (!root) continue;
    uint16_t result = m_access->Gateway().addTrustedRoot(handle, reinterpret_cast<const char*>(root->GetCertBER()),
                                                         root->GetCertBERLen(),
                                                         static_cast<uint32_t>(root->GetCallbackRootID()));
    if (result) return result;
  }
  return 0;
}

unsigned short GXNNetRequest::IsATrustedRoot(unsigned long rootID) const {
  bool any = false;
  for (unsigned short i = 0; i < m_trustedRoots.Entries(); ++i) {
    const OECert* root = m_trustedRoots.Get(i);
    if (!root) continue;
    any = true;
    if (static_cast<unsigned long>(root->GetCallbackRootID()) == rootID) return 1;
  }
  return any ? 0 : 1;
}

unsigned short GXNNetRequest::AddExpectedCertID(const char* id, unsigned short length) {
  if (!id || m_expectedCertIDs.Entries() >= 2) return 0;
  std::unique_ptr<OEBuffer> copy(new (std::nothrow) OEBuffer());
  if (!copy) {
    g_allocFailed = 1;
    return 0;
  }
  if (copy->WriteBytes(id, length) != OEBUF_OK || !m_expectedCertIDs.Append(copy.get())) return 0;
  copy.release();
  return 1;
}

unsigned short GXNNetRequest::AddExpectedSSLCertID(const char* id, unsigned short length) {
  return AddExpectedCertID(id, length);
}

unsigned short GXNNetRequest::IsAnExpectedCertID(const OEBuffer& id) const {
  for (unsigned short i = 0; i < m_expectedCertIDs.Entries(); ++i) {
    const OEBuffer* expected = m_expectedCertIDs.Get(i);
    if (expected && expected->GetBufferSize() == id.GetBufferSize() &&
        std::memcmp(expected->GetBufferPtr(), id.GetBufferPtr(), id.GetBufferSize()) == 0)
      return 1;
  }
  return 0;
}

unsigned short GXNNetRequest::AddExpectedSSLCertName(const OEString& name) {
  if (m_expectedCertNames.Entries() >= 2) return 0;
  return m_expectedCertNames.SetVal(m_expectedCertNames.Entries(), name);
}

unsigned short GXNNetRequest::IsAnExpectedSSLCertName(const OEString& name) const {
  for (unsigned short i = 0; i < m_expectedCertNames.Entries(); ++i) {
    const OEString* expected = m_expectedCertNames.Get(i);
    if (expected && std::strcmp(expected->c_str(), name.c_str()) == 0) return 1;
  }
  return 0;
}

// ---- Settings ------------------------------------------------------------

unsigned short GXNNetRequest::SetSSLVerifyCert(unsigned short verify) {
  m_sslVerify = verify;
  return 1;
}

unsigned short GXNNetRequest::SetTimeout(int32_t timeout) {
  m_timeout = timeout;
  return 1;
}

unsigned short GXNNetRequest::SetSaveHeaders(unsigned short save) {
  m_saveHeaders = save;
  return 1;
}

unsigned short GXNNetRequest::GetStatus(uint32_t& httpStatus, uint32_t& error) const {
  if (m_httpStatus) httpStatus = m_httpStatus;
  error = m_error;
  return m_httpStatus != 0;
}

unsigned short GXNNetRequest::SetSSLOptions(NCHandle handle, const char* operation, OENetStatus& status) {
  const GXNGateway& gateway = m_access->Gateway();
  uint16_t result = AddAllTrustedRoots(handle);
  if (result) {
    Log(1, "***GXN NCAddTrustedRoot:  %d (%s)", result, operation);
    status = OE_NET_ROOT_REFUSED;
    return 0;
  }
  result = gateway.setSSLInfo(handle, m_sslVerify == 1 ? 0 : 1, GXNSSLCertificateCallback, 120);
  if (result) {
    Log(1, "***GXN NCSetSSLInfo:  %d (%s)", result, operation);
    status = OE_NET_SSL_SETUP_FAILED;
    return 0;
  }
  return 1;
}

// ---- Transfers -------------------------------------------------------------

OENetStatus GXNNetRequest::Get(const OEString& url) {
  return RunTransfer(url, nullptr, false);
}

OENetStatus GXNNetRequest::Send(const OEString& url, OEBuffer* body) {
  return RunTransfer(url, body, true);
}

// A GET, or a POST of body, from start to completion.
OENetStatus GXNNetRequest::RunTransfer(const OEString& url, OEBuffer* body, bool send) {
  const std::string shown = LoggableURL(url.c_str());
  Log(1, send ? "GXN: Beginning send to %s" : "GXN: Beginning get from %s", shown.c_str());
  m_handle = 0;
  m_initiated = false;
  m_fileReply = false;
  if (!send && OENetRequest::Get(url) == OE_NET_OK) {
    m_fileReply = true;
    return OE_NET_OK;
  }

  OENetStatus status = OE_NET_OK;
  if (!m_access || (send && !body)) {
    status = OE_NET_REQUEST_FAILED;
  } else {
    const GXNGateway& gateway = m_access->Gateway();
    NCSession session = m_access->GetGXNSession();
    OEString folder;
    m_access->TempFolder(folder);
    uint16_t error = 0;
    m_handle = send ? gateway.sendDataRequest(&error, session, url.c_str(), body->GetBufferPtr(),
                                              body->GetBufferSize(), folder.c_str(), GXNNetRequestCallback, this)
                    : gateway.getFileRequest(&error, session, url.c_str(), folder.c_str(), GXNNetRequestCallback,
                                             this);
    if (error) {
      m_handle = 0;  // nothing to release
      Log(1, send ? "***GXN NCSendDataRequest:  %d" : "***GXN: NCGetFileRequest returns %d", error);
      status = OE_NET_REQUEST_FAILED;
    } else if (strncasecmp(url.c_str(), "https:", 6) == 0 &&
               !SetSSLOptions(m_handle, send ? "Send" : "Get", status)) {
      // status set and logged
    } else if (m_timeout && (error = gateway.setHTTPInfo(m_handle, 0, send ? 1 : 0,
                                                         send ? "application/x-ofx" : nullptr, 0, 1, m_timeout))) {
      Log(1, "***GXN NCSetHTTPInfo:  %d", error);
      // The transfer was never started; without this the caller would see
      // success and no reply.
      status = OE_NET_REQUEST_FAILED;
    } else {
      RemoveReplyFiles();
      m_done = 0;
      m_error = 0;
      m_replySize = 0;
      m_httpStatus = 0;
      EmptyBuffer(m_savedHeaders);
      error = gateway.initiate(session, m_handle);
      if (error) {
        Log(1, send ? "***GXN NCInitiate:  %d" : "***GXN: NCInitiate returns %d", error);
        status = OE_NET_START_FAILED;
      } else {
        m_initiated = true;
        // When the wait is given up, the transfer is cancelled: its
        // finished record then ends it like any other failure.
        if (!WaitForReply(&m_done) && !m_done) gateway.cancel(session, m_handle);
        if (!m_done && !m_error) m_error = GX_ERR_CANCELLED;
        if (m_error == 0 && m_replySize != 0) {
          if (m_saveHeaders == 1) LoadHeaders();
        } else {
          RemoveReplyFiles();
          m_replySize = 0;
        }
        status = MapGXNErrorToNetStatus(m_error);
      }
    }
    // A transfer made but never started is released.
    if (m_handle && !m_initiated) gateway.cancel(session, m_handle);
  }
  Log(1, send ? "GXN: End send to %s, netstatus %d" : "GXN: End get from %s, netstatus %d", shown.c_str(),
      static_cast<int>(status));
  m_handle = 0;
  m_initiated = false;
  return status;
}

unsigned short GXNNetRequest::WaitForReply(unsigned short* flag) {
  const GXNGateway& gateway = m_access->Gateway();
  while (!*flag) {
    if (m_access->CallWaitHook() == GXN_WAIT_QUIT) return *flag ? 1 : 0;
    if (*flag) break;
    // A session the gateway no longer knows cannot finish the transfer.
    if (gateway.pump(m_access->GetGXNSession(), kWaitSliceMs) == GX_ERR_BAD_ARGUMENT) return *flag ? 1 : 0;
  }
  return 1;
}

OENetStatus GXNNetRequest::Abort() {
  if (!m_handle || !m_initiated || !m_access) return OE_NET_OK;
  uint16_t result = m_access->Gateway().cancel(m_access->GetGXNSession(), m_handle);
  if (result) {
    Log(1, "***GXN NCCancel:  %d", result);
    return OE_NET_ABORT_FAILED;
  }
  return OE_NET_OK;
}

unsigned short GXNNetRequest::GXNNetRequestCallback(GXCallbackStatus status, void* record) {
  const GXStatusRecord* r = static_cast<const GXStatusRecord*>(record);
  if (r && r->context) static_cast<GXNNetRequest*>(r->context)->DoCallback(status, r);
  return 0;
}

unsigned short GXNNetRequest::DoCallback(GXCallbackStatus status, const GXStatusRecord* record) {
  if (status == GX_CALLBACK_PROGRESS) {
    if (!m_access) return 0;
    auto value = [](uint32_t v) { return reinterpret_cast<void*>(static_cast<uintptr_t>(v)); };
    switch (record->progressKind) {
      case GX_PROGRESS_SENDING:
        m_access->UpdateSessionStatus(OE_OP_SEND_PROGRESS, value(record->valueA2), value(record->valueB2));
        break;
      case GX_PROGRESS_RECEIVING:
        m_access->UpdateSessionStatus(OE_OP_RECEIVE_PROGRESS, value(record->valueA3), value(record->valueB3));
        break;
      default:
        m_access->UpdateSessionStatus(static_cast<OEOpCode>(record->progressKind), nullptr, nullptr);
    }
    return 0;
  }
  CopyPath(m_replyFile, record->replyFile);
  CopyPath(m_headerFile, record->headerFile);
  struct stat info;
  if (m_replyFile[0] && stat(m_replyFile, &info) == 0 && S_ISREG(info.st_mode))
    m_replySize = info.st_size > static_cast<off_t>(UINT32_MAX) ? UINT32_MAX : static_cast<uint32_t>(info.st_size);
  if (record->error == 0) {
    m_httpStatus = 200;
  } else {
    m_error = record->error;
    m_httpStatus = MapGXNErrorToHttpStatus(record->error);
    Log(1, "***GXN kGXFInished: returns %d", record->error);
  }
  m_done = 1;
  return 0;
}

uint32_t GXNNetRequest::MapGXNErrorToHttpStatus(uint32_t error) {
  struct Range {
    uint32_t first, last, http;
  };
  static const Range kRanges[] = {{1501, 1504, 201}, {1505, 1508, 301}, {1509, 1517, 400}, {1518, 1522, 500}};
  for (const Range& r : kRanges)
    if (error >= r.first && error <= r.last) return r.http + (error - r.first);
  return 200;
}

// ---- Certificates ----------------------------------------------------------

unsigned short GXNNetRequest::GXNSSLCertificateCallback(SSLCertificateChain* chain, unsigned long rootID,
                                                        unsigned short error, void* context, unsigned long,
                                                        unsigned long) {
  if (!context) return GX_ERR_CERT_UNTRUSTED;
  return static_cast<GXNNetRequest*>(context)->CheckCertificate(chain, rootID, error);
}

unsigned short GXNNetRequest::CheckCertificate(SSLCertificateChain* chain, unsigned long rootID,
                                               unsigned short error) {
  if (error) {
    Log(1, "***GXN: SSL certificate error: %d", error);
    if (const char* why = CertificateErrorText(error)) Log(1, "***GXN: %s", why);
    return error;
  }
  if (rootID == OE_ROOT_VERISIGN_CLASS3) {
    Log(1, "***GXN: VeriSign Class 3 PCA is not accepted as a trusted root.");
    return GX_ERR_CERT_ROOT_REFUSED;
  }
  if (!IsATrustedRoot(rootID) || !chain) return GX_ERR_CERT_UNTRUSTED;
  const SSLCertificateChain* last = chain;
  // The list comes from the gateway; a loop in it must not hang the check.
  for (unsigned guard = 0; last->next && guard < 64; ++guard) last = last->next;
  if (last->next || !last->der || !last->length) return GX_ERR_CERT_UNTRUSTED;

  OEBuffer der;
  OECertID id;
  if (der.WriteBytes(reinterpret_cast<const char*>(last->der), last->length) != OEBUF_OK ||
      id.SetCertBER(&der) != OE_SEC_OK)
    return GX_ERR_CERT_UNTRUSTED;
  unsigned short expected = m_expectedCertIDs.Entries();
  if (expected) {
    const OEBuffer& received = *id.GetEncodedCertIDPtr();
    if (!IsAnExpectedCertID(received)) {
      std::string got = IdentityText(received.GetBufferPtr(), received.GetBufferSize());
      std::string first, second;
      if (const OEBuffer* b = m_expectedCertIDs.Get(0)) first = IdentityText(b->GetBufferPtr(), b->GetBufferSize());
      if (const OEBuffer* b = m_expectedCertIDs.Get(1)) second = IdentityText(b->GetBufferPtr(), b->GetBufferSize());
      if (expected == 1)
        Log(1, "***GXN: SSL Cert ID failure: Expecting \"%s\", received \"%s\"", first.c_str(), got.c_str());
      else
        Log(1, "***GXN: SSL Cert ID failure: Expecting \"%s\" or \"%s\", received \"%s\"", first.c_str(),
            second.c_str(), got.c_str());
      return GX_ERR_CERT_UNTRUSTED;
    }
  }
  Log(3, "GXN: Received trusted root %d (%s)", static_cast<int>(rootID), RootLabel(rootID));
  return 0;
}

// ---- Reading the reply ------------------------------------------------------

OENetStatus GXNNetRequest::GetReplySize(uint32_t& size) {
  if (m_fileReply) return OENetRequest::GetReplySize(size);
  if (!m_replySize) return OE_NET_NO_REPLY_SIZE;
  size = m_replySize;
  return OE_NET_OK;
}

// Appends the file's bytes to out in blocks; false when the file cannot be
// read or out cannot hold them.
static bool AppendFile(const char* path, OEBuffer& out) {
  std::FILE* file = path[0] ? std::fopen(path, "rb") : nullptr;
  if (!file) return false;
  std::unique_ptr<char[]> block(new (std::nothrow) char[GXNNetRequest::kBlockSize]);
  bool ok = block != nullptr;
  while (ok) {
    size_t got = std::fread(block.get(), 1, GXNNetRequest::kBlockSize, file);
    if (got && out.WriteBytes(block.get(), static_cast<uint32_t>(got)) != OEBUF_OK) ok = false;
    if (got < GXNNetRequest::kBlockSize) break;
  }
  std::fclose(file);
  return ok;
}

OENetStatus GXNNetRequest::LoadReply(OEBuffer* buffer) {
  if (m_fileReply) return OENetRequest::LoadReply(buffer);
  if (!buffer || !m_replySize) return OE_NET_NO_REPLY;
  bool read = AppendFile(m_replyFile, *buffer);
  RemoveReplyFiles();
  return read && buffer->GetBufferSize() == m_replySize ? OE_NET_OK : OE_NET_NO_REPLY;
}

unsigned short GXNNetRequest::LoadHeaders() {
  EmptyBuffer(m_savedHeaders);
  return AppendFile(m_headerFile, m_savedHeaders) ? 1 : 0;
}

unsigned short GXNNetRequest::GetHeader(OEString& name, OEString& value) {
  const char* p = m_savedHeaders.GetBufferPtr();
  const char* end = p ? p + m_savedHeaders.GetBufferSize() : p;
  const size_t nameLength = std::strlen(name.c_str());
  while (p && p < end) {
    const char* lineEnd = static_cast<const char*>(std::memchr(p, '\n', static_cast<size_t>(end - p)));
    if (!lineEnd) lineEnd = end;
    const char* colon = static_cast<const char*>(std::memchr(p, ':', static_cast<size_t>(lineEnd - p)));
    if (!colon) return 0;
    if (static_cast<size_t>(colon - p) == nameLength && std::memcmp(p, name.c_str(), nameLength) == 0) {
      value.Assign(colon + 1, static_cast<size_t>(lineEnd - colon - 1));
      return 1;
    }
    p = lineEnd + 1;
  }
  return 0;
}
