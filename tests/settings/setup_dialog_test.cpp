#include "settings/setup_dialog.h"

#include <gtest/gtest.h>

#include <map>

#include "core/data_folder.h"
#include "settings/configuration.h"
#include "settings/settings.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill {
namespace {

// Controls that store what they are given.
class FakeDialog : public SetupDialog {
 public:
  struct Control {
    bool checked = false;
    std::string text;
    size_t limit = 0;
    SpinRange range;
    int32_t color = -1;
    std::vector<std::string> choices;
    int32_t selected = -1;
  };
  Control& At(KeyNumber key) { return controls_[KeyOf(key).control]; }
  Control& At(uint32_t control) { return controls_[control]; }
  void Add(KeyNumber key) { At(key); }

  bool Has(uint32_t control) const override { return controls_.contains(control); }
  void SetChecked(uint32_t control, bool checked) override {
    controls_.at(control).checked = checked;
  }
  bool IsChecked(uint32_t control) const override { return controls_.at(control).checked; }
  void SetText(uint32_t control, std::string_view text) override {
    controls_.at(control).text = text;
  }
  std::string Text(uint32_t control) const override { return controls_.at(control).text; }
  void LimitText(uint32_t control, size_t bytes) override { controls_.at(control).limit = bytes; }
  void SetRange(uint32_t control, const SpinRange& range) override {
    controls_.at(control).range = range;
  }
  void SetColour(uint32_t control, int32_t color) override { controls_.at(control).color = color; }
  int32_t Color(uint32_t control) const override { return controls_.at(control).color; }
  void SetChoices(uint32_t control, std::span<const std::string> texts) override {
    controls_.at(control).choices.assign(texts.begin(), texts.end());
  }
  void Select(uint32_t control, int32_t position) override {
    controls_.at(control).selected = position;
  }
  int32_t Selected(uint32_t control) const override { return controls_.at(control).selected; }

 private:
  std::map<uint32_t, Control> controls_;
};

class FourFormats : public DestinationSource {
 public:
  std::vector<std::string> Extensions() const override { return {"bmp", "jpg", "png", "tif"}; }
};

class SetupDialogTest : public testing::Test {
 protected:
  SetupDialogTest() { TakeSetupChanged(); }
  FakeDialog& Filled(std::initializer_list<KeyNumber> keys) {
    for (const KeyNumber key : keys) dialog_.Add(key);
    FillSetupDialog(dialog_, formats_);
    return dialog_;
  }
  std::optional<SetupFault> Read() { return ReadSetupDialog(dialog_, formats_); }

