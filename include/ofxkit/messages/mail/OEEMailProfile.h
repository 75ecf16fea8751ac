// What a message set offers by secure mail ("EMAILPROF" in its profile).
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/profile/OEMessageSetVersion.h"

#define OE_EMAILPROFILE_FIELDS(X)          \
  X(FLAG, CanEMail, CANEMAIL, unsigned short) \
  X(FLAG, CanNotify, CANNOTIFY, unsigned short)

class OEEMailProfile : public OEAggregate {
  OE_AGGREGATE(OEEMailProfile, OE_EMAILPROFILE_FIELDS)
};

// The e-mail message set as a profile describes it ("EMAILMSGSETV1").
#define OE_EMAILMESSAGESETV1_FIELDS(X)          \
  X(FLAG, EMailSup, MAILSUP, unsigned short)    \
  X(FLAG, GetMimeSup, GETMIMESUP, unsigned short)

class OEEMailMessageSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OEEMailMessageSetV1, OE_EMAILMESSAGESETV1_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};
