// JPEG XL through libjxl: still pictures and animations, read and written, and JPEG files stored
// in it without loss and restored from it byte for byte.
//
// The decoder applies the orientation, so EXIF is passed on with orientation 1.
// Source: ISO/IEC 18181-1 and -2.
#pragma once

#include <jxl/decode.h>
#include <jxl/encode.h>
#include <jxl/thread_parallel_runner.h>

#include <cstdint>
#include <memory>
#include <vector>

#include "fotomill_plugin_kit.h"

namespace jpegxl {

enum OptionPlace { kQuality, kLossless, kEffort, kOptions };

struct DecoderDeleter {
  void operator()(JxlDecoder* decoder) const { JxlDecoderDestroy(decoder); }
};
struct EncoderDeleter {
  void operator()(JxlEncoder* encoder) const { JxlEncoderDestroy(encoder); }
};
struct RunnerDeleter {
  void operator()(void* runner) const { JxlThreadParallelRunnerDestroy(runner); }
};
using Encoder = std::unique_ptr<JxlEncoder, EncoderDeleter>;
using Decoder = std::unique_ptr<JxlDecoder, DecoderDeleter>;
using Runner = std::unique_ptr<void, RunnerDeleter>;

inline Runner NewRunner() {
  return Runner(JxlThreadParallelRunnerCreate(
      nullptr, std::min<size_t>(JxlThreadParallelRunnerDefaultNumWorkerThreads(), 8)));
}

using Bytes = FmwOwnedFile;

// The error of a decoder that has stopped before it was done.
int32_t ErrorOf(JxlDecoderStatus status);

// Opens a file for the events.
int32_t Begin(const Bytes& bytes, int events, Decoder& decoder);

// The size after the orientation has been applied.
struct Size {
  uint32_t width, height;
};
Size SizeOf(const JxlBasicInfo& info);
int BitsOf(const JxlBasicInfo& info);

// What can be known of a file without decoding pixels.
struct Facts {
  JxlBasicInfo info = {};
  std::vector<int32_t> delays;  // of an animation's frames, milliseconds
  std::vector<uint8_t> exif, xmp;
  FMW_BLOCK icc = {nullptr, 0};  // owned by the caller
};

// Reads the header; with `all`, also boxes and frame headers.
int32_t ReadFacts(const Bytes& bytes, bool all, Facts& facts);

// Decodes a picture or frame.
int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap);

int32_t Write(const char* fileName, const FmwBitmap* given, const FMW_WRITE_REQUEST* request);

int32_t WriteFrames(const char* fileName, const FMW_FRAMES* frames,
                    const FMW_WRITE_REQUEST* request);

// Runs the encoder to its end and writes what it gives.
int32_t Finish(JxlEncoder* encoder, const char* fileName);

// Stores a JPEG file, or restores it.
int32_t Transcode(const char* source, const char* destination);

}  // namespace jpegxl
