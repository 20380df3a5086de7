#pragma once

#include <wx/dnd.h>

#include <functional>
#include <string>
#include <vector>

#include "desktop/windows/files/file_list_data.h"

namespace fotomill::desktop {

// Accepts files dropped on a window for a folder: moves them with Shift, copies them with Ctrl,
// otherwise depends on DropOptions.
class FolderDrop : public wxDropTarget {
 public:
  // The folder at a position in the window; empty if there is none.
  using FolderAt = std::function<std::string(const wxPoint& place)>;
  using Dropped = std::function<void(const std::vector<std::string>& files,
                                     const std::string& folder, bool move)>;
  // Shows where the files would go; null: nowhere any more.
  using Mark = std::function<void(const wxPoint* place)>;
  FolderDrop(FolderAt folderAt, Dropped dropped, Mark mark = {})
      : wxDropTarget(new FileListData),
        folderAt_(std::move(folderAt)),
        dropped_(std::move(dropped)),
        mark_(std::move(mark)) {}

  void OnLeave() override { MarkPlace(nullptr); }
  wxDragResult OnDragOver(wxCoord x, wxCoord y, wxDragResult suggested) override;
  wxDragResult OnData(wxCoord x, wxCoord y, wxDragResult suggested) override;

 private:
  void MarkPlace(const wxPoint* place) const {
    if (mark_) mark_(place);
  }
  bool Drop(const std::string& folder, std::vector<std::string> files) const;

  const FolderAt folderAt_;
  const Dropped dropped_;
  const Mark mark_;
};

}  // namespace fotomill::desktop
