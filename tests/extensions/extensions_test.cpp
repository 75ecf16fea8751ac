// The maker's extension message sets: branding and market tiers, client
// logs, institution and customer usage logs, surveys; their enumerations,
// and files that carry them next to the standard message sets.
#include <gtest/gtest.h>

#include <memory>
#include <string>
#include <type_traits>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"
#include "support/ofx_text.h"

namespace {

#define T_VEXA_ROOT_FIELDS(X)                                        \
  X(CHILD, BrandRq, VEXA_BRANDRQ, OEVexaBrandRq)                     \
  X(CHILD, BrandRs, VEXA_BRANDRS, OEVexaBrandRs)                     \
  X(CHILD, BrandDetails, VEXA_BRANDDETAILS, OEVexaBrandDetails)      \
  X(CHILD, ServiceList, VEXA_SVCLIST, OEVexaServiceList)             \
  X(CHILD, MktTierRs, VEXA_MKTTIERRS, OEVexaMktTierRs)               \
  X(CHILD, ClientLogRq, VEXA_CLIENTLOGRQ, OEVexaClientLogRq)         \
  X(CHILD, FiUsageLogRq, VEXA_FIUSAGELOGRQ, OEVexaFiUsageLogRQ)      \
  X(CHILD, CuUsageLogRq, VEXA_CUUSAGELOGRQ, OEVexaCuUsageLogRQ)      \
  X(CHILD, SurveyRq, VEXA_SURVEYRQ, OEVexaSurveyRq)                  \
  X(CHILD, PlatformInfo, VEXA_PLATFORMINFO, OEVexaPlatformInfo)      \
  X(CHILD, SBusinessInfo, VEXA_SBUSINESSINFO, OEVexaSBusinessInfo)   \
  X(CHILD, SignOnRs, SONRS, OESignOnRs)
class VexaRoot : public OEAggregate {
  OE_AGGREGATE(VexaRoot, T_VEXA_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(VexaRoot, OEAggregate, T_VEXA_ROOT_FIELDS, NONE,
                    .Valid(OE_TAGS(VEXA_BRANDRQ, VEXA_BRANDRS, VEXA_BRANDDETAILS, VEXA_SVCLIST, VEXA_MKTTIERRS,
                                   VEXA_CLIENTLOGRQ, VEXA_FIUSAGELOGRQ, VEXA_CUUSAGELOGRQ, VEXA_SURVEYRQ,
                                   VEXA_PLATFORMINFO, VEXA_SBUSINESSINFO, SONRS)))

const char kSoftware[] = "<VEXA.SW><VEXA.SWPRODCD>QW<VEXA.SWVER>2300<VEXA.SWOSCD>WIN<VEXA.DISTMETHOD>RETAIL</VEXA.SW>";

std::string BidInfo(const char* bid, const char* date) {
  return std::string("<VEXA.BIDINFO><VEXA.BID>") + bid + "<VEXA.DTUPDATE>" + date + "</VEXA.BIDINFO>";
}

// The branding of one institution, every field of its kind given once or
// more, in writing order. `extra` goes just before the end tag.
std::string Details(const std::string& extra = "", bool withProfileURL = true) {
  return std::string(
             "<VEXA.BRANDDETAILS><FI><ORG>Example Bank<FID>1234</FI>"
             "<VEXA.SVCLIST><VEXA.SVC>BANKSVC<VEXA.SVC>CCSVC<VEXA.SVC>BPSVC</VEXA.SVCLIST>"
             "<VEXA.SPURLLIST><VEXA.SPURL>https://sp.example/ofx<VEXA.SPURL>https://sp2.example/ofx</VEXA.SPURLLIST>"
             "<VEXA.BRANDNAME>Example Bank & Trust<VEXA.STATUS>ACTIVE<VEXA.NPCFLAG>NPCOFX"
             "<VEXA.MKTTIERTYPE>INVESTMENT<VEXA.MKTTIERCD>GOLD<VEXA.MKTDISTMETHOD>FI<VEXA.BIDREF1>4000000000"
             "<ADDR1>1 Main St<ADDR2>Suite 5<CITY>Springfield<STATE>IL<POSTALCODE>62701<COUNTRY>USA"
             "<CSPHONE>555-0100<TSPHONE>555-0101<FAXPHONE>555-0102<URL>https://bank.example"
             "<EMAIL>help@bank.example<VEXA.BRANDCATEGORY>CREDIT CARD") +
         (withProfileURL ? "<VEXA.FIPROFILEURL>https://bank.example/profile" : "") +
         "<VEXA.FIMKTINDEXFILEURL>https://bank.example/mkt<VEXA.TRADINGURL>https://trade.example"
         "<VEXA.DISTNAME>CN=ofx.bank.example<VEXA.DISTNAME>CN=ofx2.bank.example<VEXA.FISHORTNM>ExBank"
         "<VEXA.PROFCERTID>CERT-1<VEXA.PROFCERTID>CERT-2<VEXA.USERSPECIFICPROF>Y"
         "<VEXA.ENROLLURL>https://bank.example/enrol<VEXA.FIMESSAGE>Welcome"
         "<VEXA.NEWPROFILEURL>https://bank.example/new"
         "<VEXA.SPCHANGE><VEXA.SPPROFILEURL>https://sp3.example/profile<VEXA.BEGINDT>20240301</VEXA.SPCHANGE>"
         "<VEXA.BROWSERCENTRIC><VEXA.WEBFEATURENM>BILLPAY<VEXA.ACCESSMETHOD>WEBONLY"
         "<VEXA.LOGINURL>https://bank.example/login</VEXA.BROWSERCENTRIC>"
         "<VEXA.BROWSERCENTRIC><VEXA.WEBFEATURENM>TRADE<VEXA.ACCESSMETHOD>EXCLUSIVE"
         "<VEXA.LOGINURL>https://trade.example/login</VEXA.BROWSERCENTRIC>" +
         extra + "</VEXA.BRANDDETAILS>";
}

std::string BrandRs() {
  return std::string("<VEXA.BRANDRS>") + kSoftware + "<VEXA.BRANDDATALIST><VEXA.BRANDDATA>" +
         BidInfo("1001", "20240105") + Details() + "</VEXA.BRANDDATA><VEXA.BRANDDATA>" + BidInfo("1002", "20240106") +
         "</VEXA.BRANDDATA></VEXA.BRANDDATALIST></VEXA.BRANDRS>";
}

const char kPlatform[] =
    "<VEXA.PLATFORMINFO><VEXA.SWINFO><VEXA.PDTCODE>QW<VEXA.PDTPKGCODE>DLX<VEXA.MEDIA>CD<VEXA.SWVERSION>23.1"
    "<VEXA.SWPLATFORM>WIN32<VEXA.OEM>NONE<VEXA.MACSPDTCODE>-</VEXA.SWINFO>"
    "<VEXA.HWINFO><VEXA.HWPLATFORM>X86<VEXA.MFG>Acme<VEXA.COLOR>32<VEXA.SCREENRESOLUTION>1024x768"
    "<VEXA.MODEMSPD>56000<VEXA.CPU>P2<VEXA.RAM>64</VEXA.HWINFO>"
    "<VEXA.OSINFO><VEXA.OS>WINNT<VEXA.OSVERSION>4.0<VEXA.OSRELEASE>SP6</VEXA.OSINFO>"
    "<VEXA.INTERNETCONFIG><VEXA.BROWSER>IE5<VEXA.HTTPSKEYSIZE>128<VEXA.HTTPPROXY>proxy:80"
    "<VEXA.SERVERURL>https://ofx.bank.example<VEXA.SERVERCN>ofx.bank.example<VEXA.SERVERCA>Root CA"
    "<VEXA.EXPIREDCERTIFICATE>N<VEXA.INVALIDCERTIFICATE>N<VEXA.INVALIDCERTIFICATEAUTH>N</VEXA.INTERNETCONFIG>"
    "</VEXA.PLATFORMINFO>";

std::string MsgSetInfo(const char* set, const char* status) {
  return std::string("<VEXA.OFXMSGSETINFO><VEXA.OFXMESSAGE><VEXA.MESSAGE>STMTRQ<VEXA.MSGSTATUS>") + status +
         "</VEXA.OFXMESSAGE><VEXA.OFXMESSAGE><VEXA.MESSAGE>SONRQ<VEXA.MSGSTATUS>0</VEXA.OFXMESSAGE>"
         "<VEXA.OFXMSGSET>" + set + "<VEXA.VERSION>1</VEXA.OFXMSGSETINFO>";
}

std::string FiUsage(const char* bid, const char* session) {
  return "<VEXA.FIUSAGE>" + MsgSetInfo("BANKMSGSET", "2000") + kPlatform + "<VEXA.UID2>U-77<VEXA.BID>" + bid +
         "<URL>https://ofx.bank.example<VEXA.SP>SP1<VEXA.HTTPSTATUS>200<POSTALCODE>62701"
         "<DTSTART>20240105120000<DTEND>20240105120005<VEXA.SESSIONID>" + session + "</VEXA.FIUSAGE>";
}

const char kCustInfo[] =
    "<VEXA.CUSTINFO><VEXA.CUSTTYPE>SMALLBUSINESS<FIRSTNAME>Pat<LASTNAME>Lee<MIDDLENAME>Q<DAYPHONE>555-0110"
    "<EVEPHONE>555-0111<ADDR1>2 Oak Ave<ADDR2>Unit 1<ADDR3>Rear<CITY>Springfield<STATE>IL<POSTALCODE>62702"
    "<COUNTRY>USA<VEXA.BIRTHYEAR>1970<VEXA.SEX>F<VEXA.EMAIL>pat@example.com<LANGUAGE>ENG<VEXA.CANSELL>Y"
    "<VEXA.DTREGISTER>20230601</VEXA.CUSTINFO>";

class ExtensionsTest : public LogFixture {
 protected:
  std::string Write(const OEDataObj& obj) {
    WrittenText written = WriteUnderOwnTag(obj, OE_BUILD_LENIENT);
    EXPECT_EQ(written.status, OE_BUILD_OK);
    std::string flat;
    for (char c : written.text)
      if (c != '\n' && c != '\r') flat += c;
    return flat;
  }
  VexaRoot* Parse(const std::string& text, OEParseStatus expected = OE_PARSE_OK) {
    root_.reset(new VexaRoot);
    EXPECT_EQ(ParseText(text, root_.get()), expected) << text;
    return root_.get();
  }
  unsigned short Count(OEParseWarning code) const {
    unsigned short n = 0;
    for (unsigned short i = 0; i < log->Entries(); ++i)
      if (log->Get(i)->warning == code) ++n;
    return n;
  }
  std::unique_ptr<VexaRoot> root_;
};

// ---------------------------------------------------------------------------
// Branding

TEST_F(ExtensionsTest, BrandResponseReadWrittenAndCopied) {
  VexaRoot* root = Parse(BrandRs());
  EXPECT_EQ(log->Entries(), 0);
  OEVexaBrandRs* rs = root->GetBrandRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  const OEVexaSoftware* sw = rs->GetVexariSoftware();
  ASSERT_NE(sw, nullptr);
  EXPECT_EQ(sw->GetSoftwareProductCode(), "QW");
  EXPECT_EQ(sw->GetSoftwareVersion(), "2300");
  EXPECT_EQ(sw->GetSoftwareOSCode(), "WIN");
  EXPECT_EQ(sw->GetVexaDistMethod(), OE_VEXA_DISTMETHOD_RETAIL);

  const OEVexaBrandDataList* list = rs->GetVexaBrandDataList();
  ASSERT_EQ(list->GetNumVexaBrandData(), 2);
  const OEVexaBrandData* first = list->GetVexaBrandData(0);
  EXPECT_EQ(first->GetVexaBIDInfo()->GetVexaBID(), 1001u);
  EXPECT_EQ(list->GetVexaBrandData(1)->GetVexaBIDInfo()->GetVexaBID(), 1002u);
  EXPECT_EQ(list->GetVexaBrandData(1)->GetVexaBrandDetails(), nullptr);  // unchanged branding: id only
  EXPECT_EQ(list->GetVexaBrandData(1)->AllRequiredPresent(), 1);

  OEVexaBrandDetails* d = first->GetVexaBrandDetails();
  ASSERT_NE(d, nullptr);
  EXPECT_EQ(d->AllRequiredPresent(), 1);
  EXPECT_EQ(d->GetFI()->GetOrg(), "Example Bank");
  ASSERT_EQ(d->GetVexaServiceList()->GetNumVexaService(), 3);
  EXPECT_EQ(*d->GetVexaServiceList()->GetVexaService(1), OE_VEXA_SERVICE_CCSVC);
  ASSERT_EQ(d->GetVexaSPURLList()->GetNumVexaSPURL(), 2);
  EXPECT_EQ(*d->GetVexaSPURLList()->GetVexaSPURL(1), "https://sp2.example/ofx");
  EXPECT_EQ(d->GetVexaBrandName(), "Example Bank & Trust");
  EXPECT_EQ(d->GetVexaBrandStatus(), OE_VEXA_BRANDSTATUS_ACTIVE);
  EXPECT_EQ(static_cast<int>(d->GetVexaBrandStatus()), 0);
  EXPECT_EQ(d->GetVexaNPCFlag(), OE_VEXA_NPCFLAG_NPCOFX);
  EXPECT_EQ(d->GetVexaTierType(), OE_VEXA_TIERTYPE_INVESTMENT);
  EXPECT_EQ(d->GetVexaTierCode(), "GOLD");
  EXPECT_EQ(d->GetVexaDistMethod(), OE_VEXA_DISTMETHOD_FI);
  EXPECT_EQ(d->GetBIDRef1(), 4000000000u);  // the whole unsigned 32-bit range
  EXPECT_EQ(d->GetAddress1(), "1 Main St");
  EXPECT_EQ(d->GetAddress2(), "Suite 5");
  EXPECT_EQ(d->GetCity(), "Springfield");
  EXPECT_EQ(d->GetState(), "IL");
  EXPECT_EQ(d->GetPostalCode(), "62701");
  EXPECT_EQ(d->GetCountry(), "USA");
  EXPECT_EQ(d->GetCSPhone(), "555-0100");
  EXPECT_EQ(d->GetTSPhone(), "555-0101");
  EXPECT_EQ(d->GetFAXPhone(), "555-0102");
  EXPECT_EQ(d->GetURL(), "https://bank.example");
  EXPECT_EQ(d->GetEMail(), "help@bank.example");
  EXPECT_EQ(d->GetBrandCategory(), OE_VEXA_BRANDCATEGORY_CREDITCARD);
  EXPECT_EQ(static_cast<int>(d->GetBrandCategory()), 1);
  EXPECT_EQ(d->GetFIProfileURL(), "https://bank.example/profile");
  EXPECT_EQ(d->GetVexaMktgIndexFileURL(), "https://bank.example/mkt");
  EXPECT_EQ(d->GetTradingURL(), "https://trade.example");
  ASSERT_EQ(d->GetNumVexaDistinguishedName(), 2);
  EXPECT_EQ(*d->GetVexaDistinguishedName(1), "CN=ofx2.bank.example");
  EXPECT_EQ(d->GetVexaFIShortName(), "ExBank");
  ASSERT_EQ(d->GetNumVexaProfileCertID(), 2);
  EXPECT_EQ(*d->GetVexaProfileCertID(0), "CERT-1");
  EXPECT_EQ(d->GetUserSpecificProfile(), 1);
  EXPECT_EQ(d->GetEnrollURL(), "https://bank.example/enrol");
  EXPECT_EQ(d->GetFIMessage(), "Welcome");
  EXPECT_EQ(d->GetNewProfileURL(), "https://bank.example/new");
  ASSERT_NE(d->GetSpChange(), nullptr);
  EXPECT_EQ(d->GetSpChange()->GetVexaSPProfileURL(), "https://sp3.example/profile");
  EXPECT_EQ(d->GetSpChange()->GetVexaBeginDate().GetYear(), 2024);
  ASSERT_EQ(d->GetNumVexaBrowserCentric(), 2);
  EXPECT_EQ(d->GetVexaBrowserCentric(0)->GetVexaWebFeatureName(), "BILLPAY");
  EXPECT_EQ(d->GetVexaBrowserCentric(1)->GetVexaAccessMethod(), OE_VEXA_WEBACCESS_EXCLUSIVE);
  EXPECT_EQ(d->GetVexaBrowserCentric(1)->GetVexaLoginURL(), "https://trade.example/login");

  // Written in the class's order with the VEXA. tags as they are spelled;
  // the category keeps its space and the brand name is escaped.
  const std::string written = Write(*rs);
  EXPECT_EQ(written.rfind("<VEXA.BRANDRS><VEXA.SW><VEXA.SWPRODCD>QW<VEXA.SWVER>2300<VEXA.SWOSCD>WIN"
                          "<VEXA.DISTMETHOD>RETAIL</VEXA.SW><VEXA.BRANDDATALIST><VEXA.BRANDDATA><VEXA.BIDINFO>"
                          "<VEXA.BID>1001<VEXA.DTUPDATE>",
                          0),
            0u)
      << written;
  EXPECT_NE(written.find("<VEXA.BRANDDETAILS><FI><ORG>Example Bank<FID>1234</FI><VEXA.SVCLIST><VEXA.SVC>BANKSVC"
                         "<VEXA.SVC>CCSVC<VEXA.SVC>BPSVC</VEXA.SVCLIST><VEXA.SPURLLIST>"
                         "<VEXA.SPURL>https://sp.example/ofx<VEXA.SPURL>https://sp2.example/ofx</VEXA.SPURLLIST>"
                         "<VEXA.BRANDNAME>Example Bank &amp; Trust<VEXA.STATUS>ACTIVE<VEXA.NPCFLAG>NPCOFX"
                         "<VEXA.MKTTIERTYPE>INVESTMENT<VEXA.MKTTIERCD>GOLD<VEXA.MKTDISTMETHOD>FI"
                         "<VEXA.BIDREF1>4000000000<ADDR1>1 Main St<ADDR2>Suite 5<CITY>Springfield<STATE>IL"
                         "<POSTALCODE>62701<COUNTRY>USA<CSPHONE>555-0100<TSPHONE>555-0101<FAXPHONE>555-0102"
                         "<URL>https://bank.example<EMAIL>help@bank.example<VEXA.BRANDCATEGORY>CREDIT CARD"
                         "<VEXA.FIPROFILEURL>https://bank.example/profile"),
            std::string::npos)
      << written;
  EXPECT_NE(written.find("<VEXA.DISTNAME>CN=ofx.bank.example<VEXA.DISTNAME>CN=ofx2.bank.example"
                         "<VEXA.FISHORTNM>ExBank<VEXA.PROFCERTID>CERT-1<VEXA.PROFCERTID>CERT-2"
                         "<VEXA.USERSPECIFICPROF>Y<VEXA.ENROLLURL>https://bank.example/enrol"),
            std::string::npos)
      << written;
  EXPECT_NE(written.find("<VEXA.BROWSERCENTRIC><VEXA.WEBFEATURENM>BILLPAY<VEXA.ACCESSMETHOD>WEBONLY"
                         "<VEXA.LOGINURL>https://bank.example/login</VEXA.BROWSERCENTRIC><VEXA.BROWSERCENTRIC>"
                         "<VEXA.WEBFEATURENM>TRADE<VEXA.ACCESSMETHOD>EXCLUSIVE"),
            std::string::npos)
      << written;

  // Read back the same, and a deep copy writes the same text from its own children.
  VexaRoot again;
  ASSERT_EQ(ParseText(written, &again), OE_PARSE_OK);
  EXPECT_EQ(Write(*again.GetBrandRs()), written);
  OEVexaBrandRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(rs), 1);
  EXPECT_EQ(Write(copy), written);
  EXPECT_NE(copy.GetVexaBrandDataList(), rs->GetVexaBrandDataList());
  EXPECT_NE(copy.GetVexaBrandDataList()->GetVexaBrandData(0)->GetVexaBrandDetails()->GetVexaServiceList(),
            d->GetVexaServiceList());
  root_.reset();  // the copy stands on its own
  EXPECT_EQ(Write(copy), written);
}

// The selection writes its institutions in the order given, and the request
// needs both its software and its selection.
TEST_F(ExtensionsTest, BrandRequestKeepsItsSelectionInOrder) {
  VexaRoot* root = Parse(std::string("<VEXA.BRANDRQ>") + kSoftware + "<VEXA.SELECTBYBID>" +
                         BidInfo("30", "20240103") + BidInfo("10", "20240101") + BidInfo("20", "20240102") +
                         "</VEXA.SELECTBYBID></VEXA.BRANDRQ>");
  OEVexaBrandRq* rq = root->GetBrandRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  OEVexaSelectByBID* select = rq->GetVexaSelectByBid();
  ASSERT_EQ(select->GetNumVexaBIDInfo(), 3);
  const std::string written = Write(*rq);
  const size_t a = written.find("<VEXA.BID>30<"), b = written.find("<VEXA.BID>10<"), c = written.find("<VEXA.BID>20<");
  ASSERT_NE(c, std::string::npos) << written;
  EXPECT_LT(a, b);
  EXPECT_LT(b, c);

  // Replacing the second entry keeps the others where they were.
  auto* replaced = new OEVexaBIDInfo;
  replaced->SetVexaBID(uint32_t{15});
  replaced->SetVexaDtUpdate(OEString("20240201"));
  EXPECT_EQ(replaced->AllRequiredPresent(), 1);
  ASSERT_EQ(select->SetVexaBIDInfo(1, replaced), 1);
  EXPECT_EQ(select->GetVexaBIDInfo(1)->GetVexaBID(), 15u);
  EXPECT_EQ(select->GetVexaBIDInfo(2)->GetVexaBID(), 20u);

  // Without its software the request is incomplete; an empty selection too.
  OEVexaBrandRq bare;
  auto* empty = new OEVexaSelectByBID;
  ASSERT_EQ(bare.SetVexaSelectByBid(empty), 1);
  EXPECT_EQ(bare.AllRequiredPresent(), 0);
  EXPECT_EQ(bare.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_VEXA_SW);
  EXPECT_EQ(empty->AllRequiredPresent(), 0);
  OEVexaSoftware software;
  software.SetSoftwareProductCode(OEString("QW"));
  software.SetSoftwareVersion(OEString("2300"));
  EXPECT_EQ(software.AllRequiredPresent(), 0);  // no OS code
  software.SetSoftwareOSCode(OEString("WIN"));
  EXPECT_EQ(software.AllRequiredPresent(), 1);  // the distribution method is optional
}

TEST_F(ExtensionsTest, BrandDetailsRules) {
  VexaRoot* root = Parse(Details("", false));
  OEVexaBrandDetails* d = root->GetBrandDetails();
  ASSERT_NE(d, nullptr);
  EXPECT_EQ(d->AllRequiredPresent(), 0);
  EXPECT_EQ(d->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_VEXA_FIPROFILEURL);
  EXPECT_EQ(d->GetFirstMissingRequiredTag(OE_TAG_VEXA_FIPROFILEURL), OE_TAG_NONE);
  d->SetFIProfileURL(OEString("https://bank.example/profile"));
  EXPECT_EQ(d->AllRequiredPresent(), 1);

  // FI, the second address line and the other optional fields may all be left out.
  const std::string minimal =
      "<VEXA.BRANDDETAILS><VEXA.SVCLIST><VEXA.SVC>INVSTMTDLSVC</VEXA.SVCLIST><VEXA.SPURLLIST></VEXA.SPURLLIST>"
      "<VEXA.BRANDNAME>B<VEXA.STATUS>INACTIVE<VEXA.NPCFLAG>QAC<VEXA.MKTTIERTYPE>BANKING<VEXA.MKTTIERCD>T1"
      "<ADDR1>A<CITY>C<STATE>S<POSTALCODE>P<COUNTRY>USA<CSPHONE>1<URL>U<VEXA.FIPROFILEURL>F</VEXA.BRANDDETAILS>";
  root = Parse(minimal);
  d = root->GetBrandDetails();
  EXPECT_EQ(d->AllRequiredPresent(), 1);
  EXPECT_EQ(d->GetVexaSPURLList()->GetNumVexaSPURL(), 0);
  EXPECT_EQ(d->GetVexaBrandStatus(), OE_VEXA_BRANDSTATUS_INACTIVE);
  EXPECT_EQ(Write(*d), minimal);

  // A browser-centric feature needs all three of its fields; a change of
  // provider both of its own; a tier definition its type and code.
  OEVexaBrowserCentric feature;
  feature.SetVexaWebFeatureName(OEString("BILLPAY"));
  feature.SetVexaAccessMethod(OEString("ANY"));
  EXPECT_EQ(feature.AllRequiredPresent(), 0);
  feature.SetVexaLoginURL(OEString("https://x"));
  EXPECT_EQ(feature.AllRequiredPresent(), 1);
  OEVexaSPChange change;
  change.SetVexaSPProfileURL(OEString("https://x"));
  EXPECT_EQ(change.AllRequiredPresent(), 0);
  OEVexaTierDef tier;
  tier.SetVexaTierCode(OEString("GOLD"));
  EXPECT_EQ(tier.AllRequiredPresent(), 0);
  tier.SetVexaTierType(OE_VEXA_TIERTYPE_BANKING);
  EXPECT_EQ(tier.AllRequiredPresent(), 1);
  OEVexaBrandData data;
  EXPECT_EQ(data.AllRequiredPresent(), 0);  // the business id keys it
}

// Bad enumerated values and service entries are logged and left out; the
// rest of the aggregate is read.
TEST_F(ExtensionsTest, BadValuesWarnAndStayAbsent) {
  OEVexaBrandDetails fresh;
  EXPECT_EQ(fresh.SetVexaBrandStatus(OEString("DORMANT")), 0);
  EXPECT_EQ(Count(OEPW_BADFORMAT), 1);
  EXPECT_EQ(fresh.ValidateTag(OE_TAG_VEXA_STATUS), 0);
  EXPECT_EQ(fresh.SetVexaBrandStatus(OEString("active")), 1);  // OFX enumerations ignore case
  EXPECT_EQ(fresh.GetVexaBrandStatus(), OE_VEXA_BRANDSTATUS_ACTIVE);
  EXPECT_EQ(fresh.SetBrandCategory(OEString("CREDITCARD")), 0);  // the space is part of the value
  EXPECT_EQ(fresh.SetBIDRef1(OEString("4294967296")), 0);  // beyond 32 bits
  EXPECT_EQ(fresh.ValidateTag(OE_TAG_VEXA_BIDREF1), 0);
  log->DeleteAll();

  // Texts the maker gives no limit are kept whole without a word; a feature
  // name longer than its 32 characters is kept whole too, and reported.
  const std::string longText(2000, 'm');
  EXPECT_EQ(fresh.SetFIMessage(OEString(longText.c_str())), 1);
  EXPECT_EQ(fresh.GetFIMessage().GetStrLength(), 2000u);
  EXPECT_EQ(log->Entries(), 0);
  OEVexaBrowserCentric feature;
  EXPECT_EQ(feature.SetVexaWebFeatureName(OEString(longText.substr(0, 33).c_str())), 1);
  EXPECT_EQ(feature.GetVexaWebFeatureName().GetStrLength(), 33u);
  EXPECT_EQ(feature.ValidateTag(OE_TAG_VEXA_WEBFEATURENM), 1);
  EXPECT_EQ(Count(OEPW_TOOLONG), 1);
  log->DeleteAll();

  // In a parse: the bad status is logged with its tag and the text, and the
  // tag stays absent, so the aggregate is reported incomplete.
  std::string text = Details();
  text.replace(text.find("<VEXA.STATUS>ACTIVE"), 19, "<VEXA.STATUS>ACTIVATED");
  text.replace(text.find("<VEXA.SVC>CCSVC"), 15, "<VEXA.SVC>ATMSVC");
  VexaRoot* root = Parse(text, OE_PARSE_WARNINGS);
  OEVexaBrandDetails* d = root->GetBrandDetails();
  ASSERT_NE(d, nullptr);
  EXPECT_EQ(Count(OEPW_BADFORMAT), 2);
  bool sawStatus = false;
  for (unsigned short i = 0; i < log->Entries(); ++i)
    if (log->Get(i)->tag == OE_TAG_VEXA_STATUS) {
      sawStatus = true;
      EXPECT_EQ(log->Get(i)->value, "ACTIVATED");
      EXPECT_EQ(log->Get(i)->object, d);
    }
  EXPECT_TRUE(sawStatus);
  EXPECT_EQ(d->ValidateTag(OE_TAG_VEXA_STATUS), 0);
  EXPECT_EQ(d->AllRequiredPresent(), 0);
  EXPECT_EQ(d->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_VEXA_STATUS);
  ASSERT_EQ(d->GetVexaServiceList()->GetNumVexaService(), 2);  // BANKSVC, BPSVC
  EXPECT_EQ(*d->GetVexaServiceList()->GetVexaService(1), OE_VEXA_SERVICE_BPSVC);
  EXPECT_EQ(d->GetVexaNPCFlag(), OE_VEXA_NPCFLAG_NPCOFX);
}

// A service list given an empty entry reports it as a missing value, not as
// a malformed one, and keeps no entry for it.
TEST_F(ExtensionsTest, ServiceListEmptyEntry) {
  OEVexaServiceList list;
  EXPECT_EQ(list.AllRequiredPresent(), 0);
  EXPECT_EQ(list.AppendVexaService(OEString("")), 0);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_NULLPOINTER);
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_VEXA_SVC);
  EXPECT_EQ(list.GetNumVexaService(), 0);
  EXPECT_EQ(list.AppendVexaService(OEString("ATMSVC")), 0);
  EXPECT_EQ(log->Get(1)->warning, OEPW_BADFORMAT);
  EXPECT_EQ(list.AppendVexaService(OEString("INVSTMTDLSVC")), 1);
  EXPECT_EQ(list.AppendVexaService(OE_VEXA_SERVICE_BANKSVC), 1);
  EXPECT_EQ(list.AllRequiredPresent(), 1);
  EXPECT_EQ(Write(list), "<VEXA.SVCLIST><VEXA.SVC>INVSTMTDLSVC<VEXA.SVC>BANKSVC</VEXA.SVCLIST>");
  log->DeleteAll();

