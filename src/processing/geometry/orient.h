#pragma once

#include <cstdint>

#include "core/status.h"

namespace fotomill {

class PackedImage;
struct PictureRecord;

// How a stored picture must be turned to be upright: the values of EXIF's Orientation tag (0x0112),
// which name where the stored row 0 and column 0 belong.
enum class Orientation : int32_t {
  Upright = 1,       // top, left
  MirrorAcross = 2,  // top, right: left and right change places
  HalfTurn = 3,      // bottom, right
  MirrorDown = 4,    // bottom, left: top and bottom change places
  Transpose = 5,     // left, top: rows become columns
  QuarterRight = 6,  // right, top: a quarter turn clockwise
  Transverse = 7,    // right, bottom: mirrored about the other diagonal
  QuarterLeft = 8,   // left, bottom: a quarter turn anticlockwise
};

// An orientation as: does the turned picture's column run along the stored one's rows, and which
// ends are exchanged, counted in the stored one.
struct Turn {
  bool swap, flipX, flipY;
  bool operator==(const Turn&) const = default;
};
// By the number of the orientation, from 1.
inline constexpr Turn kTurns[] = {{false, false, false}, {false, true, false}, {false, true, true},
                                  {false, false, true},  {true, false, false}, {true, false, true},
                                  {true, true, true},    {true, true, false}};

// Numbers outside 1 to 8 mean what 1 does.
constexpr Turn TurnOf(Orientation orientation) {
  const auto place = static_cast<uint32_t>(orientation) - 1;
  return kTurns[place < 8 ? place : 0];
}

// What two turns one after the other come to.
constexpr Orientation Composed(Orientation first, Orientation then) {
  const Turn a = TurnOf(first), b = TurnOf(then);
  const Turn both{a.swap != b.swap, a.flipX != (a.swap ? b.flipY : b.flipX),
                  a.flipY != (a.swap ? b.flipX : b.flipY)};
  int32_t number = 1;
  while (kTurns[number - 1] != both) ++number;
  return static_cast<Orientation>(number);
}

// Whether an orientation exchanges width and height.
constexpr bool SwapsSides(Orientation orientation) { return TurnOf(orientation).swap; }

// A turned copy of an image of any depth. MemoryAllocationError leaves `turned` unchanged.
Status OrientImage(const PackedImage& image, Orientation orientation, PackedImage& turned);

// Turns image and alpha plane, of any depth, into the upright position; where sides change places,
// `width` and `height` and the two resolutions do as well. The orientation tag of the record's EXIF
// block is the caller's to change. Numbers outside 1 to 8 leave the picture as it is.
// MemoryAllocationError leaves it unchanged.
Status OrientPicture(PictureRecord& picture, Orientation orientation);

}  // namespace fotomill
