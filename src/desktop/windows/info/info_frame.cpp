#include "desktop/windows/info/info_frame.h"

#include <wx/accel.h>
#include <wx/listbox.h>
#include <wx/sizer.h>
#include <wx/splitter.h>
#include <wx/stattext.h>

#include "catalog/history/file_history.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/info/report_tree.h"
#include "desktop/windows/info/text_actions.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

wxString TitleOf(const std::vector<std::string>& paths) {
  if (paths.size() == 1) return Label("Get info: %1", Shown(platform::FileNameOf(paths.front())));
  return LabelCount("Get info: %1 file", "Get info: %1 files", paths.size());
}

constexpr int kProgressMs = 200;

}  // namespace

InfoFrame::InfoFrame(Shell& shell, wxWindow* parent, std::vector<std::string> paths)
    : ToolFrame(parent, TitleOf(paths), "InfoBox"), shell_(shell), paths_(std::move(paths)) {
  problem_ = new wxStaticText(Panel(), wxID_ANY, Label("Reading..."));
  if (paths_.size() == 1) {
    tree_ = new ReportTree(Panel());
    LayOutWith(*tree_);
  } else {
    auto* splitter = new wxSplitterWindow(Panel(), wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                          wxSP_LIVE_UPDATE | wxSP_NOBORDER);
    list_ = new wxListBox(splitter, wxID_ANY);
    list_->SetName(Label("Files"));
    tree_ = new ReportTree(splitter);
    splitter->SetMinimumPaneSize(FromDIP(80));
    splitter->SplitVertically(list_, tree_, FromDIP(220));
    list_->Bind(wxEVT_LISTBOX, [this](wxCommandEvent&) { ShowChoice(); });
    LayOutWith(*splitter);
  }
  tree_->SetFocus();

  timer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) {
    problem_->SetLabel(Label("Reading file %1 of %2...", read_.load() + 1, paths_.size()));
  });
  timer_.Start(kProgressMs);
  work_.Start(
      *this,
      [this, options = InfoOptionsFromSettings()](const StopToken& stop) {
        for (const std::string& path : paths_) {
          if (stop.Asked()) return;
          files_.push_back(ReadFileInfo(path, options));
          ++read_;
        }
        summary_ = SummaryOf(files_);
      },
      [this](Status) { Finished(); });  // shows what could be read
}

void InfoFrame::LayOutWith(wxWindow& report) {
  const RowButton rows[] = {
      {wxID_COPY, TrLater("&Copy value"), [this] { CopyText(tree_->SelectedValue()); }},
      {wxID_SELECTALL, TrLater("Copy &all"), [this] { CopyText(wxString::FromUTF8(WholeText())); }},
      {wxID_SAVE, TrLater("&Save as text..."), [this] { SaveTextAs(*this, "info.txt", WholeText()); }},
      {wxID_CLOSE, TrLater("C&lose"), [this] { Close(); }},
  };
  auto* contents = new wxBoxSizer(wxHORIZONTAL);
  contents->Add(&report, wxSizerFlags(1).Expand());
  LayOut(problem_, *contents, rows,
         {{wxACCEL_CTRL, 'C', wxID_COPY},
          {wxACCEL_CTRL | wxACCEL_SHIFT, 'C', wxID_SELECTALL},
          {wxACCEL_CTRL, 'S', wxID_SAVE}},
         paths_.size() == 1 ? wxSize(700, 560) : wxSize(900, 560));
}

void InfoFrame::Finished() {
  timer_.Stop();
  std::vector<FileUse> uses;
  for (const FileInfo& file : files_) {
    if (file.status == Status::Ok)
      uses.push_back({.path = file.path, .function = FileFunction::GetInfo});
  }
  shell_.Uses().Note(uses);
  if (list_ != nullptr) {
    wxArrayString names;
    names.Add(LabelCount("All %1 files", "All %1 files", files_.size()));
    for (const FileInfo& file : files_) names.Add(Shown(platform::FileNameOf(file.path)));
    list_->Set(names);
    list_->SetSelection(0);
  }
  ShowChoice();
  LogEvent("info", "files=" + std::to_string(files_.size()));
}

void InfoFrame::ShowChoice() {
  const int line = list_ == nullptr ? 1 : list_->GetSelection();
  if (line == wxNOT_FOUND || files_.empty()) return;
  const FileInfo* const file = line == 0 ? nullptr : &files_[static_cast<size_t>(line) - 1];
  const std::string problem = file == nullptr ? std::string() : file->problem;
  problem_->SetLabel(Shown(problem));
  problem_->Show(!problem.empty());
  problem_->GetParent()->Layout();
  tree_->Show(file == nullptr ? summary_ : file->sections);
}

std::string InfoFrame::WholeText() const {
  const int line = list_ == nullptr ? 1 : list_->GetSelection();
  // files are still being read
  if (timer_.IsRunning() || files_.empty() || line == wxNOT_FOUND) return {};
  if (line > 0) return TextOf(files_[static_cast<size_t>(line) - 1]);
  std::string text = TextOf(summary_);
  for (const FileInfo& file : files_) text.append("\n").append(TextOf(file));
  return text;
}

}  // namespace fotomill::desktop
