#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"

// Small aggregates built with the library's declarative machinery, standing
// in for a response tree: root > OFX > (SIGNONMSGSRSV1, BANKACCTFROM*, elements).
class TSignOn;
class TNest;
class TOfx;
template <>
struct OEChildCreator<TSignOn> {
  static TSignOn* Make(OEDataObjFactory*, OETagID);
};
template <>
struct OEChildCreator<TNest> {
  static TNest* Make(OEDataObjFactory*, OETagID);
};
template <>
struct OEChildCreator<TOfx> {
  static TOfx* Make(OEDataObjFactory*, OETagID);
};

#define T_SIGNON_FIELDS(X) X(TEXT, Code, CODE, OEString6) X(VALUE, DtServer, DTSERVER, OEDateTime)
class TSignOn : public OEAggregate {
  OE_AGGREGATE(TSignOn, T_SIGNON_FIELDS)
};
OE_DEFINE_AGGREGATE(TSignOn, OEAggregate, T_SIGNON_FIELDS, SIGNONMSGSRSV1,
                    .Valid(OE_TAGS(CODE, DTSERVER)).Required(OE_TAGS(CODE)))

#define T_NEST_FIELDS(X) X(CHILD, Inner, STMTRS, TNest)
class TNest : public OEAggregate {
  OE_AGGREGATE(TNest, T_NEST_FIELDS)
};
OE_DEFINE_AGGREGATE(TNest, OEAggregate, T_NEST_FIELDS, STMTRS, .Valid(OE_TAGS(STMTRS)))

#define T_OFX_FIELDS(X)                               \
  X(CHILD, SignOn, SIGNONMSGSRSV1, TSignOn)           \
  X(LIST, Account, BANKACCTFROM, OEBankAccount)       \
  X(CHILD, Nest, STMTRS, TNest)                       \
  X(TEXT, Memo, MEMO, OEString255)                    \
  X(TEXT, Password, USERPASS, OEUserPassword)         \
  X(VALUE, Amount, TRNAMT, OEPrecisionInteger)
class TOfx : public OEAggregate {
  OE_AGGREGATE(TOfx, T_OFX_FIELDS)
};
OE_DEFINE_AGGREGATE(TOfx, OEAggregate, T_OFX_FIELDS, OFX,
                    .Valid(OE_TAGS(SIGNONMSGSRSV1, BANKACCTFROM, STMTRS, MEMO, USERPASS, TRNAMT)))

