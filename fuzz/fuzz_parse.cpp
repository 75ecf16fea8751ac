// Parses arbitrary bytes as an OFX reply, writes whatever tree came out back
// as OFX, and parses that again. Any crash, leak, hang or sanitizer report is
// a fault; statuses and warnings are expected.
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
}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size > 1000000) return 0;
  const char* text = reinterpret_cast<const char*>(data);
  OEBankAccount account;
  ParseInto(&account, text, static_cast<uint32_t>(size));

  OEBuffer out;
  OEBuilder builder;
  builder.Build(&out, &account, OE_BUILD_LENIENT, 1);
  OEBankAccount again;
  ParseInto(&again, out.GetBufferPtr(), out.GetBufferSize());

  OEBankAccount copy;
  copy.DeepCopyFrom(&account);
  OEParseLogger::TheOEParseLogger()->DeleteAll();
  return 0;
}
