#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>

namespace fotomill::platform {

// Memory that a process apart can be lent: what it stores there is there afterwards. Zero at first.
class SharedBlock {
 public:
  SharedBlock() = default;
  ~SharedBlock();
  SharedBlock(const SharedBlock&) = delete;
  SharedBlock& operator=(const SharedBlock&) = delete;

  // False if there is no memory. Once for each block.
  [[nodiscard]] bool Allocate(uint64_t size);
  // empty until Allocate
  std::span<uint8_t> Bytes() { return {data_, static_cast<size_t>(size_)}; }
  std::span<const uint8_t> Bytes() const { return {data_, static_cast<size_t>(size_)}; }
  // The system's number of the block, for the process apart.
  intptr_t SystemHandle() const { return handle_; }

 private:
  uint8_t* data_ = nullptr;
  uint64_t size_ = 0;
  intptr_t handle_ = -1;
};

// What work apart is given.
struct ApartCall {
  std::span<const uint8_t> request;  // says what is to be done; at most kMostRequest bytes
  std::span<const uint8_t> input;    // what it is done with, such as a file's bytes
  std::span<uint8_t> reply;          // a shared block of the caller
  std::function<void(int32_t)> tell;  // numbers for the caller, meanwhile
};
inline constexpr size_t kMostRequest = 4096;  // bytes

// A kind of work that may run apart: one row of the program's table.
struct ApartTask {
  const char* name;                   // at most 31 characters
  bool (*run)(const ApartCall& call);  // the answer for the caller
};

// The first call of every program that has work done apart, before it begins a thread. In the
// program that the user started it does nothing, and returns nothing; in a process apart, which is
// that program started again, it does what it is asked for until no one asks any more, and returns
// the exit status.
std::optional<int> ServeApart(int count, const char* const* arguments,
                              std::span<const ApartTask> tasks);

// How work apart ended.
enum class ApartResult {
  Done,        // the work answered true
  Failed,      // it answered false, or ran out of the memory that it was given
  Broken,      // it crashed, or used more time than it was given
  Stopped,     // the caller did not want it any more, or the program is asked to end
  NotStarted,  // the system has no room for it, or the program does not serve
};

// What is to be done apart, with what, and within which limits.
struct ApartOrder {
  const char* task;  // its name in the table
  std::span<const uint8_t> request = {};
  std::span<const uint8_t> input = {};
  SharedBlock& reply;
  // of processor time; it also ends after ten times as many by the clock
  unsigned seconds = 60;
  uint64_t memory = uint64_t{2} << 30;  // bytes that it may take beside input and reply
  std::function<bool()> goesOn = {};  // asked several times a second
};

// Has work done that may crash, such as that of a library which trusts its input, where it can do
// no harm: in a process of its own that sees nothing of this one but what it is given, can write no
// file, and ends with this one. `told` gets its numbers. A process that has done well stays for the
// next order, until EndIdleProcesses.
ApartResult RunApart(const ApartOrder& order, const std::function<void(int32_t)>& told);

// Ends the processes apart that have nothing to do.
void EndIdleProcesses();

}  // namespace fotomill::platform
