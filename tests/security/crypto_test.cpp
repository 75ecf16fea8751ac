// Keys, symmetric and RSA encryption, digests and base64 coding, checked
// against published vectors (FIPS 81, SP 800-67, RFC 2268, RFC 2040, FIPS 180).
#include <gtest/gtest.h>

#include <cstring>
#include <string>

#include "ofxkit/security/OECipher.h"
#include "ofxkit/security/OECoding.h"
#include "ofxkit/security/OEDigest.h"
#include "ofxkit/security/OEKey.h"
#include "ofxkit/security/OERC5.h"

namespace {

// Test keys made once with the openssl tool: a 1024-bit RSA key (PKCS #8
// private, SubjectPublicKeyInfo public) and a 2048-bit public key.
constexpr const char* kPrivateKeyB64 =
    "MIICdQIBADANBgkqhkiG9w0BAQEFAASCAl8wggJbAgEAAoGBAKfwLIZ5sggYs9yI1AyGSsl0nq80"
    "1bG2di1deInD7jsmIGHJ9Yd0MAHpg7dERbgkT2hUKox7+1WPF9KB0YwySmSWhYeM5tlkUWdny6Sd"
    "crDC5Df1BW8jQ39po6PrcnW3rh412CDN0XUF2R8EdcEtoObP8bg5XvwWtIiv7ouKXvx1AgMBAAEC"
    "gYBbJoXUO2tA77933KBTZ/RhobWbXS77dRBxkQEirUC5w/jhes+URKDl+MuwBhNdXf/nnX82nviM"
    "uMzySdnloUo0qrNI4dbQPitI5HqgksIzi/3rPFaF9Oy/9RAeHC0oIYGbEUdMtEVY8zbMVE/CEUf1"
    "pix2Sz17B60pk4WUbCBmZQJBAN97imY/z6eBYinX2jronVGijtVA7/HTkRHOEgj0HQbtX9Gt2wh1"
    "fCFIn1w93ZnXrivKjDOQfriuLQf1SO1l8VMCQQDAX6uwTVXqpUrNLkWg7Glt5GbjsJaSkX+DOUJ8"
    "mSjn1vTScod+8daeBcK3fyR6eXOch92kx6wd9s3DzYhLoLoXAkAmmDlAi0ibTvba7xIbFk0E6iPs"
    "pDhL9ROalZH7xdy1c40WswWeolt7jAUpcu2wQdUsbuBjj1KzJjFUrIGZrf9NAkA8/lhmRq7l/dBw"
    "q6oh8rMex5sjt/qVsBIY3g/Jh5ojn9Dx5KQ3SKA+bB8npOVA+77/M0jAFRrqSTVGTqVXLTezAkBk"
    "bdGOoWYD2mpgWGm3qstAQXGZ4Rqogo2+4k428AR48xzgq7vcNnmTnXNuPKazMUA8i9GV/g38oTiB"
    "oBZOMqgs"
    ;
constexpr const char* kPublicKeyB64 =
    "MIGfMA0GCSqGSIb3DQEBAQUAA4GNADCBiQKBgQCn8CyGebIIGLPciNQMhkrJdJ6vNNWxtnYtXXiJ"
    "w+47JiBhyfWHdDAB6YO3REW4JE9oVCqMe/tVjxfSgdGMMkpkloWHjObZZFFnZ8uknXKwwuQ39QVv"
    "I0N/aaOj63J1t64eNdggzdF1BdkfBHXBLaDmz/G4OV78FrSIr+6Lil78dQIDAQAB"
    ;
constexpr const char* kPublicKey2048B64 =
    "MIIBIjANBgkqhkiG9w0BAQEFAAOCAQ8AMIIBCgKCAQEA66lblmPL+S+gk81nQ4z276H3oWn68w74"
    "F/chKW/81Gzd4wOHmVX2Wg6BtraCv6/wWEHRAgd1raPz8gbunIjWqnR48wk+2VTAF1eP8s6WYiCf"
    "zIgfy+nqNjLHS/jZG52SMcAVLXG18DzFcw06YvoykSPx9Mn5e+pKaQuDCsb8uaXMAl/CNuHfTXaO"
    "e6hbcv+gT2A9GigBRSXScA6l5zMrj1xzCFnmdNmGtQmFr5ZH5AfB0M8UOsHZroc8jGYom/xkkujy"
    "jL12p7H+0VCC+ijoeRTOB8NmkII7mNs7HbaGBboyGs1feUeQiQyvRROSdZj1B+gFAfntSjA4J25P"
    "i37HAQIDAQAB"
    ;

std::string Hex(const OEBuffer* b) {
  static const char digits[] = "0123456789abcdef";
  std::string out;
  for (uint32_t i = 0; i < b->GetBufferSize(); ++i) {
    unsigned char c = static_cast<unsigned char>(b->GetBufferPtr()[i]);
    out += digits[c >> 4];
    out += digits[c & 15];
  }
  return out;
}

void FromHex(OEBuffer& b, const std::string& hex) {
  for (size_t i = 0; i + 1 < hex.size(); i += 2) b.Write(static_cast<char>(std::stoi(hex.substr(i, 2), nullptr, 16)));
}

void FromText(OEBuffer& b, const char* text) { b.WriteLarge(text, static_cast<uint32_t>(strlen(text))); }

void FromBase64(OEBuffer& b, const char* text) {
  OEBuffer in;
  FromText(in, text);
  OEDecode d(&in);
  ASSERT_EQ(d.GetStatus(), OE_SEC_OK);
  b = *d.GetOutputData();
}

// Encrypts hex plaintext with a hex key and returns the hex cipher text, or
// "status N" on failure; decrypts the result back and checks the round trip.
std::string Crypt(OESecSelector alg, OESecSelector keyKind, const std::string& keyHex, unsigned char* info,
                  const std::string& plainHex) {
  OEBuffer keyBytes, plain;
  FromHex(keyBytes, keyHex);
  FromHex(plain, plainHex);
  OEKey key(&keyBytes, keyKind);
  OEEncrypt enc(&plain, &key, nullptr, alg);
  enc.SetAlgInfo(info);
  OEBuffer* out = enc.GetOutputData();
  if (enc.GetStatus() != OE_SEC_OK) return "status " + std::to_string(enc.GetStatus());
  OEDecrypt dec(out, &key, alg);
  dec.SetAlgInfo(info);
  EXPECT_EQ(Hex(dec.GetOutputData()), plainHex);
  return Hex(out);
}

}  // namespace

