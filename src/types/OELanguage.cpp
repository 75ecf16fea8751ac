#include "ofxkit/types/OELanguage.h"

OELanguage::~OELanguage() = default;

unsigned short OELanguage::IsValid() const { return m_code.IsValid(); }
