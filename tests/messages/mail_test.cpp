// Secure mail: the message and its body limits, free-form, account, brokerage
// and payment mail, cheque and deposit notices, MIME retrieval, and mail
// wrappers in whole documents.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <vector>

#include "ofxkit/ofxkit.h"

#include "../../tools/ofxkit/cli.h"  // Collect: the objects of a class in a tree
#include "support/log_fixture.h"
#include "support/ofx_text.h"

namespace {

#define T_MAIL_ROOT_FIELDS(X)                                   \
  X(CHILD, Mail, MAIL, OEMail)                                  \
  X(CHILD, MailRq, MAILRQ, OEMailRq)                            \
  X(CHILD, BankMailRq, BANKMAILRQ, OEBankMailRq)                \
  X(CHILD, BankMailRs, BANKMAILRS, OEBankMailRs)                \
  X(CHILD, InvMailRq, INVMAILRQ, OEInvestmentMailRq)            \
  X(CHILD, PaymentMailRq, PMTMAILRQ, OEPaymentMailRq)           \
  X(CHILD, CheckMailRs, CHKMAILRS, OECheckMailRs)               \
  X(CHILD, DepositMailRs, DEPMAILRS, OEDepositMailRs)           \
  X(CHILD, GetMimeRq, GETMIMERQ, OEGetMimeRq)                   \
  X(CHILD, GetMimeRs, GETMIMERS, OEGetMimeRs)
class MailRoot : public OEAggregate {
  OE_AGGREGATE(MailRoot, T_MAIL_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(MailRoot, OEAggregate, T_MAIL_ROOT_FIELDS, NONE,
                    .Valid(OE_TAGS(MAIL, MAILRQ, BANKMAILRQ, BANKMAILRS, INVMAILRQ, PMTMAILRQ, CHKMAILRS, DEPMAILRS,
                                   GETMIMERQ, GETMIMERS)))

const char kChecking[] = "<BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>";
const char kCard[] = "<CCACCTFROM><ACCTID>4111</CCACCTFROM>";
const char kSignOn[] =
    "<SIGNONMSGSRQV1><SONRQ><DTCLIENT>20240115<USERID>jdoe<USERPASS>x<LANGUAGE>ENG<APPID>QWIN<APPVER>2700</SONRQ>"
    "</SIGNONMSGSRQV1>";
const char kBrokerage[] = "<INVACCTFROM><BROKERID>broker.example<ACCTID>X123</INVACCTFROM>";

// A message as a server writes one: the body with its end tag.
std::string Mail(const std::string& body = "Your statement is ready.", const char* flags = "N") {
  return std::string("<MAIL><USERID>jdoe<DTCREATED>20240115103000.000[-5:EST]<FROM>Customer Service<TO>Jane Doe"
                     "<SUBJECT>Statement question<MSGBODY>") +
         body + "</MSGBODY><INCIMAGES>" + flags + "<USEHTML>" + flags + "</MAIL>";
}

// What is filled in every message the tests make.
OEMail* NewMail(const std::string& body) {
  auto* mail = new OEMail;
  mail->SetUserId(OEString("jdoe"));
  mail->SetDateTimeCreated(OEString("20240115103000"));
  mail->SetFrom(OEString("Jane Doe"));
  mail->SetTo(OEString("Customer Service"));
  mail->SetSubject(OEString("Fee refund"));
  EXPECT_EQ(mail->SetMessageBody(OEString(body.c_str())), 1);
  mail->SetIncludeImages(0);
  mail->SetUseHTML(0);
  return mail;
}

// A body of n characters with the three characters that OFX text escapes.
std::string Body(size_t n) {
  std::string body = "Fees & charges <refund> of 5 > 3: ";
  while (body.size() < n) body += static_cast<char>('a' + body.size() % 26);
  body.resize(n);
  return body;
}

using cli::Collect;

std::vector<OETagID> Tags(const OEArrayOfTags& tags) { return std::vector<OETagID>(tags.tags, tags.tags + tags.count); }

// Every missing tag that the walk names, from the start.
std::vector<OETagID> Walk(const OEDataObj& obj) {
  std::vector<OETagID> out;
  for (OETagID tag = obj.GetFirstMissingRequiredTag(OE_TAG_NONE); tag != OE_TAG_NONE && out.size() < 20;
       tag = obj.GetFirstMissingRequiredTag(tag))
    out.push_back(tag);
  return out;
}

class MailTest : public LogFixture {
 protected:
  std::string Write(const OEDataObj& obj, OEBuildStringOpt option = OE_BUILD_LENIENT) {
    WrittenText written = WriteUnderOwnTag(obj, option);
    EXPECT_EQ(written.status, OE_BUILD_OK);
    std::string flat;
    for (char c : written.text)
      if (c != '\n') flat += c;
    return flat;
  }
  MailRoot* Parse(const std::string& text, OEParseStatus expected = OE_PARSE_OK) {
    root_.reset(new MailRoot);
    EXPECT_EQ(ParseText(text, root_.get()), expected) << text;
    return root_.get();
  }
  unsigned short Count(OEParseWarning code) const {
    unsigned short n = 0;
    for (unsigned short i = 0; i < log->Entries(); ++i)
      if (log->Get(i)->warning == code) ++n;
    return n;
  }
  std::unique_ptr<MailRoot> root_;
};

// ---------------------------------------------------------------------------
// The message

TEST_F(MailTest, MessageReadAndWrittenWithTheBodyEndTagOnly) {
  OEMail* mail = Parse(Mail("Line one\nline two", "Y"))->GetMail();
  ASSERT_NE(mail, nullptr);
  EXPECT_EQ(mail->GetUserId(), "jdoe");
  EXPECT_EQ(mail->GetFrom(), "Customer Service");
  EXPECT_EQ(mail->GetTo(), "Jane Doe");
  EXPECT_EQ(mail->GetSubject(), "Statement question");
  EXPECT_EQ(mail->GetMessageBody(), "Line one\nline two");
  EXPECT_EQ(mail->GetIncludeImages(), 1);
  EXPECT_EQ(mail->GetUseHTML(), 1);
  EXPECT_EQ(mail->GetDateTimeCreated(), OEDateTime(OEString("20240115103000.000[-5:EST]")));
  EXPECT_EQ(mail->AllRequiredPresent(), 1);
  EXPECT_EQ(log->Entries(), 0);

  // The body is written after the subject, with its own end tag; nothing
  // else has one.
  WrittenText written = WriteUnderOwnTag(*mail, OE_BUILD_STRICT, 1);
  ASSERT_EQ(written.status, OE_BUILD_OK);
  EXPECT_EQ(written.text,
            "<MAIL>\n<USERID>jdoe\n<DTCREATED>20240115103000.000[-5:EST]\n<FROM>Customer Service\n<TO>Jane Doe\n"
            "<SUBJECT>Statement question\n<MSGBODY>Line one\nline two\n</MSGBODY>\n<INCIMAGES>Y\n<USEHTML>Y\n"
            "</MAIL>\n");

  // Presence bits follow the valid order, which puts the body first.
  OEArrayOfTags valid{nullptr, 0}, required{nullptr, 0};
  ASSERT_EQ(mail->GetArrayOfValidTags(valid), 1);
  ASSERT_EQ(mail->GetArrayOfRequiredTags(required), 1);
  const std::vector<OETagID> order = {OE_TAG_MSGBODY, OE_TAG_USERID,    OE_TAG_DTCREATED, OE_TAG_FROM,
                                      OE_TAG_TO,      OE_TAG_SUBJECT,   OE_TAG_INCIMAGES, OE_TAG_USEHTML};
  EXPECT_EQ(Tags(valid), order);
  EXPECT_EQ(Tags(required).size(), 8u);
  EXPECT_EQ(mail->ValidTagPosition(OE_TAG_MSGBODY), 0);

  // Every field is required, the body first.
  OEMail empty;
  EXPECT_EQ(empty.AllRequiredPresent(), 0);
  EXPECT_EQ(Walk(empty), order);
  // Only present fields are written.
  OEMail partial;
  partial.SetSubject(OEString("Hi"));
  EXPECT_EQ(Write(partial), "<MAIL><SUBJECT>Hi</MAIL>");
}

TEST_F(MailTest, BodyLimitsAndEscapedCharactersRoundTrip) {
  OEMail mail;
  // Empty and over-long bodies are refused without a warning and leave the
  // body as it was.
  EXPECT_EQ(mail.SetMessageBody(OEString("")), 0);
  EXPECT_EQ(mail.ValidateTag(OE_TAG_MSGBODY), 0);
  EXPECT_EQ(mail.SetMessageBody(OEString(std::string(10001, 'x').c_str())), 0);
  EXPECT_EQ(mail.ValidateTag(OE_TAG_MSGBODY), 0);
  EXPECT_EQ(log->Entries(), 0);
  ASSERT_EQ(mail.SetMessageBody(OEString("kept")), 1);
  EXPECT_EQ(mail.SetMessageBody(OEString(std::string(10001, 'x').c_str())), 0);
  EXPECT_EQ(mail.GetMessageBody(), "kept");
  EXPECT_EQ(mail.SetMessageBody(OEString(std::string(10000, 'x').c_str())), 1);
  EXPECT_EQ(mail.GetMessageBody().GetStrLength(), 10000);
  log->DeleteAll();

  // A body of 2000 characters with &, < and > is valid, written as entities
  // and read back exactly.
  const std::string nearLimit = Body(2000);
  std::unique_ptr<OEMail> near(NewMail(nearLimit));
  EXPECT_EQ(near->GetMessageBody().IsValid(), 1);
  EXPECT_EQ(near->GetMessageBody().SpecLength(), 2000);
  WrittenText strict = WriteUnderOwnTag(*near, OE_BUILD_STRICT, 1);
  ASSERT_EQ(strict.status, OE_BUILD_OK);
  EXPECT_NE(strict.text.find("<MSGBODY>Fees &amp; charges &lt;refund&gt; of 5 &gt; 3: "), std::string::npos);
  OEMail* back = Parse(strict.text)->GetMail();
  ASSERT_NE(back, nullptr);
  EXPECT_EQ(std::string(back->GetMessageBody().c_str()), nearLimit);
  EXPECT_EQ(log->Entries(), 0);

  // 2,500 characters are kept whole; the body is no longer valid, a strict
  // build refuses it at the message, and the warning gives no text of it.
  const std::string past = Body(2500);
  std::unique_ptr<OEMail> over(NewMail(past));
  EXPECT_EQ(std::string(over->GetMessageBody().c_str()), past);
  EXPECT_EQ(over->ValidateTag(OE_TAG_MSGBODY), 1);
  EXPECT_EQ(over->GetMessageBody().IsValid(), 0);
  ASSERT_EQ(Count(OEPW_TOOLONG), 1);
  EXPECT_EQ(std::string(log->Get(0)->value.c_str()).find("Fees"), std::string::npos);
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_MSGBODY);
  strict = WriteUnderOwnTag(*over, OE_BUILD_STRICT);
  EXPECT_EQ(strict.status, OE_BUILD_TOO_LONG);
  EXPECT_EQ(strict.inError, over.get());
  // Read from a file, it is kept whole as well.
  log->DeleteAll();
  back = Parse(Mail(std::string(2500, 'z')), OE_PARSE_WARNINGS)->GetMail();
  EXPECT_EQ(back->GetMessageBody().GetStrLength(), 2500);
  EXPECT_EQ(Count(OEPW_TOOLONG), 1);
}

TEST_F(MailTest, BadDatesAndFlagsAreWarnedAndLeftAbsent) {
  std::string text = Mail();
  text.replace(text.find("20240115103000.000[-5:EST]"), 26, "2024-13-45");
  text.replace(text.find("<INCIMAGES>N"), 12, "<INCIMAGES>MAYBE");
  OEMail* mail = Parse(text, OE_PARSE_WARNINGS)->GetMail();
  ASSERT_NE(mail, nullptr);
  EXPECT_EQ(Count(OEPW_BADFORMAT), 2);
  EXPECT_EQ(mail->ValidateTag(OE_TAG_DTCREATED), 0);
  EXPECT_EQ(mail->ValidateTag(OE_TAG_INCIMAGES), 0);
  EXPECT_EQ(mail->ValidateTag(OE_TAG_USEHTML), 1);
  EXPECT_EQ(mail->GetMessageBody(), "Your statement is ready.");
  EXPECT_EQ(mail->AllRequiredPresent(), 0);
  EXPECT_EQ(mail->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_DTCREATED);

  // The setters from values and text.
  OEMail set;
  EXPECT_EQ(set.SetUseHTML(OEString("Y")), 1);
  EXPECT_EQ(set.GetUseHTML(), 1);
  EXPECT_EQ(set.SetIncludeImages(static_cast<unsigned short>(0)), 1);
  EXPECT_EQ(set.ValidateTag(OE_TAG_INCIMAGES), 1);
  EXPECT_EQ(set.SetDateTimeCreated(OEString("20241")), 0);
  EXPECT_EQ(set.ValidateTag(OE_TAG_DTCREATED), 0);
  // An over-long subject is kept whole and reported.
  log->DeleteAll();
  EXPECT_EQ(set.SetSubject(OEString(std::string(61, 's').c_str())), 1);
  EXPECT_EQ(set.GetSubject().GetStrLength(), 61);
  EXPECT_EQ(Count(OEPW_TOOLONG), 1);
}

// ---------------------------------------------------------------------------
// What carries a message

TEST_F(MailTest, BankMailNeedsExactlyOneAccount) {
  MailRoot* root = Parse("<BANKMAILRQ>" + std::string(kCard) + Mail() + "</BANKMAILRQ>");
  OEBankMailRq* rq = root->GetBankMailRq();
  ASSERT_NE(rq, nullptr);
  ASSERT_NE(rq->GetBankAccountFrom(), nullptr);
  EXPECT_EQ(rq->GetBankAccountFrom()->GetType(), OE_TAG_CCACCTFROM);
  EXPECT_NE(dynamic_cast<OECCAccount*>(rq->GetBankAccountFrom()), nullptr);
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  EXPECT_EQ(Write(*rq), "<BANKMAILRQ>" + std::string(kCard) + Write(*rq->GetMail()) + "</BANKMAILRQ>");

  // Both accounts: both are read, and the rule fails.
  rq = Parse("<BANKMAILRQ>" + std::string(kChecking) + kCard + Mail() + "</BANKMAILRQ>")->GetBankMailRq();
  EXPECT_EQ(rq->ValidateTag(OE_TAG_BANKACCTFROM), 1);
  EXPECT_EQ(rq->ValidateTag(OE_TAG_CCACCTFROM), 1);
  EXPECT_EQ(rq->AllRequiredPresent(), 0);

  // The bank account alone passes; the response takes the same.
  OEBankMailRs* rs = Parse("<BANKMAILRS>" + std::string(kChecking) + Mail() + "</BANKMAILRS>")->GetBankMailRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  EXPECT_EQ(static_cast<OEBankAccount*>(rs->GetBankAccountFrom())->GetBankID(), "121000248");

  // The walk: the message, then each way to name the account; after
  // CCACCTFROM it ends.
  OEBankMailRq empty;
  EXPECT_EQ(empty.AllRequiredPresent(), 0);
  EXPECT_EQ(Walk(empty), (std::vector<OETagID>{OE_TAG_MAIL, OE_TAG_BANKACCTFROM, OE_TAG_CCACCTFROM}));
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_CCACCTFROM), OE_TAG_NONE);
  ASSERT_EQ(empty.SetMail(NewMail("Hello")), 1);
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_BANKACCTFROM);
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_BANKACCTFROM), OE_TAG_CCACCTFROM);
  // An account set by class stands under its own tag.
  auto* card = new OECCAccount;
  card->SetAccountID(OEString("4111"));
  ASSERT_EQ(empty.SetBankAccountFrom(card), 1);
  EXPECT_EQ(empty.ValidateTag(OE_TAG_CCACCTFROM), 1);
  EXPECT_EQ(empty.AllRequiredPresent(), 1);
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_BANKACCTFROM), OE_TAG_NONE);
  // A second account is refused while one is held.
  auto* bank = new OEBankAccount;
  EXPECT_EQ(empty.SetBankAccountFrom(bank), 0);
  delete bank;
}

