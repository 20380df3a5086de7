#pragma once

#include <cstdint>
#include <span>
#include <vector>

namespace fotomill {

// A new file, assembled from parts of an old one, which are not copied, and new bytes. The old file
// must outlive it.
class FilePieces {
 public:
  FilePieces() = default;
  FilePieces(FilePieces&&) = default;
  FilePieces& operator=(FilePieces&&) = default;

  // Appends bytes owned by the caller, new bytes, or the parts of another one.
  void Keep(std::span<const uint8_t> bytes);
  void Add(std::vector<uint8_t> bytes);
  void Append(FilePieces more);
  void Clear();
  // Takes ownership of bytes of which parts will be kept.
  std::span<const uint8_t> Own(std::vector<uint8_t> bytes);
  // Whether the contents equal these bytes.
  bool Are(std::span<const uint8_t> bytes) const;

  // The parts in order.
  const std::vector<std::span<const uint8_t>>& Parts() const { return parts_; }
  // The concatenated parts.
  std::vector<uint8_t> Joined() const;

 private:
  std::vector<std::vector<uint8_t>> made_;  // never reallocated
  std::vector<std::span<const uint8_t>> parts_;
  bool lastKept_ = false;  // the last part is owned by the caller
};

}  // namespace fotomill
