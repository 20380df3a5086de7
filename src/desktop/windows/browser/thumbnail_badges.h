#pragma once

#include <wx/dc.h>
#include <wx/window.h>

#include "desktop/models/browser/folder_listing.h"
#include "desktop/models/thumbnails/thumbnail.h"

namespace fotomill::desktop {

// Draws badges at the bottom of a thumbnail, which fills `picture`: the number of pages on the
// right, after a triangle if they are frames of an animation; a checkerboard on the left for an
// alpha channel.
void DrawBadges(wxDC& dc, const wxWindow& window, const wxRect& picture, const Thumbnail& thumbnail,
                const wxColour& color, const wxColour& textColor);

// Draws stars and label of a file at the bottom left of its place in the cell.
void DrawTags(wxDC& dc, const wxWindow& window, const wxRect& square, const FolderItem& item);

}  // namespace fotomill::desktop
