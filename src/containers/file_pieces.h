#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// A new file, put together from parts of an old one, which are not copied, and of new bytes. The
// old file must stay where it is.
class FilePieces {
 public:
  FilePieces() = default;
  FilePieces(FilePieces&&) = default;
  FilePieces& operator=(FilePieces&&) = default;

  // Appends bytes that the caller owns, bytes that come along, and the parts of another one.
  void Keep(std::span<const uint8_t> bytes);
  void Add(std::vector<uint8_t> bytes);
  void Append(FilePieces more);
  void Clear();
  // Takes bytes along of which parts will be kept.
  std::span<const uint8_t> Own(std::vector<uint8_t> bytes);
  // Whether all parts together are these bytes.
  bool Are(std::span<const uint8_t> bytes) const;

  // The parts in their order.
  const std::vector<std::span<const uint8_t>>& Parts() const { return parts_; }
  // All of them as one.
  std::vector<uint8_t> Joined() const;

 private:
  std::vector<std::vector<uint8_t>> made_;  // their contents never move
  std::vector<std::span<const uint8_t>> parts_;
  bool lastKept_ = false;  // the last part is not one of ours
};

}  // namespace fotomill
