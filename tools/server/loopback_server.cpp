// A bounded HTTP/1.1 server for loopback use: one connection at a time, every
// wait done with poll() in short slices so that Stop, the request bound and
// the time bound are seen promptly, and every connection closed after its
// response.
#include "loopback_server.h"

#include <arpa/inet.h>
#include <fcntl.h>
#include <netinet/in.h>
#include <openssl/bio.h>
#include <openssl/err.h>
#include <openssl/evp.h>
#include <openssl/pem.h>
#include <openssl/rand.h>
#include <openssl/ssl.h>
#include <openssl/x509.h>
#include <openssl/x509v3.h>
#include <poll.h>
#include <signal.h>
#include <sys/socket.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <chrono>
#include <cstring>
#include <strings.h>

namespace loopback {

namespace {

constexpr size_t kMaxHeaderBytes = 64 * 1024;
constexpr size_t kMaxBodyBytes = 64 * 1024 * 1024;
constexpr int kSliceMs = 50;
// A client that makes no progress for this long loses its connection.
constexpr auto kIdleLimit = std::chrono::seconds(20);

using Clock = std::chrono::steady_clock;

const char* Reason(int status) {
  switch (status) {
    case 100: return "Continue";
    case 200: return "OK";
    case 204: return "No Content";
    case 301: return "Moved Permanently";
    case 302: return "Found";
    case 400: return "Bad Request";
    case 401: return "Unauthorized";
    case 403: return "Forbidden";
    case 404: return "Not Found";
    case 405: return "Method Not Allowed";
    case 408: return "Request Timeout";
    case 411: return "Length Required";
    case 413: return "Payload Too Large";
    case 500: return "Internal Server Error";
    case 501: return "Not Implemented";
    case 503: return "Service Unavailable";
    default: return status < 400 ? "OK" : "Error";
  }
}

std::string Trim(const std::string& s) {
  size_t b = s.find_first_not_of(" \t");
  if (b == std::string::npos) return std::string();
  size_t e = s.find_last_not_of(" \t\r");
  return s.substr(b, e - b + 1);
}

// ---- certificates ---------------------------------------------------------

struct PKeyFree {
  void operator()(EVP_PKEY* k) const { EVP_PKEY_free(k); }
};
struct X509Free {
  void operator()(X509* x) const { X509_free(x); }
};
using PKey = std::unique_ptr<EVP_PKEY, PKeyFree>;
using Cert = std::unique_ptr<X509, X509Free>;

std::string ToDER(X509* cert) {
  int n = i2d_X509(cert, nullptr);
  if (n <= 0) return std::string();
  std::string der(static_cast<size_t>(n), '\0');
  unsigned char* p = reinterpret_cast<unsigned char*>(&der[0]);
  i2d_X509(cert, &p);
  return der;
}

bool AddExtension(X509* cert, X509* issuer, int nid, const char* value) {
  X509V3_CTX ctx;
  X509V3_set_ctx_nodb(&ctx);
  X509V3_set_ctx(&ctx, issuer, cert, nullptr, nullptr, 0);
  X509_EXTENSION* ext = X509V3_EXT_conf_nid(nullptr, &ctx, nid, value);
  if (!ext) return false;
  bool ok = X509_add_ext(cert, ext, -1) == 1;
  X509_EXTENSION_free(ext);
  return ok;
}

// A certificate for subject (O, CN) with key, valid from a day ago for
// `days`, issued by issuer (or by itself when issuer is null).
Cert MakeCert(const std::string& org, const std::string& cn, EVP_PKEY* key, X509* issuer, EVP_PKEY* issuerKey,
              long days, const std::vector<std::pair<int, const char*>>& extensions,
              const EVP_MD* digest = EVP_sha256()) {
  Cert cert(X509_new());
  if (!cert) return nullptr;
  X509_set_version(cert.get(), 2);
  unsigned char serial[16];
  if (RAND_bytes(serial, sizeof serial) != 1) return nullptr;
  serial[0] &= 0x7f;
  BIGNUM* bn = BN_bin2bn(serial, sizeof serial, nullptr);
  if (!bn) return nullptr;
  BN_to_ASN1_INTEGER(bn, X509_get_serialNumber(cert.get()));
  BN_free(bn);
  X509_gmtime_adj(X509_getm_notBefore(cert.get()), -86400L);
  X509_gmtime_adj(X509_getm_notAfter(cert.get()), days * 86400L);
  X509_NAME* name = X509_get_subject_name(cert.get());
  X509_NAME_add_entry_by_txt(name, "O", MBSTRING_UTF8, reinterpret_cast<const unsigned char*>(org.c_str()), -1,
                             -1, 0);
  X509_NAME_add_entry_by_txt(name, "CN", MBSTRING_UTF8, reinterpret_cast<const unsigned char*>(cn.c_str()), -1,
                             -1, 0);
  X509_set_issuer_name(cert.get(), issuer ? X509_get_subject_name(issuer) : name);
  if (X509_set_pubkey(cert.get(), key) != 1) return nullptr;
  X509* signer = issuer ? issuer : cert.get();
  for (const auto& ext : extensions)
    if (!AddExtension(cert.get(), signer, ext.first, ext.second)) return nullptr;
  if (!digest || X509_sign(cert.get(), issuerKey ? issuerKey : key, digest) <= 0) return nullptr;
  return cert;
}

std::string OpenSSLError(const char* what) {
  std::string message = what;
  unsigned long code = ERR_get_error();
  if (code) {
    char buf[256];
    ERR_error_string_n(code, buf, sizeof buf);
    message += ": ";
    message += buf;
  }
  ERR_clear_error();
  return message;
}

}  // namespace

struct Authority::Impl {
  PKey caKey, serverKey;
  Cert ca, server;
  std::string caDER, serverDER;
  std::string organisation;
};

Authority::Authority() : m_impl(new Impl) {}
Authority::~Authority() = default;

std::unique_ptr<Authority> Authority::Make(const std::string& organisation, const std::string& commonName,
                                           std::string* error, const LeafOptions& leaf) {
  std::unique_ptr<Authority> authority(new Authority());
  Impl& im = *authority->m_impl;
  im.caKey.reset(EVP_RSA_gen(2048));
  if (!im.caKey) {
    if (error) *error = OpenSSLError("cannot make RSA keys");
    return nullptr;
  }
  im.ca = MakeCert(organisation, commonName, im.caKey.get(), nullptr, nullptr, 3650,
                   {{NID_basic_constraints, "critical,CA:TRUE"},
                    {NID_key_usage, "critical,keyCertSign,cRLSign"},
                    {NID_subject_key_identifier, "hash"}});
  if (!im.ca) {
    if (error) *error = OpenSSLError("cannot make certificates");
    return nullptr;
  }
  im.caDER = ToDER(im.ca.get());
  im.organisation = organisation;
  if (!authority->Reissue(leaf, error)) return nullptr;
  return authority;
}

bool Authority::Reissue(const LeafOptions& leaf, std::string* error) {
  Impl& im = *m_impl;
  PKey key(EVP_RSA_gen(static_cast<unsigned>(leaf.keyBits)));
  PKey stray(leaf.forged ? EVP_RSA_gen(2048) : nullptr);
  if (!key || (leaf.forged && !stray)) {
    if (error) *error = OpenSSLError("cannot make RSA keys");
    return false;
  }
  std::vector<std::pair<int, const char*>> extensions = {{NID_basic_constraints, "critical,CA:FALSE"},
                                                         {NID_key_usage, "critical,digitalSignature,keyEncipherment"},
                                                         {NID_ext_key_usage, "serverAuth"}};
  if (!leaf.altNames.empty()) extensions.push_back({NID_subject_alt_name, leaf.altNames.c_str()});
  if (!leaf.forged) extensions.push_back({NID_authority_key_identifier, "keyid"});
  Cert server = MakeCert(im.organisation, leaf.commonName, key.get(), im.ca.get(),
                         leaf.forged ? stray.get() : im.caKey.get(), leaf.validDays, extensions,
                         EVP_get_digestbyname(leaf.digest.c_str()));
  if (!server) {
    if (error) *error = OpenSSLError("cannot make certificates");
    return false;
  }
  im.server = std::move(server);
  im.serverKey = std::move(key);
  im.serverDER = ToDER(im.server.get());
  return true;
}

const std::string& Authority::CaDER() const { return m_impl->caDER; }
const std::string& Authority::ServerDER() const { return m_impl->serverDER; }

std::string Authority::CaPEM() const {
  BIO* bio = BIO_new(BIO_s_mem());
  if (!bio) return std::string();
  std::string pem;
  if (PEM_write_bio_X509(bio, m_impl->ca.get()) == 1) {
    char* data = nullptr;
    long n = BIO_get_mem_data(bio, &data);
    if (n > 0) pem.assign(data, static_cast<size_t>(n));
  }
  BIO_free(bio);
  return pem;
}

std::string HttpRequest::Header(const std::string& name) const {
  for (const auto& h : headers)
    if (!strcasecmp(h.first.c_str(), name.c_str())) return h.second;
  return std::string();
}

// ---- server ---------------------------------------------------------------

struct Server::Impl {
  ServerOptions options;
  Handler handler;
  int listenFd = -1;
  int port = 0;
  SSL_CTX* ctx = nullptr;
  std::atomic<bool> stopping{false};
  std::atomic<int> served{0};
  std::thread thread;
  Clock::time_point deadline = Clock::time_point::max();

