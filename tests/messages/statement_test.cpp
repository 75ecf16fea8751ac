#include <gtest/gtest.h>

#include <cstdio>
#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"
#include "support/ofx_text.h"

namespace {
// A stand-in for the wrappers and lists that hold these aggregates.
#define T_STMT_ROOT_FIELDS(X)                                        \
  X(CHILD, BankRs, STMTRS, OEBankStatementRs)                        \
  X(CHILD, CCRs, CCSTMTRS, OECCStatementRs)                          \
  X(CHILD, BankRq, STMTRQ, OEBankStatementRq)                        \
  X(CHILD, CCRq, CCSTMTRQ, OECCStatementRq)                          \
  X(CHILD, Bank, BANKMSGSETV1, OEBankMessageSetV1)                   \
  X(CHILD, CreditCard, CREDITCARDMSGSETV1, OECreditCardMessageSetV1) \
  X(LIST, Balance, BAL, OEBalance)
class StmtRoot : public OEAggregate {
  OE_AGGREGATE(StmtRoot, T_STMT_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(StmtRoot, OEAggregate, T_STMT_ROOT_FIELDS, NONE,
                    .Valid(OE_TAGS(STMTRS, CCSTMTRS, STMTRQ, CCSTMTRQ, BANKMSGSETV1, CREDITCARDMSGSETV1, BAL)))

// Installs a factory for one test and puts the library's default back.
class FactoryScope {
 public:
  explicit FactoryScope(OEDataObjFactory* factory) { OEDataObj::SetFactory(factory); }
  ~FactoryScope() { OEDataObj::ResetFactory(); }
};

class StatementTest : public LogFixture {
 protected:
  OEParseStatus Parse(const std::string& text, StmtRoot& into, unsigned short checkRequired = 0) {
    return ParseText(text, &into, checkRequired);
  }
  // The object's text under its own tag, as its parent would write it.
  std::string Write(const OEDataObj& obj, OEBuildStatus* status = nullptr, OEBuildStringOpt option = OE_BUILD_STRICT) {
    WrittenText written = WriteUnderOwnTag(obj, option);
    if (status) *status = written.status;
    else EXPECT_EQ(written.status, OE_BUILD_OK);
    return written.text;
  }
  static std::string Amount(const OEPrecisionInteger& value) {
    char text[OEPrecisionInteger::kTextSize + 1];
    return value.FormatText(text) ? text : "";
  }
  static std::string Date(const OEDateTime& value) {
    OEString text;
    return value.GetDateString(text) ? text.c_str() : "";
  }
  // Warnings as "CODE TAG value" lines, for whole-log comparisons.
  std::string Warnings() const {
    std::string all;
    for (unsigned short i = 0; i < log->Entries(); ++i) {
      const OEParseException* w = log->Get(i);
      all += std::string(OEParseException::WarningName(w->warning)) + " " +
             OEUtility::TagToString(w->tag).c_str() + " " + w->value.c_str() + "\n";
    }
    return all;
  }
};

// A response with everything a bank statement carries, in the order a
// careless server might send it: balances before the transaction list.
const char kBankStatement[] =
    "<STMTRS><CURDEF>USD"
    "<BANKACCTFROM><BANKID>121000248<ACCTID>000123456789<ACCTTYPE>CHECKING</BANKACCTFROM>"
    "<LEDGERBAL><BALAMT>2156.56<DTASOF>20050831165056</LEDGERBAL>"
    "<BANKTRANLIST><DTSTART>20050801<DTEND>20050831165056.000[-7:PDT]"
    "<STMTTRN><TRNTYPE>CHECK<DTPOSTED>20050824080000<TRNAMT>-80.32<FITID>219378<CHEQUENUM>1044"
    "<PAYEE><NAME>FrogKick Scuba<ADDR1>1 Reef Rd<CITY>Key West<STATE>FL<POSTALCODE>33040<PHONE>305-555-0100</PAYEE>"
    "<CURRENCY><CURRATE>1.0<CURSYM>USD</CURRENCY></STMTTRN>"
    "<STMTTRN><TRNTYPE>XFER<DTPOSTED>20050825<DTUSER>20050824<DTAVAIL>20050826<TRNAMT>250.00<FITID>219379"
    "<CORRECTFITID>219300<CORRECTACTION>REPLACE<SRVRTID>S-77<REFNUM>R12<SIC>6011<PAYEEID>P9"
    "<NAME>Savings sweep<BANKACCTTO><BANKID>121000248<ACCTID>654321<ACCTTYPE>SAVINGS</BANKACCTTO>"
    "<MEMO>Monthly &amp; automatic<ORIGCURRENCY><CURRATE>1.0850<CURSYM>EUR</ORIGCURRENCY></STMTTRN>"
    "<STMTTRN><TRNTYPE>PAYMENT<DTPOSTED>20050830<TRNAMT>-45.10<FITID>219380<CHECKNUM>1045<NAME>Card payment"
    "<CCACCTTO><ACCTID>4111111111111111</CCACCTTO></STMTTRN>"
    "</BANKTRANLIST>"
    "<AVAILBAL><BALAMT>2000.00<DTASOF>20050831</AVAILBAL><MKTGINFO>Ask about our CDs</STMTRS>";
}  // namespace

TEST_F(StatementTest, ResponseWritesEverythingInItsOwnOrder) {
  // Filled back to front: the written order is the class's, not the caller's.
  OEBankStatementRs rs;
  EXPECT_EQ(rs.SetMarketingInfo("Free checking"), 1);
  OEAvailableBalance* avail = new OEAvailableBalance;
  avail->SetDateAsOf(OEString("20260131"));
  avail->SetBalanceAmount(OEString("90.00"));
  EXPECT_EQ(rs.SetAvailableBalance(avail), 1);
  OELedgerBalance* ledger = new OELedgerBalance;
  ledger->SetDateAsOf(OEString("20260131"));
  ledger->SetBalanceAmount(OEString("100.00"));
  EXPECT_EQ(rs.SetLedgerBalance(ledger), 1);

  OEBankStatementTx* tx = new OEBankStatementTx;
  OECurrency* currency = new OECurrency;
  currency->SetCurrencySymbol("CAD");
  currency->SetCurrencyRate(OEString("0.74"));
  currency->SetType(OE_TAG_ORIGCURRENCY);
  EXPECT_EQ(tx->SetCurrency(currency), 1);
  EXPECT_EQ(tx->ValidateTag(OE_TAG_ORIGCURRENCY), 1);
  EXPECT_EQ(tx->SetMemo("memo"), 1);
  OEBankOrCCAccount* to = OEBankOrCCAccount::NewAcctTo(OE_TAG_CCACCTTO);
  ASSERT_NE(to, nullptr);
  to->SetAccountID("4111");
  EXPECT_EQ(tx->SetAccountTo(to), 1);
  OEPayee* payee = new OEPayee;
  payee->SetName("Payee");
  EXPECT_EQ(tx->SetPayee(payee), 1);
  tx->SetName("Name");
  tx->SetPayeeId("P1");
  tx->SetSIC("5411");
  tx->SetReferenceNum("R1");
  tx->SetCheckNum("101");
  tx->SetServerTxId("S1");
  EXPECT_EQ(tx->SetCorrectAction(OE_BANKACTION_DELETE), 1);
  tx->SetCorrectedFITId("F0");
  tx->SetFITId("F1");
  tx->SetTxAmount(OEString("-12.5"));
  tx->SetDateTimeAvailable(OEString("20260103"));
  tx->SetDateTimeUser(OEString("20260101"));
  tx->SetDateTimePosted(OEString("20260102"));
  EXPECT_EQ(tx->SetTxType(OE_BANKTX_POS), 1);
  OEBankTransactionList* list = new OEBankTransactionList;
  EXPECT_EQ(list->AppendStatementTx(tx), 1);
  list->SetEndDateTime(OEString("20260131"));
  list->SetStartDateTime(OEString("20260101"));
  EXPECT_EQ(rs.SetBankTransactionList(list), 1);

  OEBankOrCCAccount* from = OEBankOrCCAccount::NewAcctFrom(OE_TAG_BANKACCTFROM);
  ASSERT_NE(from, nullptr);
  static_cast<OEBankAccount*>(from)->SetBankID("121000248");
  from->SetAccountID("1001");
  static_cast<OEBankAccount*>(from)->SetAccountType(OE_ACCTTYPE_CHECKING);
  EXPECT_EQ(rs.SetAccountFrom(from), 1);
  EXPECT_EQ(rs.SetCurrencyDefault("USD"), 1);

  EXPECT_EQ(Write(rs),
            "<STMTRS>\n<CURDEF>USD\n"
            "<BANKACCTFROM>\n<BANKID>121000248\n<ACCTID>1001\n<ACCTTYPE>CHECKING\n</BANKACCTFROM>\n"
            "<BANKTRANLIST>\n<DTSTART>20260101\n<DTEND>20260131\n"
            "<STMTTRN>\n<TRNTYPE>POS\n<DTPOSTED>20260102\n<DTUSER>20260101\n<DTAVAIL>20260103\n<TRNAMT>-12.5\n"
            "<FITID>F1\n<CORRECTFITID>F0\n<CORRECTACTION>DELETE\n<SRVRTID>S1\n<CHEQUENUM>101\n<REFNUM>R1\n"
            "<SIC>5411\n<PAYEEID>P1\n<NAME>Name\n<PAYEE>\n<NAME>Payee\n</PAYEE>\n"
            "<CCACCTTO>\n<ACCTID>4111\n</CCACCTTO>\n<MEMO>memo\n"
            "<ORIGCURRENCY>\n<CURRATE>.74\n<CURSYM>CAD\n</ORIGCURRENCY>\n</STMTTRN>\n"
            "</BANKTRANLIST>\n"
            "<LEDGERBAL>\n<BALAMT>100.00\n<DTASOF>20260131\n</LEDGERBAL>\n"
            "<AVAILBAL>\n<BALAMT>90.00\n<DTASOF>20260131\n</AVAILBAL>\n"
            "<MKTGINFO>Free checking\n</STMTRS>\n");
  EXPECT_EQ(rs.GetNumberOfChildren(), 4);
  EXPECT_EQ(rs.GetChild(0), from);
  EXPECT_EQ(log->Entries(), 0);
}

TEST_F(StatementTest, CreditCardResponseWritesTheDefaultCurrencyFirst) {
  StmtRoot root;
  ASSERT_EQ(Parse("<CCSTMTRS><CCACCTFROM><ACCTID>4111</CCACCTFROM>"
                  "<BANKTRANLIST><DTSTART>20240224<DTEND>20240326"
                  "<STMTTRN><TRNTYPE>DEBIT<DTPOSTED>20240323<TRNAMT>-13.00<FITID>A1<MEMO>coffee</STMTTRN>"
                  "</BANKTRANLIST><LEDGERBAL><BALAMT>-500.25<DTASOF>20240326</LEDGERBAL>"
                  "<CURDEF>BRL<MKTGINFO>Hi</CCSTMTRS>",
                  root, 1),
            OE_PARSE_OK);
  OECCStatementRs* rs = root.GetCCRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->GetType(), OE_TAG_CCSTMTRS);
  ASSERT_NE(rs->GetAccountFrom(), nullptr);
  EXPECT_NE(dynamic_cast<OECCAccount*>(rs->GetAccountFrom()), nullptr);
  EXPECT_EQ(rs->GetAvailableBalance(), nullptr);
  EXPECT_EQ(Write(*rs),
            "<CCSTMTRS>\n<CURDEF>BRL\n<CCACCTFROM>\n<ACCTID>4111\n</CCACCTFROM>\n"
            "<BANKTRANLIST>\n<DTSTART>20240224\n<DTEND>20240326\n"
            "<STMTTRN>\n<TRNTYPE>DEBIT\n<DTPOSTED>20240323\n<TRNAMT>-13.00\n<FITID>A1\n<MEMO>coffee\n</STMTTRN>\n"
            "</BANKTRANLIST>\n<LEDGERBAL>\n<BALAMT>-500.25\n<DTASOF>20240326\n</LEDGERBAL>\n"
            "<MKTGINFO>Hi\n</CCSTMTRS>\n");

