#include <string>
#include <vector>

#include "envelope_test_util.h"

namespace {
class MessageSetTest : public EnvelopeTest {
 protected:
  static OEMessageSetRq* NewSet(OETagID type) {
    OEMessageSetRq* set = new OEMessageSetRq;
    set->SetType(type);
    return set;
  }
  static OETransRq* NewWrapper(OETagID type, const char* id) {
    OETransRq* t = new OETransRq;
    t->SetType(type);
    t->SetTransUserID(id);
    return t;
  }
  static const char* kSignOnRs;
};
const char* MessageSetTest::kSignOnRs =
    "<SIGNONMSGSRSV1><SONRS><STATUS><CODE>0<SEVERITY>INFO</STATUS><DTSERVER>20240102<LANGUAGE>ENG</SONRS>"
    "</SIGNONMSGSRSV1>";
}  // namespace

TEST_F(MessageSetTest, SetsAreWrittenInTheFixedOrder) {
  OERequest request;
  OEMessageSetRq* bank = NewSet(OE_TAG_BANKMSGSRQV1);
  bank->AppendTrans(NewWrapper(OE_TAG_STMTENDTRNRQ, "2"));
  bank->AppendTrans(NewWrapper(OE_TAG_STMTTRNRQ, "1"));
  bank->AppendTrans(NewWrapper(OE_TAG_STMTENDTRNRQ, "3"));
  EXPECT_EQ(request.AppendMessageSet(bank), 1);
  OEMessageSetRq* signOn = NewSet(OE_TAG_SIGNONMSGSRQV1);
  OESignOnRq* sonrq = new OESignOnRq;
  sonrq->SetUserKey("k");
  EXPECT_EQ(signOn->SetSignOnRq(sonrq), 1);
  EXPECT_EQ(request.AppendMessageSet(signOn), 1);
  EXPECT_EQ(Write(request),
            "<OFX>\n<SIGNONMSGSRQV1>\n<SONRQ>\n<USERKEY>k\n</SONRQ>\n</SIGNONMSGSRQV1>\n"
            "<BANKMSGSRQV1>\n<STMTTRNRQ>\n<TRNUID>1\n</STMTTRNRQ>\n<STMTENDTRNRQ>\n<TRNUID>2\n</STMTENDTRNRQ>\n"
            "<STMTENDTRNRQ>\n<TRNUID>3\n</STMTENDTRNRQ>\n</BANKMSGSRQV1>\n</OFX>\n");
  EXPECT_EQ(request.AllRequiredPresent(), 1);
  EXPECT_EQ(request.GetNumMessage(), 2);
  EXPECT_EQ(request.GetChild(1), signOn);
}

TEST_F(MessageSetTest, RepeatedSetStopsTheBuild) {
  OERequest request;
  request.AppendMessageSet(NewSet(OE_TAG_BANKMSGSRQV1));
  request.AppendMessageSet(NewSet(OE_TAG_SIGNUPMSGSRQV1));
  request.AppendMessageSet(NewSet(OE_TAG_BANKMSGSRQV1));
  request.AppendMessageSet(NewSet(OE_TAG_SIGNONMSGSRQV1));
  OEBuildStatus status;
  std::string text = Write(request, &status);
  EXPECT_EQ(status, OE_BUILD_REPEATED_SET);
  EXPECT_EQ(text, "<OFX>\n<SIGNONMSGSRQV1>\n</SIGNONMSGSRQV1>\n<SIGNUPMSGSRQV1>\n</SIGNUPMSGSRQV1>\n");
  EXPECT_EQ(inError, &request);
}

TEST_F(MessageSetTest, SecondSetOfATypeEndsTheParse) {
  OEResponse response;
  std::string text = std::string("<OFX>") + kSignOnRs + kSignOnRs + "</OFX>";
  EXPECT_EQ(Parse(text, &response), OE_PARSE_NOT_HANDLED);
  ASSERT_EQ(log->Entries(), 2);
  EXPECT_EQ(log->Get(0)->warning, OEPW_EXTRAAGG);
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_SIGNONMSGSRSV1);
  EXPECT_EQ(log->Get(0)->object, &response);
  EXPECT_EQ(log->Get(1)->warning, OEPW_INVALIDAGG);
  EXPECT_EQ(response.GetNumMessage(), 1);
}

