#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <chrono>
#include <cmath>
#include <set>

#include "catalog/similar/hash_store.h"
#include "catalog/similar/similar_groups.h"
#include "processing/geometry/orient.h"
#include "processing/geometry/scale.h"
#include "processing/pictures.h"
#include "processing/promote.h"
#include "support/files.h"

namespace fotomill::test {
namespace {

// Smooth hills, different for each seed.
PicturePointer Landscape(int32_t width, int32_t height, int32_t seed, int32_t brighter = 0) {
  return MakePicture(width, height, [=](int32_t x, int32_t y) {
    const double u = 1.0 * x / width, v = 1.0 * y / height;
    double level = 120 + brighter;
    for (int32_t wave = 1; wave < 9; ++wave) {
      const double phase = Scatter(seed, wave) % 628 / 100.0;
      level += 14 * std::sin(u * (Scatter(wave, seed) % 20) + v * (Scatter(seed + 7, wave) % 20) +
                             phase);
    }
    const auto gray = static_cast<uint32_t>(std::clamp(level, 0.0, 255.0));
    return gray << 16 | gray << 8 | gray / 2;
  });
}

PictureHashes HashesOf(const PictureRecord& picture) {
  PictureHashes hashes{};
  EXPECT_EQ(HashPicture(picture, hashes), Status::Ok);
  return hashes;
}

TEST(PictureHash, IsTheSameForOtherVersionsOfAPicture) {
  for (int32_t seed = 1; seed < 5; ++seed) {
    const PictureHash own = HashesOf(*Landscape(160, 100, seed))[0];
    EXPECT_LE(HashDistance(own, HashesOf(*Landscape(80, 50, seed))[0]), 6) << "smaller";
    EXPECT_LE(HashDistance(own, HashesOf(*Landscape(160, 100, seed, 25))[0]), 4) << "brighter";
    EXPECT_GT(HashDistance(own, HashesOf(*Landscape(160, 100, seed + 100))[0]), 12) << "another one";
  }
}

TEST(PictureHash, FindsRotatedPictures) {
  const auto source = Landscape(96, 96, 3);
  const PictureHashes own = HashesOf(*source);
  std::set<PictureHash> found;
  for (int32_t turn = 1; turn <= 8; ++turn) {
    const auto turned = Landscape(96, 96, 3);
    ASSERT_EQ(OrientPicture(*turned, static_cast<Orientation>(turn)), Status::Ok);
    const PictureHash hash = HashesOf(*turned)[0];
    EXPECT_THAT(own, testing::Contains(hash)) << turn;
    found.insert(hash);
  }
  EXPECT_EQ(found.size(), 8u);
  PictureHashes flat{}, other{};
  ASSERT_EQ(HashPicture(*MakePicture(9, 7, [](int32_t, int32_t) { return 0x102030u; }), flat), Status::Ok);
  ASSERT_EQ(HashPicture(*MakePicture(300, 2, [](int32_t, int32_t) { return 0xf0f0f0u; }), other), Status::Ok);
  EXPECT_EQ(flat, other) << "plain ones look alike";
}

TEST(PictureHash, DigestsSeePixelsOnly) {
  const auto picture =
      MakePicture(20, 10, [](int32_t x, int32_t) { return x < 9 ? 0x000000u : 0xffffffu; });
  std::string own, other;
  ASSERT_EQ(DigestPixels(*picture, own), Status::Ok);
  EXPECT_EQ(own.size(), 32u);
  const auto packed =
      MakePicture(20, 10, [](int32_t x, int32_t) { return x < 9 ? 0x000000u : 0xffffffu; });
  bool done = false;
  ASSERT_EQ(PackFewColors(*packed, 1, done), Status::Ok);
  ASSERT_TRUE(done);
  AddAlpha(*packed, [](int32_t, int32_t) { return 255; });
  ASSERT_EQ(DigestPixels(*packed, other), Status::Ok);
  EXPECT_EQ(own, other) << "whatever the depth; opaque alpha is none";
  packed->alpha.Row(9)[19] = 254;
  ASSERT_EQ(DigestPixels(*packed, other), Status::Ok);
  EXPECT_NE(own, other);
}

// Pictures with usual hashes at the distances that `hashes` have.
std::vector<PictureHashes> Plain(std::initializer_list<PictureHash> hashes) {
  constexpr PictureHash kStructure = 0x0f0f0f0f0f0f0f0f;
  std::vector<PictureHashes> all;
  for (PictureHash hash : hashes) {
    hash ^= kStructure;
    all.push_back({hash, ~hash, ~hash, ~hash, ~hash, ~hash, ~hash, ~hash});
  }
  return all;
}

TEST(SimilarGroups, AreLinkedWithinTheLimit) {
  const auto pictures = Plain({0, 0xffffffff00000000, 0x7, 0x3f, 0xffffffff00000001,
                               0xaaaaaaaaaaaaaaaa, 0xffffffff00000000});
  const struct {
    int32_t most;
    std::vector<std::vector<size_t>> groups;
    std::vector<int32_t> distances;
  } rows[] = {
      {0, {{1, 6}}, {0}},
      {2, {{1, 4, 6}}, {1}},
      {3, {{0, 2, 3}, {1, 4, 6}}, {6, 1}},  // 0x3f is 6 from the first and 3 from the second
      {20, {{0, 2, 3}, {1, 4, 6}}, {6, 1}},
      {32, {{0, 1, 2, 3, 4, 5, 6}}, {33}},
  };
  for (const auto& row : rows) {
    const auto groups = FindSimilar(pictures, row.most, false, {});
    ASSERT_EQ(groups.size(), row.groups.size()) << row.most;
    for (size_t i = 0; i < groups.size(); ++i) {
      EXPECT_EQ(groups[i].members, row.groups[i]) << row.most;
      EXPECT_EQ(groups[i].distance, row.distances[i]) << row.most;
    }
  }
  EXPECT_EQ(FindSimilar(Plain({5, ~PictureHash{5}}), 0, false, {}).size(), 0u);
  EXPECT_EQ(FindSimilar(Plain({5, ~PictureHash{5}}), 0, true, {}).size(), 1u) << "one is the other turned";
  const auto stopped = FindSimilar(pictures, 3, false, [] { return false; });
  ASSERT_EQ(stopped.size(), 1u) << "equal ones need no comparing";
  EXPECT_EQ(stopped[0].members, (std::vector<size_t>{1, 6}));
}

TEST(SimilarGroups, BlankPicturesAreNotSimilar) {
  std::vector<PictureHashes> pictures;
  for (const uint32_t color : {0x000000u, 0xff8000u, 0xffffffu})
    pictures.push_back(HashesOf(*MakePicture(64, 48, [=](int32_t, int32_t) { return color; })));
  EXPECT_EQ(FindSimilar(pictures, 10, true, {}).size(), 0u);
}

TEST(SimilarGroups, IndexedSearchMatchesAllPairs) {
  std::vector<PictureHashes> pictures;
  for (int32_t i = 0; i < 3000; ++i) {
    // Clusters of five around scattered centers, a few bits apart.
    PictureHash hash = PictureHash{Scatter(i / 5, 1)} << 32 | Scatter(i / 5, 2);
    for (int32_t bit = 0; bit < i % 5 * 3; ++bit) hash ^= PictureHash{1} << (Scatter(i, bit) % 64);
    pictures.push_back({hash, 0, 0, 0, 0, 0, 0, 0});
  }
  for (const int32_t most : {1, 4, 7, 10, 15}) {
    std::vector<size_t> above(pictures.size());
    for (size_t i = 0; i < above.size(); ++i) {
      above[i] = i;
      for (size_t j = 0; j < i; ++j) {
        if (HashDistance(pictures[i][0], pictures[j][0]) > most) continue;
        const size_t low = std::min(above[i], above[j]), high = std::max(above[i], above[j]);
        std::ranges::replace(above, high, low);
      }
    }
    std::vector<size_t> found(pictures.size());
    for (size_t i = 0; i < found.size(); ++i) found[i] = i;
    for (const SimilarGroup& group : FindSimilar(pictures, most, false, {})) {
      for (const size_t member : group.members) found[member] = group.members[0];
    }
    EXPECT_EQ(found, above) << most;
  }
}

TEST(SimilarGroups, OfAHundredThousandTakeSeconds) {
  std::vector<PictureHashes> pictures;
  for (int32_t i = 0; i < 100000; ++i) {
    PictureHashes hashes{};
    for (size_t way = 0; way < hashes.size(); ++way)
      hashes[way] = PictureHash{Scatter(i, static_cast<int32_t>(way))} << 32 |
                    Scatter(static_cast<int32_t>(way), -i);
    if (i % 4 == 0) hashes[0] = 0x0123456789abcdef;  // as for many copies
    pictures.push_back(hashes);
  }
  const auto begun = std::chrono::steady_clock::now();
  EXPECT_GE(FindSimilar(pictures, 10, false, {}).size(), 1u);
  const std::chrono::duration<double> seconds = std::chrono::steady_clock::now() - begun;
  EXPECT_LT(seconds.count(), 30) << "a second or two where nothing else runs";
}

TEST(SimilarGroups, OfEqualDigests) {
  const std::vector<std::string> digests{"a", "", "b", "a", "", "b", "c"};
  const auto groups = FindEqual(digests);
  ASSERT_EQ(groups.size(), 2u);
  EXPECT_EQ(groups[0].members, (std::vector<size_t>{0, 3}));
  EXPECT_EQ(groups[1].members, (std::vector<size_t>{2, 5}));
}

HashRecord RecordOf(uint64_t size, PictureHash hash) {
  HashRecord record{.size = size, .modified = 1000, .width = 7, .height = 9, .hasHashes = true};
  record.hashes = {hash, 1, 2, 3, 4, 5, 6, 7};
  return record;
}

TEST(HashStore, StoresHashes) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("new/store");
  {
    HashStore store(path);
    HashRecord digested = RecordOf(11, 22);
    digested.digest = "00112233445566778899aabbccddeeff";
    digested.sharpness = 12.5F;
    digested.severalPages = true;
    store.Put("/a", digested);
    store.Put("/b", RecordOf(33, 44));
    HashRecord fresh = RecordOf(1, 1);
    fresh.modified = int64_t{1} << 40;
    store.Put("/fresh", fresh);
    ASSERT_TRUE(store.Save());
    store.Put("/b", RecordOf(55, 66));
    ASSERT_TRUE(store.Save());
  }
  const HashStore store(path);
  const auto a = store.Find("/a", 11, 1000);
  ASSERT_TRUE(a);
  EXPECT_EQ(a->digest, "00112233445566778899aabbccddeeff");
  EXPECT_EQ(a->hashes, RecordOf(11, 22).hashes);
  EXPECT_EQ(a->sharpness, 12.5F);
  EXPECT_EQ(a->width, 7);
  EXPECT_TRUE(a->hasHashes);
  EXPECT_TRUE(a->severalPages);
  ASSERT_TRUE(store.Find("/b", 55, 1000));
  EXPECT_EQ(store.Find("/b", 55, 1000)->digest, "");
  EXPECT_LT(store.Find("/b", 55, 1000)->sharpness, 0);
  EXPECT_FALSE(store.Find("/b", 33, 1000)) << "of an older file";
  EXPECT_FALSE(store.Find("/a", 11, 1001));
  EXPECT_FALSE(store.Find("/c", 11, 1000));
  EXPECT_FALSE(store.Find("/fresh", 1, int64_t{1} << 40));
}

TEST(HashStore, SurvivesTruncation) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("store");
  HashStore first(path);
  first.Put("/a", RecordOf(1, 1));
  ASSERT_TRUE(first.Save());
  const auto whole = ReadBytes(path);
  first.Put("/b", RecordOf(2, 2));
  ASSERT_TRUE(first.Save());
  const auto both = ReadBytes(path);
  for (size_t length = whole.size(); length < both.size(); length += 7) {
    WriteBytes(path, {both.begin(), both.begin() + static_cast<ptrdiff_t>(length)});
    HashStore store(path);
    EXPECT_TRUE(store.Find("/a", 1, 1000));
    EXPECT_FALSE(store.Find("/b", 2, 1000));
    store.Put("/c", RecordOf(3, 3));
    ASSERT_TRUE(store.Save());
    const HashStore again(path);
    EXPECT_TRUE(again.Find("/a", 1, 1000));
    EXPECT_TRUE(again.Find("/c", 3, 1000));
  }
  for (size_t i = whole.size(); i < both.size(); i += 5) {
    auto damaged = both;
    damaged[i] ^= 0x40;
    WriteBytes(path, damaged);
    EXPECT_FALSE(HashStore(path).Find("/b", 2, 1000)) << i;
  }
}

