// Moving money: bill payment (payees, payments, recurring payments,
// inquiries), intrabank, interbank and wire transfers, stop checks and the
// closing information of past statement periods.
#include <gtest/gtest.h>

#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"
#include "support/ofx_text.h"

namespace {

#define T_MONEY_ROOT_FIELDS(X)                                 \
  X(CHILD, XferInfo, XFERINFO, OEXferInfo)                     \
  X(CHILD, IntraRq, INTRARQ, OEIntraRq)                        \
  X(CHILD, IntraRs, INTRARS, OEIntraRs)                        \
  X(CHILD, InterRs, INTERRS, OEInterRs)                        \
  X(CHILD, RecIntraRq, RECINTRARQ, OERecIntraRq)               \
  X(CHILD, RecInterModifyRs, RECINTERMODRS, OERecInterModifyRs) \
  X(CHILD, WireRq, WIRERQ, OEWireRq)                           \
  X(CHILD, WireRs, WIRERS, OEWireRs)                           \
  X(CHILD, PayeeRq, PAYEERQ, OEPayeeRq)                        \
  X(CHILD, PayeeModifyRs, PAYEEMODRS, OEPayeeModifyRs)         \
  X(CHILD, PaymentInfo, PMTINFO, OEPaymentInfo)                \
  X(CHILD, PaymentRs, PMTRS, OEPaymentRs)                      \
  X(CHILD, RecPaymentRq, RECPMTRQ, OERecPaymentRq)             \
  X(CHILD, PaymentInquiryRs, PMTINQRS, OEPaymentInquiryRs)     \
  X(CHILD, StopCheckRq, STPCHKRQ, OEStopCheckRq)               \
  X(CHILD, StopCheckRs, STPCHKRS, OEStopCheckRs)               \
  X(CHILD, StatementEndRs, STMTENDRS, OEStatementEndRs)        \
  X(CHILD, CCStatementEndRs, CCSTMTENDRS, OECCStatementEndRs)
class MoneyRoot : public OEAggregate {
  OE_AGGREGATE(MoneyRoot, T_MONEY_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(MoneyRoot, OEAggregate, T_MONEY_ROOT_FIELDS, NONE,
                    .Valid(OE_TAGS(XFERINFO, INTRARQ, INTRARS, INTERRS, RECINTRARQ, RECINTERMODRS, WIRERQ, WIRERS,
                                   PAYEERQ, PAYEEMODRS, PMTINFO, PMTRS, RECPMTRQ, PMTINQRS, STPCHKRQ, STPCHKRS,
                                   STMTENDRS, CCSTMTENDRS)))

const char kChecking[] = "<BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>";
const char kSavingsTo[] = "<BANKACCTTO><BANKID>121000248<ACCTID>2002<ACCTTYPE>SAVINGS</BANKACCTTO>";
const char kCardFrom[] = "<CCACCTFROM><ACCTID>4111</CCACCTFROM>";
const char kPayee[] =
    "<PAYEE><NAME>City Water<ADDR1>1 Main St<CITY>Springfield<STATE>IL<POSTALCODE>62701<PHONE>555-0101</PAYEE>";

std::string XferInfo(const std::string& accounts, const char* amount = "250.00") {
  return "<XFERINFO>" + accounts + "<TRNAMT>" + amount + "<DTDUE>20240115</XFERINFO>";
}

class MovingMoneyTest : public LogFixture {
 protected:
  std::string Write(const OEDataObj& obj) {
    WrittenText written = WriteUnderOwnTag(obj, OE_BUILD_LENIENT);
    EXPECT_EQ(written.status, OE_BUILD_OK);
    // One tag a line: compared without the line breaks.
    std::string flat;
    for (char c : written.text)
      if (c != '\n') flat += c;
    return flat;
  }
  // Parses the fragment into a fresh root; the root keeps the tree.
  MoneyRoot* Parse(const std::string& text, OEParseStatus expected = OE_PARSE_OK) {
    root_.reset(new MoneyRoot);
    EXPECT_EQ(ParseText(text, root_.get()), expected) << text;
    return root_.get();
  }
  std::unique_ptr<MoneyRoot> root_;
};

// ---------------------------------------------------------------------------
// Transfers

TEST_F(MovingMoneyTest, TransferInformationReadAndRules) {
  OEXferInfo* info = Parse(XferInfo(std::string(kChecking) + kSavingsTo))->GetXferInfo();
  ASSERT_NE(info, nullptr);
  EXPECT_EQ(info->AllRequiredPresent(), 1);
  ASSERT_NE(info->GetAccountFrom(), nullptr);
  EXPECT_EQ(info->GetAccountFrom()->GetType(), OE_TAG_BANKACCTFROM);
  EXPECT_EQ(info->GetAccountFrom()->GetAccountID(), "1001");
  EXPECT_EQ(info->GetAccountTo()->GetType(), OE_TAG_BANKACCTTO);
  EXPECT_EQ(info->GetAccountTo()->GetAccountID(), "2002");
  EXPECT_EQ(info->GetTranAmount(), OEPrecisionInteger("250.00"));
  EXPECT_TRUE(info->ValidateTag(OE_TAG_DTDUE));

  // Two sources: both are kept, and the rule fails.
  info = Parse(XferInfo(std::string(kChecking) + kCardFrom + kSavingsTo))->GetXferInfo();
  EXPECT_EQ(info->AllRequiredPresent(), 0);
  ASSERT_NE(info->GetCCAcctFrom(), nullptr);
  EXPECT_EQ(info->GetCCAcctFrom()->GetAccountID(), "4111");
  EXPECT_EQ(info->GetBankAcctFrom()->GetAccountID(), "1001");

  // A card source to a bank destination passes.
  info = Parse(XferInfo(std::string(kCardFrom) + kSavingsTo))->GetXferInfo();
  EXPECT_EQ(info->AllRequiredPresent(), 1);
  EXPECT_EQ(info->GetAccountFrom()->GetType(), OE_TAG_CCACCTFROM);
  // Without a destination it fails.
  info = Parse(XferInfo(kCardFrom))->GetXferInfo();
  EXPECT_EQ(info->AllRequiredPresent(), 0);
}

TEST_F(MovingMoneyTest, TransferInformationMissingTagWalk) {
  OEXferInfo info;
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_TRNAMT);
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_TRNAMT), OE_TAG_BANKACCTFROM);
  ASSERT_EQ(info.SetTranAmount(OEString("10")), 1);
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_BANKACCTFROM);
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_BANKACCTFROM), OE_TAG_CCACCTFROM);
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_CCACCTFROM), OE_TAG_BANKACCTTO);
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_BANKACCTTO), OE_TAG_CCACCTTO);
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_CCACCTTO), OE_TAG_NONE);

  // Accounts stored by class take the tag of their place.
  auto* card = new OECCAccount;
  card->SetAccountID(OEString("4111"));
  ASSERT_EQ(info.SetAccountFrom(card), 1);
  EXPECT_EQ(card->GetType(), OE_TAG_CCACCTFROM);
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_BANKACCTTO);
  auto* bank = new OEBankAccount;
  ASSERT_EQ(info.SetAccountTo(bank), 1);
  EXPECT_EQ(bank->GetType(), OE_TAG_BANKACCTTO);
  EXPECT_EQ(info.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_NONE);
  EXPECT_EQ(info.AllRequiredPresent(), 1);
  OECCAccount second;
  EXPECT_EQ(info.SetAccountFrom(&second), 0);  // the place is taken
}

