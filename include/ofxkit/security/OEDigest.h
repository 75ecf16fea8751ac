// Message digests of at most 20 bytes (SHA-1, MD5).
#pragma once

#include "ofxkit/security/OESecStatus.h"
#include "ofxkit/types/OEBuffer.h"
#include "ofxkit/types/OEString.h"

class OEDigest {
 public:
  static constexpr uint32_t kMaxDigest = 20;

  explicit OEDigest(OESecSelector algorithm);
  OEDigest(OEBuffer* input, OESecSelector algorithm);
  OEDigest(const OEString* input, OESecSelector algorithm);
  OEDigest(const OEDigest&) = delete;
  OEDigest& operator=(const OEDigest&) = delete;
  ~OEDigest() = default;

  OESecStatus SetInputData(OEBuffer* input);
  OESecStatus SetInputStr(const OEString* input);
  OEBuffer* GetOutputData() { return &m_output; }
  OESecStatus GetStatus() const { return m_status; }

 private:
  OESecStatus Run(const unsigned char* data, size_t n);

  OEBuffer* m_input;
  const OEString* m_inputText;
  int m_alg;  // toolkit code, 0 when the selector names no digest
  OEBuffer m_output;
  OESecStatus m_status;
};