#define T_ROOT_FIELDS(X) X(CHILD, Ofx, OFX, TOfx)
class TRoot : public OEAggregate {
  OE_AGGREGATE(TRoot, T_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(TRoot, OEAggregate, T_ROOT_FIELDS, NONE, .Valid(OE_TAGS(OFX)))

TSignOn* OEChildCreator<TSignOn>::Make(OEDataObjFactory*, OETagID) { return new TSignOn; }
TNest* OEChildCreator<TNest>::Make(OEDataObjFactory*, OETagID) { return new TNest; }
TOfx* OEChildCreator<TOfx>::Make(OEDataObjFactory*, OETagID) { return new TOfx; }

namespace {
struct Parsed {
  OEParseStatus status;
  OEDataObj* withError;
};

class SimpleParserTest : public LogFixture {
 protected:
  Parsed Parse(const std::string& text, unsigned short checkRequired = 0) {
    OEBuffer buffer;
    buffer.WriteLarge(text.data(), static_cast<uint32_t>(text.size()));
    OESimpleParser parser;
    OEParseStatus status = parser.Parse(&buffer, &root, checkRequired);
    return Parsed{status, parser.GetObjectWithError()};
  }
  OEParseLogger* Log() { return log; }
  TRoot root;
};

const char kHeader[] =
    "OFXHEADER:100\r\nDATA:OFXSGML\r\nVERSION:102\r\nSECURITY:NONE\r\nENCODING:USASCII\r\n"
    "CHARSET:1252\r\nCOMPRESSION:NONE\r\nOLDFILEUID:NONE\r\nNEWFILEUID:NONE\r\n\r\n";
}  // namespace

TEST_F(SimpleParserTest, CleanResponseBuildsTheTree) {
  Parsed p = Parse(std::string(kHeader) +
                   "<OFX><SIGNONMSGSRSV1><CODE>0</CODE><DTSERVER>20261123120000</SIGNONMSGSRSV1>"
                   "<BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>"
                   "<BANKACCTFROM><BANKID>121000248<ACCTID>2002<ACCTTYPE>SAVINGS</BANKACCTFROM>"
                   "<MEMO>Rent &amp; utilities<TRNAMT>-1234.56</OFX>");
  EXPECT_EQ(p.status, OE_PARSE_OK);
  EXPECT_EQ(Log()->Entries(), 0);
  ASSERT_NE(root.GetOfx(), nullptr);
  TOfx* ofx = root.GetOfx();
  ASSERT_NE(ofx->GetSignOn(), nullptr);
  EXPECT_EQ(ofx->GetSignOn()->GetCode(), "0");
  EXPECT_EQ(ofx->GetSignOn()->GetDtServer().GetYear(), 2026);
  ASSERT_EQ(ofx->GetNumAccount(), 2);
  EXPECT_EQ(ofx->GetAccount(1)->GetAccountID(), "2002");
  EXPECT_EQ(ofx->GetAccount(1)->GetAccountType(), OE_ACCTTYPE_SAVINGS);
  EXPECT_EQ(ofx->GetMemo(), "Rent & utilities");
  EXPECT_EQ(ofx->GetNumberOfChildren(), 3);
  EXPECT_EQ(ofx->GetChild(0), ofx->GetSignOn());
  EXPECT_EQ(ofx->GetChild(2), ofx->GetAccount(1));

  // Written back: same tree, canonical form, entities restored.
  OEBuffer out;
  OEBuilder builder;
  EXPECT_EQ(builder.Build(&out, &root, OE_BUILD_STRICT, 1), OE_BUILD_OK);
  std::string text(out.GetBufferPtr(), out.GetBufferSize());
  EXPECT_NE(text.find("<MEMO>Rent &amp; utilities\n"), std::string::npos);
  EXPECT_NE(text.find("<TRNAMT>-1234.56\n"), std::string::npos);
  TRoot again;
  OESimpleParser parser;
  EXPECT_EQ(parser.Parse(&out, &again, 1), OE_PARSE_OK);
  EXPECT_EQ(again.GetOfx()->GetAccount(0)->GetBankID(), "121000248");
}

TEST_F(SimpleParserTest, ElementEndTagsAreOptional) {
  EXPECT_EQ(Parse("<OFX><SIGNONMSGSRSV1><CODE>0</CODE></SIGNONMSGSRSV1></OFX>").status, OE_PARSE_OK);
  // An element end tag that does not follow its element closes nothing.
  Parsed p = Parse("<OFX><SIGNONMSGSRSV1><CODE>0<DTSERVER>20260101</CODE></SIGNONMSGSRSV1></OFX>");
  EXPECT_EQ(p.status, OE_PARSE_END_MISMATCH);
  EXPECT_TRUE(Logged(OEPW_INVALIDENDAGG));
  EXPECT_EQ(p.withError, root.GetOfx()->GetSignOn());
}

TEST_F(SimpleParserTest, MisplacedTagsAreSkippedWithWarnings) {
  Parsed p = Parse("<OFX><CODE>9<SIGNONMSGSRSV1><MEMO>x<BANKACCTFROM><ACCTID>1</BANKACCTFROM><CODE>0"
                   "</SIGNONMSGSRSV1><TRNAMT>12.50</OFX>");
  EXPECT_EQ(p.status, OE_PARSE_WARNINGS);
  EXPECT_TRUE(Logged(OEPW_INVALIDELEM));
  EXPECT_TRUE(Logged(OEPW_INVALIDAGG));
  // Nothing read around the faults is lost.
  EXPECT_EQ(root.GetOfx()->GetSignOn()->GetCode(), "0");
  EXPECT_EQ(root.GetOfx()->GetNumAccount(), 0);
  char amount[OEPrecisionInteger::kTextSize + 1];
  root.GetOfx()->GetAmount().FormatText(amount);
  EXPECT_STREQ(amount, "12.50");
}

TEST_F(SimpleParserTest, BadValuesWarnAndTheRestIsKept) {
  Parsed p = Parse("<OFX><TRNAMT>12x<BANKACCTFROM><ACCTTYPE>SAVNGS<ACCTID>7</BANKACCTFROM><MEMO>kept</OFX>");
  EXPECT_EQ(p.status, OE_PARSE_WARNINGS);
  EXPECT_EQ(p.withError, &root);
  EXPECT_EQ(root.GetOfx()->ValidateTag(OE_TAG_TRNAMT), 0);
  OEBankAccount* account = root.GetOfx()->GetAccount(0);
  ASSERT_NE(account, nullptr);
  EXPECT_EQ(account->ValidateTag(OE_TAG_ACCTTYPE), 0);
  EXPECT_EQ(account->GetAccountID(), "7");
  EXPECT_EQ(root.GetOfx()->GetMemo(), "kept");
  ASSERT_EQ(Log()->Entries(), 2);
  EXPECT_EQ(Log()->Get(1)->warning, OEPW_BADFORMAT);
  EXPECT_EQ(Log()->Get(1)->tag, OE_TAG_ACCTTYPE);
  EXPECT_EQ(Log()->Get(1)->object, account);
  EXPECT_GT(Log()->Get(1)->position, 0);
}

TEST_F(SimpleParserTest, PasswordsNeverReachTheLog) {
  Parsed p = Parse("<OFX><SIGNONMSGSRSV1><USERPASS>hunter22</SIGNONMSGSRSV1></OFX>");
  EXPECT_EQ(p.status, OE_PARSE_WARNINGS);
  ASSERT_EQ(Log()->Entries(), 1);
  EXPECT_EQ(Log()->Get(0)->warning, OEPW_INVALIDELEM);
  EXPECT_EQ(Log()->Get(0)->value, "********");
  // Accepted, it is stored; an over-long one is reported without its text.
  std::string longPassword(200, 'p');
  p = Parse("<OFX><USERPASS>" + longPassword + "</OFX>");
  EXPECT_EQ(root.GetOfx()->GetPassword().GetStrLength(), 200);
  for (unsigned short i = 0; i < Log()->Entries(); ++i)
    EXPECT_EQ(std::string(Log()->Get(i)->value.c_str()).find("ppp"), std::string::npos);
}

TEST_F(SimpleParserTest, EveryPasswordElementAndWhatTrailsAMalformedOneStaysHidden) {
  // New and temporary passwords in the wrong place are masked like USERPASS.
  Parsed p = Parse("<OFX><SIGNONMSGSRSV1><NEWUSERPASS>n3wSecret<TEMPPASS>t3mpSecret</SIGNONMSGSRSV1></OFX>");
  ASSERT_EQ(Log()->Entries(), 2);
  EXPECT_EQ(Log()->Get(0)->value, "*********");
  EXPECT_EQ(Log()->Get(1)->value, "**********");
  // A password cut short by a '<': what follows it up to the next known tag
  // is the rest of the password, not a tag name to show.
  for (const char* text : {"<OFX><USERPASS>Secr3t<Rest0fPass\n<MEMO>kept</OFX>",
                           "<OFX><USERPASS>Secr3t<Rest0fPass><MEMO>kept</OFX>",
                           "<OFX><USERPASS>Secr3t<Rest0f Pass>more<MEMO>kept</OFX>",
                           "<OFX><USERPASS><Rest0fPass><MEMO>kept</OFX>"}) {
    SCOPED_TRACE(text);
    p = Parse(text);
    EXPECT_GT(Log()->Entries(), 0);
    for (unsigned short i = 0; i < Log()->Entries(); ++i) {
      const OEParseException* record = Log()->Get(i);
      for (const char* secret : {"Secr3t", "Rest0f", "Pass", "more"}) {
        EXPECT_EQ(std::string(record->value.c_str()).find(secret), std::string::npos) << record->value.c_str();
        EXPECT_EQ(std::string(record->tagName.c_str()).find(secret), std::string::npos) << record->tagName.c_str();
      }
    }
  }
  // What follows the next known tag is shown again.
  p = Parse("<OFX><USERPASS>Secr3t<Rest0fPass><MEMO>kept<Unknown1>x</Unknown1></OFX>");
  bool shown = false;
  for (unsigned short i = 0; i < Log()->Entries(); ++i)
    shown = shown || std::string(Log()->Get(i)->tagName.c_str()).find("Unknown1") != std::string::npos;
  EXPECT_TRUE(shown);
}

TEST_F(SimpleParserTest, TruncatedAndTrailingText) {
  Parsed p = Parse("<OFX><SIGNONMSGSRSV1>");
  EXPECT_EQ(p.status, OE_PARSE_NOT_HANDLED);
  EXPECT_TRUE(Logged(OEPW_UNKNOWNTAG));
  EXPECT_EQ(p.withError, root.GetOfx());

  p = Parse("<OFX><SIGNONMSGSRSV1><CODE>0</SIGNONMSGSRSV1>");
  EXPECT_EQ(p.status, OE_PARSE_NOT_HANDLED);

  p = Parse("<OFX><MEMO>a</OFX><MEMO>b</BOGUS><<<");
  EXPECT_EQ(p.status, OE_PARSE_OK);
  EXPECT_EQ(root.GetOfx()->GetMemo(), "a");
  // A second OFX aggregate is read (the root here holds one, replaced).
  p = Parse("<OFX><MEMO>a</OFX>\r\n<OFX><MEMO>b</OFX>trailing");
  EXPECT_EQ(p.status, OE_PARSE_OK);
  EXPECT_EQ(root.GetOfx()->GetMemo(), "b");
}

TEST_F(SimpleParserTest, RequiredCheckAndNestingLimit) {
  Parsed p = Parse("<OFX><SIGNONMSGSRSV1><DTSERVER>20260101</SIGNONMSGSRSV1></OFX>", 1);
  EXPECT_EQ(p.status, OE_PARSE_WARNINGS);
  ASSERT_EQ(Log()->Entries(), 1);
  EXPECT_EQ(Log()->Get(0)->warning, OEPW_MISSINGTAG);
  EXPECT_EQ(Log()->Get(0)->tag, OE_TAG_CODE);
  EXPECT_EQ(Log()->Get(0)->object, root.GetOfx()->GetSignOn());

  // OFX is the first level below the root; ten more fit, an eleventh does not.
  std::string nested = "<OFX>";
  for (int i = 0; i < 9; ++i) nested += "<STMTRS>";
  for (int i = 0; i < 9; ++i) nested += "</STMTRS>";
  EXPECT_EQ(Parse(nested + "</OFX>").status, OE_PARSE_OK);
  nested = "<OFX>";
  for (int i = 0; i < 10; ++i) nested += "<STMTRS>";
  for (int i = 0; i < 10; ++i) nested += "</STMTRS>";
  EXPECT_EQ(Parse(nested + "</OFX>").status, OE_PARSE_PUSH_FAILED);
}
