#include "ofxkit/envelope/OESignOn.h"

#include <cstring>

#include "ofxkit/parse/OEParseLogger.h"

bool OEAppVerTraits::FromText(const OEString& text, unsigned short& value) {
  if (strchr(text.c_str(), '.')) return false;
  return OEDataConversion::StringToUShort(text, value) != 0;
}

unsigned short OESignOnLanguageTraits::Store(OEAggregate* self, OELanguage& field, OETagID tag,
                                             const OELanguage& value) {
  field = value;
  if (field.GetString().ExceedsSpecLength()) OELogWarning(OEPW_TOOLONG, field.GetString(), OEString(), OE_TAG_NONE);
  return self->SetTag(tag);
}

OE_DEFINE_AGGREGATE(OEFI, OEAggregate, OE_FI_FIELDS, FI, .Valid(OE_TAGS(ORG, FID)).Required(OE_TAGS(ORG)))

OE_DEFINE_AGGREGATE(OESignOnRq, OEAggregate, OE_SIGNONRQ_FIELDS, SONRQ,
                    .Valid(OE_TAGS(FI, DTCLIENT, LANGUAGE, APPID, APPVER, USERID, USERPASS, USERKEY, GENUSERKEY,
                                   SESSCOOKIE))
                    .Required(OE_TAGS(DTCLIENT, LANGUAGE, APPID, APPVER))
                    .WriteOrder(OE_TAGS(DTCLIENT, USERID, USERPASS, USERKEY, GENUSERKEY, LANGUAGE, FI, SESSCOOKIE,
                                        APPID, APPVER)))

OE_DEFINE_AGGREGATE(OESignOnRs, OEAggregate, OE_SIGNONRS_FIELDS, SONRS,
                    .Valid(OE_TAGS(STATUS, FI, DTSERVER, LANGUAGE, DTPROFUP, DTACCTUP, USERKEY, TSKEYEXPIRE,
                                   SESSCOOKIE, VEXA_MKTCOOKIE, VEXA_BID, VEXA_USERID))
                    .Required(OE_TAGS(STATUS, DTSERVER, LANGUAGE))
                    // VEXA.USERID is read from responses but never written.
                    .WriteOrder(OE_TAGS(STATUS, DTSERVER, USERKEY, TSKEYEXPIRE, LANGUAGE, DTPROFUP, DTACCTUP, FI,
                                        SESSCOOKIE, VEXA_MKTCOOKIE, VEXA_BID)))

OE_DEFINE_AGGREGATE(OEChallengeRq, OETransBase, OE_CHALLENGERQ_FIELDS, CHALLENGERQ,
                    .Valid(OE_TAGS(USERID, FICERTID)).Required(OE_TAGS(USERID)))
OE_DEFINE_AGGREGATE(OEChallengeRs, OETransBase, OE_CHALLENGERS_FIELDS, CHALLENGERS,
                    .Valid(OE_TAGS(USERID, NONCE, FICERTID)).Required(OE_TAGS(USERID, NONCE, FICERTID)))
OE_DEFINE_AGGREGATE(OEPinChangeRq, OETransBase, OE_PINCHANGERQ_FIELDS, PINCHRQ,
                    .Valid(OE_TAGS(USERID, NEWUSERPASS)).Required(OE_TAGS(USERID, NEWUSERPASS)))
OE_DEFINE_AGGREGATE(OEPinChangeRs, OETransBase, OE_PINCHANGERS_FIELDS, PINCHRS,
                    .Valid(OE_TAGS(USERID, DTCHANGED)).Required(OE_TAGS(USERID)))

namespace {
// The credential a sign-on lacks (a user id, then its password), or NONE.
OETagID MissingCredential(const OESignOnRq& signOn) {
  if (signOn.ValidateTag(OE_TAG_USERKEY)) return OE_TAG_NONE;
  if (!signOn.ValidateTag(OE_TAG_USERID)) return OE_TAG_USERID;
  return signOn.ValidateTag(OE_TAG_USERPASS) ? OE_TAG_NONE : OE_TAG_USERPASS;
}
}  // namespace

unsigned short OESignOnRq::AllRequiredPresent() {
  return OEAggregate::AllRequiredPresent() && MissingCredential(*this) == OE_TAG_NONE;
}

// The missing credential follows the missing required elements.
OETagID OESignOnRq::GetFirstMissingRequiredTag(OETagID after) const {
  OETagID answer = OEAggregate::GetFirstMissingRequiredTag(after);
  if (answer != OE_TAG_NONE) return answer;
  OETagID credential = MissingCredential(*this);
  return credential == after ? OE_TAG_NONE : credential;
}

OEDataObj* OESignOnRs::GetChild(unsigned short index) const {
  if (index == 0) return GetStatus();
  return index == 1 ? GetFI() : nullptr;
}
