#include <gtest/gtest.h>

#include <string>

#include "ofxkit/ofxkit.h"

#include "support/log_fixture.h"
#include "support/ofx_text.h"

namespace {
class AccountTest : public LogFixture {
 protected:
  // Writes the object with its own start and end tags, as a parent would.
  std::string Write(const OEDataObj& obj, OEBuildStringOpt option, OEBuildStatus* status = nullptr) {
    WrittenText written = WriteUnderOwnTag(obj, option);
    if (status) *status = written.status;
    lastInError = written.inError;
    return written.text;
  }
  OEDataObj* lastInError = nullptr;
};
}  // namespace

TEST_F(AccountTest, BankAccountWritesItsElementsInOrder) {
  OEBankAccount account;
  EXPECT_EQ(Write(account, OE_BUILD_STRICT), "<BANKACCTFROM>\n</BANKACCTFROM>\n");
  EXPECT_EQ(account.SetAccountType(OEString("checking")), 1);  // case-insensitive
  EXPECT_EQ(account.SetAccountID("1001"), 1);
  EXPECT_EQ(account.SetBankID("123456789"), 1);
  EXPECT_EQ(Write(account, OE_BUILD_STRICT),
            "<BANKACCTFROM>\n<BANKID>123456789\n<ACCTID>1001\n<ACCTTYPE>CHECKING\n</BANKACCTFROM>\n");
  EXPECT_EQ(account.AllRequiredPresent(), 1);
  EXPECT_EQ(log->Entries(), 0);
}

TEST_F(AccountTest, SettersReportWhatDoesNotFit) {
  OEBankAccount account;
  EXPECT_EQ(account.SetBankID("123456789012"), 1);  // kept whole, warned
  ASSERT_EQ(log->Entries(), 1);
  EXPECT_EQ(log->Get(0)->warning, OEPW_TOOLONG);
  EXPECT_EQ(log->Get(0)->value, "123456789012");
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_BANKID);
  EXPECT_EQ(log->Get(0)->object, &account);
  EXPECT_EQ(account.GetBankID().GetStrLength(), 12);
  OEBuildStatus status;
  Write(account, OE_BUILD_STRICT, &status);
  EXPECT_EQ(status, OE_BUILD_TOO_LONG);
  EXPECT_EQ(lastInError, &account);
  EXPECT_EQ(Write(account, OE_BUILD_LENIENT), "<BANKACCTFROM>\n<BANKID>123456789\n</BANKACCTFROM>\n");

  // An empty text answers 3 and leaves the bit; the build then has no value.
  EXPECT_EQ(account.SetBankID(""), 3);
  EXPECT_EQ(account.ValidateTag(OE_TAG_BANKID), 1);
  Write(account, OE_BUILD_STRICT, &status);
  EXPECT_EQ(status, OE_BUILD_NO_VALUE);

  log->DeleteAll();
  EXPECT_EQ(account.SetAccountType(OEString("SAVNGS")), 0);
  ASSERT_EQ(log->Entries(), 1);  // one warning, naming the tag and object
  EXPECT_EQ(log->Get(0)->warning, OEPW_BADFORMAT);
  EXPECT_EQ(log->Get(0)->value, "SAVNGS");
  EXPECT_EQ(log->Get(0)->tag, OE_TAG_ACCTTYPE);
  EXPECT_EQ(log->Get(0)->object, &account);
  EXPECT_EQ(account.ValidateTag(OE_TAG_ACCTTYPE), 0);
  EXPECT_EQ(account.AllRequiredPresent(), 0);
  EXPECT_EQ(account.GetFirstMissingRequiredTag(OE_TAG_NONE), OE_TAG_ACCTID);
}

TEST_F(AccountTest, CreatorsAndDeepCopies) {
  OEAccount* cc = OEAccount::NewAcct(OE_TAG_CCACCTTO);
  ASSERT_NE(cc, nullptr);
  EXPECT_NE(dynamic_cast<OECCAccount*>(cc), nullptr);
  EXPECT_EQ(cc->GetType(), OE_TAG_CCACCTTO);
  EXPECT_EQ(OEAccount::NewAcct(OE_TAG_BANKID), nullptr);
  EXPECT_EQ(OEBankOrCCAccount::NewAcct(OE_TAG_INVACCTFROM), nullptr);
  OEAccount* inv = OEAccount::NewAcctFrom(OE_TAG_INVACCTFROM);
  ASSERT_NE(dynamic_cast<OEInvAcctFrom*>(inv), nullptr);
  EXPECT_EQ(OEAccount::NewAcctTo(OE_TAG_INVACCTFROM), nullptr);
  delete inv;

  cc->SetAccountID("4111");
  OEAccount* copy = nullptr;
  EXPECT_EQ(OEAccount::DeepCopyTo(cc, &copy), 1);
  ASSERT_NE(dynamic_cast<OECCAccount*>(copy), nullptr);
  EXPECT_EQ(copy->GetType(), OE_TAG_CCACCTTO);
  EXPECT_EQ(copy->GetAccountID(), "4111");
  EXPECT_EQ(copy->ValidateTag(OE_TAG_ACCTID), 1);
  EXPECT_EQ(OEAccount::DeepCopyTo(nullptr, &copy), 1);
  EXPECT_EQ(copy, nullptr);
  delete cc;

  OEBankAccount a, b;
  a.SetBankID("021000021");
  a.SetAccountType(OE_ACCTTYPE_SAVINGS);
  EXPECT_EQ(b.DeepCopyFrom(&a), 1);
  EXPECT_EQ(b.GetBankID(), "021000021");
  EXPECT_EQ(b.GetBankID().SpecLength(), 9);
  EXPECT_EQ(b.GetAccountType(), OE_ACCTTYPE_SAVINGS);
  OECCAccount other;
  EXPECT_EQ(b.CopyAggregateFrom(&other), 0);  // not the same class

  OECurrency currency;
  currency.SetType(OE_TAG_ORIGCURRENCY);
  currency.SetCurrencySymbol("EUR");
  currency.SetCurrencyRate(OEString("1.0850"));
  OECurrency* currencyCopy = nullptr;
  EXPECT_EQ(OECurrency::DeepCopyTo(&currency, &currencyCopy), 1);
  ASSERT_NE(currencyCopy, nullptr);
  EXPECT_EQ(Write(*currencyCopy, OE_BUILD_STRICT), "<ORIGCURRENCY>\n<CURRATE>1.0850\n<CURSYM>EUR\n</ORIGCURRENCY>\n");
  delete currencyCopy;
}
