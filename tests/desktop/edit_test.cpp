#include <gtest/gtest.h>

#include <chrono>
#include <condition_variable>
#include <deque>
#include <iterator>
#include <mutex>

#include "core/data_folder.h"
#include "desktop/models/edit/choice_text.h"
#include "desktop/models/edit/operation_memory.h"
#include "desktop/models/edit/preview_maker.h"
#include "desktop/models/edit/preview_steps.h"
#include "desktop/models/edit/quick_actions.h"
#include "desktop/models/edit/slider_scale.h"
#include "desktop/models/edit/step_list.h"
#include "operations/engine.h"
#include "operations/operations.h"
#include "picture/packed_image.h"
#include "processing/promote.h"
#include "registry/registry.h"
#include "settings/key_texts.h"
#include "settings/settings.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill::desktop {
namespace {

std::vector<Step> Read(const std::string& text) {
  Recipe recipe;
  EXPECT_TRUE(ReadRecipe(text, KeyTextInForce, recipe).empty()) << text;
  return recipe.common;
}

TEST(StepList, UndoesEveryKindOfChange) {
  StepList list;
  list.Replace(Read("gray; blur 3; contrast 10"));
  const std::string start = "gray\nblur 3\ncontrast 10\n";
  ASSERT_EQ(list.RecipeText(), start);
  const struct {
    const char* name;
    std::function<void()> change;
    std::string text;
    size_t current;
  } kRows[] = {
      {"add after the current one", [&] { list.Add(Read("invert")[0]); },
       "gray\ninvert\nblur 3\ncontrast 10\n", 1},
      {"remove", [&] { list.Remove(2); }, "gray\nblur 3\n", 1},
      {"move down", [&] { list.Move(0, 2); }, "blur 3\ncontrast 10\ngray\n", 2},
      {"move up", [&] { list.Move(2, 0); }, "contrast 10\ngray\nblur 3\n", 0},
      {"switch off", [&] { list.Switch(1, false); }, "gray\ncontrast 10\n", 0},
      {"replace", [&] { list.Replace(Read("sepia")); }, "sepia\n", 0},
      {"set", [&] { list.Select(1), (void)list.Set("sigma", "5"); }, "gray\nblur 5\ncontrast 10\n",
       1},
      {"default", [&] { list.Select(2), (void)list.Set("c", ""); }, "gray\nblur 3\ncontrast\n", 2},
  };
  for (const auto& row : kRows) {
    SCOPED_TRACE(row.name);
    list.Select(0);
    row.change();
    EXPECT_EQ(list.RecipeText(), row.text);
    EXPECT_EQ(list.Current(), row.current);
    list.Undo();
    EXPECT_EQ(list.RecipeText(), start);
    list.Redo();
    EXPECT_EQ(list.RecipeText(), row.text);
    list.Undo();
  }
  list.Undo();
  EXPECT_FALSE(list.CanUndo());
  EXPECT_EQ(list.RecipeText(), "");
}

TEST(StepList, ADragIsOneChangeAndBadValuesAreNone) {
  StepList list(Read("blur 3")[0]);
  for (const char* sigma : {"4", "5", "6"}) EXPECT_TRUE(list.Set("sigma", sigma).empty());
  list.EndChange();
  EXPECT_TRUE(list.Set("sigma", "7").empty());
  EXPECT_FALSE(list.Set("sigma", "much").empty());
  EXPECT_EQ(list.RecipeText(), "blur 7\n");
  list.Undo();
  EXPECT_EQ(list.RecipeText(), "blur 6\n");
  list.Undo();
  EXPECT_EQ(list.RecipeText(), "blur 3\n");
  EXPECT_FALSE(list.CanUndo());
  // Values that are valid by themselves, but not together.
  StepList levels(Read("levels 0 255")[0]);
  EXPECT_TRUE(levels.Set("black", "200").empty());
  EXPECT_FALSE(levels.Set("white", "100").empty());
  EXPECT_EQ(levels.RecipeText(), "levels 200 white=255\n");
}

TEST(StepList, EveryOperationStartsWithAStepThatRuns) {
  for (const Operation* operation : Operations()) {
    SCOPED_TRACE(operation->name);
    Recipe recipe;
    EXPECT_TRUE(ReadRecipe(PrintStep(FirstStep(*operation)), KeyTextInForce, recipe).empty());
  }
}

TEST(Sliders, CoverEveryNumberAndComeBack) {
  size_t sliders = 0;
  for (const Operation* operation : Operations()) {
    for (const Parameter& row : operation->parameters) {
      if (!HasSlider(row)) continue;
      SCOPED_TRACE(std::string(operation->name) + " " + row.name);
      ++sliders;
      EXPECT_EQ(SliderValue(row, 0), row.least);
      EXPECT_EQ(SliderValue(row, kSliderEnd), row.most);
      for (const int32_t position : {100, 500, 900}) {
        const double value = SliderValue(row, position);
        EXPECT_NEAR(SliderPosition(row, value), position,
                    row.kind == ParameterKind::kInteger ? 500 : 60);
        Value read;
        EXPECT_TRUE(ReadValue(row, NumberText(row, value), read).empty());
        EXPECT_EQ(read.number, value);
      }
    }
  }
  EXPECT_GT(sliders, 30u);
}

TEST(OperationMemory, KeepsChoicesValuesAndPresets) {
  const test::TemporaryFolder folder;
  SetDataFolder(folder.Path());
  test::WriteText(folder.Path("FMWOperations.txt"), "later\tunknown\nlast\tblur nonsense\n");
  const Operation& blur = *FindOperation("blur");
  {
    OperationMemory memory;
    EXPECT_EQ(PrintStep(memory.Start(blur)), PrintStep(FirstStep(blur)));
    EXPECT_TRUE(memory.KeepChosen(blur));
    EXPECT_TRUE(memory.KeepLast(Read("blur 7; gray")));
    EXPECT_TRUE(memory.KeepPreset("soft\tone", Read("blur 2")[0]));
    EXPECT_TRUE(memory.KeepPreset("hard", Read("blur 20")[0]));
    EXPECT_TRUE(memory.KeepPreset("hard", Read("blur 30")[0]));
  }
  OperationMemory memory;
  EXPECT_EQ(&memory.Chosen(Family::Filter), &blur);
  EXPECT_STREQ(memory.Chosen(Family::Crop).name, "crop");
  EXPECT_EQ(PrintStep(memory.Start(blur)), "blur 7");
  const std::vector<Preset> presets = memory.PresetsOf(blur);
  ASSERT_EQ(presets.size(), 2u);
  EXPECT_EQ(presets[0].name + ": " + PrintStep(presets[0].step), "hard: blur 30");
  EXPECT_EQ(presets[1].name, "soft one");
  EXPECT_TRUE(memory.RemovePreset("hard", blur));
  EXPECT_EQ(OperationMemory().PresetsOf(blur).size(), 1u);
  EXPECT_TRUE(test::ReadText(folder.Path("FMWOperations.txt")).starts_with("later\tunknown\n"));
  SetDataFolder({});
}

TEST(QuickActions, UseTheSizesAndTheLastValues) {
  const test::TemporaryFolder folder;
  const test::ScopedSettings keep;
  SetDataFolder(folder.Path());
  settings.Transform320.AssignCut("64,48");
  settings.Transform640.AssignCut("none");
  settings.WatermarkText.AssignCut("mine");
  ASSERT_TRUE(OperationMemory().KeepLast(Read("caption text='a b' position=above")));
  const struct {
    const char *text, *recipe;
  } kRows[] = {
      {"Resize to 64 \u00D7 48", "resize 64x48"},
      {"Resize (no size set)", ""},
      {"Resize to 800 \u00D7 600", "resize 800x600"},
      {"Resize to 1024 \u00D7 768", "resize 1024x768"},
      {"Resize to 1280 \u00D7 1024", "resize 1280x1024"},
      {"Auto &levels", "auto-levels"},
      {"&Caption", "caption text=\"a b\" position=above"},
      {"&Watermark", "watermark"},
  };
  const std::vector<QuickAction> actions = QuickActions();
  ASSERT_EQ(actions.size(), std::size(kRows));
  for (size_t i = 0; i < actions.size(); ++i) {
    EXPECT_EQ(actions[i].text, kRows[i].text);
    EXPECT_EQ(QuickRecipe(i), kRows[i].recipe);
    EXPECT_EQ(actions[i].startsGroup, i == 5);
  }
  SetDataFolder({});
}

TEST(ChoiceText, KnowsEveryWordOfTheOperations) {
  for (const Operation* operation : Operations()) {
    for (const Parameter& row : operation->parameters) {
      for (int32_t i = 0; !WordOf(row.choices, i).empty(); ++i) {
        const std::string_view word = WordOf(row.choices, i);
        const bool unit = word.size() == 2;
        EXPECT_EQ(ChoiceText(word) == word, unit) << operation->name << " " << word;
      }
    }
  }
  EXPECT_EQ(ChoiceText("top-left"), "Top left");
  const Step step = Read("watermark text=a gravity=top-left tiled=yes")[0];
  EXPECT_EQ(StepText(step), "Watermark: Text a, Place Top left, Tiled yes");
}

TEST(PreviewSteps, TheShareFallsAtOnceAndGrowsSlowly) {
  const struct {
    double share, seconds, next;
  } kRows[] = {{1, 0.1, 0.5},      {1, 0.025, 1},  {0.5, 0.0001, 0.55},
               {0.5, 0.024, 0.51}, {0.3, 4, 0.25}, {0.95, 0.001, 1}};
  for (const auto& row : kRows)
    EXPECT_NEAR(NextShare(row.share, row.seconds), row.next, 0.001) << row.seconds;
}

TEST(PreviewSteps, ReduceWhatIsMeasuredInPixels) {
  const struct {
    const char *step, *reduced;
  } kRows[] = {
      {"blur 8", "blur 2"},
      {"median 8", "median 2"},
      {"mosaic 2", "mosaic 1"},  // at least the least
      {"crop 400x200+40+80", "crop 100x50+10+20"},
      {"crop 3:2", "crop 3:2"},
      {"crop 50%x50%", "crop 50%x50%"},
      {"resize 800x", "resize 200x"},
      {"border 12", "border 3"},
      {"brightness 20", "brightness 20"},
      {"offset 40 5%", "offset 10 5%"},
  };
  for (const auto& row : kRows) {
    SCOPED_TRACE(row.step);
    const Step reduced = ReducedSteps(Read(row.step), 0.25)[0], wanted = Read(row.reduced)[0];
    for (size_t i = 0; i < wanted.arguments.Rows().size(); ++i) {
      const Value &made = reduced.arguments.At(i), &value = wanted.arguments.At(i);
      EXPECT_DOUBLE_EQ(made.number, value.number);
      for (const auto length : {&Value::x, &Value::y, &Value::width, &Value::height})
        EXPECT_DOUBLE_EQ((made.*length).number, (value.*length).number);
    }
  }
}

// Collects previews until a wanted one came. What came after it is kept for the next call.
class Watcher {
  std::mutex mutex_;  // these outlive the maker, whose threads use them
  std::condition_variable came_;

