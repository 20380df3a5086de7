// What can be known of a file without decoding pixels.
#include <algorithm>
#include <cmath>
#include <type_traits>

#include "jpegxl.h"

namespace jpegxl {

namespace {

constexpr size_t kMostFrames = 1 << 16;
constexpr size_t kMostBoxBytes = size_t{64} << 20;

// The library's older versions take a pixel format in addition, which they ignore.
template <class Function>
JxlDecoderStatus ProfileSize(Function function, const JxlDecoder* decoder, size_t* size) {
  if constexpr (std::is_invocable_v<Function, const JxlDecoder*, const JxlPixelFormat*,
                                    JxlColorProfileTarget, size_t*>) {
    return function(decoder, nullptr, JXL_COLOR_PROFILE_TARGET_DATA, size);
  } else {
    return function(decoder, JXL_COLOR_PROFILE_TARGET_DATA, size);
  }
}
template <class Function, class Out, class... More>
JxlDecoderStatus Profile(Function function, const JxlDecoder* decoder, Out* out, More... more) {
  if constexpr (std::is_invocable_v<Function, const JxlDecoder*, const JxlPixelFormat*,
                                    JxlColorProfileTarget, Out*, More...>) {
    return function(decoder, nullptr, JXL_COLOR_PROFILE_TARGET_DATA, out, more...);
  } else {
    return function(decoder, JXL_COLOR_PROFILE_TARGET_DATA, out, more...);
  }
}

bool IsSrgb(const JxlDecoder* decoder) {
  JxlColorEncoding encoding;
  if (Profile(JxlDecoderGetColorAsEncodedProfile, decoder, &encoding) != JXL_DEC_SUCCESS)
    return false;
  const bool gray = encoding.color_space == JXL_COLOR_SPACE_GRAY;
  return encoding.white_point == JXL_WHITE_POINT_D65 &&
         encoding.transfer_function == JXL_TRANSFER_FUNCTION_SRGB &&
         (gray || (encoding.color_space == JXL_COLOR_SPACE_RGB &&
                   encoding.primaries == JXL_PRIMARIES_SRGB));
}

FMW_BLOCK ReadProfile(const JxlDecoder* decoder) {
  size_t size = 0;
  FMW_BLOCK block = {nullptr, 0};
  if (IsSrgb(decoder) ||
      ProfileSize(JxlDecoderGetICCProfileSize, decoder, &size) != JXL_DEC_SUCCESS || size == 0 ||
      size > kMostBoxBytes)
    return block;
  block.data = malloc(size);
  if (block.data != nullptr && Profile(JxlDecoderGetColorAsICCProfile, decoder,
                                       static_cast<uint8_t*>(block.data), size) == JXL_DEC_SUCCESS)
    block.size = size;
  return block;
}

int32_t DelayOf(const JxlDecoder* decoder, const JxlBasicInfo& info) {
  JxlFrameHeader header;
  const auto& animation = info.animation;
  if (JxlDecoderGetFrameHeader(decoder, &header) != JXL_DEC_SUCCESS || animation.tps_numerator == 0)
    return 0;
  const double milliseconds =
      1000.0 * header.duration * animation.tps_denominator / animation.tps_numerator;
  return static_cast<int32_t>(std::clamp(std::round(milliseconds), 0.0, 1e9));
}

// Collects the box that the decoder is in; grows the buffer as the decoder asks for it.
class BoxReader {
 public:
  explicit BoxReader(JxlDecoder* decoder) : decoder_(decoder) {}
  void Start(std::vector<uint8_t>* target) {
    End();
    target_ = target;
    if (target_ == nullptr) return;
    target_->resize(1 << 16);
    JxlDecoderSetBoxBuffer(decoder_, target_->data(), target_->size());
  }
  bool Grow() {
    if (target_ == nullptr || target_->size() > kMostBoxBytes) return false;
    const size_t done = target_->size() - JxlDecoderReleaseBoxBuffer(decoder_);
    target_->resize(2 * target_->size());
    JxlDecoderSetBoxBuffer(decoder_, target_->data() + done, target_->size() - done);
    return true;
  }
  void End() {
    if (target_ != nullptr) target_->resize(target_->size() - JxlDecoderReleaseBoxBuffer(decoder_));
    target_ = nullptr;
  }

