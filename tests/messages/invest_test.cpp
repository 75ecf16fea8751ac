// Brokerage statements and securities: what is read, how it is written back,
// the links of inner aggregates to their transaction, the generic index,
// the choice rules and what bad values do.
#include <gtest/gtest.h>

#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"
#include "support/ofx_text.h"

namespace {

#define T_INV_ROOT_FIELDS(X)                              \
  X(CHILD, StmtRs, INVSTMTRS, OEInvStmtRs)                \
  X(CHILD, StmtRq, INVSTMTRQ, OEInvStmtRq)                \
  X(CHILD, SecList, SECLIST, OESecList)                   \
  X(CHILD, SecListRq, SECLISTRQ, OESecListRq)             \
  X(CHILD, InvSet, INVSTMTMSGSETV1, OEInvStmtMsgSetV1)
class InvRoot : public OEAggregate {
  OE_AGGREGATE(InvRoot, T_INV_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(InvRoot, OEAggregate, T_INV_ROOT_FIELDS, NONE,
                    .Valid(OE_TAGS(INVSTMTRS, INVSTMTRQ, SECLIST, SECLISTRQ, INVSTMTMSGSETV1)))

const char kSecId[] = "<SECID><UNIQUEID>123456789<UNIQUEIDTYPE>CUSIP</SECID>";

std::string InvTran(const char* fitid, const char* date) {
  return std::string("<INVTRAN><FITID>") + fitid + "<DTTRADE>" + date + "<MEMO>m" + fitid + "</INVTRAN>";
}

std::string BuyStock(const char* fitid, const char* date) {
  return "<BUYSTOCK><INVBUY>" + InvTran(fitid, date) + kSecId +
         "<UNITS>100<UNITPRICE>50.25<COMMISSION>9.99<TOTAL>-5034.99<SUBACCTSEC>CASH<SUBACCTFUND>CASH"
         "</INVBUY><BUYTYPE>BUY</BUYSTOCK>";
}

std::string SellStock(const char* fitid, const char* date) {
  return "<SELLSTOCK><INVSELL>" + InvTran(fitid, date) + kSecId +
         "<UNITS>-10<UNITPRICE>60<TOTAL>600<SUBACCTSEC>CASH<SUBACCTFUND>CASH</INVSELL><SELLTYPE>SELL</SELLSTOCK>";
}

std::string Statement(const std::string& transactions) {
  return "<INVSTMTRS><DTASOF>20240105<CURDEF>USD<INVACCTFROM><BROKERID>broker.example<ACCTID>X1</INVACCTFROM>"
         "<INVTRANLIST><DTSTART>20240101<DTEND>20240105" +
         transactions + "</INVTRANLIST></INVSTMTRS>";
}

class InvestTest : public LogFixture {
 protected:
  OEParseStatus Parse(const std::string& text, InvRoot& into) { return ParseText(text, &into); }
  std::string Write(const OEDataObj& obj) {
    WrittenText written = WriteUnderOwnTag(obj, OE_BUILD_LENIENT);
    EXPECT_EQ(written.status, OE_BUILD_OK);
    return written.text;
  }
  unsigned Count(OEParseWarning code) const {
    unsigned n = 0;
    for (unsigned short i = 0; i < log->Entries(); ++i) n += log->Get(i)->warning == code;
    return n;
  }
  // The start tags of text, in order, each once per line.
  static std::string StartTags(const std::string& text) {
    std::string tags;
    for (size_t at = text.find('<'); at != std::string::npos; at = text.find('<', at + 1)) {
      if (text[at + 1] == '/') continue;
      size_t end = text.find('>', at);
      tags += text.substr(at + 1, end - at - 1) + " ";
    }
    return tags;
  }
};

TEST_F(InvestTest, StatementValuesAreReadThroughEveryLevel) {
  InvRoot root;
  std::string text = Statement(BuyStock("B1", "20240102") +
                               "<INCOME>" + InvTran("I1", "20240103") + kSecId +
                               "<INCOMETYPE>DIV<TOTAL>12.50<SUBACCTSEC>CASH<SUBACCTFUND>CASH<TAXEXEMPT>N</INCOME>");
  text.insert(text.find("</INVSTMTRS>"),
              "<INVPOSLIST><POSSTOCK><INVPOS>" + std::string(kSecId) +
                  "<HELDINACCT>CASH<POSTYPE>LONG<UNITS>200<UNITPRICE>49.50<MKTVAL>9900<DTPRICEASOF>20240105"
                  "</INVPOS><REINVDIV>Y</POSSTOCK></INVPOSLIST>"
                  "<INVBAL><AVAILCASH>200.00<MARGINBALANCE>-50<SHORTBALANCE>0<BALLIST><BAL><NAME>Rate<DESC>Margin"
                  "<BALTYPE>PERCENT<VALUE>7.85</BAL></BALLIST></INVBAL>"
                  "<INVOOLIST><OOBUYSTOCK><OO><FITID>O1" + kSecId +
                  "<DTPLACED>20240104<UNITS>5<SUBACCT>CASH<DURATION>DAY<RESTRICTION>NONE<LIMITPRICE>48</OO>"
                  "<BUYTYPE>BUY</OOBUYSTOCK></INVOOLIST>");
  ASSERT_EQ(Parse(text, root), OE_PARSE_OK);
  OEInvStmtRs* rs = root.GetStmtRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->GetCurrencyDefault(), "USD");
  EXPECT_EQ(rs->GetInvAcctFrom()->GetBrokerID(), "broker.example");
  EXPECT_EQ(rs->AllRequiredPresent(), 1);

  const OEInvTranList* list = rs->GetInvTranList();
  ASSERT_EQ(list->GetNumBuyStock(), 1);
  const OEInvBuy* buy = list->GetBuyStock(0)->GetInvBuy();
  EXPECT_EQ(buy->GetInvTran()->GetFITId(), "B1");
  EXPECT_EQ(buy->GetSecID()->GetUniqueID(), "123456789");
  EXPECT_EQ(buy->GetUnitPrice(), OEPrecisionInteger(5025, 2));
  EXPECT_EQ(buy->GetTotal(), OEPrecisionInteger(-503499, 2));
  EXPECT_EQ(buy->GetSubAcctFund(), OE_SUBACCT_CASH);
  EXPECT_EQ(list->GetBuyStock(0)->GetBuyType(), OE_BUYTYPE_BUY);
  ASSERT_EQ(list->GetNumIncome(), 1);
  EXPECT_EQ(list->GetIncome(0)->GetIncomeType(), OE_INCOMETYPE_DIV);
  EXPECT_TRUE(list->GetIncome(0)->ValidateTag(OE_TAG_TAXEXEMPT));
  EXPECT_EQ(list->GetIncome(0)->GetTaxExempt(), 0);

  const OEPosStock* pos = rs->GetInvPosList()->GetPosStock(0);
  ASSERT_NE(pos, nullptr);
  EXPECT_EQ(pos->GetInvPos()->GetMktVal(), OEPrecisionInteger(9900));
  EXPECT_EQ(pos->GetReinvDiv(), 1);
  EXPECT_EQ(rs->GetInvBal()->GetMarginBalance(), OEPrecisionInteger(-50));
  EXPECT_EQ(rs->GetInvBal()->GetBalList()->GetBalance(0)->GetBalanceType(), OE_BALTYPE_PERCENT);
  OEOO* oo = rs->GetInvOOList()->GetOOBuyStock(0)->GetOO();
  EXPECT_EQ(oo->GetDuration(), OE_DURATION_DAY);
  EXPECT_EQ(oo->AllRequiredPresent(), 1);
  EXPECT_EQ(log->Entries(), 0);
}

TEST_F(InvestTest, InnerAggregatesKnowTheirTransaction) {
  InvRoot root;
  std::string text = Statement(
      "<BUYMF><INVBUY>" + InvTran("M1", "20240102") + kSecId +
      "<UNITS>1<UNITPRICE>1<TOTAL>-1<SUBACCTSEC>CASH<SUBACCTFUND>CASH</INVBUY><BUYTYPE>BUY</BUYMF>"
      "<INCOME>" + InvTran("I1", "20240103") + kSecId + "<INCOMETYPE>DIV<TOTAL>1<SUBACCTSEC>CASH<SUBACCTFUND>CASH"
      "</INCOME>");
  text.insert(text.find("</INVSTMTRS>"), "<INVPOSLIST><POSMF><INVPOS>" + std::string(kSecId) +
                                             "<HELDINACCT>CASH<POSTYPE>LONG<UNITS>1<UNITPRICE>1<MKTVAL>1"
                                             "<DTPRICEASOF>20240105</INVPOS></POSMF></INVPOSLIST>");
  ASSERT_EQ(Parse(text, root), OE_PARSE_OK);
  OEInvTranList* list = root.GetStmtRs()->GetInvTranList();
  OEBuyMF* buy = list->GetBuyMF(0);
  // Through the INVBUY, the INVTRAN reaches the BUYMF itself.
  EXPECT_EQ(buy->GetInvBuy()->GetInvTran()->GetChildObj(), buy);
  EXPECT_EQ(buy->GetInvBuy()->GetInvTran()->GetChildType(), OE_TAG_BUYMF);
  EXPECT_EQ(buy->GetInvBuy()->GetChildObj(), buy);
  EXPECT_EQ(list->GetIncome(0)->GetInvTran()->GetChildObj(), list->GetIncome(0));
  EXPECT_EQ(list->GetIncome(0)->GetInvTran()->GetChildType(), OE_TAG_INCOME);
  OEPosMF* pos = root.GetStmtRs()->GetInvPosList()->GetPosMF(0);
  EXPECT_EQ(pos->GetInvPos()->GetChildObj(), pos);
  EXPECT_EQ(pos->GetInvPos()->GetChildType(), OE_TAG_POSMF);

  // A deep copy links the copied inner aggregates to the copy, never to the source.
  OEInvStmtRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(root.GetStmtRs()), 1);
  OEBuyMF* copiedBuy = copy.GetInvTranList()->GetBuyMF(0);
  ASSERT_NE(copiedBuy, buy);
  EXPECT_EQ(copiedBuy->GetInvBuy()->GetInvTran()->GetChildObj(), copiedBuy);
  EXPECT_EQ(copiedBuy->GetInvBuy()->GetInvTran()->GetChildType(), OE_TAG_BUYMF);
  EXPECT_EQ(copy.GetInvPosList()->GetPosMF(0)->GetInvPos()->GetChildObj(), copy.GetInvPosList()->GetPosMF(0));
  ASSERT_EQ(copy.GetInvTranList()->GetNumGenericInvTran(), 2);
  EXPECT_EQ(copy.GetInvTranList()->GetGenericInvTran(0), copiedBuy->GetInvBuy()->GetInvTran());
  EXPECT_EQ(Write(copy), Write(*root.GetStmtRs()));
}

TEST_F(InvestTest, ListsWriteKindByKindAndStatementsInTheirOwnOrder) {
  InvRoot root;
  // Out of order at every level: the statement's children, and the kinds.
  std::string text =
      "<INVSTMTRS><INVTRANLIST><DTEND>20240105<DTSTART>20240101" + SellStock("S1", "20240103") +
      BuyStock("B1", "20240102") + SellStock("S2", "20240104") +
      "</INVTRANLIST><MKTGINFO>hello<INVACCTFROM><ACCTID>X1<BROKERID>b</INVACCTFROM><CURDEF>USD"
      "<DTASOF>20240105</INVSTMTRS>";
  ASSERT_EQ(Parse(text, root), OE_PARSE_OK);
  std::string written = Write(*root.GetStmtRs());
  EXPECT_EQ(StartTags(written).rfind(
                "INVSTMTRS DTASOF CURDEF INVACCTFROM BROKERID ACCTID INVTRANLIST DTSTART DTEND BUYSTOCK INVBUY ", 0),
            0u)
      << written;
  size_t b1 = written.find("<FITID>B1"), s1 = written.find("<FITID>S1"), s2 = written.find("<FITID>S2");
  EXPECT_LT(b1, s1);
  EXPECT_LT(s1, s2);
  EXPECT_LT(written.find("</INVTRANLIST>"), written.find("<MKTGINFO>"));
  // Inside a buy: INVBUY then BUYTYPE; inside INVBUY its valid order.
  EXPECT_NE(written.find("</INVBUY>\n<BUYTYPE>BUY\n</BUYSTOCK>"), std::string::npos) << written;
  EXPECT_NE(written.find("<UNITS>100\n<UNITPRICE>50.25\n<COMMISSION>9.99\n<TOTAL>-5034.99\n<SUBACCTSEC>CASH"),
            std::string::npos);
}

TEST_F(InvestTest, GenericIndexGoesKindByKindWithoutJournals) {
  InvRoot root;
  std::string text = Statement(
      SellStock("S1", "20240103") + "<JRNLFUND>" + InvTran("J1", "20240103") +
      "<SUBACCTTO>MARGIN<SUBACCTFROM>CASH<TOTAL>5</JRNLFUND>"
      "<INVBANKTRAN><STMTTRN><TRNTYPE>CREDIT<DTPOSTED>20240104<TRNAMT>100<FITID>T1<SRVRTID>SV1<NAME>Deposit"
      "<MEMO>cash in</STMTTRN><SUBACCTFUND>CASH</INVBANKTRAN>" +
      BuyStock("B1", "20240102") + "<INCOME>" + InvTran("I1", "20240103") + kSecId +
      "<INCOMETYPE>DIV<TOTAL>1<SUBACCTSEC>CASH<SUBACCTFUND>CASH</INCOME>");
  ASSERT_EQ(Parse(text, root), OE_PARSE_OK);
  OEInvTranList* list = root.GetStmtRs()->GetInvTranList();
  ASSERT_EQ(list->BuildGenericInvTranList(), 1);
  ASSERT_EQ(list->GetNumGenericInvTran(), 4);  // the journal is left out
  EXPECT_EQ(list->GetGenericInvTran(0)->GetFITId(), "B1");
  EXPECT_EQ(list->GetGenericInvTran(1)->GetFITId(), "I1");
  EXPECT_EQ(list->GetGenericInvTran(2)->GetFITId(), "S1");
  const OEInvTran* bank = list->GetGenericInvTran(3);
  EXPECT_EQ(bank->GetFITId(), "T1");
  EXPECT_EQ(bank->GetServerTxId(), "SV1");
  EXPECT_EQ(bank->GetMemo(), "cash in");
  EXPECT_TRUE(bank->ValidateTag(OE_TAG_DTTRADE));
  EXPECT_EQ(bank->GetDtTrade(), OEDateTime(2024, 1, 4));
  EXPECT_EQ(bank->GetChildObj(), list->GetInvBankTran(0));
  EXPECT_EQ(bank->GetChildType(), OE_TAG_INVBANKTRAN);
  // Rebuilding does not add twice, and the bank INVTRAN is never written.
  ASSERT_EQ(list->BuildGenericInvTranList(), 1);
  EXPECT_EQ(list->GetNumGenericInvTran(), 4);
  EXPECT_EQ(Write(*list->GetInvBankTran(0)).find("INVTRAN>"), std::string::npos);
  // Every transaction is reachable from its INVTRAN in one loop.
  unsigned kinds = 0;
  for (unsigned short i = 0; i < list->GetNumGenericInvTran(); ++i)
    kinds += list->GetGenericInvTran(i)->GetChildObj() != nullptr;
  EXPECT_EQ(kinds, 4u);
}

TEST_F(InvestTest, RequiredRulesOfRequestsAndSecurities) {
  InvRoot root;
  ASSERT_EQ(Parse("<INVSTMTRQ><INVACCTFROM><BROKERID>b<ACCTID>1</INVACCTFROM><INCTRAN><INCLUDE>Y</INCTRAN>"
                  "<INCOO>N<INCPOS><INCLUDE>Y</INCPOS></INVSTMTRQ>"
                  "<SECLISTRQ><SECRQ><TICKER>ACME<FIID>77</SECRQ><SECRQ><FIID>77</SECRQ><SECRQ></SECRQ></SECLISTRQ>",
                  root),
            OE_PARSE_OK);
  OEInvStmtRq* rq = root.GetStmtRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 0);  // no INCBAL
  EXPECT_EQ(rq->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_INCBAL);
  rq->SetIncludeBalance(OEString("N"));
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  EXPECT_NE(Write(*rq).find("<INCOO>N\n<INCPOS>\n<INCLUDE>Y\n</INCPOS>\n<INCBAL>N\n"), std::string::npos);

