// Checks every codec of the registry, including new ones automatically: it reads back what it
// writes, damaged files and system errors leave nothing half done, and progress is reported.
//
// Pictures in tests/formats/FORMAT/good are read, described and truncated; the expected
// picture is REFERENCE/NAME.bmp in the folder tests/formats/FORMAT/reference. Pictures in
// tests/formats/FORMAT/bad have the expected status of reading them before the extension:
// "huge-width.3.bmp".

#include <gtest/gtest.h>

#include <algorithm>
#include <charconv>
#include <filesystem>

#include "core/text.h"
#include "platform/paths.h"
#include "support/codecs.h"
#include "support/faults.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

namespace fs = std::filesystem;

// What a written picture keeps, for rows that cannot keep all of it.
enum class Keeps { All, Size, Nothing };
struct Keeping {
  std::string_view extension;
  Keeps keeps;
};
// clang-format off
constexpr Keeping kKeepings[] = {
    {"MAC", Keeps::Nothing},                        // one size for all pictures
    {"TXT", Keeps::Nothing},                        // characters, drawn larger
    {"UUE", Keeps::Size},                           // embedded JPEG
    {"FIT", Keeps::Size}, {"FTS", Keeps::Size},     // grayscale only
    {"JPG", Keeps::Size}, {"JPEG", Keeps::Size},    // lossy
    {"JPE", Keeps::Size}, {"JFI", Keeps::Size},
    {"JFIF", Keeps::Size},  {"WEBP", Keeps::Size},
    {"HDP", Keeps::Size},   {"WDP", Keeps::Size},
    {"HAM", Keeps::Size},                           // hold and modify
    {"PIC", Keeps::Size},                           // 6-bit colors
};
// clang-format on

Keeps KeepsOf(const FormatEntry& row) {
  for (const Keeping& keeping : kKeepings) {
    if (keeping.extension == row.extension.view()) return keeping.keeps;
  }
  return Keeps::All;
}

// The actual maximum depth of a row's writer. PIC has two formats, one of which is deeper.
int32_t DeepestOf(const FormatEntry& row) {
  return row.extension.view() == "PIC" ? 8 : static_cast<int32_t>(row.maxBits);
}

template <typename Action>
void ForEachRow(bool writable, Action action) {
  for (int32_t i = 0; i < formatCount; ++i) {
    const FormatEntry& row = FormatRow(i);
    if (!CanRead(row) || (writable && !CanWrite(row))) continue;
    SCOPED_TRACE(std::string(row.extension.view()));
    action(row);
  }
}

// The color at a position, 0x00RRGGBB, at any depth.
int32_t ColorAt(const PackedImage& image, int32_t x, int32_t y) {
  const int32_t value = image.PixelAt(x, y);
  if (image.Bits() == 24) return value;
  const uint8_t* entry = image.ColorTable().data() + 4 * static_cast<size_t>(value);
  return entry[2] << 16 | entry[1] << 8 | entry[0];
}

// Empty if both show the same, else the first difference.
std::string Difference(const PackedImage& a, const PackedImage& b) {
  if (a.Width() != b.Width() || a.Height() != b.Height()) return "size";
  for (int32_t y = 0; y < a.Height(); ++y) {
    for (int32_t x = 0; x < a.Width(); ++x) {
      if (ColorAt(a, x, y) != ColorAt(b, x, y))
        return "column " + std::to_string(x) + ", row " + std::to_string(y);
    }
  }
  return {};
}

std::vector<std::string> FilesIn(const fs::path& folder) {
  std::vector<std::string> files;
  if (!fs::is_directory(folder)) return files;
  for (const auto& entry : fs::directory_iterator(folder)) {
    if (entry.is_regular_file()) files.push_back(entry.path().string());
  }
  std::sort(files.begin(), files.end());
  return files;
}

// The files in tests/formats/*/`kind`.
std::vector<std::string> Fixtures(std::string_view kind) {
  std::vector<std::string> files;
  for (const auto& format : fs::directory_iterator(SourcePath("tests/formats"))) {
    for (std::string& file : FilesIn(format.path() / kind)) files.push_back(std::move(file));
  }
  return files;
}