  // A bank account tag has no place in a credit-card statement.
  StmtRoot other;
  EXPECT_EQ(Parse("<CCSTMTRS><BANKACCTFROM><ACCTID>1</BANKACCTFROM><CURDEF>USD</CCSTMTRS>", other),
            OE_PARSE_WARNINGS);
  EXPECT_EQ(other.GetCCRs()->GetAccountFrom(), nullptr);
  EXPECT_EQ(other.GetCCRs()->GetCurrencyDefault(), "USD");
}

TEST_F(StatementTest, ParsesTransactionsAndWritesThemBack) {
  StmtRoot root;
  EXPECT_EQ(Parse(kBankStatement, root), OE_PARSE_WARNINGS);
  // The only warning: CHECKNUM is no OFX tag; the cheque number is CHEQUENUM.
  EXPECT_EQ(Warnings(), "OEPW_UNKNOWNTAG TAG UNKNOWN \n");

  OEBankStatementRs* rs = root.GetBankRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->GetCurrencyDefault(), "USD");
  EXPECT_EQ(rs->GetMarketingInfo(), "Ask about our CDs");
  OEBankAccount* from = dynamic_cast<OEBankAccount*>(rs->GetAccountFrom());
  ASSERT_NE(from, nullptr);
  EXPECT_EQ(from->GetAccountID(), "000123456789");
  EXPECT_EQ(Amount(rs->GetLedgerBalance()->GetBalanceAmount()), "2156.56");
  EXPECT_EQ(Date(rs->GetAvailableBalance()->GetDateAsOf()), "20050831");
  OEBankTransactionList* list = rs->GetBankTransactionList();
  ASSERT_NE(list, nullptr);
  EXPECT_EQ(Date(list->GetEndDateTime()), "20050831165056.000[-7:PDT]");
  ASSERT_EQ(list->GetNumStatementTx(), 3);
  EXPECT_EQ(list->GetNumberOfChildren(), 3);