  OESecListRq* list = root.GetSecListRq();
  ASSERT_EQ(list->GetNumSecRq(), 3);
  EXPECT_EQ(list->GetSecRq(0)->AllRequiredPresent(), 0);  // two ways at once
  EXPECT_EQ(list->GetSecRq(1)->AllRequiredPresent(), 1);
  EXPECT_EQ(list->GetSecRq(2)->AllRequiredPresent(), 0);  // none
  EXPECT_EQ(list->GetSecRq(2)->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_SECID);
  EXPECT_EQ(list->GetSecRq(1)->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_NONE);

  OEInvBuy buy;
  EXPECT_EQ(buy.GetSecID(0), nullptr);
  OESecID* id = buy.GetSecID(1);
  ASSERT_NE(id, nullptr);
  EXPECT_EQ(buy.GetSecID(), id);
  EXPECT_TRUE(buy.ValidateTag(OE_TAG_SECID));
  EXPECT_EQ(buy.GetSecID(1), id);  // made once
}

TEST_F(InvestTest, SecurityListReadsEveryKindAndFindsBySecurity) {
  InvRoot root;
  ASSERT_EQ(Parse("<SECLIST><STOCKINFO><SECINFO>" + std::string(kSecId) +
                      "<SECNAME>Acme<TICKER>ACME<UNITPRICE>10.5</SECINFO><STOCKTYPE>COMMON<ASSETCLASS>LARGESTOCK"
                      "</STOCKINFO><MFINFO><SECINFO><SECID><UNIQUEID>999<UNIQUEIDTYPE>CUSIP</SECID><SECNAME>Fund"
                      "</SECINFO><MFASSETCLASS><PORTION><ASSETCLASS>DOMESTICBOND<PERCENT>60</PORTION><PORTION>"
                      "<ASSETCLASS>LARGESTOCK<PERCENT>40</PORTION></MFASSETCLASS></MFINFO>"
                      "<DEBTINFO><SECINFO><SECID><UNIQUEID>555<UNIQUEIDTYPE>CUSIP</SECID><SECNAME>Bond</SECINFO>"
                      "<PARVALUE>1000<DEBTTYPE>COUPON<COUPONRT>5.25<DTMAT>20300101</DEBTINFO>"
                      "<OPTINFO><SECINFO><SECID><UNIQUEID>777<UNIQUEIDTYPE>CUSIP</SECID><SECNAME>Call</SECINFO>"
                      "<OPTTYPE>CALL<STRIKEPRICE>55<DTEXPIRE>20250117<SHPERCTRCT>100" + kSecId +
                      "</OPTINFO></SECLIST>",
                  root),
            OE_PARSE_OK);
  const OESecList* list = root.GetSecList();
  EXPECT_EQ(list->GetNumStockInfo(), 1);
  EXPECT_EQ(list->GetStockInfo(0)->GetAssetClass(), OE_ASSETCLASS_LARGESTOCK);
  ASSERT_EQ(list->GetMFInfo(0)->GetMFAssetClass()->GetNumPortion(), 2);
  EXPECT_EQ(list->GetMFInfo(0)->GetMFAssetClass()->GetPortion(0)->GetPercent(), OEPrecisionInteger(60));
  EXPECT_EQ(list->GetDebtInfo(0)->GetCouponRate(), OEPrecisionInteger(525, 2));
  EXPECT_EQ(list->GetOptInfo(0)->GetShPerCtrct(), 100u);
  EXPECT_EQ(list->GetOptInfo(0)->GetSecID()->GetUniqueID(), "123456789");  // the underlying
  // Each SECINFO knows its description.
  EXPECT_EQ(list->GetStockInfo(0)->GetSecInfo()->GetChildObj(), list->GetStockInfo(0));
  OESecID wanted;
  wanted.SetUniqueID("555");
  wanted.SetUniqueIDType("CUSIP");
  ASSERT_NE(list->FindSecInfo(wanted), nullptr);
  EXPECT_EQ(list->FindSecInfo(wanted)->GetSecName(), "Bond");
  wanted.SetUniqueIDType("ISIN");
  EXPECT_EQ(list->FindSecInfo(wanted), nullptr);
  // Written kind by kind: DEBTINFO, MFINFO, OPTINFO, STOCKINFO.
  std::string written = Write(*list);
  EXPECT_LT(written.find("<DEBTINFO>"), written.find("<MFINFO>"));
  EXPECT_LT(written.find("<MFINFO>"), written.find("<OPTINFO>"));
  EXPECT_LT(written.find("<OPTINFO>"), written.find("<STOCKINFO>"));
}

