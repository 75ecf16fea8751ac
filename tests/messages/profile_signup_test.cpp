// Profiles (what an institution supports and its sign-on rules) and signup
// (enrolment, account information, account services, user information).
#include <gtest/gtest.h>

#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"
#include "support/ofx_text.h"

namespace {

#define T_PROFILE_ROOT_FIELDS(X)                              \
  X(CHILD, ProfileRs, PROFRS, OEProfileRs)                    \
  X(CHILD, AccountInfoRs, ACCTINFORS, OEAccountInfoRs)        \
  X(CHILD, EnrollRq, ENROLLRQ, OEEnrollRq)                    \
  X(CHILD, EnrollRs, ENROLLRS, OEEnrollRs)                    \
  X(CHILD, ServiceRq, ACCTRQ, OEAccountServiceRq)
class ProfileRoot : public OEAggregate {
  OE_AGGREGATE(ProfileRoot, T_PROFILE_ROOT_FIELDS)
};
OE_DEFINE_AGGREGATE(ProfileRoot, OEAggregate, T_PROFILE_ROOT_FIELDS, NONE,
                    .Valid(OE_TAGS(PROFRS, ACCTINFORS, ENROLLRQ, ENROLLRS, ACCTRQ)))

std::string Core(const char* url, const char* realm, const char* languages = "<LANGUAGE>ENG") {
  return std::string("<MSGSETCORE><VER>1<URL>") + url + "<OFXSEC>NONE<TRANSPSEC>Y<SIGNONREALM>" + realm +
         languages + "<SYNCMODE>LITE<RESPFILEER>N</MSGSETCORE>";
}

std::string SignOnInfo(const char* realm, const char* min, const char* max, const char* chartype) {
  return std::string("<SIGNONINFO><SIGNONREALM>") + realm + "<MIN>" + min + "<MAX>" + max + "<CHARTYPE>" + chartype +
         "<CASESEN>N<SPECIAL>Y<SPACES>N<PINCH>Y<CHGPINFIRST>N</SIGNONINFO>";
}

// A profile of several shapes: two realms, the bank set listed twice, a
// second signup version, three languages in one core.
std::string Profile() {
  return "<PROFRS><MSGSETLIST>"
         "<SIGNONMSGSET><SIGNONMSGSETV1>" + Core("https://ofx.example/so", "MAIN") + "</SIGNONMSGSETV1></SIGNONMSGSET>"
         "<SIGNUPMSGSET><SIGNUPMSGSETV2>" + Core("https://ofx.example/su", "MAIN") +
         "<WEBENROLL><URL>https://example/enrol</WEBENROLL><CHGUSERINFO>N<AVAILACCTS>Y<CLIENTACTREQ>N"
         "</SIGNUPMSGSETV2></SIGNUPMSGSET>"
         "<BANKMSGSET><BANKMSGSETV1>" + Core("https://ofx.example/bank", "MAIN", "<LANGUAGE>ENG<LANGUAGE>FRA<LANGUAGE>SPA") +
         "<INVALIDACCTTYPE>CREDITLINE<EMAILPROF><CANEMAIL>Y<CANNOTIFY>N</EMAILPROF><CLOSINGAVAIL>Y</BANKMSGSETV1>"
         "</BANKMSGSET>"
         "<INVSTMTMSGSET><INVSTMTMSGSETV1>" + Core("https://ofx.example/inv", "BROKER") +
         "<TRANDNLD>Y<OODNLD>N<POSDNLD>Y<BALDNLD>Y<CANEMAIL>N</INVSTMTMSGSETV1></INVSTMTMSGSET>"
         "<BANKMSGSET><BANKMSGSETV1>" + Core("https://ofx.example/bank2", "MAIN") +
         "<EMAILPROF><CANEMAIL>N<CANNOTIFY>N</EMAILPROF><CLOSINGAVAIL>N</BANKMSGSETV1></BANKMSGSET>"
         "<PROFMSGSET><PROFMSGSETV1>" + Core("https://ofx.example/prof", "MAIN") + "</PROFMSGSETV1></PROFMSGSET>"
         "</MSGSETLIST><SIGNONINFOLIST>" + SignOnInfo("MAIN", "6", "32", "ALPHAANDNUMERIC") +
         SignOnInfo("BROKER", "10", "4", "NUMERICONLY") +
         "</SIGNONINFOLIST><DTPROFUP>20240101<FINAME>Example Bank<ADDR1>1 Main St<CITY>Springfield<STATE>IL"
         "<POSTALCODE>62701<COUNTRY>USA<CSPHONE>555-0100<VEXA.RTN>121000248<VEXA.RTN>026009593</PROFRS>";
}

class ProfileTest : public LogFixture {
 protected:
  std::string Write(const OEDataObj& obj) {
    WrittenText written = WriteUnderOwnTag(obj, OE_BUILD_LENIENT);
    EXPECT_EQ(written.status, OE_BUILD_OK);
    return written.text;
  }
};

TEST_F(ProfileTest, ProfileTreeOfSeveralShapes) {
  ProfileRoot root;
  ASSERT_EQ(ParseText(Profile(), &root), OE_PARSE_OK);
  OEProfileRs* rs = root.GetProfileRs();
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  EXPECT_EQ(rs->GetFIName(), "Example Bank");
  ASSERT_EQ(rs->GetNumVexaRoutingNumber(), 2);
  EXPECT_EQ(*rs->GetVexaRoutingNumber(1), "026009593");

  const OEMessageSetList* list = rs->GetMessageSetList();
  ASSERT_EQ(list->GetNumOfMessageSetProfile(), 6);
  // Repeated message sets are kept, in document order.
  EXPECT_EQ(list->GetMessageSetProfile(2)->GetType(), OE_TAG_BANKMSGSET);
  EXPECT_EQ(list->GetMessageSetProfile(4)->GetType(), OE_TAG_BANKMSGSET);
  const auto* bank2 = dynamic_cast<const OEBankMessageSetV1*>(list->GetMessageSetProfile(4)->GetMessageSetVersion(0));
  ASSERT_NE(bank2, nullptr);
  EXPECT_EQ(bank2->GetMessageSetCore()->GetURL(), "https://ofx.example/bank2");
  EXPECT_NE(dynamic_cast<const OESignUpMessageSetV2*>(list->GetMessageSetProfile(1)->GetMessageSetVersion(0)),
            nullptr);
  EXPECT_NE(dynamic_cast<const OEInvStmtMsgSetV1*>(list->GetMessageSetProfile(3)->GetMessageSetVersion(0)), nullptr);
  const OEMessageSetCore* core = list->GetMessageSetProfile(2)->GetMessageSetVersion(0)->GetMessageSetCore();
  ASSERT_EQ(core->GetNumLanguage(), 3);

  // Sign-on rules are carried as read, never judged.
  const OESignOnInfo* broker = rs->GetSignOnInfoList()->GetSignOnInfo(1);
  EXPECT_EQ(broker->GetMinPassword(), 10);
  EXPECT_EQ(broker->GetMaxPassword(), 4);
  EXPECT_EQ(rs->GetSignOnInfoList()->GetSignOnInfo(0)->GetCharacterType(), OE_CHARTYPE_ALPHAANDNUMERIC);
  EXPECT_EQ(static_cast<int>(rs->GetSignOnInfoList()->GetSignOnInfo(0)->GetCharacterType()), 3);

  // From an inner request to the rules that govern it.
  EXPECT_EQ(rs->FindSignOnInfo(OE_TAG_STMTRQ), rs->GetSignOnInfoList()->GetSignOnInfo(0));
  EXPECT_EQ(rs->FindSignOnInfo(OE_TAG_INVSTMTRQ), broker);
  EXPECT_EQ(rs->FindMessageSetProfile(OE_TAG_STMTRQ), list->GetMessageSetProfile(2));  // the first one listed
  EXPECT_EQ(rs->FindSignOnInfo(OE_TAG_PMTRQ), nullptr);  // no bill payment offered

  // Written back: languages and repeated elements in order, then read again the same.
  std::string written = Write(*rs);
  EXPECT_NE(written.find("<LANGUAGE>ENG\n<LANGUAGE>FRA\n<LANGUAGE>SPA\n"), std::string::npos);
  EXPECT_NE(written.find("<VEXA.RTN>121000248\n<VEXA.RTN>026009593\n"), std::string::npos);
  EXPECT_LT(written.find("</MSGSETLIST>"), written.find("<DTPROFUP>"));
  ProfileRoot again;
  ASSERT_EQ(ParseText(written, &again), OE_PARSE_OK);
  EXPECT_EQ(Write(*again.GetProfileRs()), written);

  // A deep copy makes each version in its own class.
  OEProfileRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(rs), 1);
  EXPECT_EQ(Write(copy), written);
  EXPECT_NE(dynamic_cast<const OEInvStmtMsgSetV1*>(
                copy.GetMessageSetList()->GetMessageSetProfile(3)->GetMessageSetVersion(0)),
            nullptr);
}

