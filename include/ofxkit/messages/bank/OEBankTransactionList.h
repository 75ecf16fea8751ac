// The transactions of a bank or credit-card statement: the list
// ("BANKTRANLIST") and one transaction ("STMTTRN").
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/bank/OECurrency.h"
#include "ofxkit/messages/billpay/OEPayee.h"

// The currency stands as "CURRENCY" or "ORIGCURRENCY" and the account as
// "BANKACCTTO" or "CCACCTTO"; each is written back under the tag it came
// with (its type).
#define OE_BANKSTATEMENTTX_FIELDS(X)                          \
  X(VALUE, DateTimePosted, DTPOSTED, OEDateTime)              \
  X(VALUE, DateTimeUser, DTUSER, OEDateTime)                  \
  X(VALUE, DateTimeAvailable, DTAVAIL, OEDateTime)            \
  X(VALUE, TxAmount, TRNAMT, OEPrecisionInteger)              \
  X(VALUE, TxType, TRNTYPE, OEBankTxType)                     \
  X(CHILD, Currency, CURRENCY, OECurrency)                    \
  X(ALSO, Currency, ORIGCURRENCY, OECurrency)                 \
  X(TEXT, FITId, FITID, OEString255)                          \
  X(TEXT, CorrectedFITId, CORRECTFITID, OEString255)          \
  X(TEXT, ServerTxId, SRVRTID, OEString36)                    \
  X(TEXT, CheckNum, CHEQUENUM, OEString12)                    \
  X(TEXT, ReferenceNum, REFNUM, OEString32)                    \
  X(TEXT, PayeeId, PAYEEID, OEString12)                       \
  X(VALUE, CorrectAction, CORRECTACTION, OEBankAction)        \
  X(TEXT, Name, NAME, OEString32)                             \
  X(TEXT, Memo, MEMO, OEString255)                            \
  X(CHILD, Payee, PAYEE, OEPayee)                             \
  X(TEXT, SIC, SIC, OEString6)                                \
  X(CHILD, AccountTo, BANKACCTTO, OEBankOrCCAccount)          \
  X(ALSO, AccountTo, CCACCTTO, OEBankOrCCAccount)

class OEBankStatementTx : public OEAggregate {
  OE_AGGREGATE(OEBankStatementTx, OE_BANKSTATEMENTTX_FIELDS)

  // Besides the required tags, a transaction names its payee by "NAME" or
  // by "PAYEE" and its destination by "BANKACCTTO" or "CCACCTTO", never
  // both of a pair (AllRequiredPresent). The missing-tag walk names, after
  // the absent required tags, both tags of each pair of which neither is
  // present: "NAME", "PAYEE", "BANKACCTTO", "CCACCTTO", then 0.
  OETagID GetFirstMissingRequiredTag(OETagID after) const override;
};

#define OE_BANKTRANSACTIONLIST_FIELDS(X)                      \
  X(VALUE, StartDateTime, DTSTART, OEDateTime)                \
  X(VALUE, EndDateTime, DTEND, OEDateTime)                    \
  X(LIST, StatementTx, STMTTRN, OEBankStatementTx)

class OEBankTransactionList : public OEAggregate {
  OE_AGGREGATE(OEBankTransactionList, OE_BANKTRANSACTIONLIST_FIELDS)
};
