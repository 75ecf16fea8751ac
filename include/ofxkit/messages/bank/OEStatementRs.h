// Statement download responses: "STMTRS" for a bank account, "CCSTMTRS" for
// a credit-card account.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/bank/OEBalance.h"
#include "ofxkit/messages/bank/OEBankTransactionList.h"

#define OE_GENERICSTATEMENTRS_FIELDS(X)                                 \
  X(CHILD, AccountFrom, BANKACCTFROM, OEBankOrCCAccount)                \
  X(ALSO, AccountFrom, CCACCTFROM, OEBankOrCCAccount)                   \
  X(CHILD, BankTransactionList, BANKTRANLIST, OEBankTransactionList)    \
  X(CHILD, LedgerBalance, LEDGERBAL, OELedgerBalance)                   \
  X(CHILD, AvailableBalance, AVAILBAL, OEAvailableBalance)              \
  X(TEXT, CurrencyDefault, CURDEF, OEString3)                           \
  X(TEXT, MarketingInfo, MKTGINFO, OEString360)

// The family base: account, transactions, balances, default currency and
// marketing text. Both responses write the default currency first, then the
// account, the transaction list, the ledger and available balances and the
// marketing text, whatever order they were read in.
class OEGenericStatementRs : public OETransBase {
  OE_AGGREGATE(OEGenericStatementRs, OE_GENERICSTATEMENTRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OEBankStatementRs : public OEGenericStatementRs {
  OE_AGGREGATE(OEBankStatementRs, OE_NO_FIELDS)
  using OEGenericStatementRs::DeepCopyFrom;
};

class OECCStatementRs : public OEGenericStatementRs {
  OE_AGGREGATE(OECCStatementRs, OE_NO_FIELDS)
  using OEGenericStatementRs::DeepCopyFrom;
};
