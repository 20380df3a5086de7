#pragma once

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// Detects the skew of a scanned page in degrees, clockwise; at most `most` in either direction,
// accurate to about 0.1. 0 for pictures without lines. Rotating by the negative angle deskews it.
// MemoryAllocationError, FunctionCancelled.
//
// Counts edges between dark and light along slanted lines. The angle that maximizes the sum of
// the squared counts is the page's, as it separates lines of text from the gaps between them.
// Source: W. Postl, "Detection of Linear Oblique Structures and Skew Scan in Digitized
// Documents", ICPR (1986).
Status FindSkew(const PictureRecord& picture, double most, const Work& work, double& angle);

}  // namespace fotomill
