#pragma once

#include <array>
#include <cstdint>
#include <functional>
#include <span>
#include <vector>

#include "core/status.h"
#include "formats/photocd/pcd_planes.h"

namespace fotomill {

// The prefix code of one plane's deltas.
class PcdCode {
 public:
  struct Word {
    uint8_t length = 0;  // bits; 0: there is no such word
    int8_t delta = 0;
  };

  // Takes the table that begins at `position`, and moves there to its end. False for one that is no
  // code.
  [[nodiscard]] bool Parse(std::span<const uint8_t> bytes, uint64_t& position);
  // The word that the highest bits of `bits` begin with.
  Word Find(uint64_t bits) const {
    const Word word = fast_[bits >> (64 - kFastBits)];
    return word.length != 0 ? word : FindLong(bits);
  }

 private:
  static constexpr int kFastBits = 11;
  struct LongWord {
    uint16_t bits = 0;  // from the highest down
    Word word;
  };
  Word FindLong(uint64_t bits) const;

  std::array<Word, 1 << kFastBits> fast_ = {};
  std::vector<LongWord> long_;
};

struct PcdCodes {
  std::array<PcdCode, 3> planes;
  // The tables of `count` planes, one after the other.
  [[nodiscard]] bool Parse(std::span<const uint8_t> sector, int32_t count);
};

// Adds deltas to the planes of one size. With `lumaOnly` there are none for the chromas. `onRow` is
// told how many rows of luma are done, and its status ends the work. FileReadError when the data
// end before the last row, DamagedFile when there are none. `damaged` tells that rows were left as
// they are.
Status AddPcdDeltas(std::span<const uint8_t> data, const PcdCodes& codes, bool lumaOnly,
                    PcdPlanes& planes, const std::function<Status(int32_t)>& onRow, bool& damaged);

}  // namespace fotomill
