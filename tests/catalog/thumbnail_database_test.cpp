#include "catalog/thumbnails/thumbnail_database.h"

#include <gmock/gmock.h>
#include <signal.h>
#include <sys/resource.h>

#include <algorithm>
#include <nlohmann/json.hpp>
#include <random>
#include <thread>

#include "catalog/thumbnails/database_upkeep.h"
#include "core/data_folder.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "platform/volumes.h"
#include "support/bitmaps.h"
#include "support/child.h"
#include "support/command_line.h"
#include "support/faults.h"
#include "support/files.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using nlohmann::json;
using testing::ElementsAre;
using Opened = ThumbnailDatabase::Opened;
using Compacted = ThumbnailDatabase::Compacted;

class Database : public testing::Test {
 protected:
  Database() { platform::FixNow(0x65432100); }
  ~Database() override {
    platform::FixNow(-1);
    platform::ReplaceVolumeFunction(nullptr);
  }
  std::string Path() const { return folder_.Path("Fotomill.tdb"); }
  uint64_t Size() const { return std::filesystem::file_size(Path()); }
  // "PATH VOLUME PIXEL", followed by "x" if deleted; the pixel identifies the thumbnail.
  std::vector<std::string> Records() const {
    ThumbnailDatabase database;
    DatabaseHeader header;
    std::vector<std::string> records;
    if (database.OpenThumbnailDatabase(Path(), false) != Opened::Done ||
        !database.ReadDatabaseHeader(header))
      return {"unreadable"};
    for (int64_t i = 0; i < database.RecordCount(header); ++i) {
      DatabaseRecord record;
      if (!database.ReadDatabaseRecord(i, record)) return {"broken"};
      records.push_back(record.path + " " + record.volume + " " +
                        std::to_string(record.thumbnail.bytes[300]) + (record.deleted ? " x" : ""));
    }
    return records;
  }
  TemporaryFolder folder_;
};

DatabaseRecord Record(const std::string& path, const std::string& volume, uint8_t pixel) {
  DatabaseRecord record;
  record.thumbnail.Sign();
  record.thumbnail.bytes[300] = pixel;
  record.path = path;
  record.volume = volume;
  return record;
}

bool Append(ThumbnailDatabase& database, const std::string& path, const std::string& volume,
            uint8_t pixel, bool replace = false) {
  const DatabaseRecord record = Record(path, volume, pixel);
  return database.AppendDatabaseRecords({&record, 1}, replace);
}

