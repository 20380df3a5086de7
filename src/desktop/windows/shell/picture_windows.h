#pragma once

#include <wx/weakref.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/windows/view/view_frame.h"

namespace fotomill::desktop {

class BrowserPage;
class Shell;

// The view and compare windows opened from the frame.
class PictureWindows {
 public:
  explicit PictureWindows(Shell& shell) : shell_(shell) {}

  // Shows a file with `list` as its neighbors in the view window used last, or in a new one if
  // there is none or `another` is set. It deletes itself when closed.
  ViewFrame& View(const std::vector<std::string>& list, const std::string& file,
                  bool another = false);
  // Shows a file of the current browser: among the selected files if there are several, else all
  // shown ones. Sounds and videos are opened with their own program.
  void ViewFromBrowser(const std::string& path, bool another = false);
  // Opens a view window for a file whose folder is not listed yet. `showFolder` is called when the
  // picture is on the screen; the picture keeps the focus, and gets its neighbors after that folder
  // is listed.
  void ViewBeforeFolder(const std::string& path, std::function<void()> showFolder);
  // Call when the current browser has changed; a window may be waiting for its list.
  void OfferList(const BrowserPage& browser);
  // Call after files were written, to reload changed pictures.
  void FilesChanged();

 private:
  Shell& shell_;
  wxWeakRef<ViewFrame> lastUsed_;
  wxWeakRef<ViewFrame> wantsList_;  // waiting for the listing of its folder
};

}  // namespace fotomill::desktop
