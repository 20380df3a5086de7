// The main function of every test program, which also serves as worker process, with the program's
// tasks and those of the tests.
#include <fcntl.h>
#include <gmock/gmock.h>
#include <unistd.h>

#include <algorithm>
#include <csignal>
#include <cstdlib>
#include <vector>

#include "platform/work_apart.h"
#include "plugins/child_tasks.h"

namespace {

using fotomill::platform::ApartCall;
using fotomill::platform::ApartTask;

// Sends its process id and the request's size, and returns the input.
bool Echo(const ApartCall& call) {
  call.tell(getpid());
  call.tell(static_cast<int32_t>(call.request.size()));
  std::copy_n(call.input.begin(), std::min(call.input.size(), call.reply.size()),
              call.reply.begin());
  return true;
}

bool NeverEnds(const ApartCall&) {
  volatile bool ended = false;
  while (!ended) {
  }
  return true;
}

bool TakesMemory(const ApartCall& call) {
  std::vector<uint8_t> much(size_t{1} << 30, 1);
  call.reply[0] = much.back();
  return true;
}

bool WritesAFile(const ApartCall& call) {
  const std::string path(call.request.begin(), call.request.end());
  const int file = open(path.c_str(), O_CREAT | O_WRONLY | O_CLOEXEC, 0600);
  return file >= 0 && write(file, "x", 1) == 1;
}

constexpr ApartTask kTestTasks[] = {
    {"echo", Echo},
    {"answers false", [](const ApartCall&) { return false; }},
    {"aborts", [](const ApartCall&) -> bool { std::abort(); }},
    {"violates memory", [](const ApartCall&) { return std::raise(SIGSEGV) == 0; }},
    {"exits", [](const ApartCall&) -> bool { std::_Exit(0); }},
    {"never ends", NeverEnds},
    {"takes memory", TakesMemory},
    {"writes a file", WritesAFile},
};

}  // namespace

int main(int count, char** arguments) {
  const auto program = fotomill::ChildTasks();
  std::vector<ApartTask> tasks(program.begin(), program.end());
  tasks.insert(tasks.end(), std::begin(kTestTasks), std::end(kTestTasks));
  if (const auto status = fotomill::platform::ServeApart(count, arguments, tasks)) return *status;
  testing::InitGoogleMock(&count, arguments);
  return RUN_ALL_TESTS();
}
