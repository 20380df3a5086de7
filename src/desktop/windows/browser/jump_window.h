#pragma once

class wxWindow;

namespace fotomill::desktop {

class BrowserPage;
class ThumbnailService;

// The jump window: lists the files of a browser whose names match what one types, and selects the
// chosen one in the browser.
void JumpToFile(wxWindow& parent, BrowserPage& browser, ThumbnailService& thumbnails);

}  // namespace fotomill::desktop
