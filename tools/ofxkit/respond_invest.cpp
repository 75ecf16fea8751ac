// Investment answers of `ofxkit respond` and `ofxkit serve`: a generated
// (deterministic) brokerage statement for each investment statement request,
// and the security list that describes what it refers to.
#include <cstdio>
#include <cstring>
#include <string>

#include "cli.h"

namespace cli {
namespace {

struct Security {
  const char* cusip;
  const char* ticker;
  const char* name;
  bool fund;
  int32_t priceCents;
};
const Security kSecurities[] = {
    {"037833100", "AAPL", "Example Apple Inc", false, 18950},   {"594918104", "MSFT", "Example Microsoft Corp", false, 41210},
    {"023135106", "AMZN", "Example Amazon.com Inc", false, 17875}, {"46625H100", "JPM", "Example JPMorgan Chase", false, 19840},
    {"922908363", "VFIAX", "Example 500 Index Fund", true, 48211}, {"808515100", "SWMXX", "Example Money Market Fund", true, 100},
};
const unsigned kNumSecurities = sizeof kSecurities / sizeof kSecurities[0];

struct Sequence {
  uint32_t state;
  uint32_t Next() {
    state = state * 1103515245u + 12345u;
    return state >> 8;
  }
};

OESecID* NewSecID(const Security& s) {
  OESecID* id = new OESecID();
  id->SetUniqueID(s.cusip);
  id->SetUniqueIDType("CUSIP");
  return id;
}

OEInvTran* NewInvTran(unsigned i, const OEDateTime& when, const char* memo) {
  OEInvTran* tran = new OEInvTran();
  char fitid[32];
  std::snprintf(fitid, sizeof fitid, "INV%08u", i + 1);
  tran->SetFITId(fitid);
  tran->SetDtTrade(when);
  tran->SetDtSettle(when);
  tran->SetMemo(memo);
  return tran;
}

OEInvBuy* NewInvBuy(const Security& s, OEInvTran* tran, const OEPrecisionInteger& units) {
  OEInvBuy* buy = new OEInvBuy();
  buy->SetInvTran(tran);
  buy->SetSecID(NewSecID(s));
  buy->SetUnits(units);
  buy->SetUnitPrice(OEPrecisionInteger(s.priceCents, 2));
  buy->SetCommission(OEPrecisionInteger(495, 2));
  buy->SetTotal(OEPrecisionInteger(0) - units * OEPrecisionInteger(s.priceCents, 2) - OEPrecisionInteger(495, 2));
  buy->SetSubAcctSec(OE_SUBACCT_CASH);
  buy->SetSubAcctFund(OE_SUBACCT_CASH);
  return buy;
}

OEInvSell* NewInvSell(const Security& s, OEInvTran* tran, const OEPrecisionInteger& units) {
  OEInvSell* sell = new OEInvSell();
  sell->SetInvTran(tran);
  sell->SetSecID(NewSecID(s));
  sell->SetUnits(OEPrecisionInteger(0) - units);
  sell->SetUnitPrice(OEPrecisionInteger(s.priceCents, 2));
  sell->SetCommission(OEPrecisionInteger(495, 2));
  sell->SetTotal(units * OEPrecisionInteger(s.priceCents, 2) - OEPrecisionInteger(495, 2));
  sell->SetSubAcctSec(OE_SUBACCT_CASH);
  sell->SetSubAcctFund(OE_SUBACCT_CASH);
  return sell;
}

// One transaction of the kind that i selects.
void AddTransaction(OEInvTranList& list, unsigned i, const OEDateTime& when, Sequence& seq) {
  const Security& s = kSecurities[seq.Next() % kNumSecurities];
  OEPrecisionInteger units(static_cast<int32_t>(seq.Next() % 5000u) + 100, 2);
  OEPrecisionInteger cash(static_cast<int32_t>(seq.Next() % 90000u) + 500, 2);
  switch (i % 8) {
    case 0: {
      OEBuyStock* buy = new OEBuyStock();
      buy->SetInvBuy(NewInvBuy(s, NewInvTran(i, when, "Bought shares"), units));
      buy->SetBuyType(OE_BUYTYPE_BUY);
      list.AppendBuyStock(buy);
      break;
    }
    case 1: {
      OESellStock* sell = new OESellStock();
      sell->SetInvSell(NewInvSell(s, NewInvTran(i, when, "Sold shares"), units));
      sell->SetSellType(OE_SELLTYPE_SELL);
      list.AppendSellStock(sell);
      break;
    }
    case 2: {
      OEIncome* income = new OEIncome();
      income->SetInvTran(NewInvTran(i, when, "Dividend"));
      income->SetSecID(NewSecID(s));
      income->SetIncomeType(OE_INCOMETYPE_DIV);
      income->SetTotal(cash);
      income->SetSubAcctSec(OE_SUBACCT_CASH);
      income->SetSubAcctFund(OE_SUBACCT_CASH);
      list.AppendIncome(income);
      break;
    }
    case 3: {
      OEReinvest* reinvest = new OEReinvest();
      reinvest->SetInvTran(NewInvTran(i, when, "Dividend reinvested"));
      reinvest->SetSecID(NewSecID(s));
      reinvest->SetIncomeType(OE_INCOMETYPE_DIV);
      reinvest->SetTotal(OEPrecisionInteger(0) - cash);
      reinvest->SetSubAcctSec(OE_SUBACCT_CASH);
      reinvest->SetUnits(units);
      reinvest->SetUnitPrice(OEPrecisionInteger(s.priceCents, 2));
      list.AppendReinvest(reinvest);
      break;
    }
    case 4: {
      OEBuyMF* buy = new OEBuyMF();
      buy->SetInvBuy(NewInvBuy(s, NewInvTran(i, when, "Fund purchase"), units));
      buy->SetBuyType(OE_BUYTYPE_BUY);
      list.AppendBuyMF(buy);
      break;
    }
    case 5: {
      OEInvBankTran* bank = new OEInvBankTran();
      OEBankStatementTx* tx = new OEBankStatementTx();
      tx->SetTxType(OE_BANKTX_CREDIT);
      tx->SetDateTimePosted(when);
      tx->SetTxAmount(cash);
      char fitid[32];
      std::snprintf(fitid, sizeof fitid, "INV%08u", i + 1);
      tx->SetFITId(fitid);
      tx->SetName("Deposit");
      bank->SetStatementTx(tx);
      bank->SetSubAcctFund(OE_SUBACCT_CASH);
      list.AppendInvBankTran(bank);
      break;
    }
    case 6: {
      OEMarginInterest* interest = new OEMarginInterest();
      interest->SetInvTran(NewInvTran(i, when, "Margin interest"));
      interest->SetTotal(OEPrecisionInteger(0) - cash);
      interest->SetSubAcctFund(OE_SUBACCT_MARGIN);
      list.AppendMarginInterest(interest);
      break;
    }
    default: {
      OEJrnlFund* journal = new OEJrnlFund();
      journal->SetInvTran(NewInvTran(i, when, "Cash moved to margin"));
      journal->SetSubAcctFrom(OE_SUBACCT_CASH);
      journal->SetSubAcctTo(OE_SUBACCT_MARGIN);
      journal->SetTotal(cash);
      list.AppendJrnlFund(journal);
      break;
    }
  }
}

OEInvStmtRs* MakeInvStatement(const OEInvStmtRq& rq, unsigned count) {
  OEInvStmtRs* rs = new OEInvStmtRs();
  OEDateTime now(2026, 11, 23, 12, 0, 0);
  rs->SetDtAsOf(now);
  rs->SetCurrencyDefault("USD");
  if (const OEInvAcctFrom* from = rq.GetInvAcctFrom()) {
    OEInvAcctFrom* copy = new OEInvAcctFrom();
    copy->DeepCopyFrom(from);
    rs->SetInvAcctFrom(copy);
  }
  const OEIncTransaction* include = rq.GetIncTransaction();
  if (!include || include->GetInclude()) {
    OEDateTime start = include && include->ValidateTag(OE_TAG_DTSTART) ? include->GetDtStart() : OEDateTime(2026, 10, 24);
    OEDateTime end = include && include->ValidateTag(OE_TAG_DTEND) ? include->GetDtEnd() : now;
    OEInvTranList* list = new OEInvTranList();
    list->SetDtStart(start);
    list->SetDtEnd(end);
    Sequence seq{static_cast<uint32_t>(rq.GetInvAcctFrom() ? rq.GetInvAcctFrom()->GetAccountID().GetStrLength() : 0) + 11u};
    for (unsigned i = 0; i < count; ++i) {
      OEDateTime when = start;
      when += static_cast<int32_t>((i * 3600u) % 2592000u);
      AddTransaction(*list, i, when, seq);
    }
    rs->SetInvTranList(list);
  }
  const OEIncPos* positions = rq.GetIncPos();
  if (positions && positions->GetInclude()) {
    OEInvPosList* list = new OEInvPosList();
    for (unsigned k = 0; k < kNumSecurities; ++k) {
      const Security& s = kSecurities[k];
      OEInvPos* pos = new OEInvPos();
      pos->SetSecID(NewSecID(s));
      pos->SetHeldInAcct(OE_SUBACCT_CASH);
      pos->SetPosType(OE_POSTYPE_LONG);
      OEPrecisionInteger units(static_cast<int32_t>(1000 + 250 * k), 1);
      pos->SetUnits(units);
      pos->SetUnitPrice(OEPrecisionInteger(s.priceCents, 2));
      pos->SetMktVal(units * OEPrecisionInteger(s.priceCents, 2));
      pos->SetDtPriceAsOf(now);
      if (s.fund) {
        OEPosMF* mf = new OEPosMF();
        mf->SetInvPos(pos);
        list->AppendPosMF(mf);
      } else {
        OEPosStock* stock = new OEPosStock();
        stock->SetInvPos(pos);
        list->AppendPosStock(stock);
      }
    }
    rs->SetInvPosList(list);
  }
  if (rq.GetIncludeBalance()) {
    OEInvBal* bal = new OEInvBal();
    bal->SetAvailCash(OEPrecisionInteger(1250075, 2));
    bal->SetMarginBalance(OEPrecisionInteger(0));
    bal->SetShortBalance(OEPrecisionInteger(0));
    OEBalList* extra = new OEBalList();
    OEBalance* rate = new OEBalance();
    rate->SetName("Margin rate");
    rate->SetDescription("Current interest rate on margin balances");
    rate->SetBalanceType(OE_BALTYPE_PERCENT);
    rate->SetValue(OEPrecisionInteger(785, 2));
    extra->AppendBalance(rate);
    bal->SetBalList(extra);
    rs->SetInvBal(bal);
  }
  if (rq.GetIncludeOpenOrders()) {
    OEInvOOList* list = new OEInvOOList();
    OEOO* oo = new OEOO();
    oo->SetSecID(NewSecID(kSecurities[0]));
    oo->SetFITId("OO00000001");
    oo->SetDtPlaced(now);
    oo->SetUnits(OEPrecisionInteger(100));
    oo->SetSubAcct(OE_SUBACCT_CASH);
    oo->SetDuration(OE_DURATION_GOODTILCANCEL);
    oo->SetRestriction(OE_RESTRICTION_NONE);
    oo->SetLimitPrice(OEPrecisionInteger(17500, 2));
    OEOOBuyStock* order = new OEOOBuyStock();
    order->SetOO(oo);
    order->SetBuyType(OE_BUYTYPE_BUY);
    list->AppendOOBuyStock(order);
    rs->SetInvOOList(list);
  }
  return rs;
}

OESecList* MakeSecList() {
  OESecList* list = new OESecList();
  for (const Security& s : kSecurities) {
    OESecInfo* info = new OESecInfo();
    info->SetSecID(NewSecID(s));
    info->SetSecName(s.name);
    info->SetTicker(s.ticker);
    info->SetUnitPrice(OEPosPrecisionInteger(s.priceCents, 2));
    if (s.fund) {
      OEMFInfo* mf = new OEMFInfo();
      mf->SetSecInfo(info);
      mf->SetMFType(OE_MFTYPE_OPENEND);
      list->AppendMFInfo(mf);
    } else {
      OEStockInfo* stock = new OEStockInfo();
      stock->SetSecInfo(info);
      stock->SetStockType(OE_STOCKTYPE_COMMON);
      list->AppendStockInfo(stock);
    }
  }
  return list;
}

}  // namespace

// The response set of this type, appended when there is none yet.
OEMessageSetRs* ResponseSet(OEResponse& out, OETagID type) {
  for (unsigned short m = 0; m < out.GetNumMessage(); ++m)
    if (OEMessageSetRs* set = out.GetMessageSet(m); set && set->GetType() == type) return set;
  OEMessageSetRs* set = new OEMessageSetRs();
  set->SetType(type);
  out.AppendMessageSet(set);
  return set;
}

OETransRs* AnswerWrapper(const OETransRq& wrapper, OETagID type, OETagID innerTag, OETransBase* inner) {
  OETransRs* rs = new OETransRs();
  rs->SetType(type);
  rs->SetTransUserID(wrapper.GetTransUserID());
  OEStatus* status = new OEStatus();
  status->SetCode(0);
  status->SetSeverity(OE_SEVERITY_INFO);
  rs->SetStatus(status);
  rs->SetActualTrans(inner);
  rs->SetTag(innerTag);
  return rs;
}

bool AnswerInvestmentSet(const OEMessageSetRq& set, unsigned transactions, AnswerBudget& budget, OEResponse& out) {
  bool statements = set.GetType() == OE_TAG_INVSTMTMSGSRQV1;
  if (!statements && set.GetType() != OE_TAG_SECLISTMSGSRQV1) return false;
  OEMessageSetRs* rsSet = ResponseSet(out, statements ? OE_TAG_INVSTMTMSGSRSV1 : OE_TAG_SECLISTMSGSRSV1);
  bool answered = false;
  for (unsigned short t = 0; t < set.GetNumTrans(); ++t) {
    const OETransRq* wrapper = set.GetTrans(t);
    if (!wrapper || !wrapper->GetActualTrans() || !budget.Answer()) continue;
    if (const auto* rq = dynamic_cast<const OEInvStmtRq*>(wrapper->GetActualTrans())) {
      if (const char* refused = budget.TakeStatement(transactions, AnswerBudget::kBrokerageWeight)) {
        rsSet->AppendTrans(RefusedStatement(*wrapper, OE_TAG_INVSTMTTRNRS, refused));
        continue;
      }
      rsSet->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_INVSTMTTRNRS, OE_TAG_INVSTMTRS,
                                       MakeInvStatement(*rq, transactions)));
      answered = true;
    } else if (dynamic_cast<const OESecListRq*>(wrapper->GetActualTrans())) {
      rsSet->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_SECLISTTRNRS, OE_TAG_SECLISTRS, new OESecListRs()));
      answered = true;
    }
  }
  // The securities that the statements and the requests refer to.
  if (answered) {
    OEMessageSetRs* secSet = ResponseSet(out, OE_TAG_SECLISTMSGSRSV1);
    if (!secSet->GetSecList()) secSet->SetSecList(MakeSecList());
  }
  return true;
}

}  // namespace cli
