// The machinery behind every OFX aggregate class.
//
// An aggregate is described once, declaratively:
//
//   In its header, a field list and the class body:
//
//     #define OE_BANKACCOUNT_FIELDS(X)  X(TEXT, BankID, BANKID, OEString9)
//         X(TEXT, BranchID, BRANCHID, OEString22)
//         X(VALUE, AccountType, ACCTTYPE, OEBankAccountType)
//     (one macro, continued over lines)
//
//     class OEBankAccount : public OEBankOrCCAccount {
//       OE_AGGREGATE(OEBankAccount, OE_BANKACCOUNT_FIELDS)
//     };
//
//   In its source, the tags and rules:
//
//     OE_DEFINE_AGGREGATE(OEBankAccount, OEBankOrCCAccount, OE_BANKACCOUNT_FIELDS, BANKACCTFROM,
//         .Valid(OE_TAGS(BANKID, BRANCHID, ACCTID, ACCTTYPE, ACCTKEY))
//         .Required(OE_TAGS(BANKID, ACCTID, ACCTTYPE)))
//
// Field kinds (X(KIND, Name, TAG, Type)):
//   TEXT   an OEString subclass; Get<Name>() and Set<Name>(const OEString&).
//   VALUE  an enumeration, amount, date, time, integer or language (anything
//          with OEValueTraits); Get<Name>(), Set<Name>(value), Set<Name>(text).
//   FLAG   a Y/N flag held as unsigned short; Set<Name>(flag), Set<Name>(text).
//   CHILD  an owned child aggregate; Get<Name>() and Set<Name>(Type*).
//   ALSO   a further tag for the CHILD field <Name> declared before (an account
//          that stands as "BANKACCTFROM" or "CCACCTFROM"); declares nothing.
//   ALSOLIST  a further tag for the LIST field <Name> declared before: one
//          list of children of several kinds, kept in read order.
//   LIST   owned repeated children; GetNum<Name>(), Get<Name>(i),
//          Set<Name>(i, Type*), Append<Name>(Type*), Clear<Name>().
//   VALUES a repeated element of a VALUE type or an OEString type;
//          GetNum<Name>(), Get<Name>(i),
//          Append<Name>(value or text), Set<Name>(i, value or text), Clear<Name>().
//
// The description gives: .Valid(tags) in OFX order (the order of the
// presence bits), .Required(tags), .WriteOrder(tags) when children and
// elements are written in another order, .OneOf(a, b) for a pair of which at
// most one may be present and one is expected, .ExactlyOneOf(tags) for a
// choice of which exactly one must be present, .Alternatives(tags) for such a
// choice whose every alternative is reported missing, .Excludes(a, b) for two
// tags that may not stand together, .RequiresIf(a, b) for a tag that needs
// another. A class may inherit fields from
// a family base; its valid tags choose which of them it uses.
//
// Fields are kept only once set: an aggregate holds a small store of the
// fields it was given (see OEFieldStore), and a getter of a field never set
// answers the type's default value. A field, once made, stays where it is
// until the aggregate goes, so a reference a getter returned stays good.
//
// From that, OEAggregate supplies parsing (HandleTagElement, HandleTagStart),
// writing (Build), deep copies, child enumeration, the required checks and the
// destruction of owned children. Classes that depart from the pattern
// override those virtual operations by hand.
#pragma once

#include <atomic>
#include <cstdint>
#include <cstring>
#include <new>
#include <initializer_list>
#include <type_traits>
#include <vector>

#include "ofxkit/core/OEBuilder.h"
#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OEDataObjFactory.h"
#include "ofxkit/core/OEPreprocessor.h"
#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/types/OEDataConversion.h"
#include "ofxkit/types/OEDateTime.h"
#include "ofxkit/types/OEDynamicArray.h"
#include "ofxkit/types/OELanguage.h"
#include "ofxkit/types/OEPrecisionInteger.h"

class OEAggregate;

// ---------------------------------------------------------------------------
// Value types: how each converts from OFX text and is written.

// Runs a conversion with the log switched off and tells whether it reported a
// fault, so that a setter can log one warning that names its tag and object.
class OEQuietConversion {
 public:
  OEQuietConversion();
  ~OEQuietConversion();
  OEQuietConversion(const OEQuietConversion&) = delete;
  OEQuietConversion& operator=(const OEQuietConversion&) = delete;
  // 0 when nothing was reported, else the code of the last fault.
  OEParseWarning Fault() const;
  bool Faulted() const;

 private:
  unsigned short m_wasEnabled;
  uint32_t m_count;
};

template <class T, class Enable = void>
struct OEValueTraits;

// Enumerations of OEDataConversion. An enumeration whose reading differs
// (a service list's empty entry) specialises OEValueTraits and derives from
// OEEnumValueTraits for the rest.
template <class E>
struct OEEnumValueTraits {
  static bool FromText(const OEString& text, E& value) {
    int32_t found = OEDataConversion::FindText(text.c_str(), text.GetStrLength(), OEEnumTraits<E>::kFirstMatched,
                                               OEEnumTraits<E>::kCount - 1, OEEnumTraits<E>::Texts());
    if (found < 0) return false;
    value = static_cast<E>(found);
    return true;
  }
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const E& value) {
    return b->AddTagOEText(tag, OEDataConversion::Text(value));
  }
  static unsigned short ToText(const E& value, OEString& out) {
    const char* text = OEDataConversion::Text(value);
    out = text;
    return text != nullptr;
  }
};
template <class E>
struct OEValueTraits<E, std::enable_if_t<std::is_enum<E>::value>> : OEEnumValueTraits<E> {};

// The OFX text of a typed value, for display and export (not for writing
// OFX, which the builder does): 1 when the value has one.
unsigned short OEValueText(const OEPrecisionInteger& value, OEString& out);
unsigned short OEValueText(const OEDateTime& value, OEString& out);
unsigned short OEValueText(const OETime& value, OEString& out);
unsigned short OEValueText(const OELanguage& value, OEString& out);
unsigned short OEValueText(int64_t value, OEString& out);

