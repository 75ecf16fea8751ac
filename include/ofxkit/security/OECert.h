// X.509 certificates and the short identifiers that recognise them.
#pragma once

#include <cstdio>
#include <ctime>
#include <new>

#include "ofxkit/security/OESecStatus.h"
#include "ofxkit/types/OEBuffer.h"
#include "ofxkit/types/OEString.h"

struct x509_st;

class OECert {
 public:
  OECert();
  OECert(const OECert&) = delete;
  OECert& operator=(const OECert&) = delete;
  ~OECert();

  // Base64 text of the certificate's BER.
  OESecStatus SetEncodedCert(OEBuffer* encoded);
  OESecStatus SetEncodedCert(const char* text, unsigned short length);
  OESecStatus SetCertBER(OEBuffer* ber);
  OESecStatus SetCertBER(const char* ber, unsigned short length);

  const unsigned char* GetCertBER() const;
  unsigned short GetCertBERLen() const;
  // Appends the subject public key (SubjectPublicKeyInfo, BER) to out.
  OESecStatus GetPublicKey(OEBuffer* out) const;
  // The subject's organizationName, or "".
  OEString GetSubjectName() const { return m_subjectName; }
  time_t GetStartDate() const { return m_start; }
  time_t GetEndDate() const { return m_end; }
  OESecStatus WriteInfo(FILE* stream) const;
  OESecStatus SetCallbackRootID(OECallbackRootID id);
  OECallbackRootID GetCallbackRootID() const { return m_rootID; }
  bool IsSet() const { return m_x509 != nullptr; }

 private:
  void Reset();

  x509_st* m_x509;
  OEBuffer m_ber;
  OEString m_subjectName;
  time_t m_start;
  time_t m_end;
  OEBuffer m_publicKey;
  OECallbackRootID m_rootID;
};

class OECertID {
 public:
  OECertID();
  OECertID(const OECertID&) = delete;
  OECertID& operator=(const OECertID&) = delete;
  ~OECertID();

  // Decodes the base64 certificate and identifies it.
  OESecStatus SetEncodedCert(OEBuffer* encoded);
  OESecStatus SetCertBER(OEBuffer* ber);
  bool IsEmpty() const { return m_id.GetBufferSize() == 0; }
  // Base64 text of the SHA-1 digest of the certificate's BER.
  OEBuffer* GetEncodedCertIDPtr() { return &m_id; }

 private:
  OESecStatus Identify();

  OEBuffer* m_encoded;
  OEBuffer* m_ber;
  OEBuffer* m_decoded;  // owned; the BER decoded from m_encoded
  OEBuffer m_id;
};

// Arrays of owned pointers whose UnSet only empties a slot (nothing moves and
// the element is not deleted).
template <class T>
class OESecSlotArray {
 public:
  OESecSlotArray(unsigned short initial = 1, unsigned short growth = 1)
      : m_allocated(0), m_entries(0), m_initial(initial ? initial : 1), m_growth(growth ? growth : 1), m_slots(nullptr) {}
  OESecSlotArray(const OESecSlotArray&) = delete;
  OESecSlotArray& operator=(const OESecSlotArray&) = delete;
  ~OESecSlotArray() {
    for (unsigned short i = 0; i < m_entries; ++i) delete m_slots[i];
    delete[] m_slots;
  }

  unsigned short Entries() const { return m_entries; }
  T* Get(unsigned short i) const { return i < m_entries ? m_slots[i] : nullptr; }
  unsigned short Set(unsigned short i, T* p) {
    if (!p || i == 0xFFFF) return 0;
    while (i >= m_allocated)
      if (!Grow()) return 0;
    if (m_slots[i] != p) delete m_slots[i];
    m_slots[i] = p;
    if (i >= m_entries) m_entries = static_cast<unsigned short>(i + 1);
    return 1;
  }
  unsigned short Append(T* p) { return Set(m_entries, p); }
  unsigned short UnSet(unsigned short i) {
    if (i >= m_allocated) return 0;
    m_slots[i] = nullptr;
    return 1;
  }
  // Forgets every element without deleting it.
  void Clear() {
    for (unsigned short i = 0; i < m_allocated; ++i) m_slots[i] = nullptr;
    m_entries = 0;
  }

 private:
  unsigned short Grow() {
    uint32_t wanted = static_cast<uint32_t>(m_allocated) + (m_slots ? m_growth : m_initial);
    if (wanted > 0xFFFF) wanted = 0xFFFF;
    if (wanted <= m_allocated) return 0;
    T** slots = new (std::nothrow) T*[wanted]();
    if (!slots) {
      g_allocFailed = 1;
      return 0;
    }
    for (unsigned short i = 0; i < m_allocated; ++i) slots[i] = m_slots[i];
    delete[] m_slots;
    m_slots = slots;
    m_allocated = static_cast<unsigned short>(wanted);
    return 1;
  }

  unsigned short m_allocated;
  unsigned short m_entries;
  unsigned short m_initial;
  unsigned short m_growth;
  T** m_slots;
};

class OEDynamicArrayCert : public OESecSlotArray<OECert> {
 public:
  using OESecSlotArray<OECert>::OESecSlotArray;
};

class OEDynamicArrayBuffer : public OESecSlotArray<OEBuffer> {
 public:
  using OESecSlotArray<OEBuffer>::OESecSlotArray;
};
