#pragma once

#include <utility>
#include <vector>

#include "desktop/models/browser/browser_model.h"

namespace fotomill::desktop {

// Items with their index in the model.
using PlacedItems = std::vector<std::pair<size_t, FolderItem>>;

// Whether the order of the lines depends on what files' headers say.
bool OrderNeedsPictureFacts(const BrowserModel& model);
// Whether the view shows, or is ordered by, what files' headers say.
bool NeedsPictureFacts(const BrowserModel& model);
// The files shown whose headers are not read yet.
PlacedItems ItemsWithoutPictureFacts(const BrowserModel& model);
// The files whose rating and label are not read yet: those shown, then those hidden by a filter.
PlacedItems ItemsWithoutTags(const BrowserModel& model);

}  // namespace fotomill::desktop
