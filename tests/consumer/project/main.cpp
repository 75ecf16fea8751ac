// An application's view of the installed library: the umbrella header, a few
// objects, and the shared parse log.
#include <ofxkit/ofxkit.h>

#include <cstdio>

int main() {
  OEString32 name("Checking");
  OEBuffer buffer;
  buffer += "<OFX>";
  OEParseLogger* log = OEParseLogger::TheOEParseLogger();
  if (!log || name.SpecLength() != 32 || buffer.GetBufferSize() != 5) return 1;
  std::printf("ofxkit consumer ok\n");
  return 0;
}
