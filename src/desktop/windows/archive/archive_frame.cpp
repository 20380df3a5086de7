#include "desktop/windows/archive/archive_frame.h"

#include <wx/accel.h>
#include <wx/button.h>
#include <wx/dataview.h>
#include <wx/filedlg.h>
#include <wx/frame.h>
#include <wx/msgdlg.h>
#include <wx/panel.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include <algorithm>
#include <memory>

#include "batch/archive/create_run.h"
#include "batch/archive/extract_run.h"
#include "batch/new_job.h"
#include "desktop/models/archive/archive_listing.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/archive/archive_dialogs.h"
#include "desktop/windows/archive/archive_folders.h"
#include "desktop/windows/batch/batch_runner.h"
#include "desktop/windows/files/open_with.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/picture_windows.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/loose_work.h"
#include "desktop/windows/widgets/tool_frame.h"
#include "desktop/windows/widgets/wx_text.h"
#include "files/previous_file.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "platform/temporary_folder.h"
#include "registry/registry.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

enum { kExtractId = wxID_HIGHEST + 1, kTestId, kAddId, kBrowseId };

// A job whose answers about existing files change ArchivePromptOverwrite. If that is off, both
// files are kept.
BatchJob NewArchiveJob() {
  BatchJob job = NewBatchJob();
  job.formatIndex = FindFormatByName("a.zip");
  job.naming.askName = job.naming.askPassword = job.naming.confirmFormat = false;
  job.overwrite.prompt = job.overwrite.keepBoth = true;
  job.applyToRest = settings.ArchivePromptOverwrite == 0;
  return job;
}
void RememberPrompt(Shell& shell, BatchJob& job) {
  job.remember = [&shell, other = job.remember](Remembered what, int32_t value) {
    if (what != Remembered::PromptBeforeOverwrite) return other(what, value);
    shell.Window().CallAfter([value] {
      settings.ArchivePromptOverwrite = value;
      (void)SaveConfiguration();
    });
  };
}

class ArchiveFrame : public ToolFrame {
 public:
  ArchiveFrame(Shell& shell, const std::string& archive);

 private:
  void BuildList();
  void LayOutContents();
  void Read();
  void ShowRows();
  void SortBy(int32_t column);
  std::vector<std::string> SelectedEntries() const;
  void UpdateControls();
  void Extract();
  void Test();
  void AddFiles();
  void View();
  void Opened(const std::string& file);
  void OnClose(wxCloseEvent& event);

  Shell& shell_;
  const std::string archive_;
  ArchiveListing listing_;
  std::vector<ArchiveRow> rows_;
  std::shared_ptr<platform::TemporaryFolder> viewed_;  // unpacked for viewing
  wxDataViewListCtrl* list_ = nullptr;
  wxStaticText* summary_ = nullptr;
  const std::shared_ptr<bool> alive_ = std::make_shared<bool>(true);
  LooseWork work_;
};

ArchiveFrame::ArchiveFrame(Shell& shell, const std::string& archive)
    : ToolFrame(&shell.Window(), Label("Archive: %1", Shown(platform::FileNameOf(archive))),
                "ArchiveBox"),
      shell_(shell),
      archive_(archive) {
  BuildList();
  summary_ = new wxStaticText(Panel(), wxID_ANY, Label("Reading..."));
  LayOutContents();
  Bind(wxEVT_CLOSE_WINDOW, &ArchiveFrame::OnClose, this);
  list_->SetFocus();
  UpdateControls();
  Read();
}

void ArchiveFrame::BuildList() {
  const long rules = settings.ArchiveListRuleEnable != 0 ? wxDV_HORIZ_RULES : 0;
  list_ = new wxDataViewListCtrl(Panel(), wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                 wxDV_MULTIPLE | rules);
  list_->SetName(Label("Files in the archive"));
  for (const ArchiveColumnFacts& facts : ArchiveColumns()) {
    const int32_t kept = NumberIn(KeyOf(facts.width));
    list_->AppendTextColumn(Label(facts.title), wxDATAVIEW_CELL_INERT,
                            kept > 0 ? FromDIP(kept) : TextWidth(*this, facts.usual),
                            facts.number ? wxALIGN_RIGHT : wxALIGN_LEFT, wxDATAVIEW_COL_RESIZABLE);
  }
  list_->Bind(wxEVT_DATAVIEW_SELECTION_CHANGED, [this](wxDataViewEvent&) { UpdateControls(); });
  list_->Bind(wxEVT_DATAVIEW_ITEM_ACTIVATED, [this](wxDataViewEvent&) { View(); });
  list_->Bind(wxEVT_DATAVIEW_COLUMN_HEADER_CLICK,
              [this](wxDataViewEvent& event) { SortBy(event.GetColumn()); });
}