  // In a file, an entry with nothing after it reads as the start of an
  // aggregate the list does not take: the parse stops there with its
  // warning, keeping what it had read.
  VexaRoot* root = Parse("<VEXA.SVCLIST><VEXA.SVC>BPSVC<VEXA.SVC><VEXA.SVC>CCSVC</VEXA.SVCLIST>",
                         OE_PARSE_NOT_HANDLED);
  ASSERT_NE(root->GetServiceList(), nullptr);
  ASSERT_EQ(root->GetServiceList()->GetNumVexaService(), 1);
  EXPECT_EQ(*root->GetServiceList()->GetVexaService(0), OE_VEXA_SERVICE_BPSVC);
  EXPECT_TRUE(Logged(OEPW_INVALIDAGG));
}

TEST_F(ExtensionsTest, EnumerationTextsAndConversionNames) {
  OEVexaBrandCategory category{};
  EXPECT_EQ(OEVexaBrandDataConversion::StringToVexaBrandCategory(OEString("CREDIT CARD"), category), 1);
  EXPECT_EQ(category, 1);
  OEString out;
  EXPECT_EQ(OEVexaBrandDataConversion::VexaBrandCategoryToString(OE_VEXA_BRANDCATEGORY_BILLPAYMENT, out), 1);
  EXPECT_EQ(out, "BILL PAYMENT");
  OEVexaBrandStatus status{};
  EXPECT_EQ(OEVexaBrandDataConversion::StringToVexaBrandStatus(OEString("ACTIVE"), status), 1);
  EXPECT_EQ(status, 0);
  EXPECT_EQ(OEVexaBrandDataConversion::StringToVexaBrandStatus(OEString("CLOSED"), status), 0);
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
  log->DeleteAll();

  OEVexaService service{};
  EXPECT_EQ(OEVexaCommDataConversion::StringToVexaService(OEString("INVSTMTDLSVC"), service), 1);
  EXPECT_EQ(service, 3);
  OEVexaWebAccess access{};
  EXPECT_EQ(OEVexaWebAccessDataConversion::StringToVexaWebAccess(OEString("EXCLUSIVE"), access), 1);
  EXPECT_EQ(access, 2);
  OEVexaCustType type{};
  EXPECT_EQ(OEVexaCISDataConversion::StringToVexaCustType(OEString("SMALLBUSINESS"), type), 1);
  EXPECT_EQ(type, 2);
}

