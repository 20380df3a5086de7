#include "desktop/models/browser/browser_model.h"

#include <algorithm>
#include <cstdio>
#include <numeric>
#include <unordered_map>
#include <unordered_set>

#include "core/choice_lists.h"
#include "core/natural_order.h"
#include "core/text.h"
#include "metadata/tags/sidecar.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

template <typename T>
int Compare(const T& a, const T& b) {
  return a < b ? -1 : b < a ? 1 : 0;
}

int CompareType(const FolderItem& a, const FolderItem& b) {
  return LowerCase(platform::ExtensionOf(a.name)).compare(LowerCase(platform::ExtensionOf(b.name)));
}
int CompareSize(const FolderItem& a, const FolderItem& b) { return Compare(a.size, b.size); }
int CompareDate(const FolderItem& a, const FolderItem& b) {
  return Compare(a.modified, b.modified);
}
int CompareTaken(const FolderItem& a, const FolderItem& b) { return Compare(a.taken, b.taken); }
int CompareDimensions(const FolderItem& a, const FolderItem& b) {
  return Compare(int64_t{a.width} * a.height, int64_t{b.width} * b.height);
}

using Comparison = int (*)(const FolderItem& a, const FolderItem& b);

// By choice::SortMode; ties, and kSortName, are sorted by name.
constexpr Comparison kComparisons[] = {nullptr,     CompareType,  CompareSize,
                                       CompareDate, CompareTaken, CompareDimensions};

Comparison ComparisonOf(int32_t mode) {
  return mode >= 0 && mode < static_cast<int32_t>(std::size(kComparisons)) ? kComparisons[mode]
                                                                           : nullptr;
}

bool BeginsWith(std::string_view name, std::string_view typed) {
  return name.size() >= typed.size() && EqualIgnoringCase(name.substr(0, typed.size()), typed);
}

}  // namespace

void BrowserModel::SetView(const FolderView& view) {
  const bool sort = view.modes.sort != view_.modes.sort || view.descending != view_.descending;
  view_ = view;
  if (sort) UpdateOrder();
}

void BrowserModel::SetSort(int32_t sortMode, bool descending) {
  FolderView view = view_;
  view.modes.sort = sortMode;
  view.descending = descending;
  SetView(view);
}

void BrowserModel::SetGrouping(DateGrouping grouping) {
  if (grouping == grouping_) return;
  grouping_ = grouping;
  UpdateOrder();
}

void BrowserModel::SetFolder(const std::string& folder) {
  folder_ = folder;
  listed_ = false;
  filter_.clear();
  items_.clear();
  order_.clear();
  lines_.clear();
  groups_.clear();
  selection_.Reset(0);
}

void BrowserModel::SetItems(std::vector<FolderItem> items) {
  std::unordered_map<std::string_view, size_t> old;
  old.reserve(items_.size());
  for (size_t i = 0; i < items_.size(); ++i) old.emplace(items_[i].name, i);

  const std::vector<bool> oldSelected = SelectedItems();
  const size_t oldFocus = ItemOrNone(selection_.Focus()),
               oldAnchor = ItemOrNone(selection_.Anchor());
  const bool focused = selection_.Focus() != kNoLine;
  std::vector<bool> selected(items.size());
  size_t focus = kNoLine, anchor = kNoLine;
  std::vector<size_t> newPlaces(items_.size(), kNoLine);
  for (size_t i = 0; i < items.size(); ++i) {
    const auto found = old.find(items[i].name);
    if (found == old.end()) continue;
    const FolderItem& before = items_[found->second];
    newPlaces[found->second] = i;
    selected[i] = oldSelected[found->second];
    if (found->second == oldFocus) focus = i;
    if (found->second == oldAnchor) anchor = i;
    if (before.modified == items[i].modified && before.size == items[i].size) {
      items[i] = before;
    } else {
      items[i].rating = before.rating;
      items[i].label = before.label;
      items[i].outdated = before.tagged || before.outdated;
    }
  }
  const bool moves = focused && focus == kNoLine;
  if (moves) focus = Nearest(newPlaces);
  items_ = std::move(items);
  listed_ = true;
  SortItems();
  BuildLines(selected, focus, anchor);
  if (moves && selection_.SelectedCount() == 0 && selection_.Focus() != kNoLine)
    selection_.SelectOnly(selection_.Focus());
}

