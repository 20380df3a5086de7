#include "formats/jpeg/jpeg_coding.h"

#include <algorithm>

#include "formats/jpeg/jpeg_library.h"

namespace fotomill {

std::shared_ptr<const JpegCoding> CodingOf(const jpeg_decompress_struct& info) {
  const bool known = info.jpeg_color_space == JCS_GRAYSCALE || info.jpeg_color_space == JCS_YCbCr;
  auto coding = std::make_shared<JpegCoding>();
  coding->count = static_cast<size_t>(info.num_components);
  if (!known || coding->count > coding->components.size()) return nullptr;
  for (size_t i = 0; i < coding->count; ++i) {
    const jpeg_component_info& from = info.comp_info[i];
    if (from.quant_table == nullptr) return nullptr;
    JpegCoding::Component& to = coding->components[i];
    to.across = from.h_samp_factor;
    to.down = from.v_samp_factor;
    std::ranges::copy(from.quant_table->quantval, to.table.begin());
  }
  return coding;
}

namespace {

// The library can read fractional ratios, such as 3 next to 2, but not write them.
bool CanSample(const JpegCoding& coding) {
  int32_t across = 1, down = 1;
  for (const JpegCoding::Component& component : coding.components) {
    across = std::max(across, component.across);
    down = std::max(down, component.down);
  }
  return std::ranges::all_of(coding.components, [&](const JpegCoding::Component& component) {
    return across % component.across == 0 && down % component.down == 0;
  });
}

}  // namespace

void SetCoding(jpeg_compress_struct& info, const JpegCoding& coding) {
  const auto count = static_cast<size_t>(info.num_components);
  const bool sample = coding.count > 1 && count == coding.count && CanSample(coding);
  int tables = 0;  // defined so far
  for (size_t i = 0; i < count; ++i) {
    // a gray source has only one table
    const size_t place = std::min(i, coding.count - 1);
    const JpegCoding::Component& from = coding.components[place];
    jpeg_component_info& to = info.comp_info[i];
    if (sample) {
      to.h_samp_factor = from.across;
      to.v_samp_factor = from.down;
    }
    const auto* const end = coding.components.begin() + (place < i ? place + 1 : i);
    const auto* const same = std::find_if(
        coding.components.begin(), end,
        [&](const JpegCoding::Component& earlier) { return earlier.table == from.table; });
    if (same != end) {
      to.quant_tbl_no = info.comp_info[same - coding.components.begin()].quant_tbl_no;
      continue;
    }
    std::array<unsigned, 64> table;
    std::ranges::copy(from.table, table.begin());
    jpeg_add_quant_table(&info, tables, table.data(), 100, FALSE);
    to.quant_tbl_no = tables++;
  }
}

}  // namespace fotomill
