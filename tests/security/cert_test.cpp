// Certificates, certificate identifiers and the certificate and buffer arrays.
#include <gtest/gtest.h>

#include <cstdio>
#include <cstring>
#include <string>

#include "ofxkit/security/OECert.h"
#include "ofxkit/security/OECoding.h"
#include "ofxkit/security/OEDigest.h"
#include "support/test_cert.h"

namespace {

constexpr time_t kNotBefore = 1795401487;  // 2026-11-23 02:38:07Z
constexpr time_t kNotAfter = 2110761487;   // 2036-11-20 02:38:07Z

std::string Text(const OEBuffer* b) { return std::string(b->GetBufferPtr(), b->GetBufferSize()); }

struct CertFixture : ::testing::Test {
  void SetUp() override {
    encoded.WriteLarge(kCertB64, static_cast<uint32_t>(strlen(kCertB64)));
    OEDecode decode(&encoded);
    ASSERT_EQ(decode.GetStatus(), OE_SEC_OK);
    ber = *decode.GetOutputData();
  }
  OEBuffer encoded, ber;
};

}  // namespace

TEST_F(CertFixture, DecodesFieldsFromBerAndBase64) {
  OECert fromBer, fromText;
  ASSERT_EQ(fromBer.SetCertBER(&ber), OE_SEC_OK);
  ASSERT_EQ(fromText.SetEncodedCert(kCertB64, static_cast<unsigned short>(strlen(kCertB64))), OE_SEC_OK);
  for (OECert* cert : {&fromBer, &fromText}) {
    EXPECT_STREQ(cert->GetSubjectName().c_str(), "Vexa Test Bank");
    EXPECT_EQ(cert->GetStartDate(), kNotBefore);
    EXPECT_EQ(cert->GetEndDate(), kNotAfter);
    ASSERT_EQ(cert->GetCertBERLen(), ber.GetBufferSize());
    EXPECT_EQ(memcmp(cert->GetCertBER(), ber.GetBufferPtr(), ber.GetBufferSize()), 0);
  }
  // The public key is the certificate's SubjectPublicKeyInfo: a SEQUENCE
  // found verbatim inside the certificate.
  OEBuffer key;
  ASSERT_EQ(fromBer.GetPublicKey(&key), OE_SEC_OK);
  ASSERT_GT(key.GetBufferSize(), 140u);
  EXPECT_EQ(static_cast<unsigned char>(key.GetBufferPtr()[0]), 0x30);
  std::string all(ber.GetBufferPtr(), ber.GetBufferSize());
  EXPECT_NE(all.find(Text(&key)), std::string::npos);
}

TEST_F(CertFixture, WriteInfoPrintsValidityDates) {
  OECert cert;
  ASSERT_EQ(cert.SetEncodedCert(&encoded), OE_SEC_OK);
  FILE* f = tmpfile();
  ASSERT_NE(f, nullptr);
  EXPECT_EQ(cert.WriteInfo(f), OE_SEC_OK);
  rewind(f);
  char text[128] = {};
  size_t n = fread(text, 1, sizeof text - 1, f);
  fclose(f);
  EXPECT_EQ(std::string(text, n), "Start Date: 11 23 2026\nEnd Date:   11 20 2036\n");
  EXPECT_EQ(cert.WriteInfo(nullptr), OE_SEC_CERT_WRITE_INFO);
}

