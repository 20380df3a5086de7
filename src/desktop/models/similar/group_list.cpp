#include "desktop/models/similar/group_list.h"

#include <algorithm>
#include <tuple>
#include <utility>

#include "core/choice_lists.h"
#include "desktop/models/browser/browser_model.h"
#include "platform/existence.h"
#include "platform/paths.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

FileNow StateNow(const SimilarPicture& picture) {
  switch (platform::ExistenceOf(picture.path)) {
    case platform::Existence::No: return FileNow::Gone;
    case platform::Existence::Unknown: return FileNow::Unknown;
    case platform::Existence::Yes: break;
  }
  return platform::StampOf(picture.path) == picture.stamp ? FileNow::Same : FileNow::Changed;
}

void GroupList::SetGroups(std::vector<FoundGroup> groups) {
  groups_ = std::move(groups);
  marks_.clear();
  measured_ = true;
  for (const FoundGroup& group : groups_) {
    marks_.emplace_back(group.pictures.size());
    for (const SimilarPicture& picture : group.pictures)
      measured_ = measured_ && picture.sharpness >= 0;
  }
  Arrange();
}

void GroupList::SetRule(BestRule rule) {
  rule_ = rule;
  Arrange();
}

bool GroupList::Better(const SimilarPicture& a, const SimilarPicture& b) const {
  const auto size = [](const SimilarPicture& picture) {
    return std::pair(int64_t{picture.width} * picture.height, picture.stamp.size);
  };
  if (rule_ == BestRule::Sharpest && a.sharpness != b.sharpness) return a.sharpness > b.sharpness;
  if (rule_ == BestRule::Oldest && a.date != b.date) return a.date < b.date;
  if (size(a) != size(b)) return size(a) > size(b);
  return a.date < b.date;
}

// Of the pictures that are the same; 0 if there are none.
size_t GroupList::BestOf(size_t group) const {
  const std::vector<SimilarPicture>& pictures = groups_[group].pictures;
  size_t best = pictures.size();
  for (size_t i = 0; i < pictures.size(); ++i) {
    if (marks_[group][i].now != FileNow::Same) continue;
    if (best == pictures.size() || Better(pictures[i], pictures[best])) best = i;
  }
  return best == pictures.size() ? 0 : best;
}

void GroupList::Arrange() {
  cells_.clear();
  starts_.clear();
  for (size_t group = 0; group < groups_.size(); ++group) {
    const std::vector<Mark>& marks = marks_[group];
    const auto shown = [](const Mark& mark) { return mark.now != FileNow::Gone; };
    if (std::ranges::count_if(marks, shown) < 2) continue;
    starts_.push_back(cells_.size());
    const size_t best = BestOf(group);
    const bool suggested = marks[best].now == FileNow::Same;
    const auto add = [&](size_t picture) {
      const Mark& mark = marks[picture];
      if (shown(mark))
        cells_.push_back({group, picture, suggested && picture == best, mark.ticked, mark.now});
    };
    add(best);
    for (size_t i = 0; i < marks.size(); ++i) {
      if (i != best) add(i);
    }
  }
}

const SimilarPicture& GroupList::Picture(size_t cell) const {
  return groups_[cells_[cell].group].pictures[cells_[cell].picture];
}

GroupList::Range GroupList::GroupOf(size_t cell) const {
  const auto next = std::ranges::upper_bound(starts_, cell);
  return {next == starts_.begin() ? 0 : *(next - 1), next == starts_.end() ? cells_.size() : *next};
}

size_t GroupList::CellOf(const std::string& path) const {
  size_t cell = 0;
  while (cell < cells_.size() && Picture(cell).path != path) ++cell;
  return cell;
}

// --- ticks ---

bool GroupList::Tick(size_t cell, bool ticked) {
  Cell& shown = cells_[cell];
  if (ticked && shown.now != FileNow::Same) return false;
  shown.ticked = marks_[shown.group][shown.picture].ticked = ticked;
  return true;
}

void GroupList::TickAllButBest() {
  for (size_t i = 0; i < cells_.size(); ++i)
    (void)Tick(i, !cells_[i].best && !Picture(i).severalPages);
}

void GroupList::UntickAll() {
  for (size_t i = 0; i < cells_.size(); ++i) (void)Tick(i, false);
}

size_t GroupList::TickedCount() const {
  return static_cast<size_t>(std::ranges::count(cells_, true, &Cell::ticked));
}