 public:
  PreviewMaker maker{[this] {
    const std::lock_guard lock(mutex_);
    came_.notify_all();
  }};

  std::vector<PreviewPointer> Until(const std::function<bool(const Preview&)>& last) {
    std::vector<PreviewPointer> all;
    const auto end = std::chrono::steady_clock::now() + std::chrono::seconds(60);
    while (std::chrono::steady_clock::now() < end) {
      std::ranges::move(maker.Fetch(), std::back_inserter(waiting_));
      while (!waiting_.empty()) {
        all.push_back(std::move(waiting_.front()));
        waiting_.pop_front();
        if (last(*all.back())) return all;
      }
      std::unique_lock lock(mutex_);
      came_.wait_for(lock, std::chrono::milliseconds(20));
    }
    ADD_FAILURE() << "no such preview came";
    return {};
  }

 private:
  std::deque<PreviewPointer> waiting_;
};

// A picture of noise, so that a wrong position shows.
std::string NoisePicture(const test::TemporaryFolder& folder, int32_t width, int32_t height) {
  PictureRecord picture;
  EXPECT_EQ(NewPackedImage(width, height, nullptr, 24, picture.image), Status::Ok);
  uint32_t state = 1;
  for (int32_t y = 0; y < height; ++y) {
    for (uint8_t& byte : picture.image.Row(y).first(static_cast<size_t>(3 * width)))
      byte = static_cast<uint8_t>((state = state * 1664525 + 1013904223) >> 24);
  }
  picture.width = width;
  picture.height = height;
  picture.bitsPerPixel = 24;
  const std::string path = folder.Path("noise.png");
  EXPECT_EQ(WritePicture(picture, path, {}), Status::Ok);
  return path;
}

TEST(PreviewMaker, TheVisiblePartHasTheBytesOfTheWholeResult) {
  const test::TemporaryFolder folder;
  const std::string path = NoisePicture(folder, 300, 200);
  for (const char* recipe : {"gray", "crop 200x150+30+20; blur 2; contrast 20", "rotate 30; invert",
                             "blur 3", "resize 50%"}) {
    SCOPED_TRACE(recipe);
    const std::vector<Step> steps = Read(recipe);
    PicturePointer whole;
    ASSERT_EQ(LoadPicture({.fileName = path}, whole), Status::Ok);
    ASSERT_EQ(ApplySteps(*whole, steps, {}), Status::Ok);
    ASSERT_EQ(PromotePicture(*whole), Status::Ok);
    Watcher watcher;
    watcher.maker.SetPicture(path);
    watcher.maker.Request({.steps = 7,
                           .list = steps,
                           .place = {.mode = ZoomMode::Free, .timesFit = 8, .centerX = 0.3},
                           .width = 64,
                           .height = 48});
    const auto all = watcher.Until([](const Preview& preview) { return preview.exact; });
    ASSERT_FALSE(all.empty());
    const Preview& exact = *all.back();
    EXPECT_EQ(exact.status, Status::Ok) << exact.problem;
    EXPECT_EQ(exact.steps, 7u);
    EXPECT_EQ(exact.whole.width, whole->image.Width());
    EXPECT_EQ(exact.whole.height, whole->image.Height());
    ASSERT_EQ(exact.pixels.image.Width(), exact.area.width);
    for (int32_t y = 0; y < exact.area.height; ++y) {
      const auto bytes = static_cast<size_t>(3 * exact.area.width);
      const auto made = exact.pixels.image.Row(y).first(bytes);
      const auto wanted =
          whole->image.Row(exact.area.y + y).subspan(static_cast<size_t>(3 * exact.area.x), bytes);
      ASSERT_TRUE(std::ranges::equal(made, wanted)) << "row " << y;
    }
  }
}

TEST(PreviewMaker, AnswersTheLatestRequestOnly) {
  const test::TemporaryFolder folder;
  const std::string path = NoisePicture(folder, 1200, 900);
  Watcher watcher;
  watcher.maker.SetPicture(path);
  for (uint64_t number = 1; number <= 40; ++number) {
    watcher.maker.Request({.steps = number,
                           .list = Read("median " + std::to_string(number) + "; rotate 3"),
                           .place = {},
                           .width = 400,
                           .height = 300,
                           .original = true});
  }
  const auto all =
      watcher.Until([](const Preview& preview) { return preview.exact && preview.steps == 40; });
  EXPECT_LT(all.size(), 40u);
  const auto others =
      watcher.Until([](const Preview& preview) { return preview.exact && preview.original; });
  ASSERT_FALSE(others.empty());
  EXPECT_EQ(others.back()->whole.width, 1200);
}

TEST(PreviewMaker, SaysWhyThereIsNone) {
  const test::TemporaryFolder folder;
  test::WriteText(folder.Path("bad.png"), "no picture");
  const std::string path = NoisePicture(folder, 30, 20);
  for (const auto& [file, recipe] :
       {std::pair{folder.Path("bad.png"), "gray"}, std::pair{path, "crop 5x5+100+100"}}) {
    Watcher watcher;
    watcher.maker.SetPicture(file);
    watcher.maker.Request({.list = Read(recipe), .place = {}, .width = 40, .height = 30});
    const auto all = watcher.Until([](const Preview& preview) { return !preview.problem.empty(); });
    ASSERT_FALSE(all.empty());
    EXPECT_NE(all.back()->status, Status::Ok);
  }
}

}  // namespace
}  // namespace fotomill::desktop
