#include "catalog/similar/similar_groups.h"

#include <algorithm>
#include <array>
#include <bit>
#include <numeric>
#include <unordered_map>

namespace fotomill {

namespace {

constexpr size_t kParts = 4, kPartBits = 16, kPartValues = size_t{1} << kPartBits;
// Up to this distance, searching by parts beats comparing all pairs.
constexpr int32_t kMostByParts = 15;
constexpr size_t kAskedEvery = 256;

uint32_t PartOf(PictureHash hash, size_t part) {
  return static_cast<uint32_t>(hash >> (part * kPartBits)) & (kPartValues - 1);
}

// Disjoint sets (Tarjan 1975), represented by their smallest member.
class Sets {
 public:
  explicit Sets(size_t count) : above_(count) {
    std::iota(above_.begin(), above_.end(), size_t{0});
  }
  size_t Of(size_t i) {
    while (above_[i] != i) i = above_[i] = above_[above_[i]];
    return i;
  }
  void Join(size_t a, size_t b) {
    a = Of(a), b = Of(b);
    above_[std::max(a, b)] = std::min(a, b);
  }

 private:
  std::vector<size_t> above_;
};

// All 16-bit numbers with at most `most` bits set.
std::vector<uint32_t> FewBits(int32_t most) {
  std::vector<uint32_t> masks;
  for (uint32_t mask = 0; mask < kPartValues; ++mask) {
    if (std::popcount(mask) <= most) masks.push_back(mask);
  }
  return masks;
}

// Distinct hashes, indexed by each of their parts.
class PartIndex {
 public:
  explicit PartIndex(const std::vector<PictureHash>& hashes) : hashes_(hashes) {
    for (size_t part = 0; part < kParts; ++part) {
      auto& starts = starts_[part];
      starts.assign(kPartValues + 1, 0);
      for (const PictureHash hash : hashes) ++starts[PartOf(hash, part) + 1];
      std::partial_sum(starts.begin(), starts.end(), starts.begin());
      auto next = starts;
      places_[part].resize(hashes.size());
      for (size_t i = 0; i < hashes.size(); ++i)
        places_[part][next[PartOf(hashes[i], part)]++] = static_cast<uint32_t>(i);
    }
  }

  // Calls `found` for each hash within the distance, possibly more than once.
  template <typename Found>
  void Near(PictureHash hash, int32_t most, const std::vector<uint32_t>& masks,
            const Found& found) const {
    for (size_t part = 0; part < kParts; ++part) {
      const uint32_t own = PartOf(hash, part);
      for (const uint32_t mask : masks) {
        const uint32_t value = own ^ mask;
        for (uint32_t at = starts_[part][value]; at < starts_[part][value + 1]; ++at) {
          const uint32_t i = places_[part][at];
          if (HashDistance(hash, hashes_[i]) <= most) found(size_t{i});
        }
      }
    }
  }

