#include "desktop/windows/help.h"

#include <wx/msgdlg.h>

#include <string>

#include "desktop/windows/wx_text.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"

namespace fotomill::desktop {

namespace {

struct Topic {
  std::string_view topic;
  const char* page;
};
constexpr Topic kTopics[] = {
    {"OVERWRITE", "desktop.md"},
    {"RENAME", "desktop.md"},
    {"configuration", "configuration.md"},
    {"plugins", "plugins.md"},
};

// Beside an installed program, or in the tree that it was built in.
constexpr const char* kPlaces[] = {"../share/doc/fotomill", "../../docs", "docs"};

std::string PageOf(std::string_view topic) {
  std::string name = "configuration.md";  // a key of the configuration
  for (const Topic& row : kTopics) {
    if (row.topic == topic) name = row.page;
  }
  for (const char* place : kPlaces) {
    const std::string path = platform::AbsolutePath(platform::JoinFolder(platform::JoinFolder(platform::ProgramFolder(), place), name));
    if (platform::IsRegularFile(path)) return path;
  }
  return name;
}

}  // namespace

void ShowHelp(wxWindow& window, std::string_view topic) {
  const std::string page = PageOf(topic);
  const std::vector<std::string> program = platform::ProgramFor(page);
  if (!program.empty() && platform::RunProgram(program, false)) return;
  wxMessageBox("No program is registered that shows this page of the manual:\n" + Shown(page), "Help", wxOK | wxICON_INFORMATION,
               &window);
}

}  // namespace fotomill::desktop
