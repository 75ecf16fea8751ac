// The account aggregates: bank, credit-card and investment accounts, each
// standing as the account an operation is from or to.
#pragma once

#include "ofxkit/core/OEAggregate.h"

#define OE_ACCOUNT_FIELDS(X) X(TEXT, AccountID, ACCTID, OEString22)

class OEAccount : public OEAggregate {
  OE_AGGREGATE(OEAccount, OE_ACCOUNT_FIELDS)

  // A new account of the class that stands under the tag ("BANKACCTFROM",
  // "CCACCTFROM", "INVACCTFROM" and their ...TO forms), made through the
  // factory and given the tag as its type; null for any other tag.
  static OEAccount* NewAcctFrom(OETagID tag);
  static OEAccount* NewAcctTo(OETagID tag);
  static OEAccount* NewAcct(OETagID tag);
  // Copies from into *to, making *to (as NewAcct does, for from's type) when
  // it is null; with from null, deletes *to and leaves it null.
  static unsigned short DeepCopyTo(const OEAccount* from, OEAccount** to);
};

#define OE_BANKORCCACCOUNT_FIELDS(X) X(TEXT, AccountKey, ACCTKEY, OEString22)

class OEBankOrCCAccount : public OEAccount {
  OE_AGGREGATE(OEBankOrCCAccount, OE_BANKORCCACCOUNT_FIELDS)

  // As OEAccount's creators, for the bank and credit-card tags only.
  static OEBankOrCCAccount* NewAcctFrom(OETagID tag);
  static OEBankOrCCAccount* NewAcctTo(OETagID tag);
  static OEBankOrCCAccount* NewAcct(OETagID tag);
  static unsigned short DeepCopyTo(const OEBankOrCCAccount* from, OEBankOrCCAccount** to);
};

#define OE_BANKACCOUNT_FIELDS(X)          \
  X(TEXT, BankID, BANKID, OEString9)      \
  X(TEXT, BranchID, BRANCHID, OEString22) \
  X(VALUE, AccountType, ACCTTYPE, OEBankAccountType)

class OEBankAccount : public OEBankOrCCAccount {
  OE_AGGREGATE(OEBankAccount, OE_BANKACCOUNT_FIELDS)
};

class OECCAccount : public OEBankOrCCAccount {
  OE_AGGREGATE(OECCAccount, OE_NO_FIELDS)
};

#define OE_INVACCTFROM_FIELDS(X) X(TEXT, BrokerID, BROKERID, OEString22)

class OEInvAcctFrom : public OEAccount {
  OE_AGGREGATE(OEInvAcctFrom, OE_INVACCTFROM_FIELDS)
};

// Children declared as a family base are made by the tag they stand under.
template <>
struct OEChildCreator<OEAccount> {
  static OEAccount* Make(OEDataObjFactory*, OETagID tag) { return OEAccount::NewAcct(tag); }
};
template <>
struct OEChildCreator<OEBankOrCCAccount> {
  static OEBankOrCCAccount* Make(OEDataObjFactory*, OETagID tag) { return OEBankOrCCAccount::NewAcct(tag); }
};
