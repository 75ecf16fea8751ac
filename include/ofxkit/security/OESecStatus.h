// Result codes, algorithm and key selectors and the random source shared by
// the security wrappers.
#pragma once

#include <cstddef>
#include <cstdint>

// Result of every security wrapper operation.
enum OESecStatus : int32_t {
  OE_SEC_OK = 0,
  OE_SEC_CERTID_NO_CERT = 1,
  OE_SEC_DIGEST_SETUP = 2,
  OE_SEC_DIGEST_FAILED = 3,
  OE_SEC_ENCODE_SETUP = 4,
  OE_SEC_ENCODE_FAILED = 5,
  OE_SEC_DECODE_SETUP = 6,
  OE_SEC_DECODE_FAILED = 7,
  OE_SEC_CERTID_STORE = 8,
  OE_SEC_CERT_DECODE = 9,
  OE_SEC_CERT_PARSE = 10,
  OE_SEC_CERT_ROOT_ID = 11,
  OE_SEC_CERT_PUBLIC_KEY = 12,
  OE_SEC_CERT_WRITE_INFO = 15,
  OE_SEC_ENCRYPT_SETUP = 19,
  OE_SEC_ENCRYPT_FAILED = 20,
  OE_SEC_DECRYPT_SETUP = 21,
  OE_SEC_DECRYPT_FAILED = 22,
  OE_SEC_KEY_FAILED = 23
};

// Which built-in trusted root a certificate stands for (0 until set).
enum OECallbackRootID : int32_t {
  OE_ROOT_NONE = 0,
  OE_ROOT_VEXA_BRANDING = 1,
  OE_ROOT_VERISIGN_OFX_CA = 2,
  OE_ROOT_VERISIGN_CLASS3 = 3,
  OE_ROOT_RSA_SECURE_SERVER = 4
};

// A selector names an algorithm or a key encoding. Calling it returns the
// toolkit's code for it (and, when the argument is not null, stores a null
// default-parameter pointer there).
typedef int (*OESecSelector)(unsigned char**);

// Every selector: function name, toolkit code.
//   Algorithms (OE_AI_...): printable coding, digests, CBC ciphers without
//   padding (input a whole number of 8-byte blocks) and with PKCS #5 padding
//   (...Pad), and PKCS #1 v1.5 RSA (encrypts with a public or private key,
//   decrypts with a private key).
//   Keys (OE_KI_...): raw secret bytes of any length, exactly 8 (DES) or 24
//   (triple DES) secret bytes, RSA public key in BER (SubjectPublicKeyInfo or
//   PKCS #1 RSAPublicKey), RSA private key in BER (PKCS #8 or PKCS #1).
#define OE_SEC_SELECTORS(X)         \
  X(OE_AI_Base64, 1)                \
  X(OE_AI_SHA1, 2)                  \
  X(OE_AI_MD5, 3)                   \
  X(OE_AI_DES_CBC, 10)              \
  X(OE_AI_DES_CBCPad, 11)           \
  X(OE_AI_DES_EDE3_CBC, 12)         \
  X(OE_AI_DES_EDE3_CBCPad, 13)      \
  X(OE_AI_RC2_CBC, 14)              \
  X(OE_AI_RC2_CBCPad, 15)           \
  X(OE_AI_RC5_CBC, 16)              \
  X(OE_AI_RC5_CBCPad, 17)           \
  X(OE_AI_PKCS_RSA, 20)             \
  X(OE_KI_Item, 40)                 \
  X(OE_KI_DES8, 41)                 \
  X(OE_KI_DES24, 42)                \
  X(OE_KI_RSAPublicBER, 43)         \
  X(OE_KI_RSAPrivateBER, 44)

#define OE_SEC_DECLARE_SELECTOR(name, code) int name(unsigned char** defaultInfo);
OE_SEC_SELECTORS(OE_SEC_DECLARE_SELECTOR)
#undef OE_SEC_DECLARE_SELECTOR

// Parameters given through SetAlgInfo, by algorithm:
//   DES and triple DES: pointer to the 8-byte initialisation vector.
//   RC2: pointer to an OERC2Params.  RC5: pointer to an OERC5Params.
//   RSA: none (ignored).
struct OERC2Params {
  uint32_t effectiveKeyBits;  // 1..1024
  unsigned char iv[8];
};

struct OERC5Params {
  uint32_t version;        // 0x10 (RC5 version 1.0)
  uint32_t rounds;         // 0..255
  uint32_t wordSizeInBits; // 32 (64-bit blocks)
  unsigned char iv[8];
};

// Random source of the toolkit (the system's cryptographic generator).
class OERandom {
 public:
  OERandom() = default;
  // Mixes caller-supplied entropy into the generator.
  void Seed(const unsigned char* data, size_t n);
  // Fills out with n random bytes; 1 on success.
  unsigned short Generate(unsigned char* out, size_t n);
};
