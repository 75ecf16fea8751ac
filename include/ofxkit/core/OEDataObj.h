// Base of every OFX aggregate: presence bits, the tag it stands under, and the
// handlers through which parsers fill it and builders write it.
#pragma once

#include <cstddef>
#include <cstdint>
#include <new>

#include "ofxkit/core/OETagID.h"
#include "ofxkit/types/OECommon.h"
#include "ofxkit/types/OEString.h"

struct OETagDictionaryEntry;
class ServerImpl;
enum OEHeaderTag : int32_t;

class OEDataObj {
 public:
  static constexpr unsigned short kMaxValidTags = 96;

  OEDataObj();
  OEDataObj(const OEDataObj& other);
  OEDataObj& operator=(const OEDataObj& other);
  virtual ~OEDataObj();

  virtual OEParseStatus SetupForParsing(OEParser* const parser);
  virtual OEParseStatus HandleTagStart(const OETagDictionaryEntry* const entry);
  // Converts the text and calls the OEString form.
  virtual OEParseStatus HandleTagElement(const OETagDictionaryEntry* const entry, const char* const text);
  // The form parsers call; classes that take elements override it.
  virtual OEParseStatus HandleTagElement(const OETagDictionaryEntry* const entry, const OEString& value);
  virtual OEParseStatus HandleTagEnd(const OETagDictionaryEntry* const entry);
  virtual OEParseStatus HandleHeader(OEHeaderTag tag, const OEString& value, OEString* name);
  virtual unsigned short GetArrayOfValidTags(OEArrayOfTags& tags) const;
  virtual unsigned short GetArrayOfRequiredTags(OEArrayOfTags& tags) const;
  virtual OEBuildStatus Build(OEBuilder* builder) const;
  virtual OEBuildStatus BuildObject(OEBuilder* builder, OETagID tag) const;
  virtual OEParseStatus PushAndSetObject(OEDataObj* child, OETagID tag);
  virtual unsigned short ProcessResponse();
  virtual unsigned short ProcessRequest(const ServerImpl* server);
  virtual unsigned short AllRequiredPresent();
  virtual OETagID GetFirstMissingRequiredTag(OETagID after) const;
  virtual unsigned short AnyValidPresent();
  virtual unsigned short OneValidPresent();
  virtual OETagID GetType() const { return m_type; }
  virtual void SetType(OETagID type) { m_type = type; }
  virtual OEDataObj* GetChild(unsigned short index) const;
  virtual unsigned short GetNumberOfChildren() const;

  unsigned short CopyBaseMembersFrom(const OEDataObj* other);
  unsigned short SetTag(OETagID tag);
  unsigned short ClearTag(OETagID tag);
  // Presence test: 1 when the tag is valid here and present.
  unsigned short ValidateTag(OETagID tag) const;

  static unsigned short SetFactory(OEDataObjFactory* factory);
  static OEDataObjFactory* GetFactory();
  // Reinstalls the library's default factory.
  static void ResetFactory();

  // Objects are carved from large blocks of the library's own (2 MB, their
  // pages made present a step at a time ahead of use) rather than taken one
  // by one from the heap: a statement's tree is tens of thousands of objects,
  // and this spares each its own allocation and most of them a page fault.
  // Freed objects are reused; blocks go back to the system when no object
  // is left but for a few kept for the next parse. (Builds with
  // AddressSanitizer use the heap, so that it sees every object.)
  static void* operator new(std::size_t size);
  static void* operator new(std::size_t size, const std::nothrow_t&) noexcept;
  static void* operator new(std::size_t, void* where) noexcept { return where; }
  static void operator delete(void* p, std::size_t size) noexcept;
  static void operator delete(void* p, const std::nothrow_t&) noexcept;
  static void operator delete(void*, void*) noexcept {}

 protected:
  OEParser* GetParser() const { return m_parser; }
  void SetParser(OEParser* const parser) { m_parser = parser; }
  // Position of tag in the valid array, or -1. Aggregates answer from a
  // table made once per class.
  virtual int32_t ValidTagPosition(OETagID tag) const;
  void SetPresenceBit(int32_t position) { m_present[position >> 5] |= 1u << (position & 31); }
  void ClearPresenceBit(int32_t position) { m_present[position >> 5] &= ~(1u << (position & 31)); }
  bool PresenceBit(int32_t position) const { return (m_present[position >> 5] >> (position & 31)) & 1u; }

 private:
  unsigned short GetBitValue(OETagID tag, uint32_t* mask) const;
  // Number of valid tags present, counting no further than limit.
  unsigned short ValidPresentCount(unsigned short limit) const;

  OEParser* m_parser;
  uint32_t m_present[3];
  OETagID m_type;

  static OEDataObjFactory* m_factoryObj;
  static unsigned short m_factoryAllocated;
};

// The handle of the loaded library module (its base address on this platform).
void* GetOESDKInstance();
// How many times the library was attached to and detached from the process.
uint32_t GetOESDKAttachCount();
uint32_t GetOESDKDetachCount();
