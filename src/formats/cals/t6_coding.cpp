#include "formats/cals/t6_coding.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cstring>

#include "formats/cals/t6_codes.h"

namespace fotomill {

namespace {

// Lookup table entry for the next kLongestWord bits.
struct Word {
  int16_t value = -1;   // a run length or a mode; -1: not a valid code
  uint8_t bits = 0;     // length of the code
};
using WordTable = std::array<Word, 1 << kLongestWord>;

constexpr void AddWord(WordTable& table, const char* word, int16_t value) {
  size_t code = 0;
  uint8_t bits = 0;
  for (; word[bits] != 0; ++bits) code = code << 1 | (word[bits] == '1' ? 1u : 0u);
  const size_t rest = kLongestWord - bits;
  for (size_t i = 0; i < size_t{1} << rest; ++i) table[(code << rest) + i] = {value, bits};
}

WordTable MakeRunTable(const char* const (&words)[kTerminatingCodes + kMakeUpCodes]) {
  WordTable table{};
  for (int16_t i = 0; i < kTerminatingCodes; ++i) AddWord(table, words[i], i);
  for (int16_t i = 0; i < kMakeUpCodes; ++i) {
    AddWord(table, words[kTerminatingCodes + i], static_cast<int16_t>(64 * (i + 1)));
  }
  for (size_t i = 0; i < std::size(kLongRunWords); ++i) {
    AddWord(table, kLongRunWords[i],
            static_cast<int16_t>(kFirstLongRun + 64 * static_cast<int32_t>(i)));
  }
  return table;
}

WordTable MakeModeTable() {
  WordTable table{};
  for (size_t i = 0; i < std::size(kModeWords); ++i)
    AddWord(table, kModeWords[i], static_cast<int16_t>(i));
  return table;
}

const WordTable& RunTable(bool black) {
  static const WordTable tables[] = {MakeRunTable(kWhiteRunWords), MakeRunTable(kBlackRunWords)};
  return tables[black ? 1 : 0];
}

const WordTable& ModeTable() {
  static const WordTable table = MakeModeTable();
  return table;
}

// Finds b1: the first change in the row above to the right of `a0` to the color opposite to
// `black`, the color at `a0`; changes at even indices are to black. The search starts at `place`,
// where the previous one ended. Rows start at an imaginary white pixel before column 0, so a change
// at column 0 is found while a0 is -1.
size_t FindB1(const std::vector<int32_t>& above, size_t place, int32_t a0, bool black) {
  place = place > 1 ? place - 2 : 0;
  if ((place % 2 != 0) != black) ++place;
  while (above[place] <= a0) place += 2;  // stops at the terminating widths, as a0 is below them
  return place;
}

void FillBits(std::span<uint8_t> row, int32_t from, int32_t to) {
  const auto first = static_cast<size_t>(from / 8), last = static_cast<size_t>(to / 8);
  const auto head = static_cast<uint8_t>(0xff >> from % 8),
             tail = static_cast<uint8_t>(~(0xff >> to % 8));
  if (first == last) {
    row[first] |= head & tail;
    return;
  }
  row[first] |= head;
  std::memset(&row[first + 1], 0xff, last - first - 1);
  if (tail != 0) row[last] |= tail;
}

// Appends a change; two at the same column cancel out.
void AddChange(std::vector<int32_t>& changes, int32_t column) {
  if (!changes.empty() && changes.back() == column) {
    changes.pop_back();
  } else {
    changes.push_back(column);
  }
}

// Appends terminators, so that searches need no bounds check.
void EndChanges(std::vector<int32_t>& changes, int32_t width) {
  changes.insert(changes.end(), 4, width);
}

// The next column from `x` on with a color other than `black`; `width` if there is none.
int32_t NextChange(std::span<const uint8_t> row, int32_t x, int32_t width, bool black) {
  const uint8_t invert = black ? 0xff : 0;
  while (x < width) {
    const auto rest = static_cast<uint8_t>((row[static_cast<size_t>(x / 8)] ^ invert) << x % 8);
    if (rest != 0) return std::min(width, x + std::countl_zero(rest));
    x = (x / 8 + 1) * 8;
  }
  return width;
}

}  // namespace

T6Decoder::T6Decoder(std::span<const uint8_t> data, int32_t width) : data_(data), width_(width) {
  EndChanges(above_, width_);
}

// The next kLongestWord bits, zero-padded at the end.
uint32_t T6Decoder::PeekBits() {
  const uint64_t byte = bit_ / 8;
  uint32_t bits = 0;
  for (uint64_t i = 0; i < 3; ++i)
    bits = bits << 8 | (byte + i < data_.size() ? data_[byte + i] : 0u);
  return bits >> (24 - kLongestWord - bit_ % 8) & ((1u << kLongestWord) - 1);
}

Status T6Decoder::ReadRun(bool black, int32_t& length) {
  const WordTable& table = RunTable(black);
  length = 0;
  for (;;) {
    const Word word = table[PeekBits()];
    if (word.value < 0)
      return bit_ / 8 >= data_.size() ? Status::FileReadError : Status::DamagedFile;
    SkipBits(word.bits);
    length += word.value;
    if (length > width_) return Status::DamagedFile;
    if (word.value < kTerminatingCodes) return Status::Ok;
  }
}

Status T6Decoder::ReadChanges() {
  current_.clear();
  int32_t a0 = -1;
  bool black = false;
  size_t place = 0;
  while (a0 < width_) {
    const Word word = ModeTable()[PeekBits()];
    if (word.value < 0)
      return bit_ / 8 + 2 >= data_.size() ? Status::FileReadError : Status::DamagedFile;
    SkipBits(word.bits);
    if (bit_ > 8 * data_.size()) return Status::FileReadError;
    place = FindB1(above_, place, a0, black);
    const auto mode = static_cast<FaxMode>(word.value);
    if (mode == FaxMode::Pass) {
      a0 = above_[place + 1];
    } else if (mode == FaxMode::Horizontal) {
      int32_t first = 0, second = 0;
      RETURN_IF_BAD(ReadRun(black, first));
      RETURN_IF_BAD(ReadRun(!black, second));
      const int32_t begin = std::max(a0, 0) + first, end = begin + second;
      if (end > width_) return Status::DamagedFile;
      AddChange(current_, begin);
      AddChange(current_, end);
      a0 = end;
    } else {
      const int32_t a1 = above_[place] + word.value - static_cast<int32_t>(FaxMode::Vertical0);
      if (a1 < std::max(a0, 0) || a1 > width_) return Status::DamagedFile;
      AddChange(current_, a1);
      a0 = a1;
      black = !black;
    }
  }
  EndChanges(current_, width_);
  return Status::Ok;
}

Status T6Decoder::DecodeRow(std::span<uint8_t> row) {
  RETURN_IF_BAD(ReadChanges());
  std::fill(row.begin(), row.end(), uint8_t{0});
  for (size_t i = 0; current_[i] < width_; i += 2) FillBits(row, current_[i], current_[i + 1]);
  above_.swap(current_);
  return Status::Ok;
}

T6Encoder::T6Encoder(int32_t width) : width_(width) { EndChanges(above_, width_); }

void T6Encoder::Put(const char* word) {
  for (; *word != 0; ++word) {
    pending_ = pending_ << 1 | (*word == '1' ? 1u : 0u);
    if (++pendingBits_ == 8) {
      bytes_.push_back(static_cast<uint8_t>(pending_));
      pendingBits_ = 0;
    }
  }
}

void T6Encoder::PutRun(bool black, int32_t length) {
  const auto& words = black ? kBlackRunWords : kWhiteRunWords;
  for (; length > kLongestRun + 63; length -= kLongestRun)
    Put(kLongRunWords[std::size(kLongRunWords) - 1]);
  if (length >= kFirstLongRun) {
    Put(kLongRunWords[(length - kFirstLongRun) / 64]);
  } else if (length >= 64) {
    Put(words[kTerminatingCodes + length / 64 - 1]);
  }
  Put(words[length % 64]);
}

void T6Encoder::EncodeRow(std::span<const uint8_t> row) {
  current_.clear();
  bool black = false;
  for (int32_t x = 0; (x = NextChange(row, x, width_, black)) < width_; black = !black)
    current_.push_back(x);
  EndChanges(current_, width_);

  int32_t a0 = -1;
  black = false;
  size_t place = 0, next = 0;
  while (a0 < width_) {
    place = FindB1(above_, place, a0, black);
    const int32_t b1 = above_[place], b2 = above_[place + 1], a1 = current_[next],
                  a2 = current_[next + 1];
    if (b2 < a1) {
      Put(kModeWords[static_cast<size_t>(FaxMode::Pass)]);
      a0 = b2;
    } else if (std::abs(a1 - b1) <= 3) {
      Put(kModeWords[static_cast<int32_t>(FaxMode::Vertical0) + a1 - b1]);
      a0 = a1;
      black = !black;
      ++next;
    } else {
      Put(kModeWords[static_cast<size_t>(FaxMode::Horizontal)]);
      PutRun(black, a1 - std::max(a0, 0));
      PutRun(!black, a2 - a1);
      a0 = a2;
      next += 2;
    }
  }
  above_.swap(current_);
}

const std::vector<uint8_t>& T6Encoder::Finish() {
  Put(kEndOfLineWord);
  Put(kEndOfLineWord);
  while (pendingBits_ != 0) Put("0");
  return bytes_;
}

}  // namespace fotomill
