#pragma once

#include <vector>

#include "platform/work_apart.h"

namespace fotomill {

// What codecs leave to child processes, as their rows say; each task once.
std::vector<platform::ApartTask> ChildTasks();

}  // namespace fotomill
