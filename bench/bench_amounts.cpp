// Amount text -> OEPrecisionInteger -> text round trips, as the parser and the
// builder do them for every amount element.
#include <benchmark/benchmark.h>

#include <cstring>

#include "ofxkit/types/OEPrecisionInteger.h"

namespace {

const char* const kAmounts[] = {"-1234.56", "0.01", "1000000.0000", "123456789012345678901.25"};

void BM_AmountRoundTrip(benchmark::State& state) {
  const char* text = kAmounts[state.range(0)];
  OEPrecisionInteger value;
  for (auto _ : state) {
    value.ConvertStringToOEPrecisionInteger(text);
    char* out = static_cast<char*>(value);
    benchmark::DoNotOptimize(out);
  }
  state.SetLabel(text);
}
BENCHMARK(BM_AmountRoundTrip)->DenseRange(0, 3);

void BM_AmountParse(benchmark::State& state) {
  const char* text = kAmounts[state.range(0)];
  OEPrecisionInteger value;
  for (auto _ : state) {
    benchmark::DoNotOptimize(value.ConvertStringToOEPrecisionInteger(text));
  }
  state.SetLabel(text);
}
BENCHMARK(BM_AmountParse)->DenseRange(0, 3);

void BM_AmountFormat(benchmark::State& state) {
  OEPrecisionInteger value(kAmounts[state.range(0)]);
  for (auto _ : state) {
    char* out = static_cast<char*>(value);
    benchmark::DoNotOptimize(out);
  }
  state.SetLabel(kAmounts[state.range(0)]);
}
BENCHMARK(BM_AmountFormat)->DenseRange(0, 3);

// A fresh object per amount, as a parsed aggregate holds one per element.
void BM_AmountRoundTripFreshObject(benchmark::State& state) {
  const char* text = kAmounts[state.range(0)];
  for (auto _ : state) {
    OEPrecisionInteger value(text);
    char* out = static_cast<char*>(value);
    benchmark::DoNotOptimize(out);
  }
  state.SetLabel(text);
}
BENCHMARK(BM_AmountRoundTripFreshObject)->DenseRange(0, 3);

}  // namespace

BENCHMARK_MAIN();
