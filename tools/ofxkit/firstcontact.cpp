// First contact with an institution: profile and account-information
// requests (`request profile`, `request accounts`), what their answers say
// (`profile`, `accounts`), and the answers `respond` and `serve` give.
#include <cstdio>
#include <string>
#include <tuple>
#include <vector>

#include "cli.h"

namespace cli {
namespace {

const char kProfileHelp[] =
    "usage: ofxkit profile [--strict] FILE\n"
    "Prints what the profile response in FILE says an institution supports: its\n"
    "name and address, each message set with its version, URL, security and\n"
    "sign-on realm, and the sign-on rules of each realm. Exit status as for\n"
    "'ofxkit dump'.\n";

const char kAccountsHelp[] =
    "usage: ofxkit accounts [--raw] [--strict] FILE\n"
    "Prints the accounts of the account-information responses in FILE as CSV:\n"
    "kind,bankid,acctid,type,description,status,supports (kind is BANK, CARD,\n"
    "BILLPAY or INVESTMENT; bankid is the broker id of a brokerage account;\n"
    "supports lists download, xfersrc and xferdest, or the product type and\n"
    "checking of a brokerage account). --raw and --strict as for 'ofxkit\n"
    "statement'. Exit status as for 'ofxkit dump'.\n";

// The OFX text of a present element, or `absent`.
std::string Text(const OEAggregate& obj, OETagID tag, const char* absent = "") {
  const OEFieldDesc* d = obj.FieldAt(tag);
  OEString text;
  if (!d || !d->text || !obj.ValidateTag(tag) || !d->text(&obj, 0, text)) return absent;
  return OutputText(text.c_str(), TagName(tag));
}

std::string Join(const std::vector<std::string>& parts, const char* separator) {
  std::string out;
  for (const std::string& part : parts) {
    if (part.empty()) continue;
    if (!out.empty()) out += separator;
    out += part;
  }
  return out;
}

void PrintRealm(const OESignOnInfo& info) {
  const char* chars = info.ValidateTag(OE_TAG_CHARTYPE) ? OEDataConversion::Text(info.GetCharacterType()) : "?";
  std::printf("  %s: password of %s to %s characters, %s; %s; special characters %s; spaces %s;\n",
              Text(info, OE_TAG_SIGNONREALM).c_str(), Text(info, OE_TAG_MIN, "?").c_str(), Text(info, OE_TAG_MAX, "?").c_str(),
              chars, info.GetCaseSensitive() ? "case-sensitive" : "not case-sensitive",
              info.GetSpecialChar() ? "allowed" : "not allowed", info.GetSpaceChar() ? "allowed" : "not allowed");
  std::printf("    PIN change %s; new PIN required at first sign-on: %s\n",
              info.GetPinChange() ? "supported" : "not supported", info.GetChangePinFirst() ? "yes" : "no");
}

void PrintProfile(const OEProfileRs& rs) {
  std::printf("%s\n", Text(rs, OE_TAG_FINAME, "(no name)").c_str());
  std::string address = Join({Text(rs, OE_TAG_ADDR1), Text(rs, OE_TAG_ADDR2), Text(rs, OE_TAG_ADDR3),
                              Text(rs, OE_TAG_CITY), Join({Text(rs, OE_TAG_STATE), Text(rs, OE_TAG_POSTALCODE)}, " "),
                              Text(rs, OE_TAG_COUNTRY)},
                             ", ");
  if (!address.empty()) std::printf("  %s\n", address.c_str());
  std::string contact = Join({rs.ValidateTag(OE_TAG_CSPHONE) ? "customer service " + Text(rs, OE_TAG_CSPHONE) : "",
                              rs.ValidateTag(OE_TAG_TSPHONE) ? "technical support " + Text(rs, OE_TAG_TSPHONE) : "",
                              rs.ValidateTag(OE_TAG_FAXPHONE) ? "fax " + Text(rs, OE_TAG_FAXPHONE) : "",
                              Text(rs, OE_TAG_URL), Text(rs, OE_TAG_EMAIL)},
                             "; ");
  if (!contact.empty()) std::printf("  %s\n", contact.c_str());
  if (rs.ValidateTag(OE_TAG_DTPROFUP)) {
    const OEDateTime& d = rs.GetDateTimeProfileUp();
    std::printf("  profile of %04u-%02u-%02u\n", d.GetYear(), d.GetMonth(), d.GetDay());
  }
  std::printf("message sets:\n");
  const OEMessageSetList* list = rs.GetMessageSetList();
  for (unsigned short i = 0, n = list ? list->GetNumMessageSetProfile() : 0; i < n; ++i) {
    const OEMessageSetProfile* set = list->GetMessageSetProfile(i);
    for (unsigned short k = 0, m = set ? set->GetNumMessageSetVersion() : 0; k < m; ++k) {
      const OEMessageSetVersion* version = set->GetMessageSetVersion(k);
      const OEMessageSetCore* core = version ? version->GetMessageSetCore() : nullptr;
      if (!core) {
        std::printf("  %-18s (no core)\n", TagName(version ? version->GetType() : set->GetType()));
        continue;
      }
      std::printf("  %-18s version %s  %s  security %s, transport %s  realm %s\n", TagName(version->GetType()),
                  Text(*core, OE_TAG_VER, "?").c_str(), Text(*core, OE_TAG_URL).c_str(), Text(*core, OE_TAG_OFXSEC, "?").c_str(),
                  Text(*core, OE_TAG_TRANSPSEC, "?").c_str(), Text(*core, OE_TAG_SIGNONREALM).c_str());
    }
  }
  std::printf("sign-on realms:\n");
  const OESignOnInfoList* realms = rs.GetSignOnInfoList();
  for (unsigned short i = 0, n = realms ? realms->GetNumSignOnInfo() : 0; i < n; ++i)
    if (const OESignOnInfo* info = realms->GetSignOnInfo(i)) PrintRealm(*info);
}

// One CSV row of an account entry.
void PrintAccount(const OEAccountInfo& account, const OEAccountInfoBase& entry, bool raw) {
  const char* kind = "";
  const OEAccount* from = nullptr;
  std::string bankId, type;
  std::vector<std::string> supports;
  if (const auto* bank = dynamic_cast<const OEBankAccountInfo*>(&entry)) {
    kind = "BANK";
    if (const OEBankAccount* a = bank->GetAccountFrom()) {
      from = a;
      bankId = a->GetBankID().c_str();
      type = Text(*a, OE_TAG_ACCTTYPE);
    }
  } else if (dynamic_cast<const OECCAccountInfo*>(&entry)) {
    kind = "CARD";
    from = static_cast<const OECCAccountInfo&>(entry).GetAccountFrom();
  } else if (const auto* pay = dynamic_cast<const OEBillPayAccountInfo*>(&entry)) {
    kind = "BILLPAY";
    if (const OEBankAccount* a = pay->GetAccountFrom()) {
      from = a;
      bankId = a->GetBankID().c_str();
      type = Text(*a, OE_TAG_ACCTTYPE);
    }
  } else if (const auto* inv = dynamic_cast<const OEInvAcctInfo*>(&entry)) {
    kind = "INVESTMENT";
    if (const OEInvAcctFrom* a = inv->GetAccountFrom()) {
      from = a;
      bankId = a->GetBrokerID().c_str();
    }
    type = Text(*inv, OE_TAG_INVACCTTYPE);
    supports = {Text(*inv, OE_TAG_USPRODUCTTYPE), inv->GetChequing() ? "checking" : ""};
  }
  if (supports.empty())
    for (OETagID tag : {OE_TAG_SUPTXDL, OE_TAG_XFERSRC, OE_TAG_XFERDEST})
      if (Text(entry, tag) == "Y")
        supports.push_back(tag == OE_TAG_SUPTXDL ? "download" : tag == OE_TAG_XFERSRC ? "xfersrc" : "xferdest");
  std::printf("%s,%s,%s,%s,%s,%s,%s\n", kind, CsvText(bankId.c_str(), raw).c_str(),
              CsvText(from ? from->GetAccountID().c_str() : "", raw).c_str(), type.c_str(),
              CsvText(account.GetDescription().c_str(), raw).c_str(), Text(entry, OE_TAG_SVCSTATUS).c_str(),
              Join(supports, " ").c_str());
}

// ---------------------------------------------------------------------------
// What `respond` and `serve` answer on first contact.

const char kServedRealm[] = "DEMO";

OEMessageSetCore* ServedCore() {
  OEMessageSetCore* core = new OEMessageSetCore();
  core->SetVer(1);
  core->SetURL("https://127.0.0.1/");
  core->SetOFXSecurity(OE_OFXSECURITY_NONE);
  core->SetTransportSecurity(1);
  core->SetSignOnRealm(kServedRealm);
  core->AppendLanguage(OEString("ENG"));
  core->SetSyncMode(OE_SYNCMODE_LITE);
  core->SetRespFileer(0);
  return core;
}

// A version of a message set with the served core, inside its profile.
template <class Version>
Version* AddVersion(OEMessageSetList& list, OETagID setTag) {
  OEMessageSetProfile* set = new OEMessageSetProfile();
  set->SetType(setTag);
  Version* version = new Version();
  version->SetMessageSetCore(ServedCore());
  set->AppendMessageSetVersion(version);
  list.AppendMessageSetProfile(set);
  return version;
}

OEProfileRs* ServedProfile() {
  OEProfileRs* rs = new OEProfileRs();
  OEMessageSetList* list = new OEMessageSetList();
  AddVersion<OESignOnMessageSetV1>(*list, OE_TAG_SIGNONMSGSET);
  OESignUpMessageSetV1* signUp = AddVersion<OESignUpMessageSetV1>(*list, OE_TAG_SIGNUPMSGSET);
  OEWebEnroll* web = new OEWebEnroll();
  web->SetURL("https://127.0.0.1/enrol");
  signUp->SetWebEnroll(web);
  signUp->SetChangeUserInfo(0);
  signUp->SetAvailableAccounts(1);
  signUp->SetActivationRequest(0);
  OEBankMessageSetV1* bank = AddVersion<OEBankMessageSetV1>(*list, OE_TAG_BANKMSGSET);
  OEEMailProfile* mail = new OEEMailProfile();
  mail->SetCanEMail(1);  // secure mail about an account is answered
  mail->SetCanNotify(0);
  bank->SetEMailProfile(mail);
  bank->SetClosingAvailable(0);
  AddVersion<OECreditCardMessageSetV1>(*list, OE_TAG_CREDITCARDMSGSET)->SetClosingAvailable(0);
  OEInvStmtMsgSetV1* invest = AddVersion<OEInvStmtMsgSetV1>(*list, OE_TAG_INVSTMTMSGSET);
  for (OETagID flag : {OE_TAG_TRANDNLD, OE_TAG_OODNLD, OE_TAG_POSDNLD, OE_TAG_BALDNLD})
    invest->SetElementText(flag, OEString("Y"));
  invest->SetCanEMail(static_cast<unsigned short>(1));
  AddVersion<OESecListMsgSetV1>(*list, OE_TAG_SECLISTMSGSET)->SetSecListRqDnld(static_cast<unsigned short>(1));
  // Free-form secure mail is answered; MIME attachments are not offered.
  OEEMailMessageSetV1* email = AddVersion<OEEMailMessageSetV1>(*list, OE_TAG_EMAILMSGSET);
  email->SetEMailSup(1);
  email->SetGetMimeSup(0);
  AddVersion<OEProfileMessageSetV1>(*list, OE_TAG_PROFMSGSET);
  rs->SetMessageSetList(list);

  OESignOnInfoList* realms = new OESignOnInfoList();
  OESignOnInfo* info = new OESignOnInfo();
  info->SetSignOnRealm(kServedRealm);
  info->SetMinPassword(static_cast<unsigned short>(6));
  info->SetMaxPassword(static_cast<unsigned short>(32));
  info->SetCharacterType(OE_CHARTYPE_ALPHAORNUMERIC);
  info->SetCaseSensitive(static_cast<unsigned short>(1));
  info->SetSpecialChar(static_cast<unsigned short>(1));
  info->SetSpaceChar(static_cast<unsigned short>(0));
  info->SetPinChange(static_cast<unsigned short>(1));
  info->SetChangePinFirst(static_cast<unsigned short>(0));
  realms->AppendSignOnInfo(info);
  rs->SetSignOnInfoList(realms);
  rs->SetDateTimeProfileUp(OEDateTime(2026, 11, 1));
  rs->SetFIName("ofxkit Demo Bank");
  rs->SetAddress1("1 Loopback Way");
  rs->SetCity("Localhost");
  rs->SetState("CA");
  rs->SetPostalCode("94000");
  rs->SetCountry("USA");
  rs->SetCSPhone("555-0100");
  return rs;
}

OEBankAccount* ServedBankAccount(const char* id, OEBankAccountType type) {
  OEBankAccount* account = new OEBankAccount();
  account->SetBankID(kServedBankID);
  account->SetAccountID(id);
  account->SetAccountType(type);
  return account;
}

// The accounts the demo user holds: the statements `serve` gives are for
// these (any account is answered, these are the ones it lists).
OEAccountInfoRs* ServedAccounts() {
  OEAccountInfoRs* rs = new OEAccountInfoRs();
  rs->SetDateTimeAccountUp(OEDateTime(2026, 11, 1));
  auto add = [rs](const char* description, OEAccountInfoBase* entry) {
    OEAccountInfo* info = new OEAccountInfo();
    info->SetDescription(description);
    info->AppendAccountInfoBase(entry);
    rs->AppendAccountInfo(info);
  };
  for (auto [id, type, description] : {std::tuple{kServedChecking, OE_ACCTTYPE_CHECKING, "Everyday checking"},
                                       std::tuple{kServedSavings, OE_ACCTTYPE_SAVINGS, "Savings"}}) {
    OEBankAccountInfo* bank = new OEBankAccountInfo();
    bank->SetAccountFrom(ServedBankAccount(id, type));
    bank->SetSupportTxDownload(static_cast<unsigned short>(1));
    bank->SetXferSource(static_cast<unsigned short>(1));
    bank->SetXferDestination(static_cast<unsigned short>(1));
    bank->SetServiceStatus(OE_SVCSTATUS_ACTIVE);
    add(description, bank);
  }
  OECCAccountInfo* card = new OECCAccountInfo();
  OECCAccount* cardAccount = new OECCAccount();
  cardAccount->SetAccountID(kServedCard);
  card->SetAccountFrom(cardAccount);
  card->SetSupportTxDownload(static_cast<unsigned short>(1));
  card->SetXferSource(static_cast<unsigned short>(0));
  card->SetXferDestination(static_cast<unsigned short>(1));
  card->SetServiceStatus(OE_SVCSTATUS_ACTIVE);
  add("Rewards card", card);
  OEInvAcctInfo* invest = new OEInvAcctInfo();
  OEInvAcctFrom* brokerage = new OEInvAcctFrom();
  brokerage->SetBrokerID(kServedBrokerID);
  brokerage->SetAccountID(kServedBrokerage);
  invest->SetAccountFrom(brokerage);
  invest->SetUSProductType(OE_USPRODUCT_NORMAL);
  invest->SetChequing(static_cast<unsigned short>(0));
  invest->SetServiceStatus(OE_SVCSTATUS_ACTIVE);
  invest->SetInvAcctType(OE_INVACCTTYPE_INDIVIDUAL);
  add("Brokerage", invest);
  return rs;
}

}  // namespace

bool AppendFirstContactRequest(const StatementRequestOptions& o, OERequest& request) {
  if (o.kind == "profile") {
    OEProfileRq* profile = new OEProfileRq();
    profile->SetClientRouting(OE_ROUTING_NONE);
    profile->SetDateTimeProfileUp(OEDateTime(1990, 1, 1));
    AppendWrapped(request, OE_TAG_PROFMSGSRQV1, OE_TAG_PROFTRNRQ, OE_TAG_PROFRQ, profile);
    return true;
  }
  OEAccountInfoRq* accounts = new OEAccountInfoRq();
  if (o.since.empty()) {
    accounts->SetDateTimeAccountUp(OEDateTime(1990, 1, 1));
  } else if (!accounts->SetDateTimeAccountUp(OEString(o.since.c_str()))) {
    delete accounts;
    std::fprintf(stderr, "ofxkit request: --since must be an OFX date (YYYYMMDD)\n");
    return false;
  }
  AppendWrapped(request, OE_TAG_SIGNUPMSGSRQV1, OE_TAG_ACCTINFOTRNRQ, OE_TAG_ACCTINFORQ, accounts);
  return true;
}

bool AnswerFirstContactSet(const OEMessageSetRq& set, AnswerBudget& budget, OEResponse& out) {
  bool profile = set.GetType() == OE_TAG_PROFMSGSRQV1;
  if (!profile && set.GetType() != OE_TAG_SIGNUPMSGSRQV1) return false;
  OEMessageSetRs* rsSet = ResponseSet(out, profile ? OE_TAG_PROFMSGSRSV1 : OE_TAG_SIGNUPMSGSRSV1);
  for (unsigned short t = 0; t < set.GetNumTrans(); ++t) {
    const OETransRq* wrapper = set.GetTrans(t);
    if (!wrapper || !wrapper->GetActualTrans() || !budget.Answer()) continue;
    if (dynamic_cast<const OEProfileRq*>(wrapper->GetActualTrans()))
      rsSet->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_PROFTRNRS, OE_TAG_PROFRS, ServedProfile()));
    else if (dynamic_cast<const OEAccountInfoRq*>(wrapper->GetActualTrans()))
      rsSet->AppendTrans(AnswerWrapper(*wrapper, OE_TAG_ACCTINFOTRNRS, OE_TAG_ACCTINFORS, ServedAccounts()));
  }
  return true;
}

