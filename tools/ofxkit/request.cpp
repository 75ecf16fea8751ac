// ofxkit request statement: a sign-on plus bank or card statement request file.
#include <cstdio>
#include <cstring>
#include <ctime>
#include <string>

#include "cli.h"

namespace cli {
namespace {

const char kRequestHelp[] =
    "usage: ofxkit request statement --org ORG --fid FID --user USER --account ACCT\n"
    "                                [--bank-id ROUTING] [--broker-id ID]\n"
    "                                [--type CHECKING|SAVINGS|MONEYMRKT|CREDITLINE|CARD|INVESTMENT]\n"
    "                                [--start YYYYMMDD] [--end YYYYMMDD] [--password-stdin]\n"
    "                                [--positions] [--open-orders] [--balance] [--securities LIST]\n"
    "                                [--app-id QWIN] [--app-version 2700] [-o FILE]\n"
    "Writes an OFX request file: a sign-on and one bank (or, with --type CARD, credit\n"
    "card; with --type INVESTMENT, brokerage) statement request with a fresh\n"
    "transaction id. The password is asked for on the terminal without echo;\n"
    "--password-stdin reads it from standard input. --bank-id is needed for bank\n"
    "accounts, --broker-id for brokerage accounts. A brokerage statement asks for\n"
    "transactions and, with --positions, --open-orders and --balance, for those too;\n"
    "--securities adds a security-list request for the securities named in LIST\n"
    "(comma-separated tickers, or TYPE:ID such as CUSIP:037833100).\n"
    "Without -o the file goes to standard output.\n"
    "\n"
    "usage: ofxkit request profile --org ORG --fid FID --user USER [--password-stdin] [-o FILE]\n"
    "       ofxkit request accounts --org ORG --fid FID --user USER [--since YYYYMMDD]\n"
    "                               [--password-stdin] [-o FILE]\n"
    "First contact with an institution: a sign-on and a profile request (what it\n"
    "supports), or an account-information request (which accounts the user holds;\n"
    "--since asks only for changes after that date).\n"
    "\n"
    "usage: ofxkit request transfer --org ORG --fid FID --user USER --bank-id ROUTING --account ACCT\n"
    "                               [--type CHECKING] --to-account ACCT [--to-type SAVINGS]\n"
    "                               --amount N.NN [--due YYYYMMDD] [--password-stdin] [-o FILE]\n"
    "       ofxkit request payment --org ORG --fid FID --user USER --bank-id ROUTING --account ACCT\n"
    "                              [--type CHECKING] --amount N.NN [--due YYYYMMDD] [--memo TEXT]\n"
    "                              --pay-account PAYEE'S-NUMBER-FOR-YOU\n"
    "                              (--payee-id ID | --payee-name NAME --payee-addr1 LINE --payee-city CITY\n"
    "                               --payee-state ST --payee-postal CODE --payee-phone PHONE)\n"
    "                              [--password-stdin] [-o FILE]\n"
    "Moving money: an intrabank transfer from one account to another of the same\n"
    "bank, or a bill payment to a payee named by the institution's id or by name and\n"
    "address. Without --due the money moves today.\n"
    "\n"
    "usage: ofxkit request mail --org ORG --fid FID --user USER --subject TEXT --body-file FILE\n"
    "                           [--to NAME] [--from NAME]\n"
    "                           [--bank-id ROUTING --account ACCT [--type CHECKING|SAVINGS|...|CREDITCARD]\n"
    "                            | --broker-id ID --account ACCT] [--password-stdin] [-o FILE]\n"
    "A secure message to the institution, its body read from FILE: free-form, or\n"
    "about the bank, card (--type CREDITCARD, no --bank-id) or brokerage account\n"
    "named. --from defaults to the user, --to to the institution.\n";

bool Fail(const std::string& message) {
  std::fprintf(stderr, "ofxkit request: %s\n", message.c_str());
  return false;
}

}  // namespace

OEDateTime NowUTC() {
  std::time_t now = std::time(nullptr);
  std::tm utc{};
  gmtime_r(&now, &utc);
  return OEDateTime(static_cast<short>(utc.tm_year + 1900), static_cast<short>(utc.tm_mon + 1),
                    static_cast<short>(utc.tm_mday), static_cast<short>(utc.tm_hour),
                    static_cast<short>(utc.tm_min), static_cast<short>(utc.tm_sec));
}

bool BuildStatementRequest(const StatementRequestOptions& o, const OEUserPassword& password, OEBuffer& out) {
  OEFileRq file;
  file.SetHeader(OE_HEADER_OFXHEADER, "100");
  OERequest* request = new OERequest();
  file.AppendRequest(request);

  OEMessageSetRq* signOnSet = new OEMessageSetRq();
  signOnSet->SetType(OE_TAG_SIGNONMSGSRQV1);
  request->AppendMessageSet(signOnSet);
  OESignOnRq* signOn = new OESignOnRq();
  signOnSet->SetSignOnRq(signOn);
  signOn->SetDtClient(NowUTC());
  signOn->SetUserId(o.user.c_str());
  signOn->SetUserPass(password);
  signOn->SetLanguage(OEString("ENG"));
  OEFI* fi = new OEFI();
  fi->SetOrg(o.org.c_str());
  if (!o.fid.empty()) fi->SetFId(o.fid.c_str());
  signOn->SetFI(fi);
  signOn->SetAppId(o.appId.c_str());
  if (!signOn->SetAppVer(OEString(o.appVersion.c_str()))) return Fail("--app-version must be a number like 2700");

  if (o.kind == "transfer" || o.kind == "payment") return AppendMoveRequest(o, *request) && WriteRequest(file, out);
  if (o.kind == "mail") return AppendMailRequest(o, *request) && WriteRequest(file, out);
  if (o.kind != "statement") return AppendFirstContactRequest(o, *request) && WriteRequest(file, out);
  if (o.type == "INVESTMENT") return AppendInvestmentRequest(o, *request) && WriteRequest(file, out);
  bool card = o.type == "CARD";
  OEMessageSetRq* set = new OEMessageSetRq();
  set->SetType(card ? OE_TAG_CREDITCARDMSGSRQV1 : OE_TAG_BANKMSGSRQV1);
  request->AppendMessageSet(set);
  OETransRq* wrapper = new OETransRq();
  wrapper->SetType(card ? OE_TAG_CCSTMTTRNRQ : OE_TAG_STMTTRNRQ);
  set->AppendTrans(wrapper);
  char trnuid[OEUtility::kTransactionIDLength + 1];
  OEUtility::GenerateTransactionID(trnuid);
  wrapper->SetTransUserID(trnuid);

  OEGenericStatementRq* statement = nullptr;
  OEBankOrCCAccount* account = nullptr;
  if (card) {
    statement = new OECCStatementRq();
    account = new OECCAccount();
  } else {
    statement = new OEBankStatementRq();
    OEBankAccount* bank = new OEBankAccount();
    account = bank;
    if (o.bankId.empty()) {
      delete statement;
      delete bank;
      return Fail("--bank-id is needed for a bank account");
    }
    bank->SetBankID(o.bankId.c_str());
    if (!bank->SetAccountType(OEString(o.type.c_str()))) {
      delete statement;
      delete bank;
      return Fail("unknown account type '" + o.type + "'");
    }
  }
  account->SetAccountID(o.account.c_str());
  statement->SetAccountFrom(account);
  OEIncTransaction* include = new OEIncTransaction();
  if (!o.start.empty() && !include->SetDtStart(OEString(o.start.c_str()))) {
    delete include;
    delete statement;
    return Fail("--start must be an OFX date (YYYYMMDD)");
  }
  if (!o.end.empty() && !include->SetDtEnd(OEString(o.end.c_str()))) {
    delete include;
    delete statement;
    return Fail("--end must be an OFX date (YYYYMMDD)");
  }
  include->SetInclude(1);
  statement->SetIncTransaction(include);
  wrapper->SetActualTrans(statement);
  wrapper->SetTag(card ? OE_TAG_CCSTMTRQ : OE_TAG_STMTRQ);
  return WriteRequest(file, out);
}

bool WriteRequest(const OEFileRq& file, OEBuffer& out) {
  OEBuilder builder;
  OEBuildStatus status = builder.Build(&out, const_cast<OEFileRq*>(&file), OE_BUILD_STRICT, 1);
  if (status != OE_BUILD_OK) {
    OEDataObj* where = builder.GetObjectInError();
    return Fail("the request could not be written (build status " + std::to_string(status) +
                (where ? std::string(", at ") + TagName(where->GetType()) : std::string()) + ")");
  }
  return true;
}

int CmdRequest(int argc, char** argv) {
  Args args(argc, argv, 2);
  const bool known = argc >= 3 && (!std::strcmp(argv[2], "statement") || !std::strcmp(argv[2], "profile") ||
                                   !std::strcmp(argv[2], "accounts") || !std::strcmp(argv[2], "transfer") ||
                                   !std::strcmp(argv[2], "payment") || !std::strcmp(argv[2], "mail"));
  if (args.Flag("help") || !known) {
    bool asked = argc >= 3 && (!std::strcmp(argv[2], "--help") || known);
    std::fputs(kRequestHelp, asked ? stdout : stderr);
    return asked ? kClean : kUsage;
  }
  Args options(argc, argv, 3);
  if (options.Flag("help")) {
    std::fputs(kRequestHelp, stdout);
    return kClean;
  }
  StatementRequestOptions o;
  o.kind = argv[2];
  o.org = options.Option("org");
  o.fid = options.Option("fid");
  o.user = options.Option("user");
  o.account = options.Option("account");
  o.bankId = options.Option("bank-id");
  o.brokerId = options.Option("broker-id");
  o.positions = options.Flag("positions");
  o.openOrders = options.Flag("open-orders");
  o.balance = options.Flag("balance");
  o.securities = options.Option("securities");
  o.type = options.Option("type");
  if (o.type.empty()) o.type = "CHECKING";
  for (char& c : o.type) c = static_cast<char>(std::toupper(static_cast<unsigned char>(c)));
  o.start = options.Option("start");
  o.since = options.Option("since");
  o.end = options.Option("end");
  for (const char* name : kMoveOptionNames)
    if (options.HasOption(name)) o.values[name] = options.Option(name);
  for (const char* name : kMailOptionNames)
    if (options.HasOption(name)) o.values[name] = options.Option(name);
  o.appId = options.Option("app-id");
  if (o.appId.empty()) o.appId = "QWIN";
  o.appVersion = options.Option("app-version");
  if (o.appVersion.empty()) o.appVersion = "2700";
  std::string output = options.Option("o");
  if (output.empty()) output = options.Option("output");
  bool passwordFromStdin = options.Flag("password-stdin");
  std::string error;
  std::vector<std::string> rest = options.Positional(&error);
  if (!error.empty() || !rest.empty() || o.org.empty() || o.user.empty() ||
      (o.kind == "statement" && o.account.empty())) {
    std::fprintf(stderr, "ofxkit request: %s\n%s",
                 !error.empty() ? error.c_str() : !rest.empty() ? "unexpected arguments"
                                                                : o.kind == "statement"
                                                                      ? "--org, --user and --account are needed"
                                                                      : "--org and --user are needed",
                 kRequestHelp);
    return kUsage;
  }
  OEUserPassword password;
  bool got = passwordFromStdin ? PromptPassword("", password) : PromptPassword("Password: ", password);
  if (!got) {
    std::fprintf(stderr, "ofxkit request: no password given\n");
    return kUsage;
  }
  OEBuffer out(0, 1u << 16);
  if (!BuildStatementRequest(o, password, out)) return kUsage;
  if (output.empty()) output = "-";
  if (!WriteFile(output, out, &error, true)) {
    std::fprintf(stderr, "ofxkit request: %s\n", error.c_str());
    return kBadInput;
  }
  if (output != "-") std::fprintf(stderr, "wrote %s (%u bytes)\n", output.c_str(), out.GetBufferSize());
  return kClean;
}

}  // namespace cli