TEST_F(ProfileTest, BadSignOnRulesAndUnknownVersionsWarn) {
  ProfileRoot root;
  std::string text = Profile();
  text.replace(text.find("<CHARTYPE>NUMERICONLY"), 21, "<CHARTYPE>DIGITS");
  text.insert(text.find("<PROFMSGSET>"),
              "<BANKMSGSET><BANKMSGSETV9>" + Core("https://x", "MAIN") + "</BANKMSGSETV9></BANKMSGSET>");
  EXPECT_EQ(ParseText(text, &root), OE_PARSE_WARNINGS);
  EXPECT_TRUE(Logged(OEPW_BADFORMAT));
  OEProfileRs* rs = root.GetProfileRs();
  OESignOnInfo* broker = rs->GetSignOnInfoList()->GetSignOnInfo(1);
  EXPECT_FALSE(broker->ValidateTag(OE_TAG_CHARTYPE));
  EXPECT_EQ(broker->AllRequiredPresent(), 0);
  EXPECT_EQ(broker->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_CHARTYPE);
  // The unknown version is skipped; its set and everything after it stay.
  ASSERT_EQ(rs->GetMessageSetList()->GetNumOfMessageSetProfile(), 7);
  EXPECT_EQ(rs->GetMessageSetList()->GetMessageSetProfile(5)->GetNumOfMessageSetVersion(), 0);
  EXPECT_EQ(rs->GetMessageSetList()->GetMessageSetProfile(6)->GetType(), OE_TAG_PROFMSGSET);
  EXPECT_EQ(rs->GetFIName(), "Example Bank");

  OEMessageSetProfile set;
  EXPECT_EQ(set.NewMsgSetVersion(OE_TAG_WIREXFERMSGSETV1, 0), OE_PARSE_OK);
  EXPECT_NE(dynamic_cast<OEWireXferMessageSetV1*>(set.GetMessageSetVersion(0)), nullptr);
  EXPECT_EQ(set.NewMsgSetVersion(OE_TAG_STMTRQ, 1), OE_PARSE_NOT_HANDLED);
  EXPECT_EQ(set.GetNumOfMessageSetVersion(), 1);
}