  ~Impl() {
    if (listenFd >= 0) close(listenFd);
    if (ctx) SSL_CTX_free(ctx);
  }

  bool Done() const {
    if (stopping.load()) return true;
    if (options.maxRequests > 0 && served.load() >= options.maxRequests) return true;
    return Clock::now() >= deadline;
  }

  // One accepted connection, plain or TLS, non-blocking underneath.
  struct Connection {
    Impl& server;
    int fd;
    SSL* ssl = nullptr;
    Clock::time_point lastProgress = Clock::now();
    const Clock::time_point deadline;
    // The TLS session failed or the client went away: no close_notify then.
    bool broken = false;

    Connection(Impl& s, int f)
        : server(s), fd(f), deadline(Clock::now() + std::chrono::seconds(std::max(1, s.options.requestSeconds))) {}
    ~Connection() {
      if (ssl) {
        if (!broken) SSL_shutdown(ssl);
        SSL_free(ssl);
      }
      close(fd);
    }

    // Waits for the socket; false when the server is done, the client idles
    // too long or the connection's time is up.
    bool Wait(short events) {
      for (;;) {
        Clock::time_point now = Clock::now();
        if (server.Done() || now - lastProgress > kIdleLimit || now >= deadline) return false;
        pollfd p{fd, events, 0};
        int n = poll(&p, 1, kSliceMs);
        if (n > 0) return true;
        if (n < 0 && errno != EINTR) return false;
      }
    }

