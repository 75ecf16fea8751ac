// Brokerage requests of `ofxkit request statement --type INVESTMENT`.
#include <cstdio>
#include <string>

#include "cli.h"

namespace cli {
namespace {

bool Fail(const std::string& message) {
  std::fprintf(stderr, "ofxkit request: %s\n", message.c_str());
  return false;
}

// One SECRQ: by ticker, or by identifier when the text is TYPE:ID.
OESecRq* SecurityRequest(const std::string& spec) {
  OESecRq* rq = new OESecRq();
  size_t colon = spec.find(':');
  if (colon == std::string::npos) {
    rq->SetTicker(spec.c_str());
    return rq;
  }
  OESecID* id = new OESecID();
  id->SetUniqueIDType(spec.substr(0, colon).c_str());
  id->SetUniqueID(spec.substr(colon + 1).c_str());
  rq->SetSecID(id);
  return rq;
}

}  // namespace

// A message set of the request holding one transaction wrapper around inner.
void AppendWrapped(OERequest& request, OETagID setType, OETagID wrapperType, OETagID innerTag, OETransBase* inner) {
  OEMessageSetRq* set = new OEMessageSetRq();
  set->SetType(setType);
  request.AppendMessageSet(set);
  OETransRq* wrapper = new OETransRq();
  wrapper->SetType(wrapperType);
  set->AppendTrans(wrapper);
  char trnuid[OEUtility::kTransactionIDLength + 1];
  OEUtility::GenerateTransactionID(trnuid);
  wrapper->SetTransUserID(trnuid);
  wrapper->SetActualTrans(inner);
  wrapper->SetTag(innerTag);
}

bool AppendInvestmentRequest(const StatementRequestOptions& o, OERequest& request) {
  if (o.brokerId.empty()) return Fail("--broker-id is needed for a brokerage account");
  OEInvStmtRq* statement = new OEInvStmtRq();
  OEInvAcctFrom* account = new OEInvAcctFrom();
  account->SetBrokerID(o.brokerId.c_str());
  account->SetAccountID(o.account.c_str());
  statement->SetInvAcctFrom(account);
  OEIncTransaction* include = new OEIncTransaction();
  statement->SetIncTransaction(include);
  if ((!o.start.empty() && !include->SetDtStart(OEString(o.start.c_str()))) ||
      (!o.end.empty() && !include->SetDtEnd(OEString(o.end.c_str())))) {
    delete statement;
    return Fail("--start and --end must be OFX dates (YYYYMMDD)");
  }
  include->SetInclude(1);
  statement->SetIncludeOpenOrders(o.openOrders);
  OEIncPos* positions = new OEIncPos();
  positions->SetInclude(o.positions);
  statement->SetIncPos(positions);
  statement->SetIncludeBalance(o.balance);
  AppendWrapped(request, OE_TAG_INVSTMTMSGSRQV1, OE_TAG_INVSTMTTRNRQ, OE_TAG_INVSTMTRQ, statement);

  if (o.securities.empty()) return true;
  OESecListRq* list = new OESecListRq();
  size_t start = 0;
  while (start <= o.securities.size()) {
    size_t comma = o.securities.find(',', start);
    std::string spec = o.securities.substr(start, comma == std::string::npos ? std::string::npos : comma - start);
    if (!spec.empty()) list->AppendSecRq(SecurityRequest(spec));
    if (comma == std::string::npos) break;
    start = comma + 1;
  }
  if (list->GetNumSecRq() == 0) {
    delete list;
    return Fail("--securities names no security");
  }
  AppendWrapped(request, OE_TAG_SECLISTMSGSRQV1, OE_TAG_SECLISTTRNRQ, OE_TAG_SECLISTRQ, list);
  return true;
}

}  // namespace cli
