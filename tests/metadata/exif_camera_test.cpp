// Compares our texts for tags of real camera files with those of an independent reader.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <map>
#include <sstream>

#include "metadata/exif/exif_source.h"
#include "metadata/exif/exif_walk.h"
#include "support/files.h"
#include "support/peers.h"

namespace fotomill::test {
namespace {

const char* const kCameras[] = {"Canon_40D", "Canon_DIGITAL_IXUS_400",
                                "DSCN0010",  "Fujifilm_FinePix6900ZOOM",
                                "JVC",       "Kodak_CX7530",
                                "Minolta",   "Motorola",
                                "Nikon_D70", "Olympus_C8080WZ",
                                "GPS",       "Panasonic_DMC-FZ30",
                                "Pentax",    "Ricoh",
                                "Sanyo",     "Sony_HDR-HC3"};

class TextsByTag : public ExifSink {
 public:
  void Directory(int32_t, std::string_view label) override { label_ = label; }
  void Line(const ExifLine& line) override { texts[{label_, line.value.tag}] = line.text; }
  std::map<std::pair<std::string, uint16_t>, std::string> texts;

 private:
  std::string label_;
};

// Converts numbers such as "43/1 28/1" to our format; other texts are unchanged.
std::string InOurForm(const std::string& type, const std::string& value) {
  if (type == "Ascii") return value;
  std::istringstream words(value);
  std::string text, word;
  for (int count = 0; words >> word; ++count) {
    if (count == 16) return text + " ...";
    double numerator = 0, denominator = 1;
    char number[64];
    const bool rational = std::sscanf(word.c_str(), "%lf/%lf", &numerator, &denominator) == 2;
    std::snprintf(number, sizeof number, "%.3f", denominator == 0 ? 0 : numerator / denominator);
    text += (count > 0 ? " " : "") + (rational ? number : word);
  }
  return text;
}

TEST(ExifCameras, ValuesAgreeWithAnotherReader) {
  if (CorpusFolder().empty() || !HasProgram("exiv2"))
    GTEST_SKIP() << "needs real pictures and exiv2";
  static const std::map<std::string, std::string> kDirectories = {
      {"Image", "IFD 0"}, {"Thumbnail", "IFD 1"}, {"Photo", "EXIF"}, {"GPSInfo", "GPS"}};
  const TemporaryFolder folder;
  int compared = 0;
  for (const char* camera : kCameras) {
    const std::string path = CorpusFolder() + "/jpeg-exif/" + camera + ".jpg";
    ExifSource source;
    TextsByTag ours;
    ASSERT_EQ(source.Open(path.c_str()), Status::Ok);
    ASSERT_TRUE(WalkExif(source.Block(), &ours));
    RunShell("exiv2 -q -PExgyv '" + path + "' > '" + folder.Path("lines") + "'");
    std::istringstream lines(ReadText(folder.Path("lines")));
    for (std::string line; std::getline(lines, line);) {
      constexpr size_t kText = 31;  // column after tag, group and type
      std::string number, group, type, text = line.substr(std::min(kText, line.size()));
      if (!(std::istringstream(line) >> number >> group >> type) || !kDirectories.contains(group))
        continue;
      const ExifTag row = CopyExifTag(static_cast<uint16_t>(std::stoul(number, nullptr, 16)));
      if (row.rule != ExifRule::Plain || row.editClass == kExifOpaque) continue;
      const std::string ourText = ours.texts[{kDirectories.at(group), row.tag}];
      EXPECT_EQ(ourText, InOurForm(type, text)) << path << ' ' << group << ' ' << number << ' ' << row.name;
      ++compared;
    }
  }
  EXPECT_GT(compared, 400);
}

}  // namespace
}  // namespace fotomill::test
