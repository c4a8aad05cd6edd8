// The dynamic storage pool: a growable byte area, addressed by offsets since
// the area moves when it grows. Everything stored is rounded up to a multiple
// of 4 bytes.
#pragma once

#include <cstdint>
#include <string_view>

namespace pc {

struct DynamicStorage {
  char* data;             // a permanent tracked block
  std::int32_t used;      // bytes in use, a multiple of 4
  std::int32_t capacity;  // bytes in the area
  std::int32_t growth;    // bytes added per growth step: the initial capacity
};

// A pool of `size` bytes growing by `size`, or nullptr on exhausted memory.
DynamicStorage* createPool(std::int32_t size);
// Offset of `n` fresh zeroed bytes (rounded up to a multiple of 4), or -1.
std::int32_t reserve(DynamicStorage* pool, std::int32_t n);
// Offset of a copy of `text` with a terminating NUL, or -1.
std::int32_t addString(DynamicStorage* pool, std::string_view text);
// Address of `offset`; nullptr for a negative offset (silently) or one at or
// beyond the used size (with a warning).
char* at(DynamicStorage* pool, std::int32_t offset);
std::int32_t usedSize(const DynamicStorage* pool);
// Reduces the capacity to the used size.
void shrink(DynamicStorage* pool);
// Releases the area and the record.
void destroyPool(DynamicStorage* pool);

}  // namespace pc
