#include <gtest/gtest.h>

#include <sys/stat.h>
#include <unistd.h>

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <string>
#include <vector>

#include <openssl/x509.h>

#include "ofxkit/net/OENet.h"
#include "ofxkit/security/OECert.h"
#include "ofxkit/types/OECommon.h"

namespace {

// A request whose trusted-root slots record what they are offered.
class RecordingRequest : public OENetRequest {
 public:
  unsigned short AddTrustedRoot(const char*, unsigned short, OECallbackRootID) override { return 0; }
  unsigned short AddTrustedRootBER(const char* data, unsigned short length, OECallbackRootID id) override {
    offered.push_back(id);
    return data && length && id != refuse;
  }
  unsigned short AddExpectedSSLCertID(const char*, unsigned short) override { return 0; }
  unsigned short AddExpectedSSLCertName(const OEString&) override { return 0; }
  OENetStatus Send(const OEString&, OEBuffer*) override { return OE_NET_UNSUPPORTED_URL; }
  static bool BuiltInRoot(OECallbackRootID id, const char*& data, unsigned short& length) {
    return GetBuiltInRoot(id, data, length) != 0;
  }

  std::vector<OECallbackRootID> offered;
  OECallbackRootID refuse = OE_ROOT_NONE;
};

// A private folder for the test's files, removed with everything in it.
class NetFiles : public ::testing::Test {
 protected:
  void SetUp() override {
    char pattern[] = "/tmp/ofxkit-net-XXXXXX";
    ASSERT_NE(mkdtemp(pattern), nullptr);
    dir = pattern;
  }
  void TearDown() override {
    for (const std::string& f : files) unlink(f.c_str());
    rmdir(dir.c_str());
  }
  std::string Write(const char* name, const std::string& bytes) {
    std::string path = dir + "/" + name;
    std::FILE* f = std::fopen(path.c_str(), "wb");
    EXPECT_NE(f, nullptr);
    if (f) {
      std::fwrite(bytes.data(), 1, bytes.size(), f);
      std::fclose(f);
      chmod(path.c_str(), 0600);
    }
    files.push_back(path);
    return path;
  }
  static std::string UrlOf(const std::string& path) {
    char url[OENetRequest::kMaxLocalPath];
    EXPECT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(url, path.c_str()), 1);
    return url;
  }
  static std::string Contents(const OEBuffer& b) { return std::string(b.GetBufferPtr(), b.GetBufferSize()); }

  std::string dir;
  std::vector<std::string> files;
  RecordingRequest request;
};

