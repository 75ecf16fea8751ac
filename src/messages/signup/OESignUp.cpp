#include "ofxkit/messages/signup/OESignUp.h"

#define OE_USER_CONTACT_TAGS                                                                             \
  FIRSTNAME, MIDDLENAME, LASTNAME, ADDR1, ADDR2, ADDR3, CITY, STATE, POSTALCODE, COUNTRY, DAYPHONE, EVEPHONE, \
      EMAIL

OE_DEFINE_AGGREGATE(OEEnrollRq, OETransBase, OE_ENROLLRQ_FIELDS, ENROLLRQ,
                    .Valid(OE_TAGS(BANKACCTFROM, INVACCTFROM, CCACCTFROM, OE_USER_CONTACT_TAGS, USERID, TAXID,
                                   SECURITYNAME, DATEBIRTH))
                    .Required(OE_TAGS(FIRSTNAME, MIDDLENAME, LASTNAME, ADDR1, CITY, STATE, POSTALCODE, COUNTRY,
                                      DAYPHONE, EVEPHONE, EMAIL, TAXID, SECURITYNAME, DATEBIRTH)))
OE_DEFINE_AGGREGATE(OEEnrollRs, OETransBase, OE_ENROLLRS_FIELDS, ENROLLRS,
                    .Valid(OE_TAGS(TEMPPASS, USERID, DTEXPIRE)))

OE_DEFINE_AGGREGATE(OEAccountInfoBase, OEAggregate, OE_ACCOUNTINFOBASE_FIELDS, NONE,
                    .Valid(OE_TAGS(SVCSTATUS))
                    .Required(OE_TAGS(SVCSTATUS)))
OE_DEFINE_AGGREGATE(OEBankAccountInfo, OEAccountInfoBase, OE_BANKACCOUNTINFO_FIELDS, BANKACCTINFO,
                    .Valid(OE_TAGS(BANKACCTFROM, SUPTXDL, XFERSRC, XFERDEST, SVCSTATUS))
                    .Required(OE_TAGS(BANKACCTFROM, SUPTXDL, XFERSRC, XFERDEST, SVCSTATUS)))
OE_DEFINE_AGGREGATE(OECCAccountInfo, OEAccountInfoBase, OE_CCACCOUNTINFO_FIELDS, CCACCTINFO,
                    .Valid(OE_TAGS(CCACCTFROM, SUPTXDL, XFERSRC, XFERDEST, SVCSTATUS))
                    .Required(OE_TAGS(CCACCTFROM, SUPTXDL, XFERSRC, XFERDEST, SVCSTATUS)))
OE_DEFINE_AGGREGATE(OEInvAcctInfo, OEAccountInfoBase, OE_INVACCTINFO_FIELDS, INVACCTINFO,
                    .Valid(OE_TAGS(INVACCTFROM, USPRODUCTTYPE, CHEQUING, SVCSTATUS, INVACCTTYPE, OPTIONLEVEL))
                    .Required(OE_TAGS(INVACCTFROM, USPRODUCTTYPE, CHEQUING, SVCSTATUS)))
OE_DEFINE_AGGREGATE(OEBillPayAccountInfo, OEAccountInfoBase, OE_BILLPAYACCOUNTINFO_FIELDS, BPACCTINFO,
                    .Valid(OE_TAGS(BANKACCTFROM, SVCSTATUS))
                    .Required(OE_TAGS(BANKACCTFROM, SVCSTATUS)))
OE_DEFINE_AGGREGATE(OEAccountInfo, OEAggregate, OE_ACCOUNTINFO_FIELDS, ACCTINFO,
                    .Valid(OE_TAGS(DESC, PHONE, BANKACCTINFO, CCACCTINFO, BPACCTINFO, INVACCTINFO)))
OE_DEFINE_AGGREGATE(OEAccountInfoRq, OETransBase, OE_ACCOUNTINFORQ_FIELDS, ACCTINFORQ,
                    .Valid(OE_TAGS(DTACCTUP))
                    .Required(OE_TAGS(DTACCTUP)))
OE_DEFINE_AGGREGATE(OEAccountInfoRs, OETransBase, OE_ACCOUNTINFORS_FIELDS, ACCTINFORS,
                    .Valid(OE_TAGS(ACCTINFO, DTACCTUP))
                    .Required(OE_TAGS(DTACCTUP)))

OE_DEFINE_AGGREGATE(OEAction, OEAggregate, OE_ACTION_FIELDS, SVCADD,
                    .Valid(OE_TAGS(BANKACCTTO, BANKACCTFROM, CCACCTTO, CCACCTFROM, INVACCTTO, INVACCTFROM)))
OE_DEFINE_AGGREGATE(OEAccountServiceRq, OETransBase, OE_ACCOUNTSERVICE_FIELDS, ACCTRQ,
                    .Valid(OE_TAGS(SVCADD, SVCCHG, SVCDEL, SVC))
                    .Required(OE_TAGS(SVC)))
