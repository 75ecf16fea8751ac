// Whole transfers through the libcurl gateway against servers on the
// loopback interface: HTTP and HTTPS, certificate acceptance and refusal,
// HTTP errors, servers that never answer, and the temporary files.
#include <dirent.h>
#include <gtest/gtest.h>
#include <sys/stat.h>
#include <unistd.h>

#include <chrono>
#include <cstring>
#include <memory>
#include <mutex>
#include <string>
#include <vector>

#include "loopback_server.h"
#include "ofxkit/net/GXNNet.h"
#include "ofxkit/security/OECert.h"

namespace {

std::vector<std::string> g_lines;
void Record(const char* text, unsigned short, const char*) { g_lines.push_back(text); }

// What the server saw of the last request.
struct Seen {
  std::mutex lock;
  std::string method, contentType, body;
};

class Loopback : public ::testing::Test {
 protected:
  static void SetUpTestSuite() {
    std::string error;
    authority = loopback::Authority::Make("ofxkit tests", "ofxkit test root", &error).release();
    ASSERT_NE(authority, nullptr) << error;
  }
  static void TearDownTestSuite() {
    delete authority;
    authority = nullptr;
  }

  void SetUp() override {
    g_lines.clear();
    char pattern[] = "/tmp/ofxkit-net-XXXXXX";
    ASSERT_NE(mkdtemp(pattern), nullptr);
    folder = pattern;
    access.SetTempFilePath(OEString(folder.c_str()));
    access.SetLogCallback(Record);
    ASSERT_EQ(access.InitConnection(), OE_NET_OK);
    request.reset(static_cast<GXNNetRequest*>(access.NewNetRequest()));
  }
  void TearDown() override {
    request.reset();
    EXPECT_EQ(access.EndConnection(), OE_NET_OK);
    if (server) server->Stop();
    EXPECT_TRUE(Files().empty()) << "temporary files left behind";
    for (const std::string& line : g_lines) EXPECT_EQ(line.find("pa55word"), std::string::npos) << line;
    rmdir(folder.c_str());
  }

  // Starts a server answering with handler (or with an echo of the body).
  void Serve(bool https, loopback::Handler handler = nullptr, const char* host = "127.0.0.1",
             const loopback::Authority* with = nullptr, bool tls12Only = false) {
    loopback::ServerOptions options;
    options.tls12Only = tls12Only;
    options.host = host;
    options.https = https;
    options.authority = with ? with : authority;
    options.maxSeconds = 30;
    options.maxRequests = 10;
    if (!handler) {
      handler = [this](const loopback::HttpRequest& rq) {
        std::lock_guard<std::mutex> guard(seen.lock);
        seen.method = rq.method;
        seen.contentType = rq.Header("content-type");
        seen.body = rq.body;
        loopback::HttpResponse rs;
        rs.body = rq.method == "POST" ? "<OFX>echo " + rq.body + "</OFX>" : "<OFX>got " + rq.target + "</OFX>";
        rs.extraHeaders.push_back({"X-Reply", "yes"});
        return rs;
      };
    }
    server.reset(new loopback::Server(options, handler));
    std::string error;
    ASSERT_TRUE(server->Listen(&error)) << error;
    server->Start();
  }
  std::string URL(const char* path = "/ofx") const { return server->BaseURL() + path; }

