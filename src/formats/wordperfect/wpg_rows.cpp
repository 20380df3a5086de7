#include "formats/wordperfect/wpg_rows.h"

#include <algorithm>

#include "formats/split_runs.h"

namespace fotomill {

namespace {

constexpr uint8_t kRun = 0x80, kCount = 0x7f;
constexpr uint8_t kUnitSize = 0x7d, kDifference = 0x7e, kZeros = 0x7f, kOnes = 0xff, kAgain = 0xfd,
                  kRepeat = 0xfe;
constexpr uint8_t kMostUnit = 8;
constexpr size_t kMostInToken = 127;
constexpr size_t kShortestRun = 3;
constexpr uint8_t kZero[kMostUnit] = {};
constexpr uint8_t kFull[kMostUnit] = {0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff, 0xff};

}  // namespace

std::span<const uint8_t> WpgRows::Next() {
  if (coding_ == WpgCoding::Plain) return bytes_.Take(rowSize_);
  while (repeats_ == 0 && pending_.size() < rowSize_) {
    if (!(coding_ == WpgCoding::Runs1 ? TakeToken1() : TakeToken2())) return {};
  }
  if (repeats_ > 0) {
    --repeats_;
    return row_;
  }
  std::vector<uint8_t> row(pending_.begin(), pending_.begin() + static_cast<ptrdiff_t>(rowSize_));
  pending_.erase(pending_.begin(), pending_.begin() + static_cast<ptrdiff_t>(rowSize_));
  if (difference_ && !row_.empty())
    std::ranges::transform(row, row_, row.begin(), [](uint8_t a, uint8_t b) { return a ^ b; });
  difference_ = false;
  row_ = std::move(row);
  return row_;
}

void WpgRows::Append(size_t count, std::span<const uint8_t> unit) {
  for (; count > 0; --count) pending_.insert(pending_.end(), unit.begin(), unit.end());
}

bool WpgRows::TakeToken1() {
  const uint8_t token = bytes_.U8();
  const uint8_t count = token & kCount;
  if (token == 0) {
    repeats_ = bytes_.U8();
    if (!pending_.empty() || row_.empty()) return false;
  } else if (token == kRun) {
    Append(bytes_.U8(), std::span(kFull).first(1));
  } else if ((token & kRun) != 0) {
    const uint8_t value = bytes_.U8();
    Append(count, std::span(&value, 1));
  } else {
    Append(1, bytes_.Take(count));
  }
  return bytes_.Ok();
}

bool WpgRows::TakeToken2() {
  const uint8_t token = bytes_.U8();
  const size_t size = unit_.size();
  if (token == kUnitSize) {
    const uint8_t units = bytes_.U8();
    if (units < 1 || units > kMostUnit) return false;
    unit_.assign(units, 0);
  } else if (token == kDifference) {
    difference_ = true;
  } else if (token == kZeros) {
    Append(bytes_.U8() + size_t{1}, std::span(kZero).first(size));
  } else if (token == kOnes) {
    Append(bytes_.U8() + size_t{1}, std::span(kFull).first(size));
  } else if (token == kAgain) {
    Append(bytes_.U8() + size_t{1}, unit_);
  } else if (token == kRepeat) {
    repeats_ = bytes_.U8() + 1;
    if (!pending_.empty() || row_.empty()) return false;
  } else if ((token & kRun) != 0) {
    const auto unit = bytes_.Take(size);
    if (!bytes_.Ok()) return false;
    unit_.assign(unit.begin(), unit.end());
    Append((token & kCount) + size_t{1}, unit_);
  } else {
    Append(1, bytes_.Take((token + size_t{1}) * size));
  }
  return bytes_.Ok();
}

void EncodeWpgRow(std::span<const uint8_t> row, std::vector<uint8_t>& code) {
  SplitRuns(
      row, kShortestRun, kMostInToken,
      [&](std::span<const uint8_t> bytes) { AppendCounted(bytes, kMostInToken, code); },
      [&](size_t count, uint8_t value) {
        code.insert(code.end(), {static_cast<uint8_t>(kRun | count), value});
      });
}

}  // namespace fotomill
