#include "formats/hdphoto/hdp.h"

#include <gtest/gtest.h>

#include <algorithm>
#include <string_view>

#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/peers.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

TEST(Hdp, QuantizerZeroIsLosslessAndOthersAreClose) {
  if (!HdpWorksHere()) GTEST_SKIP() << "libjxr is not installed";
  const ScopedSettings scoped;
  // A camera maker without the terminating NUL: the peer stops reading if it is missing.
  const std::vector<uint8_t> unendedText =
      Hex("4949 2A00 08000000  0100 0F01 0200 05000000 1A000000 00000000  4B6F64616B");
  struct Row {
    int32_t compression, options;
    bool exact;
  };
  for (const Row& row : {Row{0, 0, true}, Row{0, 1, true}, Row{60, 0, false}}) {
    for (const int32_t bits : {8, 24}) {
      SCOPED_TRACE(std::to_string(row.compression) + ", " + std::to_string(row.options) + ", " + std::to_string(bits) + " bits");
      settings.HDPCompression = row.compression;
      settings.HDPWriteOptions = row.options;
      const PicturePointer picture = PatternPicture(45, 37, bits);
      if (bits == 8) {  // a gray palette keeps the depth
        for (size_t i = 0; i < 768; ++i) picture->palette[i] = static_cast<uint8_t>(i / 3);
        const PicturePointer same = PatternPicture(45, 37, bits);
        ASSERT_EQ(NewPackedImage(45, 37, &picture->palette, 8, picture->image), Status::Ok);
        for (int32_t y = 0; y < 37; ++y)
          std::copy_n(same->image.Row(y).data(), 45, picture->image.Row(y).data());
      }
      picture->metadata.exif = unendedText;
      const std::vector<uint8_t> file = Encode(HdpWrite, *picture);
      const Decoded back = Decode(HdpRead, file);
      ASSERT_EQ(back.status, Status::Ok);
      EXPECT_EQ(SamePixels(picture->image, back.picture->image), row.exact);
      if (!HasProgram("JxrDecApp")) continue;
      const TemporaryFolder folder;
      WriteBytes(folder.Path("a.wdp"), file);
      ASSERT_TRUE(RunShell("JxrDecApp -i " + folder.Path("a.wdp") + " -o " + folder.Path("a.bmp") + " > " + folder.Path("log")));
      PicturePointer peer;
      ASSERT_EQ(LoadPicture(RequestFor(folder.Path("a.bmp")), peer), Status::Ok);
      EXPECT_TRUE(SamePixels(peer->image, back.picture->image));
    }
  }
}

// The library trusts its input and often crashes; the program must not.
TEST(Hdp, DamagedDataNeverCrashTheProgram) {
  if (!HdpWorksHere()) GTEST_SKIP() << "libjxr is not installed";
  const std::vector<uint8_t> good =
      ReadBytes(SourcePath("tests/formats/hdp/good/lossless-by-frequency.wdp"));
  uint32_t state = 1;
  const auto next = [&state](size_t below) {
    return (state = state * 1664525 + 1013904223) / 65536 % below;
  };
  // Library versions reject different parts of it, but must do nothing else.
  for (int turn = 0; turn < 200; ++turn) {
    std::vector<uint8_t> file = good;
    for (int i = 0; i < 2; ++i)
      file[300 + next(file.size() - 300)] = static_cast<uint8_t>(next(256));
    const Decoded decoded = Decode(HdpRead, file);
    EXPECT_EQ(decoded.picture->image.Empty(), decoded.status != Status::Ok) << turn;
  }
}

// Cancels as soon as rows are reported.
class Stopping : public ProgressSink {
 public:
  void Step(int32_t, int32_t) override { source.Stop(); }
  StopSource source;
};

TEST(Hdp, ChildProcessesStopWithTheirJob) {
  if (!HdpWorksHere()) GTEST_SKIP() << "libjxr is not installed";
  const TemporaryFolder folder;
  const std::string path = folder.Path("large.hdp");
  WriteBytes(path, Encode(HdpWrite, *PatternPicture(3000, 2000, 24)));
  Stopping progress;
  const PicturePointer picture = NewPictureRecord();
  picture->progress = &progress;
  picture->stop = progress.source.Token();
  EXPECT_EQ(HdpRead(*picture, {.fileName = path}), Status::FunctionCancelled);
  EXPECT_TRUE(picture->image.Empty());
  progress.source.Stop();
  EXPECT_EQ(HdpRead(*picture, {.fileName = path}), Status::FunctionCancelled);
}

TEST(Hdp, UnpremultipliesColors) {
  if (!HdpWorksHere()) GTEST_SKIP() << "libjxr is not installed";
  std::vector<uint8_t> file = ReadBytes(SourcePath("tests/formats/hdp/good/alpha-multiplied.wdp"));
  const Decoded decoded = Decode(HdpRead, file);
  ASSERT_EQ(decoded.status, Status::Ok);
  const std::string_view magic = "WMPHOTO";
  const auto flags = std::search(file.begin(), file.end(), magic.begin(), magic.end()) + 10;
  ASSERT_EQ(*flags & 2, 2) << "colors were multiplied by alpha";
  *flags &= 0xFD;
  const Decoded plain = Decode(HdpRead, file);
  ASSERT_EQ(plain.status, Status::Ok);
  const int32_t alphas[] = {0, 60, 128, 200, 255};
  for (int32_t y = 0; y < 9; ++y) {
    for (int32_t x = 0; x < 12; ++x) {
      const int32_t alpha = decoded.picture->alpha.PixelAt(x, y);
      ASSERT_EQ(alpha, alphas[(x + y) % 5]);
      const int32_t colors[] = {x * y * 7 % 256, y * 25, x * 20};  // of the original
      for (int c = 0; c < 3; ++c) {
        const int32_t color = alpha == 0 ? 0 : colors[c];
        const int32_t most = alpha == 0 ? 0 : 255 / alpha + 1;  // rounding error of eight bits
        EXPECT_NEAR(decoded.picture->image.PixelAt(x, y) >> 8 * c & 255, color, most) << x << ", " << y;
        EXPECT_EQ(plain.picture->image.PixelAt(x, y) >> 8 * c & 255, colors[c] * alpha / 255) << x << ", " << y;
      }
    }
  }
}

TEST(Hdp, CyclesOfDirectoriesEnd) {
  std::vector<uint8_t> file = ReadBytes(SourcePath("tests/formats/hdp/good/tiles-by-place.hdp"));
  const auto link = [&file] {  // after the first directory
    const size_t at = static_cast<size_t>(file[4] | file[5] << 8);
    return at + 2 + 12 * static_cast<size_t>(file[at]);
  }();
  // links back to itself
  std::copy_n(file.begin() + 4, 4, file.begin() + static_cast<ptrdiff_t>(link));
  const Decoded info = Describe(HdpInfo, file);
  EXPECT_EQ(info.status, Status::Ok);
  EXPECT_EQ(info.picture->pageCount, 1);
}

}  // namespace
}  // namespace fotomill::test
