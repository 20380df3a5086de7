#pragma once

#include <list>
#include <mutex>
#include <string>
#include <unordered_map>

#include "catalog/thumbnails/thumbnail_database.h"

namespace fotomill {

// The in-memory records of the virtual mode: of the pictures most recently shown in browser lists,
// at most 2,000 (56 MB). Thread-safe.
class ListedThumbnails {
 public:
  // Finds the record of a picture. False if there is none, or its contents have changed.
  bool Find(const std::string& path, const PictureStamp& stamp, ThumbnailRecord& record);
  // Adds or replaces the record of a picture.
  void Attach(const std::string& path, const PictureStamp& stamp, const ThumbnailRecord& record);

 private:
  static constexpr size_t kMost = 2000;
  struct Entry {
    std::string path;
    PictureStamp stamp;
    ThumbnailRecord record;
  };
  std::mutex mutex_;
  std::list<Entry> entries_;  // most recently attached first
  std::unordered_map<std::string, std::list<Entry>::iterator> places_;
};

}  // namespace fotomill
