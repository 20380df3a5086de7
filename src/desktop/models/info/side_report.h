#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "core/workers/stop_token.h"
#include "desktop/models/browser/folder_listing.h"
#include "desktop/models/drawing/histogram.h"
#include "desktop/models/drawing/rgb_image.h"
#include "metadata/tags/picture_tags.h"
#include "picture/read_request.h"

namespace fotomill::desktop {

// What the side pane shows about a file or folder.
struct SideReport {
  std::string path;
  std::string name;
  // a sentence: why there is no preview, or what is wrong with the file; may be empty
  std::string remark;
  RgbImage preview;  // upright; empty if there is none
  Histogram histogram;
  std::vector<std::string> facts;  // lines: type, dimensions, size and date
  std::vector<std::string> photo;  // lines: camera, lens, exposure, date, as PhotoFacts
  std::string comment;             // may have several lines
  int32_t rating = 0;              // 1 to 5 stars; 0: none, -1: rejected
  std::vector<std::string> tags;   // lines: title, keywords, label and the like

  // The rating as stars; empty without one.
  std::string RatingText() const;
  // All texts, a line each, for the clipboard and screen readers.
  std::string Text() const;
};

// Options of a report; copy the settings on the main thread.
struct SideOptions {
  int32_t side = 320;         // of the square in which the preview must fit, in pixels
  uint32_t matte = 0xffffff;  // behind transparent pictures, 0x00BBGGRR
  ReadOptions read;
  TagSources tags;
};

// Reads a picture, or counts the contents of a folder. May take long; any thread. If stopped, the
// result is incomplete.
SideReport ReadSideReport(const std::string& folder, const FolderItem& item,
                          const SideOptions& options, const StopToken& stop);

}  // namespace fotomill::desktop
