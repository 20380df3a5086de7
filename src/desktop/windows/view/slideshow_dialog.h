#pragma once

#include <wx/window.h>

#include <optional>

#include "desktop/models/view/slideshow.h"

namespace fotomill::desktop {

// Asks for the settings of a slideshow, with initial `choices`; nullopt if canceled.
std::optional<SlideshowChoices> AskForSlideshow(wxWindow& parent, const SlideshowChoices& choices);

}  // namespace fotomill::desktop