TEST_F(InvestTest, BadValuesWarnAndNothingReadIsLost) {
  InvRoot root;
  std::string text = Statement(
      BuyStock("B1", "20240102") +
      // An unknown kind of transaction, its content skipped whole.
      "<BUYCRYPTO><INVBUY>" + InvTran("X1", "20240102") + "</INVBUY></BUYCRYPTO>" +
      // Bad enumeration, amount and date texts.
      "<SELLSTOCK><INVSELL><INVTRAN><FITID>S1<DTTRADE>2024-01-03</INVTRAN>" + kSecId +
      "<UNITS>ten<UNITPRICE>60<TOTAL>600<SUBACCTSEC>VAULT<SUBACCTFUND>CASH</INVSELL><SELLTYPE>DUMP</SELLSTOCK>"
      // A buy without its security.
      "<BUYMF><INVBUY>" + InvTran("M1", "20240104") +
      "<UNITS>1<UNITPRICE>1<TOTAL>-1<SUBACCTSEC>CASH<SUBACCTFUND>CASH</INVBUY><BUYTYPE>BUY</BUYMF>" +
      BuyStock("B2", "20240105"));
  OEParseStatus status = Parse(text, root);
  EXPECT_EQ(status, OE_PARSE_WARNINGS);
  const OEInvTranList* list = root.GetStmtRs()->GetInvTranList();
  // Everything around the bad values is still there.
  ASSERT_EQ(list->GetNumBuyStock(), 2);
  EXPECT_EQ(list->GetBuyStock(1)->GetInvBuy()->GetInvTran()->GetFITId(), "B2");
  ASSERT_EQ(list->GetNumSellStock(), 1);
  OESellStock* sell = list->GetSellStock(0);
  EXPECT_FALSE(sell->ValidateTag(OE_TAG_SELLTYPE));
  EXPECT_FALSE(sell->GetInvSell()->ValidateTag(OE_TAG_UNITS));
  EXPECT_FALSE(sell->GetInvSell()->ValidateTag(OE_TAG_SUBACCTSEC));
  EXPECT_FALSE(sell->GetInvSell()->GetInvTran()->ValidateTag(OE_TAG_DTTRADE));
  EXPECT_EQ(sell->GetInvSell()->GetUnitPrice(), OEPrecisionInteger(60));
  EXPECT_EQ(sell->AllRequiredPresent(), 0);
  EXPECT_GE(Count(OEPW_BADFORMAT), 4u);
  EXPECT_TRUE(Logged(OEPW_UNKNOWNTAG) || Logged(OEPW_INVALIDAGG));
  ASSERT_EQ(list->GetNumBuyMF(), 1);
  EXPECT_EQ(list->GetBuyMF(0)->GetInvBuy()->AllRequiredPresent(), 0);
  EXPECT_EQ(list->GetBuyMF(0)->GetInvBuy()->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_SECID);
}

