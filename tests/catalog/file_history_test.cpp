#include "catalog/history/file_history.h"

#include <gmock/gmock.h>
#include <signal.h>
#include <sys/resource.h>

#include "catalog/thumbnails/thumbnail_file.h"
#include "core/choice_lists.h"
#include "core/data_folder.h"
#include "platform/clock.h"
#include "settings/job_options.h"
#include "support/child.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/hex.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

using testing::ElementsAre;
using testing::IsEmpty;

constexpr int64_t kNow = 1'700'000'000;

// A fresh data folder and files to record, each as long as its number.
class FileHistory : public testing::Test {
 protected:
  FileHistory() {
    SetDataFolder(folder_.Path("data"));
    std::filesystem::create_directory(folder_.Path("data"));
    platform::FixNow(kNow);
    ClearFileHistory();
  }
  ~FileHistory() override {
    ClearFileHistory();
    platform::FixNow(-1);
    SetDataFolder({});
  }
  std::string File(const std::string& name, size_t size = 1) const {
    const std::string path = folder_.Path(name);
    std::filesystem::create_directories(std::filesystem::path(path).parent_path());
    WriteText(path, std::string(size, 'x'));
    return path;
  }
  std::string Store() const { return folder_.Path("data/FMWFileHistoryDatabase.fhdb"); }
  std::string Line(const std::string& name, const std::string& rest) const {
    return "\tPATH:" + folder_.Path(name) + rest + "\n";
  }
  // "NAME FUNCTION ACCESSED" of each entry in list order, with times relative to now.
  std::vector<std::string> List() const {
    std::vector<std::string> list;
    for (size_t i = 0; i < FileHistoryCount(); ++i) {
      const FileHistoryEntry entry = FileHistoryAt(i);
      list.push_back(std::string(entry.path.substr(folder_.Path().size() + 1)) + " " +
                     std::to_string(entry.function) + " " + std::to_string(entry.accessed - kNow));
    }
    return list;
  }
  std::vector<std::string> Stored() const {
    ClearFileHistory();
    LoadFileHistory(HistoryOptionsFromSettings());
    return List();
  }

  ScopedSettings keep_;
  TemporaryFolder folder_;
};

bool Record(const std::string& path, int function, int64_t before, int32_t created = kOwnTime) {
  return RecordFileHistory(HistoryOptionsFromSettings(), path, static_cast<FileFunction>(function),
                           created, static_cast<int32_t>(kNow - before));
}

TEST_F(FileHistory, RefreshesAnEntryAndKeepsItsSizeAndBirth) {
  const std::string a = File("a", 3);
  EXPECT_TRUE(Record(a, 9, 50, 1234));
  WriteText(a, "longer than before");
  EXPECT_TRUE(RecordFileHistory(HistoryOptionsFromSettings(), a, FileFunction::View));
  EXPECT_THAT(List(), ElementsAre("a 0 0"));
  EXPECT_EQ(FileHistoryAt(0).size, 3u);
  EXPECT_EQ(FileHistoryAt(0).created, 1234);
}

TEST_F(FileHistory, SortsByTimeThenBackwardsByNameThenPath) {
  for (const char* name : {"x/b.bmp", "b.jpg", "x/c.bmp", "b.bmp", "y/b.bmp", "a"})
    EXPECT_TRUE(Record(File(name), 0, 5));
  EXPECT_TRUE(Record(File("late"), 0, 4));
  EXPECT_TRUE(Record(File("early"), 0, 6));
  EXPECT_TRUE(Record(folder_.Path("a"), 0, 3));
  EXPECT_THAT(List(), ElementsAre("a 0 -3", "late 0 -4", "x/c.bmp 0 -5", "b.jpg 0 -5",
                                  "y/b.bmp 0 -5", "x/b.bmp 0 -5", "b.bmp 0 -5", "early 0 -6"));
}

