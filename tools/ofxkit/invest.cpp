// Brokerage data of the ofxkit tool: investment transactions (as part of
// `statement`), positions and balances (`positions`).
#include <algorithm>
#include <cstdint>
#include <cstdio>
#include <unordered_map>
#include <string>
#include <vector>

#include "cli.h"

namespace cli {
namespace {

const char kPositionsHelp[] =
    "usage: ofxkit positions [--balances] [--account] [--raw] [--strict] FILE\n"
    "Prints the positions of every investment statement of an OFX response file\n"
    "as CSV: security,name,kind,units,unitprice,mktval,priceasof,postype,heldinacct\n"
    "(security is the ticker when the file's security list names one, else the\n"
    "security id). With --balances, prints the cash, margin and short balances\n"
    "and the balance list instead: name,value,type,description,asof.\n"
    "With --account, a first column names the account (broker:account).\n"
    "--raw and --strict as for 'ofxkit statement'. Positions of the file that\n"
    "could not be read are reported on standard error, and the exit status is\n"
    "then never 0. Exit status as for 'ofxkit dump'.\n";

// The present element `tag` of an aggregate as OFX text; empty when absent.
std::string ElementText(const OEDataObj* obj, OETagID tag) {
  std::string text;
  AppendElement(text, obj, tag);
  return text;
}

// The child that stands under the tag (its first, for a list), or null.
const OEDataObj* ChildOfType(const OEDataObj* obj, OETagID type) {
  const auto* agg = static_cast<const OEAggregate*>(obj);
  const OEFieldDesc* d = agg->FieldAt(type);
  return d && d->get ? d->get(agg, 0) : nullptr;
}

// The body of a transaction kind that holds its common fields: its INVBUY
// or INVSELL, else the kind itself.
const OEDataObj* TransactionBody(const OEDataObj* kind) {
  if (const OEDataObj* buy = ChildOfType(kind, OE_TAG_INVBUY)) return buy;
  if (const OEDataObj* sell = ChildOfType(kind, OE_TAG_INVSELL)) return sell;
  return kind;
}

// Appends an element of a kind's body, or of the kind itself when the body
// has none.
void AppendKindElement(std::string& out, const OEDataObj* kind, const OEDataObj* body, OETagID tag) {
  if (!AppendElement(out, body, tag) && body != kind) AppendElement(out, kind, tag);
}

// The securities that the file's security lists describe, by id.
class Securities {
 public:
  explicit Securities(const OEDataObj* root) {
    std::vector<const OEMessageSetRs*> sets;
    cli::Collect(root, sets);
    for (const OEMessageSetRs* set : sets)
      if (const OESecList* list = set->GetSecList()) Add(*list);
  }

  // Appends the security's CSV fields: "ticker" (the id as TYPE:ID when no
  // ticker is known) and its name.
  void Append(std::string& out, const OESecID* id, bool raw) {
    if (!id) {
      out += ',';
      return;
    }
    m_key.assign(id->GetUniqueIDType().c_str());
    m_key += ':';
    m_key += id->GetUniqueID().c_str();
    auto found = m_byId.find(m_key);
    const bool ticker = found != m_byId.end() && !found->second.first.empty();
    AppendCsv(out, ticker ? found->second.first.c_str() : m_key.c_str(), raw);
    out += ',';
    if (found != m_byId.end()) AppendCsv(out, found->second.second.c_str(), raw);
  }

  // "ticker" (or the id when no ticker is known) and the security's name.
  void Describe(const OESecID* id, std::string& security, std::string& name) const {
    security.clear();
    name.clear();
    if (!id) return;
    auto found = m_byId.find(Key(*id));
    if (found != m_byId.end()) {
      security = found->second.first;
      name = found->second.second;
    }
    if (security.empty()) security = Key(*id);
  }