// The new place of the first item from the focus on that is still there, else of the last before.
size_t BrowserModel::Nearest(const std::vector<size_t>& newPlaces) const {
  const size_t focus = selection_.Focus();
  for (size_t line = focus; line < lines_.size(); ++line) {
    if (newPlaces[lines_[line]] != kNoLine) return newPlaces[lines_[line]];
  }
  for (size_t line = focus; line-- > 0;) {
    if (newPlaces[lines_[line]] != kNoLine) return newPlaces[lines_[line]];
  }
  return kNoLine;
}

void BrowserModel::UpdateOrder() {
  const std::vector<bool> selected = SelectedItems();
  const size_t focus = ItemOrNone(selection_.Focus()), anchor = ItemOrNone(selection_.Anchor());
  SortItems();
  BuildLines(selected, focus, anchor);
  if (focus == kNoLine || selection_.Focus() != kNoLine || lines_.empty()) return;
  if (selection_.SelectedCount() == 0) {
    selection_.SelectOnly(LineAfter(focus));
  } else {
    selection_.MoveFocus(LineAfter(focus), false, true);
  }
}

// The first line that follows an item in the sorted order; the last one if there is none.
size_t BrowserModel::LineAfter(size_t item) const {
  size_t line = 0;
  for (const uint32_t other : order_) {
    if (other == item) break;
    if (line < lines_.size() && lines_[line] == other) ++line;
  }
  return std::min(line, lines_.size() - 1);
}

void BrowserModel::SetFilter(const std::string& filter) {
  if (filter == filter_) return;
  const std::vector<bool> selected = SelectedItems();
  const size_t focus = ItemOrNone(selection_.Focus()), anchor = ItemOrNone(selection_.Anchor());
  filter_ = filter;
  BuildLines(selected, focus, anchor);
}

void BrowserModel::SetTagFilter(TagFilter filter) {
  tagFilter_ = filter;
  UpdateOrder();
}

void BrowserModel::SetFacts(size_t item, const FolderItem& facts) {
  const FolderItem now = items_[item];
  items_[item] = facts;
  SetTags(item, now);
}

void BrowserModel::SetTags(size_t item, const FolderItem& tags) {
  items_[item].tagged = tags.tagged;
  items_[item].outdated = tags.outdated;
  items_[item].rating = tags.rating;
  items_[item].label = tags.label;
}

void BrowserModel::ForgetTags(const std::vector<std::string>& paths) {
  const std::unordered_set<std::string> changed(paths.begin(), paths.end());
  for (FolderItem& item : items_) {
    const std::string path = platform::JoinFolder(folder_, item.name);
    const auto isOne = [&](const std::string& name) { return changed.contains(name); };
    if (!isOne(path) && !std::ranges::any_of(SidecarNames(path), isOne)) continue;
    item.outdated |= item.tagged;
    item.tagged = false;
  }
}

void BrowserModel::SortItems() {
  order_.resize(items_.size());
  std::iota(order_.begin(), order_.end(), 0u);
  const Comparison compare = ComparisonOf(view_.modes.sort);
  const int sign = view_.descending ? -1 : 1;
  std::vector<int32_t> dates;
  if (grouping_ != DateGrouping::None) {
    for (const FolderItem& item : items_) dates.push_back(GroupDate(item, grouping_));
  }
  std::sort(order_.begin(), order_.end(), [&](uint32_t left, uint32_t right) {
    const FolderItem& a = items_[left];
    const FolderItem& b = items_[right];
    if (a.folder != b.folder) return a.folder;
    if (!dates.empty() && dates[left] != dates[right]) return dates[left] > dates[right];
    int order = compare != nullptr && !a.folder ? compare(a, b) : 0;
    if (order == 0) order = CompareNatural(a.name, b.name);
    return order * sign < 0;
  });
}

