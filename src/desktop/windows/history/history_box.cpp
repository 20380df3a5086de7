#include "desktop/windows/history/history_box.h"

#include <wx/button.h>
#include <wx/dataview.h>
#include <wx/msgdlg.h>
#include <wx/richmsgdlg.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include <algorithm>

#include "core/choice_lists.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/setup/setup_box.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/picture_windows.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr const char* kTitle = TrLater("File history");
constexpr int kSmallSide = 32, kLargeSide = 96;  // device-independent pixels

int ThumbnailSide() {
  switch (settings.FileHistoryThumbnailMode) {
    case choice::kHistoryNoThumbnails: return 0;
    case choice::kHistoryLarge: return kLargeSide;
    default: return kSmallSide;
  }
}

}  // namespace

class FileHistoryBox::Lines : public wxDataViewVirtualListModel {
 public:
  Lines(const FileHistoryList& history, const HistoryThumbnails& thumbnails)
      : history_(history), thumbnails_(thumbnails) {}
  void GetValueByRow(wxVariant& value, unsigned int row, unsigned int column) const override {
    if (row >= history_.Count()) {
      value = wxString();
    } else if (column == choice::kColumnName) {
      value << wxDataViewIconText(Shown(history_.Cell(row, column)),
                                  thumbnails_.Find(history_.Row(row).path));
    } else {
      value = Shown(history_.Cell(row, column));
    }
  }
  bool SetValueByRow(const wxVariant&, unsigned int, unsigned int) override { return false; }

 private:
  const FileHistoryList& history_;
  const HistoryThumbnails& thumbnails_;
};

FileHistoryBox::FileHistoryBox(Shell& shell)
    : wxDialog(&shell.Window(), wxID_ANY, Label(kTitle), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER | wxMAXIMIZE_BOX, "FileHistoryBox"),
      shell_(shell),
      thumbnails_([this](const std::vector<std::string>& paths) {
        for (size_t row = 0; row < history_.Count(); ++row) {
          if (std::ranges::find(paths, history_.Row(row).path) != paths.end())
            lines_->RowChanged(static_cast<unsigned>(row));
        }
      }),
      lines_(new Lines(history_, thumbnails_)) {
  const bool known = settings.FileHistoryWidth > 0 && settings.FileHistoryDepth > 0;
  SetSize(FromDIP(known ? wxSize(settings.FileHistoryWidth, settings.FileHistoryDepth)
                        : wxSize(1080, 560)));
  count_ = new wxStaticText(this, wxID_ANY, wxEmptyString);
  auto* column = new wxBoxSizer(wxVERTICAL);
  BuildList();
  column->Add(list_, wxSizerFlags(1).Expand().Border(wxALL, FromDIP(10)));
  column->Add(count_, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT, FromDIP(10)));
  column->Add(BuildButtons(), wxSizerFlags().Expand().Border(wxALL, FromDIP(10)));
  SetSizer(column);
  Layout();
  AddColumns();
  shell_.Uses().Flush();
  readable_ = history_.Read();
  Refill();
  SetEscapeId(wxID_CLOSE);
  CentreOnParent();
  list_->SetFocus();
}

FileHistoryBox::~FileHistoryBox() { KeepPlaces(); }

// --- list ---

void FileHistoryBox::BuildList() {
  const long rules = settings.FileHistoryListRuleEnable != 0 ? wxDV_HORIZ_RULES : 0;
  list_ =
      new wxDataViewCtrl(this, wxID_ANY, wxDefaultPosition, wxDefaultSize, wxDV_MULTIPLE | rules);
  list_->SetName(Label(kTitle));
  list_->AssociateModel(lines_.get());
  list_->Bind(wxEVT_DATAVIEW_ITEM_ACTIVATED, [this](wxDataViewEvent&) { ViewFile(); });
  list_->Bind(wxEVT_DATAVIEW_SELECTION_CHANGED, [this](wxDataViewEvent&) { UpdateControls(); });
  list_->Bind(wxEVT_DATAVIEW_COLUMN_HEADER_CLICK, [this](wxDataViewEvent& event) {
    history_.SortBy(static_cast<int32_t>(event.GetDataViewColumn()->GetModelColumn()));
    settings.FileHistorySortMode = history_.SortColumn();
    Refill();
  });
  Bind(wxEVT_CHAR_HOOK, [this](wxKeyEvent& event) {
    if (!list_->HasFocus()) return event.Skip();
    const int key = event.GetKeyCode();
    if (key == WXK_DELETE) return RemoveSelected();
    if (key == WXK_RETURN || key == WXK_NUMPAD_ENTER) return ViewFile();
    event.Skip();
  });
}

