// Stopping payment of cheques ("STPCHKRQ", answered by "STPCHKRS"): by a range
// of cheque numbers or by the description of one cheque.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/bank/OECurrency.h"

#define OE_CHECKRANGE_FIELDS(X)                          \
  X(TEXT, CheckNumberStart, CHKNUMSTART, OEString12)     \
  X(TEXT, CheckNumberEnd, CHKNUMEND, OEString12)

class OECheckRange : public OEAggregate {
  OE_AGGREGATE(OECheckRange, OE_CHECKRANGE_FIELDS)
};

// A cheque as its writer knows it: payee, number, date and amount.
#define OE_CHECK_FIELDS(X)                                   \
  X(TEXT, CheckNumber, CHEQUENUM, OEString12)                \
  X(TEXT, Name, NAME, OEString32)                            \
  X(VALUE, DateTimeUser, DTUSER, OEDateTime)                 \
  X(VALUE, TransactionAmount, TRNAMT, OEPrecisionInteger)

class OECheckDescription : public OEAggregate {
  OE_AGGREGATE(OECheckDescription, OE_CHECK_FIELDS)
};

// One cheque whose payment was stopped, with the bank's status number
// (as the bank sent it: the library gives it no meaning) and error text.
#define OE_STOPCHECKNUMBER_FIELDS(X)                         \
  X(CHILD, Currency, CURRENCY, OECurrency)                   \
  X(ALSO, Currency, ORIGCURRENCY, OECurrency)                \
  OE_CHECK_FIELDS(X)                                         \
  X(VALUE, Status, CHKSTATUS, unsigned short)                \
  X(TEXT, CheckError, CHKERROR, OEString255)

class OEStopCheckNumber : public OEAggregate {
  OE_AGGREGATE(OEStopCheckNumber, OE_STOPCHECKNUMBER_FIELDS)
};

#define OE_STOPCHECKRQ_FIELDS(X)                                 \
  X(CHILD, BankAccountFrom, BANKACCTFROM, OEBankAccount)         \
  X(CHILD, CheckRange, CHKRANGE, OECheckRange)                   \
  X(CHILD, CheckDescription, CHKDESC, OECheckDescription)

class OEStopCheckRq : public OETransBase {
  OE_AGGREGATE(OEStopCheckRq, OE_STOPCHECKRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_STOPCHECKRS_FIELDS(X)                                 \
  X(CHILD, BankAccountFrom, BANKACCTFROM, OEBankAccount)         \
  X(LIST, StopCheckNumber, STPCHKNUM, OEStopCheckNumber)         \
  X(TEXT, CurrencyDefault, CURDEF, OEString3)                    \
  X(VALUE, Fee, FEE, OEPrecisionInteger)                         \
  X(TEXT, FeeMessage, FEEMSG, OEString80)

class OEStopCheckRs : public OETransBase {
  OE_AGGREGATE(OEStopCheckRs, OE_STOPCHECKRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};
