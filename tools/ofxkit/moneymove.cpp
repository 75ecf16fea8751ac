// Moving money with the tool: `request transfer` (intrabank) and `request
// payment` (bill payment), and the answers `respond` and `serve` give them.
#include <cctype>
#include <cstdio>
#include <utility>
#include <ctime>
#include <string>

#include "charset.h"
#include "cli.h"

namespace cli {
namespace {

bool Fail(const std::string& message) {
  std::fprintf(stderr, "ofxkit request: %s\n", message.c_str());
  return false;
}

// An option's value, or "" when it was not given.
std::string Value(const StatementRequestOptions& o, const char* name) {
  auto found = o.values.find(name);
  return found == o.values.end() ? std::string() : found->second;
}

OEDateTime Today() {
  std::time_t now = std::time(nullptr);
  std::tm utc{};
  gmtime_r(&now, &utc);
  return OEDateTime(static_cast<short>(utc.tm_year + 1900), static_cast<short>(utc.tm_mon + 1),
                    static_cast<short>(utc.tm_mday));
}

// A bank account from its parts; null after a message when one is not valid.
OEBankAccount* BankAccount(const std::string& bankId, const std::string& id, const std::string& type,
                           const char* what) {
  if (bankId.empty() || id.empty()) {
    Fail(std::string("the bank id and account number ") + what + " are needed");
    return nullptr;
  }
  OEBankAccount* account = new OEBankAccount();
  account->SetBankID(bankId.c_str());
  account->SetAccountID(id.c_str());
  if (!account->SetAccountType(OEString(type.c_str()))) {
    delete account;
    Fail("unknown account type '" + type + "'");
    return nullptr;
  }
  return account;
}

// Sets an amount and a due date (today when none is given) through the
// setters of the aggregate that holds them; false after a message.
bool SetAmountAndDue(OEAggregate& holder, const StatementRequestOptions& o) {
  std::string amount = Value(o, "amount"), due = Value(o, "due");
  if (amount.empty() || !holder.SetElementText(OE_TAG_TRNAMT, OEString(amount.c_str())))
    return Fail("--amount must be an amount such as 125.00");
  if (due.empty()) {
    OEString today;
    Today().GetDateString(today);
    holder.SetElementText(OE_TAG_DTDUE, today);
  } else if (!holder.SetElementText(OE_TAG_DTDUE, OEString(due.c_str()))) {
    return Fail("--due must be an OFX date (YYYYMMDD)");
  }
  return true;
}

bool AppendTransfer(const StatementRequestOptions& o, OERequest& request) {
  OEIntraRq* transfer = new OEIntraRq();
  OEXferInfo* info = new OEXferInfo();
  transfer->SetXferInfo(info);
  std::string toBank = Value(o, "to-bank-id").empty() ? o.bankId : Value(o, "to-bank-id");
  std::string toType = Value(o, "to-type").empty() ? "SAVINGS" : Value(o, "to-type");
  for (char& c : toType) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  OEBankAccount* from = BankAccount(o.bankId, o.account, o.type, "to move the money from");
  OEBankAccount* to = from ? BankAccount(toBank, Value(o, "to-account"), toType, "to move it to (--to-account)") : nullptr;
  bool ok = from && to;
  if (ok) {
    info->SetBankAcctFrom(from);
    to->SetType(OE_TAG_BANKACCTTO);
    info->SetBankAcctTo(to);
    ok = SetAmountAndDue(*info, o);
  } else {
    delete from;
  }
  if (!ok) {
    delete transfer;
    return false;
  }
  AppendWrapped(request, OE_TAG_BANKMSGSRQV1, OE_TAG_INTRATRNRQ, OE_TAG_INTRARQ, transfer);
  return true;
}

// An option's text for the request (Windows-1252); false when it has a
// character that cannot be written so.
bool RequestText(const StatementRequestOptions& o, const char* option, std::string& out) {
  const std::string given = Value(o, option);
  return ToWindows1252(given.data(), given.size(), out);
}

std::string NotWindows1252(const char* option) {
  return std::string("--") + option + " is not UTF-8 text, or holds characters that Windows-1252 lacks";
}

bool AppendPayment(const StatementRequestOptions& o, OERequest& request) {
  OEPaymentRq* payment = new OEPaymentRq();
  OEPaymentInfo* info = new OEPaymentInfo();
  payment->SetPaymentInfo(info);
  auto fail = [payment](const std::string& message) {
    delete payment;
    return Fail(message);
  };
  OEBankAccount* from = BankAccount(o.bankId, o.account, o.type, "to pay from");
  if (!from) return fail("no account to pay from");
  info->SetBankAcctFrom(from);
  if (!SetAmountAndDue(*info, o)) return fail("the payment was not written");
  std::string payeeId = Value(o, "payee-id"), name, text;
  if (!RequestText(o, "payee-name", name)) return fail(NotWindows1252("payee-name"));
  if (payeeId.empty() == name.empty()) return fail("name the payee by --payee-id or by --payee-name, not both");
  if (!payeeId.empty()) {
    info->SetPayeeID(payeeId.c_str());
  } else {
    OEPayee* payee = new OEPayee();
    info->SetPayee(payee);
    payee->SetName(name.c_str());
    const std::pair<const char*, OETagID> parts[] = {{"payee-addr1", OE_TAG_ADDR1},
                                                     {"payee-city", OE_TAG_CITY},
                                                     {"payee-state", OE_TAG_STATE},
                                                     {"payee-postal", OE_TAG_POSTALCODE},
                                                     {"payee-phone", OE_TAG_PHONE}};
    for (const auto& [option, tag] : parts) {
      if (!RequestText(o, option, text)) return fail(NotWindows1252(option));
      if (!text.empty()) payee->SetElementText(tag, text.c_str());
    }
    if (!payee->AllRequiredPresent())
      return fail("a payee named by name needs --payee-addr1, --payee-city, --payee-state, --payee-postal and --payee-phone");
  }
  if (Value(o, "pay-account").empty()) return fail("--pay-account (your account number with the payee) is needed");
  info->SetPayAccount(Value(o, "pay-account").c_str());
  if (!RequestText(o, "memo", text)) return fail(NotWindows1252("memo"));
  if (!text.empty()) info->SetMemo(text.c_str());
  AppendWrapped(request, OE_TAG_BILLPAYMSGSRQV1, OE_TAG_PMTTRNRQ, OE_TAG_PMTRQ, payment);
  return true;
}

// A server transaction id of the demo server: the wrapper's own id, shortened.
std::string ServerId(const OETransRq& wrapper, char prefix) {
  std::string id(1, prefix);
  for (const char* c = wrapper.GetTransUserID().c_str(); *c && id.size() < 10; ++c)
    if (std::isalnum(static_cast<unsigned char>(*c))) id += *c;
  return id;
}

// The date a request asks the money to move, or today.
OEDateTime DueOf(const OEAggregate* holder, const OEDateTime& due) {
  return holder && holder->ValidateTag(OE_TAG_DTDUE) ? due : Today();
}

OETransBase* AnswerTransfer(const OETransRq& wrapper, const OEIntraRq& rq) {
  OEIntraRs* rs = new OEIntraRs();
  const OEXferInfo* asked = rq.GetXferInfo();
  if (asked) {
    OEXferInfo* copy = new OEXferInfo();
    copy->DeepCopyFrom(asked);
    rs->SetXferInfo(copy);
  }
  rs->SetCurrencyDefault("USD");
  rs->SetServerTransactionID(ServerId(wrapper, 'X').c_str());
  OEDateTime when = DueOf(asked, asked ? asked->GetDateDue() : OEDateTime());
  rs->SetDateTimeXferProjected(when);
  OEXferProcessingStatus* status = new OEXferProcessingStatus();
  status->SetProcessingCode(OE_PROCCODE_WILLPROCESSON);
  status->SetDateTimeProcessed(when);
  rs->SetXferProcessingStatus(status);
  return rs;
}

OETransBase* AnswerPayment(const OETransRq& wrapper, const OEPaymentRq& rq) {
  OEPaymentRs* rs = new OEPaymentRs();
  const OEPaymentInfo* asked = rq.GetPaymentInfo();
  if (asked) {
    OEPaymentInfo* copy = new OEPaymentInfo();
    copy->DeepCopyFrom(asked);
    rs->SetPaymentInfo(copy);
  }
  rs->SetServerTransactionID(ServerId(wrapper, 'P').c_str());
  rs->SetPayeeListID(asked && asked->ValidateTag(OE_TAG_PAYEEID) ? asked->GetPayeeID().c_str() : "NEW");
  rs->SetCurrencyDefault("USD");
  OEPaymentPrcSts* status = new OEPaymentPrcSts();
  status->SetProcessingCode(OE_PROCCODE_WILLPROCESSON);
  status->SetDateTimeProcessed(DueOf(asked, asked ? asked->GetDateDue() : OEDateTime()));
  rs->SetPaymentPrcSts(status);
  return rs;
}

}  // namespace

bool AppendMoveRequest(const StatementRequestOptions& o, OERequest& request) {
  return o.kind == "transfer" ? AppendTransfer(o, request) : AppendPayment(o, request);
}

bool AnswerMoveSet(const OEMessageSetRq& set, AnswerBudget& budget, OEResponse& out) {
  bool billPay = set.GetType() == OE_TAG_BILLPAYMSGSRQV1;
  if (!billPay && set.GetType() != OE_TAG_BANKMSGSRQV1) return false;
  for (unsigned short t = 0; t < set.GetNumTrans(); ++t) {
    const OETransRq* wrapper = set.GetTrans(t);
    const OEDataObj* inner = wrapper ? wrapper->GetActualTrans() : nullptr;
    const auto* transfer = dynamic_cast<const OEIntraRq*>(inner);
    const auto* payment = dynamic_cast<const OEPaymentRq*>(inner);
    if ((!transfer && !payment) || !budget.Answer()) continue;
    OEMessageSetRs* rsSet = ResponseSet(out, billPay ? OE_TAG_BILLPAYMSGSRSV1 : OE_TAG_BANKMSGSRSV1);
    if (transfer)
      rsSet->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_INTRATRNRS, OE_TAG_INTRARS, AnswerTransfer(*wrapper, *transfer)));
    else
      rsSet->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_PMTTRNRS, OE_TAG_PMTRS, AnswerPayment(*wrapper, *payment)));
  }
  return billPay;
}

}  // namespace cli
