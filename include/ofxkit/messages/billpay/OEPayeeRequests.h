// The payee list kept at the institution: adding, modifying and deleting
// payees ("PAYEETRNRQ") and the answers.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/billpay/OEPayment.h"

// A payee by name and address, the account it is paid into and the payer's
// account numbers with it (as many as the payer has).
#define OE_PAYEEBASE_FIELDS(X)                            \
  X(CHILD, Payee, PAYEE, OEPayee)                         \
  X(CHILD, BankAcctTo, BANKACCTTO, OEBankAccount)         \
  X(VALUES, PayAccount, PAYACCT, OEString32)

class OEPayeeBase : public OETransBase {
  OE_AGGREGATE(OEPayeeBase, OE_PAYEEBASE_FIELDS)
  using OETransBase::DeepCopyFrom;

  // For payers with one account at the payee: the first account number
  // (empty when there is none), and setting it.
  const OEString32& GetPayAccount() const;
  unsigned short SetPayAccount(const OEString& text) { return SetPayAccount(0, text); }
};

// A new payee: from the institution's standard list by id, or by address.
#define OE_PAYEERQ_FIELDS(X) X(TEXT, PayeeID, PAYEEID, OEString12)

class OEPayeeRq : public OEPayeeBase {
  OE_AGGREGATE(OEPayeeRq, OE_PAYEERQ_FIELDS)
  using OEPayeeBase::DeepCopyFrom;
};

// The payee as the institution lists it.
#define OE_PAYEERS_FIELDS(X)                              \
  X(CHILD, ExtendedPayee, EXTDPAYEE, OEExtendedPayee)     \
  OE_PAYEELSTID_FIELD(X)

class OEPayeeRs : public OEPayeeBase {
  OE_AGGREGATE(OEPayeeRs, OE_PAYEERS_FIELDS)
  using OEPayeeBase::DeepCopyFrom;
};

class OEPayeeModifyRq : public OEPayeeBase {
  OE_AGGREGATE(OEPayeeModifyRq, OE_PAYEELSTID_FIELD)
  using OEPayeeBase::DeepCopyFrom;
};

class OEPayeeModifyRs : public OEPayeeBase {
  OE_AGGREGATE(OEPayeeModifyRs, OE_PAYEERS_FIELDS)
  using OEPayeeBase::DeepCopyFrom;
};

class OEPayeeDeleteBase : public OETransBase {
  OE_AGGREGATE(OEPayeeDeleteBase, OE_PAYEELSTID_FIELD)
  using OETransBase::DeepCopyFrom;
};

class OEPayeeDeleteRq : public OEPayeeDeleteBase {
  OE_AGGREGATE(OEPayeeDeleteRq, OE_NO_FIELDS)
  using OEPayeeDeleteBase::DeepCopyFrom;
};

class OEPayeeDeleteRs : public OEPayeeDeleteBase {
  OE_AGGREGATE(OEPayeeDeleteRs, OE_NO_FIELDS)
  using OEPayeeDeleteBase::DeepCopyFrom;
};
