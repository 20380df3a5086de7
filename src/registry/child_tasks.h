#pragma once

#include <span>

#include "platform/work_apart.h"

namespace fotomill {

// The work that the program has done by processes apart: one row each.
std::span<const platform::ApartTask> ChildTasks();

}  // namespace fotomill
