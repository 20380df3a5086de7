#pragma once

#include <cstdint>
#include <functional>
#include <optional>
#include <span>
#include <string>

namespace fotomill::platform {

// Memory shared with a worker process, so that its writes are visible here. Zeroed initially.
class SharedBlock {
 public:
  SharedBlock() = default;
  ~SharedBlock();
  SharedBlock(const SharedBlock&) = delete;
  SharedBlock& operator=(const SharedBlock&) = delete;

  // False if memory runs out. Only once per block.
  [[nodiscard]] bool Allocate(uint64_t size);
  // empty until Allocate
  std::span<uint8_t> Bytes() { return {data_, static_cast<size_t>(size_)}; }
  std::span<const uint8_t> Bytes() const { return {data_, static_cast<size_t>(size_)}; }
  // The system's handle of the block, for the worker process.
  intptr_t SystemHandle() const { return handle_; }

 private:
  uint8_t* data_ = nullptr;
  uint64_t size_ = 0;
  intptr_t handle_ = -1;
};

// The arguments of a task.
struct ApartCall {
  std::span<const uint8_t> request;  // parameters, at most kMostRequest bytes
  std::span<const uint8_t> input;    // input data, such as a file's contents
  std::span<uint8_t> reply;          // a shared block of the caller
  std::function<void(int32_t)> tell;  // sends numbers to the caller meanwhile
};
inline constexpr size_t kMostRequest = 4096;  // bytes

// A task that can run in a worker process: one row of the program's table.
struct ApartTask {
  const char* name;                   // at most 31 characters
  bool (*run)(const ApartCall& call);  // returns the result for the caller
};

// Must be the first call in the main() of every program that uses RunApart, before any thread is
// started. In a normal start it does nothing and returns nullopt; in a worker process, which is the
// same program started again, it serves requests until the parent closes the connection, and
// returns the exit status.
std::optional<int> ServeApart(int count, const char* const* arguments,
                              std::span<const ApartTask> tasks);

// How a task ended.
enum class ApartResult {
  Done,        // it returned true
  Failed,      // it returned false, or exceeded its memory limit
  Broken,      // it crashed, or exceeded its time limit
  Stopped,     // canceled by the caller, or the program was asked to end
  NotStarted,  // out of system resources, or the program does not call ServeApart
};

// What a worker process is for. Each kind has processes of its own.
enum class ApartKind : uint8_t {
  Own,           // the program's own code; cannot write files
  Module,        // plug-in modules; cannot write files
  ModuleWriter,  // plug-in modules that write a file
};

// A task with its input and limits.
struct ApartOrder {
  const char* task;  // its name in the table
  std::span<const uint8_t> request = {};
  std::span<const uint8_t> input = {};
  // A regular file as input, if it is too large to copy; empty: use `input`. Read-only for the
  // process; if the file is truncated meanwhile, the task fails.
  std::string inputFile = {};
  SharedBlock& reply;
  // CPU time; the wall-clock limit is ten times this, unless `patience` is set
  unsigned seconds = 60;
  unsigned patience = 0;  // wall-clock limit in seconds
  ApartKind kind = ApartKind::Own;
  uint64_t memory = uint64_t{2} << 30;  // memory limit in bytes, besides input and reply
  std::function<bool()> goesOn = {};  // polled several times a second
};

// Runs work that may crash, such as a library that trusts its input, in a worker process.
// The process sees nothing of this one but its input, cannot write files unless its kind
// says so, and ends with this one. `told` receives its numbers. After success the process is kept
// for further tasks, until EndIdleProcesses.
ApartResult RunApart(const ApartOrder& order, const std::function<void(int32_t)>& told);

// Ends the idle worker processes.
void EndIdleProcesses();

}  // namespace fotomill::platform
