#include "platform/memory.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <cstring>
#include <thread>
#include <vector>

#include "platform/reserved_memory.h"
#include "support/faults.h"

namespace fotomill::platform {
namespace {

constexpr uint64_t kMega = uint64_t{1} << 20;
constexpr uint64_t kSizes[] = {0,         1,         1000,      kMega - 1,     kMega,
                               kMega + 1, 2 * kMega, 4 * kMega, 4 * kMega + 1, 9 * kMega};

bool AllAre(std::span<const uint8_t> bytes, uint8_t value) {
  return std::all_of(bytes.begin(), bytes.end(), [value](uint8_t byte) { return byte == value; });
}

TEST(MemoryBlock, StartsAsZerosHoweverOftenItWasUsed) {
  for (int round = 0; round < 3; ++round) {
    for (const uint64_t size : kSizes) {
      SCOPED_TRACE(size);
      MemoryBlock block, other;
      ASSERT_TRUE(block.Allocate(size) && other.Allocate(size, Fill::Unset));
      EXPECT_FALSE(block.Empty());
      EXPECT_EQ(block.Size(), size);
      EXPECT_TRUE(AllAre(block.Bytes(), 0));
      std::memset(other.Data(), 0xAA, size);
      std::memset(block.Data(), 0xFF, size);
      EXPECT_TRUE(AllAre(other.Bytes(), 0xAA));  // owners never share memory
    }
  }
}

TEST(MemoryBlock, ResizeKeepsTheContentsAndAddsZeros) {
  for (const uint64_t from : kSizes) {
    for (const uint64_t to : kSizes) {
      SCOPED_TRACE(std::to_string(from) + " to " + std::to_string(to));
      MemoryBlock block;
      ASSERT_TRUE(block.Allocate(from));
      std::memset(block.Data(), 7, from);
      ASSERT_TRUE(block.Resize(to));
      ASSERT_EQ(block.Size(), to);
      const uint64_t kept = std::min(from, to);
      EXPECT_TRUE(AllAre(block.Bytes().first(kept), 7));
      EXPECT_TRUE(AllAre(block.Bytes().subspan(kept), 0));
    }
  }
  MemoryBlock block;  // bytes removed by shrinking must not reappear
  ASSERT_TRUE(block.Allocate(8 * kMega));
  std::memset(block.Data(), 7, block.Size());
  ASSERT_TRUE(block.Resize(5 * kMega) && block.Resize(8 * kMega));
  EXPECT_TRUE(AllAre(block.Bytes().subspan(5 * kMega), 0));
}

TEST(MemoryBlock, FailsIfMemoryRunsOut) {
  for (const uint64_t size : {UINT64_MAX, UINT64_MAX / 2, UINT64_MAX - kMega, uint64_t{1} << 47}) {
    MemoryBlock block;
    ASSERT_TRUE(block.Allocate(3 * kMega));
    std::memset(block.Data(), 7, block.Size());
    EXPECT_FALSE(block.Resize(size));
    EXPECT_TRUE(block.Size() == 3 * kMega && AllAre(block.Bytes(), 7));
    EXPECT_FALSE(block.Allocate(size));
    EXPECT_TRUE(block.Empty());
    EXPECT_EQ(block.Size(), 0u);
  }
  EXPECT_EQ(test::ForEachFault([] {
              MemoryBlock block;
              const bool done = block.Allocate(5 * kMega) && block.Resize(4 * kMega) &&
                                block.Resize(20 * kMega) && block.Resize(10);
              EXPECT_EQ(done, faultCountdown > 0);
            }),
            4);
}

TEST(MemoryBlock, ManyThreadsShareThePool) {
  std::vector<std::thread> threads;
  std::atomic<int> faults{0};
  for (int t = 0; t < 4; ++t) {
    threads.emplace_back([t, &faults] {
      MemoryBlock held[3];
      for (unsigned i = 0; i < 120; ++i) {
        MemoryBlock& block = held[i % 3];
        const uint8_t mark = static_cast<uint8_t>(16 * (t + 1) + i % 3);
        if (!block.Empty() && !(block.Data()[0] == mark && block.Data()[block.Size() - 1] == mark))
          ++faults;
        const uint64_t size =
            kMega + (i * 7919u + static_cast<unsigned>(t) * 104729u) % (3 * kMega);
        if (!block.Allocate(size) || block.Data()[0] != 0 || block.Data()[size / 2] != 0 ||
            block.Data()[size - 1] != 0)
          ++faults;
        block.Data()[0] = block.Data()[size / 2] = block.Data()[size - 1] = mark;
        if (i % 40 == 0) TrimMemoryPool();
      }
    });
  }
  for (std::thread& thread : threads) thread.join();
  EXPECT_EQ(faults, 0);
}

TEST(ReservedMemory, CanExceedPhysicalMemoryAndFailsCleanly) {
  ReservedMemory room;
  constexpr uint64_t kSize = uint64_t{1} << 38;
  ASSERT_TRUE(room.Reserve(kSize));
  for (const uint64_t offset : {uint64_t{0}, kSize / 2 + 1, kSize - 8}) {
    EXPECT_EQ(room.Items<uint8_t>(offset, 8)[7], 0);
    room.Items<uint8_t>(offset, 8)[7] = 7;
  }
  EXPECT_FALSE(room.Reserve(UINT64_MAX / 4));
  EXPECT_EQ(room.Size(), kSize);
  EXPECT_EQ(room.Items<uint8_t>(0, 8)[7], 7);
}

#if defined(__SANITIZE_ADDRESS__)
TEST(MemoryBlockDeathTest, TheSanitizerSeesPooledBlocks) {
  MemoryBlock block;
  ASSERT_TRUE(block.Allocate(6 * kMega - 1));
  volatile uint8_t* data = block.Data();
  EXPECT_DEATH(data[block.Size() + 8] = 1, "AddressSanitizer");
  block.Free();
  EXPECT_DEATH(data[100] = 1, "AddressSanitizer");
}
#endif

}  // namespace
}  // namespace fotomill::platform