TEST_F(ExtensionsTest, MarketTiers) {
  VexaRoot* root = Parse(
      "<VEXA.MKTTIERRS><VEXA.TIERDEF><VEXA.TIERTYPE>BANKING<VEXA.TIERCD>SILVER<VEXA.DISTMETHOD>FI"
      "<VEXA.FEATURENM>BILLPAY<VEXA.FEATURENM>ALERTS</VEXA.TIERDEF><VEXA.TIERDEF><VEXA.TIERTYPE>INVESTMENT"
      "<VEXA.TIERCD>GOLD</VEXA.TIERDEF><VEXA.TIERDTUPDATE>20240110</VEXA.MKTTIERRS>");
  OEVexaMktTierRs* rs = root->GetMktTierRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  ASSERT_EQ(rs->GetNumVexaTierDef(), 2);
  const OEVexaTierDef* silver = rs->GetVexaTierDef(0);
  EXPECT_EQ(silver->GetVexaTierType(), OE_VEXA_TIERTYPE_BANKING);
  EXPECT_EQ(silver->GetVexaTierCode(), "SILVER");
  EXPECT_EQ(silver->GetVexaDistMethod(), OE_VEXA_DISTMETHOD_FI);
  ASSERT_EQ(silver->GetNumVexaFeatureName(), 2);
  EXPECT_EQ(*silver->GetVexaFeatureName(1), "ALERTS");
  EXPECT_EQ(rs->GetVexaTierDef(1)->GetVexaTierType(), OE_VEXA_TIERTYPE_INVESTMENT);
  EXPECT_EQ(rs->GetVexaTierDtUpdate().GetDay(), 10);
  const std::string written = Write(*rs);
  EXPECT_EQ(written.rfind("<VEXA.MKTTIERRS><VEXA.TIERDEF><VEXA.TIERTYPE>BANKING<VEXA.TIERCD>SILVER"
                          "<VEXA.DISTMETHOD>FI<VEXA.FEATURENM>BILLPAY<VEXA.FEATURENM>ALERTS</VEXA.TIERDEF>"
                          "<VEXA.TIERDEF><VEXA.TIERTYPE>INVESTMENT<VEXA.TIERCD>GOLD</VEXA.TIERDEF>"
                          "<VEXA.TIERDTUPDATE>",
                          0),
            0u)
      << written;
  OEVexaMktTierRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(rs), 1);
  EXPECT_EQ(Write(copy), written);

  // A response with no definitions is complete (nothing changed); one with
  // no date is not, nor a request with no date.
  OEVexaMktTierRs none;
  EXPECT_EQ(none.AllRequiredPresent(), 0);
  none.SetVexaTierDtUpdate(OEString("20240110"));
  EXPECT_EQ(none.AllRequiredPresent(), 1);
  OEVexaMktTierRq rq;
  EXPECT_EQ(rq.AllRequiredPresent(), 0);
  EXPECT_EQ(rq.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_VEXA_TIERDTUPDATE);
}

