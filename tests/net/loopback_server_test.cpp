// The loopback server behind `ofxkit serve` and the transport tests: bad
// clients get an answer or lose their connection, and the server goes on.
#include <arpa/inet.h>
#include <gtest/gtest.h>
#include <netinet/in.h>
#include <openssl/ssl.h>
#include <poll.h>
#include <sys/socket.h>
#include <unistd.h>

#include <atomic>
#include <chrono>
#include <memory>
#include <string>
#include <thread>

#include "loopback_server.h"

namespace {

// Sends raw bytes, then reads until the server closes (or 5 s pass).
std::string Exchange(int port, const std::string& bytes, bool closeEarly = false) {
  int fd = socket(AF_INET, SOCK_STREAM, 0);
  sockaddr_in addr{};
  addr.sin_family = AF_INET;
  addr.sin_port = htons(static_cast<uint16_t>(port));
  inet_pton(AF_INET, "127.0.0.1", &addr.sin_addr);
  std::string reply;
  if (connect(fd, reinterpret_cast<sockaddr*>(&addr), sizeof addr) == 0) {
    send(fd, bytes.data(), bytes.size(), MSG_NOSIGNAL);
    if (!closeEarly) {
      char buf[4096];
      pollfd p{fd, POLLIN, 0};
      while (poll(&p, 1, 5000) > 0) {
        ssize_t n = recv(fd, buf, sizeof buf, 0);
        if (n <= 0) break;
        reply.append(buf, static_cast<size_t>(n));
      }
    }
  }
  close(fd);
  return reply;
}

std::string StatusLine(const std::string& reply) { return reply.substr(0, reply.find("\r\n")); }

int Connect(int port) {
  int fd = socket(AF_INET, SOCK_STREAM, 0);
  sockaddr_in addr{};
  addr.sin_family = AF_INET;
  addr.sin_port = htons(static_cast<uint16_t>(port));
  inet_pton(AF_INET, "127.0.0.1", &addr.sin_addr);
  if (connect(fd, reinterpret_cast<sockaddr*>(&addr), sizeof addr) != 0) {
    close(fd);
    return -1;
  }
  return fd;
}

// Over TLS (the server's certificate unchecked): shakes hands, then either
// hangs up at once or sends `bytes` and reads the answer.
std::string ExchangeTLS(int port, const std::string& bytes, bool hangUpAfterHandshake) {
  std::string reply;
  SSL_CTX* ctx = SSL_CTX_new(TLS_client_method());
  int fd = Connect(port);
  SSL* ssl = ctx && fd >= 0 ? SSL_new(ctx) : nullptr;
  if (ssl && SSL_set_fd(ssl, fd) == 1 && SSL_connect(ssl) == 1 && !hangUpAfterHandshake) {
    SSL_write(ssl, bytes.data(), static_cast<int>(bytes.size()));
    char buf[4096];
    int n;
    while ((n = SSL_read(ssl, buf, sizeof buf)) > 0) reply.append(buf, static_cast<size_t>(n));
  }
  if (ssl) SSL_free(ssl);
  if (fd >= 0) close(fd);
  if (ctx) SSL_CTX_free(ctx);
  return reply;
}

TEST(LoopbackServer, AnswersBadRequestsAndKeepsServing) {
  std::atomic<int> handled{0};
  loopback::ServerOptions options;
  options.maxSeconds = 30;
  loopback::Server server(options, [&handled](const loopback::HttpRequest& rq) {
    ++handled;
    loopback::HttpResponse rs;
    rs.body = rq.method + " " + rq.target + " " + rq.Header("x-case") + " " + std::to_string(rq.body.size());
    return rs;
  });
  std::string error;
  ASSERT_TRUE(server.Listen(&error)) << error;
  server.Start();
  const int port = server.Port();

  EXPECT_EQ(StatusLine(Exchange(port, "garbage\r\n\r\n")), "HTTP/1.1 400 Bad Request");
  EXPECT_EQ(StatusLine(Exchange(port, "GET / HTTP/1.1\r\nno colon here\r\n\r\n")), "HTTP/1.1 400 Bad Request");
  EXPECT_EQ(StatusLine(Exchange(port, "POST / HTTP/1.1\r\nContent-Length: 99999999999\r\n\r\n")),
            "HTTP/1.1 413 Payload Too Large");
  EXPECT_EQ(StatusLine(Exchange(port, "POST / HTTP/1.1\r\nContent-Length: 12x\r\n\r\n")), "HTTP/1.1 400 Bad Request");
  EXPECT_EQ(StatusLine(Exchange(port, "POST / HTTP/1.1\r\nTransfer-Encoding: chunked\r\n\r\n0\r\n\r\n")),
            "HTTP/1.1 411 Length Required");
  EXPECT_EQ(StatusLine(Exchange(port, std::string(70 * 1024, 'a'))), "HTTP/1.1 400 Bad Request");
  // A client that goes away mid-body is dropped without an answer.
  Exchange(port, "POST / HTTP/1.1\r\nContent-Length: 100\r\n\r\nshort", true);
  EXPECT_EQ(handled, 0);

  // Headers are matched without regard to case; the body is read whole.
  std::string reply = Exchange(port, "POST /ofx HTTP/1.1\r\nX-Case:  Mixed \r\nContent-Length: 5\r\n\r\nhello");
  EXPECT_EQ(StatusLine(reply), "HTTP/1.1 200 OK");
  EXPECT_NE(reply.find("Content-Type: application/x-ofx\r\n"), std::string::npos);
  EXPECT_NE(reply.find("Connection: close\r\n"), std::string::npos);
  EXPECT_EQ(reply.substr(reply.find("\r\n\r\n", 30) + 4), "POST /ofx Mixed 5");
  server.Stop();
  EXPECT_EQ(server.RequestsServed(), 1);
  EXPECT_EQ(handled, 1);
}

TEST(LoopbackServer, BoundsEndTheServer) {
  loopback::ServerOptions options;
  options.maxRequests = 1;
  options.maxSeconds = 30;
  loopback::Server server(options, [](const loopback::HttpRequest&) { return loopback::HttpResponse(); });
  std::string error;
  ASSERT_TRUE(server.Listen(&error)) << error;
  const int port = server.Port();
  std::thread client([port] { Exchange(port, "GET / HTTP/1.1\r\n\r\n"); });
  server.Run();  // returns once the one request is answered
  client.join();
  EXPECT_EQ(server.RequestsServed(), 1);
  // Once the server has ended, nobody is listening.
  EXPECT_EQ(Exchange(port, "GET / HTTP/1.1\r\n\r\n"), "");

  // A connection left unanswered does not keep the server past its time bound.
  options.maxRequests = 0;
  options.maxSeconds = 1;
  loopback::Server hanging(options, [](const loopback::HttpRequest&) {
    loopback::HttpResponse rs;
    rs.hang = true;
    return rs;
  });
  ASSERT_TRUE(hanging.Listen(&error)) << error;
  const int hangPort = hanging.Port();
  auto start = std::chrono::steady_clock::now();
  std::thread waiting([hangPort] { EXPECT_EQ(Exchange(hangPort, "GET / HTTP/1.1\r\n\r\n"), ""); });
  hanging.Run();
  waiting.join();
  EXPECT_LT(std::chrono::steady_clock::now() - start, std::chrono::seconds(4));
}

TEST(LoopbackServer, HttpsSurvivesClientsThatHangUp) {
  std::string error;
  std::unique_ptr<loopback::Authority> authority = loopback::Authority::Make("ofxkit tests", "root", &error);
  ASSERT_NE(authority, nullptr) << error;
  loopback::ServerOptions options;
  options.https = true;
  options.authority = authority.get();
  options.maxSeconds = 30;
  loopback::Server server(options, [](const loopback::HttpRequest&) {
    loopback::HttpResponse rs;
    rs.body = "still here";
    return rs;
  });
  ASSERT_TRUE(server.Listen(&error)) << error;
  server.Start();
  // Writing to them (a session ticket, a close_notify) must not raise SIGPIPE.
  for (int i = 0; i < 5; ++i) ExchangeTLS(server.Port(), "", true);
  std::string reply = ExchangeTLS(server.Port(), "GET / HTTP/1.1\r\n\r\n", false);
  EXPECT_EQ(StatusLine(reply), "HTTP/1.1 200 OK");
  EXPECT_NE(reply.find("still here"), std::string::npos);
  server.Stop();
}

TEST(LoopbackServer, TricklingClientLosesItsConnectionAtTheRequestDeadline) {
  loopback::ServerOptions options;
  options.maxSeconds = 30;
  options.requestSeconds = 1;
  loopback::Server server(options, [](const loopback::HttpRequest&) { return loopback::HttpResponse(); });
  std::string error;
  ASSERT_TRUE(server.Listen(&error)) << error;
  server.Start();
  using Clock = std::chrono::steady_clock;
  auto start = Clock::now();
  int fd = Connect(server.Port());
  ASSERT_GE(fd, 0);
  // One byte every 200 ms never idles long enough to be dropped for idling.
  bool dropped = false;
  const std::string trickle = "POST / HTTP/1.1\r\nContent-Length: 100\r\nX-Padding: aaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaaa";
  for (size_t i = 0; i < trickle.size() && !dropped; ++i) {
    if (send(fd, &trickle[i], 1, MSG_NOSIGNAL) != 1) dropped = true;
    pollfd p{fd, POLLIN, 0};
    if (poll(&p, 1, 200) > 0) {
      char c;
      if (recv(fd, &c, 1, 0) <= 0) dropped = true;
    }
  }
  close(fd);
  EXPECT_TRUE(dropped);
  EXPECT_LT(Clock::now() - start, std::chrono::seconds(3));
  // The next client is served.
  EXPECT_EQ(StatusLine(Exchange(server.Port(), "GET / HTTP/1.1\r\n\r\n")), "HTTP/1.1 200 OK");
  server.Stop();
}

TEST(LoopbackServer, RefusesWhatItCannotServe) {
  loopback::ServerOptions https;
  https.https = true;  // without an authority
  loopback::Server noAuthority(https, nullptr);
  std::string error;
  EXPECT_FALSE(noAuthority.Listen(&error));
  EXPECT_FALSE(error.empty());
  loopback::ServerOptions badHost;
  badHost.host = "localhost:80";
  loopback::Server server(badHost, nullptr);
  EXPECT_FALSE(server.Listen(&error));
}

}  // namespace
