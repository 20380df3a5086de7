#include "desktop/windows/files/delete_dialog.h"

#include <wx/button.h>
#include <wx/dialog.h>
#include <wx/msgdlg.h>
#include <wx/sizer.h>
#include <wx/statbmp.h>
#include <wx/stattext.h>

#include <algorithm>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/thumbnail_service.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/button_row.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr size_t kMostShown = 5;
constexpr int kWidth = 110;  // of a name, device-independent pixels

// A thumbnail with its name below.
wxSizer* BuildPreview(wxDialog& dialog, const std::string& path,
                      const ThumbnailPointer& thumbnail) {
  const int width = dialog.FromDIP(kWidth);
  auto* column = new wxBoxSizer(wxVERTICAL);
  const int longer = std::max(thumbnail->pixels.width, thumbnail->pixels.height);
  const wxBitmap bitmap =
      BitmapOf(thumbnail->pixels, std::max(1.0, static_cast<double>(longer) / width));
  column->AddStretchSpacer();
  column->Add(new wxStaticBitmap(&dialog, wxID_ANY, bitmap), wxSizerFlags().CenterHorizontal());
  column->AddStretchSpacer();
  column->Add(new wxStaticText(&dialog, wxID_ANY, Shown(platform::FileNameOf(path)),
                               wxDefaultPosition, wxSize(width, -1),
                               wxST_ELLIPSIZE_MIDDLE | wxALIGN_CENTRE_HORIZONTAL),
              wxSizerFlags().CenterHorizontal().Border(wxTOP, dialog.FromDIP(4)));
  return column;
}

wxSizer* BuildPreviews(wxDialog& dialog, const std::vector<std::string>& paths,
                       const ThumbnailService& thumbnails) {
  auto* row = new wxBoxSizer(wxHORIZONTAL);
  for (const std::string& path : paths) {
    const ThumbnailPointer thumbnail = thumbnails.FindAny(path);
    if (thumbnail == nullptr || thumbnail->pixels.Empty()) continue;
    row->Add(BuildPreview(dialog, path, thumbnail),
             wxSizerFlags().Expand().Border(wxRIGHT, dialog.FromDIP(10)));
    if (row->GetItemCount() == kMostShown) break;
  }
  return row;
}

bool AskWithPreviews(wxWindow& parent, const wxString& question,
                     const std::vector<std::string>& paths, const ThumbnailService& thumbnails) {
  wxDialog dialog(wxGetTopLevelParent(&parent), wxID_ANY, Label("Delete"));
  const int gap = dialog.FromDIP(12);
  auto* column = new wxBoxSizer(wxVERTICAL);
  wxSizer* const previews = BuildPreviews(dialog, paths, thumbnails);
  LogEvent("delete-previews", std::to_string(previews->GetItemCount()));
  column->Add(previews, wxSizerFlags().Border(wxLEFT | wxRIGHT | wxTOP, gap));
  column->Add(new wxStaticText(&dialog, wxID_ANY, question), wxSizerFlags().Border(wxALL, gap));
  auto* ok = new wxButton(&dialog, wxID_OK, Label("&Delete"));
  column->Add(BuildAnswerRow(dialog, *ok),
              wxSizerFlags().Expand().Border(wxLEFT | wxRIGHT | wxBOTTOM, gap));
  auto* cancel = static_cast<wxButton*>(dialog.FindWindow(wxID_CANCEL));
  cancel->SetDefault();
  cancel->SetFocus();
  dialog.SetSizerAndFit(column);
  dialog.CentreOnParent();
  return dialog.ShowModal() == wxID_OK;
}

}  // namespace

bool AskToDelete(wxWindow& parent, const wxString& question, const std::vector<std::string>& paths,
                 const ThumbnailService& thumbnails) {
  LogEvent("prompt", "delete");
  if (settings.DeleteShowPreview != 0)
    return AskWithPreviews(parent, question, paths, thumbnails);
  wxMessageDialog dialog(&parent, question, Label("Delete"),
                         wxOK | wxCANCEL | wxCANCEL_DEFAULT | wxICON_WARNING);
  dialog.SetOKLabel(Label("&Delete"));
  return dialog.ShowModal() == wxID_OK;
}

}  // namespace fotomill::desktop
