#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <filesystem>

#include "catalog/similar/sharpness.h"
#include "desktop/models/similar/folder_list_text.h"
#include "desktop/models/similar/group_list.h"
#include "desktop/models/similar/similar_run.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "processing/geometry/scale.h"
#include "processing/pictures.h"
#include "registry/registry.h"
#include "support/files.h"

namespace fotomill::desktop {
namespace {

using test::TemporaryFolder;
using testing::ElementsAre;

// --- the list of groups ---

SimilarPicture PictureOf(const char* name, int32_t side, uint64_t bytes, int64_t date,
                         float sharpness) {
  SimilarPicture picture{.path = "/pictures/" + std::string(name)};
  picture.stamp.size = bytes;
  picture.width = picture.height = side;
  picture.date = date;
  picture.sharpness = sharpness;
  return picture;
}

// Two groups, of three pictures and of two.
std::vector<FoundGroup> TwoGroups() {
  return {{{PictureOf("a", 10, 500, 2000, 3), PictureOf("b", 20, 100, 3000, 1),
            PictureOf("c", 20, 200, 3000, 2)},
           4},
          {{PictureOf("d", 5, 50, 4000, -1), PictureOf("e", 5, 50, 1000, -1)}, 0}};
}

GroupList ListOf(std::vector<FoundGroup> groups) {
  GroupList list;
  list.SetGroups(std::move(groups));
  return list;
}

// The names in order; the best has a star, ticked ones are in parentheses.
std::string Text(const GroupList& list) {
  std::string text;
  for (size_t i = 0; i < list.Cells().size(); ++i) {
    if (i > 0 && std::ranges::count(list.Starts(), i) > 0) text += "|";
    std::string name(platform::FileNameOf(list.Picture(i).path));
    if (list.Cells()[i].best) name += "*";
    text += list.Cells()[i].ticked ? "(" + name + ")" : name;
  }
  return text;
}

TEST(GroupList, SuggestsTheBestByRule) {
  const struct {
    BestRule rule;
    const char* text;
  } kRows[] = {{BestRule::Largest, "c*ab|e*d"},
               {BestRule::Sharpest, "a*bc|e*d"},
               {BestRule::Oldest, "a*bc|e*d"}};
  GroupList list = ListOf(TwoGroups());
  for (const auto& row : kRows) {
    list.SetRule(row.rule);
    EXPECT_EQ(Text(list), row.text);
  }
  EXPECT_FALSE(list.Measured());
  list.SetRule(BestRule::Sharpest);
  list.SetSharpness({1, 2, 3, 5, 4});
  EXPECT_EQ(Text(list), "c*ab|d*e");
  EXPECT_TRUE(list.Measured());
}

TEST(GroupList, KeepsOneOfEachGroupUnlessAllAreTicked) {
  GroupList list = ListOf(TwoGroups());
  list.TickAllButBest();
  EXPECT_EQ(Text(list), "c*(a)(b)|e*(d)");
  EXPECT_EQ(list.FullyTicked(), 0u);
  EXPECT_EQ(list.TickedCount(), 3u);
  EXPECT_EQ(list.TickedBytes(), 650u);
  EXPECT_TRUE(list.Tick(0, true));
  EXPECT_TRUE(list.Tick(3, true));
  EXPECT_EQ(list.FullyTicked(), 2u);
  list.KeepBest();
  EXPECT_EQ(Text(list), "c*(a)(b)|e*(d)");
  // Where one stays anyway, the best may go.
  EXPECT_TRUE(list.Tick(0, true));
  EXPECT_TRUE(list.Tick(1, false));
  list.KeepBest();
  EXPECT_EQ(Text(list), "(c*)a(b)|e*(d)");
  list.UntickAll();
  EXPECT_EQ(list.TickedCount(), 0u);
  // Only the first page was compared.
  std::vector<FoundGroup> groups = TwoGroups();
  groups[0].pictures[0].severalPages = true;
  list.SetGroups(groups);
  list.TickAllButBest();
  EXPECT_EQ(Text(list), "c*a(b)|e*(d)");
}

TEST(GroupList, FollowsWhatBecomesOfFiles) {
  using enum FileNow;
  GroupList list = ListOf(TwoGroups());
  list.TickAllButBest();
  const struct {
    const char* name;
    std::vector<FileNow> states;  // of a to e
    const char* text;
  } kRows[] = {
      {"the best is gone", {Same, Same, Gone, Same, Same}, "b*a|e*d"},
      {"as before", {Same, Same, Same, Same, Same}, "c*ab|e*d"},
      {"one changed: it is not the best, nor ticked",
       {Same, Same, Changed, Same, Unknown},
       "b*ac|d*e"},
      {"the last one is not shown", {Same, Same, Same, Same, Gone}, "c*ab"},
      {"single ones are not shown", {Gone, Same, Gone, Gone, Same}, ""},
      {"nothing is suggested", {Changed, Changed, Gone, Same, Same}, "ab|e*d"},
  };
  for (const auto& row : kRows) {
    SCOPED_TRACE(row.name);
    list.SetStates(row.states);
    list.UntickAll();
    EXPECT_EQ(Text(list), row.text);
  }
  list.SetStates({Same, Same, Same, Same, Same});
  list.TickAllButBest();
  list.SetStates({Same, Same, Same, Same, Gone});
  EXPECT_EQ(list.TickedCount(), 2u) << "the last of its group does not count";
  list.SetStates({Same, Changed, Same, Same, Same});
  list.UntickAll();
  list.TickAllButBest();
  EXPECT_EQ(Text(list), "c*(a)b|e*(d)");
  EXPECT_FALSE(list.Tick(2, true));
  // What has changed does not count as one that stays.
  EXPECT_TRUE(list.Tick(0, true));
  EXPECT_EQ(list.FullyTicked(), 1u);
  list.SetStates({Changed, Same, Same, Same, Same});
  EXPECT_EQ(Text(list), "(c*)ab|e*(d)") << "no longer ticked";
}

TEST(GroupList, ComparesAWholeGroupOrPartOfIt) {
  std::vector<SimilarPicture> many;
  for (const char* name : {"a", "b", "c", "d", "e", "f"})
    many.push_back(PictureOf(name, 10, 10, 10, 0));
  GroupList list = ListOf({{many, 3}, TwoGroups()[1]});
  const struct {
    size_t cell;
    std::string names;
  } kRows[] = {{0, "abcd"}, {1, "abcd"}, {2, "acde"}, {5, "adef"}, {6, "ed"}, {7, "ed"}};
  for (const auto& row : kRows) {
    std::string names;
    for (const std::string& path : list.ToCompare(row.cell, 4)) names += platform::FileNameOf(path);
    EXPECT_EQ(names, row.names) << row.cell;
  }
  EXPECT_EQ(list.GroupText(0), "6 pictures, 60 bytes, distance 3");
  EXPECT_EQ(list.GroupText(6), "2 pictures, 100 bytes");
  (void)list.Tick(7, true);
  EXPECT_EQ(list.CellText(7), "d, 2 of 2, ticked");
  EXPECT_EQ(list.CellText(0), "a, 1 of 6, best");
  EXPECT_EQ(list.CountText(), "2 groups with 8 pictures, 1 ticked (50 bytes)");
}

TEST(FolderListText, IsReadBack) {
  const std::vector<std::string> odd{"/with; in it", "/b"};
  EXPECT_EQ(ParseFolderList(FolderListText(odd), odd), odd);
  EXPECT_THAT(ParseFolderList("/a; /b/../c", odd), ElementsAre("/a", "/c"));
  EXPECT_THAT(ParseFolderList("; ", odd), ElementsAre());
}

TEST(SimilarProgress, SaysWhatIsDone) {
  using enum SimilarStage;
  EXPECT_EQ(SimilarProgressText({Listing, 1234, 0}, 9), "Listing the folders: 1,234 pictures");
  EXPECT_EQ(SimilarProgressText({Reading, 500, 2000}, 10),
            "Reading picture 500 of 2,000, 30 s left");
  EXPECT_EQ(SimilarProgressText({Reading, 500, 2000}, 1), "Reading picture 500 of 2,000");
}

// --- searching ---

// Smooth hills, different for each seed; `fine` adds as many small steps from edge to edge.
PicturePointer Scene(int32_t side, uint32_t seed, int32_t fine = 0) {
  return test::MakePicture(side, side, [=](int32_t x, int32_t y) {
    const double u = 1.0 * x / side, v = 1.0 * y / side;
    double level = 120;
    for (uint32_t wave = 1; wave < 9; ++wave) {
      const uint32_t some = (wave * 2654435761U) ^ (seed * 40503U);
      level += 13 * std::sin(u * (some % 19) + v * (some / 19 % 19) + some % 7);
    }
    if (fine > 0 && (x * fine / side + y * fine / side) % 2 != 0) level += 6;
    const auto gray = static_cast<uint32_t>(std::clamp(level, 0.0, 255.0));
    return gray << 16 | gray << 8 | gray;
  });
}

class SimilarRun : public testing::Test {
 protected:
  void Save(const std::string& name, PicturePointer picture) {
    ASSERT_EQ(WritePicture(*picture, Path(name), {}), Status::Ok) << name;
  }
  std::string Path(const std::string& name) const { return folder_.Path(name); }
  SimilarQuestion Question() const {
    return {.folders = {Path("in")}, .options = {.distance = 6}, .store = folder_.Path("store")};
  }
  SimilarFindings Find(const SimilarQuestion& question) {
    return FindSimilarPictures(question, {}, [this](const SimilarProgress& progress) {
      stages_.push_back(progress.stage);
      if (progress.stage == SimilarStage::Reading) read_ = progress.done;
    });
  }
  // "a.bmp b.bmp|c.bmp d.bmp"
  static std::string Names(const SimilarFindings& findings) {
    std::string names;
    for (const FoundGroup& group : findings.groups) {
      for (const SimilarPicture& picture : group.pictures)
        names.append(platform::FileNameOf(picture.path)).append(" ");
      names += "|";
    }
    return names;
  }
  void SetUp() override {
    ASSERT_TRUE(platform::MakeFolders(Path("in/sub")));
    Save("in/a.bmp", Scene(64, 1));
    Save("in/b.bmp", Scene(96, 1));
    Save("in/other.bmp", Scene(64, 2));
    Save("in/sub/c.bmp", Scene(64, 1));
    for (const auto& entry : std::filesystem::recursive_directory_iterator(Path("in")))
      std::filesystem::last_write_time(
          entry, std::filesystem::file_time_type::clock::now() - std::chrono::hours(1));
  }
  TemporaryFolder folder_;
  std::vector<SimilarStage> stages_;
  uint64_t read_ = 0;
};

TEST_F(SimilarRun, FindsGroupsAndSaysWhatCannotBeRead) {
  test::WriteText(Path("in/broken.bmp"), "BM and no more");
  SimilarQuestion question = Question();
  question.folders.push_back(Path("missing"));
  question.folders.push_back(Path("in/sub"));  // again
  SimilarFindings findings = Find(question);
  EXPECT_EQ(Names(findings), "a.bmp b.bmp c.bmp |");
  EXPECT_EQ(findings.compared, 4u);
  ASSERT_EQ(findings.problems.size(), 2u);
  EXPECT_THAT(findings.problems[0], testing::HasSubstr("missing"));
  EXPECT_THAT(findings.problems[1], testing::HasSubstr("broken.bmp: "));
  const SimilarPicture& second = findings.groups[0].pictures[1];
  EXPECT_EQ(second.width, 96);
  EXPECT_EQ(second.stamp, platform::StampOf(Path("in/b.bmp")));
  EXPECT_GT(second.date, 20250000000000);

  // Nothing is read again; more options.
  std::filesystem::remove(Path("in/broken.bmp"));
  read_ = 0;
  question = Question();
  question.subfolders = false;
  EXPECT_EQ(Names(Find(question)), "a.bmp b.bmp |");
  EXPECT_EQ(read_, 0u);
  question.subfolders = question.options.exact = true;
  EXPECT_EQ(Names(Find(question)), "a.bmp c.bmp |");
}

TEST_F(SimilarRun, NamesOfOneFileAreNotCopies) {
  Save("elsewhere.bmp", Scene(64, 1));
  std::filesystem::create_symlink(Path("elsewhere.bmp"), Path("in/link.bmp"));
  std::filesystem::create_hard_link(Path("in/other.bmp"), Path("in/same.bmp"));
  EXPECT_EQ(Names(Find(Question())), "a.bmp b.bmp c.bmp |");
}

TEST_F(SimilarRun, OtherPagesAndArchivesMayHoldMore) {
  using namespace std::string_literals;
  // 4 x 4 pixels; a clear code before each keeps the codes at 3 bits
  std::string codes;
  for (size_t bits = 0, count = 0; const char pixel : "1100100000010101"s) {
    const auto add = [&](size_t code) {
      bits |= code << count;
      for (count += 3; count >= 8; count -= 8, bits >>= 8) codes += static_cast<char>(bits & 0xff);
    };
    add(4);
    add(pixel == '1' ? 1 : 0);
  }
  codes += "\5"s;
  const std::string frame =
      ",\0\0\0\0\4\0\4\0\0\2"s + static_cast<char>(codes.size()) + codes + "\0"s;
  for (const char* name : {"in/p.gif", "in/q.gif"})
    test::WriteText(Path(name),
                    "GIF89a\4\0\4\0\x80\0\0\0\0\0\xff\xff\xff"s + frame + frame + ";");
  test::WriteText(Path("in/archive.zip"), "PK");
  SimilarQuestion question = Question();
  for (const bool exact : {false, true}) {
    question.options.exact = exact;
    const SimilarFindings findings = Find(question);
    EXPECT_THAT(findings.problems, ElementsAre());
    ASSERT_EQ(findings.groups.size(), 2u);
    EXPECT_FALSE(findings.groups[0].pictures[0].severalPages);
    EXPECT_EQ(findings.groups[1].pictures[0].severalPages, !exact);
  }
}

TEST_F(SimilarRun, KeepsWhatWasFoundWhenStopped) {
  (void)Find(Question());  // these are in the store
  for (int i = 0; i < 400; ++i)
    std::filesystem::copy_file(Path("in/a.bmp"), Path("in/a" + std::to_string(i) + ".bmp"));
  const StopSource source;
  const SimilarFindings findings =
      FindSimilarPictures(Question(), source.Token(), [&](const SimilarProgress& progress) {
        if (progress.stage == SimilarStage::Reading) source.Stop();
      });
  ASSERT_EQ(findings.groups.size(), 1u);
  EXPECT_GE(findings.groups[0].pictures.size(), 3u);
  EXPECT_LT(findings.compared, 400u);
}

TEST_F(SimilarRun, MeasuresSharpnessOnce) {
  Save("in/a.bmp", Scene(64, 1, 16));
  SimilarQuestion question = Question();
  question.sharpness = true;
  const SimilarFindings findings = Find(question);
  ASSERT_EQ(findings.groups.size(), 1u);
  const std::vector<SimilarPicture>& pictures = findings.groups[0].pictures;
  EXPECT_GT(pictures[0].sharpness, pictures[2].sharpness) << "a has more detail than c";
  ASSERT_GE(pictures[2].sharpness, 0);
  uint64_t tried = 0;
  const auto again =
      MeasurePictures({pictures[2].path, Path("in/gone.bmp")}, question, {},
                      [&](const SimilarProgress& progress) { tried = progress.count; });
  EXPECT_THAT(again, ElementsAre(pictures[2].sharpness, testing::Lt(0)));
  EXPECT_EQ(tried, 1u) << "only the missing one";
}

TEST_F(SimilarRun, KnowsWhatBecameOfAFile) {
  const SimilarPicture picture = Find(Question()).groups[0].pictures[0];
  EXPECT_EQ(StateNow(picture), FileNow::Same);
  const auto time = std::filesystem::last_write_time(picture.path);
  std::filesystem::last_write_time(picture.path, time + std::chrono::seconds(1));
  EXPECT_EQ(StateNow(picture), FileNow::Changed);
  std::filesystem::remove(picture.path);
  EXPECT_EQ(StateNow(picture), FileNow::Gone);
}

TEST(Sharpness, ComparesPicturesOfAllSizes) {
  const auto sharpness = [](const PicturePointer& picture) {
    float value = -1;
    EXPECT_EQ(MeasureSharpness(*picture, value), Status::Ok);
    return value;
  };
  const auto compare = [&](int32_t fine) {
    const PicturePointer picture = Scene(400, 1, fine);
    const float whole = sharpness(picture);
    EXPECT_EQ(ScalePicture(*picture, {50, 50}, {}), Status::Ok);
    EXPECT_GT(whole, sharpness(picture)) << fine;
  };
  for (const int32_t fine : {25, 50, 100}) compare(fine);
  const float detailed = sharpness(Scene(400, 1, 100));
  EXPECT_GT(detailed, sharpness(Scene(400, 1)));
  EXPECT_GT(detailed, sharpness(Scene(50, 1))) << "a small one has no detail";
  for (const int32_t side : {1, 2, 3}) EXPECT_GE(sharpness(Scene(side, 1)), 0) << side;
}

}  // namespace
}  // namespace fotomill::desktop
