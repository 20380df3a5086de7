#pragma once

#include <string_view>

namespace fotomill {

// The program's name as written to formats that record it. It is part of the file contents and does
// not change with the version.
inline constexpr std::string_view kCreator = "FotomillProfessional 0.00";

}  // namespace fotomill
