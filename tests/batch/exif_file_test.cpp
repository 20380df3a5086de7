#include "batch/rewrite/exif_file.h"

#include <gtest/gtest.h>

#include "batch/rewriting.h"
#include "files/file_operation.h"
#include "files/previous_file.h"
#include "formats/jpeg/jpeg.h"
#include "formats/png/png.h"
#include "metadata/edit/exif_input.h"
#include "metadata/edit/strip.h"
#include "platform/files.h"
#include "support/codecs.h"
#include "support/faults.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

ExifChanger Artist(std::string name) {
  return [name](const ExifDirectories&, std::string&) {
    return ExifChanges{{ExifPlace::First, 0x013b, ExifTextEntry(0x013b, name)}};
  };
}

// Every operation on the system fails once: the file is the old or the new one, and nothing is
// beside it.
TEST(ExifFile, FaultsLoseNothing) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.jpg"), copy = folder.Path("b.jpg");
  const std::vector<uint8_t> old = Encode(JpegWrite, *PatternPicture(32, 16, 24));
  WriteBytes(path, old);
  ASSERT_EQ(EditExifFile(path, path, Artist("Ann Lee"), {}, {}).status, Status::Ok);
  const std::vector<uint8_t> made = ReadBytes(path);
  ASSERT_NE(made, old);
  int64_t faults = ForEachFault([&] {
    WriteBytes(path, old);
    const RewrittenFile result = EditExifFile(path, path, Artist("Ann Lee"), {}, {});
    const int64_t left = platform::faultCountdown.exchange(0);
    EXPECT_EQ(ReadBytes(path), result.changed ? made : old);
    EXPECT_EQ(result.status == Status::Ok, result.changed);
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"a.jpg"});
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 4);
  WriteBytes(path, made);
  faults = ForEachFault([&] {
    const RewrittenFile result = StripFile(path, copy, {kKeepUsually, false}, {}, {});
    const int64_t left = platform::faultCountdown.exchange(0);
    EXPECT_EQ(ReadBytes(path), made);
    EXPECT_EQ(platform::FileExists(copy), result.changed);
    if (result.changed) {
      EXPECT_LT(ReadBytes(copy).size(), made.size());
      EXPECT_TRUE(platform::DeleteFile(copy));
    }
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"a.jpg"});
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 4);
}

TEST(ExifFile, WhatAnotherProgramChangesIsNotUsed) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("a.jpg"), copy = folder.Path("b.jpg");
  const std::vector<uint8_t> old = Encode(JpegWrite, *PatternPicture(32, 16, 24));
  for (const std::string& destination : {path, copy}) {
    WriteBytes(path, old);
    WriteOptions options;
    options.makeWay = [&] {
      WriteText(path, "somebody's work");
      return true;
    };
    const RewrittenFile result = EditExifFile(path, destination, Artist("Ann"), {}, options);
    EXPECT_EQ(result.status, Status::FileReadError);
    EXPECT_EQ(result.hint, "The file was changed by another program.");
    EXPECT_EQ(ReadText(path), "somebody's work");
    EXPECT_EQ(folder.Names(), std::vector<std::string>{"a.jpg"});
  }
}

TEST(ExifFile, UndoGivesTheOldFileBack) {
  const TemporaryFolder folder;
  const std::vector<uint8_t> jpeg = Encode(JpegWrite, *PatternPicture(32, 16, 24)),
                             png = Encode(PngWrite, *PatternPicture(9, 5, 24));
  WriteBytes(folder.Path("a.jpg"), jpeg);
  WriteBytes(folder.Path("b.png"), png);
  PreviousFiles previous;
  const Rewriter edit = [](const std::string& source, const std::string& destination,
                           const RewriteRequest& request, const WriteOptions& options) {
    return EditExifFile(source, destination, Artist("Ann Lee"), request, options);
  };
  RewriteInPlace({folder.Path("a.jpg"), folder.Path("b.png")}, edit, previous);
  EXPECT_NE(ReadBytes(folder.Path("a.jpg")), jpeg);
  EXPECT_NE(ReadBytes(folder.Path("b.png")), png);
  const FileOperation operation = previous.Operation();
  ASSERT_EQ(operation.steps.size(), 2u);
  (void)Revert(operation);
  EXPECT_EQ(ReadBytes(folder.Path("a.jpg")), jpeg);
  EXPECT_EQ(ReadBytes(folder.Path("b.png")), png);
}

}  // namespace
}  // namespace fotomill::test
