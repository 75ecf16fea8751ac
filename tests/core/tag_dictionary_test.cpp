#include "ofxkit/core/OETagDictionary.h"

#include <gtest/gtest.h>

#include <cctype>
#include <cstring>
#include <set>
#include <string>
#include <vector>

namespace {

constexpr OETagID Id(uint32_t value) { return static_cast<OETagID>(value); }

// Exposes the search mode and lets a test put a dictionary into the state
// that a failed index allocation leaves behind.
class ProbedDictionary : public TagDictionary {
 public:
  using TagDictionary::TagDictionary;
  using TagDictionary::SEARCH_BINARY;
  using TagDictionary::SEARCH_DIRECT;
  using TagDictionary::SEARCH_LINEAR;
  using TagDictionary::SearchMode;

  SearchMode Mode() const { return m_searchMode; }

  void DropIdIndex() {
    delete[] m_idIndex;
    m_idIndex = nullptr;
    m_searchMode = SEARCH_LINEAR;
  }
  void DropNameIndex() {
    DropIdIndex();
    delete[] m_nameIndex;
    m_nameIndex = nullptr;
  }
};

const OETagDictionaryEntry* Find(const TagDictionary& dict, const char* name, OECaseType caseType = OE_CASE_EXACT,
                                 OETagID* idOut = nullptr) {
  OETagID id = Id(12345);
  const OETagDictionaryEntry* entry =
      dict.GetTagID(name, static_cast<unsigned short>(strlen(name)), &id, caseType);
  // The id written always agrees with the row returned.
  EXPECT_EQ(id, entry ? entry->id : OE_TAG_NONE) << name;
  if (idOut) *idOut = id;
  return entry;
}

OETagID IdOf(const TagDictionary& dict, const char* name, OECaseType caseType = OE_CASE_EXACT) {
  OETagID id = OE_TAG_NONE;
  Find(dict, name, caseType, &id);
  return id;
}

// Every row must be reachable by name (to a row of the same name) and every
// id must map back to the name of its own row.
void ExpectEveryRowFound(const TagDictionary& dict, const OETagDictionaryEntry* table, unsigned short count) {
  for (unsigned short i = 0; i < count; ++i) {
    const OETagDictionaryEntry* byName = Find(dict, table[i].name);
    ASSERT_NE(byName, nullptr) << table[i].name;
    EXPECT_STREQ(byName->name, table[i].name);
    EXPECT_STREQ(dict.GetTagString(table[i].id), table[i].name) << table[i].id;
  }
}

// ---------------------------------------------------------------- built-in table

TEST(BuiltInTagTable, IdsContiguousNamesUpperCaseOnlyVHealthcareRepeated) {
  ASSERT_EQ(NumberOfOEDictionaryEntry(), 1050);
  const OETagDictionaryEntry* table = OEDictionaryEntryTable();
  std::set<std::string> seen;
  std::vector<std::string> repeated;
  for (unsigned short i = 0; i < NumberOfOEDictionaryEntry(); ++i) {
    ASSERT_EQ(table[i].id, Id(i + 1u)) << i;
    ASSERT_NE(table[i].name, nullptr);
    ASSERT_NE(table[i].name[0], '\0');
    // The case-insensitive search relies on names holding no lower-case
    // letters and nothing that sorts between "Z" and "a".
    for (const char* p = table[i].name; *p; ++p) {
      ASSERT_TRUE((*p >= 'A' && *p <= 'Z') || (*p >= '0' && *p <= '9') || *p == '.') << table[i].name;
    }
    if (!seen.insert(table[i].name).second) repeated.push_back(table[i].name);
  }
  EXPECT_EQ(repeated, std::vector<std::string>{"V.HEALTHCARE"});
}

TEST(BuiltInTagTable, GroupBoundariesFollowTheVocabularyOrder) {
  struct Expected {
    uint32_t id;
    const char* name;
  };
  // First and last name of each group of the vocabulary, and a few inside.
  const Expected expected[] = {
      {1, "MIME"},          {3, "OFXFILERS"},                                 // file-level
      {4, "ADDR1"},         {53, "VEXA.BID"},       {136, "VER"},              // sign-on and common
      {137, "ACCRDINT"},    {677, "YIELDTOMAT"},                               // standard
      {678, "FIDELITY.OPTBUYTYPE"}, {679, "FIDELITY.OPTSELLTYPE"},             // brokerage
      {680, "VEXA.BEGINDT"}, {735, "VEXA.LOGINURL"},                           // maker, first
      {736, "V.ACCRUALPD"}, {824, "V.HEALTHCARE"}, {825, "V.HEALTHCARE"}, {965, "V.YTDWB"},  // payroll
      {966, "VEXA.ADDASW"}, {1050, "VEXA.VERSION"},                            // maker, second
  };
  OETagDictionary dict;
  const OETagDictionaryEntry* table = OEDictionaryEntryTable();
  for (const Expected& e : expected) {
    EXPECT_STREQ(table[e.id - 1].name, e.name) << e.id;
    EXPECT_STREQ(dict.GetTagString(Id(e.id)), e.name) << e.id;
  }
}

// ---------------------------------------------------------------- built-in dictionary

TEST(OETagDictionary, EveryBuiltInRowRoundTrips) {
  ProbedDictionary dict(OEDictionaryEntryTable(), NumberOfOEDictionaryEntry());
  EXPECT_EQ(dict.Mode(), ProbedDictionary::SEARCH_DIRECT);
  ExpectEveryRowFound(dict, OEDictionaryEntryTable(), NumberOfOEDictionaryEntry());
}

TEST(OETagDictionary, OnlyTheFirstLengthCharactersCount) {
  OETagDictionary dict;
  OETagID id = OE_TAG_NONE;
  const OETagDictionaryEntry* memo = dict.GetTagID("MEMOS", 4, &id);
  ASSERT_NE(memo, nullptr);
  EXPECT_STREQ(memo->name, "MEMO");
  EXPECT_EQ(id, OE_TAG_MEMO);

  id = OE_TAG_ACCTID;
  EXPECT_EQ(dict.GetTagID("BANKID", 5, &id), nullptr);
  EXPECT_EQ(id, OE_TAG_NONE);

  // A name inside a larger text, as the parse engine hands it over.
  const char text[] = "<TRNAMT>-12.50";
  EXPECT_EQ(dict.GetTagID(text + 1, 6, &id), dict.FindDictionaryEntry(OE_TAG_TRNAMT));
}

TEST(OETagDictionary, CaseRules) {
  OETagDictionary dict;
  EXPECT_EQ(Find(dict, "bankid", OE_CASE_EXACT), nullptr);
  EXPECT_EQ(IdOf(dict, "bankid", OE_CASE_IGNORE), OE_TAG_BANKID);
  EXPECT_EQ(IdOf(dict, "BankId", OE_CASE_IGNORE), OE_TAG_BANKID);
  EXPECT_EQ(IdOf(dict, "vexa.bid", OE_CASE_IGNORE), OE_TAG_VEXA_BID);
  // Every non-zero case type ignores case.
  EXPECT_EQ(IdOf(dict, "memo", static_cast<OECaseType>(7)), OE_TAG_MEMO);
  // Ignoring case does not blur other characters or lengths.
  EXPECT_EQ(Find(dict, "vexa_bid", OE_CASE_IGNORE), nullptr);
  EXPECT_EQ(Find(dict, "memos", OE_CASE_IGNORE), nullptr);
  // The case rule of one lookup does not stick to the next.
  EXPECT_EQ(Find(dict, "memo", OE_CASE_EXACT), nullptr);
}

TEST(OETagDictionary, EveryBuiltInNameIsFoundInLowerCaseWhenIgnoringCase) {
  OETagDictionary dict;
  const OETagDictionaryEntry* table = OEDictionaryEntryTable();
  for (unsigned short i = 0; i < NumberOfOEDictionaryEntry(); ++i) {
    std::string lower = table[i].name;
    for (char& c : lower) c = static_cast<char>(tolower(static_cast<unsigned char>(c)));
    const OETagDictionaryEntry* entry = Find(dict, lower.c_str(), OE_CASE_IGNORE);
    ASSERT_NE(entry, nullptr) << lower;
    EXPECT_STREQ(entry->name, table[i].name);
  }
}

TEST(OETagDictionary, DuplicateNameMapsBothWays) {
  OETagDictionary dict;
  EXPECT_STREQ(dict.GetTagString(OE_TAG_V_HEALTHCARE), "V.HEALTHCARE");
  EXPECT_STREQ(dict.GetTagString(OE_TAG_V_HEALTHCARE_2), "V.HEALTHCARE");
  const OETagID found = IdOf(dict, "V.HEALTHCARE");
  EXPECT_TRUE(found == OE_TAG_V_HEALTHCARE || found == OE_TAG_V_HEALTHCARE_2) << found;
  EXPECT_EQ(dict.FindDictionaryEntry(OE_TAG_V_HEALTHCARE_2)->id, OE_TAG_V_HEALTHCARE_2);
}

TEST(OETagDictionary, UnknownNamesAndIds) {
  OETagDictionary dict;
  EXPECT_EQ(dict.GetTagString(OE_TAG_NONE), nullptr);
  EXPECT_EQ(dict.GetTagString(Id(1051)), nullptr);
  EXPECT_EQ(dict.GetTagString(Id(0xFFFFFFFFu)), nullptr);
  EXPECT_EQ(dict.FindDictionaryEntry(Id(1051)), nullptr);
  for (const char* name : {"NOSUCHTAG", "A", "ZZZZZZZZZZZZZZZZZZZZZZZZZZZZZZZZZZZ", "MEM", "MEMO ", "VEXA.", "V.", "<OFX>"}) {
    EXPECT_EQ(Find(dict, name), nullptr) << name;
    EXPECT_EQ(Find(dict, name, OE_CASE_IGNORE), nullptr) << name;
  }
  // Empty and absent names, and a null id pointer, are handled quietly.
  OETagID id = OE_TAG_OFX;
  EXPECT_EQ(dict.GetTagID("", 0, &id), nullptr);
  EXPECT_EQ(id, OE_TAG_NONE);
  EXPECT_EQ(dict.GetTagID(nullptr, 3, &id), nullptr);
  EXPECT_NE(dict.GetTagID("OFX", 3, nullptr), nullptr);
  // An embedded terminator inside the given length never matches.
  EXPECT_EQ(dict.GetTagID("OF\0", 3, &id), nullptr);
}

TEST(OETagDictionary, SharedInstanceIsMadeOnce) {
  OETagDictionary* shared = OETagDictionary::TheOETagDictionary();
  ASSERT_NE(shared, nullptr);
  EXPECT_EQ(OETagDictionary::TheOETagDictionary(), shared);
  EXPECT_EQ(IdOf(*shared, "SONRS"), OE_TAG_SONRS);
}

// ---------------------------------------------------------------- other tables

const OETagDictionaryEntry kGappedTable[] = {{Id(9), "NINE"}, {Id(5), "FIVE"}, {Id(7), "SEVEN"}};
const OETagDictionaryEntry kShuffledContiguous[] = {{Id(102), "ZED"}, {Id(100), "ALPHA"}, {Id(101), "B"}};
const OETagDictionaryEntry kBeyondSixteenBits[] = {{Id(70001), "B"}, {Id(70000), "A"}};
const OETagDictionaryEntry kSingleRow[] = {{Id(42), "ONLY"}};

// The search mode follows from the ids alone, and in every mode each id maps
// to its own row's name while ids around and between them map to nothing.
TEST(TagDictionary, SearchModeAndLookupsPerTableShape) {
  struct Case {
    const OETagDictionaryEntry* rows;
    unsigned short count;
    ProbedDictionary::SearchMode mode;
    std::vector<uint32_t> absentIds;
  };
  const Case cases[] = {
      {kGappedTable, 3, ProbedDictionary::SEARCH_BINARY, {0, 4, 6, 8, 10, 0xFFFFFFFFu}},
      {kShuffledContiguous, 3, ProbedDictionary::SEARCH_DIRECT, {99, 103}},
      {kBeyondSixteenBits, 2, ProbedDictionary::SEARCH_DIRECT, {70000 - 65536, 69999, 70002}},
      {kSingleRow, 1, ProbedDictionary::SEARCH_DIRECT, {41, 43}},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.rows[0].name);
    ProbedDictionary dict(c.rows, c.count);
    EXPECT_EQ(dict.Mode(), c.mode);
    ExpectEveryRowFound(dict, c.rows, c.count);
    for (uint32_t id : c.absentIds) EXPECT_EQ(dict.GetTagString(Id(id)), nullptr) << id;
  }
}

