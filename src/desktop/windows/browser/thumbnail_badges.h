#pragma once

#include <wx/dc.h>
#include <wx/window.h>

#include "desktop/models/thumbnails/thumbnail.h"

namespace fotomill::desktop {

// Draws what there is to know of a picture at the foot of its thumbnail, which fills `picture`: at
// the right how many pages it has, behind a triangle when they are frames of an animation; at the
// left a checkerboard when it has an alpha channel.
void DrawBadges(wxDC& dc, const wxWindow& window, const wxRect& picture, const Thumbnail& thumbnail,
                const wxColour& color, const wxColour& textColor);

}  // namespace fotomill::desktop
