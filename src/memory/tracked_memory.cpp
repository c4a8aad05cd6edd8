#include "memory/tracked_memory.h"

#include <cstdio>
#include <cstdlib>
#include <cstring>
#include <deque>
#include <optional>
#include <new>
#include <string>
#include <unordered_map>
#include <unordered_set>

#include "env/diagnostic_channels.h"

namespace pc {

namespace {

struct BlockHeader {
  std::uint64_t size;
  std::uint32_t kind;
  std::uint32_t serial;
};
static_assert(sizeof(BlockHeader) == 16, "the block header is 16 bytes");

constexpr std::size_t headerSize = sizeof(BlockHeader);
// Permanent blocks below this size are never refused by the maximum.
constexpr std::size_t smallBlockLimit = 1025;

MemoryCounters counters{0, 0, 0, 4294967295ull};
HeapFailureSeam heapSeam = nullptr;

// The C heap reuses a released header at once, so the blocks are also known
// by address: the live ones, and the most recent released ones with their
// serials. A foreign or stale pointer is then recognised without reading
// memory that is not ours.
constexpr std::size_t releasedMemory = 4096;
std::unordered_set<const void*>& liveBlocks() {
  static std::unordered_set<const void*> blocks;
  return blocks;
}
struct ReleasedBlocks {
  std::unordered_map<const void*, std::uint32_t> serials;
  std::deque<const void*> order;
};
ReleasedBlocks& releasedBlocks() {
  static ReleasedBlocks blocks;
  return blocks;
}

bool registerLive(const void* address) {
  try {
    liveBlocks().insert(address);
    releasedBlocks().serials.erase(address);  // the heap reused it
    return true;
  } catch (const std::bad_alloc&) {
    return false;
  }
}

void registerReleased(const void* address, std::uint32_t serial) {
  liveBlocks().erase(address);
  ReleasedBlocks& released = releasedBlocks();
  try {
    if (released.serials.insert_or_assign(address, serial).second) released.order.push_back(address);
    while (released.order.size() > releasedMemory) {
      released.serials.erase(released.order.front());
      released.order.pop_front();
    }
  } catch (const std::bad_alloc&) {
    // Forgetting a released block only weakens the misuse report.
  }
}

std::optional<std::uint32_t> releasedSerial(const void* address) {
  const auto& serials = releasedBlocks().serials;
  const auto it = serials.find(address);
  if (it == serials.end()) return std::nullopt;
  return it->second;
}

bool seamRefuses(HeapCall call, std::size_t bytes) { return heapSeam != nullptr && heapSeam(call, bytes); }

void* heapAllocate(std::size_t bytes) { return seamRefuses(HeapCall::Allocate, bytes) ? nullptr : std::malloc(bytes); }

void* heapResize(void* area, std::size_t bytes) {
  return seamRefuses(HeapCall::Resize, bytes) ? nullptr : std::realloc(area, bytes);
}

BlockHeader* headerOf(void* address) { return static_cast<BlockHeader*>(address) - 1; }

std::string format(const char* pattern, unsigned long long a, unsigned long long b) {
  char text[160];
  std::snprintf(text, sizeof text, pattern, a, b);
  return text;
}

// True when `size` more permanent bytes would reach the maximum.
bool reachesMaximum(std::uint64_t inUse, std::uint64_t size) {
  return inUse >= counters.permanentMaximum || size >= counters.permanentMaximum - inUse;
}

void addInUse(BlockKind kind, std::uint64_t size) {
  counters.bytesInUse += size;
  if (kind == BlockKind::Permanent) counters.permanentBytesInUse += size;
}

void subtractInUse(BlockKind kind, std::uint64_t size) {
  counters.bytesInUse -= size;
  if (kind == BlockKind::Permanent) counters.permanentBytesInUse -= size;
}

const char* reallocMisuse(std::uint32_t kind) {
  switch (kind) {
    case static_cast<std::uint32_t>(BlockKind::Permanent):
      return "Trying to reallocp permanent allocated memory#%u";
    case static_cast<std::uint32_t>(BlockKind::Temporary):
      return "Trying to reallocp temporary allocated memory#%u";
    case static_cast<std::uint32_t>(BlockKind::Released):
      return "Trying to reallocp previously freed memory #%u";
    default:
      return "Trying to reallocp unallocated or corrupt memory #%u";
  }
}

}  // namespace

void* _Wmalloc(BlockKind kind, std::size_t size) {
  if (kind == BlockKind::Permanent && size >= smallBlockLimit &&
      reachesMaximum(counters.permanentBytesInUse, size)) {
    warning(format("_Wmalloc: allocating %llu bytes would exceed maximum of %llu", size, counters.permanentMaximum));
    return nullptr;
  }
  auto* header = static_cast<BlockHeader*>(size <= SIZE_MAX - headerSize ? heapAllocate(size + headerSize) : nullptr);
  if (header != nullptr && !registerLive(header + 1)) {
    std::free(header);
    header = nullptr;
  }
  if (header == nullptr) {
    warning(format("_Wmalloc: unable to allocate %llu bytes", size, 0));
    return nullptr;
  }
  header->size = size;
  header->kind = static_cast<std::uint32_t>(kind);
  header->serial = counters.nextSerial++;
  addInUse(kind, size);
  return header + 1;
}

void* _Wrealloc(BlockKind kind, void* address, std::size_t size) {
  if (address == nullptr) return _Wmalloc(kind, size);
  const bool live = liveBlocks().count(address) != 0;
  const std::optional<std::uint32_t> released = live ? std::nullopt : releasedSerial(address);
  BlockHeader* header = headerOf(address);
  if (!live || header->kind != static_cast<std::uint32_t>(kind)) {
    char text[96];
    if (live) {
      std::snprintf(text, sizeof text, reallocMisuse(header->kind), header->serial);
    } else if (released) {
      std::snprintf(text, sizeof text, reallocMisuse(static_cast<std::uint32_t>(BlockKind::Released)), *released);
    } else {
      std::snprintf(text, sizeof text, "Trying to reallocp unallocated or corrupt memory #-1");
    }
    fatal(text);
    return nullptr;
  }
  const std::uint64_t oldSize = header->size;
  if (kind == BlockKind::Permanent && size > oldSize && size >= smallBlockLimit &&
      reachesMaximum(counters.permanentBytesInUse - oldSize, size)) {
    return nullptr;
  }
  BlockHeader* moved = nullptr;
  if (size <= SIZE_MAX - headerSize) {
    header->kind = static_cast<std::uint32_t>(BlockKind::Released);
    moved = static_cast<BlockHeader*>(heapResize(header, size + headerSize));
    if (moved == nullptr) {
      // The heap could not resize in place or move: copy into a new area and
      // give the old one back.
      moved = static_cast<BlockHeader*>(heapAllocate(size + headerSize));
      if (moved != nullptr) {
        std::memcpy(moved, header, headerSize + (size < oldSize ? size : oldSize));
        std::free(header);
      }
    }
  }
  if (moved != nullptr && moved != header) {
    // The old address is stale now: a later use of it is a use of freed memory.
    registerReleased(address, moved->serial);
    registerLive(moved + 1);
  }
  if (moved == nullptr) {
    header->kind = static_cast<std::uint32_t>(kind);  // still the caller's block, unchanged
    warning(format("_Wrealloc: unable to increase size from %llu to %llu.", oldSize, size));
    return nullptr;
  }
  moved->size = size;
  moved->kind = static_cast<std::uint32_t>(kind);
  subtractInUse(kind, oldSize);
  addInUse(kind, size);
  return moved + 1;
}

int _Wfree(void* address) {
  const bool live = address != nullptr && liveBlocks().count(address) != 0;
  BlockHeader* header = live ? headerOf(address) : nullptr;
  if (header != nullptr && (header->kind == static_cast<std::uint32_t>(BlockKind::Permanent) ||
                            header->kind == static_cast<std::uint32_t>(BlockKind::Temporary))) {
    subtractInUse(static_cast<BlockKind>(header->kind), header->size);
  } else {
    const bool released = !live && address != nullptr && releasedSerial(address).has_value();
    fatal(released ? "Trying to free previously freed memory" : "Trying to free unallocated or corrupt memory");
    return -1;
  }
  header->kind = static_cast<std::uint32_t>(BlockKind::Released);
  registerReleased(address, header->serial);
  std::free(header);
  return 0;
}

MemoryCounters memoryCounters() { return counters; }

std::uint64_t setPermanentMaximum(std::uint64_t maximum) {
  const std::uint64_t previous = counters.permanentMaximum;
  counters.permanentMaximum = maximum;
  return previous;
}

HeapFailureSeam setHeapFailureSeam(HeapFailureSeam seam) {
  const HeapFailureSeam previous = heapSeam;
  heapSeam = seam;
  return previous;
}

}  // namespace pc
