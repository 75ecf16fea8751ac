// The root certificates that the library trusts on request (DER-encoded).
// Each entry names its root id; an entry without bytes is a root this build
// does not carry, and adding it is refused.
#include "ofxkit/net/OENet.h"

namespace {

struct BuiltInRoot {
  OECallbackRootID id;
  const unsigned char* der;
  unsigned short length;
};

const BuiltInRoot kBuiltInRoots[] = {
    {OE_ROOT_VEXA_BRANDING, nullptr, 0},
    {OE_ROOT_VERISIGN_OFX_CA, nullptr, 0},
    {OE_ROOT_VERISIGN_CLASS3, nullptr, 0},
    {OE_ROOT_RSA_SECURE_SERVER, nullptr, 0},
};

}  // namespace

unsigned short OENetRequest::GetBuiltInRoot(OECallbackRootID id, const char*& data, unsigned short& length) {
  for (const BuiltInRoot& root : kBuiltInRoots) {
    if (root.id != id) continue;
    if (!root.der || !root.length) break;
    data = reinterpret_cast<const char*>(root.der);
    length = root.length;
    return 1;
  }
  data = nullptr;
  length = 0;
  return 0;
}
