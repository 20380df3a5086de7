#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include "catalog/search/picture_index.h"
#include "catalog/search/picture_search.h"
#include "catalog/search/search_criteria.h"
#include "core/folded_text.h"
#include "platform/files.h"
#include "support/bitmaps.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

TEST(FoldedText, IgnoresLetterCase) {
  const struct {
    const char *a, *b;
  } rows[] = {{"ABC xyz 12", "abc XYZ 12"},
              {"\u00c4\u00d6\u00dc", "\u00e4\u00f6\u00fc"},
              {"\u0141\u00d3D\u0179", "\u0142\u00f3d\u017a"},
              {"\u0178", "\u00ff"},
              {"\u0391\u0386\u038f", "\u03b1\u03ac\u03ce"},
              {"\u041c\u041e\u0421\u041a\u0412\u0410 \u0401",
               "\u043c\u043e\u0441\u043a\u0432\u0430 \u0451"},
              {"\u1e9e\u1ea0", "\u1e9e\u1ea1"}};
  for (const auto& row : rows) EXPECT_TRUE(IsTextLike(row.a, row.b)) << row.a;
  for (const char* same :
       {"\u00d7", "\u00df", "\u0131", "\u4e2d", "\xc3", "\xff\xfe", "\U0001f600"})
    EXPECT_EQ(FoldCase(same), same);
  EXPECT_NE(FoldCase("\u00e4"), FoldCase("a"));
  EXPECT_TRUE(ContainsText("Z\u00dcRICH am See", "z\u00fcrich"));
  EXPECT_TRUE(IsTextLike("Z\u00dcRICH", "z\u00fc*"));
  EXPECT_FALSE(IsTextLike("Z\u00dcRICH", "z\u00fcri"));
}

TEST(SearchRanges, Parse) {
  constexpr int64_t kMost = INT64_MAX, kLeast = INT64_MIN;
  using Range = std::optional<NumberRange>;
  const struct {
    Range (*parse)(std::string_view text);
    const char* text;
    Range range;
  } rows[] = {
      {ParseNumberRange, "3..", NumberRange{3, kMost}},
      {ParseNumberRange, "..-1", NumberRange{kLeast, -1}},
      {ParseNumberRange, "2..4", NumberRange{2, 4}},
      {ParseNumberRange, "4", NumberRange{4, 4}},
      {ParseNumberRange, "4..2", {}},
      {ParseNumberRange, "..", {}},
      {ParseNumberRange, "", {}},
      {ParseNumberRange, "x..", {}},
      {ParseNumberRange, "1..2..3", {}},
      {ParseSizeRange, "500k..2M", NumberRange{500 * 1024, 2 * 1024 * 1024}},
      {ParseSizeRange, "1G..", NumberRange{1 << 30, kMost}},
      {ParseSizeRange, "0", NumberRange{0, 0}},
      {ParseSizeRange, "-1..", {}},
      {ParseSizeRange, "k", {}},
      {ParseSizeRange, "9999999999999999G..", {}},
      {ParseDateRange, "2024", NumberRange{20240000000000, 20249999999999}},
      {ParseDateRange, "2024-05..2025", NumberRange{20240500000000, 20259999999999}},
      {ParseDateRange, "2024:05:31..", NumberRange{20240531000000, kMost}},
      {ParseDateRange, "2024-05-31T14:03", NumberRange{20240531140300, 20240531140399}},
      {ParseDateRange, "2024-05-31 14:03:09", NumberRange{20240531140309, 20240531140309}},
      {ParseDateRange, "24", {}},
      {ParseDateRange, "2024-", {}},
      {ParseDateRange, "2024-5", {}},
      {ParseDateRange, "2024-13", {}},
      {ParseDateRange, "2024-05-32", {}},
      {ParseDateRange, "2024-05-31 14:03:09.5", {}},
      {ParseDateRange, "2024/05", {}},
  };
  for (const auto& row : rows) EXPECT_EQ(row.parse(row.text), row.range) << row.text;
}

PictureFacts Beach() {
  PictureFacts facts{.parts = kFactsTags | kFactsHeader | kFactsFaces | kFactsDamage,
                     .format = "JPG",
                     .width = 4000,
                     .height = 3000,
                     .faces = 1,
                     .decoded = Status::DamagedFile};
  PictureTags& tags = facts.tags;
  tags.title = "Title";
  tags.description = "At the Sea";
  tags.comment = "Remark";
  tags.keywords = {"Sand", "Places/Italy/Rome", "A|B"};
  tags.rating = 3;
  tags.label = "Red";
  tags.creator = "Ada";
  tags.city = "Ostia";
  tags.taken = 20240531140309;
  tags.camera = "Canon EOS 40D";
  return facts;
}

