#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <vector>

#include "catalog/similar/picture_hash.h"

namespace fotomill {

// Pictures that look alike, as places in the list that was searched, in its order.
struct SimilarGroup {
  std::vector<size_t> members;  // two at least
  int32_t distance = 0;         // the largest one of a member to the first
};

// The groups of pictures that are linked by distances of at most `most` bits: a picture belongs to
// a group when it is that near to one of its members. `turned`: also to one of them turned or
// mirrored. Groups are in the order of their first members. Equal hashes are compared once; up to
// 15 bits, others are found by parts of 16 bits, one of which differs in a quarter of the bits at
// most. 100,000 pictures take seconds. `goesOn` is asked now and then; false gives no groups.
std::vector<SimilarGroup> FindSimilar(std::span<const PictureHashes> pictures, int32_t most,
                                      bool turned, const std::function<bool()>& goesOn);

// The groups of equal texts, empty ones left out; distances are 0.
std::vector<SimilarGroup> FindEqual(std::span<const std::string> digests);

}  // namespace fotomill