TEST_F(MovingMoneyTest, TransferResponsesAndTheirOrder) {
  const std::string rs = "<INTERRS>" + XferInfo(std::string(kChecking) + kSavingsTo) +
                         "<CURDEF>USD<SRVRTID>S-77<DTXFERPRJ>20240116<REFNUM>REF-9<XFERPRCSTS>"
                         "<XFERPRCCODE>WILLPROCESSON<DTXFERPRC>20240116</XFERPRCSTS></INTERRS>";
  OEInterRs* inter = Parse(rs)->GetInterRs();
  ASSERT_NE(inter, nullptr);
  EXPECT_EQ(inter->AllRequiredPresent(), 1);
  EXPECT_EQ(inter->GetRefrenceNumber(), "REF-9");
  EXPECT_EQ(inter->GetServerTransactionID(), "S-77");
  EXPECT_EQ(inter->GetCurrencyDefault(), "USD");
  ASSERT_NE(inter->GetXferProcessingStatus(), nullptr);
  EXPECT_EQ(inter->GetXferProcessingStatus()->GetProcessingCode(), OE_PROCCODE_WILLPROCESSON);
  EXPECT_EQ(inter->GetXferInfo()->GetAccountTo()->GetAccountID(), "2002");
  const std::string written = Write(*inter);
  EXPECT_LT(written.find("<REFNUM>"), written.find("<XFERPRCSTS>"));
  EXPECT_LT(written.find("<DTXFERPRJ>"), written.find("<REFNUM>"));

  // The intrabank answer does not take a reference number.
  std::string intra = rs;
  intra.replace(intra.find("<INTERRS>"), 9, "<INTRARS>");
  intra.replace(intra.find("</INTERRS>"), 10, "</INTRARS>");
  MoneyRoot root;
  ParseText(intra, &root);
  EXPECT_TRUE(root.GetIntraRs() == nullptr || !root.GetIntraRs()->ValidateTag(OE_TAG_REFNUM));
  OEIntraRs bare;
  EXPECT_EQ(bare.SetElementText(OE_TAG_REFNUM, OEString("R")), 0);
  EXPECT_FALSE(bare.ValidateTag(OE_TAG_REFNUM));
}

TEST_F(MovingMoneyTest, RecurringTransfersRoundTrip) {
  const std::string rq = "<RECINTRARQ><RECURRINST><NINSTS>12<FREQ>MONTHLY</RECURRINST><INTRARQ>" +
                         XferInfo(std::string(kChecking) + kSavingsTo) + "</INTRARQ></RECINTRARQ>";
  OERecIntraRq* rec = Parse(rq)->GetRecIntraRq();
  ASSERT_NE(rec, nullptr);
  EXPECT_EQ(rec->AllRequiredPresent(), 1);
  EXPECT_EQ(rec->GetRecInstructions()->GetFrequency(), OE_FREQ_MONTHLY);
  EXPECT_EQ(rec->GetRecInstructions()->GetNumInstallments(), 12);
  // Written in the valid order: FREQ before NINSTS.
  const std::string written = Write(*rec);
  EXPECT_LT(written.find("<FREQ>"), written.find("<NINSTS>"));
  MoneyRoot again;
  ASSERT_EQ(ParseText(written, &again), OE_PARSE_OK);
  EXPECT_EQ(Write(*again.GetRecIntraRq()), written);

  OERecIntraRq copy;
  ASSERT_EQ(copy.DeepCopyFrom(rec), 1);
  EXPECT_EQ(Write(copy), written);
  EXPECT_NE(copy.GetIntraRq(), rec->GetIntraRq());

  const std::string modrs =
      "<RECINTERMODRS><RECURRINST><FREQ>WEEKLY</RECURRINST><INTERRS>" + XferInfo(std::string(kChecking) + kSavingsTo) +
      "<CURDEF>USD<SRVRTID>S1</INTERRS><RECSRVRTID>R1<MODPENDING>Y</RECINTERMODRS>";
  OERecInterModifyRs* mod = Parse(modrs)->GetRecInterModifyRs();
  ASSERT_NE(mod, nullptr);
  EXPECT_EQ(mod->AllRequiredPresent(), 1);
  EXPECT_EQ(mod->GetModifyPending(), 1);
  EXPECT_EQ(mod->GetInterRs()->GetServerTransactionID(), "S1");
}

