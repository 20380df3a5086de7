#include "desktop/windows/metadata/strip_dialog.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/combobox.h>
#include <wx/dataview.h>
#include <wx/dialog.h>
#include <wx/dirdlg.h>
#include <wx/radiobut.h>
#include <wx/sizer.h>
#include <wx/stattext.h>
#include <wx/wrapsizer.h>

#include <memory>
#include <mutex>

#include "batch/rewrite/exif_file.h"
#include "desktop/models/batch/destination_choice.h"
#include "desktop/models/metadata/strip_preview.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/metadata/left_frame.h"
#include "desktop/windows/metadata/rewrite_batch.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/looks.h"
#include "desktop/windows/widgets/loose_work.h"
#include "desktop/windows/widgets/tool_frame.h"
#include "desktop/windows/widgets/wx_text.h"
#include "metadata/edit/strip.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "settings/history_list.h"
#include "settings/settings.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostPreviewed = 500;

struct KeptBox {
  uint32_t bit;
  const char* label;
};
constexpr KeptBox kKeptBoxes[] = {
    {kKeepOrientation, TrLater("&Orientation")},
    {kKeepProfile, TrLater("Color &profile")},
    {kKeepCopyright, TrLater("C&reator and copyright")},
    {kKeepExif, TrLater("&EXIF without GPS and maker notes")},
    {kKeepGps, TrLater("&GPS")},
    {kKeepXmp, TrLater("&XMP")},
    {kKeepIptc, TrLater("&IPTC")},
    {kKeepComments, TrLater("Co&mments and texts")},
};

// What the user chose.
struct StripChoice {
  StripRequest strip{kKeepUsually, false};
  std::string folder = {};  // empty: replace the files
};

class StripDialog : public wxDialog {
 public:
  StripDialog(wxWindow* parent, const std::vector<std::string>& files);
  StripChoice Choice() const;

 private:
  void BuildKept();
  void BuildFolder();
  void BuildPreview();
  wxRadioButton* AddRadio(wxSizer& sizer, const wxString& label, bool first);
  void Browse();
  void UpdateControls();
  void Preview();

  const std::vector<std::string>& files_;
  const std::string shownFolder_;
  wxRadioButton* all_ = nullptr;
  wxRadioButton* places_ = nullptr;
  wxCheckBox* kept_[std::size(kKeptBoxes)] = {};
  wxRadioButton* replace_ = nullptr;
  wxRadioButton* into_ = nullptr;
  wxComboBox* folder_ = nullptr;
  wxButton* browse_ = nullptr;
  wxDataViewListCtrl* list_ = nullptr;  // null if SecureEXIFPreview is off
  wxButton* ok_ = nullptr;
  LooseWork work_;
};

StripDialog::StripDialog(wxWindow* parent, const std::vector<std::string>& files)
    : wxDialog(parent, wxID_ANY, Label("Remove Metadata"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "StripBox"),
      files_(files),
      shownFolder_(platform::FolderOf(files.front())) {
  const int gap = FromDIP(10);
  SetSizer(new wxBoxSizer(wxVERTICAL));
  BuildKept();
  BuildFolder();
  if (settings.SecureEXIFPreview != 0) BuildPreview();
  ok_ = new wxButton(this, wxID_OK,
                     LabelCount("Remo&ve from %1 file", "Remo&ve from %1 files", files.size()));
  GetSizer()->Add(BuildAnswerRow(*this, *ok_), wxSizerFlags().Expand().Border(wxALL, gap));
  UpdateControls();
  GetSizer()->SetSizeHints(this);
  CentreOnParent();
  all_->SetFocus();
  Preview();
}

wxRadioButton* StripDialog::AddRadio(wxSizer& sizer, const wxString& label, bool first) {
  auto* radio = new wxRadioButton(this, wxID_ANY, label, wxDefaultPosition, wxDefaultSize,
                                  first ? wxRB_GROUP : 0);
  sizer.Add(radio, wxSizerFlags().CenterVertical());
  return radio;
}

void StripDialog::BuildKept() {
  const int gap = FromDIP(10);
  const wxSizerFlags row = wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap);
  auto* whole = new wxBoxSizer(wxHORIZONTAL);
  all_ = AddRadio(*whole, Label("&All metadata, except:"), true);
  GetSizer()->Add(whole, row);
  auto* boxes = new wxFlexGridSizer(2, FromDIP(6), FromDIP(24));
  for (size_t i = 0; i < std::size(kKeptBoxes); ++i) {
    kept_[i] = new wxCheckBox(this, wxID_ANY, Label(kKeptBoxes[i].label));
    kept_[i]->SetValue((kKeepUsually & kKeptBoxes[i].bit) != 0);
    kept_[i]->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { Preview(); });
    boxes->Add(kept_[i]);
  }
  GetSizer()->AddSpacer(FromDIP(6));
  GetSizer()->Add(boxes, wxSizerFlags().Border(wxLEFT, FromDIP(34)));
  auto* gps = new wxBoxSizer(wxHORIZONTAL);
  places_ = AddRadio(*gps, Label("Only the place where a picture was &taken"), false);
  GetSizer()->Add(gps, row);
  for (wxRadioButton* radio : {all_, places_}) {
    radio->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) {
      UpdateControls();
      Preview();
    });
  }
}

