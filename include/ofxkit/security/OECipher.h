// Encryption and decryption of short data (at most 128 bytes of cipher text
// per encryption) with a key and an algorithm selector.
#pragma once

#include "ofxkit/security/OEKey.h"

// What encryption and decryption share: key, algorithm, parameters and the
// cached output (made once until an input changes).
class OECipherBase {
 public:
  OECipherBase(const OECipherBase&) = delete;
  OECipherBase& operator=(const OECipherBase&) = delete;

  void SetKey(OEKey* key) { Invalidate(&m_key, key); }
  void SetAlgInfo(unsigned char* info) { Invalidate(&m_algInfo, info); }
  OESecStatus GetStatus() const { return m_status; }

 protected:
  OECipherBase(OEKey* key, OESecSelector algorithm);
  ~OECipherBase() = default;
  // Stores a new input and forgets the cached output.
  template <class T>
  void Invalidate(T* field, T value) {
    *field = value;
    m_done = 0;
  }
  // Runs the cipher over in once into at most cap bytes; later calls return
  // the cached output until an input changes.
  OEBuffer* Output(bool encrypt, const unsigned char* in, size_t n, uint32_t cap);

 private:
  OEKey* m_key;
  OESecSelector m_selector;
  unsigned char* m_algInfo;
  unsigned short m_done;
  OEBuffer m_output;
  OESecStatus m_status;
};

class OEEncrypt : public OECipherBase {
 public:
  static constexpr uint32_t kMaxOutput = 128;

  explicit OEEncrypt(OESecSelector algorithm);
  OEEncrypt(OEBuffer* input, OEKey* key, OERandom* random, OESecSelector algorithm);

  void SetInputData(OEBuffer* input);
  void SetInputStr(const OEString* input);
  // The toolkit's generator pads RSA blocks; the source is kept for callers
  // that seed it.
  void SetRandom(OERandom* random) { Invalidate(&m_random, random); }
  // Encrypts once and caches the result; empty after a failure.
  OEBuffer* GetOutputData();

 private:
  OEBuffer* m_input;
  const OEString* m_inputText;
  OERandom* m_random;
};

class OEDecrypt : public OECipherBase {
 public:
  // The default algorithm is DES-EDE3-CBC with padding.
  OEDecrypt();
  explicit OEDecrypt(OESecSelector algorithm);
  OEDecrypt(OEBuffer* cipherText, OEKey* key, OESecSelector algorithm);

  void SetCipherText(OEBuffer* cipherText) { Invalidate(&m_cipherText, cipherText); }
  OEBuffer* GetOutputData();

 private:
  OEBuffer* m_cipherText;
};
