// Helpers shared by the envelope tests: writing an object as its parent
// would, parsing a small text into a root, and reading the parse log.
#pragma once

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "ofxkit/envelope/OERequest.h"
#include "ofxkit/ofxkit.h"
#include "support/log_fixture.h"
#include "support/ofx_text.h"

class EnvelopeTest : public LogFixture {
 protected:

  // Writes obj with its own start and end tags; OE_BUILD_STRICT strings.
  std::string Write(const OEDataObj& obj, OEBuildStatus* status = nullptr, unsigned short checkRequired = 0) {
    WrittenText written = WriteUnderOwnTag(obj, OE_BUILD_STRICT, checkRequired);
    if (status) *status = written.status;
    inError = written.inError;
    return written.text;
  }

  OEParseStatus Parse(const std::string& text, OEDataObj* root) { return ParseText(text, root); }

  static std::vector<OETagID> ValidTags(const OEDataObj& obj) {
    OEArrayOfTags tags{nullptr, 0};
    obj.GetArrayOfValidTags(tags);
    return std::vector<OETagID>(tags.tags, tags.tags + tags.count);
  }

  // How many warnings of one code the log holds.
  unsigned short Count(OEParseWarning warning) const {
    unsigned short n = 0;
    for (unsigned short i = 0; i < log->Entries(); ++i)
      if (log->Get(i)->warning == warning) ++n;
    return n;
  }
  bool LogMentions(const std::string& text) const {
    for (unsigned short i = 0; i < log->Entries(); ++i) {
      const OEParseException* e = log->Get(i);
      if (std::string(e->value.c_str()).find(text) != std::string::npos ||
          std::string(e->tagName.c_str()).find(text) != std::string::npos)
        return true;
    }
    return false;
  }

  OEDataObj* inError = nullptr;
};
