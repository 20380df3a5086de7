#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <algorithm>
#include <cstdlib>

#include "catalog/history/file_history.h"
#include "catalog/thumbnails/thumbnail_database.h"
#include "core/choice_lists.h"
#include "core/data_folder.h"
#include "desktop/models/browser/file_tip.h"
#include "desktop/models/history/file_history_list.h"
#include "desktop/models/history/history_dates.h"
#include "desktop/models/info/exif_report.h"
#include "desktop/models/info/info_report.h"
#include "desktop/models/setup/configuration_transfer.h"
#include "desktop/models/thumbnails/upkeep.h"
#include "metadata/exif/exif_text.h"
#include "platform/clock.h"
#include "platform/files.h"
#include "registry/registry.h"
#include "settings/configuration.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "support/codecs.h"
#include "support/exif_blocks.h"
#include "support/files.h"
#include "support/scoped_settings.h"

namespace fotomill::desktop {
namespace {

using testing::ElementsAre;
using testing::HasSubstr;

TEST(FileTip, ShowsFactsOrTheError) {
  const test::TemporaryFolder folder;
  const PicturePointer picture = test::PatternPicture(40, 30, 24);
  const std::string words = "holiday";
  picture->comment.assign(words.begin(), words.end());
  ASSERT_EQ(WritePicture(*picture, folder.Path("a.jpg"), {}), Status::Ok);
  test::WriteText(folder.Path("b.gif"), "GIF89a and no more");
  const auto last = [&](const char* name, Status known) {
    FolderItem item;
    item.name = name;
    const std::vector<std::string> lines = FileTipLines(folder.Path(), item, known);
    return std::vector<std::string>(lines.begin() + 3, lines.end());
  };
  using Lines = std::vector<std::string>;
  EXPECT_EQ(last("a.jpg", Status::Ok), (Lines{"40 x 30 pixels, 24 bits", "holiday"}));
  EXPECT_EQ(last("a.jpg", Status::DamagedFile).front(), StatusMessage(Status::DamagedFile));
  EXPECT_EQ(last("b.gif", Status::Ok).size(), 1u);
}

// A fresh data folder and fresh settings.
class Reports : public testing::Test {
 protected:
  Reports() {
    SetDataFolder(folder_.Path("data"));
    (void)LoadConfiguration();
  }
  ~Reports() override {
    ClearFileHistory();
    SetDataFolder(folder_.Path("none"));
    (void)LoadConfiguration();
    SetDataFolder({});
  }
  std::string Sample(const std::string& name) {
    test::WriteBytes(folder_.Path(name),
                     test::ReadBytes(test::SourcePath("samples/bmp-true-color.bmp")));
    return folder_.Path(name);
  }

