#pragma once

class wxMenuBar;

namespace fotomill::desktop {

class EditFrame;

// The menu bar of an Edit window; its items call the frame.
wxMenuBar* NewEditMenu(EditFrame& frame);

}  // namespace fotomill::desktop
