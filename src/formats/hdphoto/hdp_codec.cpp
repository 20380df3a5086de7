#include "formats/hdphoto/hdp_codec.h"

#include <jxrlib/windowsmediaphoto.h>
// The library's header defines these common words as macros.
#undef Call
#undef FailIf
#undef Failed
#undef Report
#undef Test

#include <algorithm>
#include <cstring>

#include "core/limits.h"
#include "platform/shared_library.h"

namespace fotomill {

namespace {

constexpr char kLibraryName[] = "libjpegxr.so.0";
constexpr int32_t kBlock = 16;            // rows processed by the library at a time
// CPU time per picture; damaged data may keep the decoder busy
constexpr unsigned kSecondsAtLeast = 20;
constexpr uint64_t kPixelsPerSecond = 1'000'000;
constexpr uint64_t kReadAhead = 3 * 4096;  // bytes that the decoder reads ahead
constexpr U8 kNoAlpha = 0, kAlphaToo = 2;  // uAlphaMode

struct JxrLibrary {
  JxrLibrary() {
    if (!library.LoadSystem(kLibraryName)) return;
    decodeInfo = library.FunctionNamed<decltype(ImageStrDecGetInfo)>("ImageStrDecGetInfo");
    decodeInit = library.FunctionNamed<decltype(ImageStrDecInit)>("ImageStrDecInit");
    decode = library.FunctionNamed<decltype(ImageStrDecDecode)>("ImageStrDecDecode");
    decodeTerm = library.FunctionNamed<decltype(ImageStrDecTerm)>("ImageStrDecTerm");
    encodeInit = library.FunctionNamed<decltype(ImageStrEncInit)>("ImageStrEncInit");
    encode = library.FunctionNamed<decltype(ImageStrEncEncode)>("ImageStrEncEncode");
    encodeTerm = library.FunctionNamed<decltype(ImageStrEncTerm)>("ImageStrEncTerm");
  }
  bool Whole() const {
    return decodeInfo != nullptr && decodeInit != nullptr && decode != nullptr &&
           decodeTerm != nullptr && encodeInit != nullptr && encode != nullptr &&
           encodeTerm != nullptr;
  }

  platform::SharedLibrary library;
  decltype(ImageStrDecGetInfo)* decodeInfo = nullptr;
  decltype(ImageStrDecInit)* decodeInit = nullptr;
  decltype(ImageStrDecDecode)* decode = nullptr;
  decltype(ImageStrDecTerm)* decodeTerm = nullptr;
  decltype(ImageStrEncInit)* encodeInit = nullptr;
  decltype(ImageStrEncEncode)* encode = nullptr;
  decltype(ImageStrEncTerm)* encodeTerm = nullptr;
};

const JxrLibrary& Library() {
  static const JxrLibrary library;
  return library;
}

// The library's stream interface to a codestream in memory, or to a file being written. Stores its
// own address, so it must not be moved.
struct JxrStream : WMPStream {
  explicit JxrStream(std::span<const uint8_t> data) : WMPStream(), bytes(data) { Connect(); }
  explicit JxrStream(ByteWriter& file) : WMPStream(), out(&file), start(file.Position()) {
    Connect();
  }
  JxrStream(const JxrStream&) = delete;
  JxrStream& operator=(const JxrStream&) = delete;

  std::span<const uint8_t> bytes;
  ByteWriter* out = nullptr;
  uint64_t start = 0;  // offset of the codestream in the file being written
  size_t position = 0;
  bool overrun = false;  // a read went past the end

