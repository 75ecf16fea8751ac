// ofxkit: reads, writes and exchanges OFX files from the command line.
#include <unistd.h>

#include <cstdio>
#include <cstring>

#include "cli.h"

namespace {
// The network commands are loaded when they run (see net_loader.cpp).
int Exchange(int argc, char** argv) { return cli::RunNetCommand("exchange", argc, argv); }
int Serve(int argc, char** argv) { return cli::RunNetCommand("serve", argc, argv); }

struct Command {
  const char* name;
  int (*run)(int, char**);
  const char* summary;
};
const Command kCommands[] = {
    {"dump", cli::CmdDump, "print the object tree and warnings of an OFX file (text or --json)"},
    {"statement", cli::CmdStatement, "print the transactions of bank, card and investment statements as CSV"},
    {"positions", cli::CmdPositions, "print the positions (or --balances) of investment statements as CSV"},
    {"profile", cli::CmdProfile, "print what an institution supports, from a profile response"},
    {"accounts", cli::CmdAccounts, "print the accounts of an account-information response as CSV"},
    {"request", cli::CmdRequest, "write an OFX request file (request statement ...)"},
    {"respond", cli::CmdRespond, "answer a statement request file with a generated statement response"},
    {"exchange", Exchange, "post a request file to a server (http:, https:) and dump the reply"},
    {"serve", Serve, "answer OFX requests over HTTP or HTTPS on the loopback interface"},
    {"check", cli::CmdCheck, "print the warnings of a file's parse and every part of the file that was not read"},
};

void Usage(FILE* out) {
  std::fprintf(out, "usage: ofxkit COMMAND [options]\n\ncommands:\n");
  for (const Command& c : kCommands) std::fprintf(out, "  %-10s %s\n", c.name, c.summary);
  std::fprintf(out,
               "\nRun 'ofxkit COMMAND --help' for a command's options.\n"
               "Exit status: 0 clean, 1 parsed with warnings, 2 parse failed, 3 unreadable or not OFX,\n"
               "64 bad command line.\n");
}
}  // namespace

int main(int argc, char** argv) {
  // Into a file or a pipe, output goes in 64 KB writes rather than 4 KB ones
  // (a large statement's dump is megabytes); a terminal keeps its lines.
  static char outputBuffer[1 << 16];
  if (!isatty(STDOUT_FILENO)) std::setvbuf(stdout, outputBuffer, _IOFBF, sizeof outputBuffer);
  if (argc < 2 || !std::strcmp(argv[1], "--help") || !std::strcmp(argv[1], "-h") || !std::strcmp(argv[1], "help")) {
    Usage(argc < 2 ? stderr : stdout);
    return argc < 2 ? cli::kUsage : cli::kClean;
  }
  for (const Command& c : kCommands)
    if (!std::strcmp(argv[1], c.name)) return c.run(argc, argv);
  std::fprintf(stderr, "ofxkit: unknown command '%s'\n\n", argv[1]);
  Usage(stderr);
  return cli::kUsage;
}
