#include "desktop/models/browser/jump_search.h"

#include <gtest/gtest.h>

#include "desktop/models/browser/browser_model.h"

namespace fotomill::desktop {
namespace {

TEST(JumpSearch, MatchesWordsOrPhrases) {
  constexpr JumpRules kWordStarts{}, kAnywhere{false, false}, kPhrase{true, true},
      kPhraseAnywhere{false, true};
  const struct {
    const char* name;
    const char* text;
    JumpRules rules;
    bool matches;
  } rows[] = {
      {"beach at night.jpg", "", kWordStarts, true},
      {"beach at night.jpg", "", kPhrase, true},
      {"beach at night.jpg", "BEA", kWordStarts, true},
      {"beach at night.jpg", "ni be", kWordStarts, true},
      {"beach at night.jpg", "  ni  ", kWordStarts, true},
      {"beach at night.jpg", "each", kWordStarts, false},
      {"beach at night.jpg", "each", kAnywhere, true},
      {"beach at night.jpg", "each lake", kAnywhere, false},
      {"beach at night.jpg", "at n", kPhrase, true},
      {"beach at night.jpg", "t n", kPhrase, false},
      {"beach at night.jpg", "t n", kPhraseAnywhere, true},
      {"beach at night.jpg", "ni be", kPhraseAnywhere, false},
      {"banana.jpg", "na", kWordStarts, false},
      {"banana na.jpg", "na", kWordStarts, true},  // not at the first place, but later
      {"IMG_2041.jpg", "2041", kWordStarts, true},
      {"IMG2041.jpg", "2041", kWordStarts, true},
      {"IMG2041.jpg", "041", kWordStarts, false},
      {"2041img.jpg", "img", kWordStarts, true},
      {"\xC3\x9C" "bersee.jpg", "\xC3\xBC" "ber", kWordStarts, true},
      {"M\xC3\xBC" "nchen.jpg", "nchen", kWordStarts, false},
  };
  for (const auto& row : rows)
    EXPECT_EQ(JumpMatches(row.name, row.text, row.rules), row.matches)
        << row.name << " / " << row.text << row.rules.atStart << row.rules.phrase;
}

TEST(JumpSearch, ListsShownItemsInOrder) {
  BrowserModel model;
  model.SetFolder("/p");
  std::vector<FolderItem> items(4);
  for (size_t i = 0; i < items.size(); ++i) items[i].name = std::string("b") + "3120"[i] + ".jpg";
  items[3].name = "sub/b9.jpg";
  model.SetItems(items);
  model.SetFilter("b");
  const std::vector<FolderItem> found = JumpTargets(model, "b", {});
  ASSERT_EQ(found.size(), 4u);
  EXPECT_EQ(found[0].name, "b1.jpg");
  EXPECT_EQ(found[3].name, "sub/b9.jpg") << "found by its own name";
  EXPECT_TRUE(JumpTargets(model, "sub", {}).empty()) << "not by its folder";
  model.SetFilter("b2");
  EXPECT_EQ(JumpTargets(model, "b", {}).size(), 1u) << "hidden files are not found";
}

}  // namespace
}  // namespace fotomill::desktop
