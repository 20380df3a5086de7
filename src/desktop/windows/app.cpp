#include <wx/app.h>
#include <wx/cmdline.h>
#include <wx/image.h>

#include "core/configuration.h"
#include "core/data_folder.h"
#include "desktop/event_log.h"
#include "desktop/previous_file.h"
#include "desktop/view_picture.h"
#include "desktop/windows/control_names.h"
#include "desktop/windows/main_frame.h"
#include "desktop/windows/override_box.h"
#include "desktop/windows/screen_profile.h"
#include "desktop/windows/wx_text.h"
#include "picture/format_switches.h"
#include "picture/registry.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "plugins/plugin_table.h"

namespace fotomill::desktop {

namespace {

// The folder to begin with, and the file in it to show, when the argument is one.
struct Start {
  std::string folder, file;
};

Start StartFrom(const std::string& argument) {
  if (argument.empty()) return {platform::SpecialFolderPath(platform::SpecialFolder::Pictures), {}};
  const std::string path = platform::AbsolutePath(argument);
  if (platform::IsFolder(path)) return {path, {}};
  return {platform::AbsolutePath(path + "/.."), path};
}

}  // namespace

class App : public wxApp {
 public:
  void OnInitCmdLine(wxCmdLineParser& parser) override {
    parser.SetSwitchChars("-");
    parser.AddSwitch("h", "help", "tells how to call the program", wxCMD_LINE_OPTION_HELP);
    parser.AddParam("FOLDER or FILE", wxCMD_LINE_VAL_STRING, wxCMD_LINE_PARAM_OPTIONAL);
  }
  bool OnCmdLineParsed(wxCmdLineParser& parser) override {
    if (parser.GetParamCount() > 0) argument_ = Utf8(parser.GetParam(0));
    return true;
  }

  bool OnInit() override {
    platform::FillStandardStreams();
    StartEventLog();
    SetAppName("fotomill-desktop");
    SetAppDisplayName("Fotomill Professional");
    if (!wxApp::OnInit()) return false;
    wxImage::AddHandler(new wxPNGHandler);  // pictures travel over the clipboard as PNG
    SetDataFolder({});
    (void)LoadConfiguration();
    TakeFormatSwitches();
    NameControlsAsTheyCome();
    InstallOverrideBoxes();
    RunFormatStartup();
    EnablePlugins();
    DeleteOldPreviousFiles();
    std::vector<uint8_t> screen = ReadScreenProfile();
    LogEvent("screen-profile", std::to_string(screen.size()));
    SetScreenProfile(std::move(screen));
    const Start start = StartFrom(argument_);
    auto* frame = new MainFrame;
    const bool restored = frame->RestoreSession();
    if (!restored || !argument_.empty()) {
      frame->ShowFolder(platform::IsFolder(start.folder) ? start.folder : platform::CurrentFolder());
    }
    frame->Show();
    LogEvent("frame");
    if (!start.file.empty()) frame->ViewFiles({start.file}, start.file);
    return true;
  }

  // The log is told which window has the keyboard.
  int FilterEvent(wxEvent& event) override {
    if (EventLogOn() && event.GetEventType() == wxEVT_ACTIVATE && static_cast<wxActivateEvent&>(event).GetActive()) {
      const auto* window = dynamic_cast<wxTopLevelWindow*>(event.GetEventObject());
      if (window != nullptr) LogEvent("active", Utf8(window->GetTitle()));
    }
    return Event_Skip;
  }

  int OnExit() override {
    RunFormatShutdown();
    return wxApp::OnExit();
  }

 private:
  std::string argument_;
};

}  // namespace fotomill::desktop

wxIMPLEMENT_APP(fotomill::desktop::App);
