#include "processing/filters/median_kernel.h"

#include "platform/vector.h"

namespace fotomill {

namespace {

namespace baseline {
#include "processing/filters/median_kernel.inc"
}  // namespace baseline

#if VECTOR_HAS_AVX2
VECTOR_AVX2_BEGIN
namespace avx2 {
#include "processing/filters/median_kernel.inc"
}  // namespace avx2
VECTOR_AVX2_END
#endif

}  // namespace

MedianRow MedianRowHere() {
#if VECTOR_HAS_AVX2
  if (platform::HasAvx2()) return avx2::FindMedians;
#endif
  return BaselineMedianRow();
}

MedianRow BaselineMedianRow() { return baseline::FindMedians; }

}  // namespace fotomill