TEST(SearchCriteria, AreMetOrNot) {
  using Criteria = SearchCriteria;
  const struct {
    const char* name;
    Criteria criteria;
    bool met;
  } rows[] = {
      {"nothing", {}, true},
      {"part of the name", {.name = "BEACH"}, true},
      {"a pattern", {.name = "*.jpg"}, true},
      {"a pattern is for the whole name", {.name = "each*"}, false},
      {"the folder is not part of it", {.name = "photos"}, false},
      {"comment", {.comment = "the sea"}, true},
      {"title", {.comment = "TITLE"}, true},
      {"remark", {.comment = "mark"}, true},
      {"keywords are no comment", {.comment = "sand"}, false},
      {"keyword", {.keywords = {"sand"}}, true},
      {"part of a keyword", {.keywords = {"san"}}, false},
      {"pattern of a keyword", {.keywords = {"san*"}}, true},
      {"level", {.keywords = {"italy", "b"}}, true},
      {"path", {.keywords = {"places/italy/rome"}}, true},
      {"one is missing", {.keywords = {"sand", "snow"}}, false},
      {"text in the name", {.text = "beach"}, true},
      {"text in a keyword", {.text = "rom"}, true},
      {"text in the camera", {.text = "eos"}, true},
      {"text in a place", {.text = "ostia"}, true},
      {"text nowhere", {.text = "red"}, false},
      {"camera", {.camera = "canon"}, true},
      {"label", {.label = "red"}, true},
      {"part of a label", {.label = "re"}, false},
      {"format", {.formats = {"JPEG", "JPG"}}, true},
      {"other format", {.formats = {"PNG"}}, false},
      {"rating", {.rating = NumberRange{3, 5}}, true},
      {"low rating", {.rating = NumberRange{4, 5}}, false},
      {"width", {.width = NumberRange{4000, 4000}}, true},
      {"height", {.height = NumberRange{3001, 4000}}, false},
      {"size", {.size = NumberRange{1000, 1000}}, true},
      {"taken", {.taken = NumberRange{20240531140309, 20240531140309}}, true},
      {"taken later", {.taken = NumberRange{20240531140310, INT64_MAX}}, false},
      {"faces", {.faces = true}, true},
      {"damaged", {.damaged = true}, true},
      {"all", {.name = "beach", .camera = "nikon"}, false},
      {"any", {.any = true, .name = "beach", .camera = "nikon"}, true},
      {"none of any", {.any = true, .name = "tree", .camera = "nikon"}, false},
  };
  for (const auto& row : rows) {
    const PictureFacts facts = Beach();
    EXPECT_EQ(Meets(row.criteria, "/photos/Beach.jpg", 1000, [&](uint32_t) { return &facts; }),
              row.met)
        << row.name;
    EXPECT_EQ(IsEmpty(row.criteria), std::string_view(row.name) == "nothing") << row.name;
  }
  const PictureFacts unknown;  // no date, no size
  for (const Criteria& criteria : {Criteria{.taken = NumberRange{INT64_MIN, 20250000000000}},
                                   Criteria{.width = NumberRange{INT64_MIN, 100}}})
    EXPECT_FALSE(Meets(criteria, "a.jpg", 0, [&](uint32_t) { return &unknown; }));
}

// A picture is not decoded if cheaper criteria decide.
TEST(SearchCriteria, AskForCheapFactsFirst) {
  const PictureFacts facts = Beach();
  const auto asked = [&](const SearchCriteria& criteria) {
    uint32_t parts = 0;
    (void)Meets(criteria, "/photos/Beach.jpg", 1000, [&](uint32_t more) {
      parts |= more;
      return &facts;
    });
    return parts;
  };
  EXPECT_EQ(asked({.name = "tree", .camera = "canon", .damaged = true}), 0u);
  EXPECT_EQ(asked({.name = "beach", .camera = "nikon", .damaged = true}), kFactsTags);
  EXPECT_EQ(asked({.camera = "canon", .damaged = true}), kFactsTags | kFactsDamage);
  EXPECT_EQ(asked({.any = true, .name = "beach", .damaged = true}), 0u);
  EXPECT_FALSE(Meets({.camera = "canon"}, "a.jpg", 1, [](uint32_t) { return nullptr; }));
}