// The sign-on response carries the institution's business id.
TEST_F(ExtensionsTest, SignOnBusinessId) {
  VexaRoot* root = Parse(
      "<SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20240105120000<LANGUAGE>ENG<VEXA.BID>4294967295"
      "</SONRS>");
  OESignOnRs* rs = root->GetSignOnRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(log->Entries(), 0);
  EXPECT_EQ(rs->GetVexaBid(), 4294967295u);
  EXPECT_NE(Write(*rs).find("<VEXA.BID>4294967295</SONRS>"), std::string::npos) << Write(*rs);
  EXPECT_EQ(rs->SetVexaBid(OEString("4294967296")), 0);  // beyond 32 bits
  EXPECT_EQ(rs->GetVexaBid(), 4294967295u);
  rs->SetVexaBid(uint32_t{7});
  EXPECT_NE(Write(*rs).find("<VEXA.BID>7</SONRS>"), std::string::npos);
}

// ---------------------------------------------------------------------------
// Logs and surveys

TEST_F(ExtensionsTest, InstitutionUsageLogKeepsItsEntriesInOrder) {
  VexaRoot* root = Parse("<VEXA.FIUSAGELOGRQ>" + FiUsage("30", "S-3") + FiUsage("10", "S-1") + FiUsage("20", "S-2") +
                         "</VEXA.FIUSAGELOGRQ>");
  EXPECT_EQ(log->Entries(), 0);
  OEVexaFiUsageLogRQ* rq = root->GetFiUsageLogRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  ASSERT_EQ(rq->GetNumFiUsage(), 3);
  OEVexaFiUsage* usage = rq->GetVexaFiUsage(0);
  EXPECT_EQ(usage->AllRequiredPresent(), 1);
  EXPECT_EQ(usage->GetVexaBID(), 30u);
  EXPECT_EQ(usage->GetVexaUID2(), "U-77");
  EXPECT_EQ(usage->GetURL(), "https://ofx.bank.example");
  EXPECT_EQ(usage->GetVexaSP(), "SP1");
  EXPECT_EQ(usage->GetVexaStatus(), 200);
  EXPECT_EQ(usage->GetPostalCode(), "62701");
  EXPECT_EQ(usage->GetDateEnd().GetSecond(), 5);
  EXPECT_EQ(usage->GetVexaSessionID(), "S-3");
  ASSERT_EQ(usage->GetNumOfxMsgSetInfo(), 1);
  const OEVexaOfxMsgSetInfo* set = usage->GetOfxMsgSetInfo(0);
  EXPECT_EQ(set->GetVexaOfxMsgSet(), "BANKMSGSET");
  EXPECT_EQ(set->GetVexaVersion(), "1");
  ASSERT_EQ(set->GetNumVexaOfxMessage(), 2);
  EXPECT_EQ(set->GetVexaOfxMessage(0)->GetVexaMessage(), "STMTRQ");
  EXPECT_EQ(set->GetVexaOfxMessage(0)->GetVexaStatus(), 2000);
  const OEVexaPlatformInfo* platform = usage->GetPlatformInfo();
  ASSERT_NE(platform, nullptr);
  EXPECT_EQ(platform->GetSwInfo()->GetVexaProductPackageCode(), "DLX");
  EXPECT_EQ(platform->GetHwInfo()->GetVexaScreenResolution(), "1024x768");
  EXPECT_EQ(platform->GetOsInfo()->GetVexaOSRelease(), "SP6");
  EXPECT_EQ(platform->GetIntConfig()->GetVexaServerCA(), "Root CA");
  EXPECT_EQ(platform->GetIntConfig()->GetVexaInvalidCertificateAuth(), "N");

  const std::string written = Write(*rq);
  const size_t a = written.find("<VEXA.SESSIONID>S-3"), b = written.find("<VEXA.SESSIONID>S-1"),
               c = written.find("<VEXA.SESSIONID>S-2");
  ASSERT_NE(c, std::string::npos) << written;
  EXPECT_LT(a, b);
  EXPECT_LT(b, c);
  EXPECT_NE(written.find("<VEXA.FIUSAGE><VEXA.OFXMSGSETINFO><VEXA.OFXMESSAGE><VEXA.MESSAGE>STMTRQ"
                         "<VEXA.MSGSTATUS>2000</VEXA.OFXMESSAGE><VEXA.OFXMESSAGE><VEXA.MESSAGE>SONRQ"
                         "<VEXA.MSGSTATUS>0</VEXA.OFXMESSAGE><VEXA.OFXMSGSET>BANKMSGSET<VEXA.VERSION>1"
                         "</VEXA.OFXMSGSETINFO>" + std::string(kPlatform) +
                         "<VEXA.UID2>U-77<VEXA.BID>30<URL>https://ofx.bank.example<VEXA.SP>SP1"
                         "<VEXA.HTTPSTATUS>200<POSTALCODE>62701<DTSTART>"),
            std::string::npos)
      << written;

  VexaRoot again;
  ASSERT_EQ(ParseText(written, &again), OE_PARSE_OK);
  EXPECT_EQ(Write(*again.GetFiUsageLogRq()), written);
  OEVexaFiUsageLogRQ copy;
  ASSERT_EQ(copy.DeepCopyFrom(rq), 1);
  root_.reset();
  EXPECT_EQ(Write(copy), written);

  // A negative HTTP status is a number like any other; text is not.
  OEVexaFiUsage entry;
  EXPECT_EQ(entry.SetVexaStatus(OEString("-1")), 1);
  EXPECT_EQ(entry.GetVexaStatus(), -1);
  EXPECT_EQ(entry.SetVexaStatus(OEString("OK")), 0);
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
  EXPECT_EQ(entry.AllRequiredPresent(), 0);
  EXPECT_EQ(entry.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_VEXA_OFXMSGSETINFO);
}

