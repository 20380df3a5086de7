#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "core/workers/stop_token.h"
#include "settings/folder_override.h"

namespace fotomill::desktop {

// A line of a browser: a folder, or a file of a known format.
struct FolderItem {
  std::string name;
  bool folder = false;
  int32_t format = -1;  // row in the registry
  uint64_t size = 0;
  int64_t modified = 0;                     // seconds since 1970-01-01 UTC
  int32_t width = 0, height = 0, bits = 0;  // 0 until the header is read
  // the EXIF date as a sortable number; 0: none or not read yet
  int64_t taken = 0;
  // once they were read: -1 (rejected) to 5 stars, and the color label, English or another
  // program's
  bool tagged = false;
  // not `tagged`, but rating and label are those from before the file was changed
  bool outdated = false;
  int32_t rating = 0;
  std::string label = {};

  bool operator==(const FolderItem&) const = default;
};

// Whether a folder could be listed. Missing only if it certainly does not exist.
enum class FolderState { Listed, Missing, Unreadable };

// The result of listing a folder; no items unless Listed.
struct FolderListing {
  FolderState state = FolderState::Unreadable;
  std::string problem = {};            // unless Listed: why not, in sentences
  BrowserModes chosen = {-1, -1, -1};  // modes that the folder itself asks for; -1: none
  std::vector<FolderItem> items = {};  // unsorted
};

// Lists the files in a folder and its subfolders, as ListForBrowser, but without the folders; names
// are relative to `folder`. Links to folders are not followed, unreadable subfolders left out.
FolderListing ListWithSubfolders(const std::string& folder, const StopToken& stop);
// The name of an item without the folders of such a listing.
std::string_view ShownName(const FolderItem& item);

// Lists what a browser shows: folders and files of known formats, without hidden ones and thumbnail
// files. Without `facts`, sizes and times stay 0, which is many times faster. If stopped, returns
// what it has.
FolderListing ListForBrowser(const std::string& folder, bool facts, const StopToken& stop);

// Lists those of the named files that still exist; names are relative to the folder.
FolderListing ListNames(const std::string& folder, const std::vector<std::string>& names,
                        const StopToken& stop);

// Names of the folders in a folder, without hidden ones, sorted.
std::vector<std::string> SubfolderNames(const std::string& folder);

// Sets size and time of listed items.
void AddFacts(const std::string& folder, FolderListing& listing, const StopToken& stop);

// Sets dimensions, depth and EXIF date of a file from its header.
void AddPictureFacts(const std::string& folder, FolderItem& item);

// Sets rating and label of a file.
void AddPictureTags(const std::string& folder, FolderItem& item);

}  // namespace fotomill::desktop
