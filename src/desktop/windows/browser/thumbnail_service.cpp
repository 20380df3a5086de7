#include "desktop/windows/browser/thumbnail_service.h"

namespace fotomill::desktop {

namespace {

constexpr uint64_t kCacheBytes = 256ull * 1024 * 1024;

}  // namespace

ThumbnailService::ThumbnailService()
    : cache_(kCacheBytes), loader_(std::make_unique<ThumbnailLoader>(ThumbnailsAtOnce(), [this] {
        CallAfter([this] { FetchResults(); });
      })) {}

ThumbnailService::~ThumbnailService() {
  loader_.reset();  // before the handler of its events is destroyed
}

void ThumbnailService::FetchResults() {
  const std::vector<ThumbnailLoader::Result> results = loader_->FetchResults();
  for (const ThumbnailLoader::Result& result : results) {
    // Ignore stand-ins that arrive late.
    const bool late = result.request.standIn && cache_.FindAny(result.request.path) != nullptr;
    if (result.thumbnail != nullptr && !late) cache_.Put(result.request, result.thumbnail);
  }
  if (listener_ && !results.empty()) listener_(results);
}

}  // namespace fotomill::desktop
