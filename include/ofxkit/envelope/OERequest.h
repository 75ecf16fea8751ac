// The OFX aggregate of a request file (OERequest) and of a response file
// (OEResponse): the message sets of one exchange, written in a fixed order
// whatever the order they were added in.
#pragma once

#include "ofxkit/envelope/OEMessageSet.h"

// What the request and the response share.
class OEOfxAggregate : public OEEnvelopeAggregate {
 public:
  // Makes factory the one every data object uses; 0 (changing nothing) for null.
  virtual unsigned short SetFactory(OEDataObjFactory* factory) { return OEDataObj::SetFactory(factory); }

  // A message set's start tag: a second set of one type logs OEPW_EXTRAAGG
  // and is refused; otherwise the set is made, appended and made current.
  // As the root of a parse, the object takes the text's OFX start tag as
  // its own.
  OEParseStatus HandleTagStart(const OETagDictionaryEntry* const entry) override;
  // Stray elements directly inside the OFX aggregate are ignored.
  OEParseStatus HandleTagElement(const OETagDictionaryEntry* const entry, const OEString& value) override;
  using OEDataObj::HandleTagElement;
  // The sets in the fixed order; two sets of one type stop the build with
  // OE_BUILD_REPEATED_SET.
  OEBuildStatus Build(OEBuilder* builder) const override;
  // The sign-on set and at least one set.
  unsigned short AllRequiredPresent() override;
};

// The message sets known to the OFX aggregate: FIELDS of a side (S is RQ
// or RS), each a further tag of one list of sets.
#define OE_OFX_FIELDS(X, S, SetClass)                         \
  X(LIST, MessageSet, SIGNONMSGS##S##V1, SetClass)            \
  X(ALSOLIST, MessageSet, SIGNUPMSGS##S##V1, SetClass)        \
  X(ALSOLIST, MessageSet, BANKMSGS##S##V1, SetClass)          \
  X(ALSOLIST, MessageSet, CREDITCARDMSGS##S##V1, SetClass)    \
  X(ALSOLIST, MessageSet, INVSTMTMSGS##S##V1, SetClass)       \
  X(ALSOLIST, MessageSet, SECLISTMSGS##S##V1, SetClass)       \
  X(ALSOLIST, MessageSet, INTERXFERMSGS##S##V1, SetClass)     \
  X(ALSOLIST, MessageSet, WIREXFERMSGS##S##V1, SetClass)      \
  X(ALSOLIST, MessageSet, BILLPAYMSGS##S##V1, SetClass)       \
  X(ALSOLIST, MessageSet, EMAILMSGS##S##V1, SetClass)         \
  X(ALSOLIST, MessageSet, VEXA_BRANDMSGS##S##V1, SetClass)    \
  X(ALSOLIST, MessageSet, VEXA_CLOGMSGS##S##V1, SetClass)     \
  X(ALSOLIST, MessageSet, VEXA_SURVEYMSGS##S##V1, SetClass)   \
  X(ALSOLIST, MessageSet, VEXA_USLFIMSGS##S##V1, SetClass)    \
  X(ALSOLIST, MessageSet, VEXA_USLCUMSGS##S##V1, SetClass)    \
  X(ALSOLIST, MessageSet, V_PAYROLLMSGS##S##V1, SetClass)     \
  X(ALSOLIST, MessageSet, PROFMSGS##S##V1, SetClass)
#define OE_REQUEST_FIELDS(X) OE_OFX_FIELDS(X, RQ, OEMessageSetRq)
#define OE_RESPONSE_FIELDS(X) OE_OFX_FIELDS(X, RS, OEMessageSetRs)

// The OFX aggregate of a request. Message sets: GetNumMessage(),
// GetMessageSet(i), SetMessageSet(i, set) (i equal to the count appends,
// a greater i fails), AppendMessageSet(set).
class OERequest : public OEOfxAggregate {
  OE_AGGREGATE(OERequest, OE_REQUEST_FIELDS)
  unsigned short GetNumMessage() const { return GetNumMessageSet(); }
};

// The OFX aggregate of a response; the same operations with OEMessageSetRs.
class OEResponse : public OEOfxAggregate {
  OE_AGGREGATE(OEResponse, OE_RESPONSE_FIELDS)
  unsigned short GetNumMessage() const { return GetNumMessageSet(); }
};

// The requests of a request file and the responses of a response file.
template <>
struct OEArrayElementTraits<OERequest> {
  static OERequest* New();
  static void Delete(OERequest* p) { delete p; }
};
template <>
struct OEArrayElementTraits<OEResponse> {
  static OEResponse* New();
  static void Delete(OEResponse* p) { delete p; }
};
class OEDynamicArrayRequest : public OEDynamicArrayTyped<OERequest> {
 public:
  using OEDynamicArrayTyped<OERequest>::OEDynamicArrayTyped;
};
class OEDynamicArrayResponse : public OEDynamicArrayTyped<OEResponse> {
 public:
  using OEDynamicArrayTyped<OEResponse>::OEDynamicArrayTyped;
};
