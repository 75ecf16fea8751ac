#include "ofxkit/types/OEBuffer.h"

#include <sys/stat.h>
#if defined(__linux__)
#include <sys/mman.h>
#endif

#include <cerrno>
#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <new>

OEBuffer::OEBuffer(uint32_t initialSize, uint32_t growBy)
    : m_data(nullptr), m_allocation(0), m_growBy(0), m_size(0), m_offset(0) {
  if (initialSize > kMaxBufferSize) initialSize = kMaxBufferSize;
  if (initialSize != 0) {
    m_growBy = initialSize;
    GrowBuffer(initialSize);
    m_growBy = growBy;
  } else {
    m_growBy = growBy ? growBy : 512;
    GrowBuffer(m_growBy);
  }
}

OEBuffer::OEBuffer(const OEBuffer& other) : OEBuffer(other.m_allocation ? other.m_allocation : 0, other.m_growBy) {
  if (m_data && other.m_data) memcpy(m_data, other.m_data, other.m_size);
  m_size = m_data ? other.m_size : 0;
  m_offset = m_data ? other.m_offset : 0;
}

OEBuffer& OEBuffer::operator=(const OEBuffer& other) {
  if (this == &other) return *this;
  m_offset = 0;
  m_size = 0;
  if (other.m_size > m_allocation) AllocateTo(other.m_size);
  if (m_data && other.m_data && other.m_size <= m_allocation) {
    memcpy(m_data, other.m_data, other.m_size);
    m_size = other.m_size;
    m_offset = other.m_offset;
  }
  m_growBy = other.m_growBy;
  return *this;
}

OEBuffer::~OEBuffer() {
  if (m_data) {
    // Zeroed in a way the compiler may not drop, at memset's speed where the
    // C library offers it (a whole statement is megabytes).
#if defined(__GLIBC__)
    explicit_bzero(m_data, m_allocation);
#else
    volatile char* p = m_data;
    for (uint32_t i = 0; i < m_allocation; ++i) p[i] = 0;
#endif
    free(m_data);
  }
}

namespace {
constexpr size_t kHugePage = size_t{2} << 20;
}  // namespace

// A block of n bytes. One of megabytes (a whole file read at once) is
// aligned to, and a whole number of, 2 MB pages, and the kernel is asked to
// back the pages it fills with huge pages where it offers them: touching it then costs a
// fault per 2 MB instead of one per 4 KB, which on some virtual machines is
// most of the time it takes to read a file. Such a block is an ordinary heap
// block to realloc and free.
char* OEBuffer::LargeBlock(uint32_t n) {
#if defined(__linux__) && defined(MADV_HUGEPAGE)
  if (n >= kHugePage) {
    const size_t rounded = (static_cast<size_t>(n) + kHugePage - 1) & ~(kHugePage - 1);
    void* block = nullptr;
    if (posix_memalign(&block, kHugePage, rounded) != 0) return nullptr;
    // Only the whole 2 MB pages the text fills: a huge page over the tail
    // would make a 2.1 MB file cost 4 MB of memory.
    madvise(block, static_cast<size_t>(n) & ~(kHugePage - 1), MADV_HUGEPAGE);
    return static_cast<char*>(block);
  }
#endif
  return static_cast<char*>(malloc(n));
}

uint32_t OEBuffer::GrowBuffer(uint32_t n) {
  if (n == 0 && m_growBy == 0) return 0;
  uint32_t max = GetMaxBufferSize();
  if (m_allocation >= max) return 0;
  uint32_t increment = m_growBy > n ? m_growBy : n;
  uint64_t wanted = static_cast<uint64_t>(m_allocation) + increment;
  uint32_t newAllocation = wanted > max ? max : static_cast<uint32_t>(wanted);
  if (newAllocation - m_allocation < n) return 0;
  char* block;
  if (m_data && (m_allocation >= kHugePage || newAllocation < kHugePage)) {
    block = static_cast<char*>(realloc(m_data, newAllocation));
  } else {
    // Growing past 2 MB (or the first block): a block made for its size.
    block = LargeBlock(newAllocation);
    if (block && m_data) {
      memcpy(block, m_data, m_allocation);
      free(m_data);
    }
  }
  if (!block) {
    g_allocFailed = 1;
    return 0;
  }
  uint32_t added = newAllocation - m_allocation;
  m_data = block;
  m_allocation = newAllocation;
  return added;
}

