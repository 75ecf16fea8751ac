// Parsing a large bank statement response and a large brokerage statement
// response into an OEFileRs tree, and building each tree back to OFX text.
// The statements come from OFXKIT_BENCH_FILE and OFXKIT_BENCH_INVFILE, or are
// generated with the sample generators beside the project (17,000 bank
// transactions, about 2.8 MB; 10,000 brokerage transactions, about 3.0 MB).
#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <memory>
#include <string>

#include "ofxkit/ofxkit.h"
#include "statement_text.h"

namespace {
void FillBuffer(OEBuffer& buffer, const std::string& text) {
  buffer.SetBufferOffset(0);
  buffer.WriteLarge(text.data(), static_cast<uint32_t>(text.size()));
  buffer.SetBufferOffset(0);
}

using Source = const std::string& (*)();

void BM_ParseStatementIntoFileRs(benchmark::State& state, Source source) {
  const std::string& text = source();
  if (text.empty()) {
    state.SkipWithError("no statement: set OFXKIT_BENCH_FILE");
    return;
  }
  OEBuffer buffer(static_cast<uint32_t>(text.size() + 1), 0);
  FillBuffer(buffer, text);
  for (auto _ : state) {
    OEFileRs file;
    OESimpleParser parser;
    OEParseStatus status = parser.Parse(&buffer, &file, 0);
    if (status != OE_PARSE_OK && status != OE_PARSE_WARNINGS) {
      state.SkipWithError("parse failed");
      break;
    }
    benchmark::DoNotOptimize(file.GetNumberOfResponse());
  }
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) * static_cast<int64_t>(text.size()));
}
BENCHMARK_CAPTURE(BM_ParseStatementIntoFileRs, bank, &Statement)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_ParseStatementIntoFileRs, brokerage, &BrokerageStatement)->Unit(benchmark::kMillisecond);

void BM_BuildStatementFromTree(benchmark::State& state, Source source) {
  const std::string& text = source();
  if (text.empty()) {
    state.SkipWithError("no statement: set OFXKIT_BENCH_FILE");
    return;
  }
  OEBuffer input(static_cast<uint32_t>(text.size() + 1), 0);
  FillBuffer(input, text);
  OEFileRs file;
  OESimpleParser parser;
  parser.Parse(&input, &file, 0);
  int64_t written = 0;
  OEBuffer out(static_cast<uint32_t>(text.size() + 65536), 1 << 20);
  for (auto _ : state) {
    out.SetBufferOffset(0);
    out.SetBufferSize(0);
    OEBuilder builder;
    if (builder.Build(&out, &file, OE_BUILD_LENIENT, 0) != OE_BUILD_OK) {
      state.SkipWithError("build failed");
      break;
    }
    written += out.GetBufferSize();
  }
  state.SetBytesProcessed(written);
}
BENCHMARK_CAPTURE(BM_BuildStatementFromTree, bank, &Statement)->Unit(benchmark::kMillisecond);
BENCHMARK_CAPTURE(BM_BuildStatementFromTree, brokerage, &BrokerageStatement)->Unit(benchmark::kMillisecond);
}  // namespace

BENCHMARK_MAIN();