TEST(HashStore, IsSharedAndKeepsForeignFiles) {
  const TemporaryFolder folder;
  const std::string path = folder.Path("store");
  HashStore one(path), two(path);
  one.Put("/one", RecordOf(1, 1));
  two.Put("/two", RecordOf(2, 2));
  ASSERT_TRUE(one.Save());
  ASSERT_TRUE(two.Save()) << "the other one made the store meanwhile";
  one.Put("/three", RecordOf(3, 3));
  ASSERT_TRUE(one.Save());
  const HashStore all(path);
  for (const auto& [name, size] : {std::pair{"/one", 1u}, {"/two", 2u}, {"/three", 3u}})
    EXPECT_TRUE(all.Find(name, size, 1000)) << name;

  WriteText(folder.Path("letter"), "Dear Ada, this is no store at all.");
  HashStore letter(folder.Path("letter"));
  EXPECT_EQ(letter.SetAside(), folder.Path("letter.damaged"));
  EXPECT_EQ(ReadText(letter.SetAside()), "Dear Ada, this is no store at all.");
  letter.Put("/a", RecordOf(1, 1));
  EXPECT_TRUE(letter.Save());
  EXPECT_TRUE(HashStore(folder.Path("letter")).Find("/a", 1, 1000));
}

}  // namespace
}  // namespace fotomill::test
