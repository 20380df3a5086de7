#pragma once

namespace fotomill::desktop {

class ViewFrame;

// Commands of a view window for its file, which open other windows or change its tags.
void ShowInfoOf(ViewFrame& view);
void EditFileOf(ViewFrame& view);  // in an Edit window
void CropFileOf(ViewFrame& view);  // in a Crop window
void PrintFileOf(ViewFrame& view);  // in a Print and pages window
void EditExifOf(ViewFrame& view);
void CommentOn(ViewFrame& view);  // asks for a description
// Changes the tags by a digit key, as in the browser.
void TagByKey(ViewFrame& view, int key);
// Copies the picture to the clipboard, on the view background.
void CopyPictureOf(ViewFrame& view);

}  // namespace fotomill::desktop
