// What an independent reader says about the tags of real camera files, beside our texts.

#include <gtest/gtest.h>

#include <algorithm>
#include <cstdio>
#include <map>
#include <sstream>

#include "core/text.h"
#include "metadata/exif_source.h"
#include "metadata/exif_walk.h"
#include "support/files.h"
#include "support/peers.h"

namespace fotomill::test {
namespace {

const char* const kCameras[] = {
    "Canon_40D.jpg",      "Canon_DIGITAL_IXUS_400.jpg", "DSCN0010.jpg", "Fujifilm_FinePix6900ZOOM.jpg",
    "JVC.jpg",            "Kodak_CX7530.jpg",           "Minolta.jpg",  "Motorola.jpg",
    "Nikon_D70.jpg",      "Olympus_C8080WZ.jpg",        "GPS.jpg",      "Panasonic_DMC-FZ30.jpg",
    "Pentax.jpg",         "Ricoh.jpg",                  "Sanyo.jpg",    "Sony_HDR-HC3.jpg",
};

// Directory and tag.
using Key = std::pair<std::string, uint16_t>;

class TextsByTag : public ExifSink {
 public:
  void Directory(int32_t, std::string_view label) override { label_ = label; }
  void Line(const ExifLine& line) override { texts[{label_, line.value.tag}] = line.text; }
  std::map<Key, std::string> texts;

 private:
  std::string label_;
};

struct PeerLine {
  Key key;
  std::string type, text;
};

// The lines of "exiv2 -P<what>": tag, group, type, then the value.
std::vector<PeerLine> PeerLines(const std::string& path, const std::string& what, const std::string& workFile) {
  static const std::map<std::string, std::string> kGroups = {
      {"Image", "IFD 0"}, {"Thumbnail", "IFD 1"}, {"Photo", "EXIF"}, {"GPSInfo", "GPS"}};
  RunShell("exiv2 -q -P" + what + " '" + path + "' > '" + workFile + "'");
  std::istringstream file(ReadText(workFile));
  std::vector<PeerLine> lines;
  for (std::string line; std::getline(file, line);) {
    std::istringstream words(line);
    std::string tag, group;
    PeerLine peer;
    words >> tag >> group >> peer.type >> std::ws;
    std::getline(words, peer.text);
    const auto known = kGroups.find(group);
    if (known == kGroups.end()) continue;
    peer.key = {known->second, static_cast<uint16_t>(std::stoul(tag, nullptr, 16))};
    lines.push_back(peer);
  }
  return lines;
}

// Numbers such as "43/1 28/1" in our own form; characters stay.
std::string InOurForm(const PeerLine& line) {
  if (line.type == "Ascii") return line.text;
  std::istringstream words(line.text);
  std::string text;
  int count = 0;
  for (std::string word; words >> word; ++count) {
    if (count == 16) return text + " ...";
    double numerator = 0, denominator = 1;
    char number[64];
    const bool rational = std::sscanf(word.c_str(), "%lf/%lf", &numerator, &denominator) == 2;
    std::snprintf(number, sizeof number, "%.3f", denominator == 0 ? 0 : numerator / denominator);
    text += (count > 0 ? " " : "") + (rational ? std::string(number) : word);
  }
  return text;
}

std::string WithoutTrailingBlanks(const std::string& text) { return text.substr(0, text.find_last_not_of(' ') + 1); }

TEST(ExifCameras, ValuesAgreeWithAnotherReader) {
  if (CorpusFolder().empty() || !HasProgram("exiv2")) GTEST_SKIP() << "needs real pictures and exiv2";
  const TemporaryFolder folder;
  // Words that mean the same; those that are equal but for their case need not be here.
  static const std::map<std::string, std::string> kSameWords = {
      {"top, left", "Top Left"},  {"left, bottom", "Left Bottom"},   {"inch", "Inches"},
      {"Auto", "Auto exposure"},  {"Manual", "Manual exposure"},     {"Multi-segment", "Pattern"},
      {"YCbCr", "YCbCr*"},        {"JPEG (old-style)", "JPEG"},      {"(0)", "Other"},
      {"Directly photographed", "Directly photographed image"},
  };
  static const uint16_t kWordTags[] = {0x0001, 0x0003, 0x0103, 0x0112, 0x0128, 0x9207, 0x9101,
                                       0xa001, 0xa300, 0xa301, 0xa401, 0xa402, 0xa406};
  int values = 0, words = 0;
  for (const char* camera : kCameras) {
    SCOPED_TRACE(camera);
    const std::string path = CorpusFolder() + "/jpeg-exif/" + camera;
    ExifSource source;
    ASSERT_EQ(source.Open(path.c_str()), Status::Ok);
    TextsByTag ours;
    ASSERT_TRUE(WalkExif(source.Block(), &ours));
    for (const PeerLine& line : PeerLines(path, "Exgyv", folder.Path("values"))) {
      const ExifTag row = CopyExifTag(line.key.second);
      if (row.rule != ExifRule::Plain || row.editClass == kExifOpaque) continue;
      SCOPED_TRACE(line.key.first + " " + std::string(row.name) + " " + std::to_string(line.key.second));
      EXPECT_EQ(WithoutTrailingBlanks(ours.texts[line.key]), WithoutTrailingBlanks(InOurForm(line)));
      ++values;
    }
    for (const PeerLine& line : PeerLines(path, "Exgyt", folder.Path("words"))) {
      if (std::find(std::begin(kWordTags), std::end(kWordTags), line.key.second) == std::end(kWordTags)) continue;
      SCOPED_TRACE(line.key.first + " " + std::string(ExifTagName(line.key.second)));
      const auto same = kSameWords.find(line.text);
      EXPECT_EQ(LowerCase(ours.texts[line.key]), LowerCase(same == kSameWords.end() ? line.text : same->second));
      ++words;
    }
  }
  EXPECT_GT(values, 400);
  EXPECT_GT(words, 100);
}

}  // namespace
}  // namespace fotomill::test
