// Growable arrays of owned pointers, and a small owning linked list.
#pragma once

#include <cstdint>
#include <new>

#include "ofxkit/core/OETagID.h"
#include "ofxkit/types/OECommon.h"
#include "ofxkit/types/OEString.h"

// Counts, growth parameters and the type-erased slot vector shared by every
// array of the family. Slots beyond the entries count are always null.
class OEDynamicArray {
 public:
  OEDynamicArray(unsigned short initial = 1, unsigned short growth = 1);
  OEDynamicArray(const OEDynamicArray&) = delete;
  OEDynamicArray& operator=(const OEDynamicArray&) = delete;
  virtual ~OEDynamicArray();

  unsigned short Entries() const { return m_entries; }
  virtual unsigned short OkToAlloc(unsigned short) const { return 1; }
  // An untyped array has nothing to write.
  OEBuildStatus Build(OEBuilder*, OETagID) const { return static_cast<OEBuildStatus>(6); }

 protected:
  // Grows the vector once; 0 (and g_allocFailed) when it cannot.
  unsigned short Reallocate();
  // Grows until index i has a slot and raises the entries count to i + 1.
  unsigned short AllocatedTo(unsigned short i);
  void* GetSlot(unsigned short i) const { return (m_slots && i < m_entries) ? m_slots[i] : nullptr; }
  // Stores p at i (growing as needed) and returns the pointer it replaced
  // through *old; 0 when growth fails.
  unsigned short StoreSlot(unsigned short i, void* p, void** old);
  // Removes slot i, moving the rest down; returns the removed pointer.
  unsigned short RemoveSlot(unsigned short i, void** removed);
  void ClearSlots();
  void FreeVector();
  void*& SlotRef(unsigned short i) { return m_slots[i]; }

  unsigned short m_allocated;
  unsigned short m_entries;
  unsigned short m_initial;
  unsigned short m_growth;
  void** m_slots;
};

// How an array makes a fresh element and a copy of one. Element classes made
// through the object factory specialise this.
template <class T>
struct OEArrayElementTraits {
  static T* New() { return new (std::nothrow) T(); }
  static void Delete(T* p) { delete p; }
};
// Data objects come from the installed object factory.
template <>
struct OEArrayElementTraits<OEDataObj> {
  static OEDataObj* New();
  static void Delete(OEDataObj* p);
};
template <>
struct OEArrayElementTraits<OEString> {
  static OEString* New();
  static void Delete(OEString* p) { delete p; }
};
template <>
struct OEArrayElementTraits<unsigned short> {
  static unsigned short* New();
  static void Delete(unsigned short* p) { delete p; }
};

// Array of owned T*, with the behaviour every typed array of the library shares.
template <class T>
class OEDynamicArrayTyped : public OEDynamicArray {
 public:
  using Element = T;
  OEDynamicArrayTyped(unsigned short initial = 1, unsigned short growth = 1) : OEDynamicArray(initial, growth) {}
  ~OEDynamicArrayTyped() override { DeleteAllSlots(); }

  T* Get(unsigned short i) const { return static_cast<T*>(GetSlot(i)); }
  virtual unsigned short Set(unsigned short i, T* p) {
    if (!p) return 0;
    void* old = nullptr;
    if (!StoreSlot(i, p, &old)) return 0;
    if (old != p) OEArrayElementTraits<T>::Delete(static_cast<T*>(old));
    return 1;
  }
  unsigned short Append(T* p) { return Set(m_entries, p); }
  // Stores a new copy of value at i.
  unsigned short SetVal(unsigned short i, const T& value) {
    T* copy = OEArrayElementTraits<T>::New();
    if (!copy) {
      g_allocFailed = 1;
      return 0;
    }
    *copy = value;
    if (!Set(i, copy)) {
      delete copy;
      return 0;
    }
    return 1;
  }
  // Slot i, made on demand as a default element.
  T& operator[](unsigned short i) {
    static T s_failed;  // returned only when memory is exhausted
    if (!AllocatedTo(i)) return s_failed;
    T* p = static_cast<T*>(SlotRef(i));
    if (!p) {
      p = OEArrayElementTraits<T>::New();
      if (!p) {
        g_allocFailed = 1;
        return s_failed;
      }
      SlotRef(i) = p;
    }
    return *p;
  }
  // Removes slot i without deleting its element: ownership returns to the caller.
  unsigned short UnSet(unsigned short i) {
    void* removed = nullptr;
    return RemoveSlot(i, &removed);
  }
  void Clear() { ClearSlots(); }
  virtual void DeleteAll() { DeleteAllSlots(); }
  using OEDynamicArray::AllocatedTo;
  using OEDynamicArray::Reallocate;

