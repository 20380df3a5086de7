#include "files/turned_jpeg.h"

#include <gtest/gtest.h>

#include "containers/jpeg_segments.h"
#include "core/choice_lists.h"
#include "formats/jpeg/jpeg.h"
#include "metadata/exif/exif_edit.h"
#include "metadata/exif/exif_walk.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/peers.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;
constexpr const char* kTransforms[] = {"-flip horizontal", "-rotate 180", "-flip vertical",
                                       "-transpose",       "-rotate 90",  "-transverse",
                                       "-rotate 270"};

Bytes Turned(const Bytes& file, const JpegTurnRequest& request, JpegTurnResult& result) {
  Bytes made;
  EXPECT_EQ(MakeTurnedJpeg(file, request, made, result), Status::Ok);
  return made;
}

bool LookAlike(const Bytes& a, const Bytes& b) {
  const Decoded one = Decode(JpegRead, a), other = Decode(JpegRead, b);
  return one.status == Status::Ok && other.status == Status::Ok &&
         SamePixels(one.picture->image, other.picture->image);
}

TEST(TurnedJpeg, MatchesJpegtran) {
  if (!HasProgram("jpegtran")) GTEST_SKIP();
  const ScopedSettings scoped;
  const TemporaryFolder folder;
  const std::string old = folder.Path("old.jpg"), theirs = folder.Path("theirs.jpg");
  for (const auto& [width, height] : {std::pair{64, 48}, {64, 44}, {41, 32}, {37, 21}, {7, 40}}) {
    for (int32_t form = -1; form <= choice::kSubsample420; ++form) {  // -1: gray
      const PicturePointer picture = PatternPicture(width, height, form < 0 ? 8 : 24);
      if (form < 0) picture->palette = GrayRamp();
      settings.JpegSubsample = std::max(form, 0);
      settings.WriteJpegProgressive = (width + form) % 2;
      const Bytes file = Encode(JpegWrite, *picture);
      WriteBytes(old, file);
      for (int32_t number = 2; number <= 8; ++number) {
        SCOPED_TRACE(testing::Message() << width << " x " << height << ", form " << form << ", " << kTransforms[number - 2]);
        const std::string command =
            std::string("jpegtran ") + kTransforms[number - 2] + " -outfile " + theirs + " ";
        JpegTurnResult result;
        const auto orientation = static_cast<Orientation>(number);
        const Bytes ours = Turned(file, {.turn = orientation}, result);
        if (RunShell(command + "-perfect " + old)) {
          ASSERT_EQ(result.method, JpegTurnMethod::Pixels) << result.obstacle.english;
          EXPECT_TRUE(LookAlike(ours, ReadBytes(theirs)));
          EXPECT_EQ(Decode(JpegRead, ours).picture->typeName.view(), Decode(JpegRead, file).picture->typeName.view());
          continue;
        }
        ASSERT_EQ(result.method, JpegTurnMethod::Tag);
        EXPECT_FALSE(result.obstacle.empty());
        EXPECT_TRUE(std::ranges::equal(std::span(ours).last(file.size() - 2), std::span(file).last(file.size() - 2)) ||
                    LookAlike(ours, file));
        EXPECT_EQ(ExifOrientation(Decode(JpegRead, ours).picture->metadata.exif), number);
        const Bytes trimmed = Turned(file, {.turn = orientation, .trim = true}, result);
        if (result.method == JpegTurnMethod::Tag) continue;  // no whole block
        ASSERT_EQ(result.method, JpegTurnMethod::Trimmed);
        ASSERT_TRUE(RunShell(command + "-trim " + old));
        EXPECT_TRUE(LookAlike(trimmed, ReadBytes(theirs)));
      }
    }
  }
}

// A file with everything that has to be updated: EXIF with sizes, orientation 6 and a thumbnail,
// XMP, two resolutions.
Bytes FullFile(int32_t width, int32_t height, const PicturePointer& thumbnail) {
  const ScopedSettings scoped;
  settings.JpegStoreDPI = 1;
  const PicturePointer picture = PatternPicture(width, height, 24);
  picture->metadata.exif = Hex(R"(4D4D002A 00000008 0003
      0100 0004 00000001 00000040    # width 64
      0101 0004 00000001 00000030    # height 48
      0112 0003 00000001 00060000 00000000)");
  EXPECT_TRUE(ReplaceExifThumbnail(picture->metadata.exif, Encode(JpegWrite, *thumbnail), 65527));
  for (const char c :
       std::string_view("<x tiff:Orientation = '6'/><tiff:Orientation>6</tiff:Orientation>")) {
    picture->metadata.xmp.push_back(static_cast<uint8_t>(c));
  }
  picture->metadata.icc.assign(70000, 7);
  picture->metadata.dpiX = 300;
  picture->metadata.dpiY = 150;
  picture->comment = {'h', 'i'};
  Bytes file = Encode(JpegWrite, *picture);
  file.insert(file.end(), {'m', 'o', 'r', 'e'});
  return file;
}

