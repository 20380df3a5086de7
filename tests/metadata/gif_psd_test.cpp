// XMP in GIF and Photoshop files, and what is removed from them.
#include <gtest/gtest.h>

#include "containers/metadata_rewrite.h"
#include "metadata/edit/strip.h"
#include "metadata/tags/tag_edit.h"
#include "support/hex.h"

namespace fotomill::test {
namespace {

using Bytes = std::vector<uint8_t>;

Bytes Joined(std::initializer_list<Bytes> parts) {
  Bytes bytes;
  for (const Bytes& part : parts) bytes.insert(bytes.end(), part.begin(), part.end());
  return bytes;
}

Bytes Text(std::string_view text) { return {text.begin(), text.end()}; }

// --- GIF ---

const Bytes kScreen = Hex("0200 0100 80 00 00  000000 FFFFFF");
const Bytes kLoop = Hex("21FF0B 4E45545343415045322E30 03 01 0000 00");  // NETSCAPE2.0
const Bytes kTiming = Hex("21F904 00 0A00 00 00");
const Bytes kFrame = Hex("2C 0000 0000 0200 0100 00  02 02 4401 00");
const Bytes kTrailer = Hex("3B");

// A packet, as any reader must be able to skip it.
Bytes GifXmp(std::string_view packet) {
  Bytes bytes = Joined({Hex("21FF0B"), Text("XMP DataXMP"), Text(packet), Hex("01")});
  for (int i = 0xFF; i >= 0; --i) bytes.push_back(static_cast<uint8_t>(i));
  bytes.push_back(0);
  return bytes;
}

Bytes Rewritten(Status (*rewrite)(std::span<const uint8_t>, const MetadataBlocks&, FilePieces&,
                                  std::string&),
                const Bytes& file, std::string_view xmp, Status expected = Status::Ok) {
  FilePieces made;
  std::string reason;
  MetadataBlocks blocks;
  blocks.xmp = Text(xmp);
  EXPECT_EQ(rewrite(file, blocks, made, reason), expected) << reason;
  return expected == Status::Ok ? made.Joined() : Bytes();
}

TEST(GifMetadata, OnlyTheXmpBlockChanges) {
  const Bytes v87 = Joined({Text("GIF87a"), kScreen, kFrame, kTrailer});
  const Bytes with87 = Joined({Text("GIF89a"), kScreen, GifXmp("<x/>"), kFrame, kTrailer});
  EXPECT_EQ(Rewritten(RewriteGif, v87, "<x/>"), with87) << "extensions are of the newer version";
  EXPECT_EQ(Rewritten(RewriteGif, v87, ""), v87);
  const Bytes comment = Hex("21FE 02 6869 00");
  const auto file = [&](const Bytes& xmp) {
    return Joined({Text("GIF89a"), kScreen, kLoop, xmp, kTiming, kFrame, comment, kTiming, kFrame,
                   kTrailer, Text("behind")});
  };
  EXPECT_EQ(Rewritten(RewriteGif, file({}), "<one/>"), file(GifXmp("<one/>"))) << "after the loop";
  EXPECT_EQ(Rewritten(RewriteGif, file(GifXmp("<one/>")), "<longer/>"), file(GifXmp("<longer/>")));
  EXPECT_EQ(Rewritten(RewriteGif, file(GifXmp("<one/>")), ""), file({}));
  MetadataViews views;
  const Bytes viewed = file(GifXmp("<one/>"));
  ASSERT_EQ(FindGifMetadata(viewed, views), Status::Ok);
  EXPECT_EQ(Bytes(views.xmp.begin(), views.xmp.end()), Text("<one/>"));
  // a packet stored in parts, or cut, is left alone
  const Bytes parts = Joined({Hex("21FF0B"), Text("XMP DataXMP"), Hex("04 3C782F3E 00")});
  Rewritten(RewriteGif, file(parts), "<x/>", Status::UnsuitableImage);
  Rewritten(RewriteGif, v87, std::string_view("<\0>", 3), Status::UnsuitableImage);
  const Bytes whole =
      Joined({Text("GIF89a"), kScreen, GifXmp("<one/>"), kTiming, kFrame, kTrailer});
  for (size_t size = 0; size < whole.size(); ++size) {
    FilePieces made;
    std::string reason;
    const MetadataBlocks blocks{.xmp = Text("<x/>")};
    EXPECT_NE(RewriteGif(std::span(whole).first(size), blocks, made, reason), Status::Ok) << size;
  }
}

Bytes Stripped(const Bytes& file, uint32_t kept) {
  FilePieces made;
  std::string reason;
  EXPECT_EQ(StripPicture(file, kept, made, reason), Status::Ok) << reason;
  return made.Joined();
}

std::vector<std::string> Left(const Bytes& file) {
  std::vector<std::string> names;
  for (const char* name : MetadataLeft(file)) names.emplace_back(name);
  return names;
}

TEST(GifMetadata, StripKeepsThePicture) {
  const Bytes profile = Joined({Hex("21FF0B"), Text("ICCRGBG1012"), Hex("02 6963 00")});
  const Bytes other = Joined({Hex("21FF0B"), Text("MGKIPTC0000"), Hex("02 6970 00")});
  const Bytes comment = Hex("21FE 02 6869 00"), drawn = Hex("2101 01 78 00");
  const Bytes file = Joined({Text("GIF89a"), kScreen, kLoop, profile, other, GifXmp("<one/>"),
                             comment, kTiming, kFrame, kTiming, drawn, kTrailer, Text("behind")});
  const auto made = [&](const Bytes& before, const Bytes& after) {
    return Joined(
        {Text("GIF89a"), kScreen, kLoop, before, after, kTiming, kFrame, kTiming, drawn, kTrailer});
  };
  EXPECT_EQ(Left(file),
            (std::vector<std::string>{"color profile", "other data", "XMP", "comments"}));
  EXPECT_EQ(Stripped(file, 0), made({}, {}));
  EXPECT_TRUE(Left(made({}, {})).empty());
  EXPECT_EQ(Left(Joined({made({}, {}), Text("behind")})), std::vector<std::string>{"other data"});
  EXPECT_EQ(Stripped(file, kKeepUsually), made(profile, {}));
  EXPECT_EQ(Stripped(file, kKeepComments), made({}, comment));
  EXPECT_EQ(Stripped(file, kKeepXmp), made(GifXmp("<one/>"), {}));
}

// --- Photoshop ---

Bytes Resource(uint16_t number, std::string_view data, std::string_view name = {}) {
  Bytes bytes = Text("8BIM");
  const auto put = [&](uint64_t value, int count) {
    for (int i = count - 1; i >= 0; --i) bytes.push_back(static_cast<uint8_t>(value >> 8 * i));
  };
  put(number, 2);
  put(name.size(), 1);
  bytes.insert(bytes.end(), name.begin(), name.end());
  if (name.size() % 2 == 0) put(0, 1);
  put(data.size(), 4);
  bytes.insert(bytes.end(), data.begin(), data.end());
  if (data.size() % 2 != 0) put(0, 1);
  return bytes;
}

// Two pixels of gray, with color mode data of an odd size.
Bytes Psd(const Bytes& resources) {
  const auto size = static_cast<uint8_t>(resources.size());
  const Bytes head =
      Hex("38425053 0001 000000000000 0001 00000001 00000002 0008 0001  00000001 AA");
  return Joined({head,
                 {0, 0, static_cast<uint8_t>(resources.size() >> 8), size},
                 resources,
                 Hex("00000000 0000 40C0")});
}

TEST(PsdMetadata, OnlyTheXmpResourceChanges) {
  const Bytes resolution = Resource(1005, "0123456789abcdef"),
              caption = Resource(1008, "odd", "nm");
  const Bytes plain = Psd(Joined({resolution, caption}));
  const Bytes with = Psd(Joined({resolution, caption, Resource(1060, "<x/>")}));
  EXPECT_EQ(Rewritten(RewritePsd, plain, "<x/>"), with);
  EXPECT_EQ(Rewritten(RewritePsd, with, ""), plain);
  EXPECT_EQ(Rewritten(RewritePsd, plain, ""), plain);
  const auto named = [&](std::string_view packet) {
    return Psd(Joined({Resource(1060, packet, "mine"), resolution}));
  };
  EXPECT_EQ(Rewritten(RewritePsd, named("<x/>"), "<odd/>"), named("<odd/>")) << "where it was";
  EXPECT_EQ(Rewritten(RewritePsd, Psd({}), "<x/>"), Psd(Resource(1060, "<x/>")));
  // the last resource may lack its padding, and zeros may follow
  Bytes unpadded = Resource(1008, "odd");
  unpadded.pop_back();
  EXPECT_EQ(Rewritten(RewritePsd, Psd(unpadded), "<x/>"),
            Psd(Joined({Resource(1008, "odd"), Resource(1060, "<x/>")})));
  EXPECT_EQ(Rewritten(RewritePsd, Psd(Joined({resolution, Hex("0000")})), "<x/>"),
            Psd(Joined({resolution, Resource(1060, "<x/>")})));
  Rewritten(RewritePsd, Psd(Joined({resolution, Text("garbage")})), "<x/>", Status::DamagedFile);
  for (size_t size = 0; size < with.size() - 8; ++size) {
    FilePieces made;
    std::string reason;
    const MetadataBlocks blocks{.xmp = Text("<x/>")};
    EXPECT_NE(RewritePsd(std::span(with).first(size), blocks, made, reason), Status::Ok) << size;
  }
}

TEST(PsdMetadata, StripKeepsThePicture) {
  const Bytes kept = Joined({Resource(1005, "0123456789abcdef"), Resource(1057, "version"),
                             Resource(2000, "path")}),
              profile = Resource(1039, "icc"), xmp = Resource(1060, "<one/>"),
              iptc = Joined({Resource(1028, "iptc"), Resource(1061, "0123456789abcdef")});
  const Bytes file =
      Psd(Joined({kept, profile, iptc, Resource(1036, "thumbnail"), Resource(1035, "address"),
                  Resource(1086, "/home/me/a.psd"), xmp}));
  EXPECT_EQ(Left(file), (std::vector<std::string>{"color profile", "IPTC or Photoshop data",
                                                  "thumbnail", "other data", "XMP"}));
  EXPECT_EQ(Stripped(file, 0), Psd(kept));
  EXPECT_TRUE(Left(Psd(kept)).empty());
  EXPECT_EQ(Stripped(file, kKeepUsually), Psd(Joined({kept, profile})));
  EXPECT_EQ(Stripped(file, kKeepIptc), Psd(Joined({kept, iptc})));
  EXPECT_EQ(Stripped(file, kKeepXmp), Psd(Joined({kept, xmp})));
}

TEST(PsdMetadata, IptcAndExifFollowTheTags) {
  // the keyword "old", and a dataset that ends in zeros
  const Bytes iptc = Hex("1C0219 0003 6F6C64  1C02C8 0002 0100");
  const Bytes exif = Hex("4D4D002A00000008 0001 4746 0003 00000001 00010000 00000000");  // one star
  const auto text = [](const Bytes& bytes) { return std::string(bytes.begin(), bytes.end()); };
  const Bytes file = Psd(Joined({Resource(1028, text(iptc)), Resource(1058, text(exif))}));
  FilePieces made;
  std::string reason;
  bool changed = false;
  const TagChanges changes{.addedKeywords = {"new"}, .rating = 3};
  ASSERT_EQ(EditPictureTags(file, changes, made, changed, reason), Status::Ok) << reason;
  const Bytes bytes = made.Joined();
  FilePieces again;
  EXPECT_EQ(EditPictureTags(bytes, changes, again, changed, reason), Status::Ok);
  EXPECT_FALSE(changed);
  const PictureTags tags = TagsOfFile(bytes);
  EXPECT_EQ(tags.keywords, (std::vector<std::string>{"old", "new"}));
  EXPECT_EQ(tags.rating, 3);
  EXPECT_NE(text(bytes).find(text(Hex("1C0219 0003 6E6577"))), std::string::npos) << "IPTC";
  EXPECT_NE(text(bytes).find(text(Hex("4746 0003 00000001 00030000"))), std::string::npos)
      << "EXIF";
}

}  // namespace
}  // namespace fotomill::test
