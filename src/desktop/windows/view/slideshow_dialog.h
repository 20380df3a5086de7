#pragma once

#include <wx/window.h>

#include <optional>

#include "desktop/models/view/slideshow.h"

namespace fotomill::desktop {

// Asks how a slideshow is to go, beginning with `choices`; none when it was cancelled.
std::optional<SlideshowChoices> AskForSlideshow(wxWindow& parent, const SlideshowChoices& choices);

}  // namespace fotomill::desktop
