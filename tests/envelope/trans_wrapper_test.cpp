#include <string>
#include <vector>

#include "envelope_test_util.h"

namespace {
class TransWrapperTest : public EnvelopeTest {
 protected:
  // A response wrapper of the type with TRNUID and a status.
  static void Answer(OETransRs& rs, OETagID type, const char* code, const char* severity) {
    rs.SetType(type);
    rs.SetTransUserID("1");
    OEStatus* status = new OEStatus;
    status->SetCode(OEString(code));
    status->SetSeverity(OEString(severity));
    ASSERT_EQ(rs.SetStatus(status), 1);
  }
};
}  // namespace

TEST_F(TransWrapperTest, StatusCodeRangeAndSeverityTexts) {
  OEStatus status;
  EXPECT_EQ(status.SetCode(OEString("1000000")), 0);
  EXPECT_EQ(status.ValidateTag(OE_TAG_CODE), 0);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_TOOLONG);
  EXPECT_STREQ(log->Get(0)->value.c_str(), "1000000");
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_CODE);
  EXPECT_EQ(log->Get(0)->object, &status);

  EXPECT_EQ(status.SetCode(OEString("-99999")), 1);
  EXPECT_EQ(status.GetCode(), -99999);
  EXPECT_EQ(status.SetCode(OEString("-100000")), 0);
  EXPECT_EQ(status.SetCode(OEString("2000x")), 0);
  EXPECT_EQ(status.GetCode(), -99999);
  EXPECT_EQ(Count(OEPW_BADFORMAT), 1);

  EXPECT_EQ(status.SetSeverity(OEString("FATAL")), 0);
  EXPECT_EQ(status.ValidateTag(OE_TAG_SEVERITY), 0);
  EXPECT_EQ(status.AllRequiredPresent(), 0);
  EXPECT_EQ(status.SetSeverity(OEString("WARN")), 1);
  EXPECT_EQ(status.AllRequiredPresent(), 1);
  status.SetMessageText("Careful");
  EXPECT_EQ(Write(status), "<STATUS>\n<CODE>-99999\n<SEVERITY>WARN\n<MESSAGE>Careful\n</STATUS>\n");

  // A severity with no text cannot be written.
  status.SetSeverity(static_cast<OEStatusSeverity>(7));
  OEBuildStatus built;
  Write(status, &built);
  EXPECT_EQ(built, OE_BUILD_BAD_VALUE);
  EXPECT_EQ(inError, &status);
}

TEST_F(TransWrapperTest, ErrorStatusReleasesTheInnerResponse) {
  OETransRs error;
  Answer(error, OE_TAG_STMTTRNRS, "2000", "ERROR");
  EXPECT_EQ(error.AllRequiredPresent(), 1);
  OETransRs warn;
  Answer(warn, OE_TAG_STMTTRNRS, "2000", "WARN");
  EXPECT_EQ(warn.AllRequiredPresent(), 0);

  // Except for the payroll enrolment, which must answer anyway.
  OETransRs enroll;
  Answer(enroll, OE_TAG_V_PAYROLLENROLLTRNRS, "2000", "ERROR");
  EXPECT_EQ(enroll.AllRequiredPresent(), 0);
  // The log, usage and survey wrappers never carry one.
  OETransRs clientLog;
  Answer(clientLog, OE_TAG_VEXA_CLIENTLOGTRNRS, "0", "INFO");
  EXPECT_EQ(clientLog.AllRequiredPresent(), 1);
  clientLog.ClearTag(OE_TAG_TRNUID);
  EXPECT_EQ(clientLog.AllRequiredPresent(), 0);
}

TEST_F(TransWrapperTest, UpToDateReleasesOnlySomeWrappers) {
  OETransRs profile;
  Answer(profile, OE_TAG_PROFTRNRS, "1", "INFO");
  EXPECT_EQ(profile.AllRequiredPresent(), 1);
  OETransRs statement;
  Answer(statement, OE_TAG_STMTTRNRS, "1", "INFO");
  EXPECT_EQ(statement.AllRequiredPresent(), 0);
  OETransRs noStatus;
  noStatus.SetType(OE_TAG_PROFTRNRS);
  noStatus.SetTransUserID("1");
  EXPECT_EQ(noStatus.AllRequiredPresent(), 0);
}