std::vector<bool> BrowserModel::SelectedItems() const {
  std::vector<bool> selected(items_.size());
  for (size_t line = 0; line < lines_.size(); ++line)
    selected[lines_[line]] = selection_.IsSelected(line);
  return selected;
}

void BrowserModel::BuildLines(const std::vector<bool>& selectedItems, size_t focusItem,
                              size_t anchorItem) {
  ++generation_;
  lines_.clear();
  groups_.clear();
  std::vector<bool> selected;
  size_t focus = kNoLine, anchor = kNoLine;
  for (const uint32_t item : order_) {
    if (!filter_.empty() && !MatchesFilter(items_[item].name, filter_)) continue;
    if (!items_[item].folder && !Passes(items_[item], tagFilter_)) continue;
    if (item == focusItem) focus = lines_.size();
    if (item == anchorItem) anchor = lines_.size();
    if (grouping_ != DateGrouping::None) {
      const int32_t date = GroupDate(items_[item], grouping_);
      if (groups_.empty() || groups_.back().date != date) groups_.push_back({lines_.size(), date});
    }
    selected.push_back(selectedItems[item]);
    lines_.push_back(item);
  }
  selection_.Assign(std::move(selected), focus, anchor);
}

std::string BrowserModel::PathOfLine(size_t line) const {
  return platform::JoinFolder(folder_, Line(line).name);
}

size_t BrowserModel::FindLine(std::string_view name) const {
  for (size_t line = 0; line < lines_.size(); ++line) {
    if (Line(line).name == name) return line;
  }
  return kNoLine;
}

size_t BrowserModel::LineOfPath(std::string_view path) const {
  const std::string start = platform::JoinFolder(folder_, "");
  return path.starts_with(start) ? FindLine(path.substr(start.size())) : kNoLine;
}

size_t BrowserModel::FindTyped(std::string_view typed, bool next) const {
  const size_t count = lines_.size();
  const size_t focus = selection_.Focus() == kNoLine ? 0 : selection_.Focus();
  for (size_t step = next ? 1 : 0; step < count + (next ? 1 : 0); ++step) {
    const size_t line = (focus + step) % count;
    if (BeginsWith(ShownName(Line(line)), typed)) return line;
  }
  return kNoLine;
}

std::vector<std::string> BrowserModel::FilesForFunction() const {
  std::vector<std::string> files;
  for (const size_t line : selection_.SelectedLines()) {
    if (!Line(line).folder) files.push_back(PathOfLine(line));
  }
  const size_t focus = selection_.Focus();
  if (selection_.SelectedCount() == 0 && focus != kNoLine && !Line(focus).folder)
    files.push_back(PathOfLine(focus));
  return files;
}

std::vector<std::string> BrowserModel::PathsForFunction() const {
  std::vector<std::string> paths;
  for (const size_t line : selection_.SelectedLines()) paths.push_back(PathOfLine(line));
  if (paths.empty() && selection_.Focus() != kNoLine)
    paths.push_back(PathOfLine(selection_.Focus()));
  return paths;
}

bool BrowserModel::HasFileForFunction() const {
  const size_t focus = selection_.Focus();
  return selection_.SelectedCount() > 0 || (focus != kNoLine && !Line(focus).folder);
}

std::vector<std::string> BrowserModel::ShownFiles() const {
  std::vector<std::string> files;
  files.reserve(lines_.size());
  for (size_t line = 0; line < lines_.size(); ++line) {
    if (!Line(line).folder) files.push_back(PathOfLine(line));
  }
  return files;
}

void BrowserModel::SelectMatching(std::string_view pattern, MatchMode mode) {
  for (size_t line = 0; line < lines_.size(); ++line) {
    const bool matches = !pattern.empty() && MatchesFilter(Line(line).name, pattern);
    if (matches || mode == MatchMode::Only)
      selection_.Set(line, matches && mode != MatchMode::Remove);
  }
}