#define OE_VALUE_TRAITS(TYPE, FROM_TEXT, WRITE)                                                     \
  template <>                                                                                       \
  struct OEValueTraits<TYPE> {                                                                      \
    static bool FromText(const OEString& text, TYPE& value) { return FROM_TEXT; }                   \
    static OEBuildStatus Write(OEBuilder* b, OETagID tag, const TYPE& value) { return WRITE; }      \
    static unsigned short ToText(const TYPE& value, OEString& out) { return OEValueText(value, out); } \
  };
OE_VALUE_TRAITS(OEPrecisionInteger, value.ConvertStringToOEPrecisionInteger(text.c_str()) != 0,
                b->AddTagOEAmount(tag, value))
OE_VALUE_TRAITS(OEPosPrecisionInteger, value.ConvertStringToOEPrecisionInteger(text.c_str()) != 0,
                b->AddTagOEUnitPrice(tag, value))
OE_VALUE_TRAITS(OEPercent, value.ConvertStringToOEPrecisionInteger(text.c_str()) != 0, b->AddTagOERate(tag, value))
OE_VALUE_TRAITS(OEDateTime, value.ConvertStringToOEDateTime(text.c_str()) != 0, b->AddTagOEDateTime(tag, value))
OE_VALUE_TRAITS(OETime, value.ConvertStringToOETime(text.c_str()) != 0, b->AddTagOETime(tag, value))
OE_VALUE_TRAITS(unsigned short, OEDataConversion::StringToUShort(text, value) != 0, b->AddTagOEUShort(tag, value))
OE_VALUE_TRAITS(short, OEDataConversion::StringToSShort(text, value) != 0, b->AddTagOESShort(tag, value))
OE_VALUE_TRAITS(int32_t, OEDataConversion::StringToSLong(text, value) != 0, b->AddTagOESLong(tag, value))
OE_VALUE_TRAITS(uint32_t, OEDataConversion::StringToULong(text, value) != 0, b->AddTagOEULong(tag, value))
OE_VALUE_TRAITS(OELanguage, OEDataConversion::StringToLanguage(text, value) != 0, b->AddTagOELanguage(tag, value))
#undef OE_VALUE_TRAITS

// Repeated text elements (a VALUES field of an OEString type): the text is
// stored whole (an over-long one is left to the builder's strict check) and
// written as a string element; an empty text is not a value.
template <class S>
struct OEValueTraits<S, std::enable_if_t<std::is_base_of<OEString, S>::value>> {
  static bool FromText(const OEString& text, S& value) {
    value = text;
    return !value.IsNull();
  }
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const S& value) { return b->AddTagOEString(tag, value); }
  static unsigned short ToText(const S& value, OEString& out) {
    out = value;
    return 1;
  }
};

// The Y/N flags.
struct OEFlagTraits {
  static bool FromText(const OEString& text, unsigned short& value) {
    return OEDataConversion::StringToBoolean(text, value) != 0;
  }
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const unsigned short& value) {
    return b->AddTagOEBoolean(tag, value);
  }
  static unsigned short ToText(const unsigned short& value, OEString& out) {
    out = value ? "Y" : "N";
    return 1;
  }
};

// ---------------------------------------------------------------------------
// Children: how the object for a child tag is made.

// Makes the child of class T for the tag through the factory. Specialised for
// family bases (accounts) whose concrete class depends on the tag.
template <class T>
struct OEChildCreator;

#define OE_CREATOR(creator, cls)                                                           \
  template <>                                                                              \
  struct OEChildCreator<cls> {                                                             \
    static cls* Make(OEDataObjFactory* f, OETagID) { return f->creator(); }                \
  };
#define OE_CREATOR_PLAIN(creator, type)
// A family base made by the tag it stands under specialises OEChildCreator
// itself (see OEAccount.h, OEMessageSetVersion.h).
#define OE_CREATOR_FAMILY(creator, type)
#include "ofxkit/core/OEFactoryCreators.def"
#undef OE_CREATOR_FAMILY
#undef OE_CREATOR_PLAIN
#undef OE_CREATOR

// ---------------------------------------------------------------------------
// The description of one field under one tag.

enum OEFieldKind : uint8_t { OE_FIELD_ELEMENT, OE_FIELD_CHILD, OE_FIELD_LIST, OE_FIELD_VALUES };

struct OEFieldDesc {
  OETagID tag;
  OEFieldKind kind;
  bool alias;  // another tag for a member described by an earlier entry
  // Elements: set from text (logging faults) and write when present.
  unsigned short (*setText)(OEAggregate* self, OETagID tag, const OEString& text);
  OEBuildStatus (*write)(OEBuilder* b, const OEAggregate* self, OETagID tag);
  void (*copy)(OEAggregate* dst, const OEAggregate* src);
  // The text of value i (0 for a single element), for display.
  unsigned short (*text)(const OEAggregate* self, unsigned short i, OEString& out);
  // Children.
  OEDataObj* (*create)(OEDataObjFactory* f, OETagID tag);
  unsigned short (*count)(const OEAggregate* self);
  OEDataObj* (*get)(const OEAggregate* self, unsigned short i);
  // CHILD: replaces (deleting what was held); LIST: appends. 0 on failure.
  unsigned short (*put)(OEAggregate* self, OEDataObj* child);
  // Deletes every child held.
  void (*reset)(OEAggregate* self);
  // Identifies the member, so that aliases share it.
  const void* member;
  // Children that keep a link to the aggregate they stand for (see
  // OEOwnedAggregate): links a child just made by `maker`; null for others.
  void (*link)(OEDataObj* child, OEAggregate* maker, OETagID makerType);
  // The key the member is stored under (OEFieldKey of its name), and what
  // ends its stored value (deleting an owned child).
  uint16_t key = 0;
  void (*destroy)(void* value) = nullptr;
};

