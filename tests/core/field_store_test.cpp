// Aggregates keep only the fields they were given. What an application
// relies on: a field never set reads as its type's default, a reference a
// getter returned stays good while other fields are set, copies carry unset
// fields as unset, and a parsed list of many objects reads back whole.
#include <gtest/gtest.h>

#include <algorithm>
#include <memory>
#include <string>
#include <vector>

#include "ofxkit/ofxkit.h"
#include "support/ofx_text.h"

// Every class the factory makes describes its members under distinct keys:
// describing a class with two members under one key stops the program, so
// making each class's description here is the check.
TEST(FieldStore, EveryClassDescribesItsMembersUnderDistinctKeys) {
  OEDataObjFactory factory;
#define OE_CREATOR(creator, cls) Check(factory.creator());
#define OE_CREATOR_PLAIN(creator, type)
#define OE_CREATOR_FAMILY(creator, type)
  size_t aggregates = 0;
  auto Check = [&](auto* object) {
    std::unique_ptr<std::remove_pointer_t<decltype(object)>> owned(object);
    if (auto* aggregate = dynamic_cast<OEAggregate*>(owned.get())) {
      OEArrayOfTags tags{nullptr, 0};
      aggregate->GetArrayOfValidTags(tags);
      const OEAggregateInfo& info = aggregate->GetInfo();
      for (size_t i = 0; i < info.members.size(); ++i)
        for (size_t j = i + 1; j < info.members.size(); ++j)
          ASSERT_NE(info.members[i]->key, info.members[j]->key);
      ++aggregates;
    }
  };
#include "ofxkit/core/OEFactoryCreators.def"
#undef OE_CREATOR
#undef OE_CREATOR_PLAIN
#undef OE_CREATOR_FAMILY
  EXPECT_GT(aggregates, 250u);
}

TEST(FieldStore, UnsetFieldsReadAsDefaultsAndReferencesStayGood) {
  OEBankStatementTx tx;
  EXPECT_TRUE(tx.GetName().IsNull());
  EXPECT_EQ(tx.GetName().SpecLength(), OEString32().SpecLength());
  EXPECT_EQ(tx.GetPayee(), nullptr);
  EXPECT_EQ(tx.ValidateTag(OE_TAG_TRNAMT), 0);

  ASSERT_EQ(tx.SetName(OEString("GROCERY")), 1);
  const OEString& name = tx.GetName();
  const OEString* where = &name;
  // Many further fields, several blocks' worth: the name does not move.
  tx.SetMemo(OEString("a memo long enough to leave the string's own room behind"));
  tx.SetFITId(OEString("F-1"));
  tx.SetCheckNum(OEString("1001"));
  tx.SetReferenceNum(OEString("R-9"));
  tx.SetSIC(OEString("5411"));
  tx.SetPayeeId(OEString("P-1"));
  tx.SetServerTxId(OEString("S-1"));
  tx.SetTxAmount(OEPrecisionInteger("-12.34"));
  tx.SetDateTimePosted(OEDateTime("20240105"));
  EXPECT_EQ(&tx.GetName(), where);
  EXPECT_EQ(name, "GROCERY");
  // Setting a field from another of the same object.
  ASSERT_EQ(tx.SetMemo(tx.GetName()), 1);
  EXPECT_EQ(tx.GetMemo(), "GROCERY");

  // A copy carries what the source never set as unset.
  OEBankStatementTx source;
  source.SetFITId(OEString("F-2"));
  ASSERT_EQ(tx.DeepCopyFrom(&source), 1);
  EXPECT_EQ(tx.GetFITId(), "F-2");
  EXPECT_TRUE(tx.GetName().IsNull());
  EXPECT_EQ(tx.ValidateTag(OE_TAG_NAME), 0);
}

namespace {
#define T_LIST_ROOT_FIELDS(X) X(CHILD, List, BANKTRANLIST, OEBankTransactionList)
class ListRoot : public OEAggregate {
  OE_AGGREGATE(ListRoot, T_LIST_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(ListRoot, OEAggregate, T_LIST_ROOT_FIELDS, NONE, .Valid(OE_TAGS(BANKTRANLIST)))
}  // namespace

// A list whose objects differ (a rare field in some) reads back whole and
// writes back the same text.
TEST(FieldStore, ObjectsOfOneListWithRareFieldsReadWhole) {
  std::string text = "<BANKTRANLIST><DTSTART>20240101<DTEND>20240131";
  for (int i = 0; i < 600; ++i) {
    text += "<STMTTRN><TRNTYPE>DEBIT<DTPOSTED>20240102<TRNAMT>-" + std::to_string(i + 1) + ".00<FITID>F" +
            std::to_string(i);
    if (i % 7 == 0) text += "<CHEQUENUM>" + std::to_string(1000 + i);
    if (i % 50 == 0) text += "<PAYEE><NAME>Utility<ADDR1>1 Main<CITY>Town<STATE>ST<POSTALCODE>11111<PHONE>5</PAYEE>";
    else text += "<NAME>Store " + std::to_string(i);
    if (i % 3 == 0) text += "<MEMO>memo " + std::to_string(i);
    text += "</STMTTRN>";
  }
  text += "</BANKTRANLIST>";
  ListRoot root;
  ASSERT_EQ(ParseText(text, &root), OE_PARSE_OK);
  ASSERT_NE(root.GetList(), nullptr);
  const OEBankTransactionList& list = *root.GetList();
  ASSERT_EQ(list.GetNumStatementTx(), 600);
  for (int i = 0; i < 600; ++i) {
    OEBankStatementTx* tx = list.GetStatementTx(static_cast<unsigned short>(i));
    ASSERT_NE(tx, nullptr);
    EXPECT_EQ(tx->GetFITId(), ("F" + std::to_string(i)).c_str());
    EXPECT_EQ(tx->ValidateTag(OE_TAG_CHEQUENUM), i % 7 == 0 ? 1 : 0);
    EXPECT_EQ(tx->GetPayee() != nullptr, i % 50 == 0);
    EXPECT_EQ(tx->GetMemo().IsNull(), i % 3 != 0);
  }
  std::string written = WriteUnderOwnTag(list).text;
  written.erase(std::remove(written.begin(), written.end(), '\n'), written.end());
  EXPECT_TRUE(written == text) << "the list does not write back as read";
}
