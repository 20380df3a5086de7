#pragma once

#include <string>

namespace fotomill::platform {

// Whether a name is taken. Unknown: the system does not tell, as in a folder that may not be
// searched; who takes that for No overwrites, and who takes it for Yes looks for a free name
// forever.
enum class Existence { No, Yes, Unknown };

// Whether there is anything of that name, a dangling link included. Unknown keeps the system's
// reason.
Existence ExistenceOf(const std::string& path);

}  // namespace fotomill::platform
