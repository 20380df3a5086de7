#pragma once

#include <wx/dialog.h>

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "plugins/module_facts.h"

namespace fotomill::desktop {

// The options that a plug-in module has declared, each with the control for its kind.
class ModuleOptionsBox : public wxDialog {
 public:
  // `values` are the current ones, in the order of the module's options.
  ModuleOptionsBox(wxWindow* parent, const ModuleFacts& facts, const ModuleOptionValues& values);
  // After OK: a value for each option.
  std::vector<int32_t> Values() const;

 private:
  void AddOption(wxSizer& rows, const ModuleOption& option, int32_t value);

  std::vector<std::function<int32_t()>> readers_;          // of the controls
  std::vector<std::function<void(int32_t)>> setters_;
  std::vector<int32_t> standards_;
};

}  // namespace fotomill::desktop
