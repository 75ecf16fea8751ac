// What the envelope classes (the OFX aggregate, message sets, transaction and
// synchronisation wrappers, sign-on) add to the aggregate machinery:
//
// - classes whose valid tags depend on the tag they stand under: a message
//   set or a wrapper is one class for many tags, and each tag has its own
//   description (valid tags, write order, the tags of its children), made
//   once from the class's tables (OE_AGGREGATE_BY_TYPE);
// - field kinds: TRAITS (an element whose conversion is a traits class),
//   INNER (the inner request or response of a wrapper), WRAPPERS (repeated
//   wrappers, which learn the message set that holds them) and ALSOLIST
//   (a further tag for a LIST field).
#pragma once

#include <memory>
#include <vector>

#include "ofxkit/core/OEAggregate.h"

// ---------------------------------------------------------------------------
// Field kinds.

// TRAITS: X(TRAITS, Name, TAG, Traits). Traits gives `Type`, FromText, Write,
// ToText (as value traits do) and Store(self, field, tag, value), the typed
// setter's body.
#define OE_DECLARE_TRAITS(Name, TAG, Traits)                                                              \
 public:                                                                                                  \
  const Traits::Type& Get##Name() const { return OEGetField<Traits::Type>(this, OE_FIELD_KEY(Name)); }   \
  unsigned short Set##Name(const Traits::Type& value) { return Traits::Store(this, Field##Name(), OE_TAG_##TAG, value); } \
  unsigned short Set##Name(const OEString& text) {                                                        \
    return OESetFromText<Traits>(this, Field##Name(), OE_TAG_##TAG, text);                                \
  }                                                                                                       \
                                                                                                          \
 protected:                                                                                               \
  Traits::Type& Field##Name() { return OEFieldRef<Traits::Type>(this, OE_FIELD_KEY(Name)); }
#define OE_DESC_TRAITS(Name, TAG, Traits) OE_DESC_ELEMENT_(Name, TAG, Traits::Type, Traits)

// The typed setter of most TRAITS fields: store and mark present.
struct OEPlainStore {
  template <class T>
  static unsigned short Store(OEAggregate* self, T& field, OETagID tag, const T& value) {
    return OESetValueField(self, field, tag, value);
  }
};

// INNER: the one inner aggregate of a wrapper, under whichever of the
// wrapper's inner tags it stands (the tag in the field list is NONE; each
// wrapper type gives the field its tags). Setting it refuses while one is
// held and marks no tag present.
#define OE_DECLARE_INNER(Name, TAG, Type)                              \
 public:                                                               \
  Type* Get##Name() const { return OEGetField<Type*>(this, OE_FIELD_KEY(Name)); } \
  unsigned short Set##Name(Type* inner) {                              \
    if (Get##Name() || !inner) return 0;                               \
    Field##Name() = inner;                                             \
    return 1;                                                          \
  }                                                                    \
  /* Gives the inner aggregate back to the caller, who owns it now. */ \
  Type* Disconnect##Name() { return Get##Name() ? OEDisconnectChild(this, Field##Name()) : nullptr; } \
                                                                       \
 protected:                                                            \
  Type*& Field##Name() { return OEFieldRef<Type*>(this, OE_FIELD_KEY(Name)); }
#define OE_DESC_INNER(Name, TAG, Type) OE_DESC_CHILD_(Name, TAG, Type, false)

// WRAPPERS: repeated transaction or sync wrappers of several tags (the tag
// in the field list is NONE; each type of the holder gives the field its
// tags). Storing one marks its type present and tells it the message set
// that holds it. Disconnect<Name>(i) removes the element at i without
// deleting it.
#define OE_DECLARE_WRAPPERS(Name, TAG, Type)                                                         \
 public:                                                                                             \
  unsigned short GetNum##Name() const { return OEGetField<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)).Entries(); } \
  Type* Get##Name(unsigned short i) const { return OEGetField<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)).Get(i); } \
  unsigned short Set##Name(unsigned short i, Type* w) { return OEStoreWrapper(this, Field##Name(), i, w); } \
  unsigned short Append##Name(Type* w) { return Set##Name(GetNum##Name(), w); }                     \
  unsigned short Disconnect##Name(unsigned short i) { return Field##Name().UnSet(i); }               \
                                                                                                     \
 protected:                                                                                          \
  OEDynamicArrayTyped<Type>& Field##Name() { return OEFieldRef<OEDynamicArrayTyped<Type>>(this, OE_FIELD_KEY(Name)); }
#define OE_DESC_WRAPPERS(Name, TAG, Type) \
  OE_DESC_LIST_(Name, TAG, Type, false, (&OEWrapperListPut<Type, OE_FIELD_KEY(Name)>))

// ---------------------------------------------------------------------------

// Base of the envelope classes.
class OEEnvelopeAggregate : public OEAggregate {
 public:
  // Copies source, taking its type (and with it the description of that
  // type) first, and its message-set record; 1 on success.
  unsigned short CopyAggregateFrom(const OEAggregate* source) override;

