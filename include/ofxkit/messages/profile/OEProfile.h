// The profile message set: the request ("PROFRQ") and the answer ("PROFRS")
// that tells what an institution supports: its message sets in their
// versions ("MSGSETLIST"), the sign-on rules of each realm ("SIGNONINFOLIST")
// and how to reach it.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/envelope/OETransBase.h"
#include "ofxkit/messages/billpay/OEPayee.h"
#include "ofxkit/messages/profile/OEMessageSetVersion.h"

#define OE_PROFILERQ_FIELDS(X)                                    \
  X(VALUE, ClientRouting, CLIENTROUTING, OEClientRouting)         \
  X(VALUE, DateTimeProfileUp, DTPROFUP, OEDateTime)

class OEProfileRq : public OETransBase {
  OE_AGGREGATE(OEProfileRq, OE_PROFILERQ_FIELDS)
  using OETransBase::DeepCopyFrom;
};

// One message set ("BANKMSGSET", ...; its type): each version it is offered in.
#define OE_MESSAGESETPROFILE_FIELDS(X)                                       \
  X(LIST, MessageSetVersion, SIGNUPMSGSETV1, OEMessageSetVersion)            \
  X(ALSOLIST, MessageSetVersion, SIGNUPMSGSETV2, OEMessageSetVersion)        \
  X(ALSOLIST, MessageSetVersion, BANKMSGSETV1, OEMessageSetVersion)          \
  X(ALSOLIST, MessageSetVersion, CREDITCARDMSGSETV1, OEMessageSetVersion)    \
  X(ALSOLIST, MessageSetVersion, INVSTMTMSGSETV1, OEMessageSetVersion)       \
  X(ALSOLIST, MessageSetVersion, SECLISTMSGSETV1, OEMessageSetVersion)       \
  X(ALSOLIST, MessageSetVersion, INTERXFERMSGSETV1, OEMessageSetVersion)     \
  X(ALSOLIST, MessageSetVersion, WIREXFERMSGSETV1, OEMessageSetVersion)      \
  X(ALSOLIST, MessageSetVersion, BILLPAYMSGSETV1, OEMessageSetVersion)       \
  X(ALSOLIST, MessageSetVersion, EMAILMSGSETV1, OEMessageSetVersion)         \
  X(ALSOLIST, MessageSetVersion, PROFMSGSETV1, OEMessageSetVersion)          \
  X(ALSOLIST, MessageSetVersion, SIGNONMSGSETV1, OEMessageSetVersion)

class OEMessageSetProfile : public OEAggregate {
  OE_AGGREGATE(OEMessageSetProfile, OE_MESSAGESETPROFILE_FIELDS)
  unsigned short GetNumOfMessageSetVersion() const { return GetNumMessageSetVersion(); }
  // Makes the version object of the tag through the factory and stores it at
  // i (i = count appends): OE_PARSE_OK, OE_PARSE_NOT_HANDLED for a tag that
  // is no version, OE_PARSE_NO_PARSER when it cannot be made or stored.
  OEParseStatus NewMsgSetVersion(OETagID tag, unsigned short i);
};

#define OE_MESSAGESETLIST_FIELDS(X)                                      \
  X(LIST, MessageSetProfile, SIGNUPMSGSET, OEMessageSetProfile)          \
  X(ALSOLIST, MessageSetProfile, BANKMSGSET, OEMessageSetProfile)        \
  X(ALSOLIST, MessageSetProfile, CREDITCARDMSGSET, OEMessageSetProfile)  \
  X(ALSOLIST, MessageSetProfile, INVSTMTMSGSET, OEMessageSetProfile)     \
  X(ALSOLIST, MessageSetProfile, SECLISTMSGSET, OEMessageSetProfile)     \
  X(ALSOLIST, MessageSetProfile, INTERXFERMSGSET, OEMessageSetProfile)   \
  X(ALSOLIST, MessageSetProfile, WIREXFERMSGSET, OEMessageSetProfile)    \
  X(ALSOLIST, MessageSetProfile, BILLPAYMSGSET, OEMessageSetProfile)     \
  X(ALSOLIST, MessageSetProfile, EMAILMSGSET, OEMessageSetProfile)       \
  X(ALSOLIST, MessageSetProfile, PROFMSGSET, OEMessageSetProfile)        \
  X(ALSOLIST, MessageSetProfile, SIGNONMSGSET, OEMessageSetProfile)

