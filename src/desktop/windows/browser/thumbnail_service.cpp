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
  loader_.reset();  // before its events' handler goes
}

void ThumbnailService::FetchResults() {
  const std::vector<ThumbnailLoader::Result> results = loader_->FetchResults();
  for (const ThumbnailLoader::Result& result : results) {
    // A stand-in that comes late is of no use.
    const bool late = result.request.standIn && cache_.FindAny(result.request.path) != nullptr;
    if (result.thumbnail != nullptr && !late) cache_.Put(result.request, result.thumbnail);
  }
  if (listener_ && !results.empty()) listener_(results);
}

}  // namespace fotomill::desktop
