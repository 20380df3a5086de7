#pragma once

namespace fotomill::desktop {

// Whether animations are enabled in the user's system settings.
bool SystemAnimates();

}  // namespace fotomill::desktop
