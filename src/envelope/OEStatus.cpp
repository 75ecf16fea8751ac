#include "ofxkit/envelope/OEStatus.h"

#include "ofxkit/parse/OEParseLogger.h"

bool OEStatusCodeTraits::FromText(const OEString& text, int32_t& value) {
  int32_t parsed = 0;
  if (!OEDataConversion::StringToSLong(text, parsed)) return false;
  if (parsed < kMin || parsed > kMax) {
    // Reported to the setter, which logs it once with its tag and object.
    OELogWarning(OEPW_TOOLONG, text, OEString(), OE_TAG_NONE);
    return false;
  }
  value = parsed;
  return true;
}

OE_DEFINE_AGGREGATE(OEStatus, OEEnvelopeAggregate, OE_STATUS_FIELDS, STATUS,
                    .Valid(OE_TAGS(CODE, SEVERITY, MESSAGE)).Required(OE_TAGS(CODE, SEVERITY)))
