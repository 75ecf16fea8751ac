// ofxkit exchange: posts a request file to a server through the gateway
// transport, saves the reply and dumps it.
#include <signal.h>
#include <unistd.h>

#include <algorithm>
#include <cctype>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <memory>
#include <string>
#include <vector>

#include "cli.h"

namespace cli {
namespace {

const char* const kExchangeHelp =
    "usage: ofxkit exchange REQUEST URL [options]\n"
    "Posts the OFX request file REQUEST to URL (http:, https:) and saves the reply, or reads\n"
    "the reply from a file: URL. Prints where the reply went, then dumps it.\n"
    "  -o FILE                 where the reply goes (default: REQUEST's name with -reply.ofx)\n"
    "  --trust CERT[:ID]       trust the root certificate in CERT (DER or PEM) under root id\n"
    "                          ID (1-4, default 1); may be repeated\n"
    "  --expect-cert-id ID     accept only a server certificate with that identity (base64\n"
    "                          SHA-1 of its DER); at most two\n"
    "  --builtin-roots         trust the library's built-in roots\n"
    "  --no-verify             skip only the validity dates and the host name of the server's\n"
    "                          certificate; its chain must still verify up to a trusted root\n"
    "                          (signatures, key sizes, CA flags), and --trust and\n"
    "                          --expect-cert-id still apply\n"
    "  --timeout SECONDS       give up on a transfer after that long (default 300; 0: never)\n"
    "  --quiet                 no progress line\n"
    "  --verbose               print the transport's log lines on standard error\n"
    "Exit status: as for dump, or 4 when the transfer failed.\n";

constexpr int kTransferFailed = 4;
constexpr const char* kDefaultTimeout = "300";

// SIGINT or SIGTERM, once one arrived: the transfer is cancelled and its
// temporary files removed before the tool exits with 128 + the signal.
volatile sig_atomic_t g_stopSignal = 0;

extern "C" void OnStopSignal(int signal) { g_stopSignal = signal; }

GXNWaitAction StopOnSignal(void*) { return g_stopSignal ? GXN_WAIT_QUIT : GXN_WAIT_CONTINUE; }

void CatchStopSignals() {
  struct sigaction action {};
  action.sa_handler = OnStopSignal;
  sigemptyset(&action.sa_mask);
  sigaction(SIGINT, &action, nullptr);
  sigaction(SIGTERM, &action, nullptr);
}

bool g_verbose = false;
bool g_progress = true;

void PrintLogLine(const char* message, unsigned short level, const char*) {
  if (g_verbose) std::fprintf(stderr, "[%u] %s\n", level, message);
}

// Progress of the transfer: on a terminal one line rewritten in place; when
// standard error is a file or a pipe, whole lines only, one per direction
// when it completes (or where it stood when the transfer ended).
struct Progress {
  bool terminal = false;
  bool shown = false;        // something is on the terminal's line
  const char* verb = nullptr;  // direction of the last report
  unsigned long done = 0, total = 0;
  bool lineWritten = true;   // the last report already has its line
} g_state;

void WriteProgress(const char* prefix, const char* suffix) {
  if (g_state.total)
    std::fprintf(stderr, "%s%-8s %10lu of %lu bytes (%3lu%%)%s", prefix, g_state.verb, g_state.done, g_state.total,
                 g_state.done * 100 / g_state.total, suffix);
  else
    std::fprintf(stderr, "%s%-8s %10lu bytes%s", prefix, g_state.verb, g_state.done, suffix);
}

// Ends the progress output with a line end, whatever was shown.
void FinishProgress() {
  if (!g_progress) return;
  if (g_state.terminal) {
    if (g_state.shown) std::fputc('\n', stderr);
  } else if (!g_state.lineWritten && g_state.verb) {
    WriteProgress("", "\n");
  }
  g_state.shown = false;
  g_state.lineWritten = true;
  std::fflush(stderr);
}

void PrintProgress(OEOpCode op, void* a, void* b) {
  if (!g_progress || (op != OE_OP_SEND_PROGRESS && op != OE_OP_RECEIVE_PROGRESS)) return;
  const char* verb = op == OE_OP_SEND_PROGRESS ? "sent" : "received";
  if (!g_state.terminal && g_state.verb && g_state.verb != verb && !g_state.lineWritten) WriteProgress("", "\n");
  g_state.verb = verb;
  g_state.done = static_cast<unsigned long>(reinterpret_cast<uintptr_t>(a));
  g_state.total = static_cast<unsigned long>(reinterpret_cast<uintptr_t>(b));
  if (g_state.terminal) {
    WriteProgress("\r", g_state.total ? "" : "               ");
    g_state.shown = true;
  } else if (g_state.total && g_state.done >= g_state.total) {
    WriteProgress("", "\n");
    g_state.lineWritten = true;
  } else {
    g_state.lineWritten = false;
  }
  std::fflush(stderr);
}

std::string DefaultReplyPath(const std::string& request) {
  std::string base = request.substr(request.find_last_of('/') == std::string::npos ? 0 : request.find_last_of('/') + 1);
  size_t dot = base.rfind('.');
  if (dot != std::string::npos && dot > 0) base.resize(dot);
  return base + "-reply.ofx";
}

// Adds the certificate in a file (DER, or PEM's base64) as a trusted root;
// the option is PATH or PATH:SLOT (slot 1 to 4).
bool TrustRoot(GXNNetRequest& request, const std::string& option, std::string* error) {
  std::string path = option;
  long id = OE_ROOT_VEXA_BRANDING;
  size_t colon = option.rfind(':');
  if (colon != std::string::npos && colon + 2 == option.size() && option[colon + 1] >= '1' && option[colon + 1] <= '4') {
    path = option.substr(0, colon);
    id = option[colon + 1] - '0';
  }
  OEBuffer file;
  if (!ReadFile(path, file, error)) return false;
  std::string text(file.GetBufferPtr() ? file.GetBufferPtr() : "", file.GetBufferSize());
  unsigned short added;
  size_t begin = text.find("-----BEGIN CERTIFICATE-----");
  if (begin != std::string::npos) {
    size_t start = text.find('\n', begin);
    size_t end = text.find("-----END CERTIFICATE-----");
    if (start == std::string::npos || end == std::string::npos || end < start) {
      *error = path + ": not a certificate";
      return false;
    }
    std::string base64;
    for (size_t i = start; i < end; ++i)
      if (!std::isspace(static_cast<unsigned char>(text[i]))) base64 += text[i];
    added = base64.size() < 0xFFFF ? request.AddTrustedRoot(base64.data(), static_cast<unsigned short>(base64.size()),
                                                             static_cast<OECallbackRootID>(id))
                                   : 0;
  } else {
    added = text.size() < 0xFFFF ? request.AddTrustedRootBER(text.data(), static_cast<unsigned short>(text.size()),
                                                             static_cast<OECallbackRootID>(id))
                                 : 0;
  }
  if (!added) *error = path + ": not a certificate";
  return added != 0;
}

}  // namespace

int CmdExchange(int argc, char** argv) {
  Args args(argc, argv, 2);
  if (args.Flag("help")) {
    std::fputs(kExchangeHelp, stdout);
    return kClean;
  }
  std::vector<std::string> trusted = args.Options("trust");
  std::vector<std::string> expected = args.Options("expect-cert-id");
  bool builtIn = args.Flag("builtin-roots");
  bool noVerify = args.Flag("no-verify");
  g_progress = !args.Flag("quiet");
  g_state.terminal = isatty(STDERR_FILENO) != 0;
  g_verbose = args.Flag("verbose");
  std::string timeout = args.HasOption("timeout") ? args.Option("timeout") : kDefaultTimeout;
  std::string output = args.Option("o");
  std::string error;
  std::vector<std::string> positional = args.Positional(&error);
  if (!error.empty() || positional.size() != 2 || expected.size() > 2) {
    std::fprintf(stderr, "ofxkit exchange: %s\n%s",
                 !error.empty() ? error.c_str()
                 : expected.size() > 2 ? "at most two --expect-cert-id"
                                       : "expected REQUEST and URL",
                 kExchangeHelp);
    return kUsage;
  }
  const std::string& requestPath = positional[0];
  const std::string& url = positional[1];
  if (output.empty()) output = DefaultReplyPath(requestPath);

  char* end = nullptr;
  long seconds = std::strtol(timeout.c_str(), &end, 10);
  if (timeout.empty() || *end || seconds < 0 || seconds > 86400) {
    std::fprintf(stderr, "ofxkit exchange: --timeout takes a number of seconds up to 86400\n%s", kExchangeHelp);
    return kUsage;
  }

  // The request file holds the user's password.
  KeepSecretsOutOfCoreDumps();
  CatchStopSignals();
  OEBuffer body;
  if (!ReadFile(requestPath, body, &error)) {
    std::fprintf(stderr, "ofxkit exchange: %s\n", error.c_str());
    return kBadInput;
  }
  GXNNetAccess access;
  access.SetLogCallback(PrintLogLine);
  access.SetSessionCallback(PrintProgress);
  access.SetWaitHook(StopOnSignal, nullptr);
  OENetStatus status = access.InitConnection();
  if (status != OE_NET_OK) {
    std::fprintf(stderr, "ofxkit exchange: the network session could not be opened (netstatus %d)\n",
                 static_cast<int>(status));
    return kTransferFailed;
  }
  std::unique_ptr<GXNNetRequest> request(static_cast<GXNNetRequest*>(access.NewNetRequest()));
  if (!request) return kTransferFailed;
  for (const std::string& option : trusted) {
    if (!TrustRoot(*request, option, &error)) {
      std::fprintf(stderr, "ofxkit exchange: %s\n", error.c_str());
      return kBadInput;
    }
  }
  if (builtIn) {
    request->AddVexariBrandingRoot();
    request->AddRSAServerRoot();
    request->AddVeriSignOFXCARoot();
  }
  for (const std::string& id : expected)
    request->AddExpectedSSLCertID(id.data(), static_cast<unsigned short>(std::min<size_t>(id.size(), 0xFFFF)));
  if (noVerify) request->SetSSLVerifyCert(0);
  request->SetTimeout(static_cast<int32_t>(seconds));

  status = OENetRequest::HasFileScheme(url.c_str()) ? request->Get(OEString(url.c_str()))
                                                     : request->Send(OEString(url.c_str()), &body);
  body.ClearBuffer('\0');
  FinishProgress();
  uint32_t http = 0, gatewayError = 0;
  request->GetStatus(http, gatewayError);
  OEBuffer reply;
  if (status == OE_NET_OK && !g_stopSignal) status = request->LoadReply(&reply);
  // Deleting the request removes whatever temporary files it still has.
  access.DeleteNetRequest(request.release());
  access.EndConnection();
  if (g_stopSignal) {
    std::fprintf(stderr, "ofxkit exchange: stopped by a signal; nothing was saved\n");
    return 128 + g_stopSignal;
  }
  if (status != OE_NET_OK) {
    std::string http_text = gatewayError >= GX_ERR_HTTP_FIRST && gatewayError <= GX_ERR_HTTP_LAST
                                ? ", HTTP " + std::to_string(http)
                                : std::string();
    std::fprintf(stderr, "ofxkit exchange: the transfer failed: netstatus %d (gateway error %u%s)\n",
                 static_cast<int>(status), static_cast<unsigned>(gatewayError), http_text.c_str());
    return kTransferFailed;
  }
  // The reply holds account data: private to the user.
  if (!WriteFile(output, reply, &error, true)) {
    std::fprintf(stderr, "ofxkit exchange: %s\n", error.c_str());
    return kBadInput;
  }
  std::printf("reply: %s (%u bytes, HTTP %u)\n", output.c_str(), static_cast<unsigned>(reply.GetBufferSize()),
              static_cast<unsigned>(http ? http : 200));
  std::fflush(stdout);
  char dump[] = "dump";
  std::vector<char> path(output.begin(), output.end());
  path.push_back('\0');
  char* dumpArgs[] = {argv[0], dump, path.data(), nullptr};
  return CmdDump(3, dumpArgs);
}

}  // namespace cli
