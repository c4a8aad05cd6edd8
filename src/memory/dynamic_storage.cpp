#include "memory/dynamic_storage.h"

#include <cstdio>
#include <cstring>
#include <limits>

#include "env/diagnostic_channels.h"
#include "memory/tracked_memory.h"

namespace pc {

namespace {

constexpr std::int64_t poolLimit = std::numeric_limits<std::int32_t>::max();

// Grows the area by growth steps until `needed` bytes fit; false (with the
// warning) when a step fails or the area would pass what an offset can hold.
bool growTo(DynamicStorage* pool, std::int64_t needed) {
  while (needed > pool->capacity) {
    const std::int64_t next = static_cast<std::int64_t>(pool->capacity) + pool->growth;
    void* area = next <= poolLimit && pool->growth > 0
                     ? _Wrealloc(BlockKind::Permanent, pool->data, static_cast<std::size_t>(next))
                     : nullptr;
    if (area == nullptr) {
      char text[128];
      std::snprintf(text, sizeof text, "Dynamic storage: no more memory, could not expand from %d to %lld bytes\n",
                    pool->capacity, static_cast<long long>(next));
      warning(text);
      return false;
    }
    pool->data = static_cast<char*>(area);
    pool->capacity = static_cast<std::int32_t>(next);
  }
  return true;
}

}  // namespace

DynamicStorage* createPool(std::int32_t size) {
  if (size < 0) size = 0;
  auto* pool = static_cast<DynamicStorage*>(_Wmalloc(BlockKind::Permanent, sizeof(DynamicStorage)));
  if (pool == nullptr) return nullptr;
  void* area = _Wmalloc(BlockKind::Permanent, static_cast<std::size_t>(size));
  if (area == nullptr) {
    _Wfree(pool);
    warning("Dynamic storage: no more memory\n");
    return nullptr;
  }
  *pool = DynamicStorage{static_cast<char*>(area), 0, size, size};
  return pool;
}

std::int32_t reserve(DynamicStorage* pool, std::int32_t n) {
  if (pool == nullptr || n < 0) return -1;
  const std::int64_t rounded = (static_cast<std::int64_t>(n) + 3) / 4 * 4;
  const std::int64_t needed = pool->used + rounded;
  if (!growTo(pool, needed)) return -1;
  const std::int32_t offset = pool->used;
  // Zeroed, so that every stored text is followed by NUL bytes up to the next item.
  std::memset(pool->data + offset, 0, static_cast<std::size_t>(rounded));
  pool->used = static_cast<std::int32_t>(needed);
  return offset;
}

std::int32_t addString(DynamicStorage* pool, std::string_view text) {
  if (text.size() >= static_cast<std::size_t>(poolLimit)) {
    warning("Dynamic storage: no more memory\n");
    return -1;
  }
  const std::int32_t offset = reserve(pool, static_cast<std::int32_t>(text.size() + 1));
  if (offset < 0) return -1;
  if (!text.empty()) std::memcpy(pool->data + offset, text.data(), text.size());
  pool->data[offset + static_cast<std::int32_t>(text.size())] = '\0';
  return offset;
}

char* at(DynamicStorage* pool, std::int32_t offset) {
  if (pool == nullptr || offset < 0) return nullptr;
  if (offset < pool->used) return pool->data + offset;
  warning("Dynamic storage: trying to access unallocated memory\n");
  return nullptr;
}

std::int32_t usedSize(const DynamicStorage* pool) { return pool != nullptr ? pool->used : 0; }

void shrink(DynamicStorage* pool) {
  if (pool == nullptr || pool->used == pool->capacity) return;
  void* area = _Wrealloc(BlockKind::Permanent, pool->data, static_cast<std::size_t>(pool->used));
  if (area == nullptr) return;  // the larger area stays usable
  pool->data = static_cast<char*>(area);
  pool->capacity = pool->used;
}

void destroyPool(DynamicStorage* pool) {
  if (pool == nullptr) return;
  _Wfree(pool->data);
  _Wfree(pool);
}

}  // namespace pc