void ArchiveFrame::LayOutContents() {
  const RowButton rows[] = {
      {kExtractId, TrLater("&Extract..."), [this] { Extract(); }},
      {kTestId, TrLater("&Test"), [this] { Test(); }},
      {kAddId, TrLater("&Add files..."), [this] { AddFiles(); }},
      {wxID_VIEW_DETAILS, TrLater("&View"), [this] { View(); }},
      {kBrowseId, TrLater("&Browse"), [this] { OpenArchiveFolder(shell_, archive_); }},
      {wxID_CLOSE, TrLater("C&lose"), [this] { Close(); }},
  };
  auto* contents = new wxBoxSizer(wxVERTICAL);
  contents->Add(list_, wxSizerFlags(1).Expand());
  contents->Add(summary_, wxSizerFlags().Expand().Border(wxTOP, FromDIP(10)));
  const bool known = settings.ArchiveManagerWidth > 0 && settings.ArchiveManagerDepth > 0;
  LayOut(nullptr, *contents, rows,
         {{wxACCEL_CTRL, 'A', wxID_SELECTALL}, {wxACCEL_CTRL, 'E', kExtractId}},
         known ? wxSize(settings.ArchiveManagerWidth, settings.ArchiveManagerDepth)
               : wxSize(900, 520));
  Bind(
      wxEVT_MENU, [this](wxCommandEvent&) { list_->SelectAll(); }, wxID_SELECTALL);
  FindWindow(kBrowseId)->SetToolTip(Label("Shows the archive like a folder, in a tab."));
}

// --- list ---

void ArchiveFrame::Read() {
  work_.Start([this, archive = archive_](const StopToken&, const LooseWork::Report& report) {
    report([this, listing = ReadArchiveListing(archive)] {
      listing_ = listing;
      ShowRows();
    });
  });
}

void ArchiveFrame::ShowRows() {
  rows_ = listing_.rows;
  const int32_t mode = settings.ArchiveSortMode;
  SortArchive(rows_, mode % kDescendingOrder, mode >= kDescendingOrder);
  list_->DeleteAllItems();
  uint64_t bytes = 0;
  for (const ArchiveRow& row : rows_) {
    wxVector<wxVariant> cells;
    for (int32_t column = 0; column < static_cast<int32_t>(ArchiveColumns().size()); ++column)
      cells.push_back(Shown(ArchiveCell(row, column, settings.ArchiveDateMode)));
    list_->AppendItem(cells);
    bytes += row.size.value_or(0);
  }
  if (!rows_.empty()) list_->SelectRow(0);
  const wxString files = LabelCount("%1 file", "%1 files", rows_.size()) + ", " +
                         wxString::FromUTF8(TrGroupedCount("%1 byte", "%1 bytes", bytes));
  summary_->SetLabel(listing_.problem.empty() ? files : Shown(listing_.problem) + " " + files);
  UpdateControls();
  LogEvent("archive", "rows=" + std::to_string(rows_.size()) +
                          " first=" + (rows_.empty() ? std::string() : rows_.front().entry) + " " +
                          listing_.problem);
}

void ArchiveFrame::SortBy(int32_t column) {
  const bool again = settings.ArchiveSortMode == column;
  settings.ArchiveSortMode = again ? column + kDescendingOrder : column;
  ShowRows();
}

std::vector<std::string> ArchiveFrame::SelectedEntries() const {
  wxDataViewItemArray items;
  list_->GetSelections(items);
  std::vector<std::string> entries;
  for (const wxDataViewItem& item : items)
    entries.push_back(rows_[static_cast<size_t>(list_->ItemToRow(item))].entry);
  return entries;
}

void ArchiveFrame::UpdateControls() {
  const size_t selected = SelectedEntries().size();
  for (const wxWindowID id : {static_cast<wxWindowID>(kExtractId), static_cast<wxWindowID>(kTestId),
                              static_cast<wxWindowID>(kBrowseId)})
    FindWindow(id)->Enable(!rows_.empty());
  FindWindow(kAddId)->Enable(listing_.canAdd);
  FindWindow(wxID_VIEW_DETAILS)->Enable(selected == 1);
}

// --- actions ---

void ArchiveFrame::Extract() {
  const std::vector<std::string> selected = SelectedEntries();
  const auto choice = AskForExtraction(*this, archive_, rows_.size(), selected.size());
  if (!choice) return;
  ArchivePart part{.path = archive_};
  if (choice->selected) part.names = selected;
  const ExtractTarget target{.folder = choice->folder,
                             .keepPaths = settings.ArchivePreservePaths != 0,
                             .keepTimes = settings.ArchivePreserveTimestamps != 0};
  BatchJob job = NewArchiveJob();
  job.destinationFolder = target.folder;
  shell_.Batches().Run(std::move(job), [&shell = shell_, part, target](BatchJob& running) {
    RememberPrompt(shell, running);
    return RunExtract(part, target, running);
  });
}

void ArchiveFrame::Test() {
  BatchJob job = NewBatchJob();
  job.boxSettings.closeWhenDone = false;
  shell_.Batches().Run(std::move(job), [part = ArchivePart{.path = archive_}](BatchJob& running) {
    return RunArchiveTest(part, running);
  });
}