    // For a TLS call that returned rc: true to retry after waiting.
    bool RetryTLS(int rc) {
      int err = SSL_get_error(ssl, rc);
      if (err == SSL_ERROR_WANT_READ) return Wait(POLLIN);
      if (err == SSL_ERROR_WANT_WRITE) return Wait(POLLOUT);
      return false;
    }

    bool Handshake() {
      if (!server.ctx) return true;
      ssl = SSL_new(server.ctx);
      if (!ssl || SSL_set_fd(ssl, fd) != 1) return false;
      for (;;) {
        int rc = SSL_accept(ssl);
        if (rc == 1) return true;
        if (!RetryTLS(rc)) {
          ERR_clear_error();
          // A failed handshake must not send a close_notify on a dead session.
          SSL_free(ssl);
          ssl = nullptr;
          return false;
        }
      }
    }

    // Bytes read (> 0), or 0 at end of stream / error / server done.
    size_t Read(char* buf, size_t size) {
      for (;;) {
        if (ssl) {
          int rc = SSL_read(ssl, buf, static_cast<int>(size));
          if (rc > 0) {
            lastProgress = Clock::now();
            return static_cast<size_t>(rc);
          }
          if (!RetryTLS(rc)) {
            broken = true;
            return 0;
          }
        } else {
          ssize_t rc = recv(fd, buf, size, 0);
          if (rc > 0) {
            lastProgress = Clock::now();
            return static_cast<size_t>(rc);
          }
          if (rc == 0) return 0;
          if (errno != EAGAIN && errno != EWOULDBLOCK && errno != EINTR) return 0;
          if (!Wait(POLLIN)) return 0;
        }
      }
    }

    bool Write(const std::string& data) {
      size_t done = 0;
      while (done < data.size()) {
        if (ssl) {
          int rc = SSL_write(ssl, data.data() + done, static_cast<int>(data.size() - done));
          if (rc > 0) {
            done += static_cast<size_t>(rc);
            lastProgress = Clock::now();
          } else if (!RetryTLS(rc)) {
            broken = true;
            return false;
          }
        } else {
          ssize_t rc = send(fd, data.data() + done, data.size() - done, MSG_NOSIGNAL);
          if (rc > 0) {
            done += static_cast<size_t>(rc);
            lastProgress = Clock::now();
          } else if (rc < 0 && (errno == EAGAIN || errno == EWOULDBLOCK || errno == EINTR)) {
            if (!Wait(POLLOUT)) return false;
          } else {
            return false;
          }
        }
      }
      return true;
    }
  };

