#pragma once

namespace fotomill::desktop {

// From now on, gives every control shown an
// accessible name: the window's name, its own text,
// the text before it, or its tooltip. Call once.
void NameControlsAsTheyCome();

}  // namespace fotomill::desktop
