#include "ofxkit/security/OESecToolkit.h"

#include <openssl/core_names.h>
#include <openssl/crypto.h>
#include <openssl/evp.h>
#include <openssl/provider.h>
#include <openssl/rand.h>
#include <openssl/x509.h>

#include <cstring>
#include <memory>
#include <new>

#include "ofxkit/security/OERC5.h"
#include "ofxkit/types/OEBuffer.h"

#define OE_SEC_DEFINE_SELECTOR(name, code) \
  int name(unsigned char** defaultInfo) {  \
    if (defaultInfo) *defaultInfo = nullptr; \
    return code;                           \
  }
OE_SEC_SELECTORS(OE_SEC_DEFINE_SELECTOR)
#undef OE_SEC_DEFINE_SELECTOR

void OERandom::Seed(const unsigned char* data, size_t n) {
  if (data && n) RAND_add(data, static_cast<int>(n), static_cast<double>(n));
}

unsigned short OERandom::Generate(unsigned char* out, size_t n) {
  return (out && n <= 0x7FFFFFFF && RAND_bytes(out, static_cast<int>(n)) == 1) ? 1 : 0;
}

// ---------------------------------------------------------------------------
// Keys

namespace {
// Secret-key encodings and the exact length each demands (0: any length).
struct SecretKeyKind {
  int code;
  size_t length;
};
constexpr SecretKeyKind kSecretKinds[] = {{40, 0}, {41, 8}, {42, 24}};
}  // namespace

OEKeyObj::~OEKeyObj() { Release(); }

void OEKeyObj::Release() {
  if (m_secret) {
    OPENSSL_cleanse(m_secret, m_secretLen);
    delete[] m_secret;
  }
  m_secret = nullptr;
  m_secretLen = 0;
  EVP_PKEY_free(m_pkey);
  m_pkey = nullptr;
}

bool OEKeyObj::Load(int kind, const unsigned char* data, size_t n) {
  Release();
  if (!data || n == 0 || n > 0x7FFFFFFF) return false;
  for (const SecretKeyKind& k : kSecretKinds) {
    if (k.code != kind) continue;
    if (k.length && n != k.length) return false;
    m_secret = new (std::nothrow) unsigned char[n];
    if (!m_secret) return false;
    memcpy(m_secret, data, n);
    m_secretLen = n;
    return true;
  }
  const unsigned char* p = data;
  long len = static_cast<long>(n);
  if (kind == OE_KI_RSAPublicBER(nullptr)) {
    m_pkey = d2i_PUBKEY(nullptr, &p, len);
    if (!m_pkey) {
      p = data;
      m_pkey = d2i_PublicKey(EVP_PKEY_RSA, nullptr, &p, len);
    }
  } else if (kind == OE_KI_RSAPrivateBER(nullptr)) {
    m_pkey = d2i_AutoPrivateKey(nullptr, &p, len);
  }
  if (m_pkey && EVP_PKEY_get_base_id(m_pkey) != EVP_PKEY_RSA) Release();
  return m_pkey != nullptr;
}

// ---------------------------------------------------------------------------
// Ciphers

