#include "ofxkit/messages/bank/OEAccount.h"

OE_DEFINE_AGGREGATE(OEAccount, OEAggregate, OE_ACCOUNT_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OEBankOrCCAccount, OEAccount, OE_BANKORCCACCOUNT_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OEBankAccount, OEBankOrCCAccount, OE_BANKACCOUNT_FIELDS, BANKACCTFROM,
                    .Valid(OE_TAGS(BANKID, BRANCHID, ACCTID, ACCTTYPE, ACCTKEY))
                    .Required(OE_TAGS(BANKID, ACCTID, ACCTTYPE)))
OE_DEFINE_AGGREGATE(OECCAccount, OEBankOrCCAccount, OE_NO_FIELDS, CCACCTFROM,
                    .Valid(OE_TAGS(ACCTID, ACCTKEY))
                    .Required(OE_TAGS(ACCTID)))
OE_DEFINE_AGGREGATE(OEInvAcctFrom, OEAccount, OE_INVACCTFROM_FIELDS, INVACCTFROM,
                    .Valid(OE_TAGS(BROKERID, ACCTID))
                    .Required(OE_TAGS(BROKERID, ACCTID)))

namespace {
// The account tags, with the class each makes; `investment` rows are not
// bank or credit-card accounts.
struct AccountTag {
  OETagID tag;
  bool from;
  bool investment;
  OEAccount* (*make)(OEDataObjFactory*);
};
OEAccount* MakeBank(OEDataObjFactory* f) { return f->NewBankAccount(); }
OEAccount* MakeCC(OEDataObjFactory* f) { return f->NewCCAccount(); }
OEAccount* MakeInv(OEDataObjFactory* f) { return f->NewInvAcctFrom(); }
const AccountTag kAccountTags[] = {
    {OE_TAG_BANKACCTFROM, true, false, MakeBank}, {OE_TAG_CCACCTFROM, true, false, MakeCC},
    {OE_TAG_INVACCTFROM, true, true, MakeInv},    {OE_TAG_BANKACCTTO, false, false, MakeBank},
    {OE_TAG_CCACCTTO, false, false, MakeCC},      {OE_TAG_INVACCTTO, false, true, MakeInv},
};

OEAccount* MakeAccount(OETagID tag, bool from, bool bankOrCCOnly) {
  for (const AccountTag& row : kAccountTags) {
    if (row.tag != tag || row.from != from || (bankOrCCOnly && row.investment)) continue;
    OEDataObjFactory* factory = OEDataObj::GetFactory();
    OEAccount* account = factory ? row.make(factory) : nullptr;
    if (account) account->SetType(tag);
    return account;
  }
  return nullptr;
}

template <class A>
unsigned short CopyAccountTo(const A* from, A** to, A* (*make)(OETagID)) {
  if (!to) return 0;
  if (!from) {
    delete *to;
    *to = nullptr;
    return 1;
  }
  if (!*to && !(*to = make(from->GetType()))) return 0;
  return (*to)->CopyAggregateFrom(from);
}
}  // namespace

OEAccount* OEAccount::NewAcctFrom(OETagID tag) { return MakeAccount(tag, true, false); }
OEAccount* OEAccount::NewAcctTo(OETagID tag) { return MakeAccount(tag, false, false); }
OEAccount* OEAccount::NewAcct(OETagID tag) {
  OEAccount* account = NewAcctFrom(tag);
  return account ? account : NewAcctTo(tag);
}
unsigned short OEAccount::DeepCopyTo(const OEAccount* from, OEAccount** to) {
  return CopyAccountTo<OEAccount>(from, to, &OEAccount::NewAcct);
}

OEBankOrCCAccount* OEBankOrCCAccount::NewAcctFrom(OETagID tag) {
  return static_cast<OEBankOrCCAccount*>(MakeAccount(tag, true, true));
}
OEBankOrCCAccount* OEBankOrCCAccount::NewAcctTo(OETagID tag) {
  return static_cast<OEBankOrCCAccount*>(MakeAccount(tag, false, true));
}
OEBankOrCCAccount* OEBankOrCCAccount::NewAcct(OETagID tag) {
  OEBankOrCCAccount* account = NewAcctFrom(tag);
  return account ? account : NewAcctTo(tag);
}
unsigned short OEBankOrCCAccount::DeepCopyTo(const OEBankOrCCAccount* from, OEBankOrCCAccount** to) {
  return CopyAccountTo<OEBankOrCCAccount>(from, to, &OEBankOrCCAccount::NewAcct);
}