TEST_F(ExtensionsTest, CustomerUsageLogAndCustomer) {
  VexaRoot* root = Parse("<VEXA.CUUSAGELOGRQ><VEXA.CUUSAGE>" + MsgSetInfo("INVSTMTMSGSET", "0") + kCustInfo +
                         kPlatform +
                         "<VEXA.REGID>R-9<VEXA.SESSIONID>S-1<DTSTART>20240105<DTEND>20240106<VEXA.HTTPSTATUS>500"
                         "</VEXA.CUUSAGE></VEXA.CUUSAGELOGRQ>");
  EXPECT_EQ(log->Entries(), 0);
  OEVexaCuUsageLogRQ* rq = root->GetCuUsageLogRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  ASSERT_EQ(rq->GetNumCuUsage(), 1);
  OEVexaCuUsage* usage = rq->GetVexaCuUsage(0);
  EXPECT_EQ(usage->AllRequiredPresent(), 1);
  EXPECT_EQ(usage->GetVexaRegID(), "R-9");
  EXPECT_EQ(usage->GetVexaStatus(), 500);
  OEVexaCustInfo* cust = usage->GetCustInfo();
  ASSERT_NE(cust, nullptr);
  EXPECT_EQ(cust->AllRequiredPresent(), 1);
  EXPECT_EQ(cust->GetVexaCustTypeEnum(), OE_VEXA_CUSTTYPE_SMALLBUSINESS);
  EXPECT_EQ(static_cast<int>(cust->GetVexaCustTypeEnum()), 2);
  EXPECT_EQ(cust->GetVexaCustType(), "SMALLBUSINESS");
  EXPECT_EQ(cust->GetFirstName(), "Pat");
  EXPECT_EQ(cust->GetMiddleName(), "Q");
  EXPECT_EQ(cust->GetEveningPhone(), "555-0111");
  EXPECT_EQ(cust->GetAddress3(), "Rear");
  EXPECT_EQ(cust->GetVexaEMail(), "pat@example.com");
  EXPECT_EQ(cust->GetLanguage(), OELanguage("ENG"));
  EXPECT_EQ(cust->GetVexaDtRegister().GetYear(), 2023);

  // The customer is written in its own order (type, first, last, middle ...).
  const std::string written = Write(*rq);
  EXPECT_NE(written.find(kCustInfo), std::string::npos) << written;
  EXPECT_LT(written.find("</VEXA.OFXMSGSETINFO><VEXA.CUSTINFO>"), written.find("<VEXA.PLATFORMINFO>"));
  EXPECT_NE(written.find("</VEXA.PLATFORMINFO><VEXA.REGID>R-9<VEXA.SESSIONID>S-1<DTSTART>"), std::string::npos);
  OEVexaCuUsageLogRQ copy;
  ASSERT_EQ(copy.DeepCopyFrom(rq), 1);
  EXPECT_EQ(Write(copy), written);

  // Customer types: a text outside the three is logged and left absent.
  OEVexaCustInfo other;
  EXPECT_EQ(other.GetVexaCustType(), "");
  EXPECT_EQ(other.SetVexaCustType(OEString("CORPORATION")), 0);
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
  EXPECT_EQ(other.ValidateTag(OE_TAG_VEXA_CUSTTYPE), 0);
  EXPECT_EQ(other.SetVexaCustType(OEString("INDIVIDUAL")), 1);
  EXPECT_EQ(other.GetVexaCustTypeEnum(), OE_VEXA_CUSTTYPE_INDIVIDUAL);
  EXPECT_EQ(other.AllRequiredPresent(), 0);
  EXPECT_EQ(other.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_FIRSTNAME);

  // A small business wraps its owner's customer information.
  root = Parse(std::string("<VEXA.SBUSINESSINFO>") + kCustInfo +
               "<VEXA.COMPANYNAME>Lee Plumbing<VEXA.BUSINESSPHONE>555-0120<VEXA.BUSINESSTYPE>LLC"
               "<VEXA.BUSINESSCAT>TRADES<VEXA.TAXEXEMPT>N<VEXA.BUSINESSFAX>555-0121</VEXA.SBUSINESSINFO>");
  OEVexaSBusinessInfo* business = root->GetSBusinessInfo();
  ASSERT_NE(business, nullptr);
  EXPECT_EQ(business->AllRequiredPresent(), 1);
  EXPECT_EQ(business->GetCustInfo()->GetLastName(), "Lee");
  EXPECT_EQ(business->GetVexaCompanyName(), "Lee Plumbing");
  EXPECT_EQ(business->GetVexaBusinessFax(), "555-0121");
  EXPECT_EQ(Write(*business).rfind(std::string("<VEXA.SBUSINESSINFO>") + kCustInfo + "<VEXA.COMPANYNAME>", 0), 0u);
  OEVexaSBusinessInfo alone;
  alone.SetVexaCompanyName(OEString("X"));
  EXPECT_EQ(alone.AllRequiredPresent(), 0);
}

