#include "processing/bands.h"

#include <algorithm>

#include "core/workers/share_out.h"

namespace fotomill {

namespace {

// Several bands per core, so that Abort responds quickly and cores finish together. A single core
// gets more bands, but not the smallest ones possible, as adjacent bands compute some rows twice.
constexpr int32_t kBandsACore = 4, kBandsAlone = 16, kLeastAlone = 4;

}  // namespace

Status ForBands(int32_t rows, int32_t least, const Work& work, const BandFunction& band) {
  if (rows <= 0) return Status::Ok;
  const auto cores =
      work.threads == 1 ? 1 : static_cast<int32_t>(std::min(WorkerPool::Shared().Cores(), 64u));
  const int32_t wanted = cores == 1 ? std::max(kLeastAlone * least, rows / kBandsAlone)
                                    : std::max(least, rows / (cores * kBandsACore));
  const int32_t height = std::clamp(wanted, 1, rows);
  const auto part = [&](int32_t number) {
    if (!work.GoesOn()) return Status::FunctionCancelled;
    const int32_t first = number * height;
    return band(first, std::min(rows - first, height) + first);
  };
  const int32_t parts = (rows - 1) / height + 1;
  if (cores > 1 && parts > 1) return ShareOut(parts, part);
  for (int32_t number = 0; number < parts; ++number) RETURN_IF_BAD(part(number));
  return Status::Ok;
}

}  // namespace fotomill
