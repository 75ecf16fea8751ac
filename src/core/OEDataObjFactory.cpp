#include "ofxkit/core/OEDataObjFactory.h"

#include <new>

#include "ofxkit/ofxkit.h"

namespace {
template <class T>
T* MakeOrFlag() {
  T* p = new (std::nothrow) T;
  if (!p) g_allocFailed = 1;
  return p;
}
}  // namespace

#define OE_CREATOR(creator, cls) \
  cls* OEDataObjFactory::creator() { return MakeOrFlag<cls>(); }
#include "ofxkit/core/OEFactoryCreators.def"
#undef OE_CREATOR

OEParseException* OEDataObjFactory::NewParseException() { return MakeOrFlag<OEParseException>(); }
