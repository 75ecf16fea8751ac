// Statement download requests: "STMTRQ" for a bank account, "CCSTMTRQ" for
// a credit-card account, each with the transactions to include.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"

#define OE_INCTRANSACTION_FIELDS(X)                  \
  X(VALUE, DtStart, DTSTART, OEDateTime)             \
  X(VALUE, DtEnd, DTEND, OEDateTime)                 \
  X(FLAG, Include, INCLUDE, unsigned short)

// Which transactions a statement should carry ("INCTRAN"): whether any, and
// of which period.
class OEIncTransaction : public OEAggregate {
  OE_AGGREGATE(OEIncTransaction, OE_INCTRANSACTION_FIELDS)
};

#define OE_GENERICSTATEMENTRQ_FIELDS(X)                          \
  X(CHILD, AccountFrom, BANKACCTFROM, OEBankOrCCAccount)         \
  X(ALSO, AccountFrom, CCACCTFROM, OEBankOrCCAccount)            \
  X(CHILD, IncTransaction, INCTRAN, OEIncTransaction)

// The family base: the account (its type tells "BANKACCTFROM" from
// "CCACCTFROM") and the included transactions.
class OEGenericStatementRq : public OETransBase {
  OE_AGGREGATE(OEGenericStatementRq, OE_GENERICSTATEMENTRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OEBankStatementRq : public OEGenericStatementRq {
  OE_AGGREGATE(OEBankStatementRq, OE_NO_FIELDS)
  using OEGenericStatementRq::DeepCopyFrom;
};

class OECCStatementRq : public OEGenericStatementRq {
  OE_AGGREGATE(OECCStatementRq, OE_NO_FIELDS)
  using OEGenericStatementRq::DeepCopyFrom;
};
