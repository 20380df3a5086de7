#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>
#include <filesystem>

#include "batch/external_program.h"
#include "core/data_folder.h"
#include "platform/fault.h"
#include "platform/paths.h"
#include "platform/process.h"
#include "platform/work_apart.h"
#include "plugins/bad_modules.h"
#include "plugins/module_apart.h"
#include "plugins/plugin_bridge.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"
#include "settings/configuration.h"
#include "settings/plugin_settings.h"
#include "settings/settings.h"
#include "support/child.h"
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
    RunModulesApart(true);
    moduleLimits = {};
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
  for (const bool apart : {true, false}) {
    RunModulesApart(apart);
    for (const Row& row : rows) {
      SCOPED_TRACE(row.module);
      EnablePlugins(OddFolder(row.module));
      PicturePointer picture;
      EXPECT_EQ(LoadPicture({.fileName = file}, picture), row.status);
      EXPECT_EQ(picture != nullptr, row.status == Status::Ok);
    }
  }
}

// Neither the program nor the other files notice.
TEST_F(Plugins, AModuleThatCrashesOrHangsCostsOneFile) {
  for (const char* name : {"first.odd", "last.odd"}) test::WriteText(folder_.Path(name), "");
  moduleLimits.readSeconds = 1;
  moduleLimits.patience = 2;
  moduleLimits.memory = uint64_t{400} << 20;
  for (const char* module : {"CRASHES", "EXITS", "HANGS", "SPINS", "EATS"}) {
    SCOPED_TRACE(module);
    EnablePlugins(OddFolder(module));
    PicturePointer picture;
    EXPECT_EQ(LoadPicture({.fileName = folder_.Path("last.odd")}, picture), Status::DamagedFile);
    EXPECT_EQ(picture, nullptr);
    EXPECT_EQ(LoadPicture({.fileName = folder_.Path("first.odd")}, picture), Status::Ok);
  }
  EnablePlugins(OddFolder("LARGER"));
  PicturePointer picture;
  EXPECT_EQ(LoadPicture({.fileName = folder_.Path("last.odd")}, picture), Status::DamagedFile);
  platform::EndIdleProcesses();
  EXPECT_FALSE(test::HasChildren());
}

TEST_F(Plugins, AModuleThatCrashesWhenLoadedIsNotAskedAgain) {
  SetDataFolder(folder_.Path());
  const std::string module = OddFolder("EXITS_AT_ONCE") + "/FMWPL_odd.so";
  EXPECT_EQ(ScanPlugins(OddFolder("EXITS_AT_ONCE")), 0);
  EXPECT_EQ(WhyNotLoaded(module), "it crashed when it was loaded");
  EXPECT_TRUE(IsBadModule(module));
  EXPECT_TRUE(ForgiveModule("FMWPL_odd.so"));
  EXPECT_FALSE(IsBadModule(module));
  SetDataFolder({});
}

TEST_F(Plugins, StoppingEndsTheCall) {
  test::WriteText(folder_.Path("last.odd"), "");
  EnablePlugins(OddFolder("HANGS"));
  PicturePointer picture;
  ASSERT_EQ(LoadPictureInfo({.fileName = folder_.Path("last.odd")}, picture), Status::Ok);
  StopSource source;
  source.Stop();
  EXPECT_EQ(ReadPicture({.fileName = folder_.Path("last.odd"), .stop = source.Token()}, *picture),
            Status::FunctionCancelled);
}

TEST_F(Plugins, FactsAreKeptUntilTheModuleChanges) {
  SetDataFolder(folder_.Path());
  test::TemporaryFolder modules;
  const std::string copy = modules.Path("FMWPL_odd.so");
  std::filesystem::copy_file(OddFolder("METADATA") + "/FMWPL_odd.so", copy);
  ASSERT_EQ(ScanPlugins(modules.Path(), PluginScan::Cached), 1);
  const std::string kept = test::ReadText(folder_.Path("PluginFacts.txt"));
  EXPECT_NE(kept.find("option=Kind|2|0|0|1|Kind|small|large\n"), std::string::npos) << kept;
  // what is kept is used
  std::string changed = kept;
  changed.replace(changed.find("extensions=odd"), 14, "extensions=new");
  test::WriteText(folder_.Path("PluginFacts.txt"), changed);
  ASSERT_EQ(ScanPlugins(modules.Path(), PluginScan::Cached), 1);
  EXPECT_EQ(PluginRow(0).extension.view(), "new");
  EXPECT_EQ(PluginFacts(0).libraries, "libodd\t1.2\tMIT");
  std::filesystem::last_write_time(copy, std::filesystem::file_time_type::clock::now());
  ASSERT_EQ(ScanPlugins(modules.Path(), PluginScan::Cached), 1);
  EXPECT_EQ(PluginRow(0).extension.view(), "odd");
  for (const char* damaged : {"", "Plug-in facts 1\n[", "Plug-in facts 1\n[x]\nflags1=x\n"}) {
    test::WriteText(folder_.Path("PluginFacts.txt"), damaged);
    EXPECT_EQ(ScanPlugins(modules.Path(), PluginScan::Cached), 1);
  }
  SetDataFolder({});
}

