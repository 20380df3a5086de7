#include "processing/palette/diffusion.h"

#include <algorithm>
#include <cstring>

namespace fotomill {

namespace {

constexpr ErrorShare kAtkinson[] = {{1, 0, 1}, {2, 0, 1}, {-1, 1, 1},
                                    {0, 1, 1}, {1, 1, 1}, {0, 2, 1}};
constexpr ErrorShare kStucki[] = {{1, 0, 8},  {2, 0, 4}, {-2, 1, 2}, {-1, 1, 4},
                                  {0, 1, 8},  {1, 1, 4}, {2, 1, 2},  {-2, 2, 1},
                                  {-1, 2, 2}, {0, 2, 4}, {1, 2, 2},  {2, 2, 1}};
constexpr ErrorShare kBurkes[] = {{1, 0, 8}, {2, 0, 4}, {-2, 1, 2}, {-1, 1, 4},
                                  {0, 1, 8}, {1, 1, 4}, {2, 1, 2}};
constexpr ErrorShare kSierra[] = {{1, 0, 5}, {2, 0, 3}, {-2, 1, 2}, {-1, 1, 4}, {0, 1, 5},
                                  {1, 1, 4}, {2, 1, 2}, {-1, 2, 2}, {0, 2, 3},  {1, 2, 2}};

constexpr int32_t kUnit = 65536;  // per level

}  // namespace

DiffusionKernel KernelOf(Dither dither) {
  switch (dither) {
    case Dither::Atkinson: return {kAtkinson, 8};
    case Dither::Stucki: return {kStucki, 42};
    case Dither::Burkes: return {kBurkes, 32};
    default: return {kSierra, 32};
  }
}

Status WideDiffuser::Open(Dither dither, int32_t width, bool serpentine, int32_t handedOn) {
  kernel_ = KernelOf(dither);
  stride_ = 3 * (static_cast<std::ptrdiff_t>(width) + 2 * kReach);
  if (!block_.Allocate(static_cast<uint64_t>(stride_) * kRows * sizeof(int32_t)))
    return Status::MemoryAllocationError;
  errors_ = block_.Items<int32_t>().data();
  width_ = width;
  serpentine_ = serpentine;
  handedOn_ = handedOn;
  row_ = 0;
  return Status::Ok;
}

void WideDiffuser::BeginRow() {
  step_ = serpentine_ && row_ % 2 != 0 ? -1 : 1;
  shares_ = 0;
  for (const ErrorShare& share : kernel_.shares) {
    targets_[shares_++] = {RowOfErrors(share.down) + 3 * kReach, share.ahead * step_,
                           (share.weight * handedOn_ * kUnit / 16 + kernel_.divisor / 2) / kernel_.divisor};
  }
}

void WideDiffuser::EndRow() {
  std::memset(RowOfErrors(0), 0, static_cast<size_t>(stride_) * sizeof(int32_t));
  ++row_;
}

void WideDiffuser::Row(const uint8_t* bgr, NearestColor& nearest, uint8_t* indices) {
  BeginRow();
  const int32_t* own = RowOfErrors(0) + 3 * kReach;
  std::ptrdiff_t x = step_ > 0 ? 0 : width_ - 1;
  for (int32_t left = width_; left > 0; --left, x += step_) {
    int32_t wanted[3];
    for (int c = 0; c < 3; ++c)
      wanted[c] = std::clamp(bgr[3 * x + c] + ((own[3 * x + c] + kUnit / 2) >> 16), 0, 255);
    const uint8_t index = nearest.Find(wanted[0], wanted[1], wanted[2]);
    indices[x] = index;
    const int16_t* color = nearest.ColorOf(index);
    int32_t error[3];
    for (int c = 0; c < 3; ++c) error[c] = wanted[c] - color[c];
    if ((error[0] | error[1] | error[2]) == 0) continue;
    for (int32_t i = 0; i < shares_; ++i) {
      int32_t* to = targets_[i].row + 3 * (x + targets_[i].ahead);
      for (int c = 0; c < 3; ++c) to[c] += error[c] * targets_[i].factor;
    }
  }
  EndRow();
}

void WideDiffuser::GrayRow(const uint8_t* gray, uint8_t* indices) {
  BeginRow();
  const int32_t* own = RowOfErrors(0) + 3 * kReach;
  std::ptrdiff_t x = step_ > 0 ? 0 : width_ - 1;
  for (int32_t left = width_; left > 0; --left, x += step_) {
    const int32_t wanted = gray[x] + ((own[x] + kUnit / 2) >> 16);
    const bool white = wanted >= 128;
    indices[x] = white;
    const int32_t error = wanted - (white ? 255 : 0);
    for (int32_t i = 0; i < shares_; ++i)
      targets_[i].row[x + targets_[i].ahead] += error * targets_[i].factor;
  }
  EndRow();
}

}  // namespace fotomill
