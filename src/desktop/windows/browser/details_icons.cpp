#include "desktop/windows/browser/details_icons.h"

#include <wx/image.h>
#include <wx/window.h>

#include <algorithm>
#include <cmath>
#include <cstring>

#include "desktop/models/shell/event_log.h"
#include "desktop/models/thumbnails/line_request.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kSide = 32;  // device-independent pixels
constexpr int kWaitMs = 40;
constexpr size_t kMostIcons = 2000, kMostMissing = 200;

wxImage Transparent(int side) {
  wxImage image(side, side);
  image.InitAlpha();
  std::memset(image.GetAlpha(), 0, static_cast<size_t>(side) * static_cast<size_t>(side));
  return image;
}

}  // namespace

DetailsIcons::DetailsIcons(const wxWindow& window, const BrowserModel& model,
                           ThumbnailService& thumbnails, std::function<void(size_t line)> changed)
    : window_(window), model_(model), thumbnails_(thumbnails), changed_(std::move(changed)) {
  const int side = window_.FromDIP(kSide);
  none_ = wxBitmapBundle::FromBitmap(wxBitmap(Transparent(side)));
  folder_ = Symbol("folder", side, wxColour(0xc9, 0x95, 0x2b));
  wait_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { WantThumbnails(); });
}

int DetailsIcons::Side() const {
  return settings.ShowDetailListThumbnails == 0 ? 0 : window_.FromDIP(kSide);
}

const wxBitmapBundle& DetailsIcons::IconOf(size_t line) {
  const FolderItem& item = model_.Line(line);
  if (item.folder) return folder_;
  const std::string path = model_.PathOfLine(line);
  const ThumbnailPointer thumbnail = thumbnails_.FindAny(path);
  if (thumbnail == nullptr) {
    if (missing_.size() > kMostMissing) missing_.clear();  // scrolled past
    missing_[path] = line;
    if (!wait_.IsRunning()) wait_.StartOnce(kWaitMs);
    return none_;
  }
  if (thumbnail->pixels.Empty()) return none_;
  if (icons_.size() > kMostIcons) icons_.clear();
  Icon& icon = icons_[path];
  if (icon.thumbnail != thumbnail) icon = {thumbnail, Drawn(thumbnail->pixels)};
  return icon.bitmap;
}

// In the middle of a square, so that the names are aligned.
wxBitmapBundle DetailsIcons::Drawn(const RgbImage& pixels) const {
  const int side = window_.FromDIP(kSide);
  const double scale =
      std::min(static_cast<double>(side) / std::max(pixels.width, pixels.height), 1.0);
  wxImage picture(pixels.width, pixels.height);
  std::memcpy(picture.GetData(), pixels.bytes.data(), pixels.bytes.size());
  picture.Rescale(std::max(static_cast<int>(std::lround(pixels.width * scale)), 1),
                  std::max(static_cast<int>(std::lround(pixels.height * scale)), 1),
                  wxIMAGE_QUALITY_BOX_AVERAGE);
  picture.InitAlpha();
  wxImage icon = Transparent(side);
  icon.Paste(picture, (side - picture.GetWidth()) / 2, (side - picture.GetHeight()) / 2);
  return wxBitmapBundle::FromBitmap(wxBitmap(icon));
}

void DetailsIcons::Forget() { missing_.clear(); }

void DetailsIcons::WantThumbnails() {
  std::vector<ThumbnailRequest> requests;
  std::vector<std::pair<size_t, std::string>> rows;
  for (const auto& [path, line] : missing_) rows.emplace_back(line, path);
  std::ranges::sort(rows);
  for (const auto& [line, path] : rows) {
    const bool there = line < model_.LineCount() && model_.PathOfLine(line) == path;
    if (there && model_.Line(line).modified != 0)
      requests.push_back(RequestForLine(model_, line, window_.FromDIP(kSide * 3)));
  }
  thumbnails_.Want(std::move(requests));
}

void DetailsIcons::ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results) {
  size_t shown = 0;
  for (const ThumbnailLoader::Result& result : results) {
    const auto found = missing_.find(result.request.path);
    if (found == missing_.end() || result.thumbnail == nullptr) continue;
    const size_t line = found->second;
    missing_.erase(found);
    if (line >= model_.LineCount()) continue;
    changed_(line);
    ++shown;
  }
  if (shown > 0 && missing_.empty()) LogEvent("details-icons", model_.Folder());
}

}  // namespace fotomill::desktop
