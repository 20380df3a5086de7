#include "desktop/windows/browser/hover_tip.h"

#include <wx/window.h>

#include <algorithm>
#include <utility>

#include "desktop/models/browser/file_tip.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/widgets/wx_text.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

constexpr int kSystemsDelayMs = 500;  // the toolkit's own delay for tooltips

}  // namespace

HoverTip::HoverTip(wxWindow& window) : window_(window), wait_(this) {
  Bind(wxEVT_TIMER, [this](wxTimerEvent&) { Read(); });
}

void HoverTip::Over(const std::string& folder, const FolderItem* item, Status known) {
  const std::string name =
      item == nullptr || settings.FileTipShow == 0 ? std::string() : item->name;
  if (name == item_.name && folder == folder_) return;
  wait_.Stop();
  reading_.Stop();
  window_.UnsetToolTip();
  folder_ = folder;
  item_ = name.empty() ? FolderItem() : *item;
  known_ = known;
  if (!name.empty())
    wait_.StartOnce(std::clamp(settings.FileTipDelay - kSystemsDelayMs, 1, 60'000));
}

// The toolkit would leave the tip above a dialog.
void HoverTip::OnActivate(wxActivateEvent& event) {
  event.Skip();
  if (event.GetActive() || item_.name.empty()) return;
  Over(folder_, nullptr, Status::Ok);
  LogEvent("tip", "hidden");
}

void HoverTip::Read() {
  if (!std::exchange(listens_, true))
    wxGetTopLevelParent(&window_)->Bind(wxEVT_ACTIVATE, &HoverTip::OnActivate, this);
  reading_.Start([this, folder = folder_, item = item_, known = known_](
                     const StopToken&, const LooseWork::Report& report) {
    report([this, lines = FileTipLines(folder, item, known)] {
      wxString text;
      for (const std::string& line : lines) text += (text.empty() ? "" : "\n") + Shown(line);
      window_.SetToolTip(text);
      LogEvent("tip", item_.name);
    });
  });
}

}  // namespace fotomill::desktop
