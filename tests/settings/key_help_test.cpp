#include "settings/key_help.h"

#include <gtest/gtest.h>

#include <cctype>
#include <filesystem>
#include <set>
#include <string>

#include "support/files.h"

namespace fotomill {
namespace {

// Prefixes of functions that this build does not have; the rule for names knows them all.
const std::set<std::string> kWithoutEffect = {"PrefixSocialMedia", "SupercompressorSaveFilePrefix"};
// Sources that only list keys.
const std::set<std::string> kLists = {"setup_pages.cpp", "override_options.cpp", "spin_range.cpp"};

void AddKeysOf(const std::string& text, std::set<std::string>& used) {
  for (const std::string_view lead :
       {"settings.", "KeyNumber::", "Settings::", ".key = \"", "{\"", "=\""}) {
    for (size_t at = text.find(lead); at != std::string::npos; at = text.find(lead, at + 1)) {
      size_t end = at + lead.size();
      while (end < text.size() && std::isalnum(static_cast<unsigned char>(text[end])) != 0) ++end;
      const std::string name = text.substr(at + lead.size(), end - at - lead.size());
      if (FindKey(name) != nullptr) used.insert(name);
    }
  }
}

TEST(KeyHelp, ExplainsExactlyTheUsedKeys) {
  std::set<std::string> used;
  for (const auto& entry : std::filesystem::recursive_directory_iterator(test::SourcePath("src"))) {
    const std::string extension = entry.path().extension().string();
    if ((extension == ".cpp" || extension == ".h") &&
        !kLists.contains(entry.path().filename().string()))
      AddKeysOf(test::ReadText(entry.path().string()), used);
  }
  for (const KeyRow& row : Keys()) {
    const bool isUsed = used.contains(row.name);
    EXPECT_TRUE(!isUsed || kWithoutEffect.contains(row.name) || IsKeyUsed(row))
        << row.name << " needs an entry in docs/user/settings.md";
    EXPECT_TRUE(isUsed || !IsKeyUsed(row)) << row.name << " is read nowhere";
    EXPECT_EQ(KeyHelp(row).empty(), !IsKeyUsed(row));
  }
}

TEST(KeyHelp, IsPlainText) {
  EXPECT_EQ(KeySummary(*FindKey("UndoLevels")),
            "How many file operations (renaming, moving, copying, moving to the trash) can be undone.");
  EXPECT_EQ(KeyHelp(*FindKey("WebPLossless")),
            "WebP files are lossless. If off, they have the quality of WebPQualityFactor and are much smaller.");
  EXPECT_EQ(KeySummary(*FindKey("WebPLossless")), "WebP files are lossless.");
  EXPECT_EQ(KeyHelp(*FindKey("QuickTimeCodec")), "");
  for (const KeyRow& row : Keys()) {
    EXPECT_EQ(KeyHelp(row).find_first_of("`*#\n"), std::string::npos) << row.name;
    EXPECT_TRUE(!IsKeyUsed(row) || KeySummary(row).ends_with('.')) << row.name;
  }
}

}  // namespace
}  // namespace fotomill