TEST_F(ExtensionsTest, ClientLogPlatformsAndRules) {
  const std::string second =
      "<VEXA.PLATFORMINFO><VEXA.SWINFO><VEXA.PDTCODE>QB</VEXA.SWINFO></VEXA.PLATFORMINFO>";
  VexaRoot* root =
      Parse(std::string("<VEXA.CLIENTLOGRQ>") + kPlatform + second + "<VEXA.REGID>R-1</VEXA.CLIENTLOGRQ>");
  OEVexaClientLogRq* rq = root->GetClientLogRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  ASSERT_EQ(rq->GetNumPlatformInfo(), 2);
  EXPECT_EQ(rq->GetPlatformInfo(1)->GetSwInfo()->GetVexaProductCode(), "QB");
  EXPECT_EQ(rq->GetPlatformInfo(1)->GetHwInfo(), nullptr);
  EXPECT_EQ(Write(*rq), std::string("<VEXA.CLIENTLOGRQ>") + kPlatform + second + "<VEXA.REGID>R-1</VEXA.CLIENTLOGRQ>");

  // A platform needs its software; hardware alone is not enough.
  VexaRoot other;
  ASSERT_EQ(ParseText("<VEXA.PLATFORMINFO><VEXA.HWINFO><VEXA.CPU>P2</VEXA.HWINFO></VEXA.PLATFORMINFO>", &other),
            OE_PARSE_OK);
  OEVexaPlatformInfo* hardwareOnly = other.GetPlatformInfo();
  ASSERT_NE(hardwareOnly, nullptr);
  EXPECT_EQ(hardwareOnly->AllRequiredPresent(), 0);
  EXPECT_EQ(hardwareOnly->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_VEXA_SWINFO);
  ASSERT_NE(hardwareOnly->GetSwInfo(1), nullptr);  // made on demand
  EXPECT_EQ(hardwareOnly->AllRequiredPresent(), 1);

  // Replacing a platform of the log; a log without its registration id is incomplete.
  auto* replacement = new OEVexaPlatformInfo;
  ASSERT_NE(replacement->GetOsInfo(1), nullptr);
  replacement->GetOsInfo()->SetVexaOS(OEString("LINUX"));
  ASSERT_EQ(rq->SetPlatformInfo(0, replacement), 1);
  EXPECT_EQ(rq->GetPlatformInfo(0)->GetOsInfo()->GetVexaOS(), "LINUX");
  OEVexaClientLogRq bare;
  ASSERT_EQ(bare.AppendPlatformInfo(new OEVexaPlatformInfo), 1);
  EXPECT_EQ(bare.AllRequiredPresent(), 0);
  EXPECT_EQ(bare.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_VEXA_REGID);
}

