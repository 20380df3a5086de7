#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "desktop/models/browser/folder_views.h"

namespace fotomill::desktop {

// The open tabs and size of a frame. Stored as text in the data folder, in the file
// TabsetCurrentName:
//
//   [Frame]  Width, Height (device-independent pixels), Maximized, Columns (of the details),
//            Tab (the current one, from 0)
//   [Tab]    Folder, ThumbnailMode, ViewMode, SortMode, Descending, Scroll (pixels),
//            Focus (a name), AskForThumbnails (0: do not offer to make missing ones)
//
// One line "KEY=VALUE" each; invalid lines are ignored.
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
  int32_t width = 0, height = 0;  // 0: unknown
  bool maximized = false;
  std::string columns;  // of the details view
  size_t tab = 0;
  std::vector<SessionTab> tabs;

  bool operator==(const Session&) const = default;
};

// Parses a session; missing or invalid values get defaults.
Session ParseSession(std::string_view text);
// Tabs whose folder cannot be stored are skipped.
std::string SessionText(const Session& session);

// The session of the last run, also with tabs of folders that no longer exist. Empty if there is
// none.
Session LoadSession();
// False if it cannot be written.
bool SaveSession(const Session& session);

}  // namespace fotomill::desktop