 private:
  static std::string Key(const OESecID& id) {
    return std::string(id.GetUniqueIDType().c_str()) + ":" + id.GetUniqueID().c_str();
  }
  void Add(const OESecList& list) {
    for (unsigned short i = 0, n = list.GetNumberOfChildren(); i < n; ++i) {
      const OEDataObj* kind = list.GetChild(i);
      const auto* info = kind ? static_cast<const OESecInfo*>(ChildOfType(kind, OE_TAG_SECINFO)) : nullptr;
      if (!info || !info->GetSecID()) continue;
      m_byId[Key(*info->GetSecID())] = {info->GetTicker().c_str(), info->GetSecName().c_str()};
    }
  }
  std::unordered_map<std::string, std::pair<std::string, std::string>> m_byId;
  std::string m_key;
};

std::string InvAccountName(const OEInvStmtRs& rs) {
  const OEInvAcctFrom* account = rs.GetInvAcctFrom();
  if (!account) return "";
  return std::string(account->GetBrokerID().c_str()) + ":" + account->GetAccountID().c_str();
}

// A transaction in the order of printing.
struct Row {
  int64_t when;  // milliseconds since 1970 (UTC), for ordering
  OEDataObj* kind;
  const OEInvTran* tran;
  bool dated;
};

// Days since 1970-01-01 of a civil date (proleptic Gregorian calendar).
int64_t DaysFromCivil(int64_t y, unsigned m, unsigned d) {
  y -= m <= 2;
  const int64_t era = (y >= 0 ? y : y - 399) / 400;
  const unsigned yoe = static_cast<unsigned>(y - era * 400);
  const unsigned doy = (153 * (m > 2 ? m - 3 : m + 9) + 2) / 5 + d - 1;
  const unsigned doe = yoe * 365 + yoe / 4 - yoe / 100 + doy;
  return era * 146097 + static_cast<int64_t>(doe) - 719468;
}

int64_t SortKey(const OEDateTime& t) {
  int64_t hours = DaysFromCivil(t.GetYear(), t.GetMonth(), t.GetDay()) * 24 + t.GetHour() - t.GetTimeZoneOffset();
  return ((hours * 60 + t.GetMinute()) * 60 + t.GetSecond()) * 1000 + t.GetMilliseconds();
}

}  // namespace

bool PrintInvestmentTransactions(OEDataObj* root, bool withAccount, bool raw, bool separate) {
  std::vector<const OEInvStmtRs*> statements;
  Collect(root, statements);
  if (statements.empty()) return false;
  Securities securities(root);
  if (separate) std::printf("\n");
  std::printf(
      "%sdate,kind,security,name,units,unitprice,commission,total,subacctsec,subacctfund,subacctfrom,subacctto,"
      "fitid,memo\n",
      withAccount ? "account," : "");
  std::string line;
  std::vector<Row> rows;
  for (const OEInvStmtRs* rs : statements) {
    OEInvTranList* list = rs->GetInvTranList();
    if (!list) continue;
    list->BuildGenericInvTranList();  // fills the bank transactions' INVTRAN
    std::string account = withAccount ? CsvText(InvAccountName(*rs).c_str(), raw) + "," : "";
    // Ordered first, then each line made and written in turn: the lines of a
    // large statement are never all held at once.
    const unsigned short n = list->GetNumberOfChildren();
    rows.clear();
    rows.reserve(n);
    for (unsigned short i = 0; i < n; ++i) {
      OEDataObj* kind = list->GetChild(i);
      if (!kind) continue;
      const OEInvTran* tran = kind->GetType() == OE_TAG_INVBANKTRAN
                                  ? static_cast<OEInvBankTran*>(kind)->GetInvTran()
                                  : static_cast<const OEInvTran*>(ChildOfType(TransactionBody(kind), OE_TAG_INVTRAN));
      const bool dated = tran && tran->ValidateTag(OE_TAG_DTTRADE);
      rows.push_back({dated ? SortKey(tran->GetDtTrade()) : 0, kind, tran, dated});
    }
    // Trade-date order; transactions without a date last, each kind's
    // order kept among equal dates.
    std::stable_sort(rows.begin(), rows.end(), [](const Row& a, const Row& b) {
      if (a.dated != b.dated) return a.dated;
      return a.when < b.when;
    });
    for (const Row& row : rows) {
      OEDataObj* kind = row.kind;
      const OEInvTran* tran = row.tran;
      const OEDataObj* body = TransactionBody(kind);
      const OEDataObj* amounts =
          kind->GetType() == OE_TAG_INVBANKTRAN ? static_cast<OEInvBankTran*>(kind)->GetStatementTx() : body;
      line.assign(account);
      if (row.dated) AppendIsoDate(line, tran->GetDtTrade());
      line += ',';
      AppendCsv(line, TagName(kind->GetType()), raw);
      line += ',';
      securities.Append(line, static_cast<const OESecID*>(ChildOfType(body, OE_TAG_SECID)), raw);
      for (OETagID tag : {OE_TAG_UNITS, OE_TAG_UNITPRICE, OE_TAG_COMMISSION}) {
        line += ',';
        AppendKindElement(line, kind, body, tag);
      }
      line += ',';
      if (amounts) AppendElement(line, amounts, amounts == body ? OE_TAG_TOTAL : OE_TAG_TRNAMT);
      for (OETagID tag : {OE_TAG_SUBACCTSEC, OE_TAG_SUBACCTFUND, OE_TAG_SUBACCTFROM, OE_TAG_SUBACCTTO}) {
        line += ',';
        AppendKindElement(line, kind, body, tag);
      }
      line += ',';
      if (tran) AppendCsv(line, tran->GetFITId().c_str(), raw);
      line += ',';
      if (tran) AppendCsv(line, tran->GetMemo().c_str(), raw);
      line += '\n';
      std::fwrite(line.data(), 1, line.size(), stdout);
    }
  }
  return true;
}

int CmdPositions(int argc, char** argv) {
  Args args(argc, argv, 2);
  bool balances = args.Flag("balances");
  bool withAccount = args.Flag("account");
  bool raw = false;
  ParsedFile parsed;
  int rc;
  if (!ParseCommandFile("positions", kPositionsHelp, args, parsed, &raw, &rc)) return rc;
  std::vector<const OEInvStmtRs*> statements;
  Collect(parsed.file.get(), statements);
  Securities securities(parsed.file.get());
  const char* prefix = withAccount ? "account," : "";
  if (balances)
    std::printf("%sname,value,type,description,asof\n", prefix);
  else
    std::printf("%ssecurity,name,kind,units,unitprice,mktval,priceasof,postype,heldinacct\n", prefix);
  for (const OEInvStmtRs* rs : statements) {
    std::string account = withAccount ? CsvText(InvAccountName(*rs).c_str(), raw) + "," : "";
    if (balances) {
      const OEInvBal* bal = rs->GetInvBal();
      if (!bal) continue;
      for (OETagID tag : {OE_TAG_AVAILCASH, OE_TAG_MARGINBALANCE, OE_TAG_SHORTBALANCE, OE_TAG_BUYPOWER})
        if (bal->ValidateTag(tag))
          std::printf("%s%s,%s,DOLLAR,,\n", account.c_str(), TagName(tag), ElementText(bal, tag).c_str());
      const OEBalList* list = bal->GetBalList();
      for (unsigned short i = 0, n = list ? list->GetNumBalance() : 0; i < n; ++i) {
        const OEBalance* b = list->GetBalance(i);
        if (!b) continue;
        std::printf("%s%s,%s,%s,%s,%s\n", account.c_str(), CsvText(b->GetName().c_str(), raw).c_str(),
                    ElementText(b, OE_TAG_VALUE).c_str(), ElementText(b, OE_TAG_BALTYPE).c_str(),
                    CsvText(b->GetDescription().c_str(), raw).c_str(),
                    b->ValidateTag(OE_TAG_DTASOF) ? IsoDate(b->GetDateAsOf()).c_str() : "");
      }
      continue;
    }
    const OEInvPosList* list = rs->GetInvPosList();
    for (unsigned short i = 0, n = list ? list->GetNumberOfChildren() : 0; i < n; ++i) {
      const OEDataObj* kind = list->GetChild(i);
      const auto* pos = kind ? static_cast<const OEInvPos*>(ChildOfType(kind, OE_TAG_INVPOS)) : nullptr;
      if (!pos) continue;
      std::string security, name;
      securities.Describe(pos->GetSecID(), security, name);
      std::printf("%s%s,%s,%s,%s,%s,%s,%s,%s,%s\n", account.c_str(), CsvText(security.c_str(), raw).c_str(),
                  CsvText(name.c_str(), raw).c_str(), TagName(kind->GetType()), ElementText(pos, OE_TAG_UNITS).c_str(),
                  ElementText(pos, OE_TAG_UNITPRICE).c_str(), ElementText(pos, OE_TAG_MKTVAL).c_str(),
                  pos->ValidateTag(OE_TAG_DTPRICEASOF) ? IsoDate(pos->GetDtPriceAsOf()).c_str() : "",
                  ElementText(pos, OE_TAG_POSTYPE).c_str(), ElementText(pos, OE_TAG_HELDINACCT).c_str());
    }
  }
  if (statements.empty())
    std::fprintf(stderr, "ofxkit positions: no investment statement in the file\n");
  return ReportLosses("positions", parsed, rc);
}

}  // namespace cli
