#include <gtest/gtest.h>

#include "core/limits.h"
#include "operations/engine.h"
#include "operations/operations.h"
#include "processing/pictures.h"
#include "processing/promote.h"

namespace fotomill::test {
namespace {

const EngineOptions kSerial;

// All kinds of pictures: every depth, one pixel, one row, one column, with alpha.
PicturePointer TestPicture(int32_t width, int32_t height, int32_t bits, bool alpha) {
  PicturePointer picture = MakePicture(
      width, height, [](int32_t x, int32_t y) { return Scatter(x / 3, y / 2) & 0xffffff; });
  if (bits < 24) {
    Palette palette = GrayRamp();
    for (size_t i = 0; i < palette.size(); i += 3) palette[i] = static_cast<uint8_t>(255 - i / 4);
    EXPECT_EQ(NewPackedImage(width, height, &palette, bits, picture->image), Status::Ok);
    picture->palette = palette;
    picture->bitsPerPixel = bits;
    for (int32_t y = 0; y < height; ++y) {
      for (int32_t i = 0; i < (width * bits + 7) / 8; ++i)
        picture->image.Row(y)[static_cast<size_t>(i)] = static_cast<uint8_t>(Scatter(i, y));
    }
  }
  if (alpha)
    AddAlpha(*picture,
             [](int32_t x, int32_t y) { return static_cast<int32_t>(Scatter(y, x) & 0xff); });
  return picture;
}

// The visible pixels of a picture, independent of its depth.
std::vector<uint8_t> Looks(const PictureRecord& picture) {
  std::vector<uint8_t> bytes;
  BgrRows rows;
  EXPECT_EQ(rows.Open(picture.image), Status::Ok);
  for (int32_t y = 0; y < picture.image.Height(); ++y) {
    const uint8_t* bgr = rows.Row(y);
    bytes.insert(bytes.end(), bgr, bgr + 3 * picture.image.Width());
    if (picture.alpha.Empty()) continue;
    const auto alpha = picture.alpha.Row(y).first(static_cast<size_t>(picture.alpha.Width()));
    bytes.insert(bytes.end(), alpha.begin(), alpha.end());
  }
  return bytes;
}

Recipe Read(const std::string& text) {
  Recipe recipe;
  for (const Mistake& mistake : ReadRecipe(text, {}, recipe))
    ADD_FAILURE() << text << ": " << mistake.Text();
  return recipe;
}

void ExpectWhole(const PictureRecord& picture) {
  EXPECT_EQ(picture.width, picture.image.Width());
  EXPECT_EQ(picture.height, picture.image.Height());
  EXPECT_EQ(picture.bitsPerPixel, picture.image.Bits());
  if (picture.alpha.Empty()) return;
  EXPECT_EQ(picture.alpha.Width(), picture.image.Width());
  EXPECT_EQ(picture.alpha.Height(), picture.image.Height());
}

// A line with each number at its minimum or maximum, and everything else at its default; empty if
// that is invalid.
std::string LineAt(const Operation& operation, bool most) {
  std::string line = operation.name;
  for (const Parameter& row : operation.parameters) {
    const bool number = row.kind == ParameterKind::kNumber || row.kind == ParameterKind::kInteger ||
                        row.kind == ParameterKind::kPercent || row.kind == ParameterKind::kAngle;
    if (!number) continue;
    line += " " + std::string(row.name) + "=" + std::to_string(most ? row.most : row.least);
  }
  return line;
}

TEST(EveryOperation, HasAValidRow) {
  for (const Operation* operation : Operations()) {
    SCOPED_TRACE(operation->name);
    EXPECT_EQ(FindOperation(operation->name), operation) << "two operations of one name";
    EXPECT_EQ(operation->point != nullptr, operation->works == Works::Point);
    EXPECT_EQ(operation->apply != nullptr, operation->works != Works::Point);
    EXPECT_EQ(operation->reach != nullptr, operation->works == Works::Neighborhood);
    EXPECT_NE(std::string(operation->help), "");
    for (const Parameter& row : operation->parameters) {
      SCOPED_TRACE(row.name);
      EXPECT_NE(std::string(row.help), "");
      EXPECT_LE(row.least, row.most);
      Value value;
      if (row.preset != nullptr && *row.preset != '\0') {
        EXPECT_EQ(ReadValue(row, row.preset, value).english, "");
      }
    }
    const Recipe recipe = Read(operation->example);
    EXPECT_EQ(PrintRecipe(Read(PrintRecipe(recipe))), PrintRecipe(recipe));
  }
}

// What limits alone do not try: lengths beyond the picture, negative ones, and empty texts.
constexpr const char* kFurtherLines[] = {
    "caption '' size=300px frame frame-size=40 padding=90",
    "caption 'a\\n\\nb' size=1px char-spacing=-50 line-spacing=-50 position=above",
    "caption '%F %W' size=400% background=#00000000 padding=0",
    "text x size=90px margin=-60 outline=70 shadow=80 rotation=33 box frame frame-size=9",
    "text 'a b c' top-left size=1px margin=50 opacity=0 char-spacing=200",
    "text '' size=40px box background=#ff000080 padding=300",
    "watermark x tiled size=0.1 margin=-3 rotation=45",
    "watermark 'x\\ny' size=100 outline=200% shadow=200% opacity=100",
    "matt 300% bevel=raised bevel-size=400 inner-border inner-size=99 outer-border outer-size=99",
    "matt 0 bevel=sunken bevel-size=0",
    "border 200 #00ff0000",
    "shadow -90 70 blur=60 background=#ffffff00",
    "round-corners 300",
};

TEST(EveryOperation, WorksOnEveryKindOfPicture) {
  std::vector<std::string> lines(std::begin(kFurtherLines), std::end(kFurtherLines));
  for (const std::string& line : lines) (void)Read(line);
  for (const Operation* operation : Operations()) {
    for (const std::string& line :
         {std::string(operation->example), LineAt(*operation, false), LineAt(*operation, true)})
      lines.push_back(line);
  }
  {
    for (const std::string& line : lines) {
      SCOPED_TRACE(line);
      Recipe recipe;
      if (!ReadRecipe(line, {}, recipe).empty()) continue;  // it has a required parameter
      PictureRecord none;
      EXPECT_EQ(ApplySteps(none, recipe.common, kSerial), Status::EmptyImage);
      for (const int32_t bits : {1, 4, 8, 24}) {
        for (const auto& [width, height] : {std::pair{1, 1}, {1, 9}, {40, 1}, {37, 23}}) {
          for (const bool alpha : {false, true}) {
            SCOPED_TRACE(std::to_string(width) + "x" + std::to_string(height) + ", bits " + std::to_string(bits));
            const PicturePointer serial = TestPicture(width, height, bits, alpha),
                                 parallel = TestPicture(width, height, bits, alpha);
            const Status status = ApplySteps(*serial, recipe.common, kSerial);
            EXPECT_EQ(ApplySteps(*parallel, recipe.common, {.work = {.threads = 0}, .facts = {}}), status);
            if (status != Status::Ok) continue;
            ExpectWhole(*serial);
            EXPECT_EQ(Looks(*serial), Looks(*parallel)) << "depends on threads";
          }
        }
      }
    }
  }
}

TEST(EveryOperation, TreatsPalettePicturesLikePromotedOnes) {
  for (const Operation* operation : Operations()) {
    if (operation->works == Works::Colors) continue;  // these choose colors by the depth
    SCOPED_TRACE(operation->name);
    const Recipe recipe = Read(operation->example);
    for (const int32_t bits : {1, 4, 8}) {
      const PicturePointer palette = TestPicture(37, 23, bits, false),
                           promoted = TestPicture(37, 23, bits, false);
      ASSERT_EQ(PromotePicture(*promoted), Status::Ok);
      ASSERT_EQ(ApplySteps(*palette, recipe.common, kSerial), Status::Ok);
      ASSERT_EQ(ApplySteps(*promoted, recipe.common, kSerial), Status::Ok);
      if (operation->works == Works::Point) {
        EXPECT_EQ(palette->image.Bits(), bits);
      }
      EXPECT_EQ(Looks(*palette), Looks(*promoted));
    }
  }
}

TEST(EveryOperation, ComputesTilesLikeTheWhole) {
  std::vector<std::string> texts{"gray; blur 5; contrast 20; sharpen 0.7",
                                 "flip; blur 9; unsharp 2 0.5 3"};
  for (const Operation* operation : Operations()) texts.emplace_back(operation->example);
  for (const std::string& text : texts) {
    SCOPED_TRACE(text);
    const Recipe recipe = Read(text);
    for (const bool alpha : {false, true}) {
      const PicturePointer whole = TestPicture(150, 90, 24, alpha),
                           source = TestPicture(150, 90, 24, alpha);
      ASSERT_EQ(ApplySteps(*whole, recipe.common, kSerial), Status::Ok);
      for (const Rectangle& area :
           {Rectangle{0, 0, 9, 7}, {61, 33, 20, 15}, {140, 85, 30, 30}, {70, 40, 1, 1}}) {
        PictureRecord part;
        const std::vector<Step> none;
        PictureRecord cut;
        const Status status = ApplyStepsToArea(*whole, none, area, kSerial, cut);
        EXPECT_EQ(ApplyStepsToArea(*source, recipe.common, area, kSerial, part), status);
        if (status == Status::Ok) {
          EXPECT_EQ(Looks(part), Looks(cut));
        }
      }
    }
  }
}

TEST(Engine, FusesPointOperationsExactly) {
  const PicturePointer fused = TestPicture(64, 40, 24, false),
                       apart = TestPicture(64, 40, 24, false);
  const Recipe recipe =
      Read("brightness 12; gamma 1.7; temperature 40; saturation 150; tint red; gray; "
           "contrast -20; invert; channels swap=red-blue; solarize 90; sepia");
  ASSERT_EQ(ApplySteps(*fused, recipe.common, kSerial), Status::Ok);
  for (const Step& step : recipe.common)
    ASSERT_EQ(ApplySteps(*apart, std::span(&step, 1), kSerial), Status::Ok);
  EXPECT_EQ(Looks(*fused), Looks(*apart));
}

TEST(Engine, RejectsHugePicturesAndCanBeCanceled) {
  const PicturePointer picture = TestPicture(20, 20, 24, false);
  const std::vector<uint8_t> before = Looks(*picture);
  EXPECT_EQ(ApplySteps(*picture, Read("resize 1000000x1000000 stretch").common, kSerial), Status::MemoryAllocationError);
  EXPECT_EQ(ApplySteps(*picture, Read("crop 5x5+100+100").common, kSerial), Status::EmptyImage);
  const EngineOptions stopped{.work = {.goesOn = [] { return false; }}, .facts = {}};
  EXPECT_EQ(ApplySteps(*picture, Read("blur 3").common, stopped), Status::FunctionCancelled);
  EXPECT_EQ(Looks(*picture), before);
}

}  // namespace
}  // namespace fotomill::test
