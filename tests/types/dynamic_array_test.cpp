#include <gtest/gtest.h>

#include "ofxkit/ofxkit.h"

namespace {
struct Tracked : OEDataObj {
  explicit Tracked(int* deaths) : deaths(deaths) {}
  ~Tracked() override { ++*deaths; }
  int* deaths;
};
}  // namespace

TEST(OEDynamicArray, SetGrowsAndOwns) {
  int deaths = 0;
  OEDynamicArrayDataObj a;
  EXPECT_EQ(a.Set(5, new Tracked(&deaths)), 1);
  EXPECT_EQ(a.Entries(), 6);
  for (unsigned short i = 0; i < 5; ++i) EXPECT_EQ(a.Get(i), nullptr);
  EXPECT_EQ(a.Get(6), nullptr);
  EXPECT_EQ(a.Set(5, new Tracked(&deaths)), 1);  // replacing deletes the old one
  EXPECT_EQ(deaths, 1);
  EXPECT_EQ(a.Append(nullptr), 0);
  EXPECT_EQ(a.Entries(), 6);
  a.DeleteAll();
  EXPECT_EQ(deaths, 2);
  EXPECT_EQ(a.Entries(), 0);
}

TEST(OEDynamicArray, UnSetAndClearReturnOwnership) {
  int deaths = 0;
  OEDynamicArrayDataObj a;
  Tracked* items[3];
  for (auto& item : items) {
    item = new Tracked(&deaths);
    ASSERT_EQ(a.Append(item), 1);
  }
  EXPECT_EQ(a.UnSet(0), 1);
  EXPECT_EQ(a.Entries(), 2);
  EXPECT_EQ(a.Get(0), items[1]);
  EXPECT_EQ(a.Get(1), items[2]);
  EXPECT_EQ(a.Get(2), nullptr);
  EXPECT_EQ(a.UnSet(2), 0);
  EXPECT_EQ(deaths, 0);
  delete items[0];
  a.Clear();
  EXPECT_EQ(a.Entries(), 0);
  EXPECT_EQ(deaths, 1);
  delete items[1];
  delete items[2];
}

TEST(OEDynamicArray, ManyAppendsStayIndexed) {
  int deaths = 0;
  {
    OEDynamicArrayDataObj a;
    for (int i = 0; i < 20000; ++i) ASSERT_EQ(a.Append(new Tracked(&deaths)), 1);
    EXPECT_EQ(a.Entries(), 20000);
  }
  EXPECT_EQ(deaths, 20000);
  OEDynamicArrayOEUShort numbers;
  unsigned short* number = new unsigned short(1);
  EXPECT_EQ(numbers.Set(65535, number), 0);  // beyond 16-bit indices: refused, still ours
  delete number;
}

TEST(OEDynamicArray, StringArraysGiveTheirLimit) {
  OEDynamicArrayString32 names;
  OEString forty(std::string(40, 'n').c_str());
  EXPECT_EQ(names.SetVal(0, forty), 1);
  ASSERT_NE(names.Get(0), nullptr);
  EXPECT_EQ(names.Get(0)->GetStrLength(), 40);
  EXPECT_EQ(names.Get(0)->SpecLength(), 32);
  EXPECT_EQ(names.SetCopyVal(OEDataObj::GetFactory(), 1, OEString("x")), 1);
  EXPECT_EQ(names.Get(1)->SpecLength(), 32);
  EXPECT_EQ(names.SetCopy(OEDataObj::GetFactory(), 2, nullptr), 0);

  OEDynamicArrayString plain;
  plain[3] = "made on demand";
  EXPECT_EQ(plain.Entries(), 4);
  EXPECT_EQ(*plain.Get(3), "made on demand");
}

namespace {
struct Named : OECollectionItem {
  int value = 0;
  OECollectionItem* Factory() const override { return new Named(); }
  OECollectionItem& operator=(const OECollectionItem& other) override {
    OECollectionItem::operator=(other);
    if (auto* n = dynamic_cast<const Named*>(&other)) value = n->value;
    return *this;
  }
  bool operator==(const OECollectionItem& other) const override {
    auto* n = dynamic_cast<const Named*>(&other);
    return n && n->value == value;
  }
};
}  // namespace

TEST(OECollection, NewestFirstAndUnlinking) {
  OECollection c;
  Named one, two, three;
  one.value = 1;
  two.value = 2;
  three.value = 3;
  c += one;
  c += two;
  c += three;
  ASSERT_EQ(c.NumberofItems(), 3);
  EXPECT_EQ(static_cast<Named*>(c[0])->value, 3);
  c -= two;
  ASSERT_EQ(c.NumberofItems(), 2);
  EXPECT_EQ(c[0]->Next(), c[1]);
  EXPECT_EQ(c[1]->Previous(), c[0]);
  EXPECT_EQ(static_cast<Named*>(c[1])->value, 1);
  Named absent;
  absent.value = 9;
  c -= absent;
  EXPECT_EQ(c.NumberofItems(), 2);
}
