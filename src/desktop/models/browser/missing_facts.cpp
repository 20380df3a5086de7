#include "desktop/models/browser/missing_facts.h"

#include "core/choice_lists.h"

namespace fotomill::desktop {

bool OrderNeedsPictureFacts(const BrowserModel& model) {
  const int32_t sort = model.Modes().sort;
  return model.Grouping() != DateGrouping::None || sort == choice::kSortExifDate ||
         sort == choice::kSortDimensions;
}

bool NeedsPictureFacts(const BrowserModel& model) {
  return model.Modes().view == choice::kViewDetails || OrderNeedsPictureFacts(model);
}

PlacedItems ItemsWithoutPictureFacts(const BrowserModel& model) {
  PlacedItems wanted;
  for (size_t line = 0; line < model.LineCount(); ++line) {
    const FolderItem& facts = model.Line(line);
    if (!facts.folder && facts.width == 0) wanted.emplace_back(model.ItemOfLine(line), facts);
  }
  return wanted;
}

PlacedItems ItemsWithoutTags(const BrowserModel& model) {
  PlacedItems wanted;
  const auto want = [&](size_t item) {
    const FolderItem& facts = model.Item(item);
    if (!facts.folder && !facts.tagged) wanted.emplace_back(item, facts);
  };
  for (size_t line = 0; line < model.LineCount(); ++line) want(model.ItemOfLine(line));
  if (model.LineCount() < model.ItemCount()) {
    for (size_t item = 0; item < model.ItemCount(); ++item) want(item);
  }
  return wanted;
}

}  // namespace fotomill::desktop
