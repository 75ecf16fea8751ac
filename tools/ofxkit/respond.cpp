// ofxkit respond: answers a statement request file the way a bank server
// would, with a generated (deterministic) statement.
#include <cstdio>
#include <cstring>
#include <string>

#include "cli.h"

namespace cli {
namespace {

const char kRespondHelp[] =
    "usage: ofxkit respond [--transactions N] [--user USER --password-stdin] REQUEST [-o FILE]\n"
    "Reads an OFX request file and writes the response a bank would send: a sign-on\n"
    "response and, for each bank, card or investment statement request, a statement\n"
    "with N generated transactions (default 25) between the requested dates; an\n"
    "investment statement comes with the security list it refers to. With --user\n"
    "(and the password on standard input) the credentials are checked: a mismatch is\n"
    "answered with sign-on status 15500 and no statement.\n"
    "A file is answered with at most 64 statements and 25000 transactions in all;\n"
    "statement requests beyond that are answered with status 2000 (error).\n";

// A small deterministic generator, so the same request gives the same reply.
struct Sequence {
  uint32_t state;
  uint32_t Next() {
    state = state * 1103515245u + 12345u;
    return state >> 8;
  }
};

OEStatus* NewStatus(int32_t code, OEStatusSeverity severity, const char* message) {
  OEStatus* status = new OEStatus();
  status->SetCode(code);
  status->SetSeverity(severity);
  if (message) status->SetMessageText(message);
  return status;
}

OEDateTime DateOr(const OEIncTransaction* include, bool end, const OEDateTime& fallback) {
  if (!include) return fallback;
  OETagID tag = end ? OE_TAG_DTEND : OE_TAG_DTSTART;
  if (!include->ValidateTag(tag)) return fallback;
  return end ? include->GetDtEnd() : include->GetDtStart();
}

const OEBankTxType kTypes[] = {OE_BANKTX_DEBIT, OE_BANKTX_CREDIT, OE_BANKTX_CHECK, OE_BANKTX_POS,
                               OE_BANKTX_ATM,   OE_BANKTX_FEE,    OE_BANKTX_DIRECTDEP};
const char* const kNames[] = {"Corner Grocery", "Refund", "Rent & utilities", "Coffee House", "ATM Withdrawal",
                              "Monthly fee", "Payroll"};

OEGenericStatementRs* MakeStatement(const OEGenericStatementRq& rq, bool card, unsigned count) {
  OEGenericStatementRs* rs = card ? static_cast<OEGenericStatementRs*>(new OECCStatementRs())
                                  : static_cast<OEGenericStatementRs*>(new OEBankStatementRs());
  rs->SetCurrencyDefault("USD");
  if (const OEBankOrCCAccount* from = rq.GetAccountFrom()) {
    OEBankOrCCAccount* copy = nullptr;
    OEBankOrCCAccount::DeepCopyTo(from, &copy);
    if (copy) rs->SetAccountFrom(copy);
  }
  OEDateTime now(2026, 11, 23, 12, 0, 0);
  OEDateTime start = DateOr(rq.GetIncTransaction(), false, OEDateTime(2026, 10, 24));
  OEDateTime end = DateOr(rq.GetIncTransaction(), true, now);
  OEBankTransactionList* list = new OEBankTransactionList();
  list->SetStartDateTime(start);
  list->SetEndDateTime(end);
  Sequence seq{static_cast<uint32_t>(std::strlen(rq.GetAccountFrom() ? rq.GetAccountFrom()->GetAccountID().c_str() : "")) + 7u};
  OEPrecisionInteger balance(250000, 2);
  for (unsigned i = 0; i < count; ++i) {
    OEBankStatementTx* tx = new OEBankStatementTx();
    unsigned kind = seq.Next() % 7;
    tx->SetTxType(kTypes[kind]);
    OEDateTime posted = start;
    posted += static_cast<int32_t>((i * 86400u) % 2592000u);
    tx->SetDateTimePosted(posted);
    int32_t cents = static_cast<int32_t>(seq.Next() % 20000u) + 100;
    bool credit = kTypes[kind] == OE_BANKTX_CREDIT || kTypes[kind] == OE_BANKTX_DIRECTDEP;
    OEPrecisionInteger amount(credit ? cents : -cents, 2);
    balance = balance + amount;
    tx->SetTxAmount(amount);
    char fitid[32];
    std::snprintf(fitid, sizeof fitid, "%u%06u", 202611u, i + 1);
    tx->SetFITId(fitid);
    tx->SetName(kNames[kind]);
    if (kTypes[kind] == OE_BANKTX_CHECK) {
      char number[12];
      std::snprintf(number, sizeof number, "%u", 1000 + i);
      tx->SetCheckNum(number);
    }
    list->AppendStatementTx(tx);
  }
  rs->SetBankTransactionList(list);
  OELedgerBalance* ledger = new OELedgerBalance();
  ledger->SetBalanceAmount(balance);
  ledger->SetDateAsOf(end);
  rs->SetLedgerBalance(ledger);
  return rs;
}

// A response is written into one buffer of at most 4,000,000 bytes; a
// generated bank transaction takes up to about 130 bytes and a brokerage one
// about three times that, so a file is answered with at most
// kMaxTransactionsPerFile (weighted) transactions in all, in at most
// AnswerBudget::kMaxStatements statements. Statement requests beyond either
// bound are answered with an error status, and inner requests beyond
// AnswerBudget::kMaxAnswers get no answer at all.
}  // namespace

const char* AnswerBudget::TakeStatement(unsigned n, unsigned weight) {
  if (statements >= kMaxStatements) return "Too many statement requests in one file";
  if (transactions + n * weight > kMaxTransactionsPerFile) return "Too many transactions requested in one file";
  ++statements;
  transactions += n * weight;
  return nullptr;
}

OETransRs* RefusedStatement(const OETransRq& wrapper, OETagID wrapperType, const char* why) {
  OETransRs* rsWrapper = new OETransRs();
  rsWrapper->SetType(wrapperType);
  rsWrapper->SetTransUserID(wrapper.GetTransUserID());
  rsWrapper->SetStatus(NewStatus(2000, OE_SEVERITY_ERROR, why));
  return rsWrapper;
}

namespace {

// Whether the request's sign-on is accepted, decided before anything else is
// answered, wherever the sign-on stands among the message sets: with
// credentials to check, every sign-on must carry them, and a request
// without one is refused.
bool SignOnAccepted(const OEFileRq& request, const RespondOptions& options) {
  if (!options.checkCredentials) return true;
  bool seen = false;
  for (unsigned short r = 0; r < request.GetNumberOfRequest(); ++r) {
    const OERequest* rq = request.GetRequest(r);
    for (unsigned short m = 0; rq && m < rq->GetNumMessage(); ++m) {
      const OEMessageSetRq* set = rq->GetMessageSet(m);
      if (!set || set->GetType() != OE_TAG_SIGNONMSGSRQV1) continue;
      const OESignOnRq* signOn = set->GetSignOnRq();
      if (!signOn || !(signOn->GetUserId() == options.user.c_str()) || !(signOn->GetUserPass() == options.password))
        return false;
      seen = true;
    }
  }
  return seen;
}

}  // namespace

bool AnswerRequest(const OEFileRq& request, const RespondOptions& options, OEFileRs& response) {
  response.SetHeader(OE_HEADER_OFXHEADER, "100");
  OEResponse* out = new OEResponse();
  response.AppendResponse(out);
  const bool signedOn = SignOnAccepted(request, options);
  AnswerBudget budget;
  for (unsigned short r = 0; r < request.GetNumberOfRequest(); ++r) {
    const OERequest* rq = request.GetRequest(r);
    for (unsigned short m = 0; rq && m < rq->GetNumMessage(); ++m) {
      const OEMessageSetRq* set = rq->GetMessageSet(m);
      if (!set) continue;
      if (set->GetType() == OE_TAG_SIGNONMSGSRQV1) {
        const OESignOnRq* signOn = set->GetSignOnRq();
        OEMessageSetRs* rsSet = new OEMessageSetRs();
        rsSet->SetType(OE_TAG_SIGNONMSGSRSV1);
        OESignOnRs* signOnRs = new OESignOnRs();
        signOnRs->SetStatus(signedOn ? NewStatus(0, OE_SEVERITY_INFO, nullptr)
                                     : NewStatus(15500, OE_SEVERITY_ERROR, "Signon invalid"));
        signOnRs->SetDtServer(OEDateTime(2026, 11, 23, 12, 0, 0));
        signOnRs->SetLanguage(OEString("ENG"));
        if (signOn && signOn->GetFI()) {
          OEFI* fi = new OEFI();
          fi->CopyAggregateFrom(signOn->GetFI());
          signOnRs->SetFI(fi);
        }
        rsSet->SetSignOnRs(signOnRs);
        out->AppendMessageSet(rsSet);
        continue;
      }
      if (signedOn && (AnswerMailSet(*set, budget, *out) || AnswerInvestmentSet(*set, options.transactions, budget, *out) ||
                       AnswerFirstContactSet(*set, budget, *out) || AnswerMoveSet(*set, budget, *out)))
        continue;
      bool card = set->GetType() == OE_TAG_CREDITCARDMSGSRQV1;
      if (!signedOn || (set->GetType() != OE_TAG_BANKMSGSRQV1 && !card)) continue;
      OEMessageSetRs* rsSet = ResponseSet(*out, card ? OE_TAG_CREDITCARDMSGSRSV1 : OE_TAG_BANKMSGSRSV1);
      for (unsigned short t = 0; t < set->GetNumTrans(); ++t) {
        const OETransRq* wrapper = set->GetTrans(t);
        const OEGenericStatementRq* stmt =
            wrapper ? dynamic_cast<const OEGenericStatementRq*>(wrapper->GetActualTrans()) : nullptr;
        if (!stmt || !budget.Answer()) continue;
        if (const char* refused = budget.TakeStatement(options.transactions)) {
          rsSet->AppendTrans(RefusedStatement(*wrapper, card ? OE_TAG_CCSTMTTRNRS : OE_TAG_STMTTRNRS, refused));
          continue;
        }
        OETransRs* rsWrapper = new OETransRs();
        rsWrapper->SetType(card ? OE_TAG_CCSTMTTRNRS : OE_TAG_STMTTRNRS);
        rsWrapper->SetTransUserID(wrapper->GetTransUserID());
        rsWrapper->SetStatus(NewStatus(0, OE_SEVERITY_INFO, nullptr));
        rsWrapper->SetActualTrans(MakeStatement(*stmt, card, options.transactions));
        rsWrapper->SetTag(card ? OE_TAG_CCSTMTRS : OE_TAG_STMTRS);
        rsSet->AppendTrans(rsWrapper);
      }
    }
  }
  return signedOn;
}

bool ReadRespondOptions(Args& args, const char* command, RespondOptions& options) {
  std::string count = args.Option("transactions");
  if (!count.empty()) {
    char* end = nullptr;
    unsigned long n = std::strtoul(count.c_str(), &end, 10);
    if (*end || n > kMaxTransactionsPerFile) {
      std::fprintf(stderr, "ofxkit %s: --transactions takes a number up to %u\n", command, kMaxTransactionsPerFile);
      return false;
    }
    options.transactions = static_cast<unsigned>(n);
  }
  options.user = args.Option("user");
  options.passwordFromStdin = args.Flag("password-stdin");
  return true;
}

bool AskPassword(const char* command, RespondOptions& options) {
  if (options.user.empty()) return true;
  options.checkCredentials = true;
  if (!PromptPassword(options.passwordFromStdin ? "" : "Password: ", options.password)) {
    std::fprintf(stderr, "ofxkit %s: no password given\n", command);
    return false;
  }
  return true;
}

OEBuildStatus WriteAnswer(const OEFileRq& request, const RespondOptions& options, OEBuffer& out) {
  OEFileRs response;
  AnswerRequest(request, options, response);
  OEBuilder builder;
  return builder.Build(&out, &response, OE_BUILD_STRICT, 1);
}

int CmdRespond(int argc, char** argv) {
  Args args(argc, argv, 2);
  if (args.Flag("help")) {
    std::fputs(kRespondHelp, stdout);
    return kClean;
  }
  std::string output = args.Option("o");
  std::string error;
  RespondOptions options;
  if (!ReadRespondOptions(args, "respond", options)) return kUsage;
  std::vector<std::string> files = args.Positional(&error);
  if (!error.empty() || files.size() != 1) {
    std::fprintf(stderr, "ofxkit respond: %s\n%s", error.empty() ? "expected one REQUEST file" : error.c_str(),
                 kRespondHelp);
    return kUsage;
  }
  if (!AskPassword("respond", options)) return kUsage;
  ParsedFile parsed;
  int rc = ParseOFXFile(files[0], parsed, &error);
  if (rc == kBadInput || parsed.isResponse) {
    std::fprintf(stderr, "ofxkit respond: %s\n", rc == kBadInput ? error.c_str() : "not a request file");
    return kBadInput;
  }
  OEBuffer out(0, 1u << 16);
  OEBuildStatus status = WriteAnswer(*static_cast<OEFileRq*>(parsed.file.get()), options, out);
  if (status != OE_BUILD_OK) {
    std::fprintf(stderr, "ofxkit respond: the response could not be written (build status %d)\n",
                 static_cast<int>(status));
    return kParseFailed;
  }
  if (output.empty()) output = "-";
  if (!WriteFile(output, out, &error)) {
    std::fprintf(stderr, "ofxkit respond: %s\n", error.c_str());
    return kBadInput;
  }
  return kClean;
}

}  // namespace cli
