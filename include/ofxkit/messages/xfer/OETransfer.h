// Transfers between accounts: intrabank ("INTRARQ", in the bank message set)
// and interbank ("INTERRQ"), single and recurring, with their modifications
// and cancellations. Both kinds share one family of classes and differ only
// in their tags (and the interbank answer's reference number).
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/billpay/OEPayment.h"

// What moves: from one bank or card account to another, how much, and when.
// Each account kind has its own field, so that a document naming two sources
// keeps both (and fails the rules) rather than losing one.
#define OE_XFERINFO_FIELDS(X)                             \
  X(CHILD, BankAcctFrom, BANKACCTFROM, OEBankAccount)     \
  X(CHILD, BankAcctTo, BANKACCTTO, OEBankAccount)         \
  X(CHILD, CCAcctFrom, CCACCTFROM, OECCAccount)           \
  X(CHILD, CCAcctTo, CCACCTTO, OECCAccount)               \
  X(VALUE, TranAmount, TRNAMT, OEPrecisionInteger)        \
  X(VALUE, DateDue, DTDUE, OEDateTime)

class OEXferInfo : public OEAggregate {
  OE_AGGREGATE(OEXferInfo, OE_XFERINFO_FIELDS)

  // The source and destination, whichever kind they are (the bank account
  // when, against the rules, both kinds are held); null when absent.
  OEBankOrCCAccount* GetAccountFrom() const;
  OEBankOrCCAccount* GetAccountTo() const;
  // Stores a bank or card account as the source or destination, by its
  // class; 0 (and the account stays the caller's) when the place is taken.
  unsigned short SetAccountFrom(OEBankOrCCAccount* account);
  unsigned short SetAccountTo(OEBankOrCCAccount* account);
};

#define OE_XFERPROCESSINGSTATUS_FIELDS(X)                  \
  X(VALUE, ProcessingCode, XFERPRCCODE, OEProcCode)        \
  X(VALUE, DateTimeProcessed, DTXFERPRC, OEDateTime)

// Where a transfer stands ("XFERPRCSTS").
class OEXferProcessingStatus : public OEAggregate {
  OE_AGGREGATE(OEXferProcessingStatus, OE_XFERPROCESSINGSTATUS_FIELDS)
};

#define OE_XFERINFO_FIELD(X) X(CHILD, XferInfo, XFERINFO, OEXferInfo)
#define OE_XFERPRCSTS_FIELD(X) X(CHILD, XferProcessingStatus, XFERPRCSTS, OEXferProcessingStatus)

class OETransferRq : public OETransBase {
  OE_AGGREGATE(OETransferRq, OE_XFERINFO_FIELD)
  using OETransBase::DeepCopyFrom;
};

class OEIntraRq : public OETransferRq {
  OE_AGGREGATE(OEIntraRq, OE_NO_FIELDS)
  using OETransferRq::DeepCopyFrom;
};

class OEInterRq : public OETransferRq {
  OE_AGGREGATE(OEInterRq, OE_NO_FIELDS)
  using OETransferRq::DeepCopyFrom;
};

#define OE_TRANSFERRS_FIELDS(X)                                    \
  OE_XFERINFO_FIELD(X) OE_CURDEF_FIELD(X) OE_SRVRTID_FIELD(X)      \
  X(VALUE, DateTimeXferProjected, DTXFERPRJ, OEDateTime)           \
  X(VALUE, DateTimePosted, DTPOSTED, OEDateTime)                   \
  OE_RECSRVRTID_FIELD(X) OE_XFERPRCSTS_FIELD(X)