TEST_F(CertFixture, RejectsBadInputAndRootIdZero) {
  OECert cert;
  OEBuffer junk, truncated, trailing;
  junk.WriteLarge("not a certificate", 17);
  truncated.WriteLarge(ber.GetBufferPtr(), ber.GetBufferSize() - 10);
  trailing = ber;
  trailing.SetBufferOffset(trailing.GetBufferSize());
  trailing.Write('\0');
  EXPECT_EQ(cert.SetEncodedCert(nullptr), OE_SEC_CERT_DECODE);
  EXPECT_EQ(cert.SetEncodedCert("@@@@", 4), OE_SEC_CERT_DECODE);
  EXPECT_EQ(cert.SetEncodedCert("", 0), OE_SEC_CERT_DECODE);
  EXPECT_EQ(cert.SetCertBER(&junk), OE_SEC_CERT_PARSE);
  EXPECT_EQ(cert.SetCertBER(&truncated), OE_SEC_CERT_PARSE);
  EXPECT_EQ(cert.SetCertBER(&trailing), OE_SEC_CERT_PARSE);
  EXPECT_EQ(cert.SetCertBER(nullptr, 5), OE_SEC_CERT_PARSE);
  // A failed parse leaves nothing behind.
  EXPECT_EQ(cert.GetCertBERLen(), 0);
  EXPECT_STREQ(cert.GetSubjectName().c_str(), "");
  OEBuffer key;
  EXPECT_EQ(cert.GetPublicKey(&key), OE_SEC_CERT_PUBLIC_KEY);

  EXPECT_EQ(cert.SetCallbackRootID(OE_ROOT_NONE), OE_SEC_CERT_ROOT_ID);
  EXPECT_EQ(cert.GetCallbackRootID(), OE_ROOT_NONE);
  EXPECT_EQ(cert.SetCallbackRootID(OE_ROOT_VERISIGN_OFX_CA), OE_SEC_OK);
  EXPECT_EQ(cert.GetCallbackRootID(), OE_ROOT_VERISIGN_OFX_CA);
}

TEST_F(CertFixture, CertIdIsBase64Sha1OfBer) {
  OECertID fromText, fromBer, none;
  EXPECT_TRUE(fromText.IsEmpty());
  EXPECT_EQ(fromText.SetEncodedCert(&encoded), OE_SEC_OK);
  EXPECT_EQ(fromBer.SetCertBER(&ber), OE_SEC_OK);
  EXPECT_FALSE(fromText.IsEmpty());
  EXPECT_EQ(Text(fromText.GetEncodedCertIDPtr()), kCertSha1B64);
  EXPECT_EQ(Text(fromBer.GetEncodedCertIDPtr()), kCertSha1B64);
  // Identifying again replaces the identifier.
  EXPECT_EQ(fromBer.SetCertBER(&ber), OE_SEC_OK);
  EXPECT_EQ(Text(fromBer.GetEncodedCertIDPtr()), kCertSha1B64);

  OEBuffer empty, bad;
  bad.WriteLarge("%%%%", 4);
  EXPECT_EQ(none.SetCertBER(nullptr), OE_SEC_CERTID_NO_CERT);
  EXPECT_EQ(none.SetCertBER(&empty), OE_SEC_CERTID_NO_CERT);
  EXPECT_EQ(none.SetEncodedCert(&bad), OE_SEC_DECODE_FAILED);
  EXPECT_TRUE(none.IsEmpty());
}

TEST(SecArrays, UnSetOnlyEmptiesSlot) {
  OEDynamicArrayCert certs;
  EXPECT_EQ(certs.Append(new OECert()), 1);
  EXPECT_EQ(certs.Append(new OECert()), 1);
  EXPECT_EQ(certs.Set(5, new OECert()), 1);
  EXPECT_EQ(certs.Entries(), 6);
  EXPECT_EQ(certs.Get(3), nullptr);
  EXPECT_EQ(certs.Set(0, nullptr), 0);

  OECert* kept = certs.Get(1);
  EXPECT_EQ(certs.UnSet(1), 1);
  EXPECT_EQ(certs.Entries(), 6);
  EXPECT_EQ(certs.Get(1), nullptr);
  EXPECT_NE(certs.Get(0), nullptr);
  EXPECT_EQ(certs.UnSet(60000), 0);
  delete kept;  // UnSet handed it back to the caller

  OEDynamicArrayBuffer buffers(2, 5);
  OEBuffer* first = new OEBuffer();
  EXPECT_EQ(buffers.Set(0, first), 1);
  EXPECT_EQ(buffers.Set(0, new OEBuffer()), 1);  // replacing deletes the old one
  EXPECT_NE(buffers.Get(0), first);
  OEBuffer refused;  // a refused element stays the caller's
  EXPECT_EQ(buffers.Set(0xFFFF, &refused), 0);
}
