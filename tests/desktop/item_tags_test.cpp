#include "desktop/models/browser/item_tags.h"

#include <gtest/gtest.h>

#include "desktop/models/browser/browser_model.h"

namespace fotomill::desktop::test {
namespace {

TEST(ItemTags, FilterByRatingAndLabel) {
  const auto label = [](int place) {
    return static_cast<TagFilter>(static_cast<int>(TagFilter::FirstLabel) + place);
  };
  const struct {
    int32_t rating;
    const char* label;
    TagFilter filter;
    bool passes;
  } rows[] = {
      {0, "", TagFilter::All, true},
      {0, "", TagFilter::Unrated, true},
      {-1, "", TagFilter::Unrated, false},
      {-1, "", TagFilter::Rejected, true},
      {0, "", TagFilter::Rejected, false},
      {3, "", TagFilter::ThreeStars, true},
      {4, "", TagFilter::ThreeStars, true},
      {2, "", TagFilter::ThreeStars, false},
      {5, "", TagFilter::FiveStars, true},
      {0, "red", label(0), true},
      {0, "Purple", label(4), true},
      {5, "Red", label(1), false},
      {0, "", label(0), false},
  };
  for (const auto& row : rows) {
    FolderItem item{};
    item.rating = row.rating;
    item.label = row.label;
    EXPECT_EQ(Passes(item, row.filter), row.filter == TagFilter::All) << "not read yet";
    item.tagged = true;
    EXPECT_EQ(Passes(item, row.filter), row.passes) << row.rating << row.label;
  }
}

TEST(ItemTags, KeysRateAndToggleLabels) {
  EXPECT_EQ(ChangesOfKey('0', "")->rating, 0);
  EXPECT_EQ(ChangesOfKey('5', "")->rating, 5);
  EXPECT_EQ(ChangesOfKey('6', "")->label, "Red");
  EXPECT_EQ(ChangesOfKey('6', "red")->label, "");
  EXPECT_EQ(ChangesOfKey('9', "Red")->label, "Blue");
  EXPECT_FALSE(ChangesOfKey('5', "Red")->label);
  for (const int key : {int{'/'}, int{':'}, int{'a'}, 0}) EXPECT_FALSE(ChangesOfKey(key, ""));
}

TEST(ItemTags, ModelKeepsWhatBelongsTogether) {
  BrowserModel model;
  model.SetFolder("/p");
  std::vector<FolderItem> items(2);
  items[0].name = "a.nef";
  items[1].name = "b.jpg";
  for (FolderItem& item : items) {
    item.tagged = true;
    item.rating = 3;
  }
  model.SetItems(items);
  model.SetTagFilter(TagFilter::ThreeStars);
  EXPECT_EQ(model.LineCount(), 2u);
  // facts that were asked for before do not bring old tags back
  FolderItem facts = items[1];
  facts.rating = 0;
  facts.width = 7;
  model.SetFacts(1, facts);
  EXPECT_EQ(model.Item(1).rating, 3);
  EXPECT_EQ(model.Item(1).width, 7);
  model.ForgetTags({"/p/a.nef.xmp", "/p/c.xmp"});
  EXPECT_FALSE(model.Item(0).tagged);
  EXPECT_TRUE(model.Item(1).tagged);
  model.UpdateOrder();
  EXPECT_EQ(model.LineCount(), 1u);
}

}  // namespace
}  // namespace fotomill::desktop::test
