#include "formats/pcx/pcx_runs.h"

#include <gtest/gtest.h>

#include <algorithm>

#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// A reference encoder, byte by byte.
Bytes EncodePlainly(const Bytes& plane) {
  Bytes out;
  for (size_t i = 0; i < plane.size();) {
    size_t equal = 0;
    while (i + equal + 1 < plane.size() && equal < 63 && plane[i + equal] == plane[i + equal + 1])
      ++equal;
    if (equal > 0 || plane[i] >= 0xC0)
      out.push_back(static_cast<uint8_t>(0xC0 + std::max<size_t>(equal, 1)));
    out.push_back(plane[i]);
    i += std::max<size_t>(equal, 1);
  }
  return out;
}

Bytes DecodePlainly(const Bytes& data) {
  Bytes out;
  for (size_t i = 0; i < data.size(); ++i) {
    const size_t count = data[i] >= 0xC0 ? data[i++] & 63 : 1;
    if (i < data.size()) out.insert(out.end(), count, data[i]);
  }
  return out;
}

// Random bytes from a few values around 0xC0, repeating the previous byte with
// `repeatPercent` probability.
Bytes Plane(size_t size, uint32_t seed, uint8_t first, uint8_t values, uint32_t repeatPercent) {
  Bytes plane = RandomBytes(size, seed);
  const Bytes chances = RandomBytes(size, seed + 1000);
  for (size_t i = 0; i < size; ++i) {
    plane[i] = static_cast<uint8_t>(first + plane[i] % values);
    if (i > 0 && chances[i] * 100u < repeatPercent * 256u) plane[i] = plane[i - 1];
  }
  return plane;
}

struct Kind {
  const char* name;
  uint8_t first, values;
  uint32_t repeatPercent;
};
constexpr Kind kKinds[] = {
    {"noise", 0, 255, 0},       {"bright noise", 0xC0, 63, 0},     {"around the first mark", 0xBE, 4, 10},
    {"pairs", 0x20, 100, 50},   {"runs", 0x90, 100, 97},           {"long runs of bright values", 0xD0, 40, 99},
    {"two values", 0xBF, 2, 0}, {"marks of nothing", 0xC0, 3, 20},
};

TEST(PcxRuns, EncodesAsDefined) {
  for (const Kind& kind : kKinds) {
    for (uint32_t seed = 1; seed <= 300; ++seed) {
      SCOPED_TRACE(std::string(kind.name) + ", " + std::to_string(seed));
      const Bytes plane =
          Plane(seed <= 200 ? seed : 40 * seed, seed, kind.first, kind.values, kind.repeatPercent);
      Bytes out(2 * plane.size() + 1, 0xEE);
      out.resize(EncodePcxPlane(plane, out.data()) + 1);
      out.pop_back();
      ASSERT_EQ(out, EncodePlainly(plane));
      ASSERT_EQ(DecodePlainly(out), plane);
    }
  }
}

TEST(PcxRuns, DecodesAnyBytesInLinesOfAnySize) {
  for (const Kind& kind : kKinds) {
    for (uint32_t seed = 1; seed <= 200; ++seed) {
      const Bytes data = Plane(3 + 7 * seed, seed, kind.first, kind.values, kind.repeatPercent);
      const Bytes expected = DecodePlainly(data);
      const size_t size = 1 + (seed * 37 + kind.first) % 400;
      SCOPED_TRACE(std::string(kind.name) + ", " + std::to_string(seed) + ", lines of " + std::to_string(size));
      PcxLineDecoder decoder(data);
      Bytes line(size + PcxLineDecoder::kSlack);
      size_t begin = 0;
      for (; begin + size <= expected.size(); begin += size) {
        ASSERT_TRUE(decoder.Decode(line.data(), size));
        ASSERT_TRUE(std::equal(line.begin(), line.begin() + static_cast<std::ptrdiff_t>(size),
                               expected.begin() + static_cast<std::ptrdiff_t>(begin)));
      }
      EXPECT_FALSE(decoder.Decode(line.data(), size));
    }
  }
}

}  // namespace
}  // namespace fotomill::test
