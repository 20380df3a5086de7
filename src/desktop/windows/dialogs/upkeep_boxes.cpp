#include "desktop/windows/dialogs/upkeep_boxes.h"

#include <wx/button.h>
#include <wx/checkbox.h>
#include <wx/gauge.h>
#include <wx/listbox.h>
#include <wx/radiobox.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include "catalog/thumbnails/thumbnail_options.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/files.h"
#include "settings/job_options.h"

namespace fotomill::desktop {

namespace {

constexpr int kLookMs = 80;
constexpr size_t kMostLines = 2000;

enum Database { kGlobal, kLocal };

}  // namespace

// --- compaction ---

CompactionBox::CompactionBox(wxWindow* parent, const std::string& folder)
    : wxDialog(parent, wxID_ANY, Label("Compact thumbnail database"), wxDefaultPosition,
               wxDefaultSize, wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "CompactDatabaseBox"),
      paths_{ThumbnailDatabasePath({}), ThumbnailDatabasePath(folder)} {
  const int gap = FromDIP(10);
  const wxString choices[] = {Label("&Global database"), Label("&Database of this folder")};
  which_ = new wxRadioBox(this, wxID_ANY, Label("Database"), wxDefaultPosition, wxDefaultSize, 2,
                          choices, 1, wxRA_SPECIFY_COLS);
  if (!platform::FileExists(paths_[kGlobal]) && platform::FileExists(paths_[kLocal]))
    which_->SetSelection(kLocal);
  facts_ = new wxStaticText(this, wxID_ANY, wxEmptyString, wxDefaultPosition, wxDefaultSize,
                            wxST_ELLIPSIZE_MIDDLE);
  purge_ = new wxCheckBox(this, wxID_ANY, Label("Also remove thumbnails of &missing pictures"));
  purge_->SetToolTip(
      Label("Pictures on network, optical and removable drives are never considered missing."));
  gauge_ = new wxGauge(this, wxID_ANY, 1000, wxDefaultPosition, FromDIP(wxSize(460, -1)));
  gauge_->SetName(Label("Progress"));
  outcome_ = new wxStaticText(this, wxID_ANY,
                              Label("Compacting removes thumbnails that are marked as deleted."));
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_OK, Label("Com&pact")),
               wxSizerFlags().Border(wxRIGHT, FromDIP(6)));
  buttons->Add(new wxButton(this, wxID_CANCEL, Label("Close")));
  auto* column = new wxBoxSizer(wxVERTICAL);
  for (wxWindow* window :
       std::initializer_list<wxWindow*>{which_, facts_, purge_, gauge_, outcome_}) {
    column->Add(window, wxSizerFlags().Expand().Border(wxLEFT | wxTOP | wxRIGHT, gap));
  }
  column->AddStretchSpacer();
  column->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizer(column);
  which_->Bind(wxEVT_RADIOBOX, [this](wxCommandEvent&) { UpdateControls(); });
  Bind(
      wxEVT_BUTTON, [this](wxCommandEvent&) { Begin(); }, wxID_OK);
  Bind(
      wxEVT_BUTTON,
      [this](wxCommandEvent&) {
        if (compaction_ != nullptr && !compaction_->Ended()) return compaction_->Stop();
        EndModal(wxID_CANCEL);
      },
      wxID_CANCEL);
  timer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Look(); });
  UpdateControls();
  Fit();
  SetMinSize(GetSize());
  CentreOnParent();
}

void CompactionBox::Begin() {
  if (compaction_ != nullptr && !compaction_->Ended()) return;
  outcome_->SetLabel("Compacting...");
  compaction_ = std::make_unique<DatabaseCompaction>(
      paths_[which_->GetSelection()], purge_->GetValue(), ThumbnailOptionsFromSettings().hidden);
  timer_.Start(kLookMs);
  UpdateControls();
}

void CompactionBox::Look() {
  const int64_t done = compaction_->Done(), total = compaction_->Total();
  if (total > 0) gauge_->SetValue(static_cast<int>(done * 1000 / total));
  if (!compaction_->Ended()) return;
  timer_.Stop();
  gauge_->SetValue(compaction_->Succeeded() ? 1000 : 0);
  outcome_->SetLabel(Shown(compaction_->Outcome()));
  outcome_->Wrap(GetClientSize().x - FromDIP(20));
  UpdateControls();
  LogEvent("compaction", compaction_->Outcome());
}

