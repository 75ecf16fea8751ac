// The rules of an institution's transfers ("XFERPROF" in the bank and
// interbank-transfer profiles): processing days and times, what may be
// scheduled, repeated or modified, and the default days.
#pragma once

#include "ofxkit/core/OEAggregate.h"

#define OE_XFERPROFILE_FIELDS(X)                            \
  X(VALUES, DayOfWeek, PROCDAYSOFF, OEDayOfWeek)            \
  X(VALUE, TimeProcessEnd, PROCENDTM, OETime)               \
  X(FLAG, CanSchedule, CANSCHED, unsigned short)            \
  X(FLAG, CanRecure, CANRECUR, unsigned short)              \
  X(FLAG, CanModifyXfer, CANMODXFERS, unsigned short)       \
  X(FLAG, CanModifyModel, CANMODMDLS, unsigned short)       \
  X(VALUE, ModelWindow, MODELWND, unsigned short)           \
  X(VALUE, DaysWithdrawn, DAYSWITH, short)                  \
  X(VALUE, DefaultDaysToPay, DFLTDAYSTOPAY, unsigned short)

class OEXferProfile : public OEAggregate {
  OE_AGGREGATE(OEXferProfile, OE_XFERPROFILE_FIELDS)
  unsigned short GetNumberDayOfWeek() const { return GetNumDayOfWeek(); }
};
