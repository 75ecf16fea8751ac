#include "ofxkit/messages/profile/OEMessageSetVersion.h"

OE_DEFINE_AGGREGATE(OEMessageSetVersion, OEAggregate, OE_MESSAGESETVERSION_FIELDS, PROFMSGSETV1,
                    .Valid(OE_TAGS(MSGSETCORE))
                    .Required(OE_TAGS(MSGSETCORE)))
OE_DEFINE_AGGREGATE(OESignOnMessageSetV1, OEMessageSetVersion, OE_NO_FIELDS, SIGNONMSGSETV1,
                    .Valid(OE_TAGS(MSGSETCORE))
                    .Required(OE_TAGS(MSGSETCORE)))
OE_DEFINE_AGGREGATE(OEProfileMessageSetV1, OEMessageSetVersion, OE_NO_FIELDS, PROFMSGSETV1,
                    .Valid(OE_TAGS(MSGSETCORE))
                    .Required(OE_TAGS(MSGSETCORE)))
