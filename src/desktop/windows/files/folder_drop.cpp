#include "desktop/windows/files/folder_drop.h"

#include <wx/app.h>
#include <wx/msgdlg.h>
#include <wx/utils.h>

#include "core/choice_lists.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill::desktop {

namespace {

enum class DropKind { Move, Copy, Ask };

DropKind KindNow() {
  if (wxGetKeyState(WXK_SHIFT)) return DropKind::Move;
  if (wxGetKeyState(WXK_CONTROL)) return DropKind::Copy;
  if (settings.DropOptions == choice::kDropCopy) return DropKind::Copy;
  return settings.DropOptions == choice::kDropAsk ? DropKind::Ask : DropKind::Move;
}

// Returns 1: move, 0: copy, -1: canceled.
int AskKind(const std::string& folder) {
  wxMessageDialog dialog(nullptr, Label("Move or copy the files to %1?", Shown(folder)),
                         Label("Drop files"), wxYES_NO | wxCANCEL | wxICON_QUESTION);
  dialog.SetYesNoLabels(Label("&Move"), Label("&Copy"));
  const int answer = dialog.ShowModal();
  return answer == wxID_YES ? 1 : answer == wxID_NO ? 0 : -1;
}

}  // namespace

wxDragResult FolderDrop::OnDragOver(wxCoord x, wxCoord y, wxDragResult) {
  const wxPoint place(x, y);
  const bool accepts = !folderAt_(place).empty();
  MarkPlace(accepts ? &place : nullptr);
  if (!accepts) return wxDragNone;
  return KindNow() == DropKind::Move ? wxDragMove : wxDragCopy;
}

wxDragResult FolderDrop::OnData(wxCoord x, wxCoord y, wxDragResult suggested) {
  MarkPlace(nullptr);
  if (!GetData()) return wxDragNone;
  std::vector<std::string> files = static_cast<FileListData*>(GetDataObject())->Paths();
  return Drop(folderAt_(wxPoint(x, y)), std::move(files)) ? suggested : wxDragNone;
}

// False if there is nothing to do.
bool FolderDrop::Drop(const std::string& folder, std::vector<std::string> files) const {
  if (folder.empty() || files.empty()) return false;
  // Ignore files already in the folder, and folders on themselves.
  for (const std::string& file : files) {
    if (platform::JoinFolder(folder, "").starts_with(platform::JoinFolder(file, ""))) return false;
  }
  if (platform::SplitPath(files.front()).folder == platform::JoinFolder(folder, "")) return false;
  const bool asks = KindNow() == DropKind::Move && settings.PromptBeforeMoving != 0;
  const DropKind kind = asks ? DropKind::Ask : KindNow();
  // Wait for the end of the drag before asking or doing anything.
  wxTheApp->CallAfter([dropped = dropped_, files = std::move(files), folder, kind] {
    const int move = kind == DropKind::Ask ? AskKind(folder) : kind == DropKind::Move ? 1 : 0;
    if (move >= 0) dropped(files, folder, move == 1);
  });
  return true;
}

}  // namespace fotomill::desktop
