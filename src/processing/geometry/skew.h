#pragma once

#include "core/status.h"
#include "picture/picture_record.h"
#include "processing/bands.h"

namespace fotomill {

// By how many degrees, clockwise, the lines of a scanned page are turned; at most `most` either
// way, exact to about 0.1. 0 for pictures without lines. A rotation by the negative angle sets it
// straight. MemoryAllocationError, FunctionCancelled.
//
// Edges between dark and light are counted along slanted lines. The angle at which the sum of the
// squares of the counts is largest is the page's: there, lines of text and the gaps between them
// are apart. Source: W. Postl, "Detection of Linear Oblique Structures and Skew Scan in Digitized
// Documents", ICPR (1986).
Status FindSkew(const PictureRecord& picture, double most, const Work& work, double& angle);

}  // namespace fotomill
