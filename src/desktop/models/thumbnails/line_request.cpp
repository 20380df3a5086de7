#include "desktop/models/thumbnails/line_request.h"

#include "settings/job_options.h"

namespace fotomill::desktop {

ThumbnailRequest RequestForLine(const BrowserModel& model, size_t line, int32_t side) {
  const FolderItem& item = model.Line(line);
  ThumbnailRequest request;
  request.path = model.PathOfLine(line);
  request.modified = item.modified;
  request.size = item.size;
  request.side = side;
  request.mode = model.Modes().thumbnails;
  request.options = ThumbnailOptionsFromSettings();
  return request;
}

}  // namespace fotomill::desktop
