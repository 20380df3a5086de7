#pragma once

#include <wx/scrolwin.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/models/pages/page_order.h"

class wxGridBagSizer;
class wxStaticText;

namespace fotomill::desktop {

// Controls for the options of a kind of pages, made from their rows, and for those that all kinds
// share.
class OptionPanel : public wxScrolledWindow {
 public:
  // `changed` is called after a value was changed in the order, which must outlive the panel.
  OptionPanel(wxWindow* parent, PageOrder& order, std::function<void()> changed);

  // Builds the controls for the order's kind.
  void ShowKind();
  // Shows the order's values, which were changed elsewhere.
  void ShowValues();
  // Shows what is wrong with the values; empty: nothing.
  void ShowProblem(const wxString& problem);

 private:
  void AddHeading(const wxString& text);
  void AddRow(const PageOption& option);
  wxWindow* NewControl(const PageOption& option, std::function<void()>& show);
  wxWindow* NewNumber(const PageOption& option, std::function<void()>& show);
  wxWindow* NewChoice(const PageOption& option, std::function<void()>& show);
  wxWindow* NewText(const PageOption& option, std::function<void()>& show);
  void AddFlag(const PageOption& option);
  void Change(const PageOption& option, const std::string& value);

  PageOrder& order_;
  const std::function<void()> changed_;
  std::vector<std::function<void()>> shows_;  // put the value into each control
  wxGridBagSizer* grid_ = nullptr;
  wxStaticText* problem_ = nullptr;
  int row_ = 0;           // the next free one of the grid
  bool showing_ = false;  // controls are being set, not used
};

}  // namespace fotomill::desktop
