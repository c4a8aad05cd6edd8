// The tracked allocator: every block carries a 16-byte header (size, kind,
// serial) in front of the address handed out, so that a double release, a
// foreign pointer or a resize of the wrong kind of block is caught, and the
// bytes in use are counted per kind.
#pragma once

#include <cstddef>
#include <cstdint>

namespace pc {

enum class BlockKind : std::uint32_t {
  Permanent = 0x75A5A5A5u,  // long-lived table data ("data base memory")
  Temporary = 0x7C0DCAB4u,  // short-lived working data
  Released = 0x7D0ECBB5u,   // a block given back
};

// Address of `size` usable bytes, or nullptr (with a warning).
void* _Wmalloc(BlockKind kind, std::size_t size);
// Resizes a block of `kind`; a null `address` allocates. nullptr when the
// block cannot be resized: it then stays live and unchanged.
void* _Wrealloc(BlockKind kind, void* address, std::size_t size);
// 0, or -1 when `address` is not a live block (after the fatal message).
int _Wfree(void* address);

struct MemoryCounters {
  std::uint64_t bytesInUse;
  std::uint64_t permanentBytesInUse;
  std::uint32_t nextSerial;
  std::uint64_t permanentMaximum;
};

MemoryCounters memoryCounters();
// Sets the maximum for permanent memory and returns the previous one.
std::uint64_t setPermanentMaximum(std::uint64_t maximum);

// Test seam: a function asked before every C heap call; when it answers true
// the call is not made and counts as failed.
enum class HeapCall { Allocate, Resize };
using HeapFailureSeam = bool (*)(HeapCall call, std::size_t bytes);
// Installs `seam` (nullptr: the heap never fails on demand), returns the previous one.
HeapFailureSeam setHeapFailureSeam(HeapFailureSeam seam);

}  // namespace pc
