// The base of every inner request and response (what a transaction wrapper
// carries), and how the wrappers make one for a tag.
#pragma once

#include "ofxkit/core/OEAggregate.h"

class OETransBase : public OEAggregate {
 public:
  // Copies an inner request or response of the same class; 0 otherwise.
  virtual unsigned short DeepCopyFrom(const OETransBase* source) { return CopyAggregateFrom(source); }
};

// Makes the inner request or response that stands under `tag` through the
// factory: null when the tag is not an inner aggregate the library knows or
// the factory gives none. The tags and their creators are listed in
// ofxkit/envelope/OEInnerCreators.def; a message set adds its lines there.
OETransBase* OENewInnerTrans(OEDataObjFactory* factory, OETagID tag);
