#include <gtest/gtest.h>

#include <cstdlib>
#include <filesystem>

#include "core/data_folder.h"
#include "platform/fault.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "plugins/plugin_bridge.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"
#include "settings/configuration.h"
#include "settings/plugin_settings.h"
#include "settings/settings.h"
#include "support/files.h"
#include "support/scoped_settings.h"
#include "texts/status_text.h"

namespace fotomill {
namespace {

std::string OddFolder(const std::string& name) { return std::string(ODD_MODULES) + "/" + name; }

class Plugins : public testing::Test {
 protected:
  Plugins() { ApplyPluginSettings(); }
  ~Plugins() override {
    InstallPluginSource(nullptr);
    UnloadPlugins();
  }
  test::TemporaryFolder folder_;
  test::ScopedSettings settings_;
};

TEST_F(Plugins, ModulesAreRegisteredOrSkipped) {
  struct Row {
    const char* module;
    std::vector<std::string> extensions;
  };
  const Row rows[] = {
      {"REFUSES", {}},        {"NO_INFO_EXPORT", {}}, {"GAPS_IN_LIST", {"abc", "def"}}, {"UNTERMINATED_TEXTS", {"odd"}},
      {"missing folder", {}},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.module);
    ASSERT_EQ(ScanPlugins(OddFolder(row.module)), static_cast<int32_t>(row.extensions.size()));
    for (size_t i = 0; i < row.extensions.size(); ++i) {
      EXPECT_EQ(PluginRow(static_cast<int32_t>(i)).extension.view(), row.extensions[i]);
    }
  }
  EXPECT_EQ(ScanPlugins(OddFolder("FORTY_FORMATS")), kFormatsPerModule);
}

TEST_F(Plugins, UnterminatedTextsAreCut) {
  ASSERT_EQ(ScanPlugins(OddFolder("UNTERMINATED_TEXTS")), 1);
  std::string a, b;
  ASSERT_TRUE(PluginTextA(0, a));
  ASSERT_TRUE(PluginTextB(0, b));
  EXPECT_EQ(a, std::string(260, 'A'));
  EXPECT_EQ(b, std::string(260, 'B'));
  EXPECT_FALSE(PluginTextA(1, a));
  EXPECT_TRUE(PluginHelpPage(0).ends_with("/html/" + a));
  EXPECT_EQ(PluginHelpPage(1), "");
}

TEST_F(Plugins, OnlyModulesByNameAreLoaded) {
  const std::string module = OddFolder("GAPS_IN_LIST") + "/FMWPL_odd.so";
  for (const char* name :
       {"FMWPL_odd_x64.so", ".FMWPL_odd.so", "odd.so", "FMWPL.so.1", "FMWPL_link.txt"}) {
    std::filesystem::copy_file(module, folder_.Path(name));
  }
  EXPECT_EQ(ScanPlugins(folder_.Path()), 0);
  std::filesystem::copy_file(module, folder_.Path("FMWPLtwin.so"));
  std::filesystem::copy_file(module, folder_.Path("FMWPL_odd.so"));
  ASSERT_EQ(ScanPlugins(folder_.Path()), 4);
  EXPECT_EQ(PluginRow(0).extension.view(), "abc");
  EXPECT_EQ(PluginRow(1).extension.view(), "abc");
  EXPECT_LT(PluginRow(0).path.view(), PluginRow(1).path.view());
  EXPECT_TRUE(PluginCanHandle("x.ABC"));
  EXPECT_FALSE(PluginCanHandle("x.xyz"));
}

TEST_F(Plugins, DisabledModulesAreSkipped) {
  SetDataFolder(folder_.Path("data"));
  (void)LoadConfiguration();
  const std::string module = OddFolder("GAPS_IN_LIST") + "/FMWPL_odd.so";
  for (const char* name : {"FMWPL_a.so", "FMWPL_b.so"})
    std::filesystem::copy_file(module, folder_.Path(name));
  EXPECT_EQ(SwitchPluginModule("FMWPL_a.so", false), SaveResult::Done);
  (void)LoadConfiguration();
  ApplyPluginSettings();
  EnablePlugins(folder_.Path());
  EXPECT_EQ(PluginFormats().size(), 2u);
  EXPECT_EQ(platform::FileNameOf(PluginRow(0).path), "FMWPL_b.so");
  const std::vector<PluginModule> modules = PluginModules(folder_.Path());
  ASSERT_EQ(modules.size(), 2u);
  EXPECT_FALSE(modules[0].on);
  EXPECT_EQ(SwitchPluginModule("FMWPL_a.so", true), SaveResult::Done);
  EXPECT_EQ(test::ReadText(ConfigurationPath()), "[Plugins]\n");
  EXPECT_EQ(ScanPlugins(folder_.Path()), 4);
  SetDataFolder({});
  (void)LoadConfiguration();
}

TEST_F(Plugins, ValidatesWhatModulesReturn) {
  struct Row {
    const char* module;
    Status status;
  };
  const Row rows[] = {
      {"GARBAGE_SIZES", Status::DamagedFile},     {"ERROR_NUMBER", Status::InvalidPassword}, {"SMALL_BLOCK", Status::DamagedFile},
      {"WRONG_DEPTH", Status::UnsupportedFormat}, {"EMPTY_RESULT", Status::DamagedFile},     {"HALF_WRITER", Status::Ok},
      {"ODD_DEPTH", Status::DamagedFile},
  };
  const std::string file = folder_.Path("x.odd");
  test::WriteText(file, "anything");
  for (const Row& row : rows) {
    SCOPED_TRACE(row.module);
    EnablePlugins(OddFolder(row.module));
    PicturePointer picture;
    EXPECT_EQ(LoadPicture({.fileName = file}, picture), row.status);
    EXPECT_EQ(picture != nullptr, row.status == Status::Ok);
  }
}

TEST_F(Plugins, AFailedWriteLeavesTheDestinationAlone) {
  struct Row {
    const char* module;
    Status status;
  };
  for (const Row& row : {Row{"HALF_WRITER", Status::ErrorCreatingFile},
                         {"SILENT_WRITER", Status::ErrorWritingFile},
                         {"LAZY_WRITER", Status::ErrorWritingFile},
                         {"EMPTY_WRITER", Status::ErrorWritingFile},
                         {"BLIND_WRITER", Status::ErrorWritingFile}}) {
    SCOPED_TRACE(row.module);
    EnablePlugins(OddFolder(row.module));
    const std::string file = folder_.Path("x.odd");
    test::WriteText(file, "on before");
    PicturePointer picture;
    ASSERT_EQ(LoadPicture({.fileName = file}, picture), Status::Ok);
    EXPECT_EQ(picture->typeName.view(), std::string(64, 'T'));
    EXPECT_EQ(picture->image.PixelAt(0, 0), 0x0000ff);
    EXPECT_EQ(picture->image.PixelAt(1, 0), 0xff0000);
    EXPECT_EQ(WritePicture(*picture, file, {}), row.status);
    EXPECT_EQ(test::ReadText(file), "on before");
    EXPECT_EQ(folder_.Names(), std::vector<std::string>{"x.odd"});
  }
}

TEST_F(Plugins, WritersGetTheDestinationsName) {
  test::TemporaryFolder temporary;
  const char* const before = std::getenv("TMPDIR");
  const std::string kept = before == nullptr ? "/tmp" : before;
  platform::SetVariable("TMPDIR", temporary.Path());
  EnablePlugins(OddFolder("NAME_WRITER"));
  test::WriteText(folder_.Path("x.odd"), "");
  PicturePointer picture;
  ASSERT_EQ(LoadPicture({.fileName = folder_.Path("x.odd")}, picture), Status::Ok);
  // the temporary folder's path is longer than the destination's
  const std::string longest = std::string(255 - folder_.Path("x").size(), 'n') + ".odd";
  for (const std::string& name : {std::string("holiday in May.odd"), longest}) {
    ASSERT_EQ(WritePicture(*picture, folder_.Path(name), {}), Status::Ok);
    EXPECT_EQ(test::ReadText(folder_.Path(name)), name == longest ? "picture.odd" : name);
  }
  EXPECT_EQ(temporary.Names(), std::vector<std::string>());
  platform::SetVariable("TMPDIR", kept);
}

TEST_F(Plugins, ErrorNumbersAreNamed) {
  EnablePlugins(OddFolder("ERROR_42"));
  test::WriteText(folder_.Path("x.odd"), "");
  PicturePointer picture;
  const Status status = LoadPicture({.fileName = folder_.Path("x.odd")}, picture);
  EXPECT_EQ(StatusNumber(status), 42);
  EXPECT_EQ(StatusText(status), "error 42 of the plug-in");
  EXPECT_EQ(EnglishStatusText(static_cast<Status>(-1)), "error -1 of the plug-in");
  EXPECT_EQ(StatusText(Status::DamagedFile), "Damaged file.");
}

TEST_F(Plugins, ModulesCannotSetTheProgramsFlags) {
  EnablePlugins(OddFolder("ALL_FLAGS"));
  ASSERT_EQ(FindFormatByName("x.odd"), kSpareRow);
  const FormatEntry& row = FormatRow(kSpareRow);
  EXPECT_EQ(row.flags, FMT_SPARE | FMT_BITMAP | FMT_MULTI | FMT_ALPHA);
  EXPECT_EQ(row.maxBits, 24u);
  EXPECT_EQ(PluginRow(0).flags2, 0xffffffffu);
}

TEST_F(Plugins, InfoIncludesComments) {
  EnablePlugins(OddFolder("COMMENTS"));
  const std::string file = folder_.Path("x.odd");
  test::WriteText(file, "");
  PicturePointer picture;
  ASSERT_EQ(LoadPictureInfo({.fileName = file}, picture), Status::Ok);
  EXPECT_EQ(std::string(picture->comment.begin(), picture->comment.end()), "said by the module");
  bool withoutComment = false;
  for (int64_t n = 1; n < 100; ++n) {
    platform::faultCountdown = n;
    const Status status = LoadPictureInfo({.fileName = file}, picture);
    const bool reached = platform::faultCountdown <= 0;
    platform::faultCountdown = 0;
    if (!reached) break;
    withoutComment = withoutComment || (status == Status::Ok && picture->comment.empty());
  }
  EXPECT_TRUE(withoutComment) << "a comment that cannot be locked is not the picture's fault";
}

TEST_F(Plugins, AnExtensionOfTwoModulesIsListedOnce) {
  for (const char* name : {"FMWPL_a.so", "FMWPL_b.so"})
    std::filesystem::copy_file(OddFolder("GAPS_IN_LIST") + "/FMWPL_odd.so", folder_.Path(name));
  EnablePlugins(folder_.Path());
  ASSERT_EQ(PluginFormats().size(), 2u);
  EXPECT_EQ(PluginFormats()[0].extension, "ABC");
  EXPECT_EQ(PluginFormats()[1].extension, "DEF");
  EXPECT_EQ(PluginFormatCount(), 4);
}

TEST_F(Plugins, TruncatedModulesAreSkipped) {
  const std::string whole = OddFolder("GAPS_IN_LIST") + "/FMWPL_odd.so";
  const auto size = std::filesystem::file_size(whole);
  const std::string copy = folder_.Path("FMWPL_odd.so");
  std::filesystem::copy_file(whole, copy);
  for (auto end = size - 1; end > 0; end -= std::min(end, size / 40)) {
    std::filesystem::resize_file(copy, end);
    ASSERT_EQ(ScanPlugins(folder_.Path()), 0) << end << " of " << size;
    ASSERT_FALSE(WhyNotLoaded(copy).empty());
  }
}

TEST_F(Plugins, OlderModulesSetFewerFields) {
  EnablePlugins(OddFolder("OLDER"));
  test::WriteText(folder_.Path("x.odd"), "");
  PicturePointer picture;
  ASSERT_EQ(LoadPicture({.fileName = folder_.Path("x.odd")}, picture), Status::Ok);
  EXPECT_EQ(picture->typeName.view().find('T'), std::string_view::npos);
  EXPECT_EQ(picture->background, 0x102030u);
  EXPECT_EQ(picture->width, 2);
}

TEST_F(Plugins, ProgressReturnsToTheOuterCall) {
  class Sink : public ProgressSink {
   public:
    void Step(int32_t done, int32_t total) override { steps.push_back({done, total}); }
    std::vector<std::pair<int32_t, int32_t>> steps;
  };
  EnablePlugins(OddFolder("LOADS_ANOTHER"));
  for (const char* name : {"x.odd", "inner.odd"}) test::WriteText(folder_.Path(name), "");
  PicturePointer picture;
  ASSERT_EQ(LoadPictureInfo({.fileName = folder_.Path("x.odd")}, picture), Status::Ok);
  Sink sink;
  EXPECT_EQ(ReadPicture({.fileName = folder_.Path("x.odd"), .progress = &sink}, *picture), Status::Ok);
  EXPECT_EQ(sink.steps, (std::vector<std::pair<int32_t, int32_t>>{{1, 2}}));
}

TEST_F(Plugins, AModuleWithoutWriterIsReadOnly) {
  EnablePlugins(OddFolder("GAPS_IN_LIST"));
  test::WriteText(folder_.Path("x.abc"), "");
  PicturePointer picture;
  ASSERT_EQ(LoadPicture({.fileName = folder_.Path("x.abc")}, picture), Status::Ok);
  EXPECT_EQ(WritePicture(*picture, folder_.Path("y.def"), {}), Status::UnsupportedFunction);
  for (const std::string& extension : DestinationExtensions()) EXPECT_NE(extension, "def");
}

TEST_F(Plugins, SampleModuleReadsEveryVariant) {
  EnablePlugins(SAMPLE_MODULES);
  struct Row {
    const char* name;
    const char* contents;
    int32_t bits;
    std::vector<int32_t> pixels;  // indices, or 0x00RRGGBB
  };
  const Row rows[] = {
      {"plain.pbm", "P1\n# a remark\n3 1\n1 0 1\n", 1, {0, 1, 0}},
      {"raw.pgm", "P5 2 1 255\n\x10\xf0", 8, {0x10, 0xf0}},
      {"deep.pgm", "P2 2 1 1000 0 1000", 8, {0, 255}},
      {"raw.ppm", "P6\n2 1\n255\n\x01\x02\x03\xff\xfe\xfd", 24, {0x010203, 0xfffefd}},
  };
  for (const Row& row : rows) {
    SCOPED_TRACE(row.name);
    test::WriteText(folder_.Path(row.name), row.contents);
    PicturePointer picture;
    ASSERT_EQ(LoadPicture({.fileName = folder_.Path(row.name)}, picture), Status::Ok);
    EXPECT_EQ(picture->bitsPerPixel, row.bits);
    for (size_t x = 0; x < row.pixels.size(); ++x) {
      EXPECT_EQ(picture->image.PixelAt(static_cast<int32_t>(x), 0), row.pixels[x]) << "column " << x;
    }
  }
  PicturePointer picture;
  test::WriteText(folder_.Path("short.ppm"), "P6 9 9 255\nabc");
  EXPECT_EQ(LoadPicture({.fileName = folder_.Path("short.ppm")}, picture), Status::FileReadError);
  test::WriteText(folder_.Path("huge.ppm"), "P6 99999999 99999999 255\n");
  EXPECT_EQ(LoadPicture({.fileName = folder_.Path("huge.ppm")}, picture), Status::MemoryAllocationError);
}

TEST_F(Plugins, OnePluginFormatConvertsToAnother) {
  EnablePlugins(SAMPLE_MODULES);
  test::WriteText(folder_.Path("a.ppm"), "P6\n# kept\n2 1\n255\n\x01\x02\x03\xff\xfe\xfd");
  PicturePointer picture;
  ASSERT_EQ(LoadPicture({.fileName = folder_.Path("a.ppm")}, picture), Status::Ok);
  EXPECT_EQ(picture->formatIndex, kSpareRow);
  EXPECT_EQ(std::string(picture->comment.begin(), picture->comment.end()), "kept");
  WriteOptions commented;
  commented.comment = true;
  ASSERT_EQ(WritePicture(*picture, folder_.Path("b.PGM"), commented), Status::Ok);
  EXPECT_EQ(test::ReadText(folder_.Path("b.PGM")), "P5\n# kept\n2 1\n255\n\x02\xfe");
  ASSERT_EQ(WritePicture(*picture, folder_.Path("c.ppm"), {}), Status::Ok);
  EXPECT_EQ(test::ReadText(folder_.Path("c.ppm")), "P6\n2 1\n255\n\x01\x02\x03\xff\xfe\xfd");
}

TEST_F(Plugins, WrongExtensionsAreOpenedByContents) {
  EnablePlugins(SAMPLE_MODULES);
  const char* const contents = "P6\n2 1\n255\n\x01\x02\x03\xff\xfe\xfd";
  for (const char* const name : {"a.bmp", "a.pgmx", "a"}) {
    SCOPED_TRACE(name);
    test::WriteText(folder_.Path(name), contents);
    PicturePointer picture;
    ASSERT_EQ(LoadPicture({.fileName = folder_.Path(name)}, picture), Status::Ok);
    EXPECT_EQ(picture->formatIndex, kSpareRow);
    EXPECT_TRUE(OpenedByContents(*picture));
    EXPECT_EQ(picture->image.PixelAt(0, 0), 0x010203);
  }
  test::WriteText(folder_.Path("a.ppm"), contents);
  PicturePointer picture;
  ASSERT_EQ(LoadPicture({.fileName = folder_.Path("a.ppm")}, picture), Status::Ok);
  EXPECT_FALSE(OpenedByContents(*picture));
}

TEST_F(Plugins, ListsShowPluginFormatsLast) {
  EnablePlugins(SAMPLE_MODULES);
  const auto filter = OpenFileFilter();
  EXPECT_EQ(filter.back().description, "(PPM) Plugin Portable anymap");
  EXPECT_EQ(filter.back().patterns, "*.PPM");
  EXPECT_EQ(DestinationExtensions().back(), "ppm");
  EXPECT_EQ(FindFormatByName("x.Pgm"), kSpareRow);
  EXPECT_EQ(FormatRow(kSpareRow).extension.view(), "pgm");
  EXPECT_EQ(FindFormatByName("x.ppm"), kSpareRow);
  EXPECT_EQ(FormatRow(kSpareRow).extension.view(), "ppm");
  EXPECT_TRUE((FormatRow(kSpareRow).flags & FMT_SPARE) != 0);
}

}  // namespace
}  // namespace fotomill