TEST_F(FileHistory, IsLimitedByCountOrByDays) {
  for (int i = 0; i < 25; ++i) EXPECT_TRUE(Record(File("f" + std::to_string(i)), 0, 100 - i));
  ASSERT_EQ(FileHistoryCount(), 20u);
  EXPECT_EQ(List().front(), "f24 0 -76");
  EXPECT_EQ(List().back(), "f5 0 -95");
  settings.FileHistoryWindowCount = 3;
  EXPECT_TRUE(Record(File("old"), 0, 1000));
  EXPECT_THAT(List(), ElementsAre("f24 0 -76", "f23 0 -77", "f22 0 -78"));
  EXPECT_TRUE(Record(File("old"), 0, 10));  // back after it was cut off
  EXPECT_THAT(List(), ElementsAre("old 0 -10", "f24 0 -76", "f23 0 -77"));
  settings.FileHistoryWindowType = choice::kLimitDays;
  EXPECT_TRUE(Record(File("limit"), 0, 30 * 86400));
  EXPECT_TRUE(Record(File("beyond"), 0, 30 * 86400 + 1));
  EXPECT_EQ(List().back(), "limit 0 -2592000");
  settings.FileHistoryWindowType = choice::kLimitCount;
  settings.FileHistoryWindowCount = -1;
  EXPECT_TRUE(Record(File("none"), 0, 0));
  EXPECT_THAT(List(), IsEmpty());
}

TEST_F(FileHistory, RejectsInvalidEntries) {
  const std::string a = File("a");
  std::filesystem::create_directory(folder_.Path("folder"));
  std::string deep = folder_.Path();
  while (deep.size() < 200)
    deep += "/" + std::string(std::min<size_t>(50, 261 - deep.size() - 2), 'd');
  std::filesystem::create_directories(deep);
  const std::string fits = deep + "/" + std::string(260 - deep.size() - 1, 'f');
  const struct {
    const char* name;
    std::string path;
    int function;
    int32_t mask;
    bool recorded;
  } rows[] = {
      {"plain", a, 0, 1, true},
      {"masked", a, 1, 1, false},
      {"below", a, -1, -1, false},
      {"above", a, 20, -1, false},
      {"missing", folder_.Path("b"), 0, 1, false},
      {"a folder", folder_.Path("folder"), 0, 1, false},
      {"empty", "", 0, 1, false},
      {"260 bytes", fits, 0, 1, true},
      {"261 bytes", fits + "f", 0, 1, false},
      {"tab", File("a\tb"), 0, 1, false},
      {"newline", File("a\nb"), 0, 1, false},
      {"return", File("a\rb"), 0, 1, false},
      {"other bytes", File("\x01 \xff\xc3\xa4:"), 0, 1, true},
  };
  WriteText(fits, "");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    ClearFileHistory();
    settings.FileHistoryFunctions = row.mask;
    EXPECT_EQ(RecordFileHistory(HistoryOptionsFromSettings(), row.path, static_cast<FileFunction>(row.function)), row.recorded);
    const FileUse use{row.path, static_cast<FileFunction>(row.function)};
    EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}), HistoryUpdate::Done);
    if (!row.recorded) continue;
    EXPECT_TRUE(LoadFileHistory(HistoryOptionsFromSettings()));
    EXPECT_EQ(FileHistoryAt(0).path, row.path);
    std::filesystem::remove(Store());
  }
}

