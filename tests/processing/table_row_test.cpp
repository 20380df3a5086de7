#include "processing/color/table_row.h"

#include "processing/pictures.h"

namespace fotomill::test {
namespace {

TEST(TableRow, IsTheSameOnEveryProcessor) {
  uint8_t table[256];
  for (int32_t i = 0; i < 256; ++i) table[i] = static_cast<uint8_t>(Scatter(i, 7));
  for (const size_t count :
       {size_t{0}, size_t{1}, size_t{63}, size_t{64}, size_t{65}, size_t{1000}}) {
    SCOPED_TRACE(count);
    std::vector<uint8_t> here(count + 8);  // the last eight must not be written
    for (size_t i = 0; i < here.size(); ++i) here[i] = static_cast<uint8_t>(i * 13);
    std::vector<uint8_t> baseline = here;
    TableRowHere()(table, here.data(), count);
    BaselineTableRow()(table, baseline.data(), count);
    EXPECT_EQ(here, baseline);
    for (size_t i = 0; i < count; ++i) EXPECT_EQ(here[i], table[static_cast<uint8_t>(i * 13)]);
  }
}

}  // namespace
}  // namespace fotomill::test
