// Blocks that a value makes only on request (the text of an amount, the
// lock buffer of a date), kept in a table beside the values rather than
// behind a pointer in each: a parsed statement holds many thousand amounts
// and dates, and almost none of them ever makes one. The table is keyed by
// the value's address, so a value that has a block frees it when it ends.
#pragma once

#include <cstddef>

// The block of owner, made with size zeroed bytes when it has none of that
// size yet; null when memory is short.
char* OESideBlockFor(const void* owner, std::size_t size);
// Frees owner's block, when it has one.
void OEFreeSideBlock(const void* owner);
