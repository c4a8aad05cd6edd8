// Tests of the tracked allocator and the dynamic storage pools: the limits,
// the misuse reports, heap failures made on demand, and the pool offsets and
// growth steps. Messages are captured by replacing the channel handlers.
#include <gtest/gtest.h>

#include <cstring>
#include <string>
#include <vector>

#include "env/diagnostic_channels.h"
#include "support/platform_conventions.h"
#include "memory/dynamic_storage.h"
#include "memory/tracked_memory.h"

namespace pc {
namespace {

using Lines = std::vector<std::string>;

struct Captured {
  Lines warnings, fatals;
  std::vector<std::pair<HeapCall, std::size_t>> heapCalls;
  int failCalls = 0;  // heap calls to refuse, from the next one on
} captured;

class MemoryTest : public ::testing::Test {
 protected:
  MemoryTest() {
    captured = {};
    setWarningHandler([](const char* m) { captured.warnings.emplace_back(m); });
    setFatalHandler([](const char* m) { captured.fatals.emplace_back(m); });
    setHeapFailureSeam([](HeapCall call, std::size_t bytes) {
      captured.heapCalls.emplace_back(call, bytes);
      if (captured.failCalls == 0) return false;
      --captured.failCalls;
      return true;
    });
    savedMaximum_ = setPermanentMaximum(4294967295ull);
  }
  ~MemoryTest() override {
    setPermanentMaximum(savedMaximum_);
    setHeapFailureSeam(nullptr);
    setWarningHandler(nullptr);
    setFatalHandler(nullptr);
  }

