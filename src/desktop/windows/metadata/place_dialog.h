#pragma once

class wxWindow;

namespace fotomill::desktop {

class ExifEditor;

// Asks for the place of an editor's files: from the list of places, typed, from a GPX track, or
// none. False, with nothing changed, if canceled.
bool AskForPlace(wxWindow& parent, ExifEditor& editor);

}  // namespace fotomill::desktop
