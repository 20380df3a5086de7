#include "formats/paintshop/psp.h"

#include <gtest/gtest.h>

#include "support/codecs.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

Bytes Number(size_t value, size_t size) {
  Bytes bytes;
  for (size_t i = 0; i < size; ++i) bytes.push_back(static_cast<uint8_t>(value >> 8 * i));
  return bytes;
}

Bytes operator+(Bytes a, const Bytes& b) {
  a.insert(a.end(), b.begin(), b.end());
  return a;
}

// Creates files of one version: 3 has the size of a block's first part in the block header, later
// ones in the part.
struct Maker {
  size_t version;

  Bytes Block(size_t number, Bytes part, const Bytes& rest = {}) const {
    if (version >= 4) part = Number(part.size() + 4, 4) + part;
    const Bytes firstPart = version < 4 ? Number(part.size(), 4) : Bytes();
    return Hex("7E424B00") + Number(number, 2) + firstPart + Number(part.size() + rest.size(), 4) +
           part + rest;
  }
  Bytes Channel(const Bytes& data, size_t size, size_t bitmap, size_t color) const {
    return Block(5, Number(data.size(), 4) + Number(size, 4) + Number(bitmap, 2) + Number(color, 2),
                 data);
  }
  Bytes Image(size_t width, size_t height, size_t compression, size_t bits) const {
    return Block(0, Number(width, 4) + Number(height, 4) + Number(0, 8) + Number(1, 1) +
                        Number(compression, 2) + Number(bits, 2) + Number(1, 2) + Number(0, 4) +
                        Number(0, 1) + Number(0, 4 + 4) + Number(1, 2));
  }
  // A one-row layer from `left` to `right`.
  Bytes Layer(size_t left, size_t right, size_t opacity, const Bytes& channels) const {
    const Bytes sides = Number(left, 4) + Number(0, 4) + Number(right, 4) + Number(1, 4);
    const Bytes name = version < 4 ? Bytes(256) : Number(1, 2) + Hex("41");
    Bytes facts = name + Number(0, 1) + sides + sides + Number(opacity, 1) + Number(0, 1) +
                  Number(1, 1) + Bytes(2 + 32 + 3 + 2 + 40);
    if (version < 4) return Block(4, facts + Number(1, 2) + Number(3, 2), channels);
    return Block(4, facts, Number(8, 4) + Number(1, 2) + Number(3, 2) + channels);
  }
  Bytes Layers(const Bytes& layers) const {
    return Hex("7E424B00 0300") + (version < 4 ? Number(0, 4) : Bytes()) +
           Number(layers.size(), 4) + layers;
  }
  Bytes File(const Bytes& blocks) const {
    Bytes head = Hex("5061696E742053686F702050726F20496D6167652046696C650A1A 0000000000");
    return head + Number(version, 2) + Number(0, 2) + blocks;
  }
  Bytes Colors(const char* red, const char* green, const char* blue, size_t size) const {
    return Channel(Hex(red), size, 0, 1) + Channel(Hex(green), size, 0, 2) +
           Channel(Hex(blue), size, 0, 3);
  }
};

TEST(PspRead, Kinds) {
  struct Row {
    const char* name;
    Bytes file;
    Status status;
    const char* pixels;
    const char* alpha;
  };
  const Maker old{3}, newer{5};
  const Bytes two = newer.Layer(0, 2, 255, newer.Colors("FF 00", "00 00", "00 00", 2)) +
                    newer.Layer(1, 2, 128, newer.Colors("00", "00", "FF", 1));
  const Bytes facts = newer.Block(17, Number(2, 4) + Number(1, 4) + Number(24, 2) + Number(0, 2) +
                                          Number(1, 2) + Number(0, 4) + Number(0, 2));
  const Bytes composite =
      newer.Block(9, Number(1, 2) + Number(3, 2), newer.Colors("01 02", "03 04", "05 06", 2));
  const Row rows[] = {
      {"version 3, colors",
       old.File(old.Image(2, 1, 0, 24) +
                old.Layers(old.Layer(0, 2, 255, old.Colors("01 02", "03 04", "05 06", 2)))),
       Status::Ok, "010305 020406", ""},
      {"run lengths",
       old.File(
           old.Image(3, 1, 1, 24) +
           old.Layers(old.Layer(0, 3, 255, old.Colors("83 07", "03 01 02 03", "81 04 82 05", 3)))),
       Status::Ok, "070104 070205 070305", ""},
      {"4 bits with a palette",
       old.File(old.Image(3, 1, 0, 4) + old.Block(2, Number(2, 4), Hex("03020100 06050400")) +
                old.Layers(old.Layer(0, 3, 255, old.Channel(Hex("10 10"), 2, 0, 0)))),
       Status::Ok, "1 0 1", ""},
      {"a transparency of its own",
       old.File(old.Image(2, 1, 0, 24) +
                old.Layers(old.Layer(0, 2, 255,
                                     old.Colors("01 02", "03 04", "05 06", 2) +
                                         old.Channel(Hex("FF 80"), 2, 1, 0)))),
       Status::Ok, "010305 020406", "255 128"},
      {"layers, one half seen through", newer.File(newer.Image(2, 1, 0, 24) + newer.Layers(two)),
       Status::Ok, "FF0000 000080", ""},
      {"a composite goes before layers",
       newer.File(newer.Image(2, 1, 0, 24) + newer.Block(16, Number(1, 4), facts + composite) +
                  newer.Layers(two)),
       Status::Ok, "010305 020406", ""},
      {"48 bits, rounded",
       newer.File(newer.Image(1, 1, 0, 48) +
                  newer.Layers(newer.Layer(0, 1, 255, newer.Colors("8000", "8100", "FFFF", 2)))),
       Status::Ok, "0001FF", ""},
      {"rows cut short",
       old.File(old.Image(2, 1, 0, 24) +
                old.Layers(old.Layer(0, 2, 255, old.Colors("01 02", "03 04", "05", 2)))),
       Status::FileReadError, "", ""},
      {"runs that end early",
       old.File(old.Image(3, 1, 1, 24) +
                old.Layers(old.Layer(0, 3, 255, old.Colors("82 07", "83 01", "83 04", 3)))),
       Status::FileReadError, "", ""},
      {"a layer far larger than its data",
       old.File(old.Image(2, 1, 2, 24) +
                old.Layers(old.Layer(0, 0x7fffffff, 255, old.Colors("01", "03", "05", 2)))),
       Status::MemoryAllocationError, "", ""},
      {"JPEG inside",
       old.File(old.Image(2, 1, 3, 24) +
                old.Layers(old.Layer(0, 2, 255, old.Colors("01 02", "03 04", "05 06", 2)))),
       Status::UnsupportedFormat, "", ""},
      {"no layers", old.File(old.Image(2, 1, 0, 24)), Status::NoImages, "", ""},
      {"no image", old.File({}), Status::DamagedFile, "", ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(PspRead, row.file);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    EXPECT_EQ(PixelText(decoded.picture->alpha), row.alpha);
  }
}

}  // namespace
}  // namespace fotomill::test
