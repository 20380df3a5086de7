#pragma once

#include <span>
#include <string>

namespace fotomill::desktop {

// The folder or file on the command line. `parsed` is the toolkit's result, which lacks arguments
// that are not valid text, such as names that are not UTF-8. `arguments` are all original ones,
// without the program name.
std::string StartArgument(std::span<const std::string> arguments, const std::string& parsed);

}  // namespace fotomill::desktop