// Adds to an archive, or creates it; `done` as for RunExtract in a window.
void RunArchive(Shell& shell, const CreateChoice& choice, std::vector<std::string> files,
                const std::weak_ptr<bool>& alive, std::function<void()> done) {
  auto previous = std::make_shared<PreviousFiles>(FileOperationKind::Change);
  CreateArchive request{.path = choice.path,
                        .files = std::move(files),
                        .password = choice.password,
                        .add = choice.add};
  request.naming = {.base = platform::FolderOf(request.files.front()),
                    .keepPaths = settings.ArchivePreservePaths != 0,
                    .addThumbnails = settings.ArchiveAddThumbnails != 0};
  request.keepPrevious = [previous](const std::string& path) { return previous->Keep(path); };
  request.replaced = [previous](const std::string& path) { previous->Replaced(path); };
  shell.Batches().Run(
      NewArchiveJob(),
      [&shell, request, alive, done = std::move(done)](BatchJob& running) {
        RememberPrompt(shell, running);
        const Status status = RunCreateArchive(request, running);
        shell.Window().CallAfter([alive, done] {
          if (!alive.expired()) done();
        });
        return status;
      },
      previous);
}

void ArchiveFrame::AddFiles() {
  wxFileDialog dialog(this, Label("Add files"), wxString::FromUTF8(platform::FolderOf(archive_)),
                      "", "*", wxFD_OPEN | wxFD_MULTIPLE | wxFD_FILE_MUST_EXIST);
  if (dialog.ShowModal() != wxID_OK) return;
  wxArrayString paths;
  dialog.GetPaths(paths);
  std::vector<std::string> files;
  for (const wxString& path : paths) files.push_back(Utf8(path));
  RunArchive(shell_, {.path = archive_, .password = {}, .add = true}, std::move(files), alive_,
             [this] { Read(); });
}

// Unpacks the focused file to a temporary folder and opens it.
void ArchiveFrame::View() {
  const std::vector<std::string> selected = SelectedEntries();
  if (selected.size() != 1) return;
  auto folder = std::make_shared<platform::TemporaryFolder>();
  if (!folder->Create()) return wxBell();
  viewed_ = folder;
  const auto file = std::make_shared<std::string>();
  const ExtractTarget target{.folder = folder->Path(),
                             .keepPaths = false,
                             .extracted = [file](const std::string& path) { *file = path; }};
  BatchJob job = NewBatchJob();
  job.noSummary = true;
  job.boxSettings.closeWhenDone = true;
  shell_.Batches().Run(std::move(job),
                       [part = ArchivePart{.path = archive_, .names = selected}, target, file,
                        &shell = shell_, this, alive = std::weak_ptr(alive_)](BatchJob& running) {
                         const Status status = RunExtract(part, target, running);
                         running.filesChanged = false;
                         shell.Window().CallAfter([this, alive, file] {
                           if (!alive.expired() && !file->empty()) Opened(*file);
                         });
                         return status;
                       });
}

void ArchiveFrame::Opened(const std::string& file) {
  const bool picture = FindFormatByName(file) != kNoFormat;
  const auto question = [&] {
    return Label("Open %1 with its program?", Shown(platform::FileNameOf(file)));
  };
  if (!picture && !MayOpenCopy(this, question())) return;
  LogEvent("archive-view", file);
  if (picture) {
    shell_.Pictures().View({file}, file);
  } else {
    shell_.Programs().Open(file);
  }
}

void ArchiveFrame::OnClose(wxCloseEvent& event) {
  const wxSize size = ToDIP(GetSize());
  if (!IsMaximized() && !IsIconized()) {
    settings.ArchiveManagerWidth = size.x;
    settings.ArchiveManagerDepth = size.y;
  }
  for (unsigned i = 0; i < ArchiveColumns().size(); ++i)
    StoreNumber(KeyOf(ArchiveColumns()[i].width), ToDIP(list_->GetColumn(i)->GetWidth()));
  (void)SaveConfiguration();
  event.Skip();
}

std::string AskForArchiveFile(Shell& shell) {
  wxFileDialog dialog(&shell.Window(), Label("Open archive"),
                      wxString::FromUTF8(shell.Tabs().CurrentFolder()), "",
                      Label("Archives (*.zip, *.rar)|*.zip;*.rar;*.ZIP;*.RAR|All files|*"),
                      wxFD_OPEN | wxFD_FILE_MUST_EXIST);
  return dialog.ShowModal() == wxID_OK ? Utf8(dialog.GetPath()) : std::string();
}

}  // namespace

void ShowArchive(Shell& shell, const std::string& archive) {
  (new ArchiveFrame(shell, archive))->Show();
}

void ManageArchive(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  const auto found = std::ranges::find_if(files, IsArchiveName);
  const std::string archive = found != files.end() ? *found : AskForArchiveFile(shell);
  if (!archive.empty()) ShowArchive(shell, archive);
}

void ArchiveSelection(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedPaths();
  if (files.empty()) return;
  const auto choice = AskForArchive(shell.Window(), files);
  if (!choice) return;
  const auto always = std::make_shared<bool>(true);
  RunArchive(shell, *choice, files, always, [always] {});
}

}  // namespace fotomill::desktop
