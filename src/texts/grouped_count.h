#pragma once

#include <cstdint>
#include <initializer_list>
#include <string>

#include "texts/texts.h"

namespace fotomill {

// As TrCount, for windows: the count with the language's thousands separators, "12,345 files".
std::string TrGroupedCountArguments(const char* one, const char* many, uint64_t count,
                                    std::initializer_list<TextArgument> arguments);
// As above, with any number of arguments.
template <typename... Arguments>
std::string TrGroupedCount(const char* one, const char* many, uint64_t count,
                           const Arguments&... arguments) {
  return TrGroupedCountArguments(one, many, count, {TextArgument(arguments)...});
}

}  // namespace fotomill
