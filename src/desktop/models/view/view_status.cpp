#include "desktop/models/view/view_status.h"

#include "batch/picture_failure.h"
#include "core/text.h"
#include "desktop/models/browser/item_tags.h"
#include "texts/texts.h"

namespace fotomill::desktop {

std::string ViewStatusText(const ViewState& state) {
  std::string line = Tr("%1 of %2", state.place + 1, ThousandsText(state.count));
  if (state.picture == nullptr)
    return line + ", " +
           (state.loadedPercent > 0 ? Tr("loading, %1%...", state.loadedPercent)
                                    : Tr("loading..."));
  if (state.picture->picture == nullptr) return line + ", " + state.picture->problem;
  const PictureRecord& picture = *state.picture->picture;
  line += ", " + SizeAndZoom(picture, state.zoom);
  if (state.turned) line += std::string(", ") + Tr("rotated, not saved");
  if (!state.animation.empty()) {
    line += ", " + state.animation;
  } else if (picture.pageCount > 1) {
    line += ", " + Tr("page %1 of %2", state.page + 1, picture.pageCount);
  }
  const PictureTags& tags = state.picture->tags;
  if (const std::string text = TagText(tags.rating, tags.label); !text.empty()) line += ", " + text;
  for (const std::string& note : {state.note, MisnamedRemark(picture)}) {
    if (!note.empty()) line += (line.ends_with('.') ? " " : ". ") + note;
  }
  return line;
}

}  // namespace fotomill::desktop