TEST_F(MessageSetTest, ResponseIsReadIntoSetsAndWrappers) {
  OEResponse response;
  std::string text = std::string("<OFX>") + kSignOnRs +
                     "<BANKMSGSRSV1><STMTTRNRS><TRNUID>7<STATUS><CODE>2000<SEVERITY>ERROR</STATUS></STMTTRNRS>"
                     "<STMTTRNRS><TRNUID>8<STATUS><CODE>2000<SEVERITY>ERROR</STATUS></STMTTRNRS></BANKMSGSRSV1>"
                     "</OFX>trailing bytes";
  EXPECT_EQ(Parse(text, &response), OE_PARSE_OK);
  EXPECT_EQ(log->Entries(), 0);
  ASSERT_EQ(response.GetNumMessage(), 2);
  EXPECT_EQ(response.AllRequiredPresent(), 1);
  OEMessageSetRs* bank = response.GetMessageSet(1);
  EXPECT_EQ(bank->GetType(), OE_TAG_BANKMSGSRSV1);
  ASSERT_EQ(bank->GetNumTrans(), 2);
  EXPECT_EQ(bank->GetTrans(0)->GetType(), OE_TAG_STMTTRNRS);
  EXPECT_EQ(bank->GetTrans(1)->GetMsgsRsTag(), OE_TAG_BANKMSGSRSV1);
  EXPECT_STREQ(bank->GetTrans(1)->GetTransUserID().c_str(), "8");
  EXPECT_EQ(bank->AllRequiredPresent(), 1);
  EXPECT_EQ(bank->GetNumberOfChildren(), 3);
  EXPECT_EQ(bank->GetChild(0), nullptr);
  EXPECT_EQ(bank->GetChild(2), bank->GetTrans(1));

  OEResponse copy;
  EXPECT_EQ(copy.DeepCopyFrom(&response), 1);
  ASSERT_EQ(copy.GetNumMessage(), 2);
  EXPECT_NE(copy.GetMessageSet(1), bank);
  EXPECT_EQ(copy.GetMessageSet(1)->GetTrans(0)->GetMsgsRsTag(), OE_TAG_BANKMSGSRSV1);
  EXPECT_EQ(Write(copy), Write(response));
}

TEST_F(MessageSetTest, MisplacedWrapperIsSkipped) {
  OEResponse response;
  std::string text = std::string("<OFX>") + kSignOnRs +
                     "<BANKMSGSRSV1><CCSTMTTRNRS><TRNUID>7</CCSTMTTRNRS></BANKMSGSRSV1></OFX>";
  EXPECT_EQ(Parse(text, &response), OE_PARSE_WARNINGS);
  EXPECT_EQ(Count(OEPW_INVALIDAGG), 1);
  EXPECT_EQ(response.GetMessageSet(1)->GetNumTrans(), 0);
  EXPECT_EQ(response.GetMessageSet(1)->AllRequiredPresent(), 0);
}

TEST_F(MessageSetTest, ChildPositions) {
  OEMessageSetRq set;
  set.SetType(OE_TAG_SIGNONMSGSRQV1);
  EXPECT_EQ(set.GetNumberOfChildren(), 1);
  EXPECT_EQ(set.GetChild(0), nullptr);
  EXPECT_EQ(set.AllRequiredPresent(), 0);
  OESignOnRq* signOn = new OESignOnRq;
  set.SetSignOnRq(signOn);
  for (const char* id : {"1", "2", "3"}) set.AppendTrans(NewWrapper(OE_TAG_PINCHTRNRQ, id));
  EXPECT_EQ(set.GetNumberOfChildren(), 4);
  EXPECT_EQ(set.GetChild(0), signOn);
  EXPECT_EQ(set.GetChild(3), set.GetTrans(2));
  EXPECT_EQ(set.GetChild(4), nullptr);
  EXPECT_EQ(set.AllRequiredPresent(), 1);
  EXPECT_EQ(set.DisconnectSignOnRq(), signOn);
  EXPECT_EQ(set.AllRequiredPresent(), 0);
  delete signOn;

  OETransRq* second = set.GetTrans(1);
  EXPECT_EQ(set.DisconnectTrans(1), 1);
  EXPECT_EQ(set.GetNumTrans(), 2);
  EXPECT_EQ(set.DisconnectTrans(2), 0);
  EXPECT_EQ(set.SetTrans(3, second), 0);  // beyond the count
  EXPECT_EQ(set.SetTrans(2, second), 1);  // at the count: appended
  EXPECT_EQ(second->GetMsgsRqTag(), OE_TAG_SIGNONMSGSRQV1);
}

