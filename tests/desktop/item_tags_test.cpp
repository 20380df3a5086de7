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
    item.tagged = false;
    item.outdated = true;
    EXPECT_EQ(Passes(item, row.filter), row.passes) << "until it is read again";
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
  EXPECT_EQ(model.LineCount(), 2u) << "the old rating counts until the new one is read";
}

// A rated file stays in a filtered list with focus and selection, unless the new rating hides it:
// then the next one takes its place.
TEST(ItemTags, FilterKeepsARatedFileUntilItsTagsAreRead) {
  BrowserModel model;
  model.SetFolder("/p");
  std::vector<FolderItem> items(4);
  for (size_t i = 0; i < items.size(); ++i) {
    items[i].name = std::string(1, static_cast<char>('a' + i)) + ".jpg";
    items[i].tagged = true;
    items[i].rating = i == 1 ? 0 : 3;
  }
  model.SetItems(items);
  model.SetTagFilter(TagFilter::ThreeStars);
  model.Selected().SelectOnly(1);  // c.jpg
  const auto rate = [&](size_t item, int32_t rating) {
    model.ForgetTags({"/p/" + items[item].name});
    std::vector<FolderItem> listed(items);
    listed[item].modified = 7 + rating;
    for (FolderItem& now : listed) now.tagged = false, now.rating = 0;
    model.SetItems(listed);
    EXPECT_EQ(model.LineCount(), 3u);
    EXPECT_EQ(model.Line(model.Selected().Focus()).name, items[item].name);
    EXPECT_TRUE(model.Selected().IsSelected(model.Selected().Focus()));
    FolderItem read = model.Item(item);
    EXPECT_FALSE(read.tagged);
    read.tagged = true;
    read.outdated = false;
    read.rating = rating;
    model.SetTags(item, read);
    model.UpdateOrder();
    return model.Line(model.Selected().Focus()).name;
  };
  EXPECT_EQ(rate(2, 5), "c.jpg");
  EXPECT_EQ(rate(2, 2), "d.jpg");
  EXPECT_EQ(model.LineCount(), 2u);
  EXPECT_EQ(model.FilesForFunction(), std::vector<std::string>{"/p/d.jpg"});
  FolderItem hidden = model.Item(3);
  hidden.rating = 0;
  model.SetTags(3, hidden);
  model.UpdateOrder();
  EXPECT_EQ(model.FilesForFunction(), std::vector<std::string>{"/p/a.jpg"});
}

}  // namespace
}  // namespace fotomill::desktop::test
