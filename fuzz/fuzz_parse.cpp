// Parses arbitrary bytes as an OFX response file and as a request file,
// writes whatever trees came out back as OFX, parses that again and deep-
// copies the result. Any crash, leak, hang or sanitizer report is a fault;
// statuses and warnings are expected.
#include <ofxkit/ofxkit.h>

#include <cstddef>
#include <cstdint>

namespace {
OEParseStatus ParseInto(OEDataObj* root, const char* data, uint32_t size) {
  OEBuffer buffer(size + 1, 0);
  buffer.WriteLarge(data, size);
  OESimpleParser parser;
  return parser.Parse(&buffer, root, 1);
}

template <class File>
void RoundTrip(const char* text, uint32_t size) {
  File file;
  ParseInto(&file, text, size);
  file.SetHeader(OE_HEADER_OFXHEADER, "100");
  OEBuffer out;
  OEBuilder builder;
  builder.Build(&out, &file, OE_BUILD_LENIENT, 1);
  File again;
  ParseInto(&again, out.GetBufferPtr(), out.GetBufferSize());
  File copy;
  copy.DeepCopyFrom(&again);
}
}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size > 1000000) return 0;
  const char* text = reinterpret_cast<const char*>(data);
  RoundTrip<OEFileRs>(text, static_cast<uint32_t>(size));
  RoundTrip<OEFileRq>(text, static_cast<uint32_t>(size));
  OEParseLogger::TheOEParseLogger()->DeleteAll();
  return 0;
}