// The key of a member's name: FNV-1a folded to 16 bits, made at compile
// time. Two members of one class chain under one key are a fault of the
// class's description, reported (and the program stopped) the first time
// the class is used; the test of every class finds it.
constexpr uint16_t OEFieldKey(const char* name) {
  uint32_t hash = 2166136261u;
  for (; *name; ++name) hash = (hash ^ static_cast<unsigned char>(*name)) * 16777619u;
  return static_cast<uint16_t>(hash ^ (hash >> 16));
}
#define OE_FIELD_KEY(Name) (std::integral_constant<uint16_t, OEFieldKey(#Name)>::value)

// How large the first block of a class's field stores is made, learnt from
// the objects of the class a parser reads. Objects of one list are mostly
// alike, so most keep their fields in one block that fits them. The size
// follows a change only when two objects in a row show it: an object with a
// rare further field takes a small block more, and neither it nor one with a
// field missing changes the size for the objects after it.
struct OEStoreHint {
  OEStoreHint() = default;
  OEStoreHint(const OEStoreHint& other) : bytes(other.bytes.load(std::memory_order_relaxed)) {}
  OEStoreHint& operator=(const OEStoreHint& other) {
    bytes.store(other.bytes.load(std::memory_order_relaxed), std::memory_order_relaxed);
    return *this;
  }
  // Takes the bytes one block would have needed for an object just read.
  void Learn(uint16_t needed) const {
    const uint16_t now = bytes.load(std::memory_order_relaxed);
    const uint16_t before = pending.load(std::memory_order_relaxed);
    uint16_t next = now, wait = 0;
    if (now == 0)
      next = needed;
    else if (needed != now && before != 0 && (before > now) == (needed > now))
      next = before > needed ? before : needed;
    else if (needed != now)
      wait = needed;
    bytes.store(next, std::memory_order_relaxed);
    pending.store(wait, std::memory_order_relaxed);
  }
  mutable std::atomic<uint16_t> bytes{0};
  // What the last object needed, when that differed from bytes; 0 otherwise.
  mutable std::atomic<uint16_t> pending{0};
};

// The fields an aggregate was given. Each value lives in a block of the
// store, under its key, from when it is made until the store is released;
// blocks are chained, never moved. A block is its header, the address of the
// block before it (blocks after the first only), then its entries (key and
// offset) growing up, then the values growing down from its end.
class OEFieldStore {
 public:
  OEFieldStore() = default;
  OEFieldStore(const OEFieldStore&) = delete;
  OEFieldStore& operator=(const OEFieldStore&) = delete;
  ~OEFieldStore() { Release(); }

  // The value stored under key, or null.
  void* Find(uint16_t key) const {
    for (const Block* b = m_first; b; b = b->Next()) {
      const Entry* e = b->Entries();
      for (uint16_t i = 0; i < b->count; ++i)
        if (e[i].key == key) return const_cast<char*>(reinterpret_cast<const char*>(b)) + e[i].offset;
    }
    return nullptr;
  }
  // Room for a new value of size bytes (at most 8-aligned) under key, in the
  // newest block when it fits; null when none is left. The caller constructs
  // the value there.
  void* TryAdd(uint16_t key, uint32_t size) {
    Block* b = m_first;
    if (!b) return nullptr;
    size = (size + 7u) & ~7u;
    uint32_t entriesEnd = static_cast<uint32_t>(b->entriesStart + (b->count + 1u) * sizeof(Entry));
    if (b->valuesStart < entriesEnd + size) return nullptr;
    b->valuesStart = static_cast<uint16_t>(b->valuesStart - size);
    b->Entries()[b->count++] = Entry{key, b->valuesStart};
    return reinterpret_cast<char*>(b) + b->valuesStart;
  }
  // As TryAdd, with a new block when the newest one is full; the hint tells
  // the size of a first block.
  void* Add(uint16_t key, uint32_t size, const OEStoreHint& hint);
  bool Empty() const { return m_first == nullptr; }
  // Bytes one block holding every value would need (header, entries and
  // values), however many blocks hold them now.
  uint32_t NeededBytes() const;
  // Calls f(key, value) for every value, block by block, the newest first.
  template <class F>
  void ForEach(F&& f) {
    for (Block* b = m_first; b; b = b->Next()) {
      Entry* e = b->Entries();
      for (uint16_t i = 0; i < b->count; ++i) f(e[i].key, reinterpret_cast<char*>(b) + e[i].offset);
    }
  }
  // Gives the blocks back. The values must have been ended before.
  void Release();

 private:
  struct Entry {
    uint16_t key;
    uint16_t offset;
  };
  // Eight bytes: most aggregates have one block, which needs no link.
  struct Block {
    uint16_t bytes;
    uint16_t count;
    uint16_t valuesStart;
    uint16_t entriesStart;  // past the header, and past the link when there is one
    Entry* Entries() { return reinterpret_cast<Entry*>(reinterpret_cast<char*>(this) + entriesStart); }
    const Entry* Entries() const {
      return reinterpret_cast<const Entry*>(reinterpret_cast<const char*>(this) + entriesStart);
    }
    Block* Next() const {
      if (entriesStart == sizeof(Block)) return nullptr;
      Block* next;
      memcpy(&next, reinterpret_cast<const char*>(this) + sizeof(Block), sizeof next);
      return next;
    }
  };
  Block* m_first = nullptr;  // the newest block; each links to the one before
};

// Everything the generic code knows of one class.
class OEAggregateInfo {
 public:
  OEAggregateInfo(const OEAggregateInfo* parent, std::initializer_list<OEFieldDesc> fields, OETagID defaultType);

  OEAggregateInfo& Valid(std::initializer_list<OETagID> tags);
  OEAggregateInfo& Required(std::initializer_list<OETagID> tags);
  OEAggregateInfo& WriteOrder(std::initializer_list<OETagID> tags);
  OEAggregateInfo& OneOf(OETagID first, OETagID second);
  // Exactly one of the tags must be present (a choice the aggregate cannot
  // do without); the first is reported missing when none is.
  OEAggregateInfo& ExactlyOneOf(std::initializer_list<OETagID> tags);
  // Exactly one of the tags must be present; when none is, each of them is
  // reported missing in turn, so that a caller walking the missing tags
  // hears of every alternative (a payment to a payee by id or by address).
  OEAggregateInfo& Alternatives(std::initializer_list<OETagID> tags);
  // The two tags may not both be present; neither is ever reported missing.
  OEAggregateInfo& Excludes(OETagID first, OETagID second);
  // When `present` is present, `needed` must be too (and is reported missing).
  OEAggregateInfo& RequiresIf(OETagID present, OETagID needed);

