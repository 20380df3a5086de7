#include <wx/app.h>
#include <wx/cmdline.h>
#include <wx/image.h>
#include <wx/msgdlg.h>
#include <wx/translation.h>
#include <wx/weakref.h>

#include <cstdio>
#include <cstdlib>
#include <functional>
#include <memory>
#include <optional>
#include <string>
#include <vector>

#include "core/data_folder.h"
#include "desktop/models/setup/language_choice.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/models/shell/start_argument.h"
#include "desktop/models/view/view_picture.h"
#include "desktop/windows/dialogs/welcome_box.h"
#include "desktop/windows/setup/override_box.h"
#include "desktop/windows/shell/frame_session.h"
#include "desktop/windows/shell/main_frame.h"
#include "desktop/windows/shell/startup_window.h"
#include "desktop/windows/view/screen_profile.h"
#include "desktop/windows/widgets/app_icon.h"
#include "desktop/windows/widgets/control_names.h"
#include "desktop/windows/widgets/text_sizes.h"
#include "desktop/windows/widgets/wx_text.h"
#include "files/previous_file.h"
#include "platform/first_start.h"
#include "platform/folders.h"
#include "platform/freed_memory.h"
#include "platform/process.h"
#include "platform/work_apart.h"
#include "plugins/child_tasks.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"
#include "settings/configuration.h"
#include "settings/format_switches.h"
#include "settings/plugin_settings.h"
#include "settings/previous_version.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

std::vector<std::string> programArguments;  // original arguments
constexpr double kHandOverSeconds = 2;  // time for a running instance to answer

// Instances of the same user, display and data folder are combined into one.
std::string NameOfInstance() {
  std::string place = DataFolder();
  for (const char* variable : {"WAYLAND_DISPLAY", "DISPLAY"}) {
    const char* const screen = std::getenv(variable);
    if (screen != nullptr) place += std::string("\n") + screen;
  }
  return std::to_string(std::hash<std::string>()(place));
}

}  // namespace

class App : public wxApp {
 public:
  // Set the language first: toolkits choose theirs at startup.
  bool Initialize(int& count, wxChar** arguments) override {
    SetDataFolder({});
    carried_ = CarryOverAtFirstStart();
    (void)LoadConfiguration();
    (void)StartTexts(StoredLanguage());
    return wxApp::Initialize(count, arguments);
  }

  void OnInitCmdLine(wxCmdLineParser& parser) override {
    parser.SetSwitchChars("-");
    parser.AddSwitch("h", "help", Label("show this help"), wxCMD_LINE_OPTION_HELP);
    parser.AddLongSwitch(kNewInstance,
                         Label("open a new window even if the program is already running"));
    parser.AddParam("FOLDER or FILE", wxCMD_LINE_VAL_STRING, wxCMD_LINE_PARAM_OPTIONAL);
  }
  bool OnCmdLineParsed(wxCmdLineParser& parser) override {
    const std::string parsed = parser.GetParamCount() > 0 ? Utf8(parser.GetParam(0)) : "";
    const std::string argument = StartArgument(programArguments, parsed);
    if (!argument.empty()) argument_ = platform::AbsolutePath(argument);
    newInstance_ = parser.Found(kNewInstance);
    return true;
  }

  bool OnInit() override {
    platform::FillStandardStreams();
#ifdef NDEBUG
    // The toolkit's own checks are for developers; it goes on after a failed one.
    wxSetAssertHandler([](const wxString& file, int line, const wxString&,
                          const wxString& condition, const wxString& message) {
      const wxString text = file + ":" + std::to_string(line) + ": " + condition + " " + message;
      std::fprintf(stderr, "%s\n", Utf8(text).c_str());
    });
#endif
    StartTranslations();
    StartEventLog();
    SetAppName("fotomill-desktop");
    SetAppDisplayName("Fotomill Professional");
    if (!wxApp::OnInit()) return false;
    wxImage::AddHandler(new wxPNGHandler);  // the clipboard transfers pictures as PNG
    if (!newInstance_ && HandOver()) return true;
    (void)LoadConfiguration();
    TakeFormatSwitches();
    NameControlsAsTheyCome();
    GiveIconsToWindows();
    SetTextSizes(ReadEarlySettings());
    Welcome();
    InstallOverrideBoxes();
    RunFormatStartup();
    formatsStarted_ = true;
    ApplyPluginSettings();
    EnablePlugins();
    DeleteOldPreviousFiles();
    TakeScreenProfiles();
    const EarlySettings early = ReadEarlySettings();
    ShowStartupWindow(early);
    frame_ = new MainFrame;
    frame_->Session().RestorePlace();
    frame_->Show();
    LogEvent("frame");
    ReportCarryOver();
    frame_->OpenStart(argument_, true);
    firstStart_.Listen([this](std::shared_ptr<platform::LaterStart> start) {
      CallAfter([this, start = std::move(start)] { TakeOver(*start); });
    });
    return true;
  }

