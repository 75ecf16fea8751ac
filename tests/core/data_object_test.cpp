#include <gtest/gtest.h>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"

namespace {

// A data object with forty valid tags (ids 101..140) and three required ones.
const OETagID* FortyTags() {
  static OETagID tags[40];
  for (int i = 0; i < 40; ++i) tags[i] = static_cast<OETagID>(101 + i);
  return tags;
}
const OETagID kRequired[] = {static_cast<OETagID>(101), static_cast<OETagID>(102), static_cast<OETagID>(103)};

class WideObj : public OEDataObj {
 public:
  unsigned short GetArrayOfValidTags(OEArrayOfTags& t) const override {
    t.tags = FortyTags();
    t.count = 40;
    return 1;
  }
  unsigned short GetArrayOfRequiredTags(OEArrayOfTags& t) const override {
    t.tags = kRequired;
    t.count = 3;
    return 1;
  }
  using OEDataObj::GetParser;
};

OETagID Tag(int id) { return static_cast<OETagID>(id); }

using DataObjTest = LogFixture;

}  // namespace

TEST_F(DataObjTest, PresenceBitsSpanWords) {
  WideObj obj;
  EXPECT_EQ(obj.SetTag(Tag(133)), 1);  // the 33rd valid tag: bit 0 of the second word
  EXPECT_EQ(obj.ValidateTag(Tag(133)), 1);
  EXPECT_EQ(obj.ValidateTag(Tag(132)), 0);
  EXPECT_EQ(obj.ValidateTag(Tag(134)), 0);
  EXPECT_EQ(obj.SetTag(Tag(140)), 1);
  EXPECT_EQ(obj.ClearTag(Tag(133)), 1);
  EXPECT_EQ(obj.ValidateTag(Tag(133)), 0);
  EXPECT_EQ(obj.ValidateTag(Tag(140)), 1);

  // A tag the class does not have: SetTag is silent, ClearTag warns.
  EXPECT_EQ(obj.SetTag(Tag(5)), 0);
  EXPECT_EQ(log->Entries(), 0);
  EXPECT_EQ(obj.ClearTag(Tag(5)), 0);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_UNKNOWNTAG);
  EXPECT_EQ(log->Get(0)->tag, Tag(5));
  EXPECT_EQ(log->Get(0)->object, nullptr);
  EXPECT_EQ(log->Get(0)->position, -1);
}

TEST_F(DataObjTest, RequiredAndValidQueries) {
  WideObj obj;
  EXPECT_EQ(obj.AllRequiredPresent(), 0);
  EXPECT_EQ(obj.OneValidPresent(), 0);
  EXPECT_EQ(obj.AnyValidPresent(), 0);
  obj.SetTag(Tag(102));  // only B of A, B, C
  EXPECT_EQ(obj.GetFirstMissingRequiredTag(OE_TAG_NONE), Tag(101));
  EXPECT_EQ(obj.GetFirstMissingRequiredTag(Tag(101)), Tag(103));
  EXPECT_EQ(obj.GetFirstMissingRequiredTag(Tag(103)), OE_TAG_NONE);
  EXPECT_EQ(obj.GetFirstMissingRequiredTag(Tag(102)), OE_TAG_NONE);
  EXPECT_EQ(obj.OneValidPresent(), 1);
  EXPECT_EQ(obj.AnyValidPresent(), 1);
  obj.SetTag(Tag(101));
  obj.SetTag(Tag(103));
  EXPECT_EQ(obj.AllRequiredPresent(), 1);
  EXPECT_EQ(obj.OneValidPresent(), 0);

  OEDataObj plain;  // no arrays at all
  EXPECT_EQ(plain.AllRequiredPresent(), 1);
  EXPECT_EQ(plain.AnyValidPresent(), 0);
  EXPECT_EQ(plain.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_NONE);

  WideObj copy;
  copy.SetType(Tag(7));
  EXPECT_EQ(copy.CopyBaseMembersFrom(&obj), 1);
  EXPECT_EQ(copy.AllRequiredPresent(), 1);
  EXPECT_EQ(copy.GetType(), OE_TAG_NONE);
}

TEST_F(DataObjTest, PushAndEndTagsThroughTheParserStack) {
  WideObj root;
  OEParser parser;
  parser.Parse(nullptr, &root, 0);
  EXPECT_EQ(root.GetParser(), &parser);

  EXPECT_EQ(root.PushAndSetObject(nullptr, Tag(110)), OE_PARSE_NO_PARSER);
  EXPECT_EQ(root.ValidateTag(Tag(110)), 0);

  WideObj unattached;
  WideObj orphan;
  EXPECT_EQ(unattached.PushAndSetObject(&orphan, Tag(110)), OE_PARSE_NO_PARSER);

  // Ten levels fit; the eleventh push is refused after the bit was set.
  WideObj levels[11];
  OEDataObj* parent = &root;
  for (int i = 0; i < 10; ++i) {
    ASSERT_EQ(parent->PushAndSetObject(&levels[i], Tag(110)), OE_PARSE_OK) << i;
    EXPECT_EQ(parser.GetCurrentObj(), &levels[i]);
    parent = &levels[i];
  }
  EXPECT_EQ(parent->PushAndSetObject(&levels[10], Tag(111)), OE_PARSE_PUSH_FAILED);
  EXPECT_EQ(parent->ValidateTag(Tag(111)), 1);
  EXPECT_EQ(levels[10].GetType(), Tag(111));

  // An end tag that does not close the current object warns and keeps it.
  OETagDictionaryEntry wrong{Tag(120), "WRONG"};
  EXPECT_EQ(parser.GetCurrentObj()->HandleTagEnd(&wrong), OE_PARSE_END_MISMATCH);
  EXPECT_EQ(parser.GetCurrentObj(), &levels[9]);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_INVALIDENDAGG);
  EXPECT_EQ(log->Get(0)->object, &levels[9]);
  EXPECT_EQ(log->Get(0)->tagName, "WRONG");

  OETagDictionaryEntry right{Tag(110), "RIGHT"};
  EXPECT_EQ(parser.GetCurrentObj()->HandleTagEnd(&right), OE_PARSE_OK);
  EXPECT_EQ(parser.GetCurrentObj(), &levels[8]);
  EXPECT_EQ(orphan.HandleTagEnd(&right), OE_PARSE_NO_PARSER);
}

