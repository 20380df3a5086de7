#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>

namespace fotomill {

template <int32_t side> struct SquareThumbnailRecord;
using ThumbnailRecord = SquareThumbnailRecord<96>;

// The file history: which picture files the user applied which function to, and when. A list in
// memory, kept between runs in the text file FileHistoryDatabase + ".fhdb" of the data folder, one
// line for each entry in list order:
//
//   tab PATH: path  tab FUNCTION: decimal  tab ACCESSED: decimal seconds since 1970 UTC  tab END:
//   newline
//
// Creation time and size are asked of the file again when an entry is loaded. All of this belongs
// to the main thread.

// Numbers in the file, and bits of FileHistoryFunctions.
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
// How many functions there are, and the number of none.
inline constexpr int32_t kFileFunctionCount = 20;
inline constexpr int32_t kNoFileFunction = -1;  // an entry without a function

// What the history is to hold: the FileHistory... keys.
struct HistoryOptions {
  bool on = true;
  bool offForGood = true;        // where it is off, it is so in later runs as well
  uint32_t functions = 0x2FFF3;  // a bit for each function whose files are recorded
  bool limitDays = false;        // by days, else by count
  int32_t days = 30, count = 20;
  std::string name = "FMWFileHistoryDatabase";  // of the file, without extension
};

// Its name as lists show it; empty for an unknown number.
std::string_view FileFunctionName(int32_t function);
// The function of a name, whatever its case; kNoFileFunction if there is none.
int32_t FileFunctionOfName(std::string_view name);

// Stands for the file's own creation time, or for now.
inline constexpr int32_t kOwnTime = -1;

// Whether a path comes back from the file as it was: 1 to 260 bytes without tab, line end or zero
// byte.
bool FitsFileHistory(std::string_view path);

// Adds an entry, or gives the entry of that path another function and access time, puts the list in
// order and limits it as the options say. False when nothing was recorded: the history or that
// function is switched off, the path is no regular file or does not fit, or there is no memory.
bool RecordFileHistory(const HistoryOptions& options, std::string_view path, FileFunction function,
                       int32_t created = kOwnTime, int32_t accessed = kOwnTime);

// Reads the history file into the list. False when the history is switched off or the file cannot
// be read.
bool LoadFileHistory(const HistoryOptions& options);
// Writes the list to the history file, as it is, and frees it. Switched off, the history file is
// deleted; without a list as well, provided that LoadFileHistory was called before. False when the
// file cannot be written or was never read.
bool SaveFileHistory(const HistoryOptions& options);
// Frees the list.
bool ClearFileHistory();

// Path of the history file; empty without a data folder, or when its name is no plain one.
std::string FileHistoryPath(const HistoryOptions& options);

// One entry as lists show it. The path is a view into the list, valid until it changes.
struct FileHistoryEntry {
  std::string_view path;
  int32_t function = 0;
  int32_t created = 0, accessed = 0;  // seconds since 1970 UTC
  uint64_t size = 0;                  // bytes
};
// How many entries the list has; 0 while it is not loaded.
size_t FileHistoryCount();
FileHistoryEntry FileHistoryAt(size_t index);  // from 0, the last use first
// The thumbnail of an entry, read from its file's thumbnail file when it is first asked for; null
// if there is none. It stays where it is until the list changes.
const ThumbnailRecord* FileHistoryThumbnail(size_t index);

// What a command did to a file.
struct FileUse {
  std::string path;  // absolute
  FileFunction function = FileFunction::View;
  int32_t created = kOwnTime;
  int32_t accessed = kOwnTime;
  bool removed = false;  // the path is gone: its entry is taken out instead
  // The file or folder had this path before: its entry, or those of the files in it, continue under
  // `path`, to which the use is then recorded.
  std::string from = {};
};

// What became of the uses that a command recorded.
enum class HistoryUpdate {
  Done,     // loaded, recorded and saved
  Off,      // switched off: nothing was recorded
  NotRead,  // the history file cannot be read, or is something else: it was left alone
  Failed,   // it could not be written, or there is no place for it: it is unchanged
};
// Records uses, in order, permanently: locks the history file, reads it afresh, so that what other
// processes recorded stays, records, and replaces the file in one step. `recorded` counts the uses
// that were, not the entries that merely follow their files. A file that was there when it was used
// and has vanished since counts as removed. With the history switched off permanently the history
// file is deleted; switched off for this run only, it stays. The list is free afterwards.
HistoryUpdate UpdateFileHistory(const HistoryOptions& options, std::span<const FileUse> uses,
                                size_t* recorded = nullptr);

}  // namespace fotomill