TEST_F(MovingMoneyTest, WiresNeedTheirDestinationBankOnlyWhenAsked) {
  const std::string beneficiary =
      "<WIREBENEFICIARY><NAME>Jo Smith<BANKACCTTO><BANKID>026009593<ACCTID>55<ACCTTYPE>CHECKING</BANKACCTTO>"
      "<MEMO>rent</WIREBENEFICIARY>";
  const std::string dest =
      "<WIREDESTBANK><EXTBANKDESC><NAME>Far Bank<BANKID>026009593<ADDR1>2 Elm<CITY>Boston<STATE>MA"
      "<POSTALCODE>02110</EXTBANKDESC></WIREDESTBANK>";
  OEWireRq* wire =
      Parse("<WIRERQ>" + std::string(kChecking) + beneficiary + dest + "<TRNAMT>5000</WIRERQ>")->GetWireRq();
  ASSERT_NE(wire, nullptr);
  EXPECT_EQ(wire->AllRequiredPresent(), 1);
  EXPECT_EQ(wire->GetWireBeneficiary()->GetName(), "Jo Smith");
  EXPECT_EQ(wire->GetWireDestinationBank()->GetExtBankDesc()->GetCity(), "Boston");
  // The beneficiary writes its account before its name.
  const std::string written = Write(*wire->GetWireBeneficiary());
  EXPECT_EQ(written.find("<WIREBENEFICIARY><BANKACCTTO>"), 0u) << written;

  wire = Parse("<WIRERQ>" + std::string(kChecking) + beneficiary + "<TRNAMT>5000</WIRERQ>")->GetWireRq();
  EXPECT_EQ(wire->AllRequiredPresent(), 0);
  EXPECT_EQ(wire->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_WIREDESTBANK);

  OEWireRs* rs = Parse("<WIRERS>" + std::string(kChecking) + beneficiary +
                       "<CURDEF>USD<SRVRTID>W1<TRNAMT>5000<FEE>25<CONFMSG>sent</WIRERS>")
                     ->GetWireRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  EXPECT_EQ(rs->GetFee(), OEPrecisionInteger("25"));
  EXPECT_EQ(rs->GetConfirmationMessage(), "sent");
}

// ---------------------------------------------------------------------------
// Bill payment

TEST_F(MovingMoneyTest, PayeeRequestsChooseOneWayOfNamingThePayee) {
  OEPayeeRq* rq = Parse("<PAYEERQ><PAYEEID>P-1<PAYACCT>A1<PAYACCT>A2</PAYEERQ>")->GetPayeeRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  ASSERT_EQ(rq->GetNumPayAccount(), 2);
  EXPECT_EQ(*rq->GetPayAccount(1), "A2");

  rq = Parse("<PAYEERQ>" + std::string(kPayee) + "<PAYEEID>P-1</PAYEERQ>")->GetPayeeRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 0);
  EXPECT_EQ(rq->GetPayee()->GetCity(), "Springfield");  // nothing read is lost

  rq = Parse("<PAYEERQ>" + std::string(kPayee) + kSavingsTo + "<PAYACCT>A1</PAYEERQ>")->GetPayeeRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  // An id with an account to pay into is refused: the account goes with an address.
  OEPayeeRq withId;
  withId.SetPayeeID(OEString("P-2"));
  EXPECT_EQ(withId.AllRequiredPresent(), 1);
  auto* to = new OEBankAccount;
  to->SetType(OE_TAG_BANKACCTTO);
  ASSERT_EQ(withId.SetBankAcctTo(to), 1);
  EXPECT_EQ(withId.AllRequiredPresent(), 0);

  OEPayeeRq empty;
  EXPECT_EQ(empty.AllRequiredPresent(), 0);
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_PAYEEID);
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_PAYEEID), OE_TAG_PAYEE);
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_PAYEE), OE_TAG_NONE);

  // A modification answer with an account to pay into needs the address.
  OEPayeeModifyRs* mod = Parse("<PAYEEMODRS>" + std::string(kSavingsTo) + "<PAYEELSTID>L1</PAYEEMODRS>")
                             ->GetPayeeModifyRs();
  ASSERT_NE(mod, nullptr);
  EXPECT_EQ(mod->AllRequiredPresent(), 0);
  EXPECT_EQ(mod->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_PAYEE);
  mod = Parse("<PAYEEMODRS>" + std::string(kPayee) + kSavingsTo +
              "<EXTDPAYEE><PAYEEID>77<IDSCOPE>GLOBAL<NAME>City Water<DAYSTOPAY>3</EXTDPAYEE><PAYEELSTID>L1"
              "</PAYEEMODRS>")
            ->GetPayeeModifyRs();
  EXPECT_EQ(mod->AllRequiredPresent(), 1);
  EXPECT_EQ(mod->GetExtendedPayee()->GetDaysToPay(), 3);
  EXPECT_EQ(mod->GetExtendedPayee()->GetIDScope(), OE_PAYEEIDSCOPE_GLOBAL);
}

std::string PaymentInfo(const std::string& payee) {
  return "<PMTINFO>" + std::string(kChecking) + payee +
         "<TRNAMT>123.45<PAYACCT>ACC-9<DTDUE>20240120<MEMO>January</PMTINFO>";
}

TEST_F(MovingMoneyTest, PaymentInformationRuleAndWalk) {
  OEPaymentInfo* info = Parse(PaymentInfo("<PAYEEID>P-1"))->GetPaymentInfo();
  ASSERT_NE(info, nullptr);
  EXPECT_EQ(info->AllRequiredPresent(), 1);
  EXPECT_EQ(info->GetPayeeID(), "P-1");
  EXPECT_EQ(info->GetBankAcctFrom()->GetAccountID(), "1001");
  EXPECT_EQ(info->GetTranAmount(), OEPrecisionInteger("123.45"));
  EXPECT_EQ(info->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_NONE);

  info = Parse(PaymentInfo(std::string(kPayee) + "<PAYEEID>P-1"))->GetPaymentInfo();
  EXPECT_EQ(info->AllRequiredPresent(), 0);
  ASSERT_NE(info->GetPayee(), nullptr);

  info = Parse(PaymentInfo(""))->GetPaymentInfo();
  EXPECT_EQ(info->AllRequiredPresent(), 0);
  EXPECT_EQ(info->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_PAYEEID);
  EXPECT_EQ(info->GetFirstMissingRequiredTag(OE_TAG_PAYEEID), OE_TAG_PAYEE);
  EXPECT_EQ(info->GetFirstMissingRequiredTag(OE_TAG_PAYEE), OE_TAG_NONE);

  // Required tags come first in the walk, the payee forms after them.
  OEPaymentInfo empty;
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_BANKACCTFROM);
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_DTDUE), OE_TAG_PAYEEID);
}

