#include "ofxkit/core/OEDataObj.h"

#include "OEPool.h"

#include <dlfcn.h>
#include <sys/mman.h>

#include <cstdint>
#include <cstdlib>
#include <cstring>
#include <mutex>
#include <new>

#include "ofxkit/core/OEDataObjFactory.h"
#include "ofxkit/core/OETagDictionary.h"
#include "ofxkit/parse/OEParseLogger.h"
#include "ofxkit/parse/OEParseEngine.h"
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

// ---------------------------------------------------------------------------
// Object blocks.

#if defined(__SANITIZE_ADDRESS__)
#define OE_OBJECTS_FROM_HEAP 1
#elif defined(__has_feature)
#if __has_feature(address_sanitizer)
#define OE_OBJECTS_FROM_HEAP 1
#endif
#endif

namespace {

#if !defined(OE_OBJECTS_FROM_HEAP)
// Objects of up to kLargest bytes come from blocks, in size classes of the
// pool's grain, each class with a list of freed objects to reuse; larger ones
// from the heap. Data objects come 16 bytes apart, aligned for any type as
// operator new promises; the blocks aggregates keep their fields in, which
// need only 8, come from a pool of their own 8 bytes apart.
constexpr size_t kObjectGrain = 16;
constexpr size_t kFieldGrain = 8;
constexpr size_t kLargest = 4096;
constexpr size_t kClasses = kLargest / kFieldGrain;
constexpr size_t kBlock = size_t{2} << 20;
// Page size. A block is one huge page when it will be filled: every first
// touch of a small page is a fault (on virtual machines a costly one, taken
// again for each of a large tree's thousands of pages), while a huge page is
// held whole, used or not. Whether a block will be filled is projected from
// the parse that is reading on this thread: the bytes carved so far, scaled by
// the share of its text read. Without a parse, or when the projection falls
// short, pages of a block are made present a step at a time just ahead of
// the objects carved from them: one call instead of a fault per page, and at
// most one step held beyond what the objects use. Steps start small, for the
// many programs that read one small file, and double up to the largest. A
// block of small pages that fills after all becomes one huge page then, for
// the walks over the tree that follow.
constexpr size_t kFirstPopulateStep = size_t{16} << 10;
constexpr size_t kPopulateStep = size_t{64} << 10;
// Blocks kept, when no object is left, for the next parse to reuse.
constexpr size_t kKeptWhenIdle = 8;

struct FreeObject {
  FreeObject* next;
};

// A block: this header (16 bytes, so the first object is 16-byte aligned),
// then the objects.
struct Block {
  Block* next;
  size_t present;  // bytes from the block's start made present (all of it for a huge page)
};

// Constant-initialized, so it is ready before any constructor runs; its
// blocks are never unmapped at exit (objects may be deleted during exit).
struct ObjectPool {
  constexpr explicit ObjectPool(size_t sizeGrain) : grain(sizeGrain) {}
  const size_t grain;
  std::mutex lock;
  FreeObject* freed[kClasses + 1] = {};
  Block* blocks = nullptr;   // every block, in the order they were had
  Block* current = nullptr;  // the block being carved
  char* cursor = nullptr;
  char* limit = nullptr;
  size_t step = kFirstPopulateStep;
  size_t carved = 0;  // bytes carved since carving last started from the first block
  size_t live = 0;  // objects handed out and not yet freed
};

ObjectPool& Pool() {
  static ObjectPool pool(kObjectGrain);
  return pool;
}

ObjectPool& FieldPool() {
  static ObjectPool pool(kFieldGrain);
  return pool;
}

Block* NewBlock() {
  void* memory = nullptr;
#if defined(__linux__)
  // Aligned to the huge page size, so that a block once filled can become one.
  void* mapped = mmap(nullptr, kBlock * 2, PROT_READ | PROT_WRITE, MAP_PRIVATE | MAP_ANONYMOUS, -1, 0);
  if (mapped == MAP_FAILED) return nullptr;
  uintptr_t start = reinterpret_cast<uintptr_t>(mapped);
  uintptr_t aligned = (start + kBlock - 1) & ~(kBlock - 1);
  if (aligned > start) munmap(mapped, aligned - start);
  if (aligned + kBlock < start + kBlock * 2) munmap(reinterpret_cast<void*>(aligned + kBlock), start + kBlock - aligned);
  memory = reinterpret_cast<void*>(aligned);
#else
  memory = malloc(kBlock);
  if (!memory) return nullptr;
#endif
  Block* block = static_cast<Block*>(memory);
  block->next = nullptr;
  block->present = 0;
  return block;
}

void FreeBlock(Block* block) {
#if defined(__linux__)
  munmap(block, kBlock);
#else
  free(block);
#endif
}

#if defined(__linux__)
#if !defined(MADV_COLLAPSE)
constexpr int MADV_COLLAPSE = 25;
#endif
#endif

// The parse reading on this thread, for the projection (see OEPoolReading).
thread_local const OEParseEngine* t_reading = nullptr;

// Whether the pool, carving at its present rate, will fill its current block:
// the bytes carved so far, scaled by the share of the text still to read,
// must reach past the block's end with a tenth to spare.
bool WillFill(const ObjectPool& pool) {
  if (!t_reading) return false;
  const int32_t read = t_reading->ItemEnd();
  const int32_t end = t_reading->TextLength();
  if (read <= 0 || read >= end) return false;
  const double projected = static_cast<double>(pool.carved) * end / read;
  const double needed = static_cast<double>(pool.carved) + static_cast<double>(pool.limit - pool.cursor);
  return projected * 0.9 >= needed;
}

void MarkHuge(ObjectPool& pool) { pool.current->present = kBlock; }

void StartCarving(ObjectPool& pool, Block* block) {
  pool.current = block;
  pool.cursor = reinterpret_cast<char*>(block + 1);
  pool.limit = reinterpret_cast<char*>(block) + kBlock;
}

// Makes the next step of the current block present, once the objects reach
// it; or the whole block one huge page, when it will be filled.
void MakePresent(ObjectPool& pool, char* end) {
#if defined(__linux__) && defined(MADV_POPULATE_WRITE)
  char* present = reinterpret_cast<char*>(pool.current) + pool.current->present;
  if (end <= present) return;
  if (WillFill(pool)) {
    // The part in use is copied into the huge page; the rest comes with it.
    if (madvise(pool.current, kBlock, MADV_COLLAPSE) == 0) {
      MarkHuge(pool);
      return;
    }
  }
  size_t step = pool.step;
  if (pool.step < kPopulateStep) pool.step *= 2;
  if (static_cast<size_t>(pool.limit - present) < step) step = static_cast<size_t>(pool.limit - present);
  // A kernel without this request faults the pages in one at a time instead.
  madvise(present, step, MADV_POPULATE_WRITE);
  pool.current->present += step;
#else
  (void)pool;
  (void)end;
#endif
}

// Starts carving a block: one huge page when it will be filled.
void BeginBlock(ObjectPool& pool, Block* block) {
  StartCarving(pool, block);
#if defined(__linux__) && defined(MADV_HUGEPAGE)
  if (block->present < kBlock && WillFill(pool) && madvise(block, kBlock, MADV_HUGEPAGE) == 0) MarkHuge(pool);
#endif
}

// A block of small pages that was filled becomes one huge page after all:
// the tree in it is walked again (checks, output, its end).
void FilledBlock(Block* block) {
#if defined(__linux__)
  if (block->present < kBlock && madvise(block, kBlock, MADV_COLLAPSE) == 0) block->present = kBlock;
#else
  (void)block;
#endif
}

void* TakeObject(ObjectPool& pool, size_t size) {
  if (size == 0) size = 1;
  if (size > kLargest) return ::operator new(size, std::nothrow);
  size_t sizeClass = (size + pool.grain - 1) / pool.grain;
  size_t bytes = sizeClass * pool.grain;
  std::lock_guard<std::mutex> guard(pool.lock);
  if (FreeObject* reused = pool.freed[sizeClass]) {
    pool.freed[sizeClass] = reused->next;
    ++pool.live;
    return reused;
  }
  if (static_cast<size_t>(pool.limit - pool.cursor) < bytes) {
    if (pool.current) FilledBlock(pool.current);
    Block* next = pool.current ? pool.current->next : nullptr;  // a block kept from before
    if (!next) {
      next = NewBlock();
      if (!next) return nullptr;
      if (pool.current) {
        pool.current->next = next;
      } else {
        next->next = pool.blocks;
        pool.blocks = next;
      }
    }
    BeginBlock(pool, next);
  }
  void* object = pool.cursor;
  pool.cursor += bytes;
  pool.carved += bytes;
  MakePresent(pool, pool.cursor);
  ++pool.live;
  return object;
}

// When the last object goes, the free lists are dropped and carving starts
// again from the first block; blocks beyond the few kept go back.
void Idle(ObjectPool& pool) {
  for (FreeObject*& list : pool.freed) list = nullptr;
  Block* block = pool.blocks;
  for (size_t kept = 1; block && kept < kKeptWhenIdle; ++kept) block = block->next;
  if (block) {
    Block* extra = block->next;
    block->next = nullptr;
    while (extra) {
      Block* next = extra->next;
      FreeBlock(extra);
      extra = next;
    }
  }
  pool.carved = 0;
  if (pool.blocks) StartCarving(pool, pool.blocks);
}

void GiveBack(ObjectPool& pool, void* p, size_t size) {
  if (!p) return;
  if (size == 0) size = 1;
  if (size > kLargest) {
    ::operator delete(p);
    return;
  }
  size_t sizeClass = (size + pool.grain - 1) / pool.grain;
  std::lock_guard<std::mutex> guard(pool.lock);
  FreeObject* freed = static_cast<FreeObject*>(p);
  freed->next = pool.freed[sizeClass];
  pool.freed[sizeClass] = freed;
  if (--pool.live == 0) Idle(pool);
}

// For the one release that comes without a size (a constructor that threw).
bool FromBlocks(void* p) {
  ObjectPool& pool = Pool();
  std::lock_guard<std::mutex> guard(pool.lock);
  for (Block* block = pool.blocks; block; block = block->next) {
    char* start = reinterpret_cast<char*>(block);
    if (static_cast<char*>(p) >= start && static_cast<char*>(p) < start + kBlock) return true;
  }
  return false;
}
#endif

}  // namespace

