#include "ofxkit/envelope/OERequest.h"

#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/parse/OEParser.h"

// The message sets in the order of the valid-tag array, and in the order
// they are written (S is RQ or RS).
#define OE_OFX_VALID(S)                                                                                      \
  SIGNUPMSGS##S##V1, BANKMSGS##S##V1, CREDITCARDMSGS##S##V1, INVSTMTMSGS##S##V1, SECLISTMSGS##S##V1,         \
      INTERXFERMSGS##S##V1, WIREXFERMSGS##S##V1, BILLPAYMSGS##S##V1, EMAILMSGS##S##V1, VEXA_BRANDMSGS##S##V1, \
      VEXA_CLOGMSGS##S##V1, VEXA_SURVEYMSGS##S##V1, VEXA_USLFIMSGS##S##V1, VEXA_USLCUMSGS##S##V1,             \
      V_PAYROLLMSGS##S##V1, SIGNONMSGS##S##V1, PROFMSGS##S##V1
#define OE_OFX_ORDER(S)                                                                                         \
  SIGNONMSGS##S##V1, SIGNUPMSGS##S##V1, BANKMSGS##S##V1, CREDITCARDMSGS##S##V1, INVSTMTMSGS##S##V1,             \
      INTERXFERMSGS##S##V1, WIREXFERMSGS##S##V1, BILLPAYMSGS##S##V1, EMAILMSGS##S##V1, SECLISTMSGS##S##V1,       \
      PROFMSGS##S##V1, VEXA_BRANDMSGS##S##V1, VEXA_CLOGMSGS##S##V1, VEXA_SURVEYMSGS##S##V1, VEXA_USLFIMSGS##S##V1, \
      VEXA_USLCUMSGS##S##V1, V_PAYROLLMSGS##S##V1

OE_DEFINE_AGGREGATE(OERequest, OEOfxAggregate, OE_REQUEST_FIELDS, OFX,
                    .Valid(OE_TAGS(OE_OFX_VALID(RQ)))
                    .Required(OE_TAGS(SIGNONMSGSRQV1))
                    .WriteOrder(OE_TAGS(OE_OFX_ORDER(RQ))))
OE_DEFINE_AGGREGATE(OEResponse, OEOfxAggregate, OE_RESPONSE_FIELDS, OFX,
                    .Valid(OE_TAGS(OE_OFX_VALID(RS)))
                    .Required(OE_TAGS(SIGNONMSGSRSV1))
                    .WriteOrder(OE_TAGS(OE_OFX_ORDER(RS))))

OEParseStatus OEOfxAggregate::HandleTagStart(const OETagDictionaryEntry* const entry) {
  // Given as the root of a parse, the object stands for the text's OFX
  // aggregate itself: it enters itself, and the end tag leaves it.
  OEParser* parser = GetParser();
  if (entry && entry->id == GetType() && parser && parser->GetDepth() == 0 && parser->GetCurrentObj() == this)
    return parser->PushObject(this) ? OE_PARSE_OK : OE_PARSE_PUSH_FAILED;
  const OEFieldDesc* d = entry ? FieldFor(entry->id) : nullptr;
  if (!d || !d->count) return OE_PARSE_NOT_HANDLED;
  unsigned short n = d->count(this);
  for (unsigned short k = 0; k < n; ++k) {
    const OEDataObj* set = d->get(this, k);
    if (set && set->GetType() == entry->id) {
      OELogWarning(OEPW_EXTRAAGG, OEString(), OEString(), entry->id, this);
      return OE_PARSE_NOT_HANDLED;
    }
  }
  return OEAggregate::HandleTagStart(entry);
}

OEParseStatus OEOfxAggregate::HandleTagElement(const OETagDictionaryEntry* const, const OEString&) {
  return OE_PARSE_OK;
}

OEBuildStatus OEOfxAggregate::Build(OEBuilder* builder) const {
  return BuildChildrenByTag(builder, GetInfo().order, true);
}

unsigned short OEOfxAggregate::AllRequiredPresent() {
  return OEDataObj::AllRequiredPresent() && GetNumberOfChildren() > 0;
}

OERequest* OEArrayElementTraits<OERequest>::New() {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  return factory ? factory->NewRequest() : nullptr;
}
OEResponse* OEArrayElementTraits<OEResponse>::New() {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  return factory ? factory->NewResponse() : nullptr;
}
