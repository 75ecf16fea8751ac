// Growable byte buffer with a read/write position; whole OFX documents live in one.
#pragma once

#include <cstdint>

#include "ofxkit/types/OEString.h"

enum OEBufferResult : int32_t {
  OEBUF_OK = 0,
  OEBUF_OUTOFRANGE = -9996,
  OEBUF_NOMEMORY = -9997,
  OEBUF_NOBUFFER = -9998
};

class OEBuffer {
 public:
  static constexpr uint32_t kMaxBufferSize = 4000000;
  static constexpr uint32_t kChunk = 16384;

  explicit OEBuffer(uint32_t initialSize = 0, uint32_t growBy = 0);
  OEBuffer(const OEBuffer& other);  // copies the data
  OEBuffer& operator=(const OEBuffer& other);
  virtual ~OEBuffer();

  OEBufferResult Write(char c) { return WriteBytes(&c, 1); }
  OEBufferResult Write(const char* data, unsigned short n) { return WriteBytes(data, n); }
  OEBufferResult WriteLarge(const char* data, uint32_t n);
  OEBufferResult Write(const OEBuffer* source);
  OEBufferResult operator+=(char c) { return WriteBytes(&c, 1); }
  OEBufferResult operator+=(const char* text);
  OEBufferResult operator+=(const OEBuffer* source) { return Write(source); }

  OEBufferResult Read(char* dest);
  OEBufferResult Read(char* dest, unsigned short& got, unsigned short max);

  virtual char GetCh(int32_t index);
  unsigned short FindSubChar(int32_t start, char ch, int32_t* where);
  unsigned short GetData(OEString& out, int32_t start, unsigned short count);

  OEBufferResult CopyBuffer(OEBuffer* dest, uint32_t offset, uint32_t count);
  unsigned short CompareBuffer(OEBuffer* other);
  void ClearBuffer(char c);
  OEBufferResult AllocateTo(uint32_t n);

  uint32_t GetBufferSize() const { return m_size; }
  void SetBufferSize(uint32_t n) { m_size = n ? n : m_offset; }
  uint32_t GetBufferOffset() const { return m_offset; }
  unsigned short SetBufferOffset(uint32_t n);
  uint32_t GetBufferAllocation() const { return m_allocation; }
  char* GetBufferPtr() { return m_data; }
  const char* GetBufferPtr() const { return m_data; }
  char* GetSmallBufferPtr() { return m_allocation < 65535 ? m_data : nullptr; }

  // Writes n bytes at the offset; every writer goes through here.
  OEBufferResult WriteBytes(const char* data, uint32_t n);

 protected:
  virtual uint32_t GetMaxBufferSize() const { return kMaxBufferSize; }
  uint32_t GrowBuffer(uint32_t n);

 private:
  static char* LargeBlock(uint32_t n);

  char* m_data;
  uint32_t m_allocation;
  uint32_t m_growBy;
  uint32_t m_size;
  uint32_t m_offset;
};

// A buffer whose ceiling is chosen when it is made instead of the fixed
// 4,000,000 bytes, for documents of any size that positions can reach
// (kMaxCeiling bytes, the reach of GetCh's signed 32-bit index).
class OELargeBuffer : public OEBuffer {
 public:
  static constexpr uint32_t kMaxCeiling = 0x7FFFFFFF;

  // Writes must end below ceiling (capped at kMaxCeiling), as they must end
  // below 4,000,000 in a plain buffer.
  explicit OELargeBuffer(uint32_t ceiling, uint32_t growBy = 0);

 protected:
  uint32_t GetMaxBufferSize() const override { return m_ceiling; }

 private:
  uint32_t m_ceiling;
};

// Reads a whole file into a new buffer sized for it (ceiling the file's size
// plus one), ready to parse: offset 0, size the file's size. A pipe or a
// device is read to its end. Answers null when it cannot, with *error (when
// given) set to the errno value: the file's own error, EISDIR for a
// directory, EFBIG for a file beyond OELargeBuffer::kMaxCeiling, ENOMEM when
// the memory cannot be had, EIO for a failed read.
OEBuffer* OEReadFileIntoBuffer(const char* path, int* error = nullptr);