  const OEBankStatementTx* check = list->GetStatementTx(0);
  EXPECT_EQ(check->GetTxType(), OE_BANKTX_CHECK);
  EXPECT_EQ(check->GetCheckNum(), "1044");
  ASSERT_NE(check->GetPayee(), nullptr);
  EXPECT_EQ(check->GetPayee()->GetCity(), "Key West");
  EXPECT_EQ(check->GetPayee()->AllRequiredPresent(), 1);
  ASSERT_NE(check->GetCurrency(), nullptr);
  EXPECT_EQ(check->GetCurrency()->GetType(), OE_TAG_CURRENCY);
  EXPECT_EQ(check->GetAccountTo(), nullptr);

  const OEBankStatementTx* xfer = list->GetStatementTx(1);
  EXPECT_EQ(Date(xfer->GetDateTimeUser()), "20050824");
  EXPECT_EQ(Date(xfer->GetDateTimeAvailable()), "20050826");
  EXPECT_EQ(xfer->GetCorrectAction(), OE_BANKACTION_REPLACE);
  EXPECT_EQ(xfer->GetCorrectedFITId(), "219300");
  EXPECT_EQ(xfer->GetServerTxId(), "S-77");
  EXPECT_EQ(xfer->GetReferenceNum(), "R12");
  EXPECT_EQ(xfer->GetSIC(), "6011");
  EXPECT_EQ(xfer->GetPayeeId(), "P9");
  EXPECT_EQ(xfer->GetMemo(), "Monthly & automatic");
  ASSERT_NE(xfer->GetCurrency(), nullptr);
  EXPECT_EQ(xfer->GetCurrency()->GetType(), OE_TAG_ORIGCURRENCY);
  EXPECT_EQ(xfer->ValidateTag(OE_TAG_ORIGCURRENCY), 1);
  EXPECT_EQ(xfer->ValidateTag(OE_TAG_CURRENCY), 0);
  EXPECT_EQ(Amount(xfer->GetCurrency()->GetCurrencyRate()), "1.0850");
  OEBankAccount* to = dynamic_cast<OEBankAccount*>(xfer->GetAccountTo());
  ASSERT_NE(to, nullptr);
  EXPECT_EQ(to->GetType(), OE_TAG_BANKACCTTO);
  EXPECT_EQ(to->GetAccountType(), OE_ACCTTYPE_SAVINGS);

  const OEBankStatementTx* payment = list->GetStatementTx(2);
  EXPECT_EQ(payment->ValidateTag(OE_TAG_CHEQUENUM), 0);
  ASSERT_NE(dynamic_cast<OECCAccount*>(payment->GetAccountTo()), nullptr);
  EXPECT_EQ(payment->GetAccountTo()->GetType(), OE_TAG_CCACCTTO);
  EXPECT_EQ(payment->ValidateTag(OE_TAG_CCACCTTO), 1);

  // Written back: the list before the ledger balance, the currency under the
  // tag it came with, the cheque number only as CHEQUENUM.
  std::string text = Write(*rs);
  EXPECT_LT(text.find("<BANKTRANLIST>"), text.find("<LEDGERBAL>"));
  EXPECT_NE(text.find("<MEMO>Monthly &amp; automatic\n<ORIGCURRENCY>\n<CURRATE>1.0850\n<CURSYM>EUR\n</ORIGCURRENCY>"),
            std::string::npos);
  EXPECT_NE(text.find("<NAME>Savings sweep\n<BANKACCTTO>\n"), std::string::npos);
  EXPECT_NE(text.find("<CHEQUENUM>1044\n"), std::string::npos);
  EXPECT_EQ(text.find("CHECKNUM"), std::string::npos);

  // Read again, nothing is lost: the second reading writes the same text.
  log->DeleteAll();
  StmtRoot again;
  EXPECT_EQ(Parse(text, again, 1), OE_PARSE_OK);
  ASSERT_NE(again.GetBankRs(), nullptr);
  EXPECT_EQ(Write(*again.GetBankRs()), text);
  EXPECT_EQ(again.GetBankRs()->GetBankTransactionList()->GetStatementTx(1)->GetCurrency()->GetType(),
            OE_TAG_ORIGCURRENCY);
}

