#include "desktop/models/shell/start_argument.h"

#include <algorithm>

#include "core/utf8.h"

namespace fotomill::desktop {

std::string StartArgument(std::span<const std::string> arguments, const std::string& parsed) {
  if (!parsed.empty()) return parsed;
  const auto end = std::ranges::find(arguments, "--");
  for (auto argument = arguments.begin(); argument != arguments.end(); ++argument) {
    const bool option = argument < end && argument->starts_with('-');
    if (!option && !IsUtf8(*argument)) return *argument;
  }
  return {};
}

}  // namespace fotomill::desktop
