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
    for (unsigned short i = 0; i < list->GetNumStatementTx(); ++i) {
      const OEBankStatementTx* tx = list->GetStatementTx(i);
      if (!tx) continue;
      const char* type = tx->ValidateTag(OE_TAG_TRNTYPE) ? OEDataConversion::Text(tx->GetTxType()) : "";
      std::printf("%s%s,%s,%s,%s,%s,%s,%s\n", account.c_str(), IsoDate(*tx).c_str(), Amount(*tx).c_str(),
                  CsvText(type, raw).c_str(), CsvText(tx->GetFITId(), raw, "FITID").c_str(),
                  CsvText(tx->GetName(), raw, "NAME").c_str(),
                  CsvText(tx->GetMemo(), raw, "MEMO").c_str(),
                  CsvText(tx->GetCheckNum(), raw, "CHEQUENUM").c_str());
    }
  }
  bool investments = PrintInvestmentTransactions(parsed.file.get(), withAccount, raw, !statements.empty());
  if (statements.empty() && !investments)
    std::fprintf(stderr, "ofxkit statement: no bank, card or investment statement in the file\n");
  return ReportLosses("statement", parsed, rc);
}

}  // namespace cli