TEST(TagDictionary, DuplicateIdsAreNotContiguous) {
  const OETagDictionaryEntry table[] = {{Id(1), "ONE"}, {Id(2), "TWO"}, {Id(2), "DEUX"}};
  ProbedDictionary dict(table, 3);
  EXPECT_EQ(dict.Mode(), ProbedDictionary::SEARCH_BINARY);
  const char* two = dict.GetTagString(Id(2));
  ASSERT_NE(two, nullptr);
  EXPECT_TRUE(strcmp(two, "TWO") == 0 || strcmp(two, "DEUX") == 0) << two;
  EXPECT_STREQ(dict.FindDictionaryEntry(Id(2))->name, "TWO");
  EXPECT_EQ(IdOf(dict, "DEUX"), 2u);
}

TEST(TagDictionary, ZeroRowTableFindsNothing) {
  const OETagDictionaryEntry table[] = {{Id(1), "ONE"}};
  for (const OETagDictionaryEntry* rows : {table, static_cast<const OETagDictionaryEntry*>(nullptr)}) {
    TagDictionary dict(rows, 0);
    EXPECT_EQ(Find(dict, "ONE"), nullptr);
    EXPECT_EQ(dict.GetTagString(OE_TAG_NONE), nullptr);
    EXPECT_EQ(dict.GetTagString(Id(1)), nullptr);
    EXPECT_EQ(dict.FindDictionaryEntry(Id(1)), nullptr);
  }
  // A null table with a non-zero count is a table of no rows.
  TagDictionary absent(nullptr, 5);
  EXPECT_EQ(absent.GetTagString(Id(1)), nullptr);
  EXPECT_EQ(Find(absent, "ONE"), nullptr);
}