TEST_F(MessageSetTest, SetMessageSetAppendsOnlyAtTheCount) {
  OERequest request;
  EXPECT_EQ(request.SetMessageSet(0, NewSet(OE_TAG_SIGNONMSGSRQV1)), 1);
  OEMessageSetRq* far = NewSet(OE_TAG_BANKMSGSRQV1);
  EXPECT_EQ(request.SetMessageSet(2, far), 0);
  EXPECT_EQ(request.SetMessageSet(1, far), 1);
  EXPECT_EQ(request.GetNumMessage(), 2);
  EXPECT_EQ(request.ValidateTag(OE_TAG_BANKMSGSRQV1), 1);
  EXPECT_EQ(request.AllRequiredPresent(), 1);

  OERequest empty;
  EXPECT_EQ(empty.AllRequiredPresent(), 0);
}

TEST_F(MessageSetTest, SecurityListSetsNeedTheirContent) {
  OEMessageSetRq rq;
  rq.SetType(OE_TAG_SECLISTMSGSRQV1);
  EXPECT_EQ(rq.AllRequiredPresent(), 0);
  rq.AppendTrans(NewWrapper(OE_TAG_SECLISTTRNRQ, "1"));
  EXPECT_EQ(rq.AllRequiredPresent(), 1);

  OEMessageSetRs rs;
  rs.SetType(OE_TAG_SECLISTMSGSRSV1);
  EXPECT_EQ(rs.AllRequiredPresent(), 0);
  OESecList* list = new OESecList;
  EXPECT_EQ(rs.SetSecList(list), 1);
  EXPECT_EQ(rs.AllRequiredPresent(), 1);
  EXPECT_EQ(rs.GetNumberOfChildren(), 1);  // the list is not one of the set's child positions
}

TEST_F(MessageSetTest, RequiredContentByType) {
  OEMessageSetRq bank;
  bank.SetType(OE_TAG_BANKMSGSRQV1);
  EXPECT_EQ(bank.AllRequiredPresent(), 0);
  bank.AppendSync(new OESyncRq);  // an untyped sync is not a valid child of the bank set
  EXPECT_EQ(bank.AllRequiredPresent(), 0);

  OEMessageSetRq billPay;
  billPay.SetType(OE_TAG_BILLPAYMSGSRQV1);
  EXPECT_EQ(billPay.AllRequiredPresent(), 0);
  OESyncRq* sync = new OESyncRq;
  sync->SetType(OE_TAG_PMTSYNCRQ);
  billPay.AppendSync(sync);
  EXPECT_EQ(billPay.AllRequiredPresent(), 1);

  OEMessageSetRs profile;
  profile.SetType(OE_TAG_PROFMSGSRSV1);
  OETransRs* wrapper = new OETransRs;
  wrapper->SetType(OE_TAG_PROFTRNRS);
  profile.AppendTrans(wrapper);
  EXPECT_EQ(profile.AllRequiredPresent(), 1);
  EXPECT_EQ(ValidTags(profile), (std::vector<OETagID>{OE_TAG_PROFTRNRS}));

  OEMessageSetRq unknown;
  EXPECT_EQ(ValidTags(unknown).size(), 0u);
}

TEST_F(MessageSetTest, ExtensionWrappersAreWrittenLast) {
  OEMessageSetRq brand;
  brand.SetType(OE_TAG_VEXA_BRANDMSGSRQV1);
  brand.AppendTrans(NewWrapper(OE_TAG_VEXA_MKTTIERTRNRQ, "2"));
  brand.AppendTrans(NewWrapper(OE_TAG_VEXA_BRANDTRNRQ, "1"));
  EXPECT_EQ(Write(brand), "<VEXA.BRANDMSGSRQV1>\n<VEXA.BRANDTRNRQ>\n<TRNUID>1\n</VEXA.BRANDTRNRQ>\n"
                          "<VEXA.MKTTIERTRNRQ>\n<TRNUID>2\n</VEXA.MKTTIERTRNRQ>\n</VEXA.BRANDMSGSRQV1>\n");

  OEMessageSetRq payroll;
  payroll.SetType(OE_TAG_V_PAYROLLMSGSRQV1);
  payroll.AppendTrans(NewWrapper(OE_TAG_V_PAYROLLENROLLTRNRQ, "1"));
  OESyncRq* update = new OESyncRq;
  update->SetType(OE_TAG_V_PAYROLLUPDATERQ);
  update->SetToken("5");
  payroll.AppendSync(update);
  EXPECT_EQ(Write(payroll), "<V.PAYROLLMSGSRQV1>\n<V.PAYROLLUPDATERQ>\n<TOKEN>5\n</V.PAYROLLUPDATERQ>\n"
                            "<V.PAYROLLENROLLTRNRQ>\n<TRNUID>1\n</V.PAYROLLENROLLTRNRQ>\n</V.PAYROLLMSGSRQV1>\n");
}

