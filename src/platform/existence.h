#pragma once

#include <string>

namespace fotomill::platform {

// Whether a name is taken. Unknown if the system cannot say, as in a folder without search
// permission. Treating that as No would overwrite files; treating it as Yes would search for a free
// name forever.
enum class Existence { No, Yes, Unknown };

// Whether anything has that name, including a dangling link. For Unknown, the system's
// reason is kept.
Existence ExistenceOf(const std::string& path);

}  // namespace fotomill::platform
