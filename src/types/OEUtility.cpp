#include "ofxkit/types/OEUtility.h"

#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/types/OEDynamicArray.h"

#include <chrono>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <ctime>
#include <strings.h>

unsigned short OEUtility::m_clockSequence = 0;
unsigned short OEUtility::m_seeded = 0;
unsigned short OEUtility::m_nodeSet = 0;
uint32_t OEUtility::m_node25 = 0;
unsigned short OEUtility::m_node01 = 0;
int64_t OEUtility::m_lastTime = 0;
uint32_t OEUtility::m_lastSecond = 0;
uint32_t OEUtility::m_nextFracSec = 0;

namespace {

// Seconds from 1 January 1900 to 1 January 1970, and from the start of the
// Gregorian calendar (15 October 1582) to 1 January 1900.
constexpr uint64_t kSeconds1900To1970 = 2208988800ULL;
constexpr uint64_t kSecondsGregorianTo1900 = 10004083200ULL;
// Identifier timestamps count ten-thousandths of a second.
constexpr uint64_t kTicksPerSecond = 10000;

constexpr unsigned short kClockSequenceMask = 0x3FFF;
constexpr unsigned short kVariantBit = 0x8000;
constexpr unsigned short kVersion1 = 0x1000;
constexpr uint32_t kRandomNodeBit = 0x80000000u;

// Entropy from volatile process state: the address of a stack slot (moved by
// address-space randomisation), a static's address and a fine-grained clock,
// mixed so that every bit depends on all of them.
uint64_t VolatileState() {
  int probe = 0;
  uint64_t x = static_cast<uint64_t>(reinterpret_cast<uintptr_t>(&probe));
  x ^= static_cast<uint64_t>(reinterpret_cast<uintptr_t>(&VolatileState)) << 17;
  x ^= static_cast<uint64_t>(std::chrono::high_resolution_clock::now().time_since_epoch().count());
  x += 0x9E3779B97F4A7C15ULL;
  x = (x ^ (x >> 30)) * 0xBF58476D1CE4E5B9ULL;
  x = (x ^ (x >> 27)) * 0x94D049BB133111EBULL;
  return x ^ (x >> 31);
}

struct Entity {
  const char* name;
  char character;
};
constexpr Entity kEntities[] = {{"gt", '>'}, {"lt", '<'}, {"amp", '&'}};
constexpr char kEntityChars[] = "><&";

constexpr short kMaxAscDigits = 5;

}  // namespace

// ---------------------------------------------------------------------------
// Transaction identifiers

unsigned short OEUtility::GetSequence() {
  if (m_clockSequence == 0) {
    m_clockSequence = static_cast<unsigned short>(VolatileState() & kClockSequenceMask);
  }
  m_clockSequence = static_cast<unsigned short>((m_clockSequence + 1) & kClockSequenceMask);
  return m_clockSequence;
}

void OEUtility::MakeNode() {
  if (!m_seeded) {
    std::srand(static_cast<unsigned>(VolatileState()));
    m_seeded = 1;
  }
  const uint64_t state = VolatileState() ^ static_cast<uint64_t>(std::time(nullptr));
  m_node25 = static_cast<uint32_t>(state ^ (state >> 32)) | kRandomNodeBit;
  m_node01 = static_cast<unsigned short>(std::rand());
  m_nodeSet = 1;
}

unsigned short OEUtility::GenerateTransactionID(char* out) {
  if (out == nullptr) return 0;
  const std::time_t now = std::time(nullptr);
  const uint32_t t = static_cast<uint32_t>(now);
  uint64_t timestamp =
      (static_cast<uint64_t>(now) + kSeconds1900To1970 + kSecondsGregorianTo1900) * kTicksPerSecond;
  if (t == m_lastSecond) {
    ++m_nextFracSec;
    timestamp += m_nextFracSec;
  } else {
    m_nextFracSec = 0;
  }
  m_lastSecond = t;

  const uint32_t timeLow = static_cast<uint32_t>(timestamp);
  const unsigned short timeMid = static_cast<unsigned short>(timestamp >> 32);
  const unsigned short timeHiAndVersion =
      static_cast<unsigned short>(((timestamp >> 48) & 0x0FFF) | kVersion1);

  if (m_clockSequence == 0 || static_cast<int64_t>(timestamp) < m_lastTime) GetSequence();
  m_lastTime = static_cast<int64_t>(timestamp);
  const unsigned short clock = static_cast<unsigned short>(m_clockSequence | kVariantBit);

  if (!m_nodeSet) MakeNode();

  std::snprintf(out, kTransactionIDLength + 1, "%08X-%04X-%04X-%04X-%08X%04X", static_cast<unsigned>(timeLow),
                static_cast<unsigned>(timeMid), static_cast<unsigned>(timeHiAndVersion),
                static_cast<unsigned>(clock), static_cast<unsigned>(m_node25), static_cast<unsigned>(m_node01));
  return 1;
}

unsigned short OEUtility::GetGUIDClockSequence() { return m_clockSequence; }

void OEUtility::SetGUIDClockSequence(unsigned short sequence) {
  m_clockSequence = static_cast<unsigned short>(sequence & kClockSequenceMask);
}

void OEUtility::GetGUIDNode(unsigned short* node01, uint32_t* node25) {
  if (node01 == nullptr || node25 == nullptr) return;
  *node01 = m_node01;
  *node25 = m_node25;
}

void OEUtility::SetGUIDNode(unsigned short node01, uint32_t node25) {
  m_node01 = node01;
  m_node25 = node25;
  m_nodeSet = 1;
}

