// Base transfer: serves "file:" URLs from the local disk and converts between
// "file:" URLs and local file names.
#include <cctype>
#include <cstdio>

#ifndef _WIN32
#include <sys/stat.h>
#endif

#include "ofxkit/net/OENet.h"

namespace {

constexpr char kFileScheme[] = "file:";
constexpr size_t kFileSchemeLength = sizeof(kFileScheme) - 1;

// Writes characters into a caller's array of known size; a text that does not
// fit leaves the array empty instead of running past it.
class BoundedWriter {
 public:
  BoundedWriter(char* out, size_t size) : m_out(out), m_size(out ? size : 0), m_used(0), m_overflow(m_size == 0) {}

  void Put(char c) {
    if (m_used + 1 < m_size)
      m_out[m_used++] = c;
    else
      m_overflow = true;
  }
  void Put(const char* text) {
    while (*text && !m_overflow) Put(*text++);
  }
  // Copies text, replacing each character found in `from` by the character
  // at the same place in `to`.
  void PutTranslated(const char* text, const char* from, const char* to) {
    for (; *text && !m_overflow; ++text) {
      char c = *text;
      for (size_t i = 0; from[i]; ++i) {
        if (from[i] == c) {
          c = to[i];
          break;
        }
      }
      Put(c);
    }
  }
  // Terminates the text: 1, or 0 with the array emptied when it overflowed.
  unsigned short Finish(unsigned short ok = 1) {
    if (m_size == 0) return 0;
    if (m_overflow || !ok) m_used = 0;
    m_out[m_used] = '\0';
    return (m_overflow || !ok) ? 0 : 1;
  }

 private:
  char* m_out;
  size_t m_size;
  size_t m_used;
  bool m_overflow;
};

// The gateway's completion errors by range, and the transfer status of each.
struct GatewayErrorRange {
  uint32_t first;
  uint32_t last;
  OENetStatus status;
};

const GatewayErrorRange kGatewayErrors[] = {
    {1509, 1516, OE_NET_HTTP_CLIENT_ERROR}, {1517, 1517, OE_NET_TIMEOUT},
    {1518, 1520, OE_NET_SERVER_ERROR},      {1521, 1522, OE_NET_SERVER_BUSY},
    {1524, 1526, OE_NET_HTTP_CLIENT_ERROR}, {1529, 1529, OE_NET_HTTP_CLIENT_ERROR},
    {1531, 1531, OE_NET_NOT_CONNECTED},     {1532, 1536, OE_NET_HTTP_CLIENT_ERROR},
    {1539, 1540, OE_NET_HTTP_CLIENT_ERROR}, {1544, 1547, OE_NET_HTTP_CLIENT_ERROR},
    {1548, 1549, OE_NET_CONNECTION_FAILED}, {1600, 1600, OE_NET_CONNECTION_FAILED},
    {1601, 1601, OE_NET_NETWORK_ERROR},     {1602, 1602, OE_NET_CONNECTION_FAILED},
    {1603, 1604, OE_NET_NETWORK_ERROR},     {1605, 1611, OE_NET_CONNECTION_FAILED},
    {1612, 1619, OE_NET_NETWORK_ERROR},     {1620, 1620, OE_NET_CONNECTION_FAILED},
    {1670, 1670, OE_NET_CERT_REJECTED},     {1672, 1672, OE_NET_CERT_ERROR_1672},
    {1673, 1673, OE_NET_CERT_ERROR_1673},   {1699, 1699, OE_NET_NETWORK_ERROR},
};

// Opens the local file that a "file:" URL names, for binary reading. The
// converted name has "\" separators; where folders are separated by "/",
// they are turned back.
std::FILE* OpenLocalFile(const OEString& url) {
  char name[OENetRequest::kMaxLocalPath];
  if (!OENetRequest::ConvertFileURLToLocalFileName(name, sizeof(name), url.c_str()) || !name[0]) return nullptr;
#ifndef _WIN32
  for (char* p = name; *p; ++p)
    if (*p == '\\') *p = '/';
#endif
  std::FILE* file = std::fopen(name, "rb");
#ifndef _WIN32
  // Folders and devices open here too, but are no reply.
  struct stat info;
  if (file && (fstat(fileno(file), &info) != 0 || !S_ISREG(info.st_mode))) {
    std::fclose(file);
    file = nullptr;
  }
#endif
  return file;
}

// Size of an open file, leaving it positioned at the start; -1 when unknown.
long FileSize(std::FILE* file) {
  if (std::fseek(file, 0, SEEK_END) != 0) return -1;
  long size = std::ftell(file);
  if (std::fseek(file, 0, SEEK_SET) != 0) return -1;
  return size;
}

}  // namespace

OENetRequest::OENetRequest() : m_url() {}

OENetRequest::~OENetRequest() = default;

unsigned short OENetRequest::AddBuiltInRoot(OECallbackRootID id) {
  const char* data = nullptr;
  unsigned short length = 0;
  if (!GetBuiltInRoot(id, data, length)) return 0;
  return AddTrustedRootBER(data, length, id);
}

