#include "plugins/bad_modules.h"

#include <string_view>

#include "core/data_folder.h"
#include "core/limits.h"
#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

std::string RecordedText() {
  std::string text;
  if (platform::ReadWholeFile(BadModuleFile(), limits.listFileBytes, text) !=
      platform::ReadResult::Done)
    text.clear();
  return text;
}

std::string_view TakeLine(std::string_view& text) {
  const std::string_view line = text.substr(0, text.find('\n'));
  text.remove_prefix(line.size() == text.size() ? line.size() : line.size() + 1);
  return line;
}

}  // namespace

std::string BadModuleFile() { return DataFile("PluginFailures.txt"); }

std::string BadModuleLine(const std::string& path) {
  if (path.find_first_of("\r\n") != std::string::npos) return {};
  const platform::FileFacts facts = platform::FactsOf(path);
  const auto time = platform::ModificationTime(path).value_or(platform::ExactTime());
  return std::to_string(facts.size) + " " + std::to_string(time.seconds) + "." +
         std::to_string(time.nanoseconds) + " " + path;
}

bool IsBadModule(const std::string& path) {
  const std::string recorded = RecordedText();
  if (recorded.empty()) return false;
  const std::string wanted = BadModuleLine(path);
  for (std::string_view rest = recorded; !rest.empty();) {
    if (TakeLine(rest) == wanted) return true;
  }
  return false;
}

void RecordBadModule(const std::string& path) {
  const std::string line = BadModuleLine(path);
  if (line.empty() || BadModuleFile().empty()) return;
  (void)platform::WriteWholeFile(BadModuleFile(), RecordedText() + line + "\n");
}

bool ForgiveModule(const std::string& name) {
  const std::string recorded = RecordedText();
  std::string kept;
  for (std::string_view rest = recorded; !rest.empty();) {
    const std::string_view line = TakeLine(rest);
    if (platform::FileNameOf(line) != name) kept.append(line).append("\n");
  }
  if (kept == recorded) return true;
  return platform::WriteWholeFile(BadModuleFile(), kept);
}

}  // namespace fotomill