TEST_F(Database, HasTheDocumentedLayout) {
  ThumbnailDatabase database;
  EXPECT_EQ(database.OpenThumbnailDatabase(Path(), false), Opened::Missing);
  ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
  std::vector<uint8_t> empty = Hex(R"(42 52 4E 54 54 44 42 58  # BRNTTDBX
      00 01 60 01  00 00 00 00  00 00 00 00                    # version, count, reserved
      00 21 43 65  00 21 43 65                                 # created, appended)");
  empty.resize(60);
  EXPECT_EQ(ReadBytes(Path()), empty);
  platform::FixNow(0x65432101);
  ASSERT_TRUE(Append(database, "/a", "PHOTOS:12345", 9));
  const std::vector<uint8_t> bytes = ReadBytes(Path());
  ASSERT_EQ(bytes.size(), 28502u);
  EXPECT_EQ(bytes[12], 1);
  EXPECT_EQ(bytes[24], 1);
  const auto part = [&](size_t from, size_t count) {
    return std::string(bytes.begin() + from, bytes.begin() + from + count);
  };
  EXPECT_EQ(part(60, 4), "THNL");
  EXPECT_EQ(part(60 + 27912, 261), "/a" + std::string(259, '\0'));
  EXPECT_EQ(part(60 + 28173, 261), "PHOTOS:12345" + std::string(249, '\0'));
  EXPECT_EQ(part(60 + 28434, 8), std::string(8, '\0'));
  EXPECT_EQ(database.Delete("/a"), 1);
  EXPECT_EQ(ReadBytes(Path())[60 + 28434], 1);
  const StopSource stop;
  stop.Stop();
  EXPECT_EQ(database.CompactThumbnailDatabase(false, nullptr, stop.Token()), Compacted::Stopped);
  EXPECT_EQ(Size(), 28502u);
  EXPECT_EQ(database.CompactThumbnailDatabase(false), Compacted::Done);
  EXPECT_EQ(Size(), 60u);
  EXPECT_THAT(folder_.Names(), ElementsAre("Fotomill.tdb"));
}

TEST_F(Database, IsPurgedOfVanishedPicturesWhenItPays) {
  const std::string dataBefore = DataFolder();
  SetDataFolder(folder_.Path("data"));
  std::filesystem::create_directory(folder_.Path("data"));
  constexpr int32_t kDays = 30;
  constexpr int64_t kStart = 0x65432100, kDay = 86'400;
  ThumbnailDatabase database;
  ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
  for (const char* name : {"a", "b", "c", "d", "e", "f"}) {
    WriteText(folder_.Path(name), name);
    ASSERT_TRUE(Append(database, folder_.Path(name), VolumeKeyFor(folder_.Path(name)), 1));
  }
  ASSERT_TRUE(Append(database, "/no/such/picture", "ANOTHER:1", 1));  // a drive that is not there
  const StopSource stopped;
  stopped.Stop();
  const struct {
    const char* removed;  // a file, before the check
    int64_t day;
    bool stop, checked;
    size_t records;
  } rows[] = {{"a", 0, true, false, 7},   {"a", 0, false, true, 7},  // one of seven is not enough
              {"b", 29, false, false, 7}, {"b", 30, false, true, 5},
              {"c", 59, false, false, 5}, {"d", 60, false, true, 3}};
  for (const auto& row : rows) {
    SCOPED_TRACE(row.day);
    std::filesystem::remove(folder_.Path(row.removed));
    platform::FixNow(kStart + row.day * kDay);
    const StopToken stop = row.stop ? stopped.Token() : StopToken();
    EXPECT_EQ(PurgeDatabaseWhenDue(Path(), kDays, false, stop), row.checked);
    EXPECT_EQ(Records().size(), row.records);
  }
  EXPECT_FALSE(PurgeDatabaseWhenDue({}, kDays, false, {}));
  SetDataFolder(dataBefore);
}

TEST_F(Database, RecordsGoForThePicturesTheyWereMadeOf) {
  ThumbnailDatabase database;
  ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
  DatabaseRecord record = Record("/a", "v", 1);
  record.stamp = PictureStampOf(0x165432107, 0xabcd123456);
  ASSERT_TRUE(database.AppendDatabaseRecord(record));
  const std::vector<uint8_t> bytes = ReadBytes(Path());
  EXPECT_THAT(std::vector(bytes.end() - 8, bytes.end()),
              ElementsAre(0, 0x07, 0x21, 0x43, 0x65, 0x56, 0x34, 0x12));
  ASSERT_TRUE(Append(database, "/old", "v", 2));  // of a program that keeps no time and size
  const struct {
    const char* name;
    const char* path;
    PictureStamp stamp;
    bool found;
  } rows[] = {
      {"the same", "/a", PictureStampOf(0x65432107, 0x123456), true},
      {"later", "/a", PictureStampOf(0x65432108, 0x123456), false},
      {"earlier", "/a", PictureStampOf(0x65432106, 0x123456), false},
      {"longer", "/a", PictureStampOf(0x65432107, 0x123457), false},
      {"only a size", "/a", PictureStampOf(0, 0x123456), false},
      {"nothing known of the picture", "/a", {}, true},
      {"nothing known of the record", "/old", PictureStampOf(1, 2), true},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    ThumbnailRecord found;
    EXPECT_EQ(database.Find(row.path, "v", found, row.stamp), row.found);
  }
  // An older record of the same path is not in the way of the current one.
  record.stamp = PictureStampOf(0x65432108, 5);
  record.thumbnail.bytes[300] = 3;
  ASSERT_TRUE(database.AppendDatabaseRecord(record));
  ThumbnailRecord found;
  ASSERT_TRUE(database.Find("/a", "v", found, record.stamp));
  EXPECT_EQ(found.bytes[300], 3);
  DatabaseRecord read;
  ASSERT_TRUE(database.ReadDatabaseRecord(2, read));
  EXPECT_EQ(read.stamp, record.stamp);
  EXPECT_EQ(database.Delete("/a"), 2);  // time and size stay as they are
  ASSERT_TRUE(database.ReadDatabaseRecord(2, read));
  EXPECT_TRUE(read.deleted && read.stamp == record.stamp);
}

TEST_F(Database, DeletesManyPathsAndWholeFolders) {
  ThumbnailDatabase database;
  ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
  for (const char* path : {"/p/a", "/p/b", "/p/b", "/pq/a", "/p/s/a", "/q/a", "/r/s/a"})
    ASSERT_TRUE(Append(database, path, "v", 1));
  const std::vector<std::string> paths = {"/p/b", "/none", "/q/a"};
  EXPECT_EQ(database.Delete(paths), 3);
  EXPECT_EQ(database.Delete(paths), 0);
  const std::vector<std::string> folders = {"/p", "/r/"};
  EXPECT_EQ(database.DeleteBelow(folders), 3);
  EXPECT_THAT(Records(), ElementsAre("/p/a v 1 x", "/p/b v 1 x", "/p/b v 1 x", "/pq/a v 1",
                                     "/p/s/a v 1 x", "/q/a v 1 x", "/r/s/a v 1 x"));
  ThumbnailRecord found;
  EXPECT_FALSE(database.Find("/r/s/a", "v", found));
  EXPECT_TRUE(database.Find("/pq/a", "v", found));
}

// Where it may not be written to, a database is still read; nothing is changed, nor replaced.
TEST_F(Database, OneThatMayOnlyBeReadIsRead) {
  {
    ThumbnailDatabase database;
    ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
    ASSERT_TRUE(Append(database, "/a", "v", 1));
  }
  std::filesystem::permissions(folder_.Path(), std::filesystem::perms(0777));
  std::filesystem::permissions(Path(), std::filesystem::perms(0444));
  const std::vector<uint8_t> before = ReadBytes(Path());
  const int status = InChild([&] {
    if (geteuid() == 0 && setresuid(65534, 65534, 65534) != 0) _exit(9);
    ThumbnailDatabase database;
    ThumbnailRecord found;
    if (database.OpenThumbnailDatabase(Path(), true) != Opened::NotRead) _exit(1);
    if (database.OpenToRead(Path()) != Opened::Done || database.IsOpenForChanges()) _exit(2);
    if (!database.Find("/a", "v", found) || found.bytes[300] != 1) _exit(3);
    if (Append(database, "/b", "v", 1) || database.Delete("/a") != -1) _exit(4);
    if (database.CompactThumbnailDatabase(false) != Compacted::NotRead) _exit(5);
  });
  EXPECT_EQ(status, 0);
  EXPECT_EQ(ReadBytes(Path()), before);
}

TEST_F(Database, NamesVolumes) {
  static platform::Volume volume;
  platform::ReplaceVolumeFunction([](const std::string&) { return volume; });
  const struct {
    bool available;
    std::string label, key;
  } rows[] = {
      {false, "X", "Unknown"},
      {true, "PHOTOS", "PHOTOS:4294967295"},
      {true, "", ":4294967295"},
      {true, std::string(248, 'x'), std::string(248, 'x') + ":4294967295"},
      {true, std::string(249, 'x'), std::string(249, 'x')},
      {true, std::string(300, 'x'), std::string(260, 'x')},
  };
  for (const auto& row : rows) {
    volume = {row.available, row.label, 4294967295u, platform::DriveKind::Fixed};
    EXPECT_EQ(VolumeKeyFor("/a"), row.key);
  }
}

// Every lookup must return the same as a scan from the first record, whatever happened before, and
// through any handle.
TEST_F(Database, LookupsMatchAScan) {
  ThumbnailDatabase one, two;
  ASSERT_EQ(one.OpenThumbnailDatabase(Path(), true), Opened::Done);
  ASSERT_EQ(two.OpenThumbnailDatabase(Path(), false), Opened::Done);
  struct Row {
    std::string path, volume;
    uint8_t pixel;
    bool deleted = false;
  };
  std::vector<Row> model;
  std::mt19937 random(7);
  for (int step = 0; step < 400; ++step) {
    SCOPED_TRACE(step);
    ThumbnailDatabase& database = random() % 2 ? one : two;
    const std::string path = "/p" + std::to_string(random() % 6),
                      volume = "v" + std::to_string(random() % 2);
    const auto pixel = static_cast<uint8_t>(step);
    switch (random() % 9) {
      case 0: {
        int64_t count = 0;
        for (Row& row : model)
          count += row.path == path && !std::exchange(row.deleted, row.deleted || row.path == path);
        EXPECT_EQ(database.Delete(path), count);
        break;
      }
      case 1:
        if (random() % 4 == 0) {
          ASSERT_EQ(database.CompactThumbnailDatabase(false), Compacted::Done);
          std::erase_if(model, [](const Row& row) { return row.deleted; });
        }
        break;
      case 2:
      case 3: {
        const bool replace = random() % 2;
        ASSERT_TRUE(Append(database, path, volume, pixel, replace));
        for (Row& row : model)
          row.deleted = row.deleted || (replace && row.path == path && row.volume == volume);
        model.push_back({path, volume, pixel});
        break;
      }
      case 4:
        if (!model.empty() && random() % 4 == 0) {
          const size_t index = random() % model.size();
          ASSERT_TRUE(database.WriteDatabaseRecord(static_cast<int64_t>(index), Record(path, volume, pixel)));
          model[index] = {path, volume, pixel};
        }
        break;
      default: break;
    }
    // After the database was compacted through another handle, the next change reopens it.
    ThumbnailDatabase fresh;
    ASSERT_EQ(fresh.OpenThumbnailDatabase(Path(), false), Opened::Done);
    ThumbnailRecord found;
    const auto wanted = std::ranges::find_if(model, [&](const Row& row) {
      return !row.deleted && row.path == path && row.volume == volume;
    });
    ASSERT_EQ(fresh.Find(path, volume, found), wanted != model.end());
    if (wanted != model.end()) {
      ASSERT_EQ(found.bytes[300], wanted->pixel);
    }
    ASSERT_EQ(database.Find(path, volume, found), wanted != model.end());
    if (wanted != model.end()) {
      ASSERT_EQ(found.bytes[300], wanted->pixel);
    }
  }
}

TEST_F(Database, ComparesExtensionsByOption) {
  ThumbnailDatabase database;
  ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
  ASSERT_TRUE(Append(database, "/p.x/a.jpg", "v", 1) && Append(database, "/p.x/a.png", "w", 2) &&
              Append(database, "/p.x/a.png", "v", 3));
  ThumbnailRecord found;
  EXPECT_FALSE(database.Find("/p.x/a.gif", "v", found));
  ASSERT_TRUE(database.Find("/p.x/a.png", "v", found));
  EXPECT_EQ(found.bytes[300], 3);
  browserOptions = 0;
  ASSERT_TRUE(database.Find("/p.x/a.gif", "v", found));
  EXPECT_EQ(found.bytes[300], 1);
  EXPECT_FALSE(database.Find("/p.y/a.jpg", "v", found));
  browserOptions = kCompareExtensions;
  // By exact path on any volume, including deleted ones.
  ASSERT_EQ(database.Delete("/p.x/a.png"), 2);
  ASSERT_TRUE(FindDatabaseThumbnail(found, "/p.x/a.png", Path()));
  EXPECT_EQ(found.bytes[300], 2);
  EXPECT_FALSE(FindDatabaseThumbnail(found, "/p.x/a.gif", Path()));
  std::vector<uint8_t> bytes = ReadBytes(Path());
  bytes[60] = 'X';
  WriteBytes(Path(), bytes);
  EXPECT_FALSE(FindDatabaseThumbnail(found, "/p.x/a.png", Path())) << "a record before it is none";
}

// Lookups are right whatever happened to the saved index.
TEST_F(Database, SavedIndexIsOnlyAHint) {
  constexpr int kMany = 1200;
  const std::string index = Path() + ".index";
  std::vector<DatabaseRecord> records;
  for (int i = 0; i < kMany; ++i)
    records.push_back(Record("/p/" + std::to_string(i), "v", static_cast<uint8_t>(i)));
  const auto open = [&](ThumbnailDatabase& database) {
    return database.OpenThumbnailDatabase(Path(), true) == Opened::Done;
  };
  const auto finds = [&](int number) {
    ThumbnailDatabase database;
    ThumbnailRecord found;
    const auto find = [&] {
      return database.Find("/p/" + std::to_string(number), "v", found) &&
             found.bytes[300] == number % 256;
    };
    if (!open(database)) return false;
    const bool inFile = find();  // the second time after loading everything
    EXPECT_EQ(find(), inFile);
    return inFile;
  };
  {
    ThumbnailDatabase database;
    ASSERT_TRUE(open(database) && database.AppendDatabaseRecords(records, true));
  }
  ASSERT_TRUE(std::filesystem::exists(index));
  const std::vector<uint8_t> good = ReadBytes(index);
  EXPECT_EQ(good.size(), 48u + 512 * 31);
  EXPECT_TRUE(finds(0) && finds(kMany - 1) && !finds(kMany));
  EXPECT_EQ(ReadBytes(index), good);
  std::vector<uint8_t> bad = good;
  // all hashes, but not the checksum
  for (size_t cell = 48; cell < bad.size(); cell += 8) bad[cell] ^= (cell - 48) % 512 != 0;
  WriteBytes(index, bad);
  EXPECT_TRUE(finds(7));
  EXPECT_EQ(ReadBytes(index), good) << "made anew";
  WriteBytes(index, {good.begin(), good.begin() + 100});
  EXPECT_TRUE(finds(7));
  {
    ThumbnailDatabase database;
    ASSERT_TRUE(open(database));
    ASSERT_TRUE(Append(database, "/p/7", "v", 99, true));
    EXPECT_EQ(database.Delete("/p/8"), 1);
  }
  EXPECT_TRUE(!finds(7) && !finds(8) && finds(9));
  WriteBytes(index, good);  // outdated
  EXPECT_TRUE(!finds(7) && !finds(8) && finds(9));
  WriteText(index, "precious");
  EXPECT_TRUE(finds(9));
  EXPECT_EQ(ReadText(index), "precious");
}

TEST(ThumbnailIndex, KnowsEveryRecordInOrderThroughChanges) {
  ThumbnailIndex index;
  std::vector<uint32_t> model;
  std::mt19937 random(3);
  // Few hashes, and some with the same home slot, so that probe sequences overlap.
  const auto hash = [&] {
    return random() % 3 == 0 ? 0 : static_cast<uint32_t>(random() % 40 + 1) << (random() % 2 * 27);
  };
  for (int step = 0; step < 4000; ++step) {
    if (random() % 3 != 0 || model.empty()) {
      model.push_back(hash());
      index.Append(model.back());
    } else {
      const size_t record = random() % model.size();
      model[record] = random() % 8 == 0 ? hash() : 0;
      index.Change(record, model[record]);
    }
    if (step % 50 != 0) continue;
    for (const uint32_t wanted : model) {
      std::vector<size_t> found, expected;
      for (size_t i = 0; i < model.size(); ++i) {
        if (wanted != 0 && model[i] == wanted) expected.push_back(i);
      }
      index.Find(std::max(wanted, 1u), [&](size_t record) {
        found.push_back(record);
        return false;
      });
      ASSERT_TRUE(wanted == 0 || found == expected) << step;
    }
  }
}

TEST_F(Database, LeavesUnreadableFilesAlone) {
  ThumbnailDatabase database;
  ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
  ASSERT_TRUE(Append(database, "/a", "v", 1));
  ASSERT_TRUE(Append(database, "/b", "v", 2));
  const std::vector<uint8_t> good = ReadBytes(Path());
  const auto count = [&](std::vector<uint8_t> bytes, std::initializer_list<uint8_t> value) {
    std::copy(value.begin(), value.end(), bytes.begin() + 12);
    return bytes;
  };
  std::vector<uint8_t> cut(good.begin(), good.end() - 1), foreign = good, hole = good;
  foreign[0] = 'X';
  hole[60] = 'X';
  const struct {
    const char* name;
    std::vector<uint8_t> bytes;
    bool opens, appends;
    Compacted compacts;
    bool findsB;
  } rows[] = {
      {"good", good, true, true, Compacted::Done, true},
      {"counts too many", count(good, {3, 0, 0, 0}), true, false, Compacted::NotRead, true},
      {"counts very many", count(good, {255, 255, 255, 127}), true, false, Compacted::NotRead, true},
      {"counts less than none", count(good, {255, 255, 255, 255}), true, false, Compacted::NotRead, false},
      {"counts fewer", count(good, {1, 0, 0, 0}), true, true, Compacted::Done, false},
      {"cut short", cut, true, false, Compacted::NotRead, false},
      {"a record that is none", hole, true, true, Compacted::NotRead, true},
      {"foreign", foreign, false, false, Compacted::NotRead, false},
      {"short header", {good.begin(), good.begin() + 59}, false, false, Compacted::NotRead, false},
      {"empty", {}, false, false, Compacted::NotRead, false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    WriteBytes(Path(), row.bytes);
    ThumbnailDatabase odd;
    ASSERT_EQ(odd.OpenThumbnailDatabase(Path(), true), row.opens ? Opened::Done : Opened::NotRead);
    if (row.opens) {
      ThumbnailRecord found;
      EXPECT_EQ(odd.Find("/b", "v", found), row.findsB);
      EXPECT_EQ(odd.CompactThumbnailDatabase(false), row.compacts);
      if (row.compacts != Compacted::Done) {
        EXPECT_EQ(ReadBytes(Path()), row.bytes);
      }
      EXPECT_EQ(Append(odd, "/c", "v", 3), row.appends);
    }
    if (!row.appends) {
      EXPECT_EQ(ReadBytes(Path()), row.bytes);
    }
    EXPECT_THAT(folder_.Names(), ElementsAre("Fotomill.tdb"));
  }
}

TEST_F(Database, PurgesOnlyAvailableVolumes) {
  static platform::DriveKind kind;
  static std::string label;
  platform::ReplaceVolumeFunction([](const std::string&) {
    return platform::Volume{true, label, 1, kind};
  });
  const struct {
    const char* name;
    platform::DriveKind kind;
    std::string label;
    bool purged;
  } rows[] = {
      {"fixed", platform::DriveKind::Fixed, "v", true},          {"unknown", platform::DriveKind::Unknown, "v", true},
      {"network", platform::DriveKind::Network, "v", false},     {"optical", platform::DriveKind::Optical, "v", false},
      {"removable", platform::DriveKind::Removable, "v", false}, {"another volume", platform::DriveKind::Fixed, "w", false},
  };
  WriteText(folder_.Path("there"), "");
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    std::filesystem::remove(Path());
    ThumbnailDatabase database;
    ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
    ASSERT_TRUE(Append(database, "/nowhere/at/all", "v:1", 1));
    ASSERT_TRUE(Append(database, folder_.Path("there"), "v:1", 2));
    kind = row.kind;
    label = row.label;
    ASSERT_EQ(database.CompactThumbnailDatabase(true), Compacted::Done);
    EXPECT_EQ(Records().size(), row.purged ? 1u : 2u);
    EXPECT_EQ(Records().back(), folder_.Path("there") + " v:1 2");
  }
}

TEST_F(Database, FaultsLoseNoRecord) {
  ThumbnailDatabase database;
  ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
  ASSERT_TRUE(Append(database, "/a", "v", 1));
  ASSERT_TRUE(Append(database, "/b", "v", 2));
  ASSERT_EQ(database.Delete("/b"), 1);
  database.CloseThumbnailDatabase();
  const std::vector<uint8_t> start = ReadBytes(Path());
  int64_t faults = ForEachFault([&] {
    WriteBytes(Path(), start);
    ThumbnailDatabase odd;
    const bool added =
        odd.OpenThumbnailDatabase(Path(), true) == Opened::Done && Append(odd, "/a", "v", 3, true);
    const int64_t left = platform::faultCountdown.exchange(0);
    const std::vector<std::string> records = Records();
    ASSERT_GE(records.size(), 2u);
    if (added) {
      EXPECT_THAT(records, ElementsAre("/a v 1 x", "/b v 2 x", "/a v 3"));
    }
    ThumbnailDatabase after;
    ThumbnailRecord found;
    EXPECT_EQ(after.OpenThumbnailDatabase(Path(), false), Opened::Done);
    EXPECT_TRUE(after.Find("/a", "v", found));
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 6);
  faults = ForEachFault([&] {
    WriteBytes(Path(), start);
    ThumbnailDatabase odd;
    const bool done = odd.OpenThumbnailDatabase(Path(), false) == Opened::Done &&
                      odd.CompactThumbnailDatabase(false) == Compacted::Done;
    const int64_t left = platform::faultCountdown.exchange(0);
    if (done) {
      EXPECT_THAT(Records(), ElementsAre("/a v 1"));
    } else if (Records().size() != 1) {
      EXPECT_EQ(ReadBytes(Path()), start);
    }
    EXPECT_THAT(folder_.Names(), ElementsAre("Fotomill.tdb"));
    platform::faultCountdown = left;
  });
  EXPECT_GT(faults, 6);
}

TEST_F(Database, TwoProcessesAppendAndCompact) {
  { ASSERT_EQ(ThumbnailDatabase().OpenThumbnailDatabase(Path(), true), Opened::Done); }
  constexpr int kEach = 25;
  const auto add = [&](const std::string& name) {
    ThumbnailDatabase database;
    if (database.OpenThumbnailDatabase(Path(), true) != Opened::Done) _exit(1);
    for (int i = 0; i < kEach; ++i) {
      if (!Append(database, "/" + name + std::to_string(i), "v", 1)) _exit(2);
      if (i % 10 == 9 && database.CompactThumbnailDatabase(false) != Compacted::Done) _exit(3);
    }
  };
  const pid_t child = fork();
  if (child == 0) {
    add("child");
    _exit(0);
  }
  add("parent");
  int status = -1;
  waitpid(child, &status, 0);
  EXPECT_EQ(status, 0);
  EXPECT_EQ(Records().size(), 2u * kEach);
}

// Records whose append was reported exist, and the database is readable, whenever the
// writer is killed.
TEST_F(Database, AKilledWriterLosesNoReportedRecord) {
  for (int round = 0; round < 12; ++round) {
    int reported[2];
    ASSERT_EQ(pipe(reported), 0);
    const std::vector<std::string> before = Records();
    const size_t had = before == std::vector<std::string>{"unreadable"} ? 0 : before.size();
    const pid_t child = fork();
    if (child == 0) {
      ThumbnailDatabase database;
      if (database.OpenThumbnailDatabase(Path(), true) != Opened::Done) _exit(1);
      for (int i = 0;; ++i) {
        if (!Append(database, "/" + std::to_string(round) + "-" + std::to_string(i), "v", 1))
          _exit(2);
        if (write(reported[1], "x", 1) != 1) _exit(3);
        if (i % 5 == 4 && database.CompactThumbnailDatabase(false) != Compacted::Done) _exit(4);
      }
    }
    close(reported[1]);
    std::this_thread::sleep_for(std::chrono::milliseconds(5 + 7 * round));
    kill(child, SIGKILL);
    int status = 0;
    waitpid(child, &status, 0);
    EXPECT_TRUE(WIFSIGNALED(status));
    size_t count = 0;
    for (char c; read(reported[0], &c, 1) == 1;) ++count;
    close(reported[0]);
    if (!std::filesystem::exists(Path())) continue;
    EXPECT_GE(Records().size(), had + count);
    ThumbnailDatabase database;
    EXPECT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
    EXPECT_EQ(database.CompactThumbnailDatabase(false), Compacted::Done);
    EXPECT_THAT(folder_.Names(), ElementsAre("Fotomill.tdb"));
  }
}

// Whenever a process that marks records is killed, each is as before or deleted, and nothing else
// has changed.
TEST_F(Database, AKilledMarkerChangesFlagsOnly) {
  constexpr int kRecords = 300;
  std::vector<DatabaseRecord> records;
  std::vector<std::string> paths;
  for (int i = 0; i < kRecords; ++i) {
    records.push_back(Record("/p/" + std::to_string(i), "v", 1));
    paths.push_back(records.back().path);
  }
  {
    ThumbnailDatabase database;
    ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
    ASSERT_TRUE(database.AppendDatabaseRecords(records, false));
  }
  const std::vector<uint8_t> before = ReadBytes(Path());
  for (int round = 0; round < 8; ++round) {
    WriteBytes(Path(), before);
    const pid_t child = fork();
    if (child == 0) {
      ThumbnailDatabase database;
      if (database.OpenThumbnailDatabase(Path(), false) != Opened::Done) _exit(1);
      for (const std::string& path : paths) (void)database.Delete(path);
      _exit(0);
    }
    std::this_thread::sleep_for(std::chrono::microseconds(300 * (1 << round)));
    kill(child, SIGKILL);
    int status = 0;
    waitpid(child, &status, 0);
    std::vector<uint8_t> after = ReadBytes(Path());
    ASSERT_EQ(after.size(), before.size());
    for (size_t i = 0; i < kRecords; ++i) after[60 + i * 28442 + 28434] &= 0xfe;
    EXPECT_TRUE(after == before);
  }
}

TEST_F(Database, AFullDiskFailsAndCountsNothing) {
  ThumbnailDatabase database;
  ASSERT_EQ(database.OpenThumbnailDatabase(Path(), true), Opened::Done);
  ASSERT_TRUE(Append(database, "/a", "v", 1));
  const int status = InChild([&] {
    signal(SIGXFSZ, SIG_IGN);
    const rlimit limit{40000, 40000};
    setrlimit(RLIMIT_FSIZE, &limit);
    ThumbnailDatabase full;
    _exit(full.OpenThumbnailDatabase(Path(), true) == Opened::Done && !Append(full, "/b", "v", 2)
              ? 0
              : 1);
  });
  EXPECT_EQ(status, 0);
  EXPECT_THAT(Records(), ElementsAre("/a v 1"));
  EXPECT_TRUE(Append(database, "/c", "v", 3));
  EXPECT_THAT(Records(), ElementsAre("/a v 1", "/c v 3"));
}

TEST_F(Database, Commands) {
  platform::FixNow(-1);
  const auto in = [&](const char* name) { return folder_.Path(name); };
  WriteBytes(in("a.bmp"), BitmapFile(5, 3, 24));
  WriteBytes(in("b.bmp"), BitmapFile(3, 5, 8));
  EXPECT_TRUE(RunCommand({"tdb", "list", Path()}).Says(Path() + ": File open error."));
  EXPECT_FALSE(std::filesystem::exists(Path()));
  EXPECT_EQ(RunCommand({"tdb", "add", Path()}).status, 2);
  EXPECT_EQ(RunCommand({"tdb", "add", Path(), in("a.bmp"), in("b.bmp"), in("none.bmp")}).status, 1);
  EXPECT_EQ(RunCommand({"tdb", "add", Path(), in("a.bmp")}).status, 0);
  const json list = json::parse(RunCommand({"tdb", "list", Path(), "--json"}).out);
  EXPECT_EQ(list["version"], 0x01600100);
  EXPECT_EQ(list["count"], 3);
  EXPECT_EQ(list["records"][0]["path"], in("a.bmp"));
  EXPECT_EQ(list["records"][0]["deleted"], true);
  EXPECT_EQ(list["records"][2]["deleted"], false);
  EXPECT_EQ(list["records"][2]["modified"],
            platform::ModificationTime(in("a.bmp")).value_or(platform::ExactTime()).seconds);
  EXPECT_EQ(RunCommand({"tdb", "find", Path(), in("a.bmp"), "--out", in("a.THN")}).status, 0);
  EXPECT_EQ(ReadText(in("a.THN")), ReadText(Path()).substr(60 + 2 * 28442, 27912));
  EXPECT_EQ(RunCommand({"tdb", "find", Path(), in("a.bmp"), "--out", in("a.THN")}).status, 1);
  WriteBytes(in("a.bmp"), BitmapFile(6, 3, 24));
  EXPECT_THAT(RunCommand({"tdb", "find", Path(), in("a.bmp"), "--out", in("c.THN")}).err,
              testing::HasSubstr("The database has no thumbnail of this picture as it is now."));
  EXPECT_EQ(RunCommand({"tdb", "delete", Path(), in("b.bmp"), in("c.bmp")}).status, 1);
  EXPECT_EQ(RunCommand({"tdb", "find", Path(), in("b.bmp"), "--out", in("b.THN")}).status, 1);
  EXPECT_EQ(RunCommand({"tdb", "compact", Path(), "-n"}).out, "3 -> 1 records\n");
  EXPECT_EQ(Size(), 60u + 3 * 28442);
  std::filesystem::remove(in("a.bmp"));
  EXPECT_EQ(RunCommand({"tdb", "compact", Path()}).out, "3 -> 1 records\n");
  WriteText(in("foreign"), "foreign");
  for (const char* command : {"add", "list", "compact"}) {
    std::vector<std::string> words{"tdb", command, in("foreign")};
    if (words[1] == "add") words.push_back(in("b.bmp"));
    EXPECT_EQ(RunCommand(words).status, 1);
    EXPECT_EQ(ReadText(in("foreign")), "foreign");
  }
}

}  // namespace
}  // namespace fotomill::test
