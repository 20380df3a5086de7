#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "core/workers/stop_token.h"
#include "platform/programs.h"

class wxMenu;

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

// Creates a menu of the programs registered for the first file's type; each opens all files. Null
// if there are none.
wxMenu* NewOpenWithMenu(Shell& shell, const std::vector<std::string>& files);

}  // namespace fotomill::desktop
