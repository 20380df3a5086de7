#pragma once

#include <functional>
#include <string>
#include <utility>
#include <vector>

#include "desktop/models/browser/folder_listing.h"
#include "desktop/windows/widgets/loose_work.h"

namespace fotomill::desktop {

// Items by their place in the list that they were taken from.
using PlacedItems = std::vector<std::pair<size_t, FolderItem>>;

// Reads a browser's folder apart from the window: what is in it, and what only the headers of files
// tell.
class FolderReader {
 public:
  // Called on the window's thread, never after the reader has gone.
  struct Events {
    // Names alone first where that was asked for: `complete` is false then.
    std::function<void(FolderListing listing, bool complete)> listed;
    // `last`: nothing more comes.
    std::function<void(const PlacedItems& found, bool last)> factsFound;
  };
  explicit FolderReader(Events events) : events_(std::move(events)) {}

  // Lists a folder. With `namesFirst` the names come at once and sizes and times in a second,
  // complete list, so that even a folder of 100,000 files is shown at once.
  void List(const std::string& folder, bool namesFirst);
  // Whether a listing is in progress.
  bool Listing() const { return listing_.Started(); }
  // Reads the headers of items; those that told something come in bunches. Ends with the next
  // listing.
  void ReadFacts(const std::string& folder, PlacedItems wanted);
  // Whether headers are being read.
  bool ReadingFacts() const { return facts_.Started(); }

 private:
  const Events events_;
  LooseWork listing_;
  LooseWork facts_;
};

}  // namespace fotomill::desktop
