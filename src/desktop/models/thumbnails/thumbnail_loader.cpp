#include "desktop/models/thumbnails/thumbnail_loader.h"

#include <algorithm>

#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"

namespace fotomill::desktop {

ThumbnailLoader::ThumbnailLoader(unsigned atOnce, std::function<void()> wake, Load load, void (*idle)())
    : wake_(std::move(wake)), load_(load), idle_(idle), work_(Lane::Compute, atOnce, [this] { return Next(); }) {}

void ThumbnailLoader::Want(std::vector<ThumbnailWish> wishes) {
  {
    const std::lock_guard lock(mutex_);
    std::erase_if(wishes, [this](const ThumbnailWish& wish) { return std::ranges::find(inWork_, wish) != inWork_.end(); });
    std::reverse(wishes.begin(), wishes.end());
    wishes_ = std::move(wishes);
  }
  work_.Look();
}

std::vector<ThumbnailLoader::Result> ThumbnailLoader::TakeResults() {
  const std::lock_guard lock(mutex_);
  return std::exchange(results_, {});
}

size_t ThumbnailLoader::Pending() const {
  const std::lock_guard lock(mutex_);
  return wishes_.size() + inWork_.size() + results_.size();
}

LatestWork::Piece ThumbnailLoader::Next() {
  const std::lock_guard lock(mutex_);
  if (wishes_.empty()) return {};
  ThumbnailWish wish = std::move(wishes_.back());
  wishes_.pop_back();
  inWork_.push_back(wish);
  return [this, wish = std::move(wish)] { LoadOne(wish); };
}

void ThumbnailLoader::LoadOne(ThumbnailWish wish) {
  ThumbnailPointer thumbnail;
  const Status status = Guarded([&] {
    const FolderScope folder(wish.path);
    thumbnail = load_(wish);
  });
  if (status != Status::Ok) {
    auto failed = std::make_shared<Thumbnail>();
    failed->status = status;
    thumbnail = std::move(failed);
  }
  std::unique_lock lock(mutex_);
  inWork_.erase(std::ranges::find(inWork_, wish));
  if (wish.standIn && thumbnail != nullptr && !thumbnail->standIn) {
    wish.standIn = false;
    std::erase(wishes_, wish);
  }
  const bool tell = results_.empty();
  results_.push_back({std::move(wish), std::move(thumbnail)});
  const bool last = wishes_.empty() && inWork_.empty();
  lock.unlock();
  if (tell) wake_();
  if (last) idle_();
}

unsigned ThumbnailsAtOnce() { return std::max(WorkerPool::Shared().Cores(), 2u) - 1; }

ThumbnailPointer ThumbnailCache::Find(const ThumbnailWish& wish) {
  const auto found = places_.find(wish.path);
  if (found == places_.end() || found->second->wish != wish) return nullptr;
  entries_.splice(entries_.begin(), entries_, found->second);
  return found->second->thumbnail;
}

ThumbnailPointer ThumbnailCache::FindAny(const std::string& path) const {
  const auto found = places_.find(path);
  return found == places_.end() ? nullptr : found->second->thumbnail;
}

void ThumbnailCache::Put(const ThumbnailWish& wish, ThumbnailPointer thumbnail) {
  if (const auto found = places_.find(wish.path); found != places_.end()) {
    bytes_ -= found->second->thumbnail->Bytes();
    entries_.erase(found->second);
    places_.erase(found);
  }
  bytes_ += thumbnail->Bytes();
  entries_.push_front({wish, std::move(thumbnail)});
  places_[wish.path] = entries_.begin();
  while (bytes_ > capacity_ && entries_.size() > 1) {
    bytes_ -= entries_.back().thumbnail->Bytes();
    places_.erase(entries_.back().wish.path);
    entries_.pop_back();
  }
}

void ThumbnailCache::Clear() {
  entries_.clear();
  places_.clear();
  bytes_ = 0;
}

}  // namespace fotomill::desktop