 private:
  JxlDecoder* decoder_;
  std::vector<uint8_t>* target_ = nullptr;
};

std::vector<uint8_t>* TargetOf(JxlDecoder* decoder, Facts& facts) {
  JxlBoxType type;
  if (JxlDecoderGetBoxType(decoder, type, JXL_TRUE) != JXL_DEC_SUCCESS) return nullptr;
  if (memcmp(type, "Exif", 4) == 0 && facts.exif.empty()) return &facts.exif;
  if (memcmp(type, "xml ", 4) == 0 && facts.xmp.empty()) return &facts.xmp;
  return nullptr;
}

// EXIF starts with the big-endian offset of its TIFF header.
void TrimExif(std::vector<uint8_t>& exif) {
  const uint64_t start = exif.size() < 4 ? exif.size() : 4 + uint64_t{FmwGetBe(exif.data(), 4)};
  exif.erase(exif.begin(),
             exif.begin() + static_cast<ptrdiff_t>(std::min<uint64_t>(start, exif.size())));
  FmwSetUpright(exif.data(), exif.size());
}

}  // namespace

int32_t ErrorOf(JxlDecoderStatus status) {
  return status == JXL_DEC_NEED_MORE_INPUT ? FMW_ERROR_READ : FMW_ERROR_DAMAGED;
}

int32_t Begin(const Bytes& bytes, int events, Decoder& decoder) {
  decoder.reset(JxlDecoderCreate(nullptr));
  if (decoder == nullptr) return FMW_ERROR_MEMORY;
  if (JxlSignatureCheck(bytes.file.bytes, bytes.file.size) < JXL_SIG_CODESTREAM)
    return FMW_ERROR_DAMAGED;
  JxlDecoderSubscribeEvents(decoder.get(), events);
  JxlDecoderSetInput(decoder.get(), bytes.file.bytes, bytes.file.size);
  JxlDecoderCloseInput(decoder.get());
  return 0;
}

Size SizeOf(const JxlBasicInfo& info) {
  return info.orientation >= JXL_ORIENT_TRANSPOSE ? Size{info.ysize, info.xsize}
                                                  : Size{info.xsize, info.ysize};
}

int BitsOf(const JxlBasicInfo& info) {
  if (info.alpha_bits > 0) return 32;
  return info.num_color_channels == 1 ? 8 : 24;
}

int32_t ReadFacts(const Bytes& bytes, bool all, Facts& facts) {
  Decoder decoder;
  const int events = JXL_DEC_BASIC_INFO |
                     (all ? JXL_DEC_COLOR_ENCODING | JXL_DEC_FRAME | JXL_DEC_BOX : JXL_DEC_FRAME);
  const int32_t error = Begin(bytes, events, decoder);
  if (error != 0) return error;
  JxlDecoderSetDecompressBoxes(decoder.get(), JXL_TRUE);
  BoxReader boxes(decoder.get());
  for (bool known = false;;) {
    const JxlDecoderStatus status = JxlDecoderProcessInput(decoder.get());
    if (status == JXL_DEC_BASIC_INFO) {
      if (JxlDecoderGetBasicInfo(decoder.get(), &facts.info) != JXL_DEC_SUCCESS)
        return FMW_ERROR_DAMAGED;
      known = true;
      if (!all && facts.info.have_animation == 0) return 0;
    } else if (status == JXL_DEC_COLOR_ENCODING) {
      facts.icc = ReadProfile(decoder.get());
    } else if (status == JXL_DEC_BOX) {
      boxes.Start(TargetOf(decoder.get(), facts));
    } else if (status == JXL_DEC_FRAME && facts.delays.size() < kMostFrames) {
      facts.delays.push_back(DelayOf(decoder.get(), facts.info));
    } else if (status != JXL_DEC_BOX_NEED_MORE_OUTPUT || !boxes.Grow()) {
      boxes.End();
      TrimExif(facts.exif);
      return known ? 0 : ErrorOf(status);  // pixels that are damaged are found when they are read
    }
  }
}

}  // namespace jpegxl
