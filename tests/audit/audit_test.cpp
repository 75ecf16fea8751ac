#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <memory>
#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"

namespace {

const char kHeaders[] =
    "OFXHEADER:100\r\nDATA:OFXSGML\r\nVERSION:102\r\nSECURITY:NONE\r\nENCODING:USASCII\r\nCHARSET:1252\r\n"
    "COMPRESSION:NONE\r\nOLDFILEUID:NONE\r\nNEWFILEUID:NONE\r\n\r\n";

std::string Transaction(int n, const std::string& extra = "") {
  return "<STMTTRN><TRNTYPE>DEBIT<DTPOSTED>20261101<TRNAMT>-" + std::to_string(n) + ".00<FITID>F" +
         std::to_string(n) + extra + "<NAME>Shop " + std::to_string(n) + "</STMTTRN>\n";
}

std::string Body(const std::string& transactions) {
  return std::string("<OFX><SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20261123"
                     "<LANGUAGE>ENG</SONRS></SIGNONMSGSRSV1>\n<BANKMSGSRSV1><STMTTRNRS><TRNUID>1<STATUS><CODE>0"
                     "<SEVERITY>INFO</STATUS><STMTRS><CURDEF>USD<BANKACCTFROM><BANKID>121000248<ACCTID>1001"
                     "<ACCTTYPE>CHECKING</BANKACCTFROM>\n<BANKTRANLIST><DTSTART>20261101<DTEND>20261123\n") +
         transactions +
         "</BANKTRANLIST><LEDGERBAL><BALAMT>10.00<DTASOF>20261123</LEDGERBAL></STMTRS></STMTTRNRS>"
         "</BANKMSGSRSV1></OFX>\n";
}

std::string ThreeTransactions() { return Transaction(1) + Transaction(2) + Transaction(3); }

class AuditTest : public LogFixture {
 protected:
  // Parses text as a response file and audits it.
  ofxkit::AuditReport Audit(const std::string& text, uint32_t options = OE_READ_STRICT) {
    OEBuffer buffer(static_cast<uint32_t>(text.size() + 1), 1u << 16);
    buffer.WriteLarge(text.data(), static_cast<uint32_t>(text.size()));
    OESimpleParser parser;
    parser.SetReadingOptions(options);
    file.reset(new OEFileRs());
    status = parser.Parse(&buffer, file.get(), 0);
    warnings = log->Entries();
    ofxkit::AuditReport report = ofxkit::AuditParse(buffer, *file);
    EXPECT_EQ(log->Entries(), warnings) << "the audit logs nothing";
    return report;
  }
  static const ofxkit::AuditFinding* Find(const ofxkit::AuditReport& r, ofxkit::AuditKind kind, OETagID tag) {
    for (const ofxkit::AuditFinding& f : r.findings)
      if (f.kind == kind && f.tag == tag) return &f;
    return nullptr;
  }
  std::unique_ptr<OEFileRs> file;
  OEParseStatus status = OE_PARSE_OK;
  unsigned short warnings = 0;
};

TEST_F(AuditTest, AFileReadWhollyHasNoFinding) {
  ofxkit::AuditReport r = Audit(kHeaders + Body(ThreeTransactions()));
  EXPECT_EQ(status, OE_PARSE_OK);
  EXPECT_TRUE(r.findings.empty()) << r.findings.front().Describe();
  EXPECT_FALSE(r.HasLoss());
  EXPECT_GT(r.tagsInText, 50u);
}

TEST_F(AuditTest, TransactionsSwallowedByTheSkipOfAnUnknownEmptyTagAreCounted) {
  // <XTRA> has no end tag of its own; its skip runs to the </XTRA> after the
  // second transaction, taking both with it, with no warning beyond the tag.
  const std::string text =
      kHeaders + Body("<XTRA>" + Transaction(1) + Transaction(2) + "<MEMO>x</XTRA>" + Transaction(3));
  ofxkit::AuditReport r = Audit(text);
  const ofxkit::AuditFinding* f = Find(r, ofxkit::AuditKind::kMissing, OE_TAG_STMTTRN);
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(f->inText, 3u);
  EXPECT_EQ(f->inTree, 1u);
  EXPECT_EQ(f->position, static_cast<int32_t>(text.find("<STMTTRN>", text.find("<STMTTRN>") + 1)) + 1);
  EXPECT_TRUE(r.HasLoss());
  EXPECT_EQ(f->Describe().rfind("2 of 3 STMTTRN in the file were not read: ", 0), 0u) << f->Describe();
}

TEST_F(AuditTest, ATagWithoutItsCloseIsALoss) {
  std::string text = kHeaders + Body(ThreeTransactions());
  const size_t at = text.find("<TRNAMT>");
  text.replace(at, 8, "<TRNAMT 3983.18\n");
  ofxkit::AuditReport r = Audit(text);
  const ofxkit::AuditFinding* f = Find(r, ofxkit::AuditKind::kBrokenTag, OE_TAG_TRNAMT);
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(f->position, static_cast<int32_t>(at) + 1);
  EXPECT_TRUE(r.HasLoss());
}

TEST_F(AuditTest, RepeatedSingleElementsAndChildrenAreReported) {
  ofxkit::AuditReport r =
      Audit(kHeaders + Body(Transaction(1, "<TRNAMT>-5.00") + Transaction(2, "<TRNAMT>-6.00") + Transaction(3)));
  const ofxkit::AuditFinding* f = Find(r, ofxkit::AuditKind::kReplaced, OE_TAG_TRNAMT);
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(f->parent, OE_TAG_STMTTRN);
  EXPECT_EQ(f->occurrences, 2u);
  EXPECT_TRUE(r.HasLoss());

  // A second transaction list in one statement replaces the first.
  std::string two = kHeaders + Body(ThreeTransactions());
  const size_t end = two.find("</BANKTRANLIST>") + 15;
  two.insert(end, "<BANKTRANLIST><DTSTART>20261101<DTEND>20261123" + Transaction(4) + "</BANKTRANLIST>");
  r = Audit(two);
  EXPECT_NE(Find(r, ofxkit::AuditKind::kReplaced, OE_TAG_BANKTRANLIST), nullptr);
  f = Find(r, ofxkit::AuditKind::kMissing, OE_TAG_STMTTRN);
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(f->inText - f->inTree, 3u);
}

TEST_F(AuditTest, ACDataSectionRunningOverTagsIsALoss) {
  // Opened in the first memo and never closed: it runs to the "]...]>" in
  // the third transaction's name.
  ofxkit::AuditReport r = Audit(kHeaders + Body(Transaction(1, "<MEMO><![CDATA[note") + Transaction(2) +
                                                "<STMTTRN><TRNTYPE>DEBIT<DTPOSTED>20261101<TRNAMT>-3.00<FITID>F3"
                                                "<NAME>Shop [a] [b]</STMTTRN>\n"));
  EXPECT_NE(Find(r, ofxkit::AuditKind::kCDataOverTags, OE_TAG_NONE), nullptr);
  EXPECT_TRUE(r.HasLoss());
}

TEST_F(AuditTest, AnOFXAfterTheEndAndTextAfterANulAreReported) {
  const std::string body = Body(ThreeTransactions());
  ofxkit::AuditReport r = Audit(kHeaders + body + "<!-- again -->\n" + body);
  const ofxkit::AuditFinding* f = Find(r, ofxkit::AuditKind::kOFXAfterEnd, OE_TAG_OFX);
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(f->inText, 2u);
  EXPECT_EQ(f->inTree, 1u);
  EXPECT_NE(Find(r, ofxkit::AuditKind::kMissing, OE_TAG_STMTTRN), nullptr);

  std::string text = std::string(kHeaders) + '\0' + body;
  r = Audit(text);
  EXPECT_EQ(status, OE_PARSE_OK) << "the parser's text ends at the NUL";
  f = Find(r, ofxkit::AuditKind::kTextAfterNul, OE_TAG_NONE);
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(f->position, static_cast<int32_t>(sizeof kHeaders - 1));
  f = Find(r, ofxkit::AuditKind::kMissing, OE_TAG_STMTTRN);
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(f->inText, 3u);
  EXPECT_EQ(f->inTree, 0u);

  // NUL bytes that only pad the end lose nothing.
  r = Audit(kHeaders + body + std::string(8, '\0'));
  EXPECT_FALSE(r.HasLoss());
}

TEST_F(AuditTest, InvestmentAggregatesAreAuditedWhetherOrNotTheyAreRead) {
  const std::vector<OETagID>& audited = ofxkit::AuditedAggregates();
  for (OETagID tag : {OE_TAG_INVSTMTRS, OE_TAG_INVTRANLIST, OE_TAG_BUYSTOCK, OE_TAG_SELLMF, OE_TAG_INCOME,
                      OE_TAG_INVBANKTRAN, OE_TAG_REINVEST, OE_TAG_INVPOSLIST, OE_TAG_POSSTOCK, OE_TAG_POSMF,
                      OE_TAG_INVBAL, OE_TAG_BAL, OE_TAG_INVOOLIST, OE_TAG_OOBUYSTOCK, OE_TAG_SECLIST, OE_TAG_SECINFO,
                      OE_TAG_STOCKINFO, OE_TAG_MFINFO, OE_TAG_STMTTRN, OE_TAG_STMTRS, OE_TAG_OFX})
    EXPECT_NE(std::find(audited.begin(), audited.end(), tag), audited.end()) << tag;

  const std::string invest =
      "<OFX><SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20261123<LANGUAGE>ENG</SONRS>"
      "</SIGNONMSGSRSV1><INVSTMTMSGSRSV1><INVSTMTTRNRS><TRNUID>1<STATUS><CODE>0<SEVERITY>INFO</STATUS>"
      "<INVSTMTRS><DTASOF>20261123<CURDEF>USD<INVACCTFROM><BROKERID>b.example<ACCTID>9</INVACCTFROM>"
      "<INVTRANLIST><DTSTART>20261101<DTEND>20261123<BUYSTOCK><INVBUY><INVTRAN><FITID>B1<DTTRADE>20261102"
      "</INVTRAN><SECID><UNIQUEID>123456789<UNIQUEIDTYPE>CUSIP</SECID><UNITS>10<UNITPRICE>5<TOTAL>-50"
      "<SUBACCTSEC>CASH<SUBACCTFUND>CASH</INVBUY><BUYTYPE>BUY</BUYSTOCK></INVTRANLIST></INVSTMTRS>"
      "</INVSTMTTRNRS></INVSTMTMSGSRSV1></OFX>\n";
  ofxkit::AuditReport r = Audit(kHeaders + invest);
  // Whatever this build reads of it, every buy in the text is in the tree or
  // reported.
  const ofxkit::AuditFinding* f = Find(r, ofxkit::AuditKind::kMissing, OE_TAG_BUYSTOCK);
  if (f) {
    EXPECT_EQ(f->inText, 1u);
    EXPECT_TRUE(r.HasLoss());
  }
  f = Find(r, ofxkit::AuditKind::kMissing, OE_TAG_SECID);
  if (f) {
    EXPECT_EQ(f->inText, 1u);
  }
}

TEST_F(AuditTest, HostileTextsAreAuditedInBoundedWork) {
  // Deep nesting, long runs of unclosed tags and of stray end tags.
  std::string text = kHeaders;
  for (int i = 0; i < 20000; ++i) text += "<STMTTRN>";
  for (int i = 0; i < 20000; ++i) text += "</BANKTRANLIST>";
  for (int i = 0; i < 2000; ++i) text += "<![CDATA[<OFX>";
  ofxkit::AuditReport r = Audit(text);
  const ofxkit::AuditFinding* f = Find(r, ofxkit::AuditKind::kMissing, OE_TAG_STMTTRN);
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(f->inText, 20000u);
  EXPECT_TRUE(r.complete);
}

TEST_F(AuditTest, CorpusFilesAuditWithoutSurplus) {
  const char* names[] = {"bank-statement-response.ofx", "creditcard-statement-response.ofx",
                         "bank-statement-commented.sgml", "invest-statement-response.ofx"};
  int read = 0;
  for (const char* name : names) {
    std::string path = std::string(OFXKIT_CORPUS_DIR) + "/" + name;
    FILE* f = std::fopen(path.c_str(), "rb");
    if (!f) continue;
    std::string text;
    char chunk[4096];
    size_t n;
    while ((n = std::fread(chunk, 1, sizeof chunk, f)) > 0) text.append(chunk, n);
    std::fclose(f);
    ++read;
    ofxkit::AuditReport r = Audit(text);
    for (const ofxkit::AuditFinding& finding : r.findings)
      EXPECT_NE(finding.kind, ofxkit::AuditKind::kSurplus) << name << ": " << finding.Describe();
    if (status == OE_PARSE_OK) {
      EXPECT_FALSE(r.HasLoss()) << name;
    }
  }
  if (!read) GTEST_SKIP() << "no corpus";
}

}  // namespace
