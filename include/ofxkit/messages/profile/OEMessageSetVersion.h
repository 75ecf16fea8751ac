// One version of a message set in a profile response ("...MSGSETV1"): its
// core, and in the subclasses of each message set that set's own fields.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/profile/OEMessageSetCore.h"

#define OE_MESSAGESETVERSION_FIELDS(X) X(CHILD, MessageSetCore, MSGSETCORE, OEMessageSetCore)

class OEMessageSetVersion : public OEAggregate {
  OE_AGGREGATE(OEMessageSetVersion, OE_MESSAGESETVERSION_FIELDS)
};
