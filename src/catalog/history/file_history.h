#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace fotomill {

template <int32_t side> struct SquareThumbnailRecord;
using ThumbnailRecord = SquareThumbnailRecord<96>;

// The file history: the picture files used, with function and time. A list in memory, saved between
// runs in the text file FileHistoryDatabase + ".fhdb" in the data folder, with one line per entry
// in list order:
//
//   tab PATH: path  tab FUNCTION: decimal  tab ACCESSED: decimal seconds since 1970 UTC
//   tab END: newline
//
// Creation time and size are read from the file again when an entry is loaded. Main thread only.
// to the main thread.

// Numbers in the file, and bits in FileHistoryFunctions.
enum class FileFunction : int32_t {
  View = 0,
  Paint,
  ContactSheet,
  WebGallery,
  Annotate,
  Print,
  Transform,
  Filter,
  Effects,
  Convert,
  GetInfo,
  MoveAndCopy,
  CopyToClipboard,
  Crop,
  Matt,
  Watermark,
  FileTime,
  PhotoWorkshop,
  FindSimilar,
  Catalog,
};
// Number of functions, and the value for "none".
inline constexpr int32_t kFileFunctionCount = 20;
inline constexpr int32_t kNoFileFunction = -1;  // no function

// Options of the history, from the FileHistory... keys.
struct HistoryOptions {
  bool on = true;
  bool offForGood = true;        // if off, also in later runs
  uint32_t functions = 0x2FFF3;  // a bit for each function to record
  bool limitDays = false;        // limit by days, else by count
  int32_t days = 30, count = 20;
  std::string name = "FMWFileHistoryDatabase";  // of the file, without extension
};

// Display name; empty for an unknown number.
std::string_view FileFunctionName(int32_t function);
// Finds a function by name, ignoring case; kNoFileFunction if not found.
int32_t FileFunctionOfName(std::string_view name);

// Use the file's creation time, or the current time.
inline constexpr int32_t kOwnTime = -1;

// Whether a path can be stored in the file: 1
// to 260 bytes without tab, line end or NUL.
bool FitsFileHistory(std::string_view path);

// Adds an entry, or updates function and access time of the entry with that path, then sorts and
// limits the list. False if nothing was recorded: the history or the function is disabled, the path
// is not a regular file or cannot be stored, or memory ran out.
bool RecordFileHistory(const HistoryOptions& options, std::string_view path, FileFunction function,
                       int32_t created = kOwnTime, int32_t accessed = kOwnTime);

// Loads the history file into the list. False if the history is disabled or the file cannot be
// read.
bool LoadFileHistory(const HistoryOptions& options);
// Writes the list to the history file and frees it. If the history is disabled, deletes the history
// file; if there is no list, only after a call of LoadFileHistory. False if the file cannot be
// written or was never read.
bool SaveFileHistory(const HistoryOptions& options);
// Frees the list.
bool ClearFileHistory();

// Path of the history file; empty without a data folder, or if the name is invalid.
std::string FileHistoryPath(const HistoryOptions& options);

// An entry. The path is a view into the list, valid until it changes.
struct FileHistoryEntry {
  std::string_view path;
  int32_t function = 0;
  int32_t created = 0, accessed = 0;  // seconds since 1970 UTC
  uint64_t size = 0;                  // bytes
};
// Number of entries; 0 if not loaded.
size_t FileHistoryCount();
FileHistoryEntry FileHistoryAt(size_t index);  // from 0, most recent first
// The thumbnail of an entry, loaded from its thumbnail file on first use; null if there is none.
// Valid until the list changes.
const ThumbnailRecord* FileHistoryThumbnail(size_t index);

// A use of a file by a command.
struct FileUse {
  std::string path;  // absolute
  FileFunction function = FileFunction::View;
  int32_t created = kOwnTime;
  int32_t accessed = kOwnTime;
  bool removed = false;  // the path no longer exists: its entry is removed
  // the previous path of the file or folder: its entry, or those of the files in it, continue under
  // `path`, to which the use is then recorded
  std::string from = {};
};

// The result of recording a command's uses.
enum class HistoryUpdate {
  Done,     // loaded, recorded and saved
  Off,      // disabled: nothing was recorded
  NotRead,  // the history file cannot be read or is not valid: left unchanged
  Failed,   // it could not be written, or has no path: left unchanged
};
// Permanently records uses, in order: locks the history file, loads it to keep entries of other
// processes, records, and replaces the file atomically. `recorded` counts recorded uses, not
// entries that only follow their files. A file that has vanished since its use counts as removed.
// If the history is disabled permanently, the history file is deleted; if only for this run, it is
// kept. The list is freed afterwards.
HistoryUpdate UpdateFileHistory(const HistoryOptions& options, std::span<const FileUse> uses,
                                size_t* recorded = nullptr);

}  // namespace fotomill
