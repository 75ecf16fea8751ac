// ofxkit statement: the transactions of bank and card statements as CSV.
#include <cstdio>
#include <string>

#include "cli.h"

namespace cli {
namespace {

const char kStatementHelp[] =
    "usage: ofxkit statement [--account] [--raw] [--strict] FILE\n"
    "Prints the transactions of every bank and credit-card statement of an OFX\n"
    "response file as CSV: date,amount,type,fitid,name,memo,checknum\n"
    "(dates as YYYY-MM-DD; with --account, a first column names the account).\n"
    "Text that a spreadsheet would run as a formula (beginning with = + - @, a tab\n"
    "or a carriage return) is prefixed with ' unless --raw is given; amounts never are.\n"
    "--strict reads by the OFX 1.x rules only, as 'ofxkit dump --strict' does.\n"
    "Investment statements follow (after a blank line when both are present),\n"
    "one row per transaction of every kind in trade-date order:\n"
    "date,kind,security,name,units,unitprice,commission,total,subacctsec,\n"
    "subacctfund,subacctfrom,subacctto,fitid,memo (security is the ticker when\n"
    "the file's security list names one, else the security id).\n"
    "Transactions of the file that could not be read are reported on standard\n"
    "error, and the exit status is then never 0. Exit status as for 'ofxkit dump'.\n";

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
  bool withAccount = args.Flag("account");
  bool raw = false;
  ParsedFile parsed;
  int rc;
  if (!ParseCommandFile("statement", kStatementHelp, args, parsed, &raw, &rc)) return rc;
  std::vector<const OEGenericStatementRs*> statements;
  Collect(parsed.file.get(), statements);
  if (!statements.empty()) std::printf("%sdate,amount,type,fitid,name,memo,checknum\n", withAccount ? "account," : "");
  for (const OEGenericStatementRs* rs : statements) {
    const OEBankTransactionList* list = rs->GetBankTransactionList();
    if (!list) continue;
    std::string account = withAccount ? CsvText(AccountName(*rs).c_str(), raw) + "," : "";
    std::string line;
    for (unsigned short i = 0; i < list->GetNumStatementTx(); ++i) {
      const OEBankStatementTx* tx = list->GetStatementTx(i);
      if (!tx) continue;
      line.assign(account);
      if (tx->ValidateTag(OE_TAG_DTPOSTED)) AppendIsoDate(line, tx->GetDateTimePosted());
      line += ',';
      AppendElement(line, tx, OE_TAG_TRNAMT);
      line += ',';
      AppendCsv(line, tx->ValidateTag(OE_TAG_TRNTYPE) ? OEDataConversion::Text(tx->GetTxType()) : "", raw);
      line += ',';
      AppendCsv(line, tx->GetFITId(), raw, "FITID");
      line += ',';
      AppendCsv(line, tx->GetName(), raw, "NAME");
      line += ',';
      AppendCsv(line, tx->GetMemo(), raw, "MEMO");
      line += ',';
      AppendCsv(line, tx->GetCheckNum(), raw, "CHEQUENUM");
      line += '\n';
      std::fwrite(line.data(), 1, line.size(), stdout);
    }
  }
  bool investments = PrintInvestmentTransactions(parsed.file.get(), withAccount, raw, !statements.empty());
  if (statements.empty() && !investments)
    std::fprintf(stderr, "ofxkit statement: no bank, card or investment statement in the file\n");
  return ReportLosses("statement", parsed, rc);
}

}  // namespace cli
