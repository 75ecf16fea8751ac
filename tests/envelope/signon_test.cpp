#include <string>

#include "envelope_test_util.h"

namespace {
class SignOnTest : public EnvelopeTest {
 protected:
  // A sign-on request with its four required elements.
  void FillRequired(OESignOnRq& rq) {
    ASSERT_EQ(rq.SetDtClient(OEString("20240102030405")), 1);
    ASSERT_EQ(rq.SetLanguage(OEString("ENG")), 1);
    ASSERT_EQ(rq.SetAppId(OEString("QWIN")), 1);
    ASSERT_EQ(rq.SetAppVer(OEString("0500")), 1);
  }
};
}  // namespace

TEST_F(SignOnTest, CredentialsAreAUserIdWithPasswordOrAUserKey) {
  OESignOnRq rq;
  FillRequired(rq);
  EXPECT_EQ(rq.AllRequiredPresent(), 0);  // no credentials at all
  EXPECT_EQ(rq.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_USERID);
  rq.SetUserId("alice");
  EXPECT_EQ(rq.AllRequiredPresent(), 0);  // a user id without its password
  EXPECT_EQ(rq.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_USERPASS);
  EXPECT_EQ(rq.GetFirstMissingRequiredTag(OE_TAG_USERPASS), OE_TAG_NONE);
  rq.SetUserPass("secret");
  EXPECT_EQ(rq.AllRequiredPresent(), 1);

  OESignOnRq byKey;
  FillRequired(byKey);
  byKey.SetUserKey("K123");
  EXPECT_EQ(byKey.AllRequiredPresent(), 1);

  OESignOnRq lacking;
  lacking.SetUserKey("K123");
  EXPECT_EQ(lacking.AllRequiredPresent(), 0);
  EXPECT_EQ(lacking.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_DTCLIENT);
}

TEST_F(SignOnTest, OverlongPasswordIsKeptButNeverLogged) {
  OESignOnRq rq;
  std::string password(200, 'p');
  password.replace(0, 6, "SECRET");
  EXPECT_EQ(rq.SetUserPass(OEString(password.c_str())), 1);
  EXPECT_EQ(rq.GetUserPass().GetStrLength(), 200);
  EXPECT_EQ(rq.ValidateTag(OE_TAG_USERPASS), 1);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_TOOLONG);
  EXPECT_STREQ(log->Get(0)->value.c_str(), "Password too long");
  EXPECT_TRUE(log->Get(0)->tagName.IsEmpty());
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_USERPASS);
  EXPECT_EQ(log->Get(0)->object, &rq);

  // The new password of a PIN change follows the same rule.
  OEPinChangeRq pin;
  EXPECT_EQ(pin.SetNewUserPass(OEString(password.c_str())), 1);
  ASSERT_EQ(log->Entries(), 2);
  EXPECT_EQ(log->Get(1)->tag, OE_TAG_NEWUSERPASS);
  EXPECT_FALSE(LogMentions("SECRET"));

  // A copy keeps the password; no copy made along the way logs it.
  OESignOnRq copy;
  EXPECT_EQ(copy.DeepCopyFrom(&rq), 1);
  EXPECT_STREQ(copy.GetUserPass().c_str(), password.c_str());
  EXPECT_FALSE(LogMentions("SECRET"));
}

TEST_F(SignOnTest, ParsedPasswordNeverReachesTheLog) {
  OEResponse root;  // USERPASS is valid nowhere in a response: the parser logs the element
  std::string text = "<OFX><SIGNONMSGSRSV1><SONRS><USERPASS>SECRET</SONRS></SIGNONMSGSRSV1></OFX>";
  Parse(text, &root);
  EXPECT_GE(log->Entries(), 1);
  EXPECT_FALSE(LogMentions("SECRET"));
}

TEST_F(SignOnTest, AppVerIsReadAsANumberAndWrittenWithFourDigits) {
  OESignOnRq rq;
  FillRequired(rq);
  EXPECT_EQ(rq.GetAppVer(), 500);
  EXPECT_EQ(rq.SetAppVer(OEString("5.0")), 0);
  EXPECT_EQ(rq.GetAppVer(), 500);  // unchanged
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_BADFORMAT);
  EXPECT_STREQ(log->Get(0)->value.c_str(), "5.0");
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_APPVER);

  OESignOnRq fresh;
  EXPECT_EQ(fresh.SetAppVer(OEString("5.0")), 0);
  EXPECT_EQ(fresh.ValidateTag(OE_TAG_APPVER), 0);
}