TEST(TagDictionary, RowsWithoutNamesAreHarmless) {
  const OETagDictionaryEntry table[] = {{Id(1), nullptr}, {Id(2), "TWO"}, {Id(3), nullptr}};
  TagDictionary dict(table, 3);
  EXPECT_EQ(dict.GetTagString(Id(1)), nullptr);
  EXPECT_STREQ(dict.GetTagString(Id(2)), "TWO");
  EXPECT_EQ(IdOf(dict, "TWO"), 2u);
}

TEST(TagDictionary, LinearModeAfterIdIndexLoss) {
  ProbedDictionary dict(kGappedTable, 3);
  dict.DropIdIndex();
  EXPECT_EQ(dict.Mode(), ProbedDictionary::SEARCH_LINEAR);
  ExpectEveryRowFound(dict, kGappedTable, 3);
  EXPECT_EQ(dict.GetTagString(Id(6)), nullptr);
}

TEST(TagDictionary, WithoutNameIndexNamesAreNotFoundButIdsAre) {
  ProbedDictionary dict(OEDictionaryEntryTable(), NumberOfOEDictionaryEntry());
  dict.DropNameIndex();
  OETagID id = OE_TAG_OFX;
  EXPECT_EQ(dict.GetTagID("OFX", 3, &id), nullptr);
  EXPECT_EQ(id, OE_TAG_NONE);
  EXPECT_STREQ(dict.GetTagString(OE_TAG_OFX), "OFX");
  EXPECT_STREQ(dict.GetTagString(OE_TAG_V_HEALTHCARE_2), "V.HEALTHCARE");
}

