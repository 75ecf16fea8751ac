// Small blocks from the library's object pool (see OEDataObj::operator new):
// the blocks aggregates keep their fields in. Sizes up to 4096 bytes come
// from a pool of their own, in size classes 8 bytes apart; builds with
// AddressSanitizer use the heap.
#pragma once

#include <cstddef>
#include <cstdint>

class OEParseEngine;

void* OEPoolTake(std::size_t size) noexcept;
void OEPoolGive(void* p, std::size_t size) noexcept;

// The parse now reading on this thread (null when it ends). The pools project
// from its progress how much a tree will take, to choose their page size (see
// OEDataObj.cpp).
void OEPoolReading(const OEParseEngine* engine) noexcept;
