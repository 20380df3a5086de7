#pragma once

#include <wx/frame.h>

#include <string>

#include "desktop/models/info/exif_report.h"
#include "desktop/windows/widgets/background.h"

class wxDataViewListCtrl;
class wxStaticBitmap;
class wxStaticText;

namespace fotomill::desktop {

class Shell;

// The EXIF viewer: the EXIF entries as a list, and the embedded thumbnail.
class ExifFrame : public wxFrame {
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