TEST_F(MailTest, PaymentMailNeedsTheServerIdAndPaymentTogether) {
  const std::string payment =
      "<PMTINFO>" + std::string(kChecking) + "<TRNAMT>42.50<PAYEEID>P-7<PAYACCT>ACC-1<DTDUE>20240120</PMTINFO>";
  OEPaymentMailRq* rq = Parse("<PMTMAILRQ>" + Mail() + "<SRVRTID>S-99" + payment + "</PMTMAILRQ>")->GetPaymentMailRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->GetServerTransactionID(), "S-99");
  ASSERT_NE(rq->GetPaymentInfo(), nullptr);
  EXPECT_EQ(rq->GetPaymentInfo()->GetPayeeID(), "P-7");
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  const std::string written = Write(*rq);
  EXPECT_EQ(written.find("<PMTMAILRQ><MAIL>"), 0u) << written;
  EXPECT_NE(written.find("</MAIL><SRVRTID>S-99<PMTINFO>"), std::string::npos) << written;

  // The server id without the payment fails; neither passes.
  rq = Parse("<PMTMAILRQ>" + Mail() + "<SRVRTID>S-99</PMTMAILRQ>")->GetPaymentMailRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 0);
  EXPECT_EQ(rq->GetFirstMissingRequiredTag(OE_TAG_SRVRTID), OE_TAG_PMTINFO);
  rq = Parse("<PMTMAILRQ>" + Mail() + payment + "</PMTMAILRQ>")->GetPaymentMailRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 0);
  rq = Parse("<PMTMAILRQ>" + Mail() + "</PMTMAILRQ>")->GetPaymentMailRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 1);

  OEPaymentMailRs empty;
  EXPECT_EQ(Walk(empty), (std::vector<OETagID>{OE_TAG_MAIL, OE_TAG_SRVRTID, OE_TAG_PMTINFO}));
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_PMTINFO), OE_TAG_NONE);
  EXPECT_EQ(empty.SetServerTransactionID(OEString36("S-1")), 1);
  EXPECT_EQ(empty.AllRequiredPresent(), 0);
}

