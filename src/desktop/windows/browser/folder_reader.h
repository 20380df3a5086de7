#pragma once

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/browser/folder_listing.h"
#include "desktop/models/browser/missing_facts.h"
#include "desktop/windows/widgets/loose_work.h"

namespace fotomill::desktop {

// Reads a browser's folder in the background: its contents, and facts from the files' headers.
class FolderReader {
 public:
  // `last`: no more follow.
  using Found = std::function<void(const PlacedItems& found, bool last)>;
  // Called on the window's thread, never after the reader is destroyed.
  struct Events {
    // `complete` is false for the first listing with names only, if requested.
    std::function<void(FolderListing listing, bool complete)> listed;
    Found factsFound;
    Found tagsFound;
  };
  explicit FolderReader(Events events) : events_(std::move(events)) {}

  // Lists a folder. With `namesFirst`, names are delivered first, and sizes and times in a second,
  // complete list, so that even a folder of 100,000 files is shown immediately.
  // With `subfolders`, lists the files in them as well.
  void List(const std::string& folder, bool namesFirst, bool subfolders);
  // Lists only these files, by names relative to the folder.
  void ListFound(const std::string& folder, std::vector<std::string> names);
  // Whether a listing is in progress.
  bool Listing() const { return listing_.Started(); }
  // Reads the headers of items; results are delivered
  // in batches. Stopped by the next listing.
  void ReadFacts(const std::string& folder, PlacedItems wanted);
  // Reads ratings and labels of items, likewise; instead of those being read.
  void ReadTags(const std::string& folder, PlacedItems wanted);
  // Whether headers are being read.
  bool ReadingFacts() const { return facts_.Started(); }

 private:
  void ReadItems(LooseWork& work, PlacedItems wanted, std::function<bool(FolderItem& item)> read,
                 const Found& found);

  const Events events_;
  LooseWork listing_;
  LooseWork facts_, tags_;
};

}  // namespace fotomill::desktop
