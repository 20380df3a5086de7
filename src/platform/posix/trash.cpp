// The freedesktop.org trash. A trash folder contains
//
//   files/NAME            the deleted file, under a name that is unique there
//   info/NAME.trashinfo   its original path and deletion time:
//
//       [Trash Info]
//       Path=/home/user/a%20picture.bmp     percent-encoded; in a volume's own trash relative
//                                           to the volume's top folder
//       DeletionDate=2004-08-31T22:32:08    local time
//
// Files on the home folder's device go to $XDG_DATA_HOME/Trash, others to TOP/.Trash/UID (made by
// the administrator, with the sticky bit) or TOP/.Trash-UID on their volume. The info file is
// created first, exclusively, to reserve the name. The size cache of folders ("directorysizes") is
// optional and left to the desktops. Source: freedesktop.org, "The FreeDesktop.org Trash
// specification", version 1.0.

#include <fcntl.h>
#include <stdlib.h>
#include <sys/stat.h>
#include <unistd.h>

#include <cerrno>
#include <cstdio>
#include <memory>
#include <string_view>
#include <vector>

#include "platform/clock.h"
#include "platform/fault.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/posix/handle.h"
#include "platform/posix/kept_reason.h"
#include "platform/reason.h"
#include "platform/rights.h"

namespace fotomill::platform {

namespace {

constexpr int kAttempts = 10'000;     // names tried per file
// bytes kept of a long name, before number, extension and ".trashinfo"
constexpr size_t kLongestBase = 200;
constexpr size_t kLongestExtension = 24;

// The file to delete: its folder with links resolved, and its name.
struct Victim {
  std::string folder;
  std::string name;
  dev_t device = 0;
  std::string Path() const { return JoinFolder(folder, name); }
};

// A trash folder for a file and the path to record in the info file.
struct Place {
  std::string folder;
  std::string remembered;
  bool shared = false;  // on a volume others may write to: must be owned by us and not a link
};

// Newly created folders, removed again unless the operation succeeds.
class MadeFolders {
 public:
  ~MadeFolders() {
    for (size_t i = paths_.size(); i > 0; --i) rmdir(paths_[i - 1].c_str());
  }
  bool Make(const std::string& path) {
    if (FaultDue()) return false;
    if (mkdir(path.c_str(), 0700) != 0) return errno == EEXIST;
    paths_.push_back(path);
    return true;
  }
  bool MakeWithParents(const std::string& path) {
    for (size_t end = path.find('/', 1); end != std::string::npos; end = path.find('/', end + 1)) {
      if (!IsFolder(path.substr(0, end)) && !Make(path.substr(0, end))) return false;
    }
    return IsFolder(path) || Make(path);
  }
  void Keep() { paths_.clear(); }

