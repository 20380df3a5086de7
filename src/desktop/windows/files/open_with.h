#pragma once

#include <wx/menu.h>

#include <cstdint>
#include <string>
#include <vector>

#include "core/workers/stop_token.h"
#include "desktop/windows/widgets/file_question.h"
#include "platform/programs.h"

namespace fotomill::desktop {

class Shell;

// Opens files with other programs, which run in parallel. When one exits, reloads the folders and
// raises the window, unless the program only passed the file to another process.
// Does not wait when many are started at once.
class ExternalPrograms {
 public:
  explicit ExternalPrograms(Shell& shell) : shell_(shell) {}
  ExternalPrograms(const ExternalPrograms&) = delete;
  ExternalPrograms& operator=(const ExternalPrograms&) = delete;
  ~ExternalPrograms() { stop_.Stop(); }

  // Uses the registered program; shows a message if there is none.
  void Open(const std::string& file);
  // Uses the given program; at least one file.
  void OpenWith(const platform::Program& program, const std::vector<std::string>& files);

 private:
  void Start(const std::string& file, std::vector<std::string> command, uint32_t flags);

  Shell& shell_;
  const StopSource stop_;
};

// A menu of the programs registered for the first file's type; each opens all files. The system is
// asked in the background, so they may appear a moment after the menu.
class OpenWithMenu : public wxMenu {
 public:
  OpenWithMenu(Shell& shell, const std::vector<std::string>& files);  // at least one

 private:
  void Fill(const std::vector<platform::Program>& programs);

  Shell& shell_;
  const std::vector<std::string> files_;
  wxMenuItem* const waiting_;
  FileQuestion programs_;
};

}  // namespace fotomill::desktop
