#pragma once

#include <functional>
#include <memory>
#include <string>
#include <thread>

namespace fotomill::platform {

// A later instance that passes on its message and waits for a reply. Ended with its last owner.
class LaterStart {
 public:
  virtual ~LaterStart() = default;
  // The message of the later instance, byte for byte.
  virtual const std::string& Message() const = 0;
  // Lets the later instance exit. False if it has timed out: it continues by itself, and its
  // message must be ignored.
  virtual bool Accept() = 0;
};

// Single instance per user and name: later instances pass
// their message to the first. Leftovers of a killed instance,
// a hanging one, and files of other users never block it.
class FirstStart {
 public:
  // The role of this instance.
  enum class Standing {
    First,       // the only one so far
    HandedOver,  // another instance has taken the message
    // the other instance did not answer in time, or the system has no suitable folder: this one
    // continues by itself
    Alone,
  };

  FirstStart();
  FirstStart(const FirstStart&) = delete;
  FirstStart& operator=(const FirstStart&) = delete;
  ~FirstStart();  // gives up the role, and waits for the listening thread

  // `name` consists of letters and digits. Waits at most `seconds` for an answer.
  [[nodiscard]] Standing Begin(const std::string& name, const std::string& message, double seconds);
  // For the first instance: calls `came` on a separate thread for every later instance.
  void Listen(std::function<void(std::shared_ptr<LaterStart> start)> came);

 private:
  struct Place;
  std::unique_ptr<Place> place_;
  std::thread listener_;
};

}  // namespace fotomill::platform