TEST_F(FileHistory, HasTheDocumentedLayout) {
  const std::string path = folder_.Path("data/a");
  WriteText(path, "");
  EXPECT_TRUE(Record(path, 9, 0));
  EXPECT_TRUE(SaveFileHistory(HistoryOptionsFromSettings()));
  EXPECT_EQ(FileHistoryCount(), 0u);
  std::vector<uint8_t> wanted = Hex("09 50 41 54 48 3A  # tab PATH:");
  wanted.insert(wanted.end(), path.begin(), path.end());
  const std::vector<uint8_t> rest = Hex(R"(09 46 55 4E 43 54 49 4F 4E 3A 39   # tab FUNCTION:9
      09 41 43 43 45 53 53 45 44 3A 31 37 30 30 30 30 30 30 30 30         # tab ACCESSED:1700000000
      09 45 4E 44 3A 0A                                                  # tab END: newline)");
  wanted.insert(wanted.end(), rest.begin(), rest.end());
  EXPECT_EQ(ReadBytes(Store()), wanted);
}

TEST_F(FileHistory, ReadsAllKindsOfLines) {
  File("a");
  File("b");
  const std::string good = Line("a", "\tFUNCTION:3\tACCESSED:1699999990\tEND:");
  settings.FileHistoryFunctions = 0xfffff;
  const struct {
    const char* name;
    std::string text;
    std::vector<std::string> list;
  } rows[] = {
      {"good", good, {"a 3 -10"}},
      {"blanks before", " \x01\x1f" + good, {"a 3 -10"}},
      {"a letter before", "x" + good + Line("b", "\tFUNCTION:0"), {"b 0 0"}},
      {"no time", Line("a", "\tFUNCTION:3"), {"a 3 0"}},
      {"no function", Line("a", "\tACCESSED:5") + good, {"a 3 -10"}},
      {"function too large", Line("a", "\tFUNCTION:25\tACCESSED:5"), {}},
      {"function huge", Line("a", "\tFUNCTION:4294967296\tACCESSED:5"), {}},
      {"order turned round", "\tACCESSED:1699999999\tFUNCTION:19" + Line("a", "\tEND:"), {"a 19 -1"}},
      {"cut at a return", Line("a", "\tFUNCTION:3\r\tACCESSED:5"), {"a 3 0"}},
      {"lines of DOS", good.substr(0, good.size() - 1) + "\r\n" + Line("b", "\tFUNCTION:4"), {"b 4 0", "a 3 -10"}},
      {"no end of line", good.substr(0, good.size() - 6), {"a 3 -10"}},
      {"file is gone", Line("c", "\tFUNCTION:3"), {}},
      {"empty path", "\tPATH:\tFUNCTION:3\n" + good, {"a 3 -10"}},
      {"path too long", "\tPATH:/" + std::string(300, 'x') + "\tFUNCTION:3\n" + good, {"a 3 -10"}},
      {"a line over two reads", std::string(4095, 'x') + good, {"a 3 -10"}},
      {"zeros", std::string(3, '\0') + good + good, {"a 3 -10"}},
      {"same path twice", good + Line("a", "\tFUNCTION:4\tACCESSED:1699999000"), {"a 4 -1000"}},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteText(Store(), row.text);
    EXPECT_EQ(Stored(), row.list);
  }
}

TEST_F(FileHistory, LeavesUnreadableFilesAlone) {
  const FileUse use{File("a"), FileFunction::View};
  EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}), HistoryUpdate::Done);
  for (const std::string text : {"a letter to my aunt\n", "\x89PNG\r\n"}) {
    WriteText(Store(), text);
    EXPECT_FALSE(LoadFileHistory(HistoryOptionsFromSettings()));
    EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}), HistoryUpdate::NotRead);
    EXPECT_EQ(ReadText(Store()), text);
  }
  std::filesystem::resize_file(Store(), (16u << 20) + 1);
  EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}), HistoryUpdate::NotRead);
  EXPECT_EQ(std::filesystem::file_size(Store()), (16u << 20) + 1);
  EXPECT_FALSE(SaveFileHistory(HistoryOptionsFromSettings())) << "nothing was loaded";
  EXPECT_TRUE(std::filesystem::exists(Store()));
  settings.FileHistoryDatabase = SettingName("../elsewhere");
  EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}), HistoryUpdate::Failed);
}