TEST_F(ProfileTest, AccountInformationKeepsReadOrderOfEveryKind) {
  ProfileRoot root;
  ASSERT_EQ(ParseText("<ACCTINFORS><DTACCTUP>20240101<ACCTINFO><DESC>Card and checking<PHONE>555"
                      "<CCACCTINFO><CCACCTFROM><ACCTID>4111</CCACCTFROM><SUPTXDL>Y<XFERSRC>N<XFERDEST>N"
                      "<SVCSTATUS>ACTIVE</CCACCTINFO>"
                      "<BANKACCTINFO><BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>"
                      "<SUPTXDL>Y<XFERSRC>Y<XFERDEST>Y<SVCSTATUS>AVAIL</BANKACCTINFO>"
                      "<BPACCTINFO><BANKACCTFROM><BANKID>121000248<ACCTID>1001<ACCTTYPE>CHECKING</BANKACCTFROM>"
                      "<SVCSTATUS>PEND</BPACCTINFO></ACCTINFO>"
                      "<ACCTINFO><DESC>Brokerage<INVACCTINFO><INVACCTFROM><BROKERID>b.example<ACCTID>X1</INVACCTFROM>"
                      "<USPRODUCTTYPE>401K<CHEQUING>N<SVCSTATUS>ACTIVE<INVACCTTYPE>INDIVIDUAL</INVACCTINFO></ACCTINFO>"
                      "</ACCTINFORS>",
                      &root),
            OE_PARSE_OK);
  const OEAccountInfoRs* rs = root.GetAccountInfoRs();
  ASSERT_EQ(rs->GetNumAccountInfo(), 2);
  const OEAccountInfo* first = rs->GetAccountInfo(0);
  ASSERT_EQ(first->GetNumAccountInfoBase(), 3);
  EXPECT_NE(dynamic_cast<const OECCAccountInfo*>(first->GetAccountInfoBase(0)), nullptr);
  const auto* bank = dynamic_cast<const OEBankAccountInfo*>(first->GetAccountInfoBase(1));
  ASSERT_NE(bank, nullptr);
  EXPECT_EQ(bank->GetAccountFrom()->GetBankID(), "121000248");
  EXPECT_EQ(bank->GetServiceStatus(), OE_SVCSTATUS_AVAIL);
  EXPECT_EQ(first->GetAccountInfoBase(2)->GetServiceStatus(), OE_SVCSTATUS_PEND);
  auto* inv = dynamic_cast<OEInvAcctInfo*>(rs->GetAccountInfo(1)->GetAccountInfoBase(0));
  ASSERT_NE(inv, nullptr);
  EXPECT_EQ(inv->GetUSProductType(), OE_USPRODUCT_401K);
  EXPECT_EQ(inv->AllRequiredPresent(), 1);
  std::string written = Write(*rs);
  EXPECT_LT(written.find("<CCACCTINFO>"), written.find("<BANKACCTINFO>"));
  EXPECT_LT(written.find("<BANKACCTINFO>"), written.find("<BPACCTINFO>"));
  OEAccountInfoRs copy;
  ASSERT_EQ(copy.DeepCopyFrom(rs), 1);
  EXPECT_EQ(Write(copy), written);
}

