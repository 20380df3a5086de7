#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/models/browser/folder_views.h"

namespace fotomill::desktop {

// What is open: the tabs of a frame and its size. Kept as a text in the data folder, under the name
// TabsetCurrentName:
//
//   [Frame]            Width, Height (device-independent pixels), Maximized, Columns (of the
//   details), Tab (the
//                      one in front, from 0)
//   [Tab]              Folder, ThumbnailMode, ViewMode, SortMode, Descending, Scroll (pixels),
//   Focus (a name), AskForThumbnails (0: the tab does not offer to make missing ones)
//
// a line "KEY=VALUE" each; lines that are not understood are passed over.
struct SessionTab {
  std::string folder;
  FolderView view;
  int64_t scroll = 0;
  std::string focus;
  bool asksForThumbnails = true;

  bool operator==(const SessionTab&) const = default;
};
// A frame with its tabs.
struct Session {
  int32_t width = 0, height = 0;  // 0: nothing is known
  bool maximized = false;
  std::string columns;  // of the details
  size_t tab = 0;
  std::vector<SessionTab> tabs;

  bool operator==(const Session&) const = default;
};

// Reads the text of a session; what is missing or makes no sense is as in a new one.
Session ParseSession(std::string_view text);
// Tabs whose folder cannot be on a line are left out.
std::string SessionText(const Session& session);

// The session of the last run, without tabs whose folder is missing. Empty if there is none.
Session LoadSession();
// False when it could not be written.
bool SaveSession(const Session& session);

}  // namespace fotomill::desktop
