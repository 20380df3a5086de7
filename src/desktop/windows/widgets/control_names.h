#pragma once

namespace fotomill::desktop {

// From now on every control that comes onto the screen is told to screen readers by a name: that of
// its window, where it was given one; its own text; the text that is before it; its tip. To be
// called once.
void NameControlsAsTheyCome();

}  // namespace fotomill::desktop
