#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <span>
#include <vector>

#include "core/status.h"
#include "formats/photocd/pcd_planes.h"

namespace fotomill {

// The prefix code for one plane's deltas.
class PcdCode {
 public:
  // A code and the delta it represents.
  struct Word {
    uint8_t length = 0;  // bits; 0: not a valid code
    int8_t delta = 0;
  };

  // Parses the table at `position`, and advances
  // past it. False if it is not a valid code.
  [[nodiscard]] bool Parse(std::span<const uint8_t> bytes, uint64_t& position);
  // The code at the highest bits of `bits`.
  Word Find(uint64_t bits) const {
    const Word word = fast_[bits >> (64 - kFastBits)];
    return word.length != 0 ? word : FindLong(bits);
  }

 private:
  static constexpr int kFastBits = 11;
  struct LongWord {
    uint16_t bits = 0;  // most significant first
    Word word;
  };
  Word FindLong(uint64_t bits) const;

  std::array<Word, 1 << kFastBits> fast_ = {};
  std::vector<LongWord> long_;
};

// The code tables for luma and, if there are three, both chroma planes.
struct PcdCodes {
  std::array<PcdCode, 3> planes;
  // The tables of `count` planes, in sequence.
  [[nodiscard]] bool Parse(std::span<const uint8_t> sector, int32_t count);
};

// Adds deltas to the planes of one resolution. With `lumaOnly` there are none for chroma. `onRow`
// receives the number of luma rows done, and its status may stop the operation. FileReadError if
// the data end before the last row, DamagedFile if there are none. `damaged` is set if rows were
// left without deltas.
Status AddPcdDeltas(std::span<const uint8_t> data, const PcdCodes& codes, bool lumaOnly,
                    PcdPlanes& planes, const std::function<Status(int32_t)>& onRow, bool& damaged);

}  // namespace fotomill
