#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/models/browser/folder_listing.h"
#include "desktop/models/browser/folder_views.h"
#include "desktop/models/browser/item_tags.h"
#include "desktop/models/browser/selection.h"

namespace fotomill::desktop {

// What to do with lines whose names match a pattern: select only them, add them to the selection,
// or remove them from it.
enum class MatchMode { Only, Add, Remove };

// Groups of files with the same date: when a picture was taken if known, else changed.
enum class DateGrouping { None, Day, Month, Year };

// A group of lines. `date` is like 20261122, with 00 for what differs within a group; 0: folders.
struct LineGroup {
  size_t first = 0;  // line
  int32_t date = 0;
};

// The contents of a browser: the sorted items of a folder, the items that pass the filter as lines,
// and the selection of lines. Uses no windows or files.
class BrowserModel {
 public:
  // The folder, and its view.
  const std::string& Folder() const { return folder_; }
  const BrowserModes& Modes() const { return view_.modes; }  // view mode, thumbnails, sort mode
  bool Descending() const { return view_.descending; }  // of the sort mode
  const FolderView& View() const { return view_; }      // modes and direction
  void SetView(const FolderView& view);                 // sorts again if the order changes
  void SetSort(int32_t sortMode, bool descending);  // choice::SortMode

  // Groups lines by date, newest first; kept when the folder changes. Sorts again.
  void SetGrouping(DateGrouping grouping);
  DateGrouping Grouping() const { return grouping_; }
  // The groups of lines; empty without grouping.
  const std::vector<LineGroup>& Groups() const { return groups_; }

  // Changes the folder; empty until listed.
  void SetFolder(const std::string& folder);
  bool Listed() const { return listed_; }  // the items of the folder were set
  // Sets the folder's items. Items of the same name stay selected and focused. If the focused item
  // is gone, the focus moves to the next line that is left. Facts missing in the new items are kept
  // from the old ones.
  void SetItems(std::vector<FolderItem> items);
  // Sets facts read later; call UpdateOrder to sort again.
  void SetFacts(size_t item, const FolderItem& facts);
  // Sorts by current facts and applies the filters, keeping the selection. If the focused item is
  // hidden now, the focus moves to the next line.
  void UpdateOrder();

  // Shows only lines whose name matches; others are deselected.
  void SetFilter(const std::string& filter);
  const std::string& Filter() const { return filter_; }  // empty: show everything
  // Also by rating and label; files whose tags were never read are hidden.
  void SetTagFilter(TagFilter filter);
  TagFilter TagsShown() const { return tagFilter_; }
  // Sets rating and label read later. Call UpdateOrder if a tag filter is on.
  void SetTags(size_t item, const FolderItem& tags);
  // The tags of these files, or of those with these sidecars, must be read again; until then, the
  // old ones count.
  void ForgetTags(const std::vector<std::string>& paths);

  // Items are the folder's contents, lines those that pass the filter, both from 0. References are
  // valid until the next change.
  size_t ItemCount() const { return items_.size(); }
  const FolderItem& Item(size_t item) const { return items_[item]; }  // below ItemCount
  size_t LineCount() const { return lines_.size(); }                  // at most ItemCount
  // Changes whenever the lines do, or their order.
  uint64_t Generation() const { return generation_; }
  size_t ItemOfLine(size_t line) const { return lines_[line]; }       // below LineCount
  const FolderItem& Line(size_t line) const { return items_[lines_[line]]; }
  std::string PathOfLine(size_t line) const;  // folder and name
  // The line with this name, or of this file; kNoLine if not shown.
  size_t FindLine(std::string_view name) const;
  size_t LineOfPath(std::string_view path) const;
  // The first line from the focus on, or with `next` after it, whose name starts with `typed`;
  // wraps around. kNoLine if not found.
  size_t FindTyped(std::string_view typed, bool next) const;

  // The selection of lines. Callers must update the display after a change.
  Selection& Selected() { return selection_; }
  const Selection& Selected() const { return selection_; }
  // Input for functions: the selected files in list order; if nothing is selected, the focused one.
  std::vector<std::string> FilesForFunction() const;
  // The same including folders.
  std::vector<std::string> PathsForFunction() const;
  // PathsForFunction would not be empty.
  bool HasPathForFunction() const {
    return selection_.SelectedCount() > 0 || selection_.Focus() != kNoLine;
  }
  bool HasFileForFunction() const;  // FilesForFunction would not be empty
  // All shown files, in list order.
  std::vector<std::string> ShownFiles() const;
  // Among the shown lines; an empty pattern matches none.
  void SelectMatching(std::string_view pattern, MatchMode mode);
  // Selects exactly the lines with these names and focuses the first; if none is shown, nothing is
  // selected or focused.
  void SelectNames(const std::vector<std::string>& names);
  void SelectSameType();  // selects only lines with the focused one's format

  // "312 files, 4 selected, 18.2 MB"
  std::string CountText() const;
  // The focused line for screen readers: "a.bmp, 1 of 12, selected". Empty if there is none.
  std::string FocusText() const;

 private:
  struct Keep;
  size_t Nearest(const std::vector<size_t>& newPlaces) const;
  void SortItems();
  void BuildLines(const std::vector<bool>& selectedItems, size_t focusItem, size_t anchorItem);
  std::vector<bool> SelectedItems() const;
  size_t LineAfter(size_t item) const;
  size_t ItemOrNone(size_t line) const { return line < lines_.size() ? lines_[line] : kNoLine; }

  std::string folder_;
  bool listed_ = false;
  uint64_t generation_ = 0;
  FolderView view_;
  std::string filter_;
  TagFilter tagFilter_ = TagFilter::All;
  std::vector<FolderItem> items_;     // as listed
  std::vector<uint32_t> order_;       // all items in sorted order
  std::vector<uint32_t> lines_;       // items that pass the filter
  DateGrouping grouping_ = DateGrouping::None;
  std::vector<LineGroup> groups_;
  Selection selection_;               // of lines
};

// The date of the group of a file, as in LineGroup.
int32_t GroupDate(const FolderItem& item, DateGrouping grouping);

// Formats a size, translated: "740 bytes", "18.2 MB"; by choice::SizeMode.
std::string SizeText(uint64_t bytes, int32_t mode);
// "2026-11-21 19:05"
std::string DateText(int64_t seconds);

}  // namespace fotomill::desktop
