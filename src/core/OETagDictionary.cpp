#include "ofxkit/core/OETagDictionary.h"

#include <algorithm>
#include <cstring>
#include <new>

#include "ofxkit/types/OECommon.h"

namespace {

// The built-in vocabulary, generated from the tag list in id order.
const OETagDictionaryEntry kBuiltInTable[] = {
#define OE_TAG(sym, name) {OE_TAG_##sym, name},
#include "ofxkit/core/OETags.def"
#undef OE_TAG
};

constexpr size_t kBuiltInCount = sizeof(kBuiltInTable) / sizeof(kBuiltInTable[0]);
static_assert(kBuiltInCount == OE_TAG_COUNT_PLUS_ONE - 1, "tag table and tag enum disagree");
static_assert(kBuiltInCount <= TagDictionary::kMaxEntries, "tag table too large to index");

}  // namespace

OECaseType TagDictionary::m_compareType = OE_CASE_EXACT;

int TagDictionary::sCompareTag(const void* left, const void* right) {
  const auto* l = static_cast<const OEMapTagStringToID*>(left);
  const auto* r = static_cast<const OEMapTagStringToID*>(right);
  return sCompare({l->entry->name, l->length}, {r->entry->name, r->length});
}

int TagDictionary::sCompareTagID(const void* left, const void* right) {
  const OETagID l = static_cast<const OEMapTagIDToIndex*>(left)->id;
  const OETagID r = static_cast<const OEMapTagIDToIndex*>(right)->id;
  return (l > r) - (l < r);
}

TagDictionary::TagDictionary(const OETagDictionaryEntry* table, unsigned short count)
    : m_entries(table),
      m_nameIndex(nullptr),
      m_count(table ? std::min(count, kMaxEntries) : 0),
      m_idIndex(nullptr),
      m_lowestID(0),
      m_searchMode(SEARCH_DIRECT) {
  m_compareType = OE_CASE_EXACT;
  if (m_count == 0) return;

  m_nameIndex = new (std::nothrow) OEMapTagStringToID[m_count];
  if (!m_nameIndex) {
    g_allocFailed = 1;
    m_searchMode = SEARCH_LINEAR;
    return;
  }
  for (unsigned short i = 0; i < m_count; ++i) {
    const char* name = m_entries[i].name;
    const size_t length = name ? strlen(name) : 0;
    m_nameIndex[i] = {&m_entries[i], static_cast<unsigned short>(std::min<size_t>(length, 0xFFFF))};
  }
  std::sort(m_nameIndex, m_nameIndex + m_count,
            [](const OEMapTagStringToID& l, const OEMapTagStringToID& r) {
              return sCompare({l.entry->name, l.length}, {r.entry->name, r.length}) < 0;
            });

  m_idIndex = new (std::nothrow) OEMapTagIDToIndex[m_count];
  if (!m_idIndex) {
    g_allocFailed = 1;
    m_searchMode = SEARCH_LINEAR;
    return;
  }
  for (unsigned short i = 0; i < m_count; ++i) m_idIndex[i] = {i, m_nameIndex[i].entry->id};
  std::sort(m_idIndex, m_idIndex + m_count,
            [](const OEMapTagIDToIndex& l, const OEMapTagIDToIndex& r) { return l.id < r.id; });

  m_lowestID = m_idIndex[0].id;
  m_searchMode = AreTagIDsContiguous() ? SEARCH_DIRECT : SEARCH_BINARY;
}

TagDictionary::~TagDictionary() {
  delete[] m_nameIndex;
  delete[] m_idIndex;
}

unsigned short TagDictionary::AreTagIDsContiguous() const {
  for (unsigned short i = 1; i < m_count; ++i) {
    if (m_idIndex[i].id != m_idIndex[i - 1].id + 1u) return 0;
  }
  return 1;
}

const OETagDictionaryEntry* TagDictionary::FindDictionaryEntry(const char* name, unsigned short length,
                                                               OECaseType caseType) const {
  m_compareType = caseType;
  if (!m_nameIndex || !name || length == 0) return nullptr;
  const short found = SearchDictionaryEntry(m_nameIndex, name, length, m_count).Search();
  return found < 0 ? nullptr : m_nameIndex[found].entry;
}

const OETagDictionaryEntry* TagDictionary::GetTagID(const char* name, unsigned short length, OETagID* id,
                                                    OECaseType caseType) const {
  const OETagDictionaryEntry* entry = FindDictionaryEntry(name, length, caseType);
  if (id) *id = entry ? entry->id : OE_TAG_NONE;
  return entry;
}

const OETagDictionaryEntry* TagDictionary::FindDictionaryEntry(OETagID id) const {
  for (unsigned short i = 0; i < m_count; ++i) {
    if (m_entries[i].id == id) return &m_entries[i];
  }
  return nullptr;
}

const char* TagDictionary::GetTagString(OETagID id) const {
  if (id == OE_TAG_NONE) return nullptr;
  const OETagDictionaryEntry* entry = nullptr;
  switch (m_searchMode) {
    case SEARCH_DIRECT: {
      const uint32_t place = static_cast<uint32_t>(id) - m_lowestID;
      if (place < m_count) entry = m_nameIndex[m_idIndex[place].position].entry;
      break;
    }
    case SEARCH_BINARY: {
      const short found = SearchDictionaryIndex(m_idIndex, id, m_count).Search();
      if (found >= 0) entry = m_nameIndex[m_idIndex[found].position].entry;
      break;
    }
    case SEARCH_LINEAR:
      entry = FindDictionaryEntry(id);
      break;
  }
  return entry ? entry->name : nullptr;
}

OETagDictionary* OETagDictionary::ms_theOETagDictionary = nullptr;

OETagDictionary::OETagDictionary()
    : TagDictionary(kBuiltInTable, static_cast<unsigned short>(kBuiltInCount)) {}

OETagDictionary::~OETagDictionary() = default;

OETagDictionary* OETagDictionary::TheOETagDictionary() {
  if (!ms_theOETagDictionary) {
    OETagDictionary* made = new (std::nothrow) OETagDictionary;
    if (!made) {
      g_allocFailed = 1;
      return nullptr;
    }
    // A dictionary whose indexes could not be made would find no names for
    // the rest of the process; drop it and try again on the next call.
    if (made->m_searchMode != SEARCH_DIRECT) {
      delete made;
      return nullptr;
    }
    ms_theOETagDictionary = made;
  }
  return ms_theOETagDictionary;
}

unsigned short NumberOfOEDictionaryEntry() { return static_cast<unsigned short>(kBuiltInCount); }

const OETagDictionaryEntry* OEDictionaryEntryTable() { return kBuiltInTable; }