TEST_F(MailTest, BrokerageMailAndFreeFormMail) {
  OEInvestmentMailRq* rq = Parse("<INVMAILRQ>" + std::string(kBrokerage) + Mail() + "</INVMAILRQ>")->GetInvMailRq();
  ASSERT_NE(rq, nullptr);
  ASSERT_NE(rq->GetInvAccountFrom(), nullptr);
  EXPECT_EQ(rq->GetInvAccountFrom()->GetBrokerID(), "broker.example");
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  EXPECT_EQ(Write(*rq).find("<INVMAILRQ>" + std::string(kBrokerage) + "<MAIL>"), 0u);
  OEInvestmentMailRs noAccount;
  noAccount.SetMail(NewMail("x"));
  EXPECT_EQ(noAccount.AllRequiredPresent(), 0);
  EXPECT_EQ(noAccount.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_INVACCTFROM);

  OEMailRq* free = Parse("<MAILRQ>" + Mail() + "</MAILRQ>")->GetMailRq();
  ASSERT_NE(free, nullptr);
  EXPECT_EQ(free->AllRequiredPresent(), 1);
  OEMailRs noMail;
  EXPECT_EQ(noMail.AllRequiredPresent(), 0);
  EXPECT_EQ(noMail.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_MAIL);
}

TEST_F(MailTest, ChequeAndDepositNotices) {
  const std::string check = "<CHKMAILRS>" + std::string(kChecking) + Mail() +
                            "<CHEQUENUM>1042<TRNAMT>-125.00<DTUSER>20240110<FEE>2.50</CHKMAILRS>";
  OECheckMailRs* chk = Parse(check)->GetCheckMailRs();
  ASSERT_NE(chk, nullptr);
  EXPECT_EQ(chk->GetCheckNumber(), "1042");
  EXPECT_EQ(chk->GetTransactionAmount(), OEPrecisionInteger("-125.00"));
  EXPECT_EQ(chk->GetFee(), OEPrecisionInteger("2.50"));
  EXPECT_EQ(chk->GetDateTimeUser(), OEDateTime(OEString("20240110")));
  EXPECT_EQ(chk->GetBankAccountFrom()->GetAccountID(), "1001");
  EXPECT_EQ(chk->AllRequiredPresent(), 1);
  // Account, message, then the cheque's elements.
  EXPECT_EQ(Write(*chk), "<CHKMAILRS>" + std::string(kChecking) + Write(*chk->GetMail()) +
                             "<CHEQUENUM>1042<TRNAMT>-125.00<DTUSER>20240110<FEE>2.50</CHKMAILRS>");

  // A bad amount is warned and left out; the cheque number is required.
  OECheckMailRs* bad = Parse("<CHKMAILRS>" + std::string(kChecking) + Mail() + "<TRNAMT>12,5x</CHKMAILRS>",
                                 OE_PARSE_WARNINGS)
                           ->GetCheckMailRs();
  EXPECT_EQ(Count(OEPW_BADFORMAT), 1);
  EXPECT_EQ(bad->ValidateTag(OE_TAG_TRNAMT), 0);
  EXPECT_EQ(bad->AllRequiredPresent(), 0);
  EXPECT_EQ(bad->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_CHEQUENUM);

  OEDepositMailRs* dep = Parse("<DEPMAILRS>" + std::string(kChecking) + Mail() +
                               "<TRNAMT>900.00<DTUSER>20240112</DEPMAILRS>")
                             ->GetDepositMailRs();
  ASSERT_NE(dep, nullptr);
  EXPECT_EQ(dep->GetTransactionAmount(), OEPrecisionInteger("900.00"));
  EXPECT_EQ(dep->AllRequiredPresent(), 1);
  EXPECT_EQ(dep->ValidateTag(OE_TAG_FEE), 0);
  OEDepositMailRs noAmount;
  auto* account = new OEBankAccount;
  ASSERT_EQ(noAmount.SetBankAccountFrom(account), 1);
  ASSERT_EQ(noAmount.SetMail(NewMail("x")), 1);
  EXPECT_EQ(Walk(noAmount), std::vector<OETagID>{OE_TAG_TRNAMT});
  // A cheque number is not a deposit's: it is skipped with a warning.
  log->DeleteAll();
  Parse("<DEPMAILRS>" + std::string(kChecking) + Mail() + "<CHEQUENUM>7<TRNAMT>1</DEPMAILRS>", OE_PARSE_WARNINGS);
  EXPECT_GT(log->Entries(), 0);
}

