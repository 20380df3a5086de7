#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "catalog/similar/picture_hash.h"

namespace fotomill {

// Similar pictures, as indices in the input, in order.
struct SimilarGroup {
  std::vector<size_t> members;  // at least two
  int32_t distance = 0;         // largest distance of a member to the first
};

// Groups pictures connected by distances of at most `most` bits: a picture belongs to a group if it
// is that close to any of its members; with `turned`, in any orientation. Groups are ordered by
// their first members. Equal hashes are compared once; up to 15 bits, candidates are found by parts
// of 16 bits, one of which has at most a quarter of the differing bits. 100,000 pictures take
// seconds. Blank pictures and plain gradients are in no group: their hashes are alike, whatever
// their colors. `goesOn` is polled; after false, what was not compared yet is in no group.
std::vector<SimilarGroup> FindSimilar(std::span<const PictureHashes> pictures, int32_t most,
                                      bool turned, const std::function<bool()>& goesOn);

// Groups equal texts, ignoring empty ones; distances are 0.
std::vector<SimilarGroup> FindEqual(std::span<const std::string> digests);

}  // namespace fotomill
