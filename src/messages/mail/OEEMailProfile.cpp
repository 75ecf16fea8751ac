#include "ofxkit/messages/mail/OEEMailProfile.h"

OE_DEFINE_AGGREGATE(OEEMailProfile, OEAggregate, OE_EMAILPROFILE_FIELDS, EMAILPROF,
                    .Valid(OE_TAGS(CANEMAIL, CANNOTIFY))
                    .Required(OE_TAGS(CANEMAIL, CANNOTIFY)))
OE_DEFINE_AGGREGATE(OEEMailMessageSetV1, OEMessageSetVersion, OE_EMAILMESSAGESETV1_FIELDS, EMAILMSGSETV1,
                    .Valid(OE_TAGS(MSGSETCORE, MAILSUP, GETMIMESUP))
                    .Required(OE_TAGS(MSGSETCORE, MAILSUP, GETMIMESUP)))
