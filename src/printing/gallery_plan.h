#pragma once

#include <string>

#include "pages/gallery/gallery_build.h"
#include "printing/page_option.h"

namespace fotomill {

// Completes a default `gallery` in `folder` by values of the options of the kind "gallery", and by
// the settings. Reads the files of a theme. Returns what is wrong with the values, translated;
// empty on success.
std::string PlanGallery(const PageValues& values, const std::string& folder,
                        GalleryOptions& gallery);

// The names of the files of a theme.
inline constexpr const char *kThemePage = "template.html", *kThemeStyle = "gallery.css",
                            *kThemeScript = "gallery.js";

}  // namespace fotomill
