#pragma once

#include <span>

#include "operations/macros.h"
#include "operations/recipe.h"
#include "picture/rectangle.h"
#include "processing/faces/face_options.h"

namespace fotomill {

// Runs steps over a picture.

// What a run of steps works with.
struct EngineOptions {
  Work work;
  MacroFacts facts;  // for the macros in texts
  FaceOptions faces = {};  // for operations that look for faces
};

// Applies steps one after the other. Neighboring point operations are fused into one pass,
// byte-equal to separate ones. Afterwards EXIF tells the new size, and its thumbnail is dropped
// when a step changed anything. EmptyImage (31) without a picture or when nothing is left of it,
// MemoryAllocationError (6) for a result that cannot be held, FunctionCancelled (4) when
// `work.goesOn` says so, else what the operation returns. After a failure the picture may have run
// through some steps.
Status ApplySteps(PictureRecord& picture, std::span<const Step> steps,
                  const EngineOptions& options);

// Computes `area` of what the steps make of a picture, for previews. `part` gets that area as its
// picture: the same bytes as in the whole result, outside of which nothing is. Steps from the last
// one that is neither a point operation nor a filter of known reach on are computed for the area
// alone. EmptyImage when the area is outside the result.
Status ApplyStepsToArea(const PictureRecord& picture, std::span<const Step> steps,
                        const Rectangle& area, const EngineOptions& options, PictureRecord& part);

// A copy of a picture with its pixels and metadata; what belongs to a file or a face (window,
// progress, extra blocks) is left out. Statuses as NewPackedImage.
Status CopyPicture(const PictureRecord& picture, PictureRecord& copy);

}  // namespace fotomill