uint64_t GroupList::TickedBytes() const {
  uint64_t bytes = 0;
  for (const SimilarPicture& picture : Ticked()) bytes += picture.stamp.size;
  return bytes;
}

std::vector<SimilarPicture> GroupList::Ticked() const {
  std::vector<SimilarPicture> ticked;
  for (size_t i = 0; i < cells_.size(); ++i) {
    if (cells_[i].ticked) ticked.push_back(Picture(i));
  }
  return ticked;
}

size_t GroupList::FullyTicked() const {
  size_t full = 0;
  for (const size_t start : starts_) {
    bool any = false, all = true;
    for (size_t i = start; i < GroupOf(start).end; ++i) {
      any = any || cells_[i].ticked;
      all = all && (cells_[i].ticked || cells_[i].now != FileNow::Same);
    }
    full += any && all ? 1 : 0;
  }
  return full;
}

void GroupList::KeepBest() {
  for (const size_t start : starts_) {
    const Range group = GroupOf(start);
    const auto stays = [](const Cell& cell) { return !cell.ticked && cell.now == FileNow::Same; };
    if (std::none_of(cells_.begin() + static_cast<ptrdiff_t>(group.first),
                     cells_.begin() + static_cast<ptrdiff_t>(group.end), stays))
      (void)Tick(start, false);
  }
}

// --- changes ---

std::vector<SimilarPicture> GroupList::All() const {
  std::vector<SimilarPicture> all;
  for (const FoundGroup& group : groups_)
    all.insert(all.end(), group.pictures.begin(), group.pictures.end());
  return all;
}

void GroupList::SetStates(const std::vector<FileNow>& states) {
  size_t place = 0;
  for (std::vector<Mark>& marks : marks_) {
    for (Mark& mark : marks) {
      if (place == states.size()) break;
      mark.now = states[place++];
      mark.ticked = mark.ticked && mark.now == FileNow::Same;
    }
  }
  Arrange();
}

void GroupList::SetSharpness(const std::vector<float>& sharpness) {
  size_t place = 0;
  for (FoundGroup& group : groups_) {
    for (SimilarPicture& picture : group.pictures) {
      if (place < sharpness.size()) picture.sharpness = sharpness[place++];
    }
  }
  measured_ = true;
  Arrange();
}

bool GroupList::Measured() const { return measured_; }

std::vector<std::string> GroupList::ToCompare(size_t cell, size_t most) const {
  const Range group = GroupOf(cell);
  std::vector<std::string> paths;
  const bool all = group.end - group.first <= most;
  if (!all) {
    cell = std::max(std::min(cell, group.end - most + 1), group.first + 1);
    paths.push_back(Picture(group.first).path);
  }
  for (size_t i = all ? group.first : cell; i < group.end && paths.size() < most; ++i)
    paths.push_back(Picture(i).path);
  return paths;
}

// --- texts ---

std::string GroupList::GroupText(size_t start) const {
  const Range range = GroupOf(start);
  uint64_t bytes = 0;
  for (size_t i = range.first; i < range.end; ++i) bytes += Picture(i).stamp.size;
  std::string text = TrGroupedCount("%1 picture", "%1 pictures", range.end - range.first);
  text.append(", ").append(SizeText(bytes, choice::kSizeFitting));
  const int32_t distance = groups_[cells_[start].group].distance;
  if (distance > 0) text.append(", ").append(Tr("distance %1", distance));
  return text;
}

std::string GroupList::CellText(size_t cell) const {
  const Range range = GroupOf(cell);
  std::string text(platform::FileNameOf(Picture(cell).path));
  text.append(", ").append(Tr("%1 of %2", ThousandsText(cell - range.first + 1),
                              ThousandsText(range.end - range.first)));
  if (cells_[cell].best) text.append(", ").append(Tr("best"));
  if (cells_[cell].ticked) text.append(", ").append(Tr("ticked"));
  return text;
}

std::string GroupList::CountText() const {
  if (cells_.empty()) return Tr("No similar pictures.");
  const std::string pictures = TrGroupedCount("%1 picture", "%1 pictures", cells_.size());
  std::string text =
      TrGroupedCount("%1 group with %2", "%1 groups with %2", starts_.size(), pictures);
  if (const size_t ticked = TickedCount(); ticked > 0)
    text.append(", ").append(
        Tr("%1 ticked (%2)", ThousandsText(ticked), SizeText(TickedBytes(), choice::kSizeFitting)));
  return text;
}

}  // namespace fotomill::desktop