void FileHistoryBox::AddColumns() {
  const int whole = std::max(list_->GetClientSize().x, FromDIP(400));
  for (unsigned i = 0; i < HistoryColumns().size(); ++i) {
    const HistoryColumnFacts& facts = HistoryColumns()[i];
    const wxAlignment alignment = facts.number ? wxALIGN_RIGHT : wxALIGN_LEFT;
    const int middle = alignment | wxALIGN_CENTER_VERTICAL;
    const int width = std::max(NumberIn(KeyOf(facts.width)) * whole / kWholeWidth, FromDIP(30));
    wxDataViewRenderer* renderer =
        i == choice::kColumnName
            ? static_cast<wxDataViewRenderer*>(new wxDataViewIconTextRenderer(
                  "wxDataViewIconText", wxDATAVIEW_CELL_INERT, middle))
            : new wxDataViewTextRenderer("string", wxDATAVIEW_CELL_INERT, middle);
    list_->AppendColumn(
        new wxDataViewColumn(Label(facts.title), renderer, i, width, alignment,
                             wxDATAVIEW_COL_RESIZABLE | wxDATAVIEW_COL_REORDERABLE));
  }
}

void FileHistoryBox::Refill() {
  std::vector<std::string> paths;
  for (size_t row = 0; row < history_.Count(); ++row) paths.push_back(history_.Row(row).path);
  const double scale = GetContentScaleFactor();
  thumbnails_.Want(paths, static_cast<int>(FromDIP(ThumbnailSide()) * scale), scale);
  lines_->Reset(static_cast<unsigned>(history_.Count()));
  if (history_.Count() > 0) {
    list_->SetCurrentItem(lines_->GetItem(0));
    list_->Select(lines_->GetItem(0));
  }
  UpdateControls();
  LogEvent("history", "rows=" + std::to_string(history_.Count()) +
                          " sort=" + std::to_string(history_.SortColumn()));
}

void FileHistoryBox::UpdateControls() {
  const size_t selected = SelectedRows().size();
  wxString text = settings.FileHistoryEnable == 0
                      ? Label("The file history is disabled; Options enables it.")
                      : LabelCount("%1 file", "%1 files", history_.Count());
  if (settings.FileHistoryEnable != 0 && selected > 1)
    text += ", " + Label("%1 selected", selected);
  if (!readable_) text = Label("The history file is not readable. Clear deletes it.");
  count_->SetLabel(text);
  for (const wxWindowID id : {wxID_OPEN, wxID_UP}) FindWindow(id)->Enable(selected == 1);
  FindWindow(wxID_DELETE)->Enable(selected > 0);
  FindWindow(wxID_CLEAR)->Enable(history_.Count() > 0 || !readable_);
}

std::vector<size_t> FileHistoryBox::SelectedRows() const {
  wxDataViewItemArray items;
  list_->GetSelections(items);
  std::vector<size_t> rows;
  for (const wxDataViewItem& item : items) rows.push_back(lines_->GetRow(item));
  return rows;
}

// --- buttons ---

wxSizer* FileHistoryBox::BuildButtons() {
  struct Button {
    wxWindowID id;
    const char* label;
    void (FileHistoryBox::*run)();
  };
  static constexpr Button kButtons[] = {
      {wxID_OPEN, TrLater("&View"), &FileHistoryBox::ViewFile},
      {wxID_UP, TrLater("Show in &folder"), &FileHistoryBox::ShowFolder},
      {wxID_DELETE, TrLater("&Remove"), &FileHistoryBox::RemoveSelected},
      {wxID_CLEAR, TrLater("&Clear"), &FileHistoryBox::ClearAll},
      {wxID_PREFERENCES, TrLater("&Options..."), &FileHistoryBox::Options},
  };
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  for (const Button& button : kButtons) {
    row->Add(new wxButton(this, button.id, Label(button.label)),
             wxSizerFlags().Border(wxRIGHT, FromDIP(6)));
    Bind(
        wxEVT_BUTTON, [this, run = button.run](wxCommandEvent&) { (this->*run)(); }, button.id);
  }
  row->AddStretchSpacer();
  row->Add(new wxButton(this, wxID_CLOSE, Label("Close")));
  return row;
}

