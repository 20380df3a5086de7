#include "desktop/windows/browser/thumbnail_service.h"

#include <algorithm>

namespace fotomill::desktop {

namespace {

constexpr uint64_t kUsualBytes = 24 * 1024 * 1024;  // about 1,000 thumbnails of 96 pixels

}  // namespace

ThumbnailService::ThumbnailService()
    : cache_(kUsualBytes), loader_(std::make_unique<ThumbnailLoader>(ThumbnailsAtOnce(), [this] {
        CallAfter([this] { FetchResults(); });
      })) {}

ThumbnailService::~ThumbnailService() {
  loader_.reset();  // before the handler of its events is destroyed
}

void ThumbnailService::Want(std::vector<ThumbnailRequest> requests) {
  ofBrowser_ = std::move(requests);
  WantBoth();
}

void ThumbnailService::WantForStrip(const void* owner, std::vector<ThumbnailRequest> requests,
                                    std::function<void()> came) {
  stripOwner_ = owner;
  stripCame_ = std::move(came);
  ofStrip_ = std::move(requests);
  WantBoth();
}

void ThumbnailService::EndStrip(const void* owner) {
  if (owner == stripOwner_) WantForStrip(nullptr, {}, nullptr);
}

void ThumbnailService::WantBoth() {
  std::vector<ThumbnailRequest> requests = ofStrip_;
  requests.insert(requests.end(), ofBrowser_.begin(), ofBrowser_.end());
  loader_->Want(std::move(requests));
}

void ThumbnailService::MakeRoomFor(uint64_t bytes) {
  cache_.SetCapacity(std::max(bytes, kUsualBytes));
}

void ThumbnailService::FetchResults() {
  const std::vector<ThumbnailLoader::Result> results = loader_->FetchResults();
  for (const ThumbnailLoader::Result& result : results) {
    // Ignore stand-ins that arrive late.
    const bool late = result.request.standIn && cache_.FindAny(result.request.path) != nullptr;
    if (result.thumbnail != nullptr && !late) cache_.Put(result.request, result.thumbnail);
  }
  if (results.empty()) return;
  const auto isDone = [&](const ThumbnailRequest& request) {
    return cache_.FindAny(request.path) != nullptr;
  };
  if (std::erase_if(ofStrip_, isDone) > 0 && stripCame_) stripCame_();
  if (listener_) listener_(results);
}

}  // namespace fotomill::desktop
