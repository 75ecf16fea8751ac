// Writing an object as its parent would, and parsing a small OFX text into a
// root: what most tests of aggregates do.
#pragma once

#include <string>

#include "ofxkit/ofxkit.h"

struct WrittenText {
  std::string text;
  OEBuildStatus status;
  OEDataObj* inError;  // the builder's first failing object
};

// obj with its own start and end tags (its type), as a parent writes it.
inline WrittenText WriteUnderOwnTag(const OEDataObj& obj, OEBuildStringOpt option = OE_BUILD_STRICT,
                                    unsigned short checkRequired = 0) {
  struct Holder : OEDataObj {
    const OEDataObj* inner = nullptr;
    OEBuildStatus Build(OEBuilder* b) const override { return inner->BuildObject(b, OE_TAG_NONE); }
  } holder;
  holder.inner = &obj;
  OEBuilder writer;
  OEBuffer buffer;
  OEBuildStatus status = writer.Build(&buffer, &holder, option, checkRequired);
  return WrittenText{std::string(buffer.GetBufferPtr(), buffer.GetBufferSize()), status, writer.GetObjectInError()};
}

inline OEParseStatus ParseText(const std::string& text, OEDataObj* root, unsigned short checkRequired = 0,
                               OEDataObj** withError = nullptr) {
  OEBuffer buffer(static_cast<uint32_t>(text.size() + 1), 1u << 16);
  buffer.WriteLarge(text.data(), static_cast<uint32_t>(text.size()));
  OESimpleParser parser;
  OEParseStatus status = parser.Parse(&buffer, root, checkRequired);
  if (withError) *withError = parser.GetObjectWithError();
  return status;
}