TEST_F(MessageSetTest, PayrollUpdateResponseIsReadAsASync) {
  OEMessageSetRs payroll;
  payroll.SetType(OE_TAG_V_PAYROLLMSGSRSV1);
  EXPECT_EQ(Parse("<V.PAYROLLUPDATERS><TOKEN>9<V.PAYROLLTRNRS><TRNUID>1<STATUS><CODE>0<SEVERITY>INFO</STATUS>"
                  "</V.PAYROLLTRNRS></V.PAYROLLUPDATERS>",
                  &payroll),
            OE_PARSE_OK);
  ASSERT_EQ(payroll.GetNumSync(), 1);
  EXPECT_EQ(payroll.GetSync(0)->GetType(), OE_TAG_V_PAYROLLUPDATERS);
  ASSERT_EQ(payroll.GetSync(0)->GetNumTrans(), 1);
  EXPECT_EQ(payroll.GetSync(0)->GetTrans(0)->AllRequiredPresent(), 1);
  EXPECT_EQ(payroll.AllRequiredPresent(), 1);
}

TEST_F(MessageSetTest, ProfileMessageSetLookup) {
  EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(OE_TAG_SONRQ), OE_TAG_SIGNONMSGSET);
  EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(OE_TAG_RECINTRACANRQ), OE_TAG_BANKMSGSET);
  EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(OE_TAG_INVMAILTRNRQ), OE_TAG_INVSTMTMSGSET);
  EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(OE_TAG_V_PAYROLLUPDATERQ), OE_TAG_V_PAYROLLMSGSET);
  for (OETagID none : {OE_TAG_SECLISTRQ, OE_TAG_ENROLLRQ, OE_TAG_PINCHRQ, OE_TAG_PMTMODRQ, OE_TAG_NONE})
    EXPECT_EQ(OEMessageSetRq::MsgIDToMsgSetID(none), OE_TAG_NONE) << none;
}

TEST_F(MessageSetTest, FactoryIsSetOnlyWhenGiven) {
  OEDataObjFactory* current = OEDataObj::GetFactory();
  OERequest request;
  EXPECT_EQ(request.SetFactory(nullptr), 0);
  EXPECT_EQ(OEDataObj::GetFactory(), current);
  OEMessageSetRq set;
  EXPECT_EQ(set.SetFactory(nullptr), 0);
  EXPECT_EQ(set.SetFactory(current), 1);
  EXPECT_EQ(OEDataObj::GetFactory(), current);
}

TEST_F(MessageSetTest, SecurityListIsReadAndWrittenAfterItsTransaction) {
  OEResponse response;
  std::string text = std::string("<OFX>") + kSignOnRs +
                     "<SECLISTMSGSRSV1><SECLIST><STOCKINFO><SECINFO><SECID><UNIQUEID>123<UNIQUEIDTYPE>CUSIP</SECID>"
                     "<SECNAME>Acme</SECINFO></STOCKINFO></SECLIST>"
                     "<SECLISTTRNRS><TRNUID>9<STATUS><CODE>0<SEVERITY>INFO</STATUS><SECLISTRS></SECLISTRS>"
                     "</SECLISTTRNRS></SECLISTMSGSRSV1></OFX>";
  EXPECT_EQ(Parse(text, &response), OE_PARSE_OK);
  ASSERT_EQ(response.GetNumMessage(), 2);
  OEMessageSetRs* set = response.GetMessageSet(1);
  ASSERT_NE(set->GetSecList(), nullptr);
  ASSERT_EQ(set->GetSecList()->GetNumStockInfo(), 1);
  EXPECT_EQ(set->GetSecList()->GetStockInfo(0)->GetSecInfo()->GetSecName(), "Acme");
  EXPECT_EQ(set->AllRequiredPresent(), 1);
  const std::string written = Write(*set);
  EXPECT_LT(written.find("</SECLISTTRNRS>"), written.find("<SECLIST>")) << written;
}

