#include "formats/sgi/sgi.h"

#include <gtest/gtest.h>

#include "formats/sgi/sgi_runs.h"
#include "support/codecs.h"
#include "support/hex.h"
#include "support/pictures.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

// A header with the given fields, followed by data.
Bytes File(const char* fields, const char* data) {
  Bytes file = Hex(fields);
  file.resize(512);
  const Bytes rest = Hex(data);
  file.insert(file.end(), rest.begin(), rest.end());
  return file;
}

TEST(SgiRead, Kinds) {
  struct Row {
    const char* name;
    Bytes file;
    Status status;
    const char* pixels;
    const char* alpha;
  };
  const Row rows[] = {
      {"gray, rows from the bottom", File("01DA 00 01 0002 0002 0002 0001", "01 02 03 04"), Status::Ok, "3 4 / 1 2", ""},
      {"a single row whose other sizes do not count", File("01DA 00 01 0001 0003 0000 0000", "01 02 03"), Status::Ok, "1 2 3", ""},
      {"RGB in planes", File("01DA 00 01 0003 0002 0001 0003", "01 02 03 04 05 06"), Status::Ok, "010305 020406", ""},
      {"RGB and alpha", File("01DA 00 01 0003 0001 0001 0004", "01 02 03 80"), Status::Ok, "010203", "128"},
      {"gray and alpha", File("01DA 00 01 0003 0001 0001 0002", "07 80"), Status::Ok, "070707", "128"},
      {"a fifth channel is passed over", File("01DA 00 01 0003 0001 0001 0005", "01 02 03 80 99"), Status::Ok, "010203", "128"},
      {"two bytes a sample, rounded", File("01DA 00 02 0002 0003 0001 0001", "00FF 0080 FF7F"), Status::Ok, "1 0 255", ""},
      {"runs", File("01DA 01 01 0002 0004 0001 0001", "00000208 00000006  03 07 81 09 00 00"), Status::Ok, "7 7 7 9", ""},
      {"runs of two bytes a sample", File("01DA 01 02 0002 0003 0001 0001", "00000208 00000008  0002 07FF 0081 0900"), Status::Ok,
       "8 8 9", ""},
      {"a run beyond the row", File("01DA 01 01 0002 0002 0001 0001", "00000208 00000002  7F 07"), Status::Ok, "7 7", ""},
      {"a code that ends early", File("01DA 01 01 0002 0003 0001 0001", "00000208 00000003  01 07 00"), Status::Ok, "7 0 0", ""},
      {"code behind the end", File("01DA 01 01 0002 0003 0001 0001", "00FF0208 00000003  01 07 00"), Status::FileReadError, "", ""},
      {"code cut short", File("01DA 01 01 0002 0003 0001 0001", "00000208 00000009  83 07"), Status::FileReadError, "", ""},
      {"rows cut short", File("01DA 00 01 0002 0002 0002 0001", "01 02 03"), Status::FileReadError, "", ""},
      {"65535 x 65535 x 65535 in a header", File("01DA 01 01 0003 FFFF FFFF FFFF", ""), Status::FileReadError, "", ""},
      {"no channels", File("01DA 00 01 0003 0001 0001 0000", "01"), Status::DamagedFile, "", ""},
      {"three bytes a sample", File("01DA 00 03 0003 0001 0001 0001", "01"), Status::DamagedFile, "", ""},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    const Decoded decoded = Decode(SgiRead, row.file);
    EXPECT_EQ(decoded.status, row.status);
    EXPECT_EQ(PixelText(decoded.picture->image), row.pixels);
    EXPECT_EQ(PixelText(decoded.picture->alpha), row.alpha);
  }
}

TEST(SgiRuns, RoundTripWithinTheLimit) {
  for (const size_t width : {1, 2, 3, 126, 127, 128, 1000}) {
    for (const int mask : {0xff, 0x01, 0x00}) {
      SCOPED_TRACE(width);
      Bytes row = RandomBytes(width, 9);
      for (uint8_t& byte : row) byte = static_cast<uint8_t>(byte & mask);
      Bytes code(MostSgiCode(width));
      code.resize(EncodeSgiRow(row, code.data()));
      Bytes back(width);
      EXPECT_TRUE(DecodeSgiRow(code, back));
      EXPECT_EQ(back, row);
    }
  }
}

}  // namespace
}  // namespace fotomill::test