TEST_F(DataObjTest, ValidTagFilterOfTheParser) {
  OEParser parser;
  EXPECT_EQ(parser.IsValidTag(Tag(1)), 1);  // no filter: everything goes
  OETagID none[1] = {OE_TAG_NONE};
  OEArrayOfTags empty{none, 0};
  parser.SetValidTags(empty);
  EXPECT_EQ(parser.IsValidTag(Tag(1)), 0);
  WideObj obj;
  EXPECT_EQ(parser.PushObject(&obj), 1);
  EXPECT_EQ(parser.IsValidTag(Tag(120)), 1);
  EXPECT_EQ(parser.IsValidTag(Tag(99)), 0);
  // Asked in any order (each answer leaves a hint for the next time), every
  // valid tag is found and nothing else, also once the array has changed.
  for (int round = 0; round < 3; ++round) {
    for (int i = 0; i < 40; ++i) {
      const int k = round == 0 ? i : round == 1 ? 39 - i : (i * 7) % 40;
      EXPECT_EQ(parser.IsValidTag(Tag(101 + k)), 1) << k;
      EXPECT_EQ(parser.IsValidTag(Tag(141 + k)), 0) << k;
    }
  }
  EXPECT_EQ(parser.IsValidTag(Tag(100)), 0);
  OETagID reordered[3] = {Tag(140), Tag(101), Tag(120)};
  OEArrayOfTags three{reordered, 3};
  parser.SetValidTags(three);
  EXPECT_EQ(parser.IsValidTag(Tag(140)) + parser.IsValidTag(Tag(101)) + parser.IsValidTag(Tag(120)), 3);
  EXPECT_EQ(parser.IsValidTag(Tag(102)), 0);
  reordered[0] = Tag(102);  // an array changed in place after it was used
  EXPECT_EQ(parser.IsValidTag(Tag(102)), 1);
  EXPECT_EQ(parser.IsValidTag(Tag(140)), 0);
  OEArrayOfTags valid{nullptr, 0};
  obj.GetArrayOfValidTags(valid);
  parser.SetValidTags(valid);
  EXPECT_EQ(parser.PopObject(), 1);
  EXPECT_EQ(parser.IsValidTag(Tag(120)), 0);
  EXPECT_EQ(parser.PopObject(), 0);
}

namespace {
class CountingFactory : public OEDataObjFactory {
 public:
  OEDataObj* NewDataObj() override {
    ++made;
    return OEDataObjFactory::NewDataObj();
  }
  int made = 0;
};
}  // namespace

TEST_F(DataObjTest, FactoryHook) {
  OEDataObjFactory* original = OEDataObj::GetFactory();
  ASSERT_NE(original, nullptr);
  EXPECT_EQ(OEDataObj::SetFactory(nullptr), 0);
  EXPECT_EQ(OEDataObj::GetFactory(), original);

  CountingFactory mine;
  EXPECT_EQ(OEDataObj::SetFactory(&mine), 1);
  {
    OEDynamicArrayDataObj objects;
    OEDataObj& made = objects[2];  // made on demand through the installed factory
    EXPECT_EQ(mine.made, 1);
    EXPECT_EQ(objects.Entries(), 3);
    EXPECT_EQ(&made, objects.Get(2));
  }
  // Destroying objects never deletes an application's factory.
  { WideObj temp; }
  EXPECT_EQ(OEDataObj::GetFactory(), &mine);

  // Back to the library's own factory, the one it had before.
  OEDataObj::ResetFactory();
  EXPECT_EQ(OEDataObj::GetFactory(), original);
  OEDataObjFactory& lasting = *original;

  unsigned short* number = lasting.NewOEUShort();
  ASSERT_NE(number, nullptr);
  delete number;
  OEParseException* record = lasting.NewParseException();
  ASSERT_NE(record, nullptr);
  EXPECT_EQ(record->warning, OEPW_UNKNOWNEXCEPTION);
  EXPECT_EQ(record->object, nullptr);
  EXPECT_TRUE(record->tagName.IsEmpty());
  EXPECT_EQ(record->position, -1);
  delete record;
}

TEST(OESDKInstance, RecordsTheModule) {
  EXPECT_NE(GetOESDKInstance(), nullptr);
  EXPECT_GE(GetOESDKAttachCount(), 1u);
}
