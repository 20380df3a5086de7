#include "desktop/windows/files/open_with.h"

#include <wx/app.h>
#include <wx/control.h>
#include <wx/frame.h>
#include <wx/menu.h>
#include <wx/msgdlg.h>

#include <algorithm>
#include <functional>
#include <memory>
#include <utility>

#include "batch/external_program.h"
#include "core/workers/background_task.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

// Waiting for a program takes a thread of the pool, which other work needs, too.
constexpr size_t kMostWaitedFor = 16;
constexpr double kHandOverSeconds = 2;  // earlier exit: passed on to another process

// Runs the chosen command, or else the first registered program. Reports to the window's thread as
// long as the window exists.
class Host : public ExternalProgramHost {
 public:
  Host(Shell& shell, StopToken stop, std::vector<std::string> command)
      : shell_(shell), stop_(std::move(stop)), command_(std::move(command)) {}

  std::vector<std::string> CommandFor(const std::string& file) override {
    if (!command_.empty()) return command_;
    const std::vector<platform::Program> programs = platform::ProgramsFor(file);
    if (programs.empty()) return {};
    OnWindow([name = programs.front().name] { LogEvent("open-with", name); });
    std::vector<std::vector<std::string>> commands =
        platform::CommandsFor(programs.front(), {file});
    return commands.empty() ? std::vector<std::string>() : std::move(commands.front());
  }
  void ShowMessage(std::string_view text) override {
    OnWindow([&shell = shell_, text] {
      LogEvent("prompt", std::string(text));
      wxMessageBox(Label(text.data()), "Fotomill Professional", wxOK | wxICON_WARNING,
                   &shell.Window());
    });
  }
  // The program may have changed the file.
  void TakeFocus() override {
    const bool raise = platform::MonotonicSeconds() - started_ >= kHandOverSeconds;
    OnWindow([&shell = shell_, raise] {
      shell.FilesChanged();
      if (raise) shell.Window().Raise();
      LogEvent("external-program", raise ? "ended, raised" : "ended");
    });
  }

 private:
  void OnWindow(std::function<void()> action) const {
    if (stop_.Asked()) return;
    wxTheApp->CallAfter([stop = stop_, action = std::move(action)] {
      if (!stop.Asked()) action();
    });
  }

  Shell& shell_;
  const StopToken stop_;
  const std::vector<std::string> command_;
  const double started_ = platform::MonotonicSeconds();
};

// Asks if a file is one unpacked from an archive.
bool MayOpen(wxWindow* parent, const platform::Program& program,
             const std::vector<std::string>& files) {
  const bool unpacked = std::ranges::any_of(
      files, [](const std::string& file) { return !ArchiveOfFolder(file).empty(); });
  if (!unpacked) return true;
  const wxString name = Shown(program.name);
  return MayOpenCopy(
      parent,
      files.size() == 1
          ? Label("Open %1 with %2?", Shown(platform::FileNameOf(files.front())), name)
          : LabelCount("Open %1 file with %2?", "Open %1 files with %2?", files.size(), name));
}

}  // namespace

void ExternalPrograms::Start(const std::string& file, std::vector<std::string> command,
                             uint32_t flags) {
  LogEvent("external-program", "starts for " + file);
  const auto host = std::make_shared<Host>(shell_, stop_.Token(), std::move(command));
  const auto run = [host, file, flags] { (void)OpenWithExternalProgram(*host, file, flags); };
  if (!RunLoose(run)) host->ShowMessage(kNoExternalProgram);
}

void ExternalPrograms::Open(const std::string& file) {
  const wxString name = Shown(platform::FileNameOf(file));
  if (!ArchiveOfFolder(file).empty() &&
      !MayOpenCopy(&shell_.Window(), Label("Open %1 with its program?", name)))
    return;
  Start(file, {}, 0);
}

void ExternalPrograms::OpenWith(const platform::Program& program,
                                const std::vector<std::string>& files) {
  if (!MayOpen(&shell_.Window(), program, files)) return;
  LogEvent("open-with", program.name);
  std::vector<std::vector<std::string>> commands = platform::CommandsFor(program, files);
  if (commands.empty()) return Start(files.front(), {}, 0);
  const uint32_t flags = commands.size() > kMostWaitedFor ? kDoNotWait : 0;
  for (size_t i = 0; i < commands.size(); ++i) Start(files[i], std::move(commands[i]), flags);
}

OpenWithMenu::OpenWithMenu(Shell& shell, const std::vector<std::string>& files)
    : shell_(shell), files_(files), waiting_(Append(wxID_ANY, Label("Searching..."))) {
  waiting_->Enable(false);
  programs_.Ask<std::vector<platform::Program>>(
      [file = files.front()] { return platform::ProgramsFor(file); },
      [this](const std::vector<platform::Program>& programs) { Fill(programs); });
}

void OpenWithMenu::Fill(const std::vector<platform::Program>& programs) {
  std::string names;
  for (const platform::Program& program : programs) {
    names += program.name + ";";
    const int id = Append(wxID_ANY, wxControl::EscapeMnemonics(Shown(program.name)))->GetId();
    Bind(
        wxEVT_MENU,
        [this, program](wxCommandEvent&) { shell_.Programs().OpenWith(program, files_); }, id);
  }
  if (programs.empty()) {
    waiting_->SetItemLabel(Label("No programs"));
  } else {
    Destroy(waiting_);
  }
  LogEvent("programs", names);
}

}  // namespace fotomill::desktop
