// The signup message set: enrolment ("ENROLLRQ"/"ENROLLRS"), the accounts a
// user holds ("ACCTINFORQ"/"ACCTINFORS"), services added, changed or removed
// on an account ("ACCTRQ"/"ACCTRS"), changes of the user's name and address
// ("CHGUSERINFORQ"/"CHGUSERINFORS"), and the signup profile versions.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/bank/OEAccount.h"
#include "ofxkit/messages/billpay/OEPayee.h"
#include "ofxkit/messages/profile/OEMessageSetVersion.h"

// A user's name, address and how to reach them.
#define OE_USER_CONTACT_FIELDS(X)                       \
  X(TEXT, FirstName, FIRSTNAME, OEString32)             \
  X(TEXT, MiddleName, MIDDLENAME, OEString32)           \
  X(TEXT, LastName, LASTNAME, OEString32)               \
  OE_ADDRESS_FIELDS(X)                                  \
  X(TEXT, DayPhone, DAYPHONE, OEString32)               \
  X(TEXT, EveningPhone, EVEPHONE, OEString32)           \
  X(TEXT, EMail, EMAIL, OEString80)

#define OE_ENROLLRQ_FIELDS(X)                                 \
  X(CHILD, AccountFrom, BANKACCTFROM, OEAccount)              \
  X(ALSO, AccountFrom, INVACCTFROM, OEAccount)                \
  X(ALSO, AccountFrom, CCACCTFROM, OEAccount)                 \
  OE_USER_CONTACT_FIELDS(X)                                   \
  X(TEXT, UserID, USERID, OEString32)                         \
  X(TEXT, TaxID, TAXID, OEString32)                           \
  X(TEXT, SecurityName, SECURITYNAME, OEString32)             \
  X(VALUE, DateOfBirth, DATEBIRTH, OEDateTime)

