#include "archive/archive_reader.h"

#include <gtest/gtest.h>

#include <filesystem>
#include <string>
#include <utility>
#include <vector>

#include "archive/archive_exchange.h"
#include "archive/archive_limits.h"
#include "archive/extract.h"
#include "archive/zip_writer.h"
#include "platform/files.h"
#include "support/faults.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

// A ZIP archive of stored files with these contents, named "0", "1", ...
std::string Archive(const TemporaryFolder& folder, const std::vector<std::string>& contents,
                    const std::string& password = {}) {
  const std::string path = folder.Path("made.zip");
  ZipWriter zip;
  EXPECT_EQ(zip.Create(path, password), Status::Ok);
  for (size_t i = 0; i < contents.size(); ++i) {
    WriteText(folder.Path("member"), contents[i]);
    EXPECT_EQ(zip.Add(folder.Path("member"), std::to_string(i), {}), Status::Ok);
  }
  EXPECT_EQ(zip.Finish(platform::Existing::Replace), platform::CommitResult::Done);
  EXPECT_TRUE(platform::DeleteFile(folder.Path("member")));
  return path;
}

struct Received final : EntryReceiver {
  Status Begin(size_t index) override {
    begun.push_back(index);
    text.clear();
    return index == refused ? Status::ErrorCreatingFile : Status::Ok;
  }
  Status Data(std::span<const uint8_t> bytes) override {
    text.append(bytes.begin(), bytes.end());
    return Status::Ok;
  }
  void End(size_t index, const ArchiveEnd& end) override {
    ended.push_back({index, end.status});
    texts.push_back(text);
  }
  size_t refused = SIZE_MAX;
  std::string text;
  std::vector<size_t> begun;
  std::vector<std::pair<size_t, Status>> ended;
  std::vector<std::string> texts;
};

class ArchiveReader : public testing::Test {
 protected:
  void SetUp() override {
    if (!HasArchiveLibrary()) GTEST_SKIP() << "libarchive is not installed";
  }
  void TearDown() override { archiveLimits = {}; }
  TemporaryFolder folder;
};

TEST_F(ArchiveReader, UnpacksWhatIsWanted) {
  const std::string large(3 * kExchangeBlock + 17, 'x');
  const ArchiveSource source = {Archive(folder, {"zero", large, "", "three"})};
  std::vector<ArchiveEntry> entries;
  ASSERT_EQ(ListArchive(source, entries).status, Status::Ok);
  ASSERT_EQ(entries.size(), 4u);
  EXPECT_EQ(entries[1].facts.size, large.size());
  Received received;
  received.refused = 3;
  EXPECT_EQ(ReadArchive(source, entries, {false, true, true, true}, received).status, Status::Ok);
  EXPECT_EQ(received.begun, (std::vector<size_t>{1, 2, 3}));
  EXPECT_EQ(received.texts, (std::vector<std::string>{large, "", ""}));
  EXPECT_EQ(received.ended[1].second, Status::Ok);
  EXPECT_EQ(received.ended[2].second, Status::ErrorCreatingFile);
}