// The message sets an institution offers, in the order it lists them.
class OEMessageSetList : public OEAggregate {
  OE_AGGREGATE(OEMessageSetList, OE_MESSAGESETLIST_FIELDS)
  unsigned short GetNumOfMessageSetProfile() const { return GetNumMessageSetProfile(); }
};

#define OE_SIGNONINFO_FIELDS(X)                                  \
  X(TEXT, SignOnRealm, SIGNONREALM, OEString32)                  \
  X(VALUE, MinPassword, MIN, unsigned short)                     \
  X(VALUE, MaxPassword, MAX, unsigned short)                     \
  X(VALUE, CharacterType, CHARTYPE, OECharacterType)             \
  X(FLAG, CaseSensitive, CASESEN, unsigned short)                \
  X(FLAG, SpecialChar, SPECIAL, unsigned short)                  \
  X(FLAG, SpaceChar, SPACES, unsigned short)                     \
  X(FLAG, PinChange, PINCH, unsigned short)                      \
  X(FLAG, ChangePinFirst, CHGPINFIRST, unsigned short)

// The sign-on rules of one realm. They are carried, never enforced: MIN
// above MAX is kept as read.
class OESignOnInfo : public OEAggregate {
  OE_AGGREGATE(OESignOnInfo, OE_SIGNONINFO_FIELDS)
};

#define OE_SIGNONINFOLIST_FIELDS(X) X(LIST, SignOnInfo, SIGNONINFO, OESignOnInfo)

class OESignOnInfoList : public OEAggregate {
  OE_AGGREGATE(OESignOnInfoList, OE_SIGNONINFOLIST_FIELDS)
  unsigned short GetNumOfSignOnInfo() const { return GetNumSignOnInfo(); }
  // The rules of the realm; null when the list has none of that name.
  const OESignOnInfo* FindSignOnInfo(const OEString& realm) const;
};

#define OE_PROFILERS_FIELDS(X)                                        \
  X(CHILD, MessageSetList, MSGSETLIST, OEMessageSetList)              \
  X(CHILD, SignOnInfoList, SIGNONINFOLIST, OESignOnInfoList)          \
  X(VALUE, DateTimeProfileUp, DTPROFUP, OEDateTime)                   \
  X(TEXT, FIName, FINAME, OEString32)                                 \
  OE_ADDRESS_FIELDS(X)                                                \
  X(TEXT, CSPhone, CSPHONE, OEString32)                               \
  X(TEXT, TSPhone, TSPHONE, OEString32)                               \
  X(TEXT, FAXPhone, FAXPHONE, OEString32)                             \
  X(TEXT, URL, URL, OEString255)                                      \
  X(TEXT, EMail, EMAIL, OEString80)                                   \
  X(VALUES, VexaRoutingNumber, VEXA_RTN, OEString9)                   \
  X(TEXT, VexaBrokerID, VEXA_BROKERID, OEString22)                    \
  X(FLAG, VexaNPC, VEXA_NPC, unsigned short)                          \
  X(FLAG, VexaQAC, VEXA_QAC, unsigned short)

class OEProfileRs : public OETransBase {
  OE_AGGREGATE(OEProfileRs, OE_PROFILERS_FIELDS)
  using OETransBase::DeepCopyFrom;

  // Which profile governs a request: the message set that the inner request
  // tag ("STMTRQ", "INVSTMTRQ", ...) belongs to, the version the institution
  // lists first for it, and the sign-on rules of that version's realm. Each
  // answers null when the profile does not say.
  const OEMessageSetProfile* FindMessageSetProfile(OETagID innerRequestTag) const;
  const OEMessageSetVersion* FindMessageSetVersion(OETagID innerRequestTag) const;
  const OESignOnInfo* FindSignOnInfo(OETagID innerRequestTag) const;
};
