#pragma once

#include <wx/scrolwin.h>

#include <functional>
#include <string>
#include <vector>

#include "operations/recipe.h"
#include "texts/texts.h"

class wxFlexGridSizer;
class wxStaticText;

namespace fotomill::desktop {

// Controls for the parameters of a step, made from the rows of its operation: sliders and fields
// for numbers, lists for choices, and fields in recipe syntax for the rest. A double click on a
// name restores its default.
class ParameterPanel : public wxScrolledWindow {
 public:
  struct Events {
    // A value was entered; an empty text stands for the default. Returns what is wrong with it.
    std::function<RecordedText(const char* parameter, const std::string& text)> changed;
    std::function<void()> ended;  // the change is complete: the next one is undone separately
  };
  ParameterPanel(wxWindow* parent, Events events);

  // Shows a step's values; null: none. Controls are kept as long as the operation is the same;
  // true if they were replaced.
  bool ShowStep(const Step* step);

 private:
  // The control of a parameter, which may consist of several windows.
  struct Row {
    const Parameter* parameter;
    std::function<void(const Value& value)> show;
  };
  void Build(const Operation& operation);
  void AddRow(const Parameter& parameter);
  wxSizer* NewControl(const Parameter& parameter, Row& row);
  wxSizer* NewNumber(const Parameter& parameter, Row& row);
  wxSizer* NewChoice(const Parameter& parameter, Row& row);
  wxSizer* NewFlag(const Parameter& parameter, Row& row);
  wxSizer* NewColor(const Parameter& parameter, Row& row);
  wxSizer* NewField(const Parameter& parameter, Row& row);
  void Change(const Parameter& parameter, const std::string& text, bool end);
  void End() { events_.ended(); }

  const Events events_;
  const Operation* operation_ = nullptr;
  std::vector<Row> rows_;
  wxFlexGridSizer* grid_ = nullptr;
  wxStaticText* problem_ = nullptr;   // what is wrong with the last value
  bool showing_ = false;              // controls are being set, not used
  const Parameter* typed_ = nullptr;  // being changed with its control
};

}  // namespace fotomill::desktop