TEST(OENetRequestStatus, GatewayErrorsMapAtEveryRangeEdge) {
  struct Case {
    uint32_t error;
    OENetStatus status;
  } cases[] = {
      {0, OE_NET_OK},        {1, OE_NET_OTHER_ERROR},     {1508, OE_NET_OTHER_ERROR},
      {1509, OE_NET_HTTP_CLIENT_ERROR},  {1516, OE_NET_HTTP_CLIENT_ERROR}, {1517, OE_NET_TIMEOUT},
      {1518, OE_NET_SERVER_ERROR},       {1520, OE_NET_SERVER_ERROR},      {1521, OE_NET_SERVER_BUSY},
      {1522, OE_NET_SERVER_BUSY},        {1523, OE_NET_OTHER_ERROR},       {1524, OE_NET_HTTP_CLIENT_ERROR},
      {1526, OE_NET_HTTP_CLIENT_ERROR},  {1527, OE_NET_OTHER_ERROR},       {1528, OE_NET_OTHER_ERROR},
      {1529, OE_NET_HTTP_CLIENT_ERROR},  {1530, OE_NET_OTHER_ERROR},       {1531, OE_NET_NOT_CONNECTED},
      {1532, OE_NET_HTTP_CLIENT_ERROR},  {1536, OE_NET_HTTP_CLIENT_ERROR}, {1537, OE_NET_OTHER_ERROR},
      {1539, OE_NET_HTTP_CLIENT_ERROR},  {1540, OE_NET_HTTP_CLIENT_ERROR}, {1541, OE_NET_OTHER_ERROR},
      {1543, OE_NET_OTHER_ERROR},        {1544, OE_NET_HTTP_CLIENT_ERROR}, {1547, OE_NET_HTTP_CLIENT_ERROR},
      {1548, OE_NET_CONNECTION_FAILED},  {1549, OE_NET_CONNECTION_FAILED}, {1550, OE_NET_OTHER_ERROR},
      {1599, OE_NET_OTHER_ERROR},        {1600, OE_NET_CONNECTION_FAILED}, {1601, OE_NET_NETWORK_ERROR},
      {1602, OE_NET_CONNECTION_FAILED},  {1603, OE_NET_NETWORK_ERROR},     {1604, OE_NET_NETWORK_ERROR},
      {1605, OE_NET_CONNECTION_FAILED},  {1611, OE_NET_CONNECTION_FAILED}, {1612, OE_NET_NETWORK_ERROR},
      {1619, OE_NET_NETWORK_ERROR},      {1620, OE_NET_CONNECTION_FAILED}, {1621, OE_NET_OTHER_ERROR},
      {1669, OE_NET_OTHER_ERROR},        {1670, OE_NET_CERT_REJECTED},     {1671, OE_NET_OTHER_ERROR},
      {1672, OE_NET_CERT_ERROR_1672},    {1673, OE_NET_CERT_ERROR_1673},   {1674, OE_NET_OTHER_ERROR},
      {1698, OE_NET_OTHER_ERROR},        {1699, OE_NET_NETWORK_ERROR},     {1700, OE_NET_OTHER_ERROR},
      {2200, OE_NET_OTHER_ERROR},        {UINT32_MAX, OE_NET_OTHER_ERROR},
  };
  for (const Case& c : cases)
    EXPECT_EQ(OENetRequest::MapGatewayErrorToNetStatus(c.error), c.status) << "gateway error " << c.error;
}

TEST(OENetRequestNames, FileSchemeIsMatchedIgnoringCaseOverFiveCharacters) {
  EXPECT_EQ(OENetRequest::HasFileScheme("file:"), 1);
  EXPECT_EQ(OENetRequest::HasFileScheme("FILE://C|/x.ofx"), 1);
  EXPECT_EQ(OENetRequest::HasFileScheme("FiLe:reply"), 1);
  EXPECT_EQ(OENetRequest::HasFileScheme("file"), 0);
  EXPECT_EQ(OENetRequest::HasFileScheme("files:"), 0);
  EXPECT_EQ(OENetRequest::HasFileScheme("https://bank.example/ofx"), 0);
  EXPECT_EQ(OENetRequest::HasFileScheme(""), 0);
  EXPECT_EQ(OENetRequest::HasFileScheme(nullptr), 0);
}

TEST(OENetRequestNames, UrlToLocalName) {
  struct Case {
    const char* url;
    unsigned short ok;
    const char* name;
  } cases[] = {
      {"file://C|/data/reply.ofx", 1, "C:\\data\\reply.ofx"},
      {"file:/reply.ofx", 1, "reply.ofx"},
      {"FILE://C|/x.ofx", 1, "C:\\x.ofx"},
      {"file:///tmp/x.ofx", 1, "\\tmp\\x.ofx"},
      {"file:xreply.ofx", 1, "reply.ofx"},  // the character after the scheme always goes
      {"file:", 1, ""},
      {"file:/", 1, ""},
      {"file://", 1, ""},
      {"file:///", 1, "\\"},
      {"file://a||b//c", 1, "a::b\\\\c"},
      {"http://C|/x.ofx", 0, ""},
      {"", 0, ""},
  };
  for (const Case& c : cases) {
    char out[OENetRequest::kMaxLocalPath];
    std::memset(out, 'z', sizeof(out));
    EXPECT_EQ(OENetRequest::ConvertFileURLToLocalFileName(out, c.url), c.ok) << c.url;
    EXPECT_STREQ(out, c.name) << c.url;
  }
  char out[8] = "junk";
  EXPECT_EQ(OENetRequest::ConvertFileURLToLocalFileName(out, sizeof(out), nullptr), 0);
  EXPECT_STREQ(out, "");
  EXPECT_EQ(OENetRequest::ConvertFileURLToLocalFileName(nullptr, "file:/x"), 0);
  EXPECT_EQ(OENetRequest::ConvertFileURLToLocalFileName(out, 0, "file:/x"), 0);
}