  test::ScopedSettings settings_;
  FakeDialog dialog_;
  FourFormats formats_;
};

using enum KeyNumber;

TEST_F(SetupDialogTest, ShowsEachKindAsItsControlDoes) {
  settings.PrefixCrop = std::string_view("Cut ");
  FakeDialog& dialog = Filled({WriteOS2Bitmaps, UseAlphaChannels, FileTipDelay, PrefixCrop,
                               AnnotateText, FXBrightness, JpegCompression, AlphaBackground,
                               TiffOptions, DefaultViewZoom, JpegProcessor, DefaultFileExtension});
  EXPECT_FALSE(dialog.At(WriteOS2Bitmaps).checked);
  EXPECT_TRUE(dialog.At(UseAlphaChannels).checked);
  EXPECT_TRUE(dialog.At(FileTipDelay).checked) << "500 is on";
  EXPECT_EQ(dialog.At(PrefixCrop).text, "Cut ");
  EXPECT_EQ(dialog.At(PrefixCrop).limit, 32u);
  EXPECT_EQ(dialog.At(AnnotateText).limit, 260u);
  EXPECT_EQ(dialog.At(FXBrightness).text, "0");
  EXPECT_EQ(dialog.At(JpegCompression).text, "75");
  EXPECT_EQ(dialog.At(JpegCompression).range.maximum, 100);
  EXPECT_EQ(dialog.At(AlphaBackground).color, 0xFFFFFF);
  EXPECT_EQ(dialog.At(TiffOptions).choices[static_cast<size_t>(dialog.At(TiffOptions).selected)], "LZW");
  EXPECT_EQ(dialog.At(DefaultViewZoom).selected, 12) << "the place of value 13";
  EXPECT_EQ(dialog.At(JpegProcessor).selected, 1) << "2 lies beyond the list";
  EXPECT_EQ(dialog.At(DefaultFileExtension).choices.size(), 4u);
  EXPECT_EQ(dialog.At(DefaultFileExtension).selected, 2);

  const Settings before = settings;
  ASSERT_FALSE(Read());
  EXPECT_EQ(settings.FileTipDelay, 500);
  EXPECT_EQ(settings.JpegProcessor, 2) << "nobody touched it";
  for (const KeyRow& row : Keys()) {
    const std::string now = ValueText(row);
    settings = before;
    EXPECT_EQ(now, ValueText(row)) << "OK without a change changes nothing";
  }
}

TEST_F(SetupDialogTest, StoresChangedValues) {
  FakeDialog& dialog =
      Filled({WriteOS2Bitmaps, FileTipDelay, PrefixCrop, FXBrightness, JpegCompression,
              AlphaBackground, TiffOptions, DefaultViewZoom, JpegProcessor, DefaultFileExtension});
  dialog.At(WriteOS2Bitmaps).checked = true;
  dialog.At(FileTipDelay).checked = false;
  dialog.At(PrefixCrop).text = "My ";
  dialog.At(FXBrightness).text = " -20 ";
  dialog.At(JpegCompression).text = "100";
  dialog.At(AlphaBackground).color = 0x0000FF;
  dialog.At(TiffOptions).selected = 1;
  dialog.At(DefaultViewZoom).selected = 0;
  dialog.At(JpegProcessor).selected = 0;
  dialog.At(DefaultFileExtension).selected = 3;
  ASSERT_FALSE(Read());
  EXPECT_EQ(settings.WriteOS2Bitmaps, 1);
  EXPECT_EQ(settings.FileTipDelay, 0);
  EXPECT_EQ(settings.PrefixCrop.view(), "My ");
  EXPECT_EQ(settings.FXBrightness, -20);
  EXPECT_EQ(settings.JpegCompression, 100);
  EXPECT_EQ(settings.AlphaBackground, 0x0000FF);
  EXPECT_EQ(settings.TiffOptions, choice::kTiffPackBits);
  EXPECT_EQ(settings.DefaultViewZoom, 1) << "the value, not the position";
  EXPECT_EQ(settings.JpegProcessor, choice::kJpegStandard);
  EXPECT_EQ(settings.DefaultFileExtension.view(), "tif");
  EXPECT_FALSE(TakeSetupChanged());

  dialog.At(FileTipDelay).checked = true;
  ASSERT_FALSE(Read());
  EXPECT_EQ(settings.FileTipDelay, 500) << "on again is the default number";
}

TEST_F(SetupDialogTest, ChosenValuesOverrideTheCommandLine) {
  const test::TemporaryFolder folder;
  SetDataFolder(folder.Path());
  LoadConfiguration();
  ASSERT_TRUE(SetSetting("JpegCompression", "10").Ok());
  ASSERT_TRUE(SetSetting("UndoLevels", "20").Ok());
  FakeDialog& dialog = Filled({JpegCompression, UndoLevels});
  dialog.At(JpegCompression).text = "30";
  ASSERT_FALSE(Read());
  EXPECT_EQ(SaveConfiguration(), SaveResult::Done);
  EXPECT_EQ(test::ReadText(ConfigurationPath()), "[Fotomill]\nJpegCompression=30\n");
  SetDataFolder(folder.Path("none"));
  LoadConfiguration();
  SetDataFolder({});
}

TEST_F(SetupDialogTest, RejectsAllIfOneIsInvalid) {
  struct Row {
    KeyNumber key;
    const char* text;
    const char* message;
  };
  const Row rows[] = {
      {JpegCompression, "101", "JpegCompression takes a number from 0 to 100."},
      {JpegCompression, "", "JpegCompression takes a number from 0 to 100."},
      {FXBrightness, "9999999999", "FXBrightness takes a number from -100 to 100."},
      {PrefixCrop, "../",
       "Invalid destination. PrefixCrop takes a name, not a path: no \"/\", \"\\\", \"..\" or control characters."},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.text);
    FakeDialog& dialog = Filled({AnnotateText, JpegCompression, FXBrightness, PrefixCrop});
    dialog.At(AnnotateText).text = "changed";
    dialog.At(row.key).text = row.text;
    const auto fault = Read();
    ASSERT_TRUE(fault);
    EXPECT_EQ(fault->control, KeyOf(row.key).control);
    EXPECT_EQ(fault->message, row.message);
    EXPECT_EQ(settings.AnnotateText.view(), "This space for rent...");
  }
}

