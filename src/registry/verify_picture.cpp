#include "registry/verify_picture.h"

#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

// Decodes every frame of an animation.
Status VerifyFrames(const ReadRequest& request) {
  AnimationPointer animation;
  Status status = OpenAnimation(request, animation);
  while (status == Status::Ok) status = animation->Next();
  return status == Status::NoImages ? Status::Ok : status;
}

}  // namespace

Status VerifyPicture(const std::string& name, const ReadOptions& options, std::string& hint,
                     std::string& note, const StopToken& stop) {
  PicturePointer picture;
  ReadRequest request{.fileName = name, .stop = stop, .options = options};
  RETURN_IF_BAD(LoadPictureInfo(request, picture));
  for (; request.page < picture->pageCount; ++request.page) {
    RETURN_IF_BAD(ReadPicture(request, *picture));
    if (!picture->warning.empty()) {  // displayable, but incomplete
      hint = Tr(picture->warning.view());
      return Status::DamagedFile;
    }
    if (note.empty()) note = picture->note.view();
    if (picture->pageCount == 1) break;
    const FormatEntry& row = FormatRow(picture->formatIndex);
    if (row.animate != nullptr)
      return VerifyFrames({.fileName = name, .stop = stop, .options = options});
    // frames cannot be selected: each page is the same picture
    if ((row.flags & FMT_ANIMATED) != 0) break;
  }
  return Status::Ok;
}

}  // namespace fotomill
