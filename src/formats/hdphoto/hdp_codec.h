#pragma once

#include <cstdint>
#include <functional>
#include <span>

#include "core/byte_writer.h"
#include "core/status.h"
#include "core/workers/stop_token.h"
#include "formats/hdphoto/hdp_file.h"
#include "picture/packed_image.h"
#include "platform/work_apart.h"

namespace fotomill {

// The coder of HD Photo codestreams is libjxr, which is loaded with the first picture that needs it
// and may not be there.
bool HasHdpLibrary();

// The pixels of a page as the library delivers them: rows from the top, of `stride` bytes; samples
// of a pixel lie together in the machine's byte order, 8-bit colors as blue, green, red, deeper
// ones as red, green, blue; alpha comes last.
struct HdpRaster {
  platform::SharedBlock block;  // of rows, and a byte behind them that the decoder keeps for itself
  uint64_t stride = 0;
  uint32_t samples = 1;      // of a pixel, alpha among them
  uint32_t sampleBytes = 1;  // 0 for pixels of one bit, from the most significant one down
  bool alpha = false;
  const uint8_t* Row(int32_t y) const {
    return block.Bytes().data() + stride * static_cast<uint64_t>(y);
  }
};

// Whether such codestreams can become pixels here.
bool CanDecodeHdp(const HdpStream& stream);

// Decodes a page. The library trusts what it reads, so it works apart: a fault in the data that
// brings it down is DamagedFile like any other. FileReadError when the data end too early,
// FeatureDisabled without the library, UnsupportedFormat for colors that CanDecodeHdp refuses,
// MemoryAllocationError, FunctionCancelled when `stop` was asked meanwhile. `told` receives
// finished rows.
Status DecodeHdp(const HdpPage& page, HdpRaster& raster, const StopToken& stop,
                 const std::function<void(int32_t)>& told);

// The part of it that runs apart: a row of the program's table of such work.
bool DecodeHdpApart(const platform::ApartCall& call);
inline constexpr platform::ApartTask kHdpTask = {"hdp-decode", DecodeHdpApart};

// How the library is to code a picture.
struct HdpEncoding {
  int32_t quantizer = 0;  // 0 to 255, 0 is lossless
  bool frequencyOrder = false;
};

// Encodes an image: gray when it has 8 bits, else colors. `report` is called with finished rows.
// FeatureDisabled without the library, ErrorWritingFile.
Status EncodeHdp(const PackedImage& image, const HdpEncoding& encoding, ByteWriter& out,
                 const std::function<void(int32_t)>& report);

}  // namespace fotomill
