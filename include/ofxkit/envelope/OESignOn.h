// The sign-on aggregates: the sign-on request and response ("SONRQ",
// "SONRS"), the financial institution ("FI"), and the inner requests and
// responses of the PIN change and challenge wrappers.
#pragma once

#include "ofxkit/envelope/OEStatus.h"
#include "ofxkit/envelope/OETransBase.h"

// "APPVER": an unsigned whole number (a version such as "5.0" is refused,
// not rounded), written with at least four digits (500 is written 0500).
struct OEAppVerTraits : OEPlainStore {
  using Type = unsigned short;
  static bool FromText(const OEString& text, unsigned short& value);
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const unsigned short& value) {
    return b->AddTagOEUShort(tag, value, '0', 4);
  }
  static unsigned short ToText(const unsigned short& value, OEString& out) { return OEValueText(value, out); }
};

// "LANGUAGE" of the sign-on: a language given as a value is stored whole
// and, when longer than three characters, logged (OEPW_TOOLONG, naming no
// tag and no object).
struct OESignOnLanguageTraits : OEValueTraits<OELanguage> {
  using Type = OELanguage;
  static unsigned short Store(OEAggregate* self, OELanguage& field, OETagID tag, const OELanguage& value);
};

#define OE_FI_FIELDS(X)               \
  X(TEXT, Org, ORG, OEString32)       \
  X(TEXT, FId, FID, OEString32)

class OEFI : public OEAggregate {
  OE_AGGREGATE(OEFI, OE_FI_FIELDS)
};

#define OE_SIGNONRQ_FIELDS(X)                               \
  X(CHILD, FI, FI, OEFI)                                    \
  X(VALUE, DtClient, DTCLIENT, OEDateTime)                  \
  X(TRAITS, Language, LANGUAGE, OESignOnLanguageTraits)     \
  X(TEXT, AppId, APPID, OEString5)                          \
  X(TRAITS, AppVer, APPVER, OEAppVerTraits)                 \
  X(TEXT, UserId, USERID, OEString32)                       \
  X(TEXT, UserPass, USERPASS, OEUserPassword)               \
  X(TEXT, UserKey, USERKEY, OEString64)                     \
  X(FLAG, GenUserKey, GENUSERKEY, unsigned short)           \
  X(TEXT, SessCookie, SESSCOOKIE, OEString1000)

class OESignOnRq : public OEAggregate {
  OE_AGGREGATE(OESignOnRq, OE_SIGNONRQ_FIELDS)

  // The required elements, and credentials: a user id with its password,
  // or a user key.
  unsigned short AllRequiredPresent() override;
  OETagID GetFirstMissingRequiredTag(OETagID after) const override;
  // One child position, the financial institution (possibly null).
  OEDataObj* GetChild(unsigned short index) const override { return index == 0 ? GetFI() : nullptr; }
  unsigned short GetNumberOfChildren() const override { return 1; }
};

#define OE_SIGNONRS_FIELDS(X)                               \
  X(CHILD, Status, STATUS, OEStatus)                        \
  X(CHILD, FI, FI, OEFI)                                    \
  X(VALUE, DtServer, DTSERVER, OEDateTime)                  \
  X(TRAITS, Language, LANGUAGE, OESignOnLanguageTraits)     \
  X(VALUE, DtProfUp, DTPROFUP, OEDateTime)                  \
  X(VALUE, DtAcctUp, DTACCTUP, OEDateTime)                  \
  X(TEXT, UserKey, USERKEY, OEString64)                     \
  X(VALUE, TsKeyExpire, TSKEYEXPIRE, OEDateTime)            \
  X(TEXT, SessCookie, SESSCOOKIE, OEString1000)             \
  X(TEXT, VexaMktCookie, VEXA_MKTCOOKIE, OEString80)        \
  X(VALUE, VexaBid, VEXA_BID, uint32_t)                     \
  X(TEXT, VexaUserId, VEXA_USERID, OEString)

class OESignOnRs : public OEAggregate {
  OE_AGGREGATE(OESignOnRs, OE_SIGNONRS_FIELDS)

  // Two child positions: the status, then the financial institution.
  OEDataObj* GetChild(unsigned short index) const override;
  unsigned short GetNumberOfChildren() const override { return 2; }
};

#define OE_CHALLENGERQ_FIELDS(X)              \
  X(TEXT, UserID, USERID, OEString32)         \
  X(TEXT, FICertID, FICERTID, OEString64)

class OEChallengeRq : public OETransBase {
  OE_AGGREGATE(OEChallengeRq, OE_CHALLENGERQ_FIELDS)
};

#define OE_CHALLENGERS_FIELDS(X)              \
  X(TEXT, UserID, USERID, OEString32)         \
  X(TEXT, Nonce, NONCE, OEString16)           \
  X(TEXT, FICertID, FICERTID, OEString64)

class OEChallengeRs : public OETransBase {
  OE_AGGREGATE(OEChallengeRs, OE_CHALLENGERS_FIELDS)
};

#define OE_PINCHANGERQ_FIELDS(X)                       \
  X(TEXT, UserId, USERID, OEString32)                  \
  X(TEXT, NewUserPass, NEWUSERPASS, OEUserPassword)

class OEPinChangeRq : public OETransBase {
  OE_AGGREGATE(OEPinChangeRq, OE_PINCHANGERQ_FIELDS)
};

#define OE_PINCHANGERS_FIELDS(X)                         \
  X(TEXT, UserId, USERID, OEString32)                    \
  X(VALUE, DateTimeChanged, DTCHANGED, OEDateTime)

class OEPinChangeRs : public OETransBase {
  OE_AGGREGATE(OEPinChangeRs, OE_PINCHANGERS_FIELDS)
};