TEST_F(MovingMoneyTest, PaymentWrittenInItsOrderAndCopied) {
  const std::string info = "<PMTINFO>" + std::string(kChecking) + kPayee +
                           "<EXTDPMT><EXTDPMTINV><INVOICE><DISCOUNT><DSCRATE>2<DSCAMT>2.47<DSCDESC>early"
                           "</DISCOUNT><LINEITEM><LITMAMT>100<LITMDESC>water</LINEITEM><LINEITEM><LITMAMT>23.45"
                           "<LITMDESC>sewer</LINEITEM><INVNO>I-1<INVTOTALAMT>123.45<INVPAIDAMT>123.45"
                           "<INVDATE>20240101<INVDESC>Q4</INVOICE></EXTDPMTINV><EXTDPMTFOR>INDIVIDUAL</EXTDPMT>"
                           "<TRNAMT>123.45<PAYACCT>ACC-9<DTDUE>20240120</PMTINFO>";
  const std::string text = "<PMTRS>" + info +
                           "<PMTPRCSTS><PMTPRCCODE>WILLPROCESSON<DTPMTPRC>20240119</PMTPRCSTS><SRVRTID>S-5"
                           "<PAYEELSTID>L1<CURDEF>USD<CHEQUENUM>1042</PMTRS>";
  OEPaymentRs* rs = Parse(text)->GetPaymentRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  EXPECT_EQ(rs->GetCheckNumber(), "1042");
  EXPECT_EQ(rs->GetPaymentPrcSts()->GetProcessingCode(), OE_PROCCODE_WILLPROCESSON);
  const OEInvoice* invoice = rs->GetPaymentInfo()->GetExtendedPayment()->GetExtendedPaymentInvoice(0)->GetInvoice(0);
  ASSERT_NE(invoice, nullptr);
  ASSERT_EQ(invoice->GetNumLineItem(), 2);
  EXPECT_EQ(invoice->GetLineItem(1)->GetDescription(), "sewer");
  EXPECT_EQ(invoice->GetDiscount()->GetAmount(), OEPrecisionInteger("2.47"));

  const std::string written = Write(*rs);
  MoneyRoot again;
  ASSERT_EQ(ParseText(written, &again), OE_PARSE_OK);
  EXPECT_EQ(Write(*again.GetPaymentRs()), written);
  OEPaymentRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(rs), 1);
  EXPECT_EQ(Write(copy), written);
  EXPECT_NE(copy.GetPaymentInfo(), rs->GetPaymentInfo());

  // Recurring payments reach their payment and instructions through the base.
  OERecPaymentRq* rec = Parse("<RECPMTRQ><RECURRINST><FREQ>MONTHLY</RECURRINST>" + PaymentInfo("<PAYEEID>P-1") +
                              "<INITIALAMT>50</RECPMTRQ>")
                            ->GetRecPaymentRq();
  ASSERT_NE(rec, nullptr);
  EXPECT_EQ(rec->AllRequiredPresent(), 1);
  OERecPaymentBase* base = rec;
  EXPECT_EQ(base->GetRecInstructions()->GetFrequency(), OE_FREQ_MONTHLY);
  EXPECT_EQ(base->GetPaymentInfo()->GetPayeeID(), "P-1");
  // PMTINFO is written before RECURRINST, as the valid order has it.
  const std::string recWritten = Write(*rec);
  EXPECT_LT(recWritten.find("<PMTINFO>"), recWritten.find("<RECURRINST>"));
}

TEST_F(MovingMoneyTest, BadPaymentValuesWarnAndStayAbsent) {
  OEPaymentInquiryRs* inq = Parse("<PMTINQRS><PMTPRCSTS><PMTPRCCODE>LATER<DTPMTPRC>2024x</PMTPRCSTS>"
                                  "<SRVRTID>S-5</PMTINQRS>",
                                  OE_PARSE_WARNINGS)
                                ->GetPaymentInquiryRs();
  ASSERT_NE(inq, nullptr);
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
  EXPECT_FALSE(inq->GetPaymentPrcSts()->ValidateTag(OE_TAG_PMTPRCCODE));
  EXPECT_FALSE(inq->GetPaymentPrcSts()->ValidateTag(OE_TAG_DTPMTPRC));
  EXPECT_EQ(inq->AllRequiredPresent(), 1);  // its own tags are there
  EXPECT_EQ(inq->GetPaymentPrcSts()->AllRequiredPresent(), 0);

  log->DeleteAll();
  OEExtendedPayee payee;
  EXPECT_EQ(payee.SetDaysToPay(OEString("70000")), 0);
  EXPECT_FALSE(payee.ValidateTag(OE_TAG_DAYSTOPAY));
  EXPECT_EQ(payee.SetPayeeID(OEString("A-PAYEE-ID-LONGER-THAN-12")), 1);
  EXPECT_TRUE(Logged(OEPW_TOOLONG));
  EXPECT_EQ(payee.GetPayeeID(), "A-PAYEE-ID-LONGER-THAN-12");
}

// ---------------------------------------------------------------------------
// Stop checks and closings