 private:
  static JxrStream& Of(WMPStream* stream) { return *static_cast<JxrStream*>(stream); }
  void Connect();
};

ERR CloseNothing(WMPStream**) { return WMP_errSuccess; }

void JxrStream::Connect() {
  Close = CloseNothing;
  EOS = [](WMPStream* stream) -> Bool { return Of(stream).position >= Of(stream).bytes.size(); };
  // The library reads whole packets and so past the end of every file; missing bytes read as zeros.
  Read = [](WMPStream* stream, void* target, size_t count) -> ERR {
    JxrStream& self = Of(stream);
    const size_t left = self.bytes.size() - std::min(self.position, self.bytes.size());
    const size_t taken = std::min(count, left);
    if (taken > 0) std::memcpy(target, self.bytes.data() + self.position, taken);
    std::memset(static_cast<uint8_t*>(target) + taken, 0, count - taken);
    self.position += count;
    self.overrun = self.overrun || self.position > self.bytes.size() + kReadAhead;
    return WMP_errSuccess;
  };
  Write = [](WMPStream* stream, const void* source, size_t count) -> ERR {
    JxrStream& self = Of(stream);
    const std::span<const uint8_t> data(static_cast<const uint8_t*>(source), count);
    const uint64_t place = self.start + self.position, end = self.out->Position();
    if (place > end) self.out->Zeros(place - end);
    const auto inside = std::min<uint64_t>(count, self.out->Position() - place);
    self.out->Patch(place, data.first(inside));
    self.out->Bytes(data.subspan(inside));
    self.position += count;
    return self.out->Failed() ? WMP_errFileIO : WMP_errSuccess;
  };
  SetPos = [](WMPStream* stream, size_t place) -> ERR {
    Of(stream).position = place;
    return WMP_errSuccess;
  };
  GetPos = [](WMPStream* stream, size_t* place) -> ERR {
    *place = Of(stream).position;
    return WMP_errSuccess;
  };
}

// Samples per pixel and bytes per sample; 0 samples if the library cannot deliver pixels.
struct SampleShape {
  uint32_t samples, bytes;
};
SampleShape ShapeOf(const HdpStream& stream) {
  uint32_t bytes = 1;
  switch (stream.depth) {
    case HdpDepth::WhiteIsOne:
    case HdpDepth::BlackIsOne: return {stream.colors == HdpColors::Gray ? 1u : 0u, 0};
    case HdpDepth::Rgb555:
    case HdpDepth::Rgb565: return {stream.colors == HdpColors::Rgb ? 1u : 0u, 2};
    case HdpDepth::Rgb101010: return {stream.colors == HdpColors::Rgb ? 1u : 0u, 4};
    case HdpDepth::U8: break;
    case HdpDepth::U16:
    case HdpDepth::Fixed16:
    case HdpDepth::Half: bytes = 2; break;
    default: bytes = 4; break;
  }
  switch (stream.colors) {
    case HdpColors::Gray: return {1, bytes};
    case HdpColors::Rgb: return {3, bytes};
    case HdpColors::Rgbe:
    case HdpColors::Cmyk:
      return {bytes == 1 || (bytes == 2 && stream.colors == HdpColors::Cmyk) ? 4u : 0u, bytes};
    default: return {0, 0};
  }
}

// The request to the child process: the sizes of the codestreams, which are concatenated in its
// input, and the raster.
struct DecodeRequest {
  // bytes; without alphaSize, alpha, if any, is interleaved with the colors
  uint64_t imageSize = 0, alphaSize = 0;
  uint64_t stride = 0;
  int32_t width = 0, height = 0;
  uint32_t samples = 0, sampleBytes = 0;
  uint32_t alpha = 0;

  uint64_t RasterBytes() const { return stride * static_cast<uint64_t>(height); }
};

// One of the codestreams, and its destination.
struct DecodeJob {
  std::span<const uint8_t> stream;
  uint32_t firstSample = 0;
  bool alphaToo = false;
};

// Decodes a codestream into the raster; false on failure. Runs in the worker process.
bool DecodeStream(const DecodeJob& job, const DecodeRequest& request, std::span<uint8_t> raster,
                  const std::function<void(int32_t)>& tell, bool& overrun) {
  const JxrLibrary& library = Library();
  JxrStream source(job.stream);
  CWMImageInfo info = {};
  CWMIStrCodecParam parameters = {};
  parameters.pWStream = &source;
  parameters.uAlphaMode = job.alphaToo ? kAlphaToo : kNoAlpha;
  if (library.decodeInfo(&info, &parameters) != ICERR_OK) return false;
  const auto width = static_cast<size_t>(request.width),
             height = static_cast<size_t>(request.height);
  if (info.cWidth != width || info.cHeight != height) return false;
  info.cThumbnailWidth = info.cROIWidth = width;
  info.cThumbnailHeight = info.cROIHeight = height;
  info.oOrientation = O_NONE;
  info.bRGB = FALSE;
  info.cBitsPerUnit = request.sampleBytes == 0 ? 1 : 8 * request.samples * request.sampleBytes;
  info.cLeadingPadding = job.firstSample;
  CTXSTRCODEC context = nullptr;
  if (library.decodeInit(&info, &parameters, &context) != ICERR_OK || context == nullptr)
    return false;
  CWMImageBufferInfo buffer = {};
  buffer.pv = raster.data();
  buffer.cLine = height;
  buffer.cbStride = request.stride;
  const int32_t blocks = (request.height + kBlock - 1) / kBlock;
  bool decoded = true;
  // each row of blocks is completed by the next one
  for (int32_t row = 0; decoded && row <= blocks; ++row) {
    size_t lines = 0;
    buffer.uiFirstMBRow = buffer.uiLastMBRow = static_cast<unsigned>(row);
    decoded = library.decode(context, &buffer, &lines) == ICERR_OK && !source.overrun;
    tell(std::min(row * kBlock, request.height));
  }
  library.decodeTerm(context);
  overrun = source.overrun;
  return decoded;
}

Status MakeRaster(const HdpPage& page, HdpRaster& raster) {
  const SampleShape shape = ShapeOf(page.image);
  const bool holdsAlpha =
      shape.samples >= 3 || (shape.samples == 1 && !page.alpha.bytes.empty() && shape.bytes > 0 &&
                             page.image.colors == HdpColors::Gray);
  raster.alpha = holdsAlpha && page.image.colors != HdpColors::Rgbe &&
                 (page.image.alpha || !page.alpha.bytes.empty());
  raster.samples = shape.samples + (raster.alpha ? 1 : 0);
  raster.sampleBytes = shape.bytes;
  const auto width = static_cast<uint64_t>(page.image.width),
             height = static_cast<uint64_t>(page.image.height);
  raster.stride = shape.bytes == 0 ? (width + 7) / 8 : width * raster.samples * shape.bytes;
  raster.stride = (raster.stride + 127) / 128 * 128;
  constexpr uint64_t kShare = 2;  // the picture is in memory as well
  if (raster.stride > limits.packedBlockBytes / kShare / height)
    return Status::MemoryAllocationError;
  return raster.block.Allocate(raster.stride * height + 1) ? Status::Ok
                                                           : Status::MemoryAllocationError;
}

}  // namespace

bool HasHdpLibrary() { return Library().Whole(); }

bool CanDecodeHdp(const HdpStream& stream) { return ShapeOf(stream).samples > 0; }

Status DecodeHdp(const HdpPage& page, HdpRaster& raster, const StopToken& stop,
                 const std::function<void(int32_t)>& told) {
  if (!CanDecodeHdp(page.image)) return Status::UnsupportedFormat;
  if (page.cutShort) return Status::FileReadError;
  if (!HasHdpLibrary()) return Status::FeatureDisabled;
  RETURN_IF_BAD(MakeRaster(page, raster));
  const DecodeRequest request = {.imageSize = page.image.bytes.size(),
                                 .alphaSize = page.alpha.bytes.size(),
                                 .stride = raster.stride,
                                 .width = page.image.width,
                                 .height = page.image.height,
                                 .samples = raster.samples,
                                 .sampleBytes = raster.sampleBytes,
                                 .alpha = raster.alpha};
  platform::MemoryBlock input;
  if (!input.Allocate(request.imageSize + request.alphaSize, platform::Fill::Unset))
    return Status::MemoryAllocationError;
  std::ranges::copy(page.image.bytes, input.Bytes().begin());
  std::ranges::copy(page.alpha.bytes,
                    input.Bytes().begin() + static_cast<ptrdiff_t>(request.imageSize));
  const auto pixels =
      static_cast<uint64_t>(page.image.width) * static_cast<uint64_t>(page.image.height);
  const platform::ApartResult result = platform::RunApart(
      {.task = kHdpTask.name,
       .request = {reinterpret_cast<const uint8_t*>(&request), sizeof request},
       .input = input.Bytes(),
       .reply = raster.block,
       .seconds = kSecondsAtLeast + static_cast<unsigned>(pixels / kPixelsPerSecond),
       .goesOn = [&] { return !stop.Asked(); }},
      told);
  const bool overrun = raster.block.Bytes().back() != 0;
  switch (result) {
    case platform::ApartResult::Done: return overrun ? Status::FileReadError : Status::Ok;
    case platform::ApartResult::NotStarted: return Status::MemoryAllocationError;
    case platform::ApartResult::Stopped: return Status::FunctionCancelled;
    default: return overrun ? Status::FileReadError : Status::DamagedFile;
  }
}

bool DecodeHdpApart(const platform::ApartCall& call) {
  DecodeRequest request;
  if (call.request.size() != sizeof request || !HasHdpLibrary()) return false;
  std::memcpy(&request, call.request.data(), sizeof request);
  if (request.imageSize + request.alphaSize != call.input.size() ||
      request.RasterBytes() + 1 != call.reply.size())
    return false;
  const std::span<uint8_t> raster = call.reply.first(request.RasterBytes());
  const bool apart = request.alphaSize > 0;
  bool overrun = false, alphaOverrun = false;
  bool done = DecodeStream({call.input.first(request.imageSize), 0, request.alpha != 0 && !apart},
                           request, raster, call.tell, overrun);
  if (done && request.alpha != 0 && apart) {
    const DecodeJob alpha = {call.input.subspan(request.imageSize), request.samples - 1, false};
    done = DecodeStream(
        alpha, request, raster, [](int32_t) {}, alphaOverrun);
  }
  call.reply.back() = overrun || alphaOverrun;
  return done;
}

Status EncodeHdp(const PackedImage& image, const HdpEncoding& encoding, ByteWriter& out,
                 const std::function<void(int32_t)>& report) {
  if (!HasHdpLibrary()) return Status::FeatureDisabled;
  const JxrLibrary& library = Library();
  const bool gray = image.Bits() == 8;
  JxrStream target(out);
  CWMImageInfo info = {};
  info.cWidth = static_cast<size_t>(image.Width());
  info.cHeight = static_cast<size_t>(image.Height());
  info.cfColorFormat = gray ? Y_ONLY : CF_RGB;
  info.bdBitDepth = BD_8;
  info.cBitsPerUnit = gray ? 8 : 24;
  info.bRGB = FALSE;
  CWMIStrCodecParam parameters = {};
  parameters.pWStream = &target;
  parameters.cfColorFormat = gray ? Y_ONLY : YUV_444;
  parameters.cChannel = gray ? 1 : 3;
  parameters.bdBitDepth = BD_LONG;
  parameters.olOverlap = encoding.quantizer == 0 ? OL_NONE : OL_ONE;
  parameters.bfBitstreamFormat = encoding.frequencyOrder ? FREQUENCY : SPATIAL;
  parameters.bProgressiveMode = encoding.frequencyOrder ? TRUE : FALSE;
  parameters.sbSubband = SB_ALL;
  parameters.uiDefaultQPIndex = static_cast<U8>(std::clamp(encoding.quantizer, 1, 255));
  CTXSTRCODEC context = nullptr;
  if (library.encodeInit(&info, &parameters, &context) != ICERR_OK || context == nullptr)
    return Status::ResourceError;
  // The library takes bands of 16 rows, top first; the image is stored bottom-up.
  platform::MemoryBlock band;
  bool done = band.Allocate(image.Stride() * kBlock);
  const bool room = done;
  for (int32_t top = 0; done && top < image.Height(); top += kBlock) {
    const int32_t rows = std::min(kBlock, image.Height() - top);
    for (int32_t r = 0; r < rows; ++r) {
      std::memcpy(band.Data() + image.Stride() * static_cast<uint64_t>(r),
                  image.Row(top + r).data(), image.Stride());
    }
    CWMImageBufferInfo buffer = {};
    buffer.pv = band.Data();
    buffer.cLine = static_cast<size_t>(rows);
    buffer.cbStride = image.Stride();
    done = library.encode(context, &buffer) == ICERR_OK;
    for (int32_t r = 0; r < rows; ++r) report(top + r);
  }
  done = library.encodeTerm(context) == ICERR_OK && done;
  return done && !out.Failed() ? Status::Ok
         : room                ? Status::ErrorWritingFile
                               : Status::MemoryAllocationError;
}

}  // namespace fotomill
