#include "formats/pcx/pcx_runs.h"

#include <algorithm>
#include <array>
#include <bit>
#include <cstring>

#include "core/byte_shuffle.h"

namespace fotomill {

namespace {

constexpr uint8_t kMark = 0xC0;
constexpr uint8_t kSingle = kMark + 1;  // the mark for a single byte
constexpr size_t kLongestRun = 63;
#ifdef BYTE_SHUFFLE
constexpr int kManyMarks = 10;  // per 64 bytes, from which removing them in bulk is faster
#endif

// State of encoder and decoder. The fast loops stop near the end of the data and return their
// state, by value so that it is kept in registers despite byte stores.
struct Walk {
  const uint8_t* from;
  const uint8_t* fromEnd;
  uint8_t* to;
};

// Writes tokens for `count` equal bytes.
inline uint8_t* PutRun(uint8_t* to, size_t count, uint8_t value) {
  for (; count > kLongestRun; count -= kLongestRun) {
    *to++ = static_cast<uint8_t>(kMark + kLongestRun);
    *to++ = value;
  }
  *to++ = static_cast<uint8_t>(kMark + count);
  *to++ = value;
  return to;
}

#ifdef BYTE_SHUFFLE

BYTE_SHUFFLE __m128i Load(const uint8_t* bytes) {
  return _mm_loadu_si128(reinterpret_cast<const __m128i*>(bytes));
}
BYTE_SHUFFLE __m128i Load8(const uint8_t* bytes) {
  return _mm_loadl_epi64(reinterpret_cast<const __m128i*>(bytes));
}
BYTE_SHUFFLE void Store(uint8_t* bytes, __m128i value) {
  _mm_storeu_si128(reinterpret_cast<__m128i*>(bytes), value);
}
BYTE_SHUFFLE void Store8(uint8_t* bytes, __m128i value) {
  _mm_storel_epi64(reinterpret_cast<__m128i*>(bytes), value);
}

// A bit mask of the bytes, of sixteen, that are marks or equal to another.
BYTE_SHUFFLE uint32_t Marks(__m128i bytes) {
  const __m128i mark = _mm_set1_epi8(static_cast<char>(kMark));
  return static_cast<uint32_t>(_mm_movemask_epi8(_mm_cmpeq_epi8(_mm_max_epu8(bytes, mark), bytes)));
}
BYTE_SHUFFLE uint32_t Equal(__m128i a, __m128i b) {
  return static_cast<uint32_t>(_mm_movemask_epi8(_mm_cmpeq_epi8(a, b)));
}

using ShuffleTable = std::array<std::array<uint8_t, 16>, 256>;

// Shuffles for each 8-bit mask: all eight bytes, with byte 9 of the register inserted before each
// flagged one.
constexpr ShuffleTable MakeInsertions() {
  ShuffleTable table{};
  for (size_t flags = 0; flags < table.size(); ++flags) {
    size_t place = 0;
    for (uint8_t i = 0; i < 8; ++i) {
      if ((flags >> i & 1) != 0) table[flags][place++] = 8;
      table[flags][place++] = i;
    }
  }
  return table;
}

// Shuffles for each 8-bit mask: the unflagged bytes.
constexpr ShuffleTable MakeRemovals() {
  ShuffleTable table{};
  for (size_t flags = 0; flags < table.size(); ++flags) {
    size_t place = 0;
    for (uint8_t i = 0; i < 8; ++i) {
      if ((flags >> i & 1) == 0) table[flags][place++] = i;
    }
  }
  return table;
}

alignas(16) constexpr ShuffleTable kInsertions = MakeInsertions();
alignas(16) constexpr ShuffleTable kRemovals = MakeRemovals();

BYTE_SHUFFLE __m128i Shuffle(__m128i bytes, const ShuffleTable& table, uint32_t flags) {
  return _mm_shuffle_epi8(bytes,
                          _mm_load_si128(reinterpret_cast<const __m128i*>(table[flags].data())));
}

// Writes the first `count` of eight bytes, inserting a single mark before each flagged one. May
// overwrite sixteen bytes of `to`.
BYTE_SHUFFLE uint8_t* PutSingles(uint8_t* to, const uint8_t* bytes, uint32_t count,
                                 uint32_t flags) {
  const __m128i marked =
      _mm_unpacklo_epi64(Load8(bytes), _mm_set1_epi8(static_cast<char>(kSingle)));
  Store(to, Shuffle(marked, kInsertions, flags & 0xFF));
  return to + count + static_cast<uint32_t>(std::popcount(flags & ((1u << count) - 1)));
}

// Number of bytes from `from` on that equal their successor.
BYTE_SHUFFLE size_t CountEqual(const uint8_t* from, const uint8_t* end) {
  const __m128i value = _mm_set1_epi8(static_cast<char>(*from));
  const uint8_t* next = from + 1;
  for (; end - next >= 16; next += 16) {
    const uint32_t other = Equal(Load(next), value) ^ 0xFFFF;
    if (other != 0)
      return static_cast<size_t>(next - from) - 1 + static_cast<size_t>(std::countr_zero(other));
  }
  while (next < end && *next == *from) ++next;
  return static_cast<size_t>(next - from) - 1;
}

// Sixteen bytes at a time. A byte equal to the next is coded like a single byte with a mark, unless
// the next one equals its neighbor as well: only runs of at least three bytes need counting.
BYTE_SHUFFLE Walk EncodeFast(Walk walk) {
  while (walk.fromEnd - walk.from >= 18) {
    const __m128i bytes = Load(walk.from);
    const uint32_t last = walk.from[16] == walk.from[17] ? 0x10000 : 0;
    const uint32_t equal = Equal(bytes, Load(walk.from + 1)) | last;
    const uint32_t flags = (equal & 0xFFFF) | Marks(bytes);
    const uint32_t runs = equal & equal >> 1;
    // bytes before a run
    const uint32_t count = runs == 0 ? 16 : static_cast<uint32_t>(std::countr_zero(runs));
    if (flags == 0) {
      Store(walk.to, bytes);
      walk.to += 16;
    } else {
      walk.to = PutSingles(walk.to, walk.from, std::min(count, 8u), flags);
      walk.to = PutSingles(walk.to, walk.from + 8, std::max(count, 8u) - 8, flags >> 8);
    }
    walk.from += count;
    if (runs == 0) continue;
    size_t length = static_cast<size_t>(std::countr_one(equal >> count));
    if (count + length == 17) length = CountEqual(walk.from, walk.fromEnd);
    walk.to = PutRun(walk.to, length, *walk.from);
    walk.from += length;
  }
  return walk;
}

// Which of 64 bytes are marks, given a mask of those >= 0xC0: in each sequence of such bytes every
// other one, starting with the first, since the byte after a mark is data. The subtraction
// propagates a carry through each sequence.
constexpr uint64_t MarksAmong(uint64_t candidates) {
  constexpr uint64_t kOdd = 0xAAAAAAAAAAAAAAAA;
  return (((candidates << 1 | kOdd) - candidates) ^ kOdd) & candidates;
}
static_assert(MarksAmong(0b0'1111'0'111'0'11'0'1) == 0b0'0101'0'101'0'01'0'1);
static_assert(MarksAmong(0b0'1111'0'111'0'11'0'1'0) == 0b0'0101'0'101'0'01'0'1'0);

// Copies or fills `count` bytes, at most 64. May overwrite all 64.
BYTE_SHUFFLE void CopyShort(uint8_t* to, const uint8_t* from, size_t count) {
  Store(to, Load(from));
  Store(to + 16, Load(from + 16));
  for (size_t i = 32; i < count; i += 16) Store(to + i, Load(from + i));
}
BYTE_SHUFFLE void FillShort(uint8_t* to, uint8_t value, size_t count) {
  const __m128i bytes = _mm_set1_epi8(static_cast<char>(value));
  Store(to, bytes);
  for (size_t i = 16; i < count; i += 16) Store(to + i, bytes);
}

// Decodes the tokens that start in the 64 bytes at walk.from, one by one, given the positions of
// their marks, and advances past them. False at a token that goes beyond the line.
BYTE_SHUFFLE bool DecodeTokens(Walk& walk, uint64_t marks, const uint8_t* lineEnd) {
  const uint8_t* const block = walk.from;
  const uint8_t* const blockEnd = block + 64;
  for (; marks != 0; marks &= marks - 1) {
    const uint8_t* const mark = block + std::countr_zero(marks);
    const size_t plain = static_cast<size_t>(mark - walk.from), count = *mark & kLongestRun;
    if (plain + count > static_cast<size_t>(lineEnd - walk.to)) return false;
    CopyShort(walk.to, walk.from, plain);
    FillShort(walk.to + plain, mark[1], count);
    walk.to += plain + count;
    walk.from = mark + 2;
  }
  if (walk.from >= blockEnd) return true;
  const size_t plain = static_cast<size_t>(blockEnd - walk.from);
  if (plain > static_cast<size_t>(lineEnd - walk.to)) return false;
  CopyShort(walk.to, walk.from, plain);
  walk.to += plain;
  walk.from = blockEnd;
  return true;
}

// Whether all marks in 64 bytes are single marks.
BYTE_SHUFFLE bool AllSingle(const uint8_t* bytes, uint64_t marks) {
  const __m128i single = _mm_set1_epi8(static_cast<char>(kSingle));
  uint64_t singles = 0;
  for (unsigned i = 0; i < 64; i += 16)
    singles |= static_cast<uint64_t>(Equal(Load(bytes + i), single)) << i;
  return (marks & ~singles) == 0;
}

// Decodes 64 bytes with single marks only, by removing the marks, eight bytes at a time. The line
// must have enough room for the result. A mark at the end is left for the next call.
BYTE_SHUFFLE void DecodeSingles(Walk& walk, uint64_t marks) {
  for (unsigned i = 0; i < 64; i += 8) {
    const uint32_t flags = static_cast<uint32_t>(marks >> i & 0xFF);
    Store8(walk.to, Shuffle(Load8(walk.from + i), kRemovals, flags));
    walk.to += 8 - std::popcount(flags);
  }
  walk.from += 64 - (marks >> 63);
}

// Decodes a line 64 bytes at a time until near the end of the line or the data. May overwrite up to
// 64 bytes after the line.
BYTE_SHUFFLE Walk DecodeFast(Walk walk, const uint8_t* lineEnd) {
  while (walk.fromEnd - walk.from >= 128) {
    if (*walk.from > kSingle) {  // a run here is likely followed by more runs
      const size_t count = *walk.from & kLongestRun;
      if (count > static_cast<size_t>(lineEnd - walk.to)) return walk;
      FillShort(walk.to, walk.from[1], 64);
      walk.from += 2;
      walk.to += count;
      continue;
    }
    uint64_t candidates = 0;
    for (unsigned i = 0; i < 64; i += 16)
      candidates |= static_cast<uint64_t>(Marks(Load(walk.from + i))) << i;
    const uint64_t marks = MarksAmong(candidates);
    if (std::popcount(marks) >= kManyMarks && lineEnd - walk.to >= 64 &&
        AllSingle(walk.from, marks)) {
      DecodeSingles(walk, marks);
    } else if (!DecodeTokens(walk, marks, lineEnd)) {
      return walk;
    }
  }
  return walk;
}

#endif

}  // namespace

bool PcxLineDecoder::Decode(uint8_t* line, size_t size) {
  const size_t repeated = std::min(pending_, size);
  std::memset(line, value_, repeated);
  pending_ -= repeated;
  Walk walk{next_, end_, line + repeated};
  uint8_t* const lineEnd = line + size;
#ifdef BYTE_SHUFFLE
  if (CanShuffleBytes()) walk = DecodeFast(walk, lineEnd);
#endif
  while (walk.to < lineEnd) {
    if (walk.from == walk.fromEnd) return false;
    const uint8_t byte = *walk.from++;
    if (byte < kMark) {
      *walk.to++ = byte;
      continue;
    }
    if (walk.from == walk.fromEnd) return false;
    value_ = *walk.from++;
    const size_t count = byte & kLongestRun,
                 now = std::min(count, static_cast<size_t>(lineEnd - walk.to));
    std::memset(walk.to, value_, now);
    walk.to += now;
    pending_ = count - now;
  }
  next_ = walk.from;
  return true;
}

size_t EncodePcxPlane(std::span<const uint8_t> plane, uint8_t* out) {
  Walk walk{plane.data(), plane.data() + plane.size(), out};
#ifdef BYTE_SHUFFLE
  if (CanShuffleBytes()) walk = EncodeFast(walk);
#endif
  while (walk.from < walk.fromEnd) {
    const uint8_t value = *walk.from;
    const uint8_t* next = walk.from + 1;
    while (next < walk.fromEnd && *next == value) ++next;
    const size_t equal = static_cast<size_t>(next - walk.from) - 1;
    if (equal > 0) walk.to = PutRun(walk.to, equal, value);
    if (value >= kMark) *walk.to++ = kSingle;
    *walk.to++ = value;
    walk.from = next;
  }
  return static_cast<size_t>(walk.to - out);
}

}  // namespace fotomill
