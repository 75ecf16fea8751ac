#include "ofxkit/security/OECert.h"

#include <openssl/asn1.h>
#include <openssl/crypto.h>
#include <openssl/objects.h>
#include <openssl/x509.h>

#include <new>

#include "ofxkit/security/OECoding.h"
#include "ofxkit/security/OEDigest.h"
#include "ofxkit/security/OESecToolkit.h"

namespace {
constexpr uint32_t kMaxCertBER = 0xFFFF;

time_t ToTimeT(const ASN1_TIME* t) {
  struct tm tmv = {};
  if (!t || ASN1_TIME_to_tm(t, &tmv) != 1) return 0;
  return timegm(&tmv);
}

OEString OrganisationOf(X509* cert) {
  OEString result;
  X509_NAME* name = X509_get_subject_name(cert);
  int at = name ? X509_NAME_get_index_by_NID(name, NID_organizationName, -1) : -1;
  X509_NAME_ENTRY* entry = at >= 0 ? X509_NAME_get_entry(name, at) : nullptr;
  unsigned char* text = nullptr;
  int n = entry ? ASN1_STRING_to_UTF8(&text, X509_NAME_ENTRY_get_data(entry)) : -1;
  if (n > 0) result.Assign(reinterpret_cast<const char*>(text), static_cast<size_t>(n));
  OPENSSL_free(text);
  return result;
}
}  // namespace

OECert::OECert() : m_x509(nullptr), m_start(0), m_end(0), m_rootID(OE_ROOT_NONE) {}

OECert::~OECert() { X509_free(m_x509); }

void OECert::Reset() {
  X509_free(m_x509);
  m_x509 = nullptr;
  OESecEmpty(m_ber);
  OESecEmpty(m_publicKey);
  m_subjectName.Assign("", 0);
  m_start = m_end = 0;
}

OESecStatus OECert::SetEncodedCert(OEBuffer* encoded) {
  OEDecode decode;
  if (!encoded || decode.SetInputData(encoded) != OE_SEC_OK) {
    Reset();
    return OE_SEC_CERT_DECODE;
  }
  return SetCertBER(decode.GetOutputData());
}

OESecStatus OECert::SetEncodedCert(const char* text, unsigned short length) {
  OEBuffer copy;
  if (!text || length == 0 || copy.WriteBytes(text, length) != OEBUF_OK) {
    Reset();
    return OE_SEC_CERT_DECODE;
  }
  return SetEncodedCert(&copy);
}

OESecStatus OECert::SetCertBER(OEBuffer* ber) {
  if (!ber || ber->GetBufferSize() > kMaxCertBER) {
    Reset();
    return OE_SEC_CERT_PARSE;
  }
  return SetCertBER(ber->GetBufferPtr(), static_cast<unsigned short>(ber->GetBufferSize()));
}

OESecStatus OECert::SetCertBER(const char* ber, unsigned short length) {
  Reset();
  if (!ber || length == 0) return OE_SEC_CERT_PARSE;
  const unsigned char* p = reinterpret_cast<const unsigned char*>(ber);
  X509* cert = d2i_X509(nullptr, &p, length);
  // The whole input must be the one certificate.
  if (!cert || p != reinterpret_cast<const unsigned char*>(ber) + length) {
    X509_free(cert);
    return OE_SEC_CERT_PARSE;
  }
  unsigned char* key = nullptr;
  int keyLen = i2d_PUBKEY(X509_get0_pubkey(cert), &key);
  bool ok = keyLen > 0 && OESecSetOutput(m_publicKey, key, static_cast<size_t>(keyLen)) &&
            OESecSetOutput(m_ber, reinterpret_cast<const unsigned char*>(ber), length);
  OPENSSL_free(key);
  if (!ok) {
    X509_free(cert);
    Reset();
    return OE_SEC_CERT_PARSE;
  }
  m_x509 = cert;
  m_subjectName = OrganisationOf(cert);
  m_start = ToTimeT(X509_get0_notBefore(cert));
  m_end = ToTimeT(X509_get0_notAfter(cert));
  return OE_SEC_OK;
}

const unsigned char* OECert::GetCertBER() const {
  return m_x509 ? reinterpret_cast<const unsigned char*>(m_ber.GetBufferPtr()) : nullptr;
}

unsigned short OECert::GetCertBERLen() const {
  return m_x509 ? static_cast<unsigned short>(m_ber.GetBufferSize()) : 0;
}

OESecStatus OECert::GetPublicKey(OEBuffer* out) const {
  uint32_t n = m_publicKey.GetBufferSize();
  if (!out || !m_x509 || n == 0 || n > 0xFFFF || out->WriteBytes(m_publicKey.GetBufferPtr(), n) != OEBUF_OK)
    return OE_SEC_CERT_PUBLIC_KEY;
  return OE_SEC_OK;
}

OESecStatus OECert::WriteInfo(FILE* stream) const {
  if (!stream) return OE_SEC_CERT_WRITE_INFO;
  struct Line {
    const char* format;
    time_t when;
  };
  const Line lines[] = {{"Start Date: %02d %02d %4d\n", m_start}, {"End Date:   %02d %02d %4d\n", m_end}};
  for (const Line& line : lines) {
    struct tm d = {};
    if (!gmtime_r(&line.when, &d) || fprintf(stream, line.format, d.tm_mon + 1, d.tm_mday, d.tm_year + 1900) < 0)
      return OE_SEC_CERT_WRITE_INFO;
  }
  return OE_SEC_OK;
}

OESecStatus OECert::SetCallbackRootID(OECallbackRootID id) {
  if (id == OE_ROOT_NONE) return OE_SEC_CERT_ROOT_ID;
  m_rootID = id;
  return OE_SEC_OK;
}

// ---------------------------------------------------------------------------

OECertID::OECertID() : m_encoded(nullptr), m_ber(nullptr), m_decoded(nullptr) {}

OECertID::~OECertID() { delete m_decoded; }

OESecStatus OECertID::SetEncodedCert(OEBuffer* encoded) {
  m_encoded = encoded;
  m_ber = nullptr;
  return Identify();
}

OESecStatus OECertID::SetCertBER(OEBuffer* ber) {
  m_ber = ber;
  m_encoded = nullptr;
  return Identify();
}

OESecStatus OECertID::Identify() {
  OESecEmpty(m_id);
  OEBuffer* ber = m_ber;
  if (!ber && m_encoded) {
    if (!m_decoded) m_decoded = new (std::nothrow) OEBuffer();
    if (!m_decoded) {
      g_allocFailed = 1;
      return OE_SEC_CERTID_STORE;
    }
    OEDecode decode(m_encoded);
    if (decode.GetStatus() != OE_SEC_OK) return decode.GetStatus();
    *m_decoded = *decode.GetOutputData();
    ber = m_decoded;
  }
  if (!ber || ber->GetBufferSize() == 0) return OE_SEC_CERTID_NO_CERT;
  OEDigest digest(ber, OE_AI_SHA1);
  if (digest.GetStatus() != OE_SEC_OK) return digest.GetStatus();
  OEEncode encode(digest.GetOutputData());
  if (encode.GetStatus() != OE_SEC_OK) return encode.GetStatus();
  OEBuffer* text = encode.GetOutputData();
  if (m_id.WriteBytes(text->GetBufferPtr(), text->GetBufferSize()) != OEBUF_OK) return OE_SEC_CERTID_STORE;
  return OE_SEC_OK;
}
