// The bank and credit-card message sets as a profile describes them
// ("BANKMSGSETV1", "CREDITCARDMSGSETV1").
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/bank/OEStopCheckProfile.h"
#include "ofxkit/messages/mail/OEEMailProfile.h"
#include "ofxkit/messages/profile/OEMessageSetVersion.h"
#include "ofxkit/messages/xfer/OEXferProfile.h"

// The account types the institution does not serve may be listed any number
// of times ("INVALIDACCTTYPE"); a value that is no account type is logged
// and dropped.
#define OE_BANKMESSAGESETV1_FIELDS(X)                                       \
  X(CHILD, XferProfile, XFERPROF, OEXferProfile)                            \
  X(CHILD, StopCheckProfile, STPCHKPROF, OEStopCheckProfile)                \
  X(CHILD, EMailProfile, EMAILPROF, OEEMailProfile)                         \
  X(VALUES, InvalidBankAccountType, INVALIDACCTTYPE, OEBankAccountType)     \
  X(FLAG, ClosingAvailable, CLOSINGAVAIL, unsigned short)

class OEBankMessageSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OEBankMessageSetV1, OE_BANKMESSAGESETV1_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
  unsigned short GetNumInvalidBankAccountTypes() const { return GetNumInvalidBankAccountType(); }
};

#define OE_CREDITCARDMESSAGESETV1_FIELDS(X) X(FLAG, ClosingAvailable, CLOSINGAVAIL, unsigned short)

class OECreditCardMessageSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OECreditCardMessageSetV1, OE_CREDITCARDMESSAGESETV1_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};
