#pragma once

#include <atomic>
#include <memory>

namespace fotomill {

// Asked by work now and then: whether its result is still wanted. Copies ask the same source, and
// may outlive it.
class StopToken {
 public:
  StopToken() = default;  // of no source: only the end of the program stops its work
  // Whether the source was stopped, or the program was asked to end (Ctrl-C, the system's request).
  bool Asked() const;

 private:
  friend class StopSource;
  explicit StopToken(std::shared_ptr<const std::atomic<bool>> stopped)
      : stopped_(std::move(stopped)) {}
  std::shared_ptr<const std::atomic<bool>> stopped_;
};

// Stops the work of those who hold its tokens; once stopped, it stays so. Copies are the same
// source.
class StopSource {
 public:
  // Asks for the end; whoever works notices it at its next look at the token. Any thread may call
  // both.
  void Stop() const { stopped_->store(true, std::memory_order_relaxed); }
  StopToken Token() const { return StopToken(stopped_); }  // lives on when the source has gone

 private:
  std::shared_ptr<std::atomic<bool>> stopped_ = std::make_shared<std::atomic<bool>>(false);
};

}  // namespace fotomill
