#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "batch/batch_file.h"
#include "core/status.h"
#include "pages/gallery/gallery_page.h"
#include "pages/picture_reading.h"

namespace fotomill {

// How to build a gallery.
struct GalleryOptions {
  std::string folder;  // of the gallery
  GalleryTheme theme;
  GalleryTexts texts;  // `count` is set by the build
  PagePictureOptions reading;
  std::vector<int32_t> sides{480, 960, 1920};  // longer sides of the pictures, ascending
  int32_t quality = 82;                        // of JPEG and WebP
  bool webp = true;                            // beside JPEG, for the smaller sizes
  bool details = true;                         // camera and exposure
  bool originals = false;                      // link to the files
  std::string caption = "%F";                  // with macros
  std::string copyrightHolder = {};
  size_t perPage = 120;
  uint32_t jobs = 0;  // pictures at a time; 0: one per core
  bool dryRun = false;
};

// What became of a file.
struct GalleryOutcome {
  Status status = Status::Ok;
  std::string hint = {};
  std::string destination = {};  // its largest picture
  bool kept = false;             // all of its pictures were there already
};

struct GalleryHost {
  std::function<void(size_t done, size_t total)> progress;  // in files
  std::function<bool()> goesOn;                             // false: cancel
  std::function<void()> tick;                               // a few times a second
  std::function<std::string(size_t pictures)> countText;    // "12 pictures"
};

// The path of an existing page, style sheet or script that a gallery of that many files would
// replace, although no gallery wrote it. Empty if there is none.
std::string ForeignFile(const GalleryOptions& options, size_t files);

// Removes files that are named twice, and the files of a gallery in `folder`.
void LeaveOutRepeated(const std::string& folder, std::vector<BatchFile>& files);

// Builds a gallery: pages, style sheet, script, and the pictures in several sizes in the folder
// "pictures". Pictures that are there already, for an unchanged file and unchanged options, are
// kept, as are pages that would not change; pictures of the previous build that are no longer used
// are deleted. Without any picture, the gallery is left as it is. `outcomes` is in the order of the
// files. Ok, FunctionCancelled, or why a page cannot be written, with its path in `failed`.
Status BuildGallery(std::span<const BatchFile> files, const GalleryOptions& options,
                    const GalleryHost& host, std::vector<GalleryOutcome>& outcomes,
                    std::string& failed);

}  // namespace fotomill