TEST(SecCoding, Base64KnownTextsAndRoundTrip) {
  OEBuffer in;
  in.Write("\x00\x01\x02", 3);
  OEEncode enc(&in);
  EXPECT_EQ(enc.GetStatus(), OE_SEC_OK);
  EXPECT_EQ(std::string(enc.GetOutputData()->GetBufferPtr(), enc.GetOutputData()->GetBufferSize()), "AAEC");
  EXPECT_EQ(enc.GetOutputData()->GetBufferOffset(), 0u);

  const char* cases[][2] = {{"f", "Zg=="}, {"fo", "Zm8="}, {"foobar", "Zm9vYmFy"}};
  for (auto& c : cases) {
    OEBuffer plain;
    FromText(plain, c[0]);
    EXPECT_EQ(enc.SetInputData(&plain), OE_SEC_OK);
    EXPECT_EQ(std::string(enc.GetOutputData()->GetBufferPtr(), enc.GetOutputData()->GetBufferSize()), c[1]);
    OEDecode dec(enc.GetOutputData());
    EXPECT_EQ(std::string(dec.GetOutputData()->GetBufferPtr(), dec.GetOutputData()->GetBufferSize()), c[0]);
  }

  // A long input keeps one line; decoding accepts line breaks.
  OEBuffer big;
  for (int i = 0; i < 300; ++i) big.Write(static_cast<char>(i));
  OEEncode longEnc(&big);
  std::string text(longEnc.GetOutputData()->GetBufferPtr(), longEnc.GetOutputData()->GetBufferSize());
  EXPECT_EQ(text.size(), 400u);
  EXPECT_EQ(text.find('\n'), std::string::npos);
  std::string wrapped = text.substr(0, 64) + "\n" + text.substr(64) + "\n";
  OEBuffer wrappedBuf;
  FromText(wrappedBuf, wrapped.c_str());
  OEDecode longDec(&wrappedBuf);
  ASSERT_EQ(longDec.GetStatus(), OE_SEC_OK);
  EXPECT_EQ(longDec.GetOutputData()->CompareBuffer(&big), 1);
}

