#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/models/browser/folder_listing.h"
#include "desktop/models/browser/folder_views.h"
#include "desktop/models/browser/selection.h"

namespace fotomill::desktop {

// What becomes of the selection of lines whose names match a pattern: they alone are selected, they
// as well, or not any more.
enum class MatchMode { Only, Add, Remove };

// What one browser shows: the items of a folder in their order, those that pass the filter as
// lines, and the selection among the lines. No window, no file access.
class BrowserModel {
 public:
  // The folder, and how it is shown.
  const std::string& Folder() const { return folder_; }
  const BrowserModes& Modes() const { return view_.modes; }  // view mode, thumbnails, sort mode
  bool Descending() const { return view_.descending; }  // of the sort mode
  const FolderView& View() const { return view_; }      // all modes and the order in one
  void SetView(const FolderView& view);  // sorts anew where the order changes
  void SetSort(int32_t sortMode, bool descending);  // choice::SortMode

  // Another folder, empty until its listing comes.
  void SetFolder(const std::string& folder);
  // The folder's items; what was selected or focused stays so where an item of the name is still
  // there. When the focused item has gone, the focus goes to the line that took its place. Facts
  // that the new items lack are taken over.
  void SetItems(std::vector<FolderItem> items);
  // Facts that were found later; sorts anew only by UpdateOrder.
  void SetFacts(size_t item, const FolderItem& facts) { items_[item] = facts; }
  void UpdateOrder();  // sorts by the facts as they are now; the selection stays with its items

  // Only lines whose name matches are shown; others are no longer selected.
  void SetFilter(const std::string& filter);
  const std::string& Filter() const { return filter_; }  // empty: everything is shown

  // Items are what the folder holds, lines what the filter lets pass, both from 0. The model keeps
  // what is returned until the next change.
  size_t ItemCount() const { return items_.size(); }
  const FolderItem& Item(size_t item) const { return items_[item]; }  // below ItemCount
  size_t LineCount() const { return lines_.size(); }                  // at most ItemCount
  size_t ItemOfLine(size_t line) const { return lines_[line]; }       // below LineCount
  const FolderItem& Line(size_t line) const { return items_[lines_[line]]; }
  std::string PathOfLine(size_t line) const;  // folder and name
  // The line of that name, kNoLine when it is not shown.
  size_t FindLine(std::string_view name) const;
  // The next line whose name begins with `typed`, from the focus on: `typed` of one letter typed
  // again continues to the next.
  size_t FindTyped(std::string_view typed, bool next) const;

  // The selection of lines. Whoever changes it shows it.
  Selection& Selected() { return selection_; }
  const Selection& Selected() const { return selection_; }
  // What functions work on: the selected files in list order; without a selection the focused one.
  std::vector<std::string> FilesForFunction() const;
  // The same with folders.
  std::vector<std::string> PathsForFunction() const;
  // PathsForFunction would not be empty.
  bool HasPathForFunction() const {
    return selection_.SelectedCount() > 0 || selection_.Focus() != kNoLine;
  }
  bool HasFileForFunction() const;  // FilesForFunction would not be empty
  // All files that are shown, in list order.
  std::vector<std::string> ShownFiles() const;
  // Among the lines that are shown; an empty pattern matches none.
  void SelectMatching(std::string_view pattern, MatchMode mode);
  void SelectSameType();  // the lines of the focused one's format, and nothing else

  // "312 files, 4 selected, 18.2 MB"
  std::string CountText() const;
  // The focused line for screen readers: "a.bmp, 1 of 12, selected". Empty without one.
  std::string FocusText() const;

 private:
  struct Keep;
  void SortItems();
  void BuildLines(const std::vector<bool>& selectedItems, size_t focusItem, size_t anchorItem);
  std::vector<bool> SelectedItems() const;
  size_t ItemOrNone(size_t line) const { return line < lines_.size() ? lines_[line] : kNoLine; }

  std::string folder_;
  FolderView view_;
  std::string filter_;
  std::vector<FolderItem> items_;     // as listed
  std::vector<uint32_t> order_;       // all items in sorted order
  std::vector<uint32_t> lines_;       // those that pass the filter
  Selection selection_;               // over the lines
};

// A size in the user's language: "740 bytes", "18.2 MB"; by choice::SizeMode.
std::string SizeText(uint64_t bytes, int32_t mode);
// "2026-11-21 19:05"
std::string DateText(int64_t seconds);

}  // namespace fotomill::desktop
