#pragma once

#include <span>

#include "operations/macros.h"
#include "operations/recipe.h"
#include "picture/rectangle.h"
#include "processing/faces/face_options.h"

namespace fotomill {

// Runs steps over a picture.

// The environment for running steps.
struct EngineOptions {
  Work work;
  MacroFacts facts;  // for macros in texts
  FaceOptions faces = {};  // for operations that detect faces
};

// Applies steps in order. Consecutive point operations are fused into one pass,
// with identical results. Afterwards the size in EXIF is updated, and the EXIF
// thumbnail is dropped if anything changed. EmptyImage (31) if there is no
// picture or nothing is left of it, MemoryAllocationError (6) if the result is
// too large, FunctionCancelled (4) if `work.goesOn` returns false, else the
// status of the operation. On failure, some steps may already have been applied.
Status ApplySteps(PictureRecord& picture, std::span<const Step> steps,
                  const EngineOptions& options);

// Computes only `area` of the result, for previews. `part` becomes that area, with the same bytes
// as in the full result; pixels outside are left out. The trailing point operations and filters of
// known reach are computed for the area alone, all earlier steps for the whole picture. EmptyImage
// if the area is outside the result.
Status ApplyStepsToArea(const PictureRecord& picture, std::span<const Step> steps,
                        const Rectangle& area, const EngineOptions& options, PictureRecord& part);

// Copies pixels and metadata, but not what belongs to the file or the display (window, progress,
// extra blocks). Statuses of NewPackedImage.
Status CopyPicture(const PictureRecord& picture, PictureRecord& copy);

}  // namespace fotomill