  // Logs which window has the keyboard focus.
  int FilterEvent(wxEvent& event) override {
    if (EventLogOn() && event.GetEventType() == wxEVT_ACTIVATE &&
        static_cast<wxActivateEvent&>(event).GetActive()) {
      const auto* window = dynamic_cast<wxTopLevelWindow*>(event.GetEventObject());
      if (window != nullptr) LogEvent("active", Utf8(window->GetTitle()));
    }
    return Event_Skip;
  }

  // After passing its argument to a running instance, it has no window.
  int OnRun() override { return frame_ == nullptr ? 0 : wxApp::OnRun(); }

  int OnExit() override {
    if (formatsStarted_) RunFormatShutdown();
    return wxApp::OnExit();
  }

 private:
  static constexpr const char* kNewInstance = "new-instance";

  // Select the translation again, as the toolkit has set the locale.
  void StartTranslations() {
    (void)StartTexts(StoredLanguage());
    auto* const translations = new wxTranslations;
    wxTranslations::Set(translations);
    translations->SetLanguage(wxString::FromUTF8(TextLanguage()));
    translations->AddStdCatalog();
  }

  // At the first start, or if Setup asks for it; not when a file or folder is to be shown, and not
  // if nothing can be stored, as it would come each time. Texts follow a new language at once.
  void Welcome() {
    const bool first = StateOfConfiguration() == ConfigurationState::Missing;
    if (!argument_.empty() || (!first && settings.ShowWelcomeWizard == 0)) return;
    if (StoreSetting(KeyOf(KeyNumber::ShowWelcomeWizard), {}) != SaveResult::Done) return;
    argument_ = ShowWelcome();
    (void)SaveConfiguration();
    StartTranslations();
  }

  // Shown in the status bar; failures in a message.
  void ReportCarryOver() {
    if (!carried_) return;
    const std::string text = CarryOverText(*carried_);
    LogEvent("carried-over", text);
    frame_->Report(text);
    if (carried_->failed.empty()) return;
    CallAfter(
        [text] { wxMessageBox(Shown(text), "Fotomill Professional", wxOK | wxICON_WARNING); });
  }

  bool HandOver() {
    const auto standing = firstStart_.Begin(NameOfInstance(), argument_, kHandOverSeconds);
    if (standing == platform::FirstStart::Standing::HandedOver) LogEvent("handed-over", argument_);
    return standing == platform::FirstStart::Standing::HandedOver;
  }

  void TakeOver(platform::LaterStart& start) {
    if (frame_ == nullptr || !start.Accept()) return;
    LogEvent("taken-over", start.Message());
    if (frame_->IsIconized()) frame_->Iconize(false);
    frame_->Raise();
    frame_->OpenStart(start.Message(), false);
  }

  std::string argument_;  // absolute path or empty
  std::optional<CarryOver> carried_;
  bool newInstance_ = false;
  bool formatsStarted_ = false;
  wxWeakRef<MainFrame> frame_;
  platform::FirstStart firstStart_;
};

void KeepArguments(int count, char** arguments) {
  if (count > 1) programArguments.assign(arguments + 1, arguments + count);
}

}  // namespace fotomill::desktop

wxIMPLEMENT_APP_NO_MAIN(fotomill::desktop::App);

int main(int count, char** arguments) {
  using namespace fotomill;
  if (const auto status = platform::ServeApart(count, arguments, ChildTasks())) return *status;
  platform::ReturnFreedMemory();
  fotomill::desktop::KeepArguments(count, arguments);
  return wxEntry(count, arguments);
}
