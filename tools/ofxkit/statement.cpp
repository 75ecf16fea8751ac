// ofxkit statement: the transactions of bank and card statements as CSV.
#include <cstdio>
#include <string>

#include "charset.h"
#include "cli.h"

namespace cli {
namespace {

const char kStatementHelp[] =
    "usage: ofxkit statement [--account] FILE\n"
    "Prints the transactions of every bank and credit-card statement of an OFX\n"
    "response file as CSV: date,amount,type,fitid,name,memo,checknum\n"
    "(dates as YYYY-MM-DD; with --account, a first column names the account).\n"
    "Exit status as for 'ofxkit dump'.\n";

// A CSV field: quoted when it holds a comma, quote or line break.
std::string Csv(const char* text) {
  std::string s(text ? text : "");
  if (s.find_first_of(",\"\r\n") == std::string::npos) return s;
  std::string q = "\"";
  for (char c : s) q += c == '"' ? std::string("\"\"") : std::string(1, c);
  return q + "\"";
}

std::string IsoDate(const OEBankStatementTx& tx) {
  if (!tx.ValidateTag(OE_TAG_DTPOSTED)) return "";
  const OEDateTime& d = tx.GetDateTimePosted();
  char text[24];
  std::snprintf(text, sizeof text, "%04u-%02u-%02u", d.GetYear(), d.GetMonth(), d.GetDay());
  return text;
}

std::string Amount(const OEBankStatementTx& tx) {
  OEString text;
  return tx.ValidateTag(OE_TAG_TRNAMT) && OEValueText(tx.GetTxAmount(), text) ? text.c_str() : "";
}

// Statement responses (bank or card) anywhere in the tree, in document order.
void CollectStatements(const OEDataObj* obj, std::vector<const OEGenericStatementRs*>& out) {
  if (const OEGenericStatementRs* rs = dynamic_cast<const OEGenericStatementRs*>(obj)) {
    out.push_back(rs);
    return;
  }
  unsigned short n = obj->GetNumberOfChildren();
  for (unsigned short i = 0; i < n; ++i)
    if (const OEDataObj* child = obj->GetChild(i)) CollectStatements(child, out);
}

std::string AccountName(const OEGenericStatementRs& rs) {
  const OEBankOrCCAccount* account = rs.GetAccountFrom();
  if (!account) return "";
  if (const OEBankAccount* bank = dynamic_cast<const OEBankAccount*>(account))
    return std::string(bank->GetBankID().c_str()) + ":" + account->GetAccountID().c_str();
  return account->GetAccountID().c_str();
}

}  // namespace

int CmdStatement(int argc, char** argv) {
  Args args(argc, argv, 2);
  if (args.Flag("help")) {
    std::fputs(kStatementHelp, stdout);
    return kClean;
  }
  bool withAccount = args.Flag("account");
  std::string error;
  std::vector<std::string> files = args.Positional(&error);
  if (!error.empty() || files.size() != 1) {
    std::fprintf(stderr, "ofxkit statement: %s\n%s", error.empty() ? "expected one FILE" : error.c_str(),
                 kStatementHelp);
    return kUsage;
  }
  ParsedFile parsed;
  int rc = ParseOFXFile(files[0], parsed, &error);
  if (rc == kBadInput) {
    std::fprintf(stderr, "ofxkit statement: %s\n", error.c_str());
    return rc;
  }
  if (rc == kParseFailed)
    std::fprintf(stderr, "ofxkit statement: the parse stopped early (status %d); what was read is shown\n",
                 static_cast<int>(parsed.status));
  std::vector<const OEGenericStatementRs*> statements;
  CollectStatements(parsed.file.get(), statements);
  Utf8Converter text(CharsetOf(*parsed.file));
  std::printf("%sdate,amount,type,fitid,name,memo,checknum\n", withAccount ? "account," : "");
  for (const OEGenericStatementRs* rs : statements) {
    const OEBankTransactionList* list = rs->GetBankTransactionList();
    if (!list) continue;
    std::string account = withAccount ? Csv(text(AccountName(*rs).c_str(), "the account").c_str()) + "," : "";
    for (unsigned short i = 0; i < list->GetNumStatementTx(); ++i) {
      const OEBankStatementTx* tx = list->GetStatementTx(i);
      if (!tx) continue;
      const char* type = tx->ValidateTag(OE_TAG_TRNTYPE) ? OEDataConversion::Text(tx->GetTxType()) : "";
      std::printf("%s%s,%s,%s,%s,%s,%s,%s\n", account.c_str(), IsoDate(*tx).c_str(), Amount(*tx).c_str(),
                  Csv(type).c_str(), Csv(text(tx->GetFITId(), "FITID").c_str()).c_str(),
                  Csv(text(tx->GetName(), "NAME").c_str()).c_str(), Csv(text(tx->GetMemo(), "MEMO").c_str()).c_str(),
                  Csv(text(tx->GetCheckNum(), "CHEQUENUM").c_str()).c_str());
    }
  }
  if (statements.empty()) std::fprintf(stderr, "ofxkit statement: no bank or card statement in %s\n", files[0].c_str());
  if (!text.Report().empty()) std::fprintf(stderr, "ofxkit statement: %s\n", text.Report().c_str());
  return rc;
}

}  // namespace cli
