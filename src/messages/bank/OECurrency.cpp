#include "ofxkit/messages/bank/OECurrency.h"

OE_DEFINE_AGGREGATE(OECurrency, OEAggregate, OE_CURRENCY_FIELDS, CURRENCY,
                    .Valid(OE_TAGS(CURRATE, CURSYM))
                    .Required(OE_TAGS(CURRATE, CURSYM)))

unsigned short OECurrency::DeepCopyTo(const OECurrency* from, OECurrency** to) {
  if (!to) return 0;
  if (!from) {
    delete *to;
    *to = nullptr;
    return 1;
  }
  if (!*to) {
    OEDataObjFactory* factory = GetFactory();
    if (!factory || !(*to = factory->NewCurrency())) {
      if (factory) g_allocFailed = 1;
      return 0;
    }
  }
  return (*to)->CopyAggregateFrom(from);
}
