#include "ofxkit/envelope/OETransBase.h"

#include "ofxkit/ofxkit.h"

OETransBase* OENewInnerTrans(OEDataObjFactory* factory, OETagID tag) {
  if (!factory) return nullptr;
  switch (tag) {
#define OE_INNER(TAG, creator) \
  case OE_TAG_##TAG:           \
    return factory->creator();
#include "ofxkit/envelope/OEInnerCreators.def"
#undef OE_INNER
    default:
      return nullptr;
  }
}
