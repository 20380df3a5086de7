#include "settings/format_switches.h"

#include <gtest/gtest.h>

#include "core/data_folder.h"
#include "registry/registry.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill {
namespace {

TEST(FormatSwitches, AreStoredUnlessDefault) {
  const test::ScopedSettings settingsBefore;
  const test::TemporaryFolder folder;
  SetDataFolder(folder.Path());
  test::WriteText(ConfigurationPath(), "[Formats]\nEXE=1\nNONE=1\n[Fotomill]\nUnknown=7\n");
  (void)LoadConfiguration();
  TakeFormatSwitches();
  const int32_t exe = FindFormatByName("a.exe"), pcx = FindFormatByName("a.pcx");
  EXPECT_EQ(FormatRow(exe).enabled, 1) << "off by default";
  EXPECT_EQ(SwitchFormat(exe, false), SaveResult::Done);
  EXPECT_EQ(SwitchFormat(pcx, false), SaveResult::Done);
  EXPECT_EQ(test::ReadText(ConfigurationPath()), "[Formats]\nNONE=1\nPCX=0\n[Fotomill]\nUnknown=7\n");
  FormatRow(pcx).enabled = 1;
  (void)LoadConfiguration();
  TakeFormatSwitches();
  EXPECT_EQ(FormatRow(pcx).enabled, 0);
  EXPECT_EQ(DescribeFileType("a.pcx"), "(PCX) PCX file") << "a format that is off has no name";
  EXPECT_EQ(SwitchFormat(pcx, true), SaveResult::Done);
  EXPECT_EQ(test::ReadText(ConfigurationPath()).find("PCX"), std::string::npos);

  SetDataFolder(folder.Path("none"));
  (void)LoadConfiguration();
  TakeFormatSwitches();
  EXPECT_EQ(FormatRow(exe).enabled, 0);
  SetDataFolder({});
}

}  // namespace
}  // namespace fotomill
