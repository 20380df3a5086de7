#include "batch/output_target.h"

#include "batch/job.h"
#include "registry/registry.h"

namespace fotomill {

OutputTarget TargetOf(const std::string& source, const BatchOutput& output, const BatchJob& job,
                      const FallbackFormat& fallback) {
  if (output.formatIndex != kNoFormat)
    return {&output, output.formatIndex, output.extension, false, {}};
  if (job.formatIndex != kNoFormat) return {&output, job.formatIndex, job.extension, false, {}};
  const int32_t own = FindFormatByName(source);
  const bool kept = own != kNoFormat && own != kSpareRow && CanWrite(FormatRow(own));
  if (kept) return {&output, own, std::string(FormatRow(own).extension), true, {}};
  return {&output, fallback.formatIndex, fallback.extension, true, {}};
}

void BindPluginRow(const OutputTarget& target) {
  if (target.formatIndex == kSpareRow) (void)FindPluginFormat("x." + target.extension);
}

Status FindQuality(uint64_t most,
                   const std::function<Status(int32_t quality, uint64_t& bytes)>& trial,
                   int32_t& quality, uint64_t& smallest) {
  int32_t fits = 0, tooLarge = 101;
  while (tooLarge - fits > 1) {
    const int32_t middle = (fits + tooLarge) / 2;
    uint64_t bytes = 0;
    RETURN_IF_BAD(trial(middle, bytes));
    if (bytes <= most) {
      fits = middle;
    } else {
      tooLarge = middle;
      smallest = bytes;
    }
  }
  quality = fits;
  return fits == 0 ? Status::UnsuitableImage : Status::Ok;
}

}  // namespace fotomill
