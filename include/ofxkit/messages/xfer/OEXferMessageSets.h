// The interbank and wire transfer message sets as a profile describes them
// ("INTERXFERMSGSETV1", "WIREXFERMSGSETV1").
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/profile/OEMessageSetVersion.h"
#include "ofxkit/messages/xfer/OEXferProfile.h"

#define OE_XFER_FEES_FIELDS(X)                                           \
  X(VALUE, DomesticXferFee, DOMXFERFEE, OEPrecisionInteger)              \
  X(VALUE, InternationalXferFee, INTLXFERFEE, OEPrecisionInteger)

#define OE_INTERXFERMESSAGESETV1_FIELDS(X)                 \
  X(CHILD, XferProfile, XFERPROF, OEXferProfile)           \
  X(FLAG, CanBillPay, CANBILLPAY, unsigned short)          \
  X(VALUE, CancelWindow, CANCELWND, unsigned short)        \
  OE_XFER_FEES_FIELDS(X)

class OEInterXferMessageSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OEInterXferMessageSetV1, OE_INTERXFERMESSAGESETV1_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};

#define OE_WIREXFERMESSAGESETV1_FIELDS(X)                  \
  X(VALUES, DayOfWeek, PROCDAYSOFF, OEDayOfWeek)           \
  X(VALUE, TimeProcessEnd, PROCENDTM, OETime)              \
  X(FLAG, CanSchedule, CANSCHED, unsigned short)           \
  OE_XFER_FEES_FIELDS(X)

class OEWireXferMessageSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OEWireXferMessageSetV1, OE_WIREXFERMESSAGESETV1_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
  unsigned short GetNumberDayOfWeek() const { return GetNumDayOfWeek(); }
};
