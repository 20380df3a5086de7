#include "desktop/models/thumbnails/thumbnail_loader.h"

#include <algorithm>
#include <utility>

#include "core/workers/folder_scope.h"
#include "core/workers/guarded.h"

namespace fotomill::desktop {

ThumbnailLoader::ThumbnailLoader(unsigned atOnce, std::function<void()> wake, Load load,
                                 void (*idle)())
    : wake_(std::move(wake)),
      load_(load),
      idle_(idle),
      work_(Lane::Compute, atOnce, [this] { return Next(); }) {}

void ThumbnailLoader::Want(std::vector<ThumbnailRequest> requests) {
  {
    const std::lock_guard lock(mutex_);
    std::erase_if(requests, [this](const ThumbnailRequest& request) {
      return std::ranges::find(inWork_, request) != inWork_.end();
    });
    std::reverse(requests.begin(), requests.end());
    requests_ = std::move(requests);
  }
  work_.Look();
}

std::vector<ThumbnailLoader::Result> ThumbnailLoader::FetchResults() {
  const std::lock_guard lock(mutex_);
  return std::exchange(results_, {});
}

size_t ThumbnailLoader::Pending() const {
  const std::lock_guard lock(mutex_);
  return requests_.size() + inWork_.size() + results_.size();
}

LatestWork::Piece ThumbnailLoader::Next() {
  const std::lock_guard lock(mutex_);
  if (requests_.empty()) return {};
  ThumbnailRequest request = std::move(requests_.back());
  requests_.pop_back();
  inWork_.push_back(request);
  return [this, request = std::move(request)] { LoadOne(request); };
}

void ThumbnailLoader::LoadOne(ThumbnailRequest request) {
  ThumbnailPointer thumbnail;
  const Status status = Guarded([&] {
    const FolderScope folder(request.path);
    thumbnail = load_(request);
  });
  if (status != Status::Ok) {
    auto failed = std::make_shared<Thumbnail>();
    failed->status = status;
    thumbnail = std::move(failed);
  }
  std::unique_lock lock(mutex_);
  inWork_.erase(std::ranges::find(inWork_, request));
  if (request.standIn && thumbnail != nullptr && !thumbnail->standIn) {
    request.standIn = false;
    std::erase(requests_, request);
  }
  const bool tell = results_.empty();
  results_.push_back({std::move(request), std::move(thumbnail)});
  const bool last = requests_.empty() && inWork_.empty();
  lock.unlock();
  if (tell) wake_();
  if (last) idle_();
}

unsigned ThumbnailsAtOnce() { return std::max(WorkerPool::Shared().Cores(), 2u) - 1; }

ThumbnailPointer ThumbnailCache::Find(const ThumbnailRequest& request) {
  const auto found = places_.find(request.path);
  if (found == places_.end() || found->second->request != request) return nullptr;
  entries_.splice(entries_.begin(), entries_, found->second);
  return found->second->thumbnail;
}

ThumbnailPointer ThumbnailCache::FindAny(const std::string& path) const {
  const auto found = places_.find(path);
  return found == places_.end() ? nullptr : found->second->thumbnail;
}

void ThumbnailCache::Put(const ThumbnailRequest& request, ThumbnailPointer thumbnail) {
  if (const auto found = places_.find(request.path); found != places_.end()) {
    bytes_ -= found->second->thumbnail->Bytes();
    entries_.erase(found->second);
    places_.erase(found);
  }
  bytes_ += thumbnail->Bytes();
  entries_.push_front({request, std::move(thumbnail)});
  places_[request.path] = entries_.begin();
  Shrink();
}

void ThumbnailCache::SetCapacity(uint64_t capacity) {
  capacity_ = capacity;
  Shrink();
}

void ThumbnailCache::Shrink() {
  while (bytes_ > capacity_ && entries_.size() > 1) {
    bytes_ -= entries_.back().thumbnail->Bytes();
    places_.erase(entries_.back().request.path);
    entries_.pop_back();
  }
}

void ThumbnailCache::Clear() {
  entries_.clear();
  places_.clear();
  bytes_ = 0;
}

}  // namespace fotomill::desktop