  static std::string StatusOnly(int status) {
    std::string body = std::to_string(status) + " " + Reason(status) + "\n";
    return "HTTP/1.1 " + std::to_string(status) + " " + Reason(status) +
           "\r\nContent-Type: text/plain\r\nContent-Length: " + std::to_string(body.size()) +
           "\r\nConnection: close\r\n\r\n" + body;
  }

  // Reads one request; on a protocol error fills `status` with the answer to send.
  bool ReadRequest(Connection& c, HttpRequest& rq, int& status) {
    std::string data;
    char buf[16384];
    size_t headerEnd;
    for (;;) {
      headerEnd = data.find("\r\n\r\n");
      if (headerEnd != std::string::npos) break;
      if (data.size() > kMaxHeaderBytes) {
        status = 400;
        return false;
      }
      size_t n = c.Read(buf, sizeof buf);
      if (!n) return false;
      data.append(buf, n);
    }
    if (headerEnd > kMaxHeaderBytes) {
      status = 400;
      return false;
    }
    size_t lineEnd = data.find("\r\n");
    std::string line = data.substr(0, lineEnd);
    size_t sp1 = line.find(' ');
    size_t sp2 = sp1 == std::string::npos ? std::string::npos : line.find(' ', sp1 + 1);
    if (sp2 == std::string::npos || line.compare(sp2 + 1, 5, "HTTP/") != 0) {
      status = 400;
      return false;
    }
    rq.method = line.substr(0, sp1);
    rq.target = line.substr(sp1 + 1, sp2 - sp1 - 1);
    size_t pos = lineEnd + 2;
    while (pos < headerEnd) {
      size_t end = data.find("\r\n", pos);
      std::string h = data.substr(pos, end - pos);
      pos = end + 2;
      size_t colon = h.find(':');
      if (colon == std::string::npos || colon == 0) {
        status = 400;
        return false;
      }
      rq.headers.emplace_back(h.substr(0, colon), Trim(h.substr(colon + 1)));
    }
    std::string body = data.substr(headerEnd + 4);
    if (!rq.Header("Transfer-Encoding").empty()) {
      status = 411;
      return false;
    }
    size_t length = 0;
    std::string lengthText = rq.Header("Content-Length");
    if (!lengthText.empty()) {
      if (lengthText.find_first_not_of("0123456789") != std::string::npos || lengthText.size() > 12) {
        status = 400;
        return false;
      }
      length = static_cast<size_t>(std::stoull(lengthText));
      if (length > kMaxBodyBytes) {
        status = 413;
        return false;
      }
    }
    if (body.size() < length && !strcasecmp(rq.Header("Expect").c_str(), "100-continue") &&
        !c.Write("HTTP/1.1 100 Continue\r\n\r\n"))
      return false;
    body.reserve(length);
    while (body.size() < length) {
      size_t n = c.Read(buf, std::min(sizeof buf, length - body.size()));
      if (!n) return false;
      body.append(buf, n);
    }
    body.resize(length);
    rq.body.swap(body);
    return true;
  }

