#include "desktop/models/setup/setup_pages.h"

#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <filesystem>
#include <set>

#include "desktop/models/setup/override_options.h"
#include "desktop/models/setup/setup_help.h"
#include "registry/registry.h"
#include "settings/settings.h"
#include "support/files.h"
#include "texts/texts.h"

namespace fotomill::desktop {
namespace {

// Keys used by the sources, except those that only list keys.
std::set<std::string> UsedKeys() {
  std::set<std::string> used;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(test::SourcePath("src"))) {
    const std::string name = entry.path().filename().string();
    if (!entry.is_regular_file() || name == "setup_pages.cpp" || name == "override_options.cpp" ||
        name == "spin_range.cpp")
      continue;
    const std::string text = test::ReadText(entry.path().string());
    for (const std::string_view lead : {"settings.", "KeyNumber::", "&Settings::", ".key = \""}) {
      for (size_t at = text.find(lead); at != std::string::npos; at = text.find(lead, at + 1)) {
        const size_t start = at + lead.size();
        size_t end = start;
        while (end < text.size() && (std::isalnum(static_cast<unsigned char>(text[end])) != 0))
          ++end;
        used.insert(text.substr(start, end - start));
      }
    }
  }
  return used;
}

TEST(SetupPages, ShowSettingsThatDoSomethingAndExplainThem) {
  const std::set<std::string> used = UsedKeys();
  for (const SetupItem& item : SetupItems()) {
    const KeyRow& row = KeyOf(item.key);
    EXPECT_NE(row.control, 0u) << row.name << " has no control number in settings.def";
    EXPECT_TRUE(HasHelpEntry(row.name)) << row.name << " has no entry in docs/user/settings.md";
    EXPECT_TRUE(used.contains(row.name)) << row.name << " is in Setup, but nothing reads it";
  }
}

// The page of format options has each format in one group, with all of its settings except those on
// other pages.
TEST(SetupPages, EveryFormatHasAGroup) {
  std::set<std::string_view> groups;
  for (const FormatSettings* const codec : SettingsOfFormats()) {
    EXPECT_TRUE(groups.insert(codec->group).second) << codec->group;
  }
  std::string_view last;
  for (const SetupItem& item : ItemsOf(SetupPage::FormatOptions)) {
    if (item.group == last) continue;
    EXPECT_EQ(groups.erase(item.group), 1u) << item.group << " is there twice";
    last = item.group;
  }
  EXPECT_TRUE(groups.empty()) << *groups.begin() << " has nothing to set";
}

TEST(SetupPages, SearchFindsEveryWord) {
  struct Row {
    const char* words;
    KeyNumber found;
    size_t most;  // maximum number of other matches
  };
  const Row rows[] = {
      {"jpegcompression", KeyNumber::JpegCompression, 2},
      {"JPEG quality", KeyNumber::JpegCompression, 3},
      {"  upright   camera ", KeyNumber::ExifAdjustOrientation, 1},
      {"trash", KeyNumber::OverwritePromptRecycle, 3},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.words);
    const std::vector<SetupItem> found = FindSettings(row.words);
    EXPECT_TRUE(std::ranges::count(found, row.found, &SetupItem::key) == 1);
    EXPECT_LE(found.size(), row.most);
  }
  EXPECT_TRUE(FindSettings("   ").empty());
  EXPECT_TRUE(FindSettings("quality zebra").empty());
}

TEST(SetupHelp, EntriesArePlainTextAndSeparate) {
  const HelpText help = HelpOn("JpegStoreDPI");
  EXPECT_EQ(help.title, "JpegStoreDPI");
  EXPECT_EQ(help.text, "The picture's resolution is written into JPEG files.");
  EXPECT_EQ(HelpOn("FileHistoryDatabase").text, "The name of the history file in the data folder, without its extension .fhdb.");
  const HelpText general = HelpOn("NoSuchKey");
  EXPECT_EQ(general.title, "Configuration");
  EXPECT_THAT(general.text,
              testing::StartsWith(
                  "Every setting is a named key. fotomill config list shows all of them with their values, "));
  EXPECT_THAT(general.text, testing::HasSubstr("\n    [Fotomill]\n    JpegCompression=85\n"));
  EXPECT_THAT(general.text, testing::HasSubstr("\n\nLocation\n\n"));
  for (const char* topic : {"OVERWRITE", "RENAME"})
    EXPECT_FALSE(HelpOn(topic).text.empty()) << topic << " has no part of its own in the manual";
  const HelpText manual = HelpOn(kManual);
  EXPECT_EQ(manual.title, "The desktop program");
  EXPECT_THAT(manual.text, testing::HasSubstr("\nF5, F9   reload the folder, show or hide the folder tree\n"));
  EXPECT_THAT(manual.text, testing::Not(testing::ContainsRegex("[|`(]desktop-|png|--- ")))
      << "marks, addresses and pictures are left out";
}

TEST(SetupHelp, TheFormatListHasAPageOfItsOwn) {
  const HelpText help = HelpOn(kFormatsTopic);
  EXPECT_EQ(help.title, "Formats");
  EXPECT_THAT(help.text, testing::HasSubstr("\n\nThe format list\n\nSetup lists all formats"));
}

TEST(SetupHelp, TipsAreInTheLanguageOfTheWindows) {
  const KeyRow& row = KeyOf(KeyNumber::JpegStoreDPI);
  EXPECT_EQ(ControlTip(row),
            "The picture's resolution is written into JPEG files.\n\nJpegStoreDPI");
  if (StartTexts("de")) {
    EXPECT_EQ(ControlTip(row), "JpegStoreDPI");
  }
  (void)StartTexts("en");
  EXPECT_EQ(LimitsText(KeyOf(KeyNumber::PngCompression)), "0 to 9");
  EXPECT_EQ(LimitsText(KeyOf(KeyNumber::DitherContrast)), "-100 to 100");
  EXPECT_EQ(LimitsText(KeyOf(KeyNumber::LogoDelay)), "");
}

TEST(OverrideOptions, BelongToFormatsThatAreWritten) {
  for (const FormatSettings* const options : SettingsOfFormats()) {
    SCOPED_TRACE(options->box);
    const bool written =
        CanWrite(FormatRow(FindFormatByName("a." + std::string(options->extension))));
    EXPECT_EQ(FindOverrideOptions(options->extension), written ? options : nullptr);
    EXPECT_EQ(ItemsOf(*options).size(), options->keys.size()) << "every option is a row of Setup";
  }
  EXPECT_STREQ(FindOverrideOptions("jpeg")->box, "OverrideJpgBox") << "another row of the same codec";
  EXPECT_STREQ(FindOverrideOptions("Dib")->box, "OverrideBmpBox");
  EXPECT_EQ(FindOverrideOptions("pcx"), nullptr) << "it has no options";
  EXPECT_EQ(FindOverrideOptions("avi"), nullptr) << "nothing writes it";
  EXPECT_EQ(FindOverrideOptions("zzz"), nullptr);
}

}  // namespace
}  // namespace fotomill::desktop
