#include "platform/programs.h"

#include <algorithm>
#include <cstdlib>
#include <optional>
#include <string_view>

#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/posix/desktop_entries.h"

namespace fotomill::platform {

namespace {

constexpr uint64_t kLongestFile = uint64_t{16} << 20;

// The absolute folders that a variable lists, each with `child` below; `otherwise` where it lists none.
void AddFolders(const char* variable, std::string_view otherwise, std::string_view child, std::vector<std::string>& folders) {
  const char* value = std::getenv(variable);
  for (std::string_view rest = value != nullptr && *value != '\0' ? value : otherwise; !rest.empty();) {
    const std::string_view folder = rest.substr(0, rest.find(':'));
    rest.remove_prefix(std::min(folder.size() + 1, rest.size()));
    if (folder.starts_with('/')) folders.push_back(JoinFolder(folder, child));
  }
}

// The user's own folder first.
std::vector<std::string> DataFolders(std::string_view child) {
  std::vector<std::string> folders;
  AddFolders("XDG_DATA_HOME", JoinFolder(SpecialFolderPath(SpecialFolder::Home), ".local/share"), child, folders);
  AddFolders("XDG_DATA_DIRS", "/usr/local/share:/usr/share", child, folders);
  return folders;
}

std::string TextOf(const std::string& folder, std::string_view name) {
  std::string text;
  (void)ReadWholeFile(JoinFolder(folder, name), kLongestFile, text);
  return text;
}

std::string MimeTypeOf(const std::string& file) {
  for (const std::string& folder : DataFolders("mime")) {
    std::string type = MimeTypeIn(TextOf(folder, "globs2"), FileNameOf(file));
    if (!type.empty()) return type;
  }
  return {};
}

// The text of a desktop entry; a "-" of its name may stand for a folder.
std::string EntryText(const std::vector<std::string>& folders, std::string name) {
  if (name.find('/') != std::string::npos) return {};
  for (bool again = true; again;) {
    for (const std::string& folder : folders) {
      std::string text = TextOf(folder, name);
      if (!text.empty()) return text;
    }
    const size_t dash = name.find('-');
    again = dash != std::string::npos;
    if (again) name[dash] = '/';
  }
  return {};
}

// A word with its codes replaced, that of the file anywhere in it. `named` when it holds the file, nullopt when nothing is left.
std::optional<std::string> Expanded(const std::string& word, const std::string& file, bool& named) {
  std::string text;
  bool coded = false;
  for (size_t i = 0; i < word.size(); ++i) {
    if (word[i] != '%' || i + 1 == word.size()) {
      text += word[i];
      continue;
    }
    const char code = word[++i];
    coded = true;
    if (code == '%') text += code;
    if (code != 'f' && code != 'u' && code != 'F' && code != 'U') continue;
    text += file;
    named = true;
  }
  return coded && text.empty() ? std::nullopt : std::optional(text);
}

}  // namespace

std::vector<Program> ProgramsFor(const std::string& file) {
  const std::string type = MimeTypeOf(file);
  if (type.empty()) return {};
  const std::vector<std::string> applications = DataFolders("applications");
  std::vector<std::string> lists{SpecialFolderPath(SpecialFolder::ApplicationData)};
  AddFolders("XDG_CONFIG_DIRS", "/etc/xdg", "", lists);
  lists.insert(lists.end(), applications.begin(), applications.end());
  std::vector<std::string> names, removed;
  const auto take = [&](const std::string& folder, const char* list) {
    const Associations found = AssociationsIn(TextOf(folder, list), type);
    for (const std::string& name : found.programs) {
      const bool known = std::ranges::find(names, name) != names.end() || std::ranges::find(removed, name) != removed.end();
      if (!known) names.push_back(name);
    }
    removed.insert(removed.end(), found.removed.begin(), found.removed.end());
  };
  for (const std::string& folder : lists) take(folder, "mimeapps.list");
  for (const std::string& folder : applications) take(folder, "mimeinfo.cache");
  std::vector<Program> programs;
  for (const std::string& name : names) {
    const std::optional<Program> program = ProgramOfEntry(EntryText(applications, name));
    if (program && std::ranges::find(programs, *program) == programs.end()) programs.push_back(*program);
  }
  return programs;
}

// %F and %U stand for all files, %f and %u for one; other codes stand for nothing.
std::vector<std::vector<std::string>> StartsOf(const Program& program, const std::vector<std::string>& files) {
  const auto has = [&](const char* code) { return std::ranges::find(program.words, code) != program.words.end(); };
  const bool takesSeveral = has("%F") || has("%U");
  std::vector<std::vector<std::string>> starts;
  for (size_t i = 0; i < files.size(); i += takesSeveral ? files.size() : 1) {
    std::vector<std::string> arguments;
    bool named = false;
    for (const std::string& word : program.words) {
      if (word == "%F" || word == "%U") {
        for (const std::string& file : files) arguments.push_back(AbsolutePath(file));
        named = true;
      } else if (auto expanded = Expanded(word, AbsolutePath(files[i]), named)) {
        arguments.push_back(std::move(*expanded));
      }
    }
    if (!named) arguments.push_back(AbsolutePath(files[i]));
    starts.push_back(std::move(arguments));
  }
  return starts;
}

}  // namespace fotomill::platform
