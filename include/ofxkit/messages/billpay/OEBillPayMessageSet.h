// The bill-payment message set as a profile describes it ("BILLPAYMSGSETV1"):
// processing days and windows, how payees may be named and what may change.
#pragma once

#include "ofxkit/core/OEAggregate.h"
#include "ofxkit/messages/profile/OEMessageSetVersion.h"

#define OE_BILLPAYMESSAGESETV1_FIELDS(X)                                         \
  X(VALUE, DaysWithdrawn, DAYSWITH, short)                                       \
  X(VALUE, DefaultDaysToPay, DFLTDAYSTOPAY, unsigned short)                      \
  X(VALUE, XferDaysWithdrawn, XFERDAYSWITH, unsigned short)                      \
  X(VALUE, XferDefaultDaysToPay, XFERDFLTDAYSTOPAY, unsigned short)              \
  X(VALUE, ProcessingEndTime, PROCENDTM, OETime)                                 \
  X(VALUE, ModelWindow, MODELWND, unsigned short)                                \
  X(VALUE, PostProcessingWindow, POSTPROCWND, unsigned short)                    \
  X(FLAG, StatusViaMods, STSVIAMODS, unsigned short)                             \
  X(FLAG, PaymentByAddress, PMTBYADDR, unsigned short)                           \
  X(FLAG, PaymentByTransfer, PMTBYXFER, unsigned short)                          \
  X(FLAG, PaymentByPayeeID, PMTBYPAYEEID, unsigned short)                        \
  X(FLAG, CanAddPayee, CANADDPAYEE, unsigned short)                              \
  X(FLAG, HasExtendedPayments, HASEXTDPMT, unsigned short)                       \
  X(FLAG, CanModifyPayments, CANMODPMTS, unsigned short)                         \
  X(FLAG, CanModifyModels, CANMODMDLS, unsigned short)                           \
  X(FLAG, DifferentFirstPayment, DIFFFIRSTPMT, unsigned short)                   \
  X(FLAG, DifferentLastPayment, DIFFLASTPMT, unsigned short)                     \
  X(VALUES, ProcessingDaysOff, PROCDAYSOFF, OEDayOfWeek)                         \
  X(FLAG, VexaCanRecur, VEXA_CANRECUR, unsigned short)                           \
  X(FLAG, VexaJustOnePayacct, VEXA_JUSTONEPAYACCT, unsigned short)

class OEBillPayMessageSetV1 : public OEMessageSetVersion {
  OE_AGGREGATE(OEBillPayMessageSetV1, OE_BILLPAYMESSAGESETV1_FIELDS)
  using OEMessageSetVersion::DeepCopyFrom;
};