TEST_F(TransWrapperTest, InnerAlternativesAreExclusive) {
  OETransRs mail;
  Answer(mail, OE_TAG_BANKMAILTRNRS, "0", "INFO");
  EXPECT_EQ(mail.AllRequiredPresent(), 0);
  mail.SetTag(OE_TAG_DEPMAILRS);  // any one of the mail responses
  EXPECT_EQ(mail.AllRequiredPresent(), 1);

  OETransRq intra;
  intra.SetType(OE_TAG_INTRATRNRQ);
  intra.SetTransUserID("1");
  OEChallengeRq* inner = new OEChallengeRq;  // any inner object will do here
  EXPECT_EQ(intra.SetActualTrans(inner), 1);
  EXPECT_EQ(intra.AllRequiredPresent(), 0);  // the inner tag is not marked
  intra.SetTag(OE_TAG_INTRAMODRQ);
  EXPECT_EQ(intra.AllRequiredPresent(), 1);
  intra.SetTag(OE_TAG_INTRACANRQ);
  EXPECT_EQ(intra.AllRequiredPresent(), 0);  // two alternatives at once

  OETransRq pin;
  pin.SetType(OE_TAG_PINCHTRNRQ);
  pin.SetTransUserID("1");
  EXPECT_EQ(pin.AllRequiredPresent(), 0);  // no inner request held
  pin.SetActualTrans(new OEPinChangeRq);
  EXPECT_EQ(pin.AllRequiredPresent(), 1);
}

TEST_F(TransWrapperTest, SecondInnerRequestIsRefused) {
  OETransRq wrapper;
  wrapper.SetType(OE_TAG_CHALLENGETRNRQ);
  OEChallengeRq* first = new OEChallengeRq;
  OEChallengeRq second;
  EXPECT_EQ(wrapper.SetActualTrans(first), 1);
  EXPECT_EQ(wrapper.SetActualTrans(&second), 0);
  EXPECT_EQ(wrapper.GetActualTrans(), first);
  EXPECT_EQ(wrapper.ValidateTag(OE_TAG_CHALLENGERQ), 0);
  EXPECT_EQ(wrapper.GetNumberOfChildren(), 1);
  EXPECT_EQ(wrapper.GetChild(0), first);
  EXPECT_EQ(wrapper.DisconnectActualTrans(), first);
  EXPECT_EQ(wrapper.GetNumberOfChildren(), 0);
  delete first;
}

TEST_F(TransWrapperTest, OverlongTransactionIdIsKeptAndLogged) {
  OETransRq wrapper;
  wrapper.SetType(OE_TAG_STMTTRNRQ);
  std::string id(40, '7');
  EXPECT_EQ(wrapper.SetTransUserID(OEString(id.c_str())), 1);
  EXPECT_EQ(wrapper.GetTransUserID().GetStrLength(), 40);
  EXPECT_EQ(wrapper.ValidateTag(OE_TAG_TRNUID), 1);
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_TOOLONG);
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_TRNUID);
}