unsigned short OENetRequest::AddVexariBrandingRoot() { return AddBuiltInRoot(OE_ROOT_VEXA_BRANDING); }

unsigned short OENetRequest::AddRSAServerRoot() { return AddBuiltInRoot(OE_ROOT_RSA_SECURE_SERVER); }

unsigned short OENetRequest::AddVeriSignOFXCARoot() {
  // The primary authority is added only behind the OFX CA that it signed.
  if (!AddBuiltInRoot(OE_ROOT_VERISIGN_OFX_CA)) return 0;
  return AddBuiltInRoot(OE_ROOT_VERISIGN_CLASS3);
}

unsigned short OENetRequest::SetSSLVerifyCert(unsigned short) { return 0; }

OENetStatus OENetRequest::Get(const OEString& url) {
  // Every address is remembered, so that a derived transport and the reply
  // readers below always look at the current one.
  m_url = url;
  return HasFileScheme(url.c_str()) ? OE_NET_OK : OE_NET_UNSUPPORTED_URL;
}

OENetStatus OENetRequest::Abort() { return OE_NET_ABORT_UNSUPPORTED; }

OENetStatus OENetRequest::GetReplySize(uint32_t& size) {
  std::FILE* file = OpenLocalFile(m_url);
  if (!file) return OE_NET_NO_REPLY_SIZE;
  long length = FileSize(file);
  std::fclose(file);
  if (length < 0 || static_cast<unsigned long>(length) > UINT32_MAX) return OE_NET_NO_REPLY_SIZE;
  size = static_cast<uint32_t>(length);
  return OE_NET_OK;
}

OENetStatus OENetRequest::LoadReply(OEBuffer* buffer) {
  if (!buffer) return OE_NET_NO_REPLY;
  std::FILE* file = OpenLocalFile(m_url);
  if (!file) return OE_NET_NO_REPLY;
  long length = FileSize(file);
  OENetStatus status = OE_NET_OK;
  if (length < 0) {
    status = OE_NET_NO_REPLY;
  } else if (static_cast<unsigned long>(length) > UINT32_MAX ||
             buffer->AllocateTo(static_cast<uint32_t>(length)) != OEBUF_OK) {
    status = OE_NET_NO_MEMORY;
  } else {
    size_t got = length ? std::fread(buffer->GetBufferPtr(), 1, static_cast<size_t>(length), file) : 0;
    // A file that shrank since its size was taken gives what is there. With
    // the offset at 0, a size of 0 leaves the buffer empty.
    buffer->SetBufferOffset(0);
    buffer->SetBufferSize(static_cast<uint32_t>(got));
  }
  std::fclose(file);
  return status;
}

unsigned short OENetRequest::SetSaveHeaders(unsigned short) { return 0; }

unsigned short OENetRequest::GetHeader(OEString&, OEString&) { return 0; }

unsigned short OENetRequest::GetStatus(uint32_t&, uint32_t&) const { return 0; }

unsigned short OENetRequest::SetTimeout(int32_t) { return 0; }

unsigned short OENetRequest::HasFileScheme(const char* url) {
  if (!url) return 0;
  for (size_t i = 0; i < kFileSchemeLength; ++i) {
    // A terminator in url stops the loop at the mismatch.
    if (std::tolower(static_cast<unsigned char>(url[i])) != kFileScheme[i]) return 0;
  }
  return 1;
}

unsigned short OENetRequest::ConvertFileURLToLocalFileName(char* out, const char* url) {
  return ConvertFileURLToLocalFileName(out, kMaxLocalPath, url);
}

unsigned short OENetRequest::ConvertFileURLToLocalFileName(char* out, size_t outSize, const char* url) {
  BoundedWriter writer(out, outSize);
  if (!HasFileScheme(url)) return writer.Finish(0);
  const char* rest = url + kFileSchemeLength;
  if (*rest) ++rest;  // normally the first "/"
  if (*rest == '/') ++rest;
  writer.PutTranslated(rest, "/|", "\\:");
  return writer.Finish();
}

unsigned short OENetRequest::ConvertLocalFileNameToFileURL(char* out, const char* name) {
  return ConvertLocalFileNameToFileURL(out, kMaxLocalPath, name);
}

unsigned short OENetRequest::ConvertLocalFileNameToFileURL(char* out, size_t outSize, const char* name) {
  BoundedWriter writer(out, outSize);
  if (!name) return writer.Finish(0);
  if (HasFileScheme(name)) {
    writer.Put(name);
    return writer.Finish();
  }
  writer.Put("file:/");
  // A rooted name ("\data", "/data") or one with a drive ("C:...") gets the
  // second slash, so that the URL converts back to the same name.
  if (name[0] == '\\' || name[0] == '/' || (name[0] && name[1] == ':')) writer.Put('/');
  writer.PutTranslated(name, ":\\", "|/");
  return writer.Finish();
}

OENetStatus OENetRequest::MapGatewayErrorToNetStatus(uint32_t error) {
  if (error == 0) return OE_NET_OK;
  for (const GatewayErrorRange& range : kGatewayErrors) {
    if (error >= range.first && error <= range.last) return range.status;
  }
  return OE_NET_OTHER_ERROR;
}
