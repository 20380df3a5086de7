#include <string>
#include <vector>

#include "catalog/history/file_history.h"
#include "core/data_folder.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "support/scratch_file.h"

// A history file must read back the same after saving, and recording must add one entry
// at the front.

namespace {

using namespace fotomill;
using fuzz::Require;

std::vector<std::string> List() {
  std::vector<std::string> list;
  for (size_t i = 0; i < FileHistoryCount(); ++i) {
    const FileHistoryEntry entry = FileHistoryAt(i);
    list.push_back(std::string(entry.path) + "\t" + std::to_string(entry.function) + "\t" +
                   std::to_string(entry.accessed));
  }
  return list;
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  static const std::string folder = fuzz::ScratchPath("data"), picture = "/proc/self/status";
  SetDataFolder(folder);
  Require(platform::MakeFolders(folder));
  platform::FixNow(1'700'000'000);
  settings.FileHistoryFunctions = 0xfffff;
  settings.FileHistoryWindowType = size & 1;
  ClearFileHistory();
  Require(platform::WriteWholeFile(FileHistoryPath(HistoryOptionsFromSettings()),
                                   {reinterpret_cast<const char*>(data), size}));
  if (!LoadFileHistory(HistoryOptionsFromSettings())) return 0;
  const std::vector<std::string> list = List();
  for (size_t i = 1; i < list.size(); ++i)
    Require(FileHistoryAt(i - 1).accessed >= FileHistoryAt(i).accessed);
  if (!SaveFileHistory(HistoryOptionsFromSettings())) return 0;
  (void)LoadFileHistory(HistoryOptionsFromSettings());
  Require(List() == list);
  ClearFileHistory();
  const FileUse use{picture, FileFunction::View, kOwnTime, INT32_MAX, false};
  if (UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}) != HistoryUpdate::Done) return 0;
  Require(LoadFileHistory(HistoryOptionsFromSettings()) && FileHistoryAt(0).accessed == INT32_MAX);
  return 0;
}