TEST_F(MailTest, MimeRetrievalByURL) {
  const char url[] = "https://ofx.example.com/mime/123?part=2&x=<y>";
  MailRoot* root = Parse(std::string("<GETMIMERQ><URL>https://ofx.example.com/mime/123?part=2&amp;x=&lt;y&gt;"
                                     "</GETMIMERQ><GETMIMERS><URL>https://ofx.example.com/a</GETMIMERS>"));
  ASSERT_NE(root->GetGetMimeRq(), nullptr);
  EXPECT_EQ(root->GetGetMimeRq()->GetURL(), url);
  EXPECT_EQ(root->GetGetMimeRs()->GetURL(), "https://ofx.example.com/a");
  EXPECT_EQ(Write(*root->GetGetMimeRq()),
            "<GETMIMERQ><URL>https://ofx.example.com/mime/123?part=2&amp;x=&lt;y&gt;</GETMIMERQ>");
  OEGetMimeRs empty;
  EXPECT_EQ(empty.AllRequiredPresent(), 0);
  EXPECT_EQ(empty.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_URL);
}

TEST_F(MailTest, DeepCopiesAreIndependent) {
  OEBankMailRs source;
  auto* card = new OECCAccount;
  card->SetAccountID(OEString("4111"));
  source.SetBankAccountFrom(card);
  const std::string body = Body(2100);
  source.SetMail(NewMail(body));

  OEBankMailRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(&source), 1);
  ASSERT_NE(copy.GetMail(), nullptr);
  EXPECT_NE(copy.GetMail(), source.GetMail());
  EXPECT_EQ(std::string(copy.GetMail()->GetMessageBody().c_str()), body);
  EXPECT_NE(dynamic_cast<OECCAccount*>(copy.GetBankAccountFrom()), nullptr);
  EXPECT_EQ(copy.GetBankAccountFrom()->GetType(), OE_TAG_CCACCTFROM);
  EXPECT_EQ(Write(copy), Write(source));
  source.GetMail()->SetSubject(OEString("changed"));
  source.GetMail()->SetMessageBody(OEString("changed"));
  EXPECT_EQ(copy.GetMail()->GetSubject(), "Fee refund");
  EXPECT_EQ(std::string(copy.GetMail()->GetMessageBody().c_str()), body);

  // Through the inner-request interface, and a payment mail with its payment.
  OEPaymentMailRq pmt;
  pmt.SetMail(NewMail("About my payment"));
  pmt.SetServerTransactionID(OEString("S-1"));
  OEPaymentInfo* info = pmt.GetPaymentInfo(1);
  ASSERT_NE(info, nullptr);
  info->SetPayeeID(OEString("P-1"));
  std::unique_ptr<OETransBase> made(OENewInnerTrans(OEDataObj::GetFactory(), OE_TAG_PMTMAILRQ));
  ASSERT_NE(made, nullptr);
  ASSERT_EQ(made->DeepCopyFrom(static_cast<const OETransBase*>(&pmt)), 1);
  EXPECT_EQ(Write(*made), Write(pmt));
  // A copy between classes is refused.
  OEMailRq other;
  EXPECT_EQ(other.DeepCopyFrom(static_cast<const OETransBase*>(&pmt)), 0);
}

