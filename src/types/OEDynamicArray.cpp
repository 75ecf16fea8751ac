#include "ofxkit/types/OEDynamicArray.h"

#include <cstdlib>
#include <cstring>

#include "ofxkit/core/OEDataObj.h"
#include "ofxkit/core/OEDataObjFactory.h"

namespace {
constexpr uint32_t kMaxSlots = 0xFFFF;  // indices are 16-bit; the last usable index is 65534
}

OEDynamicArray::OEDynamicArray(unsigned short initial, unsigned short growth)
    : m_allocated(0), m_entries(0), m_initial(initial ? initial : 1), m_growth(growth ? growth : 1), m_slots(nullptr) {}

OEDynamicArray::~OEDynamicArray() { FreeVector(); }

void OEDynamicArray::FreeVector() {
  free(m_slots);
  m_slots = nullptr;
  m_allocated = 0;
  m_entries = 0;
}

// The vector grows by the growth count, or by half its size once it is large,
// so that appending thousands of entries stays linear.
unsigned short OEDynamicArray::Reallocate() {
  uint32_t increment = m_slots ? m_growth : m_initial;
  if (m_slots && m_allocated / 2u > increment) increment = m_allocated / 2u;
  uint32_t wanted = static_cast<uint32_t>(m_allocated) + increment;
  if (wanted > kMaxSlots) wanted = kMaxSlots;
  if (wanted <= m_allocated) return 0;
  void** slots = static_cast<void**>(realloc(m_slots, wanted * sizeof(void*)));
  if (!slots) {
    g_allocFailed = 1;
    return 0;
  }
  memset(slots + m_allocated, 0, (wanted - m_allocated) * sizeof(void*));
  m_slots = slots;
  m_allocated = static_cast<unsigned short>(wanted);
  return 1;
}

unsigned short OEDynamicArray::AllocatedTo(unsigned short i) {
  if (i >= kMaxSlots) return 0;
  while (i >= m_allocated)
    if (!Reallocate()) return 0;
  if (i >= m_entries) m_entries = static_cast<unsigned short>(i + 1);
  return 1;
}

unsigned short OEDynamicArray::StoreSlot(unsigned short i, void* p, void** old) {
  *old = nullptr;
  if (!AllocatedTo(i)) return 0;
  *old = m_slots[i];
  m_slots[i] = p;
  return 1;
}

unsigned short OEDynamicArray::RemoveSlot(unsigned short i, void** removed) {
  *removed = nullptr;
  if (i >= m_entries) return 0;
  *removed = m_slots[i];
  memmove(m_slots + i, m_slots + i + 1, (m_entries - i - 1u) * sizeof(void*));
  --m_entries;
  m_slots[m_entries] = nullptr;
  return 1;
}

void OEDynamicArray::ClearSlots() {
  if (m_slots) memset(m_slots, 0, m_allocated * sizeof(void*));
  m_entries = 0;
}

// ---------------------------------------------------------------------------

OEDataObj* OEArrayElementTraits<OEDataObj>::New() {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  return factory ? factory->NewDataObj() : nullptr;
}

void OEArrayElementTraits<OEDataObj>::Delete(OEDataObj* p) { delete p; }

OEString* OEArrayElementTraits<OEString>::New() {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  return factory ? factory->NewString() : nullptr;
}

unsigned short* OEArrayElementTraits<unsigned short>::New() {
  OEDataObjFactory* factory = OEDataObj::GetFactory();
  return factory ? factory->NewOEUShort() : nullptr;
}

OEBuildStatus OEDynamicArrayDataObj::Build(OEBuilder* builder, OETagID tag) const {
  for (unsigned short i = 0; i < m_entries; ++i) {
    const OEDataObj* obj = Get(i);
    if (!obj) continue;
    OEBuildStatus status = obj->BuildObject(builder, tag);
    if (status != OE_BUILD_OK) return status;
  }
  return OE_BUILD_OK;
}

unsigned short OEDynamicArrayStringLen::SetCopy(OEDataObjFactory* factory, unsigned short i, const OEString* s) {
  if (!factory || !s) return 0;
  OEString* copy = factory->NewString();
  if (!copy) return 0;
  *copy = *s;
  if (!Set(i, copy)) {
    delete copy;
    return 0;
  }
  return 1;
}

// ---------------------------------------------------------------------------

OECollection::~OECollection() {
  while (m_head) {
    OECollectionItem* next = m_head->Next();
    delete m_head;
    m_head = next;
  }
  m_count = 0;
}

OECollection& OECollection::operator+=(const OECollectionItem& item) {
  OECollectionItem* node = item.Factory();
  if (!node) {
    g_allocFailed = 1;
    return *this;
  }
  *node = item;
  node->Next(m_head);
  node->Previous(nullptr);
  if (m_head) m_head->Previous(node);
  m_head = node;
  ++m_count;
  return *this;
}

OECollection& OECollection::operator-=(const OECollectionItem& item) {
  for (OECollectionItem* node = m_head; node; node = node->Next()) {
    if (!(item == *node)) continue;
    OECollectionItem* previous = node->Previous();
    OECollectionItem* next = node->Next();
    if (previous) previous->Next(next);
    else m_head = next;
    if (next) next->Previous(previous);
    delete node;
    --m_count;
    break;
  }
  return *this;
}

OECollectionItem* OECollection::operator[](unsigned short i) const {
  OECollectionItem* node = m_head;
  while (node && i-- > 0) node = node->Next();
  return node;
}