  std::vector<std::string> Files() const {
    std::vector<std::string> names;
    if (DIR* d = opendir(folder.c_str())) {
      while (dirent* e = readdir(d))
        if (e->d_name[0] != '.') names.push_back(folder + "/" + e->d_name);
      closedir(d);
    }
    return names;
  }
  bool Logged(const std::string& text) const {
    for (const std::string& l : g_lines)
      if (l == text) return true;
    return false;
  }
  OENetStatus Send(const std::string& url, const char* text = "<OFX>request</OFX>") {
    OEBuffer body;
    body.WriteLarge(text, static_cast<uint32_t>(std::strlen(text)));
    return request->Send(OEString(url.c_str()), &body);
  }
  std::string Reply() {
    OEBuffer reply;
    EXPECT_EQ(request->LoadReply(&reply), OE_NET_OK);
    return std::string(reply.GetBufferPtr() ? reply.GetBufferPtr() : "", reply.GetBufferSize());
  }
  unsigned short TrustAuthority(OECallbackRootID id, const loopback::Authority* which = nullptr) {
    const std::string& der = (which ? which : authority)->CaDER();
    return request->AddTrustedRootBER(der.data(), static_cast<unsigned short>(der.size()), id);
  }
  std::string ServerCertID() {
    OEBuffer der;
    der.WriteLarge(authority->ServerDER().data(), static_cast<uint32_t>(authority->ServerDER().size()));
    OECertID id;
    EXPECT_EQ(id.SetCertBER(&der), OE_SEC_OK);
    const OEBuffer* text = id.GetEncodedCertIDPtr();
    return std::string(text->GetBufferPtr(), text->GetBufferSize());
  }

  // Serves HTTPS with a certificate made as leaf asks, by a new authority
  // that a fresh request trusts under root id 1.
  void ServeCertificate(const loopback::LeafOptions& leaf, bool tls12Only = false) {
    std::string error;
    odd = loopback::Authority::Make("ofxkit tests", "odd root", &error, leaf);
    ASSERT_NE(odd, nullptr) << error;
    Serve(true, nullptr, "127.0.0.1", odd.get(), tls12Only);
    request.reset(static_cast<GXNNetRequest*>(access.NewNetRequest()));
    ASSERT_EQ(TrustAuthority(OE_ROOT_VEXA_BRANDING, odd.get()), 1);
  }

