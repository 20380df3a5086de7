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
  // Call when the current browser has changed: view windows that show its folder get its list.
  void OfferList(const BrowserPage& browser);
  // Call after a file or folder may have been renamed.
  void FollowRename(const std::string& from, const std::string& to);
  // Call after files were written, to reload changed pictures.
  void FilesChanged();

 private:
  std::vector<ViewFrame*> Views() const;

  Shell& shell_;
  wxWeakRef<ViewFrame> lastUsed_;
  uint64_t offered_ = 0;  // generation of the list last offered, and its folder
  std::string offeredFolder_;
  wxWeakRef<ViewFrame> wantsList_;  // waiting for the listing of its folder
};

}  // namespace fotomill::desktop
