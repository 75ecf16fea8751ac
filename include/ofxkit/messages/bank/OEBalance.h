// Balances: the ledger and available balances of a statement ("LEDGERBAL",
// "AVAILBAL") and the named balances of an account ("BAL").
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/bank/OECurrency.h"

#define OE_BANKBALANCE_FIELDS(X)                            \
  X(VALUE, BalanceAmount, BALAMT, OEPrecisionInteger)       \
  X(VALUE, DateAsOf, DTASOF, OEDateTime)

// An amount as of a date; the subclasses tell which balance it is.
class OEBankBalance : public OEAggregate {
  OE_AGGREGATE(OEBankBalance, OE_BANKBALANCE_FIELDS)
};

class OELedgerBalance : public OEBankBalance {
  OE_AGGREGATE(OELedgerBalance, OE_NO_FIELDS)
  using OEBankBalance::DeepCopyFrom;
};

class OEAvailableBalance : public OEBankBalance {
  OE_AGGREGATE(OEAvailableBalance, OE_NO_FIELDS)
  using OEBankBalance::DeepCopyFrom;
};

#define OE_BALANCE_FIELDS(X)                                \
  X(VALUE, DateAsOf, DTASOF, OEDateTime)                    \
  X(VALUE, Value, VALUE, OEPrecisionInteger)                \
  X(VALUE, BalanceType, BALTYPE, OEBalType)                 \
  X(CHILD, Currency, CURRENCY, OECurrency)                  \
  X(TEXT, Name, NAME, OEString32)                           \
  X(TEXT, Description, DESC, OEString80)

// A named balance: a dollar amount, a percentage or a number, with its
// description and, when it is not in the default currency, its currency.
class OEBalance : public OEAggregate {
  OE_AGGREGATE(OEBalance, OE_BALANCE_FIELDS)
};
