#include "ofxkit/security/OERC5.h"

#include <openssl/crypto.h>

#include <cstring>

namespace {
constexpr uint32_t kP32 = 0xB7E15163u;
constexpr uint32_t kQ32 = 0x9E3779B9u;

inline uint32_t Rotl(uint32_t x, uint32_t s) {
  s &= 31;
  return s ? (x << s) | (x >> (32 - s)) : x;
}
inline uint32_t Rotr(uint32_t x, uint32_t s) {
  s &= 31;
  return s ? (x >> s) | (x << (32 - s)) : x;
}
inline uint32_t Load32(const unsigned char* p) {
  return static_cast<uint32_t>(p[0]) | static_cast<uint32_t>(p[1]) << 8 | static_cast<uint32_t>(p[2]) << 16 |
         static_cast<uint32_t>(p[3]) << 24;
}
inline void Store32(unsigned char* p, uint32_t v) {
  for (int i = 0; i < 4; ++i) p[i] = static_cast<unsigned char>(v >> (8 * i));
}
}  // namespace

OERC5::~OERC5() { OPENSSL_cleanse(m_s, sizeof m_s); }

unsigned short OERC5::SetKey(const unsigned char* key, size_t keyLen, unsigned rounds) {
  if (rounds > kMaxRounds || keyLen > kMaxKeyBytes || (keyLen && !key)) return 0;
  uint32_t l[(kMaxKeyBytes + 3) / 4 + 1] = {};
  size_t c = keyLen ? (keyLen + 3) / 4 : 1;
  for (size_t i = keyLen; i-- > 0;) l[i / 4] = (l[i / 4] << 8) + key[i];
  size_t t = 2 * (rounds + 1);
  m_s[0] = kP32;
  for (size_t i = 1; i < t; ++i) m_s[i] = m_s[i - 1] + kQ32;
  uint32_t a = 0, b = 0;
  size_t i = 0, j = 0;
  for (size_t k = 0, passes = 3 * (t > c ? t : c); k < passes; ++k) {
    a = m_s[i] = Rotl(m_s[i] + a + b, 3);
    b = l[j] = Rotl(l[j] + a + b, a + b);
    i = (i + 1) % t;
    j = (j + 1) % c;
  }
  OPENSSL_cleanse(l, sizeof l);
  m_rounds = rounds;
  return 1;
}

void OERC5::EncryptBlock(const unsigned char in[8], unsigned char out[8]) const {
  uint32_t a = Load32(in) + m_s[0];
  uint32_t b = Load32(in + 4) + m_s[1];
  for (unsigned r = 1; r <= m_rounds; ++r) {
    a = Rotl(a ^ b, b) + m_s[2 * r];
    b = Rotl(b ^ a, a) + m_s[2 * r + 1];
  }
  Store32(out, a);
  Store32(out + 4, b);
}

void OERC5::DecryptBlock(const unsigned char in[8], unsigned char out[8]) const {
  uint32_t a = Load32(in);
  uint32_t b = Load32(in + 4);
  for (unsigned r = m_rounds; r >= 1; --r) {
    b = Rotr(b - m_s[2 * r + 1], a) ^ a;
    a = Rotr(a - m_s[2 * r], b) ^ b;
  }
  Store32(out, a - m_s[0]);
  Store32(out + 4, b - m_s[1]);
}

long OERC5::Encrypt(const unsigned char iv[8], const unsigned char* in, size_t n, unsigned char* out, bool pad) const {
  if (!iv || (n && (!in || !out)) || (!pad && n % kBlock) || n > 0x7FFFFFF0) return -1;
  size_t total = pad ? (n / kBlock + 1) * kBlock : n;
  unsigned char chain[kBlock];
  memcpy(chain, iv, kBlock);
  unsigned char padByte = static_cast<unsigned char>(total - n);
  for (size_t off = 0; off < total; off += kBlock) {
    unsigned char block[kBlock];
    for (size_t k = 0; k < kBlock; ++k) block[k] = chain[k] ^ (off + k < n ? in[off + k] : padByte);
    EncryptBlock(block, chain);
    memcpy(out + off, chain, kBlock);
    OPENSSL_cleanse(block, sizeof block);
  }
  return static_cast<long>(total);
}

long OERC5::Decrypt(const unsigned char iv[8], const unsigned char* in, size_t n, unsigned char* out, bool pad) const {
  if (!iv || (n && (!in || !out)) || n % kBlock || (pad && n == 0) || n > 0x7FFFFFF0) return -1;
  unsigned char chain[kBlock], next[kBlock], block[kBlock];
  memcpy(chain, iv, kBlock);
  for (size_t off = 0; off < n; off += kBlock) {
    memcpy(next, in + off, kBlock);
    DecryptBlock(next, block);
    for (size_t k = 0; k < kBlock; ++k) out[off + k] = block[k] ^ chain[k];
    memcpy(chain, next, kBlock);
  }
  OPENSSL_cleanse(block, sizeof block);
  if (!pad) return static_cast<long>(n);
  unsigned padLen = out[n - 1];
  bool ok = padLen >= 1 && padLen <= kBlock;
  for (unsigned k = 1; ok && k <= padLen; ++k) ok = out[n - k] == padLen;
  if (!ok) {
    OPENSSL_cleanse(out, n);
    return -1;
  }
  return static_cast<long>(n - padLen);
}