TEST_F(MovingMoneyTest, StopCheckRequestChoosesRangeOrDescription) {
  const std::string range = "<CHKRANGE><CHKNUMSTART>100<CHKNUMEND>120</CHKRANGE>";
  const std::string desc = "<CHKDESC><NAME>Acme<CHEQUENUM>1042<DTUSER>20240102<TRNAMT>-45.00</CHKDESC>";
  OEStopCheckRq* rq = Parse("<STPCHKRQ>" + std::string(kChecking) + range + desc + "</STPCHKRQ>")->GetStopCheckRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->AllRequiredPresent(), 0);
  EXPECT_EQ(rq->GetCheckRange()->GetCheckNumberEnd(), "120");
  EXPECT_EQ(rq->GetCheckDescription()->GetTransactionAmount(), OEPrecisionInteger("-45.00"));

  rq = Parse("<STPCHKRQ>" + std::string(kChecking) + desc + "</STPCHKRQ>")->GetStopCheckRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  EXPECT_EQ(rq->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_NONE);
  // The description writes the payee's name first.
  EXPECT_EQ(Write(*rq->GetCheckDescription()).find("<CHKDESC><NAME>Acme"), 0u);

  rq = Parse("<STPCHKRQ>" + std::string(kChecking) + "</STPCHKRQ>")->GetStopCheckRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 0);
  EXPECT_EQ(rq->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_CHKRANGE);
  EXPECT_EQ(rq->GetFirstMissingRequiredTag(OE_TAG_CHKRANGE), OE_TAG_CHKDESC);
  EXPECT_EQ(rq->GetFirstMissingRequiredTag(OE_TAG_CHKDESC), OE_TAG_NONE);
}

TEST_F(MovingMoneyTest, StopCheckResponseStatusAndOrder) {
  const std::string text = "<STPCHKRS>" + std::string(kChecking) +
                           "<STPCHKNUM><CURRENCY><CURRATE>1.5<CURSYM>CAD</CURRENCY><CHEQUENUM>1042<NAME>Acme"
                           "<CHKSTATUS>101<CHKERROR>none</STPCHKNUM>"
                           "<STPCHKNUM><CHEQUENUM>1043<CHKSTATUS>1X</STPCHKNUM>"
                           "<CURDEF>USD<FEE>15.00<FEEMSG>Stop fee</STPCHKRS>";
  OEStopCheckRs* rs = Parse(text, OE_PARSE_WARNINGS)->GetStopCheckRs();
  ASSERT_NE(rs, nullptr);
  ASSERT_EQ(rs->GetNumStopCheckNumber(), 2);
  EXPECT_EQ(rs->GetStopCheckNumber(0)->GetStatus(), 101);
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
  const OEStopCheckNumber* second = rs->GetStopCheckNumber(1);
  EXPECT_FALSE(second->ValidateTag(OE_TAG_CHKSTATUS));
  EXPECT_EQ(second->GetCheckNumber(), "1043");
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  EXPECT_EQ(rs->GetFeeMessage(), "Stop fee");

  EXPECT_EQ(Write(*rs),
            "<STPCHKRS><CURDEF>USD" + std::string(kChecking) +
                "<STPCHKNUM><CHEQUENUM>1042<NAME>Acme<CHKSTATUS>101<CHKERROR>none<CURRENCY><CURRATE>1.5"
                "<CURSYM>CAD</CURRENCY></STPCHKNUM><STPCHKNUM><CHEQUENUM>1043</STPCHKNUM>"
                "<FEE>15.00<FEEMSG>Stop fee</STPCHKRS>");

  OEStopCheckRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(rs), 1);
  EXPECT_EQ(Write(copy), Write(*rs));
}

std::string Closing(const char* fitid, const char* currency = "") {
  return std::string("<CLOSING>") + currency + "<FITID>" + fitid +
         "<DTCLOSE>20240131<BALCLOSE>1000.00<DTPOSTSTART>20240101<DTPOSTEND>20240131<MKTGINFO>Thanks</CLOSING>";
}

TEST_F(MovingMoneyTest, StatementClosingsInDocumentOrder) {
  const std::string text = "<STMTENDRS>" + std::string(kChecking) + Closing("C1") +
                           Closing("C2", "<ORIGCURRENCY><CURRATE>0.9<CURSYM>EUR</ORIGCURRENCY>") + Closing("C3") +
                           "<CURDEF>USD</STMTENDRS>";
  OEStatementEndRs* rs = Parse(text)->GetStatementEndRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  ASSERT_EQ(rs->GetNumOfClosing(), 3);
  EXPECT_EQ(rs->GetClosing(0)->GetFITId(), "C1");
  EXPECT_EQ(rs->GetClosing(2)->GetFITId(), "C3");
  EXPECT_EQ(rs->GetClosing(1)->GetCurrency()->GetType(), OE_TAG_ORIGCURRENCY);

  const std::string written = Write(*rs);
  EXPECT_EQ(written.find("<STMTENDRS><CURDEF>USD<BANKACCTFROM>"), 0u) << written;
  const std::string closing = Write(*rs->GetClosing(1));
  EXPECT_NE(closing.find("<MKTGINFO>Thanks<ORIGCURRENCY>"), std::string::npos) << closing;

  // A closing handed back is the caller's.
  OEClosing* taken = rs->DisconnectClosing(0);
  ASSERT_NE(taken, nullptr);
  EXPECT_EQ(taken->GetFITId(), "C1");
  EXPECT_EQ(rs->GetNumOfClosing(), 2);
  delete taken;
  EXPECT_EQ(rs->DisconnectClosing(5), nullptr);

  const std::string cc = "<CCSTMTENDRS><CURDEF>USD" + std::string(kCardFrom) +
                         "<CCCLOSING><FITID>K1<DTCLOSE>20240131<BALCLOSE>-300<DTPMTDUE>20240225<MINPMTDUE>25"
                         "<CREDITLIMIT>5000<DTPOSTSTART>20240101<DTPOSTEND>20240131</CCCLOSING></CCSTMTENDRS>";
  OECCStatementEndRs* ccrs = Parse(cc)->GetCCStatementEndRs();
  ASSERT_NE(ccrs, nullptr);
  EXPECT_EQ(ccrs->AllRequiredPresent(), 1);
  EXPECT_EQ(ccrs->GetCCClosing(0)->GetCreditLimit(), OEPrecisionInteger("5000"));
  EXPECT_EQ(ccrs->GetCCClosing(0)->GetMinimumPaymentDue(), OEPrecisionInteger("25"));
}

