// What a message set offers by secure mail ("EMAILPROF" in its profile).
#pragma once

#include "ofxkit/core/OEAggregate.h"

#define OE_EMAILPROFILE_FIELDS(X)          \
  X(FLAG, CanEMail, CANEMAIL, unsigned short) \
  X(FLAG, CanNotify, CANNOTIFY, unsigned short)

class OEEMailProfile : public OEAggregate {
  OE_AGGREGATE(OEEMailProfile, OE_EMAILPROFILE_FIELDS)
};