TEST(SecCoding, FailuresReportDirectionStatus) {
  OEBuffer empty, bad;
  FromText(bad, "A@@=");
  EXPECT_EQ(OEEncode(&empty).GetStatus(), OE_SEC_ENCODE_FAILED);
  EXPECT_EQ(OEDecode(&empty).GetStatus(), OE_SEC_DECODE_FAILED);
  EXPECT_EQ(OEDecode(&bad).GetStatus(), OE_SEC_DECODE_FAILED);
  EXPECT_EQ(OEDecode(&bad).GetOutputData()->GetBufferSize(), 0u);
  EXPECT_EQ(OEEncode().SetInputData(nullptr), OE_SEC_ENCODE_FAILED);
  EXPECT_EQ(OEEncode(OE_AI_SHA1).SetInputData(&bad), OE_SEC_ENCODE_SETUP);
  EXPECT_EQ(OEDecode(OE_AI_SHA1).GetStatus(), OE_SEC_DECODE_SETUP);
}

TEST(SecDigest, KnownDigestsAndFailures) {
  OEBuffer abc;
  FromText(abc, "abc");
  OEDigest sha(&abc, OE_AI_SHA1);
  EXPECT_EQ(sha.GetStatus(), OE_SEC_OK);
  EXPECT_EQ(Hex(sha.GetOutputData()), "a9993e364706816aba3e25717850c26c9cd0d89d");
  OEString text;
  text.Assign("abc", 3);
  EXPECT_EQ(OEDigest(&text, OE_AI_MD5).GetStatus(), OE_SEC_OK);
  EXPECT_EQ(Hex(OEDigest(&text, OE_AI_MD5).GetOutputData()), "900150983cd24fb0d6963f7d28e17f72");
  // Setting a new input replaces the digest.
  OEBuffer other;
  FromText(other, "abcdbcdecdefdefgefghfghighijhijkijkljklmklmnlmnomnopnopq");
  EXPECT_EQ(sha.SetInputData(&other), OE_SEC_OK);
  EXPECT_EQ(Hex(sha.GetOutputData()), "84983e441c3bd26ebaae4aa1f95129e5e54670f1");

  OEBuffer empty;
  EXPECT_EQ(sha.SetInputData(&empty), OE_SEC_DIGEST_FAILED);
  EXPECT_EQ(sha.GetOutputData()->GetBufferSize(), 0u);
  EXPECT_EQ(sha.SetInputData(nullptr), OE_SEC_DIGEST_FAILED);
  EXPECT_EQ(OEDigest(OE_AI_DES_CBC).GetStatus(), OE_SEC_DIGEST_SETUP);
  EXPECT_EQ(OEDigest(nullptr).SetInputData(&abc), OE_SEC_DIGEST_SETUP);
}

TEST(SecKey, SourcesAndRefusals) {
  OEKey none(OE_KI_Item);
  EXPECT_EQ(none.GetKeyObjPtr(), nullptr);
  EXPECT_EQ(none.GetStatus(), OE_SEC_KEY_FAILED);

  OEBuffer seven, eight;
  FromHex(seven, "01020304050607");
  FromHex(eight, "0102030405060708");
  OEKey des(&seven, OE_KI_DES8);
  EXPECT_EQ(des.GetStatus(), OE_SEC_KEY_FAILED);
  EXPECT_EQ(des.SetKey(&eight), OE_SEC_OK);
  EXPECT_NE(des.GetKeyObjPtr(), nullptr);

  // Text replaces the buffer source; the empty text is no key.
  OEString empty, pass;
  EXPECT_EQ(des.SetKeyStr(&empty), OE_SEC_KEY_FAILED);
  pass.Assign("12345678", 8);
  EXPECT_EQ(des.SetKeyStr(&pass), OE_SEC_OK);

  OEBuffer garbage, pub;
  FromHex(garbage, "300500");
  FromBase64(pub, kPublicKeyB64);
  EXPECT_EQ(OEKey(&garbage, OE_KI_RSAPublicBER).GetStatus(), OE_SEC_KEY_FAILED);
  EXPECT_EQ(OEKey(&pub, OE_KI_RSAPublicBER).GetStatus(), OE_SEC_OK);
  EXPECT_EQ(OEKey(&pub, OE_KI_RSAPrivateBER).GetStatus(), OE_SEC_KEY_FAILED);
  EXPECT_EQ(OEKey(&pub, nullptr).GetStatus(), OE_SEC_KEY_FAILED);
}