TEST_F(SignOnTest, RequestIsWrittenInItsOwnOrder) {
  OESignOnRq rq;
  FillRequired(rq);
  rq.SetUserId("alice");
  rq.SetUserPass("secret");
  rq.SetGenUserKey(1);
  rq.SetSessCookie("cookie");
  OEFI* fi = new OEFI;
  fi->SetOrg("Bank");
  fi->SetFId("1234");
  EXPECT_EQ(rq.SetFI(fi), 1);
  EXPECT_EQ(Write(rq),
            "<SONRQ>\n<DTCLIENT>20240102030405\n<USERID>alice\n<USERPASS>secret\n<GENUSERKEY>Y\n"
            "<LANGUAGE>ENG\n<FI>\n<ORG>Bank\n<FID>1234\n</FI>\n<SESSCOOKIE>cookie\n<APPID>QWIN\n<APPVER>0500\n"
            "</SONRQ>\n");
  EXPECT_EQ(rq.GetNumberOfChildren(), 1);
  EXPECT_EQ(rq.GetChild(0), fi);

  OESignOnRq bare;
  EXPECT_EQ(bare.GetNumberOfChildren(), 1);
  EXPECT_EQ(bare.GetChild(0), nullptr);
}

TEST_F(SignOnTest, LanguageValueLongerThanThreeIsKeptAndLogged) {
  OESignOnRq rq;
  EXPECT_EQ(rq.SetLanguage(OELanguage("ENGL")), 1);
  EXPECT_EQ(rq.ValidateTag(OE_TAG_LANGUAGE), 1);
  EXPECT_STREQ(rq.GetLanguage().GetString().c_str(), "ENGL");
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_TOOLONG);
  EXPECT_STREQ(log->Get(0)->value.c_str(), "ENGL");
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_NONE);
  EXPECT_EQ(log->Get(0)->object, nullptr);
}

TEST_F(SignOnTest, ResponseReadsAndWritesItsElements) {
  OEResponse root;
  std::string text =
      "<OFX><SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS>"
      "<DTSERVER>20240102030405<LANGUAGE>ENG<FI><ORG>Bank<FID>99</FI>"
      "<VEXA.BID>12345<VEXA.MKTCOOKIE>mc<VEXA.USERID>someone</SONRS></SIGNONMSGSRSV1></OFX>";
  EXPECT_EQ(Parse(text, &root), OE_PARSE_OK);
  ASSERT_EQ(root.GetNumMessage(), 1);
  OESignOnRs* rs = root.GetMessageSet(0)->GetSignOnRs();
  ASSERT_NE(rs, nullptr);
  ASSERT_NE(rs->GetStatus(), nullptr);
  EXPECT_EQ(rs->GetStatus()->GetSeverity(), OE_SEVERITY_INFO);
  EXPECT_EQ(rs->GetVexaBid(), 12345u);
  EXPECT_STREQ(rs->GetVexaUserId().c_str(), "someone");
  EXPECT_STREQ(rs->GetFI()->GetFId().c_str(), "99");
  EXPECT_EQ(rs->AllRequiredPresent(), 1);
  EXPECT_EQ(rs->GetNumberOfChildren(), 2);
  EXPECT_EQ(rs->GetChild(0), rs->GetStatus());
  EXPECT_EQ(rs->GetChild(1), rs->GetFI());
  EXPECT_EQ(rs->GetChild(2), nullptr);
  // VEXA.USERID is read but never written.
  EXPECT_EQ(Write(*rs),
            "<SONRS>\n<STATUS>\n<CODE>0\n<SEVERITY>INFO\n</STATUS>\n<DTSERVER>20240102030405\n<LANGUAGE>ENG\n"
            "<FI>\n<ORG>Bank\n<FID>99\n</FI>\n<VEXA.MKTCOOKIE>mc\n<VEXA.BID>12345\n</SONRS>\n");

  OESignOnRs copy;
  EXPECT_EQ(copy.DeepCopyFrom(rs), 1);
  EXPECT_NE(copy.GetStatus(), rs->GetStatus());
  EXPECT_EQ(Write(copy), Write(*rs));
}

