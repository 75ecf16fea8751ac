// Date-time text -> OEDateTime -> text, on the values OFX files carry most.
#include <benchmark/benchmark.h>

#include <cstring>

#include "ofxkit/types/OEDateTime.h"

namespace {

const char* const kTexts[] = {"20261123", "20261123120000", "20261123120000.123[-5:EST]"};

void BM_DateRoundTrip(benchmark::State& state) {
  const char* text = kTexts[state.range(0)];
  OEDateTime value;
  OEString out;
  for (auto _ : state) {
    value.ConvertStringToOEDateTime(text);
    value.GetDateString(out);
    benchmark::DoNotOptimize(out.c_str());
  }
  if (strcmp(out.c_str(), text) != 0) state.SkipWithError("round trip changed the text");
  state.SetLabel(text);
}
BENCHMARK(BM_DateRoundTrip)->DenseRange(0, 2);

void BM_DateRead(benchmark::State& state) {
  const char* text = kTexts[state.range(0)];
  OEDateTime value;
  for (auto _ : state) {
    benchmark::DoNotOptimize(value.ConvertStringToOEDateTime(text));
    benchmark::ClobberMemory();
  }
  state.SetLabel(text);
}
BENCHMARK(BM_DateRead)->DenseRange(0, 2);

void BM_DateWrite(benchmark::State& state) {
  const OEDateTime value(kTexts[state.range(0)]);
  OEString out;
  for (auto _ : state) {
    value.GetDateString(out);
    benchmark::DoNotOptimize(out.c_str());
  }
  state.SetLabel(kTexts[state.range(0)]);
}
BENCHMARK(BM_DateWrite)->DenseRange(0, 2);

void BM_DateCompare(benchmark::State& state) {
  const OEDateTime a(kTexts[2]);
  const OEDateTime b(kTexts[1]);
  for (auto _ : state) benchmark::DoNotOptimize(a < b);
}
BENCHMARK(BM_DateCompare);

}  // namespace

BENCHMARK_MAIN();
