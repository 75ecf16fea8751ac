// Every library object that a parse needs is made through the installed
// factory, so an application can substitute its own subclasses.
#pragma once

#include "ofxkit/types/OECommon.h"

class OEParseException;
#define OE_CREATOR(creator, cls) class cls;
#define OE_CREATOR_PLAIN(creator, type)
#include "ofxkit/core/OEFactoryCreators.def"
#undef OE_CREATOR_PLAIN
#undef OE_CREATOR

class OEDataObjFactory {
 public:
  OEDataObjFactory() = default;
  OEDataObjFactory(const OEDataObjFactory&) = default;
  OEDataObjFactory& operator=(const OEDataObjFactory&) = default;
  virtual ~OEDataObjFactory() = default;

#define OE_CREATOR(creator, cls) virtual cls* creator();
#include "ofxkit/core/OEFactoryCreators.def"
#undef OE_CREATOR

  // A new, empty warning record (warning 0, no object, empty texts, position -1).
  OEParseException* NewParseException();
};
