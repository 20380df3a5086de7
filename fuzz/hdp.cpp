#include "platform/work_apart.h"
#include "plugins/child_tasks.h"
#include "support/codec_target.h"

#include <cstdlib>

// The decoder runs in a worker process, which is this program started again.
extern "C" int LLVMFuzzerInitialize(int* count, char*** arguments) {
  if (const auto status =
          fotomill::platform::ServeApart(*count, *arguments, fotomill::ChildTasks()))
    std::exit(*status);
  return 0;
}

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fotomill::fuzz::TryCodec("hdp", data, size);
  return 0;
}
