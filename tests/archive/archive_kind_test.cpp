#include "archive/archive_kind.h"

#include <gtest/gtest.h>

#include <string>
#include <vector>

#include "support/hex.h"

namespace fotomill::test {
namespace {

TEST(ArchiveKind, IsReadFromHeaders) {
  using Kind = ArchiveKind;
  const std::string end = "504B0506", counts = "0100 0100 0000 0000 0000 0000 0000";
  const struct {
    const char* name;
    std::string bytes;
    Kind::Type type;
    bool volume, namesLocked;
  } rows[] = {
      {"nothing", "", Kind::None, false, false},
      {"a picture", "FFD8FFE0", Kind::None, false, false},
      {"an empty ZIP", end + " 0000 0000" + counts, Kind::Zip, false, false},
      {"a cut ZIP", "504B0304 1400", Kind::Zip, false, false},
      {"the last of several", end + " 0200 0200" + counts, Kind::Zip, true, false},
      {"its directory is on a later one", end + " 0000 0100" + counts, Kind::Zip, true, false},
      {"numbers in ZIP64", end + " FFFF FFFF" + counts, Kind::Zip, false, false},
      {"the first of several", "504B0708 504B0304", Kind::Zip, true, false},
      {"RAR 4", "526172211A0700 CF90 73 0000 0D00", Kind::Rar4, false, false},
      {"a volume of it", "526172211A0700 CF90 73 0101 0D00", Kind::Rar4, true, false},
      {"names encrypted", "526172211A0700 CF90 73 8000 0D00", Kind::Rar4, false, true},
      {"RAR 4, cut", "526172211A0700", Kind::Rar4, false, false},
      {"RAR 5", "526172211A070100 11111111 03 01 00 00", Kind::Rar5, false, false},
      {"a volume of it", "526172211A070100 11111111 03 01 00 01", Kind::Rar5, true, false},
      {"behind an extra area", "526172211A070100 11111111 05 01 01 82 01 03", Kind::Rar5, true,
       false},
      {"names encrypted", "526172211A070100 11111111 05 04 00 00 00", Kind::Rar5, false, true},
      {"endless number", "526172211A070100 11111111 FFFFFFFFFFFFFFFFFFFFFFFFFF", Kind::Rar5, false,
       false},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const std::vector<uint8_t> bytes = Hex(row.bytes);
    const ArchiveKind kind = ArchiveKindOf(bytes);
    EXPECT_EQ(kind.type, row.type);
    EXPECT_EQ(kind.volume, row.volume);
    EXPECT_EQ(kind.namesLocked, row.namesLocked);
  }
}

}  // namespace
}  // namespace fotomill::test