  // Fills in the per-position lookup; called once when the info is complete.
  const OEAggregateInfo& Finish();

  const OEAggregateInfo* parent;
  std::vector<OEFieldDesc> fields;  // declared by this class itself
  OETagID defaultType;
  std::vector<OETagID> valid;
  std::vector<OETagID> required;
  std::vector<OETagID> order;  // empty: the valid order
  struct Pair {
    OETagID first, second;
  };
  std::vector<Pair> oneOf;
  std::vector<std::vector<OETagID>> exactlyOne;
  std::vector<std::vector<OETagID>> alternatives;
  std::vector<Pair> excludes;
  std::vector<Pair> requiresIf;  // first present needs second
  // Per valid position: the field that takes the tag (null for none), and
  // whether that position writes the member (its first tag in write order).
  std::vector<const OEFieldDesc*> byPosition;
  std::vector<const OEFieldDesc*> writeList;  // in write order, one per member to write
  std::vector<OETagID> writeTags;
  std::vector<const OEFieldDesc*> children;  // child members in valid order, once each
  std::vector<const OEFieldDesc*> members;   // every member of the class chain, once each
  // Position + 1 of each tag from firstTag on (0: not valid here), so that
  // finding a tag's presence bit does not search the valid array; empty when
  // the valid tags lie too far apart for a table.
  OETagID firstTag = OE_TAG_NONE;
  std::vector<uint8_t> positionOf;
  // The size the field stores of this class's objects start with.
  OEStoreHint storeHint;

  // The member (of the class chain) stored under key, or null.
  const OEFieldDesc* MemberByKey(uint16_t key) const {
    for (const OEFieldDesc* d : members)
      if (d->key == key) return d;
    return nullptr;
  }

 private:
  const OEFieldDesc* FindField(OETagID tag) const;
};

// ---------------------------------------------------------------------------

class OEAggregate : public OEDataObj {
 public:
  OEAggregate() = default;
  OEAggregate(const OEAggregate&) = delete;
  OEAggregate& operator=(const OEAggregate&) = delete;
  ~OEAggregate() override = default;

  static const OEAggregateInfo& ClassInfo();
  virtual const OEAggregateInfo& GetInfo() const { return ClassInfo(); }

  OEParseStatus HandleTagStart(const OETagDictionaryEntry* const entry) override;
  using OEDataObj::HandleTagElement;
  OEParseStatus HandleTagElement(const OETagDictionaryEntry* const entry, const OEString& value) override;
  // At its own end tag, an aggregate tells its class how large a field
  // store it needed (OEStoreHint).
  OEParseStatus HandleTagEnd(const OETagDictionaryEntry* const entry) override;
  unsigned short GetArrayOfValidTags(OEArrayOfTags& tags) const override;
  int32_t ValidTagPosition(OETagID tag) const override;
  unsigned short GetArrayOfRequiredTags(OEArrayOfTags& tags) const override;
  OEBuildStatus Build(OEBuilder* builder) const override;
  unsigned short AllRequiredPresent() override;
  OETagID GetFirstMissingRequiredTag(OETagID after) const override;
  OEDataObj* GetChild(unsigned short index) const override;
  unsigned short GetNumberOfChildren() const override;

  // Copies every field of source, which must be of this object's class;
  // children are copied deeply through the factory. 1 on success.
  virtual unsigned short CopyAggregateFrom(const OEAggregate* source);

  // Sets the value of an element from OFX text, as a parser would.
  unsigned short SetElementText(OETagID tag, const OEString& text);

  // Logs a value that did not fit or convert, naming this object and the tag.
  void LogFieldFault(OEParseWarning warning, OETagID tag, const OEString& text);
  // Clears a presence bit without the warning ClearTag gives for unknown tags.
  void ClearTagQuietly(OETagID tag);
  // How many of the tags are present.
  unsigned short PresentAmong(const std::vector<OETagID>& tags) const;
  // The field that takes the tag in this class, or null.
  const OEFieldDesc* FieldAt(OETagID tag) const;

  // The stored value of the member with key, or null when it was never set.
  void* FindFieldValue(uint16_t key) const { return m_fields.Find(key); }
  // Room for a new value of the member with key (see OEFieldStore), or null
  // when memory is exhausted.
  void* MakeFieldValue(uint16_t key, uint32_t size) {
    if (void* place = m_fields.TryAdd(key, size)) return place;
    return m_fields.Add(key, size, GetInfo().storeHint);
  }

 protected:
  // Ends every stored value (deleting owned children) through the members
  // of info, which must describe this object's class; the store is empty
  // afterwards. The destructor of the most derived class calls it.
  void DestroyFields(const OEAggregateInfo& info);

 private:
  OEFieldStore m_fields;
};

// An inner aggregate that knows the outer aggregate it belongs to: the
// INVTRAN inside a BUYSTOCK's INVBUY knows the BUYSTOCK and its tag. The link
// is not an OFX field; it is neither owned, written nor compared.
//
// Whenever an aggregate makes such a child (while parsing, through a
// creating getter, or in a deep copy), the child is linked: to the maker's
// own owner when the maker is itself a linked inner aggregate, else to the
// maker and the maker's type. A deep copy therefore links the copied
// children to the copy, never to the source tree; copying an inner aggregate
// on its own leaves its link as it was.
class OEOwnedAggregate : public OEAggregate {
 public:
  OEDataObj* GetChildObj() const { return m_owner; }
  void SetChildObj(OEDataObj* owner) { m_owner = owner; }
  OETagID GetChildType() const { return m_ownerTag; }
  void SetChildType(OETagID tag) { m_ownerTag = tag; }

