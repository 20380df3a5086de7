#include "processing/color/color_histogram.h"

namespace fotomill {

namespace {

constexpr uint32_t kCellBits = 6;  // per channel
constexpr uint32_t kLowBits = 8 - kCellBits;
constexpr uint32_t kLowMask = (1 << kLowBits) - 1;
constexpr uint32_t kCellMask = (1 << kCellBits) - 1;

constexpr uint32_t kSlotBits = 17;  // twice as many slots as colors
static_assert(ColorCounts::kMostColors * 2 == 1 << kSlotBits);

}  // namespace

Status ColorCells::Open() {
  const uint64_t bytes = sizeof(Cell) << (3 * kCellBits);
  return cells_.Allocate(bytes) ? Status::Ok : Status::MemoryAllocationError;
}

void ColorCells::AddRow(const uint8_t* bgr, int32_t width) {
  Cell* cells = cells_.Items<Cell>().data();
  for (int32_t x = 0; x < width; ++x, bgr += 3) {
    const uint32_t b = bgr[0], g = bgr[1], r = bgr[2];
    Cell& cell =
        cells[(r >> kLowBits) << (2 * kCellBits) | (g >> kLowBits) << kCellBits | b >> kLowBits];
    cell.low[0] += b & kLowMask;
    cell.low[1] += g & kLowMask;
    cell.low[2] += r & kLowMask;
    ++cell.count;
  }
}

std::vector<ColorBin> ColorCells::Bins() {
  std::vector<ColorBin> bins;
  const auto cells = cells_.Items<Cell>();
  for (uint32_t i = 0; i < cells.size(); ++i) {
    const Cell& cell = cells[i];
    if (cell.count == 0) continue;
    ColorBin bin;
    for (uint32_t c = 0; c < 3; ++c) {
      const uint32_t base = (i >> (kCellBits * c) & kCellMask) << kLowBits;
      bin.channel[c] = static_cast<float>(base + static_cast<double>(cell.low[c]) / cell.count);
    }
    bin.weight = static_cast<float>(cell.count);
    bins.push_back(bin);
  }
  return bins;
}

Status ColorCounts::Open() {
  colors_ = 0;
  return slots_.Allocate(sizeof(Slot) << kSlotBits) ? Status::Ok : Status::MemoryAllocationError;
}

void ColorCounts::AddRow(const uint8_t* bgr, int32_t width) {
  Slot* slots = slots_.Items<Slot>().data();
  for (int32_t x = 0; x < width; ++x, bgr += 3) {
    const auto color = static_cast<uint32_t>(bgr[2] << 16 | bgr[1] << 8 | bgr[0]);
    uint32_t at = (color * 0x9e3779b1u) >> (32 - kSlotBits);
    while (slots[at].count != 0 && slots[at].color != color) at = (at + 1) % (1 << kSlotBits);
    if (slots[at].count == 0) {
      if (colors_ == kMostColors) continue;
      ++colors_;
      slots[at].color = color;
    }
    ++slots[at].count;
  }
}

std::vector<ColorBin> ColorCounts::Bins() {
  std::vector<ColorBin> bins;
  for (const Slot& slot : slots_.Items<Slot>()) {
    if (slot.count == 0) continue;
    ColorBin bin;
    for (int c = 0; c < 3; ++c) bin.channel[c] = static_cast<float>(slot.color >> (8 * c) & 255);
    bin.weight = static_cast<float>(slot.count);
    bins.push_back(bin);
  }
  return bins;
}

}  // namespace fotomill