namespace {

enum CipherFamily { FAMILY_EVP, FAMILY_RC2, FAMILY_RC5, FAMILY_RSA };

struct CipherInfo {
  int code;
  CipherFamily family;
  const char* name;  // OpenSSL cipher name
  bool pad;
  size_t minKey, maxKey;
};

constexpr CipherInfo kCiphers[] = {
    {10, FAMILY_EVP, "DES-CBC", false, 8, 8},
    {11, FAMILY_EVP, "DES-CBC", true, 8, 8},
    {12, FAMILY_EVP, "DES-EDE3-CBC", false, 24, 24},
    {13, FAMILY_EVP, "DES-EDE3-CBC", true, 24, 24},
    {14, FAMILY_RC2, "RC2-CBC", false, 1, 128},
    {15, FAMILY_RC2, "RC2-CBC", true, 1, 128},
    {16, FAMILY_RC5, nullptr, false, 0, OERC5::kMaxKeyBytes},
    {17, FAMILY_RC5, nullptr, true, 0, OERC5::kMaxKeyBytes},
    {20, FAMILY_RSA, nullptr, false, 0, 0},
};

const CipherInfo* FindCipher(int code) {
  for (const CipherInfo& c : kCiphers)
    if (c.code == code) return &c;
  return nullptr;
}

// Library context with the default and legacy providers, made on first use;
// null when the legacy provider cannot be loaded.
OSSL_LIB_CTX* LegacyContext() {
  static OSSL_LIB_CTX* ctx = [] {
    OSSL_LIB_CTX* c = OSSL_LIB_CTX_new();
    if (c && (!OSSL_PROVIDER_load(c, "legacy") || !OSSL_PROVIDER_load(c, "default"))) {
      OSSL_LIB_CTX_free(c);
      c = nullptr;
    }
    return c;
  }();
  return ctx;
}

struct CtxFree {
  void operator()(EVP_CIPHER_CTX* c) const { EVP_CIPHER_CTX_free(c); }
  void operator()(EVP_CIPHER* c) const { EVP_CIPHER_free(c); }
  void operator()(EVP_PKEY_CTX* c) const { EVP_PKEY_CTX_free(c); }
};

OECipherResult RunEvp(const CipherInfo& info, const unsigned char* params, const OEKeyObj& key, bool encrypt,
                      const unsigned char* in, size_t n, unsigned char* out, size_t cap, size_t* outLen) {
  OSSL_LIB_CTX* lib = LegacyContext();
  if (!lib) return OE_CIPHER_SETUP;
  std::unique_ptr<EVP_CIPHER, CtxFree> cipher(EVP_CIPHER_fetch(lib, info.name, nullptr));
  std::unique_ptr<EVP_CIPHER_CTX, CtxFree> ctx(EVP_CIPHER_CTX_new());
  if (!cipher || !ctx) return OE_CIPHER_SETUP;
  const unsigned char* iv = params;
  unsigned int rc2Bits = 0;
  if (info.family == FAMILY_RC2) {
    const OERC2Params* rc2 = reinterpret_cast<const OERC2Params*>(params);
    if (!rc2 || rc2->effectiveKeyBits == 0 || rc2->effectiveKeyBits > 1024) return OE_CIPHER_SETUP;
    iv = rc2->iv;
    rc2Bits = rc2->effectiveKeyBits;
  }
  int enc = encrypt ? 1 : 0;
  if (!EVP_CipherInit_ex2(ctx.get(), cipher.get(), nullptr, nullptr, enc, nullptr) ||
      !EVP_CIPHER_CTX_set_key_length(ctx.get(), static_cast<int>(key.SecretLen())))
    return OE_CIPHER_SETUP;
  if (rc2Bits) {
    OSSL_PARAM p[2] = {OSSL_PARAM_construct_uint(OSSL_CIPHER_PARAM_RC2_KEYBITS, &rc2Bits), OSSL_PARAM_construct_end()};
    if (!EVP_CIPHER_CTX_set_params(ctx.get(), p)) return OE_CIPHER_SETUP;
  }
  if (!EVP_CipherInit_ex2(ctx.get(), nullptr, key.Secret(), iv, enc, nullptr)) return OE_CIPHER_SETUP;
  EVP_CIPHER_CTX_set_padding(ctx.get(), info.pad ? 1 : 0);
  // Room check before any write: the update writes at most n (rounded up to a
  // block) and the final at most one block more.
  size_t block = static_cast<size_t>(EVP_CIPHER_CTX_get_block_size(ctx.get()));
  size_t worst = encrypt ? (info.pad ? (n / block + 1) * block : n) : n;
  if (n > 0x7FFFFFFF || worst > cap) return OE_CIPHER_FAILED;
  // Decryption's final step may hold back a block; give it a private area.
  unsigned char scratch[2 * EVP_MAX_BLOCK_LENGTH];
  unsigned char* tmp = encrypt ? out : scratch;
  int got = 0, last = 0;
  OECipherResult result = OE_CIPHER_FAILED;
  if (encrypt) {
    if (EVP_CipherUpdate(ctx.get(), out, &got, in, static_cast<int>(n)) &&
        EVP_CipherFinal_ex(ctx.get(), out + got, &last))
      result = OE_CIPHER_OK;
  } else {
    // Decrypt all but the last block into out, then the last block through
    // scratch so a padded final never writes past cap.
    size_t head = n > block ? n - block : 0;
    int got2 = 0;
    if (EVP_CipherUpdate(ctx.get(), out, &got, in, static_cast<int>(head)) &&
        EVP_CipherUpdate(ctx.get(), tmp, &got2, in + head, static_cast<int>(n - head)) &&
        EVP_CipherFinal_ex(ctx.get(), tmp + got2, &last) &&
        static_cast<size_t>(got + got2 + last) <= cap) {
      memcpy(out + got, tmp, static_cast<size_t>(got2 + last));
      got += got2;
      result = OE_CIPHER_OK;
    }
    OPENSSL_cleanse(scratch, sizeof scratch);
  }
  *outLen = result == OE_CIPHER_OK ? static_cast<size_t>(got + last) : 0;
  return result;
}

OECipherResult RunRC5(const CipherInfo& info, const unsigned char* params, const OEKeyObj& key, bool encrypt,
                      const unsigned char* in, size_t n, unsigned char* out, size_t cap, size_t* outLen) {
  const OERC5Params* rc5 = reinterpret_cast<const OERC5Params*>(params);
  if (!rc5 || rc5->version != 0x10 || rc5->wordSizeInBits != 32) return OE_CIPHER_SETUP;
  std::unique_ptr<OERC5> engine(new (std::nothrow) OERC5());
  if (!engine || !engine->SetKey(key.Secret(), key.SecretLen(), rc5->rounds)) return OE_CIPHER_SETUP;
  size_t worst = (encrypt && info.pad) ? (n / OERC5::kBlock + 1) * OERC5::kBlock : n;
  if (worst > cap) return OE_CIPHER_FAILED;
  long got = encrypt ? engine->Encrypt(rc5->iv, in, n, out, info.pad) : engine->Decrypt(rc5->iv, in, n, out, info.pad);
  if (got < 0) return OE_CIPHER_FAILED;
  *outLen = static_cast<size_t>(got);
  return OE_CIPHER_OK;
}

OECipherResult RunRSA(const OEKeyObj& key, bool encrypt, const unsigned char* in, size_t n, unsigned char* out,
                      size_t cap, size_t* outLen) {
  if (!key.PKey()) return OE_CIPHER_SETUP;
  std::unique_ptr<EVP_PKEY_CTX, CtxFree> ctx(EVP_PKEY_CTX_new(key.PKey(), nullptr));
  if (!ctx || (encrypt ? EVP_PKEY_encrypt_init(ctx.get()) : EVP_PKEY_decrypt_init(ctx.get())) <= 0 ||
      EVP_PKEY_CTX_set_rsa_padding(ctx.get(), RSA_PKCS1_PADDING) <= 0)
    return OE_CIPHER_SETUP;
  size_t need = 0;
  auto op = encrypt ? EVP_PKEY_encrypt : EVP_PKEY_decrypt;
  if (op(ctx.get(), nullptr, &need, in, n) <= 0 || need > cap) return OE_CIPHER_FAILED;
  size_t got = cap;
  if (op(ctx.get(), out, &got, in, n) <= 0) return OE_CIPHER_FAILED;
  *outLen = got;
  return OE_CIPHER_OK;
}

}  // namespace