TEST_F(TransWrapperTest, ValidTagsFollowTheWrapperType) {
  OETransRq rq;
  EXPECT_EQ(ValidTags(rq), (std::vector<OETagID>{OE_TAG_TRNUID, OE_TAG_CLTCOOKIE, OE_TAG_TAN}));
  rq.SetType(OE_TAG_STMTTRNRQ);
  EXPECT_EQ(ValidTags(rq), (std::vector<OETagID>{OE_TAG_TRNUID, OE_TAG_CLTCOOKIE, OE_TAG_TAN, OE_TAG_STMTRQ}));
  rq.SetType(OE_TAG_V_PAYROLLTRNRQ);
  EXPECT_EQ(ValidTags(rq), (std::vector<OETagID>{OE_TAG_TRNUID, OE_TAG_V_PAYROLLRQ}));
  // The payroll wrapper has no cookie: the text setter refuses it, and the
  // inner tag (second here) is not mistaken for a text element.
  EXPECT_EQ(rq.SetClientCookie("c"), 0);
  EXPECT_EQ(rq.SetElementText(OE_TAG_V_PAYROLLRQ, "x"), 0);
  EXPECT_EQ(rq.ValidateTag(OE_TAG_V_PAYROLLRQ), 0);

  OETransRs rs;
  rs.SetType(OE_TAG_INTRATRNRS);
  EXPECT_EQ(ValidTags(rs), (std::vector<OETagID>{OE_TAG_TRNUID, OE_TAG_CLTCOOKIE, OE_TAG_STATUS, OE_TAG_INTRACANRS,
                                                 OE_TAG_INTRAMODRS, OE_TAG_INTRARS}));
  rs.SetType(OE_TAG_V_PAYROLLENROLLTRNRS);
  EXPECT_EQ(ValidTags(rs), (std::vector<OETagID>{OE_TAG_TRNUID, OE_TAG_STATUS, OE_TAG_V_PAYROLLENROLLRS}));

  OESyncRq sync;
  sync.SetType(OE_TAG_PMTMAILSYNCRQ);
  EXPECT_EQ(ValidTags(sync),
            (std::vector<OETagID>{OE_TAG_TOKEN, OE_TAG_TOKENONLY, OE_TAG_REFRESH, OE_TAG_REJECTIFMISSING,
                                  OE_TAG_VEXA_REFRESH, OE_TAG_BANKACCTFROM, OE_TAG_INCIMAGES, OE_TAG_USEHTML,
                                  OE_TAG_PMTMAILTRNRQ}));
  sync.SetType(OE_TAG_V_PAYROLLUPDATERQ);
  EXPECT_EQ(ValidTags(sync), (std::vector<OETagID>{OE_TAG_TOKEN, OE_TAG_REJECTIFMISSING, OE_TAG_V_PAYROLLTRNRQ}));
  OESyncRs syncRs;
  syncRs.SetType(OE_TAG_BANKMAILSYNCRS);
  EXPECT_EQ(ValidTags(syncRs), (std::vector<OETagID>{OE_TAG_TOKEN, OE_TAG_LOSTSYNC, OE_TAG_VEXA_REFRESH,
                                                     OE_TAG_VEXA_SYNCERROR, OE_TAG_BANKACCTFROM, OE_TAG_CCACCTFROM,
                                                     OE_TAG_BANKMAILTRNRS}));
}

TEST_F(TransWrapperTest, WrappersAreWrittenInTheirOrder) {
  OETransRq rq;
  rq.SetType(OE_TAG_CHALLENGETRNRQ);
  rq.SetTAN("tan");
  rq.SetClientCookie("c");
  rq.SetTransUserID("1001");
  OEChallengeRq* inner = new OEChallengeRq;
  inner->SetUserID("u");
  rq.SetActualTrans(inner);
  EXPECT_EQ(Write(rq), "<CHALLENGETRNRQ>\n<TRNUID>1001\n<CLTCOOKIE>c\n<TAN>tan\n<CHALLENGERQ>\n<USERID>u\n"
                       "</CHALLENGERQ>\n</CHALLENGETRNRQ>\n");

  OETransRs rs;
  Answer(rs, OE_TAG_PINCHTRNRS, "0", "INFO");
  rs.SetClientCookie("c");
  OEPinChangeRs* pin = new OEPinChangeRs;
  pin->SetUserId("u");
  rs.SetActualTrans(pin);
  EXPECT_EQ(Write(rs), "<PINCHTRNRS>\n<TRNUID>1\n<STATUS>\n<CODE>0\n<SEVERITY>INFO\n</STATUS>\n<CLTCOOKIE>c\n"
                       "<PINCHRS>\n<USERID>u\n</PINCHRS>\n</PINCHTRNRS>\n");
  EXPECT_EQ(rs.GetNumberOfChildren(), 2);
  EXPECT_EQ(rs.GetChild(0), pin);
  EXPECT_EQ(rs.GetChild(1), rs.GetStatus());
  rs.DisconnectActualTrans();
  EXPECT_EQ(rs.GetChild(0), rs.GetStatus());
  delete pin;
}

