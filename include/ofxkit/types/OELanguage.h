// An OFX language code (ISO 639-2, three letters such as "ENG").
#pragma once

#include "ofxkit/types/OEDynamicArray.h"
#include "ofxkit/types/OEString.h"

// The code is held as a three-character string; a longer code is kept whole
// and answers IsValid() 0.
class OELanguage {
 public:
  OELanguage() = default;
  OELanguage(const char* code) { m_code = code; }  // NOLINT: implicit, like a string
  explicit OELanguage(const OEString& code) { m_code = code; }
  OELanguage(const OELanguage& other) = default;
  OELanguage& operator=(const OELanguage& other) = default;
  virtual ~OELanguage();

  // Assigns the code text; the three-character limit stays.
  OELanguage& operator=(const OEString& code) {
    m_code = code;
    return *this;
  }
  OELanguage& operator=(const char* code) {
    m_code = code;
    return *this;
  }

  const OEString3& GetString() const { return m_code; }
  virtual unsigned short IsValid() const;

  bool operator==(const OELanguage& other) const { return m_code == other.m_code; }
  bool operator!=(const OELanguage& other) const { return !(m_code == other.m_code); }

 private:
  OEString3 m_code;
};

// The repeated LANGUAGE element of a message set's profile.
class OEDynamicArrayLanguage : public OEDynamicArrayTyped<OELanguage> {
 public:
  using OEDynamicArrayTyped<OELanguage>::OEDynamicArrayTyped;
};
