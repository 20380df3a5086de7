#include "plugins/child_tasks.h"

#include <algorithm>

#include "plugins/module_apart.h"
#include "processing/faces/face_finder.h"
#include "registry/format_table.h"

namespace fotomill {

std::vector<platform::ApartTask> ChildTasks() {
  std::vector<const platform::ApartTask*> found;
  for (const std::span<const FormatEntry> family : FormatFamilies()) {
    for (const FormatEntry& row : family) {
      if (row.childTask != nullptr && std::ranges::find(found, row.childTask) == found.end())
        found.push_back(row.childTask);
    }
  }
  std::vector<platform::ApartTask> tasks = {{kFacesTask, FindFacesApart}, kModuleTask};
  for (const platform::ApartTask* task : found) tasks.push_back(*task);
  return tasks;
}

}  // namespace fotomill