TEST_F(ProfileTest, ServiceActionsNeedTheirAccounts) {
  struct Case {
    const char* text;
    unsigned short complete;
    OETagID firstMissing;
  } cases[] = {
      {"<SVCADD><BANKACCTTO><BANKID>1<ACCTID>2<ACCTTYPE>SAVINGS</BANKACCTTO></SVCADD>", 1, OE_TAG_NONE},
      {"<SVCADD><BANKACCTTO><BANKID>1<ACCTID>2<ACCTTYPE>SAVINGS</BANKACCTTO><CCACCTTO><ACCTID>3</CCACCTTO></SVCADD>", 0,
       OE_TAG_NONE},
      {"<SVCCHG><BANKACCTFROM><BANKID>1<ACCTID>2<ACCTTYPE>SAVINGS</BANKACCTFROM></SVCCHG>", 0, OE_TAG_BANKACCTTO},
      {"<SVCDEL><INVACCTFROM><BROKERID>b<ACCTID>1</INVACCTFROM></SVCDEL>", 1, OE_TAG_NONE},
      {"<SVCDEL></SVCDEL>", 0, OE_TAG_BANKACCTFROM},
  };
  for (const Case& c : cases) {
    ProfileRoot root;
    ASSERT_EQ(ParseText(std::string("<ACCTRQ>") + c.text + "<SVC>BANKSVC</ACCTRQ>", &root), OE_PARSE_OK) << c.text;
    OEAction* action = root.GetServiceRq()->GetAction();
    ASSERT_NE(action, nullptr) << c.text;
    EXPECT_EQ(action->AllRequiredPresent(), c.complete) << c.text;
    EXPECT_EQ(action->GetFirstMissingRequiredTag(OE_TAG_NONE), c.firstMissing) << c.text;
    EXPECT_NE(Write(*root.GetServiceRq()).find(std::string("<") + OEUtility::TagToString(action->GetType()).c_str()),
              std::string::npos);
  }
  // The walk names each alternative once and ends.
  OEAction change;
  change.SetType(OE_TAG_SVCCHG);
  std::string walk;
  for (OETagID t = change.GetFirstMissingRequiredTag(OE_TAG_NONE); t != OE_TAG_NONE;
       t = change.GetFirstMissingRequiredTag(t))
    walk += std::string(OEUtility::TagToString(t).c_str()) + " ";
  EXPECT_EQ(walk, "BANKACCTTO CCACCTTO INVACCTTO BANKACCTFROM CCACCTFROM INVACCTFROM ");
}

