#include "ofxkit/messages/bank/OEBalance.h"

// The ledger and available balances are bank balances under their own tags.
#define OE_BANKBALANCE_TAGS .Valid(OE_TAGS(BALAMT, DTASOF)).Required(OE_TAGS(BALAMT, DTASOF))
OE_DEFINE_AGGREGATE(OEBankBalance, OEAggregate, OE_BANKBALANCE_FIELDS, NONE, OE_BANKBALANCE_TAGS)
OE_DEFINE_AGGREGATE(OELedgerBalance, OEBankBalance, OE_NO_FIELDS, LEDGERBAL, OE_BANKBALANCE_TAGS)
OE_DEFINE_AGGREGATE(OEAvailableBalance, OEBankBalance, OE_NO_FIELDS, AVAILBAL, OE_BANKBALANCE_TAGS)
#undef OE_BANKBALANCE_TAGS

OE_DEFINE_AGGREGATE(OEBalance, OEAggregate, OE_BALANCE_FIELDS, BAL,
                    .Valid(OE_TAGS(VALUE, NAME, DTASOF, BALTYPE, DESC, LEDGERBAL, AVAILBAL, BAL, CURRENCY))
                    .Required(OE_TAGS(VALUE, NAME, BALTYPE, DESC)))
