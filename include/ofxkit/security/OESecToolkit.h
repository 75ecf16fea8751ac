// The cryptographic toolkit under the security wrappers: key objects and a
// one-shot cipher run over OpenSSL (DES, RC2 through the legacy provider) and
// the library's own RC5.
#pragma once

#include <cstddef>
#include <cstdint>

#include "ofxkit/security/OESecStatus.h"

struct evp_pkey_st;

// Loaded key: secret bytes or an RSA key. Secret bytes are wiped on release.
class OEKeyObj {
 public:
  OEKeyObj() = default;
  OEKeyObj(const OEKeyObj&) = delete;
  OEKeyObj& operator=(const OEKeyObj&) = delete;
  ~OEKeyObj();

  // Loads bytes as the key encoding named by kind (an OE_KI_ code); false
  // when the bytes do not fit the encoding.
  bool Load(int kind, const unsigned char* data, size_t n);
  const unsigned char* Secret() const { return m_secret; }
  size_t SecretLen() const { return m_secretLen; }
  evp_pkey_st* PKey() const { return m_pkey; }

 private:
  void Release();

  unsigned char* m_secret = nullptr;
  size_t m_secretLen = 0;
  evp_pkey_st* m_pkey = nullptr;
};

enum OECipherResult { OE_CIPHER_OK, OE_CIPHER_SETUP, OE_CIPHER_FAILED };

// Runs the algorithm named by code over in (encrypting or decrypting) into
// out, which holds cap bytes; nothing beyond cap is ever written.
OECipherResult OESecCipherRun(int code, const unsigned char* params, const OEKeyObj& key, bool encrypt,
                              const unsigned char* in, size_t n, unsigned char* out, size_t cap, size_t* outLen);

// Code of a selector (0 for a null selector).
inline int OESecCode(OESecSelector s) { return s ? s(nullptr) : 0; }

class OEBuffer;
// Wipes the buffer's contents and empties it (size and offset 0).
void OESecEmpty(OEBuffer& out);
// Makes out hold exactly data[0..n) with offset 0; false when it cannot.
bool OESecSetOutput(OEBuffer& out, const unsigned char* data, size_t n);
// Base64 without line breaks; decoding skips whitespace. False on bad text
// or no room. Encoding needs 4 * ((n + 2) / 3) bytes, decoding n bytes.
bool OESecBase64(bool encode, const unsigned char* in, size_t n, OEBuffer& out);