 private:
  std::vector<std::string> paths_;
};

std::string RealPath(const std::string& path) {
  const std::unique_ptr<char, decltype(&free)> real(realpath(path.c_str(), nullptr), free);
  return real != nullptr ? std::string(real.get()) : std::string();
}

bool FindVictim(std::string path, Victim& victim) {
  while (path.size() > 1 && path.back() == '/') path.pop_back();
  const std::string folder(SplitPath(path).folder);
  victim.name = FileNameOf(path);
  victim.folder = RealPath(folder.empty() ? "." : folder);
  struct stat facts;
  if (victim.name.empty() || victim.name == "." || victim.name == ".." || victim.folder.empty())
    return false;
  if (lstat(victim.Path().c_str(), &facts) != 0) return false;
  victim.device = facts.st_dev;
  return true;
}

std::string HomeTrash() {
  const char* data = std::getenv("XDG_DATA_HOME");
  if (data != nullptr && data[0] == '/') return AbsolutePath(JoinFolder(data, "Trash"));
  const std::string home = SpecialFolderPath(SpecialFolder::Home);
  return home.empty() ? home : JoinFolder(home, ".local/share/Trash");
}

// The nearest existing ancestor folder, at last "/".
std::string NearestFolder(std::string path) {
  while (path.size() > 1 && !IsFolder(path)) path = AbsolutePath(path + "/..");
  return path;
}

bool IsOnDevice(const std::string& path, dev_t device) {
  struct stat facts;
  return stat(path.c_str(), &facts) == 0 && facts.st_dev == device;
}

// The mount point of the volume of a folder without links.
std::string TopFolder(std::string folder, dev_t device) {
  while (folder.size() > 1) {
    std::string above = AbsolutePath(folder + "/..");
    if (!IsOnDevice(above, device)) break;
    folder = std::move(above);
  }
  return folder;
}

bool IsOwnFolder(const std::string& path) {
  struct stat facts;
  return lstat(path.c_str(), &facts) == 0 && S_ISDIR(facts.st_mode) && facts.st_uid == getuid();
}

// Possible trash folders for a file, in order of preference.
std::vector<Place> PlacesFor(const Victim& victim) {
  const std::string home = HomeTrash();
  if (!home.empty() && IsOnDevice(NearestFolder(home), victim.device))
    return {{home, victim.Path(), false}};
  if (!IsOnDevice(victim.folder, victim.device)) return {};  // a volume's top folder itself
  const std::string top = TopFolder(victim.folder, victim.device);
  const std::string remembered = victim.Path().substr(top.size() == 1 ? 1 : top.size() + 1);
  const std::string user = std::to_string(getuid());
  std::vector<Place> places;
  struct stat facts;
  const std::string administered = JoinFolder(top, ".Trash");
  if (lstat(administered.c_str(), &facts) == 0 && S_ISDIR(facts.st_mode) &&
      (facts.st_mode & S_ISVTX) != 0) {
    places.push_back({JoinFolder(administered, user), remembered, true});
  }
  places.push_back({JoinFolder(top, ".Trash-" + user), remembered, true});
  return places;
}

std::string PercentEncoded(std::string_view path) {
  constexpr std::string_view plain = "/-_.!~*'()";
  std::string result;
  for (const char c : path) {
    const bool letter = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9');
    if (letter || plain.find(c) != std::string_view::npos) {
      result += c;
    } else {
      char code[4];
      std::snprintf(code, sizeof code, "%%%02X", static_cast<unsigned char>(c));
      result += code;
    }
  }
  return result;
}

std::string InfoText(const std::string& remembered) {
  const LocalTime time = LocalTimeOf(Now());
  char date[80];
  std::snprintf(date, sizeof date, "%04d-%02d-%02dT%02d:%02d:%02d", time.year, time.month, time.day,
                time.hour, time.minute, time.second);
  return "[Trash Info]\nPath=" + PercentEncoded(remembered) + "\nDeletionDate=" + date + "\n";
}

// The name to try: the original, then "picture.2.bmp" and so on. Very long names are shortened; the
// full name is in the info file.
std::string NameInTrash(const std::string& name, int attempt) {
  const PathParts parts = SplitPath(name);
  const std::string_view extension = parts.extension.substr(0, kLongestExtension);
  std::string result(parts.base.substr(0, kLongestBase));
  if (attempt > 1) result.append(1, '.').append(std::to_string(attempt));
  return result.append(extension);
}

// Reserves a name by creating its info file: Done, Taken or Failed (no leftovers).
CommitResult CreateInfo(const std::string& path, const std::string& text) {
  if (FaultDue()) return CommitResult::Failed;
  Handle handle = OpenHandle(path.c_str(), O_WRONLY | O_CREAT | O_EXCL | O_NOFOLLOW, 0600);
  if (!handle.IsOpen()) return errno == EEXIST ? CommitResult::Taken : CommitResult::Failed;
  const bool written =
      !FaultDue() &&
      WriteFully(handle.Number(), reinterpret_cast<const uint8_t*>(text.data()), text.size());
  if (handle.Reset() && written) return CommitResult::Done;
  unlink(path.c_str());
  return CommitResult::Failed;
}

bool MoveTo(const Place& place, const Victim& victim) {
  MadeFolders made;
  const std::string files = JoinFolder(place.folder, "files"),
                    info = JoinFolder(place.folder, "info");
  if (!(place.shared ? made.Make(place.folder) && IsOwnFolder(place.folder)
                     : made.MakeWithParents(place.folder)))
    return false;
  if (!made.Make(files) || !made.Make(info)) return false;
  if (place.shared && !(IsOwnFolder(files) && IsOwnFolder(info))) return false;
  const std::string text = InfoText(place.remembered);
  for (int attempt = 1; attempt <= kAttempts; ++attempt) {
    const std::string name = NameInTrash(victim.name, attempt);
    const std::string infoPath = JoinFolder(info, name + ".trashinfo");
    CommitResult result = CreateInfo(infoPath, text);
    if (result == CommitResult::Taken) continue;
    if (result == CommitResult::Failed) return false;
    result =
        FaultDue() ? CommitResult::Failed : RenameRefusing(victim.Path(), JoinFolder(files, name));
    if (result == CommitResult::Done) {
      made.Keep();
      return true;
    }
    if (errno != EXDEV) KeepErrno();  // a trash on another volume is none
    unlink(infoPath.c_str());
    if (result == CommitResult::Failed) return false;
  }
  return false;
}

// The name in a trash folder of what was last deleted from that path; empty if there is none.
std::string FindInTrash(const Place& place, const std::string& ownName) {
  constexpr std::string_view kInfo = ".trashinfo";
  constexpr uint64_t kLongestInfo = 64 * 1024;
  const std::string info = JoinFolder(place.folder, "info");
  const std::string begin(SplitPath(ownName).base.substr(0, kLongestBase));
  const std::string wanted = "\nPath=" + PercentEncoded(place.remembered) + "\n";
  std::string found, foundDate;
  for (const FolderEntry& entry : ListFolder(info).value_or(std::vector<FolderEntry>())) {
    std::string text;
    if (!entry.name.starts_with(begin) || !entry.name.ends_with(kInfo)) continue;
    if (ReadWholeFile(JoinFolder(info, entry.name), kLongestInfo, text) != ReadResult::Done)
      continue;
    const size_t date = text.find("\nDeletionDate=");
    if (text.find(wanted) == std::string::npos || date == std::string::npos) continue;
    const std::string name = entry.name.substr(0, entry.name.size() - kInfo.size());
    if (!FileExists(JoinFolder(JoinFolder(place.folder, "files"), name))) continue;
    if (!found.empty() && text.compare(date, std::string::npos, foundDate) < 0) continue;
    found = name;
    foundDate = text.substr(date);
  }
  return found;
}

bool MayWriteTo(const std::string& folder) { return access(folder.c_str(), W_OK | X_OK) == 0; }

}  // namespace

bool MoveToTrash(const std::string& path) {
  Victim victim;
  ForgetReason();
  if (!FindVictim(path, victim)) return false;
  if (!MayWriteTo(victim.folder)) {
    KeepErrno();
    return false;
  }
  for (const Place& place : PlacesFor(victim)) {
    if (MoveTo(place, victim)) return true;
  }
  return false;
}

bool RestoreFromTrash(const std::string& path) {
  Victim victim;
  struct stat facts;
  victim.name = FileNameOf(path);
  victim.folder = RealPath(FolderOf(path));
  if (victim.name.empty() || victim.folder.empty() || stat(victim.folder.c_str(), &facts) != 0)
    return false;
  victim.device = facts.st_dev;
  for (const Place& place : PlacesFor(victim)) {
    const std::string name = FindInTrash(place, victim.name);
    if (name.empty()) continue;
    if (FaultDue()) return false;
    if (RenameRefusing(JoinFolder(JoinFolder(place.folder, "files"), name), victim.Path()) !=
        CommitResult::Done)
      return false;
    unlink(JoinFolder(JoinFolder(place.folder, "info"), name + ".trashinfo").c_str());
    return true;
  }
  return false;
}

bool MayBeMoved(const std::string& path) {
  Victim victim;
  return FindVictim(path, victim) && MayWriteTo(victim.folder);
}

bool HasTrash(const std::string& path) {
  Victim victim;
  if (!FindVictim(path, victim) || !MayWriteTo(victim.folder)) return false;
  for (const Place& place : PlacesFor(victim)) {
    const bool there = FileExists(place.folder);
    if (there && place.shared && !IsOwnFolder(place.folder)) continue;
    if (MayWriteTo(NearestFolder(there ? place.folder : FolderOf(place.folder)))) return true;
  }
  return false;
}

}  // namespace fotomill::platform
