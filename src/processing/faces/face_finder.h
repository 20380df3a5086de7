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

// Whether detector and classifier are installed. Loads nothing.
bool CanFindFaces(const FaceOptions& options);

// Finds upright faces, in a worker process; alpha is ignored. `faces` are within the picture, the
// largest first. Uses OpenCV's implementation of the Viola-Jones detector (CVPR 2001).
// FeatureDisabled (22) if it or the classifier is not installed, EmptyImage (31),
// MemoryAllocationError (6), FunctionCancelled (4) if `goesOn` returns false or the program is
// asked to end.
Status FindFaces(const PackedImage& image, const FaceOptions& options,
                 std::vector<Rectangle>& faces, const std::function<bool()>& goesOn = {});

// The bounding box of some faces, with a margin for hair and chin, within a picture of that size.
// `faces` must not be empty.
Rectangle AroundFaces(const std::vector<Rectangle>& faces, int32_t width, int32_t height);

// Crops a picture to its largest face, or with `all` to all of them, plus a margin. Pictures
// without a face are unchanged, as are all pictures if detection is not available. Statuses of
// CutPicture and FunctionCancelled (4).
Status FrameOnFaces(PictureRecord& picture, const FaceOptions& options, bool all,
                    const std::function<bool()>& goesOn = {});
// Minimum decoding size for it, where smaller would otherwise do.
inline constexpr int32_t kFramingSide = 512;

// The task for the worker process, a row of the program's task table.
inline constexpr char kFacesTask[] = "find-faces";
bool FindFacesApart(const platform::ApartCall& call);

}  // namespace fotomill