TEST(OENetRequestNames, LocalNameToUrl) {
  struct Case {
    const char* name;
    const char* url;
  } cases[] = {
      {"C:\\data\\reply.ofx", "file://C|/data/reply.ofx"},
      {"data\\reply.ofx", "file:/data/reply.ofx"},
      {"\\data\\reply.ofx", "file:///data/reply.ofx"},
      {"/tmp/reply.ofx", "file:///tmp/reply.ofx"},
      {"FILE://C|/x.ofx", "FILE://C|/x.ofx"},  // already a URL: copied unchanged
      {"C", "file:/C"},
      {"C:", "file://C|"},
      {":", "file:/|"},
      {"", "file:/"},
  };
  for (const Case& c : cases) {
    char out[OENetRequest::kMaxLocalPath];
    std::memset(out, 'z', sizeof(out));
    EXPECT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(out, c.name), 1) << c.name;
    EXPECT_STREQ(out, c.url) << c.name;
  }
  char out[8] = "junk";
  EXPECT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(out, sizeof(out), nullptr), 0);
  EXPECT_STREQ(out, "");
  EXPECT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(nullptr, "C:\\x"), 0);
}

TEST(OENetRequestNames, ConversionsRoundTrip) {
  const char* names[] = {"C:\\data\\reply.ofx", "D:\\a b\\c.d\\e", "\\share\\x.ofx", "reply.ofx", "C:\\"};
  for (const char* name : names) {
    char url[OENetRequest::kMaxLocalPath];
    char back[OENetRequest::kMaxLocalPath];
    ASSERT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(url, name), 1);
    ASSERT_EQ(OENetRequest::ConvertFileURLToLocalFileName(back, url), 1);
    EXPECT_STREQ(back, name) << url;
  }
}

TEST(OENetRequestNames, NamesThatDoNotFitAreRefusedNotTruncated) {
  // "file:/" + 9 characters -> a 9-character name, which needs 10 bytes.
  const char* url = "file:/abcdefghi";
  char out[16];
  std::memset(out, 'z', sizeof(out));
  EXPECT_EQ(OENetRequest::ConvertFileURLToLocalFileName(out, 10, url), 1);
  EXPECT_STREQ(out, "abcdefghi");
  std::memset(out, 'z', sizeof(out));
  EXPECT_EQ(OENetRequest::ConvertFileURLToLocalFileName(out, 9, url), 0);
  EXPECT_STREQ(out, "");
  EXPECT_EQ(out[9], 'z');  // nothing written past the given size

  // "C:\x" -> "file://C|/x" needs 12 bytes.
  std::memset(out, 'z', sizeof(out));
  EXPECT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(out, 12, "C:\\x"), 1);
  EXPECT_STREQ(out, "file://C|/x");
  std::memset(out, 'z', sizeof(out));
  EXPECT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(out, 11, "C:\\x"), 0);
  EXPECT_STREQ(out, "");
  EXPECT_EQ(out[11], 'z');
  // A URL copied unchanged is bounded too.
  EXPECT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(out, 5, "file:/x"), 0);
  EXPECT_STREQ(out, "");

  // The two-argument forms hold kMaxLocalPath bytes, terminator included.
  std::string longName(OENetRequest::kMaxLocalPath - 1, 'n');
  std::vector<char> big(OENetRequest::kMaxLocalPath + 64, 'z');
  EXPECT_EQ(OENetRequest::ConvertFileURLToLocalFileName(big.data(), ("file:/" + longName).c_str()), 1);
  EXPECT_EQ(std::strlen(big.data()), longName.size());
  EXPECT_EQ(OENetRequest::ConvertFileURLToLocalFileName(big.data(), ("file:/" + longName + "n").c_str()), 0);
  EXPECT_STREQ(big.data(), "");
  EXPECT_EQ(big[OENetRequest::kMaxLocalPath], 'z');
  EXPECT_EQ(OENetRequest::ConvertLocalFileNameToFileURL(big.data(), longName.c_str()), 0);
  EXPECT_EQ(big[OENetRequest::kMaxLocalPath], 'z');
}

