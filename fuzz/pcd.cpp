// The first byte selects: a whole file, zero-padded to the size of the smallest picture, or code
// tables and deltas for tiny planes, which are much faster.

#include <algorithm>
#include <span>
#include <vector>

#include "formats/photocd/pcd_deltas.h"
#include "support/codec_target.h"

namespace {

void TryDeltas(std::span<const uint8_t> data, bool lumaOnly) {
  fotomill::PcdCodes codes;
  const size_t tables = std::min<size_t>(data.size(), 128);
  if (!codes.Parse(data.first(tables), lumaOnly ? 1 : 3)) return;
  fotomill::PcdPlanes planes;
  planes.luma.Make(24, 16);
  for (fotomill::PcdPlane& chroma : planes.chroma) chroma.Make(12, 8);
  bool damaged = false;
  (void)AddPcdDeltas(data.subspan(tables), codes, lumaOnly, planes,
                     [](int32_t) { return fotomill::Status::Ok; }, damaged);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  if (size == 0) return 0;
  if (*data != 0xFF && *data != 'P') {
    TryDeltas({data + 1, size - 1}, *data % 2 == 0);
    return 0;
  }
  std::vector<uint8_t> file(data, data + size);
  file.resize(std::max<size_t>(size, 8192 + 36864));
  fotomill::fuzz::TryCodec("pcd", file.data(), file.size());
  return 0;
}
