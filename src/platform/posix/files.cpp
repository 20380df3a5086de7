#include "platform/files.h"

#include <dirent.h>
#include <fcntl.h>
#include <sys/stat.h>
#include <sys/sysmacros.h>
#include <unistd.h>

#include <algorithm>
#include <cerrno>
#include <cstdio>
#include <memory>
#include <new>
#include <stdexcept>

#include "platform/existence.h"
#include "platform/fault.h"
#include "platform/paths.h"
#include "platform/posix/handle.h"
#include "platform/posix/kept_reason.h"
#include "platform/reason.h"

namespace fotomill::platform {

namespace {

constexpr int kMostAppearances = 3;
constexpr uint64_t kFirstRead = 64 * 1024;  // for files that do not report their size

FileKind KindOf(mode_t mode) {
  if (S_ISREG(mode)) return FileKind::Regular;
  return S_ISDIR(mode) ? FileKind::Folder : FileKind::Other;
}

// Whether the last call failed because the name does not or cannot exist.
bool NothingThere() { return errno == ENOENT || errno == ENOTDIR || errno == ENAMETOOLONG; }

// Kind of a folder entry; Missing if it was deleted since it was listed.
FolderEntry EntryOf(int folder, const dirent& entry) {
  FolderEntry result{entry.d_name, FileKind::Other, entry.d_type == DT_LNK};
  if (entry.d_type == DT_REG) result.kind = FileKind::Regular;
  if (entry.d_type == DT_DIR) result.kind = FileKind::Folder;
  if (entry.d_type != DT_UNKNOWN && entry.d_type != DT_LNK) return result;
  struct stat facts;
  if (entry.d_type == DT_UNKNOWN) {
    if (fstatat(folder, entry.d_name, &facts, AT_SYMLINK_NOFOLLOW) != 0) {
      if (errno == ENOENT) result.kind = FileKind::Missing;
      return result;
    }
    result.link = S_ISLNK(facts.st_mode);
    result.kind = KindOf(facts.st_mode);
  }
  if (result.link && fstatat(folder, entry.d_name, &facts, 0) == 0)
    result.kind = KindOf(facts.st_mode);
  return result;
}

// Reads an open file to its end into `contents`, whatever size it reports.
ReadResult ReadToEnd(int handle, uint64_t size, uint64_t most, std::string& contents) {
  uint64_t room = size == 0 ? kFirstRead : size + 1;  // one extra byte detects a grown file
  uint64_t done = 0;
  for (;;) {
    room = std::min(room, most + 1);
    contents.resize(static_cast<size_t>(room));
    const int64_t count =
        FaultDue()
            ? -1
            : ReadFully(handle, reinterpret_cast<uint8_t*>(contents.data()) + done, room - done);
    if (count < 0) return ReadResult::Failed;
    done += static_cast<uint64_t>(count);
    if (done > most) return ReadResult::TooLarge;
    if (done < room) break;
    room *= 2;
  }
  contents.resize(static_cast<size_t>(done));
  return ReadResult::Done;
}

}  // namespace

FileFacts FactsOf(const std::string& path) {
  constexpr unsigned kWanted = STATX_BASIC_STATS | STATX_BTIME;
  FileFacts facts;
  struct statx found;
  if (statx(AT_FDCWD, path.c_str(), AT_STATX_SYNC_AS_STAT | AT_SYMLINK_NOFOLLOW, kWanted, &found) !=
      0) {
    facts.kind = NothingThere() ? FileKind::Missing : FileKind::Other;
    return facts;
  }
  facts.link = S_ISLNK(found.stx_mode);
  facts.kind = FileKind::Other;
  if (facts.link && statx(AT_FDCWD, path.c_str(), AT_STATX_SYNC_AS_STAT, kWanted, &found) != 0)
    return facts;
  facts.kind = KindOf(found.stx_mode);
  facts.size = found.stx_size;
  facts.modified = found.stx_mtime.tv_sec;
  facts.created = (found.stx_mask & STATX_BTIME) != 0 ? found.stx_btime.tv_sec : facts.modified;
  facts.device = makedev(found.stx_dev_major, found.stx_dev_minor);
  facts.identity = found.stx_ino;
  return facts;
}

Existence ExistenceOf(const std::string& path) {
  struct stat facts;
  if (lstat(path.c_str(), &facts) == 0) return Existence::Yes;
  if (NothingThere()) return Existence::No;
  KeepErrno();
  return Existence::Unknown;
}

bool FileExists(const std::string& path) {
  struct stat facts;
  return lstat(path.c_str(), &facts) == 0 || !NothingThere();
}

bool IsRegularFile(const std::string& path) {
  struct stat facts;
  return stat(path.c_str(), &facts) == 0 && S_ISREG(facts.st_mode);
}

bool IsFolder(const std::string& path) {
  struct stat facts;
  return stat(path.c_str(), &facts) == 0 && S_ISDIR(facts.st_mode);
}

std::optional<std::vector<FolderEntry>> ListFolder(const std::string& path) {
  ForgetReason();
  if (FaultDue()) return std::nullopt;
  const std::unique_ptr<DIR, int (*)(DIR*)> folder(opendir(path.c_str()), closedir);
  if (folder == nullptr) {
    KeepErrno();
    return std::nullopt;
  }
  std::vector<FolderEntry> entries;
  for (;;) {
    errno = FaultDue() ? EIO : 0;
    const dirent* entry = errno != 0 ? nullptr : readdir(folder.get());
    if (entry == nullptr) break;
    const std::string_view name = entry->d_name;
    if (name == "." || name == "..") continue;
    entries.push_back(EntryOf(dirfd(folder.get()), *entry));
    if (entries.back().kind == FileKind::Missing) entries.pop_back();
  }
  if (errno != 0) return std::nullopt;
  std::sort(entries.begin(), entries.end(),
            [](const FolderEntry& a, const FolderEntry& b) { return a.name < b.name; });
  return entries;
}

bool MakeFolders(const std::string& path) {
  ForgetReason();
  if (IsFolder(path)) return true;
  if (path.empty() || FaultDue()) return false;
  for (size_t end = path.find('/', 1);; end = path.find('/', end + 1)) {
    const std::string part = path.substr(0, end);
    if (mkdir(part.c_str(), 0777) != 0 && errno != EEXIST) {
      KeepErrno();
      if (!IsFolder(part)) return false;
    }
    if (end == std::string::npos) break;
  }
  if (!IsFolder(path)) return false;
  ForgetReason();
  return true;
}

bool DeleteFile(const std::string& path) {
  struct stat facts;
  ForgetReason();
  if (lstat(path.c_str(), &facts) == 0 && (S_ISDIR(facts.st_mode) || FaultDue())) return false;
  if (unlink(path.c_str()) == 0) return true;
  KeepErrno();
  return false;
}

bool DeleteFolder(const std::string& path) { return !FaultDue() && rmdir(path.c_str()) == 0; }

CommitResult RenameFile(const std::string& from, const std::string& to, Existing existing) {
  ForgetReason();
  if (FaultDue()) return CommitResult::Failed;
  CommitResult result = CommitResult::Failed;
  if (existing == Existing::Refuse) {
    result = RenameRefusing(from, to);
  } else {
    struct stat facts;
    if (lstat(to.c_str(), &facts) == 0 && !S_ISREG(facts.st_mode) && !S_ISLNK(facts.st_mode))
      return CommitResult::Failed;
    if (std::rename(from.c_str(), to.c_str()) == 0) result = CommitResult::Done;
  }
  if (result == CommitResult::Failed) KeepErrno();
  return result;
}

bool SetHidden(const std::string& path, bool) { return FileExists(path); }

bool IsHidden(const std::string& path) {
  const std::string_view name = FileNameOf(path);
  return !name.empty() && name.front() == '.';
}

bool SetNormal(const std::string& path) {
  struct stat facts;
  if (lstat(path.c_str(), &facts) != 0) return false;
  if (!S_ISREG(facts.st_mode) || (facts.st_mode & S_IWUSR) != 0) return true;
  return fchmodat(AT_FDCWD, path.c_str(), (facts.st_mode & 07777) | S_IWUSR, AT_SYMLINK_NOFOLLOW) ==
         0;
}

std::optional<ExactTime> ModificationTime(const std::string& path) {
  struct stat facts;
  if (stat(path.c_str(), &facts) != 0) return std::nullopt;
  return ExactTime{facts.st_mtim.tv_sec, facts.st_mtim.tv_nsec};
}

bool SetModificationTime(const std::string& path, ExactTime time) {
  const timespec times[2] = {{0, UTIME_OMIT}, {time.seconds, time.nanoseconds}};
  return utimensat(AT_FDCWD, path.c_str(), times, AT_SYMLINK_NOFOLLOW) == 0;
}

bool CopyTimes(const std::string& from, const std::string& to) {
  const auto time = ModificationTime(from);
  return time && SetModificationTime(to, *time);
}

ReadResult ReadWholeFile(const std::string& path, uint64_t most, std::string& contents) {
  contents.clear();
  struct stat facts;
  if (FaultDue()) return FileExists(path) ? ReadResult::Failed : ReadResult::Missing;
  Handle handle = OpenRegular(path.c_str(), O_RDONLY, facts);
  for (int attempt = 0; !handle.IsOpen(); ++attempt) {
    const bool missing = errno == ENOENT;
    if (!FileExists(path)) return ReadResult::Missing;
    if (!missing || attempt == kMostAppearances) return ReadResult::Failed;
    // it was just created, unless it is a dangling link
    handle = OpenRegular(path.c_str(), O_RDONLY, facts);
  }
  const uint64_t size = static_cast<uint64_t>(facts.st_size);
  if (size > most) return ReadResult::TooLarge;
  ReadResult result = ReadResult::Failed;
  try {
    result = ReadToEnd(handle.Number(), size, std::min<uint64_t>(most, INT64_MAX - 1), contents);
  } catch (const std::bad_alloc&) {
  } catch (const std::length_error&) {
  }
  if (result != ReadResult::Done) contents.clear();
  return result;
}

bool WriteWholeFile(const std::string& path, std::string_view contents) {
  OutputFile file;
  return file.Create(path) &&
         file.Write({reinterpret_cast<const uint8_t*>(contents.data()), contents.size()}) &&
         file.Commit(Existing::Replace, true) == CommitResult::Done;
}

}  // namespace fotomill::platform