TEST_F(StatementTest, TransactionChoiceRules) {
  OEBankStatementTx tx;
  // The missing-tag walk: required tags, then both tags of each open choice.
  const OETagID expected[] = {OE_TAG_TRNTYPE, OE_TAG_DTPOSTED, OE_TAG_TRNAMT,     OE_TAG_FITID,
                              OE_TAG_NAME,    OE_TAG_PAYEE,    OE_TAG_BANKACCTTO, OE_TAG_CCACCTTO};
  OETagID after = OE_TAG_NONE;
  for (OETagID tag : expected) {
    after = tx.GetFirstMissingRequiredTag(after);
    EXPECT_EQ(after, tag);
  }
  EXPECT_EQ(tx.GetFirstMissingRequiredTag(after), OE_TAG_NONE);
  EXPECT_EQ(tx.AllRequiredPresent(), 0);

  tx.SetTxType(OE_BANKTX_DEBIT);
  tx.SetDateTimePosted(OEString("20260101"));
  tx.SetTxAmount(OEString("-1"));
  tx.SetFITId("1");
  // Neither name nor account is needed for completeness, though the walk
  // still names the choices that are open.
  EXPECT_EQ(tx.AllRequiredPresent(), 1);
  EXPECT_EQ(tx.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_NAME);
  tx.SetName("Shop");
  EXPECT_EQ(tx.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_BANKACCTTO);
  EXPECT_EQ(tx.GetFirstMissingRequiredTag(OE_TAG_BANKACCTTO), OE_TAG_CCACCTTO);
  EXPECT_EQ(tx.GetFirstMissingRequiredTag(OE_TAG_CCACCTTO), OE_TAG_NONE);
  EXPECT_EQ(tx.AllRequiredPresent(), 1);

  // Both of a pair: incomplete.
  EXPECT_EQ(tx.SetPayee(new OEPayee), 1);
  EXPECT_EQ(tx.AllRequiredPresent(), 0);
  OEBankStatementTx accounts;
  accounts.SetTxType(OE_BANKTX_XFER);
  accounts.SetDateTimePosted(OEString("20260101"));
  accounts.SetTxAmount(OEString("5"));
  accounts.SetFITId("2");
  accounts.SetAccountTo(OEBankOrCCAccount::NewAcctTo(OE_TAG_BANKACCTTO));
  EXPECT_EQ(accounts.AllRequiredPresent(), 1);
  accounts.SetTag(OE_TAG_CCACCTTO);
  EXPECT_EQ(accounts.AllRequiredPresent(), 0);

  // A statement whose transaction has both is reported by a checking parse.
  StmtRoot root;
  EXPECT_EQ(Parse("<STMTRS><CURDEF>USD<BANKACCTFROM><BANKID>1<ACCTID>2<ACCTTYPE>SAVINGS</BANKACCTFROM>"
                  "<BANKTRANLIST><DTSTART>20260101<DTEND>20260102<STMTTRN><TRNTYPE>FEE<DTPOSTED>20260101"
                  "<TRNAMT>-1<FITID>9<NAME>Fee<PAYEE><NAME>Bank</PAYEE></STMTTRN></BANKTRANLIST>"
                  "<LEDGERBAL><BALAMT>1<DTASOF>20260102</LEDGERBAL></STMTRS>",
                  root, 1),
            OE_PARSE_WARNINGS);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_MISSINGTAG);
  EXPECT_EQ(log->Get(0)->object, root.GetBankRs()->GetBankTransactionList()->GetStatementTx(0));
}

TEST_F(StatementTest, RequestsHoldOneAccountAndWriteInOrder) {
  OEBankStatementRq rq;
  EXPECT_EQ(rq.GetType(), OE_TAG_STMTRQ);
  OEIncTransaction* inc = new OEIncTransaction;
  EXPECT_EQ(inc->SetInclude(OEString("Y")), 1);
  EXPECT_EQ(inc->SetDtStart(OEString("20260101")), 1);
  EXPECT_EQ(rq.SetIncTransaction(inc), 1);
  EXPECT_EQ(rq.ValidateTag(OE_TAG_INCTRAN), 1);

  OEBankAccount* first = new OEBankAccount;
  first->SetBankID("121000248");
  first->SetAccountID("1001");
  first->SetAccountType(OE_ACCTTYPE_CHECKING);
  EXPECT_EQ(rq.SetAccountFrom(first), 1);
  OEBankAccount second;  // refused: still the caller's
  EXPECT_EQ(rq.SetAccountFrom(&second), 0);
  EXPECT_EQ(rq.GetAccountFrom(), first);
  EXPECT_EQ(rq.AllRequiredPresent(), 1);
  EXPECT_EQ(Write(rq),
            "<STMTRQ>\n<BANKACCTFROM>\n<BANKID>121000248\n<ACCTID>1001\n<ACCTTYPE>CHECKING\n</BANKACCTFROM>\n"
            "<INCTRAN>\n<DTSTART>20260101\n<INCLUDE>Y\n</INCTRAN>\n</STMTRQ>\n");

  // The credit-card request marks the account under its own tag.
  OECCStatementRq cc;
  EXPECT_EQ(cc.AllRequiredPresent(), 0);
  EXPECT_EQ(cc.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_CCACCTFROM);
  OECCAccount* card = new OECCAccount;
  card->SetAccountID("4111");
  EXPECT_EQ(cc.SetAccountFrom(card), 1);
  EXPECT_EQ(cc.ValidateTag(OE_TAG_CCACCTFROM), 1);
  EXPECT_EQ(Write(cc), "<CCSTMTRQ>\n<CCACCTFROM>\n<ACCTID>4111\n</CCACCTFROM>\n</CCSTMTRQ>\n");

  // Parsed, an INCTRAN without INCLUDE is incomplete.
  StmtRoot root;
  EXPECT_EQ(Parse("<CCSTMTRQ><CCACCTFROM><ACCTID>4111</CCACCTFROM><INCTRAN><DTEND>20260131</INCTRAN></CCSTMTRQ>",
                  root, 1),
            OE_PARSE_WARNINGS);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_INCLUDE);
  EXPECT_EQ(log->Get(0)->object, root.GetCCRq()->GetIncTransaction());
}

