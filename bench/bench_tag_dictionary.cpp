// Tag dictionary lookups: the parse engine's name-to-id path and the
// builder's id-to-name path.
#include <benchmark/benchmark.h>

#include <cstring>
#include <string>
#include <vector>

#include "ofxkit/core/OETagDictionary.h"

namespace {

// Tags as they occur in a bank statement download, most frequent first.
const char* const kTypicalNames[] = {
    "STMTTRN", "TRNTYPE",  "DTPOSTED", "TRNAMT",       "FITID",        "NAME",
    "MEMO",    "SRVRTID",  "BANKTRANLIST", "LEDGERBAL", "BALAMT",      "DTASOF",
    "OFX",     "SIGNONMSGSRSV1", "SONRS", "STATUS",     "CODE",        "SEVERITY",
    "DTSERVER", "LANGUAGE", "FI",      "ORG",          "FID",          "BANKMSGSRSV1",
    "STMTTRNRS", "TRNUID", "STMTRS",   "CURDEF",       "BANKACCTFROM", "BANKID",
    "ACCTID",  "ACCTTYPE", "DTSTART",  "DTEND",        "AVAILBAL",     "VEXA.BID",
};

struct Key {
  std::string text;
  unsigned short length;
};

std::vector<Key> MakeKeys(bool lowerCase, const char* suffix) {
  std::vector<Key> keys;
  for (const char* name : kTypicalNames) {
    Key key{std::string(name) + suffix, static_cast<unsigned short>(strlen(name) + strlen(suffix))};
    if (lowerCase) {
      for (char& c : key.text) c = static_cast<char>((c >= 'A' && c <= 'Z') ? c - 'A' + 'a' : c);
    }
    keys.push_back(key);
  }
  return keys;
}

void RunNameLookups(benchmark::State& state, const std::vector<Key>& keys, OECaseType caseType) {
  const TagDictionary* dict = OETagDictionary::TheOETagDictionary();
  size_t i = 0;
  for (auto _ : state) {
    const Key& key = keys[i];
    OETagID id;
    benchmark::DoNotOptimize(dict->GetTagID(key.text.data(), key.length, &id, caseType));
    benchmark::DoNotOptimize(id);
    if (++i == keys.size()) i = 0;
  }
  state.SetItemsProcessed(state.iterations());
}

void BM_GetTagID_Exact(benchmark::State& state) {
  RunNameLookups(state, MakeKeys(false, ""), OE_CASE_EXACT);
}
BENCHMARK(BM_GetTagID_Exact);

// The engine's retry for a lower-case name.
void BM_GetTagID_IgnoreCase(benchmark::State& state) {
  RunNameLookups(state, MakeKeys(true, ""), OE_CASE_IGNORE);
}
BENCHMARK(BM_GetTagID_IgnoreCase);

// Names that are not in the table (the engine then logs an unknown tag).
void BM_GetTagID_Unknown(benchmark::State& state) {
  RunNameLookups(state, MakeKeys(false, "X"), OE_CASE_EXACT);
}
BENCHMARK(BM_GetTagID_Unknown);

void BM_GetTagString(benchmark::State& state) {
  const TagDictionary* dict = OETagDictionary::TheOETagDictionary();
  std::vector<OETagID> ids;
  for (const Key& key : MakeKeys(false, "")) {
    OETagID id;
    dict->GetTagID(key.text.data(), key.length, &id);
    ids.push_back(id);
  }
  size_t i = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(dict->GetTagString(ids[i]));
    if (++i == ids.size()) i = 0;
  }
  state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_GetTagString);

// Id lookups over a table whose ids have gaps (binary search over the id index).
void BM_GetTagString_Gapped(benchmark::State& state) {
  std::vector<OETagDictionaryEntry> table(OEDictionaryEntryTable(),
                                          OEDictionaryEntryTable() + NumberOfOEDictionaryEntry());
  for (OETagDictionaryEntry& row : table) row.id = static_cast<OETagID>(row.id * 2);
  TagDictionary dict(table.data(), static_cast<unsigned short>(table.size()));
  size_t i = 0;
  for (auto _ : state) {
    benchmark::DoNotOptimize(dict.GetTagString(table[i].id));
    i = (i + 37) % table.size();
  }
  state.SetItemsProcessed(state.iterations());
}
BENCHMARK(BM_GetTagString_Gapped);

// Building a dictionary over the built-in table, as every temporary
// dictionary pays.
void BM_ConstructBuiltIn(benchmark::State& state) {
  for (auto _ : state) {
    OETagDictionary dict;
    benchmark::DoNotOptimize(&dict);
  }
}
BENCHMARK(BM_ConstructBuiltIn);

}  // namespace

BENCHMARK_MAIN();