  test::ScopedSettings settings_;
  test::TemporaryFolder folder_;
};

TEST_F(Reports, ExifRowsMatchTheText) {
  const std::string path = folder_.Path("a.tif");
  test::WriteBytes(path, test::BigEndianBlock());
  for (const int32_t types : {0, 1}) {
    const ExifReport report = ReadExifReport(path, {.text = {.showTypes = types == 1}});
    EXPECT_EQ(report.status, Status::Ok);
    std::string text;
    for (const ExifRow& row : report.rows)
      text += row.heading ? row.name + "\n" : "    " + row.name + "\t" + row.text + "\n";
    EXPECT_EQ(text, report.text);
    EXPECT_THAT(text, HasSubstr("DIRECTORY EXIF\n"));
    EXPECT_EQ(text.find(" [SHORT]\t") != std::string::npos, types == 1);
  }
  test::WriteText(folder_.Path("b.tif"), "II, but no more than that");
  EXPECT_THAT(ReadExifReport(folder_.Path("b.tif"), {}).problem, HasSubstr("no valid header"));
  EXPECT_THAT(ReadExifReport(Sample("c.bmp"), {}).problem, HasSubstr("no EXIF"));
  EXPECT_EQ(ReadExifReport(folder_.Path("none.jpg"), {}).status, Status::FileOpenError);
}

// A block with a place of 0 degrees in both directions, which all zero bytes mean.
std::vector<uint8_t> BlockWithPlace() {
  test::BlockBuilder builder;
  const uint32_t first = builder.Directory({{0x8825, 4, 1, 0}});
  const uint32_t angle =
      builder.Bytes({0, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 1, 0, 0, 0, 0, 0, 0, 0, 1, 0, 0, 0});
  const uint32_t gps =
      builder.Directory({{1, 2, 2, 'N'}, {2, 5, 3, angle}, {3, 2, 2, 'E'}, {4, 5, 3, angle}});
  builder.Patch32(first + 2 + 8, gps);
  return builder.block;
}

TEST_F(Reports, PlacesAreReadableAndMeasured) {
  const std::string path = folder_.Path("a.tif");
  test::WriteBytes(path, BlockWithPlace());
  settings.ExifDefaultLocation = std::string_view("1,0,0,N,0,0,0,E");
  settings.ExifDistinceUnits = 1;
  const ExifReport report = ReadExifReport(path, ExifReportOptionsFromSettings());
  EXPECT_THAT(report.text, testing::EndsWith("Places\n"
                                             "    Place of the picture\t0° 00' 00.00\" N, 0° 00' 00.00\" E (0.00000, 0.00000)\n"
                                             "    Distance to the default location\t111.1 kilometers\n"));
  settings.ExifDefaultLocation = std::string_view("nowhere");
  EXPECT_THAT(ReadExifReport(path, ExifReportOptionsFromSettings()).text, testing::Not(HasSubstr("Distance")));
}

TEST_F(Reports, PhotographersReadTheirOwnUnits) {
  const std::string path = folder_.Path("a.tif");
  test::WriteBytes(path, test::LittleEndianBlock());
  const ExifReport report = ReadExifReport(path, {});
  const auto rows = RowsForPeople(report, false);
  ASSERT_GT(rows.size(), 3u);
  EXPECT_EQ(rows[0].name, "Photo");
  EXPECT_EQ(rows[1].text, "Acme");
  const auto has = [](std::span<const ExifRow> all, const char* name, const char* text) {
    return std::ranges::any_of(
        all, [&](const ExifRow& row) { return row.name == name && row.text == text; });
  };
  EXPECT_TRUE(has(rows, "Exposure time", "1/60 s"));
  EXPECT_TRUE(has(rows, "Camera settings", ""));
  EXPECT_FALSE(has(rows, "DIRECTORY EXIF", ""));
  const auto raw = RowsForPeople(report, true);
  EXPECT_TRUE(has(raw, "DIRECTORY EXIF", ""));
  EXPECT_FALSE(has(raw, "Photo", ""));

  test::WriteBytes(path, BlockWithPlace());
  EXPECT_THAT(ReadExifReport(path, {}).link, testing::StartsWith("https://www.openstreetmap.org/"));
}

TEST_F(Reports, CardsStayWhole) {
  const std::string path = folder_.Path("a.fits");
  std::string header;
  for (const char* card : {"SIMPLE  =                    T", "BITPIX  =                    8",
                           "NAXIS   =                    2", "NAXIS1  =                    2",
                           "NAXIS2  =                    1", "OBJECT  = 'NGC: 4565'", "END"})
    header += std::string(card).append(80 - std::string_view(card).size(), ' ');
  header.resize(2880, ' ');
  test::WriteText(path, header + std::string(2880, '\0'));
  const FileInfo info = ReadFileInfo(path, InfoOptionsFromSettings());
  ASSERT_EQ(info.status, Status::Ok);
  std::vector<std::string> labels, values;
  for (const InfoLine& line : info.sections.at(1).lines) {
    labels.push_back(line.label);
    values.push_back(line.value);
  }
  EXPECT_THAT(labels, testing::Each(""));
  EXPECT_THAT(values, testing::Contains(HasSubstr("NGC: 4565")));
}

std::string ValueOf(const std::vector<InfoSection>& sections, const std::string& title,
                    const std::string& label) {
  for (const InfoSection& section : sections) {
    for (const InfoLine& line : section.lines) {
      if (section.title == title && line.label == label) return line.value;
    }
  }
  return "-";
}

TEST_F(Reports, InfoOfOneAndOfSeveral) {
  settings.InfoResolution = 75;
  settings.InfoUnits = choice::kCentimeters;
  const FileInfo one = ReadFileInfo(Sample("one.bmp"), InfoOptionsFromSettings());
  EXPECT_EQ(one.status, Status::Ok);
  EXPECT_EQ(ValueOf(one.sections, "General", "Dimensions"), "150 x 112 pixels");
  EXPECT_EQ(ValueOf(one.sections, "General", "Print size"), "5.08 x 3.79 centimeters at 75 dots per inch");
  EXPECT_EQ(ValueOf(one.sections, "Details", "Planes"), "1") << "the blanks in front of the codec's names are gone";
  settings.InfoUnits = choice::kPixels;
  const FileInfo two = ReadFileInfo(Sample("two.bmp"), InfoOptionsFromSettings());
  EXPECT_EQ(ValueOf(two.sections, "General", "Print size"), "-");

  test::WriteText(folder_.Path("no.png"), "This is no picture.");
  const FileInfo broken = ReadFileInfo(folder_.Path("no.png"), InfoOptionsFromSettings());
  EXPECT_NE(broken.status, Status::Ok);
  EXPECT_FALSE(broken.problem.empty());
  EXPECT_EQ(ValueOf(broken.sections, "General", "File size"), "19 bytes");

  const std::vector<InfoSection> summary = SummaryOf(std::vector{one, two, broken});
  EXPECT_EQ(ValueOf(summary, "Totals", "Files"), "3");
  EXPECT_EQ(ValueOf(summary, "Totals", "Pictures"), "2");
  EXPECT_EQ(ValueOf(summary, "Totals", "File size"), "101375 bytes");
  EXPECT_EQ(ValueOf(summary, "Could not be read", "no.png"), broken.problem);
  EXPECT_EQ(ValueOf(summary, "The same in all", "Folder"), folder_.Path() + "/");
  EXPECT_EQ(ValueOf(summary, "Different", "File size"), "2 different: 50678 bytes (2 files); 19 bytes");
  EXPECT_EQ(ValueOf(summary, "Different", "Dimensions"), "150 x 112 pixels (in 2 of 3 files)");
  EXPECT_THAT(TextOf(broken), testing::StartsWith(folder_.Path("no.png") + "\n" + broken.problem +
                                                  "\nGeneral\n    File name: no.png\n"));
}

TEST(HistoryDates, EachStyle) {
  setenv("TZ", "UTC", 1);
  struct {
    int64_t seconds;
    const char* styles[4];
  } const rows[] = {
      {1795287909,
       {"Saturday, November 21, 2026 7:05:09 p.m.", "Saturday, November 21, 2026 19:05:09", "2026-11-21 7:05 p.m.",
        "2026-11-21 19:05"}},
      {0,
       {"Thursday, January 1, 1970 12:00:00 a.m.", "Thursday, January 1, 1970 00:00:00", "1970-01-01 12:00 a.m.",
        "1970-01-01 00:00"}},
      {43200,
       {"Thursday, January 1, 1970 12:00:00 p.m.", "Thursday, January 1, 1970 12:00:00", "1970-01-01 12:00 p.m.",
        "1970-01-01 12:00"}},
  };
  for (const auto& row : rows) {
    for (int32_t mode = 0; mode < 4; ++mode)
      EXPECT_EQ(HistoryDate(row.seconds, mode), row.styles[mode]);
  }
}

TEST_F(Reports, HistorySortsRemovesAndForgets) {
  settings.FileHistoryFunctions = -1;
  const FileUse uses[] = {{Sample("a10.bmp"), FileFunction::Convert, 300, 100},
                          {Sample("a2.bmp"), FileFunction::View, 100, 300},
                          {Sample("B.bmp"), FileFunction::Crop, 200, 200}};
  ASSERT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), uses), HistoryUpdate::Done);
  FileHistoryList list;
  EXPECT_TRUE(list.Read());
  const auto names = [&] {
    std::vector<std::string> shown;
    for (size_t row = 0; row < list.Count(); ++row)
      shown.push_back(list.Cell(row, choice::kColumnName));
    return shown;
  };
  EXPECT_THAT(names(), ElementsAre("a2.bmp", "a10.bmp", "B.bmp"));
  list.SortBy(choice::kColumnName);
  EXPECT_THAT(names(), ElementsAre("B.bmp", "a10.bmp", "a2.bmp")) << "again: the other way round";
  list.SortBy(choice::kColumnAccessed);
  EXPECT_THAT(names(), ElementsAre("a2.bmp", "B.bmp", "a10.bmp")) << "the last use first";
  list.SortBy(choice::kColumnFunction);
  EXPECT_THAT(names(), ElementsAre("a10.bmp", "B.bmp", "a2.bmp"));
  EXPECT_EQ(list.Cell(1, choice::kColumnSize), "50,678");
  EXPECT_EQ(list.Cell(1, choice::kColumnPath), folder_.Path() + "/");

  const FileUse later{Sample("c.bmp"), FileFunction::Crop};
  ASSERT_EQ(UpdateFileHistory(HistoryOptionsFromSettings(), {&later, 1}), HistoryUpdate::Done);
  EXPECT_TRUE(list.Remove({0, 2}));
  EXPECT_THAT(names(), ElementsAre("B.bmp"));
  EXPECT_THAT(
      test::ReadText(FileHistoryPath(HistoryOptionsFromSettings())),
      testing::AllOf(HasSubstr("B.bmp"), HasSubstr("c.bmp"), testing::Not(HasSubstr("a2"))));
  EXPECT_TRUE(list.Clear());
  EXPECT_FALSE(platform::FileExists(FileHistoryPath(HistoryOptionsFromSettings())));
  test::WriteText(FileHistoryPath(HistoryOptionsFromSettings()), "no history at all");
  EXPECT_FALSE(list.Read());
}

