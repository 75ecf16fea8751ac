// Printable (base64) encoding and decoding of binary data.
#pragma once

#include "ofxkit/security/OESecStatus.h"
#include "ofxkit/types/OEBuffer.h"

// Shared body of the two directions; the status codes differ by direction.
class OECodingBase {
 public:
  OECodingBase(const OECodingBase&) = delete;
  OECodingBase& operator=(const OECodingBase&) = delete;
  OEBuffer* GetOutputData() { return &m_output; }
  OESecStatus GetStatus() const { return m_status; }

 protected:
  OECodingBase(OEBuffer* input, OESecSelector selector, bool encode);
  ~OECodingBase() = default;
  OESecStatus SetInput(OEBuffer* input);

 private:
  OEBuffer* m_input;
  int m_alg;
  bool m_encode;
  OEBuffer m_output;
  OESecStatus m_status;
};

class OEEncode : public OECodingBase {
 public:
  OEEncode() : OECodingBase(nullptr, OE_AI_Base64, true) {}
  explicit OEEncode(OESecSelector selector) : OECodingBase(nullptr, selector, true) {}
  OEEncode(OEBuffer* input, OESecSelector selector = OE_AI_Base64) : OECodingBase(input, selector, true) {}
  OESecStatus SetInputData(OEBuffer* input) { return SetInput(input); }
};

class OEDecode : public OECodingBase {
 public:
  OEDecode() : OECodingBase(nullptr, OE_AI_Base64, false) {}
  explicit OEDecode(OESecSelector selector) : OECodingBase(nullptr, selector, false) {}
  OEDecode(OEBuffer* input, OESecSelector selector = OE_AI_Base64) : OECodingBase(input, selector, false) {}
  OESecStatus SetInputData(OEBuffer* input) { return SetInput(input); }
};