// A text the setter cannot convert is OEPW_BADFORMAT whatever code the
// conversion gives the same fault (too long for a language, out of range for
// a number, a date beyond its fields): one warning, the tag absent.
TEST_F(SignOnTest, TextSettersReportFailedConversionsAsBadFormat) {
  OESignOnRq rq;
  OESignOnRs rs;
  struct Case {
    const char* what;
    unsigned short (*set)(OESignOnRq&, OESignOnRs&, const OEString&);
    const char* text;
    OETagID tag;
  };
  const Case cases[] = {
      {"language", [](OESignOnRq& q, OESignOnRs&, const OEString& t) { return q.SetLanguage(t); }, "ENGL",
       OE_TAG_LANGUAGE},
      {"response language", [](OESignOnRq&, OESignOnRs& r, const OEString& t) { return r.SetLanguage(t); },
       "ENGLISH", OE_TAG_LANGUAGE},
      {"app version out of range", [](OESignOnRq& q, OESignOnRs&, const OEString& t) { return q.SetAppVer(t); },
       "70000", OE_TAG_APPVER},
      {"bid out of range", [](OESignOnRq&, OESignOnRs& r, const OEString& t) { return r.SetVexaBid(t); },
       "99999999999", OE_TAG_VEXA_BID},
      {"client date out of range", [](OESignOnRq& q, OESignOnRs&, const OEString& t) { return q.SetDtClient(t); },
       "20261340", OE_TAG_DTCLIENT},
  };
  for (const Case& c : cases) {
    SCOPED_TRACE(c.what);
    log->DeleteAll();
    EXPECT_EQ(c.set(rq, rs, OEString(c.text)), 0);
    ASSERT_EQ(log->Entries(), 1);
    EXPECT_EQ(log->Get(0)->warning, OEPW_BADFORMAT);
    EXPECT_STREQ(log->Get(0)->value.c_str(), c.text);
    EXPECT_EQ(log->Get(0)->tag, c.tag);
  }
  EXPECT_EQ(rq.ValidateTag(OE_TAG_LANGUAGE), 0);
  EXPECT_EQ(rq.ValidateTag(OE_TAG_APPVER), 0);
  EXPECT_EQ(rq.ValidateTag(OE_TAG_DTCLIENT), 0);
  EXPECT_EQ(rs.ValidateTag(OE_TAG_LANGUAGE), 0);
  EXPECT_EQ(rs.ValidateTag(OE_TAG_VEXA_BID), 0);
}

TEST_F(SignOnTest, VexaBidTakesOnlyNumbers) {
  OESignOnRs rs;
  EXPECT_EQ(rs.SetVexaBid(OEString("12345")), 1);
  EXPECT_EQ(rs.GetVexaBid(), 12345u);
  EXPECT_EQ(rs.SetVexaBid(OEString("12a")), 0);
  EXPECT_EQ(rs.GetVexaBid(), 12345u);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_BADFORMAT);
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_VEXA_BID);
  EXPECT_EQ(rs.AllRequiredPresent(), 0);  // no status, server date or language
  EXPECT_EQ(rs.GetNumberOfChildren(), 2);
  EXPECT_EQ(rs.GetChild(0), nullptr);
}

TEST_F(SignOnTest, ChallengeAndPinChangeRules) {
  OEChallengeRs challenge;
  challenge.SetUserID("u");
  challenge.SetNonce("n");
  EXPECT_EQ(challenge.AllRequiredPresent(), 0);
  challenge.SetFICertID("c");
  EXPECT_EQ(challenge.AllRequiredPresent(), 1);
  EXPECT_EQ(Write(challenge), "<CHALLENGERS>\n<USERID>u\n<NONCE>n\n<FICERTID>c\n</CHALLENGERS>\n");

  OEPinChangeRs pin;
  pin.SetUserId("u");
  EXPECT_EQ(pin.AllRequiredPresent(), 1);
  EXPECT_EQ(pin.SetDateTimeChanged(OEString("yesterday")), 0);
  EXPECT_EQ(Count(OEPW_BADFORMAT), 1);

  OEChallengeRq original;
  original.SetUserID("u");
  OETransBase* copy = new OEChallengeRq;
  EXPECT_EQ(copy->DeepCopyFrom(&original), 1);
  EXPECT_STREQ(static_cast<OEChallengeRq*>(copy)->GetUserID().c_str(), "u");
  OEPinChangeRq other;
  EXPECT_EQ(copy->DeepCopyFrom(&other), 0);  // another class
  delete copy;
}