void BrowserModel::SelectNames(const std::vector<std::string>& names) {
  const std::unordered_set<std::string_view> wanted(names.begin(), names.end());
  std::vector<bool> selected(lines_.size());
  size_t first = kNoLine;
  for (size_t line = 0; line < lines_.size(); ++line) {
    selected[line] = wanted.contains(Line(line).name);
    if (selected[line]) first = std::min(first, line);
  }
  selection_.Assign(std::move(selected), first, first);
}

void BrowserModel::SelectSameType() {
  if (selection_.Focus() == kNoLine) return;
  const FolderItem& focused = Line(selection_.Focus());
  for (size_t line = 0; line < lines_.size(); ++line) {
    const FolderItem& item = Line(line);
    selection_.Set(line, item.folder == focused.folder && item.format == focused.format);
  }
}

std::string BrowserModel::CountText() const {
  size_t files = 0, folders = 0;
  uint64_t bytes = 0;
  for (const uint32_t item : lines_) {
    ++(items_[item].folder ? folders : files);
    if (selection_.SelectedCount() == 0) bytes += items_[item].size;
  }
  for (const size_t line : selection_.SelectedLines()) bytes += Line(line).size;
  std::string text = TrGroupedCount("%1 file", "%1 files", files);
  if (folders > 0) text.append(", ").append(TrGroupedCount("%1 folder", "%1 folders", folders));
  if (lines_.size() < items_.size()) text = Tr("%1 of %2", text, ThousandsText(items_.size()));
  if (selection_.SelectedCount() > 0)
    text.append(", ").append(Tr("%1 selected", ThousandsText(selection_.SelectedCount())));
  if (files > 0) text.append(", ").append(SizeText(bytes, choice::kSizeFitting));
  if (selection_.SelectedCount() == 1) {
    const FolderItem& only = Line(selection_.SelectedLines().front());
    const std::string tags = TagText(only.rating, only.label);
    if (!tags.empty()) text.append(", ").append(tags);
  }
  return text;
}

std::string BrowserModel::FocusText() const {
  const size_t focus = selection_.Focus();
  if (focus >= LineCount()) return {};
  std::string text = Line(focus).name;
  if (Line(focus).folder) text.append(", ").append(Tr("folder"));
  text.append(", ").append(Tr("%1 of %2", ThousandsText(focus + 1), ThousandsText(LineCount())));
  if (selection_.IsSelected(focus)) text.append(", ").append(Tr("selected"));
  if (const std::string tags = TagText(Line(focus).rating, Line(focus).label); !tags.empty())
    text.append(", ").append(tags);
  return text;
}

int32_t GroupDate(const FolderItem& item, DateGrouping grouping) {
  if (item.folder) return 0;
  int32_t date = static_cast<int32_t>(item.taken / 1'000'000);
  if (date <= 0) {
    const platform::LocalTime time = platform::LocalTimeOf(item.modified);
    date = (time.year * 100 + time.month) * 100 + time.day;
  }
  if (grouping == DateGrouping::Month) return date / 100 * 100;
  return grouping == DateGrouping::Year ? date / 10'000 * 10'000 : date;
}

std::string SizeText(uint64_t bytes, int32_t mode) {
  constexpr const char* kUnits[] = {"KB", "MB", "GB", "TB", "PB", "EB"};
  if (mode == choice::kSizeKilobytes) return ThousandsText((bytes + 1023) / 1024) + " KB";
  if (mode == choice::kSizeBytes || bytes < 1024)
    return TrGroupedCount("%1 byte", "%1 bytes", bytes);
  double value = static_cast<double>(bytes) / 1024;
  size_t unit = 0;
  while (value >= 999.5 && unit + 1 < std::size(kUnits)) {
    value /= 1024;
    ++unit;
  }
  return DecimalText(value, value < 99.95 ? 1 : 0) + " " + kUnits[unit];
}

std::string DateText(int64_t seconds) {
  const platform::LocalTime time = platform::LocalTimeOf(seconds);
  char text[64];
  std::snprintf(text, sizeof text, "%04d-%02d-%02d %02d:%02d", time.year, time.month, time.day,
                time.hour, time.minute);
  return text;
}

}  // namespace fotomill::desktop