TEST_F(StatementTest, BadValuesAreLoggedOnceAndLeftAbsent) {
  StmtRoot root;
  std::string longName(40, 'N');
  EXPECT_EQ(Parse("<STMTRS><CURDEF>USDX<BANKTRANLIST><DTSTART>2026-01-01<DTEND>20260131"
                  "<STMTTRN><TRNTYPE>BOGUS<DTPOSTED>20260101<TRNAMT>12x<FITID>1<CORRECTACTION>UNDO<NAME>" +
                      longName + "</STMTTRN></BANKTRANLIST>"
                                 "<LEDGERBAL><BALAMT>1,000.00<DTASOF>20260131</LEDGERBAL></STMTRS>",
                  root),
            OE_PARSE_WARNINGS);
  EXPECT_EQ(Warnings(),
            "OEPW_TOOLONG CURDEF USDX\n"
            "OEPW_BADFORMAT DTSTART 2026-01-01\n"
            "OEPW_BADFORMAT TRNTYPE BOGUS\n"
            "OEPW_BADFORMAT TRNAMT 12x\n"
            "OEPW_BADFORMAT CORRECTACTION UNDO\n"
            "OEPW_TOOLONG NAME " + longName + "\n"
            "OEPW_BADFORMAT BALAMT 1,000.00\n");
  OEBankStatementRs* rs = root.GetBankRs();
  OEBankTransactionList* list = rs->GetBankTransactionList();
  OEBankStatementTx* tx = list->GetStatementTx(0);
  EXPECT_EQ(log->Get(0)->object, rs);
  EXPECT_EQ(log->Get(1)->object, list);
  EXPECT_EQ(log->Get(2)->object, tx);
  EXPECT_EQ(log->Get(6)->object, rs->GetLedgerBalance());

  // Texts too long are kept whole and present; unconverted values are absent.
  EXPECT_EQ(rs->GetCurrencyDefault(), "USDX");
  EXPECT_EQ(tx->GetName().GetStrLength(), 40);
  EXPECT_EQ(tx->ValidateTag(OE_TAG_NAME), 1);
  EXPECT_EQ(list->ValidateTag(OE_TAG_DTSTART), 0);
  EXPECT_EQ(tx->ValidateTag(OE_TAG_TRNTYPE), 0);
  EXPECT_EQ(tx->ValidateTag(OE_TAG_TRNAMT), 0);
  EXPECT_EQ(tx->ValidateTag(OE_TAG_CORRECTACTION), 0);
  EXPECT_EQ(tx->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_TRNTYPE);
  EXPECT_EQ(tx->GetFirstMissingRequiredTag(OE_TAG_TRNTYPE), OE_TAG_TRNAMT);
  EXPECT_EQ(rs->GetLedgerBalance()->AllRequiredPresent(), 0);

  // A strict build refuses the over-long default currency; a lenient one cuts it.
  OEBuildStatus status;
  Write(*rs, &status);
  EXPECT_EQ(status, OE_BUILD_TOO_LONG);
  std::string lenient = Write(*rs, &status, OE_BUILD_LENIENT);
  EXPECT_EQ(status, OE_BUILD_OK);
  EXPECT_EQ(lenient.find("<STMTRS>\n<CURDEF>USD\n<BANKTRANLIST>\n<DTEND>20260131\n<STMTTRN>\n<DTPOSTED>"), 0u);
}

TEST_F(StatementTest, DeepCopiesOfRequests) {
  OECCStatementRq source;
  OEBankOrCCAccount* card = OEBankOrCCAccount::NewAcctFrom(OE_TAG_CCACCTFROM);
  card->SetAccountID("4111");
  card->SetAccountKey("K");
  source.SetAccountFrom(card);
  OEIncTransaction* inc = new OEIncTransaction;
  inc->SetInclude(1);
  inc->SetDtEnd(OEString("20260131"));
  source.SetIncTransaction(inc);

  // Whatever the target held is replaced by copies of the source's children.
  OECCStatementRq target;
  OECCAccount* old = new OECCAccount;
  old->SetAccountID("9999");
  target.SetAccountFrom(old);
  OETransBase* asTrans = &target;
  EXPECT_EQ(asTrans->DeepCopyFrom(&source), 1);
  ASSERT_NE(target.GetAccountFrom(), nullptr);
  EXPECT_NE(target.GetAccountFrom(), card);
  EXPECT_EQ(target.GetAccountFrom()->GetType(), OE_TAG_CCACCTFROM);
  EXPECT_EQ(target.GetAccountFrom()->GetAccountKey(), "K");
  ASSERT_NE(target.GetIncTransaction(), nullptr);
  EXPECT_NE(target.GetIncTransaction(), inc);
  EXPECT_EQ(Write(target), Write(source));
  card->SetAccountID("1234");  // the copy is independent
  EXPECT_EQ(target.GetAccountFrom()->GetAccountID(), "4111");

  // A source without included transactions removes the target's.
  OECCStatementRq bare;
  bare.SetAccountFrom(OEBankOrCCAccount::NewAcctFrom(OE_TAG_CCACCTFROM));
  EXPECT_EQ(target.DeepCopyFrom(&bare), 1);
  EXPECT_EQ(target.GetIncTransaction(), nullptr);
  EXPECT_EQ(target.ValidateTag(OE_TAG_INCTRAN), 0);

  // Only a request of the same class is copied.
  OEBankStatementRq bank;
  EXPECT_EQ(bank.DeepCopyFrom(static_cast<const OETransBase*>(&source)), 0);
  EXPECT_EQ(bank.GetAccountFrom(), nullptr);
}

namespace {
struct FailingFactory : OEDataObjFactory {
  OEIncTransaction* NewIncTransaction() override { return nullptr; }
  OEBankStatementTx* NewStatementTx() override { return nullptr; }
};
// A factory that makes an application's own transaction class.
struct MyTx : OEBankStatementTx {};
struct MyFactory : OEDataObjFactory {
  OEBankStatementTx* NewStatementTx() override { return new MyTx; }
};
}  // namespace