// An entry stays with its file, whatever the file is called.
TEST_F(FileHistory, EntriesFollowTheirFiles) {
  const auto path = [&](const std::string& name) { return folder_.Path(name); };
  const auto move = [&](const std::string& from, const std::string& to) {
    std::filesystem::create_directories(std::filesystem::path(path(to)).parent_path());
    std::filesystem::rename(path(from), path(to));
    return FileUse{.path = path(to),
                   .function = FileFunction::MoveAndCopy,
                   .accessed = static_cast<int32_t>(kNow),
                   .from = path(from)};
  };
  const auto update = [&](const std::vector<FileUse>& uses) {
    size_t recorded = 99;
    EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), uses, &recorded),
              HistoryUpdate::Done);
    return recorded;
  };
  const auto viewed = [&](const std::string& name, int64_t before) {
    return FileUse{.path = File(name), .accessed = static_cast<int32_t>(kNow - before)};
  };
  EXPECT_EQ(update({viewed("a", 10), viewed("b", 20), viewed("d/e", 30), viewed("d/f/g", 40)}), 4u);
  // Where moves are not recorded, entries keep their function and time.
  settings.FileHistoryFunctions = ~(1 << 11) & 0xfffff;
  EXPECT_EQ(update({move("b", "c")}), 0u);
  EXPECT_THAT(Stored(), ElementsAre("a 0 -10", "c 0 -20", "d/e 0 -30", "d/f/g 0 -40"));
  // Two that change places.
  EXPECT_EQ(update({move("a", "t"), move("c", "a"), move("t", "c")}), 0u);
  EXPECT_THAT(Stored(), ElementsAre("c 0 -10", "a 0 -20", "d/e 0 -30", "d/f/g 0 -40"));
  // A name that had another file before, which some other program deleted.
  EXPECT_EQ(update({viewed("gone", 90)}), 1u);
  std::filesystem::remove(path("gone"));
  EXPECT_EQ(update({move("c", "gone"), move("gone", "c")}), 0u);
  EXPECT_THAT(Stored(), ElementsAre("c 0 -10", "a 0 -20", "d/e 0 -30", "d/f/g 0 -40"));
  // A folder takes along what is in it; itself it is no file.
  settings.FileHistoryFunctions = 0xfffff;
  EXPECT_EQ(update({move("d", "h"), viewed("d/e", 5)}), 1u);
  EXPECT_THAT(Stored(), ElementsAre("d/e 0 -5", "c 0 -10", "a 0 -20", "h/e 0 -30", "h/f/g 0 -40"));
  // Used, then renamed twice, all before it is written.
  EXPECT_EQ(update({viewed("a", 3), move("a", "x"), move("x", "y")}), 3u);
  EXPECT_THAT(Stored(),
              ElementsAre("y 11 0", "d/e 0 -5", "c 0 -10", "h/e 0 -30", "h/f/g 0 -40"));
  // Renamed within a folder that was renamed before, and within one that came in its place.
  EXPECT_EQ(update({viewed("k/v", 50), viewed("k/w", 60)}), 2u);
  settings.FileHistoryFunctions = ~(1 << 16) & 0xfffff;
  std::filesystem::rename(path("k"), path("m"));
  std::filesystem::rename(path("m/v"), path("m/u"));
  for (const char* file : {"k/w", "d2/w"}) File(file);
  const auto moved = [&](const std::string& from, const std::string& to) {
    return FileUse{.path = path(to), .function = FileFunction::FileTime, .from = path(from)};
  };
  EXPECT_EQ(update({moved("k", "m"), moved("m/v", "m/u"), moved("k/w", "d2/w")}), 0u);
  EXPECT_THAT(Stored(), ElementsAre("y 11 0", "d/e 0 -5", "c 0 -10", "h/e 0 -30", "h/f/g 0 -40",
                                    "m/u 0 -50", "m/w 0 -60"));
  std::filesystem::remove_all(path("m"));
  settings.FileHistoryFunctions = 0xfffff;
  // A file that has vanished counts as removed, whoever asks; so does all that was in a folder.
  std::filesystem::remove(path("c"));
  std::filesystem::remove_all(path("h"));
  EXPECT_EQ(update({{.path = path("c"), .removed = true}, {.path = path("h"), .removed = true}}),
            0u);
  EXPECT_EQ(ReadText(Store()).find(path("c") + "\t"), std::string::npos);
  EXPECT_EQ(ReadText(Store()).find(path("h/")), std::string::npos);
  EXPECT_THAT(Stored(), ElementsAre("y 11 0", "d/e 0 -5"));
  EXPECT_EQ(update({{.path = path("y"), .removed = true}}), 0u) << "it is there, but not wanted";
  EXPECT_THAT(Stored(), ElementsAre("d/e 0 -5"));
}

TEST_F(FileHistory, IsDeletedWhenSwitchedOff) {
  const FileUse use{File("a"), FileFunction::View};
  EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}), HistoryUpdate::Done);
  settings.FileHistoryEnable = 0;
  EXPECT_FALSE(LoadFileHistory(HistoryOptionsFromSettings()));
  EXPECT_TRUE(std::filesystem::exists(Store()));
  EXPECT_TRUE(SaveFileHistory(HistoryOptionsFromSettings()));
  EXPECT_FALSE(std::filesystem::exists(Store()));
}

// The list grows to 128 x 128 slots and more, but only slots with entries may use memory.
TEST_F(FileHistory, GrowsWithoutTouchingReservedMemory) {
  settings.FileHistoryWindowType = choice::kLimitDays;
  const std::string file = File("a");
  int64_t recorded = 0;
  struct rusage before, after;
  getrusage(RUSAGE_SELF, &before);
  for (int i = 0; i < 300; ++i) {
    const std::string link = folder_.Path("l" + std::to_string(i));
    std::filesystem::create_hard_link(file, link);
    recorded += Record(link, 0, (i * 7) % 300);
  }
  getrusage(RUSAGE_SELF, &after);
  EXPECT_EQ(recorded, 300);
  ASSERT_EQ(FileHistoryCount(), 300u);
  for (size_t i = 1; i < 300; ++i)
    EXPECT_GE(FileHistoryAt(i - 1).accessed, FileHistoryAt(i).accessed);
#ifndef __SANITIZE_ADDRESS__  // the sanitizer's shadow of reserved memory takes memory, too
  EXPECT_LT(after.ru_maxrss - before.ru_maxrss, 4 * 1024) << "kilobytes";
#endif
}