TEST(OENetRequestBase, AnswersOfTheBaseTransport) {
  RecordingRequest request;
  uint32_t size = 77;
  OEBuffer buffer;
  EXPECT_EQ(request.GetReplySize(size), OE_NET_NO_REPLY_SIZE);  // before any Get
  EXPECT_EQ(size, 77u);
  EXPECT_EQ(request.LoadReply(&buffer), OE_NET_NO_REPLY);
  EXPECT_EQ(request.Get(OEString("FILE://C|/x.ofx")), OE_NET_OK);
  EXPECT_EQ(request.Get(OEString("https://bank.example/ofx")), OE_NET_UNSUPPORTED_URL);
  EXPECT_EQ(request.Get(OEString()), OE_NET_UNSUPPORTED_URL);
  EXPECT_EQ(request.Abort(), OE_NET_ABORT_UNSUPPORTED);

  OEString name("Content-Type"), value;
  uint32_t http = 5, error = 6;
  EXPECT_EQ(request.SetSSLVerifyCert(1), 0);
  EXPECT_EQ(request.SetSaveHeaders(1), 0);
  EXPECT_EQ(request.GetHeader(name, value), 0);
  EXPECT_EQ(request.GetStatus(http, error), 0);
  EXPECT_EQ(http, 5u);
  EXPECT_EQ(error, 6u);
  EXPECT_EQ(request.SetTimeout(30), 0);
}

TEST(OENetRequestBase, BuiltInRootsAreOfferedInOrder) {
  RecordingRequest request;
  // The primary authority follows the OFX CA only when the CA was accepted.
  request.refuse = OE_ROOT_VERISIGN_OFX_CA;
  EXPECT_EQ(request.AddVeriSignOFXCARoot(), 0);
  EXPECT_EQ(request.offered, std::vector<OECallbackRootID>({OE_ROOT_VERISIGN_OFX_CA}));

  request.offered.clear();
  request.refuse = OE_ROOT_NONE;
  EXPECT_EQ(request.AddVeriSignOFXCARoot(), 1);
  EXPECT_EQ(request.AddVexariBrandingRoot(), 1);
  EXPECT_EQ(request.AddRSAServerRoot(), 1);
  EXPECT_EQ(request.offered, std::vector<OECallbackRootID>({OE_ROOT_VERISIGN_OFX_CA, OE_ROOT_VERISIGN_CLASS3,
                                                             OE_ROOT_VEXA_BRANDING, OE_ROOT_RSA_SECURE_SERVER}));
}

time_t Day(int year, int month, int day) {
  std::tm t{};
  t.tm_year = year - 1900;
  t.tm_mon = month - 1;
  t.tm_mday = day;
  return timegm(&t);
}

