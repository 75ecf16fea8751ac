#include "ofxkit/types/OEUtility.h"

#include <gtest/gtest.h>

#include <cctype>
#include <cstring>
#include <ctime>
#include <string>
#include <vector>

#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/types/OEDynamicArray.h"

namespace {

// ---------------------------------------------------------------------------
// Transaction identifiers

std::string NewID() {
  char out[OEUtility::kTransactionIDLength + 1];
  std::memset(out, 'x', sizeof out);
  EXPECT_EQ(OEUtility::GenerateTransactionID(out), 1);
  EXPECT_EQ(out[OEUtility::kTransactionIDLength], '\0');
  return out;
}

uint64_t Hex(const std::string& id, size_t pos, size_t len) { return std::stoull(id.substr(pos, len), nullptr, 16); }

// Ten-thousandths of a second since 15 October 1582, as laid out in the id.
uint64_t TimestampOf(const std::string& id) {
  return Hex(id, 0, 8) | (Hex(id, 9, 4) << 32) | ((Hex(id, 14, 4) & 0x0FFF) << 48);
}

TEST(UtilityGUID, LayoutOfAnIdentifier) {
  for (int i = 0; i < 50; ++i) {
    const std::string id = NewID();
    ASSERT_EQ(id.size(), 36u) << id;
    for (size_t k = 0; k < id.size(); ++k) {
      if (k == 8 || k == 13 || k == 18 || k == 23) {
        EXPECT_EQ(id[k], '-') << id;
      } else {
        EXPECT_TRUE(std::isdigit(static_cast<unsigned char>(id[k])) || (id[k] >= 'A' && id[k] <= 'F')) << id;
      }
    }
    EXPECT_EQ(id[14], '1') << id;                                // version 1
    EXPECT_NE(std::strchr("89AB", id[19]), nullptr) << id;       // variant bits
  }
  EXPECT_EQ(OEUtility::GenerateTransactionID(nullptr), 0);
}

TEST(UtilityGUID, TimestampCountsFromTheGregorianReform) {
  const uint64_t before = static_cast<uint64_t>(std::time(nullptr));
  const uint64_t stamp = TimestampOf(NewID());
  const uint64_t after = static_cast<uint64_t>(std::time(nullptr));
  const uint64_t offset = 2208988800ULL + 10004083200ULL;
  EXPECT_GE(stamp, (before + offset) * 10000);
  EXPECT_LT(stamp, (after + offset + 1) * 10000);
}

TEST(UtilityGUID, IdentifiersWithinOneSecondDifferByOne) {
  // Retry until both identifiers were certainly made in the same second.
  for (int attempt = 0; attempt < 100; ++attempt) {
    const std::time_t start = std::time(nullptr);
    const std::string a = NewID(), b = NewID(), c = NewID();
    if (std::time(nullptr) != start) continue;
    EXPECT_EQ(static_cast<uint32_t>(Hex(b, 0, 8) - Hex(a, 0, 8)), 1u) << a << " " << b;
    EXPECT_EQ(static_cast<uint32_t>(Hex(c, 0, 8) - Hex(b, 0, 8)), 1u) << b << " " << c;
    EXPECT_NE(a, b);
    return;
  }
  FAIL() << "could not make identifiers within one second";
}

TEST(UtilityGUID, NodeAndClockSequence) {
  OEUtility::SetGUIDNode(0x1234, 0x89ABCDEF);
  unsigned short node01 = 0;
  uint32_t node25 = 0;
  OEUtility::GetGUIDNode(&node01, &node25);
  EXPECT_EQ(node01, 0x1234);
  EXPECT_EQ(node25, 0x89ABCDEFu);
  OEUtility::GetGUIDNode(nullptr, &node25);  // does nothing
  OEUtility::GetGUIDNode(&node01, nullptr);

  OEUtility::SetGUIDClockSequence(0xFFFF);
  EXPECT_EQ(OEUtility::GetGUIDClockSequence(), 0x3FFF);
  const std::string id = NewID();
  EXPECT_EQ(id.substr(24), "89ABCDEF1234");
  EXPECT_EQ(id.substr(19, 4), "BFFF");  // sequence with the variant bit

  // A zero sequence is given a starting value on the next identifier.
  OEUtility::SetGUIDClockSequence(0);
  const std::string fresh = NewID();
  EXPECT_EQ(Hex(fresh, 19, 4), static_cast<uint64_t>(OEUtility::GetGUIDClockSequence() | 0x8000));
}

// ---------------------------------------------------------------------------
// Character entities

TEST(UtilityEntities, NamesAndCharacters) {
  EXPECT_EQ(OEUtility::GetMacroChar("AMP"), '&');
  EXPECT_EQ(OEUtility::GetMacroChar("amp"), '&');
  EXPECT_EQ(OEUtility::GetMacroChar("Gt"), '>');
  EXPECT_EQ(OEUtility::GetMacroChar("lT"), '<');
  EXPECT_EQ(OEUtility::GetMacroChar("quot"), ' ');
  EXPECT_EQ(OEUtility::GetMacroChar("am"), ' ');
  EXPECT_EQ(OEUtility::GetMacroChar(""), ' ');
  EXPECT_EQ(OEUtility::GetMacroChar(nullptr), ' ');

  EXPECT_STREQ(OEUtility::GetMacroString('>'), "gt");
  EXPECT_STREQ(OEUtility::GetMacroString('<'), "lt");
  EXPECT_STREQ(OEUtility::GetMacroString('&'), "amp");
  EXPECT_EQ(OEUtility::GetMacroString('"'), nullptr);
  EXPECT_EQ(OEUtility::GetMacroString('\0'), nullptr);

  char text[] = "Smith & Sons <B>";
  EXPECT_EQ(OEUtility::ContainsMacro(text), text + 6);
  char plain[] = "no entities here";
  EXPECT_EQ(OEUtility::ContainsMacro(plain), nullptr);
  EXPECT_EQ(OEUtility::ContainsMacro(static_cast<char*>(nullptr)), nullptr);
  EXPECT_STREQ(OEUtility::ContainsMacro("a>b"), ">b");
}

// ---------------------------------------------------------------------------
// Packing

TEST(UtilityPacking, LittleEndianRoundTrips) {
  unsigned char buf[4];
  char* out = reinterpret_cast<char*>(buf);
  OEUtility::PackLong(out, 0x01020304);
  EXPECT_EQ(buf[0], 0x04);
  EXPECT_EQ(buf[1], 0x03);
  EXPECT_EQ(buf[2], 0x02);
  EXPECT_EQ(buf[3], 0x01);
  // High bytes must not be sign-extended when read back.
  for (uint32_t v : {0u, 1u, 0x80u, 0xFFu, 0x8000u, 0xFF80u, 0x80000000u, 0xFFFFFFFFu, 0x7F80FF01u}) {
    OEUtility::PackLong(out, v);
    EXPECT_EQ(OEUtility::UnPackLong(out), v);
    OEUtility::PackShort(out, static_cast<unsigned short>(v));
    EXPECT_EQ(OEUtility::UnPackShort(out), static_cast<unsigned short>(v));
    EXPECT_EQ(buf[0], static_cast<unsigned char>(v));
    EXPECT_EQ(buf[1], static_cast<unsigned char>(v >> 8));
  }
  OEUtility::PackByte(out, '\x9C');
  EXPECT_EQ(OEUtility::UnPackByte(out), '\x9C');
}

// ---------------------------------------------------------------------------
// Digit groups

TEST(UtilityAscToUInt, DigitGroups) {
  struct Case {
    const char* text;
    short required;
    short scale;
    OEParseStatus status;
    unsigned short value;
  };
  const Case cases[] = {
      {"123", 2, 0, OE_PARSE_NOT_HANDLED, 0},
      {"07", 2, 0, OE_PARSE_OK, 7},
      {"1", 2, 0, OE_PARSE_NOT_HANDLED, 0},
      {"", 2, 0, OE_PARSE_NOT_HANDLED, 0},
      {"", 0, 0, OE_PARSE_OK, 0},
      {"5", 0, 3, OE_PARSE_OK, 500},
      {"25", 0, 3, OE_PARSE_OK, 250},
      {"125", 0, 3, OE_PARSE_OK, 125},
      {"1234", 0, 3, OE_PARSE_OK, 1234},
      {"1a", 0, 0, OE_PARSE_NOT_HANDLED, 0},
      {"-1", 0, 0, OE_PARSE_NOT_HANDLED, 0},
      {" 1", 0, 0, OE_PARSE_NOT_HANDLED, 0},
      {"123456", 0, 0, OE_PARSE_OK, 12345},  // only five characters are read
      {"12345x", 5, 0, OE_PARSE_OK, 12345},
      {"65535", 5, 0, OE_PARSE_OK, 65535},
      {"2024", 4, 0, OE_PARSE_OK, 2024},
  };
  for (const Case& c : cases) {
    unsigned short value = 0xBEEF;
    EXPECT_EQ(OEUtility::AscToUInt(c.text, &value, c.required, c.scale), c.status) << c.text;
    EXPECT_EQ(value, c.status == OE_PARSE_OK ? c.value : 0xBEEF) << c.text;
  }
  unsigned short value = 0;
  EXPECT_EQ(OEUtility::AscToUInt("12", nullptr, 0, 0), OE_PARSE_NOT_HANDLED);
  EXPECT_EQ(OEUtility::AscToUInt(nullptr, &value, 2, 0), OE_PARSE_NOT_HANDLED);
}

// ---------------------------------------------------------------------------
// Data-object helpers

// An aggregate with valid tags ACCTID, BANKID, BRANCHID, required ACCTID and
// BRANCHID, and borrowed children.
class TestObj : public OEDataObj {
 public:
  explicit TestObj(OETagID type) { SetType(type); }
  unsigned short GetArrayOfValidTags(OEArrayOfTags& tags) const override {
    tags = {kValid, 3};
    return 1;
  }
  unsigned short GetArrayOfRequiredTags(OEArrayOfTags& tags) const override {
    tags = {kRequired, 2};
    return 1;
  }
  OEDataObj* GetChild(unsigned short i) const override { return i < children.size() ? children[i] : nullptr; }
  unsigned short GetNumberOfChildren() const override { return static_cast<unsigned short>(children.size()); }
  TestObj* Complete() {
    SetTag(OE_TAG_ACCTID);
    SetTag(OE_TAG_BRANCHID);
    return this;
  }