TEST_F(ArchiveReader, KeepsToTheLimits) {
  const ArchiveSource source = {Archive(folder, {std::string(100'000, 'x'), "b", "c"})};
  std::vector<ArchiveEntry> entries;
  archiveLimits.entries = 2;
  ArchiveEnd end = ListArchive(source, entries);
  EXPECT_EQ(end.trouble, ArchiveTrouble::TooManyEntries);
  EXPECT_EQ(entries.size(), 2u);
  archiveLimits = {};
  archiveLimits.ratio = 1;
  ASSERT_EQ(ListArchive(source, entries).status, Status::Ok);
  Received received;
  EXPECT_EQ(ReadArchive(source, entries, {true, true, true}, received).status, Status::Ok);
  archiveLimits.unpackedBytes = 99'999;
  end = ReadArchive(source, entries, {true, true, true}, received);
  EXPECT_EQ(end.trouble, ArchiveTrouble::Bomb);
  EXPECT_EQ(received.ended.back(), std::make_pair(size_t{0}, Status::UnsupportedFormat));
}

TEST_F(ArchiveReader, NoticesAChangedArchive) {
  const ArchiveSource source = {Archive(folder, {"a", "b"})};
  std::vector<ArchiveEntry> entries;
  ASSERT_EQ(ListArchive(source, entries).status, Status::Ok);
  entries[1].name = "other";
  Received received;
  EXPECT_EQ(ReadArchive(source, entries, {false, true}, received).trouble, ArchiveTrouble::Changed);
  EXPECT_TRUE(received.begun.empty());
  entries.resize(1);
  EXPECT_EQ(ReadArchive(source, entries, {true}, received).trouble, ArchiveTrouble::Changed);
}

TEST_F(ArchiveReader, StopsWhenAsked) {
  const StopSource stop;
  stop.Stop();
  const ArchiveSource source = {
      .path = Archive(folder, {"a"}), .password = {}, .stop = stop.Token()};
  std::vector<ArchiveEntry> entries;
  EXPECT_EQ(ListArchive(source, entries).status, Status::FunctionCancelled);
}

// Every byte of a small archive is damaged once: no crash, no wrong contents taken for right.
TEST_F(ArchiveReader, SurvivesDamage) {
  const std::string whole = ReadText(Archive(folder, {"contents", "more"}));
  for (size_t at = 0; at < whole.size(); at += 3) {
    std::string damaged = whole;
    damaged[at] = static_cast<char>(damaged[at] ^ 0x5A);
    WriteText(folder.Path("d.zip"), damaged);
    const ArchiveSource source = {folder.Path("d.zip")};
    std::vector<ArchiveEntry> entries;
    (void)ListArchive(source, entries);
    Received received;
    (void)ReadArchive(source, entries, std::vector<bool>(entries.size(), true), received);
    for (size_t i = 0; i < received.ended.size(); ++i) {
      if (received.ended[i].second != Status::Ok || received.texts[i].empty()) continue;
      EXPECT_TRUE(received.texts[i] == "contents" || received.texts[i] == "more") << at;
    }
  }
}

// A write fails at every place in turn: there is the whole archive, or none.
TEST_F(ArchiveReader, WritesAllOrNothing) {
  WriteText(folder.Path("a"), std::string(5000, 'a'));
  const int64_t faults = ForEachFault([&] {
    {
      ZipWriter zip;
      bool done = zip.Create(folder.Path("x.zip"), "") == Status::Ok &&
                  zip.Add(folder.Path("a"), "a", {}) == Status::Ok;
      done = done && zip.Finish(platform::Existing::Refuse) == platform::CommitResult::Done;
      EXPECT_EQ(std::filesystem::exists(folder.Path("x.zip")), done);
    }
    std::filesystem::remove(folder.Path("x.zip"));
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{"a"}));
  });
  EXPECT_GT(faults, 2);
}

TEST_F(ArchiveReader, FinishesNoArchiveWithPartOfAFile) {
  WriteText(folder.Path("a"), "contents");
  const StopSource stop;
  stop.Stop();
  ZipWriter zip;
  ASSERT_EQ(zip.Create(folder.Path("x.zip"), ""), Status::Ok);
  EXPECT_EQ(zip.Add(folder.Path("a"), "a", stop.Token()), Status::FunctionCancelled);
  EXPECT_EQ(zip.Finish(platform::Existing::Refuse), platform::CommitResult::Failed);
  EXPECT_FALSE(platform::FileExists(folder.Path("x.zip")));
}

// Extracting is all or nothing as well.
TEST_F(ArchiveReader, ExtractsAllOrNothing) {
  const ArchiveSource source = {Archive(folder, {std::string(300'000, 'x')})};
  const std::string target = folder.Path("out");
  const int64_t faults = ForEachFault([&] {
    Status status = Status::FileReadError;
    std::vector<ArchiveEntry> entries;
    (void)ListArchive(source, entries);
    const ExtractJob job = {.place = [&](const ArchiveEntry&) { return ExtractPlace{target}; },
                            .done = [&](const ArchiveEntry&, const std::string&,
                                        const ArchiveEnd& end) { status = end.status; }};
    (void)ExtractArchive(source, entries, std::vector<bool>(entries.size(), true), job);
    EXPECT_EQ(std::filesystem::exists(target), status == Status::Ok);
    if (status == Status::Ok) {
      EXPECT_EQ(ReadText(target).size(), 300'000u);
    }
    std::filesystem::remove(target);
    EXPECT_EQ(folder.Names(), (std::vector<std::string>{"made.zip"}));
  });
  EXPECT_GT(faults, 2);
}

TEST_F(ArchiveReader, RefusesPasswordsOverTheLimit) {
  ZipWriter zip;
  EXPECT_EQ(zip.Create(folder.Path("x.zip"), std::string(kLongestPassword + 1, 'x')),
            Status::InvalidPassword);
  EXPECT_EQ(zip.Create(folder.Path("x.zip"), std::string("a\0b", 3)), Status::InvalidPassword);
  const std::string longest(kLongestPassword, 'p');
  const ArchiveSource source = {Archive(folder, {"secret"}, longest), longest};
  std::vector<ArchiveEntry> entries;
  ASSERT_EQ(ListArchive(source, entries).status, Status::Ok);
  Received received;
  EXPECT_EQ(ReadArchive(source, entries, {true}, received).status, Status::Ok);
  EXPECT_EQ(received.texts, (std::vector<std::string>{"secret"}));
}

}  // namespace
}  // namespace fotomill::test
