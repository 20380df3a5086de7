#pragma once

#include <cstdint>
#include <functional>
#include <string>
#include <vector>

#include "catalog/similar/similar_search.h"
#include "core/workers/stop_token.h"
#include "platform/held_file.h"

namespace fotomill::desktop {

// A picture that has similar ones.
struct SimilarPicture {
  std::string path;
  platform::FileStamp stamp = {};  // when it was searched
  int64_t modified = 0;            // seconds since 1970 UTC
  int32_t width = 0, height = 0;   // pixels
  int64_t date = 0;                // when taken, else modified: 20040831223208 in local time
  float sharpness = -1;            // as MeasureSharpness; negative if not measured
  bool severalPages = false;       // of which only the first was compared
};

// Pictures that are similar to each other.
struct FoundGroup {
  std::vector<SimilarPicture> pictures;
  int32_t distance = 0;  // as in SimilarGroup
};

// What to search for.
struct SimilarQuestion {
  std::vector<std::string> folders;  // absolute
  bool subfolders = true;
  SimilarOptions options = {};
  bool sharpness = false;  // also measures that of the pictures found
  std::string store = {};  // path of the store of hashes
};

// The steps of a search.
enum class SimilarStage { Listing, Reading, Comparing, Measuring };
struct SimilarProgress {
  SimilarStage stage = SimilarStage::Listing;
  uint64_t done = 0, count = 0;  // pictures; Listing: `done` were found so far
};
// "Reading 312 of 2,000 pictures, 12 s left"; `seconds` since the stage began.
std::string SimilarProgressText(const SimilarProgress& progress, double seconds);

struct SimilarFindings {
  std::vector<FoundGroup> groups;
  uint64_t compared = 0;                   // pictures
  std::vector<std::string> problems = {};  // a line for each file or folder that cannot be read
};

// Searches folders, in the background. If stopped, compares the pictures read until then. Links are
// left out, as are further names of a file that has several: they are not copies. So are archives,
// of which only the first picture would be compared. What was read is kept in the store.
SimilarFindings FindSimilarPictures(const SimilarQuestion& question, const StopToken& stop,
                                    const std::function<void(const SimilarProgress&)>& report);

// Measures the sharpness of pictures found earlier, in their order; negative if a picture cannot be
// read, or after a stop.
std::vector<float> MeasurePictures(const std::vector<std::string>& paths,
                                   const SimilarQuestion& question, const StopToken& stop,
                                   const std::function<void(const SimilarProgress&)>& report);

}  // namespace fotomill::desktop