TEST_F(Plugins, TheNewerInterfaceCarriesMetadataPagesAndOptions) {
  test::WriteText(folder_.Path("x.odd"), "");
  SetModuleOptions({{"FMWPL_odd.so.Level", 12}});
  for (const bool apart : {true, false}) {
    SCOPED_TRACE(apart);
    RunModulesApart(apart);
    EnablePlugins(OddFolder("METADATA"));
    PicturePointer picture;
    ASSERT_EQ(
        LoadPicture({.fileName = folder_.Path("x.odd"), .page = 2, .thumbnailSide = 60}, picture),
        Status::Ok);
    const auto text = [](const std::vector<uint8_t>& bytes) {
      return std::string(bytes.begin(), bytes.end());
    };
    EXPECT_EQ(picture->pageCount, 3);
    EXPECT_EQ(text(picture->metadata.exif), "exif");
    EXPECT_EQ(text(picture->metadata.xmp), "xmp");
    EXPECT_EQ(text(picture->metadata.icc).substr(0, 4), std::string("icc\0", 4));
    EXPECT_LT(picture->metadata.icc.size(), 100u) << "the module claims more than there is";
    EXPECT_EQ(picture->unread, kUnreadDepth);
    EXPECT_EQ(picture->image.PixelAt(0, 0), 9 << 16 | 120 << 8 | 2);
    picture->metadata.icc = {'p'};
    WriteOptions options;
    options.encode.SetQuality(33);
    ASSERT_EQ(WritePicture(*picture, folder_.Path("y.odd"), options), Status::Ok);
    EXPECT_EQ(test::ReadText(folder_.Path("y.odd")),
              "quality 33 lossless 0 options 9 1 exif exif xmp xmp icc p comment none");
    EXPECT_EQ(picture->lostMetadata, kAllMetadata & ~(kLostExif | kLostMakerNote | kLostIcc));
    options.keepMetadata = false;
    ASSERT_EQ(WritePicture(*picture, folder_.Path("y.odd"), options), Status::Ok);
    EXPECT_EQ(test::ReadText(folder_.Path("y.odd")),
              "quality 33 lossless 0 options 9 1 exif  xmp  icc p comment none");
    AnimationPointer animation;
    ASSERT_EQ(OpenAnimation({.fileName = folder_.Path("x.odd")}, animation), Status::Ok);
    EXPECT_EQ(animation->Delays(), (std::vector<int32_t>{100, 0, 300}));
    EXPECT_EQ(animation->Rounds(), 2);
    for (int32_t frame = 0; frame < 3; ++frame) {
      ASSERT_EQ(animation->Next(), Status::Ok);
      EXPECT_EQ(animation->Frame().image.PixelAt(0, 0) & 255, frame);
      EXPECT_EQ(animation->Frame().alpha.PixelAt(0, 0), 255);
    }
    EXPECT_EQ(animation->Next(), Status::NoImages);
  }
  SetModuleOptions({});
}

TEST_F(Plugins, AModuleMayAskToRunInTheProgram) {
  ASSERT_EQ(ScanPlugins(OddFolder("IN_PROGRAM")), 1);
  EXPECT_NE(PluginRow(0).module, nullptr);
  ASSERT_EQ(ScanPlugins(OddFolder("COMMENTS")), 1);
  EXPECT_EQ(PluginRow(0).module, nullptr);
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
  RunModulesApart(false);
  EnablePlugins(OddFolder("COMMENTS"));
  ASSERT_EQ(LoadPictureInfo({.fileName = file}, picture), Status::Ok);
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

TEST_F(Plugins, PicturesWithNamesLikeVideosAreNotPlayed) {
  EXPECT_TRUE(NeedsExternalProgram("a.avif"));
  EnablePlugins(SAMPLE_MODULES);
  EXPECT_TRUE(NeedsExternalProgram("a.avi"));
  if (FindPluginFormat("a.avif") == kNoFormat) GTEST_SKIP() << "no module for AVIF";
  EXPECT_FALSE(NeedsExternalProgram("a.avif"));
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
  const auto last = std::ranges::find(filter, "*.PPM", &FilterPair::patterns);
  ASSERT_NE(last, filter.end());
  EXPECT_EQ(last->description, "(PPM) Plugin Portable anymap");
  EXPECT_GT(last, std::ranges::find(filter, "*.ZIP", &FilterPair::patterns));
  const auto extensions = DestinationExtensions();
  EXPECT_GT(std::ranges::find(extensions, "ppm"), std::ranges::find(extensions, "xbm"));
  EXPECT_EQ(FindFormatByName("x.Pgm"), kSpareRow);
  EXPECT_EQ(FormatRow(kSpareRow).extension.view(), "pgm");
  EXPECT_EQ(FindFormatByName("x.ppm"), kSpareRow);
  EXPECT_EQ(FormatRow(kSpareRow).extension.view(), "ppm");
  EXPECT_TRUE((FormatRow(kSpareRow).flags & FMT_SPARE) != 0);
}

}  // namespace
}  // namespace fotomill
