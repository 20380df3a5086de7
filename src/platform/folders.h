#pragma once

#include <string>
#include <vector>

namespace fotomill::platform {

// The user's folders; each is a path without a
// trailing separator, or empty if the system has none.
enum class SpecialFolder {
  // $XDG_CONFIG_HOME, else ~/.config; on Windows the roaming application data (CSIDL 26)
  ApplicationData,
  Cache,            // $XDG_CACHE_HOME, else ~/.cache
  Home,
  // from user-dirs.dirs, else ~/Pictures if it exists, else the home folder
  Pictures,
  Documents,  // likewise
  Temporary,  // $TMPDIR if it is a folder, else /tmp
};
// Queries the environment and the system each time; the folder may not exist.
std::string SpecialFolderPath(SpecialFolder folder);

// The user's full name, else the login name; empty if the system knows neither.
std::string UserFullName();

// Path of the running program, links resolved.
std::string ProgramPath();
std::string ProgramFolder();  // folder of the running program
std::string CurrentFolder();  // absolute
// Makes a relative path absolute against the current folder, and removes ".", ".." and a
// trailing separator; links are not resolved. If the current folder was deleted, a relative path
// is returned unchanged.
std::string AbsolutePath(const std::string& path);

}  // namespace fotomill::platform
