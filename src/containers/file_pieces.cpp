#include "containers/file_pieces.h"

#include <algorithm>
#include <utility>

namespace fotomill {

void FilePieces::Keep(std::span<const uint8_t> bytes) {
  if (bytes.empty()) return;
  const bool follows =
      lastKept_ && !parts_.empty() && parts_.back().data() + parts_.back().size() == bytes.data();
  if (follows) {
    parts_.back() = {parts_.back().data(), parts_.back().size() + bytes.size()};
  } else {
    parts_.push_back(bytes);
  }
  lastKept_ = true;
}

void FilePieces::Add(std::vector<uint8_t> bytes) {
  if (bytes.empty()) return;
  made_.push_back(std::move(bytes));
  parts_.emplace_back(made_.back());
  lastKept_ = false;
}

std::span<const uint8_t> FilePieces::Own(std::vector<uint8_t> bytes) {
  made_.push_back(std::move(bytes));
  return made_.back();
}

bool FilePieces::Are(std::span<const uint8_t> bytes) const {
  for (const auto& part : parts_) {
    const bool same =
        part.size() <= bytes.size() &&
        (part.data() == bytes.data() || std::ranges::equal(part, bytes.first(part.size())));
    if (!same) return false;
    bytes = bytes.subspan(part.size());
  }
  return bytes.empty();
}

void FilePieces::Append(FilePieces more) {
  parts_.insert(parts_.end(), more.parts_.begin(), more.parts_.end());
  lastKept_ = false;
  for (auto& bytes : more.made_) made_.push_back(std::move(bytes));
}

void FilePieces::Clear() {
  parts_.clear();
  made_.clear();
}

std::vector<uint8_t> FilePieces::Joined() const {
  std::vector<uint8_t> bytes;
  for (const auto& part : parts_) bytes.insert(bytes.end(), part.begin(), part.end());
  return bytes;
}

}  // namespace fotomill