  std::vector<OEDataObj*> children;
  static constexpr OETagID kValid[] = {OE_TAG_ACCTID, OE_TAG_BANKID, OE_TAG_BRANCHID};
  static constexpr OETagID kRequired[] = {OE_TAG_ACCTID, OE_TAG_BRANCHID};
};

TEST(UtilityObjects, FindByTag) {
  OEDynamicArrayDataObj array;
  for (OETagID t : {OE_TAG_BANKID, OE_TAG_ACCTID, OE_TAG_BANKID, OE_TAG_ACCTID}) {
    auto* obj = new OEDataObj();
    obj->SetType(t);
    ASSERT_TRUE(array.Append(obj));
  }
  EXPECT_EQ(OEUtility::Find(&array, OE_TAG_ACCTID, 0), 2);
  EXPECT_EQ(OEUtility::Find(&array, OE_TAG_ACCTID, 1), 2);
  EXPECT_EQ(OEUtility::Find(&array, OE_TAG_ACCTID, 2), 2);
  EXPECT_EQ(OEUtility::Find(&array, OE_TAG_ACCTID, 3), 4);
  EXPECT_EQ(OEUtility::Find(&array, OE_TAG_BANKID, 2), 3);
  EXPECT_EQ(OEUtility::Find(&array, OE_TAG_ACCTID, 5), 0);
  EXPECT_EQ(OEUtility::Find(&array, OE_TAG_BRANCHID, 0), 0);
  EXPECT_EQ(OEUtility::Find(nullptr, OE_TAG_ACCTID, 0), 0);
}

TEST(UtilityObjects, AllRequiredPresentReportsTheDeepestFailure) {
  TestObj root(OE_TAG_STMTRS), child1(OE_TAG_BANKACCTFROM), child2(OE_TAG_LEDGERBAL), grandchild(OE_TAG_PAYEE);
  root.Complete();
  child1.Complete();
  root.children = {nullptr, &child1, &child2};
  child2.children = {&grandchild};
  child2.Complete();
  grandchild.SetTag(OE_TAG_ACCTID);  // lacks BRANCHID

  OEDataObj* where = &root;
  OETagID missing = OE_TAG_ACCTID;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&where, &missing), 0);
  EXPECT_EQ(where, &grandchild);
  EXPECT_EQ(missing, OE_TAG_BRANCHID);

  grandchild.Complete();
  where = &root;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&where, &missing), 1);
  EXPECT_EQ(where, &root);
  EXPECT_EQ(missing, OE_TAG_NONE);

  // The object itself failing stays the reported object.
  TestObj bare(OE_TAG_PAYEE);
  where = &bare;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&where, nullptr), 0);
  EXPECT_EQ(where, &bare);
}