TEST(SecCipher, DesAndTripleDesVectors) {
  // FIPS 81 CBC example: "Now is the time for all ".
  unsigned char iv[8] = {0x12, 0x34, 0x56, 0x78, 0x90, 0xab, 0xcd, 0xef};
  const std::string plain = "4e6f77206973207468652074696d6520666f7220616c6c20";
  const std::string fips81 = "e5c7cdde872bf27c43e934008c389c0f683788499a7c05f6";
  EXPECT_EQ(Crypt(OE_AI_DES_CBC, OE_KI_DES8, "0123456789abcdef", iv, plain), fips81);
  // Triple DES with three equal keys is single DES.
  EXPECT_EQ(Crypt(OE_AI_DES_EDE3_CBC, OE_KI_DES24, "0123456789abcdef0123456789abcdef0123456789abcdef", iv, plain),
            fips81);
  // Padding adds a whole block to block-aligned input.
  EXPECT_EQ(Crypt(OE_AI_DES_CBCPad, OE_KI_DES8, "0123456789abcdef", iv, plain).substr(0, 48), fips81);
  EXPECT_EQ(Crypt(OE_AI_DES_CBCPad, OE_KI_DES8, "0123456789abcdef", iv, plain).size(), 64u);

  // SP 800-67 example ("The quick brown fox jump"), first block (CBC with a
  // zero vector equals ECB there).
  unsigned char zero[8] = {};
  EXPECT_EQ(Crypt(OE_AI_DES_EDE3_CBC, OE_KI_DES24, "0123456789abcdef23456789abcdef01456789abcdef0123", zero,
                  "54686520717566636b2062726f776e20666f78206a756d70")
                .substr(0, 16),
            "a826fd8ce53b855f");
}

TEST(SecCipher, Rc2Vectors) {
  // RFC 2268 vectors (single block, zero vector).
  struct {
    uint32_t bits;
    const char *key, *plain, *cipher;
  } cases[] = {{63, "0000000000000000", "0000000000000000", "ebb773f993278eff"},
               {64, "ffffffffffffffff", "ffffffffffffffff", "278b27e42e2f0d49"},
               {64, "3000000000000000", "1000000000000001", "30649edf9be7d2c2"},
               {64, "88", "0000000000000000", "61a8a244adacccf0"},
               {128, "88bca90e90875a7f0f79c384627bafb2", "0000000000000000", "2269552ab0f85ca6"}};
  for (auto& c : cases) {
    OERC2Params params = {c.bits, {}};
    EXPECT_EQ(Crypt(OE_AI_RC2_CBC, OE_KI_Item, c.key, reinterpret_cast<unsigned char*>(&params), c.plain), c.cipher)
        << c.key;
  }
}

TEST(SecCipher, Rc5CbcVectors) {
  // RFC 2040 RC5-CBC vectors: rounds, key, vector, plaintext, cipher text.
  struct {
    unsigned rounds;
    const char *key, *iv, *plain, *cipher;
  } cases[] = {
      {0, "00", "0000000000000000", "0000000000000000", "7a7bba4d79111d1e"},
      {0, "00", "0000000000000000", "ffffffffffffffff", "797bba4d78111d1e"},
      {0, "00", "0000000000000001", "0000000000000000", "7a7bba4d79111d1f"},
      {0, "00", "0000000000000000", "0000000000000001", "7a7bba4d79111d1f"},
      {0, "00", "0102030405060708", "1020304050607080", "8b9ded91ce7794a6"},
      {1, "11", "0000000000000000", "0000000000000000", "2f759fe7ad86a378"},
      {2, "00", "0000000000000000", "0000000000000000", "dca2694bf40e0788"},
      {2, "00000000", "0000000000000000", "0000000000000000", "dca2694bf40e0788"},
      {8, "00", "0000000000000000", "0000000000000000", "dcfe098577eca5ff"},
      {8, "00", "0102030405060708", "1020304050607080", "9646fb77638f9ca8"},
      {12, "00", "0102030405060708", "1020304050607080", "b2b3209db6594da4"},
      {16, "00", "0102030405060708", "1020304050607080", "545f7f32a5fc3836"},
      {8, "01020304", "0000000000000000", "ffffffffffffffff", "8285e7c1b5bc7402"},
      {12, "01020304", "0000000000000000", "ffffffffffffffff", "fc586f92f7080934"},
      {16, "01020304", "0000000000000000", "ffffffffffffffff", "cf270ef9717ff7c4"},
      {12, "0102030405060708", "0000000000000000", "ffffffffffffffff", "e493f1c1bb4d6e8c"},
      {8, "0102030405060708", "0102030405060708", "1020304050607080", "5c4c041e0f217ac3"},
      {12, "0102030405060708", "0102030405060708", "1020304050607080", "921f12485373b4f7"},
      {16, "0102030405060708", "0102030405060708", "1020304050607080", "5ba0ca6bbe7f5fad"},
      {8, "01020304050607081020304050607080", "0102030405060708", "1020304050607080", "c533771cd0110e63"},
      {12, "01020304050607081020304050607080", "0102030405060708", "1020304050607080", "294ddb46b3278d60"},
      {16, "01020304050607081020304050607080", "0102030405060708", "1020304050607080", "dad6bda9dfe8f7e8"},
      {12, "0102030405", "0000000000000000", "ffffffffffffffff", "97e0787837ed317f"},
  };
  for (auto& c : cases) {
    OERC5Params params = {0x10, c.rounds, 32, {}};
    OEBuffer iv;
    FromHex(iv, c.iv);
    memcpy(params.iv, iv.GetBufferPtr(), 8);
    EXPECT_EQ(Crypt(OE_AI_RC5_CBC, OE_KI_Item, c.key, reinterpret_cast<unsigned char*>(&params), c.plain), c.cipher)
        << "rounds " << c.rounds << " key " << c.key;
  }
}

