#include "ofxkit/security/OEKey.h"

#include <new>

#include "ofxkit/security/OESecToolkit.h"

OEKey::OEKey(OESecSelector keySelector)
    : m_keyBytes(nullptr), m_keyText(nullptr), m_selector(keySelector), m_keyObj(nullptr), m_status(OE_SEC_KEY_FAILED) {}

OEKey::OEKey(OEBuffer* keyBytes, OESecSelector keySelector) : OEKey(keySelector) { SetKey(keyBytes); }

OEKey::OEKey(OEString* keyText, OESecSelector keySelector) : OEKey(keySelector) { SetKeyStr(keyText); }

OEKey::~OEKey() { delete m_keyObj; }

OESecStatus OEKey::SetKey(OEBuffer* keyBytes) {
  m_keyBytes = keyBytes;
  m_keyText = nullptr;
  return Setup();
}

OESecStatus OEKey::SetKeyStr(OEString* keyText) {
  m_keyText = keyText;
  m_keyBytes = nullptr;
  return Setup();
}

OEKeyObj* OEKey::GetKeyObjPtr() { return Setup() == OE_SEC_OK ? m_keyObj : nullptr; }

OESecStatus OEKey::Setup() {
  delete m_keyObj;  // wipes the previous key material
  m_keyObj = nullptr;
  m_status = OE_SEC_KEY_FAILED;
  const unsigned char* data = nullptr;
  size_t n = 0;
  if (m_keyBytes) {
    data = reinterpret_cast<const unsigned char*>(m_keyBytes->GetBufferPtr());
    n = m_keyBytes->GetBufferSize();
  } else if (m_keyText) {
    data = reinterpret_cast<const unsigned char*>(m_keyText->c_str());
    n = m_keyText->GetStrLength();
  }
  if (!data || n == 0) return m_status;
  m_keyObj = new (std::nothrow) OEKeyObj();
  if (!m_keyObj) {
    g_allocFailed = 1;
    return m_status;
  }
  if (!m_keyObj->Load(OESecCode(m_selector), data, n)) {
    delete m_keyObj;
    m_keyObj = nullptr;
    return m_status;
  }
  return m_status = OE_SEC_OK;
}
