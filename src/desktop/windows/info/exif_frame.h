#pragma once

#include <string>

#include "desktop/models/info/exif_report.h"
#include "desktop/windows/widgets/background.h"
#include "desktop/windows/widgets/tool_frame.h"

class wxStaticBitmap;

namespace fotomill::desktop {

class Shell;

// The EXIF viewer: the EXIF entries as a list, and the embedded thumbnail.
class ExifFrame : public ToolFrame {
 public:
  ExifFrame(Shell& shell, wxWindow* parent, const std::string& path);

 private:
  void Finished();
  void SaveThumbnail();
  wxString SelectedValue() const;

  Shell& shell_;
  const std::string path_;
  ExifReport report_;
  std::vector<ExifRow> rows_;  // as shown
  wxStaticText* problem_ = nullptr;
  wxDataViewListCtrl* list_ = nullptr;
  wxStaticBitmap* thumbnail_ = nullptr;
  wxStaticText* thumbnailFacts_ = nullptr;
  Background work_;  // must be last, so that it ends first
};

}  // namespace fotomill::desktop
