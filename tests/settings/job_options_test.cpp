#include "settings/job_options.h"

#include <gtest/gtest.h>

#include "batch/new_job.h"
#include "picture/encode_options.h"
#include "picture/read_request.h"
#include "registry/registry.h"
#include "settings/key_table.h"
#include "support/scoped_settings.h"

namespace fotomill::test {
namespace {

TEST(JobOptions, DefaultsAreThoseOfTheSettings) {
  const ScopedSettings keep;
  for (const KeyRow& row : Keys()) StoreDefault(row);
  EXPECT_EQ(ReadOptionsFromSettings(), ReadOptions());
  EXPECT_EQ(EncodeOptionsFromSettings(), EncodeOptions());
}

// Every format key in Setup must reach its codec or the batch.
TEST(JobOptions, CoverEveryFormatKey) {
  for (const FormatSettings* const codec : SettingsOfFormats()) {
    for (const FormatSetting& setting : codec->keys) {
      if (*setting.label == '\0') continue;
      SCOPED_TRACE(setting.key);
      const ScopedSettings keep;
      const EncodeOptions encode = EncodeOptionsFromSettings();
      const ReadOptions read = ReadOptionsFromSettings();
      const auto everyPage = NewBatchJob().everyPage;
      const KeyRow* const row = FindKey(setting.key);
      ASSERT_NE(row, nullptr);
      if ((row->type & KEY_TEXT) != 0) {
        StoreText(*row, "another");
      } else {
        StoreNumber(*row, NumberIn(*row) == 0 ? 1 : 0);
      }
      EXPECT_TRUE(EncodeOptionsFromSettings() != encode || ReadOptionsFromSettings() != read ||
                  NewBatchJob().everyPage != everyPage);
    }
  }
}

}  // namespace
}  // namespace fotomill::test
