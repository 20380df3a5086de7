#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "platform/output_file.h"

namespace fotomill::platform {

// Other: FIFO, device, socket, dangling link
enum class FileKind { Missing, Regular, Folder, Other };

// What the system tells of a file. Times are seconds since 1970-01-01 UTC.
struct FileFacts {
  FileKind kind = FileKind::Missing;
  uint64_t size = 0;
  int64_t modified = 0;
  // the birth time where the file system keeps one, else the modification time
  int64_t created = 0;
  bool link = false;                  // the name itself is a symbolic link
  uint64_t device = 0, identity = 0;  // together they name the file itself, whatever its path
};

// Facts of the file that `path` leads to, through links. Missing is a kind, not an error. What
// cannot be asked (a folder on the way may not be searched) is Other: no one may take it for free.
FileFacts FactsOf(const std::string& path);
bool FileExists(const std::string& path);  // anything of that name, a dangling link included
bool IsRegularFile(const std::string& path);  // links are followed
bool IsFolder(const std::string& path);  // links are followed

// Names in a folder, without "." and "..", in byte order. nullopt when it cannot be read.
struct FolderEntry {
  std::string name;
  FileKind kind;  // of a link: what it leads to, Other when that is nothing
  bool link;      // the entry is a symbolic link; who walks down folders does not follow these
};
// Reads the whole folder; links are followed once to tell their kind.
std::optional<std::vector<FolderEntry>> ListFolder(const std::string& path);
// Makes a folder with its parents; true when it is there afterwards.
[[nodiscard]] bool MakeFolders(const std::string& path);

// Deletes one file, never a folder. A path's final link is deleted itself.
[[nodiscard]] bool DeleteFile(const std::string& path);
// Deletes a folder that is empty.
[[nodiscard]] bool DeleteFolder(const std::string& path);
// Renames within one file system. A destination that is there and neither a regular file nor a link
// stays: Failed. Where case does not count, a name may be changed to itself in other case.
[[nodiscard]] CommitResult RenameFile(const std::string& from, const std::string& to,
                                      Existing existing);
// Moves a file, folder or link into the system's trash, from which its user can bring it back.
// False if there is none for it; nothing has happened then.
[[nodiscard]] bool MoveToTrash(const std::string& path);
// Brings back what MoveToTrash took away from that path last. False when it is not in the trash any
// more, or when the path is taken.
[[nodiscard]] bool RestoreFromTrash(const std::string& path);
// Whether MoveToTrash can work for that path, without doing it.
bool HasTrash(const std::string& path);

// The attribute that keeps a file out of listings. Where hidden is what begins with a dot,
// SetHidden answers true and changes nothing.
[[nodiscard]] bool SetHidden(const std::string& path, bool hidden);
bool IsHidden(const std::string& path);  // a leading dot, or the system's attribute
// Clears hidden and read-only.
[[nodiscard]] bool SetNormal(const std::string& path);
// A file's modification time, as finely as the system keeps it.
struct ExactTime {
  int64_t seconds = 0;
  int64_t nanoseconds = 0;
};
// Of the file that a path leads to, through links. nullopt and false when it is not there or not
// ours to change.
std::optional<ExactTime> ModificationTime(const std::string& path);
// False when the system refuses.
[[nodiscard]] bool SetModificationTime(const std::string& path, ExactTime time);
// Gives a file the modification time of another, as finely as the system keeps it.
[[nodiscard]] bool CopyTimes(const std::string& from, const std::string& to);

// A small whole file, at most `most` bytes. Missing and unreadable are told apart: who would
// overwrite a file that it could not read loses it. A link that leads nowhere has failed.
// `contents` is empty unless Done.
enum class ReadResult { Done, Missing, Failed, TooLarge };
ReadResult ReadWholeFile(const std::string& path, uint64_t most, std::string& contents);
// Replaces a file's contents in one step, synced. False leaves the old file unchanged.
[[nodiscard]] bool WriteWholeFile(const std::string& path, std::string_view contents);

}  // namespace fotomill::platform
