#pragma once

namespace fotomill::desktop {

// Base of windows that may hold unsaved work: their close handlers ask before it is lost. The
// program closes them first when it quits.
class HoldsWork {};

// Closes all such windows. False if the user keeps one open.
bool CloseWorkWindows();

}  // namespace fotomill::desktop
