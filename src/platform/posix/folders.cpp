#include "platform/folders.h"

#include <pwd.h>
#include <unistd.h>

#include <cerrno>
#include <cstdlib>
#include <string_view>
#include <vector>

#include "platform/files.h"
#include "platform/paths.h"

namespace fotomill::platform {

namespace {

constexpr uint64_t kMostUserFolders = 64 * 1024;  // bytes of user-dirs.dirs

std::string WithoutClosingSeparator(std::string path) {
  while (path.size() > 1 && path.back() == '/') path.pop_back();
  return path;
}

// A folder from an environment variable; empty unless it is absolute, as the base directory
// specification requires.
std::string FolderFromEnvironment(const char* name) {
  const char* value = std::getenv(name);
  return value != nullptr && value[0] == '/' ? WithoutClosingSeparator(value) : std::string();
}

// The user's entry in the password database, or null. Its strings are stored in `buffer`.
const passwd* PasswordEntry(passwd& entry, std::vector<char>& buffer) {
  passwd* found = nullptr;
  buffer.resize(4096);
  while (getpwuid_r(getuid(), &entry, buffer.data(), buffer.size(), &found) == ERANGE &&
         buffer.size() < (size_t{1} << 20)) {
    buffer.resize(buffer.size() * 2);
  }
  return found;
}

std::string HomeFolder() {
  std::string home = FolderFromEnvironment("HOME");
  if (!home.empty()) return home;
  passwd entry;
  std::vector<char> buffer;
  const passwd* const found = PasswordEntry(entry, buffer);
  return found != nullptr && found->pw_dir[0] == '/' ? WithoutClosingSeparator(found->pw_dir)
                                                     : std::string();
}

std::string FolderOrHomeChild(const char* variable, std::string_view child) {
  std::string folder = FolderFromEnvironment(variable);
  if (!folder.empty()) return folder;
  const std::string home = HomeFolder();
  return home.empty() ? home : JoinFolder(home, child);
}

// A value of user-dirs.dirs, as in XDG_PICTURES_DIR="$HOME/Pictures"; empty if it is malformed.
std::string UserFolderValue(std::string_view value, const std::string& home) {
  if (value.size() < 2 || value.front() != '"') return {};
  std::string text;
  size_t at = 1;
  for (; at < value.size() && value[at] != '"'; ++at) {
    if (value[at] == '\\' && at + 1 < value.size()) ++at;
    text += value[at];
  }
  if (at == value.size()) return {};
  if (text.starts_with("$HOME/") || text == "$HOME") text.replace(0, 5, home);
  return text.starts_with('/') ? WithoutClosingSeparator(text) : std::string();
}

// A folder set in user-dirs.dirs, else the one with the usual name if it exists, else home.
std::string UserFolder(std::string_view key, std::string_view usualName) {
  const std::string home = HomeFolder();
  const std::string configuration = FolderOrHomeChild("XDG_CONFIG_HOME", ".config");
  std::string text, folder;
  if (!configuration.empty() && ReadWholeFile(JoinFolder(configuration, "user-dirs.dirs"),
                                              kMostUserFolders, text) == ReadResult::Done) {
    for (std::string_view rest = text; !rest.empty();) {
      std::string_view line = rest.substr(0, rest.find('\n'));
      rest.remove_prefix(std::min(line.size() + 1, rest.size()));
      line.remove_prefix(std::min(line.find_first_not_of(" \t"), line.size()));
      if (!line.starts_with(key) || line.substr(key.size()).find('=') != 0) continue;
      folder = UserFolderValue(line.substr(key.size() + 1), home);
    }
  }
  if (!folder.empty()) return folder;
  if (home.empty()) return {};
  folder = JoinFolder(home, usualName);
  return IsFolder(folder) ? folder : home;
}

}  // namespace

std::string SpecialFolderPath(SpecialFolder folder) {
  switch (folder) {
    case SpecialFolder::ApplicationData: return FolderOrHomeChild("XDG_CONFIG_HOME", ".config");
    case SpecialFolder::Cache: return FolderOrHomeChild("XDG_CACHE_HOME", ".cache");
    case SpecialFolder::Home: return HomeFolder();
    case SpecialFolder::Pictures: return UserFolder("XDG_PICTURES_DIR", "Pictures");
    case SpecialFolder::Documents: return UserFolder("XDG_DOCUMENTS_DIR", "Documents");
    case SpecialFolder::Temporary: {
      const std::string temporary = FolderFromEnvironment("TMPDIR");
      return IsFolder(temporary) ? temporary : "/tmp";
    }
  }
  return {};
}

// The full name is the first field of the GECOS entry; "&" stands for the login name.
std::string UserFullName() {
  passwd entry;
  std::vector<char> buffer;
  const passwd* const found = PasswordEntry(entry, buffer);
  if (found == nullptr) return {};
  const std::string login = found->pw_name;
  const std::string_view comment = found->pw_gecos != nullptr ? found->pw_gecos : "";
  std::string name;
  for (const char c : comment.substr(0, comment.find(','))) {
    if (c == '&') {
      name += login;
    } else {
      name += c;
    }
  }
  return name.empty() ? login : name;
}

std::string ProgramPath() {
  std::string path(256, '\0');
  for (;;) {
    const ssize_t length = readlink("/proc/self/exe", path.data(), path.size());
    if (length < 0) return {};
    if (static_cast<size_t>(length) < path.size()) {
      path.resize(static_cast<size_t>(length));
      break;
    }
    path.resize(path.size() * 2);
  }
  // appended by the kernel after an update has replaced the file
  constexpr std::string_view deleted = " (deleted)";
  if (path.ends_with(deleted) && !FileExists(path)) path.resize(path.size() - deleted.size());
  return path;
}

std::string ProgramFolder() {
  return WithoutClosingSeparator(std::string(SplitPath(ProgramPath()).folder));
}

std::string CurrentFolder() {
  std::string path(256, '\0');
  while (getcwd(path.data(), path.size()) == nullptr) {
    if (errno != ERANGE) return {};
    path.resize(path.size() * 2);
  }
  path.resize(path.find('\0'));
  return path.starts_with('/') ? path : std::string();  // "(unreachable)/..." is not a path
}

std::string AbsolutePath(const std::string& path) {
  std::string whole = path;
  if (!path.starts_with('/')) {
    whole = CurrentFolder();
    if (whole.empty()) return path;
    whole += '/' + path;
  }
  std::string result;
  for (size_t start = 0; start < whole.size();) {
    const size_t end = std::min(whole.find('/', start), whole.size());
    const std::string_view part = std::string_view(whole).substr(start, end - start);
    start = end + 1;
    if (part == "..") {
      result.resize(std::min(result.rfind('/'), result.size()));
    } else if (!part.empty() && part != ".") {
      result.append(1, '/').append(part);
    }
  }
  return result.empty() ? "/" : result;
}

}  // namespace fotomill::platform
