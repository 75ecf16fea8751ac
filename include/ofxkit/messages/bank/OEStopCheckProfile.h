// The rules of an institution's stop-payment service ("STPCHKPROF" in the
// bank profile): processing days and time, ranges, descriptions and the fee.
#pragma once

#include "ofxkit/core/OEAggregate.h"

#define OE_STOPCHECKPROFILE_FIELDS(X)                       \
  X(VALUES, DayOfWeek, PROCDAYSOFF, OEDayOfWeek)            \
  X(VALUE, TimeProcessEnd, PROCENDTM, OETime)               \
  X(FLAG, CanUseRange, CANUSERANGE, unsigned short)         \
  X(FLAG, CanUseDescription, CANUSEDESC, unsigned short)    \
  X(VALUE, StopCheckFee, STPCHKFEE, OEPrecisionInteger)

class OEStopCheckProfile : public OEAggregate {
  OE_AGGREGATE(OEStopCheckProfile, OE_STOPCHECKPROFILE_FIELDS)
  unsigned short GetNumberDayOfWeek() const { return GetNumDayOfWeek(); }
};