// ---------------------------------------------------------------------------
// Whole documents

TEST_F(MailTest, ResponseWithMailOfEverySetParsesFullyAndRoundTrips) {
  const std::string body = Body(1990);
  std::string escaped;
  for (char c : body) escaped += c == '&' ? "&amp;" : c == '<' ? "&lt;" : c == '>' ? "&gt;" : std::string(1, c);
  auto trn = [](const char* wrapper, const char* id, const std::string& inner) {
    return std::string("<") + wrapper + "><TRNUID>" + id +
           "<STATUS><CODE>0<SEVERITY>INFO</STATUS>" + inner + "</" + wrapper + ">";
  };
  const std::string text =
      "<OFX><SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20240115120000"
      "<LANGUAGE>ENG</SONRS></SIGNONMSGSRSV1>"
      "<BANKMSGSRSV1>" +
      trn("BANKMAILTRNRS", "B1", "<BANKMAILRS>" + std::string(kChecking) + Mail() + "</BANKMAILRS>") +
      trn("BANKMAILTRNRS", "B2",
          "<CHKMAILRS>" + std::string(kChecking) + Mail() + "<CHEQUENUM>1042<TRNAMT>-125.00</CHKMAILRS>") +
      trn("BANKMAILTRNRS", "B3", "<DEPMAILRS>" + std::string(kChecking) + Mail() + "<TRNAMT>900.00</DEPMAILRS>") +
      "</BANKMSGSRSV1><INVSTMTMSGSRSV1>" +
      trn("INVMAILTRNRS", "I1", "<INVMAILRS>" + std::string(kBrokerage) + Mail() + "</INVMAILRS>") +
      "</INVSTMTMSGSRSV1><BILLPAYMSGSRSV1>" +
      trn("PMTMAILTRNRS", "P1", "<PMTMAILRS>" + Mail() + "</PMTMAILRS>") +
      "</BILLPAYMSGSRSV1><EMAILMSGSRSV1><MAILSYNCRS><TOKEN>42<LOSTSYNC>N" +
      trn("MAILTRNRS", "M1", "<MAILRS>" + Mail(escaped) + "</MAILRS>") +
      trn("MAILTRNRS", "M2", "<MAILRS>" + Mail("Second") + "</MAILRS>") +
      trn("MAILTRNRS", "M3", "<MAILRS>" + Mail("Third") + "</MAILRS>") +
      "</MAILSYNCRS>" + trn("GETMIMETRNRS", "G1", "<GETMIMERS><URL>https://ofx.example.com/m/1</GETMIMERS>") +
      "</EMAILMSGSRSV1></OFX>";

  OEResponse response;
  ASSERT_EQ(ParseText(text, &response), OE_PARSE_OK);
  EXPECT_EQ(log->Entries(), 0);
  std::vector<const OEMailBase*> mails;
  Collect(&response, mails);
  ASSERT_EQ(mails.size(), 8u);
  std::vector<const OEMailRs*> free;
  for (const OEMailBase* m : mails)
    if (auto* rs = dynamic_cast<const OEMailRs*>(m)) free.push_back(rs);
  ASSERT_EQ(free.size(), 3u);
  EXPECT_EQ(std::string(free[0]->GetMail()->GetMessageBody().c_str()), body);
  EXPECT_EQ(free[2]->GetMail()->GetMessageBody(), "Third");
  std::vector<const OEGetMimeRs*> mime;
  Collect(&response, mime);
  ASSERT_EQ(mime.size(), 1u);
  std::vector<const OECheckMailRs*> checks;
  Collect(&response, checks);
  ASSERT_EQ(checks.size(), 1u);
  EXPECT_EQ(checks[0]->GetCheckNumber(), "1042");

  // Written strictly and read back, the document is the same.
  WrittenText strict = WriteUnderOwnTag(response, OE_BUILD_STRICT);
  ASSERT_EQ(strict.status, OE_BUILD_OK);
  OEResponse again;
  ASSERT_EQ(ParseText(strict.text, &again), OE_PARSE_OK);
  EXPECT_EQ(WriteUnderOwnTag(again, OE_BUILD_STRICT).text, strict.text);
  std::vector<const OEMailBase*> mailsAgain;
  Collect(&again, mailsAgain);
  ASSERT_EQ(mailsAgain.size(), 8u);
}