OEBufferResult OEBuffer::WriteBytes(const char* data, uint32_t n) {
  uint64_t end = static_cast<uint64_t>(m_offset) + n;
  if (end > m_allocation) {
    if (end >= GetMaxBufferSize()) return OEBUF_OUTOFRANGE;
    if (GrowBuffer(static_cast<uint32_t>(end - m_allocation)) == 0)
      return m_growBy != 0 ? OEBUF_NOMEMORY : OEBUF_OUTOFRANGE;
  }
  if (!m_data) return OEBUF_NOBUFFER;
  if (n) memcpy(m_data + m_offset, data, n);
  m_offset = static_cast<uint32_t>(end);
  m_size = m_offset;
  return OEBUF_OK;
}

OEBufferResult OEBuffer::WriteLarge(const char* data, uint32_t n) {
  while (n > 0) {
    uint32_t chunk = n < kChunk ? n : kChunk;
    OEBufferResult r = WriteBytes(data, chunk);
    if (r != OEBUF_OK) return r;
    data += chunk;
    n -= chunk;
  }
  return OEBUF_OK;
}

OEBufferResult OEBuffer::Write(const OEBuffer* source) {
  if (!source || !source->m_data) return OEBUF_NOBUFFER;
  if (source == this) {  // appending ourselves: copy first so growth cannot move the source
    OEBuffer copy(*this);
    return Write(&copy);
  }
  return WriteLarge(source->m_data, source->m_size);
}

OEBufferResult OEBuffer::operator+=(const char* text) {
  if (!text) return OEBUF_OK;
  size_t n = strlen(text);
  if (n > 65535) n = 65535;
  return WriteBytes(text, static_cast<uint32_t>(n));
}

OEBufferResult OEBuffer::Read(char* dest) {
  if (static_cast<uint64_t>(m_offset) + 1 > m_size) return OEBUF_OUTOFRANGE;
  *dest = m_data[m_offset++];
  return OEBUF_OK;
}

OEBufferResult OEBuffer::Read(char* dest, unsigned short& got, unsigned short max) {
  if (m_offset >= m_size) return OEBUF_OUTOFRANGE;
  uint32_t available = m_size - m_offset;
  got = static_cast<unsigned short>(max < available ? max : available);
  memcpy(dest, m_data + m_offset, got);
  m_offset += got;
  return OEBUF_OK;
}

char OEBuffer::GetCh(int32_t index) {
  if (index < 0 || static_cast<uint32_t>(index) >= m_size || !m_data) return 0;
  return m_data[index];
}

unsigned short OEBuffer::FindSubChar(int32_t start, char ch, int32_t* where) {
  for (int32_t i = start;; ++i) {
    char c = GetCh(i);
    if (c == ch && c != 0) {
      *where = i;
      return 1;
    }
    if (c == 0) {
      *where = i;
      return 0;
    }
  }
}

unsigned short OEBuffer::GetData(OEString& out, int32_t start, unsigned short count) {
  char* dest = out.LockBuffer(static_cast<unsigned short>(count + 1u > 0xFFFF ? 0xFFFF : count + 1u));
  if (!dest) return 0;
  unsigned short copied = 0;
  while (copied < count && copied < 0xFFFE) {
    char c = GetCh(start + copied);
    if (c == 0) break;
    dest[copied++] = c;
  }
  dest[copied] = '\0';
  out.UnlockBuffer();
  return copied;
}

OEBufferResult OEBuffer::CopyBuffer(OEBuffer* dest, uint32_t offset, uint32_t count) {
  if (!dest) return OEBUF_NOBUFFER;
  if (offset > m_size) return OEBUF_OUTOFRANGE;
  if (count == 0) count = m_size - offset;
  if (static_cast<uint64_t>(offset) + count > m_size) return OEBUF_OUTOFRANGE;
  if (count > dest->m_allocation && dest->AllocateTo(count) != OEBUF_OK) return OEBUF_NOMEMORY;
  if (count) {
    if (!dest->m_data || !m_data) return OEBUF_NOBUFFER;
    memmove(dest->m_data, m_data + offset, count);
    dest->m_size = count;
    dest->m_offset = count;
  } else {
    dest->m_size = dest->m_offset;
  }
  return OEBUF_OK;
}

