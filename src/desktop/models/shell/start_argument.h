#pragma once

#include <span>
#include <string>

namespace fotomill::desktop {

// The folder or file that a command line names. `parsed` is what the toolkit made of it: the
// toolkit drops arguments that it cannot read as text, such as names that are not UTF-8.
// `arguments` are all of them, as the system gave them, without the program's name.
std::string StartArgument(std::span<const std::string> arguments, const std::string& parsed);

}  // namespace fotomill::desktop