TEST_F(FileHistory, SlotsMatchTheirFiles) {
  settings.FileHistoryWindowType = choice::kLimitDays;
  const auto put = [&](const std::string& name, uint8_t value) {
    ThumbnailRecord record;
    record.Fill(value * 0x010101u);
    ASSERT_TRUE(WriteThumbnailFile(record, folder_.Path(name + ".THN"), true));
  };
  const auto shown = [&](size_t index) {
    const ThumbnailRecord* const record = FileHistoryThumbnail(index);
    return record == nullptr ? -1 : record->bytes[27911];
  };
  for (int i = 0; i < 130; ++i) {  // grows once
    EXPECT_TRUE(Record(File("f" + std::to_string(i) + ".bmp"), 0, i));
    if (i == 1) {
      put("f0", 10);
      put("f1", 11);
    }
    EXPECT_EQ(i < 1 ? 1011 : shown(0) * 100 + shown(1), 1011);
  }
  EXPECT_EQ(shown(2), -1);
  put("f2", 12);
  EXPECT_EQ(shown(2), 12);
  settings.FileHistoryWindowType = choice::kLimitCount;
  settings.FileHistoryWindowCount = 2;
  EXPECT_TRUE(Record(folder_.Path("f0.bmp"), 0, 0));  // the others are cut off, f2 the last
  EXPECT_TRUE(Record(File("g.bmp"), 0, 0));           // in the free slot
  EXPECT_EQ(FileHistoryAt(0).path, folder_.Path("g.bmp"));
  EXPECT_EQ(shown(0), -1);
}

TEST_F(FileHistory, FaultsLoseNoEntry) {
  const FileUse first{File("a"), FileFunction::View, kOwnTime, static_cast<int32_t>(kNow - 9)};
  EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&first, 1}), HistoryUpdate::Done);
  const std::string old = ReadText(Store());
  const FileUse second{File("b"), FileFunction::Convert};
  const int64_t faults = ForEachFault([&] {
    WriteText(Store(), old);
    size_t recorded = 0;
    const HistoryUpdate result =
        UpdateFileHistory(HistoryOptionsFromSettings(), {&second, 1}, &recorded);
    const int64_t left = platform::faultCountdown.exchange(0);
    const std::vector<std::string> stored = Stored();
    if (result == HistoryUpdate::Done && recorded == 1) {
      EXPECT_THAT(stored, ElementsAre("b 9 0", "a 0 -9"));
    } else {
      EXPECT_EQ(ReadText(Store()), old);
    }
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 3);
}

TEST_F(FileHistory, TwoProcessesKeepEachOthersEntries) {
  settings.FileHistoryWindowCount = 1000;
  std::vector<std::string> files;
  for (int i = 0; i < 40; ++i) files.push_back(File("f" + std::to_string(i)));
  const auto recordHalf = [&](size_t from) {
    for (size_t i = from; i < files.size(); i += 2) {
      const FileUse use{files[i], FileFunction::View};
      if (UpdateFileHistory(HistoryOptionsFromSettings(), {&use, 1}) != HistoryUpdate::Done)
        _exit(1);
    }
  };
  const pid_t child = fork();
  if (child == 0) {
    recordHalf(0);
    _exit(0);
  }
  recordHalf(1);
  int status = -1;
  waitpid(child, &status, 0);
  EXPECT_EQ(status, 0);
  EXPECT_EQ(Stored().size(), files.size());
}

TEST_F(FileHistory, AFullDiskLeavesTheOldFile) {
  const FileUse first{File("a"), FileFunction::View};
  EXPECT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&first, 1}), HistoryUpdate::Done);
  const std::string old = ReadText(Store());
  const FileUse second{File("b"), FileFunction::Convert};
  const int status = InChild([&] {
    signal(SIGXFSZ, SIG_IGN);
    const rlimit limit{10, 10};
    setrlimit(RLIMIT_FSIZE, &limit);
    _exit(UpdateFileHistory(HistoryOptionsFromSettings(), {&second, 1}) == HistoryUpdate::Failed
              ? 0
              : 1);
  });
  EXPECT_EQ(status, 0);
  EXPECT_EQ(ReadText(Store()), old);
}

}  // namespace
}  // namespace fotomill::test
