#include "platform/work_apart.h"

#include <gtest/gtest.h>

#include <csignal>
#include <cstdlib>
#include <vector>

#include "support/faults.h"

namespace fotomill::platform {
namespace {

using Tell = std::function<void(int32_t)>;

TEST(WorkApart, LeavesBehindWhatItSharesAndNothingElse) {
  SharedBlock block;
  ASSERT_TRUE(block.Allocate(5000));
  int own = 1;
  std::vector<int32_t> told;
  const auto work = [&](const Tell& tell) {
    own = 2;
    for (int32_t i = 0; i < 3; ++i) tell(i);
    block.Bytes()[4999] = 7;
    return true;
  };
  EXPECT_EQ(RunApart(work, 10, [&](int32_t number) { told.push_back(number); }), ApartResult::Done);
  EXPECT_EQ(block.Bytes()[4999], 7);
  EXPECT_EQ(own, 1);
  EXPECT_EQ(told, (std::vector<int32_t>{0, 1, 2}));
}

TEST(WorkApart, SaysHowItEnded) {
  struct Row {
    const char* name;
    bool (*work)(const Tell&);
    ApartResult result;
  };
  const Row rows[] = {
      {"answers false", [](const Tell&) { return false; }, ApartResult::Failed},
      {"aborts", [](const Tell&) -> bool { std::abort(); }, ApartResult::Broken},
      {"violates memory", [](const Tell&) { return std::raise(SIGSEGV) == 0; }, ApartResult::Broken},
      {"never ends",
       [](const Tell&) {
         volatile bool ended = false;
         while (!ended) {
         }
         return true;
       },
       ApartResult::Broken},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(RunApart(row.work, 1, [](int32_t) {}), row.result);
  }
  EXPECT_EQ(test::ForEachFault([] { (void)RunApart([](const Tell&) { return true; }, 10, [](int32_t) {}); }), 1);
}

}  // namespace
}  // namespace fotomill::platform
