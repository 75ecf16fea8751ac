// Reading a large bank statement tag by tag, as a parse does.
//
// The statement comes from the file named by OFXKIT_BENCH_FILE, or, when that
// is unset, from the generator script of the shared tools (17000
// transactions, about 2.8 MB).
#include <benchmark/benchmark.h>

#include <cstdio>
#include <cstdlib>
#include <string>

#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/parse/OEParseEngine.h"
#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/types/OEBuffer.h"

namespace {

const char kGenerator[] = "python3 /work/shared/tools/gen_statement.py 17000";

bool ReadAll(FILE* f, std::string& out) {
  char chunk[65536];
  size_t n;
  while ((n = fread(chunk, 1, sizeof chunk, f)) > 0) out.append(chunk, n);
  return !ferror(f);
}

// The statement text, or "" when it cannot be had.
const std::string& Statement() {
  static const std::string text = [] {
    std::string s;
    if (const char* path = getenv("OFXKIT_BENCH_FILE")) {
      if (FILE* f = fopen(path, "rb")) {
        if (!ReadAll(f, s)) s.clear();
        fclose(f);
      }
      return s;
    }
    if (FILE* p = popen(kGenerator, "r")) {
      if (!ReadAll(p, s)) s.clear();
      if (pclose(p) != 0) s.clear();
    }
    return s;
  }();
  return text;
}

bool LoadBuffer(benchmark::State& state, OEBuffer& buffer) {
  const std::string& text = Statement();
  if (text.empty()) {
    state.SkipWithError(
        "no statement: set OFXKIT_BENCH_FILE to a readable file, or make python3 and the generator available");
    return false;
  }
  if (buffer.WriteLarge(text.data(), static_cast<uint32_t>(text.size())) != OEBUF_OK) {
    state.SkipWithError("statement does not fit an OEBuffer");
    return false;
  }
  return true;
}

// Header lines, then every tag up to the end, values copied and expanded.
void BM_ParseEngine_Statement(benchmark::State& state) {
  OEBuffer buffer;
  if (!LoadBuffer(state, buffer)) return;
  OETagDictionary::TheOETagDictionary();
  OEParseLogger::TheOEParseLogger()->DeleteAll();
  size_t tags = 0;
  for (auto _ : state) {
    OEParseEngine engine(buffer);
    OEHeaderTag header;
    OEString value;
    while (engine.GetHeader(header, value, nullptr)) {
    }
    engine.ResetToEndOfHeader();
    OETagDictionaryEntry entry{OE_TAG_NONE, nullptr};
    OETagType kind;
    tags = 0;
    while ((kind = engine.GetOETag(entry, value)) != OE_TAG_DONE) {
      if (kind == OE_TAG_FAILED) {
        state.SkipWithError("engine failed on the statement");
        return;
      }
      ++tags;
      benchmark::DoNotOptimize(entry.id);
    }
    benchmark::DoNotOptimize(value.c_str());
  }
  if (OEParseLogger::TheOEParseLogger()->GetAnyParseExceptionsLogged()) {
    state.SkipWithError("the statement produced warnings");
    return;
  }
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) * static_cast<int64_t>(buffer.GetBufferSize()));
  state.counters["tags"] = static_cast<double>(tags);
}
BENCHMARK(BM_ParseEngine_Statement)->Unit(benchmark::kMillisecond);

// Items only (no dictionary lookups, no copies): the floor of the scanner.
class ItemReader : public OEParseEngine {
 public:
  using OEParseEngine::OEParseEngine;
  using OEParseEngine::GetOeTagItem;
};

void BM_ParseEngine_ItemsOnly(benchmark::State& state) {
  OEBuffer buffer;
  if (!LoadBuffer(state, buffer)) return;
  for (auto _ : state) {
    ItemReader reader(buffer);
    size_t items = 0;
    while (reader.GetOeTagItem()) ++items;
    benchmark::DoNotOptimize(items);
  }
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) * static_cast<int64_t>(buffer.GetBufferSize()));
}
BENCHMARK(BM_ParseEngine_ItemsOnly)->Unit(benchmark::kMillisecond);

}  // namespace

BENCHMARK_MAIN();
