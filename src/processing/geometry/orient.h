#pragma once

#include <cstdint>

#include "core/status.h"

namespace fotomill {

class PackedImage;
struct PictureRecord;

// How to rotate a stored picture upright: the values of EXIF's Orientation tag (0x0112), which
// specify the sides of row 0 and column 0.
enum class Orientation : int32_t {
  Upright = 1,       // top, left
  MirrorAcross = 2,  // top, right: mirrored horizontally
  HalfTurn = 3,      // bottom, right
  MirrorDown = 4,    // bottom, left: mirrored vertically
  Transpose = 5,     // left, top: rows and columns exchanged
  QuarterRight = 6,  // right, top: rotated by 90 degrees clockwise
  Transverse = 7,    // right, bottom: mirrored along the other diagonal
  QuarterLeft = 8,   // left, bottom: rotated by 90 degrees counterclockwise
};

// An orientation as three flags: whether rows and columns are exchanged, and which axes of the
// stored picture are reversed.
struct Turn {
  bool swap, flipX, flipY;
  bool operator==(const Turn&) const = default;
};
// Indexed by orientation, from 1.
inline constexpr Turn kTurns[] = {{false, false, false}, {false, true, false}, {false, true, true},
                                  {false, false, true},  {true, false, false}, {true, false, true},
                                  {true, true, true},    {true, true, false}};

// Values outside 1 to 8 count as 1.
constexpr Turn TurnOf(Orientation orientation) {
  const auto place = static_cast<uint32_t>(orientation) - 1;
  return kTurns[place < 8 ? place : 0];
}

// The combination of two orientations.
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

// Creates a rotated copy of an image of any depth. MemoryAllocationError leaves `turned` unchanged.
Status OrientImage(const PackedImage& image, Orientation orientation, PackedImage& turned);

// Rotates image and alpha plane, of any depth, upright; if sides are exchanged, so are `width`
// and `height` and the two resolutions. Updating the orientation tag in the record's EXIF
// block is up to the caller. Values outside 1 to 8 are a no-op. MemoryAllocationError leaves
// the picture unchanged.
Status OrientPicture(PictureRecord& picture, Orientation orientation);

}  // namespace fotomill
