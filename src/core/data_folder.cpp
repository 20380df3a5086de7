#include "core/data_folder.h"

#include <cstdlib>
#include <optional>

#include "core/fixed_text.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr const char* kMakersFolder = "Brantwick";

std::string DefaultFolder() {
  const char* const variable = std::getenv("FOTOMILL_DATA");
  if (variable != nullptr && *variable != '\0') return platform::AbsolutePath(variable);
  const std::string data = platform::SpecialFolderPath(platform::SpecialFolder::ApplicationData);
  return data.empty() ? std::string() : platform::JoinFolder(data, kMakersFolder);
}

std::optional<std::string>& Chosen() {
  static std::optional<std::string> chosen;
  return chosen;
}

}  // namespace

const std::string& DataFolder() {
  std::optional<std::string>& chosen = Chosen();
  if (!chosen) chosen = DefaultFolder();
  return *chosen;
}

void SetDataFolder(const std::string& folder) {
  Chosen() = folder.empty() ? DefaultFolder() : platform::AbsolutePath(folder);
}

std::string DataFile(std::string_view name) {
  if (DataFolder().empty()) return {};
  std::string path = platform::JoinFolder(DataFolder(), name);
  return path.size() > PathText::Capacity() ? std::string() : path;
}

}  // namespace fotomill
