#include <gtest/gtest.h>

#include <atomic>
#include <chrono>
#include <condition_variable>
#include <mutex>
#include <new>
#include <stdexcept>
#include <thread>
#include <vector>

#include "core/workers/background_task.h"
#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"
#include "core/workers/latest_work.h"
#include "core/workers/ordered_run.h"
#include "core/workers/share_out.h"
#include "core/workers/worker_pool.h"
#include "platform/volumes.h"

namespace fotomill {
namespace {

using std::chrono::milliseconds;

// A gate that tasks wait at, counting them.
class Gate {
 public:
  void Pass() {
    std::unique_lock lock(mutex_);
    ++waiting_;
    changed_.notify_all();
    changed_.wait(lock, [this] { return open_; });
    --waiting_;
  }
  void Open() {
    const std::lock_guard lock(mutex_);
    open_ = true;
    changed_.notify_all();
  }
  // False if fewer than `count` arrive within some seconds.
  bool Await(int count) {
    std::unique_lock lock(mutex_);
    return changed_.wait_for(lock, milliseconds(5000), [&] { return waiting_ >= count; });
  }
  int Waiting() {
    const std::lock_guard lock(mutex_);
    return waiting_;
  }

 private:
  std::mutex mutex_;
  std::condition_variable changed_;
  int waiting_ = 0;
  bool open_ = false;
};

TEST(WorkerPool, ComputingTasksUseNoMoreThanAllCores) {
  std::atomic<int> now{0}, most{0}, done{0};
  {
    WorkerPool pool(3);
    for (int i = 0; i < 60; ++i) {
      ASSERT_TRUE(pool.Run(Lane::Compute, [&] {
        const int here = ++now;
        for (int seen = most; here > seen && !most.compare_exchange_weak(seen, here);) {
        }
        std::this_thread::sleep_for(milliseconds(1));
        --now;
        ++done;
      }));
    }
  }
  EXPECT_EQ(done, 60);
  EXPECT_EQ(most, 3);
}

TEST(WorkerPool, BlockingTasksDoNotOccupyCores) {
  Gate hanging, computing, urgent;
  std::atomic<int> computed{0};
  WorkerPool pool(2);
  for (int i = 0; i < 10; ++i) ASSERT_TRUE(pool.Run(Lane::Blocking, [&] { hanging.Pass(); }));
  // Two that wait for something slow and have released their cores.
  for (int i = 0; i < 2; ++i) {
    ASSERT_TRUE(pool.Run(Lane::Compute, [&] {
      const CoreRelease release;
      hanging.Pass();
    }));
  }
  EXPECT_TRUE(hanging.Await(12));
  for (int i = 0; i < 4; ++i) {
    ASSERT_TRUE(pool.Run(Lane::Compute, [&] {
      computing.Pass();
      ++computed;
    }));
  }
  EXPECT_TRUE(computing.Await(2));
  // Urgent tasks do not wait for a core.
  ASSERT_TRUE(pool.Run(Lane::Urgent, [&] { urgent.Pass(); }));
  EXPECT_TRUE(urgent.Await(1));
  EXPECT_EQ(computing.Waiting(), 2);
  urgent.Open();
  computing.Open();
  hanging.Open();
}

TEST(WorkerPool, AnExceptionEndsOneTaskOnly) {
  std::atomic<int> done{0}, quiet{0};
  {
    WorkerPool pool(1, [&] { ++quiet; });
    ASSERT_TRUE(pool.Run(Lane::Compute, [] { throw std::bad_alloc(); }));
    ASSERT_TRUE(pool.Run(Lane::Compute, [&] { ++done; }));
  }
  EXPECT_EQ(done, 1);
  EXPECT_GE(quiet, 1);
  EXPECT_EQ(Guarded([] { throw std::bad_alloc(); }), Status::MemoryAllocationError);
  EXPECT_EQ(Guarded([]() -> Status { throw std::length_error("too long"); }), Status::MemoryAllocationError);
  EXPECT_EQ(Guarded([] { return Status::DamagedFile; }), Status::DamagedFile);
}

TEST(ShareOut, UsesFreeCoresOnly) {
  // Alone, the work runs on all cores; while other tasks occupy the rest, on the calling thread.
  for (const bool busy : {false, true}) {
    SCOPED_TRACE(busy);
    Gate others;
    WorkerPool pool(4);
    if (busy) {
      for (int i = 0; i < 3; ++i) ASSERT_TRUE(pool.Run(Lane::Compute, [&] { others.Pass(); }));
      ASSERT_TRUE(others.Await(3));
    }
    std::mutex mutex;
    std::condition_variable changed;
    size_t here = 0, most = 0;
    std::atomic<int> parts{0};
    const auto part = [&](int32_t) {
      std::unique_lock lock(mutex);
      most = std::max(most, ++here);
      changed.notify_all();
      changed.wait_for(lock, milliseconds(busy ? 5 : 500), [&] { return most == 4; });
      --here;
      ++parts;
      return Status::Ok;
    };
    EXPECT_EQ(ShareOut(20, part, {}, pool), Status::Ok);
    EXPECT_EQ(parts, 20);
    EXPECT_EQ(most, busy ? 1u : 4u);
    others.Open();
  }
}

TEST(ShareOut, EndsWithTheFirstFailure) {
  WorkerPool pool(2);
  StopSource source;
  std::atomic<int> begun{0};
  const struct {
    const char* name;
    std::function<Status(int32_t)> part;
    Status status;
  } rows[] = {
      {"a status", [](int32_t part) { return part == 5 ? Status::DamagedFile : Status::Ok; }, Status::DamagedFile},
      {"no memory", [](int32_t part) -> Status { return part == 5 ? throw std::bad_alloc() : Status::Ok; }, Status::MemoryAllocationError},
      {"stopped",
       [&](int32_t part) {
         if (part == 5) source.Stop();
         return Status::Ok;
       },
       Status::FunctionCancelled},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    begun = 0;
    const auto part = [&](int32_t number) {
      ++begun;
      if (number > 5) std::this_thread::sleep_for(milliseconds(1));
      return row.part(number);
    };
    EXPECT_EQ(ShareOut(1000, part, source.Token(), pool), row.status);
    EXPECT_LT(begun, 1000);
  }
  EXPECT_EQ(ShareOut(0, [](int32_t) { return Status::DamagedFile; }, {}, pool), Status::Ok);
}

TEST(OrderedRun, ReportsLackOfMemoryAndContinues) {
  for (const uint32_t jobs : {1u, 4u}) {
    WorkerPool pool(2);
    std::vector<Status> delivered;
    {
      OrderedRun run({.work = [](size_t item) -> Status {
                        return item == 3 ? throw std::bad_alloc() : Status::Ok;
                      },
                      .deliver =
                          [&](size_t item, Status status) {
                            EXPECT_EQ(item, delivered.size());
                            delivered.push_back(status);
                          },
                      .goesOn = [] { return true; },
                      .tick = {},
                      .ahead = 5},
                     pool);
      run.Run(50, jobs);
    }
    ASSERT_EQ(delivered.size(), 50u);
    for (size_t i = 0; i < delivered.size(); ++i) EXPECT_EQ(delivered[i] != Status::Ok, i == 3);
  }
}

TEST(OrderedRun, WaitingForAnAnswerHoldsNoCore) {
  // The first item asks; the next ones wait for their turn. Other work continues meanwhile.
  WorkerPool pool(2);
  std::atomic<bool> othersDone = false;
  std::vector<size_t> turns;
  OrderedRun* run = nullptr;
  OrderedRun ordered({.work =
                          [&](size_t item) {
                            EXPECT_TRUE(run->InTurn(item, [&, item] {
                              turns.push_back(item);
                              if (item > 0) return;
                              Gate done;
                              for (int i = 0; i < 2; ++i)
                                ASSERT_TRUE(pool.Run(Lane::Compute, [&] { done.Pass(); }));
                              othersDone = done.Await(2);
                              done.Open();
                              while (done.Waiting() > 0) std::this_thread::yield();
                            }));
                            return Status::Ok;
                          },
                      .deliver = [](size_t, Status) {},
                      .goesOn = [] { return true; },
                      .tick = {}},
                     pool);
  run = &ordered;
  ordered.Run(6, 6);
  EXPECT_TRUE(othersDone);
  EXPECT_EQ(turns, (std::vector<size_t>{0, 1, 2, 3, 4, 5}));
}

TEST(LatestWork, DoesTheLatestRequests) {
  WorkerPool pool(2);
  Gate first;
  std::mutex mutex;
  std::vector<int> wanted, done;
  {
    LatestWork work(
        Lane::Compute, 1,
        [&]() -> LatestWork::Piece {
          const std::lock_guard lock(mutex);
          if (wanted.empty()) return {};
          const int piece = wanted.front();
          wanted.erase(wanted.begin());
          return [&, piece] {
            if (piece == 1) first.Pass();
            const std::lock_guard again(mutex);
            done.push_back(piece);
            if (piece == 4) throw std::bad_alloc();
          };
        },
        pool);
    const auto want = [&](std::vector<int> pieces) {
      {
        const std::lock_guard lock(mutex);
        wanted = std::move(pieces);
      }
      work.Look();
    };
    want({1, 2, 3});
    ASSERT_TRUE(first.Await(1));
    want({4, 5});
    first.Open();
    for (bool ended = false; !ended; std::this_thread::yield()) {
      const std::lock_guard lock(mutex);
      ended = done.size() == 3;
    }
  }
  EXPECT_EQ(done, (std::vector<int>{1, 4, 5}));
}

TEST(BackgroundTask, EndsWithItsOwnerAndReportsItsStatus) {
  std::atomic<int> ended{-1};
  std::atomic<bool> saw = false;
  {
    BackgroundTask task;
    task.Start(
        Lane::Blocking, [](const StopToken&) -> Status { throw std::bad_alloc(); },
        [&](Status status) { ended = StatusNumber(status); });
    task.Wait();
    EXPECT_EQ(ended, 6);
    EXPECT_FALSE(task.Running());
    task.Start(Lane::Compute, [&](const StopToken& stop) {
      while (!stop.Asked()) std::this_thread::yield();
      saw = true;
      return Status::Ok;
    });
    EXPECT_TRUE(task.Running());
  }
  EXPECT_TRUE(saw);
}

// Every folder but "/near" is on the network; queries are counted.
std::atomic<int> asked{0};
platform::Volume FarVolume(const std::string& path) {
  ++asked;
  platform::Volume volume;
  volume.kind =
      path.starts_with("/near") ? platform::DriveKind::Fixed : platform::DriveKind::Network;
  return volume;
}

TEST(FolderScope, ReleasesTheCoreForNetworkFiles) {
  platform::ReplaceVolumeFunction(FarVolume);
  Gate far, near;
  {
    WorkerPool pool(1);
    for (int i = 0; i < 3; ++i) {
      ASSERT_TRUE(pool.Run(Lane::Compute, [&] {
        const FolderScope folder("/far/a.bmp");
        far.Pass();
      }));
    }
    EXPECT_TRUE(far.Await(3));
    for (int i = 0; i < 2; ++i) {
      ASSERT_TRUE(pool.Run(Lane::Compute, [&] {
        const FolderScope folder("/near/a.bmp");
        EXPECT_TRUE(CoreRelease::HoldsCore());
        near.Pass();
      }));
    }
    EXPECT_TRUE(near.Await(1));
    std::this_thread::sleep_for(milliseconds(20));
    EXPECT_EQ(near.Waiting(), 1);
    near.Open();
    far.Open();
  }
  platform::ReplaceVolumeFunction(nullptr);
}

}  // namespace
}  // namespace fotomill
