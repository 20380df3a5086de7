#pragma once

#include <condition_variable>
#include <cstdint>
#include <functional>
#include <mutex>
#include <thread>
#include <vector>

namespace fotomill {

// Work on numbered items that goes on on several threads and looks from outside as if it were done one item after the other.
class OrderedRun {
 public:
  struct Steps {
    std::function<void(size_t item)> work;     // on any thread, several at a time; never throws
    std::function<void(size_t item)> deliver;  // on the calling thread, in order, once the item's work is done
    std::function<bool()> goesOn;              // on any thread, before an item is begun; false: no more are begun
    std::function<void()> tick;                // on the calling thread, a few times a second while it waits
    size_t ahead = 1024;                       // an item is not begun while so many before it wait to be delivered
  };

  explicit OrderedRun(Steps steps) : steps_(std::move(steps)) {}
  OrderedRun(const OrderedRun&) = delete;
  OrderedRun& operator=(const OrderedRun&) = delete;
  ~OrderedRun() { Stop(); }

  // Works on items 0 to count - 1, at most `threads` of them at a time, and delivers those that were begun. With one thread
  // all of it happens on the calling one.
  void Run(size_t count, uint32_t threads);

  // For the work on an item: waits until every item before it is delivered, then runs `step` on the calling thread of Run.
  // False when the run is given up; `step` has not run then.
  bool InTurn(size_t item, const std::function<void()>& step);

 private:
  enum class State : uint8_t { AtWork, Asking, Done };

  void Work();
  void DeliverAll();
  void Stop();

  Steps steps_;
  std::mutex mutex_;
  std::condition_variable delivered_;  // something for the calling thread
  std::condition_variable answered_;   // a step has run
  std::condition_variable caughtUp_;   // items may be begun again
  std::vector<State> states_;
  std::vector<std::thread> workers_;
  size_t begun_ = 0;                             // items before this one were begun
  size_t head_ = 0;                              // the item that is delivered next
  size_t working_ = 0;                           // workers that have not ended
  const std::function<void()>* step_ = nullptr;  // of the head item, while it asks
  bool threaded_ = false;
  bool stopped_ = false;
};

}  // namespace fotomill