// Valid pictures of readable formats: the fixtures and the project's samples.
std::vector<std::string> GoodPictures() {
  std::vector<std::string> files = Fixtures("good");
  for (std::string& file : FilesIn(SourcePath("samples"))) {
    if (!platform::FileNameOf(file).starts_with("damaged")) files.push_back(std::move(file));
  }
  std::erase_if(files, [](const std::string& file) {
    const int32_t row = FindFormatByName(file);
    return row == kNoFormat || !CanRead(FormatRow(row));
  });
  return files;
}

// Counts a codec's progress reports.
class CountingSink : public ProgressSink {
 public:
  void Begin() override { ++begun; }
  void Step(int32_t done, int32_t total) override {
    ++steps;
    inRange = inRange && done >= 0 && done <= total;
  }
  void End() override { ++ended; }
  int begun = 0, steps = 0, ended = 0;
  bool inRange = true;
};

void ExpectWellBehaved(const CountingSink& sink) {
  EXPECT_EQ(sink.begun, 1);
  EXPECT_EQ(sink.ended, 1);
  EXPECT_TRUE(sink.inRange);
}

Status InfoOf(const FormatEntry& row, const std::string& path, PictureRecord& picture) {
  return row.info(picture, RequestFor(path));
}

TEST(EveryCodec, ReadsBackWhatItWrote) {
  const TemporaryFolder folder;
  ForEachRow(true, [&](const FormatEntry& row) {
    const std::string path = folder.Path("picture." + LowerCase(row.extension.view()));
    for (const int32_t bits : {1, 2, 3, 4, 5, 6, 7, 8, 24}) {
      for (const int32_t width : {1, 3, 7, 8, 9, 33, 130}) {
        if (bits > DeepestOf(row) || row.limits.exact) continue;
        SCOPED_TRACE(std::to_string(bits) + " bits, width " + std::to_string(width));
        const PicturePointer picture = PatternPicture(width, 35, bits);
        picture->fileName.AssignCut(path);
        CountingSink sink;
        picture->progress = &sink;
        ASSERT_EQ(row.write(*picture, {}), Status::Ok);
        ExpectWellBehaved(sink);

        const PicturePointer described = NewPictureRecord(), back = NewPictureRecord();
        sink = CountingSink();
        back->progress = &sink;
        ASSERT_EQ(InfoOf(row, path, *described), Status::Ok);
        ASSERT_EQ(row.read(*back, RequestFor(path)), Status::Ok);
        fs::remove(path);
        ExpectWellBehaved(sink);
        EXPECT_GE(sink.steps, 35);
        EXPECT_EQ(described->width, back->image.Width());
        EXPECT_EQ(described->height, back->image.Height());
        EXPECT_EQ(NormalizedDepth(described->bitsPerPixel), back->image.Bits());
        if (KeepsOf(row) != Keeps::Nothing) {
          EXPECT_EQ(picture->image.Width(), back->image.Width());
          EXPECT_EQ(picture->image.Height(), back->image.Height());
        }
        if (KeepsOf(row) == Keeps::All) {
          EXPECT_EQ(Difference(picture->image, back->image), "");
        }
      }
    }
  });
}

TEST(EveryCodec, WritesUpToTheLimitsOfItsRow) {
  ForEachRow(true, [&](const FormatEntry& row) {
    const WriterLimits& limits = row.limits;
    if (limits.width == INT32_MAX) return;
    const int32_t one = limits.exact ? limits.width : 1, other = limits.exact ? limits.height : 1;
    const struct {
      int32_t width, height;
      Status status;
    } sizes[] = {
        {limits.width, other, Status::Ok},
        {one, limits.height, Status::Ok},
        {limits.width + 1, other, Status::UnsuitableImage},
        {one, limits.height + 1, Status::UnsuitableImage},
        {limits.width - 1, other, limits.exact ? Status::UnsuitableImage : Status::Ok},
        {one, limits.height - 1, limits.exact ? Status::UnsuitableImage : Status::Ok},
    };
    for (const auto& size : sizes) {
      SCOPED_TRACE(std::to_string(size.width) + " x " + std::to_string(size.height));
      const TemporaryFolder folder;
      const std::string path = folder.Path("picture." + LowerCase(row.extension.view()));
      const PicturePointer picture = PatternPicture(size.width, size.height, 1);
      // single-color, so that no packed row is too long
      for (int32_t y = 0; y < size.height; ++y) std::ranges::fill(picture->image.Row(y), 0);
      ASSERT_EQ(WritePicture(*picture, path, {}), size.status);
      ASSERT_EQ(fs::exists(path), size.status == Status::Ok);
      if (size.status != Status::Ok) continue;
      const PicturePointer back = NewPictureRecord();
      ASSERT_EQ(row.read(*back, RequestFor(path)), Status::Ok);
      EXPECT_EQ(back->image.Width(), size.width);
      EXPECT_EQ(back->image.Height(), size.height);
    }
  });
}

