#include "desktop/windows/shell/side_pane.h"

#include <wx/frame.h>
#include <wx/splitter.h>

#include <algorithm>

#include "desktop/models/browser/browser_model.h"
#include "desktop/models/info/side_report.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/browser/thumbnail_service.h"
#include "desktop/windows/info/side_view.h"
#include "desktop/windows/shell/browser_tabs.h"
#include "desktop/windows/shell/picture_windows.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "settings/job_options.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kUsualWidth = 280, kLeastWidth = 160;  // device-independent pixels
constexpr int kWaitMs = 60;  // while keys move quickly over files, nothing is read

}  // namespace

SidePane::SidePane(Shell& shell, wxWindow* parent) : shell_(shell) {
  splitter_ = new wxSplitterWindow(parent, wxID_ANY, wxDefaultPosition, wxDefaultSize,
                                   wxSP_LIVE_UPDATE | wxSP_NOBORDER);
  splitter_->SetMinimumPaneSize(splitter_->FromDIP(kLeastWidth));
  splitter_->SetSashGravity(1);  // the browsers take what the frame gains
  width_ = std::max(settings.SidePaneWidth > 0 ? settings.SidePaneWidth : kUsualWidth, kLeastWidth);
  splitter_->Bind(wxEVT_SPLITTER_SASH_POS_CHANGED, [this](wxSplitterEvent& event) {
    width_ = splitter_->ToDIP(splitter_->GetClientSize().x - event.GetSashPosition());
    event.Skip();
  });
  // The first sizes are not those of the frame.
  splitter_->Bind(wxEVT_SIZE, [this](wxSizeEvent& event) {
    if (Shown()) splitter_->SetSashPosition(-splitter_->FromDIP(width_));
    event.Skip();
  });
  view_ = new SideView(splitter_, [this] {
    if (!item_.name.empty() && !item_.folder)
      shell_.Pictures().ViewFromBrowser(platform::JoinFolder(folder_, item_.name));
  });
  view_->Hide();
  wait_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Read(); });
}

wxWindow* SidePane::Parent() const { return splitter_; }

void SidePane::PlaceBeside(wxWindow& browsers) {
  browsers_ = &browsers;
  splitter_->Initialize(browsers_);
  if (settings.SidePaneEnable != 0) Show(true);
}

bool SidePane::Shown() const { return splitter_->IsSplit(); }

void SidePane::Show(bool show) {
  if (show == Shown()) return;
  if (show) {
    view_->Show();
    splitter_->SplitVertically(browsers_, view_, -splitter_->FromDIP(width_));
    ShowItem();
  } else {
    splitter_->Unsplit(view_);
    reading_.Stop();
  }
  settings.SidePaneEnable = show ? 1 : 0;
  LogEvent("side-pane", show ? "shown" : "hidden");
}

void SidePane::KeepWidth() { settings.SidePaneWidth = width_ == kUsualWidth ? 0 : width_; }

void SidePane::Follow(const BrowserModel& model) {
  const size_t focus = model.Selected().Focus();
  const FolderItem item = focus == kNoLine ? FolderItem() : model.Line(focus);
  const bool same = item.name == item_.name && item.modified == item_.modified &&
                    item.size == item_.size && model.Folder() == folder_;
  if (same) return;
  item_ = item;
  folder_ = model.Folder();
  if (Shown()) ShowItem();
}

void SidePane::ShowItem() {
  reading_.Stop();
  if (item_.name.empty()) {
    wait_.Stop();
    return view_->ShowHint(Label("Select a picture to see it here."));
  }
  const ThumbnailPointer thumbnail =
      shell_.Thumbnails().FindAny(platform::JoinFolder(folder_, item_.name));
  view_->ShowStandIn(item_.name, thumbnail == nullptr ? RgbImage() : thumbnail->pixels,
                     item_.folder);
  wait_.StartOnce(kWaitMs);
}

void SidePane::Read() {
  SideOptions options;
  options.side = view_->PreviewSide();
  options.matte = static_cast<uint32_t>(settings.ThumbnailMatte);
  options.read = ReadOptionsFromSettings();
  options.tags = TagSourcesFromSettings();
  reading_.Start([this, folder = folder_, item = item_, options](const StopToken& stop,
                                                                 const LooseWork::Report& report) {
    SideReport found = ReadSideReport(folder, item, options, stop);
    if (stop.Asked()) return;
    report([this, found = std::move(found)]() mutable {
      LogEvent("side", found.path + " preview=" + std::to_string(found.preview.width) + "x" +
                           std::to_string(found.preview.height) +
                           (found.remark.empty() ? "" : " remark=" + found.remark));
      view_->ShowReport(std::move(found));
    });
  });
}

}  // namespace fotomill::desktop