  // The message set that holds this object (wrappers), or that this object
  // is (message sets); NONE when not known.
  virtual OETagID MessageSetTag() const { return OE_TAG_NONE; }
  // Records the message set that holds this wrapper (and its wrappers).
  virtual void SetMessageSetTag(OETagID) {}

 protected:
  using TypeInfoLookup = const OEAggregateInfo* (*)(OETagID type);
  // The description made for the current type by lookup (made once per
  // type), or classInfo when the type has none.
  const OEAggregateInfo& InfoForType(const OEAggregateInfo& classInfo, TypeInfoLookup lookup) const;

  // Writes, for each tag of order whose presence bit is set, every child
  // that stands under that tag (in the order held). With onePerTag, two
  // children under one tag answer OE_BUILD_REPEATED_SET before either is
  // written.
  OEBuildStatus BuildChildrenByTag(OEBuilder* builder, const std::vector<OETagID>& order, bool onePerTag) const;

  // The field that takes tag in the current description, or null.
  const OEFieldDesc* FieldFor(OETagID tag) const;

 private:
  mutable const OEAggregateInfo* m_info = nullptr;
  mutable OETagID m_infoType = OE_TAG_NONE;
};

// Stores wrapper w at i of list (i = count appends): its type is marked
// present and it learns the holder's message set. 0 when refused.
template <class T>
unsigned short OEStoreWrapper(OEEnvelopeAggregate* self, OEDynamicArrayTyped<T>& list, unsigned short i, T* w) {
  if (!w || i > list.Entries() || !list.Set(i, w)) return 0;
  self->SetTag(w->GetType());
  w->SetMessageSetTag(self->MessageSetTag());
  return 1;
}

// Gives the single child held in field back to the caller, who owns it now.
template <class T>
T* OEDisconnectChild(OEAggregate* self, T*& field) {
  T* held = field;
  if (held) self->ClearTagQuietly(held->GetType());
  field = nullptr;
  return held;
}

template <class T, uint16_t Key>
unsigned short OEWrapperListPut(OEAggregate* self, OEDataObj* child) {
  OEDynamicArrayTyped<T>& list = OEFieldRef<OEDynamicArrayTyped<T>>(self, Key);
  return OEStoreWrapper(static_cast<OEEnvelopeAggregate*>(self), list, list.Entries(), static_cast<T*>(child));
}

// The description of one type of a class of OE_AGGREGATE_BY_TYPE: the
// class's own fields, further tags for some of them (each alias names the
// field by its member name), and the tag lists.
struct OETypeAlias {
  OETagID tag;
  const char* member;
  // Makes the child for this tag instead of the field's own creator.
  OEDataObj* (*create)(OEDataObjFactory* factory, OETagID tag) = nullptr;
};
struct OETypeDescription {
  OETagID type = OE_TAG_NONE;
  std::vector<OETagID> valid;
  std::vector<OETagID> required;
  std::vector<OETagID> order;  // empty: the valid order
  std::vector<OETypeAlias> aliases;
};
// Makes the description (finished) from the class description; null when
// memory runs out.
OEAggregateInfo* OEMakeTypeInfo(const OEAggregateInfo& classInfo, const OETypeDescription& description);

// The descriptions of the types of one class (one per row of its table),
// each made on first use and kept for the life of the process.
class OETypeInfoCache {
 public:
  explicit OETypeInfoCache(size_t rows) : m_infos(rows) {}
  // describe() gives the OETypeDescription of the row.
  template <class Describe>
  const OEAggregateInfo* Get(int row, const OEAggregateInfo& classInfo, Describe describe) {
    if (row < 0 || static_cast<size_t>(row) >= m_infos.size()) return nullptr;
    if (!m_infos[row]) m_infos[row].reset(OEMakeTypeInfo(classInfo, describe()));
    return m_infos[row].get();
  }

 private:
  std::vector<std::unique_ptr<OEAggregateInfo>> m_infos;
};

// The index of the row of table whose column holds tag on side (0 request,
// 1 response), or -1: the envelope classes keep their types in such tables.
template <class Row, size_t N>
int OEFindRow(const Row (&table)[N], const OETagID (Row::*column)[2], OETagID tag, int side) {
  for (size_t i = 0; i < N; ++i)
    if ((table[i].*column)[side] == tag) return static_cast<int>(i);
  return -1;
}

// As OE_AGGREGATE, for a class whose description depends on its type. The
// class defines `static const OEAggregateInfo* TypeInfo(OETagID type)`,
// answering the description of a type (made once) or null.
#define OE_AGGREGATE_BY_TYPE(Class, FIELDS)                                                    \
 public:                                                                                       \
  Class();                                                                                     \
  ~Class() override;                                                                           \
  static const OEAggregateInfo& ClassInfo();                                                   \
  const OEAggregateInfo& GetInfo() const override { return InfoForType(ClassInfo(), &TypeInfo); } \
  unsigned short DeepCopyFrom(const Class* source) { return CopyAggregateFrom(source); }       \
  static const OEAggregateInfo* TypeInfo(OETagID type);                                        \
  FIELDS(OE_FIELD_DECLARE)                                                                     \
 public:
