// The deltas of a Photo CD picture, big-endian: differences between a resolution and the next
// smaller one, doubled by PcdDoubleRow.
//
// A code table has the number of codes minus one (1 byte), then for each code
//   offset size  field
//        0    1  its length in bits minus one; at most 15
//        1    2  its bits, most significant first
//        3    1  the delta it represents, signed
//
// A row of deltas starts with the mark FF FF FE, at any bit position, which cannot occur within
// codes. It is followed by
//     2 bits  plane: 0 luma, 2 and 3 chroma
//    13 bits  row; doubled for chroma. The number after the last row ends the picture.
//     1 bit   unused
// and one code for each sample of the row. Rows may come in any order.
// Source: H. Danisch, hpcdtoppm (1992).
#include "formats/photocd/pcd_deltas.h"

#include <algorithm>
#include <bit>

#include "core/byte_reader.h"

namespace fotomill {

namespace {

constexpr uint64_t kMark = 0xFFFFFE;
constexpr int kMarkBits = 24, kLongestWord = 16;

// A bit reader, most significant bit first; zero-padded after the last byte.
class Bits {
 public:
  explicit Bits(std::span<const uint8_t> data) : data_(data) {}

  // At least 48 bits, left-aligned.
  uint64_t Peek() {
    if (held_ < 48) Fill();
    return bits_;
  }
  void Skip(int count) {
    bits_ <<= count;
    held_ -= count;
  }
  // Whether bits past the end were read.
  bool PastEnd() const { return at_ == data_.size() && held_ < padding_; }

  // Moves to the next mark; false if there is none.
  bool FindMark() {
    while (Peek() >> (64 - kMarkBits) != kMark) {
      if (PastEnd()) return false;
      // a mark starts with ones
      const int zeros = std::countl_zero(bits_);
      Skip(std::clamp(zeros, 1, kMarkBits));
    }
    return !PastEnd();
  }

 private:
  void Fill() {
    while (held_ <= 56) {
      if (at_ < data_.size()) {
        bits_ |= uint64_t{data_[at_++]} << (56 - held_);
      } else {
        padding_ += 8;
      }
      held_ += 8;
    }
  }

  std::span<const uint8_t> data_;
  size_t at_ = 0;
  uint64_t bits_ = 0;
  int held_ = 0;
  int padding_ = 0;  // number of padding bits in the buffer
};

// False for an invalid code.
bool AddRow(Bits& bits, const PcdCode& code, uint8_t* row, int32_t width) {
  for (int32_t x = 0; x < width; ++x) {
    const PcdCode::Word word = code.Find(bits.Peek());
    if (word.length == 0) return false;
    row[x] = static_cast<uint8_t>(std::clamp(row[x] + word.delta, 0, 255));
    bits.Skip(word.length);
  }
  return true;
}

// Maximum data size for the deltas of one resolution.
uint64_t MostBytes(const PcdPlanes& planes) {
  const uint64_t samples = planes.luma.samples.size() + planes.chroma[0].samples.size() +
                           planes.chroma[1].samples.size();
  return samples * kLongestWord / 8 + uint64_t{16} * static_cast<uint64_t>(planes.luma.height) +
         4096;
}

}  // namespace

bool PcdCode::Parse(std::span<const uint8_t> bytes, uint64_t& position) {
  ByteReader reader(bytes);
  reader.Seek(position);
  const size_t count = size_t{reader.U8()} + 1;
  std::vector<LongWord> words;
  for (size_t i = 0; i < count && reader.Ok(); ++i) {
    LongWord entry;
    entry.word.length = static_cast<uint8_t>(reader.U8() + 1);
    entry.bits = reader.Be16();
    entry.word.delta = static_cast<int8_t>(reader.U8());
    if (entry.word.length > kLongestWord || entry.word.length == 0) return false;
    if ((entry.bits & ((1u << (kLongestWord - entry.word.length)) - 1)) != 0) return false;
    words.push_back(entry);
  }
  position = reader.Position();
  if (!reader.Ok() || count < 2) return false;
  std::ranges::sort(words, {}, &LongWord::bits);
  uint32_t end = 0;  // prefix check: no code may be the start of another
  for (const LongWord& entry : words) {
    if (entry.bits < end) return false;
    end = entry.bits + (1u << (kLongestWord - entry.word.length));
  }
  fast_ = {};
  long_.clear();
  for (const LongWord& entry : words) {
    if (entry.word.length > kFastBits) {
      long_.push_back(entry);
      continue;
    }
    const size_t first = entry.bits >> (kLongestWord - kFastBits);
    std::fill_n(fast_.begin() + static_cast<ptrdiff_t>(first),
                size_t{1} << (kFastBits - entry.word.length), entry.word);
  }
  return true;
}

PcdCode::Word PcdCode::FindLong(uint64_t bits) const {
  const auto top = static_cast<uint16_t>(bits >> (64 - kLongestWord));
  const auto after = std::ranges::upper_bound(long_, top, {}, &LongWord::bits);
  if (after == long_.begin()) return {};
  const LongWord& entry = *(after - 1);
  return (top ^ entry.bits) >> (kLongestWord - entry.word.length) == 0 ? entry.word : Word{};
}

bool PcdCodes::Parse(std::span<const uint8_t> sector, int32_t count) {
  uint64_t position = 0;
  return std::all_of(planes.begin(), planes.begin() + count,
                     [&](PcdCode& code) { return code.Parse(sector, position); });
}

Status AddPcdDeltas(std::span<const uint8_t> data, const PcdCodes& codes, bool lumaOnly,
                    PcdPlanes& planes, const std::function<Status(int32_t)>& onRow, bool& damaged) {
  Bits bits(data.first(std::min<uint64_t>(data.size(), MostBytes(planes))));
  int32_t rows = 0;
  while (bits.FindMark()) {
    bits.Skip(kMarkBits);
    const auto head = static_cast<uint32_t>(bits.Peek() >> 48);
    bits.Skip(16);
    const uint32_t plane = head >> 14;
    const auto row = static_cast<int32_t>(head >> 1 & 0x1FFF);
    if (row == planes.luma.height) return rows == 0 ? Status::DamagedFile : Status::Ok;
    if (row > planes.luma.height || plane == 1 || (plane != 0 && lumaOnly)) {
      damaged = true;
      continue;
    }
    PcdPlane& target = plane == 0 ? planes.luma : planes.chroma[plane - 2];
    const int32_t y = plane == 0 ? row : row / 2;
    if (!AddRow(bits, codes.planes[plane == 0 ? 0 : plane - 1], target.Row(y), target.width))
      damaged = true;
    if (plane == 0) rows = std::min(rows + 1, planes.luma.height);
    RETURN_IF_BAD(onRow(rows));
  }
  return Status::FileReadError;
}

}  // namespace fotomill
