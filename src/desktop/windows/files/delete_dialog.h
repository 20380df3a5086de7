#pragma once

#include <wx/string.h>

#include <string>
#include <vector>

class wxWindow;

namespace fotomill::desktop {

class ThumbnailService;

// Asks whether files are deleted permanently; Enter and Escape delete nothing. With
// DeleteShowPreview, shows the thumbnails of the first few, as far as they are loaded.
bool AskToDelete(wxWindow& parent, const wxString& question, const std::vector<std::string>& paths,
                 const ThumbnailService& thumbnails);

}  // namespace fotomill::desktop
