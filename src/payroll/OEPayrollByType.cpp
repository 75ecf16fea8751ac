#include "ofxkit/payroll/OEPayrollByType.h"

const OEAggregateInfo* OEPayrollTypeInfo(OETypeInfoCache& cache, const OEAggregateInfo& classInfo, OETagID type,
                                         const std::vector<OEPayrollTypeRow>& rows) {
  for (size_t i = 0; i < rows.size(); ++i) {
    if (rows[i].type != type) continue;
    const OEPayrollTypeRow& row = rows[i];
    return cache.Get(static_cast<int>(i), classInfo, [&row] {
      OETypeDescription d;
      d.type = row.type;
      d.valid = row.valid;
      d.required = row.required;
      return d;
    });
  }
  return nullptr;
}