  static loopback::Authority* authority;
  std::unique_ptr<loopback::Authority> odd;
  std::string folder;
  GXNNetAccess access;
  std::unique_ptr<GXNNetRequest> request;
  std::unique_ptr<loopback::Server> server;
  Seen seen;
};
loopback::Authority* Loopback::authority = nullptr;

TEST_F(Loopback, HttpPostAndGetRoundTrips) {
  Serve(false);
  request->SetSaveHeaders(1);
  ASSERT_EQ(Send(URL()), OE_NET_OK);
  // The reply waits in private files until it is read.
  std::vector<std::string> files = Files();
  ASSERT_EQ(files.size(), 2u);
  for (const std::string& f : files) {
    struct stat info;
    ASSERT_EQ(stat(f.c_str(), &info), 0);
    EXPECT_EQ(info.st_mode & 0777, 0600u) << f;
  }
  uint32_t size = 0, http = 0, error = 0;
  EXPECT_EQ(request->GetReplySize(size), OE_NET_OK);
  EXPECT_EQ(request->GetStatus(http, error), 1);
  EXPECT_EQ(http, 200u);
  OEString name("X-Reply"), value;
  EXPECT_EQ(request->GetHeader(name, value), 1);
  EXPECT_STREQ(value.c_str(), " yes\r");
  EXPECT_EQ(Reply(), "<OFX>echo <OFX>request</OFX></OFX>");
  EXPECT_EQ(size, 34u);
  {
    std::lock_guard<std::mutex> guard(seen.lock);
    EXPECT_EQ(seen.method, "POST");
    EXPECT_EQ(seen.contentType, "application/x-ofx");
  }

  ASSERT_EQ(request->Get(OEString(URL("/file.ofx").c_str())), OE_NET_OK);
  EXPECT_EQ(Reply(), "<OFX>got /file.ofx</OFX>");

  // With a timeout the content type is set explicitly; a body of a few
  // hundred kilobytes goes through whole.
  request->SetTimeout(20);
  std::string big(300000, 'x');
  ASSERT_EQ(Send(URL(), big.c_str()), OE_NET_OK);
  EXPECT_EQ(Reply().size(), big.size() + 16);
  std::lock_guard<std::mutex> guard(seen.lock);
  EXPECT_EQ(seen.contentType, "application/x-ofx");
  EXPECT_EQ(seen.body.size(), big.size());
}

TEST_F(Loopback, HttpErrorsAndUnreachableServers) {
  Serve(false, [](const loopback::HttpRequest&) {
    loopback::HttpResponse rs;
    rs.status = 404;
    rs.body = "no such service";
    return rs;
  });
  // Credentials in the address and in the body stay out of the log.
  std::string withUser = "http://alice:pa55word@" + URL().substr(7);
  EXPECT_EQ(Send(withUser, "<OFX><USERPASS>pa55word</OFX>"), OE_NET_HTTP_CLIENT_ERROR);
  EXPECT_TRUE(Logged("GXN: Beginning send to http://alice:(hidden)@" + URL().substr(7)));
  uint32_t http = 0, error = 0;
  EXPECT_EQ(request->GetStatus(http, error), 1);
  EXPECT_EQ(http, 404u);
  EXPECT_EQ(error, 1513u);
  EXPECT_TRUE(Logged("***GXN kGXFInished: returns 1513"));
  uint32_t size = 0;
  EXPECT_EQ(request->GetReplySize(size), OE_NET_NO_REPLY_SIZE);

  // Nobody listens on the port once the server is gone.
  std::string url = URL();
  server->Stop();
  EXPECT_EQ(Send(url), OE_NET_NOT_CONNECTED);
}

TEST_F(Loopback, HttpsAcceptedOnlyUnderATrustedRoot) {
  Serve(true);
  // The test authority is unknown to the system and to the built-in roots:
  // the chain does not verify.
  EXPECT_EQ(request->AddVexariBrandingRoot(), 1);
  EXPECT_EQ(request->AddRSAServerRoot(), 1);
  EXPECT_EQ(request->AddVeriSignOFXCARoot(), 1);
  EXPECT_EQ(Send(URL()), OE_NET_CERT_REJECTED);
  EXPECT_TRUE(Logged("***GXN: SSL certificate error: 1670"));

  ASSERT_EQ(TrustAuthority(OE_ROOT_VEXA_BRANDING), 1);
  g_lines.clear();
  ASSERT_EQ(Send(URL()), OE_NET_OK);
  EXPECT_TRUE(Logged("GXN: Received trusted root 1 (Vexari Branding CA)"));
  EXPECT_EQ(Reply(), "<OFX>echo <OFX>request</OFX></OFX>");

  // The server's certificate names 127.0.0.1 and localhost, nothing else.
  server->Stop();
  Serve(true, nullptr, "127.0.0.2");
  std::string other = URL();
  EXPECT_EQ(Send(other), OE_NET_CERT_ERROR_1673);
  // With verification off the name is not checked, but roots still are.
  request->SetSSLVerifyCert(0);
  EXPECT_EQ(Send(other), OE_NET_OK);
  Reply();
}

TEST_F(Loopback, HttpsExpectedIdentityAndRefusedRoots) {
  Serve(true);
  ASSERT_EQ(TrustAuthority(OE_ROOT_VERISIGN_OFX_CA), 1);
  const std::string id = ServerCertID();
  ASSERT_EQ(request->AddExpectedSSLCertID("AAAAAAAAAAAAAAAAAAAAAAAAAAA=", 28), 1);
  EXPECT_EQ(Send(URL()), OE_NET_CERT_REJECTED);
  EXPECT_TRUE(Logged("***GXN: SSL Cert ID failure: Expecting \"AAAAAAAAAAAAAAAAAAAAAAAAAAA=\", received \"" + id +
                     "\""));
  ASSERT_EQ(request->AddExpectedSSLCertID(id.data(), static_cast<unsigned short>(id.size())), 1);
  ASSERT_EQ(Send(URL()), OE_NET_OK);
  EXPECT_TRUE(Logged("GXN: Received trusted root 2 (VeriSign OFX CA)"));
  Reply();

  // The same authority added as the Class 3 primary authority is refused.
  request.reset(static_cast<GXNNetRequest*>(access.NewNetRequest()));
  ASSERT_EQ(TrustAuthority(OE_ROOT_VERISIGN_CLASS3), 1);
  g_lines.clear();
  EXPECT_EQ(Send(URL()), OE_NET_OTHER_ERROR);
  EXPECT_TRUE(Logged("***GXN: VeriSign Class 3 PCA is not accepted as a trusted root."));
  uint32_t http = 0, error = 0;
  request->GetStatus(http, error);
  EXPECT_EQ(error, 1671u);
}

TEST_F(Loopback, WeakCertificatesRefusedWithOrWithoutVerification) {
  struct Case {
    int bits;
    const char* digest;
  };
  for (Case weak : {Case{1024, "SHA256"}, Case{2048, "SHA1"}, Case{2048, "MD5"}, Case{512, "SHA256"}}) {
    SCOPED_TRACE(std::to_string(weak.bits) + " bits, " + weak.digest);
    loopback::LeafOptions leaf;
    leaf.keyBits = weak.bits;
    leaf.digest = weak.digest;
    // A 512-bit key cannot sign for TLS 1.3: offered over TLS 1.2.
    ASSERT_NO_FATAL_FAILURE(ServeCertificate(leaf, weak.bits < 1024));
    for (unsigned short verify : {1, 0}) {
      request->SetSSLVerifyCert(verify);
      g_lines.clear();
      EXPECT_EQ(Send(URL()), OE_NET_OTHER_ERROR);
      uint32_t http = 0, error = 0;
      request->GetStatus(http, error);
      EXPECT_EQ(error, 1674u);
      EXPECT_TRUE(Logged("***GXN: SSL certificate error: 1674"));
      EXPECT_FALSE(Logged("GXN: Received trusted root 1 (Vexari Branding CA)"));
    }
    server->Stop();
  }
  // A sound certificate made the same way is accepted.
  ASSERT_NO_FATAL_FAILURE(ServeCertificate(loopback::LeafOptions()));
  EXPECT_EQ(Send(URL()), OE_NET_OK);
  Reply();
}

TEST_F(Loopback, ForgedCertificateGetsNoRootEvenWithoutVerification) {
  // Signed by a stray key while naming the trusted authority as its issuer.
  loopback::LeafOptions leaf;
  leaf.forged = true;
  ASSERT_NO_FATAL_FAILURE(ServeCertificate(leaf));
  for (unsigned short verify : {1, 0}) {
    request->SetSSLVerifyCert(verify);
    g_lines.clear();
    EXPECT_EQ(Send(URL()), OE_NET_CERT_REJECTED);
    EXPECT_TRUE(Logged("***GXN: SSL certificate error: 1670"));
    EXPECT_FALSE(Logged("GXN: Received trusted root 1 (Vexari Branding CA)"));
  }
}

TEST_F(Loopback, WithoutVerificationOnlyDatesAndHostGoUnchecked) {
  loopback::LeafOptions leaf;
  leaf.validDays = 0;
  leaf.altNames = "DNS:elsewhere.example";
  ASSERT_NO_FATAL_FAILURE(ServeCertificate(leaf));
  sleep(1);  // past its end
  EXPECT_NE(Send(URL()), OE_NET_OK);
  request->SetSSLVerifyCert(0);
  g_lines.clear();
  ASSERT_EQ(Send(URL()), OE_NET_OK);
  EXPECT_TRUE(Logged("GXN: Received trusted root 1 (Vexari Branding CA)"));
  Reply();
}

TEST_F(Loopback, HostNamesCheckedAsStrictlyAsCurlDoes) {
  struct Case {
    const char* commonName;
    const char* altNames;
    const char* host;
    OENetStatus expected;
  };
  const Case cases[] = {
      {"bank.example.localhost", "DNS:bank.example.localhost", "bank.example.localhost", OE_NET_OK},
      {"x", "DNS:*.example.localhost", "bank.example.localhost", OE_NET_OK},
      // A partial wildcard names nothing.
      {"x", "DNS:b*.example.localhost", "bank.example.localhost", OE_NET_CERT_ERROR_1673},
      // With alternative names the common name is never consulted.
      {"localhost", "IP:127.0.0.1", "localhost", OE_NET_CERT_ERROR_1673},
      {"localhost", "DNS:other.localhost", "localhost", OE_NET_CERT_ERROR_1673},
      // Without any, it is.
      {"localhost", "", "localhost", OE_NET_OK},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(std::string(c.altNames) + " for " + c.host);
    loopback::LeafOptions leaf;
    leaf.commonName = c.commonName;
    leaf.altNames = c.altNames;
    ASSERT_NO_FATAL_FAILURE(ServeCertificate(leaf));
    std::string url = "https://" + std::string(c.host) + ":" + std::to_string(server->Port()) + "/ofx";
    EXPECT_EQ(Send(url), c.expected);
    if (c.expected == OE_NET_OK) Reply();
    server->Stop();
  }
}

TEST_F(Loopback, ReplyLargerThanABufferRefusedWhileArriving) {
  Serve(false, [](const loopback::HttpRequest&) {
    loopback::HttpResponse rs;
    rs.body.assign(OEBuffer::kMaxBufferSize, 'x');
    return rs;
  });
  EXPECT_EQ(Send(URL()), OE_NET_OTHER_ERROR);
  uint32_t http = 0, error = 0;
  request->GetStatus(http, error);
  EXPECT_EQ(error, 1541u);
  server->Stop();
  // One byte less fits.
  Serve(false, [](const loopback::HttpRequest&) {
    loopback::HttpResponse rs;
    rs.body.assign(OEBuffer::kMaxBufferSize - 1, 'x');
    return rs;
  });
  ASSERT_EQ(Send(URL()), OE_NET_OK);
  EXPECT_EQ(Reply().size(), OEBuffer::kMaxBufferSize - 1);
}

GXNNetRequest* g_request;
std::chrono::steady_clock::time_point g_abortAt;
GXNWaitAction AbortWhenDue(void*) {
  if (std::chrono::steady_clock::now() >= g_abortAt) g_request->Abort();
  return GXN_WAIT_CONTINUE;
}
GXNWaitAction QuitWhenDue(void*) {
  return std::chrono::steady_clock::now() >= g_abortAt ? GXN_WAIT_QUIT : GXN_WAIT_CONTINUE;
}

TEST_F(Loopback, ServerThatNeverAnswers) {
  Serve(false, [](const loopback::HttpRequest&) {
    loopback::HttpResponse rs;
    rs.hang = true;
    return rs;
  });
  using Clock = std::chrono::steady_clock;
  auto start = Clock::now();
  request->SetTimeout(1);
  EXPECT_EQ(Send(URL()), OE_NET_TIMEOUT);
  EXPECT_LT(Clock::now() - start, std::chrono::seconds(10));

  // No timeout: the application's wait hook ends it.
  request->SetTimeout(0);
  g_request = request.get();
  g_abortAt = Clock::now() + std::chrono::milliseconds(300);
  access.SetWaitHook(AbortWhenDue, nullptr);
  EXPECT_EQ(request->Get(OEString(URL().c_str())), OE_NET_OTHER_ERROR);
  g_abortAt = Clock::now() + std::chrono::milliseconds(300);
  access.SetWaitHook(QuitWhenDue, nullptr);
  EXPECT_EQ(Send(URL()), OE_NET_OTHER_ERROR);
  EXPECT_LT(Clock::now() - start, std::chrono::seconds(20));
}

}  // namespace