TEST_F(InvestTest, InvTranOutsideATransactionIsRefusedAndTheRestKept) {
  InvRoot root;
  std::string text = Statement(BuyStock("B1", "20240102") + InvTran("LOOSE", "20240103") + BuyStock("B2", "20240104"));
  EXPECT_EQ(Parse(text, root), OE_PARSE_WARNINGS);
  EXPECT_TRUE(Logged(OEPW_INVALIDAGG));
  const OEInvTranList* list = root.GetStmtRs()->GetInvTranList();
  ASSERT_EQ(list->GetNumBuyStock(), 2);
  EXPECT_EQ(list->GetBuyStock(1)->GetInvBuy()->GetInvTran()->GetFITId(), "B2");
}

TEST_F(InvestTest, ProfileOfTheInvestmentSet) {
  InvRoot root;
  ASSERT_EQ(Parse("<INVSTMTMSGSETV1><MSGSETCORE><VER>1<URL>https://x<OFXSEC>NONE<TRANSPSEC>Y<SIGNONREALM>R"
                  "<LANGUAGE>ENG<SYNCMODE>LITE<RESPFILEER>N</MSGSETCORE><TRANDNLD>Y<OODNLD>N<POSDNLD>Y<BALDNLD>Y"
                  "<CANEMAIL>N</INVSTMTMSGSETV1>",
                  root),
            OE_PARSE_OK);
  OEInvStmtMsgSetV1* set = root.GetInvSet();
  EXPECT_EQ(set->GetTranDnld(), 1);
  EXPECT_EQ(set->GetOODnld(), 0);
  EXPECT_EQ(set->AllRequiredPresent(), 1);
  EXPECT_NE(set->GetMessageSetCore(), nullptr);
}

}  // namespace
