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

// File metadata. Times are seconds since 1970-01-01 UTC.
struct FileFacts {
  FileKind kind = FileKind::Missing;
  uint64_t size = 0;
  int64_t modified = 0;
  // birth time if the file system stores it, else modification time
  int64_t created = 0;
  bool link = false;                  // the name itself is a symbolic link
  uint64_t device = 0, identity = 0;  // together they identify the file, whatever its path
};

// Facts of the file that `path` refers to, following links. Missing is a kind, not an error. Other
// if it cannot be determined (no permission to search a folder), so the name is not taken for free.
FileFacts FactsOf(const std::string& path);
bool FileExists(const std::string& path);  // anything with that name, including a dangling link
bool IsRegularFile(const std::string& path);  // links are followed
bool IsFolder(const std::string& path);  // links are followed

// Names in a folder, without "." and "..", in byte order. nullopt if it cannot be read.
struct FolderEntry {
  std::string name;
  FileKind kind;  // of a link: its target's, Other if dangling
  bool link;      // the entry is a symbolic link; not followed when descending into folders
};
// Reads the whole folder; links are resolved once for their kind.
std::optional<std::vector<FolderEntry>> ListFolder(const std::string& path);
// Creates a folder with its parents; true if it exists afterwards.
[[nodiscard]] bool MakeFolders(const std::string& path);

// Deletes one file, never a folder. A symbolic link is deleted, not its target.
[[nodiscard]] bool DeleteFile(const std::string& path);
// Deletes an empty folder.
[[nodiscard]] bool DeleteFolder(const std::string& path);
// Renames within one file system. Failed if the destination is neither a regular file nor a link.
// On case-insensitive file systems, the case of a name may be changed.
[[nodiscard]] CommitResult RenameFile(const std::string& from, const std::string& to,
                                      Existing existing);
// Moves a file, folder or link into the system's trash, from which the user can restore it. False
// if there is no trash for it; nothing is changed then.
[[nodiscard]] bool MoveToTrash(const std::string& path);
// Restores what MoveToTrash last removed from that path. False if it is no longer in the trash, or
// if the path is taken.
[[nodiscard]] bool RestoreFromTrash(const std::string& path);
// Whether MoveToTrash can work for that path, without trying it.
bool HasTrash(const std::string& path);

// Sets or clears the hidden attribute. On systems that hide files by a leading dot, SetHidden
// returns true and changes nothing.
[[nodiscard]] bool SetHidden(const std::string& path, bool hidden);
bool IsHidden(const std::string& path);  // a leading dot, or the hidden attribute
// Clears the hidden and read-only attributes.
[[nodiscard]] bool SetNormal(const std::string& path);
// A file's modification time, in the file system's resolution.
struct ExactTime {
  int64_t seconds = 0;
  int64_t nanoseconds = 0;
  bool operator==(const ExactTime&) const = default;
};
// Of the file that a path refers to, following links. nullopt or false if it does not exist or
// permission is denied.
std::optional<ExactTime> ModificationTime(const std::string& path);
// False if the system refuses.
[[nodiscard]] bool SetModificationTime(const std::string& path, ExactTime time);
// Copies a file's modification time to another file, in the file system's resolution.
[[nodiscard]] bool CopyTimes(const std::string& from, const std::string& to);

// Reads a small file, at most `most` bytes. Missing and Failed are
// distinct, so that callers do not overwrite a file they could not
// read. A dangling link is Failed. `contents` is empty unless Done.
enum class ReadResult { Done, Missing, Failed, TooLarge };
ReadResult ReadWholeFile(const std::string& path, uint64_t most, std::string& contents);
// Replaces a file's contents atomically, synced. On false, the old file is unchanged.
[[nodiscard]] bool WriteWholeFile(const std::string& path, std::string_view contents);

}  // namespace fotomill::platform
