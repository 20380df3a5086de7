#include "settings/configuration.h"

#include <gtest/gtest.h>

#include "core/data_folder.h"
#include "core/limits.h"
#include "platform/files.h"
#include "platform/paths.h"
#include "settings/settings.h"
#include "settings/spin_range.h"
#include "support/child.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/scoped_environment.h"
#include "support/scoped_settings.h"

namespace fotomill {
namespace {

using namespace std::string_literals;
using test::TemporaryFolder;

class ConfigurationTest : public testing::Test {
 protected:
  ConfigurationTest() { SetDataFolder(folder_.Path("data")); }
  ~ConfigurationTest() override {
    SetDataFolder(folder_.Path("none"));
    LoadConfiguration();
    SetDataFolder({});
  }
  void Write(std::string_view text) {
    ASSERT_TRUE(platform::MakeFolders(DataFolder()));
    test::WriteText(ConfigurationPath(), text);
  }
  static std::string Read() { return test::ReadText(ConfigurationPath()); }

  test::ScopedSettings settings_;
  TemporaryFolder folder_;
};

TEST_F(ConfigurationTest, LoadsTheFile) {
  const std::string forty(40, 'x'), long260(260, 'p'), long261(261, 'p');
  struct Row {
    const char* name;
    std::string line;
    const char* key;
    std::string value;  // the result
    ValueFault fault = ValueFault::None;
  };
  const Row rows[] = {
      {"number", "JpegCompression=80", "JpegCompression", "80"},
      {"negative number", "FXBrightness=-12", "FXBrightness", "-12"},
      {"blanks around a number", "JpegCompression= 80\t", "JpegCompression", "80"},
      {"largest number", "NumberedVariantMin=2147483647", "NumberedVariantMin", "2147483647"},
      {"too large a number", "JpegCompression=2147483648", "JpegCompression", "75", ValueFault::NotNumber},
      {"no number", "JpegCompression=80%", "JpegCompression", "75", ValueFault::NotNumber},
      {"hexadecimal is no number here", "JpegCompression=0x50", "JpegCompression", "75", ValueFault::NotNumber},
      {"empty number", "JpegCompression=", "JpegCompression", "75", ValueFault::NotNumber},
      {"out of its range", "PngCompression=12", "PngCompression", "9", ValueFault::OutOfRange},
      {"out of the limits of a key without spin control", "FXBrightness=101", "FXBrightness", "0", ValueFault::OutOfRange},
      {"flag", "WriteOS2Bitmaps=1", "WriteOS2Bitmaps", "1"},
      {"flag of another number", "WriteOS2Bitmaps=-7", "WriteOS2Bitmaps", "0", ValueFault::NotFlag},
      {"flag as a word", "WriteOS2Bitmaps=Yes", "WriteOS2Bitmaps", "1"},
      {"flag as another word", "UseAlphaChannels=off", "UseAlphaChannels", "0"},
      {"flag as no word", "UseAlphaChannels=maybe", "UseAlphaChannels", "1", ValueFault::NotNumber},
      {"flag that keeps its number", "FileTipDelay=750", "FileTipDelay", "750"},
      {"color", "AlphaBackground=255", "AlphaBackground", "255"},
      {"color of 25 bits", "AlphaBackground=16777216", "AlphaBackground", "16777215", ValueFault::NotColor},
      {"negative color", "AlphaBackground=-1", "AlphaBackground", "16777215", ValueFault::NotColor},
      {"color in red, green and blue", "AlphaBackground=#FF8000", "AlphaBackground", "33023"},
      {"color by name", "AlphaBackground=Orange", "AlphaBackground", "42495"},
      {"color that shines through", "AlphaBackground=#FF800080", "AlphaBackground", "16777215", ValueFault::NotNumber},
      {"choice by value", "DropOptions=101", "DropOptions", "101"},
      {"choice not in the list", "DropOptions=1", "DropOptions", "102", ValueFault::NotChoice},
      {"choice beyond its list by default", "JpegProcessor=2", "JpegProcessor", "2"},
      {"misspelt by its true name", "FindSimlarDistance=3", "FindSimlarDistance", "3"},
      {"the same, spelt well", "FindSimilarDistance=3", "FindSimlarDistance", "10"},
      {"text with blanks", "AnnotateText= a = b ", "AnnotateText", " a = b "},
      {"text of 260", "MoveCopyPath=" + long260, "MoveCopyPath", long260},
      {"longer texts may be paths and are not cut", "MoveCopyPath=" + long261, "MoveCopyPath", "", ValueFault::TooLong},
      {"limited text is cut", "PrefixCrop=" + forty, "PrefixCrop", forty.substr(0, 32), ValueFault::TooLong},
      {"cut before a character that would break", "PrefixCrop=" + forty.substr(0, 30) + "\xE2\x82\xAC", "PrefixCrop",
       forty.substr(0, 30), ValueFault::TooLong},
      {"not UTF-8", "TextCharacterLevels=\xFF\xFE", "TextCharacterLevels", "\xFF\xFE"},
      {"zero byte in a text", "AnnotateText=a\0b"s, "AnnotateText", "This space for rent...", ValueFault::NotText},
      {"prefix that leads elsewhere", "PrefixCrop=../", "PrefixCrop", "Cropped_ ", ValueFault::NotName},
      {"database name that is a path", "FileHistoryDatabase=a\\b", "FileHistoryDatabase", "FMWFileHistoryDatabase",
       ValueFault::NotName},
      {"internal value", "VersionNumber=7", "VersionNumber", "352"},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    Write("[Fotomill]\n" + row.line + "\n");
    ASSERT_EQ(LoadConfiguration(), ConfigurationState::Loaded);
    EXPECT_EQ(ValueText(*FindKey(row.key)), row.value);
    const auto complaints = ConfigurationComplaints();
    ASSERT_EQ(complaints.size(), row.fault == ValueFault::None ? 0u : 1u);
    if (!complaints.empty()) {
      EXPECT_EQ(complaints[0].fault, row.fault);
      EXPECT_EQ(complaints[0].line, 2u);
    }
    EXPECT_EQ(SaveConfiguration(), SaveResult::Unchanged) << "what was only read is never written";
  }
}

TEST_F(ConfigurationTest, UsesDefaultsWithoutAUsableFile) {
  limits.listFileBytes = 1000;
  const std::string tooLong(1001, '\n');
  struct Row {
    const char* name;
    std::string text;
    ConfigurationState state;
  };
  const Row rows[] = {
      {"empty", "", ConfigurationState::Loaded},
      {"no section", "JpegCompression=10\n", ConfigurationState::Loaded},
      {"one long line", "[Fotomill]JpegCompression=10" + std::string(900, '='), ConfigurationState::Loaded},
      {"zero bytes", std::string(900, '\0'), ConfigurationState::Loaded},
      {"over the limit", "[Fotomill]\nJpegCompression=10\n" + tooLong, ConfigurationState::Unreadable},
      {"UTF-16", "\xFF\xFE[\0F\0"s, ConfigurationState::Unreadable},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    Write(row.text);
    EXPECT_EQ(LoadConfiguration(), row.state);
    EXPECT_EQ(settings.JpegCompression, 75);
    settings.UndoLevels = 11;
    const bool writable = row.state == ConfigurationState::Loaded;
    EXPECT_EQ(SaveConfiguration(), writable ? SaveResult::Done : SaveResult::Unreadable);
    EXPECT_TRUE(Read().starts_with(row.text)) << "whatever it was, it is still there";
    EXPECT_EQ(Read().ends_with("UndoLevels=11\n"), writable);
  }
  limits = Limits{};
  ASSERT_TRUE(platform::DeleteFile(ConfigurationPath()));
  EXPECT_EQ(LoadConfiguration(), ConfigurationState::Missing);
  ASSERT_TRUE(platform::MakeFolders(ConfigurationPath()));  // a folder with that name
  EXPECT_EQ(LoadConfiguration(), ConfigurationState::Unreadable);
  settings.UndoLevels = 11;
  EXPECT_EQ(SaveConfiguration(), SaveResult::Unreadable);
}

TEST_F(ConfigurationTest, SaveKeepsUnknownContents) {
  Write(
      "; by "
      "hand\r\n[Other]\r\nJpegCompression=1\r\n[Fotomill]\r\nFutureKey=5\r\nJpegCompression="
      "80\r\nPngCompression=bad\r\n");
  LoadConfiguration();
  settings.JpegCompression = 75;  // its default, which must be written
  settings.PrefixCrop = std::string_view("Cut ");
  settings.AlphaBackground = 0x00FF8000;
  settings.TextCharacterLevels = std::string_view("\xFF ");
  EXPECT_EQ(SaveConfiguration(), SaveResult::Done);
  const std::string saved =
      "; by hand\r\n[Other]\r\nJpegCompression=1\r\n[Fotomill]\r\nFutureKey=5\r\nJpegCompression=75\r\nPngCompression=bad\r\n"
      "AlphaBackground=16744448\r\nPrefixCrop=Cut \r\nTextCharacterLevels=\xFF \r\n";
  EXPECT_EQ(Read(), saved);
  EXPECT_EQ(SaveConfiguration(), SaveResult::Unchanged);

  LoadConfiguration();
  EXPECT_EQ(settings.PrefixCrop.view(), "Cut ");
  EXPECT_EQ(settings.AlphaBackground, 0x00FF8000);
  EXPECT_EQ(settings.TextCharacterLevels.view(), "\xFF ");
  EXPECT_EQ(Read(), saved);
}

TEST_F(ConfigurationTest, EveryKeyRoundTrips) {
  ASSERT_EQ(LoadConfiguration(), ConfigurationState::Missing);
  const auto give = [](const KeyRow& row) -> std::string {
    if ((row.type & KEY_TEXT) != 0)
      return std::string(1, ' ').append(row.name).substr(0, 28).append(1, ' ');
    if ((row.type & KEY_FLAG) != 0) return NumberIn(row) != 0 ? "0" : "1";
    if ((row.type & KEY_BY_VALUE) != 0) {
      const ChoiceEntry* const first = row.extra.choices;
      return std::to_string(first->value != NumberIn(row) ? first->value : first[1].value);
    }
    if ((row.type & KEY_CHOICE) != 0) return NumberIn(row) == 1 ? "0" : "1";
    if (const auto range = LimitsOf(row))
      return std::to_string(NumberIn(row) == range->maximum ? range->minimum : range->maximum);
    return std::to_string(NumberIn(row) == 1 ? 2 : 1);
  };
  for (const KeyRow& row : Keys()) {
    const std::string text = give(row);
    const SettingValue value = ReadValue(row, text, ValueSource::File);
    if (value.usable) StoreValue(row, value);
  }
  const Settings changed = settings;
  EXPECT_EQ(SaveConfiguration(), SaveResult::Done);
  settings = defaultSettings;
  ASSERT_EQ(LoadConfiguration(), ConfigurationState::Loaded);
  const Settings loaded = settings;
  settings = changed;
  for (const KeyRow& row : Keys()) {
    SCOPED_TRACE(row.name);
    settings = changed;
    const std::string expected = ValueText(row);
    settings = loaded;
    EXPECT_EQ(ValueText(row), expected);
    EXPECT_EQ(IsAtDefault(row), (row.type & KEY_INTERNAL) != 0 && &row != &KeyOf(KeyNumber::BuildDate) &&
                                    &row != &KeyOf(KeyNumber::ApplicationPath));
  }
}

TEST_F(ConfigurationTest, ValuesForThisRunAreNotSaved) {
  Write("[Fotomill]\nJpegCompression=80\n");
  LoadConfiguration();
  struct Row {
    const char *key, *value;
    SetResult::Code code;
    std::string message;
  };
  const Row rows[] = {
      {"JpegCompression", "90", SetResult::Done, ""},
      {"AlphaBackground", "0xFF8000", SetResult::Done, ""},
      {"FileTipDelay", "20", SetResult::Done, ""},
      {"JpegCompresion", "90", SetResult::UnknownKey, "Unknown key \"JpegCompresion\"; the nearest is JpegCompression."},
      {"writeos2bitmaps", "1", SetResult::UnknownKey, "Unknown key \"writeos2bitmaps\"; the nearest is WriteOS2Bitmaps."},
      {"JpegCompression", "101", SetResult::WrongValue, "JpegCompression takes a number from 0 to 100."},
      {"TiffResolution", "0", SetResult::WrongValue, "TiffResolution takes a number from 1 to 32767."},
      {"JpegCompression", "many", SetResult::WrongValue, "JpegCompression takes a number from 0 to 100."},
      {"WriteOS2Bitmaps", "2", SetResult::WrongValue, "WriteOS2Bitmaps takes yes or no (1 or 0)."},
      {"ExtensionCaseStyle", "3", SetResult::WrongValue,
       "ExtensionCaseStyle takes 0 (As in the source file's name), 1 (Upper case), 2 (Lower case)."},
      {"AlphaBackground", "0x1000000", SetResult::WrongValue,
       "AlphaBackground takes a color: #RRGGBB, a name such as orange, or the number blue * 65536 + green * 256 + red."},
      {"PrefixCrop", "a name that has thirty-three bytes", SetResult::WrongValue, "PrefixCrop takes at most 32 characters."},
      {"PrefixCrop", "a/b", SetResult::WrongValue,
       "Invalid destination. PrefixCrop takes a name, not a path: no \"/\", \"\\\", \"..\" or control characters."},
      {"AnnotateText", "two\nlines", SetResult::WrongValue, "AnnotateText takes no line breaks and no NUL bytes."},
      {"PatchLevel", "1", SetResult::WrongValue, "PatchLevel is an internal value and cannot be set."},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(std::string(row.key).append("=").append(row.value));
    const SetResult result = SetSetting(row.key, row.value);
    EXPECT_EQ(result.code, row.code);
    EXPECT_EQ(result.message, row.message);
  }
  EXPECT_EQ(settings.JpegCompression, 90);
  EXPECT_EQ(settings.AlphaBackground, 0xFF8000);
  settings.UndoLevels = 3;
  EXPECT_EQ(SaveConfiguration(), SaveResult::Done);
  EXPECT_EQ(Read(), "[Fotomill]\nJpegCompression=80\nUndoLevels=3\n");

  const KeyRow& quality = KeyOf(KeyNumber::JpegCompression);
  EXPECT_EQ(StoreSetting(quality, ReadValue(quality, "91", ValueSource::Person)), SaveResult::Done);
  EXPECT_EQ(Read(), "[Fotomill]\nJpegCompression=91\nUndoLevels=3\n");
  EXPECT_EQ(RemoveSetting(quality), SaveResult::Done);
  EXPECT_EQ(RemoveSetting(quality), SaveResult::Unchanged);
  EXPECT_EQ(settings.JpegCompression, 75);
  settings.AlphaBackground = 5;  // later chosen in a dialog
  KeepSetting(KeyOf(KeyNumber::AlphaBackground));
  EXPECT_EQ(SaveConfiguration(), SaveResult::Done);
  EXPECT_EQ(Read(), "[Fotomill]\nUndoLevels=3\nAlphaBackground=5\n");
}

TEST_F(ConfigurationTest, MergesConcurrentChanges) {
  Write("[Fotomill]\nJpegCompression=80\nUndoLevels=5\n");
  LoadConfiguration();
  const int status = test::InChild([] {
    LoadConfiguration();
    settings.UndoLevels = 6;
    settings.PngCompression = 1;
    (void)SaveConfiguration();
  });
  EXPECT_EQ(status, 0);
  settings.JpegCompression = 70;
  settings.PngCompression = 2;  // the later save wins
  EXPECT_EQ(SaveConfiguration(), SaveResult::Done);
  EXPECT_EQ(Read(), "[Fotomill]\nJpegCompression=70\nUndoLevels=6\nPngCompression=2\n");
  settings.JpegCompression = 71;
  EXPECT_EQ(SaveConfiguration(), SaveResult::Done);
  EXPECT_EQ(Read(), "[Fotomill]\nJpegCompression=71\nUndoLevels=6\nPngCompression=2\n")
      << "the other one's value is not ours to write back";
}

TEST_F(ConfigurationTest, NoFaultHarmsTheFile) {
  const std::string before = "; keep\n[Fotomill]\nUndoLevels=5\n",
                    after = "; keep\n[Fotomill]\nUndoLevels=9\n";
  const int64_t faults = test::ForEachFault([&] {
    const int64_t countdown = platform::faultCountdown.exchange(0);
    Write(before);
    LoadConfiguration();
    settings.UndoLevels = 9;
    platform::faultCountdown = countdown;
    const SaveResult result = SaveConfiguration();
    const bool hit = platform::faultCountdown <= 0;
    platform::faultCountdown = 0;
    EXPECT_EQ(Read(), result == SaveResult::Done ? after : before);
    EXPECT_TRUE(hit || result == SaveResult::Done);
    EXPECT_EQ(SaveConfiguration(), result == SaveResult::Done ? SaveResult::Unchanged : SaveResult::Done)
        << "a later save makes up for it";
    EXPECT_EQ(Read(), after);
    platform::faultCountdown = hit ? 0 : 1;
  });
  EXPECT_GE(faults, 6) << "lock, open, read, create, write, sync, rename";
  EXPECT_EQ(platform::ListFolder(DataFolder())->size(), 1u) << "no lock and no temporary file is left";
}

TEST_F(ConfigurationTest, ReadsEarlyKeysDirectlyFromTheFile) {
  Write(
      "[Fotomill]\nLogoDelay=1\nShowStartupWindow=1\nSmallTextFontSize=x\nNormalThumbFontSize="
      "99\n");
  const EarlySettings early = ReadEarlySettings();
  EXPECT_EQ(early.logoDelay, 1);
  EXPECT_EQ(early.showStartupWindow, 1);
  EXPECT_EQ(early.smallTextFontSize, defaultSettings.SmallTextFontSize);
  EXPECT_EQ(early.normalTextFontSize, defaultSettings.NormalTextFontSize);
  EXPECT_EQ(early.normalThumbFontSize, 99);
  EXPECT_EQ(settings.LogoDelay, 6000) << "the settings wait for the load";
}

TEST_F(ConfigurationTest, BlockIsTheFileAfterItsHeader) {
  EXPECT_EQ(LoadConfigurationBlock(), std::nullopt);
  Write("[Fotomill]\nA=\xFF\0\n"s);
  EXPECT_EQ(LoadConfigurationBlock(), ";\r\n;\r\n;------ INI FILE ------\r\n;\r\n;\r\n[Fotomill]\nA=\xFF\0\n"s);
}

TEST(DataFolderTest, PrefersOptionThenVariableThenSystem) {
  const test::ScopedEnvironment config("XDG_CONFIG_HOME", "/x/config");
  {
    const test::ScopedEnvironment variable("FOTOMILL_DATA", "/x/variable");
    SetDataFolder("/x/option/");
    EXPECT_EQ(ConfigurationPath(), "/x/option/Fotomill Professional 11.ini");
    SetDataFolder({});
    EXPECT_EQ(DataFolder(), "/x/variable");
  }
  const test::ScopedEnvironment variable("FOTOMILL_DATA", "");
  SetDataFolder({});
  EXPECT_EQ(DataFolder(), "/x/config/Brantwick");
  SetDataFolder("/" + std::string(250, 'd'));
  EXPECT_EQ(ConfigurationPath(), "") << "a path of more than 260 bytes is no path";
  EXPECT_EQ(SaveConfiguration(), SaveResult::Unchanged);
  SetDataFolder({});
}

}  // namespace
}  // namespace fotomill