 private:
  std::uint64_t savedMaximum_;
};

TEST_F(MemoryTest, CountersSerialsAndThePermanentMaximum) {
  const MemoryCounters before = memoryCounters();
  void* permanent = _Wmalloc(BlockKind::Permanent, 100);
  void* temporary = _Wmalloc(BlockKind::Temporary, 40);
  ASSERT_NE(permanent, nullptr);
  ASSERT_NE(temporary, nullptr);
  MemoryCounters now = memoryCounters();
  EXPECT_EQ(now.bytesInUse - before.bytesInUse, 140u);
  EXPECT_EQ(now.permanentBytesInUse - before.permanentBytesInUse, 100u);
  EXPECT_EQ(now.nextSerial - before.nextSerial, 2u);

  // Small permanent blocks pass even a maximum already reached; from 1025
  // bytes on, reaching the maximum refuses.
  setPermanentMaximum(now.permanentBytesInUse);
  void* small = _Wmalloc(BlockKind::Permanent, 1024);
  EXPECT_NE(small, nullptr);
  now = memoryCounters();
  setPermanentMaximum(now.permanentBytesInUse + 1025);
  EXPECT_EQ(_Wmalloc(BlockKind::Permanent, 1025), nullptr);
  ASSERT_EQ(captured.warnings.size(), 1u);
  EXPECT_EQ(captured.warnings[0], "_Wmalloc: allocating 1025 bytes would exceed maximum of " +
                                      std::to_string(now.permanentBytesInUse + 1025));
  setPermanentMaximum(now.permanentBytesInUse + 1026);
  void* large = _Wmalloc(BlockKind::Permanent, 1025);
  EXPECT_NE(large, nullptr);
  // Temporary blocks are never measured against it.
  void* bigTemporary = _Wmalloc(BlockKind::Temporary, 4096);
  EXPECT_NE(bigTemporary, nullptr);

  // Growing a permanent block to reach the maximum is refused silently, and
  // the block is unchanged.
  std::memset(large, 'q', 1025);
  EXPECT_EQ(_Wrealloc(BlockKind::Permanent, large, 2000), nullptr);
  EXPECT_EQ(static_cast<char*>(large)[1024], 'q');
  EXPECT_EQ(captured.warnings.size(), 1u);

  // Sizes above 32 bits are printed in full.
  setPermanentMaximum(4294967295ull);
  EXPECT_EQ(_Wmalloc(BlockKind::Permanent, 4294967296ull), nullptr);
  EXPECT_EQ(captured.warnings.back(), "_Wmalloc: allocating 4294967296 bytes would exceed maximum of 4294967295");

  for (void* block : {permanent, temporary, small, large, bigTemporary}) EXPECT_EQ(_Wfree(block), 0);
  now = memoryCounters();
  EXPECT_EQ(now.bytesInUse, before.bytesInUse);
  EXPECT_EQ(now.permanentBytesInUse, before.permanentBytesInUse);
  EXPECT_TRUE(captured.fatals.empty());
}

TEST_F(MemoryTest, MisuseIsFatalWithTheBlockSerial) {
  const std::uint32_t serial = memoryCounters().nextSerial;
  void* temporary = _Wmalloc(BlockKind::Temporary, 16);
  void* permanent = _Wmalloc(BlockKind::Permanent, 16);
  EXPECT_EQ(_Wrealloc(BlockKind::Permanent, temporary, 32), nullptr);
  EXPECT_EQ(_Wrealloc(BlockKind::Temporary, permanent, 32), nullptr);
  // Both blocks survive the refused resize.
  EXPECT_EQ(_Wfree(temporary), 0);
  EXPECT_EQ(_Wrealloc(BlockKind::Permanent, temporary, 32), nullptr);
  EXPECT_EQ(_Wfree(temporary), -1);
  int local = 0;
  EXPECT_EQ(_Wfree(&local), -1);
  EXPECT_EQ(_Wfree(nullptr), -1);
  EXPECT_EQ(_Wrealloc(BlockKind::Temporary, &local, 8), nullptr);
  EXPECT_EQ(_Wfree(permanent), 0);
  EXPECT_EQ(captured.fatals,
            (Lines{"Trying to reallocp temporary allocated memory#" + std::to_string(serial),
                   "Trying to reallocp permanent allocated memory#" + std::to_string(serial + 1),
                   "Trying to reallocp previously freed memory #" + std::to_string(serial),
                   "Trying to free previously freed memory", "Trying to free unallocated or corrupt memory",
                   "Trying to free unallocated or corrupt memory",
                   "Trying to reallocp unallocated or corrupt memory #-1"}));
}

TEST(MemoryDeathTest, DoubleReleaseEndsTheProcessByDefault) {
  void* block = _Wmalloc(BlockKind::Permanent, 8);
  ASSERT_EQ(_Wfree(block), 0);
  EXPECT_EXIT(_Wfree(block), ::testing::ExitedWithCode(test::platformConventions().fatalExitStatus), "^Trying to free previously freed memory\n$");
}

TEST_F(MemoryTest, HeapFailuresKeepTheBlockAndWarnExactly) {
  captured.failCalls = 1;
  EXPECT_EQ(_Wmalloc(BlockKind::Temporary, 5000000000ull), nullptr);
  EXPECT_EQ(captured.warnings, Lines{"_Wmalloc: unable to allocate 5000000000 bytes"});

  char* block = static_cast<char*>(_Wmalloc(BlockKind::Temporary, 64));
  ASSERT_NE(block, nullptr);
  std::memset(block, 'k', 64);
  const MemoryCounters before = memoryCounters();
  // Neither a resize nor a fresh area: the block stays live, unchanged.
  captured.failCalls = 2;
  EXPECT_EQ(_Wrealloc(BlockKind::Temporary, block, 128), nullptr);
  EXPECT_EQ(captured.warnings.back(), "_Wrealloc: unable to increase size from 64 to 128.");
  EXPECT_EQ(block[63], 'k');
  EXPECT_EQ(memoryCounters().bytesInUse, before.bytesInUse);

  // The resize fails but a fresh area is found: contents copied, old address stale.
  captured.failCalls = 1;
  char* moved = static_cast<char*>(_Wrealloc(BlockKind::Temporary, block, 128));
  ASSERT_NE(moved, nullptr);
  EXPECT_EQ(std::string(moved, 64), std::string(64, 'k'));
  EXPECT_EQ(memoryCounters().bytesInUse, before.bytesInUse + 64);
  const auto calls = captured.heapCalls.size();
  EXPECT_EQ(captured.heapCalls[calls - 2], std::make_pair(HeapCall::Resize, std::size_t{144}));
  EXPECT_EQ(captured.heapCalls[calls - 1], std::make_pair(HeapCall::Allocate, std::size_t{144}));
  if (moved != block) {
    EXPECT_EQ(_Wfree(block), -1);
    EXPECT_EQ(captured.fatals, Lines{"Trying to free previously freed memory"});
  }
  EXPECT_EQ(_Wfree(moved), 0);
  EXPECT_EQ(captured.warnings.size(), 2u);
}

TEST_F(MemoryTest, PoolOffsetsGrowthAndAccess) {
  DynamicStorage* pool = createPool(128);
  ASSERT_NE(pool, nullptr);
  EXPECT_EQ(reserve(pool, 5), 0);
  EXPECT_EQ(usedSize(pool), 8);
  EXPECT_EQ(reserve(pool, 1), 8);
  EXPECT_EQ(addString(pool, "abc"), 12);
  EXPECT_STREQ(at(pool, 12), "abc");
  EXPECT_EQ(at(pool, -1), nullptr);
  EXPECT_TRUE(captured.warnings.empty());
  EXPECT_EQ(at(pool, usedSize(pool)), nullptr);
  EXPECT_EQ(captured.warnings, Lines{"Dynamic storage: trying to access unallocated memory\n"});
  shrink(pool);
  EXPECT_EQ(pool->capacity, 16);
  EXPECT_EQ(reserve(pool, 4), 16);
  EXPECT_EQ(pool->capacity, 144);
  destroyPool(pool);

  // 148 bytes needing 300: two growth steps of 148.
  pool = createPool(148);
  captured.heapCalls.clear();
  EXPECT_EQ(reserve(pool, 300), 0);
  EXPECT_EQ(pool->capacity, 444);
  EXPECT_EQ(pool->growth, 148);
  EXPECT_EQ(captured.heapCalls, (std::vector<std::pair<HeapCall, std::size_t>>{{HeapCall::Resize, 296 + 16},
                                                                               {HeapCall::Resize, 444 + 16}}));
  destroyPool(pool);
  EXPECT_TRUE(captured.fatals.empty());
}

TEST_F(MemoryTest, PoolsReportExhaustedMemory) {
  // Record obtained, area refused.
  setHeapFailureSeam([](HeapCall, std::size_t bytes) { return bytes == 256 + 16; });
  EXPECT_EQ(createPool(256), nullptr);
  EXPECT_EQ(captured.warnings, (Lines{"_Wmalloc: unable to allocate 256 bytes", "Dynamic storage: no more memory\n"}));
  EXPECT_TRUE(captured.fatals.empty());  // the record was released as a live block

  captured.warnings.clear();
  DynamicStorage* pool = createPool(128);
  ASSERT_NE(pool, nullptr);
  ASSERT_EQ(reserve(pool, 100), 0);
  setHeapFailureSeam([](HeapCall, std::size_t) { return true; });
  EXPECT_EQ(reserve(pool, 100), -1);
  EXPECT_EQ(captured.warnings, (Lines{"_Wrealloc: unable to increase size from 128 to 256.",
                                      "Dynamic storage: no more memory, could not expand from 128 to 256 bytes\n"}));
  EXPECT_EQ(usedSize(pool), 100);
  EXPECT_EQ(pool->capacity, 128);
  setHeapFailureSeam(nullptr);
  EXPECT_EQ(reserve(pool, 100), 100);
  destroyPool(pool);
  EXPECT_TRUE(captured.fatals.empty());
}

}  // namespace
}  // namespace pc
