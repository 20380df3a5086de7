#include "catalog/thumbnails/listed_thumbnails.h"

namespace fotomill {

bool ListedThumbnails::Find(const std::string& path, const PictureStamp& stamp,
                            ThumbnailRecord& record) {
  const std::lock_guard lock(mutex_);
  const auto found = places_.find(path);
  if (found == places_.end() || !found->second->stamp.Suits(stamp)) return false;
  record = found->second->record;
  return true;
}

void ListedThumbnails::Attach(const std::string& path, const PictureStamp& stamp,
                              const ThumbnailRecord& record) {
  const std::lock_guard lock(mutex_);
  if (const auto found = places_.find(path); found != places_.end()) {
    entries_.erase(found->second);
    places_.erase(found);
  }
  entries_.push_front({path, stamp, record});
  places_[path] = entries_.begin();
  if (entries_.size() <= kMost) return;
  places_.erase(entries_.back().path);
  entries_.pop_back();
}

}  // namespace fotomill