  // Links this aggregate to the one that made it, as described above.
  void LinkToMaker(OEAggregate* maker, OETagID makerType);

 private:
  OEDataObj* m_owner = nullptr;
  OETagID m_ownerTag = OE_TAG_NONE;
};

template <class T>
void OELinkChild(OEDataObj* child, OEAggregate* maker, OETagID makerType) {
  static_cast<T*>(child)->LinkToMaker(maker, makerType);
}
// The link function of a child class: null unless it is an owned aggregate.
template <class T>
constexpr void (*OELinkerOf())(OEDataObj*, OEAggregate*, OETagID) {
  if constexpr (std::is_base_of<OEOwnedAggregate, T>::value)
    return &OELinkChild<T>;
  else
    return nullptr;
}

// ---------------------------------------------------------------------------
// Setter bodies shared by the generated accessors.

// A text element: kept whole; an empty text answers 3 and changes no bit; an
// over-long text is logged (OEPW_TOOLONG) and still marked present.
unsigned short OESetTextField(OEAggregate* self, OEString& field, OETagID tag, const OEString& text);

template <class T>
unsigned short OESetValueField(OEAggregate* self, T& field, OETagID tag, const T& value) {
  field = value;
  return self->SetTag(tag);
}

// Traits whose conversion reports a code of its own that the setter passes
// on (a status code out of its range is OEPW_TOOLONG) declare
// `static constexpr bool kOwnFaultCode = true`.
template <class Traits, class = void>
struct OEKeepsOwnFaultCode : std::false_type {};
template <class Traits>
struct OEKeepsOwnFaultCode<Traits, std::void_t<decltype(Traits::kOwnFaultCode)>>
    : std::integral_constant<bool, Traits::kOwnFaultCode> {};

// Converts text quietly into value; answers the warning the setter logs:
// 0 when the conversion succeeded, else OEPW_BADFORMAT, whatever code the
// conversion itself reported (OEPW_OUTOFRANGE for a number that does not
// fit, OEPW_TOOLONG for a language code), unless the traits keep their own.
template <class Traits, class T>
OEParseWarning OEConvertText(const OEString& text, T& value) {
  OEQuietConversion quiet;
  bool ok = Traits::FromText(text, value);
  if (ok && !quiet.Faulted()) return OEPW_UNKNOWNEXCEPTION;
  if (OEKeepsOwnFaultCode<Traits>::value && quiet.Faulted()) return quiet.Fault();
  return OEPW_BADFORMAT;
}

// A typed element from text: converted quietly; a fault logs one warning
// (OEPW_BADFORMAT, the text, the tag, the object) and leaves the field and
// its presence bit as they were.
template <class Traits, class T>
unsigned short OESetFromText(OEAggregate* self, T& field, OETagID tag, const OEString& text) {
  T converted = field;
  OEParseWarning fault = OEConvertText<Traits>(text, converted);
  if (fault != OEPW_UNKNOWNEXCEPTION) {
    self->LogFieldFault(fault, tag, text);
    return 0;
  }
  field = converted;
  return self->SetTag(tag);
}

// A single child: refused (0) while one is held; otherwise owned from now on,
// and the tag that is the child's own type is marked present.
template <class T>
unsigned short OESetChildField(OEAggregate* self, T*& field, T* child) {
  if (field || !child) return 0;
  field = child;
  return self->SetTag(child->GetType());
}

// The single child, made through the factory (with the tag as its type, and
// linked as a parse would link it) when there is none and `create` is set.
template <class T>
T* OEGetOrMakeChild(OEAggregate* self, T*& field, unsigned short create, OETagID tag) {
  if (field || !create) return field;
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  if (!factory) return nullptr;
  T* child = OEChildCreator<T>::Make(factory, tag);
  if (!child) {
    g_allocFailed = 1;
    return nullptr;
  }
  child->SetType(tag);
  if (auto link = OELinkerOf<T>()) link(child, self, self->GetType());
  field = child;
  self->SetTag(tag);
  return child;
}

// A repeated child at i (i = count appends); its type's tag is marked present.
template <class T>
unsigned short OESetListElement(OEAggregate* self, OEDynamicArrayTyped<T>& list, unsigned short i, T* child) {
  if (!child || i > list.Entries()) return 0;
  if (!list.Set(i, child)) return 0;
  self->SetTag(child->GetType());
  return 1;
}

template <class T>
unsigned short OESetValuesElement(OEAggregate* self, OEDynamicArrayTyped<T>& list, unsigned short i, OETagID tag,
                                  const T& value) {
  if (i > list.Entries() || !list.SetVal(i, value)) return 0;
  return self->SetTag(tag);
}

template <class Traits, class T>
unsigned short OESetValuesText(OEAggregate* self, OEDynamicArrayTyped<T>& list, unsigned short i, OETagID tag,
                               const OEString& text) {
  T value{};
  OEParseWarning fault = OEConvertText<Traits>(text, value);
  if (fault != OEPW_UNKNOWNEXCEPTION) {
    self->LogFieldFault(fault, tag, text);
    return 0;
  }
  return OESetValuesElement(self, list, i, tag, value);
}

template <class T>
void OEClearList(OEAggregate* self, OEDynamicArrayTyped<T>& list, OETagID tag) {
  list.DeleteAll();
  self->ClearTagQuietly(tag);
}

// ---------------------------------------------------------------------------
// Stored fields.

// The value of a member never set.
template <class T>
const T& OEFieldDefault() {
  static const T value{};
  return value;
}

template <class T>
const T* OEFindField(const OEAggregate* self, uint16_t key) {
  return static_cast<const T*>(self->FindFieldValue(key));
}

// The member's value, or its type's default when it was never set.
template <class T>
const T& OEGetField(const OEAggregate* self, uint16_t key) {
  const T* value = OEFindField<T>(self, key);
  return value ? *value : OEFieldDefault<T>();
}

