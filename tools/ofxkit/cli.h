// Shared pieces of the ofxkit command-line tool.
#pragma once

#include <ofxkit/ofxkit.h>

#include <map>
#include <memory>
#include <string>
#include <vector>

namespace cli {

// Exit statuses of the tool.
enum Exit : int {
  kClean = 0,        // parsed with no warning / command done
  kWarnings = 1,     // parsed to the end, with warnings
  kParseFailed = 2,  // the parse stopped (malformed OFX)
  kBadInput = 3,     // missing, unreadable or not an OFX file
  kUsage = 64        // bad command line
};

// Command-line arguments after the command name, with --name value options.
class Args {
 public:
  Args(int argc, char** argv, int first);
  bool Flag(const std::string& name);  // --name present (and consumed)
  // The value of --name VALUE (or --name=VALUE); empty when absent.
  std::string Option(const std::string& name);
  // Every value of a repeated --name VALUE, in order.
  std::vector<std::string> Options(const std::string& name);
  bool HasOption(const std::string& name) const;
  // The remaining positional arguments; reports unknown options.
  std::vector<std::string> Positional(std::string* error);

 private:
  std::vector<std::string> m_args;
  std::vector<bool> m_used;
};

// A parsed OFX file: a request or a response file, whichever it is.
struct ParsedFile {
  // Set before the parse: the library's recovery rules only, without the
  // tolerant reading (OE_READ_TOLERANT) that the tool uses by default.
  bool strict = false;
  std::unique_ptr<OEFileOFX> file;
  bool isResponse = false;
  OEParseStatus status = OE_PARSE_OK;
  OEDataObj* objectWithError = nullptr;
  // What the text holds that the tree does not (read once more after the parse).
  ofxkit::AuditReport audit;
  // A command that reads one file and ends keeps the tree until the process
  // ends instead of taking it apart object by object (a few milliseconds on
  // a large statement); the system takes the memory back at once.
  bool keepUntilExit = false;

