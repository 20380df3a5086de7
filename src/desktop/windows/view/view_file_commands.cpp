#include "desktop/windows/view/view_file_commands.h"

#include <wx/clipbrd.h>
#include <wx/textdlg.h>

#include "desktop/models/browser/item_tags.h"
#include "desktop/models/drawing/rgb_image.h"
#include "desktop/models/shell/event_log.h"
#include "desktop/windows/edit/crop_frame.h"
#include "desktop/windows/edit/edit_frame.h"
#include "desktop/windows/files/file_actions.h"
#include "desktop/windows/history/use_recorder.h"
#include "desktop/windows/info/info_frame.h"
#include "desktop/windows/metadata/exif_edit_frame.h"
#include "desktop/windows/pages/pages_frame.h"
#include "desktop/windows/shell/shell.h"
#include "desktop/windows/view/view_frame.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/paths.h"
#include "settings/settings.h"

namespace fotomill::desktop {

void ShowInfoOf(ViewFrame& view) { (new InfoFrame(view.Owner(), &view, {view.File()}))->Show(); }

void EditFileOf(ViewFrame& view) { (new EditFrame(view.Owner(), {view.File()}, nullptr))->Show(); }

void PrintFileOf(ViewFrame& view) {
  (new PagesFrame(view.Owner(), {view.File()}, "print"))->Show();
}

void CropFileOf(ViewFrame& view) { (new CropFrame(view.Owner(), {view.File()}))->Show(); }

void EditExifOf(ViewFrame& view) {
  (new ExifEditFrame(view.Owner(), &view, {view.File()}))->Show();
}

void CommentOn(ViewFrame& view) {
  const std::string path = view.File();
  const ViewPicturePointer loaded = view.Loaded();
  const wxString old = loaded != nullptr ? Shown(loaded->tags.description) : wxString();
  wxTextEntryDialog dialog(&view, Label("Comment for %1:", Shown(platform::FileNameOf(path))),
                           Label("Comment"), old, wxTextEntryDialogStyle | wxTE_MULTILINE);
  LogEvent("prompt", "comment");
  if (dialog.ShowModal() != wxID_OK) return;
  TagChanges changes;
  changes.description = Utf8(dialog.GetValue());
  view.TagFile(path, changes);
}

void TagByKey(ViewFrame& view, int key) {
  const ViewPicturePointer loaded = view.Loaded();
  const auto changes = ChangesOfKey(key, loaded != nullptr ? loaded->tags.label : std::string());
  if (changes) view.TagFile(view.File(), *changes);
}

void CopyPictureOf(ViewFrame& view) {
  const ViewPicturePointer& shown = view.Canvas().Picture();
  if (shown == nullptr || shown->picture == nullptr) return;
  RgbImage pixels;
  if (PixelsForOthers(*shown, static_cast<Color>(settings.ViewModeBackground), pixels) !=
      Status::Ok)
    return wxBell();
  const wxClipboardLocker clipboard;
  if (!clipboard || !wxTheClipboard->SetData(new wxBitmapDataObject(BitmapOf(pixels))))
    return wxBell();
  view.Owner().Uses().NoteAll({shown->request.path}, FileFunction::CopyToClipboard);
  view.SetStatusText(Label("The picture was copied to the clipboard."));
}

}  // namespace fotomill::desktop
