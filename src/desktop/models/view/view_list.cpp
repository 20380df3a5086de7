#include "desktop/models/view/view_list.h"

#include <algorithm>
#include <utility>

#include "desktop/models/shell/favorites.h"

namespace fotomill::desktop {

ViewList::ViewList(const std::vector<std::string>& files, const std::string& file)
    : files_({file}) {
  (void)Replace(files);
}

bool ViewList::Contains(const std::string& file) const {
  return std::ranges::find(files_, file) != files_.end();
}

size_t ViewList::PlaceAfter(int64_t steps) const {
  const auto count = static_cast<int64_t>(files_.size());
  return static_cast<size_t>(((static_cast<int64_t>(place_) + steps) % count + count) % count);
}

void ViewList::GoTo(size_t place) {
  if (place == place_) return;
  if (std::exchange(isGone_, false)) {
    files_.erase(files_.begin() + static_cast<std::ptrdiff_t>(place_));
    if (place > place_) --place;
  }
  place_ = place;
}

bool ViewList::Replace(const std::vector<std::string>& files) {
  const auto found = std::ranges::find(files, File());
  if (found == files.end()) return false;
  place_ = static_cast<size_t>(found - files.begin());
  files_ = files;
  isGone_ = false;
  return true;
}

void ViewList::Follow(const std::vector<std::string>& files) {
  if (Replace(files)) return;
  const std::string shown = File();
  place_ = std::min(place_, files.size());
  files_ = files;
  files_.insert(files_.begin() + static_cast<std::ptrdiff_t>(place_), shown);
  isGone_ = true;
}

bool ViewList::FollowRename(const std::string& from, const std::string& to) {
  const std::string shown = File();
  for (std::string& file : files_) {
    if (LiesIn(file, from)) file = RenamedPath(file, from, to);
  }
  return File() != shown;
}

void ViewList::Remove(const std::string& file) {
  const auto found = std::ranges::find(files_, file);
  if (found == files_.end() || files_.size() == 1) return;
  const auto place = static_cast<size_t>(found - files_.begin());
  if (place == place_) isGone_ = false;
  if (place < place_) --place_;
  files_.erase(found);
  place_ = std::min(place_, files_.size() - 1);
}

std::vector<size_t> ViewList::PlacesToLoad(std::optional<size_t> upcoming) const {
  std::vector<size_t> places;
  const auto want = [&](size_t place) {
    if (place < files_.size() && std::ranges::find(places, place) == places.end())
      places.push_back(place);
  };
  want(place_);
  if (upcoming) want(*upcoming);
  for (const int64_t steps : {1, -1, 2, -2}) want(PlaceAfter(steps));
  return places;
}

}  // namespace fotomill::desktop
