#include "desktop/windows/files/open_with.h"

#include <wx/control.h>
#include <wx/menu.h>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/programs.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

void Open(Shell& shell, const platform::Program& program, const std::vector<std::string>& files) {
  const bool started = platform::OpenWith(program, files);
  LogEvent("open-with", program.name + (started ? "" : " failed"));
  shell.Report(started ? Tr("%1 was started.", program.name)
                       : Tr("%1 could not be started.", program.name));
}

}  // namespace

wxMenu* NewOpenWithMenu(Shell& shell, const std::vector<std::string>& files) {
  if (files.empty()) return nullptr;
  const std::vector<platform::Program> programs = platform::ProgramsFor(files.front());
  std::string names;
  for (const platform::Program& program : programs) names += program.name + ";";
  LogEvent("programs", names);
  if (programs.empty()) return nullptr;
  auto* menu = new wxMenu;
  for (const platform::Program& program : programs) {
    const int id = menu->Append(wxID_ANY, wxControl::EscapeMnemonics(Shown(program.name)))->GetId();
    menu->Bind(
        wxEVT_MENU, [&shell, program, files](wxCommandEvent&) { Open(shell, program, files); }, id);
  }
  return menu;
}

}  // namespace fotomill::desktop