OE_DEFINE_AGGREGATE(OEAccountServiceRs, OETransBase, OE_ACCOUNTSERVICERS_FIELDS, ACCTRS,
                    .Valid(OE_TAGS(SVCADD, SVCCHG, SVCDEL, SVC, SVCSTATUS))
                    .Required(OE_TAGS(SVC, SVCSTATUS)))

OE_DEFINE_AGGREGATE(OEChangeUserInfoBase, OETransBase, OE_USER_CONTACT_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OEChangeUserInfoRq, OEChangeUserInfoBase, OE_NO_FIELDS, CHGUSERINFORQ,
                    .Valid(OE_TAGS(OE_USER_CONTACT_TAGS)))
OE_DEFINE_AGGREGATE(OEChangeUserInfoRs, OEChangeUserInfoBase, OE_CHANGEUSERINFORS_FIELDS, CHGUSERINFORS,
                    .Valid(OE_TAGS(OE_USER_CONTACT_TAGS, DTINFOCHG))
                    .Required(OE_TAGS(DTINFOCHG)))

OE_DEFINE_AGGREGATE(OEClientEnroll, OEAggregate, OE_CLIENTENROLL_FIELDS, CLIENTENROLL,
                    .Valid(OE_TAGS(ACCTREQUIRED))
                    .Required(OE_TAGS(ACCTREQUIRED)))
OE_DEFINE_AGGREGATE(OEWebEnroll, OEAggregate, OE_WEBENROLL_FIELDS, WEBENROLL,
                    .Valid(OE_TAGS(URL))
                    .Required(OE_TAGS(URL)))
OE_DEFINE_AGGREGATE(OEOtherEnroll, OEAggregate, OE_OTHERENROLL_FIELDS, OTHERENROLL,
                    .Valid(OE_TAGS(MESSAGE))
                    .Required(OE_TAGS(MESSAGE)))
OE_DEFINE_AGGREGATE(OESignUpMessageSetBase, OEMessageSetVersion, OE_SIGNUPMESSAGESET_FIELDS, NONE, )
OE_DEFINE_AGGREGATE(OESignUpMessageSetV1, OESignUpMessageSetBase, OE_NO_FIELDS, SIGNUPMSGSETV1,
                    .Valid(OE_TAGS(MSGSETCORE, CLIENTENROLL, WEBENROLL, OTHERENROLL, CHGUSERINFO, AVAILACCTS,
                                   CLIENTACTREQ))
                    .Required(OE_TAGS(MSGSETCORE, CHGUSERINFO, AVAILACCTS, CLIENTACTREQ)))
OE_DEFINE_AGGREGATE(OESignUpMessageSetV2, OESignUpMessageSetBase, OE_NO_FIELDS, SIGNUPMSGSETV2,
                    .Valid(OE_TAGS(MSGSETCORE, CLIENTENROLL, WEBENROLL, OTHERENROLL, CHGUSERINFO, AVAILACCTS,
                                   CLIENTACTREQ))
                    .Required(OE_TAGS(MSGSETCORE, CHGUSERINFO, AVAILACCTS, CLIENTACTREQ)))

OEAccountInfoBase* OEChildCreator<OEAccountInfoBase>::Make(OEDataObjFactory* f, OETagID tag) {
  switch (tag) {
    case OE_TAG_BANKACCTINFO: return f->NewBankAccountInfo();
    case OE_TAG_CCACCTINFO: return f->NewCCAccountInfo();
    case OE_TAG_BPACCTINFO: return f->NewBillPayAccountInfo();
    case OE_TAG_INVACCTINFO: return f->NewInvAcctInfo();
    default: return nullptr;
  }
}

namespace {
const std::vector<OETagID> kToTags = {OE_TAG_BANKACCTTO, OE_TAG_CCACCTTO, OE_TAG_INVACCTTO};
const std::vector<OETagID> kFromTags = {OE_TAG_BANKACCTFROM, OE_TAG_CCACCTFROM, OE_TAG_INVACCTFROM};

// How many accounts of each side an action of this type needs.
bool Needs(OETagID type, bool* to, bool* from) {
  *to = type == OE_TAG_SVCADD || type == OE_TAG_SVCCHG;
  *from = type == OE_TAG_SVCDEL || type == OE_TAG_SVCCHG;
  return *to || *from;
}
}  // namespace

unsigned short OEAction::AllRequiredPresent() {
  bool to, from;
  if (!Needs(GetType(), &to, &from)) return 0;
  return PresentAmong(kToTags) == (to ? 1 : 0) && PresentAmong(kFromTags) == (from ? 1 : 0);
}

OETagID OEAction::GetFirstMissingRequiredTag(OETagID after) const {
  bool to, from;
  if (!Needs(GetType(), &to, &from)) return OE_TAG_NONE;
  std::vector<OETagID> missing;
  if (to && PresentAmong(kToTags) == 0) missing.insert(missing.end(), kToTags.begin(), kToTags.end());
  if (from && PresentAmong(kFromTags) == 0) missing.insert(missing.end(), kFromTags.begin(), kFromTags.end());
  bool passed = after == OE_TAG_NONE;
  for (OETagID tag : missing) {
    if (passed) return tag;
    passed = tag == after;
  }
  return OE_TAG_NONE;
}
