#include "desktop/windows/metadata/left_frame.h"

#include <wx/accel.h>
#include <wx/dataview.h>
#include <wx/sizer.h>
#include <wx/stattext.h>

#include <algorithm>

#include "desktop/models/metadata/strip_preview.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/info/text_actions.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/background.h"
#include "desktop/windows/widgets/tool_frame.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

class LeftFrame : public ToolFrame {
 public:
  LeftFrame(wxWindow* parent, std::vector<std::string> files);

 private:
  void Finished();

  const std::vector<std::string> files_;
  std::vector<std::string> left_;  // written by the background task
  std::string text_;
  wxStaticText* summary_ = nullptr;
  wxDataViewListCtrl* list_ = nullptr;
  Background work_;  // must be last, so that it ends first
};

LeftFrame::LeftFrame(wxWindow* parent, std::vector<std::string> files)
    : ToolFrame(parent, Label("Metadata Left"), "MetadataLeftBox"), files_(std::move(files)) {
  summary_ = new wxStaticText(Panel(), wxID_ANY, Label("Reading..."));
  list_ = NewTextList(Panel(), Label("Files"),
                      {{Label("File"), 240}, {Label("Left in the file"), 320}});
  const RowButton rows[] = {
      {wxID_COPY, TrLater("Copy &all"), [this] { CopyText(wxString::FromUTF8(text_)); }},
      {wxID_CLOSE, TrLater("C&lose"), [this] { Close(); }},
  };
  auto* contents = new wxBoxSizer(wxHORIZONTAL);
  contents->Add(list_, wxSizerFlags(1).Expand());
  LayOut(summary_, *contents, rows, {{wxACCEL_CTRL, 'C', wxID_COPY}}, wxSize(640, 400));
  list_->SetFocus();
  work_.Start(
      *this,
      [this](const StopToken& stop) {
        for (const std::string& file : files_) {
          if (stop.Asked()) return;
          left_.push_back(MetadataInFile(file));
        }
      },
      [this](Status) { Finished(); });
}

void LeftFrame::Finished() {
  const std::string nothing = Tr("nothing");
  size_t clean = 0;
  for (size_t i = 0; i < left_.size(); ++i) {
    wxVector<wxVariant> cells;
    cells.push_back(Shown(platform::FileNameOf(files_[i])));
    cells.push_back(Shown(left_[i]));
    list_->AppendItem(cells);
    text_.append(files_[i]).append("\t").append(left_[i]).append("\n");
    clean += left_[i] == nothing;
    LogEvent("metadata-left", files_[i] + ": " + left_[i]);
  }
  summary_->SetLabel(LabelCount("%1 file was read again; %2 without metadata.",
                                "%1 files were read again; %2 without metadata.", left_.size(),
                                clean));
  if (!left_.empty()) list_->SelectRow(0);
  Layout();
}

}  // namespace

void ShowMetadataLeft(Shell& shell, std::vector<std::string> files) {
  std::ranges::sort(files);
  (new LeftFrame(&shell.Window(), std::move(files)))->Show();
}

}  // namespace fotomill::desktop