TEST(UtilityObjects, GetNextMissingRequiredTagWalksDepthFirst) {
  TestObj root(OE_TAG_STMTRS), child(OE_TAG_BANKACCTFROM), later(OE_TAG_LEDGERBAL);
  root.Complete();
  later.SetTag(OE_TAG_BRANCHID);
  root.children = {&child, &later};

  OEDataObj* where = &root;
  EXPECT_EQ(OEUtility::GetNextMissingRequiredTag(&root, &where, OE_TAG_NONE), OE_TAG_ACCTID);
  EXPECT_EQ(where, &child);
  EXPECT_EQ(OEUtility::GetNextMissingRequiredTag(&root, &where, OE_TAG_ACCTID), OE_TAG_BRANCHID);
  EXPECT_EQ(where, &child);
  EXPECT_EQ(OEUtility::GetNextMissingRequiredTag(&root, &where, OE_TAG_BRANCHID), OE_TAG_NONE);
  EXPECT_EQ(where, &child);

  child.Complete();
  EXPECT_EQ(OEUtility::GetNextMissingRequiredTag(&root, &where, OE_TAG_NONE), OE_TAG_ACCTID);
  EXPECT_EQ(where, &later);
  later.Complete();
  EXPECT_EQ(OEUtility::GetNextMissingRequiredTag(&root, &where, OE_TAG_NONE), OE_TAG_NONE);
  EXPECT_EQ(where, nullptr);
  EXPECT_EQ(OEUtility::GetNextMissingRequiredTag(nullptr, &where, OE_TAG_NONE), OE_TAG_NONE);
  EXPECT_EQ(OEUtility::GetNextMissingRequiredTag(&root, nullptr, OE_TAG_NONE), OE_TAG_NONE);
}

TEST(UtilityDiagnostics, ObjectAndTagNames) {
  EXPECT_STREQ(OEUtility::TagToString(OE_TAG_NONE).c_str(), "TAG UNKNOWN");
  EXPECT_STREQ(OEUtility::TagToString(OE_TAG_ACCTID).c_str(), "ACCTID");
  EXPECT_STREQ(OEUtility::TagToString(OE_TAG_VEXA_BID).c_str(), "VEXA.BID");
  EXPECT_STREQ(OEUtility::TagToString(OE_TAG_COUNT_PLUS_ONE).c_str(), "TAG UNKNOWN");
  EXPECT_STREQ(OEUtility::ObjectToString(nullptr).c_str(), "OBJECT NULL");
  TestObj obj(OE_TAG_BANKACCTFROM);
  EXPECT_STREQ(OEUtility::ObjectToString(&obj).c_str(), "BANKACCTFROM");
}

}  // namespace