TEST_F(ExtensionsTest, SurveyAnswers) {
  const std::string text =
      "<VEXA.SURVEYRQ><VEXA.SURVEYINFO><VEXA.SURVEYITEM><VEXA.QSTLABEL>Q1<VEXA.ASWLABEL>Yes</VEXA.SURVEYITEM>"
      "<VEXA.SURVEYITEM><VEXA.QSTLABEL>Q2<VEXA.ASWLABEL>Other<VEXA.ADDASW>Mostly on weekends &lt;3"
      "</VEXA.SURVEYITEM><VEXA.SURVEYID>SV-2024</VEXA.SURVEYINFO><VEXA.REGID>R-1</VEXA.SURVEYRQ>";
  VexaRoot* root = Parse(text);
  OEVexaSurveyRq* rq = root->GetSurveyRq();
  ASSERT_NE(rq, nullptr);
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  const OEVexaSurveyInfo* info = rq->GetSurveyInfo();
  EXPECT_EQ(info->GetVexaSurveyID(), "SV-2024");
  ASSERT_EQ(info->GetNumSurveyItem(), 2);
  EXPECT_EQ(info->GetSurveyItem(1)->GetVexaAdditionalAnswer(), "Mostly on weekends <3");
  EXPECT_EQ(Write(*rq), text);
  OEVexaSurveyRq copy;
  ASSERT_EQ(copy.DeepCopyFrom(rq), 1);
  EXPECT_EQ(Write(copy), text);

  OEVexaSurveyItem item;
  item.SetVexaQuestionLabel(OEString("Q"));
  EXPECT_EQ(item.AllRequiredPresent(), 0);
  EXPECT_EQ(item.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_VEXA_ASWLABEL);
  OEVexaSurveyInfo empty;
  empty.SetVexaSurveyID(OEString("S"));
  EXPECT_EQ(empty.AllRequiredPresent(), 0);  // a survey with no answers
}

// ---------------------------------------------------------------------------
// Factory, wrappers and whole files

TEST_F(ExtensionsTest, InnerAggregatesAndFactoryCreators) {
  struct Inner {
    OETagID tag;
    OETagID wrapper;
  };
  const Inner inner[] = {{OE_TAG_VEXA_BRANDRQ, OE_TAG_VEXA_BRANDTRNRQ},
                         {OE_TAG_VEXA_MKTTIERRQ, OE_TAG_VEXA_MKTTIERTRNRQ},
                         {OE_TAG_VEXA_CLIENTLOGRQ, OE_TAG_VEXA_CLIENTLOGTRNRQ},
                         {OE_TAG_VEXA_FIUSAGELOGRQ, OE_TAG_VEXA_FIUSAGELOGTRNRQ},
                         {OE_TAG_VEXA_CUUSAGELOGRQ, OE_TAG_VEXA_CUUSAGELOGTRNRQ},
                         {OE_TAG_VEXA_SURVEYRQ, OE_TAG_VEXA_SURVEYTRNRQ},
                         {OE_TAG_VEXA_BRANDRS, OE_TAG_NONE},
                         {OE_TAG_VEXA_MKTTIERRS, OE_TAG_NONE}};
  OEDataObjFactory factory;
  for (const Inner& i : inner) {
    std::unique_ptr<OETransBase> made(OENewInnerTrans(&factory, i.tag));
    ASSERT_NE(made, nullptr) << i.tag;
    EXPECT_EQ(made->GetType(), i.tag);
    if (i.wrapper != OE_TAG_NONE) {
      EXPECT_EQ(OETransRq::MsgIDToTranWrapper(i.tag), i.wrapper) << i.tag;
    }
  }
  EXPECT_NE(dynamic_cast<OEVexaCuUsageLogRQ*>(std::unique_ptr<OETransBase>(
                OENewInnerTrans(&factory, OE_TAG_VEXA_CUUSAGELOGRQ)).get()),
            nullptr);

  // Each creator makes its class, standing under its own tag.
  std::unique_ptr<OEDataObj> objs[] = {
      std::unique_ptr<OEDataObj>(factory.NewVexaSoftware()),      std::unique_ptr<OEDataObj>(factory.NewVexaBrandDetails()),
      std::unique_ptr<OEDataObj>(factory.NewVexaSPChange()),      std::unique_ptr<OEDataObj>(factory.NewVexaIntConfig()),
      std::unique_ptr<OEDataObj>(factory.NewVexaSBusinessInfo()), std::unique_ptr<OEDataObj>(factory.NewVexaClientLogRq())};
  const OETagID tags[] = {OE_TAG_VEXA_SW,          OE_TAG_VEXA_BRANDDETAILS,  OE_TAG_VEXA_SPCHANGE,
                          OE_TAG_VEXA_INTERNETCONFIG, OE_TAG_VEXA_SBUSINESSINFO, OE_TAG_VEXA_CLIENTLOGRQ};
  for (size_t k = 0; k < 6; ++k) {
    ASSERT_NE(objs[k], nullptr);
    EXPECT_EQ(objs[k]->GetType(), tags[k]);
  }

  // An application's factory is the one a parse of these sets uses.
  struct Counting : OEDataObjFactory {
    int made = 0;
    OEVexaBIDInfo* NewVexaBIDInfo() override {
      ++made;
      return OEDataObjFactory::NewVexaBIDInfo();
    }
  } counting;
  OEDataObjFactory* before = OEDataObj::GetFactory();
  OEDataObj::SetFactory(&counting);
  Parse(BrandRs());
  OEDataObj::SetFactory(before);
  EXPECT_EQ(counting.made, 2);
}

const char kHeaders[] =
    "OFXHEADER:100\r\nDATA:OFXSGML\r\nVERSION:102\r\nSECURITY:NONE\r\nENCODING:USASCII\r\n"
    "CHARSET:1252\r\nCOMPRESSION:NONE\r\nOLDFILEUID:NONE\r\nNEWFILEUID:NONE\r\n\r\n";
const char kOk[] = "<STATUS><CODE>0<SEVERITY>INFO</STATUS>";

// A server's answer that mixes the standard sets with every extension set,
// with extension tags this library does not know in several places.
std::string MixedResponse() {
  return std::string(kHeaders) +
         "<OFX><SIGNONMSGSRSV1><SONRS>" + kOk +
         "<DTSERVER>20240105120000<LANGUAGE>ENG<VEXA.BID>1001</SONRS></SIGNONMSGSRSV1>"
         "<BANKMSGSRSV1><STMTTRNRS><TRNUID>1" + kOk +
         "<STMTRS><CURDEF>USD<BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>"
         "<BANKTRANLIST><DTSTART>20240101<DTEND>20240105<STMTTRN><TRNTYPE>DEBIT<DTPOSTED>20240102"
         "<TRNAMT>-12.50<FITID>T1<NAME>Coffee</STMTTRN></BANKTRANLIST>"
         "<LEDGERBAL><BALAMT>100.00<DTASOF>20240105</LEDGERBAL></STMTRS></STMTTRNRS></BANKMSGSRSV1>"
         "<VEXA.BRANDMSGSRSV1><VEXA.BRANDTRNRS><TRNUID>2" + kOk +
         "<VEXA.BRANDRS>" + kSoftware + "<VEXA.BRANDDATALIST><VEXA.BRANDDATA>" + BidInfo("1001", "20240105") +
         Details("<VEXA.NEWTHING>x<VEXA.FUTUREAGG><VEXA.INNER>y</VEXA.FUTUREAGG>") +
         "</VEXA.BRANDDATA></VEXA.BRANDDATALIST></VEXA.BRANDRS></VEXA.BRANDTRNRS>"
         "<VEXA.MKTTIERTRNRS><TRNUID>3<STATUS><CODE>1<SEVERITY>INFO</STATUS></VEXA.MKTTIERTRNRS>"
         "</VEXA.BRANDMSGSRSV1>"
         "<VEXA.CLOGMSGSRSV1><VEXA.CLIENTLOGTRNRS><TRNUID>4" + kOk + "</VEXA.CLIENTLOGTRNRS></VEXA.CLOGMSGSRSV1>"
         "<VEXA.SURVEYMSGSRSV1><VEXA.SURVEYTRNRS><TRNUID>5" + kOk + "<VEXA.UNKNOWNEL>z</VEXA.SURVEYTRNRS>"
         "</VEXA.SURVEYMSGSRSV1>"
         "<VEXA.USLFIMSGSRSV1><VEXA.FIUSAGELOGTRNRS><TRNUID>6" + kOk + "</VEXA.FIUSAGELOGTRNRS>"
         "</VEXA.USLFIMSGSRSV1>"
         "<VEXA.USLCUMSGSRSV1><VEXA.CUUSAGELOGTRNRS><TRNUID>7" + kOk + "</VEXA.CUUSAGELOGTRNRS>"
         "</VEXA.USLCUMSGSRSV1></OFX>";
}