TEST(EveryCodec, KeepsAlphaAccordingToItsRow) {
  const TemporaryFolder folder;
  ForEachRow(true, [&](const FormatEntry& row) {
    if ((row.flags & FMT_ALPHA) == 0) return;
    const PicturePointer picture = PatternPicture(33, 7, 24);
    ASSERT_EQ(NewAlphaPlane(33, 7, picture->alpha), Status::Ok);
    for (int32_t y = 0; y < 7; ++y) {
      for (int32_t x = 0; x < 33; ++x)
        picture->alpha.Row(y)[static_cast<size_t>(x)] = static_cast<uint8_t>(x * 8 + y);
    }
    picture->alphaFlags = kHasAlpha;
    const std::string path = folder.Path("picture." + LowerCase(row.extension.view()));
    picture->fileName.AssignCut(path);
    ASSERT_EQ(row.write(*picture, {}), Status::Ok);
    const PicturePointer back = NewPictureRecord();
    ASSERT_EQ(row.read(*back, RequestFor(path)), Status::Ok);
    if (KeepsOf(row) == Keeps::All) {
      EXPECT_EQ(Difference(picture->image, back->image), "");
    }
    EXPECT_EQ(Difference(picture->alpha, back->alpha), "");
    EXPECT_EQ(back->alphaFlags & kHasAlpha, kHasAlpha);
  });
}

TEST(EveryCodec, ReadsGoodPictures) {
  const std::vector<std::string> files = GoodPictures();
  EXPECT_FALSE(files.empty());
  for (const std::string& file : files) {
    SCOPED_TRACE(file);
    PicturePointer described, picture;
    ASSERT_EQ(LoadPictureInfo(RequestFor(file), described), Status::Ok);
    ASSERT_EQ(LoadPicture(RequestFor(file), picture), Status::Ok);
    EXPECT_EQ(described->width, picture->image.Width());
    EXPECT_EQ(described->height, picture->image.Height());
    const fs::path path(file);
    const fs::path reference =
        path.parent_path().parent_path() / "reference" / path.filename().replace_extension(".bmp");
    if (!fs::exists(reference)) continue;
    PicturePointer expected;
    ASSERT_EQ(LoadPicture(RequestFor(reference), expected), Status::Ok);
    EXPECT_EQ(Difference(expected->image, picture->image), "");
  }
}

TEST(EveryCodec, RejectsBadPictures) {
  const std::vector<std::string> files = Fixtures("bad");
  EXPECT_FALSE(files.empty());
  for (const std::string& file : files) {
    SCOPED_TRACE(file);
    const std::string stem = fs::path(file).stem().extension().string();  // ".3"
    int32_t status = -1;
    if (!stem.empty()) std::from_chars(stem.data() + 1, stem.data() + stem.size(), status);
    const int32_t row = FindFormatByName(file);
    ASSERT_NE(row, kNoFormat);
    const PicturePointer picture = NewPictureRecord();
    EXPECT_EQ(StatusNumber(FormatRow(row).read(*picture, RequestFor(file))), status);
    EXPECT_TRUE(picture->image.Empty());
    EXPECT_TRUE(picture->alpha.Empty());
  }
}

