#pragma once

#include <cstdint>

#include "core/status.h"

namespace fotomill::desktop {

// Edges of thumbnails, in device-independent pixels.
inline constexpr int32_t kSmallestSide = 48, kLargestSide = 512;

// The edge of thumbnails in a view (choice::ViewMode): `wanted` if it belongs to that view, else
// the usual one of 48, 96 or 176.
int32_t SideInView(int32_t view, int32_t wanted);
// The view to which an edge belongs: small, normal or large thumbnails.
int32_t ViewOfSide(int32_t side);
// The edge after a number of steps up or down, each by about a third.
int32_t SteppedSide(int32_t side, int32_t steps);

// Positions of a slider, from 0, with equal steps in proportion.
inline constexpr int32_t kSliderEnd = 60;
int32_t SideAtSlider(int32_t position);
int32_t SliderAtSide(int32_t side);

// Why a file has no thumbnail, for people.
enum class CellTrouble { None, Damaged, NoAccess, Unsupported };
CellTrouble TroubleOf(Status status);
// "Damaged", in English; empty for None.
const char* TroubleText(CellTrouble trouble);

}  // namespace fotomill::desktop