class OETransferRs : public OETransBase {
  OE_AGGREGATE(OETransferRs, OE_TRANSFERRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OEIntraRs : public OETransferRs {
  OE_AGGREGATE(OEIntraRs, OE_NO_FIELDS)
  using OETransferRs::DeepCopyFrom;
};

// The interbank answer also carries the institution's reference number.
#define OE_INTERRS_FIELDS(X) X(TEXT, RefrenceNumber, REFNUM, OEString32)

class OEInterRs : public OETransferRs {
  OE_AGGREGATE(OEInterRs, OE_INTERRS_FIELDS)
  using OETransferRs::DeepCopyFrom;
};

#define OE_TRANSFERMODIFYRQ_FIELDS(X) OE_XFERINFO_FIELD(X) OE_SRVRTID_FIELD(X)

class OETransferModifyRq : public OETransBase {
  OE_AGGREGATE(OETransferModifyRq, OE_TRANSFERMODIFYRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OEIntraModifyRq : public OETransferModifyRq {
  OE_AGGREGATE(OEIntraModifyRq, OE_NO_FIELDS)
  using OETransferModifyRq::DeepCopyFrom;
};

class OEInterModifyRq : public OETransferModifyRq {
  OE_AGGREGATE(OEInterModifyRq, OE_NO_FIELDS)
  using OETransferModifyRq::DeepCopyFrom;
};

#define OE_TRANSFERMODIFYRS_FIELDS(X) OE_XFERINFO_FIELD(X) OE_XFERPRCSTS_FIELD(X) OE_SRVRTID_FIELD(X)

class OETransferModifyRs : public OETransBase {
  OE_AGGREGATE(OETransferModifyRs, OE_TRANSFERMODIFYRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OEIntraModifyRs : public OETransferModifyRs {
  OE_AGGREGATE(OEIntraModifyRs, OE_NO_FIELDS)
  using OETransferModifyRs::DeepCopyFrom;
};

class OEInterModifyRs : public OETransferModifyRs {
  OE_AGGREGATE(OEInterModifyRs, OE_NO_FIELDS)
  using OETransferModifyRs::DeepCopyFrom;
};

// Cancelling a transfer or a wire names it by its server id.
class OETransferCancel : public OETransBase {
  OE_AGGREGATE(OETransferCancel, OE_SRVRTID_FIELD)
  using OETransBase::DeepCopyFrom;
};

#define OE_TRANSFERCANCEL_CLASS(Class)               \
  class Class : public OETransferCancel {            \
    OE_AGGREGATE(Class, OE_NO_FIELDS)                \
    using OETransferCancel::DeepCopyFrom;            \
  };
OE_TRANSFERCANCEL_CLASS(OEIntraCancelRq)
OE_TRANSFERCANCEL_CLASS(OEIntraCancelRs)
OE_TRANSFERCANCEL_CLASS(OEInterCancelRq)
OE_TRANSFERCANCEL_CLASS(OEInterCancelRs)
OE_TRANSFERCANCEL_CLASS(OEWireCancelRq)
OE_TRANSFERCANCEL_CLASS(OEWireCancelRs)
#undef OE_TRANSFERCANCEL_CLASS

// Cancelling a recurring transfer: its model's id, and whether the transfers
// already scheduled are cancelled too.
class OERecTransferCancel : public OETransBase {
  OE_AGGREGATE(OERecTransferCancel, OE_RECCANCEL_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_RECTRANSFERCANCEL_CLASS(Class)            \
  class Class : public OERecTransferCancel {         \
    OE_AGGREGATE(Class, OE_NO_FIELDS)                \
    using OERecTransferCancel::DeepCopyFrom;         \
  };
OE_RECTRANSFERCANCEL_CLASS(OERecIntraCancelRq)
OE_RECTRANSFERCANCEL_CLASS(OERecIntraCancelRs)
OE_RECTRANSFERCANCEL_CLASS(OERecInterCancelRq)
OE_RECTRANSFERCANCEL_CLASS(OERecInterCancelRs)
#undef OE_RECTRANSFERCANCEL_CLASS

// Recurring transfers: the instructions and the transfer they repeat.
#define OE_RECINTRARQ_FIELDS(X) OE_RECURRINST_FIELD(X) X(CHILD, IntraRq, INTRARQ, OEIntraRq)
#define OE_RECINTRARS_FIELDS(X) \
  OE_RECURRINST_FIELD(X) X(CHILD, IntraRs, INTRARS, OEIntraRs) OE_RECSRVRTID_FIELD(X)
#define OE_RECINTRAMODIFYRQ_FIELDS(X) OE_RECINTRARQ_FIELDS(X) OE_RECSRVRTID_FIELD(X) OE_MODPENDING_FIELD(X)
#define OE_RECINTRAMODIFYRS_FIELDS(X) OE_RECINTRARS_FIELDS(X) OE_MODPENDING_FIELD(X)
#define OE_RECINTERRQ_FIELDS(X) OE_RECURRINST_FIELD(X) X(CHILD, InterRq, INTERRQ, OEInterRq)
#define OE_RECINTERRS_FIELDS(X) \
  OE_RECURRINST_FIELD(X) X(CHILD, InterRs, INTERRS, OEInterRs) OE_RECSRVRTID_FIELD(X)
#define OE_RECINTERMODIFYRQ_FIELDS(X) OE_RECINTERRQ_FIELDS(X) OE_RECSRVRTID_FIELD(X) OE_MODPENDING_FIELD(X)
#define OE_RECINTERMODIFYRS_FIELDS(X) OE_RECINTERRS_FIELDS(X) OE_MODPENDING_FIELD(X)

class OERecIntraRq : public OETransBase {
  OE_AGGREGATE(OERecIntraRq, OE_RECINTRARQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};
class OERecIntraRs : public OETransBase {
  OE_AGGREGATE(OERecIntraRs, OE_RECINTRARS_FIELDS)
  using OETransBase::DeepCopyFrom;
};
class OERecIntraModifyRq : public OETransBase {
  OE_AGGREGATE(OERecIntraModifyRq, OE_RECINTRAMODIFYRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};
class OERecIntraModifyRs : public OETransBase {
  OE_AGGREGATE(OERecIntraModifyRs, OE_RECINTRAMODIFYRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};
class OERecInterRq : public OETransBase {
  OE_AGGREGATE(OERecInterRq, OE_RECINTERRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};
class OERecInterRs : public OETransBase {
  OE_AGGREGATE(OERecInterRs, OE_RECINTERRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};
class OERecInterModifyRq : public OETransBase {
  OE_AGGREGATE(OERecInterModifyRq, OE_RECINTERMODIFYRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};
class OERecInterModifyRs : public OETransBase {
  OE_AGGREGATE(OERecInterModifyRs, OE_RECINTERMODIFYRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};
