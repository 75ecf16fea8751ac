#include "ofxkit/security/OEDigest.h"

#include <openssl/evp.h>

#include "ofxkit/security/OESecToolkit.h"

namespace {
const EVP_MD* DigestFor(int code) {
  if (code == OE_AI_SHA1(nullptr)) return EVP_sha1();
  if (code == OE_AI_MD5(nullptr)) return EVP_md5();
  return nullptr;
}
}  // namespace

OEDigest::OEDigest(OESecSelector algorithm)
    : m_input(nullptr), m_inputText(nullptr), m_alg(OESecCode(algorithm)), m_status(OE_SEC_OK) {
  if (!DigestFor(m_alg)) {
    m_alg = 0;
    m_status = OE_SEC_DIGEST_SETUP;
  }
}

OEDigest::OEDigest(OEBuffer* input, OESecSelector algorithm) : OEDigest(algorithm) {
  if (m_alg) SetInputData(input);
}

OEDigest::OEDigest(const OEString* input, OESecSelector algorithm) : OEDigest(algorithm) {
  if (m_alg) SetInputStr(input);
}

OESecStatus OEDigest::SetInputData(OEBuffer* input) {
  m_input = input;
  m_inputText = nullptr;
  return input ? Run(reinterpret_cast<const unsigned char*>(input->GetBufferPtr()), input->GetBufferSize())
               : Run(nullptr, 0);
}

OESecStatus OEDigest::SetInputStr(const OEString* input) {
  m_inputText = input;
  m_input = nullptr;
  return input ? Run(reinterpret_cast<const unsigned char*>(input->c_str()), input->GetStrLength()) : Run(nullptr, 0);
}

OESecStatus OEDigest::Run(const unsigned char* data, size_t n) {
  OESecEmpty(m_output);
  const EVP_MD* md = DigestFor(m_alg);
  if (!md) return m_status = OE_SEC_DIGEST_SETUP;
  unsigned char digest[EVP_MAX_MD_SIZE];
  unsigned int got = 0;
  // An empty buffer is no input; the empty text is a valid message.
  if ((!data && n) || (m_input && n == 0) || (!m_input && !m_inputText) ||
      EVP_Digest(data ? data : reinterpret_cast<const unsigned char*>(""), n, digest, &got, md, nullptr) != 1 ||
      got > kMaxDigest || !OESecSetOutput(m_output, digest, got))
    return m_status = OE_SEC_DIGEST_FAILED;
  return m_status = OE_SEC_OK;
}
