// ofxkit serve: a small OFX server on the loopback interface, plain HTTP or
// HTTPS with a certificate authority made at start-up, answering sign-on and
// statement requests the way `ofxkit respond` does.
#include <signal.h>

#include <atomic>
#include <cstdio>
#include <cstdlib>
#include <string>

#include "cli.h"
#include "loopback_server.h"

namespace cli {
namespace {

const char kServeHelp[] =
    "usage: ofxkit serve [--https [--cert-out FILE]] [--port N] [--max-requests N] [--max-seconds N]\n"
    "                    [--request-seconds N]\n"
    "                    [--transactions N] [--user USER [--password-stdin]] [--ready-file FILE]\n"
    "Answers OFX requests POSTed to any path of 127.0.0.1:PORT (an unused port by\n"
    "default) with a sign-on response and generated statements, as 'ofxkit respond'\n"
    "does; with --user, other credentials get sign-on status 15500. With --https the\n"
    "server makes a certificate authority and a certificate for 127.0.0.1; --cert-out\n"
    "writes the authority's certificate (DER) for clients to trust. Prints\n"
    "'listening on URL' once ready (and writes URL to the --ready-file), logs one line\n"
    "per request on standard error, and ends after --max-requests, --max-seconds, or\n"
    "on SIGINT/SIGTERM. Each connection gets at most --request-seconds (default 30)\n"
    "from its acceptance to its answer.\n";

// Read by the signal handler: an atomic pointer is lock-free, hence safe there.
std::atomic<loopback::Server*> g_server{nullptr};

extern "C" void OnSignal(int) {
  if (loopback::Server* server = g_server.load()) server->RequestStop();
}

loopback::HttpResponse TextResponse(int status, const char* text) {
  loopback::HttpResponse rs;
  rs.status = status;
  rs.contentType = "text/plain";
  rs.body = text;
  return rs;
}

loopback::HttpResponse Answer(const loopback::HttpRequest& rq, const RespondOptions& options) {
  if (rq.method != "POST") {
    loopback::HttpResponse rs = TextResponse(405, "POST an OFX request file\n");
    rs.extraHeaders.emplace_back("Allow", "POST");
    return rs;
  }
  // The whole body in one allocation; more than a buffer can hold is refused
  // rather than parsed cut short.
  OEBuffer body;
  const uint32_t size = static_cast<uint32_t>(rq.body.size());
  if (rq.body.size() >= OEBuffer::kMaxBufferSize || body.AllocateTo(size + 1) != OEBUF_OK ||
      body.WriteLarge(rq.body.data(), size) != OEBUF_OK)
    return TextResponse(413, "the request file is too large\n");
  ParsedFile parsed;
  std::string error;
  int rc = ParseOFXBuffer(body, "request", parsed, &error);
  body.ClearBuffer('\0');  // the copy holds the user's password
  if (rc == kBadInput || rc == kParseFailed || parsed.isResponse)
    return TextResponse(400, "not an OFX request file\n");
  loopback::HttpResponse rs;
  OEBuffer out(0, 1u << 16);
  if (WriteAnswer(*static_cast<OEFileRq*>(parsed.file.get()), options, out) != OE_BUILD_OK)
    return TextResponse(500, "the response could not be written\n");
  rs.body.assign(out.GetBufferPtr() ? out.GetBufferPtr() : "", out.GetBufferSize());
  return rs;
}

// What the request log shows of a method or target: printable ASCII only, at
// most 200 characters, and no query string, which may carry credentials.
std::string Loggable(const std::string& text) {
  std::string out;
  for (char c : text) {
    if (c == '?' || out.size() >= 200) {
      out += c == '?' ? "?..." : "...";
      break;
    }
    out += (c > ' ' && c < 127) ? c : '.';
  }
  return out;
}

bool WriteText(const std::string& path, const std::string& text, std::string* error) {
  OEBuffer buffer;
  buffer.WriteLarge(text.data(), static_cast<uint32_t>(text.size()));
  return WriteFile(path, buffer, error);
}

// Writes the URL into a new file of an unpredictable name beside path, then
// renames it, so that a script waiting for the file never reads half of it
// and nobody can plant a file or link under the temporary name.
bool WriteReadyFile(const std::string& path, const std::string& url, std::string* error) {
  OEBuffer buffer;
  const std::string line = url + "\n";
  buffer.WriteLarge(line.data(), static_cast<uint32_t>(line.size()));
  return WritePrivateFile(path, buffer, error);
}

int Number(const std::string& text, int fallback) {
  if (text.empty()) return fallback;
  char* end = nullptr;
  long n = std::strtol(text.c_str(), &end, 10);
  return (*end || n < 0 || n > 65535 * 16) ? -1 : static_cast<int>(n);
}

}  // namespace

int CmdServe(int argc, char** argv) {
  Args args(argc, argv, 2);
  if (args.Flag("help")) {
    std::fputs(kServeHelp, stdout);
    return kClean;
  }
  loopback::ServerOptions server;
  server.https = args.Flag("https");
  std::string certOut = args.Option("cert-out");
  std::string readyFile = args.Option("ready-file");
  server.port = Number(args.Option("port"), 0);
  server.maxRequests = Number(args.Option("max-requests"), 0);
  server.maxSeconds = Number(args.Option("max-seconds"), 0);
  server.requestSeconds = Number(args.Option("request-seconds"), 30);
  RespondOptions options;
  if (!ReadRespondOptions(args, "serve", options)) return kUsage;
  std::string error;
  std::vector<std::string> rest = args.Positional(&error);
  if (error.empty() && !rest.empty()) error = "unexpected argument " + rest[0];
  if (error.empty() && (server.port < 0 || server.port > 65535 || server.maxRequests < 0 || server.maxSeconds < 0 ||
                         server.requestSeconds < 1))
    error = "--port, --max-requests, --max-seconds and --request-seconds take small numbers";
  if (error.empty() && !certOut.empty() && !server.https) error = "--cert-out needs --https";
  if (!error.empty()) {
    std::fprintf(stderr, "ofxkit serve: %s\n%s", error.c_str(), kServeHelp);
    return kUsage;
  }
  if (!AskPassword("serve", options)) return kUsage;

  std::unique_ptr<loopback::Authority> authority;
  if (server.https) {
    authority = loopback::Authority::Make("ofxkit", "ofxkit test authority", &error);
    if (!authority) {
      std::fprintf(stderr, "ofxkit serve: %s\n", error.c_str());
      return kBadInput;
    }
    server.authority = authority.get();
    if (!certOut.empty() && !WriteText(certOut, authority->CaDER(), &error)) {
      std::fprintf(stderr, "ofxkit serve: %s\n", error.c_str());
      return kBadInput;
    }
  }
  loopback::Server listener(server, [&options](const loopback::HttpRequest& rq) {
    loopback::HttpResponse rs = Answer(rq, options);
    std::fprintf(stderr, "%s %s %d %zu bytes\n", Loggable(rq.method).c_str(), Loggable(rq.target).c_str(),
                 rs.status, rs.body.size());
    return rs;
  });
  if (!listener.Listen(&error)) {
    std::fprintf(stderr, "ofxkit serve: %s\n", error.c_str());
    return kBadInput;
  }
  // Handlers first, so that a script which stops the server as soon as it is
  // announced always gets a clean exit.
  g_server.store(&listener);
  struct sigaction action {};
  action.sa_handler = OnSignal;
  sigemptyset(&action.sa_mask);
  sigaction(SIGINT, &action, nullptr);
  sigaction(SIGTERM, &action, nullptr);
  // A client that hangs up while being answered must not end the server.
  struct sigaction ignore {};
  ignore.sa_handler = SIG_IGN;
  sigemptyset(&ignore.sa_mask);
  sigaction(SIGPIPE, &ignore, nullptr);
  const std::string url = listener.BaseURL() + "/";
  std::printf("listening on %s\n", url.c_str());
  std::fflush(stdout);
  bool ready = readyFile.empty() || WriteReadyFile(readyFile, url, &error);
  if (ready) listener.Run();
  g_server.store(nullptr);
  if (!ready) {
    std::fprintf(stderr, "ofxkit serve: %s\n", error.c_str());
    return kBadInput;
  }
  if (!readyFile.empty()) std::remove(readyFile.c_str());
  return kClean;
}

}  // namespace cli