TEST(TurnedJpeg, RotatesThumbnailAndMetadata) {
  struct Row {
    Orientation turn;
    int32_t width, height, thumbnailWidth;  // of the thumbnail: 32 is whole blocks, 30 is not
    Orientation whole;
  };
  for (const Row& row : {Row{Orientation::Upright, 48, 64, 32, Orientation::QuarterRight},
                         Row{Orientation::QuarterRight, 64, 48, 30, Orientation::HalfTurn}}) {
    const Bytes file = FullFile(64, 48, PatternPicture(row.thumbnailWidth, 24, 24));
    JpegTurnResult result;
    const Bytes made = Turned(file, {.turn = row.turn}, result);
    ASSERT_EQ(result.method, JpegTurnMethod::Pixels);
    const PicturePointer picture = Decode(JpegRead, made).picture,
                         old = Decode(JpegRead, file).picture;
    EXPECT_EQ(picture->width, row.width);
    EXPECT_EQ(ExifOrientation(picture->metadata.exif), 1);
    EXPECT_EQ(picture->metadata.exif[21], row.width);
    EXPECT_EQ(picture->metadata.exif[33], row.height);
    EXPECT_EQ(picture->metadata.xmp.size(), old->metadata.xmp.size());
    EXPECT_EQ(std::ranges::count(picture->metadata.xmp, '1'), 2);
    EXPECT_EQ(picture->metadata.icc, old->metadata.icc);
    EXPECT_EQ(picture->metadata.dpiX, SwapsSides(row.whole) ? 150 : 300);
    EXPECT_EQ(picture->comment, old->comment);
    EXPECT_EQ(Bytes(made.end() - 6, made.end()), Hex("FFD9 6D6F7265"));
    ExifFindings findings;
    WalkExif(picture->metadata.exif, nullptr, &findings);
    const Decoded thumbnail = Decode(JpegRead, ExifThumbnail(picture->metadata.exif, findings));
    ASSERT_EQ(thumbnail.status, Status::Ok);
    EXPECT_EQ(thumbnail.picture->width, SwapsSides(row.whole) ? 24 : row.thumbnailWidth);
    // If its orientation tag is ignored, only the requested rotation applies; a rotation that the
    // tag alone can express changes nothing else.
    const Bytes raw = Turned(file, {.turn = Orientation::HalfTurn, .seenByExif = false}, result);
    EXPECT_EQ(Decode(JpegRead, raw).picture->width, 64);
    (void)Turned(file, {.turn = Orientation::QuarterLeft}, result);
    EXPECT_EQ(result.method, JpegTurnMethod::Tag);
    EXPECT_TRUE(result.obstacle.empty());
  }
}

TEST(TurnedJpeg, UnsuitableFilesKeepTheirPixels) {
  const Bytes sound = FullFile(64, 48, PatternPicture(32, 24, 24));
  Bytes flawed = sound, several = sound, split = sound;
  const auto middle = flawed.begin() + static_cast<std::ptrdiff_t>(flawed.size() - 400);
  middle[0] = 0xFF;
  middle[1] = 0xD9;  // an end marker in the middle of the scan
  const Bytes index = Hex("FFE20006 4D504600");
  several.insert(several.begin() + 2, index.begin(), index.end());
  JpegHead head;
  ASSERT_EQ(ParseJpegHead(sound, head), Status::Ok);
  // continues the first EXIF segment
  const Bytes second = Hex("FFE1000A 457869660000 0102");
  split.insert(split.begin() + static_cast<std::ptrdiff_t>(head.scan), second.begin(),
               second.end());
  for (const Bytes& file : {flawed, several, split}) {
    JpegTurnResult result;
    const Bytes made = Turned(file, {.turn = Orientation::HalfTurn}, result);
    EXPECT_EQ(result.method, JpegTurnMethod::Tag);
    EXPECT_EQ(ExifOrientation(Decode(JpegRead, made).picture->metadata.exif), 8);
    EXPECT_EQ(made.size(), file.size());
    EXPECT_EQ(Bytes(made.end() - 500, made.end()), Bytes(file.end() - 500, file.end()));
  }
  Bytes made;
  JpegTurnResult result;
  const JpegTurnRequest request{.turn = Orientation::HalfTurn};
  EXPECT_EQ(MakeTurnedJpeg(std::span(sound).first(sound.size() - 500), request, made, result), Status::FileReadError);
  EXPECT_EQ(MakeTurnedJpeg(Hex("FFD8FFD9"), request, made, result), Status::DamagedFile);
  EXPECT_TRUE(made.empty());
  const StopSource stop;
  stop.Stop();
  EXPECT_EQ(MakeTurnedJpeg(sound, {.turn = Orientation::HalfTurn, .stop = stop.Token()}, made, result),
            Status::FunctionCancelled);
  EXPECT_TRUE(made.empty());
}

TEST(TurnedJpeg, AddsTheOrientationInTagOrder) {
  const Bytes first = Hex(
      "4D4D002A 00000008 0002  010F 0002 00000004 41424300  0132 0002 00000002 44000000  00000000");
  for (const Bytes& block : {Bytes(), first, Hex("49492A00 08000000 0000 00000000")}) {
    Bytes changed = block;
    ASSERT_TRUE(PutExifOrientation(changed, 6));
    EXPECT_EQ(ExifOrientation(changed), 6);
    EXPECT_TRUE(std::equal(block.begin() + (block.empty() ? 0 : 8), block.end(), changed.begin() + (block.empty() ? 0 : 8)));
  }
  Bytes changed = first;
  ASSERT_TRUE(PutExifOrientation(changed, 6));
  EXPECT_EQ(Bytes(changed.begin() + static_cast<std::ptrdiff_t>(first.size()), changed.end()),
            Hex("0003 010F 0002 00000004 41424300  0112 0003 00000001 00060000  0132 0002 00000002 "
                "44000000  00000000"));
  Bytes odd = {1, 2, 3};
  EXPECT_FALSE(PutExifOrientation(odd, 6));
}

}  // namespace
}  // namespace fotomill::test