TEST(OENetRequestBase, BuiltInRootsAreTheRightCertificates) {
  struct Expected {
    OECallbackRootID id;
    const char* organisation;
    time_t start, end;
  };
  const Expected roots[] = {
      {OE_ROOT_VEXA_BRANDING, "Vexari Inc.", Day(1997, 9, 3), Day(2002, 9, 3)},
      {OE_ROOT_VERISIGN_OFX_CA, "VeriSign, Inc.", Day(1997, 7, 10), Day(2002, 7, 11)},
      {OE_ROOT_VERISIGN_CLASS3, "VeriSign, Inc.", Day(1996, 1, 29), Day(2004, 1, 8)},
      {OE_ROOT_RSA_SECURE_SERVER, "RSA Data Security, Inc.", Day(1994, 11, 9), Day(2010, 1, 8)},
  };
  X509* certs[5] = {};
  for (const Expected& root : roots) {
    SCOPED_TRACE(root.id);
    const char* data = nullptr;
    unsigned short length = 0;
    ASSERT_TRUE(RecordingRequest::BuiltInRoot(root.id, data, length));
    OECert cert;
    ASSERT_EQ(cert.SetCertBER(data, length), OE_SEC_OK);
    EXPECT_STREQ(cert.GetSubjectName().c_str(), root.organisation);
    EXPECT_EQ(cert.GetStartDate(), root.start);
    // Validity ends on the day named, at midnight or the second before the next.
    EXPECT_LE(cert.GetEndDate(), root.end);
    EXPECT_GT(cert.GetEndDate(), root.end - 86400);
    const unsigned char* p = reinterpret_cast<const unsigned char*>(data);
    certs[root.id] = d2i_X509(nullptr, &p, length);
    ASSERT_NE(certs[root.id], nullptr);
  }
  // The OFX CA is issued by the Class 3 authority and signed with its key;
  // the others sign themselves.
  X509* ofxCA = certs[OE_ROOT_VERISIGN_OFX_CA];
  X509* class3 = certs[OE_ROOT_VERISIGN_CLASS3];
  EXPECT_EQ(X509_NAME_cmp(X509_get_issuer_name(ofxCA), X509_get_subject_name(class3)), 0);
  EXPECT_EQ(X509_verify(ofxCA, X509_get0_pubkey(class3)), 1);
  EXPECT_NE(X509_verify(ofxCA, X509_get0_pubkey(ofxCA)), 1);
  for (OECallbackRootID self : {OE_ROOT_VEXA_BRANDING, OE_ROOT_VERISIGN_CLASS3, OE_ROOT_RSA_SECURE_SERVER})
    EXPECT_EQ(X509_verify(certs[self], X509_get0_pubkey(certs[self])), 1) << self;
  for (X509* cert : certs) X509_free(cert);
}

TEST_F(NetFiles, RequestWrittenToFileUrlReadsBack) {
  // Binary bytes, including NUL and CR LF, come back unchanged.
  std::string body("OFXHEADER:100\r\nDATA:OFXSGML\r\n\r\n<OFX>\0\xff</OFX>\r\n", 47);
  std::string url = UrlOf(Write("reply.ofx", body));
  EXPECT_EQ(url.compare(0, 8, "file:///"), 0);
  ASSERT_EQ(request.Get(OEString(url.c_str())), OE_NET_OK);
  uint32_t size = 0;
  EXPECT_EQ(request.GetReplySize(size), OE_NET_OK);
  EXPECT_EQ(size, body.size());

  // Whatever the buffer held before is replaced by the reply.
  OEBuffer buffer;
  std::string old(200, 'o');
  buffer.WriteLarge(old.data(), static_cast<uint32_t>(old.size()));
  ASSERT_EQ(request.LoadReply(&buffer), OE_NET_OK);
  EXPECT_EQ(Contents(buffer), body);
  EXPECT_EQ(buffer.GetBufferOffset(), 0u);
  // The reply may be read again while the file is there.
  OEBuffer again;
  EXPECT_EQ(request.LoadReply(&again), OE_NET_OK);
  EXPECT_EQ(Contents(again), body);

  // A later address that the base cannot serve is not read from the old file.
  EXPECT_EQ(request.Get(OEString("http://bank.example/ofx")), OE_NET_UNSUPPORTED_URL);
  EXPECT_EQ(request.GetReplySize(size), OE_NET_NO_REPLY_SIZE);
  EXPECT_EQ(request.LoadReply(&again), OE_NET_NO_REPLY);
  EXPECT_EQ(request.LoadReply(nullptr), OE_NET_NO_REPLY);
}

