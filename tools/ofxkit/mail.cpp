// Secure mail with the tool: `request mail` writes a message to the
// institution, free-form or about a bank, card or brokerage account. The body
// comes from a file and is private: it goes into the request only, never into
// a message of the tool.
#include <iconv.h>

#include <cstdio>
#include <string>
#include <tuple>
#include <type_traits>

#include "charset.h"
#include "cli.h"

namespace cli {
namespace {

bool Fail(const std::string& message) {
  std::fprintf(stderr, "ofxkit request: %s\n", message.c_str());
  return false;
}

// The body file's text without surrounding blank space (a reader drops it
// anyway); false after a message that names the file, never its content.
bool ReadBody(const std::string& path, OEString& body) {
  if (path.empty()) return Fail("--body-file is needed (the message body is read from a file)");
  OEBuffer buffer(0, 1u << 16);
  std::string error;
  if (!ReadFile(path, buffer, &error)) return Fail("cannot read --body-file: " + error);
  const char* text = buffer.GetBufferPtr();
  size_t begin = 0, end = buffer.GetBufferSize();
  for (size_t i = begin; i < end; ++i)
    if (text[i] == '\0') return Fail("--body-file " + path + " is not text (it holds a NUL byte)");
  auto blank = [](char c) { return c == ' ' || c == '\t' || c == '\r' || c == '\n'; };
  while (begin < end && blank(text[begin])) ++begin;
  while (end > begin && blank(text[end - 1])) --end;
  if (begin == end) return Fail("--body-file " + path + " is empty");
  std::string converted;
  if (!ToWindows1252(text + begin, end - begin, converted))
    return Fail("--body-file " + path + " is not UTF-8 text, or holds characters that Windows-1252 lacks");
  if (converted.size() > OE_MAIL_BODY_MAX_KEPT)
    return Fail("the message body is " + std::to_string(converted.size()) + " characters long; OFX allows 2000");
  body = OEString(converted.data(), converted.size());
  return true;
}

// The message of the options; null after a message when one is not usable.
OEMail* MakeMail(const StatementRequestOptions& o) {
  OEString body;
  if (!ReadBody(o.Value("body-file"), body)) return nullptr;
  std::string subject, from, to;
  const std::string fromGiven = o.Value("from").empty() ? o.user : o.Value("from");
  const std::string toGiven = o.Value("to").empty() ? o.org : o.Value("to");
  for (const auto& [given, out, option] : {std::make_tuple(o.Value("subject"), &subject, "--subject"),
                                           std::make_tuple(fromGiven, &from, "--from"),
                                           std::make_tuple(toGiven, &to, "--to")})
    if (!ToWindows1252(given.data(), given.size(), *out)) {
      Fail(std::string(option) + " is not UTF-8 text, or holds characters that Windows-1252 lacks");
      return nullptr;
    }
  if (subject.empty()) {
    Fail("--subject is needed");
    return nullptr;
  }
  // The limits of OFX, checked here so that the tool says which option is
  // too long instead of failing to write the request.
  const struct {
    const std::string& value;
    size_t limit;
    const char* what;
  } texts[] = {{subject, 60, "--subject"}, {from, 32, "--from (or --user)"}, {to, 32, "--to (or --org)"},
               {o.user, 32, "--user"}};
  for (const auto& t : texts)
    if (t.value.size() > t.limit) {
      Fail(std::string(t.what) + " is longer than " + std::to_string(t.limit) + " characters");
      return nullptr;
    }
  OEMail* mail = new OEMail();
  mail->SetUserId(o.user.c_str());
  mail->SetDateTimeCreated(NowUTC());
  mail->SetFrom(from.c_str());
  mail->SetTo(to.c_str());
  mail->SetSubject(subject.c_str());
  mail->SetMessageBody(body);
  mail->SetIncludeImages(0);
  mail->SetUseHTML(0);
  if (!mail->GetMessageBody().IsValid()) {
    Fail("the message body is " + std::to_string(body.GetStrLength()) + " characters long; OFX allows 2000");
    delete mail;
    return nullptr;
  }
  return mail;
}

// The demo institution's reply to a message: from whom it was sent to, about
// the same subject, with a fixed text (the message's own body is not echoed).
OEMail* Reply(const OEMail* asked) {
  OEMail* reply = new OEMail();
  if (asked && asked->ValidateTag(OE_TAG_USERID)) reply->SetUserId(asked->GetUserId());
  reply->SetDateTimeCreated(NowUTC());
  reply->SetFrom(asked && asked->ValidateTag(OE_TAG_TO) ? asked->GetTo() : OEString("Customer Service"));
  reply->SetTo(asked && asked->ValidateTag(OE_TAG_FROM) ? asked->GetFrom() : OEString("Customer"));
  std::string subject = "Re: ";
  if (asked && asked->ValidateTag(OE_TAG_SUBJECT)) subject += asked->GetSubject().c_str();
  if (subject.size() > 60) subject.resize(60);
  reply->SetSubject(subject.c_str());
  reply->SetMessageBody("Thank you for your message. We have received it and will answer within two business days.");
  reply->SetIncludeImages(0);
  reply->SetUseHTML(0);
  return reply;
}

// The account of a mail request, copied for its answer.
template <class Account>
Account* CopyOf(const Account* asked) {
  if (!asked) return nullptr;
  Account* copy = nullptr;
  if constexpr (std::is_same<Account, OEBankOrCCAccount>::value) {
    OEBankOrCCAccount::DeepCopyTo(asked, &copy);
  } else {
    copy = new Account();
    copy->DeepCopyFrom(asked);
  }
  return copy;
}

}  // namespace

bool AnswerMailSet(const OEMessageSetRq& set, AnswerBudget& budget, OEResponse& out) {
  const OETagID type = set.GetType();
  const bool email = type == OE_TAG_EMAILMSGSRQV1;
  if (!email && type != OE_TAG_BANKMSGSRQV1 && type != OE_TAG_INVSTMTMSGSRQV1) return false;
  for (unsigned short t = 0; t < set.GetNumTrans(); ++t) {
    const OETransRq* wrapper = set.GetTrans(t);
    const OEDataObj* inner = wrapper ? wrapper->GetActualTrans() : nullptr;
    const auto* plain = dynamic_cast<const OEMailRq*>(inner);
    const auto* bank = dynamic_cast<const OEBankMailRq*>(inner);
    const auto* invest = dynamic_cast<const OEInvestmentMailRq*>(inner);
    if ((!plain && !bank && !invest) || !budget.Answer()) continue;
    if (plain) {
      OEMailRs* rs = new OEMailRs();
      rs->SetMail(Reply(plain->GetMail()));
      ResponseSet(out, OE_TAG_EMAILMSGSRSV1)
          ->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_MAILTRNRS, OE_TAG_MAILRS, rs));
    } else if (bank) {
      OEBankMailRs* rs = new OEBankMailRs();
      if (OEBankOrCCAccount* account = CopyOf(bank->GetBankAccountFrom())) rs->SetBankAccountFrom(account);
      rs->SetMail(Reply(bank->GetMail()));
      ResponseSet(out, OE_TAG_BANKMSGSRSV1)
          ->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_BANKMAILTRNRS, OE_TAG_BANKMAILRS, rs));
    } else {
      OEInvestmentMailRs* rs = new OEInvestmentMailRs();
      if (OEInvAcctFrom* account = CopyOf(invest->GetInvAccountFrom())) rs->SetInvAccountFrom(account);
      rs->SetMail(Reply(invest->GetMail()));
      ResponseSet(out, OE_TAG_INVSTMTMSGSRSV1)
          ->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_INVMAILTRNRS, OE_TAG_INVMAILRS, rs));
    }
  }
  return email;
}

