#include "metadata/xmp/xmp_tag_edit.h"

#include <gtest/gtest.h>

#include <string>

#include "metadata/xmp/xmp_names.h"
#include "metadata/xmp/xmp_tags.h"

namespace fotomill::test {
namespace {

std::span<const uint8_t> Bytes(const std::string& text) {
  return {reinterpret_cast<const uint8_t*>(text.data()), text.size()};
}

// A packet whose graph has this content.
std::string Packet(const std::string& content) {
  return "<x:xmpmeta xmlns:x='adobe:ns:meta/'><r:RDF "
         "xmlns:r='http://www.w3.org/1999/02/22-rdf-syntax-ns#'>" +
         content + "</r:RDF></x:xmpmeta>";
}
std::string Description(const std::string& attributes, const std::string& content) {
  return "<r:Description r:about='me' xmlns:d='http://purl.org/dc/elements/1.1/' "
         "xmlns:b='http://ns.adobe.com/xap/1.0/'" +
         attributes + (content.empty() ? "/>" : ">" + content + "</r:Description>");
}

const XmpChange kRating = {xmp::kBasic, "xmp", "Rating", XmpForm::Text, {"4"}};
const XmpChange kNoRating = {xmp::kBasic, "xmp", "Rating"};
const XmpChange kText = {xmp::kDublinCore, "dc", "description", XmpForm::Languages, {"a<b"}};
const XmpChange kWords = {xmp::kDublinCore, "dc", "subject", XmpForm::Bag, {"x", "\"y\" & z"}};
const XmpChange kCopy = {xmp::kDigiKam, "digiKam", "TagsList", XmpForm::Seq, {"x"}, false};

std::string Edited(const std::string& packet, const XmpChange& change) {
  std::vector<uint8_t> made;
  if (EditXmp(Bytes(packet), {&change, 1}, made) != Status::Ok) return "refused";
  return {made.begin(), made.end()};
}

TEST(XmpTagEdit, ChangesOnlyTheProperty) {
  const std::string bag =
      "\n    <r:Bag>\n     <r:li>x</r:li>\n     <r:li>&quot;y&quot; &amp; z</r:li>"
      "\n    </r:Bag>\n   ";
  const std::string added =
      "\n  <r:Description r:about=\"me\"\n    xmlns:xmp=\"http://ns.adobe.com/"
      "xap/1.0/\">\n   <xmp:Rating>4</xmp:Rating>\n  </r:Description>";
  const struct {
    const char* name;
    std::string before;
    const XmpChange& change;
    std::string after;
  } rows[] = {
      {"attribute", Description(" b:Rating='1' b:Label = \"L\"", ""), kRating,
       Description(" b:Rating='4' b:Label = \"L\"", "")},
      {"element", Description("", "<b:Rating >1</b:Rating><!-- <b:Rating>9 -->"), kRating,
       Description("", "<b:Rating>4</b:Rating><!-- <b:Rating>9 -->")},
      {"its own prefix", Description("", "<z:Rating xmlns:z='http://ns.adobe.com/xap/1.0/'/>"),
       kRating, Description("", "<z:Rating xmlns:z='http://ns.adobe.com/xap/1.0/'>4</z:Rating>")},
      {"a second one goes", Description(" b:Rating='1'", "<b:Rating>2</b:Rating><d:x/>"), kRating,
       Description(" b:Rating='4'", "<d:x/>")},
      {"other namespace", Description(" d:Rating='1'", ""), kRating,
       Description(" d:Rating='1'", "") + added},
      {"removed", Description("\n b:Rating='1' b:Label='L'", "\n <d:x/>"), kNoRating,
       Description(" b:Label='L'", "\n <d:x/>")},
      {"removed with what was around it",
       Description("", "<d:x/>") + " " + Description("", " <b:Rating>1</b:Rating> "), kNoRating,
       Description("", "<d:x/>")},
      {"nothing to remove", Description("", "<d:x/>"), kNoRating, Description("", "<d:x/>")},
      {"list", Description("", "<d:subject><r:Bag><r:li>old</r:li></r:Bag></d:subject>"), kWords,
       Description("", "<d:subject>" + bag + "</d:subject>")},
      {"default language",
       Description("",
                   "<d:description><r:Alt><r:li xml:lang='de'>B</r:li>"
                   "<r:li xml:lang='x-default'>A</r:li></r:Alt></d:description>"),
       kText,
       Description("",
                   "<d:description><r:Alt><r:li xml:lang='de'>B</r:li>"
                   "<r:li xml:lang='x-default'>a&lt;b</r:li></r:Alt></d:description>")},
      {"other languages",
       Description("",
                   "<d:description><r:Alt><r:li xml:lang='de'>B</r:li></r:Alt></d:description>"),
       kText,
       Description("",
                   "<d:description><r:Alt>\n     <r:li xml:lang=\"x-default\">a&lt;b</r:li>"
                   "<r:li xml:lang='de'>B</r:li></r:Alt></d:description>")},
      {"no language",
       Description("", "<d:description><r:Alt><r:li>B</r:li></r:Alt></d:description>"), kText,
       Description("",
                   "<d:description>\n    <r:Alt>\n     <r:li xml:lang=\"x-default\">a&lt;b</r:li>"
                   "\n    </r:Alt>\n   </d:description>")},
      {"copy that is not there", Description("", "<d:x/>"), kCopy, Description("", "<d:x/>")},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    EXPECT_EQ(Edited(Packet(row.before), row.change), Packet(row.after));
  }
}

TEST(XmpTagEdit, KeepsTheSizeOfPaddedPackets) {
  const std::string end = "<?xpacket end='w'?>", packet = Packet(Description("", "<d:x/>"));
  for (const size_t padding : {1000, 30, 0}) {
    const std::string before = packet + std::string(padding, ' ') + end;
    const std::string after = Edited(before, kRating);
    EXPECT_EQ(after.size() == before.size(), padding == 1000) << padding;
    EXPECT_TRUE(after.ends_with(end));
    if (padding == 1000) {
      EXPECT_EQ(Edited(after, kNoRating).size(), before.size());
    }
  }
}

// Repetitions that take minutes if work grows with the square of their number.
TEST(XmpTagEdit, IsLinearInLargePackets) {
  std::string many, deep;
  for (int i = 0; i < 50000; ++i) many += Description("", "<b:Rating>1</b:Rating>");
  for (int i = 0; i < 100000; ++i) deep += "<r:RDF>";
  EXPECT_EQ(Edited(Packet(many), kRating), Packet(Description("", "<b:Rating>4</b:Rating>")));
  for (int i = 0; i < 100000; ++i) deep += "</r:RDF>";
  EXPECT_EQ(Edited(Packet(Description("", "<d:subject>" + deep + "</d:subject>")), kRating),
            "refused");
}

TEST(XmpTagEdit, RefusesWhatItDoesNotUnderstand) {
  for (const std::string& packet :
       {std::string("<x"), std::string("<a/>"), Packet("") + Packet(""), std::string("\xFF\xFE<"),
        Packet(Description("", "<d:subject r:nodeID='a'/>")), "<!DOCTYPE x []>" + Packet(""),
        Packet("<r:RDF/>"), "<a>" + Packet("") + "</a>", Packet("<x xmlns:y='a&amp;b'/>"),
        std::string("<RDF xmlns='http://www.w3.org/1999/02/22-rdf-syntax-ns#'/>")})
    EXPECT_EQ(Edited(packet, kRating), "refused") << packet;
  const XmpChange bad = {xmp::kBasic, "xmp", "Label", XmpForm::Text, {"\xFF"}};
  EXPECT_EQ(Edited(Packet(""), bad), "refused");
}

TEST(XmpTagEdit, StartsPacketsThatCanBeRead) {
  const XmpChange changes[] = {kRating, kText, kWords};
  std::vector<uint8_t> made, again;
  ASSERT_EQ(EditXmp({}, changes, made), Status::Ok);
  XmpTags tags;
  ASSERT_EQ(ReadXmpTags(made, tags), Status::Ok);
  EXPECT_EQ(tags.rating, "4");
  EXPECT_EQ(tags.description, "a<b");
  EXPECT_EQ(tags.keywords, kWords.values);
  ASSERT_EQ(EditXmp(made, changes, again), Status::Ok);
  EXPECT_EQ(again, made);
  // an empty graph without an end tag
  std::string alone = Packet("");
  alone.replace(alone.find("></r:RDF>"), 9, "/>");
  EXPECT_NE(Edited(alone, kRating).find("<xmp:Rating>4</xmp:Rating>"), std::string::npos);
}

TEST(XmpTags, ReadsAllForms) {
  const std::string ext = "xmlns:e='http://iptc.org/std/Iptc4xmpExt/2008-02-29/'";
  const struct {
    std::string content;
    std::string XmpTags::*text;
    const char* value;
  } rows[] = {
      {Description(" b:Rating='3'", ""), &XmpTags::rating, "3"},
      {Description("",
                   "<d:title><r:Alt><r:li xml:lang='de'>B</r:li><r:li xml:lang='x-default'>A"
                   "</r:li></r:Alt></d:title>"),
       &XmpTags::title, "A"},
      {Description("", "<d:title><r:Alt><r:li xml:lang='de'>B</r:li></r:Alt></d:title>"),
       &XmpTags::title, "B"},
      {Description("",
                   "<b:Label r:parseType='Resource'><r:value>L</r:value><d:q>q</d:q></b:Label>"),
       &XmpTags::label, "L"},
      {Description("", "<b:Label><r:Description><r:value>L</r:value></r:Description></b:Label>"),
       &XmpTags::label, "L"},
      {Description(" " + ext,
                   "<e:LocationCreated><r:Bag><r:li r:parseType='Resource'>"
                   "<e:City>C</e:City></r:li></r:Bag></e:LocationCreated>"),
       &XmpTags::city, "C"},
      {Description(" " + ext,
                   "<e:LocationCreated><r:Bag><r:li><r:Description e:City='C'/></r:li>"
                   "</r:Bag></e:LocationCreated>"),
       &XmpTags::city, "C"},
      {Description(" " + ext,
                   "<e:LocationShown><r:Bag><r:li><r:Description e:City='C'/></r:li>"
                   "</r:Bag></e:LocationShown>"),
       &XmpTags::city, ""},
      {"<r:Description xmlns='http://ns.adobe.com/xap/1.0/'><Label>L</Label></r:Description>",
       &XmpTags::label, "L"},
      {"<r:Bag xmlns:b='http://ns.adobe.com/xap/1.0/' b:Label='L'/>", &XmpTags::label, ""},
  };
  for (const auto& row : rows) {
    XmpTags tags;
    EXPECT_EQ(ReadXmpTags(Bytes(Packet(row.content)), tags), Status::Ok) << row.content;
    EXPECT_EQ(tags.*row.text, row.value) << row.content;
  }
  const std::string deep = [] {
    std::string text;
    for (int i = 0; i < 100000; ++i) text += "<r:value>";
    return Packet("<r:Description xmlns:b='http://ns.adobe.com/xap/1.0/'><b:Label>") + text;
  }();
  XmpTags tags;
  EXPECT_EQ(ReadXmpTags(Bytes(deep), tags), Status::DamagedFile);
}

TEST(XmpTags, ReadsDates) {
  EXPECT_EQ(XmpDateNumber("2024-05-31T14:03:05.25+02:00"), 20240531140305);
  EXPECT_EQ(XmpDateNumber("2024-05-31T14:03+02:00"), 20240531140300);
  EXPECT_EQ(XmpDateNumber("2024:05:31 14:03:05"), 20240531140305);
  EXPECT_EQ(XmpDateNumber("2024-05"), 20240500000000);
  EXPECT_EQ(XmpDateNumber("soon"), 0);
}

}  // namespace
}  // namespace fotomill::test
