#pragma once

#include <string>
#include <vector>

namespace fotomill::desktop {

// A size offered by the function Resize.
struct NamedSize {
  std::string text;  // "640 x 480"
  std::string step;  // recipe step: "resize 640x480"
};

// The settings Transform320 to Transform1280, in this order. Texts of those that are not
// WIDTH,HEIGHT are empty.
std::vector<NamedSize> SizeSettings();
// The same without those.
std::vector<NamedSize> NamedSizes();

}  // namespace fotomill::desktop