// A request document as a mail client sends one: each kind of mail request
// in its wrapper or sync wrapper, in the message set its request belongs to.
TEST_F(MailTest, RequestDocumentWithMailWrappersAndSyncs) {
  EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(OE_TAG_BANKMAILRQ), OE_TAG_BANKMSGSET);
  EXPECT_EQ(OETransRq::MsgIDToTranWrapper(OE_TAG_BANKMAILRQ), OE_TAG_BANKMAILTRNRQ);
  EXPECT_EQ(OETransRq::MsgIDToTranWrapper(OE_TAG_PMTMAILRQ), OE_TAG_PMTMAILTRNRQ);
  EXPECT_EQ(OETransRq::MsgIDToTranWrapper(OE_TAG_INVMAILRQ), OE_TAG_INVMAILTRNRQ);

  const std::string text =
      "<OFX>" + std::string(kSignOn) + "<BANKMSGSRQV1><BANKMAILSYNCRQ><TOKEN>0<REJECTIFMISSING>N" + kChecking +
      "<INCIMAGES>N<USEHTML>N<BANKMAILTRNRQ><TRNUID>1<BANKMAILRQ>" + kChecking + Mail() +
      "</BANKMAILRQ></BANKMAILTRNRQ></BANKMAILSYNCRQ></BANKMSGSRQV1>"
      "<INVSTMTMSGSRQV1><INVMAILTRNRQ><TRNUID>2<INVMAILRQ>" + kBrokerage + Mail() +
      "</INVMAILRQ></INVMAILTRNRQ></INVSTMTMSGSRQV1>"
      "<BILLPAYMSGSRQV1><PMTMAILTRNRQ><TRNUID>3<PMTMAILRQ>" + Mail() +
      "</PMTMAILRQ></PMTMAILTRNRQ></BILLPAYMSGSRQV1>"
      "<EMAILMSGSRQV1><MAILSYNCRQ><TOKEN>0<REJECTIFMISSING>N<INCIMAGES>N<USEHTML>N"
      "<MAILTRNRQ><TRNUID>4<MAILRQ>" + Mail() +
      "</MAILRQ></MAILTRNRQ></MAILSYNCRQ><GETMIMETRNRQ><TRNUID>5<GETMIMERQ><URL>https://ofx.example.com/m/1"
      "</GETMIMERQ></GETMIMETRNRQ></EMAILMSGSRQV1></OFX>";
  OERequest request;
  ASSERT_EQ(ParseText(text, &request, 1), OE_PARSE_OK);
  EXPECT_EQ(log->Entries(), 0);
  std::vector<const OEMailBase*> mails;
  Collect(&request, mails);
  EXPECT_EQ(mails.size(), 4u);
  std::vector<const OEGetMimeRq*> mime;
  Collect(&request, mime);
  EXPECT_EQ(mime.size(), 1u);

  OEDataObj* where = &request;
  OETagID missing = OE_TAG_NONE;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&where, &missing), 1);
  WrittenText strict = WriteUnderOwnTag(request, OE_BUILD_STRICT, 1);
  ASSERT_EQ(strict.status, OE_BUILD_OK);
  OERequest again;
  ASSERT_EQ(ParseText(strict.text, &again, 1), OE_PARSE_OK);
  EXPECT_EQ(WriteUnderOwnTag(again, OE_BUILD_STRICT).text, strict.text);

  // A bank mail request naming two accounts is read whole, and the check
  // finds it.
  OERequest twoAccounts;
  ASSERT_EQ(ParseText("<OFX>" + std::string(kSignOn) + "<BANKMSGSRQV1><BANKMAILTRNRQ><TRNUID>1<BANKMAILRQ>" +
                          kChecking + kCard + Mail() + "</BANKMAILRQ></BANKMAILTRNRQ></BANKMSGSRQV1></OFX>",
                      &twoAccounts),
            OE_PARSE_OK);
  std::vector<const OEBankMailRq*> bank;
  Collect(&twoAccounts, bank);
  ASSERT_EQ(bank.size(), 1u);
  where = &twoAccounts;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&where, &missing), 0);
  EXPECT_EQ(where, bank[0]);
}

