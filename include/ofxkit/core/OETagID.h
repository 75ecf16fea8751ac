// Ids of every OFX tag the library knows. Names exist only at the text
// boundary, through the tag dictionary.
#pragma once

#include <cstdint>

enum OETagID : uint32_t {
  OE_TAG_NONE = 0,
#define OE_TAG(sym, name) OE_TAG_##sym,
#include "ofxkit/core/OETags.def"
#undef OE_TAG
  OE_TAG_COUNT_PLUS_ONE
};

// Kind of a tag item, as written or read.
enum OETagType : int32_t {
  OE_TAG_START = 0,
  OE_TAG_END = 1,
  OE_TAG_ELEMENT = 2,
  OE_TAG_DONE = 3,     // the parse engine found no further tag
  OE_TAG_FAILED = -1   // a start tag with nothing after it, or an unreadable value
};

// How an object hands out its valid or required tags.
struct OEArrayOfTags {
  const OETagID* tags;
  unsigned short count;
};