// The member's value to change, made (as the type's default) when it was
// never set. When memory is exhausted, g_allocFailed is set and a spare
// value, kept nowhere, is answered.
template <class T>
T& OEFieldRef(OEAggregate* self, uint16_t key) {
  static_assert(alignof(T) <= 8, "a stored field is at most 8-aligned");
  if (void* value = self->FindFieldValue(key)) return *static_cast<T*>(value);
  void* place = self->MakeFieldValue(key, static_cast<uint32_t>(sizeof(T)));
  if (!place) {
    g_allocFailed = 1;
    static T s_spare{};
    return s_spare;
  }
  return *new (place) T{};
}

// Copies the member from src to dst: the default when src never set it.
template <class T>
void OECopyField(OEAggregate* dst, const OEAggregate* src, uint16_t key) {
  if (const T* from = OEFindField<T>(src, key))
    OEFieldRef<T>(dst, key) = *from;
  else if (void* to = dst->FindFieldValue(key))
    *static_cast<T*>(to) = OEFieldDefault<T>();
}

template <class T>
void OEDestroyValue(void* value) {
  static_cast<T*>(value)->~T();
}
// A single child's place: the child goes with it.
template <class T>
void OEDestroyChild(void* value) {
  delete *static_cast<T**>(value);
}

// ---------------------------------------------------------------------------
// Generic field operations, instantiated per member.

template <class T, uint16_t Key, class Traits>
struct OEElementOps {
  static unsigned short SetText(OEAggregate* self, OETagID tag, const OEString& text);
  static OEBuildStatus Write(OEBuilder* b, const OEAggregate* self, OETagID tag) {
    return Traits::Write(b, tag, OEGetField<T>(self, Key));
  }
  static void Copy(OEAggregate* dst, const OEAggregate* src) { OECopyField<T>(dst, src, Key); }
  static unsigned short Text(const OEAggregate* self, unsigned short, OEString& out) {
    return Traits::ToText(OEGetField<T>(self, Key), out);
  }
};

struct OETextTraits {
  static OEBuildStatus Write(OEBuilder* b, OETagID tag, const OEString& value) { return b->AddTagOEString(tag, value); }
  static unsigned short ToText(const OEString& value, OEString& out) {
    out = value;
    return 1;
  }
};

template <class T, uint16_t Key, class Traits>
unsigned short OEElementOps<T, Key, Traits>::SetText(OEAggregate* self, OETagID tag, const OEString& text) {
  T& field = OEFieldRef<T>(self, Key);
  if constexpr (std::is_same<Traits, OETextTraits>::value)
    return OESetTextField(self, field, tag, text);
  else
    return OESetFromText<Traits>(self, field, tag, text);
}

template <class T, uint16_t Key>
struct OEChildOps {
  static T*& Ref(OEAggregate* self) { return OEFieldRef<T*>(self, Key); }
  static T* Ref(const OEAggregate* self) { return OEGetField<T*>(self, Key); }
  static OEDataObj* Create(OEDataObjFactory* f, OETagID tag) { return OEChildCreator<T>::Make(f, tag); }
  static unsigned short Count(const OEAggregate* self) { return Ref(self) ? 1 : 0; }
  static OEDataObj* Get(const OEAggregate* self, unsigned short i) { return i == 0 ? Ref(self) : nullptr; }
  static unsigned short Put(OEAggregate* self, OEDataObj* child) {
    T*& field = Ref(self);
    if (field != child) delete field;
    field = static_cast<T*>(child);
    return 1;
  }
  static void Reset(OEAggregate* self) {
    if (void* place = self->FindFieldValue(Key)) {
      T*& field = *static_cast<T**>(place);
      delete field;
      field = nullptr;
    }
  }
};

template <class T, uint16_t Key>
struct OEListOps {
  using List = OEDynamicArrayTyped<T>;
  static List& Ref(OEAggregate* self) { return OEFieldRef<List>(self, Key); }
  static const List& Ref(const OEAggregate* self) { return OEGetField<List>(self, Key); }
  static OEDataObj* Create(OEDataObjFactory* f, OETagID tag) { return OEChildCreator<T>::Make(f, tag); }
  static unsigned short Count(const OEAggregate* self) { return Ref(self).Entries(); }
  static OEDataObj* Get(const OEAggregate* self, unsigned short i) { return Ref(self).Get(i); }
  static unsigned short Put(OEAggregate* self, OEDataObj* child) { return Ref(self).Append(static_cast<T*>(child)); }
  static void Reset(OEAggregate* self) {
    if (void* place = self->FindFieldValue(Key)) static_cast<List*>(place)->DeleteAll();
  }
};

template <class T, uint16_t Key, class Traits>
struct OEValuesOps {
  using List = OEDynamicArrayTyped<T>;
  static unsigned short SetText(OEAggregate* self, OETagID tag, const OEString& text) {
    List& list = OEFieldRef<List>(self, Key);
    return OESetValuesText<Traits>(self, list, list.Entries(), tag, text);
  }
  static OEBuildStatus Write(OEBuilder* b, const OEAggregate* self, OETagID tag) {
    const List& list = OEGetField<List>(self, Key);
    for (unsigned short i = 0; i < list.Entries(); ++i) {
      const T* value = list.Get(i);
      if (!value) continue;
      OEBuildStatus s = Traits::Write(b, tag, *value);
      if (s != OE_BUILD_OK) return s;
    }
    return OE_BUILD_OK;
  }
  static void Copy(OEAggregate* dst, const OEAggregate* src) {
    const List* from = OEFindField<List>(src, Key);
    void* place = dst->FindFieldValue(Key);
    if (!from && !place) return;
    List& to = OEFieldRef<List>(dst, Key);
    to.DeleteAll();
    if (!from) return;
    for (unsigned short i = 0; i < from->Entries(); ++i)
      if (const T* v = from->Get(i)) to.SetVal(i, *v);
  }
  static unsigned short Count(const OEAggregate* self) { return OEGetField<List>(self, Key).Entries(); }
  static unsigned short Text(const OEAggregate* self, unsigned short i, OEString& out) {
    const T* value = OEGetField<List>(self, Key).Get(i);
    return value ? Traits::ToText(*value, out) : 0;
  }
};

