#include "texts/status_text.h"

#include <string_view>

#include "texts/texts.h"

namespace fotomill {

std::string StatusText(Status status) {
  const std::string_view message = StatusMessage(status);
  return message.empty() ? Tr("error %1 of the plug-in", StatusNumber(status)) : Tr(message);
}

std::string EnglishStatusText(Status status) {
  const std::string_view message = StatusMessage(status);
  return message.empty() ? "error " + std::to_string(StatusNumber(status)) + " of the plug-in"
                         : std::string(message);
}

}  // namespace fotomill
