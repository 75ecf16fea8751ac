// Wire transfers ("WIRERQ", in the wire message set): to a beneficiary's
// account at another bank.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/billpay/OEPayee.h"
#include "ofxkit/messages/billpay/OEPayment.h"

// A bank outside the institution ("EXTBANKDESC"): name, routing id, address.
#define OE_EXTBANKDESC_FIELDS(X)                 \
  X(TEXT, Name, NAME, OEString32)                \
  X(TEXT, BankID, BANKID, OEString9)             \
  OE_ADDRESS_FIELDS(X)                           \
  X(TEXT, Phone, PHONE, OEString32)

class OEExtBankDesc : public OEAggregate {
  OE_AGGREGATE(OEExtBankDesc, OE_EXTBANKDESC_FIELDS)
};

#define OE_WIREBENEFICIARY_FIELDS(X)                      \
  X(CHILD, BankAcctTo, BANKACCTTO, OEBankAccount)         \
  X(TEXT, Name, NAME, OEString32)                         \
  X(TEXT, Memo, MEMO, OEString255)

class OEWireBeneficiary : public OEAggregate {
  OE_AGGREGATE(OEWireBeneficiary, OE_WIREBENEFICIARY_FIELDS)
};

#define OE_WIREDESTINATIONBANK_FIELDS(X) X(CHILD, ExtBankDesc, EXTBANKDESC, OEExtBankDesc)

class OEWireDestinationBank : public OEAggregate {
  OE_AGGREGATE(OEWireDestinationBank, OE_WIREDESTINATIONBANK_FIELDS)
};

#define OE_WIRE_FIELDS(X)                                                \
  X(CHILD, BankAcctFrom, BANKACCTFROM, OEBankAccount)                    \
  X(CHILD, WireBeneficiary, WIREBENEFICIARY, OEWireBeneficiary)          \
  X(CHILD, WireDestinationBank, WIREDESTBANK, OEWireDestinationBank)     \
  X(VALUE, TranAmount, TRNAMT, OEPrecisionInteger)                       \
  X(VALUE, DateDue, DTDUE, OEDateTime)                                   \
  X(TEXT, PayInstruct, PAYINSTRUCT, OEString255)

class OEWireRq : public OETransBase {
  OE_AGGREGATE(OEWireRq, OE_WIRE_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_WIRERS_FIELDS(X)                                      \
  OE_WIRE_FIELDS(X) OE_CURDEF_FIELD(X) OE_SRVRTID_FIELD(X)       \
  X(VALUE, DateTimeXferProjected, DTXFERPRJ, OEDateTime)         \
  X(VALUE, DateTimePosted, DTPOSTED, OEDateTime)                 \
  X(VALUE, Fee, FEE, OEPrecisionInteger)                         \
  X(TEXT, ConfirmationMessage, CONFMSG, OEString255)

class OEWireRs : public OETransBase {
  OE_AGGREGATE(OEWireRs, OE_WIRERS_FIELDS)
  using OETransBase::DeepCopyFrom;
};