TEST_F(Reports, CompactionReportsItsResult) {
  const std::string path = folder_.Path("Fotomill.tdb");
  const auto outcome = [&] {
    DatabaseCompaction compaction(path, false, true);
    while (!compaction.Ended()) std::this_thread::yield();
    return std::pair(compaction.Succeeded(), compaction.Outcome());
  };
  EXPECT_EQ(outcome(), std::pair(false, std::string("This thumbnail database does not exist.")));
  {
    ThumbnailDatabase database;
    ASSERT_EQ(database.OpenThumbnailDatabase(path, true), ThumbnailDatabase::Opened::Done);
    std::vector<DatabaseRecord> records(2);
    records[0].path = "/a";
    records[1].path = "/b";
    for (DatabaseRecord& record : records) record.thumbnail.Sign();
    ASSERT_TRUE(database.AppendDatabaseRecords(records, false));
    ASSERT_EQ(database.Delete("/a"), 1);
  }
  EXPECT_EQ(DescribeDatabase(path), "2 records, 55.6 KB");
  EXPECT_EQ(outcome(), std::pair(true, std::string("1 record was removed, 1 remain. The file is 27.8 KB smaller.")));
  test::WriteText(path, "something else");
  EXPECT_FALSE(outcome().first);
  EXPECT_EQ(test::ReadText(path), "something else");
}