TEST_F(TransWrapperTest, WrapperLookups) {
  EXPECT_EQ(OETransRq::MsgIDToTranWrapper(OE_TAG_STMTRQ), OE_TAG_STMTTRNRQ);
  EXPECT_EQ(OETransRq::MsgIDToTranWrapper(OE_TAG_RECPMTCANCRQ), OE_TAG_RECPMTTRNRQ);
  EXPECT_EQ(OETransRq::MsgIDToTranWrapper(OE_TAG_V_PAYROLLENROLLRQ), OE_TAG_V_PAYROLLENROLLTRNRQ);
  for (OETagID withheld : {OE_TAG_MAILRQ, OE_TAG_GETMIMERQ, OE_TAG_ACCTRQ, OE_TAG_ENROLLRQ, OE_TAG_CHGUSERINFORQ,
                           OE_TAG_STMTRS, OE_TAG_NONE})
    EXPECT_EQ(OETransRq::MsgIDToTranWrapper(withheld), OE_TAG_NONE) << withheld;

  EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(OE_TAG_BANKMAILRQ), OE_TAG_BANKMAILSYNCRQ);
  EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(OE_TAG_INTERCANRQ), OE_TAG_INTERSYNCRQ);
  EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(OE_TAG_PAYEEMODRQ), OE_TAG_PAYEESYNCRQ);
  EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(OE_TAG_STPCHKRQ), OE_TAG_STPCHKSYNCRQ);
  EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(OE_TAG_V_PAYROLLRQ), OE_TAG_V_PAYROLLUPDATERQ);
  EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(OE_TAG_V_PAYROLLTRNRQ), OE_TAG_V_PAYROLLUPDATERQ);
  for (OETagID none : {OE_TAG_MAILRQ, OE_TAG_ACCTRQ, OE_TAG_STMTRQ, OE_TAG_PMTINQRQ, OE_TAG_INTRATRNRQ})
    EXPECT_EQ(OESyncRq::MsgIDToSyncWrapper(none), OE_TAG_NONE) << none;
}

TEST_F(TransWrapperTest, SyncRequestRules) {
  OESyncRq sync;
  sync.SetType(OE_TAG_ACCTSYNCRQ);
  sync.SetRejectIfMissing(0);
  EXPECT_EQ(sync.AllRequiredPresent(), 0);  // none of TOKEN, TOKENONLY, REFRESH
  sync.SetToken("0");
  EXPECT_EQ(sync.AllRequiredPresent(), 1);
  sync.SetRefresh(1);
  EXPECT_EQ(sync.AllRequiredPresent(), 0);  // TOKEN and REFRESH
  sync.SetTokenOnly(1);
  EXPECT_EQ(sync.AllRequiredPresent(), 1);  // all three pass the exclusive or

  OESyncRq mail;
  mail.SetType(OE_TAG_BANKMAILSYNCRQ);
  mail.SetRejectIfMissing(OEString("N"));
  mail.SetToken("0");
  mail.SetIncludeImages(0);
  mail.SetUseHTML(0);
  EXPECT_EQ(mail.AllRequiredPresent(), 0);  // no account
  OEAccount* cc = OEAccount::NewAcctFrom(OE_TAG_CCACCTFROM);
  ASSERT_NE(cc, nullptr);
  EXPECT_EQ(mail.SetAccount(cc), 1);
  EXPECT_EQ(mail.AllRequiredPresent(), 1);
  mail.SetTag(OE_TAG_BANKACCTFROM);  // both accounts: not exactly one
  EXPECT_EQ(mail.AllRequiredPresent(), 0);

  EXPECT_EQ(mail.SetUseHTML(OEString("maybe")), 0);
  EXPECT_EQ(Count(OEPW_BADFORMAT), 1);
}

TEST_F(TransWrapperTest, SyncWritesElementsAccountThenWrappers) {
  OESyncRq sync;
  sync.SetType(OE_TAG_INTRASYNCRQ);
  sync.SetRejectIfMissing(1);
  sync.SetToken("42");
  OEAccount* account = OEAccount::NewAcctFrom(OE_TAG_BANKACCTFROM);
  account->SetAccountID("100");
  sync.SetAccount(account);
  OETransRq* wrapper = new OETransRq;
  wrapper->SetType(OE_TAG_INTRATRNRQ);
  wrapper->SetTransUserID("1");
  EXPECT_EQ(sync.AppendTrans(wrapper), 1);
  EXPECT_EQ(sync.AllRequiredPresent(), 1);
  EXPECT_EQ(Write(sync), "<INTRASYNCRQ>\n<TOKEN>42\n<REJECTIFMISSING>Y\n<BANKACCTFROM>\n<ACCTID>100\n"
                         "</BANKACCTFROM>\n<INTRATRNRQ>\n<TRNUID>1\n</INTRATRNRQ>\n</INTRASYNCRQ>\n");
  EXPECT_EQ(sync.GetNumberOfChildren(), 2);
  EXPECT_EQ(sync.GetChild(0), account);
  EXPECT_EQ(sync.GetChild(1), wrapper);

  // The message set that stores the sync is recorded in it and its wrappers.
  OEMessageSetRq set;
  set.SetType(OE_TAG_BANKMSGSRQV1);
  OESyncRq* held = new OESyncRq;
  EXPECT_EQ(held->DeepCopyFrom(&sync), 1);
  EXPECT_EQ(set.AppendSync(held), 1);
  EXPECT_EQ(held->GetMsgsRqTag(), OE_TAG_BANKMSGSRQV1);
  EXPECT_EQ(held->GetTrans(0)->GetMsgsRqTag(), OE_TAG_BANKMSGSRQV1);
  EXPECT_EQ(wrapper->GetMsgsRqTag(), OE_TAG_NONE);
  OETransRq copied;
  EXPECT_EQ(copied.DeepCopyFrom(held->GetTrans(0)), 1);  // the record travels with a copy
  EXPECT_EQ(copied.GetMsgsRqTag(), OE_TAG_BANKMSGSRQV1);
  EXPECT_EQ(copied.GetType(), OE_TAG_INTRATRNRQ);
  EXPECT_EQ(Write(*held), Write(sync));
}