TEST_F(StatementTest, DeepCopiesOfResponsesAndFactoryFailures) {
  StmtRoot root;
  Parse(kBankStatement, root);
  OEBankStatementRs copy;
  EXPECT_EQ(copy.DeepCopyFrom(root.GetBankRs()), 1);
  EXPECT_EQ(Write(copy), Write(*root.GetBankRs()));
  OEBankTransactionList* list = copy.GetBankTransactionList();
  ASSERT_EQ(list->GetNumStatementTx(), 3);
  EXPECT_NE(list->GetStatementTx(0), root.GetBankRs()->GetBankTransactionList()->GetStatementTx(0));
  EXPECT_EQ(list->GetStatementTx(1)->GetAccountTo()->GetType(), OE_TAG_BANKACCTTO);
  EXPECT_EQ(list->GetStatementTx(2)->GetAccountTo()->GetType(), OE_TAG_CCACCTTO);
  // A shorter source list leaves the copy with exactly its elements.
  OEBankTransactionList shorter;
  shorter.AppendStatementTx(new OEBankStatementTx);
  EXPECT_EQ(list->DeepCopyFrom(&shorter), 1);
  EXPECT_EQ(list->GetNumStatementTx(), 1);
  list->ClearStatementTx();
  EXPECT_EQ(list->GetNumStatementTx(), 0);
  EXPECT_EQ(list->ValidateTag(OE_TAG_STMTTRN), 0);

  {
    FailingFactory failing;
    FactoryScope scope(&failing);
    // A child that cannot be made stops the parse with status 3.
    StmtRoot broken;
    EXPECT_EQ(Parse("<STMTRS><BANKTRANLIST><STMTTRN><FITID>1</STMTTRN></BANKTRANLIST></STMTRS>", broken),
              OE_PARSE_NO_PARSER);
    EXPECT_EQ(broken.GetBankRs()->GetBankTransactionList()->GetNumStatementTx(), 0);

    OEBankStatementRq source;
    source.SetIncTransaction(new OEIncTransaction);
    OEBankStatementRq target;
    g_allocFailed = 0;
    EXPECT_EQ(target.DeepCopyFrom(&source), 0);
    EXPECT_EQ(g_allocFailed, 1);
    g_allocFailed = 0;
  }
  {
    MyFactory mine;
    FactoryScope scope(&mine);
    StmtRoot custom;
    EXPECT_EQ(Parse(kBankStatement, custom), OE_PARSE_WARNINGS);
    OEBankTransactionList* parsed = custom.GetBankRs()->GetBankTransactionList();
    ASSERT_EQ(parsed->GetNumStatementTx(), 3);
    EXPECT_NE(dynamic_cast<MyTx*>(parsed->GetStatementTx(2)), nullptr);
  }
}

TEST_F(StatementTest, InnerTransactionsAreMadeByTag) {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  struct Row {
    OETagID tag;
    bool (*is)(OETransBase*);
  } rows[] = {
      {OE_TAG_STMTRQ, [](OETransBase* p) { return dynamic_cast<OEBankStatementRq*>(p) != nullptr; }},
      {OE_TAG_STMTRS, [](OETransBase* p) { return dynamic_cast<OEBankStatementRs*>(p) != nullptr; }},
      {OE_TAG_CCSTMTRQ, [](OETransBase* p) { return dynamic_cast<OECCStatementRq*>(p) != nullptr; }},
      {OE_TAG_CCSTMTRS, [](OETransBase* p) { return dynamic_cast<OECCStatementRs*>(p) != nullptr; }},
  };
  for (const Row& row : rows) {
    OETransBase* made = OENewInnerTrans(factory, row.tag);
    ASSERT_NE(made, nullptr);
    EXPECT_TRUE(row.is(made));
    EXPECT_EQ(made->GetType(), row.tag);
    delete made;
  }
}

// A long statement in the form the builder writes reads and writes back
// unchanged.
TEST_F(StatementTest, LongStatementRoundTrip) {
  const int count = 17000;
  std::string text =
      "<STMTRS>\n<CURDEF>USD\n<BANKACCTFROM>\n<BANKID>121000248\n<ACCTID>000123456789\n<ACCTTYPE>CHECKING\n"
      "</BANKACCTFROM>\n<BANKTRANLIST>\n<DTSTART>20200101\n<DTEND>20261122\n";
  char line[256];
  for (int i = 0; i < count; ++i) {
    snprintf(line, sizeof line,
             "<STMTTRN>\n<TRNTYPE>%s\n<DTPOSTED>2026%02d%02d120000.000[-5:EST]\n<TRNAMT>%d.%02d\n<FITID>%012d\n"
             "<NAME>Payee %d &amp; co\n<MEMO>Transaction %d\n</STMTTRN>\n",
             i % 2 ? "DEBIT" : "CREDIT", 1 + i % 12, 1 + i % 28, i % 2 ? -(1 + i % 5000) : 1 + i % 5000, i % 100,
             1000000 + i, i % 97, i);
    text += line;
  }
  text += "</BANKTRANLIST>\n<LEDGERBAL>\n<BALAMT>12345.67\n<DTASOF>20261122\n</LEDGERBAL>\n</STMTRS>\n";
  StmtRoot root;
  ASSERT_EQ(Parse(text, root, 1), OE_PARSE_OK);
  OEBankTransactionList* list = root.GetBankRs()->GetBankTransactionList();
  ASSERT_EQ(list->GetNumStatementTx(), count);
  EXPECT_EQ(list->GetStatementTx(count - 1)->GetFITId(), "000001016999");
  // Compared by hand: a failing comparison of two long texts would make the
  // test framework compute their whole difference.
  std::string written = Write(*root.GetBankRs());
  size_t differ = 0;
  while (differ < written.size() && differ < text.size() && written[differ] == text[differ]) ++differ;
  EXPECT_EQ(written.size(), text.size());
  EXPECT_EQ(differ, text.size()) << written.substr(differ < 60 ? 0 : differ - 60, 120);
}

