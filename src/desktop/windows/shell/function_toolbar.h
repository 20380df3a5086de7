#pragma once

class wxToolBar;

namespace fotomill::desktop {

class Shell;
struct Command;

// The toolbar of the frame: command buttons, selected and ordered by the user.
class FunctionToolbar {
 public:
  explicit FunctionToolbar(Shell& shell);

  // Lets the user select the buttons.
  void Choose();

 private:
  void Fill();
  void ChooseOfFamily(const Command& command);
  void ShowTip(const Command& command);

  Shell& shell_;
  wxToolBar* const bar_;
};

}  // namespace fotomill::desktop
