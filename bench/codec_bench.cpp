#include "codec_bench.h"

#include <benchmark/benchmark.h>

#include <cstring>
#include <filesystem>
#include <string>
#include <vector>

namespace fotomill::bench {

namespace {

enum class Content { Photo, Flat };

// Row data: a gradient with a little noise, or areas of 200 equal bytes.
PicturePointer MakePicture(Content content, int32_t depth, Size size) {
  PicturePointer picture = NewPictureRecord();
  picture->width = size.width;
  picture->height = size.height;
  picture->bitsPerPixel = depth;
  MakeDefaultPalette(&picture->palette, nullptr,
                     depth == 1 ? kBlackAndWhitePalette : kDisplayPalette);
  if (NewPackedImage(size.width, size.height, &picture->palette, depth, picture->image) !=
      Status::Ok)
    return nullptr;
  uint32_t state = 1;
  for (int32_t y = 0; y < size.height; ++y) {
    const auto row = picture->image.Row(y);
    for (size_t i = 0; i < row.size(); ++i) {
      state = state * 1664525 + 1013904223;
      const size_t level = content == Content::Flat
                               ? i / 200 * 50 + static_cast<size_t>(y / 40 * 7)
                               : 60 + 120 * i / row.size() + (state >> 29) + (state >> 26 & 7);
      row[i] = static_cast<uint8_t>(level);
    }
  }
  return picture;
}

std::string FileName(const char* extension) {
  return (std::filesystem::temp_directory_path() / "fotomill-bench.").string() + extension;
}

void SetBytes(benchmark::State& state, const PackedImage& image) {
  state.SetBytesProcessed(static_cast<int64_t>(state.iterations()) *
                          static_cast<int64_t>(image.Rows().size()));
}

void Encode(benchmark::State& state, const char* extension, Content content, int32_t depth,
            Size size) {
  const PicturePointer picture = MakePicture(content, depth, size);
  const std::string name = FileName(extension);
  const FormatEntry& row = FormatRow(FindFormatByName(name));
  picture->fileName.AssignCut(name);
  for (auto _ : state) {
    if (row.write(*picture, {}) != Status::Ok) state.SkipWithError("cannot write");
    state.PauseTiming();
    std::filesystem::remove(name);  // replacing a file would sync it
    state.ResumeTiming();
  }
  SetBytes(state, picture->image);
}

void Decode(benchmark::State& state, const char* extension, Content content, int32_t depth,
            Size size) {
  const PicturePointer source = MakePicture(content, depth, size);
  const std::string name = FileName(extension);
  const FormatEntry& row = FormatRow(FindFormatByName(name));
  source->fileName.AssignCut(name);
  if (row.write(*source, {}) != Status::Ok) state.SkipWithError("cannot write");
  const PicturePointer picture = NewPictureRecord();
  for (auto _ : state) {
    if (row.read(*picture, {.fileName = name}) != Status::Ok) state.SkipWithError("cannot read");
  }
  std::filesystem::remove(name);
  SetBytes(state, picture->image);
}

void Copy(benchmark::State& state, int32_t depth) {
  const PicturePointer picture = MakePicture(Content::Photo, depth, Size());
  const auto rows = picture->image.Rows();
  std::vector<uint8_t> copy(rows.size());
  for (auto _ : state) {
    std::memcpy(copy.data(), rows.data(), rows.size());
    benchmark::DoNotOptimize(copy.data());
    benchmark::ClobberMemory();
  }
  SetBytes(state, picture->image);
}

const bool copiesAreRegistered = [] {
  for (const int32_t depth : {8, 24}) {
    benchmark::RegisterBenchmark(("memcpy/" + std::to_string(depth)).c_str(), Copy, depth);
  }
  return true;
}();

}  // namespace

void RegisterCodec(const char* extension, std::initializer_list<int32_t> depths, Size size) {
  constexpr struct {
    const char* name;
    Content content;
  } kContents[] = {{"photo", Content::Photo}, {"flat", Content::Flat}};
  for (const int32_t depth : depths) {
    for (const auto& kind : kContents) {
      const std::string tail = std::string("/") + kind.name + "/" + std::to_string(depth);
      benchmark::RegisterBenchmark((extension + ("/decode" + tail)).c_str(), Decode, extension,
                                   kind.content, depth, size);
      benchmark::RegisterBenchmark((extension + ("/encode" + tail)).c_str(), Encode, extension,
                                   kind.content, depth, size);
    }
  }
}

}  // namespace fotomill::bench
