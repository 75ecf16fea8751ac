// Shared pieces of the ofxkit command-line tool.
#pragma once

#include <ofxkit/ofxkit.h>

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
  std::unique_ptr<OEFileOFX> file;
  bool isResponse = false;
  OEParseStatus status = OE_PARSE_OK;
  OEDataObj* objectWithError = nullptr;
};

// Reads a whole file; false with a message when it cannot.
bool ReadFile(const std::string& path, OEBuffer& buffer, std::string* error);
bool WriteFile(const std::string& path, const OEBuffer& buffer, std::string* error, bool privateFile = false);
// Parses an OFX file (request or response, told from its message sets).
// Returns kBadInput with a message for what is not OFX at all.
int ParseOFXFile(const std::string& path, ParsedFile& parsed, std::string* error);
// The same for a file already in memory; name is used in messages.
int ParseOFXBuffer(OEBuffer& buffer, const std::string& name, ParsedFile& parsed, std::string* error);
int ExitForStatus(OEParseStatus status);
// The tag's name, or "?".
const char* TagName(OETagID tag);
// Reads a password from the terminal without echo (or a line of standard
// input when it is not a terminal).
bool PromptPassword(const char* prompt, OEUserPassword& out);

// What a statement request names.
struct StatementRequestOptions {
  std::string org, fid, user, account, bankId, type, start, end, appId, appVersion;
};
// Writes a sign-on + statement request file into out; false (with a message
// on standard error) when an option is not valid.
bool BuildStatementRequest(const StatementRequestOptions& options, const OEUserPassword& password, OEBuffer& out);

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
// Answers request and writes the response file into out; the build status.
OEBuildStatus WriteAnswer(const OEFileRq& request, const RespondOptions& options, OEBuffer& out);

int CmdDump(int argc, char** argv);
int CmdStatement(int argc, char** argv);
int CmdRequest(int argc, char** argv);
int CmdRespond(int argc, char** argv);
int CmdExchange(int argc, char** argv);
int CmdServe(int argc, char** argv);
// Runs a command of the network module (exchange, serve), loading it first.
int RunNetCommand(const char* name, int argc, char** argv);

}  // namespace cli