TEST(SecCipher, Rc5CbcPadChainsBlocks) {
  // RFC 2040 RC5-CBC-Pad vectors (key 0102030405, 8 rounds).
  OERC5Params params = {0x10, 8, 32, {}};
  auto* info = reinterpret_cast<unsigned char*>(&params);
  EXPECT_EQ(Crypt(OE_AI_RC5_CBCPad, OE_KI_Item, "0102030405", info, "ffffffffffffffff"),
            "7875dbf6738c64788f34c3c681c99695");
  EXPECT_EQ(Crypt(OE_AI_RC5_CBCPad, OE_KI_Item, "0102030405", info, "ffffffffffffffff7875dbf6738c647811223344556677"),
            "7875dbf6738c64787cb3f1df34f948117fd1a023a5bba217");
  // Bad parameters are set-up failures.
  OERC5Params wide = {0x10, 8, 64, {}};
  EXPECT_EQ(Crypt(OE_AI_RC5_CBC, OE_KI_Item, "00", reinterpret_cast<unsigned char*>(&wide), "0000000000000000"),
            "status 19");
  OERC5Params many = {0x10, 256, 32, {}};
  EXPECT_EQ(Crypt(OE_AI_RC5_CBC, OE_KI_Item, "00", reinterpret_cast<unsigned char*>(&many), "0000000000000000"),
            "status 19");
}

TEST(SecCipher, LimitsAndFailures) {
  unsigned char iv[8] = {};
  const std::string key = "0123456789abcdef";
  // 120 bytes pad to exactly 128; 128 bytes would need 136 and fail empty.
  EXPECT_EQ(Crypt(OE_AI_DES_CBCPad, OE_KI_DES8, key, iv, std::string(240, 'a')).size(), 256u);
  OEBuffer keyBytes, big;
  FromHex(keyBytes, key);
  FromHex(big, std::string(256, 'a'));
  OEKey desKey(&keyBytes, OE_KI_DES8);
  OEEncrypt enc(&big, &desKey, nullptr, OE_AI_DES_CBCPad);
  enc.SetAlgInfo(iv);
  EXPECT_EQ(enc.GetOutputData()->GetBufferSize(), 0u);
  EXPECT_EQ(enc.GetStatus(), OE_SEC_ENCRYPT_FAILED);

  EXPECT_EQ(Crypt(OE_AI_DES_CBC, OE_KI_DES8, key, nullptr, "0000000000000000"), "status 19");  // no vector
  EXPECT_EQ(Crypt(OE_AI_DES_CBC, OE_KI_Item, "0102", iv, "0000000000000000"), "status 19");    // short key
  EXPECT_EQ(Crypt(OE_AI_DES_CBC, OE_KI_DES8, key, iv, "00000000000000"), "status 20");        // partial block
  EXPECT_EQ(Crypt(OE_AI_DES_CBC, OE_KI_DES8, key, iv, ""), "status 20");                      // no input
  EXPECT_EQ(Crypt(OE_AI_SHA1, OE_KI_DES8, key, iv, "0000000000000000"), "status 19");         // not a cipher
  OEEncrypt noKey(&big, nullptr, nullptr, OE_AI_DES_CBCPad);
  EXPECT_EQ(noKey.GetOutputData()->GetBufferSize(), 0u);
  EXPECT_EQ(noKey.GetStatus(), OE_SEC_ENCRYPT_SETUP);

  // Decryption: a wrong key breaks the padding; no cipher text; no key.
  OEBuffer cipher, otherKey;
  FromHex(cipher, Crypt(OE_AI_DES_CBCPad, OE_KI_DES8, key, iv, "41"));
  FromHex(otherKey, "fedcba9876543210");
  OEKey wrong(&otherKey, OE_KI_DES8);
  OEDecrypt dec(&cipher, &wrong, OE_AI_DES_CBCPad);
  dec.SetAlgInfo(iv);
  EXPECT_EQ(dec.GetOutputData()->GetBufferSize(), 0u);
  EXPECT_EQ(dec.GetStatus(), OE_SEC_DECRYPT_FAILED);
  dec.SetCipherText(nullptr);
  dec.SetKey(&desKey);
  dec.GetOutputData();
  EXPECT_EQ(dec.GetStatus(), OE_SEC_DECRYPT_FAILED);
  OEDecrypt noDecKey;
  noDecKey.SetCipherText(&cipher);
  noDecKey.GetOutputData();
  EXPECT_EQ(noDecKey.GetStatus(), OE_SEC_DECRYPT_SETUP);
}

