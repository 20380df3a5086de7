#include "batch/new_job.h"

#include <gtest/gtest.h>

#include "settings/settings.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

TEST(Naming, KnowsThePrefixOfEveryFunction) {
  const struct {
    PrefixedFunction function;
    const char *prefix, *withoutUnderbars;
  } rows[] = {
      {PrefixedFunction::Annotate, "Captioned_", "Captioned "},
      {PrefixedFunction::Catalog, "Catalog_", "Catalog "},
      {PrefixedFunction::Crop, "Cropped_ ", "Cropped "},
      {PrefixedFunction::Duplicate, "Duplicate of ", "Duplicate of "},
      {PrefixedFunction::Effects, "Effected_", "Effected "},
      {PrefixedFunction::Filter, "Filtered_", "Filtered "},
      {PrefixedFunction::Matt, "Matted_", "Matted "},
      {PrefixedFunction::SocialMedia, "SocialMedia_ ", "SocialMedia "},
      {PrefixedFunction::Transform, "Transformed_", "Transformed "},
      {PrefixedFunction::Watermark, "Watermarked_", "Watermarked "},
      {PrefixedFunction::Supercompressor, "Supercompressed_", "Supercompressed "},
  };
  static_assert(std::size(rows) == kPrefixedFunctionCount);
  const ScopedSettings keep;
  const BatchJob usual = NewBatchJob();
  settings.FilenameUnderbars = 0;
  const BatchJob without = NewBatchJob();
  for (const auto& row : rows) {
    EXPECT_EQ(usual.naming.PrefixOf(row.function), row.prefix);
    EXPECT_EQ(without.naming.PrefixOf(row.function), row.withoutUnderbars);
  }
  EXPECT_EQ(usual.naming.PrefixOf(FileFunction::Watermark), "Watermarked_");
  EXPECT_EQ(usual.naming.PrefixOf(FileFunction::Matt), "Matted_");
  EXPECT_EQ(usual.naming.PrefixOf(FileFunction::Convert), "");
  settings.PrefixFilter = std::string_view("a  b_");
  settings.FilenameUnderbars = 1;
  EXPECT_EQ(NewBatchJob().naming.PrefixOf(FileFunction::Filter), "a  b_");
}

}  // namespace
}  // namespace fotomill::test
