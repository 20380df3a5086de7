#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "core/workers/stop_token.h"

namespace fotomill::desktop {

// One line of a browser: a folder, or a file of a format that the registry knows.
struct FolderItem {
  std::string name;
  bool folder = false;
  int32_t format = -1;  // row of the registry
  uint64_t size = 0;
  int64_t modified = 0;                     // seconds since 1970-01-01 UTC
  int32_t width = 0, height = 0, bits = 0;  // 0 until the file's header is read
  // the EXIF date as a number that sorts, 0 without one or before it is read
  int64_t taken = 0;

  bool operator==(const FolderItem&) const = default;
};

// What reading a folder gave; no items where it cannot be read.
struct FolderListing {
  bool readable = false;
  std::vector<FolderItem> items;  // in no particular order
};

// What a browser shows of a folder: folders, and files of known formats, without hidden ones and
// thumbnail files. With `facts` off, sizes and times stay 0, which is many times faster. Ends
// early, with what it has, when `stop` is asked.
FolderListing ListForBrowser(const std::string& folder, bool facts, const StopToken& stop);

// The names of the folders in a folder, without hidden ones, in order.
std::vector<std::string> SubfolderNames(const std::string& folder);

// Fills in size and time of listed items.
void AddFacts(const std::string& folder, FolderListing& listing, const StopToken& stop);

// Fills in dimensions, depth and EXIF date of one file from its header.
void AddPictureFacts(const std::string& folder, FolderItem& item);

}  // namespace fotomill::desktop