class OEEnrollRq : public OETransBase {
  OE_AGGREGATE(OEEnrollRq, OE_ENROLLRQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

// The temporary password is a password: its text never reaches the log.
#define OE_ENROLLRS_FIELDS(X)                                 \
  X(TEXT, TempPassword, TEMPPASS, OEUserPassword)             \
  X(TEXT, UserID, USERID, OEString32)                         \
  X(VALUE, TempPasswordExpire, DTEXPIRE, OEDateTime)

class OEEnrollRs : public OETransBase {
  OE_AGGREGATE(OEEnrollRs, OE_ENROLLRS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

// ---------------------------------------------------------------------------
// Account information.

#define OE_ACCOUNTINFOBASE_FIELDS(X) X(VALUE, ServiceStatus, SVCSTATUS, OEServiceStatus)

// What every kind of account entry has: the state of its service.
class OEAccountInfoBase : public OEAggregate {
  OE_AGGREGATE(OEAccountInfoBase, OE_ACCOUNTINFOBASE_FIELDS)
};

// An entry is made by the tag it stands under ("BANKACCTINFO", "CCACCTINFO",
// "BPACCTINFO", "INVACCTINFO"); null for any other tag.
template <>
struct OEChildCreator<OEAccountInfoBase> {
  static OEAccountInfoBase* Make(OEDataObjFactory* factory, OETagID tag);
};

#define OE_ACCOUNT_TRANSFER_FIELDS(X)                         \
  X(FLAG, SupportTxDownload, SUPTXDL, unsigned short)         \
  X(FLAG, XferSource, XFERSRC, unsigned short)                \
  X(FLAG, XferDestination, XFERDEST, unsigned short)

#define OE_BANKACCOUNTINFO_FIELDS(X)                          \
  X(CHILD, AccountFrom, BANKACCTFROM, OEBankAccount)          \
  OE_ACCOUNT_TRANSFER_FIELDS(X)
class OEBankAccountInfo : public OEAccountInfoBase {
  OE_AGGREGATE(OEBankAccountInfo, OE_BANKACCOUNTINFO_FIELDS)
};

#define OE_CCACCOUNTINFO_FIELDS(X)                            \
  X(CHILD, AccountFrom, CCACCTFROM, OECCAccount)              \
  OE_ACCOUNT_TRANSFER_FIELDS(X)
class OECCAccountInfo : public OEAccountInfoBase {
  OE_AGGREGATE(OECCAccountInfo, OE_CCACCOUNTINFO_FIELDS)
};

#define OE_INVACCTINFO_FIELDS(X)                                  \
  X(CHILD, AccountFrom, INVACCTFROM, OEInvAcctFrom)               \
  X(VALUE, USProductType, USPRODUCTTYPE, OEUSProductType)         \
  X(FLAG, Chequing, CHEQUING, unsigned short)                     \
  X(VALUE, InvAcctType, INVACCTTYPE, OEInvAcctType)               \
  X(TEXT, OptionLevel, OPTIONLEVEL, OEString36)
class OEInvAcctInfo : public OEAccountInfoBase {
  OE_AGGREGATE(OEInvAcctInfo, OE_INVACCTINFO_FIELDS)
};

#define OE_BILLPAYACCOUNTINFO_FIELDS(X) X(CHILD, AccountFrom, BANKACCTFROM, OEBankAccount)
class OEBillPayAccountInfo : public OEAccountInfoBase {
  OE_AGGREGATE(OEBillPayAccountInfo, OE_BILLPAYACCOUNTINFO_FIELDS)
};

// One account of the user: a description, a phone number, and its entries
// of the four kinds, in the order read or appended, whatever their kind.
#define OE_ACCOUNTINFO_FIELDS(X)                                     \
  X(TEXT, Description, DESC, OEString80)                             \
  X(TEXT, Phone, PHONE, OEString32)                                  \
  X(LIST, AccountInfoBase, BANKACCTINFO, OEAccountInfoBase)          \
  X(ALSOLIST, AccountInfoBase, CCACCTINFO, OEAccountInfoBase)        \
  X(ALSOLIST, AccountInfoBase, BPACCTINFO, OEAccountInfoBase)        \
  X(ALSOLIST, AccountInfoBase, INVACCTINFO, OEAccountInfoBase)
class OEAccountInfo : public OEAggregate {
  OE_AGGREGATE(OEAccountInfo, OE_ACCOUNTINFO_FIELDS)
};

#define OE_ACCOUNTINFORQ_FIELDS(X) X(VALUE, DateTimeAccountUp, DTACCTUP, OEDateTime)
class OEAccountInfoRq : public OETransBase {
  OE_AGGREGATE(OEAccountInfoRq, OE_ACCOUNTINFORQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_ACCOUNTINFORS_FIELDS(X)                            \
  X(LIST, AccountInfo, ACCTINFO, OEAccountInfo)               \
  X(VALUE, DateTimeAccountUp, DTACCTUP, OEDateTime)
class OEAccountInfoRs : public OETransBase {
  OE_AGGREGATE(OEAccountInfoRs, OE_ACCOUNTINFORS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

// ---------------------------------------------------------------------------
// Services on an account.

// Adding a service names the account it goes to, removing one the account it
// leaves, changing one both (the type, "SVCADD", "SVCDEL" or "SVCCHG", says
// which); exactly one account on each side the action needs.
#define OE_ACTION_FIELDS(X)                                   \
  X(CHILD, BankAcctTo, BANKACCTTO, OEBankAccount)             \
  X(CHILD, BankAcctFrom, BANKACCTFROM, OEBankAccount)         \
  X(CHILD, CCAcctTo, CCACCTTO, OECCAccount)                   \
  X(CHILD, CCAcctFrom, CCACCTFROM, OECCAccount)               \
  X(CHILD, InvAcctTo, INVACCTTO, OEInvAcctFrom)               \
  X(CHILD, InvAcctFrom, INVACCTFROM, OEInvAcctFrom)
class OEAction : public OEAggregate {
  OE_AGGREGATE(OEAction, OE_ACTION_FIELDS)
  unsigned short AllRequiredPresent() override;
  // Names, one per call, an account tag the action still needs: the "to"
  // tags (bank, card, investment) while an add or change has no account to,
  // then the "from" tags while a delete or change has no account from.
  OETagID GetFirstMissingRequiredTag(OETagID after) const override;
};

#define OE_ACCOUNTSERVICE_FIELDS(X)                         \
  X(CHILD, Action, SVCADD, OEAction)                        \
  X(ALSO, Action, SVCCHG, OEAction)                         \
  X(ALSO, Action, SVCDEL, OEAction)                         \
  X(VALUE, Service, SVC, OEService)
class OEAccountServiceRq : public OETransBase {
  OE_AGGREGATE(OEAccountServiceRq, OE_ACCOUNTSERVICE_FIELDS)
  using OETransBase::DeepCopyFrom;
};

#define OE_ACCOUNTSERVICERS_FIELDS(X) \
  OE_ACCOUNTSERVICE_FIELDS(X) X(VALUE, ServiceStatus, SVCSTATUS, OEServiceStatus)
class OEAccountServiceRs : public OETransBase {
  OE_AGGREGATE(OEAccountServiceRs, OE_ACCOUNTSERVICERS_FIELDS)
  using OETransBase::DeepCopyFrom;
};

// ---------------------------------------------------------------------------
// Changes of the user's name and address.

class OEChangeUserInfoBase : public OETransBase {
  OE_AGGREGATE(OEChangeUserInfoBase, OE_USER_CONTACT_FIELDS)
  using OETransBase::DeepCopyFrom;
};

class OEChangeUserInfoRq : public OEChangeUserInfoBase {
  OE_AGGREGATE(OEChangeUserInfoRq, OE_NO_FIELDS)
  using OEChangeUserInfoBase::DeepCopyFrom;
};

#define OE_CHANGEUSERINFORS_FIELDS(X) X(VALUE, DateTimeInfoChange, DTINFOCHG, OEDateTime)
class OEChangeUserInfoRs : public OEChangeUserInfoBase {
  OE_AGGREGATE(OEChangeUserInfoRs, OE_CHANGEUSERINFORS_FIELDS)
  using OEChangeUserInfoBase::DeepCopyFrom;
};

// ---------------------------------------------------------------------------
// How a user enrols: in the client, on the web, or otherwise.

#define OE_CLIENTENROLL_FIELDS(X) X(FLAG, AccountRequired, ACCTREQUIRED, unsigned short)
class OEClientEnroll : public OEAggregate {
  OE_AGGREGATE(OEClientEnroll, OE_CLIENTENROLL_FIELDS)
};

#define OE_WEBENROLL_FIELDS(X) X(TEXT, URL, URL, OEString255)
class OEWebEnroll : public OEAggregate {
  OE_AGGREGATE(OEWebEnroll, OE_WEBENROLL_FIELDS)
};

#define OE_OTHERENROLL_FIELDS(X) X(TEXT, Message, MESSAGE, OEString80)
class OEOtherEnroll : public OEAggregate {
  OE_AGGREGATE(OEOtherEnroll, OE_OTHERENROLL_FIELDS)
};

#define OE_SIGNUPMESSAGESET_FIELDS(X)                              \
  X(CHILD, ClientEnroll, CLIENTENROLL, OEClientEnroll)             \
  X(CHILD, WebEnroll, WEBENROLL, OEWebEnroll)                      \
  X(CHILD, OtherEnroll, OTHERENROLL, OEOtherEnroll)                \
  X(FLAG, ChangeUserInfo, CHGUSERINFO, unsigned short)             \
  X(FLAG, AvailableAccounts, AVAILACCTS, unsigned short)           \
  X(FLAG, ActivationRequest, CLIENTACTREQ, unsigned short)

// The signup message set as a profile describes it, in either version.
class OESignUpMessageSetBase : public OEMessageSetVersion {
  OE_AGGREGATE(OESignUpMessageSetBase, OE_SIGNUPMESSAGESET_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};

class OESignUpMessageSetV1 : public OESignUpMessageSetBase {
  OE_AGGREGATE(OESignUpMessageSetV1, OE_NO_FIELDS)
  using OESignUpMessageSetBase::DeepCopyFrom;
};

class OESignUpMessageSetV2 : public OESignUpMessageSetBase {
  OE_AGGREGATE(OESignUpMessageSetV2, OE_NO_FIELDS)
  using OESignUpMessageSetBase::DeepCopyFrom;
};
