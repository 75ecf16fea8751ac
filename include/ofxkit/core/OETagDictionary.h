// Tag dictionary: turns OFX tag names into ids and ids back into names.
//
// A TagDictionary is a read-only pair of sorted indexes over a constant table
// of OETagDictionaryEntry rows that the caller keeps alive. The name index is
// ordered by (length, text), so most comparisons of a lookup end on the
// length test; the id index lets an id reach its row in two array steps when
// the ids of the table are contiguous, or by binary search when they are not.
// Lookups never allocate.
#pragma once

#include <cstdint>
#include <cstring>

#include "ofxkit/core/OETagID.h"

// One row of a tag table: the id and the tag text exactly as OFX spells it,
// without angle brackets. Tables live in static storage and are never copied.
struct OETagDictionaryEntry {
  OETagID id;
  const char* name;
};

// Record of the name index: a table row and the byte length of its name.
struct OEMapTagStringToID {
  const OETagDictionaryEntry* entry;
  unsigned short length;
};

// Record of the id index: where in the name index the row with this id sits.
struct OEMapTagIDToIndex {
  unsigned short position;
  OETagID id;
};

// A name that need not be NUL-terminated, with its length.
struct OECompareInfo {
  const char* name;
  unsigned short length;
};

// How names are compared. Every value other than OE_CASE_EXACT ignores case.
enum OECaseType : int32_t {
  OE_CASE_EXACT = 0,
  OE_CASE_IGNORE = 1
};

// Binary search over any indexed sequence sorted in ascending order.
// Compare(index) returns < 0 when the sought key sorts before the element at
// index, 0 on a match and > 0 when it sorts after it.
class OEBinarySearch {
 public:
  virtual int Compare(unsigned short index) const = 0;
  virtual short GetNumberOfItems() const = 0;

  // Index of a matching element, or -1 (also for an empty sequence).
  // Defined here so that a search over a final derived object can be
  // inlined and its comparisons devirtualised.
  short Search() const {
    int low = 0;
    int high = GetNumberOfItems() - 1;
    while (low <= high) {
      const int middle = (low + high) / 2;
      const int result = Compare(static_cast<unsigned short>(middle));
      if (result == 0) return static_cast<short>(middle);
      if (result < 0) {
        high = middle - 1;
      } else {
        low = middle + 1;
      }
    }
    return -1;
  }

 protected:
  OEBinarySearch() = default;
  OEBinarySearch(const OEBinarySearch&) = default;
  OEBinarySearch& operator=(const OEBinarySearch&) = default;
  ~OEBinarySearch() = default;
};

// Search of a name index for a name of a given length, under the case rule
// currently set in TagDictionary.
class SearchDictionaryEntry final : public OEBinarySearch {
 public:
  SearchDictionaryEntry(const OEMapTagStringToID* records, const char* name,
                        unsigned short length, unsigned short count)
      : m_records(records), m_name(name), m_length(length), m_count(count) {}

  inline int Compare(unsigned short index) const override;
  short GetNumberOfItems() const override { return static_cast<short>(m_count); }

 private:
  const OEMapTagStringToID* m_records;
  const char* m_name;
  unsigned short m_length;
  unsigned short m_count;
};

// Search of an id index for an id.
class SearchDictionaryIndex final : public OEBinarySearch {
 public:
  SearchDictionaryIndex(const OEMapTagIDToIndex* records, OETagID id, unsigned short count)
      : m_records(records), m_id(id), m_count(count) {}

  int Compare(unsigned short index) const override {
    const OETagID other = m_records[index].id;
    return (m_id > other) - (m_id < other);
  }
  short GetNumberOfItems() const override { return static_cast<short>(m_count); }

 private:
  const OEMapTagIDToIndex* m_records;
  OETagID m_id;
  unsigned short m_count;
};

class TagDictionary {
 public:
  // Largest table that the signed 16-bit search positions can reach; rows
  // beyond it are ignored.
  static constexpr unsigned short kMaxEntries = 32767;

  // Builds both indexes over `table` (not copied, not owned). A null table
  // counts as one of zero rows. If an index cannot be allocated,
  // g_allocFailed is set and the dictionary degrades: without a name index
  // no name is found, and ids are then looked up by scanning the table.
  TagDictionary(const OETagDictionaryEntry* table, unsigned short count);
  virtual ~TagDictionary();

  TagDictionary(const TagDictionary&) = delete;
  TagDictionary& operator=(const TagDictionary&) = delete;

  // Row whose name equals the first `length` characters at `name` (no
  // terminator needed), or null; stores its id, or 0, through `id` when
  // `id` is not null. An empty name is never found.
  const OETagDictionaryEntry* GetTagID(const char* name, unsigned short length, OETagID* id,
                                       OECaseType caseType = OE_CASE_EXACT) const;

