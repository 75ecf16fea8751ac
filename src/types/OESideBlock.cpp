#include "OESideBlock.h"

#include <cstdlib>
#include <mutex>
#include <new>
#include <unordered_map>

namespace {
struct SideTable {
  std::mutex lock;
  struct Entry {
    char* block;
    std::size_t size;
  };
  std::unordered_map<const void*, Entry> blocks;
};

// Never destroyed: values held in static objects may end after it would.
SideTable& Table() {
  static SideTable* table = new SideTable;
  return *table;
}
}  // namespace

char* OESideBlockFor(const void* owner, std::size_t size) {
  SideTable& table = Table();
  std::lock_guard<std::mutex> guard(table.lock);
  try {
    auto found = table.blocks.find(owner);
    if (found != table.blocks.end()) {
      if (found->second.size == size) return found->second.block;
      // Left by a value that ended without its destructor: not this one's.
      free(found->second.block);
      table.blocks.erase(found);
    }
    char* block = static_cast<char*>(calloc(size, 1));
    if (!block) return nullptr;
    try {
      table.blocks.emplace(owner, SideTable::Entry{block, size});
    } catch (const std::bad_alloc&) {
      free(block);
      return nullptr;
    }
    return block;
  } catch (const std::bad_alloc&) {
    return nullptr;
  }
}

void OEFreeSideBlock(const void* owner) {
  SideTable& table = Table();
  std::lock_guard<std::mutex> guard(table.lock);
  auto found = table.blocks.find(owner);
  if (found == table.blocks.end()) return;
  free(found->second.block);
  table.blocks.erase(found);
}
