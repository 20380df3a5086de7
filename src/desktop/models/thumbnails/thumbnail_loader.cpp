#include "desktop/models/thumbnails/thumbnail_loader.h"

#include <algorithm>

#include "platform/process.h"

namespace fotomill::desktop {

ThumbnailLoader::ThumbnailLoader(unsigned workers, std::function<void()> wake, Load load, void (*idle)())
    : wake_(std::move(wake)), load_(load), idle_(idle) {
  for (unsigned i = 0; i < workers; ++i) workers_.emplace_back([this] { Work(); });
}

ThumbnailLoader::~ThumbnailLoader() {
  {
    const std::lock_guard lock(mutex_);
    stop_ = true;
    wishes_.clear();
  }
  wanted_.notify_all();
  for (std::thread& worker : workers_) worker.join();
}

void ThumbnailLoader::Want(std::vector<ThumbnailWish> wishes) {
  {
    const std::lock_guard lock(mutex_);
    std::erase_if(wishes, [this](const ThumbnailWish& wish) { return std::ranges::find(inWork_, wish) != inWork_.end(); });
    std::reverse(wishes.begin(), wishes.end());
    wishes_ = std::move(wishes);
  }
  wanted_.notify_all();
}

std::vector<ThumbnailLoader::Result> ThumbnailLoader::TakeResults() {
  const std::lock_guard lock(mutex_);
  return std::exchange(results_, {});
}

size_t ThumbnailLoader::Pending() const {
  const std::lock_guard lock(mutex_);
  return wishes_.size() + inWork_.size() + results_.size();
}

void ThumbnailLoader::Work() {
  std::unique_lock lock(mutex_);
  while (true) {
    wanted_.wait(lock, [this] { return stop_ || !wishes_.empty(); });
    if (stop_) return;
    ThumbnailWish wish = std::move(wishes_.back());
    wishes_.pop_back();
    inWork_.push_back(wish);
    lock.unlock();
    ThumbnailPointer thumbnail = load_(wish);
    lock.lock();
    inWork_.erase(std::ranges::find(inWork_, wish));
    if (wish.standIn && thumbnail != nullptr && !thumbnail->standIn) {
      wish.standIn = false;
      std::erase(wishes_, wish);
    }
    const bool tell = results_.empty() && !stop_;
    results_.push_back({std::move(wish), std::move(thumbnail)});
    const bool last = wishes_.empty() && inWork_.empty();
    lock.unlock();
    if (tell) wake_();
    if (last) idle_();
    lock.lock();
  }
}

unsigned WorkerCount() { return std::max(platform::CoreCount(), 2u) - 1; }

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