  // Name of the row with that id, or null (always null for 0).
  const char* GetTagString(OETagID id) const;

  // First row of the table, in table order, with that id, or null.
  const OETagDictionaryEntry* FindDictionaryEntry(OETagID id) const;

  // Orders of the name index (length first, then text under the current
  // case rule) and of the id index, as three-way comparisons.
  static int sCompareTag(const void* left, const void* right);
  static int sCompareTagID(const void* left, const void* right);
  static int sCompare(const OECompareInfo& left, const OECompareInfo& right) {
    if (left.length != right.length) return static_cast<int>(left.length) - right.length;
    if (left.length == 0) return 0;
    return m_compareType == OE_CASE_EXACT ? strncmp(left.name, right.name, left.length)
                                          : sCompareIgnoringCase(left.name, right.name, left.length);
  }

 protected:
  enum SearchMode : unsigned short {
    SEARCH_DIRECT = 0,  // ids contiguous: id - lowest id is the id-index place
    SEARCH_BINARY = 1,  // binary search over the id index
    SEARCH_LINEAR = 2   // no id index: scan the table
  };

  const OETagDictionaryEntry* m_entries;
  OEMapTagStringToID* m_nameIndex;
  unsigned short m_count;
  OEMapTagIDToIndex* m_idIndex;
  uint32_t m_lowestID;
  SearchMode m_searchMode;

  // Case rule used by the comparison functions; set by every lookup by name.
  static OECaseType m_compareType;

 private:
  const OETagDictionaryEntry* FindDictionaryEntry(const char* name, unsigned short length,
                                                  OECaseType caseType) const;
  unsigned short AreTagIDsContiguous() const;

  // Compares exactly n bytes with ASCII letters folded to upper case, which
  // leaves upper-case table names untouched: a name index sorted by the
  // exact rule stays sorted under this one whenever the table holds no
  // lower-case letters.
  static int sCompareIgnoringCase(const char* left, const char* right, unsigned short n) {
    auto upper = [](char c) {
      const int u = static_cast<unsigned char>(c);
      return (u >= 'a' && u <= 'z') ? u - ('a' - 'A') : u;
    };
    for (unsigned short i = 0; i < n; ++i) {
      const int diff = upper(left[i]) - upper(right[i]);
      if (diff != 0) return diff;
    }
    return 0;
  }
};

// Defined here, with the comparison it uses, so that the name search of the
// parse engine's hot path compiles to one loop without calls per step.
inline int SearchDictionaryEntry::Compare(unsigned short index) const {
  const OEMapTagStringToID& record = m_records[index];
  return TagDictionary::sCompare({m_name, m_length}, {record.entry->name, record.length});
}

// The dictionary over the library's built-in OFX vocabulary.
class OETagDictionary : public TagDictionary {
 public:
  OETagDictionary();
  ~OETagDictionary() override;

  // The process-wide instance, made on the first call and never released.
  // Null if it could not be made; the next call tries again.
  static OETagDictionary* TheOETagDictionary();

 private:
  static OETagDictionary* ms_theOETagDictionary;
};

// Recent exact-case answers of a dictionary, by a hash of the name: names
// repeat heavily in a statement, and a hit costs one comparison with the
// entry's own name instead of a search.
class OETagNameCache {
 public:
  const OETagDictionaryEntry* Find(const char* name, unsigned short length) const {
    if (length == 0) return nullptr;
    const Slot& slot = m_slots[Hash(name, length)];
    if (slot.length != length) return nullptr;
    for (unsigned short i = 0; i < length; ++i)
      if (slot.entry->name[i] != name[i]) return nullptr;
    return slot.entry;
  }
  void Remember(const OETagDictionaryEntry* entry, const char* name, unsigned short length) {
    if (entry && length) m_slots[Hash(name, length)] = {entry, length};
  }
  void Clear() {
    for (Slot& slot : m_slots) slot = {nullptr, 0};
  }

 private:
  struct Slot {
    const OETagDictionaryEntry* entry;
    unsigned short length;
  };
  static constexpr unsigned kSlots = 128;
  static unsigned Hash(const char* name, unsigned short length) {
    const unsigned char* u = reinterpret_cast<const unsigned char*>(name);
    return (length * 61u + u[0] * 7u + u[length - 1] * 3u + u[length / 2]) & (kSlots - 1);
  }
  Slot m_slots[kSlots] = {};
};

// Number of rows of the built-in table (ids 1 to this number, in order).
unsigned short NumberOfOEDictionaryEntry();

// The built-in table itself, NumberOfOEDictionaryEntry() rows in id order.
const OETagDictionaryEntry* OEDictionaryEntryTable();
