#include "processing/color/point_effect.h"

#include <algorithm>
#include <vector>

#include "processing/color/table_row.h"

namespace fotomill {

namespace {

constexpr int32_t kLeastRows = 16;  // per band

void ApplyTables(const std::array<ChannelTable, 3>& tables, uint8_t* bgr, size_t pixels) {
  if (tables[0] == tables[1] && tables[1] == tables[2]) {
    TableRowHere()(tables[0].data(), bgr, 3 * pixels);
    return;
  }
  const uint8_t *blue = tables[0].data(), *green = tables[1].data(), *red = tables[2].data();
  for (size_t i = 0; i < pixels; ++i, bgr += 3) {
    bgr[0] = blue[bgr[0]];
    bgr[1] = green[bgr[1]];
    bgr[2] = red[bgr[2]];
  }
}

// The effects with adjacent tables merged.
std::vector<PointEffect> Merged(std::span<const PointEffect> effects) {
  std::vector<PointEffect> merged;
  for (const PointEffect& effect : effects) {
    const bool behindTable = !merged.empty() && merged.back().IsTable();
    if (behindTable && effect.after) {
      merged.back() = effect.after(merged.back().tables);
      continue;
    }
    if (!behindTable || !effect.IsTable()) {
      merged.push_back(effect);
      continue;
    }
    for (size_t c = 0; c < 3; ++c) {
      for (uint8_t& value : merged.back().tables[c]) value = effect.tables[c][value];
    }
  }
  return merged;
}

void ApplyRow(std::span<const PointEffect> effects, uint8_t* bgr, size_t pixels) {
  for (const PointEffect& effect : effects) {
    if (effect.IsTable()) {
      ApplyTables(effect.tables, bgr, pixels);
    } else {
      effect.colors(bgr, pixels);
    }
  }
}

void ApplyToPalette(PictureRecord& picture, std::span<const PointEffect> effects) {
  const auto colors = static_cast<size_t>(picture.image.Colors());
  std::array<uint8_t, 768> bgr{};
  uint8_t* table = picture.image.ColorTable().data();
  for (size_t i = 0; i < colors; ++i) std::copy_n(table + 4 * i, 3, bgr.data() + 3 * i);
  ApplyRow(effects, bgr.data(), colors);
  for (size_t i = 0; i < colors; ++i) {
    std::copy_n(bgr.data() + 3 * i, 3, table + 4 * i);
    std::reverse_copy(bgr.data() + 3 * i, bgr.data() + 3 * i + 3, picture.palette.data() + 3 * i);
  }
}

}  // namespace

PointEffect EffectOf(const std::function<double(double)>& value) {
  PointEffect effect;
  for (size_t v = 0; v < 256; ++v)
    effect.tables[0][v] = RoundedLevel(value(static_cast<double>(v)));
  effect.tables[1] = effect.tables[2] = effect.tables[0];
  return effect;
}

Status ApplyPointEffects(PictureRecord& picture, std::span<const PointEffect> effects,
                         const Work& work) {
  if (picture.image.Empty()) return Status::EmptyImage;
  const std::vector<PointEffect> merged = Merged(effects);
  if (picture.image.Bits() < 24) {
    ApplyToPalette(picture, merged);
    return Status::Ok;
  }
  const auto width = static_cast<size_t>(picture.image.Width());
  return ForBands(picture.image.Height(), kLeastRows, work, [&](int32_t first, int32_t end) {
    for (int32_t y = first; y < end; ++y) ApplyRow(merged, picture.image.Row(y).data(), width);
    return Status::Ok;
  });
}

}  // namespace fotomill