#if !defined(OE_OBJECTS_FROM_HEAP)
void* OEDataObj::operator new(std::size_t size) {
  void* p = TakeObject(Pool(), size);
  if (!p) throw std::bad_alloc();
  return p;
}

void* OEDataObj::operator new(std::size_t size, const std::nothrow_t&) noexcept { return TakeObject(Pool(), size); }

void OEDataObj::operator delete(void* p, std::size_t size) noexcept { GiveBack(Pool(), p, size); }

void* OEPoolTake(std::size_t size) noexcept { return TakeObject(FieldPool(), size); }

void OEPoolReading(const OEParseEngine* engine) noexcept { t_reading = engine; }
void OEPoolGive(void* p, std::size_t size) noexcept { GiveBack(FieldPool(), p, size); }

void OEDataObj::operator delete(void* p, const std::nothrow_t&) noexcept {
  // Only a constructor that threw comes here: the object is not counted as
  // freed (its size is not known), only its memory is not reused.
  if (p && !FromBlocks(p)) ::operator delete(p);
}
#else
void* OEDataObj::operator new(std::size_t size) { return ::operator new(size); }
void* OEDataObj::operator new(std::size_t size, const std::nothrow_t&) noexcept {
  return ::operator new(size, std::nothrow);
}
void OEDataObj::operator delete(void* p, std::size_t) noexcept { ::operator delete(p); }

void* OEPoolTake(std::size_t size) noexcept { return ::operator new(size, std::nothrow); }
void OEPoolReading(const OEParseEngine*) noexcept {}
void OEPoolGive(void* p, std::size_t) noexcept { ::operator delete(p); }
void OEDataObj::operator delete(void* p, const std::nothrow_t&) noexcept { ::operator delete(p); }
#endif
