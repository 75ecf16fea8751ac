// Objects come from the library's blocks: many of them, of several sizes,
// freed in any order and from other threads, stay whole and distinct.
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdint>
#include <string>
#include <memory>
#include <set>
#include <thread>
#include <vector>

#include "ofxkit/ofxkit.h"
#include "support/ofx_text.h"

namespace {
// Larger than the largest size class: comes from the heap.
struct BigObject : OEDataObj {
  char payload[10000] = {};
};
}  // namespace

TEST(ObjectBlocks, ManyObjectsStayDistinctAndWhole) {
  std::vector<OEBankStatementTx*> txs;
  std::vector<OEDataObj*> small;
  for (int i = 0; i < 12000; ++i) {  // several blocks' worth
    OEBankStatementTx* tx = new OEBankStatementTx;
    tx->SetFITId(OEString(std::to_string(i).c_str()));
    txs.push_back(tx);
    small.push_back(new (std::nothrow) OEDataObj);
    ASSERT_NE(small.back(), nullptr);
  }
  std::set<const void*> seen(txs.begin(), txs.end());
  seen.insert(small.begin(), small.end());
  EXPECT_EQ(seen.size(), txs.size() + small.size());
  for (const OEBankStatementTx* tx : txs)
    EXPECT_EQ(reinterpret_cast<uintptr_t>(tx) % alignof(std::max_align_t), 0u);
  // Free every other one, make new ones in their place: the survivors keep
  // their values.
  for (size_t i = 0; i < txs.size(); i += 2) {
    delete txs[i];
    txs[i] = new OEBankStatementTx;
    txs[i]->SetFITId("again");
  }
  for (size_t i = 1; i < txs.size(); i += 2) EXPECT_EQ(txs[i]->GetFITId(), std::to_string(i).c_str());
  for (size_t i = 0; i < txs.size(); i += 2) EXPECT_EQ(txs[i]->GetFITId(), "again");
  // Deleted through the base class, in reverse order.
  std::reverse(txs.begin(), txs.end());
  for (OEDataObj* obj : txs) delete obj;
  for (OEDataObj* obj : small) delete obj;

  std::unique_ptr<BigObject> big(new BigObject);
  big->payload[9999] = 'x';
  EXPECT_EQ(big->payload[9999], 'x');
}

TEST(ObjectBlocks, ObjectsMadeAndFreedOnOtherThreads) {
  std::vector<std::unique_ptr<OEDataObj>> made(4);
  std::vector<std::thread> threads;
  for (int t = 0; t < 4; ++t)
    threads.emplace_back([t, &made] {
      std::vector<OEBankTransactionList*> lists;
      for (int i = 0; i < 2000; ++i) lists.push_back(new OEBankTransactionList);
      for (OEBankTransactionList* list : lists) delete list;
      made[t].reset(new OEStatus);  // freed by the main thread
    });
  for (std::thread& thread : threads) thread.join();
  for (auto& obj : made) EXPECT_NE(obj.get(), nullptr);
}

const OEBankTransactionList* FindList(const OEDataObj* obj) {
  if (const auto* list = dynamic_cast<const OEBankTransactionList*>(obj)) return list;
  for (unsigned short i = 0; i < obj->GetNumberOfChildren(); ++i)
    if (const OEDataObj* child = obj->GetChild(i))
      if (const OEBankTransactionList* found = FindList(child)) return found;
  return nullptr;
}

TEST(ObjectBlocks, ParsedTreesComeAndGo) {
  std::string text =
      "OFXHEADER:100\nDATA:OFXSGML\nVERSION:102\nSECURITY:NONE\nENCODING:USASCII\nCHARSET:1252\n"
      "COMPRESSION:NONE\nOLDFILEUID:NONE\nNEWFILEUID:NONE\n\n<OFX><BANKMSGSRSV1><STMTTRNRS><TRNUID>1<STATUS>"
      "<CODE>0<SEVERITY>INFO</STATUS><STMTRS><CURDEF>USD<BANKACCTFROM><BANKID>1<ACCTID>2<ACCTTYPE>CHECKING"
      "</BANKACCTFROM><BANKTRANLIST><DTSTART>20260101<DTEND>20260131";
  for (int i = 0; i < 3000; ++i)
    text += "<STMTTRN><TRNTYPE>DEBIT<DTPOSTED>20260102<TRNAMT>-1.00<FITID>" + std::to_string(i) +
            "<NAME>A NAME<MEMO>A MEMO LONGER THAN THIRTY CHARACTERS</STMTTRN>";
  text += "</BANKTRANLIST></STMTRS></STMTTRNRS></BANKMSGSRSV1></OFX>";
  for (int round = 0; round < 3; ++round) {
    OEFileRs file;
    EXPECT_EQ(ParseText(text, &file), OE_PARSE_OK);
    const OEBankTransactionList* list = FindList(&file);
    ASSERT_NE(list, nullptr);
    ASSERT_EQ(list->GetNumStatementTx(), 3000);
    EXPECT_EQ(list->GetStatementTx(2999)->GetFITId(), "2999");
    EXPECT_EQ(list->GetStatementTx(0)->GetMemo(), "A MEMO LONGER THAN THIRTY CHARACTERS");
  }
}