 protected:
  void DeleteAllSlots() {
    for (unsigned short i = 0; i < m_entries; ++i) OEArrayElementTraits<T>::Delete(static_cast<T*>(m_slots[i]));
    FreeVector();
  }
};

// Data objects of any class.
class OEDynamicArrayDataObj : public OEDynamicArrayTyped<OEDataObj> {
 public:
  using OEDynamicArrayTyped<OEDataObj>::OEDynamicArrayTyped;
  unsigned short OkToAlloc(unsigned short i) const override { return i < m_entries; }
  // Writes every entry as an aggregate under `tag` (0: each under its own type);
  // the first failing status stops the loop.
  OEBuildStatus Build(OEBuilder* builder, OETagID tag) const;
};

// Strings, each written as an element.
class OEDynamicArrayString : public OEDynamicArrayTyped<OEString> {
 public:
  using OEDynamicArrayTyped<OEString>::OEDynamicArrayTyped;
  OEBuildStatus Build(OEBuilder* builder, OETagID tag) const;
};

// Strings that all receive the array's spec length when stored.
class OEDynamicArrayStringLen : public OEDynamicArrayString {
 public:
  explicit OEDynamicArrayStringLen(unsigned short specLength = OEString::kNoLimit, unsigned short = 1,
                                   unsigned short = 1)
      : OEDynamicArrayString(1, 1), m_specLength(specLength) {}
  unsigned short Set(unsigned short i, OEString* p) override {
    if (!OEDynamicArrayString::Set(i, p)) return 0;
    p->SetSpecLength(m_specLength);
    return 1;
  }
  unsigned short SetCopy(OEDataObjFactory* factory, unsigned short i, const OEString* s);
  unsigned short SetCopyVal(OEDataObjFactory* factory, unsigned short i, const OEString& s) {
    return SetCopy(factory, i, &s);
  }
  unsigned short GetSpecLength() const { return m_specLength; }

 private:
  unsigned short m_specLength;
};

#define OE_STRING_ARRAY(N)                                                                        \
  class OEDynamicArrayString##N : public OEDynamicArrayStringLen {                                \
   public:                                                                                        \
    OEDynamicArrayString##N(unsigned short = 1, unsigned short = 1) : OEDynamicArrayStringLen(N) {} \
  };
OE_STRING_ARRAY(9)
OE_STRING_ARRAY(16)
OE_STRING_ARRAY(32)
OE_STRING_ARRAY(64)
OE_STRING_ARRAY(255)
#undef OE_STRING_ARRAY

// A named array of owned elements of one class, for applications that keep
// lists of them: OE_TYPED_ARRAY(Wage, OEWage) is OEDynamicArrayWage.
#define OE_TYPED_ARRAY(Name, Element)                                    \
  class OEDynamicArray##Name : public OEDynamicArrayTyped<Element> {     \
   public:                                                               \
    using OEDynamicArrayTyped<Element>::OEDynamicArrayTyped;             \
  };

class OEDynamicArrayOEUShort : public OEDynamicArrayTyped<unsigned short> {
 public:
  using OEDynamicArrayTyped<unsigned short>::OEDynamicArrayTyped;
};

// Node of an OECollection; Factory() makes a new node of the same class.
class OECollectionItem {
 public:
  OECollectionItem() = default;
  OECollectionItem(const OECollectionItem&) = default;
  virtual ~OECollectionItem() = default;
  virtual OECollectionItem& operator=(const OECollectionItem& other) {
    m_next = other.m_next;
    m_previous = other.m_previous;
    return *this;
  }
  virtual bool operator==(const OECollectionItem& other) const { return this == &other; }
  virtual OECollectionItem* Factory() const { return new (std::nothrow) OECollectionItem(); }
  OECollectionItem* Next() const { return m_next; }
  void Next(OECollectionItem* item) { m_next = item; }
  OECollectionItem* Previous() const { return m_previous; }
  void Previous(OECollectionItem* item) { m_previous = item; }

 private:
  OECollectionItem* m_next = nullptr;
  OECollectionItem* m_previous = nullptr;
};

// Owning doubly linked list; newest item first.
class OECollection {
 public:
  OECollection() = default;
  OECollection(const OECollection&) = delete;
  OECollection& operator=(const OECollection&) = delete;
  virtual ~OECollection();
  OECollection& operator+=(const OECollectionItem& item);
  OECollection& operator-=(const OECollectionItem& item);
  OECollectionItem* operator[](unsigned short i) const;
  unsigned short NumberofItems() const { return m_count; }

 private:
  OECollectionItem* m_head = nullptr;
  unsigned short m_count = 0;
};