TEST_F(MessageSetTest, RequestRoundTripsThroughTheParser) {
  const std::string written =
      "<OFX>\n<SIGNONMSGSRQV1>\n<SONRQ>\n<DTCLIENT>20240102030405\n<USERID>alice\n<USERPASS>secret\n"
      "<LANGUAGE>ENG\n<APPID>QWIN\n<APPVER>0500\n</SONRQ>\n<PINCHTRNRQ>\n<TRNUID>1\n<PINCHRQ>\n<USERID>alice\n"
      "<NEWUSERPASS>better\n</PINCHRQ>\n</PINCHTRNRQ>\n<CHALLENGETRNRQ>\n<TRNUID>2\n<CHALLENGERQ>\n<USERID>alice\n"
      "</CHALLENGERQ>\n</CHALLENGETRNRQ>\n</SIGNONMSGSRQV1>\n</OFX>\n";
  // The same content in another order, as a server might send it.
  const std::string read =
      "<OFX><SIGNONMSGSRQV1><CHALLENGETRNRQ><TRNUID>2<CHALLENGERQ><USERID>alice</CHALLENGERQ></CHALLENGETRNRQ>"
      "<SONRQ><APPVER>500<APPID>QWIN<USERPASS>secret<USERID>alice<LANGUAGE>ENG<DTCLIENT>20240102030405</SONRQ>"
      "<PINCHTRNRQ><TRNUID>1<PINCHRQ><NEWUSERPASS>better<USERID>alice</PINCHRQ></PINCHTRNRQ></SIGNONMSGSRQV1></OFX>";
  OERequest request;
  EXPECT_EQ(Parse(read, &request), OE_PARSE_OK);
  EXPECT_EQ(Write(request), written);
  OEMessageSetRq* set = request.GetMessageSet(0);
  ASSERT_EQ(set->GetNumTrans(), 2);
  OETransRq* challenge = set->GetTrans(0);
  EXPECT_EQ(challenge->ValidateTag(OE_TAG_CHALLENGERQ), 1);
  ASSERT_NE(dynamic_cast<OEChallengeRq*>(challenge->GetActualTrans()), nullptr);
  EXPECT_EQ(challenge->AllRequiredPresent(), 1);
  EXPECT_EQ(set->GetTrans(1)->AllRequiredPresent(), 1);
  OEDataObj* lacking = &request;
  OETagID missing = OE_TAG_NONE;
  EXPECT_EQ(OEUtility::AllRequiredPresent(&lacking, &missing), 1);

  OERequest copy;
  EXPECT_EQ(copy.DeepCopyFrom(&request), 1);
  EXPECT_NE(copy.GetMessageSet(0)->GetTrans(0)->GetActualTrans(), challenge->GetActualTrans());
  EXPECT_EQ(Write(copy), written);
}

TEST_F(MessageSetTest, InnerAggregateTheFactoryCannotMakeEndsTheParse) {
  struct NoChallenges : OEDataObjFactory {
    OEChallengeRs* NewChallengeRs() override { return nullptr; }
  } factory;
  OEDataObj::SetFactory(&factory);  // (the library's own default factory is deleted here)
  OEMessageSetRs set;
  set.SetType(OE_TAG_SIGNONMSGSRSV1);
  OEParseStatus status =
      Parse("<CHALLENGETRNRS><TRNUID>1<STATUS><CODE>0<SEVERITY>INFO</STATUS><CHALLENGERS><USERID>u"
            "</CHALLENGERS></CHALLENGETRNRS>",
            &set);
  static OEDataObjFactory lasting;  // outlives every later test
  OEDataObj::SetFactory(&lasting);
  EXPECT_EQ(status, OE_PARSE_NO_PARSER);
  ASSERT_EQ(set.GetNumTrans(), 1);
  EXPECT_EQ(set.GetTrans(0)->GetActualTrans(), nullptr);
  EXPECT_NE(set.GetTrans(0)->GetStatus(), nullptr);
}