// ---------------------------------------------------------------------------
// Declaration macros (class body).

#define OE_FIELD_DECLARE(KIND, Name, TAG, Type) OE_DECLARE_##KIND(Name, TAG, Type)

#define OE_DECLARE_TEXT(Name, TAG, Type)                                                      \
 public:                                                                                      \
  const Type& Get##Name() const { return OEGetField<Type>(this, OE_FIELD_KEY(Name)); }        \
  unsigned short Set##Name(const OEString& text) { return OESetTextField(this, Field##Name(), OE_TAG_##TAG, text); } \
                                                                                              \
 protected:                                                                                   \
  Type& Field##Name() { return OEFieldRef<Type>(this, OE_FIELD_KEY(Name)); }

#define OE_DECLARE_VALUE(Name, TAG, Type)                                                     \
 public:                                                                                      \
  const Type& Get##Name() const { return OEGetField<Type>(this, OE_FIELD_KEY(Name)); }        \
  unsigned short Set##Name(const Type& value) { return OESetValueField(this, Field##Name(), OE_TAG_##TAG, value); } \
  unsigned short Set##Name(const OEString& text) {                                            \
    return OESetFromText<OEValueTraits<Type>>(this, Field##Name(), OE_TAG_##TAG, text);       \
  }                                                                                           \
                                                                                              \
 protected:                                                                                   \
  Type& Field##Name() { return OEFieldRef<Type>(this, OE_FIELD_KEY(Name)); }

#define OE_DECLARE_FLAG(Name, TAG, Type)                                                      \
 public:                                                                                      \
  unsigned short Get##Name() const { return OEGetField<unsigned short>(this, OE_FIELD_KEY(Name)); } \
  unsigned short Set##Name(unsigned short flag) {                                             \
    return OESetValueField(this, Field##Name(), OE_TAG_##TAG, static_cast<unsigned short>(flag ? 1 : 0)); \
  }                                                                                           \
  unsigned short Set##Name(const OEString& text) { return OESetFromText<OEFlagTraits>(this, Field##Name(), OE_TAG_##TAG, text); } \
                                                                                              \
 protected:                                                                                   \
  unsigned short& Field##Name() { return OEFieldRef<unsigned short>(this, OE_FIELD_KEY(Name)); }

#define OE_DECLARE_CHILD(Name, TAG, Type)                                \
 public:                                                                 \
  Type* Get##Name() const { return OEGetField<Type*>(this, OE_FIELD_KEY(Name)); } \
  Type* Get##Name(unsigned short create) {                               \
    if (!create) return Get##Name();                                     \
    return OEGetOrMakeChild(this, Field##Name(), create, OE_TAG_##TAG);  \
  }                                                                      \
  unsigned short Set##Name(Type* child) { return OESetChildField(this, Field##Name(), child); } \
                                                                         \
 protected:                                                              \
  Type*& Field##Name() { return OEFieldRef<Type*>(this, OE_FIELD_KEY(Name)); }

#define OE_DECLARE_ALSO(Name, TAG, Type)

#define OE_DECLARE_LIST(Name, TAG, Type)                                                          \
 public:                                                                                          \
  unsigned short GetNum##Name() const { return OEGetField<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)).Entries(); } \
  Type* Get##Name(unsigned short i) const { return OEGetField<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)).Get(i); } \
  unsigned short Set##Name(unsigned short i, Type* child) { return OESetListElement(this, Field##Name(), i, child); } \
  unsigned short Append##Name(Type* child) { return Set##Name(GetNum##Name(), child); }           \
  void Clear##Name() { OEClearList(this, Field##Name(), OE_TAG_##TAG); }                          \
                                                                                                  \
 protected:                                                                                       \
  OEDynamicArrayTyped<Type>& Field##Name() { return OEFieldRef<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)); }

// ALSOLIST: a further tag for the LIST field Name declared before.
#define OE_DECLARE_ALSOLIST(Name, TAG, Type)

#define OE_DECLARE_VALUES(Name, TAG, Type)                                                        \
 public:                                                                                          \
  unsigned short GetNum##Name() const { return OEGetField<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)).Entries(); } \
  const Type* Get##Name(unsigned short i) const { return OEGetField<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)).Get(i); } \
  unsigned short Set##Name(unsigned short i, const Type& value) {                                 \
    return OESetValuesElement(this, Field##Name(), i, OE_TAG_##TAG, value);                       \
  }                                                                                               \
  unsigned short Set##Name(unsigned short i, const OEString& text) {                              \
    return OESetValuesText<OEValueTraits<Type>>(this, Field##Name(), i, OE_TAG_##TAG, text);      \
  }                                                                                               \
  unsigned short Append##Name(const Type& value) { return Set##Name(GetNum##Name(), value); }     \
  unsigned short Append##Name(const OEString& text) { return Set##Name(GetNum##Name(), text); }   \
  void Clear##Name() { OEClearList(this, Field##Name(), OE_TAG_##TAG); }                          \
                                                                                                  \
 protected:                                                                                       \
  OEDynamicArrayTyped<Type>& Field##Name() { return OEFieldRef<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)); }

// The class body of an aggregate: construction, destruction, its description
// and DeepCopyFrom, then the fields of FIELDS.
#define OE_AGGREGATE(Class, FIELDS)                                            \
 public:                                                                       \
  Class();                                                                     \
  ~Class() override;                                                           \
  static const OEAggregateInfo& ClassInfo();                                   \
  const OEAggregateInfo& GetInfo() const override { return ClassInfo(); }      \
  unsigned short DeepCopyFrom(const Class* source) { return CopyAggregateFrom(source); } \
  FIELDS(OE_FIELD_DECLARE)                                                     \
 public:

// A field list with no fields.
#define OE_NO_FIELDS(X)

// ---------------------------------------------------------------------------
// Definition macros (source file).

