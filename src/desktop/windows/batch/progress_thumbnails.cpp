#include "desktop/windows/batch/progress_thumbnails.h"

#include <algorithm>
#include <utility>

#include "core/choice_lists.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/thumbnail_service.h"
#include "platform/files.h"
#include "settings/job_options.h"

namespace fotomill::desktop {

namespace {

constexpr uint64_t kCacheBytes = 32ull * 1024 * 1024;

bool IsShown(const ThumbnailPointer& thumbnail) {
  return thumbnail != nullptr && thumbnail->status == Status::Ok && !thumbnail->pixels.Empty();
}

}  // namespace

ProgressThumbnails::ProgressThumbnails(ThumbnailService& browser, bool makes,
                                       std::function<void()> came)
    : browser_(browser),
      makes_(makes),
      came_(std::move(came)),
      cache_(kCacheBytes),
      loader_(1, [this] { CallAfter([this] { FetchResults(); }); }) {}

ThumbnailPointer ProgressThumbnails::Find(const std::string& path) const {
  for (const ThumbnailPointer& there : {browser_.FindAny(path), cache_.FindAny(path)})
    if (IsShown(there)) return there;
  return nullptr;
}

void ProgressThumbnails::Want(const std::string& path, int side) {
  if (settled_.contains(path) || std::ranges::find(wanted_, path) != wanted_.end()) return;
  side_ = side;
  if (wanted_.empty()) CallAfter([this] { Order(); });
  wanted_.push_back(path);
}

// Pending requests for rows no longer visible are dropped; running ones finish.
void ProgressThumbnails::Order() {
  std::vector<ThumbnailRequest> requests;
  for (const std::string& path : std::exchange(wanted_, {})) {
    const platform::FileFacts facts = platform::FactsOf(path);
    if (facts.kind == platform::FileKind::Regular)
      requests.push_back({path, facts.modified, facts.size, side_, choice::kDiskBased, !makes_,
                          ThumbnailOptionsFromSettings()});
  }
  loader_.Want(std::move(requests));
}

void ProgressThumbnails::FetchResults() {
  bool came = false;
  for (const ThumbnailLoader::Result& result : loader_.FetchResults()) {
    settled_.insert(result.request.path);
    if (!IsShown(result.thumbnail)) continue;
    cache_.Put(result.request, result.thumbnail);
    LogEvent("progress-thumbnail", result.request.path);
    came = true;
  }
  if (came) came_();
}

}  // namespace fotomill::desktop