TEST(TagDictionary, TableIsNeitherCopiedNorReordered) {
  const OETagDictionaryEntry table[] = {{Id(3), "CCC"}, {Id(1), "A"}, {Id(2), "BB"}};
  TagDictionary dict(table, 3);
  EXPECT_EQ(Find(dict, "BB"), &table[2]);
  EXPECT_EQ(dict.GetTagString(Id(3)), table[0].name);
  EXPECT_EQ(table[0].id, 3u);
  EXPECT_EQ(table[1].id, 1u);
}

// A generated table of `count` rows with ids 1.. and names prefix + f(row).
struct GeneratedTable {
  std::vector<std::string> names;
  std::vector<OETagDictionaryEntry> rows;

  GeneratedTable(unsigned short count, const char* prefix, uint32_t multiplier) : names(count), rows(count) {
    for (unsigned short i = 0; i < count; ++i) {
      names[i] = prefix + std::to_string(i * multiplier % 100000u);
      rows[i] = {Id(i + 1u), names[i].c_str()};
    }
  }
};

TEST(TagDictionary, LargestTableIsFullySearchable) {
  // 32,767 distinct names of varied lengths, ids in an order unrelated to
  // the names; every row must be reachable, which exercises the signed
  // 16-bit search positions at their limit.
  GeneratedTable table(TagDictionary::kMaxEntries, "T", 7919u);
  ProbedDictionary dict(table.rows.data(), TagDictionary::kMaxEntries);
  EXPECT_EQ(dict.Mode(), ProbedDictionary::SEARCH_DIRECT);
  ExpectEveryRowFound(dict, table.rows.data(), TagDictionary::kMaxEntries);
  EXPECT_EQ(Find(dict, "T99999"), nullptr);
}

