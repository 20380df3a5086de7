#include <gtest/gtest.h>
#include <lcms2.h>

#include <algorithm>
#include <atomic>
#include <condition_variable>
#include <cstring>

#include "catalog/thumbnails/thumbnail_database.h"
#include "catalog/thumbnails/thumbnail_file.h"
#include "core/choice_lists.h"
#include "core/data_folder.h"
#include "desktop/models/thumbnails/placeholder.h"
#include "desktop/models/thumbnails/thumbnail_loader.h"
#include "desktop/models/view/photo_facts.h"
#include "desktop/models/view/view_drawing.h"
#include "desktop/models/view/view_picture.h"
#include "desktop/models/view/view_transform.h"
#include "metadata/exif/exif_edit.h"
#include "registry/registry.h"
#include "support/codecs.h"
#include "support/exif_blocks.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::desktop {
namespace {

TEST(ViewTransform, FitsAndZoomsAtThePointer) {
  ViewTransform view;
  view.SetPicture(400, 200);
  view.SetWindow(200, 200);
  EXPECT_EQ(view.Scale(), 0.5);
  EXPECT_EQ(view.X(), 0);
  EXPECT_EQ(view.Y(), 50);
  view.SetMode(ZoomMode::Fill);
  EXPECT_EQ(view.ShownHeight(), 200);
  EXPECT_EQ(view.X(), -100);
  // The point of the picture under the pointer stays there.
  view.ZoomTo(4, 50, 150);
  EXPECT_EQ(view.X(), 50 - 4 * 150);
  EXPECT_EQ(view.Y(), 150 - 4 * 150);
  view.Pan(10'000, -10'000);
  EXPECT_EQ(view.X(), 0);
  EXPECT_EQ(view.Y(), 200 - 800);
  view.ZoomTo(0.00001, 0, 0);
  EXPECT_EQ(view.ShownWidth(), 4);
  // The same relative part of another picture; in another window at the same multiple of its fit.
  view.SetPicture(800, 400);
  view.ZoomTo(1, 100, 100);
  view.Pan(-100, -30);
  view.SetPicture(1600, 800);
  EXPECT_EQ(view.Scale(), 1);
  const ViewPlace place = view.Place();
  ViewTransform other;
  other.SetPicture(1600, 800);
  other.SetWindow(400, 400);
  other.SetPlace(place);
  EXPECT_EQ(other.Scale(), 2);
  EXPECT_EQ(other.X() - 200, 2 * (view.X() - 100));
  EXPECT_EQ(other.Y() - 200, 2 * (view.Y() - 100));
  other.StartAfresh(choice::kZoomFill);
  EXPECT_EQ(other.Scale(), 0.5);
  EXPECT_EQ(other.X(), -200);
  // Small pictures are not enlarged to fit unless requested.
  view.SetPicture(10, 10);
  view.SetMode(ZoomMode::Fit);
  EXPECT_EQ(view.Scale(), 1);
}

PackedImage Ramp(int32_t width, int32_t height) {
  PackedImage image;
  EXPECT_EQ(NewPackedImage(width, height, nullptr, 24, image), Status::Ok);
  for (int32_t y = 0; y < height; ++y) {
    for (int32_t x = 0; x < 3 * width; ++x)
      image.Row(y)[static_cast<size_t>(x)] = static_cast<uint8_t>(40 * y + x);
  }
  return image;
}

// Green of the pixels in a row of the canvas, 255 for the blue background.
std::vector<int> Greens(const RgbImage& canvas, int32_t y) {
  std::vector<int> values;
  for (int32_t x = 0; x < canvas.width; ++x) values.push_back(canvas.Row(y)[3 * x + 1]);
  return values;
}

TEST(DrawView, PositionsCopiesAndSamples) {
  const PackedImage image = Ramp(2, 2);  // greens 1 4 / 41 44
  const PackedImage opaque;
  const ViewSource source{image, opaque};
  const Backdrop plain{.around = 0x00ff00};
  RgbImage canvas = FilledImage(6, 4, 0);
  ViewTransform view;
  view.SetPicture(2, 2);
  view.SetWindow(6, 4);
  DrawView(source, view, plain, true, canvas);
  EXPECT_EQ(Greens(canvas, 0), (std::vector<int>{255, 255, 255, 255, 255, 255}));
  EXPECT_EQ(Greens(canvas, 1), (std::vector<int>{255, 255, 1, 4, 255, 255}));
  EXPECT_EQ(canvas.Row(1)[6], 2);  // red first
  view.ZoomToMiddle(2);
  DrawView(source, view, plain, false, canvas);
  EXPECT_EQ(Greens(canvas, 0), (std::vector<int>{255, 1, 1, 4, 4, 255}));
  EXPECT_EQ(Greens(canvas, 2), (std::vector<int>{255, 41, 41, 44, 44, 255}));
  DrawView(source, view, plain, true, canvas);
  EXPECT_EQ(Greens(canvas, 0), (std::vector<int>{255, 1, 2, 3, 4, 255}));
  // At maximum zoom, panned to the end, nothing is read beyond the picture.
  view.ZoomTo(64, 0, 0);
  view.Pan(-1000, -1000);
  DrawView(source, view, plain, true, canvas);
  EXPECT_EQ(Greens(canvas, 3), (std::vector<int>(6, 44)));
}

TEST(DrawView, CheckerboardShowsThroughAndStaysInPlace) {
  const PackedImage image = Ramp(4, 2);  // greens 1 4 7 10 / 41 44 47 50
  PackedImage alpha;
  ASSERT_EQ(NewAlphaPlane(4, 2, alpha), Status::Ok);
  alpha.Row(0)[3] = 255;
  alpha.Row(1)[0] = 128;
  const ViewSource source{image, alpha};
  const Backdrop squares{
      .around = 0x00ff00, .squares = true, .square = {0x006400, 0x00c800}, .side = 2};
  RgbImage canvas = FilledImage(6, 4, 0);
  ViewTransform view;
  view.SetPicture(4, 2);
  view.SetWindow(6, 4);
  DrawView(source, view, squares, true, canvas);
  EXPECT_EQ(Greens(canvas, 1), (std::vector<int>{255, 100, 200, 200, 10, 255}));
  EXPECT_EQ(Greens(canvas, 2), (std::vector<int>{255, (200 * 127 + 41 * 128 + 127) / 255, 100, 100, 200, 255}));
  view.ZoomToMiddle(2);
  view.Pan(-1, 0);
  DrawView(source, view, squares, false, canvas);
  EXPECT_EQ(Greens(canvas, 0), (std::vector<int>{100, 100, 200, 200, 10, 10}));
  // Interpolation ignores the colors of transparent pixels: from 10 to the background square
  // without a shade of 7.
  view.ZoomTo(4, 0, 0);
  view.Pan(-100, 0);
  DrawView(source, view, {.around = 0x000a00}, true, canvas);
  EXPECT_EQ(Greens(canvas, 0), (std::vector<int>(6, 10)));
}

TEST(ViewPicture, SaysWhatIsWrongWithItsFile) {
  const test::TemporaryFolder folder;
  test::WriteText(folder.Path("a.png"), "%PDF-1.4 and no more");
  const ViewPicturePointer view = LoadViewPicture({.path = folder.Path("a.png")});
  EXPECT_NE(view->status, Status::Ok);
  EXPECT_NE(view->problem.find(" It looks like "), std::string::npos) << view->problem;
}

TEST(ViewPicture, AppliesItsProfileAndKeepsItsAlpha) {
  const test::TemporaryFolder folder;
  const std::string path = folder.Path("a.png");
  PicturePointer picture = NewPictureRecord();
  picture->image = Ramp(8, 8);
  picture->width = picture->height = 8;
  picture->bitsPerPixel = 24;
  ASSERT_EQ(NewAlphaPlane(8, 8, picture->alpha), Status::Ok);
  picture->alphaFlags = kHasAlpha;
  cmsToneCurve* const linear = cmsBuildGamma(nullptr, 1);
  cmsToneCurve* const curves[] = {linear, linear, linear};
  const cmsCIExyY white = {0.3127, 0.3290, 1};
  const cmsCIExyYTRIPLE primaries = {{0.64, 0.33, 1}, {0.3, 0.6, 1}, {0.15, 0.06, 1}};
  const cmsHPROFILE profile = cmsCreateRGBProfile(&white, &primaries, curves);
  cmsUInt32Number size = 0;
  cmsSaveProfileToMem(profile, nullptr, &size);
  picture->metadata.icc.resize(size);
  cmsSaveProfileToMem(profile, picture->metadata.icc.data(), &size);
  cmsCloseProfile(profile);
  cmsFreeToneCurve(linear);
  ASSERT_EQ(WritePicture(*picture, path, {}), Status::Ok);

  ViewRequest request{path, 0, 4, 4, {.profiles = true, .keepAlpha = true}};
  const ViewPicturePointer managed = LoadViewPicture(request);
  ASSERT_EQ(managed->status, Status::Ok);
  EXPECT_EQ(managed->picture->image.Row(1)[0], 110);  // linear light 40, in sRGB
  EXPECT_EQ(managed->picture->alpha.Width(), 8);
  EXPECT_EQ(managed->fitted.alpha.Width(), 4);
  request.look = {};
  const ViewPicturePointer plain = LoadViewPicture(request);
  EXPECT_EQ(plain->picture->image.Row(1)[0], 0xc0);  // the background: all is transparent
  EXPECT_TRUE(plain->picture->alpha.Empty());
  EXPECT_GT(managed->Bytes(), plain->Bytes());
}

TEST(PhotoFacts, SummarizeExposure) {
  const std::vector<std::string> little = {"Acme", "1/60 s"};
  EXPECT_EQ(PhotoFacts(test::BigEndianBlock()), little);
  EXPECT_EQ(PhotoFacts(test::LittleEndianBlock()), little);
  test::BlockBuilder builder;
  const auto text = [&](const char* words) {
    return builder.Bytes({words, words + std::strlen(words) + 1});
  };
  const uint32_t make = text("ACME CORPORATION"), model = text("ACME 5D  "), lens = text("24-70mm"),
                 date = text("2001:05:19 18:36:41");
  const uint32_t exposure = builder.Bytes({5, 0, 0, 0, 2, 0, 0, 0}),
                 aperture = builder.Bytes({28, 0, 0, 0, 10, 0, 0, 0}),
                 length = builder.Bytes({50, 0, 0, 0, 0, 0, 0, 0});  // divided by zero
  builder.Patch32(4, builder.Directory({{0x010f, 2, 17, make},
                                        {0x0110, 2, 10, model},
                                        {0x829a, 5, 1, exposure},
                                        {0x829d, 5, 1, aperture},
                                        {0x8827, 3, 1, 400},
                                        {0x9003, 2, 20, date},
                                        {0x920a, 5, 1, length},
                                        {0xa434, 2, 8, lens}}));
  EXPECT_EQ(PhotoFacts(builder.block),
            (std::vector<std::string>{"ACME 5D", "24-70mm", "2.5 s   f/2.8   ISO 400", "2001-05-19 18:36:41"}));
}

TEST(Thumbnail, DatabaseModesStoreThumbnails) {
  const test::TemporaryFolder folder;
  const std::string picture = folder.Path("a.bmp");
  std::filesystem::copy_file(test::SourcePath("samples/bmp-true-color.bmp"), picture);
  ThumbnailRequest request{picture, 1, 1, 96, choice::kLocalDatabase};
  for (int time = 0; time < 2; ++time) {  // the second time from the database
    const ThumbnailPointer thumbnail = LoadThumbnail(request);
    ASSERT_EQ(thumbnail->status, Status::Ok);
    EXPECT_EQ(thumbnail->pixels.width, 96);
    EXPECT_EQ(thumbnail->width, 150) << "what is known of the picture is always the same";
    KeepThumbnailRecords();
    EXPECT_EQ(std::filesystem::file_size(folder.Path("Fotomill.tdb")), 60u + 28442u);
  }
  request.path = folder.Path("a.webp");
  std::filesystem::copy_file(test::SourcePath("tests/formats/webp/good/frames.webp"), request.path);
  for (int time = 0; time < 2; ++time) {
    const ThumbnailPointer thumbnail = LoadThumbnail(request);
    EXPECT_EQ(thumbnail->pages, 3);
    EXPECT_TRUE(thumbnail->animated && thumbnail->alpha);
    KeepThumbnailRecords();
  }
  // In a large view the record is enlarged as the settings say, and is not the picture itself.
  request = {picture, 1, 1, 176, choice::kLocalDatabase};
  const RgbImage enlarged = LoadThumbnail(request)->pixels;
  EXPECT_EQ(enlarged.width, 176);
  request.options.zoomFilter = choice::kNearest;
  EXPECT_NE(LoadThumbnail(request)->pixels.bytes, enlarged.bytes);
  request.options.fastZoom = true;
  EXPECT_NE(LoadThumbnail(request)->pixels.bytes, enlarged.bytes);
  // Of a picture that has changed since, nothing that was kept is shown.
  const PicturePointer gray = test::PatternPicture(60, 30, 24);
  ASSERT_EQ(WritePicture(*gray, picture, {}), Status::Ok);
  request = {picture, 2, 1, 96, choice::kLocalDatabase};
  EXPECT_EQ(LoadThumbnail(request)->pixels.width, 60);
  KeepThumbnailRecords();
  EXPECT_EQ(std::filesystem::file_size(folder.Path("Fotomill.tdb")), 60u + 3 * 28442u);
  request = {folder.Path("none.bmp"), 1, 1, 96, choice::kLocalDatabase};
  EXPECT_EQ(LoadThumbnail(request)->status, Status::FileOpenError);
}

// A picture without a thumbnail file is decoded once; what the database cannot show well is made
// again.
TEST(Thumbnail, DiskBasedModeKeepsCopies) {
  const test::TemporaryFolder folder;
  std::filesystem::create_directory(folder.Path("data"));
  SetDataFolder(folder.Path("data"));
  const std::string picture = folder.Path("a.bmp"), small = folder.Path("small.bmp");
  const auto usual = [](const std::string& path, int32_t side) {
    return ThumbnailRequest{path, 1, 1, side, choice::kDiskBased};
  };
  const auto kept = [&] {
    KeepThumbnailRecords();
    std::error_code none;
    const auto size = std::filesystem::file_size(folder.Path("data/Fotomill.tdb"), none);
    return none ? 0 : (size - 60) / 28442;
  };
  ASSERT_EQ(WritePicture(*test::PatternPicture(60, 30, 24), small, {}), Status::Ok);
  std::filesystem::copy_file(test::SourcePath("samples/bmp-true-color.bmp"), picture);
  ThumbnailRequest unkept = usual(picture, 96), faces = unkept, virtually = unkept;
  unkept.options.keep = false;
  faces.options.onFacesUnkept = true;
  virtually.mode = choice::kVirtual;
  for (const ThumbnailRequest& request : {unkept, faces, virtually, usual(small, 96)}) {
    EXPECT_FALSE(LoadThumbnail(request)->pixels.Empty());
    EXPECT_EQ(kept(), 0u);
  }
  const RgbImage made = LoadThumbnail(usual(picture, 96))->pixels;
  EXPECT_EQ(kept(), 1u);
  std::filesystem::remove(picture);
  const ThumbnailPointer again = LoadThumbnail(usual(picture, 96));
  EXPECT_EQ(again->pixels.bytes, made.bytes);
  ThumbnailRequest standIn = usual(picture, 48), changed = usual(picture, 96);
  standIn.standIn = true;
  changed.size = 2;
  EXPECT_EQ(LoadThumbnail(standIn)->pixels.width, 48);
  for (const ThumbnailRequest& request : {unkept, faces, changed, usual(picture, 176)})
    EXPECT_EQ(LoadThumbnail(request)->status, Status::FileOpenError);
  SetDataFolder({});
}

// Badges are the same wherever the pixels came from.
TEST(Thumbnail, FactsDoNotDependOnTheSource) {
  const test::TemporaryFolder folder;
  const std::string picture = folder.Path("a.png");
  const PicturePointer made = test::PatternPicture(120, 60, 24);
  ASSERT_EQ(NewAlphaPlane(120, 60, made->alpha), Status::Ok);
  std::ranges::fill(made->alpha.Rows(), uint8_t{200});
  made->alphaFlags |= kHasAlpha;
  ASSERT_EQ(WritePicture(*made, picture, {}), Status::Ok);
  ThumbnailRequest request{picture, 1, 1, 96, choice::kVirtual};
  for (const char* source : {"the picture", "the record in memory", "the thumbnail file"}) {
    SCOPED_TRACE(source);
    const ThumbnailPointer thumbnail = LoadThumbnail(request);
    EXPECT_TRUE(thumbnail->alpha && thumbnail->width == 120 && thumbnail->pages == 1);
    if (source == std::string("the record in memory")) {
      ASSERT_EQ(WriteThumbnail(picture, {}), Status::Ok);
    }
  }
  request.options.fromFiles = false;
  std::filesystem::remove(picture);
  EXPECT_EQ(LoadThumbnail(request)->pixels.width, 96) << "it comes from memory";
  request.size = 2;
  EXPECT_EQ(LoadThumbnail(request)->status, Status::FileOpenError);
}

// A small view does not leave a blurred record behind.
TEST(Thumbnail, RecordsAreMadeOfEnoughPixels) {
  const test::TemporaryFolder folder;
  const std::string picture = folder.Path("a.jpg");
  ASSERT_EQ(WritePicture(*test::PatternPicture(1600, 1200, 24), picture, {}), Status::Ok);
  ThumbnailRecord wanted, kept;
  ASSERT_EQ(MakeThumbnailOfFile(picture, {}, wanted), Status::Ok);
  const ThumbnailRequest request{picture, 1, 1, 48, choice::kLocalDatabase};
  ASSERT_EQ(LoadThumbnail(request)->pixels.width, 48);
  KeepThumbnailRecords();
  ASSERT_TRUE(FindDatabaseThumbnail(kept, picture, folder.Path("Fotomill.tdb")));
  EXPECT_EQ(kept.bytes, wanted.bytes);
}

TEST(Placeholder, HasTwoKindsInAnySizeOnAnyBackground) {
  for (const int32_t side : {16, 48, 96, 176, 300}) {
    const RgbImage made = PlaceholderPixels(false, side, 0x332211),
                   none = PlaceholderPixels(true, side, 0x332211);
    ASSERT_TRUE(made.width == side && made.height == side && none.width == side);
    EXPECT_NE(made.bytes, none.bytes);
    EXPECT_EQ(std::vector(made.bytes.begin(), made.bytes.begin() + 3),
              (std::vector<uint8_t>{0x11, 0x22, 0x33}));
  }
}

// A placeholder is the file's embedded thumbnail, upright like the picture; if there is none,
// nothing is decoded.
TEST(Thumbnail, PlaceholdersComeFromExif) {
  const test::TemporaryFolder folder;
  const std::string small = folder.Path("small.jpg"), large = folder.Path("large.jpg"),
                    plain = folder.Path("plain.bmp");
  ASSERT_EQ(WritePicture(*test::PatternPicture(16, 12, 24), small, {}), Status::Ok);
  const PicturePointer picture = test::PatternPicture(400, 300, 24);
  // rotated clockwise
  picture->metadata.exif = test::Hex("49492A00 08000000 0100 1201 0300 01000000 06000000 00000000");
  ASSERT_TRUE(ReplaceExifThumbnail(picture->metadata.exif, test::ReadBytes(small), 65527));
  ASSERT_EQ(WritePicture(*picture, large, {}), Status::Ok);
  std::filesystem::copy_file(test::SourcePath("samples/bmp-true-color.bmp"), plain);
  ThumbnailRequest request{large, 1, 1, 176, choice::kDiskBased, true};
  const ThumbnailPointer standIn = LoadThumbnail(request);
  ASSERT_NE(standIn, nullptr);
  EXPECT_TRUE(standIn->standIn);
  EXPECT_EQ(standIn->pixels.width, 12);
  request.standIn = false;
  EXPECT_EQ(LoadThumbnail(request)->pixels.height, 176);
  request = {plain, 1, 1, 96, choice::kDiskBased, true};
  EXPECT_EQ(LoadThumbnail(request), nullptr);
  ASSERT_EQ(WriteThumbnail(plain, {}), Status::Ok);
  request.side = 48;
  const ThumbnailPointer ready = LoadThumbnail(request);  // the final one, smaller than its record
  ASSERT_NE(ready, nullptr);
  EXPECT_FALSE(ready->standIn);
  EXPECT_EQ(ready->pixels.width, 48);
}

std::mutex gate;
std::condition_variable opened;
std::atomic<int> loads{0};
bool open = false;

ThumbnailPointer SlowThumbnail(const ThumbnailRequest& request) {
  ++loads;
  std::unique_lock lock(gate);
  opened.wait(lock, [] { return open; });
  auto thumbnail = std::make_shared<Thumbnail>();
  thumbnail->width = static_cast<int32_t>(request.size);
  return thumbnail;
}

TEST(ThumbnailLoader, DropsOutdatedRequests) {
  std::atomic<int> wakes{0};
  ThumbnailLoader loader(
      1, [&] { ++wakes; }, SlowThumbnail);
  const auto request = [](const char* path) { return ThumbnailRequest{path, 1, 2, 96, 0}; };
  loader.Want({request("a"), request("b"), request("c")});
  while (loads == 0) std::this_thread::yield();
  loader.Want({request("a"), request("d")});  // a is in progress
  {
    const std::lock_guard lock(gate);
    open = true;
  }
  opened.notify_all();
  while (loads < 2 || loader.Pending() > loader.FetchResults().size()) {
    if (loads == 2 && loader.Pending() == 0) break;
    std::this_thread::yield();
  }
  EXPECT_EQ(loads, 2);
  EXPECT_GT(wakes, 0);
}

TEST(ThumbnailLoader, LoadsEachThumbnailOnce) {
  static std::atomic<int> calls;
  static std::atomic<bool> idle;
  const auto load = [](const ThumbnailRequest& request) {
    ++calls;
    auto thumbnail = std::make_shared<Thumbnail>();
    thumbnail->standIn = request.standIn && request.path == "embedded";
    return ThumbnailPointer(request.standIn && request.path == "none" ? nullptr : thumbnail);
  };
  ThumbnailLoader loader(
      1, [] {}, load, [] { idle = true; });
  std::vector<ThumbnailRequest> requests;
  for (const bool standIn : {true, false}) {
    for (const char* path : {"ready", "embedded", "none"})
      requests.push_back({path, 1, 2, 96, 0, standIn});
  }
  loader.Want(requests);
  while (!idle) std::this_thread::yield();
  EXPECT_EQ(calls, 5);
  std::string order;
  for (const auto& result : loader.FetchResults()) {
    order += result.request.path + (result.request.standIn ? "?" : "") +
             (result.thumbnail == nullptr ? "- " : " ");
  }
  EXPECT_EQ(order, "ready embedded? none?- embedded none ");
}

TEST(ThumbnailLoader, SurvivesFilesThatNeedTooMuchMemory) {
  static std::atomic<bool> idle;
  const auto load = [](const ThumbnailRequest& request) -> ThumbnailPointer {
    if (request.path == "huge") throw std::bad_alloc();
    return std::make_shared<Thumbnail>();
  };
  ThumbnailLoader loader(
      1, [] {}, load, [] { idle = true; });
  loader.Want({{"huge", 1, 2, 96, 0}, {"small", 1, 2, 96, 0}});
  while (!idle) std::this_thread::yield();
  const auto results = loader.FetchResults();
  ASSERT_EQ(results.size(), 2u);
  EXPECT_EQ(results[0].thumbnail->status, Status::MemoryAllocationError);
  EXPECT_EQ(results[1].thumbnail->status, Status::Ok);
  EXPECT_EQ(loader.Pending(), 0u);
}

TEST(ThumbnailCache, KeepsTheLatestWithinItsLimit) {
  const auto picture = [] {
    auto thumbnail = std::make_shared<Thumbnail>();
    thumbnail->pixels = FilledImage(10, 10, 0);
    return thumbnail;
  };
  ThumbnailCache cache(3 * picture()->Bytes());
  const auto request = [](const char* path, int64_t modified) {
    return ThumbnailRequest{path, modified, 0, 96, 0};
  };
  for (const char* path : {"a", "b", "c"}) cache.Put(request(path, 1), picture());
  EXPECT_NE(cache.Find(request("a", 1)), nullptr);
  cache.Put(request("d", 1), picture());
  EXPECT_EQ(cache.Count(), 3u);
  EXPECT_EQ(cache.Find(request("b", 1)), nullptr);
  EXPECT_EQ(cache.Find(request("a", 2)), nullptr);  // the file has changed
  EXPECT_NE(cache.FindAny("a"), nullptr);
  cache.Put(request("a", 2), picture());
  EXPECT_EQ(cache.Bytes(), 3 * picture()->Bytes());
  cache.SetCapacity(picture()->Bytes());
  EXPECT_EQ(cache.Count(), 1u);
  EXPECT_NE(cache.Find(request("a", 2)), nullptr);
}

}  // namespace
}  // namespace fotomill::desktop
