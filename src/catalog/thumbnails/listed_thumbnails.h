#pragma once

#include <list>
#include <mutex>
#include <string>
#include <unordered_map>

#include "catalog/thumbnails/thumbnail_database.h"

namespace fotomill {

// The records of the virtual mode, which live in memory only: those of the pictures that the
// browsers' lists showed last, 2,000 at most (56 MB). From any thread.
class ListedThumbnails {
 public:
  // The record of a picture, unless it was made of other contents. False if there is none.
  bool Find(const std::string& path, const PictureStamp& stamp, ThumbnailRecord& record);
  // Keeps the record of a picture in place of an earlier one.
  void Attach(const std::string& path, const PictureStamp& stamp, const ThumbnailRecord& record);

 private:
  static constexpr size_t kMost = 2000;
  struct Entry {
    std::string path;
    PictureStamp stamp;
    ThumbnailRecord record;
  };
  std::mutex mutex_;
  std::list<Entry> entries_;  // the last attached first
  std::unordered_map<std::string, std::list<Entry>::iterator> places_;
};

}  // namespace fotomill