TEST_F(ProfileTest, EnrolmentRulesAndTheTemporaryPassword) {
  ProfileRoot root;
  std::string enroll =
      "<ENROLLRQ><FIRSTNAME>Ann<MIDDLENAME>B<LASTNAME>Lee<ADDR1>1 Elm<CITY>Town<STATE>CA<POSTALCODE>90001"
      "<COUNTRY>USA<DAYPHONE>555<EMAIL>ann@example.com<TAXID>123-45-6789<SECURITYNAME>Smith<DATEBIRTH>19800101"
      "<INVACCTFROM><BROKERID>b<ACCTID>1</INVACCTFROM></ENROLLRQ>";
  ASSERT_EQ(ParseText(enroll + "<ENROLLRS><TEMPPASS>" + std::string(40, 'q') + "<USERID>ann</ENROLLRS>", &root),
            OE_PARSE_OK);
  OEEnrollRq* rq = root.GetEnrollRq();
  EXPECT_EQ(rq->AllRequiredPresent(), 0);  // no evening phone
  EXPECT_EQ(rq->GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_EVEPHONE);
  rq->SetEveningPhone("555-0199");
  EXPECT_EQ(rq->AllRequiredPresent(), 1);
  EXPECT_EQ(rq->GetAccountFrom()->GetType(), OE_TAG_INVACCTFROM);
  EXPECT_EQ(rq->GetDateOfBirth().GetYear(), 1980);
  // The account is written first, under its own tag.
  EXPECT_EQ(Write(*rq).rfind("<ENROLLRQ>\n<INVACCTFROM>", 0), 0u);
  // An over-long temporary password is kept but never logged.
  EXPECT_EQ(root.GetEnrollRs()->GetTempPassword().GetStrLength(), 40);
  for (unsigned short i = 0; i < log->Entries(); ++i)
    EXPECT_EQ(std::string(log->Get(i)->value.c_str()).find("qqqq"), std::string::npos);
}

TEST_F(ProfileTest, FirstContactThroughTheWrappers) {
  const std::string text =
      "<OFX><SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20240101<LANGUAGE>ENG</SONRS>"
      "</SIGNONMSGSRSV1><SIGNUPMSGSRSV1><ACCTINFOTRNRS><TRNUID>1<STATUS><CODE>0<SEVERITY>INFO</STATUS>"
      "<ACCTINFORS><DTACCTUP>20240101<ACCTINFO><DESC>Checking<BANKACCTINFO><BANKACCTFROM><BANKID>1<ACCTID>2"
      "<ACCTTYPE>CHECKING</BANKACCTFROM><SUPTXDL>Y<XFERSRC>Y<XFERDEST>Y<SVCSTATUS>ACTIVE</BANKACCTINFO></ACCTINFO>"
      "</ACCTINFORS></ACCTINFOTRNRS></SIGNUPMSGSRSV1><PROFMSGSRSV1><PROFTRNRS><TRNUID>2<STATUS><CODE>0"
      "<SEVERITY>INFO</STATUS>" +
      Profile() + "</PROFTRNRS></PROFMSGSRSV1></OFX>";
  OEResponse response;
  ASSERT_EQ(ParseText(text, &response), OE_PARSE_OK);
  ASSERT_EQ(response.GetNumMessage(), 3);
  const OETransRs* accounts = response.GetMessageSet(1)->GetTrans(0);
  ASSERT_NE(dynamic_cast<const OEAccountInfoRs*>(accounts->GetActualTrans()), nullptr);
  const OETransRs* profile = response.GetMessageSet(2)->GetTrans(0);
  const auto* rs = dynamic_cast<const OEProfileRs*>(profile->GetActualTrans());
  ASSERT_NE(rs, nullptr);
  EXPECT_EQ(rs->GetMessageSetList()->GetNumOfMessageSetProfile(), 6);
}

}  // namespace
