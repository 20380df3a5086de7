#include "batch/rewrite/tag_file.h"

#include <gtest/gtest.h>

#include "batch/rewriting.h"
#include "files/file_operation.h"
#include "files/previous_file.h"
#include "formats/bmp/bmp.h"
#include "formats/gif/gif.h"
#include "formats/jpeg/jpeg.h"
#include "formats/photoshop/psd.h"
#include "support/codecs.h"
#include "support/faults.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

const TagRequest kRequest{.changes = {.rating = 4, .description = "Lake"}};

std::vector<uint8_t> Jpeg() { return Encode(JpegWrite, *PatternPicture(32, 16, 24)); }

PictureTags TagsIn(const std::string& path) {
  PictureTags tags;
  (void)ReadPictureTags(path, {}, tags);
  return tags;
}

// Every operation on the system fails once: each file is the old or the new one, and nothing else
// is there.
void SweepFaults(const std::string& name, const std::vector<uint8_t>& old) {
  SCOPED_TRACE(name);
  const TemporaryFolder folder;
  const std::string path = folder.Path(name), sidecar = path + ".xmp";
  WriteBytes(path, old);
  TagRequest beside = kRequest;
  beside.sidecarOnly = true;
  beside.changes.rating = 1;
  ASSERT_EQ(TagPictureFile(path, path, beside, {}, {}).status, Status::Ok);
  EXPECT_EQ(ReadBytes(path), old);
  const std::vector<uint8_t> oldSidecar = ReadBytes(sidecar);
  ASSERT_EQ(TagPictureFile(path, path, kRequest, {}, {}).status, Status::Ok);
  const std::vector<uint8_t> made = ReadBytes(path), newSidecar = ReadBytes(sidecar);
  ASSERT_NE(made, old);
  ASSERT_NE(newSidecar, oldSidecar);
  const int64_t faults = ForEachFault([&] {
    WriteBytes(path, old);
    WriteBytes(sidecar, oldSidecar);
    const RewrittenFile result = TagPictureFile(path, path, kRequest, {}, {});
    const int64_t left = platform::faultCountdown.exchange(0);
    const std::vector<uint8_t> now = ReadBytes(path), second = ReadBytes(sidecar);
    EXPECT_TRUE(now == old || now == made);
    EXPECT_TRUE(second == oldSidecar || second == newSidecar);
    EXPECT_EQ(result.changed, now == made || second == newSidecar);
    if (result.status == Status::Ok) {
      EXPECT_EQ(second, newSidecar);
    }
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{name, name + ".xmp"}));
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 8);
}

TEST(TagFile, FaultsLoseNothing) {
  SweepFaults("a.jpg", Jpeg());
  SweepFaults("a.gif", Encode(GifWrite, *PatternPicture(32, 16, 8)));
  SweepFaults("a.psd", Encode(PsdWrite, *PatternPicture(32, 16, 24)));
}

TEST(TagFile, UndoGivesFilesBackAndRemovesNewSidecars) {
  const TemporaryFolder folder;
  const std::vector<uint8_t> jpeg = Jpeg(), bmp = Encode(BmpWrite, *PatternPicture(9, 5, 24));
  WriteBytes(folder.Path("a.jpg"), jpeg);
  WriteBytes(folder.Path("b.bmp"), bmp);
  const std::vector<std::string> paths = {folder.Path("a.jpg"), folder.Path("b.bmp")};
  PreviousFiles previous;
  const Rewriter tag = [](const std::string& source, const std::string& destination,
                          const RewriteRequest& request, const WriteOptions& options) {
    return TagPictureFile(source, destination, kRequest, request, options);
  };
  RewriteInPlace(paths, tag, previous);
  const auto check = [&](bool tagged) {
    EXPECT_EQ(folder.Names().size(), tagged ? 3u : 2u);
    EXPECT_EQ(ReadBytes(folder.Path("a.jpg")) == jpeg, !tagged);
    EXPECT_EQ(ReadBytes(folder.Path("b.bmp")), bmp);
    for (const std::string& path : paths) EXPECT_EQ(TagsIn(path).rating, tagged ? 4 : 0);
  };
  check(true);
  FileOperation operation = previous.Operation(FileOperationKind::Tag);
  ASSERT_EQ(operation.steps.size(), 2u);
  operation = Revert(operation).done;
  ASSERT_EQ(operation.steps.size(), 2u);
  check(false);
  EXPECT_EQ(CarryOut(operation).done.steps.size(), 2u);
  check(true);
  // a sidecar that another program changed since stays
  WriteText(folder.Path("b.bmp.xmp"), "theirs");
  EXPECT_EQ(Revert(operation).failures.size(), 1u);
  EXPECT_EQ(ReadText(folder.Path("b.bmp.xmp")), "theirs");
}

TEST(TagFile, AFileThatAnotherProgramChangesIsKept) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.jpg");
  WriteBytes(path, Jpeg());
  WriteOptions options;
  options.makeWay = [&] {
    WriteText(path, "theirs");
    return true;
  };
  EXPECT_EQ(TagPictureFile(path, path, kRequest, {}, options).status, Status::FileReadError);
  EXPECT_EQ(ReadText(path), "theirs");
  EXPECT_EQ(folder.Names(), std::vector<std::string>{"a.jpg"});
}

TEST(TagFile, KeywordsAreAddedAndRemovedOnce) {
  const struct {
    TagChanges changes;
    std::vector<std::string> expected;
  } rows[] = {
      {{.addedKeywords = {"b", "c", "c"}}, {"a", "b", "c"}},
      {{.removedKeywords = {"a", "x"}}, {"b"}},
      {{.keywords = {{"z", "z", ""}}, .addedKeywords = {"y"}, .removedKeywords = {"z"}}, {"y"}},
      {{.rating = 1}, {"a", "b"}},
  };
  for (const auto& row : rows) EXPECT_EQ(ChangedKeywords({"a", "b"}, row.changes), row.expected);
}

}  // namespace
}  // namespace fotomill::test
