#include "ofxkit/messages/profile/OEProfile.h"

#include "ofxkit/envelope/OEMessageSet.h"
#include "ofxkit/ofxkit.h"

OE_DEFINE_AGGREGATE(OEProfileRq, OETransBase, OE_PROFILERQ_FIELDS, PROFRQ,
                    .Valid(OE_TAGS(CLIENTROUTING, DTPROFUP))
                    .Required(OE_TAGS(CLIENTROUTING, DTPROFUP)))
OE_DEFINE_AGGREGATE(OEMessageSetProfile, OEAggregate, OE_MESSAGESETPROFILE_FIELDS, NONE,
                    .Valid(OE_TAGS(SIGNUPMSGSETV1, SIGNUPMSGSETV2, BANKMSGSETV1, CREDITCARDMSGSETV1, INVSTMTMSGSETV1,
                                   SECLISTMSGSETV1, INTERXFERMSGSETV1, WIREXFERMSGSETV1, BILLPAYMSGSETV1,
                                   EMAILMSGSETV1, PROFMSGSETV1, SIGNONMSGSETV1)))
OE_DEFINE_AGGREGATE(OEMessageSetList, OEAggregate, OE_MESSAGESETLIST_FIELDS, MSGSETLIST,
                    .Valid(OE_TAGS(SIGNUPMSGSET, BANKMSGSET, CREDITCARDMSGSET, INVSTMTMSGSET, SECLISTMSGSET,
                                   INTERXFERMSGSET, WIREXFERMSGSET, BILLPAYMSGSET, EMAILMSGSET, PROFMSGSET,
                                   SIGNONMSGSET))
                    .Required(OE_TAGS(PROFMSGSET)))
OE_DEFINE_AGGREGATE(OESignOnInfo, OEAggregate, OE_SIGNONINFO_FIELDS, SIGNONINFO,
                    .Valid(OE_TAGS(SIGNONREALM, MIN, MAX, CHARTYPE, CASESEN, SPECIAL, SPACES, PINCH, CHGPINFIRST))
                    .Required(OE_TAGS(SIGNONREALM, MIN, MAX, CHARTYPE, CASESEN, SPECIAL, SPACES, PINCH, CHGPINFIRST)))
OE_DEFINE_AGGREGATE(OESignOnInfoList, OEAggregate, OE_SIGNONINFOLIST_FIELDS, SIGNONINFOLIST,
                    .Valid(OE_TAGS(SIGNONINFO))
                    .Required(OE_TAGS(SIGNONINFO)))
OE_DEFINE_AGGREGATE(OEProfileRs, OETransBase, OE_PROFILERS_FIELDS, PROFRS,
                    .Valid(OE_TAGS(MSGSETLIST, SIGNONINFOLIST, DTPROFUP, FINAME, ADDR1, ADDR2, ADDR3, CITY, STATE,
                                   POSTALCODE, COUNTRY, CSPHONE, TSPHONE, FAXPHONE, URL, EMAIL, VEXA_RTN, VEXA_BROKERID,
                                   VEXA_NPC, VEXA_QAC))
                    .Required(OE_TAGS(MSGSETLIST, SIGNONINFOLIST, DTPROFUP, FINAME, ADDR1, CITY, STATE, POSTALCODE,
                                      COUNTRY)))

OEMessageSetVersion* OEChildCreator<OEMessageSetVersion>::Make(OEDataObjFactory* f, OETagID tag) {
  switch (tag) {
    case OE_TAG_PROFMSGSETV1: return f->NewProfileMessageSetV1();
    case OE_TAG_SIGNONMSGSETV1: return f->NewSignOnMessageSetV1();
    case OE_TAG_BANKMSGSETV1: return f->NewBankMessageSetV1();
    case OE_TAG_BILLPAYMSGSETV1: return f->NewBillPayMessageSetV1();
    case OE_TAG_CREDITCARDMSGSETV1: return f->NewCreditCardMessageSetV1();
    case OE_TAG_EMAILMSGSETV1: return f->NewEMailMessageSetV1();
    case OE_TAG_INTERXFERMSGSETV1: return f->NewInterXferMessageSetV1();
    case OE_TAG_INVSTMTMSGSETV1: return f->NewInvStmtMsgSetV1();
    case OE_TAG_SIGNUPMSGSETV1: return f->NewSignUpMessageSetV1();
    case OE_TAG_SIGNUPMSGSETV2: return f->NewSignUpMessageSetV2();
    case OE_TAG_SECLISTMSGSETV1: return f->NewSecListMsgSetV1();
    case OE_TAG_WIREXFERMSGSETV1: return f->NewWireXferMessageSetV1();
    default: return nullptr;
  }
}

OEParseStatus OEMessageSetProfile::NewMsgSetVersion(OETagID tag, unsigned short i) {
  OEDataObjFactory* factory = GetFactory();
  if (!factory) return OE_PARSE_NO_PARSER;
  if (ValidTagPosition(tag) < 0) return OE_PARSE_NOT_HANDLED;
  OEMessageSetVersion* version = OEChildCreator<OEMessageSetVersion>::Make(factory, tag);
  if (!version) {
    g_allocFailed = 1;
    return OE_PARSE_NO_PARSER;
  }
  version->SetType(tag);
  if (!SetMessageSetVersion(i, version)) {
    delete version;
    return OE_PARSE_NO_PARSER;
  }
  return OE_PARSE_OK;
}

const OESignOnInfo* OESignOnInfoList::FindSignOnInfo(const OEString& realm) const {
  for (unsigned short i = 0; i < GetNumSignOnInfo(); ++i)
    if (const OESignOnInfo* info = GetSignOnInfo(i); info && info->GetSignOnRealm() == realm) return info;
  return nullptr;
}

const OEMessageSetProfile* OEProfileRs::FindMessageSetProfile(OETagID innerRequestTag) const {
  OETagID setTag = OEMessageSetRq::MsgIDToMsgSetID(innerRequestTag);
  const OEMessageSetList* list = GetMessageSetList();
  if (setTag == OE_TAG_NONE || !list) return nullptr;
  for (unsigned short i = 0; i < list->GetNumMessageSetProfile(); ++i)
    if (const OEMessageSetProfile* p = list->GetMessageSetProfile(i); p && p->GetType() == setTag) return p;
  return nullptr;
}

const OEMessageSetVersion* OEProfileRs::FindMessageSetVersion(OETagID innerRequestTag) const {
  const OEMessageSetProfile* profile = FindMessageSetProfile(innerRequestTag);
  return profile && profile->GetNumMessageSetVersion() > 0 ? profile->GetMessageSetVersion(0) : nullptr;
}

const OESignOnInfo* OEProfileRs::FindSignOnInfo(OETagID innerRequestTag) const {
  const OEMessageSetVersion* version = FindMessageSetVersion(innerRequestTag);
  const OEMessageSetCore* core = version ? version->GetMessageSetCore() : nullptr;
  if (!core || !GetSignOnInfoList()) return nullptr;
  return GetSignOnInfoList()->FindSignOnInfo(core->GetSignOnRealm());
}
