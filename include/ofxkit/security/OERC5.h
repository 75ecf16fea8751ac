// RC5-32 block cipher (64-bit blocks, 0..255 rounds, 0..255 key bytes) in CBC
// mode, as the toolkit's RC5-CBC and RC5-CBC-Pad.
#pragma once

#include <cstddef>
#include <cstdint>

class OERC5 {
 public:
  static constexpr unsigned kMaxRounds = 255;
  static constexpr size_t kMaxKeyBytes = 255;
  static constexpr size_t kBlock = 8;

  OERC5() = default;
  OERC5(const OERC5&) = delete;
  OERC5& operator=(const OERC5&) = delete;
  ~OERC5();  // wipes the key schedule

  // Expands the key; 0 when rounds or key length are out of range.
  unsigned short SetKey(const unsigned char* key, size_t keyLen, unsigned rounds);
  void EncryptBlock(const unsigned char in[8], unsigned char out[8]) const;
  void DecryptBlock(const unsigned char in[8], unsigned char out[8]) const;

  // CBC over whole blocks (n a multiple of 8; out may equal in). With pad,
  // encryption appends PKCS #5 padding (out needs n/8*8+8 bytes) and
  // decryption checks and strips it. Returns the bytes written, or -1.
  long Encrypt(const unsigned char iv[8], const unsigned char* in, size_t n, unsigned char* out, bool pad) const;
  long Decrypt(const unsigned char iv[8], const unsigned char* in, size_t n, unsigned char* out, bool pad) const;

 private:
  uint32_t m_s[2 * (kMaxRounds + 1)] = {};
  unsigned m_rounds = 0;
};