// Info, details and reading of an arbitrary file: never both a picture and a failure.
void ExpectClean(const FormatEntry& row, const std::string& path) {
  const PicturePointer picture = NewPictureRecord();
  picture->fileName.AssignCut(path);
  const Status described = InfoOf(row, path, *picture);
  if (described == Status::Ok && row.details != nullptr) (void)row.details(*picture);
  CountingSink sink;
  picture->progress = &sink;
  const Status status = row.read(*picture, RequestFor(path));
  ExpectWellBehaved(sink);
  EXPECT_EQ(picture->image.Empty(), status != Status::Ok);
  if (status != Status::Ok) {
    EXPECT_TRUE(picture->alpha.Empty());
  }
  AnimationPointer animation;
  if (row.animate == nullptr || row.animate(RequestFor(path), animation) != Status::Ok) return;
  size_t frames = 0;
  while (animation->Next() == Status::Ok) ++frames;
  EXPECT_LE(frames, animation->Delays().size());
}

TEST(EveryCodec, FailsCleanlyOnTruncatedFiles) {
  const TemporaryFolder folder;
  for (const std::string& file : GoodPictures()) {
    SCOPED_TRACE(file);
    const FormatEntry& row = FormatRow(FindFormatByName(file));
    const std::string path = folder.Path(platform::FileNameOf(file));
    fs::copy_file(file, path);
    const size_t size = fs::file_size(path), step = std::max<size_t>(size / 40, 1);
    for (size_t length = size; length > 0;) {
      length -= length <= 512 ? 1 : std::min(step, length - 512);
      SCOPED_TRACE("cut to " + std::to_string(length));
      fs::resize_file(path, length);
      ExpectClean(row, path);
    }
  }
}

TEST(EveryCodec, FailsCleanlyOnSystemErrors) {
  for (const std::string& file : GoodPictures()) {
    SCOPED_TRACE(file);
    const FormatEntry& row = FormatRow(FindFormatByName(file));
    EXPECT_GT(ForEachFault([&] { ExpectClean(row, file); }), 0);
  }
}

TEST(EveryCodec, FailedWriteLeavesTheDestinationAlone) {
  ForEachRow(true, [&](const FormatEntry& row) {
    const TemporaryFolder folder;
    const std::string name = "picture." + LowerCase(row.extension.view());
    const PicturePointer picture =
        PatternPicture(row.limits.exact ? row.limits.width : 33,
                       row.limits.exact ? row.limits.height : 20, DeepestOf(row));
    picture->fileName.AssignCut(folder.Path(name));
    const int64_t faults = ForEachFault([&] {
      WriteText(folder.Path(name), "old");
      fs::remove(folder.Path("picture.pal"));
      CountingSink sink;
      picture->progress = &sink;
      const Status status = row.write(*picture, {});
      ExpectWellBehaved(sink);
      EXPECT_EQ(ReadText(folder.Path(name)) == "old", status != Status::Ok);
      std::vector<std::string> names = folder.Names();
      if (status == Status::Ok) std::erase(names, "picture.pal");  // second file of CUT
      EXPECT_EQ(names, std::vector<std::string>{name});
    });
    EXPECT_GT(faults, 2);
  });
}

TEST(EveryCodec, ReadsOrRejectsRealPictures) {
  if (CorpusFolder().empty()) GTEST_SKIP() << "FOTOMILL_CORPUS names no folder";
  size_t count = 0;
  for (const auto& entry : fs::recursive_directory_iterator(CorpusFolder())) {
    const std::string path = entry.path().string();
    const int32_t index = entry.is_regular_file() ? FindFormatByName(path) : kNoFormat;
    if (index == kNoFormat || !CanRead(FormatRow(index)) || path.size() > 260) continue;
    SCOPED_TRACE(path);
    const FormatEntry& row = FormatRow(index);
    const PicturePointer described = NewPictureRecord(), picture = NewPictureRecord();
    const Status info = InfoOf(row, path, *described);
    const Status read = row.read(*picture, RequestFor(path));
    EXPECT_EQ(picture->image.Empty(), read != Status::Ok);
    if (read != Status::Ok) continue;
    EXPECT_EQ(info, Status::Ok);
    EXPECT_EQ(picture->image.Width(), described->width);
    EXPECT_EQ(picture->image.Height(), described->height);
    ++count;
  }
  EXPECT_GT(count, 0u);
}

}  // namespace
}  // namespace fotomill::test