#define OE_TAG_PREFIX(name) OE_TAG_##name
// A list of tag names: OE_TAGS(BANKID, ACCTID) is {OE_TAG_BANKID, OE_TAG_ACCTID}.
#define OE_TAGS(...) {OE_PP_FOR_EACH(OE_TAG_PREFIX, __VA_ARGS__)}
#define OE_NO_TAGS {}

#define OE_FIELD_DESC(KIND, Name, TAG, Type) OE_DESC_##KIND(Name, TAG, Type)
#define OE_DESC_ELEMENT_(Name, TAG, Type, Traits)                                                        \
  OEFieldDesc{OE_TAG_##TAG, OE_FIELD_ELEMENT, false,                                                     \
              &OEElementOps<Type, OE_FIELD_KEY(Name), Traits>::SetText,                                 \
              &OEElementOps<Type, OE_FIELD_KEY(Name), Traits>::Write,                                   \
              &OEElementOps<Type, OE_FIELD_KEY(Name), Traits>::Copy,                                    \
              &OEElementOps<Type, OE_FIELD_KEY(Name), Traits>::Text,                                    \
              nullptr, nullptr, nullptr, nullptr, nullptr, #Name, nullptr,                               \
              OE_FIELD_KEY(Name), &OEDestroyValue<Type>},
#define OE_DESC_TEXT(Name, TAG, Type) OE_DESC_ELEMENT_(Name, TAG, Type, OETextTraits)
#define OE_DESC_VALUE(Name, TAG, Type) OE_DESC_ELEMENT_(Name, TAG, Type, OEValueTraits<Type>)
#define OE_DESC_FLAG(Name, TAG, Type) OE_DESC_ELEMENT_(Name, TAG, unsigned short, OEFlagTraits)
#define OE_DESC_CHILD_(Name, TAG, Type, alias)                                                           \
  OEFieldDesc{OE_TAG_##TAG, OE_FIELD_CHILD, alias, nullptr, nullptr, nullptr, nullptr,                  \
              &OEChildOps<Type, OE_FIELD_KEY(Name)>::Create,                                            \
              &OEChildOps<Type, OE_FIELD_KEY(Name)>::Count,                                             \
              &OEChildOps<Type, OE_FIELD_KEY(Name)>::Get,                                               \
              &OEChildOps<Type, OE_FIELD_KEY(Name)>::Put,                                               \
              &OEChildOps<Type, OE_FIELD_KEY(Name)>::Reset, #Name, OELinkerOf<Type>(),                  \
              OE_FIELD_KEY(Name), &OEDestroyChild<Type>},
#define OE_DESC_CHILD(Name, TAG, Type) OE_DESC_CHILD_(Name, TAG, Type, false)
#define OE_DESC_ALSO(Name, TAG, Type) OE_DESC_CHILD_(Name, TAG, Type, true)
// A list field; PUT is how a child read is stored (OEListOps<...>::Put).
#define OE_DESC_LIST_(Name, TAG, Type, alias, PUT)                                                       \
  OEFieldDesc{OE_TAG_##TAG, OE_FIELD_LIST, alias, nullptr, nullptr, nullptr, nullptr,                   \
              &OEListOps<Type, OE_FIELD_KEY(Name)>::Create,                                             \
              &OEListOps<Type, OE_FIELD_KEY(Name)>::Count,                                              \
              &OEListOps<Type, OE_FIELD_KEY(Name)>::Get, PUT,                                           \
              &OEListOps<Type, OE_FIELD_KEY(Name)>::Reset, #Name, OELinkerOf<Type>(),                   \
              OE_FIELD_KEY(Name), &OEDestroyValue<OEDynamicArrayTyped<Type>>},
#define OE_DESC_LIST(Name, TAG, Type) \
  OE_DESC_LIST_(Name, TAG, Type, false, (&OEListOps<Type, OE_FIELD_KEY(Name)>::Put))
#define OE_DESC_ALSOLIST(Name, TAG, Type) \
  OE_DESC_LIST_(Name, TAG, Type, true, (&OEListOps<Type, OE_FIELD_KEY(Name)>::Put))
#define OE_DESC_VALUES(Name, TAG, Type)                                                                  \
  OEFieldDesc{OE_TAG_##TAG, OE_FIELD_VALUES, false,                                                     \
              &OEValuesOps<Type, OE_FIELD_KEY(Name), OEValueTraits<Type>>::SetText,                     \
              &OEValuesOps<Type, OE_FIELD_KEY(Name), OEValueTraits<Type>>::Write,                       \
              &OEValuesOps<Type, OE_FIELD_KEY(Name), OEValueTraits<Type>>::Copy,                        \
              &OEValuesOps<Type, OE_FIELD_KEY(Name), OEValueTraits<Type>>::Text, nullptr,               \
              &OEValuesOps<Type, OE_FIELD_KEY(Name), OEValueTraits<Type>>::Count,                       \
              nullptr, nullptr, nullptr, #Name, nullptr,                                                \
              OE_FIELD_KEY(Name), &OEDestroyValue<OEDynamicArrayTyped<Type>>},

// Defines construction (setting the default type), destruction and the class
// description. DESCRIPTION continues the description: .Valid(...) and so on.
#define OE_DEFINE_AGGREGATE(Class, Base, FIELDS, DEFAULT_TYPE, DESCRIPTION)                  \
  Class::Class() { SetType(OE_TAG_##DEFAULT_TYPE); }                                         \
  Class::~Class() { DestroyFields(ClassInfo()); }                                         \
  const OEAggregateInfo& Class::ClassInfo() {                                                \
    /* One guarded static: this runs for every tag an object is given. */                    \
    static const OEAggregateInfo& finished = []() -> const OEAggregateInfo& {                \
      using ThisClass [[maybe_unused]] = Class;                                              \
      static OEAggregateInfo info =                                                          \
          OEAggregateInfo(&Base::ClassInfo(), {FIELDS(OE_FIELD_DESC)}, OE_TAG_##DEFAULT_TYPE) \
              DESCRIPTION;                                                                   \
      return info.Finish();                                                                  \
    }();                                                                                     \
    return finished;                                                                         \
  }