TEST_F(MovingMoneyTest, SingleAccountFormsOfTheListsAndAccounts) {
  OEPayeeRq rq;
  EXPECT_EQ(rq.GetPayAccount(), "");
  ASSERT_EQ(rq.SetPayAccount(OEString("ACC-1")), 1);
  EXPECT_EQ(rq.GetPayAccount(), "ACC-1");
  ASSERT_EQ(rq.AppendPayAccount(OEString("ACC-2")), 1);
  EXPECT_EQ(rq.GetNumPayAccount(), 2);
  rq.SetPayeeID(OEString("P-1"));
  EXPECT_EQ(Write(rq), "<PAYEERQ><PAYEEID>P-1<PAYACCT>ACC-1<PAYACCT>ACC-2</PAYEERQ>");

  OECCStatementEndRs cc;
  auto* card = new OECCAccount;
  card->SetAccountID(OEString("4111"));
  ASSERT_EQ(cc.SetAccountFrom(card), 1);
  cc.SetCurrencyDefault(OEString("USD"));
  EXPECT_EQ(cc.AllRequiredPresent(), 1);
  EXPECT_EQ(Write(cc), "<CCSTMTENDRS><CURDEF>USD<CCACCTFROM><ACCTID>4111</CCACCTFROM></CCSTMTENDRS>");

  OEStatementEndRq end;
  auto* bank = new OEBankAccount;
  ASSERT_EQ(end.SetAccountFrom(bank), 1);
  EXPECT_EQ(end.GetAcctFrom(), bank);
  EXPECT_EQ(end.SetDateTimeStart(OEString("20240101")), 1);
  EXPECT_EQ(end.SetDateTimeEnd(OEString("not a date")), 0);
  EXPECT_FALSE(end.ValidateTag(OE_TAG_DTEND));
}

// Answers as servers send them: unknown extension tags, elements closed and
// unclosed, an aggregate cut short. Nothing crashes and what was read stays.
TEST_F(MovingMoneyTest, UntidyServerAnswersKeepWhatTheyCarry) {
  const std::string text =
      "<OFX><BILLPAYMSGSRSV1><PMTTRNRS><TRNUID>9<STATUS><CODE>0<SEVERITY>INFO</STATUS><PMTRS>"
      "<PMTINFO><BANKACCTFROM><BANKID>121000248</BANKID><ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>"
      "<PAYEEID>P-1</PAYEEID><INTU.PAYEENAME>Water</INTU.PAYEENAME><TRNAMT>12.00<PAYACCT>9<DTDUE>20240120120000.000"
      "[-5:EST]</PMTINFO><PMTPRCSTS><PMTPRCCODE>PROCESSEDON<DTPMTPRC>20240120</PMTPRCSTS><SRVRTID>S9"
      "<PAYEELSTID>L9<CURDEF>USD</PMTRS></PMTTRNRS><RECPMTTRNRS><TRNUID>10<STATUS><CODE>2000"
      "<SEVERITY>ERROR<MESSAGE>no such model</STATUS></RECPMTTRNRS></BILLPAYMSGSRSV1>"
      "<BANKMSGSRSV1><STPCHKTRNRS><TRNUID>11<STATUS><CODE>0<SEVERITY>INFO</STATUS><STPCHKRS><CURDEF>USD"
      "<BANKACCTFROM><BANKID>1<ACCTID>2<ACCTTYPE>CHECKING</BANKACCTFROM><STPCHKNUM><CHEQUENUM>7<CHKSTATUS>0";
  OEResponse response;
  OEParseStatus status = ParseText(text, &response);
  EXPECT_NE(status, OE_PARSE_OK);
  ASSERT_GE(response.GetNumMessage(), 1);
  OETransRs* payment = response.GetMessageSet(0)->GetTrans(0);
  ASSERT_NE(payment, nullptr);
  auto* rs = dynamic_cast<OEPaymentRs*>(payment->GetActualTrans());
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->GetPaymentInfo()->GetPayeeID(), "P-1");
  EXPECT_EQ(rs->GetPaymentInfo()->GetBankAcctFrom()->GetAccountID(), "1001");
  EXPECT_EQ(rs->GetPaymentPrcSts()->GetProcessingCode(), OE_PROCCODE_PROCESSEDON);
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  // The error answer needs no recurring payment.
  OETransRs* failed = response.GetMessageSet(0)->GetTrans(1);
  ASSERT_NE(failed, nullptr);
  EXPECT_EQ(failed->AllRequiredPresent(), 1);
}

// ---------------------------------------------------------------------------
// Through the wrappers