TEST_F(Reports, OrphansBelowAreFoundOnRequest) {
  Sample("a.bmp");
  ASSERT_TRUE(platform::MakeFolders(folder_.Path("sub")));
  for (const char* name : {"A.THN", "gone.thn", ".hidden.THN", "sub/gone.THN"})
    test::WriteText(folder_.Path(name), "");
  const StopSource stop, stopped;
  stopped.Stop();
  EXPECT_THAT(FindOrphanThumbnails(folder_.Path(), false, stop.Token()), ElementsAre(folder_.Path("gone.thn")));
  const std::vector<std::string> all = FindOrphanThumbnails(folder_.Path(), true, stop.Token());
  EXPECT_THAT(all, ElementsAre(folder_.Path("gone.thn"), folder_.Path("sub/gone.THN")));
  EXPECT_TRUE(FindOrphanThumbnails(folder_.Path(), true, stopped.Token()).empty());
  EXPECT_TRUE(DeleteThumbnails(all).empty());
  EXPECT_TRUE(platform::FileExists(folder_.Path("A.THN")));
  EXPECT_FALSE(platform::FileExists(folder_.Path("sub/gone.THN")));
  EXPECT_THAT(DeleteThumbnails(all), all) << "what is not there cannot be deleted";
}

TEST_F(Reports, SettingsRoundTrip) {
  EXPECT_FALSE(ExportConfiguration(folder_.Path("out.ini")).ok) << "there is nothing yet";
  settings.JpegCompression = 42;
  settings.PrefixCrop = std::string_view("Cut ");
  ASSERT_TRUE(ExportConfiguration(folder_.Path("out.ini")).ok) << "what was not saved yet is saved first";
  EXPECT_THAT(test::ReadText(folder_.Path("out.ini")),
              testing::AllOf(testing::StartsWith(";\r\n;\r\n;------ INI"),
                             HasSubstr("JpegCompression=42\n")));
  settings.JpegCompression = 80;
  settings.UndoLevels = 3;
  test::WriteText(folder_.Path("in.ini"),
                  test::ReadText(folder_.Path("out.ini")) +
                      "PngCompression=many\nNoSuchKey=1\nVersionNumber=9\n");
  const Transfer transfer = ImportConfiguration(folder_.Path("in.ini"));
  EXPECT_TRUE(transfer.ok);
  EXPECT_EQ(transfer.message,
            "2 settings were imported; all others are unchanged. 1 value was invalid. 1 key is unknown.");
  EXPECT_EQ(settings.JpegCompression, 42);
  EXPECT_EQ(settings.UndoLevels, 3);
  EXPECT_THAT(test::ReadText(ConfigurationPath()), HasSubstr("JpegCompression=42\n"));
  test::WriteText(folder_.Path("in.ini"), "no settings at all");
  EXPECT_FALSE(ImportConfiguration(folder_.Path("in.ini")).ok);
}

}  // namespace
}  // namespace fotomill::desktop
