#pragma once

#include <wx/weakref.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/windows/view/view_frame.h"

namespace fotomill::desktop {

class BrowserPage;
class Shell;

// The view windows and those that compare pictures, as far as they are opened on the frame.
class PictureWindows {
 public:
  explicit PictureWindows(Shell& shell) : shell_(shell) {}

  // Opens a view window on a file, with the files of `list` as its neighbors. It deletes itself
  // when it is closed.
  ViewFrame& View(const std::vector<std::string>& list, const std::string& file);
  // Opens one on a file of the browser in front: among the selected files if there are several,
  // else among all shown. A sound or video is opened with its own program instead.
  void ViewFromBrowser(const std::string& path);
  // Opens one on a file whose folder is not listed yet. `showFolder` is called once the picture is
  // on the screen; the keyboard stays with the picture, whose neighbors come with the list of that
  // folder.
  void ViewBeforeFolder(const std::string& path, std::function<void()> showFolder);
  // The browser in front has changed; a window may have waited for its list.
  void OfferList(const BrowserPage& browser);
  // Files were written: windows look again.
  void FilesChanged();

 private:
  Shell& shell_;
  wxWeakRef<ViewFrame> wantsList_;  // shows a file whose folder is being listed
};

}  // namespace fotomill::desktop
