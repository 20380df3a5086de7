#pragma once

#include <functional>
#include <string>
#include <string_view>
#include <vector>

namespace fotomill::desktop {

// Breaks UTF-8 text into lines that satisfy `fits`: between words, or inside a word that is too
// long for a line. Line feeds are kept as breaks. A single character is never broken, even if it
// does not fit.
std::vector<std::string> WrapText(std::string_view text,
                                  const std::function<bool(const std::string& line)>& fits);

}  // namespace fotomill::desktop