TEST_F(MovingMoneyTest, WrappersCarryTheNewRequestsAndResponses) {
  EXPECT_EQ(OETransRq::MsgIDToTranWrapper(OE_TAG_INTRARQ), OE_TAG_INTRATRNRQ);
  EXPECT_EQ(OETransRq::MsgIDToTranWrapper(OE_TAG_PMTINQRQ), OE_TAG_PMTINQTRNRQ);
  EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(OE_TAG_RECPMTCANCRQ), OE_TAG_RECPMTSYNCRQ);
  EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(OE_TAG_STPCHKRQ), OE_TAG_STPCHKSYNCRQ);
  EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(OE_TAG_WIRERQ), OE_TAG_WIREXFERMSGSET);
  EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(OE_TAG_INTRARQ), OE_TAG_BANKMSGSET);
  EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(OE_TAG_PMTRQ), OE_TAG_BILLPAYMSGSET);

  const std::string ok = "<STATUS><CODE>0<SEVERITY>INFO</STATUS>";
  const std::string text =
      "<OFX><BANKMSGSRSV1><INTRATRNRS><TRNUID>1" + ok + "<INTRARS>" + XferInfo(std::string(kChecking) + kSavingsTo) +
      "<CURDEF>USD<SRVRTID>X1<XFERPRCSTS><XFERPRCCODE>WILLPROCESSON<DTXFERPRC>20240115</XFERPRCSTS></INTRARS>"
      "</INTRATRNRS><STMTENDTRNRS><TRNUID>2" + ok + "<STMTENDRS><CURDEF>USD" + kChecking + Closing("C1") +
      "</STMTENDRS></STMTENDTRNRS></BANKMSGSRSV1><BILLPAYMSGSRSV1><PMTSYNCRS><TOKEN>7" + kChecking +
      "<PMTTRNRS><TRNUID>3" + ok + "<PMTCANCRS><SRVRTID>S-5</PMTCANCRS></PMTTRNRS></PMTSYNCRS>"
      "<PAYEETRNRS><TRNUID>4" + ok + "<PAYEEDELRS><PAYEELSTID>L1</PAYEEDELRS></PAYEETRNRS></BILLPAYMSGSRSV1>"
      "<WIREXFERMSGSRSV1><WIRETRNRS><TRNUID>5" + ok + "<WIRECANRS><SRVRTID>W1</WIRECANRS></WIRETRNRS>"
      "</WIREXFERMSGSRSV1></OFX>";
  OEResponse response;
  ASSERT_EQ(ParseText(text, &response), OE_PARSE_OK);
  ASSERT_EQ(response.GetNumMessage(), 3);
  OETransRs* intra = response.GetMessageSet(0)->GetTrans(0);
  EXPECT_EQ(intra->AllRequiredPresent(), 1);
  const auto* intraRs = dynamic_cast<const OEIntraRs*>(intra->GetActualTrans());
  ASSERT_NE(intraRs, nullptr);
  EXPECT_EQ(intraRs->GetServerTransactionID(), "X1");
  EXPECT_NE(dynamic_cast<const OEStatementEndRs*>(response.GetMessageSet(0)->GetTrans(1)->GetActualTrans()),
            nullptr);
  const OESyncRs* sync = response.GetMessageSet(1)->GetSync(0);
  ASSERT_NE(sync, nullptr);
  EXPECT_NE(dynamic_cast<const OEPaymentCancelRs*>(sync->GetTrans(0)->GetActualTrans()), nullptr);
  EXPECT_NE(dynamic_cast<const OEPayeeDeleteRs*>(response.GetMessageSet(1)->GetTrans(0)->GetActualTrans()),
            nullptr);
  EXPECT_NE(dynamic_cast<const OEWireCancelRs*>(response.GetMessageSet(2)->GetTrans(0)->GetActualTrans()), nullptr);

  // A request wrapper holding a transfer writes it inside its own tags.
  OETransRq wrapper;
  wrapper.SetType(OE_TAG_INTRATRNRQ);
  wrapper.SetTransUserID(OEString("T-1"));
  auto* intraRq = new OEIntraRq;
  ASSERT_NE(intraRq->GetXferInfo(1), nullptr);
  intraRq->GetXferInfo()->SetTranAmount(OEString("10.00"));
  ASSERT_EQ(wrapper.SetActualTrans(intraRq), 1);
  const std::string written = Write(wrapper);
  EXPECT_NE(written.find("<INTRATRNRQ><TRNUID>T-1<INTRARQ><XFERINFO><TRNAMT>10.00</XFERINFO></INTRARQ>"),
            std::string::npos)
      << written;
}


// A request file as an application makes one: a transfer in the bank set, a
// payment and a new payee in the bill-pay set, checked and read back whole.
TEST_F(MovingMoneyTest, RequestFileOfTransferAndPaymentRoundTrips) {
  auto wrap = [](OETagID type, const char* id, OETransBase* inner) {
    auto* t = new OETransRq;
    t->SetType(type);
    t->SetTransUserID(OEString(id));
    EXPECT_EQ(t->SetActualTrans(inner), 1);
    t->SetTag(inner->GetType());  // the wrapper's rule reads the inner tag's bit
    return t;
  };
  auto* bankFrom = new OEBankAccount;
  bankFrom->SetBankID(OEString("121000248"));
  bankFrom->SetAccountID(OEString("1001"));
  bankFrom->SetAccountType(OEString("CHECKING"));
  auto* bankTo = new OEBankAccount;
  bankTo->SetBankID(OEString("121000248"));
  bankTo->SetAccountID(OEString("2002"));
  bankTo->SetAccountType(OEString("SAVINGS"));
  auto* intra = new OEIntraRq;
  OEXferInfo* info = intra->GetXferInfo(1);
  ASSERT_EQ(info->SetAccountFrom(bankFrom), 1);
  ASSERT_EQ(info->SetAccountTo(bankTo), 1);
  info->SetTranAmount(OEString("250.00"));
  info->SetDateDue(OEString("20240115"));

  auto* payment = new OEPaymentRq;
  OEPaymentInfo* pmt = payment->GetPaymentInfo(1);
  auto* payFrom = new OEBankAccount;
  payFrom->SetBankID(OEString("121000248"));
  payFrom->SetAccountID(OEString("1001"));
  payFrom->SetAccountType(OEString("CHECKING"));
  ASSERT_EQ(pmt->SetBankAcctFrom(payFrom), 1);
  pmt->SetTranAmount(OEString("123.45"));
  pmt->SetPayeeID(OEString("P-1"));
  pmt->SetPayAccount(OEString("ACC-9"));
  pmt->SetDateDue(OEString("20240120"));
  pmt->SetMemo(OEString("January"));
  auto* payee = new OEPayeeRq;
  payee->SetPayeeID(OEString("P-2"));

  OERequest request;
  auto* bank = new OEMessageSetRq;
  bank->SetType(OE_TAG_BANKMSGSRQV1);
  bank->AppendTrans(wrap(OE_TAG_INTRATRNRQ, "T-1", intra));
  auto* billpay = new OEMessageSetRq;
  billpay->SetType(OE_TAG_BILLPAYMSGSRQV1);
  billpay->AppendTrans(wrap(OE_TAG_PMTTRNRQ, "T-2", payment));
  billpay->AppendTrans(wrap(OE_TAG_PAYEETRNRQ, "T-3", payee));
  ASSERT_EQ(request.AppendMessageSet(billpay), 1);
  ASSERT_EQ(request.AppendMessageSet(bank), 1);

  // (The request itself would also want a sign-on; the sets are checked.)
  OETagID missing = OE_TAG_NONE;
  OEDataObj* where = bank;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&where, &missing), 1);
  where = billpay;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&where, &missing), 1);
  WrittenText strict = WriteUnderOwnTag(request, OE_BUILD_STRICT);
  ASSERT_EQ(strict.status, OE_BUILD_OK);
  EXPECT_LT(strict.text.find("<BANKMSGSRQV1>"), strict.text.find("<BILLPAYMSGSRQV1>"));
  const std::string written = Write(request);
  EXPECT_NE(written.find("<INTRATRNRQ><TRNUID>T-1<INTRARQ><XFERINFO><BANKACCTFROM><BANKID>121000248<ACCTID>1001"
                         "<ACCTTYPE>CHECKING</BANKACCTFROM><BANKACCTTO><BANKID>121000248<ACCTID>2002"
                         "<ACCTTYPE>SAVINGS</BANKACCTTO><TRNAMT>250.00<DTDUE>"),
            std::string::npos)
      << written;
  EXPECT_NE(written.find("<PMTINFO><BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>"
                         "<TRNAMT>123.45<PAYEEID>P-1<PAYACCT>ACC-9<DTDUE>"),
            std::string::npos)
      << written;

  OERequest again;
  ASSERT_EQ(ParseText(strict.text, &again), OE_PARSE_OK);
  EXPECT_EQ(Write(again), written);

  // A payment that names no payee is found by the check, at its PMTINFO.
  pmt->ClearTagQuietly(OE_TAG_PAYEEID);
  where = billpay;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&where, &missing), 0);
  EXPECT_EQ(where, pmt);
  EXPECT_EQ(missing, OE_TAG_PAYEEID);
}


