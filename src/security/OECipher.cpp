#include "ofxkit/security/OECipher.h"

#include <openssl/crypto.h>

#include "ofxkit/security/OESecToolkit.h"

namespace {
// Shared body of encryption and decryption: sets the key up, runs the cipher
// into out (emptied first) with at most cap bytes, and reports the status.
OESecStatus RunCipher(bool encrypt, OEKey* key, OESecSelector selector, const unsigned char* info,
                      const unsigned char* in, size_t n, uint32_t cap, OEBuffer& out) {
  OESecStatus setupFail = encrypt ? OE_SEC_ENCRYPT_SETUP : OE_SEC_DECRYPT_SETUP;
  OESecStatus runFail = encrypt ? OE_SEC_ENCRYPT_FAILED : OE_SEC_DECRYPT_FAILED;
  OESecEmpty(out);
  OEKeyObj* keyObj = key ? key->GetKeyObjPtr() : nullptr;
  if (!keyObj) return setupFail;
  if (!in || n == 0) return runFail;
  if (cap == 0 || out.AllocateTo(cap) != OEBUF_OK) return runFail;
  size_t got = 0;
  unsigned char* dst = reinterpret_cast<unsigned char*>(out.GetBufferPtr());
  OECipherResult r = OESecCipherRun(OESecCode(selector), info, *keyObj, encrypt, in, n, dst, cap, &got);
  if (r != OE_CIPHER_OK) {
    OPENSSL_cleanse(dst, cap);
    return r == OE_CIPHER_SETUP ? setupFail : runFail;
  }
  if (got) out.SetBufferSize(static_cast<uint32_t>(got));
  out.SetBufferOffset(0);
  return OE_SEC_OK;
}
}  // namespace

// ---------------------------------------------------------------------------

OECipherBase::OECipherBase(OEKey* key, OESecSelector algorithm)
    : m_key(key), m_selector(algorithm), m_algInfo(nullptr), m_done(0), m_status(OE_SEC_OK) {}

OEBuffer* OECipherBase::Output(bool encrypt, const unsigned char* in, size_t n, uint32_t cap) {
  if (m_done) return &m_output;
  m_status = RunCipher(encrypt, m_key, m_selector, m_algInfo, in, n, cap, m_output);
  m_done = m_status == OE_SEC_OK;
  return &m_output;
}

OEEncrypt::OEEncrypt(OESecSelector algorithm) : OEEncrypt(nullptr, nullptr, nullptr, algorithm) {}

OEEncrypt::OEEncrypt(OEBuffer* input, OEKey* key, OERandom* random, OESecSelector algorithm)
    : OECipherBase(key, algorithm), m_input(input), m_inputText(nullptr), m_random(random) {}

void OEEncrypt::SetInputData(OEBuffer* input) {
  m_inputText = nullptr;
  Invalidate(&m_input, input);
}

void OEEncrypt::SetInputStr(const OEString* input) {
  m_input = nullptr;
  Invalidate(&m_inputText, input);
}

OEBuffer* OEEncrypt::GetOutputData() {
  if (m_input)
    return Output(true, reinterpret_cast<const unsigned char*>(m_input->GetBufferPtr()), m_input->GetBufferSize(),
                  kMaxOutput);
  if (m_inputText)
    return Output(true, reinterpret_cast<const unsigned char*>(m_inputText->c_str()), m_inputText->GetStrLength(),
                  kMaxOutput);
  return Output(true, nullptr, 0, kMaxOutput);
}

OEDecrypt::OEDecrypt() : OEDecrypt(nullptr, nullptr, OE_AI_DES_EDE3_CBCPad) {}

OEDecrypt::OEDecrypt(OESecSelector algorithm) : OEDecrypt(nullptr, nullptr, algorithm) {}

OEDecrypt::OEDecrypt(OEBuffer* cipherText, OEKey* key, OESecSelector algorithm)
    : OECipherBase(key, algorithm), m_cipherText(cipherText) {}

OEBuffer* OEDecrypt::GetOutputData() {
  if (!m_cipherText) return Output(false, nullptr, 0, 0);
  uint32_t n = m_cipherText->GetBufferSize();
  return Output(false, reinterpret_cast<const unsigned char*>(m_cipherText->GetBufferPtr()), n, n);
}
