#include "ofxkit/core/OEDataObj.h"

#include <dlfcn.h>

#include <cstring>
#include <new>

#include "ofxkit/core/OEDataObjFactory.h"
#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/parse/OEParser.h"

OEDataObjFactory* OEDataObj::m_factoryObj = nullptr;
unsigned short OEDataObj::m_factoryAllocated = 0;

OEDataObj::OEDataObj() : m_parser(nullptr), m_present{0, 0, 0}, m_type(OE_TAG_NONE) {}

OEDataObj::OEDataObj(const OEDataObj& other)
    : m_parser(other.m_parser), m_present{other.m_present[0], other.m_present[1], other.m_present[2]},
      m_type(other.m_type) {}

OEDataObj& OEDataObj::operator=(const OEDataObj& other) {
  CopyBaseMembersFrom(&other);
  return *this;
}

OEDataObj::~OEDataObj() = default;

unsigned short OEDataObj::CopyBaseMembersFrom(const OEDataObj* other) {
  if (!other) return 0;
  m_parser = other->m_parser;
  memcpy(m_present, other->m_present, sizeof m_present);
  m_type = other->m_type;
  return 1;
}

OEParseStatus OEDataObj::SetupForParsing(OEParser* const parser) {
  m_parser = parser;
  return OE_PARSE_OK;
}

OEParseStatus OEDataObj::HandleTagStart(const OETagDictionaryEntry* const) { return OE_PARSE_NOT_HANDLED; }

OEParseStatus OEDataObj::HandleTagElement(const OETagDictionaryEntry* const entry, const char* const text) {
  return HandleTagElement(entry, OEString(text));
}

OEParseStatus OEDataObj::HandleTagElement(const OETagDictionaryEntry* const, const OEString&) {
  return OE_PARSE_NOT_HANDLED;
}

OEParseStatus OEDataObj::HandleTagEnd(const OETagDictionaryEntry* const entry) {
  if (!m_parser) return OE_PARSE_NO_PARSER;
  OETagID id = entry ? entry->id : OE_TAG_NONE;
  if (id == GetType()) {
    m_parser->PopObject();
    return OE_PARSE_OK;
  }
  OELogWarning(OEPW_INVALIDENDAGG, OEString(), OEString(entry ? entry->name : nullptr), id, this);
  return OE_PARSE_END_MISMATCH;
}

OEParseStatus OEDataObj::HandleHeader(OEHeaderTag, const OEString&, OEString*) { return OE_PARSE_OK; }

unsigned short OEDataObj::GetArrayOfValidTags(OEArrayOfTags& tags) const {
  tags.tags = nullptr;
  tags.count = 0;
  return 1;
}

unsigned short OEDataObj::GetArrayOfRequiredTags(OEArrayOfTags& tags) const {
  tags.tags = nullptr;
  tags.count = 0;
  return 1;
}

OEBuildStatus OEDataObj::Build(OEBuilder*) const { return OE_BUILD_OK; }

OEParseStatus OEDataObj::PushAndSetObject(OEDataObj* child, OETagID tag) {
  if (!child) return OE_PARSE_NO_PARSER;
  if (tag != OE_TAG_NONE) {
    child->SetType(tag);
    if (!SetTag(tag)) return OE_PARSE_NOT_HANDLED;
  }
  if (!m_parser) return OE_PARSE_NO_PARSER;
  return m_parser->PushObject(child) ? OE_PARSE_OK : OE_PARSE_PUSH_FAILED;
}

unsigned short OEDataObj::ProcessResponse() {
  unsigned short n = GetNumberOfChildren();
  for (unsigned short i = 0; i < n; ++i)
    if (OEDataObj* child = GetChild(i)) child->ProcessResponse();
  return 1;
}

unsigned short OEDataObj::ProcessRequest(const ServerImpl*) { return 1; }

int32_t OEDataObj::ValidTagPosition(OETagID tag) const {
  OEArrayOfTags valid{nullptr, 0};
  if (!GetArrayOfValidTags(valid) || !valid.tags) return -1;
  unsigned short count = valid.count < kMaxValidTags ? valid.count : kMaxValidTags;
  for (unsigned short i = 0; i < count; ++i)
    if (valid.tags[i] == tag) return i;
  return -1;
}

unsigned short OEDataObj::GetBitValue(OETagID tag, uint32_t* mask) const {
  mask[0] = mask[1] = mask[2] = 0;
  int32_t position = ValidTagPosition(tag);
  if (position < 0) return 0;
  mask[position >> 5] = 1u << (position & 31);
  return 1;
}