// The bank message set as written: core, sub-profiles, then the elements.
namespace {
// The profile side of the bank and credit-card message sets.
class BankProfileTest : public StatementTest {};

const char kBankMessageSet[] =
    "<BANKMSGSETV1>\n"
    "<MSGSETCORE>\n<VER>1\n<URL>https://ofx.example.com/cgi\n<OFXSEC>NONE\n<TRANSPSEC>Y\n<SIGNONREALM>Main\n"
    "<LANGUAGE>ENG\n<LANGUAGE>FRA\n<LANGUAGE>SPA\n<SYNCMODE>LITE\n<RESPFILEER>N\n<SPNAME>Hosting Co\n"
    "<VEXA.TIMEOUT>90\n<VEXA.MSSCERTID>C1\n<VEXA.MSSCERTID>C2\n<VEXA.TYPE1CERTID>T1\n</MSGSETCORE>\n"
    "<XFERPROF>\n<PROCDAYSOFF>SATURDAY\n<PROCDAYSOFF>SUNDAY\n<PROCENDTM>170000\n<CANSCHED>Y\n<CANRECUR>Y\n"
    "<CANMODXFERS>N\n<CANMODMDLS>Y\n<MODELWND>30\n<DAYSWITH>-1\n<DFLTDAYSTOPAY>3\n</XFERPROF>\n"
    "<STPCHKPROF>\n<PROCDAYSOFF>SUNDAY\n<PROCENDTM>150000\n<CANUSERANGE>Y\n<CANUSEDESC>N\n<STPCHKFEE>15.00\n"
    "</STPCHKPROF>\n"
    "<EMAILPROF>\n<CANEMAIL>Y\n<CANNOTIFY>N\n</EMAILPROF>\n"
    "<INVALIDACCTTYPE>CHECKING\n<INVALIDACCTTYPE>SAVINGS\n<CLOSINGAVAIL>Y\n"
    "</BANKMSGSETV1>\n";
}  // namespace

TEST_F(BankProfileTest, BankMessageSetReadsAndWritesEveryPart) {
  // Read in another order, with an account type that does not exist.
  StmtRoot root;
  std::string text(kBankMessageSet);
  text.replace(text.find("<INVALIDACCTTYPE>SAVINGS"), 0, "<INVALIDACCTTYPE>OVERDRAFT\n");
  text.replace(text.find("<CLOSINGAVAIL>Y\n"), 16, "");
  text.replace(text.find("<MSGSETCORE>"), 0, "<CLOSINGAVAIL>Y\n");
  EXPECT_EQ(Parse(text, root, 1), OE_PARSE_WARNINGS);
  ASSERT_EQ(log->Entries(), 1);
  OEBankMessageSetV1* bank = root.GetBank();
  ASSERT_NE(bank, nullptr);
  EXPECT_EQ(log->Get(0)->warning, OEPW_BADFORMAT);
  EXPECT_EQ(log->Get(0)->value, "OVERDRAFT");
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_INVALIDACCTTYPE);
  EXPECT_EQ(log->Get(0)->object, bank);

  ASSERT_EQ(bank->GetNumInvalidBankAccountTypes(), 2);
  EXPECT_EQ(*bank->GetInvalidBankAccountType(0), OE_ACCTTYPE_CHECKING);
  EXPECT_EQ(*bank->GetInvalidBankAccountType(1), OE_ACCTTYPE_SAVINGS);
  EXPECT_EQ(bank->GetClosingAvailable(), 1);
  EXPECT_EQ(bank->AllRequiredPresent(), 1);
  const OEMessageSetCore* core = bank->GetMessageSetCore();
  ASSERT_NE(core, nullptr);
  EXPECT_EQ(core->GetVer(), 1);
  EXPECT_EQ(core->GetSyncMode(), OE_SYNCMODE_LITE);
  ASSERT_EQ(core->GetNumLanguage(), 3);
  EXPECT_EQ(core->GetLanguage(2)->GetString(), "SPA");
  ASSERT_EQ(core->GetNumVexaMSSCertID(), 2);
  EXPECT_EQ(*core->GetVexaMSSCertID(1), "C2");
  EXPECT_EQ(core->GetVexaTimeout(), 90);
  ASSERT_NE(bank->GetXferProfile(), nullptr);
  EXPECT_EQ(bank->GetXferProfile()->GetNumberDayOfWeek(), 2);
  EXPECT_EQ(*bank->GetXferProfile()->GetDayOfWeek(1), OE_DAY_SUNDAY);
  EXPECT_EQ(bank->GetXferProfile()->GetDaysWithdrawn(), -1);
  EXPECT_EQ(bank->GetStopCheckProfile()->GetCanUseDescription(), 0);
  EXPECT_EQ(bank->GetEMailProfile()->GetCanEMail(), 1);
  EXPECT_EQ(bank->GetNumberOfChildren(), 4);

  EXPECT_EQ(Write(*bank), kBankMessageSet);

  // Copied through the version base, the copy writes the same.
  OEBankMessageSetV1 copy;
  OEMessageSetVersion* asVersion = &copy;
  EXPECT_EQ(asVersion->DeepCopyFrom(bank), 1);
  EXPECT_NE(copy.GetEMailProfile(), bank->GetEMailProfile());
  EXPECT_EQ(Write(copy), kBankMessageSet);
}

TEST_F(BankProfileTest, MessageSetValuesSetByTheApplication) {
  OEBankMessageSetV1 bank;
  EXPECT_EQ(bank.AllRequiredPresent(), 0);
  EXPECT_EQ(bank.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_MSGSETCORE);
  EXPECT_EQ(bank.GetFirstMissingRequiredTag(OE_TAG_MSGSETCORE), OE_TAG_EMAILPROF);
  EXPECT_EQ(bank.AppendInvalidBankAccountType(OE_ACCTTYPE_CREDITLINE), 1);
  EXPECT_EQ(bank.AppendInvalidBankAccountType(OEString("MONEYMRKT")), 1);
  EXPECT_EQ(bank.SetInvalidBankAccountType(0, OEString("SAVINGS")), 1);
  EXPECT_EQ(bank.SetInvalidBankAccountType(5, OE_ACCTTYPE_CHECKING), 0);  // past the end
  EXPECT_EQ(bank.AppendInvalidBankAccountType(OEString("LOAN")), 0);
  EXPECT_EQ(log->Entries(), 1);
  ASSERT_EQ(bank.GetNumInvalidBankAccountTypes(), 2);
  EXPECT_EQ(*bank.GetInvalidBankAccountType(0), OE_ACCTTYPE_SAVINGS);
  EXPECT_EQ(bank.GetInvalidBankAccountType(2), nullptr);
  EXPECT_EQ(bank.SetClosingAvailable(OEString("N")), 1);
  EXPECT_EQ(bank.ValidateTag(OE_TAG_CLOSINGAVAIL), 1);
  EXPECT_EQ(bank.SetMessageSetCore(new OEMessageSetCore), 1);
  EXPECT_EQ(bank.SetEMailProfile(new OEEMailProfile), 1);
  EXPECT_EQ(bank.AllRequiredPresent(), 1);
  EXPECT_EQ(Write(bank),
            "<BANKMSGSETV1>\n<MSGSETCORE>\n</MSGSETCORE>\n<EMAILPROF>\n</EMAILPROF>\n"
            "<INVALIDACCTTYPE>SAVINGS\n<INVALIDACCTTYPE>MONEYMRKT\n<CLOSINGAVAIL>N\n</BANKMSGSETV1>\n");
  bank.ClearInvalidBankAccountType();
  EXPECT_EQ(bank.ValidateTag(OE_TAG_INVALIDACCTTYPE), 0);

  OEMessageSetCore core;
  EXPECT_EQ(core.AppendLanguage(OEString("ENG")), 1);
  EXPECT_EQ(core.AppendVexaType1CertID(OEString("")), 0);  // an empty text is no id
  EXPECT_EQ(core.GetNumVexaType1CertID(), 0);
  EXPECT_EQ(core.SetOFXSecurity(OEString("TYPE2")), 0);
  EXPECT_EQ(core.SetVer(OEString("1.5")), 0);
  EXPECT_EQ(log->Entries(), 4);
}