  ParsedFile() = default;
  ParsedFile(const ParsedFile&) = delete;
  ParsedFile& operator=(const ParsedFile&) = delete;
  ~ParsedFile();
};

// The time now (UTC), to the second.
OEDateTime NowUTC();
// Reads a whole file; false with a message when it cannot.
bool ReadFile(const std::string& path, OEBuffer& buffer, std::string* error);
// Writes a file, or standard output for "-". A private file (one holding a
// password or account data) goes through WritePrivateFile.
bool WriteFile(const std::string& path, const OEBuffer& buffer, std::string* error, bool privateFile = false);
// Writes buffer to path so that nobody else can read it there at any moment:
// into a new file of mode 0600 beside path, renamed over it once complete. A
// symbolic link at path is refused, not followed; a device or pipe
// (/dev/null) is written into as it is.
bool WritePrivateFile(const std::string& path, const OEBuffer& buffer, std::string* error);
// No core dump of this process from now on (it holds a password).
void KeepSecretsOutOfCoreDumps();
// Parses an OFX file (request or response, told from its message sets).
// Returns kBadInput with a message for what is not OFX at all.
int ParseOFXFile(const std::string& path, ParsedFile& parsed, std::string* error);
// The same for a file already in memory; name is used in messages.
int ParseOFXBuffer(OEBuffer& buffer, const std::string& name, ParsedFile& parsed, std::string* error);
int ExitForStatus(OEParseStatus status);
// Prints one line per loss the audit found ("ofxkit COMMAND: 3 of 6 STMTTRN in
// the file were not read: ...") on standard error and answers the exit status:
// rc, but never kClean when something of the file was not read.
int ReportLosses(const char* command, const ParsedFile& parsed, int rc);
// Text of the file read last (by ParseOFXFile or ParseOFXBuffer) as UTF-8,
// converted from the character set its header names; bytes that do not
// convert are counted (and named by field, when given) for ReportLosses to
// report. Every text of the file that the tool prints goes through here.
std::string OutputText(const char* text, const char* field = nullptr);
// The same for n bytes at text, appended to out.
void AppendOutputText(std::string& out, const char* text, size_t n, const char* field = nullptr);
// A text field of CSV output: quoted when it holds a comma, quote or line
// break, converted as OutputText does. Unless raw, a text that a spreadsheet would run as a formula (one
// that begins with '=', '+', '-', '@', a tab or a carriage return) is
// prefixed with a single quote. Amounts and dates are not passed through here.
std::string CsvText(const char* text, bool raw, const char* field = nullptr);
// The same, appended to out (no temporary per field: rows of large files are
// made this way).
void AppendCsv(std::string& out, const char* text, bool raw, const char* field = nullptr);
// The tag's name, or "?".
const char* TagName(OETagID tag);
// A date as YYYY-MM-DD, appended to out or answered.
void AppendIsoDate(std::string& out, const OEDateTime& d);
std::string IsoDate(const OEDateTime& d);
// Appends the present element `tag` of an aggregate as OFX text (nothing
// when absent); answers whether anything was appended.
bool AppendElement(std::string& out, const OEDataObj* obj, OETagID tag);
// Reads a password from the terminal without echo (or a line of standard
// input when it is not a terminal).
bool PromptPassword(const char* prompt, OEUserPassword& out);

// What a statement request names.
struct StatementRequestOptions {
  std::string org, fid, user, account, bankId, type, start, end, appId, appVersion;
  // Brokerage statements: the broker, what to include besides transactions,
  // and the securities to ask a security list for (comma-separated).
  std::string brokerId, securities;
  bool positions = false, openOrders = false, balance = false;
  // What is asked besides the sign-on: "statement", "profile" or "accounts"
  // (since: the date of the last account list the client holds).
  std::string kind = "statement", since;
  // Transfers, payments and mail: the options of kMoveOptionNames and
  // kMailOptionNames that were given.
  std::map<std::string, std::string> values;
  // The value of one of them, or "" when it was not given.
  std::string Value(const char* name) const {
    auto found = values.find(name);
    return found == values.end() ? std::string() : found->second;
  }
};

// The options of `request transfer` and `request payment` beyond the sign-on
// and the account they move money from.
constexpr const char* kMoveOptionNames[] = {"to-account", "to-bank-id", "to-type", "amount", "due", "memo",
                                            "pay-account", "payee-id", "payee-name", "payee-addr1",
                                            "payee-city", "payee-state", "payee-postal", "payee-phone"};
// The options of `request mail`: the message and where its body is read from.
constexpr const char* kMailOptionNames[] = {"subject", "body-file", "to", "from"};
// Writes a sign-on + statement request file into out; false (with a message
// on standard error) when an option is not valid.
bool BuildStatementRequest(const StatementRequestOptions& options, const OEUserPassword& password, OEBuffer& out);
// Adds the brokerage statement request (and the security-list request) that
// options name; false after a message when an option is not valid.
bool AppendInvestmentRequest(const StatementRequestOptions& options, OERequest& request);
// Appends to request a message set of setType holding one transaction
// wrapper (a fresh transaction id) around inner.
void AppendWrapped(OERequest& request, OETagID setType, OETagID wrapperType, OETagID innerTag, OETransBase* inner);
// The response set of this type in out, appended when there is none yet.
OEMessageSetRs* ResponseSet(OEResponse& out, OETagID type);
// A response wrapper (status 0) around inner, answering wrapper.
OETransRs* AnswerWrapper(const OETransRq& wrapper, OETagID type, OETagID innerTag, OETransBase* inner);
// Adds the transfer or payment request that options name; false after a
// message when an option is missing or not valid.
bool AppendMoveRequest(const StatementRequestOptions& options, OERequest& request);
// Adds the secure-mail request that options name (free-form, or about the
// bank, card or brokerage account they name); false after a message, which
// never holds the body.
bool AppendMailRequest(const StatementRequestOptions& options, OERequest& request);
// Adds the profile or account-information request that options name.
bool AppendFirstContactRequest(const StatementRequestOptions& options, OERequest& request);
// Writes a request file strictly into out; false after a message.
bool WriteRequest(const OEFileRq& file, OEBuffer& out);

// Transactions generated for one request file at most (the most that fits in
// one response buffer), so also the largest --transactions.
constexpr unsigned kMaxTransactionsPerFile = 25000;

// What answering one request file may still cost: statements, answers and
// generated transactions (a brokerage transaction counts as the bytes of
// kBrokerageWeight bank ones).
struct AnswerBudget {
  static constexpr unsigned kMaxStatements = 64;
  static constexpr unsigned kMaxAnswers = 1000;
  static constexpr unsigned kBrokerageWeight = 3;
  unsigned statements = 0, answers = 0, transactions = 0;
  // False when the file has had all the answers it gets (the request is then
  // not answered at all).
  bool Answer() { return answers < kMaxAnswers && ++answers; }
  // Null when a statement of n transactions (each of the given weight) is
  // still allowed, and counts it; else why it is refused.
  const char* TakeStatement(unsigned n, unsigned weight = 1);
};

// The answer to a statement request refused with status 2000 and why.
OETransRs* RefusedStatement(const OETransRq& wrapper, OETagID wrapperType, const char* why);

// The accounts `respond` and `serve` list for the demo user.
constexpr const char* kServedBankID = "121000248";
constexpr const char* kServedChecking = "1001";
constexpr const char* kServedSavings = "1002";
constexpr const char* kServedCard = "4111111111111111";
constexpr const char* kServedBrokerID = "broker.example";
constexpr const char* kServedBrokerage = "X12345678";

// How a request is answered.
struct RespondOptions {
  unsigned transactions = 25;
  bool checkCredentials = false;
  bool passwordFromStdin = false;
  std::string user;
  OEUserPassword password;
};
// Fills response with the answer to request; false when the credentials did
// not match (the response then says so).
bool AnswerRequest(const OEFileRq& request, const RespondOptions& options, OEFileRs& response);
// Reads --transactions, --user and --password-stdin; false after a message on
// standard error when they are not usable.
bool ReadRespondOptions(Args& args, const char* command, RespondOptions& options);
// With a user named, reads the password (from the terminal without echo, or
// a line of standard input); false after a message when none is given.
bool AskPassword(const char* command, RespondOptions& options);
// Answers an investment statement or securities-list request set into out
// (with the security list); false for a set of another type.
bool AnswerInvestmentSet(const OEMessageSetRq& set, unsigned transactions, AnswerBudget& budget, OEResponse& out);
// Answers a bank set's transfers or a bill-payment set's payments into out,
// each with a processing status and a server transaction id; false for a set
// whose other requests are still to answer (bank sets), or of another type.
bool AnswerMoveSet(const OEMessageSetRq& set, AnswerBudget& budget, OEResponse& out);
// Answers the secure-mail requests of an e-mail, bank or brokerage set into
// out, each with a reply from the institution; true for an e-mail set (whose
// requests are all answered then), false for the others.
bool AnswerMailSet(const OEMessageSetRq& set, AnswerBudget& budget, OEResponse& out);
// Answers a profile or signup request set into out; false for a set of
// another type.
bool AnswerFirstContactSet(const OEMessageSetRq& set, AnswerBudget& budget, OEResponse& out);
// Answers request and writes the response file into out; the build status.
OEBuildStatus WriteAnswer(const OEFileRq& request, const RespondOptions& options, OEBuffer& out);

// Prints the transactions of the investment statements under root as CSV
// (after a blank line when `separate`; text fields as CsvText makes them);
// false when there are none.
bool PrintInvestmentTransactions(OEDataObj* root, bool withAccount, bool raw, bool separate);

// What every command that reads one file does first: --help (printing help),
// --raw (when raw is given) and --strict, the one FILE, its parse and the
// messages for a file that is not OFX or whose parse stopped. False with *rc
// the exit status when the command ends here; else true with *rc the exit
// status of the parse.
bool ParseCommandFile(const char* command, const char* help, Args& args, ParsedFile& parsed, bool* raw, int* rc);

// The objects of class T under obj, in document order: the envelope down to
// the requests and responses that wrappers hold. It does not look inside one
// that is found, nor inside another wrapper's request or response (a
// statement holds no statements: walking its transactions would cost more
// than the rest of a command).
template <class T>
void Collect(const OEDataObj* obj, std::vector<const T*>& out) {
  if (const T* found = dynamic_cast<const T*>(obj)) {
    out.push_back(found);
    return;
  }
  if (dynamic_cast<const OETransBase*>(obj)) return;
  for (unsigned short i = 0, n = obj->GetNumberOfChildren(); i < n; ++i)
    if (const OEDataObj* child = obj->GetChild(i)) Collect(child, out);
}

int CmdDump(int argc, char** argv);
int CmdPositions(int argc, char** argv);
int CmdProfile(int argc, char** argv);
int CmdAccounts(int argc, char** argv);
int CmdStatement(int argc, char** argv);
int CmdRequest(int argc, char** argv);
int CmdRespond(int argc, char** argv);
int CmdExchange(int argc, char** argv);
int CmdServe(int argc, char** argv);
// Runs a command of the network module (exchange, serve), loading it first.
int RunNetCommand(const char* name, int argc, char** argv);
int CmdCheck(int argc, char** argv);

}  // namespace cli
