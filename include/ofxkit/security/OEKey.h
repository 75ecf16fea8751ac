// Key material for the security wrappers, from bytes or text.
#pragma once

#include "ofxkit/security/OESecStatus.h"
#include "ofxkit/types/OEBuffer.h"
#include "ofxkit/types/OEString.h"

class OEKeyObj;

class OEKey {
 public:
  explicit OEKey(OESecSelector keySelector);
  OEKey(OEBuffer* keyBytes, OESecSelector keySelector);
  OEKey(OEString* keyText, OESecSelector keySelector);
  OEKey(const OEKey&) = delete;
  OEKey& operator=(const OEKey&) = delete;
  ~OEKey();

  // Each setter replaces the other source and sets the key up.
  OESecStatus SetKey(OEBuffer* keyBytes);
  OESecStatus SetKeyBER(OEBuffer* keyBytes) { return SetKey(keyBytes); }
  OESecStatus SetKeyStr(OEString* keyText);
  // Sets the key up from the current source; null on failure (status 23).
  OEKeyObj* GetKeyObjPtr();
  OESecStatus GetStatus() const { return m_status; }

 private:
  OESecStatus Setup();

  OEBuffer* m_keyBytes;
  OEString* m_keyText;
  OESecSelector m_selector;
  OEKeyObj* m_keyObj;
  OESecStatus m_status;
};