void CompactionBox::UpdateControls() {
  const std::string& path = paths_[which_->GetSelection()];
  const bool working = compaction_ != nullptr && !compaction_->Ended();
  if (!working) facts_->SetLabel(Shown((path.empty() ? "" : path + ": ") + DescribeDatabase(path)));
  which_->Enable(!working);
  purge_->Enable(!working);
  FindWindow(wxID_OK)->Enable(!working && platform::FileExists(path));
  FindWindow(wxID_CANCEL)->SetLabel(working ? Label("Stop") : Label("Close"));
  Layout();
}

// --- clean-up ---

CleanUpBox::CleanUpBox(wxWindow* parent, const std::string& folder)
    : wxDialog(parent, wxID_ANY, Label("Clean up thumbnails"), wxDefaultPosition, wxDefaultSize,
               wxDEFAULT_DIALOG_STYLE | wxRESIZE_BORDER, "CleanUpThumbnailsBox"),
      folder_(folder) {
  const int gap = FromDIP(10);
  auto* place = new wxStaticText(this, wxID_ANY,
                                 Label("Thumbnail files without a picture in %1", Shown(folder)));
  below_ = new wxCheckBox(this, wxID_ANY, Label("Include su&bfolders"));
  list_ = new wxListBox(this, wxID_ANY, wxDefaultPosition, FromDIP(wxSize(560, 240)));
  list_->SetName(Label("Thumbnail files"));
  outcome_ = new wxStaticText(this, wxID_ANY, wxEmptyString);
  auto* buttons = new wxBoxSizer(wxHORIZONTAL);
  buttons->AddStretchSpacer();
  buttons->Add(new wxButton(this, wxID_DELETE, Label("&Delete")),
               wxSizerFlags().Border(wxRIGHT, FromDIP(6)));
  buttons->Add(new wxButton(this, wxID_CANCEL, Label("Close")));
  auto* column = new wxBoxSizer(wxVERTICAL);
  for (wxWindow* window : std::initializer_list<wxWindow*>{place, below_}) {
    column->Add(window, wxSizerFlags().Expand().Border(wxLEFT | wxTOP | wxRIGHT, gap));
  }
  column->Add(list_, wxSizerFlags(1).Expand().Border(wxLEFT | wxTOP | wxRIGHT, gap));
  column->Add(outcome_, wxSizerFlags().Expand().Border(wxLEFT | wxTOP | wxRIGHT, gap));
  column->Add(buttons, wxSizerFlags().Expand().Border(wxALL, gap));
  SetSizerAndFit(column);
  below_->Bind(wxEVT_CHECKBOX, [this](wxCommandEvent&) { Search(); });
  Bind(
      wxEVT_BUTTON, [this](wxCommandEvent&) { Delete(); }, wxID_DELETE);
  CentreOnParent();
  Search();
}

void CleanUpBox::Search() {
  FindWindow(wxID_DELETE)->Disable();
  outcome_->SetLabel("Searching...");
  list_->Clear();
  work_.Start(
      *this,
      [this, below = below_->GetValue()](const StopToken& stop) {
        orphans_ = FindOrphanThumbnails(folder_, below, stop);
      },
      [this](Status) { Found(); });  // as many as fit in memory
}

void CleanUpBox::Found() {
  wxArrayString lines;
  for (size_t i = 0; i < std::min(orphans_.size(), kMostLines); ++i) lines.Add(Shown(orphans_[i]));
  if (orphans_.size() > kMostLines)
    lines.Add(LabelCount("... and %1 more", "... and %1 more", orphans_.size() - kMostLines));
  list_->Set(lines);
  outcome_->SetLabel(orphans_.empty()
                         ? Label("Nothing to clean up: every thumbnail file has its picture.")
                         : LabelCount("%1 file", "%1 files", orphans_.size()));
  FindWindow(wxID_DELETE)->Enable(!orphans_.empty());
  Layout();
  LogEvent("cleanup", "orphans=" + std::to_string(orphans_.size()));
}

void CleanUpBox::Delete() {
  const size_t all = orphans_.size();
  orphans_ = DeleteThumbnails(orphans_);
  const size_t left = orphans_.size();
  Found();
  outcome_->SetLabel(left == 0 ? LabelCount("%1 file was deleted.", "%1 files were deleted.", all)
                               : LabelCount("%1 of %2 files could not be deleted; it is listed.",
                                            "%1 of %2 files could not be deleted; they are listed.",
                                            left, all));
}

}  // namespace fotomill::desktop