TEST_F(TransWrapperTest, SyncResponseIsReadWithItsWrappers) {
  OEMessageSetRs set;
  set.SetType(OE_TAG_BANKMSGSRSV1);
  std::string text =
      "<INTRASYNCRS><TOKEN>12<LOSTSYNC>N<VEXA.SYNCERROR>1000000<BANKACCTFROM><BANKID>123456789<ACCTID>1"
      "<ACCTTYPE>CHECKING</BANKACCTFROM><INTRATRNRS><TRNUID>1<STATUS><CODE>0<SEVERITY>INFO</STATUS>"
      "</INTRATRNRS><INTRATRNRS><TRNUID>2<STATUS><CODE>2000<SEVERITY>ERROR</STATUS></INTRATRNRS></INTRASYNCRS>";
  EXPECT_EQ(Parse(text, &set), OE_PARSE_WARNINGS);
  EXPECT_EQ(Count(OEPW_TOOLONG), 1);  // the sync error out of range
  ASSERT_EQ(set.GetNumSync(), 1);
  OESyncRs* sync = set.GetSync(0);
  EXPECT_EQ(sync->GetType(), OE_TAG_INTRASYNCRS);
  EXPECT_EQ(sync->GetMsgsRsTag(), OE_TAG_BANKMSGSRSV1);
  EXPECT_STREQ(sync->GetToken().c_str(), "12");
  EXPECT_EQ(sync->ValidateTag(OE_TAG_VEXA_SYNCERROR), 0);
  ASSERT_NE(sync->GetAccount(), nullptr);
  EXPECT_EQ(sync->GetAccount()->GetType(), OE_TAG_BANKACCTFROM);
  ASSERT_EQ(sync->GetNumTrans(), 2);
  EXPECT_EQ(sync->GetTrans(1)->GetMsgsRsTag(), OE_TAG_BANKMSGSRSV1);
  EXPECT_EQ(sync->GetTrans(1)->AllRequiredPresent(), 1);  // error status, no inner response
  EXPECT_EQ(sync->GetTrans(0)->AllRequiredPresent(), 0);
  EXPECT_EQ(sync->AllRequiredPresent(), 1);
  EXPECT_EQ(Write(*sync),
            "<INTRASYNCRS>\n<TOKEN>12\n<LOSTSYNC>N\n<BANKACCTFROM>\n<BANKID>123456789\n<ACCTID>1\n"
            "<ACCTTYPE>CHECKING\n</BANKACCTFROM>\n<INTRATRNRS>\n<TRNUID>1\n<STATUS>\n<CODE>0\n<SEVERITY>INFO\n"
            "</STATUS>\n</INTRATRNRS>\n<INTRATRNRS>\n<TRNUID>2\n<STATUS>\n<CODE>2000\n<SEVERITY>ERROR\n</STATUS>\n"
            "</INTRATRNRS>\n</INTRASYNCRS>\n");

  OESyncRs copy;
  EXPECT_EQ(copy.DeepCopyFrom(sync), 1);
  EXPECT_EQ(copy.GetType(), OE_TAG_INTRASYNCRS);
  EXPECT_NE(copy.GetTrans(0), sync->GetTrans(0));
  EXPECT_EQ(Write(copy), Write(*sync));
}