bool AppendMailRequest(const StatementRequestOptions& o, OERequest& request) {
  OEMail* mail = MakeMail(o);
  if (!mail) return false;
  const bool card = o.type == "CREDITCARD" || o.type == "CARD";
  if (!o.brokerId.empty()) {
    if (o.account.empty()) {
      delete mail;
      return Fail("--account is needed with --broker-id");
    }
    OEInvestmentMailRq* rq = new OEInvestmentMailRq();
    rq->SetMail(mail);
    OEInvAcctFrom* account = rq->GetInvAccountFrom(1);
    account->SetBrokerID(o.brokerId.c_str());
    account->SetAccountID(o.account.c_str());
    AppendWrapped(request, OE_TAG_INVSTMTMSGSRQV1, OE_TAG_INVMAILTRNRQ, OE_TAG_INVMAILRQ, rq);
    return true;
  }
  if (!o.account.empty() || !o.bankId.empty()) {
    if (o.account.empty() || (!card && o.bankId.empty())) {
      delete mail;
      return Fail("mail about an account needs --account, and --bank-id unless it is a card (--type CREDITCARD)");
    }
    OEBankOrCCAccount* account = nullptr;
    if (card) {
      account = new OECCAccount();
    } else {
      OEBankAccount* bank = new OEBankAccount();
      bank->SetBankID(o.bankId.c_str());
      if (!bank->SetAccountType(OEString(o.type.c_str()))) {
        delete bank;
        delete mail;
        return Fail("unknown account type '" + o.type + "'");
      }
      account = bank;
    }
    account->SetAccountID(o.account.c_str());
    OEBankMailRq* rq = new OEBankMailRq();
    rq->SetBankAccountFrom(account);
    rq->SetMail(mail);
    AppendWrapped(request, OE_TAG_BANKMSGSRQV1, OE_TAG_BANKMAILTRNRQ, OE_TAG_BANKMAILRQ, rq);
    return true;
  }
  OEMailRq* rq = new OEMailRq();
  rq->SetMail(mail);
  AppendWrapped(request, OE_TAG_EMAILMSGSRQV1, OE_TAG_MAILTRNRQ, OE_TAG_MAILRQ, rq);
  return true;
}

}  // namespace cli
