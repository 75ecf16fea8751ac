#include <gtest/gtest.h>

#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"

namespace {

std::string Headers(const char* encoding = "USASCII", const char* version = "102") {
  return std::string("OFXHEADER:100\r\nDATA:OFXSGML\r\nVERSION:") + version +
         "\r\nSECURITY:NONE\r\nENCODING:" + encoding +
         "\r\nCHARSET:1252\r\nCOMPRESSION:NONE\r\nOLDFILEUID:NONE\r\nNEWFILEUID:NONE\r\n\r\n";
}

std::string Body(const std::string& memo) {
  return "<OFX><SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20261123<LANGUAGE>ENG"
         "</SONRS></SIGNONMSGSRSV1><BANKMSGSRSV1><STMTTRNRS><TRNUID>1<STATUS><CODE>0<SEVERITY>INFO</STATUS>"
         "<STMTRS><CURDEF>USD<BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>"
         "<BANKTRANLIST><DTSTART>20261101<DTEND>20261123<STMTTRN><TRNTYPE>DEBIT<DTPOSTED>20261101"
         "<TRNAMT>-1.00<FITID>F1" +
         memo +
         "<NAME>Shop</STMTTRN><STMTTRN><TRNTYPE>DEBIT<DTPOSTED>20261102<TRNAMT>-2.00<FITID>F2<NAME>Shop"
         "</STMTTRN></BANKTRANLIST></STMTRS></STMTTRNRS></BANKMSGSRSV1></OFX>\n";
}

class TolerantReadingTest : public LogFixture {
 protected:
  OEParseStatus Parse(const std::string& text, uint32_t options) {
    OEBuffer buffer(static_cast<uint32_t>(text.size() + 1), 1u << 16);
    buffer.WriteLarge(text.data(), static_cast<uint32_t>(text.size()));
    OESimpleParser parser;
    parser.SetReadingOptions(options);
    file.reset(new OEFileRs());
    return parser.Parse(&buffer, file.get(), 0);
  }
  unsigned short Transactions() const {
    const OEResponse* rs = file->GetResponse(0);
    for (unsigned short m = 0; rs && m < rs->GetNumMessage(); ++m) {
      const OEMessageSetRs* set = rs->GetMessageSet(m);
      const OETransRs* trn = set && set->GetNumTrans() ? set->GetTrans(0) : nullptr;
      const OEGenericStatementRs* st = trn ? dynamic_cast<const OEGenericStatementRs*>(trn->GetActualTrans()) : nullptr;
      if (st && st->GetBankTransactionList()) return st->GetBankTransactionList()->GetNumStatementTx();
    }
    return 0;
  }
  std::unique_ptr<OEFileRs> file;
};

TEST_F(TolerantReadingTest, TheDefaultIsTheDesignedReading) {
  OESimpleParser parser;
  EXPECT_EQ(parser.GetReadingOptions(), OE_READ_STRICT);
  EXPECT_EQ(Parse(Headers() + Body("<MEMO>"), OE_READ_STRICT), OE_PARSE_NOT_HANDLED);
  EXPECT_EQ(Parse(Headers("UTF-8") + Body(""), OE_READ_STRICT), OE_PARSE_NOT_HANDLED);
  EXPECT_EQ(Parse("\n\n\n" + Headers() + Body(""), OE_READ_STRICT), OE_PARSE_WARNINGS);
  EXPECT_EQ(file->GetHeader(OE_HEADER_VERSION), nullptr) << "a blank line ends the header block";
}

TEST_F(TolerantReadingTest, EmptyElementsAreReadWithAWarning) {
  for (const char* memo : {"<MEMO>", "<MEMO></MEMO>", "<MEMO>\r\n"}) {
    EXPECT_EQ(Parse(Headers() + Body(memo), OE_READ_TOLERANT), OE_PARSE_WARNINGS) << memo;
    EXPECT_EQ(Transactions(), 2u) << memo;
    ASSERT_EQ(log->Entries(), 1u) << memo;
    EXPECT_EQ(log->Get(0)->warning, OEPW_BADFORMAT);
    EXPECT_EQ(log->Get(0)->tag, OE_TAG_MEMO);
  }
  // An aggregate tag stays an aggregate; an element that the aggregate does
  // not take is skipped as before.
  EXPECT_EQ(Parse(Headers() + Body(""), OE_READ_TOLERANT), OE_PARSE_OK);
}

TEST_F(TolerantReadingTest, ModernHeadersAndBlankLinesAreReadWithWarnings) {
  EXPECT_EQ(Parse(Headers("UTF-8", "160") + Body(""), OE_READ_TOLERANT), OE_PARSE_WARNINGS);
  EXPECT_EQ(Transactions(), 2u);
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
  EXPECT_EQ(Parse(Headers("DATA") + Body(""), OE_READ_TOLERANT), OE_PARSE_NOT_HANDLED) << "only known encodings";

  EXPECT_EQ(Parse(std::string(12, '\n') + Headers() + Body(""), OE_READ_TOLERANT), OE_PARSE_WARNINGS);
  ASSERT_NE(file->GetHeader(OE_HEADER_VERSION), nullptr);
  EXPECT_STREQ(file->GetHeader(OE_HEADER_VERSION)->c_str(), "102");
  EXPECT_EQ(log->Entries(), 1u);
}

TEST_F(TolerantReadingTest, LongHeaderBlocksAreBoundedAndKeepTheLastValue) {
  std::string text;
  for (int i = 0; i < 3000; ++i) text += "X-Line" + std::to_string(i % 1500) + ": v" + std::to_string(i) + "\r\n";
  text += "\r\n" + Headers() + Body("");
  EXPECT_EQ(Parse(text, OE_READ_STRICT), OE_PARSE_WARNINGS);
  EXPECT_EQ(Transactions(), 2u) << "the body is still found";
  EXPECT_EQ(file->GetNumberMIMEHeaders(), 1000u);
  OEString name("x-line7");
  const OEMIMEHeader* h = file->GetMIMEHeader(&name);
  ASSERT_NE(h, nullptr);
  EXPECT_STREQ(h->GetValue().c_str(), "v7");
  bool bounded = false;
  for (unsigned short i = 0; i < log->Entries(); ++i)
    bounded |= std::string(log->Get(i)->value.c_str()).find("more than 1000 header lines") == 0;
  EXPECT_TRUE(bounded);

  // Under the bound, a repeated name replaces the earlier value.
  EXPECT_EQ(Parse("A: 1\r\nB: 2\r\na: 3\r\n\r\n" + Headers() + Body(""), OE_READ_STRICT), OE_PARSE_WARNINGS);
  ASSERT_EQ(file->GetNumberMIMEHeaders(), 2u);
  EXPECT_STREQ(file->GetMIMEHeader(0)->GetValue().c_str(), "3");
}

}  // namespace