TEST(TagDictionary, RowsBeyondTheLimitAreIgnored) {
  GeneratedTable table(40000, "N", 1u);
  TagDictionary dict(table.rows.data(), 40000);
  EXPECT_STREQ(dict.GetTagString(Id(TagDictionary::kMaxEntries)), "N32766");
  EXPECT_EQ(dict.GetTagString(Id(TagDictionary::kMaxEntries + 1)), nullptr);
  EXPECT_EQ(Find(dict, "N39999"), nullptr);
  EXPECT_NE(Find(dict, "N0"), nullptr);
}

// ---------------------------------------------------------------- comparisons

TEST(TagDictionaryOrder, LengthFirstThenText) {
  TagDictionary reset(nullptr, 0);  // construction restores the exact rule
  auto cmp = [](const char* l, const char* r) {
    return TagDictionary::sCompare({l, static_cast<unsigned short>(strlen(l))},
                                   {r, static_cast<unsigned short>(strlen(r))});
  };
  EXPECT_LT(cmp("FI", "BAL"), 0);
  EXPECT_LT(cmp("BAL", "ACCTID"), 0);
  EXPECT_GT(cmp("ACCTID", "BAL"), 0);
  EXPECT_LT(cmp("BAL", "BAM"), 0);
  EXPECT_EQ(cmp("BAL", "BAL"), 0);
  EXPECT_NE(cmp("bal", "BAL"), 0);
  EXPECT_EQ(cmp("", ""), 0);

  const OETagDictionaryEntry rows[] = {{Id(1), "ZZ"}, {Id(2), "AAA"}};
  const OEMapTagStringToID l = {&rows[0], 2}, r = {&rows[1], 3};
  EXPECT_LT(TagDictionary::sCompareTag(&l, &r), 0);
  EXPECT_GT(TagDictionary::sCompareTag(&r, &l), 0);

  const OEMapTagIDToIndex lo = {1, Id(1)}, hi = {0, Id(0xFFFFFFFFu)};
  EXPECT_LT(TagDictionary::sCompareTagID(&lo, &hi), 0);  // no overflow for large ids
  EXPECT_GT(TagDictionary::sCompareTagID(&hi, &lo), 0);
  EXPECT_EQ(TagDictionary::sCompareTagID(&lo, &lo), 0);
}

class IntSearch final : public OEBinarySearch {
 public:
  IntSearch(const std::vector<int>& items, int key) : m_items(items), m_key(key) {}
  int Compare(unsigned short index) const override { return m_key - m_items[index]; }
  short GetNumberOfItems() const override { return static_cast<short>(m_items.size()); }

 private:
  const std::vector<int>& m_items;
  int m_key;
};

TEST(OEBinarySearchTest, FindsEveryElementAndRejectsGaps) {
  EXPECT_EQ(IntSearch({}, 3).Search(), -1);
  for (size_t n = 1; n <= 9; ++n) {
    std::vector<int> items;
    for (size_t i = 0; i < n; ++i) items.push_back(static_cast<int>(2 * i + 1));  // 1, 3, 5, ...
    for (size_t i = 0; i < n; ++i) EXPECT_EQ(IntSearch(items, items[i]).Search(), static_cast<short>(i));
    for (size_t i = 0; i <= n; ++i) EXPECT_EQ(IntSearch(items, static_cast<int>(2 * i)).Search(), -1);
  }
}

}  // namespace
