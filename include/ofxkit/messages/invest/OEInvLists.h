// The lists of an investment statement: transactions ("INVTRANLIST"),
// positions ("INVPOSLIST") and open orders ("INVOOLIST"). Each holds one
// array per kind, with typed accessors named after the kind (GetBuyStock(i),
// GetNumBuyStock(), SetBuyStock(i, p), AppendBuyStock(p), ClearBuyStock());
// within a kind the order read is kept, and the kinds are written grouped in
// a fixed order.
#pragma once

#include <vector>

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/invest/OEInvPositions.h"
#include "ofxkit/messages/invest/OEInvTransactions.h"

#define OE_INVTRANLIST_FIELDS(X)                             \
  X(VALUE, DtStart, DTSTART, OEDateTime)                     \
  X(VALUE, DtEnd, DTEND, OEDateTime)                         \
  X(LIST, BuyDebt, BUYDEBT, OEBuyDebt)                       \
  X(LIST, BuyMF, BUYMF, OEBuyMF)                             \
  X(LIST, BuyOpt, BUYOPT, OEBuyOpt)                          \
  X(LIST, BuyOther, BUYOTHER, OEBuyOther)                    \
  X(LIST, BuyStock, BUYSTOCK, OEBuyStock)                    \
  X(LIST, ClosureOpt, CLOSUREOPT, OEClosureOpt)              \
  X(LIST, Income, INCOME, OEIncome)                          \
  X(LIST, InvExpense, INVEXPENSE, OEInvExpense)              \
  X(LIST, JrnlFund, JRNLFUND, OEJrnlFund)                    \
  X(LIST, JrnlSec, JRNLSEC, OEJrnlSec)                       \
  X(LIST, MarginInterest, MARGININTEREST, OEMarginInterest)  \
  X(LIST, Reinvest, REINVEST, OEReinvest)                    \
  X(LIST, RetOfCap, RETOFCAP, OERetOfCap)                    \
  X(LIST, SellDebt, SELLDEBT, OESellDebt)                    \
  X(LIST, SellMF, SELLMF, OESellMF)                          \
  X(LIST, SellOpt, SELLOPT, OESellOpt)                       \
  X(LIST, SellOther, SELLOTHER, OESellOther)                 \
  X(LIST, SellStock, SELLSTOCK, OESellStock)                 \
  X(LIST, Split, SPLIT, OESplit)                             \
  X(LIST, Transfer, TRANSFER, OETransfer)                    \
  X(LIST, InvBankTran, INVBANKTRAN, OEInvBankTran)

class OEInvTranList : public OEAggregate {
  OE_AGGREGATE(OEInvTranList, OE_INVTRANLIST_FIELDS)

  // The generic index: the INVTRAN of every transaction but the journals,
  // kind by kind in writing order, then one per INVBANKTRAN (its own INVTRAN,
  // filled from the bank transaction). Through each INVTRAN's owner link an
  // application walks every transaction of the statement in one loop. The
  // index does not own what it points to; it is built when the list's end tag
  // is read, by BuildGenericInvTranList and after a deep copy.
  unsigned short GetNumGenericInvTran() const;
  OEInvTran* GetGenericInvTran(unsigned short i) const;
  // Stores t at i (i = count appends); 0 when i is past the end or t is null.
  unsigned short SetGenericInvTran(unsigned short i, OEInvTran* t);
  unsigned short BuildGenericInvTranList();
  // Appends the index entries to array; 0 when an INVBANKTRAN's INVTRAN
  // could not be made.
  unsigned short FillGenericInvTranList(std::vector<OEInvTran*>& array);

  OEParseStatus HandleTagEnd(const OETagDictionaryEntry* const entry) override;
  unsigned short CopyAggregateFrom(const OEAggregate* source) override;

 private:
  std::vector<OEInvTran*> m_generic;
};

#define OE_INVPOSLIST_FIELDS(X)                \
  X(LIST, PosDebt, POSDEBT, OEPosDebt)         \
  X(LIST, PosMF, POSMF, OEPosMF)               \
  X(LIST, PosOpt, POSOPT, OEPosOpt)            \
  X(LIST, PosOther, POSOTHER, OEPosOther)      \
  X(LIST, PosStock, POSSTOCK, OEPosStock)

class OEInvPosList : public OEAggregate {
  OE_AGGREGATE(OEInvPosList, OE_INVPOSLIST_FIELDS)
};

#define OE_INVOOLIST_FIELDS(X)                       \
  X(LIST, OOBuyDebt, OOBUYDEBT, OEOOBuyDebt)         \
  X(LIST, OOBuyMF, OOBUYMF, OEOOBuyMF)               \
  X(LIST, OOBuyOpt, OOBUYOPT, OEOOBuyOpt)            \
  X(LIST, OOBuyOther, OOBUYOTHER, OEOOBuyOther)      \
  X(LIST, OOBuyStock, OOBUYSTOCK, OEOOBuyStock)      \
  X(LIST, OOSellDebt, OOSELLDEBT, OEOOSellDebt)      \
  X(LIST, OOSellMF, OOSELLMF, OEOOSellMF)            \
  X(LIST, OOSellOpt, OOSELLOPT, OEOOSellOpt)         \
  X(LIST, OOSellOther, OOSELLOTHER, OEOOSellOther)   \
  X(LIST, OOSellStock, OOSELLSTOCK, OEOOSellStock)   \
  X(LIST, OOSwitchMF, OOSWITCHMF, OEOOSwitchMF)

class OEInvOOList : public OEAggregate {
  OE_AGGREGATE(OEInvOOList, OE_INVOOLIST_FIELDS)
};
