#pragma once

#include <functional>
#include <memory>
#include <string>
#include <thread>

namespace fotomill::platform {

// A later start that hands its message over and waits for it to be taken. Goes with its last owner.
class LaterStart {
 public:
  virtual ~LaterStart() = default;
  // What the later start was given, byte for byte.
  virtual const std::string& Message() const = 0;
  // Lets the later start end. False when it has given up waiting: it continues by itself, and its
  // message is to be dropped.
  virtual bool Accept() = 0;
};

// Has one running program of the user stand for all those of a name: later starts hand over what
// they were started with. What an earlier program left behind when it was killed, one that hangs,
// and files of other users never are in the way.
class FirstStart {
 public:
  // Which of the programs of a name this one is.
  enum class Standing {
    First,       // the only one so far
    HandedOver,  // another one has taken the message
    // the other one did not answer in time, or the system has no place for this: this one continues
    // by itself
    Alone,
  };

  FirstStart();
  FirstStart(const FirstStart&) = delete;
  FirstStart& operator=(const FirstStart&) = delete;
  ~FirstStart();  // leaves the place to others, and waits for the thread that listens

  // `name` of letters and digits. Waits for an answer for so many seconds at most.
  [[nodiscard]] Standing Begin(const std::string& name, const std::string& message, double seconds);
  // For the first one: calls `came` on a thread of its own for every later start from here on.
  void Listen(std::function<void(std::shared_ptr<LaterStart> start)> came);

 private:
  struct Place;
  std::unique_ptr<Place> place_;
  std::thread listener_;
};

}  // namespace fotomill::platform
