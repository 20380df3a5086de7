#include "texts/texts.h"

#include <gtest/gtest.h>

#include "cli/frame/commands.h"
#include "cli/frame/libraries.h"
#include "core/limits.h"
#include "operations/operations.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "support/files.h"
#include "texts/grouped_count.h"

namespace fotomill {
namespace {

TEST(Texts, ReplacesArguments) {
  EXPECT_EQ(Tr("%2 of %1", 7, "three"), "three of 7");
  EXPECT_EQ(Tr("%1%1", std::string("ab")), "abab");
  EXPECT_EQ(Tr("100% of %1, 5%", "all"), "100% of all, 5%");
  EXPECT_EQ(Tr("%1 and %3", "one"), "one and %3");
  EXPECT_EQ(Tr("%1", "%1 is not read again"), "%1 is not read again");
}

TEST(Texts, ChoosesThePluralForm) {
  EXPECT_EQ(TrCount("one file", "%1 files", 1), "one file");
  EXPECT_EQ(TrCount("one file", "%1 files", 0), "0 files");
  EXPECT_EQ(TrCount("%1 file in %2", "%1 files in %2", 12345, "x"), "12345 files in x");
  EXPECT_EQ(TrGroupedCount("%1 file in %2", "%1 files in %2", 12345, "x"), "12,345 files in x");
}

TEST(Texts, RecordedTextsKeepTheirEnglish) {
  RecordedText text = TrRecorded("First %1.", 1);
  text.Append(TrRecorded("Second."));
  EXPECT_EQ(text.english, "First 1. Second.");
}

// Texts in tables are translated when displayed; xgettext finds them only if the table marks them
// with TrLater.
TEST(Texts, TablesAreMarkedForTranslation) {
  std::string pot;
  ASSERT_EQ(platform::ReadWholeFile(test::SourcePath("po/fotomill.pot"), limits.listFileBytes, pot), platform::ReadResult::Done);
  const auto expect = [&](std::string_view text) {
    std::string entry = "\nmsgid \"";
    for (const char c : text) {
      if (c == '"' || c == '\\') entry += '\\';
      entry += c;
    }
    entry += "\"\n";
    EXPECT_NE(pot.find(entry), std::string::npos) << "mark it with TrLater and run po/update: " << text;
  };
  for (const cli::Command& command : cli::Commands()) expect(command.summary);
  for (const Library& library : cli::Libraries()) expect(library.purpose);
  for (const FormatSettings* const codec : SettingsOfFormats()) {
    expect(codec->group);
    for (const FormatSetting& setting : codec->keys) {
      if (*setting.label != '\0') expect(setting.label);
    }
  }
  for (const Operation* const operation : Operations()) {
    expect(operation->label);
    expect(operation->help);
    for (const Parameter& parameter : operation->parameters) expect(parameter.help);
  }
  for (int32_t i = 0; i < formatCount; ++i) {
    if (const std::string_view reason = FormatRow(i).whyNot; !reason.empty()) expect(reason);
    // "It looks like an icon."; other names are proper nouns
    for (const Signature& signature : FormatRow(i).signatures) {
      if (signature.name.starts_with("a ") || signature.name.starts_with("an "))
        expect(signature.name);
    }
  }
}

}  // namespace
}  // namespace fotomill