TEST_F(ExtensionsTest, FileMixingStandardAndExtensionSetsParsesToTheEnd) {
  OEFileRs file;
  ASSERT_EQ(ParseText(MixedResponse(), &file), OE_PARSE_WARNINGS);
  // The unknown tags were skipped, each with its warning, and nothing else.
  unsigned short unknown = 0;
  for (unsigned short i = 0; i < log->Entries(); ++i) {
    EXPECT_EQ(log->Get(i)->warning, OEPW_UNKNOWNTAG) << log->Get(i)->tagName.c_str();
    ++unknown;
  }
  EXPECT_GE(unknown, 3);

  ASSERT_EQ(file.GetNumberOfResponse(), 1);
  OEResponse* response = file.GetResponse(0);
  ASSERT_EQ(response->GetNumMessage(), 7);
  OEDataObj* lacking = &file;
  OETagID missing = OE_TAG_NONE;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&lacking, &missing), 1) << missing;

  const OESignOnRs* signOn = nullptr;
  const OEVexaBrandRs* brand = nullptr;
  const OETransRs* tiers = nullptr;
  for (unsigned short i = 0; i < response->GetNumMessage(); ++i) {
    OEMessageSetRs* set = response->GetMessageSet(i);
    if (set->GetType() == OE_TAG_SIGNONMSGSRSV1) signOn = set->GetSignOnRs();
    if (set->GetType() == OE_TAG_VEXA_BRANDMSGSRSV1) {
      ASSERT_EQ(set->GetNumTrans(), 2);
      brand = dynamic_cast<const OEVexaBrandRs*>(set->GetTrans(0)->GetActualTrans());
      tiers = set->GetTrans(1);
    }
    if (set->GetType() == OE_TAG_VEXA_USLCUMSGSRSV1) {
      ASSERT_EQ(set->GetNumTrans(), 1);
      EXPECT_EQ(set->GetTrans(0)->GetTransUserID(), "7");  // the last set was read whole
    }
  }
  ASSERT_NE(brand, nullptr);
  const OEVexaBrandDetails* details = brand->GetVexaBrandDataList()->GetVexaBrandData(0)->GetVexaBrandDetails();
  EXPECT_EQ(details->GetNumVexaBrowserCentric(), 2);  // read on past the unknown aggregate
  EXPECT_EQ(details->GetVexaBrandName(), "Example Bank & Trust");
  ASSERT_NE(tiers, nullptr);
  EXPECT_EQ(tiers->GetActualTrans(), nullptr);  // "up to date": no definitions sent
  ASSERT_NE(signOn, nullptr);
  EXPECT_EQ(signOn->GetVexaBid(), 1001u);

  // Written back without the unknown tags and read again the same.
  OEBuffer out;
  OEBuilder builder;
  ASSERT_EQ(builder.Build(&out, &file, OE_BUILD_LENIENT, 0), OE_BUILD_OK);
  const std::string written(out.GetBufferPtr(), out.GetBufferSize());
  EXPECT_EQ(written.find("VEXA.NEWTHING"), std::string::npos);
  EXPECT_NE(written.find("<VEXA.BRANDMSGSRSV1>"), std::string::npos);
  EXPECT_LT(written.find("<BANKMSGSRSV1>"), written.find("<VEXA.BRANDMSGSRSV1>"));
  EXPECT_LT(written.find("<VEXA.CLOGMSGSRSV1>"), written.find("<VEXA.SURVEYMSGSRSV1>"));
  OEFileRs again;
  log->DeleteAll();
  ASSERT_EQ(ParseText(written, &again), OE_PARSE_OK);
  OEBuffer out2;
  ASSERT_EQ(builder.Build(&out2, &again, OE_BUILD_LENIENT, 0), OE_BUILD_OK);
  EXPECT_EQ(std::string(out2.GetBufferPtr(), out2.GetBufferSize()), written);
}

// A request an application builds: a brand request and a market-tier
// request in the branding set, a client log, a survey and both usage logs,
// written strictly with required tags checked, and read back the same.
TEST_F(ExtensionsTest, RequestOfEveryExtensionSetRoundTrips) {
  VexaRoot* root = Parse(std::string("<VEXA.BRANDRQ>") + kSoftware + "<VEXA.SELECTBYBID>" + BidInfo("1", "20240101") +
                         "</VEXA.SELECTBYBID></VEXA.BRANDRQ>" + "<VEXA.CLIENTLOGRQ>" + kPlatform +
                         "<VEXA.REGID>R</VEXA.CLIENTLOGRQ><VEXA.FIUSAGELOGRQ>" + FiUsage("1", "S") +
                         "</VEXA.FIUSAGELOGRQ><VEXA.SURVEYRQ><VEXA.SURVEYINFO><VEXA.SURVEYITEM><VEXA.QSTLABEL>Q"
                         "<VEXA.ASWLABEL>A</VEXA.SURVEYITEM><VEXA.SURVEYID>S</VEXA.SURVEYINFO><VEXA.REGID>R"
                         "</VEXA.SURVEYRQ>");
  auto wrap = [](OETagID set, OETagID type, const char* id, OETransBase* inner) {
    auto* t = new OETransRq;
    t->SetType(type);
    t->SetTransUserID(OEString(id));
    EXPECT_EQ(t->SetActualTrans(inner), 1);
    t->SetTag(inner->GetType());
    auto* s = new OEMessageSetRq;
    s->SetType(set);
    s->AppendTrans(t);
    return s;
  };
  // Each inner request is a copy of the one read, owned by its wrapper.
  auto copyOf = [](auto* source) {
    auto* made = new std::remove_pointer_t<decltype(source)>;
    EXPECT_EQ(made->DeepCopyFrom(source), 1);
    return made;
  };
  auto* tierRq = new OEVexaMktTierRq;
  tierRq->SetVexaTierDtUpdate(OEString("20240101"));
  OEMessageSetRq* brandSet = wrap(OE_TAG_VEXA_BRANDMSGSRQV1, OE_TAG_VEXA_BRANDTRNRQ, "1", copyOf(root->GetBrandRq()));
  auto* tierWrapper = new OETransRq;
  tierWrapper->SetType(OE_TAG_VEXA_MKTTIERTRNRQ);
  tierWrapper->SetTransUserID(OEString("2"));
  EXPECT_EQ(tierWrapper->SetActualTrans(tierRq), 1);
  tierWrapper->SetTag(OE_TAG_VEXA_MKTTIERRQ);
  brandSet->AppendTrans(tierWrapper);
  OERequest request;
  ASSERT_EQ(request.AppendMessageSet(
                wrap(OE_TAG_VEXA_SURVEYMSGSRQV1, OE_TAG_VEXA_SURVEYTRNRQ, "5", copyOf(root->GetSurveyRq()))),
            1);
  ASSERT_EQ(request.AppendMessageSet(wrap(OE_TAG_VEXA_USLFIMSGSRQV1, OE_TAG_VEXA_FIUSAGELOGTRNRQ, "4",
                                          copyOf(root->GetFiUsageLogRq()))),
            1);
  ASSERT_EQ(request.AppendMessageSet(brandSet), 1);
  ASSERT_EQ(request.AppendMessageSet(
                wrap(OE_TAG_VEXA_CLOGMSGSRQV1, OE_TAG_VEXA_CLIENTLOGTRNRQ, "3", copyOf(root->GetClientLogRq()))),
            1);

  OEDataObj* where = &request;
  OETagID missing = OE_TAG_NONE;
  for (unsigned short i = 0; i < request.GetNumMessage(); ++i) {
    where = request.GetMessageSet(i);
    EXPECT_EQ(OEUtility::AllRequiredPresent(&where, &missing), 1) << missing;
  }
  WrittenText strict = WriteUnderOwnTag(request, OE_BUILD_STRICT);
  ASSERT_EQ(strict.status, OE_BUILD_OK);
  const std::string& text = strict.text;
  // Sets in their fixed order, whatever the order they were added in.
  EXPECT_LT(text.find("<VEXA.BRANDMSGSRQV1>"), text.find("<VEXA.CLOGMSGSRQV1>"));
  EXPECT_LT(text.find("<VEXA.CLOGMSGSRQV1>"), text.find("<VEXA.SURVEYMSGSRQV1>"));
  EXPECT_LT(text.find("<VEXA.SURVEYMSGSRQV1>"), text.find("<VEXA.USLFIMSGSRQV1>"));
  EXPECT_LT(text.find("<VEXA.BRANDTRNRQ>"), text.find("<VEXA.MKTTIERTRNRQ>"));
  OERequest again;
  ASSERT_EQ(ParseText(text, &again), OE_PARSE_OK);
  EXPECT_EQ(log->Entries(), 0);
  EXPECT_EQ(WriteUnderOwnTag(again, OE_BUILD_STRICT).text, text);
}

}  // namespace