TEST(SecCipher, RsaPublicEncryptPrivateDecrypt) {
  OEBuffer pubBytes, privBytes, pub2048Bytes;
  FromBase64(pubBytes, kPublicKeyB64);
  FromBase64(privBytes, kPrivateKeyB64);
  FromBase64(pub2048Bytes, kPublicKey2048B64);
  OEKey pub(&pubBytes, OE_KI_RSAPublicBER), priv(&privBytes, OE_KI_RSAPrivateBER);
  OEKey pub2048(&pub2048Bytes, OE_KI_RSAPublicBER);
  OERandom random;
  OEString secret;
  secret.Assign("user password 1234", 18);

  OEEncrypt enc(OE_AI_PKCS_RSA);
  enc.SetInputStr(&secret);
  enc.SetKey(&pub);
  enc.SetRandom(&random);
  OEBuffer* first = enc.GetOutputData();
  ASSERT_EQ(enc.GetStatus(), OE_SEC_OK);
  EXPECT_EQ(first->GetBufferSize(), 128u);
  // The result is cached: random padding would otherwise change it.
  const std::string once = Hex(first);
  EXPECT_EQ(Hex(enc.GetOutputData()), once);
  enc.SetInputStr(&secret);
  EXPECT_NE(Hex(enc.GetOutputData()), once);

  OEDecrypt dec(enc.GetOutputData(), &priv, OE_AI_PKCS_RSA);
  OEBuffer* plain = dec.GetOutputData();
  ASSERT_EQ(dec.GetStatus(), OE_SEC_OK);
  EXPECT_EQ(std::string(plain->GetBufferPtr(), plain->GetBufferSize()), "user password 1234");
  // A public key cannot decrypt; a 2048-bit key's output exceeds 128 bytes.
  OEDecrypt pubDec(enc.GetOutputData(), &pub, OE_AI_PKCS_RSA);
  EXPECT_EQ(pubDec.GetOutputData()->GetBufferSize(), 0u);
  enc.SetKey(&pub2048);
  EXPECT_EQ(enc.GetOutputData()->GetBufferSize(), 0u);
  EXPECT_EQ(enc.GetStatus(), OE_SEC_ENCRYPT_FAILED);
}

TEST(SecCipher, Rc5BlockRoundTripAllRounds) {
  OERC5 rc5;
  const unsigned char key[16] = {1, 2, 3, 4, 5, 6, 7, 8, 9, 10, 11, 12, 13, 14, 15, 16};
  const unsigned char plain[8] = {0xde, 0xad, 0xbe, 0xef, 0, 1, 2, 3};
  EXPECT_EQ(rc5.SetKey(key, 16, 256), 0);
  for (unsigned rounds : {0u, 1u, 12u, 255u}) {
    ASSERT_EQ(rc5.SetKey(key, sizeof key, rounds), 1);
    unsigned char c[8], p[8];
    rc5.EncryptBlock(plain, c);
    rc5.DecryptBlock(c, p);
    EXPECT_EQ(memcmp(p, plain, 8), 0) << rounds;
  }
}
