#include "ofxkit/messages/mail/OEEMailProfile.h"

OE_DEFINE_AGGREGATE(OEEMailProfile, OEAggregate, OE_EMAILPROFILE_FIELDS, EMAILPROF,
                    .Valid(OE_TAGS(CANEMAIL, CANNOTIFY))
                    .Required(OE_TAGS(CANEMAIL, CANNOTIFY)))