void FileHistoryBox::ViewFile() {
  const std::vector<size_t> rows = SelectedRows();
  if (rows.size() != 1) return;
  const std::string path = history_.Row(rows.front()).path;
  if (!platform::IsRegularFile(path)) {
    wxMessageBox(Label("The file no longer exists. Remove deletes its entry from the list."),
                 Label(kTitle), wxOK | wxICON_INFORMATION, this);
    return;
  }
  Shell& shell = shell_;
  EndModal(wxID_OPEN);
  shell.Window().CallAfter([&shell, path] { shell.Pictures().View({path}, path); });
}

void FileHistoryBox::ShowFolder() {
  const std::vector<size_t> rows = SelectedRows();
  if (rows.size() != 1) return;
  const std::string path = history_.Row(rows.front()).path;
  const std::string folder(platform::SplitPath(path).folder);
  Shell& shell = shell_;
  EndModal(wxID_OPEN);
  shell.Window().CallAfter([&shell, path, folder] {
    const std::string trimmed = folder.size() > 1 ? folder.substr(0, folder.size() - 1) : folder;
    if (BrowserPage* browser = shell.Tabs().Open(trimmed))
      browser->Open(trimmed, std::string(platform::FileNameOf(path)));
  });
}

bool FileHistoryBox::Confirm(const wxString& question, const wxString& verb) {
  if (settings.FileHistoryRemovePrompt == 0) return true;
  wxRichMessageDialog dialog(this, question, Label("History entries"),
                             wxYES_NO | wxNO_DEFAULT | wxICON_QUESTION);
  dialog.SetExtendedMessage(Label("The files themselves are not affected."));
  dialog.SetYesNoLabels("&" + verb, Label("&Keep"));
  dialog.ShowCheckBox(Label("Do not ask again (can be re-enabled in Setup)"));
  LogEvent("question", Utf8(question));
  if (dialog.ShowModal() != wxID_YES) return false;
  if (dialog.IsCheckBoxChecked()) {
    settings.FileHistoryRemovePrompt = 0;
    (void)SaveConfiguration();
  }
  return true;
}

void FileHistoryBox::RemoveSelected() {
  const std::vector<size_t> rows = SelectedRows();
  if (rows.empty()) return;
  const wxString what = rows.size() == 1
                            ? "\"" + Shown(history_.Cell(rows.front(), choice::kColumnName)) + "\""
                            : LabelCount("%1 entry", "%1 entries", rows.size());
  if (!Confirm(Label("Remove %1 from the file history?", what), Label("Remove"))) return;
  if (!history_.Remove(rows))
    wxMessageBox(Label("The history file could not be written. The entries were not removed."),
                 Label(kTitle), wxOK | wxICON_WARNING, this);
  Refill();
}

void FileHistoryBox::ClearAll() {
  if (!Confirm(Label("Remove all entries from the file history?"), Label("Clear"))) return;
  readable_ = history_.Clear();
  if (!readable_)
    wxMessageBox(Label("The history file could not be deleted."), Label(kTitle),
                 wxOK | wxICON_WARNING, this);
  Refill();
}

void FileHistoryBox::Options() {
  if (!ShowFileHistorySetup(this)) return;
  list_->SetWindowStyleFlag((list_->GetWindowStyleFlag() & ~wxDV_HORIZ_RULES) |
                            (settings.FileHistoryListRuleEnable != 0 ? wxDV_HORIZ_RULES : 0));
  readable_ = history_.Read();
  Refill();
}

void FileHistoryBox::KeepPlaces() {
  const int whole = std::max(list_->GetClientSize().x, 1);
  for (unsigned i = 0; i < list_->GetColumnCount(); ++i) {
    const wxDataViewColumn* const column = list_->GetColumn(i);
    const KeyRow& row = KeyOf(HistoryColumns()[column->GetModelColumn()].width);
    if (column->GetWidth() > 0) StoreNumber(row, column->GetWidth() * kWholeWidth / whole);
  }
  settings.FileHistoryWidth = ToDIP(GetSize()).x;
  settings.FileHistoryDepth = ToDIP(GetSize()).y;
}

bool ShowFileHistorySetup(wxWindow* parent) {
  return ShowSettingsBox(parent, Label("File history options"), "FileHistorySetupBox",
                         ItemsOf(SetupPage::History));
}

}  // namespace fotomill::desktop
