// Small blocks from the library's object pool (see OEDataObj::operator new):
// the blocks aggregates keep their fields in. Sizes up to 4096 bytes come
// from a pool of their own, in size classes 8 bytes apart; builds with
// AddressSanitizer use the heap.
#pragma once

#include <cstddef>

void* OEPoolTake(std::size_t size) noexcept;
void OEPoolGive(void* p, std::size_t size) noexcept;
