#include "ofxkit/security/OECoding.h"

#include "ofxkit/security/OESecToolkit.h"

OECodingBase::OECodingBase(OEBuffer* input, OESecSelector selector, bool encode)
    : m_input(nullptr), m_alg(OESecCode(selector)), m_encode(encode), m_status(OE_SEC_OK) {
  if (m_alg != OE_AI_Base64(nullptr)) {
    m_alg = 0;
    m_status = encode ? OE_SEC_ENCODE_SETUP : OE_SEC_DECODE_SETUP;
  } else if (input) {
    SetInput(input);
  }
}

OESecStatus OECodingBase::SetInput(OEBuffer* input) {
  m_input = input;
  if (!m_alg) return m_status = m_encode ? OE_SEC_ENCODE_SETUP : OE_SEC_DECODE_SETUP;
  const unsigned char* data = input ? reinterpret_cast<const unsigned char*>(input->GetBufferPtr()) : nullptr;
  size_t n = input ? input->GetBufferSize() : 0;
  if (OESecBase64(m_encode, data, n, m_output)) return m_status = OE_SEC_OK;
  return m_status = m_encode ? OE_SEC_ENCODE_FAILED : OE_SEC_DECODE_FAILED;
}
