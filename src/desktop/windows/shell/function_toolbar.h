#pragma once

class wxToolBar;

namespace fotomill::desktop {

class Shell;
struct Command;

// The toolbar of the frame: buttons of commands, which and in which order as the user wants them.
class FunctionToolbar {
 public:
  explicit FunctionToolbar(Shell& shell);

  // Lets the user choose the buttons.
  void Choose();

 private:
  void Fill();
  void ShowTip(const Command& command);

  Shell& shell_;
  wxToolBar* const bar_;
};

}  // namespace fotomill::desktop