unsigned short OEDataObj::SetTag(OETagID tag) {
  int32_t position = ValidTagPosition(tag);
  if (position < 0) return 0;
  SetPresenceBit(position);
  return 1;
}

unsigned short OEDataObj::ClearTag(OETagID tag) {
  int32_t position = ValidTagPosition(tag);
  if (position < 0) {
    OELogWarning(OEPW_UNKNOWNTAG, OEString(), OEString(), tag, nullptr);
    return 0;
  }
  ClearPresenceBit(position);
  return 1;
}

unsigned short OEDataObj::ValidateTag(OETagID tag) const {
  int32_t position = ValidTagPosition(tag);
  return position >= 0 && PresenceBit(position);
}

unsigned short OEDataObj::AllRequiredPresent() {
  OEArrayOfTags required{nullptr, 0};
  if (!GetArrayOfRequiredTags(required) || !required.tags) return 1;
  for (unsigned short i = 0; i < required.count; ++i)
    if (!ValidateTag(required.tags[i])) return 0;
  return 1;
}

OETagID OEDataObj::GetFirstMissingRequiredTag(OETagID after) const {
  OEArrayOfTags required{nullptr, 0};
  if (!GetArrayOfRequiredTags(required) || !required.tags) return OE_TAG_NONE;
  bool passed = after == OE_TAG_NONE;
  for (unsigned short i = 0; i < required.count; ++i) {
    OETagID tag = required.tags[i];
    if (ValidateTag(tag)) continue;  // only absent tags take part in the walk
    if (passed) return tag;
    if (tag == after) passed = true;
  }
  return OE_TAG_NONE;
}

unsigned short OEDataObj::ValidPresentCount(unsigned short limit) const {
  OEArrayOfTags valid{nullptr, 0};
  if (!GetArrayOfValidTags(valid) || !valid.tags) return 0;
  unsigned short count = valid.count < kMaxValidTags ? valid.count : kMaxValidTags;
  unsigned short found = 0;
  for (unsigned short i = 0; i < count && found < limit; ++i)
    if (PresenceBit(i)) ++found;
  return found;
}

unsigned short OEDataObj::AnyValidPresent() { return ValidPresentCount(1) > 0; }

unsigned short OEDataObj::OneValidPresent() { return ValidPresentCount(2) == 1; }

OEDataObj* OEDataObj::GetChild(unsigned short) const { return nullptr; }

unsigned short OEDataObj::GetNumberOfChildren() const { return 0; }

// The library's default factory is made once, on first need, and lives for
// the process; it is never deleted while objects may still ask for it. An
// installed factory stays the application's.
namespace {
OEDataObjFactory* DefaultFactory() {
  static OEDataObjFactory* factory = new (std::nothrow) OEDataObjFactory();
  return factory;
}
}  // namespace

unsigned short OEDataObj::SetFactory(OEDataObjFactory* factory) {
  if (!factory) return 0;
  m_factoryObj = factory;
  m_factoryAllocated = factory == DefaultFactory();
  return 1;
}

OEDataObjFactory* OEDataObj::GetFactory() {
  if (!m_factoryObj) {
    m_factoryObj = DefaultFactory();
    if (!m_factoryObj) {
      g_allocFailed = 1;
      return nullptr;
    }
    m_factoryAllocated = 1;
  }
  return m_factoryObj;
}

// Puts the library's default factory back (after an application's factory
// is gone).
void OEDataObj::ResetFactory() {
  m_factoryObj = DefaultFactory();
  m_factoryAllocated = 1;
}

// ---------------------------------------------------------------------------
// Load-time record of the library module.

namespace {
void* g_moduleHandle = nullptr;
uint32_t g_attachCount = 0;
uint32_t g_detachCount = 0;

__attribute__((constructor)) void OnLibraryAttach() {
  if (g_attachCount++ == 0) {
    Dl_info info;
    if (dladdr(reinterpret_cast<void*>(&OnLibraryAttach), &info) && info.dli_fbase) g_moduleHandle = info.dli_fbase;
  }
}

__attribute__((destructor)) void OnLibraryDetach() { ++g_detachCount; }
}  // namespace

void* GetOESDKInstance() { return g_moduleHandle; }
uint32_t GetOESDKAttachCount() { return g_attachCount; }
uint32_t GetOESDKDetachCount() { return g_detachCount; }
