#pragma once

#include <wx/dataview.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/detail_columns.h"
#include "desktop/windows/browser/details_icons.h"

namespace fotomill::desktop {

// What is dragged out of a browser.
struct DraggedFiles {
  std::vector<std::string> paths;
  bool mayMove = true;  // false: only copies
};

// The details view of a browser: a native list, for screen readers.
class DetailsList : public wxDataViewCtrl {
 public:
  // User actions; lines are those of the model.
  struct Events {
    std::function<void()> selectionChanged;                        // already in the model
    std::function<void(size_t line)> activated;                    // double click or Return
    std::function<void(size_t line, const wxPoint&)> contextMenu;  // relative to the list
    std::function<void(int32_t sortMode)> sort;  // a column header was clicked
    std::function<DraggedFiles()> dragBegins;    // with the selection
  };

  // `columns` belong to the frame: all lists share them.
  DetailsList(wxWindow* parent, BrowserModel& model, DetailColumns& columns,
              ThumbnailService& thumbnails, Events events);

  // Small thumbnails: when some are loaded, and when this browser becomes active.
  void ThumbnailsCame(const std::vector<ThumbnailLoader::Result>& results);
  void WantThumbnails() { icons_.WantThumbnails(); }
  // Call after changes of lines, order or facts.
  void ModelChanged();
  // Shows the model's selection and scrolls to the focused line.
  void ShowSelection();
  // Applies the arrangement of columns; stores the user's current arrangement.
  void ShowColumns();
  void KeepColumns();
  // Shows a menu to choose the columns.
  void ChooseColumns();

 private:
  class Lines;
  void ReadSelection();
  void OnBeginDrag(wxDataViewEvent& event);
  void ShowLines();

  BrowserModel& model_;
  DetailColumns& columns_;
  DetailColumns shown_;  // as currently shown
  const Events events_;
  DetailsIcons icons_;
  wxObjectDataPtr<Lines> lines_;
  bool changing_ = false;  // events are caused by the program
  std::vector<size_t> beforePress_;  // lines selected before the pressed button changed that
};

}  // namespace fotomill::desktop