// Every inner request and response of the moving-money wrappers is made by
// the factory as the class of its own tag, and an application's factory is
// the one a parse uses.
TEST_F(MovingMoneyTest, InnerAggregatesAreMadeForTheirTags) {
  const OETagID inner[] = {
      OE_TAG_INTRARQ,      OE_TAG_INTRAMODRQ,    OE_TAG_INTRACANRQ,    OE_TAG_INTRARS,       OE_TAG_INTRAMODRS,
      OE_TAG_INTRACANRS,   OE_TAG_RECINTRARQ,    OE_TAG_RECINTRAMODRQ, OE_TAG_RECINTRACANRQ, OE_TAG_RECINTRARS,
      OE_TAG_RECINTRAMODRS, OE_TAG_RECINTRACANRS, OE_TAG_INTERRQ,      OE_TAG_INTERMODRQ,    OE_TAG_INTERCANRQ,
      OE_TAG_INTERRS,      OE_TAG_INTERMODRS,    OE_TAG_INTERCANRS,    OE_TAG_RECINTERRQ,    OE_TAG_RECINTERMODRQ,
      OE_TAG_RECINTERCANRQ, OE_TAG_RECINTERRS,   OE_TAG_RECINTERMODRS, OE_TAG_RECINTERCANRS, OE_TAG_WIRERQ,
      OE_TAG_WIRECANRQ,    OE_TAG_WIRERS,        OE_TAG_WIRECANRS,     OE_TAG_PAYEERQ,       OE_TAG_PAYEEMODRQ,
      OE_TAG_PAYEEDELRQ,   OE_TAG_PAYEERS,       OE_TAG_PAYEEMODRS,    OE_TAG_PAYEEDELRS,    OE_TAG_PMTRQ,
      OE_TAG_PMTMODRQ,     OE_TAG_PMTCANCRQ,     OE_TAG_PMTRS,         OE_TAG_PMTMODRS,      OE_TAG_PMTCANCRS,
      OE_TAG_RECPMTRQ,     OE_TAG_RECPMTMODRQ,   OE_TAG_RECPMTCANCRQ,  OE_TAG_RECPMTRS,      OE_TAG_RECPMTMODRS,
      OE_TAG_RECPMTCANCRS, OE_TAG_PMTINQRQ,      OE_TAG_PMTINQRS,      OE_TAG_STPCHKRQ,      OE_TAG_STPCHKRS,
      OE_TAG_STMTENDRQ,    OE_TAG_STMTENDRS,     OE_TAG_CCSTMTENDRQ,   OE_TAG_CCSTMTENDRS};
  OEDataObjFactory factory;
  for (OETagID tag : inner) {
    std::unique_ptr<OETransBase> made(OENewInnerTrans(&factory, tag));
    ASSERT_NE(made, nullptr) << tag;
    EXPECT_EQ(made->GetType(), tag);
    // Its own tag's class takes exactly the tags of its row.
    OEArrayOfTags valid{nullptr, 0};
    EXPECT_EQ(made->GetArrayOfValidTags(valid), 1);
    EXPECT_GT(valid.count, 0);
  }

  struct Counting : OEDataObjFactory {
    int made = 0;
    OEIntraRq* NewIntraRq() override {
      ++made;
      return OEDataObjFactory::NewIntraRq();
    }
  } counting;
  OEDataObjFactory* before = OEDataObj::GetFactory();
  OEDataObj::SetFactory(&counting);
  OERequest request;
  const std::string text = "<OFX><BANKMSGSRQV1><INTRATRNRQ><TRNUID>1<INTRARQ>" +
                           XferInfo(std::string(kChecking) + kSavingsTo) +
                           "</INTRARQ></INTRATRNRQ></BANKMSGSRQV1></OFX>";
  EXPECT_EQ(ParseText(text, &request), OE_PARSE_OK);
  OEDataObj::SetFactory(before);
  EXPECT_EQ(counting.made, 1);
}

}  // namespace
