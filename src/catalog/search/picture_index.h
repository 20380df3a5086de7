#pragma once

#include <cstdint>
#include <optional>
#include <string>
#include <string_view>

#include "catalog/records/record_store.h"
#include "catalog/search/picture_facts.h"

namespace fotomill {

// The state of a picture file and of the files beside it that hold its metadata. Facts read in the
// same state are current.
struct PictureState {
  bool regular = false;  // the picture is a regular file
  uint64_t size = 0;     // of the picture, bytes
  int64_t modified = 0;  // of the newest of the files: seconds since 1970 UTC
  uint64_t digest = 0;   // of identity, sizes and exact times of all of them
};
// Of a picture, from the system; nothing is opened. `sources` say which files may be beside it.
PictureState StateOf(const std::string& path, const TagSources& sources = {});

// The store of facts in the data folder, so that a later search need not read the pictures again: a
// RecordStore with the time from PictureState, and data of this layout, little-endian:
//
//   offset size  content
//        0    8  the state's digest
//        8    4  known parts: kFacts bits
//       12    8  capture date, as in PictureTags
//       20    4  rating
//       24    4  width
//       28    4  height
//       32    4  number of faces
//       36    4  digest of the options for faces
//       40    2  status of the header
//       42    2  status of decoding
//       44    4  number of keywords
//       48       texts, each of 4 bytes length and its bytes: the format, the texts of the tags in
//                the order of PictureTags, then the keywords
inline constexpr std::string_view kPictureIndexName = "Fotomill.index";

// A store. Not thread-safe.
class PictureIndex {
 public:
  explicit PictureIndex(std::string path);  // loads it

  // The facts read in this state.
  std::optional<PictureFacts> Find(const std::string& path, const PictureState& state) const;
  // As those of RecordStore.
  void Put(const std::string& path, const PictureState& state, const PictureFacts& facts);
  [[nodiscard]] bool Save() { return store_.Save(); }
  const std::string& SetAside() const { return store_.SetAside(); }

 private:
  RecordStore store_;
};

}  // namespace fotomill
