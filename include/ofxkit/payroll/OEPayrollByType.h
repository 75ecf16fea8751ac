// Payroll classes that stand under several tags with different contents
// (sick and vacation hours, the state taxes of an employee, quarter- and
// year-to-date totals, salary and hourly items): one class whose valid and
// required tags are chosen at run time by the tag the object stands under.
// A subclass per tag only sets its default type.
#pragma once

#include <vector>

#include "ofxkit/envelope/OEEnvelopeAggregate.h"
#include "ofxkit/payroll/OEPayrollTypes.h"

struct OEPayrollTypeRow {
  OETagID type;
  std::vector<OETagID> valid;
  std::vector<OETagID> required;
};

// The description of the row whose type is `type` (made once, kept in
// cache), or null when no row has it.
const OEAggregateInfo* OEPayrollTypeInfo(OETypeInfoCache& cache, const OEAggregateInfo& classInfo, OETagID type,
                                         const std::vector<OEPayrollTypeRow>& rows);

// A subclass that only stands under another tag of its base.
#define OE_PAYROLL_TYPED_SUBCLASS(Class, Base, TAG) \
  class Class : public Base {                       \
   public:                                          \
    Class() { SetType(OE_TAG_##TAG); }              \
  };