TEST_F(SetupDialogTest, RangeComesFromTheDialog) {
  const uint32_t range = KeyOf(JpegCompression).control + 10000;
  dialog_.At(range).text = "10,50,5";
  FakeDialog& dialog = Filled({JpegCompression});
  EXPECT_EQ(dialog.At(JpegCompression).range.minimum, 10);
  EXPECT_EQ(dialog.At(JpegCompression).range.maximum, 50);
  EXPECT_EQ(dialog.At(JpegCompression).range.step, 5);
  EXPECT_FALSE(Read()) << "75 was there before";
  dialog.At(JpegCompression).text = "60";
  EXPECT_EQ(Read()->message, "JpegCompression takes a number from 10 to 50.");
  dialog.At(range).text = "10,50";
  EXPECT_FALSE(Read()) << "a range that cannot be read leaves the key's own";
  EXPECT_EQ(settings.JpegCompression, 60);
}

TEST_F(SetupDialogTest, FilledTextsAreOnlyRead) {
  KeyRow rows[] = {KeyOf(AnnotateText)};
  rows[0].type |= KEY_FILLED_TEXT;
  dialog_.Add(AnnotateText);
  dialog_.At(AnnotateText).text = "its own";
  FillSetupDialog(dialog_, formats_, rows);
  EXPECT_EQ(dialog_.At(AnnotateText).text, "its own");
  EXPECT_FALSE(ReadSetupDialog(dialog_, formats_, rows));
  EXPECT_EQ(settings.AnnotateText.view(), "its own");
}

TEST_F(SetupDialogTest, ChangesSetTheSetupMark) {
  FakeDialog& dialog = Filled({WatchFolders, WriteOS2Bitmaps});
  dialog.At(WriteOS2Bitmaps).checked = true;
  EXPECT_FALSE(Read());
  EXPECT_FALSE(TakeSetupChanged());
  dialog.At(WatchFolders).checked = !dialog.At(WatchFolders).checked;
  EXPECT_FALSE(Read());
  EXPECT_TRUE(TakeSetupChanged());
  EXPECT_FALSE(TakeSetupChanged());
  NoteControlChanged(KeyOf(WriteOS2Bitmaps).control);
  EXPECT_FALSE(TakeSetupChanged());
  NoteControlChanged(KeyOf(BrowserThumbnailPrecacheDelay).control);
  EXPECT_TRUE(TakeSetupChanged());
}

TEST_F(SetupDialogTest, MarksAndResetsChangedValues) {
  const KeyNumber keys[] = {WriteOS2Bitmaps, FileTipDelay,  PrefixCrop,          JpegCompression,
                            AlphaBackground, JpegProcessor, DefaultFileExtension};
  settings.WriteOS2Bitmaps = settings.JpegProcessor = settings.AlphaBackground =
      settings.FileTipDelay = 0;
  settings.JpegCompression = 10;
  settings.PrefixCrop = std::string_view("x");
  settings.DefaultFileExtension = std::string_view("TIF");
  FakeDialog& dialog = Filled({WriteOS2Bitmaps, FileTipDelay, PrefixCrop, JpegCompression,
                               AlphaBackground, JpegProcessor, DefaultFileExtension});
  for (const KeyNumber key : keys)
    EXPECT_EQ(ShowsDefault(dialog, formats_, KeyOf(key)), key == WriteOS2Bitmaps) << KeyOf(key).name;
  FillSetupDialog(dialog, formats_, Keys(), SetupValues::Default);
  for (const KeyNumber key : keys)
    EXPECT_TRUE(ShowsDefault(dialog, formats_, KeyOf(key))) << KeyOf(key).name;
  EXPECT_EQ(settings.JpegCompression, 10) << "nothing changes before OK";
  ASSERT_FALSE(Read());
  EXPECT_EQ(settings.PrefixCrop.view(), "Cropped_ ");
  EXPECT_EQ(settings.FileTipDelay, 500);
  EXPECT_EQ(settings.DefaultFileExtension.view(), "png");
}

TEST_F(SetupDialogTest, HelpIsByKey) {
  EXPECT_EQ(HelpPageFor(KeyOf(JpegCompression).control), "JpegCompression");
  EXPECT_EQ(HelpPageFor(0), kGeneralHelpPage);
  EXPECT_EQ(HelpPageFor(9999), kGeneralHelpPage);
}

}  // namespace
}  // namespace fotomill
