#pragma once

#include <vector>

#include "platform/work_apart.h"

namespace fotomill {

// Tasks that codecs run in child processes, from their rows, without duplicates.
std::vector<platform::ApartTask> ChildTasks();

}  // namespace fotomill
