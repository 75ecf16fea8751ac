// Closing information of past statement periods: "STMTENDRQ" for a bank
// account and "CCSTMTENDRQ" for a card account, answered with one "CLOSING"
// or "CCCLOSING" per closed period.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/bank/OECurrency.h"

// What every closed period tells: its currency, id, dates and balances.
#define OE_CLOSING_PERIOD_FIELDS(X)                               \
  X(CHILD, Currency, CURRENCY, OECurrency)                        \
  X(ALSO, Currency, ORIGCURRENCY, OECurrency)                     \
  X(TEXT, FITId, FITID, OEString255)                              \
  X(VALUE, DateTimeOpen, DTOPEN, OEDateTime)                      \
  X(VALUE, DateTimeClose, DTCLOSE, OEDateTime)                    \
  X(VALUE, DateTimeNext, DTNEXT, OEDateTime)                      \
  X(VALUE, BalanceOpen, BALOPEN, OEPrecisionInteger)              \
  X(VALUE, BalanceClose, BALCLOSE, OEPrecisionInteger)            \
  X(VALUE, DateTimePostStart, DTPOSTSTART, OEDateTime)            \
  X(VALUE, DateTimePostEnd, DTPOSTEND, OEDateTime)                \
  X(TEXT, MarketingInfo, MKTGINFO, OEString360)

#define OE_CLOSING_FIELDS(X)                                      \
  OE_CLOSING_PERIOD_FIELDS(X)                                     \
  X(VALUE, MinimumBalance, BALMIN, OEPrecisionInteger)            \
  X(VALUE, DepositAndCredit, DEPANDCREDIT, OEPrecisionInteger)    \
  X(VALUE, CheckAndDebit, CHKANDDEB, OEPrecisionInteger)          \
  X(VALUE, TotalFees, TOTALFEES, OEPrecisionInteger)              \
  X(VALUE, TotalInterest, TOTALINT, OEPrecisionInteger)

class OEClosing : public OEAggregate {
  OE_AGGREGATE(OEClosing, OE_CLOSING_FIELDS)
};

#define OE_CCCLOSING_FIELDS(X)                                    \
  OE_CLOSING_PERIOD_FIELDS(X)                                     \
  X(VALUE, DateTimePaymentDue, DTPMTDUE, OEDateTime)              \
  X(VALUE, MinimumPaymentDue, MINPMTDUE, OEPrecisionInteger)      \
  X(VALUE, FinanceCharge, FINCHG, OEPrecisionInteger)             \
  X(VALUE, PaymentAndCredit, PAYANDCREDIT, OEPrecisionInteger)    \
  X(VALUE, PurchaseAndAdvance, PURANDADV, OEPrecisionInteger)     \
  X(VALUE, DebitAdjustment, DEBADJ, OEPrecisionInteger)           \
  X(VALUE, CreditLimit, CREDITLIMIT, OEPrecisionInteger)

class OECCClosing : public OEAggregate {
  OE_AGGREGATE(OECCClosing, OE_CCCLOSING_FIELDS)
};

#define OE_STATEMENTEND_PERIOD_FIELDS(X)            \
  X(VALUE, DateTimeStart, DTSTART, OEDateTime)      \
  X(VALUE, DateTimeEnd, DTEND, OEDateTime)

#define OE_STATEMENTENDRQ_FIELDS(X) \
  X(CHILD, AccountFrom, BANKACCTFROM, OEAccount) OE_STATEMENTEND_PERIOD_FIELDS(X)

class OEStatementEndRq : public OETransBase {
  OE_AGGREGATE(OEStatementEndRq, OE_STATEMENTENDRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
  OEAccount* GetAcctFrom() const { return GetAccountFrom(); }
};

#define OE_CCSTATEMENTENDRQ_FIELDS(X) \
  X(CHILD, CCAccountFrom, CCACCTFROM, OECCAccount) OE_STATEMENTEND_PERIOD_FIELDS(X)

class OECCStatementEndRq : public OETransBase {
  OE_AGGREGATE(OECCStatementEndRq, OE_CCSTATEMENTENDRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_STATEMENTENDRS_FIELDS(X)                       \
  X(CHILD, AccountFrom, BANKACCTFROM, OEAccount)          \
  X(LIST, Closing, CLOSING, OEClosing)                    \
  X(TEXT, CurrencyDefault, CURDEF, OEString3)

class OEStatementEndRs : public OETransBase {
  OE_AGGREGATE(OEStatementEndRs, OE_STATEMENTENDRS_FIELDS)
  using OETransBase::DeepCopyFrom;
  unsigned short GetNumOfClosing() const { return GetNumClosing(); }
  // Hands closing i back to the caller without deleting it; null when there
  // is none.
  OEClosing* DisconnectClosing(unsigned short index);
};

#define OE_CCSTATEMENTENDRS_FIELDS(X)                     \
  X(CHILD, AccountFrom, CCACCTFROM, OECCAccount)          \
  X(LIST, CCClosing, CCCLOSING, OECCClosing)              \
  X(TEXT, CurrencyDefault, CURDEF, OEString3)

class OECCStatementEndRs : public OETransBase {
  OE_AGGREGATE(OECCStatementEndRs, OE_CCSTATEMENTENDRS_FIELDS)
  using OETransBase::DeepCopyFrom;
  unsigned short GetNumOfCCClosing() const { return GetNumCCClosing(); }
  OECCClosing* DisconnectCCClosing(unsigned short index);
};