// ---------------------------------------------------------------------------
// Character entities

char OEUtility::GetMacroChar(const char* name) {
  if (name != nullptr) {
    for (const Entity& e : kEntities) {
      if (strcasecmp(name, e.name) == 0) return e.character;
    }
  }
  return ' ';
}

const char* OEUtility::GetMacroString(char c) {
  for (const Entity& e : kEntities) {
    if (e.character == c) return e.name;
  }
  return nullptr;
}

const char* OEUtility::ContainsMacro(const char* text) {
  return text == nullptr ? nullptr : std::strpbrk(text, kEntityChars);
}

char* OEUtility::ContainsMacro(char* text) {
  return const_cast<char*>(ContainsMacro(static_cast<const char*>(text)));
}

// ---------------------------------------------------------------------------
// Packing

void OEUtility::PackByte(char* dest, char value) { dest[0] = value; }

void OEUtility::PackShort(char* dest, unsigned short value) {
  dest[0] = static_cast<char>(value & 0xFF);
  dest[1] = static_cast<char>(value >> 8);
}

void OEUtility::PackLong(char* dest, uint32_t value) {
  PackShort(dest, static_cast<unsigned short>(value & 0xFFFF));
  PackShort(dest + 2, static_cast<unsigned short>(value >> 16));
}

char OEUtility::UnPackByte(const char* src) { return src[0]; }

unsigned short OEUtility::UnPackShort(const char* src) {
  return static_cast<unsigned short>(static_cast<unsigned char>(src[0]) |
                                     (static_cast<unsigned char>(src[1]) << 8));
}

uint32_t OEUtility::UnPackLong(const char* src) {
  return static_cast<uint32_t>(UnPackShort(src)) | (static_cast<uint32_t>(UnPackShort(src + 2)) << 16);
}

// ---------------------------------------------------------------------------
// Digit groups

OEParseStatus OEUtility::AscToUInt(const char* text, unsigned short* value, short requiredDigits,
                                   short scaleDigits) {
  if (value == nullptr) return OE_PARSE_NOT_HANDLED;
  uint32_t result = 0;
  short count = 0;
  if (text != nullptr) {
    for (; count < kMaxAscDigits && text[count] != '\0'; ++count) {
      const char c = text[count];
      if (c < '0' || c > '9') return OE_PARSE_NOT_HANDLED;
      result = result * 10 + static_cast<uint32_t>(c - '0');
    }
  }
  if (requiredDigits >= 1 && count != requiredDigits) return OE_PARSE_NOT_HANDLED;
  for (short n = count; n < scaleDigits; ++n) result *= 10;
  *value = static_cast<unsigned short>(result);
  return OE_PARSE_OK;
}

// ---------------------------------------------------------------------------
// Data-object helpers

unsigned short OEUtility::Find(const OEDynamicArrayDataObj* array, OETagID tag, unsigned short start) {
  if (array == nullptr) return 0;
  const unsigned short entries = array->Entries();
  for (unsigned short i = start == 0 ? 0 : static_cast<unsigned short>(start - 1); i < entries; ++i) {
    const OEDataObj* entry = array->Get(i);
    if (entry == nullptr) break;
    if (entry->GetType() == tag) return static_cast<unsigned short>(i + 1);
  }
  return 0;
}

unsigned short OEUtility::AllRequiredPresent(OEDataObj** object, OETagID* missingTag) {
  if (missingTag != nullptr) *missingTag = OE_TAG_NONE;
  if (object == nullptr || *object == nullptr) return 1;
  OEDataObj* const self = *object;
  if (!self->AllRequiredPresent()) {
    if (missingTag != nullptr) *missingTag = self->GetFirstMissingRequiredTag(OE_TAG_NONE);
    return 0;
  }
  const unsigned short children = self->GetNumberOfChildren();
  for (unsigned short i = 0; i < children; ++i) {
    OEDataObj* failing = self->GetChild(i);
    if (failing != nullptr && !AllRequiredPresent(&failing, missingTag)) {
      *object = failing;
      return 0;
    }
  }
  return 1;
}

OETagID OEUtility::GetNextMissingRequiredTag(OEDataObj* object, OEDataObj** where, OETagID after) {
  OEDataObj* found = nullptr;
  OETagID tag = OE_TAG_NONE;
  if (object != nullptr) {
    if (!object->AllRequiredPresent()) {
      found = object;
      tag = object->GetFirstMissingRequiredTag(after);
    } else {
      const unsigned short children = object->GetNumberOfChildren();
      for (unsigned short i = 0; i < children && found == nullptr; ++i) {
        tag = GetNextMissingRequiredTag(object->GetChild(i), &found, after);
      }
    }
  }
  if (where != nullptr) *where = found;
  return tag;
}

// ---------------------------------------------------------------------------
// Diagnostics

namespace {
constexpr char kTagUnknown[] = "TAG UNKNOWN";

// Name from the shared dictionary, or "TAG UNKNOWN" for 0, an id without a
// name, or a dictionary that could not be made.
const char* TagName(OETagID tag) {
  if (tag == OE_TAG_NONE) return kTagUnknown;
  const OETagDictionary* dictionary = OETagDictionary::TheOETagDictionary();
  const char* name = dictionary != nullptr ? dictionary->GetTagString(tag) : nullptr;
  return name != nullptr ? name : kTagUnknown;
}
}  // namespace

OEString OEUtility::ObjectToString(OEDataObj* object) {
  return OEString(object == nullptr ? "OBJECT NULL" : TagName(object->GetType()));
}

OEString OEUtility::TagToString(OETagID tag) { return OEString(TagName(tag)); }
