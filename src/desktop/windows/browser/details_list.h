#pragma once

#include <wx/dataview.h>

#include <functional>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/browser/detail_columns.h"

namespace fotomill::desktop {

// The details view of a browser: a native list, which screen readers know how to read.
class DetailsList : public wxDataViewCtrl {
 public:
  // What the user did in it; lines are those of the model.
  struct Events {
    std::function<void()> selectionChanged;                        // the model has it already
    std::function<void(size_t line)> activated;                    // double click or Return
    std::function<void(size_t line, const wxPoint&)> contextMenu;  // the point is one of the list
    std::function<void(int32_t sortMode)> sort;  // the head of a column was clicked
    std::function<void()> dragBegins;            // of the selection
  };

  // `columns` are the frame's: all lists show the same.
  DetailsList(wxWindow* parent, BrowserModel& model, DetailColumns& columns, Events events);

  // Other lines, another order or other facts.
  void ModelChanged();
  // Marks what the model has selected and shows the focused line.
  void ShowSelection();
  // Shows the columns as they are arranged, and takes down how the user has arranged them here.
  void ShowColumns();
  void KeepColumns();
  // Lets the user choose the columns from a menu.
  void ChooseColumns();

 private:
  class Lines;
  void ReadSelection();
  void ShowLines();

  BrowserModel& model_;
  DetailColumns& columns_;
  DetailColumns shown_;  // as they are in the list
  const Events events_;
  wxObjectDataPtr<Lines> lines_;
  bool changing_ = false;  // what the list tells now is what it was told
};

}  // namespace fotomill::desktop
