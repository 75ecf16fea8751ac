// One version of a message set in a profile response ("...MSGSETV1"): its
// core, and in the subclasses of each message set that set's own fields.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/profile/OEMessageSetCore.h"

#define OE_MESSAGESETVERSION_FIELDS(X) X(CHILD, MessageSetCore, MSGSETCORE, OEMessageSetCore)

class OEMessageSetVersion : public OEAggregate {
  OE_AGGREGATE(OEMessageSetVersion, OE_MESSAGESETVERSION_FIELDS)
};

// A version object is made by the tag it stands under: "BANKMSGSETV1" makes
// an OEBankMessageSetV1, "PROFMSGSETV1" an OEProfileMessageSetV1, ...; null
// for a tag that is no version of a message set.
template <>
struct OEChildCreator<OEMessageSetVersion> {
  static OEMessageSetVersion* Make(OEDataObjFactory* factory, OETagID tag);
};

// The sign-on and profile message sets have nothing of their own.
class OESignOnMessageSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OESignOnMessageSetV1, OE_NO_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};

class OEProfileMessageSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OEProfileMessageSetV1, OE_NO_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};
