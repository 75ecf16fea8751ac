// The currency of an amount: "CURRENCY" or "ORIGCURRENCY" (its type tells which).
#pragma once

#include "ofxkit/core/OEAggregate.h"

#define OE_CURRENCY_FIELDS(X)                              \
  X(VALUE, CurrencyRate, CURRATE, OEPrecisionInteger)      \
  X(TEXT, CurrencySymbol, CURSYM, OEString3)

class OECurrency : public OEAggregate {
  OE_AGGREGATE(OECurrency, OE_CURRENCY_FIELDS)

  // Copies from into *to, making *to through the factory when it is null;
  // with from null, deletes *to and leaves it null.
  static unsigned short DeepCopyTo(const OECurrency* from, OECurrency** to);
};
