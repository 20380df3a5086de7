#pragma once

#include <vector>

#include "platform/work_apart.h"

namespace fotomill {

// All tasks of the program for worker processes: those that codecs name in their rows, the face
// detector and the plug-in modules.
std::vector<platform::ApartTask> ChildTasks();

}  // namespace fotomill