TEST(PictureIndex, KeepsFactsOfUnchangedFiles) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.bmp"), store = folder.Path("index");
  WriteText(path, "first");
  ASSERT_TRUE(platform::SetModificationTime(path, {1000, 5}));
  const PictureState state = StateOf(path);
  {
    PictureIndex index(store);
    index.Put(path, state, Beach());
    ASSERT_TRUE(index.Save());
  }
  const PictureIndex index(store);
  EXPECT_EQ(index.Find(path, StateOf(path)), Beach());
  EXPECT_FALSE(index.Find(folder.Path("b.bmp"), state));
  // same size and second, other nanosecond; then another file with the same size and time
  ASSERT_TRUE(platform::SetModificationTime(path, {1000, 6}));
  EXPECT_FALSE(index.Find(path, StateOf(path)));
  WriteText(folder.Path("other"), "other");
  ASSERT_TRUE(platform::SetModificationTime(folder.Path("other"), {1000, 5}));
  ASSERT_EQ(platform::RenameFile(folder.Path("other"), path, platform::Existing::Replace),
            platform::CommitResult::Done);
  EXPECT_FALSE(index.Find(path, StateOf(path)));
  EXPECT_FALSE(StateOf(folder.Path("none")).regular);
  EXPECT_FALSE(StateOf(folder.Path()).regular);
}

TEST(RecordStore, KeepsWhatOthersAppendBeforeRewriting) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("store");
  const RecordLayout layout{"MAGICMAG", 0};
  RecordStore one(path, layout);
  const auto put = [](RecordStore& store, const std::string& name, int64_t modified) {
    store.Put(name, {.size = 1, .modified = modified, .data = "data of " + name});
  };
  put(one, "/one", 1);
  ASSERT_TRUE(one.Save());
  const auto putMany = [&](RecordStore& store, const std::string& place, int64_t modified) {
    for (int64_t i = 0; i < 5000; ++i) put(store, place + std::to_string(i), modified);
    ASSERT_TRUE(store.Save());
  };
  for (int64_t time = 0; time < 3; ++time) putMany(one, "/a/", time);  // mostly outdated now
  RecordStore two(path, layout);
  putMany(two, "/b/", 5);
  put(one, "/three", 3);
  ASSERT_TRUE(one.Save()) << "would be rewritten but for the records of the other one";
  putMany(one, "/a/", 9);
  const auto size = ReadBytes(path).size();
  put(two, "/two", 2);
  ASSERT_TRUE(two.Save());
  EXPECT_LT(ReadBytes(path).size(), size) << "rewritten";
  put(one, "/four", 4);
  ASSERT_TRUE(one.Save());
  const RecordStore all(path, layout);
  for (const auto& [name, time] : {std::pair{"/one", 1},
                                   {"/two", 2},
                                   {"/three", 3},
                                   {"/four", 4},
                                   {"/b/4999", 5},
                                   {"/a/0", 9}}) {
    const StoredRecord* const record = all.Find(name, 1, time);
    ASSERT_NE(record, nullptr) << name;
    EXPECT_EQ(record->data, "data of " + std::string(name));
  }
  EXPECT_EQ(all.Find("/a/0", 1, 2), nullptr);
}

// A claimed length beyond the record, with a right checksum, is not believed.
TEST(RecordStore, ChecksLengths) {
  const TemporaryFolder folder;
  for (const uint32_t claimed : {0u, 3u, 4u, 0xfffffff0u}) {
    RecordStore(folder.Path("store"), {"MAGICMAG", 0});
    std::vector<uint8_t> body(16);
    for (int shift = 0; shift < 32; shift += 8)
      body.push_back(static_cast<uint8_t>(claimed >> shift));
    for (const char c : {'a', 'b', '/', 'p'}) body.push_back(static_cast<uint8_t>(c));
    uint32_t sum = 0x811c9dc5u;
    for (const uint8_t byte : body) sum = (sum ^ byte) * 0x01000193u;
    std::vector<uint8_t> bytes{'M', 'A', 'G', 'I', 'C', 'M', 'A', 'G', 32, 0, 0, 0};
    for (int shift = 0; shift < 32; shift += 8) bytes.push_back(static_cast<uint8_t>(sum >> shift));
    bytes.insert(bytes.end(), body.begin(), body.end());
    WriteBytes(folder.Path("store"), bytes);
    const RecordStore store(folder.Path("store"), {"MAGICMAG", 0});
    EXPECT_EQ(store.Find("p", 0, 0) != nullptr, claimed == 3) << claimed;
    EXPECT_EQ(store.Find("ab/p", 0, 0) != nullptr, claimed == 0) << claimed;
  }
}

}  // namespace
}  // namespace fotomill::test