int CmdProfile(int argc, char** argv) {
  Args args(argc, argv, 2);
  ParsedFile parsed;
  int rc;
  if (!ParseCommandFile("profile", kProfileHelp, args, parsed, nullptr, &rc)) return rc;
  std::vector<const OEProfileRs*> profiles;
  Collect(parsed.file.get(), profiles);
  for (size_t i = 0; i < profiles.size(); ++i) {
    if (i) std::printf("\n");
    PrintProfile(*profiles[i]);
  }
  if (profiles.empty()) std::fprintf(stderr, "ofxkit profile: no profile response in the file\n");
  return ReportLosses("profile", parsed, rc);
}

int CmdAccounts(int argc, char** argv) {
  Args args(argc, argv, 2);
  ParsedFile parsed;
  bool raw = false;
  int rc;
  if (!ParseCommandFile("accounts", kAccountsHelp, args, parsed, &raw, &rc)) return rc;
  std::vector<const OEAccountInfoRs*> lists;
  Collect(parsed.file.get(), lists);
  std::printf("kind,bankid,acctid,type,description,status,supports\n");
  for (const OEAccountInfoRs* list : lists)
    for (unsigned short i = 0; i < list->GetNumAccountInfo(); ++i)
      if (const OEAccountInfo* account = list->GetAccountInfo(i))
        for (unsigned short k = 0; k < account->GetNumAccountInfoBase(); ++k)
          if (const OEAccountInfoBase* entry = account->GetAccountInfoBase(k)) PrintAccount(*account, *entry, raw);
  if (lists.empty()) std::fprintf(stderr, "ofxkit accounts: no account-information response in the file\n");
  return ReportLosses("accounts", parsed, rc);
}

}  // namespace cli
