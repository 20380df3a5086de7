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

// HD Photo codestreams are handled by libjxr,
// loaded when first needed, if installed.
bool HasHdpLibrary();

// The pixels of a page as delivered by the library: rows of `stride` bytes, top first; interleaved
// samples in native byte order, 8-bit colors as blue, green, red, deeper ones as red, green, blue;
// alpha is last.
struct HdpRaster {
  platform::SharedBlock block;  // rows, followed by one byte reserved for the decoder
  uint64_t stride = 0;
  uint32_t samples = 1;      // per pixel, including alpha
  uint32_t sampleBytes = 1;  // 0 for 1-bit pixels, most significant bit first
  bool alpha = false;
  const uint8_t* Row(int32_t y) const {
    return block.Bytes().data() + stride * static_cast<uint64_t>(y);
  }
};

// Whether such codestreams can be decoded here.
bool CanDecodeHdp(const HdpStream& stream);

// Decodes a page. The library trusts its input, so it runs in a worker
// process: a crash on bad data is reported as DamagedFile. FileReadError if
// truncated, FeatureDisabled without the library, UnsupportedFormat if
// CanDecodeHdp is false, MemoryAllocationError, FunctionCancelled if `stop`
// was requested meanwhile. `told` receives the number of finished rows.
Status DecodeHdp(const HdpPage& page, HdpRaster& raster, const StopToken& stop,
                 const std::function<void(int32_t)>& told);

// The task for the worker process, a row of the program's task table.
bool DecodeHdpApart(const platform::ApartCall& call);
inline constexpr platform::ApartTask kHdpTask = {"hdp-decode", DecodeHdpApart};

// Encoder options.
struct HdpEncoding {
  int32_t quantizer = 0;  // 0 to 255, 0 is lossless
  bool frequencyOrder = false;
};

// Encodes an image: grayscale if it has 8 bits, else color. `report` is called with the number of
// finished rows. FeatureDisabled without the library, ErrorWritingFile.
Status EncodeHdp(const PackedImage& image, const HdpEncoding& encoding, ByteWriter& out,
                 const std::function<void(int32_t)>& report);

}  // namespace fotomill
