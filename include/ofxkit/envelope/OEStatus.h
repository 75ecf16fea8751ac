// The STATUS aggregate of every response wrapper and of the sign-on response.
#pragma once

#include "ofxkit/envelope/OEEnvelopeAggregate.h"

// A status code: a signed number that OFX keeps within -99999 ... 999999
// ("CODE", and the extension's "VEXA.SYNCERROR"). Text that is not a number
// logs OEPW_BADFORMAT; a number outside the range logs OEPW_TOOLONG; either
// leaves the field as it was.
struct OEStatusCodeTraits : OEPlainStore {
  using Type = int32_t;
  static constexpr int32_t kMin = -99999;
  static constexpr int32_t kMax = 999999;
  static constexpr bool kOwnFaultCode = true;  // out of range is OEPW_TOOLONG
  static bool FromText(const OEString& text, int32_t& value);
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const int32_t& value) { return b->AddTagOESLong(tag, value); }
  static unsigned short ToText(const int32_t& value, OEString& out) { return OEValueText(value, out); }
};

#define OE_STATUS_FIELDS(X)                           \
  X(TRAITS, Code, CODE, OEStatusCodeTraits)           \
  X(VALUE, Severity, SEVERITY, OEStatusSeverity)      \
  X(TEXT, MessageText, MESSAGE, OEString255)

class OEStatus : public OEEnvelopeAggregate {
  OE_AGGREGATE(OEStatus, OE_STATUS_FIELDS)

  // The OFX code of a client that is up to date.
  static constexpr int32_t kCodeUpToDate = 1;
  // True when SEVERITY is present and is ERROR.
  bool IsError() const { return ValidateTag(OE_TAG_SEVERITY) && GetSeverity() == OE_SEVERITY_ERROR; }
  // True when CODE is present and is 1.
  bool IsUpToDate() const { return ValidateTag(OE_TAG_CODE) && GetCode() == kCodeUpToDate; }
};
