#include "platform/work_apart.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string>
#include <string_view>
#include <vector>

#include "platform/clock.h"
#include "platform/files.h"
#include "support/child.h"
#include "support/faults.h"
#include "support/files.h"

// The tasks are registered in the test programs' main function.
namespace fotomill::platform {
namespace {

std::span<const uint8_t> Bytes(std::string_view text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

TEST(WorkApart, ReturnsItsReplyAndStaysForTheNextTask) {
  std::vector<int32_t> processes;
  for (const char* text : {"a first input", "another one"}) {
    SharedBlock block;
    ASSERT_TRUE(block.Allocate(5000));
    std::vector<int32_t> told;
    const ApartOrder order{
        .task = "echo", .request = Bytes("abc"), .input = Bytes(text), .reply = block};
    ASSERT_EQ(RunApart(order, [&](int32_t number) { told.push_back(number); }), ApartResult::Done);
    ASSERT_EQ(told.size(), 2u);
    EXPECT_EQ(told[1], 3);
    EXPECT_EQ(std::string_view(reinterpret_cast<const char*>(block.Bytes().data())), text);
    processes.push_back(told[0]);
  }
  EXPECT_EQ(processes[0], processes[1]);
  EXPECT_TRUE(test::HasChildren());
  EndIdleProcesses();
  EXPECT_FALSE(test::HasChildren());
}

TEST(WorkApart, ReportsItsResult) {
  const test::TemporaryFolder folder;
  const std::string path = folder.Path("made");
  const struct {
    const char* task;
    ApartResult result;
  } rows[] = {
      {"answers false", ApartResult::Failed},   {"there is none", ApartResult::Failed}, {"aborts", ApartResult::Broken},
      {"violates memory", ApartResult::Broken}, {"exits", ApartResult::Broken},         {"never ends", ApartResult::Broken},
#ifndef __SANITIZE_ADDRESS__
      {"takes memory", ApartResult::Failed},
#endif
      {"writes a file", ApartResult::Broken},   {"echo", ApartResult::Done},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.task);
    SharedBlock block;
    ASSERT_TRUE(block.Allocate(10));
    const ApartOrder order{.task = row.task,
                           .request = Bytes(path),
                           .reply = block,
                           .seconds = 1,
                           .memory = 256 << 20};
    EXPECT_EQ(RunApart(order, [](int32_t) {}), row.result);
  }
  EXPECT_EQ(FactsOf(path).size, 0u);
  EndIdleProcesses();
  EXPECT_FALSE(test::HasChildren());
}

TEST(WorkApart, EndsWhenCanceled) {
  SharedBlock block;
  ASSERT_TRUE(block.Allocate(10));
  const double begun = MonotonicSeconds();
  const ApartOrder order{.task = "never ends", .reply = block, .goesOn = [&] {
                           return MonotonicSeconds() < begun + 0.2;
                         }};
  EXPECT_EQ(RunApart(order, [](int32_t) {}), ApartResult::Stopped);
  EXPECT_LT(MonotonicSeconds(), begun + 1);
  EXPECT_FALSE(test::HasChildren());
}

TEST(WorkApart, FailsToStartWithoutResources) {
  SharedBlock block;
  ASSERT_TRUE(block.Allocate(10));
  const int64_t faults = test::ForEachFault([&] {
    const bool planned = faultCountdown > 0;
    const ApartResult result =
        RunApart({.task = "echo", .input = Bytes("in"), .reply = block}, [](int32_t) {});
    EXPECT_EQ(result, planned && faultCountdown <= 0 ? ApartResult::NotStarted : ApartResult::Done);
    EndIdleProcesses();
  });
  EXPECT_EQ(faults, 2);
}

}  // namespace
}  // namespace fotomill::platform
