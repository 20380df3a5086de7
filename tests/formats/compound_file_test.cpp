#include "containers/compound_file.h"

#include <gtest/gtest.h>

#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

void Put(Bytes& file, size_t offset, uint32_t value) {
  for (size_t i = 0; i < 4; ++i) file[offset + i] = static_cast<uint8_t>(value >> (8 * i));
}

constexpr size_t Sector(size_t number) { return 512 * (number + 1); }
constexpr uint32_t kEnd = 0xFFFFFFFE, kFree = 0xFFFFFFFF;

// Sector 0 is the sector table, 1 the directory, 2 the table of short sectors, 3 the short sectors,
// and 4, 6, 5, and those from 7 on are a stream of 5000 bytes.
Bytes File() {
  Bytes file(Sector(14));
  const Bytes head =
      Hex("D0CF11E0A1B11AE1 00000000000000000000000000000000 3E00 0300 FEFF 0900 0600");
  std::ranges::copy(head, file.begin());
  Put(file, 44, 1);
  Put(file, 48, 1);
  Put(file, 56, 4096);
  Put(file, 60, 2);
  Put(file, 64, 1);
  Put(file, 68, kEnd);
  for (size_t i = 0; i < 109; ++i) Put(file, 76 + 4 * i, i == 0 ? 0 : kFree);
  const uint32_t next[] = {0xFFFFFFFD, kEnd, kEnd, kEnd, 6, 7, 5, 8, 9, 10, 11, 12, 13, kEnd};
  for (size_t i = 0; i < 128; ++i)
    Put(file, Sector(0) + 4 * i, i < std::size(next) ? next[i] : kFree);
  struct Entry {
    const char* name;
    uint8_t kind;
    uint32_t left, right, child, first, size;
  };
  const Entry entries[] = {{"Root Entry", 5, kFree, kFree, 1, 3, 512},
                           {"Folder", 1, kFree, 2, 3, 0, 0},
                           {"Long", 2, kFree, kFree, kFree, 4, 5000},
                           {"Short", 2, kFree, kFree, kFree, 5, 100}};
  for (size_t i = 0; i < 4; ++i) {
    const size_t at = Sector(1) + 128 * i;
    const std::string_view name = entries[i].name;
    for (size_t c = 0; c < name.size(); ++c) file[at + 2 * c] = static_cast<uint8_t>(name[c]);
    file[at + 64] = static_cast<uint8_t>(2 * name.size() + 2);
    file[at + 66] = entries[i].kind;
    Put(file, at + 68, entries[i].left);
    Put(file, at + 72, entries[i].right);
    Put(file, at + 76, entries[i].child);
    Put(file, at + 116, entries[i].first);
    Put(file, at + 120, entries[i].size);
  }
  for (size_t i = 0; i < 128; ++i) Put(file, Sector(2) + 4 * i, i == 5 ? 1 : i == 1 ? kEnd : kFree);
  for (size_t i = 0; i < 512; ++i) file[Sector(3) + i] = static_cast<uint8_t>(i / 64);
  for (size_t i = 0; i < 10 * 512; ++i) file[Sector(4) + i] = static_cast<uint8_t>(4 + i / 512);
  return file;
}

Bytes ReadAll(const CompoundStream& stream) {
  Bytes gathered;
  const auto bytes = stream.Bytes(0, stream.Size(), gathered);
  return {bytes.begin(), bytes.end()};
}

TEST(CompoundFile, Streams) {
  const Bytes file = File();
  CompoundFile compound;
  ASSERT_EQ(compound.Open(file), Status::Ok);
  const int32_t folder = compound.Find(CompoundFile::kRoot, "Folder");
  EXPECT_EQ(folder, 1);
  EXPECT_EQ(compound.Find(CompoundFile::kRoot, "Short"), CompoundFile::kNone);
  EXPECT_EQ(compound.Find(99, "Short"), CompoundFile::kNone);
  EXPECT_EQ(compound.FindBeginning(folder, "Sh"), 3);
  Bytes expected(64, 5);
  expected.resize(100, 1);
  EXPECT_EQ(ReadAll(compound.Stream(compound.Find(folder, "Short"))), expected);

  const CompoundStream stream = compound.Stream(compound.Find(CompoundFile::kRoot, "Long"));
  EXPECT_EQ(stream.Size(), 5000u);
  Bytes gathered;
  EXPECT_EQ(stream.Bytes(511, 3, gathered)[0], 4);
  EXPECT_EQ(stream.Bytes(511, 3, gathered)[2], 6);
  EXPECT_EQ(stream.Bytes(1536, 1, gathered)[0], 7);
  EXPECT_EQ(stream.Bytes(4999, 1, gathered).size(), 1u);
  EXPECT_TRUE(stream.Bytes(4999, 2, gathered).empty());
  EXPECT_TRUE(stream.Bytes(UINT64_MAX, 2, gathered).empty());
  EXPECT_TRUE(compound.Stream(CompoundFile::kNone).Bytes(0, 1, gathered).empty());
}

TEST(CompoundFile, Damaged) {
  struct Row {
    const char* name;
    size_t offset;
    uint32_t value;
    Status status;
    uint64_t longSize, shortSize;
  };
  const size_t table = Sector(0), entries = Sector(1);
  const Row rows[] = {
      {"a circle of sectors", table + 4 * 6, 4, Status::Ok, 5000, 100},
      {"a sector beyond the end", table + 4 * 6, 5000, Status::Ok, 1024, 100},
      {"a chain that ends early", table + 4 * 6, kEnd, Status::Ok, 1024, 100},
      {"a stream of 4 GiB", entries + 256 + 120, 0xFFFFFFFF, Status::Ok, 5120, 100},
      {"a circle of short sectors", Sector(2) + 4 * 5, 5, Status::Ok, 5000, 100},
      {"a short sector beyond the end", Sector(2) + 4 * 5, 77, Status::Ok, 5000, 64},
      {"a circle of entries", entries + 128 + 72, 1, Status::Ok, 0, 100},
      {"an entry beyond the end", entries + 128 + 72, 9999, Status::Ok, 0, 100},
      {"a directory in a circle", table + 4 * 1, 1, Status::Ok, 5000, 100},
      {"the directory beyond the end", 48, 777, Status::FileReadError, 0, 0},
      {"sectors of another size", 30, 0x0006000A, Status::DamagedFile, 0, 0},
      {"a list that goes on beyond the end", 68, 0, Status::Ok, 5000, 100},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    Bytes file = File();
    Put(file, row.offset, row.value);
    CompoundFile compound;
    ASSERT_EQ(compound.Open(file), row.status);
    if (row.status != Status::Ok) continue;
    EXPECT_EQ(compound.Stream(compound.Find(CompoundFile::kRoot, "Long")).Size(), row.longSize);
    EXPECT_EQ(compound.Stream(compound.Find(compound.Find(CompoundFile::kRoot, "Folder"), "Short")).Size(), row.shortSize);
  }
}

TEST(CompoundFile, Truncated) {
  const Bytes whole = File();
  for (size_t length = 0; length < whole.size(); length += length < 600 ? 1 : 97) {
    CompoundFile compound;
    if (compound.Open(std::span(whole).first(length)) != Status::Ok) continue;
    EXPECT_LE(compound.Stream(2).Size() + compound.Stream(3).Size(), length);
  }
}

}  // namespace
}  // namespace fotomill::test