 private:
  const std::vector<PictureHash>& hashes_;
  std::array<std::vector<uint32_t>, kParts> starts_, places_;
};

// Pictures grouped by hash.
struct Distinct {
  std::vector<PictureHash> hashes;     // distinct
  std::vector<PictureHashes> turned;   // hashes of one picture with that hash
  std::vector<size_t> of;              // for each picture, its index in `hashes`
};

Distinct DistinctOf(std::span<const PictureHashes> pictures) {
  Distinct distinct;
  std::unordered_map<PictureHash, size_t> places;
  for (const PictureHashes& picture : pictures) {
    const auto [at, isNew] = places.try_emplace(picture[0], distinct.hashes.size());
    if (isNew) {
      distinct.hashes.push_back(picture[0]);
      distinct.turned.push_back(picture);
    }
    distinct.of.push_back(at->second);
  }
  return distinct;
}

// The smallest distance of a picture, in any orientation if `turned`, to another one.
int32_t Apart(const PictureHashes& picture, PictureHash other, bool turned) {
  int32_t least = HashDistance(picture[0], other);
  for (size_t i = 1; turned && i < picture.size(); ++i)
    least = std::min(least, HashDistance(picture[i], other));
  return least;
}

void JoinNear(const Distinct& distinct, int32_t most, bool turned,
              const std::function<bool()>& goesOn, Sets& sets) {
  const size_t count = distinct.hashes.size(), ways = turned ? PictureHashes().size() : 1;
  const bool byParts = most <= kMostByParts;
  const PartIndex index(distinct.hashes);
  const std::vector<uint32_t> masks =
      FewBits(byParts ? most / static_cast<int32_t>(kParts) : 0);
  for (size_t i = 0; i < count; ++i) {
    if (i % kAskedEvery == 0 && goesOn && !goesOn()) return;
    for (size_t way = 0; way < ways; ++way) {
      const PictureHash hash = distinct.turned[i][way];
      if (byParts) {
        index.Near(hash, most, masks, [&](size_t other) { sets.Join(i, other); });
        continue;
      }
      for (size_t other = i + 1; other < count; ++other) {
        if (HashDistance(hash, distinct.hashes[other]) <= most) sets.Join(i, other);
      }
    }
  }
}

// Groups pictures with equal `keys`, ordered by their first members.
template <typename Key>
std::vector<SimilarGroup> GroupsOf(const std::vector<Key>& keys) {
  std::vector<SimilarGroup> groups;
  std::unordered_map<Key, size_t> places;
  for (size_t i = 0; i < keys.size(); ++i) {
    const auto [at, isNew] = places.try_emplace(keys[i], groups.size());
    if (isNew) groups.emplace_back();
    groups[at->second].members.push_back(i);
  }
  std::erase_if(groups, [](const SimilarGroup& group) { return group.members.size() < 2; });
  return groups;
}

// Half of the bits are usual; blank pictures have none, whatever their color.
bool HasStructure(const PictureHashes& picture) {
  constexpr int kLeastBits = 8;
  return std::popcount(picture[0]) >= kLeastBits;
}

std::vector<SimilarGroup> GroupsOfStructured(std::span<const PictureHashes> pictures, int32_t most,
                                             bool turned, const std::function<bool()>& goesOn) {
  const Distinct distinct = DistinctOf(pictures);
  Sets sets(distinct.hashes.size());
  JoinNear(distinct, most, turned, goesOn, sets);
  std::vector<size_t> keys;
  for (const size_t place : distinct.of) keys.push_back(sets.Of(place));
  std::vector<SimilarGroup> groups = GroupsOf(keys);
  for (SimilarGroup& group : groups) {
    const PictureHashes& first = pictures[group.members[0]];
    for (const size_t member : group.members)
      group.distance = std::max(group.distance, Apart(first, pictures[member][0], turned));
  }
  return groups;
}

}  // namespace

std::vector<SimilarGroup> FindSimilar(std::span<const PictureHashes> pictures, int32_t most,
                                      bool turned, const std::function<bool()>& goesOn) {
  std::vector<PictureHashes> structured;
  std::vector<size_t> places;
  for (size_t i = 0; i < pictures.size(); ++i) {
    if (!HasStructure(pictures[i])) continue;
    structured.push_back(pictures[i]);
    places.push_back(i);
  }
  std::vector<SimilarGroup> groups = GroupsOfStructured(structured, most, turned, goesOn);
  for (SimilarGroup& group : groups) {
    for (size_t& member : group.members) member = places[member];
  }
  return groups;
}

std::vector<SimilarGroup> FindEqual(std::span<const std::string> digests) {
  std::vector<std::string> keys(digests.begin(), digests.end());
  for (size_t i = 0; i < keys.size(); ++i) {
    if (keys[i].empty()) keys[i] = std::to_string(i);  // unique, as it is shorter than any digest
  }
  return GroupsOf(keys);
}

}  // namespace fotomill
