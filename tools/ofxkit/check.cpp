// ofxkit check: everything known of how a file was read, for people
// debugging a bank's file: the parse status, every warning, and the audit of
// what the file holds that the tree does not.
#include <cstdio>
#include <string>

#include "cli.h"

namespace cli {
namespace {

const char kCheckHelp[] =
    "usage: ofxkit check [--strict] FILE\n"
    "Parses an OFX file and prints how it was read: the parse status, every\n"
    "warning of the parse (code, tag, value, byte position), and the audit of the\n"
    "text against what was read: aggregates of the file that are missing from the\n"
    "result (statements, transactions, positions, balances, securities, accounts),\n"
    "values given twice of which only the last was kept, tags without their '>',\n"
    "CDATA sections that run over tags, OFX aggregates after the end, and text\n"
    "after a NUL byte.\n"
    "  --strict read by the OFX 1.x rules only (see 'ofxkit dump --help')\n"
    "Exit status: 0 clean and nothing lost, 1 warnings or something of the file not\n"
    "read, 2 parse failed, 3 unreadable or not OFX, 64 bad command line.\n";

const char* KindName(ofxkit::AuditKind kind) {
  switch (kind) {
    case ofxkit::AuditKind::kMissing: return "missing";
    case ofxkit::AuditKind::kSurplus: return "surplus";
    case ofxkit::AuditKind::kReplaced: return "replaced";
    case ofxkit::AuditKind::kBrokenTag: return "broken-tag";
    case ofxkit::AuditKind::kCDataOverTags: return "cdata-over-tags";
    case ofxkit::AuditKind::kOFXAfterEnd: return "ofx-after-end";
    case ofxkit::AuditKind::kTextAfterNul: return "text-after-nul";
  }
  return "?";
}

}  // namespace

int CmdCheck(int argc, char** argv) {
  Args args(argc, argv, 2);
  if (args.Flag("help")) {
    std::fputs(kCheckHelp, stdout);
    return kClean;
  }
  ParsedFile parsed;
  parsed.strict = args.Flag("strict");
  std::string error;
  std::vector<std::string> files = args.Positional(&error);
  if (!error.empty() || files.size() != 1) {
    std::fprintf(stderr, "ofxkit check: %s\n%s", error.empty() ? "expected one FILE" : error.c_str(), kCheckHelp);
    return kUsage;
  }
  int rc = ParseOFXFile(files[0], parsed, &error);
  if (rc == kBadInput) {
    std::fprintf(stderr, "ofxkit check: %s\n", error.c_str());
    return rc;
  }
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  std::printf("%s: %s reading, parse status %d", files[0].c_str(), parsed.strict ? "strict" : "tolerant",
              static_cast<int>(parsed.status));
  if (parsed.objectWithError && parsed.status != OE_PARSE_OK && parsed.status != OE_PARSE_WARNINGS)
    std::printf(" (stopped in %s)", TagName(parsed.objectWithError->GetType()));
  std::printf("\n%u warning(s)\n", static_cast<unsigned>(log->Entries()));
  for (unsigned short i = 0; i < log->Entries(); ++i) {
    const OEParseException* w = log->Get(i);
    std::printf("  %s tag=%s value=\"%s\" position=%d\n", OEParseException::WarningName(w->warning),
                w->tag ? TagName(w->tag) : w->tagName.c_str(), w->value.c_str(), static_cast<int>(w->position));
  }
  const ofxkit::AuditReport& audit = parsed.audit;
  std::printf("audit: %u tags in the text, %zu finding(s)%s\n", audit.tagsInText, audit.findings.size(),
              audit.complete ? "" : " (incomplete: out of memory)");
  for (const ofxkit::AuditFinding& finding : audit.findings)
    std::printf("  %s%s: %s\n", finding.IsLoss() ? "LOSS " : "", KindName(finding.kind), finding.Describe().c_str());
  if (audit.HasLoss() && rc == kClean) rc = kWarnings;
  return rc;
}

}  // namespace cli