TEST_F(NetFiles, FileThatShrankAfterItsSizeGivesWhatIsThere) {
  std::string path = Write("reply.ofx", std::string(5000, 'x'));
  ASSERT_EQ(request.Get(OEString(UrlOf(path).c_str())), OE_NET_OK);
  uint32_t size = 0;
  ASSERT_EQ(request.GetReplySize(size), OE_NET_OK);
  EXPECT_EQ(size, 5000u);
  Write("reply.ofx", "<OFX>");
  OEBuffer buffer;
  EXPECT_EQ(request.LoadReply(&buffer), OE_NET_OK);
  EXPECT_EQ(Contents(buffer), "<OFX>");
}

TEST_F(NetFiles, EmptyMissingAndUnreadableFiles) {
  std::string url = UrlOf(Write("empty.ofx", ""));
  ASSERT_EQ(request.Get(OEString(url.c_str())), OE_NET_OK);
  uint32_t size = 99;
  EXPECT_EQ(request.GetReplySize(size), OE_NET_OK);
  EXPECT_EQ(size, 0u);
  OEBuffer buffer;
  buffer += "stale";
  EXPECT_EQ(request.LoadReply(&buffer), OE_NET_OK);
  EXPECT_EQ(buffer.GetBufferSize(), 0u);

  ASSERT_EQ(request.Get(OEString(UrlOf(dir + "/missing.ofx").c_str())), OE_NET_OK);
  EXPECT_EQ(request.GetReplySize(size), OE_NET_NO_REPLY_SIZE);
  EXPECT_EQ(request.LoadReply(&buffer), OE_NET_NO_REPLY);

  // A name too long for a local path is refused, not opened truncated.
  std::string longUrl = "file://" + dir + "/" + std::string(OENetRequest::kMaxLocalPath, 'a');
  ASSERT_EQ(request.Get(OEString(longUrl.c_str())), OE_NET_OK);
  EXPECT_EQ(request.GetReplySize(size), OE_NET_NO_REPLY_SIZE);
  EXPECT_EQ(request.LoadReply(&buffer), OE_NET_NO_REPLY);

  // "file:" alone names nothing.
  ASSERT_EQ(request.Get(OEString("file:")), OE_NET_OK);
  EXPECT_EQ(request.GetReplySize(size), OE_NET_NO_REPLY_SIZE);
  EXPECT_EQ(request.LoadReply(&buffer), OE_NET_NO_REPLY);

  // A folder is not a reply.
  ASSERT_EQ(request.Get(OEString(UrlOf(dir).c_str())), OE_NET_OK);
  EXPECT_EQ(request.GetReplySize(size), OE_NET_NO_REPLY_SIZE);
  EXPECT_EQ(request.LoadReply(&buffer), OE_NET_NO_REPLY);
}

TEST_F(NetFiles, ReplyLargerThanABufferMayHoldIsNoMemory) {
  std::string path = Write("huge.ofx", "");
  ASSERT_EQ(truncate(path.c_str(), OEBuffer::kMaxBufferSize + 1), 0);  // sparse: cheap to make
  ASSERT_EQ(request.Get(OEString(UrlOf(path).c_str())), OE_NET_OK);
  uint32_t size = 0;
  EXPECT_EQ(request.GetReplySize(size), OE_NET_OK);
  EXPECT_EQ(size, OEBuffer::kMaxBufferSize + 1);
  OEBuffer buffer;
  EXPECT_EQ(request.LoadReply(&buffer), OE_NET_NO_MEMORY);
  g_allocFailed = 0;
}

}  // namespace