// Every inner mail request and response is made by the factory as the class
// of its tag, and an application's factory is the one a parse uses.
TEST_F(MailTest, InnerAggregatesAreMadeForTheirTags) {
  const OETagID inner[] = {OE_TAG_MAILRQ,    OE_TAG_MAILRS,    OE_TAG_BANKMAILRQ, OE_TAG_BANKMAILRS,
                           OE_TAG_CHKMAILRS, OE_TAG_DEPMAILRS, OE_TAG_INVMAILRQ,  OE_TAG_INVMAILRS,
                           OE_TAG_PMTMAILRQ, OE_TAG_PMTMAILRS, OE_TAG_GETMIMERQ,  OE_TAG_GETMIMERS};
  OEDataObjFactory factory;
  for (OETagID tag : inner) {
    std::unique_ptr<OETransBase> made(OENewInnerTrans(&factory, tag));
    ASSERT_NE(made, nullptr) << tag;
    EXPECT_EQ(made->GetType(), tag);
  }
  EXPECT_NE(dynamic_cast<OEPaymentMailBase*>(std::unique_ptr<OETransBase>(
                                                 OENewInnerTrans(&factory, OE_TAG_PMTMAILRS)).get()),
            nullptr);

  struct Counting : OEDataObjFactory {
    int mails = 0;
    OEMail* NewMail() override {
      ++mails;
      return OEDataObjFactory::NewMail();
    }
  } counting;
  OEDataObjFactory* before = OEDataObj::GetFactory();
  OEDataObj::SetFactory(&counting);
  OERequest request;
  const std::string text = "<OFX><EMAILMSGSRQV1><MAILTRNRQ><TRNUID>1<MAILRQ>" + Mail() +
                           "</MAILRQ></MAILTRNRQ></EMAILMSGSRQV1><BANKMSGSRQV1><BANKMAILTRNRQ><TRNUID>2<BANKMAILRQ>" +
                           kChecking + Mail() + "</BANKMAILRQ></BANKMAILTRNRQ></BANKMSGSRQV1></OFX>";
  EXPECT_EQ(ParseText(text, &request), OE_PARSE_OK);
  OEDataObj::SetFactory(before);
  EXPECT_EQ(counting.mails, 2);
}

}  // namespace