OECipherResult OESecCipherRun(int code, const unsigned char* params, const OEKeyObj& key, bool encrypt,
                              const unsigned char* in, size_t n, unsigned char* out, size_t cap, size_t* outLen) {
  *outLen = 0;
  const CipherInfo* info = FindCipher(code);
  if (!info) return OE_CIPHER_SETUP;
  if (info->family == FAMILY_RSA) return RunRSA(key, encrypt, in, n, out, cap, outLen);
  if (!key.Secret() || key.SecretLen() < info->minKey || key.SecretLen() > info->maxKey) return OE_CIPHER_SETUP;
  if (!in && n) return OE_CIPHER_FAILED;
  if (info->family == FAMILY_RC5) return RunRC5(*info, params, key, encrypt, in, n, out, cap, outLen);
  if (!params) return OE_CIPHER_SETUP;  // CBC needs its initialisation vector
  return RunEvp(*info, params, key, encrypt, in, n, out, cap, outLen);
}

// ---------------------------------------------------------------------------
// Output buffers and printable coding

void OESecEmpty(OEBuffer& out) {
  if (out.GetBufferPtr()) OPENSSL_cleanse(out.GetBufferPtr(), out.GetBufferAllocation());
  out.SetBufferOffset(0);
  out.SetBufferSize(0);
}

bool OESecSetOutput(OEBuffer& out, const unsigned char* data, size_t n) {
  OESecEmpty(out);
  if (n > 0xFFFFFFFFu) return false;
  if (n && out.WriteBytes(reinterpret_cast<const char*>(data), static_cast<uint32_t>(n)) != OEBUF_OK) return false;
  out.SetBufferOffset(0);
  return true;
}

bool OESecBase64(bool encode, const unsigned char* in, size_t n, OEBuffer& out) {
  OESecEmpty(out);
  if (!in || n == 0 || n > 0x3FFFFFFF) return false;
  size_t room = encode ? 4 * ((n + 2) / 3) + 1 : n + 1;
  if (room > 0xFFFFFFFFu || out.AllocateTo(static_cast<uint32_t>(room)) != OEBUF_OK) return false;
  unsigned char* dst = reinterpret_cast<unsigned char*>(out.GetBufferPtr());
  int got = 0, last = 0;
  if (encode) {
    got = EVP_EncodeBlock(dst, in, static_cast<int>(n));
  } else {
    EVP_ENCODE_CTX* ctx = EVP_ENCODE_CTX_new();
    if (!ctx) return false;
    EVP_DecodeInit(ctx);
    bool ok = EVP_DecodeUpdate(ctx, dst, &got, in, static_cast<int>(n)) >= 0 && EVP_DecodeFinal(ctx, dst + got, &last) == 1;
    EVP_ENCODE_CTX_free(ctx);
    if (!ok) {
      OPENSSL_cleanse(dst, room);
      return false;
    }
  }
  size_t total = static_cast<size_t>(got + last);
  if (got < 0 || total == 0) return false;
  out.SetBufferSize(static_cast<uint32_t>(total));
  out.SetBufferOffset(0);
  return true;
}