  void Serve(int fd) {
    Connection c(*this, fd);
    if (!c.Handshake()) return;
    HttpRequest rq;
    int status = 0;
    if (!ReadRequest(c, rq, status)) {
      if (status) c.Write(StatusOnly(status));
      return;
    }
    HttpResponse rs = handler ? handler(rq) : HttpResponse{404, "text/plain", "no handler\n", {}, false};
    if (rs.hang) {
      // Keep the connection open, unanswered, until the server ends or the
      // client goes away; only then does the request count.
      char buf[4096];
      while (c.Read(buf, sizeof buf)) {
      }
      served.fetch_add(1);
      return;
    }
    std::string head = "HTTP/1.1 " + std::to_string(rs.status) + " " + Reason(rs.status) + "\r\n";
    if (!rs.contentType.empty()) head += "Content-Type: " + rs.contentType + "\r\n";
    head += "Content-Length: " + std::to_string(rs.body.size()) + "\r\n";
    for (const auto& h : rs.extraHeaders) head += h.first + ": " + h.second + "\r\n";
    head += "Connection: close\r\n\r\n";
    if (c.Write(head)) c.Write(rs.body);
    served.fetch_add(1);
  }
};

Server::Server(ServerOptions options, Handler handler) : m_impl(new Impl) {
  m_impl->options = std::move(options);
  m_impl->handler = std::move(handler);
}

Server::~Server() { Stop(); }

bool Server::Listen(std::string* error) {
  Impl& im = *m_impl;
  // Writing to a client that hung up must fail with EPIPE, not end the process.
  struct sigaction current {};
  if (sigaction(SIGPIPE, nullptr, &current) == 0 && current.sa_handler == SIG_DFL) {
    struct sigaction ignore {};
    ignore.sa_handler = SIG_IGN;
    sigemptyset(&ignore.sa_mask);
    sigaction(SIGPIPE, &ignore, nullptr);
  }
  auto fail = [&](const std::string& message) {
    if (error) *error = message;
    return false;
  };
  if (im.options.https) {
    const Authority* authority = im.options.authority;
    if (!authority) return fail("an HTTPS server needs a certificate authority");
    im.ctx = SSL_CTX_new(TLS_server_method());
    if (!im.ctx) return fail(OpenSSLError("cannot make a TLS context"));
    SSL_CTX_set_min_proto_version(im.ctx, TLS1_2_VERSION);
    // Test equipment: the server offers whatever certificate it was given
    // and leaves it to the client to judge whether it is strong enough.
    SSL_CTX_set_security_level(im.ctx, 0);
    if (im.options.tls12Only) SSL_CTX_set_max_proto_version(im.ctx, TLS1_2_VERSION);
    Authority::Impl* a = authority->impl();
    if (SSL_CTX_use_certificate(im.ctx, a->server.get()) != 1 ||
        SSL_CTX_use_PrivateKey(im.ctx, a->serverKey.get()) != 1 || SSL_CTX_check_private_key(im.ctx) != 1)
      return fail(OpenSSLError("cannot load the server certificate"));
  }
  sockaddr_in addr{};
  addr.sin_family = AF_INET;
  addr.sin_port = htons(static_cast<uint16_t>(im.options.port));
  if (inet_pton(AF_INET, im.options.host.c_str(), &addr.sin_addr) != 1)
    return fail("not an IPv4 address: " + im.options.host);
  im.listenFd = socket(AF_INET, SOCK_STREAM | SOCK_CLOEXEC | SOCK_NONBLOCK, 0);
  if (im.listenFd < 0) return fail(std::string("socket: ") + std::strerror(errno));
  int one = 1;
  setsockopt(im.listenFd, SOL_SOCKET, SO_REUSEADDR, &one, sizeof one);
  if (bind(im.listenFd, reinterpret_cast<sockaddr*>(&addr), sizeof addr) != 0 || listen(im.listenFd, 16) != 0) {
    std::string message = "cannot listen on " + im.options.host + ":" + std::to_string(im.options.port) + ": " +
                          std::strerror(errno);
    close(im.listenFd);
    im.listenFd = -1;
    return fail(message);
  }
  socklen_t len = sizeof addr;
  getsockname(im.listenFd, reinterpret_cast<sockaddr*>(&addr), &len);
  im.port = ntohs(addr.sin_port);
  return true;
}

int Server::Port() const { return m_impl->port; }

std::string Server::BaseURL() const {
  return std::string(m_impl->options.https ? "https://" : "http://") + m_impl->options.host + ":" +
         std::to_string(m_impl->port);
}

void Server::Run() {
  Impl& im = *m_impl;
  if (im.listenFd < 0) return;
  if (im.options.maxSeconds > 0) im.deadline = Clock::now() + std::chrono::seconds(im.options.maxSeconds);
  while (!im.Done()) {
    pollfd p{im.listenFd, POLLIN, 0};
    if (poll(&p, 1, kSliceMs) <= 0) continue;
    int fd = accept4(im.listenFd, nullptr, nullptr, SOCK_CLOEXEC | SOCK_NONBLOCK);
    if (fd < 0) continue;
    im.Serve(fd);
  }
  // Once stopped, new connections are refused rather than left waiting.
  close(im.listenFd);
  im.listenFd = -1;
}

void Server::Start() {
  if (m_impl->thread.joinable()) return;
  m_impl->thread = std::thread([this] { Run(); });
}

void Server::Stop() {
  RequestStop();
  if (m_impl->thread.joinable() && m_impl->thread.get_id() != std::this_thread::get_id()) m_impl->thread.join();
}

void Server::RequestStop() { m_impl->stopping.store(true); }

int Server::RequestsServed() const { return m_impl->served.load(); }

}  // namespace loopback