unsigned short OEBuffer::CompareBuffer(OEBuffer* other) {
  if (!other || !m_data || !other->m_data || m_size != other->m_size) return 0;
  return memcmp(m_data, other->m_data, m_size) == 0;
}

void OEBuffer::ClearBuffer(char c) {
  if (m_data) memset(m_data, c, m_size);
  m_size = m_offset;
  m_offset = 0;
}

OEBufferResult OEBuffer::AllocateTo(uint32_t n) {
  if (m_allocation >= n) return OEBUF_OK;
  uint32_t missing = n - m_allocation;
  return GrowBuffer(missing) < missing ? OEBUF_NOMEMORY : OEBUF_OK;
}

unsigned short OEBuffer::SetBufferOffset(uint32_t n) {
  if (n > m_size) return 0;
  m_offset = n;
  return 1;
}

// ---------------------------------------------------------------------------

OELargeBuffer::OELargeBuffer(uint32_t ceiling, uint32_t growBy)
    : OEBuffer(0, growBy), m_ceiling(ceiling > kMaxCeiling ? kMaxCeiling : ceiling) {}

namespace {
void SetError(int* error, int value) {
  if (error) *error = value;
}
}  // namespace

namespace {
// A regular file of a known size, read at once into a buffer of that size.
OEBuffer* ReadSized(FILE* f, uint32_t length, int* failure) {
  OEBuffer* buffer = new (std::nothrow) OELargeBuffer(length + 1);
  if (!buffer || buffer->AllocateTo(length + 1) != OEBUF_OK || !buffer->GetBufferPtr()) {
    *failure = ENOMEM;
    return buffer;
  }
  size_t got = length ? fread(buffer->GetBufferPtr(), 1, length, f) : 0;
  // A file that changed size under us: what was read is what there is.
  if (got != length && ferror(f)) *failure = EIO;
  if (got) buffer->SetBufferSize(static_cast<uint32_t>(got));
  return buffer;
}

// A pipe or a device: read to its end, the buffer growing a megabyte at a time.
OEBuffer* ReadStream(FILE* f, int* failure) {
  OEBuffer* buffer = new (std::nothrow) OELargeBuffer(OELargeBuffer::kMaxCeiling, 1u << 20);
  if (!buffer || !buffer->GetBufferPtr()) {
    *failure = ENOMEM;
    return buffer;
  }
  char chunk[OEBuffer::kChunk];
  size_t n;
  while ((n = fread(chunk, 1, sizeof chunk, f)) > 0) {
    OEBufferResult r = buffer->WriteLarge(chunk, static_cast<uint32_t>(n));
    if (r != OEBUF_OK) {
      *failure = r == OEBUF_OUTOFRANGE ? EFBIG : ENOMEM;
      return buffer;
    }
  }
  if (ferror(f)) *failure = EIO;
  buffer->SetBufferOffset(0);
  return buffer;
}
}  // namespace

OEBuffer* OEReadFileIntoBuffer(const char* path, int* error) {
  SetError(error, 0);
  FILE* f = path ? fopen(path, "rb") : nullptr;
  if (!f) {
    SetError(error, path ? errno : EINVAL);
    return nullptr;
  }
  OEBuffer* buffer = nullptr;
  int failure = 0;
  struct stat info;
  if (fstat(fileno(f), &info) != 0) {
    failure = errno ? errno : EIO;
  } else if (S_ISDIR(info.st_mode)) {
    failure = EISDIR;
  } else if (!S_ISREG(info.st_mode)) {
    buffer = ReadStream(f, &failure);
  } else if (static_cast<unsigned long long>(info.st_size) >= OELargeBuffer::kMaxCeiling) {
    failure = EFBIG;
  } else {
    buffer = ReadSized(f, static_cast<uint32_t>(info.st_size), &failure);
  }
  fclose(f);
  if (failure) {
    delete buffer;
    if (failure == ENOMEM) g_allocFailed = 1;
    SetError(error, failure);
    return nullptr;
  }
  return buffer;
}

