#pragma once

#include <string_view>

namespace fotomill {

// The program's name as writers put it where a format has room for one. It is part of the files'
// bytes and never follows the version.
inline constexpr std::string_view kCreator = "FotomillProfessional 0.00";

}  // namespace fotomill