TEST_F(BankProfileTest, CreditCardMessageSetAndABadFlag) {
  StmtRoot root;
  EXPECT_EQ(Parse("<CREDITCARDMSGSETV1><MSGSETCORE><VER>1</MSGSETCORE><CLOSINGAVAIL>maybe</CREDITCARDMSGSETV1>", root),
            OE_PARSE_WARNINGS);
  OECreditCardMessageSetV1* cc = root.GetCreditCard();
  ASSERT_NE(cc, nullptr);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_BADFORMAT);
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_CLOSINGAVAIL);
  EXPECT_EQ(log->Get(0)->object, cc);
  EXPECT_EQ(cc->ValidateTag(OE_TAG_CLOSINGAVAIL), 0);
  EXPECT_EQ(cc->AllRequiredPresent(), 0);
  EXPECT_EQ(cc->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_CLOSINGAVAIL);
  EXPECT_EQ(cc->SetClosingAvailable(1), 1);
  EXPECT_EQ(Write(*cc), "<CREDITCARDMSGSETV1>\n<MSGSETCORE>\n<VER>1\n</MSGSETCORE>\n<CLOSINGAVAIL>Y\n"
                        "</CREDITCARDMSGSETV1>\n");
  OECreditCardMessageSetV1 copy;
  EXPECT_EQ(copy.DeepCopyFrom(cc), 1);
  EXPECT_EQ(Write(copy), Write(*cc));
  // A version of another set is not copied.
  OEBankMessageSetV1 bank;
  EXPECT_EQ(bank.DeepCopyFrom(static_cast<OEMessageSetVersion*>(cc)), 0);
}

TEST_F(BankProfileTest, BalancesWriteInTheirOrder) {
  StmtRoot root;
  EXPECT_EQ(Parse("<BAL><NAME>Margin<DESC>Margin balance<BALTYPE>DOLLAR<VALUE>1200.50<DTASOF>20260101"
                  "<CURRENCY><CURRATE>1.1<CURSYM>EUR</CURRENCY></BAL>"
                  "<BAL><NAME>Rate<DESC>Interest<BALTYPE>RATE<VALUE>4.5</BAL>",
                  root, 1),
            OE_PARSE_WARNINGS);
  ASSERT_EQ(root.GetNumBalance(), 2);
  const OEBalance* margin = root.GetBalance(0);
  EXPECT_EQ(margin->GetBalanceType(), OE_BALTYPE_DOLLAR);
  EXPECT_EQ(margin->GetCurrency()->GetCurrencySymbol(), "EUR");
  EXPECT_EQ(Write(*margin),
            "<BAL>\n<VALUE>1200.50\n<NAME>Margin\n<DTASOF>20260101\n<BALTYPE>DOLLAR\n<DESC>Margin balance\n"
            "<CURRENCY>\n<CURRATE>1.1\n<CURSYM>EUR\n</CURRENCY>\n</BAL>\n");
  // RATE is no balance type: the second balance lacks it.
  ASSERT_EQ(log->Entries(), 2);
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_BALTYPE);
  EXPECT_EQ(log->Get(1)->warning, OEPW_MISSINGTAG);
  EXPECT_EQ(log->Get(1)->tag, OE_TAG_BALTYPE);
  EXPECT_EQ(log->Get(1)->object, root.GetBalance(1));

  OELedgerBalance ledger;
  EXPECT_EQ(ledger.GetType(), OE_TAG_LEDGERBAL);
  EXPECT_EQ(ledger.SetBalanceAmount(OEString("abc")), 0);
  EXPECT_EQ(ledger.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_BALAMT);
  OEAvailableBalance avail;
  EXPECT_EQ(avail.SetDateAsOf(OEString("20260102")), 1);
  EXPECT_EQ(avail.SetBalanceAmount(OEPrecisionInteger("7.25")), 1);
  OEAvailableBalance copy;
  EXPECT_EQ(copy.DeepCopyFrom(&avail), 1);
  EXPECT_EQ(Write(copy), "<AVAILBAL>\n<BALAMT>7.25\n<DTASOF>20260102\n</AVAILBAL>\n");
}

TEST_F(BankProfileTest, PayeeNeedsItsAddress) {
  OEPayee payee;
  payee.SetName("Water Co");
  payee.SetAddress1("1 Main St");
  payee.SetCity("Springfield");
  payee.SetState("IL");
  payee.SetPostalCode("62701");
  EXPECT_EQ(payee.AllRequiredPresent(), 0);
  EXPECT_EQ(payee.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_PHONE);
  payee.SetPhone("217-555-0100");
  payee.SetCountry("USA");
  EXPECT_EQ(payee.AllRequiredPresent(), 1);
  EXPECT_EQ(Write(payee),
            "<PAYEE>\n<NAME>Water Co\n<ADDR1>1 Main St\n<CITY>Springfield\n<STATE>IL\n<POSTALCODE>62701\n"
            "<COUNTRY>USA\n<PHONE>217-555-0100\n</PAYEE>\n");
}
