// A small HTTP/1.1 server on the loopback interface, plain or over TLS, for
// `ofxkit serve` and for the transport tests. Listening makes the process
// ignore SIGPIPE (when nothing else handles it): a client that hangs up
// must not end the server. It is not part of the library:
// it is test and demonstration equipment, bounded in requests and in time.
#pragma once

#include <atomic>
#include <functional>
#include <memory>
#include <string>
#include <thread>
#include <utility>
#include <vector>

namespace loopback {

struct HttpRequest {
  std::string method;   // "GET", "POST", ...
  std::string target;   // "/ofx", as sent
  std::vector<std::pair<std::string, std::string>> headers;  // in order, values trimmed
  std::string body;
  // The first header of that name (case-insensitive), or "".
  std::string Header(const std::string& name) const;
};

struct HttpResponse {
  int status = 200;
  std::string contentType = "application/x-ofx";
  std::string body;
  std::vector<std::pair<std::string, std::string>> extraHeaders;
  // Read the request, then never answer (the connection stays open until
  // the server stops): for timeout and cancel tests.
  bool hang = false;
};

using Handler = std::function<HttpResponse(const HttpRequest&)>;

// What the server certificate of an authority looks like. The defaults make
// a sound one; the others let tests show that a client refuses weak or
// ill-named certificates.
struct LeafOptions {
  int keyBits = 2048;                                  // RSA key size
  std::string digest = "SHA256";                       // signature digest: "SHA256", "SHA1", "MD5"
  std::string commonName = "localhost";                // subject CN=
  std::string altNames = "DNS:localhost,IP:127.0.0.1";  // subjectAltName; empty for none
  // Signed by a stray key while naming the authority as its issuer.
  bool forged = false;
  // Valid from a day ago for this many days (0: expired a moment after it
  // is made).
  long validDays = 730;
};

// A certificate authority made in memory (RSA, SHA-256), and a server
// certificate it issues, by default for "localhost" and 127.0.0.1.
class Authority {
 public:
  // organisation names the authority's subject O=; commonName its CN=.
  static std::unique_ptr<Authority> Make(const std::string& organisation, const std::string& commonName,
                                         std::string* error, const LeafOptions& leaf = LeafOptions());
  // Replaces the server certificate (and its key) with one made as leaf asks.
  bool Reissue(const LeafOptions& leaf, std::string* error);
  ~Authority();
  const std::string& CaDER() const;      // the authority's certificate, DER
  std::string CaPEM() const;
  const std::string& ServerDER() const;  // the server's certificate, DER
  struct Impl;
  Impl* impl() const { return m_impl.get(); }

 private:
  Authority();
  std::unique_ptr<Impl> m_impl;
};

struct ServerOptions {
  std::string host = "127.0.0.1";       // a loopback address to bind
  bool https = false;
  const Authority* authority = nullptr;  // required when https
  int port = 0;                          // 0: any free port
  int maxRequests = 0;                   // stop after that many requests; 0: no bound
  int maxSeconds = 0;                    // stop after that long; 0: no bound
  // Each connection, from its acceptance to its response, gets at most this
  // long, however slowly its client trickles bytes in.
  int requestSeconds = 30;
  // TLS 1.2 at most (a key too small for TLS 1.3's signatures can still be
  // offered that way).
  bool tls12Only = false;
};

class Server {
 public:
  Server(ServerOptions options, Handler handler);
  ~Server();  // stops and joins
  // Binds options.host and listens; false with a message when it cannot.
  bool Listen(std::string* error);
  int Port() const;
  // "http://HOST:PORT" or "https://HOST:PORT".
  std::string BaseURL() const;
  // Serves on the calling thread until Stop, maxRequests or maxSeconds.
  void Run();
  // Serves on a thread of its own (for tests).
  void Start();
  // Ends Run (from any thread) and joins the thread Start made.
  void Stop();
  // Asks Run to end soon, without waiting: safe in a signal handler.
  void RequestStop();
  int RequestsServed() const;

 private:
  struct Impl;
  std::unique_ptr<Impl> m_impl;
};

}  // namespace loopback
