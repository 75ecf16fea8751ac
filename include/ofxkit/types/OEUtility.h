// Small shared services of the library: transaction identifiers, the SGML
// character entities, little-endian byte packing for binary records, the
// digit-group reader of the date parsers, and helpers that walk data objects.
#pragma once

#include <cstdint>

#include "ofxkit/core/OETagID.h"
#include "ofxkit/types/OECommon.h"
#include "ofxkit/types/OEString.h"

class OEDataObj;
class OEDynamicArrayDataObj;

class OEUtility {
 public:
  // Length of a transaction identifier, without its terminating nul.
  static constexpr unsigned short kTransactionIDLength = 36;

  // ---- Transaction identifiers (time-based, laid out as DCE version-1 UUIDs)
  // Writes 36 upper-case hexadecimal characters in 8-4-4-4-12 groups and a nul
  // into out, which must hold 37 bytes. Returns 1 (0 only for a null out).
  static unsigned short GenerateTransactionID(char* out);
  static unsigned short GetGUIDClockSequence();
  // Keeps the low 14 bits.
  static void SetGUIDClockSequence(unsigned short sequence);
  // Does nothing when either pointer is null.
  static void GetGUIDNode(unsigned short* node01, uint32_t* node25);
  // node25 is the upper 32 bits of the 48-bit node, node01 the lower 16.
  static void SetGUIDNode(unsigned short node01, uint32_t node25);

  // ---- SGML character entities ("gt", "lt", "amp")
  // The character of a named entity (name matched without regard to case), or
  // a space when the name is unknown or null.
  static char GetMacroChar(const char* name);
  // The entity name of a character that needs one, or null.
  static const char* GetMacroString(char c);
  // The first of '>', '<', '&' in text, or null (also for a null text).
  static char* ContainsMacro(char* text);
  static const char* ContainsMacro(const char* text);

  // ---- Little-endian packing (low byte first)
  static void PackByte(char* dest, char value);
  static void PackShort(char* dest, unsigned short value);
  static void PackLong(char* dest, uint32_t value);
  static char UnPackByte(const char* src);
  static unsigned short UnPackShort(const char* src);
  static uint32_t UnPackLong(const char* src);

  // Reads up to five decimal digits. requiredDigits >= 1 demands exactly that
  // many (an empty text fails); 0 takes any count (empty gives 0). When fewer
  // digits than scaleDigits were read the value is scaled up by 10 per missing
  // digit ("5" with scaleDigits 3 gives 500). The result is kept to 16 bits.
  // Returns OE_PARSE_OK, or OE_PARSE_NOT_HANDLED on failure (value untouched).
  static OEParseStatus AscToUInt(const char* text, unsigned short* value, short requiredDigits,
                                 short scaleDigits);

  // ---- Data-object helpers
  // 1-based position of the first entry at or after start (0 counts as 1)
  // whose tag is tag; 0 when none (the search stops at the first empty slot).
  static unsigned short Find(const OEDynamicArrayDataObj* array, OETagID tag, unsigned short start);
  // 1 when the whole tree under *object has its required tags. Otherwise 0,
  // *object becomes the deepest object found lacking (when a child fails) and
  // *missingTag that object's first missing required tag.
  static unsigned short AllRequiredPresent(OEDataObj** object, OETagID* missingTag);
  // Depth-first search for the next missing required tag after `after`; *where
  // receives the object lacking it, or null when nothing is missing.
  static OETagID GetNextMissingRequiredTag(OEDataObj* object, OEDataObj** where, OETagID after);

  // ---- Diagnostics
  // "OBJECT NULL" for a null object, otherwise the object's OFX tag name.
  static OEString ObjectToString(OEDataObj* object);
  // "TAG UNKNOWN" for tag 0, otherwise the tag's OFX name.
  static OEString TagToString(OETagID tag);

 private:
  // Advances the clock sequence (modulo 2^14), choosing a starting value first
  // when it is still 0.
  static unsigned short GetSequence();
  static void MakeNode();

  static unsigned short m_clockSequence;
  static unsigned short m_seeded;
  static unsigned short m_nodeSet;
  static uint32_t m_node25;
  static unsigned short m_node01;
  // Full timestamp of the previous identifier (ten-thousandths of a second
  // since 15 October 1582); wider than 32 bits so that comparing it never
  // wraps.
  static int64_t m_lastTime;
  static uint32_t m_lastSecond;
  static uint32_t m_nextFracSec;
};