void StripDialog::BuildFolder() {
  const int gap = FromDIP(10);
  auto* line = new wxBoxSizer(wxHORIZONTAL);
  replace_ = AddRadio(*line, Label("Rep&lace the files (can be undone)"), true);
  GetSizer()->AddSpacer(gap / 2);
  GetSizer()->Add(line, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap));
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  into_ = AddRadio(*row, Label("Copies i&nto the folder"), false);
  folder_ = new wxComboBox(this, wxID_ANY, "", wxDefaultPosition, FromDIP(wxSize(360, -1)), 0,
                           nullptr, 0, wxDefaultValidator, Label("Folder"));
  for (const std::string& folder : RecentDestinations(shownFolder_))
    folder_->Append(wxString::FromUTF8(folder));
  folder_->AutoCompleteDirectories();
  browse_ = new wxButton(this, wxID_ANY, Label("&Browse..."));
  row->Add(folder_, wxSizerFlags(1).Border(wxLEFT, gap));
  row->Add(browse_, wxSizerFlags().Border(wxLEFT, FromDIP(6)));
  GetSizer()->Add(row, wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxTOP, gap));
  for (wxRadioButton* radio : {replace_, into_})
    radio->Bind(wxEVT_RADIOBUTTON, [this](wxCommandEvent&) { UpdateControls(); });
  folder_->Bind(wxEVT_TEXT, [this](wxCommandEvent&) { UpdateControls(); });
  browse_->Bind(wxEVT_BUTTON, [this](wxCommandEvent&) { Browse(); });
}

void StripDialog::BuildPreview() {
  list_ = NewTextList(this, Label("Preview"),
                      {{Label("File"), 170}, {Label("Removed"), 280}, {Label("Kept"), 200}});
  list_->SetMinSize(wxSize(TextWidth(*this, 680), FromDIP(180)));
  GetSizer()->Add(list_, wxSizerFlags(1).Expand().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(10)));
  if (files_.size() <= kMostPreviewed) return;
  auto* note =
      new wxStaticText(this, wxID_ANY, Label("The first %1 files are shown.", kMostPreviewed));
  GetSizer()->Add(note, wxSizerFlags().Border(wxLEFT | wxRIGHT | wxTOP, FromDIP(10)));
}

StripChoice StripDialog::Choice() const {
  StripChoice choice;
  choice.strip = {0, places_->GetValue()};
  for (size_t i = 0; i < std::size(kKeptBoxes); ++i)
    choice.strip.kept |= kept_[i]->GetValue() ? kKeptBoxes[i].bit : 0;
  if (into_->GetValue()) choice.folder = WholeFolder(Utf8(folder_->GetValue()), shownFolder_);
  return choice;
}

void StripDialog::Browse() {
  wxDirDialog dialog(this, Label("Destination folder"), folder_->GetValue());
  if (dialog.ShowModal() == wxID_OK) folder_->SetValue(dialog.GetPath());
}

void StripDialog::UpdateControls() {
  for (wxCheckBox* box : kept_) box->Enable(all_->GetValue());
  folder_->Enable(into_->GetValue());
  browse_->Enable(into_->GetValue());
  if (ok_ != nullptr) ok_->Enable(replace_->GetValue() || !folder_->GetValue().empty());
}

// Files are read in the background; a line appears when its file is done.
void StripDialog::Preview() {
  if (list_ == nullptr) return;
  list_->DeleteAllItems();
  const std::vector<std::string> files(
      files_.begin(),
      files_.begin() + static_cast<ptrdiff_t>(std::min(files_.size(), kMostPreviewed)));
  work_.Start([this, files, strip = Choice().strip](const StopToken& stop,
                                                    const LooseWork::Report& report) {
    for (const std::string& file : files) {
      if (stop.Asked()) return;
      report([this, file, preview = PreviewStrip(file, strip)] {
        const bool good = preview.problem.empty();
        wxVector<wxVariant> cells;
        cells.push_back(Shown(platform::FileNameOf(file)));
        cells.push_back(Shown(good ? preview.removed : preview.problem));
        cells.push_back(Shown(preview.left));
        list_->AppendItem(cells);
        LogEvent("strip-preview",
                 file + ": " + (good ? preview.removed + "; " + preview.left : preview.problem));
      });
    }
  });
}

// The files that a run has written.
struct Written {
  std::mutex mutex;
  std::vector<std::string> paths;
};

void Run(Shell& shell, const std::vector<std::string>& files, const StripChoice& choice) {
  const auto written = std::make_shared<Written>();
  RewriteFunction function;
  function.unchanged = TrLater("has no metadata to remove.");
  function.listedTwice = TrLater("listed twice; already changed.");
  function.rewrite = [strip = choice.strip, written](
                         const std::string& source, const std::string& destination,
                         const RewriteRequest& request, const WriteOptions& options) {
    RewrittenFile made = StripFile(source, destination, strip, request, options);
    const std::lock_guard lock(written->mutex);
    if (made.status == Status::Ok) written->paths.push_back(destination);
    return made;
  };
  const auto always = std::make_shared<bool>(true);
  RunRewriteBatch(shell, files, std::move(function), choice.folder, always,
                  [&shell, written, always](bool) {
                    if (settings.SecureEXIFPreview != 0 && !written->paths.empty())
                      ShowMetadataLeft(shell, written->paths);
                  });
}

}  // namespace

void StripSelection(Shell& shell) {
  const std::vector<std::string> files = shell.Tabs().SelectedFiles();
  if (files.empty()) return;
  StripChoice choice;
  if (settings.SecureEXIFPrompt != 0) {
    StripDialog dialog(&shell.Window(), files);
    LogEvent("prompt", "strip");
    if (dialog.ShowModal() != wxID_OK) return;
    choice = dialog.Choice();
    if (!choice.folder.empty())
      (void)AddChoice(HistoryList::Destination, platform::AbsolutePath(choice.folder),
                      platform::FolderOf(files.front()));
  }
  Run(shell, files, choice);
}

}  // namespace fotomill::desktop
