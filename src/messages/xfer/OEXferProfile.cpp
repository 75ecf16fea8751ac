#include "ofxkit/messages/xfer/OEXferProfile.h"

OE_DEFINE_AGGREGATE(OEXferProfile, OEAggregate, OE_XFERPROFILE_FIELDS, XFERPROF,
                    .Valid(OE_TAGS(PROCDAYSOFF, PROCENDTM, CANSCHED, CANRECUR, CANMODXFERS, CANMODMDLS, MODELWND,
                                   DAYSWITH, DFLTDAYSTOPAY))
                    .Required(OE_TAGS(PROCENDTM, CANSCHED, CANRECUR, CANMODXFERS, CANMODMDLS, MODELWND, DAYSWITH,
                                      DFLTDAYSTOPAY)))
