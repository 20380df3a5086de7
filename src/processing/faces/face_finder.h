#pragma once

#include <functional>
#include <vector>

#include "core/status.h"
#include "picture/packed_image.h"
#include "picture/picture_record.h"
#include "picture/rectangle.h"
#include "platform/work_apart.h"
#include "processing/faces/face_options.h"

namespace fotomill {

// Whether the detector and the classifier are installed. Nothing is loaded.
bool CanFindFaces(const FaceOptions& options);

// Looks for upright faces, in a process of its own; `alpha` does not count. `faces` are within the
// picture, the largest first. The detector is Viola and Jones's (CVPR 2001) as OpenCV has it.
// FeatureDisabled (22) where it or the classifier is not installed, EmptyImage (31),
// MemoryAllocationError (6), FunctionCancelled (4) when `goesOn` says no or the program is asked to
// end.
Status FindFaces(const PackedImage& image, const FaceOptions& options,
                 std::vector<Rectangle>& faces, const std::function<bool()>& goesOn = {});

// The smallest rectangle around some faces, with room around it for hair and chin, within a
// picture of that size. `faces` must not be empty.
Rectangle AroundFaces(const std::vector<Rectangle>& faces, int32_t width, int32_t height);

// Cuts a picture down to its largest face, or to all of them with `all`, and the room around. A
// picture without a face, or where no one can look for one, stays as it is. Statuses of CutPicture
// and FunctionCancelled (4).
Status FrameOnFaces(PictureRecord& picture, const FaceOptions& options, bool all,
                    const std::function<bool()>& goesOn = {});
// Pictures are decoded at least as large as this for it, where smaller ones would do otherwise.
inline constexpr int32_t kFramingSide = 512;

// The part of the work that runs apart: a row of the program's table of such work.
inline constexpr char kFacesTask[] = "find-faces";
bool FindFacesApart(const platform::ApartCall& call);

}  // namespace fotomill
