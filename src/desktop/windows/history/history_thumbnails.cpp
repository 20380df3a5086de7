#include "desktop/windows/history/history_thumbnails.h"

#include <wx/dcmemory.h>
#include <wx/image.h>

#include <cstring>

#include "core/choice_lists.h"
#include "settings/job_options.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

// Centers a picture in a transparent square.
wxBitmapBundle OnSquare(const RgbImage& pixels, int side, double scale) {
  wxImage square(side, side);
  square.InitAlpha();
  std::memset(square.GetAlpha(), 0, static_cast<size_t>(side) * static_cast<size_t>(side));
  const int left = (side - pixels.width) / 2, top = (side - pixels.height) / 2;
  for (int y = 0; y < pixels.height && pixels.width <= side && pixels.height <= side; ++y) {
    const size_t place =
        static_cast<size_t>(top + y) * static_cast<size_t>(side) + static_cast<size_t>(left);
    std::memcpy(square.GetData() + 3 * place, pixels.Row(y), static_cast<size_t>(pixels.width) * 3);
    std::memset(square.GetAlpha() + place, 255, static_cast<size_t>(pixels.width));
  }
  wxBitmap bitmap(square);
  bitmap.SetScaleFactor(scale);
  return wxBitmapBundle(bitmap);
}

}  // namespace

HistoryThumbnails::HistoryThumbnails(std::function<void(const std::vector<std::string>&)> came)
    : came_(std::move(came)), loader_(1, [this] { CallAfter([this] { FetchResults(); }); }) {}

void HistoryThumbnails::Want(const std::vector<std::string>& paths, int side, double scale) {
  if (side != side_) bitmaps_.clear();
  side_ = side;
  scale_ = scale;
  empty_ = side == 0 ? wxBitmapBundle() : OnSquare({}, side, scale);
  const bool none = side == 0 || settings.FileHistoryThumbnailMode == choice::kHistoryNoThumbnails;
  std::vector<ThumbnailRequest> requests;
  for (const std::string& path : paths) {
    if (none || bitmaps_.contains(path)) continue;
    // The volume may be slow: time and size of the file are left to the loader's thread.
    ThumbnailRequest request{.path = path, .side = side, .mode = choice::kDiskBased};
    request.options = ThumbnailOptionsFromSettings();
    request.drivesLeftOut = settings.FileHistoryDriveTypes;
    requests.push_back(std::move(request));
  }
  loader_.Want(std::move(requests));
}

const wxBitmapBundle& HistoryThumbnails::Find(const std::string& path) const {
  const auto found = bitmaps_.find(path);
  return found == bitmaps_.end() ? empty_ : found->second;
}

void HistoryThumbnails::FetchResults() {
  std::vector<std::string> paths;
  for (const ThumbnailLoader::Result& result : loader_.FetchResults()) {
    if (result.request.side != side_ || result.thumbnail == nullptr ||
        result.thumbnail->pixels.Empty())
      continue;
    bitmaps_[result.request.path] = OnSquare(result.thumbnail->pixels, side_, scale_);
    paths.push_back(result.request.path);
  }
  if (!paths.empty()) came_(paths);
}

}  // namespace fotomill::desktop
