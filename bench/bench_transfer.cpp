// A statement download through the gateway against a loopback server: post a
// small request, receive the large statement into the temporary file, load
// it into a buffer. Plain HTTP and HTTPS (a fresh handshake each time).
#include <benchmark/benchmark.h>

#include <memory>
#include <string>

#include "loopback_server.h"
#include "ofxkit/ofxkit.h"
#include "statement_text.h"

namespace {

void Download(benchmark::State& state, bool https) {
  const std::string& text = Statement();
  if (text.empty()) {
    state.SkipWithError("no statement: set OFXKIT_BENCH_FILE");
    return;
  }
  std::string error;
  std::unique_ptr<loopback::Authority> authority = loopback::Authority::Make("bench", "bench root", &error);
  loopback::ServerOptions options;
  options.https = https;
  options.authority = authority.get();
  loopback::Server server(options, [&text](const loopback::HttpRequest&) {
    loopback::HttpResponse rs;
    rs.body = text;
    return rs;
  });
  if (!authority || !server.Listen(&error)) {
    state.SkipWithError(error.c_str());
    return;
  }
  server.Start();
  GXNNetAccess access;
  access.InitConnection();
  const OEString url((server.BaseURL() + "/ofx").c_str());
  for (auto _ : state) {
    std::unique_ptr<GXNNetRequest> request(static_cast<GXNNetRequest*>(access.NewNetRequest()));
    const std::string& der = authority->CaDER();
    request->AddTrustedRootBER(der.data(), static_cast<unsigned short>(der.size()), OE_ROOT_VEXA_BRANDING);
    OEBuffer body;
    body += "<OFX></OFX>";
    OEBuffer reply;
    if (request->Send(url, &body) != OE_NET_OK || request->LoadReply(&reply) != OE_NET_OK ||
        reply.GetBufferSize() != text.size()) {
      state.SkipWithError("transfer failed");
      break;
    }
  }
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations() * text.size()));
  access.EndConnection();
  server.Stop();
}

void BM_DownloadStatementHttp(benchmark::State& state) { Download(state, false); }
void BM_DownloadStatementHttps(benchmark::State& state) { Download(state, true); }
BENCHMARK(BM_DownloadStatementHttp)->Unit(benchmark::kMillisecond)->UseRealTime();
BENCHMARK(BM_DownloadStatementHttps)->Unit(benchmark::kMillisecond)->UseRealTime();

}  // namespace

BENCHMARK_MAIN();
