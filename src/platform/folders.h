#pragma once

#include <string>
#include <vector>

namespace fotomill::platform {

// The user's folders; each is a path without a closing separator, or empty when the system has
// none.
enum class SpecialFolder {
  // $XDG_CONFIG_HOME, else ~/.config; on Windows the roaming application data (CSIDL 26)
  ApplicationData,
  Cache,            // $XDG_CACHE_HOME, else ~/.cache
  Home,
  // as the user named it (user-dirs.dirs), else ~/Pictures if there is one, else the home folder
  Pictures,
  Documents,  // likewise
  Temporary,  // $TMPDIR where it is a folder, else /tmp
};
// Asks the environment and the system each time; the folder need not be there.
std::string SpecialFolderPath(SpecialFolder folder);

// The user's full name as the system knows it, else the login name; empty when it knows neither.
std::string UserFullName();

// The running program's own file and its folder, links resolved.
std::string ProgramPath();
std::string ProgramFolder();  // the folder of the running program's file
std::string CurrentFolder();  // absolute
// A relative path made absolute against the current folder, with "." and ".." taken out and no
// closing separator; links stay. Without a current folder (it was deleted) a relative path comes
// back as it is.
std::string AbsolutePath(const std::string& path);

}  // namespace fotomill::platform
