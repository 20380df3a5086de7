#include "desktop/windows/similar/group_thumbnails.h"

#include <utility>

#include "core/choice_lists.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "settings/job_options.h"

namespace fotomill::desktop {

namespace {

constexpr uint64_t kCacheBytes = 32 * 1024 * 1024;  // some screens
constexpr size_t kMostBitmaps = 200;

ThumbnailRequest RequestOf(const SimilarPicture& picture, int side) {
  return {.path = picture.path,
          .modified = picture.modified,
          .size = picture.stamp.size,
          .side = side,
          .mode = choice::kDiskBased,
          .options = ThumbnailOptionsFromSettings()};
}

}  // namespace

GroupThumbnails::GroupThumbnails(std::function<void()> came)
    : came_(std::move(came)),
      cache_(kCacheBytes),
      loader_(std::make_unique<ThumbnailLoader>(ThumbnailsAtOnce(), [this, post = calls_.Poster()] {
        post([this] { FetchResults(); });
      })) {}

GroupThumbnails::~GroupThumbnails() { DestroyInBackground(std::move(loader_)); }

void GroupThumbnails::Want(const std::vector<SimilarPicture>& pictures, int side, double scale) {
  std::vector<ThumbnailRequest> requests;
  for (const SimilarPicture& picture : pictures) {
    ThumbnailRequest request = RequestOf(picture, static_cast<int>(side * scale));
    if (cache_.Find(request) == nullptr) requests.push_back(std::move(request));
  }
  loader_->Want(std::move(requests));
}

const wxBitmap* GroupThumbnails::Find(const SimilarPicture& picture, int side, double scale) {
  const ThumbnailPointer thumbnail =
      cache_.Find(RequestOf(picture, static_cast<int>(side * scale)));
  if (thumbnail == nullptr) return nullptr;
  if (bitmaps_.size() > kMostBitmaps && !bitmaps_.contains(thumbnail)) bitmaps_.clear();
  const auto [place, added] = bitmaps_.try_emplace(thumbnail);
  if (added) place->second = BitmapOf(thumbnail->pixels, scale);
  return &place->second;
}

void GroupThumbnails::FetchResults() {
  bool any = false;
  for (const ThumbnailLoader::Result& result : loader_->FetchResults()) {
    if (result.thumbnail == nullptr) continue;
    cache_.Put(result.request, result.thumbnail);
    any = true;
  }
  if (any) came_();
}

}  // namespace fotomill::desktop
