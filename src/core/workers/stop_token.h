#pragma once

#include <atomic>
#include <memory>

namespace fotomill {

// Lets running work check whether its result is still needed. Copies share the same source and may
// outlive it.
class StopToken {
 public:
  StopToken() = default;  // no source: stopped only when the program ends
  // Whether the source was stopped or the program was asked to end (Ctrl-C, system shutdown).
  bool Asked() const;

 private:
  friend class StopSource;
  explicit StopToken(std::shared_ptr<const std::atomic<bool>> stopped)
      : stopped_(std::move(stopped)) {}
  std::shared_ptr<const std::atomic<bool>> stopped_;
};

// Stops work that holds its tokens,
// permanently. Copies share the same state.
class StopSource {
 public:
  // Requests a stop; workers notice at their next check of the token. Both
  // functions are thread-safe.
  void Stop() const { stopped_->store(true, std::memory_order_relaxed); }
  StopToken Token() const { return StopToken(stopped_); }  // may outlive the source

 private:
  std::shared_ptr<std::atomic<bool>> stopped_ = std::make_shared<std::atomic<bool>>(false);
};

}  // namespace fotomill
