#pragma once

namespace fotomill::desktop {

// Whether the user lets the system's programs move things about by themselves.
bool SystemAnimates();

}  // namespace fotomill::desktop
