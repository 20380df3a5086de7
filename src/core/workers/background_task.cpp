#include "core/workers/background_task.h"

#include <utility>

#include "core/workers/guarded.h"

namespace fotomill {

void BackgroundTask::Start(Lane lane, Work work, std::function<void(Status)> ended) {
  StopAndWait();
  auto state = std::make_shared<State>();
  state_ = state;
  const auto end = [ended = std::move(ended)](State& of, Status status) {
    if (ended) ended(status);
    const std::lock_guard lock(of.mutex);
    of.running = false;
    of.ended.notify_all();
  };
  const bool begun = WorkerPool::Shared().Run(lane, [state, work = std::move(work), end] {
    const Status status = Guarded([&] { return work(state->stop.Token()); });
    end(*state, status);
  });
  if (!begun) end(*state, Status::MemoryAllocationError);
}

void BackgroundTask::Stop() {
  if (state_ != nullptr) state_->stop.Stop();
}

void BackgroundTask::StopAndWait() {
  Stop();
  Wait();
}

void BackgroundTask::Wait() {
  if (state_ == nullptr) return;
  std::unique_lock lock(state_->mutex);
  state_->ended.wait(lock, [this] { return !state_->running; });
}

bool BackgroundTask::Running() const {
  if (state_ == nullptr) return false;
  const std::lock_guard lock(state_->mutex);
  return state_->running;
}

bool RunLoose(std::function<void()> work) {
  return WorkerPool::Shared().Run(Lane::Blocking, std::move(work));
}

}  // namespace fotomill
