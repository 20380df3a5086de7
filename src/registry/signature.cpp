#include "registry/signature.h"

#include <algorithm>

#include "platform/file_view.h"
#include "registry/registry.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

// A signature and the extensions of the rows or plug-ins for such files; none for files that are
// not pictures.
struct SignatureOfRow {
  std::string_view extension;
  Signature signature;
};

// Signatures of formats without a codec, and of files often mistaken for pictures.
// clang-format off
constexpr SignatureOfRow kWithoutCodec[] = {
    {"AVI",  {0, "RIFF"sv, "AVI", 8, "AVI "sv}},
    {"WAV",  {0, "RIFF"sv, "WAV", 8, "WAVE"sv}},
    {"CDR",  {0, "RIFF"sv, "CorelDRAW", 8, "CDR"sv}},
    {"AVIF", {4, "ftyp"sv, "AVIF", 8, "avif"sv}},
    {"AVIF", {4, "ftyp"sv, "AVIF", 8, "avis"sv}},
    {"HEIC", {4, "ftyp"sv, "HEIC", 8, "heic"sv}},
    {"HEIC", {4, "ftyp"sv, "HEIC", 8, "heix"sv}},
    {"HEIC", {4, "ftyp"sv, "HEIC", 8, "hevc"sv}},
    {"HEIF", {4, "ftyp"sv, "HEIF", 8, "mif1"sv}},
    {"HEIF", {4, "ftyp"sv, "HEIF", 8, "msf1"sv}},
    {"CR3",  {4, "ftyp"sv, "Canon CR3", 8, "crx "sv}},
    {"MOV",  {4, "ftyp"sv, "QuickTime", 8, "qt  "sv}},
    {"MP4",  {4, "ftyp"sv, "MP4"}},
    {"M4V",  {4, "ftyp"sv}},
    {"MOV",  {4, "ftyp"sv}},
    {"MPEG", {4, "ftyp"sv}},
    {"MPG",  {4, "ftyp"sv}},
    {"MOV",  {4, "moov"sv, "QuickTime"}},
    {"MOV",  {4, "mdat"sv, "QuickTime"}},
    {"JXL",  {0, "\0\0\0\x0cJXL \r\n\x87\n"sv, "JPEG XL"}},
    {"JP2",  {0, "\0\0\0\x0cjP  \r\n\x87\n"sv, "JPEG 2000"}},
    {"JP2",  {0, "\xff\x4f\xff\x51"sv, "JPEG 2000"}},
    {"CR2",  {0, "II\x2a\0"sv, "Canon CR2", 8, "CR"sv}},
    {"RAF",  {0, "FUJIFILMCCD-RAW "sv, "Fujifilm RAF"}},
    {"RW2",  {0, "IIU\0"sv, "Panasonic RW2"}},
    {"ORF",  {0, "IIRO"sv, "Olympus ORF"}},
    {"ORF",  {0, "IIRS"sv, "Olympus ORF"}},
    {"",     {0, "\x53\x80\xf6\x34"sv, "Softimage PIC", 88, "PICT"sv}},
    {"PSB",  {0, "8BPS\0\2"sv, "Photoshop PSB"}},
    {"XCF",  {0, "gimp xcf"sv, "GIMP XCF"}},
    {"",     {0, "FORM"sv, TrLater("IFF animation"), 8, "ANIM"sv}},
    {"QOI",  {0, "qoif"sv, "QOI"}},
    {"FLIF", {0, "FLIF"sv, "FLIF"}},
    {"ICNS", {0, "icns"sv, TrLater("an Apple icon")}},
    {"DDS",  {0, "DDS "sv, "DDS"}},
    {"EXR",  {0, "\x76\x2f\x31\x01"sv, "OpenEXR"}},
    {"HDR",  {0, "#?RADIANCE"sv, "Radiance HDR"}},
    {"HDR",  {0, "#?RGBE"sv, "Radiance HDR"}},
    {"PDF",  {0, "%PDF-"sv, "PDF"}},
    {"EPS",  {0, "%!PS"sv, "PostScript"}},
    {"EPS",  {0, "\xc5\xd0\xd3\xc6"sv, "EPS"}},
    {"WMF",  {0, "\xd7\xcd\xc6\x9a"sv, "WMF"}},
    {"FLI",  {4, "\x11\xaf"sv, "FLIC"}},
    {"FLC",  {4, "\x11\xaf"sv}},
    {"FLC",  {4, "\x12\xaf"sv, "FLIC"}},
    {"FLI",  {4, "\x12\xaf"sv}},
    {"FIF",  {0, "FIF\1"sv, "FIF"}},
    {"",     {0, "\x1a\x45\xdf\xa3"sv, TrLater("WebM or Matroska")}},
    {"WMV",  {0, "\x30\x26\xb2\x75\x8e\x66\xcf\x11"sv, "WMV"}},
    {"MPEG", {0, "\0\0\1\xba"sv, "MPEG"}},
    {"MPG",  {0, "\0\0\1\xba"sv}},
    {"MPEG", {0, "\0\0\1\xb3"sv, "MPEG"}},
    {"MPG",  {0, "\0\0\1\xb3"sv}},
    {"",     {0, "OggS"sv, "Ogg"}},
    {"",     {0, "fLaC"sv, "FLAC"}},
    {"MP3",  {0, "ID3"sv, "MP3"}},
    {"MID",  {0, "MThd"sv, "MIDI"}},
    {"SWF",  {0, "FWS"sv, "Flash"}},
    {"SWF",  {0, "CWS"sv, "Flash"}},
    {"ZIP",  {0, "PK\3\4"sv, "ZIP"}},
    {"CDR",  {0, "PK\3\4"sv}},
    {"RAR",  {0, "Rar!\x1a\x07"sv, "RAR"}},
    {"",     {0, "7z\xbc\xaf\x27\x1c"sv, "7-Zip"}},
    {"",     {0, "\x1f\x8b\x08"sv, "gzip"}},
    {"TTF",  {0, "\0\1\0\0\0"sv, "TrueType"}},
    {"OTF",  {0, "\0\1\0\0\0"sv}},
    {"OTF",  {0, "OTTO"sv, "OpenType"}},
    {"TTF",  {0, "OTTO"sv}},
    {"",     {0, "ttcf"sv, TrLater("a TrueType collection")}},
    {"",     {0, "wOFF"sv, TrLater("a web font")}},
    {"",     {0, "wOF2"sv, TrLater("a web font")}},
    {"SVG",  {0, "<svg"sv, "SVG"}},
    {"",     {0, "<?xml"sv, "XML"}},
    {"",     {0, "<!DOCTYPE html"sv, "HTML"}},
    {"",     {0, "<!doctype html"sv, "HTML"}},
    {"",     {0, "<html"sv, "HTML"}},
    {"XPM",  {0, "/* XPM */"sv, "XPM"}},
    {"PBM",  {0, "P1\n"sv, "PBM"}},
    {"PGM",  {0, "P2\n"sv, "PGM"}},
    {"PPM",  {0, "P3\n"sv, "PPM"}},
    {"PBM",  {0, "P4\n"sv, "PBM"}},
    {"PGM",  {0, "P5\n"sv, "PGM"}},
    {"PPM",  {0, "P6\n"sv, "PPM"}},
    {"PAM",  {0, "P7\n"sv, "PAM"}},
    {"JXL",  {0, "\xff\x0a"sv, "JPEG XL"}},
    {"EXE",  {0, "MZ"sv, TrLater("a program")}},
    {"SCR",  {0, "MZ"sv}},
    {"SGI",  {0, "\x01\xda"sv, "SGI"}},
    {"RGB",  {0, "\x01\xda"sv}},
};
// clang-format on

size_t Length(const Signature& signature) {
  return signature.bytes.size() + signature.second.size();
}

// Long signatures first, as short ones may match by chance; among equal ones, the format that
// provides the name comes first.
std::vector<SignatureOfRow> AllSignatures() {
  std::vector<SignatureOfRow> all;
  for (const std::span<const FormatEntry> family : FormatFamilies()) {
    for (const FormatEntry& row : family) {
      for (const Signature& signature : row.signatures) all.push_back({row.extension, signature});
    }
  }
  all.insert(all.end(), std::begin(kWithoutCodec), std::end(kWithoutCodec));
  std::ranges::stable_sort(all, [](const SignatureOfRow& a, const SignatureOfRow& b) {
    if (Length(a.signature) != Length(b.signature))
      return Length(a.signature) > Length(b.signature);
    return !a.signature.name.empty() && b.signature.name.empty();
  });
  return all;
}

bool StandsAt(std::span<const uint8_t> head, size_t offset, std::string_view text) {
  if (offset + text.size() > head.size()) return false;
  for (size_t i = 0; i < text.size(); ++i) {
    if (head[offset + i] != static_cast<uint8_t>(text[i])) return false;
  }
  return true;
}

bool Fits(std::span<const uint8_t> head, const Signature& signature) {
  return StandsAt(head, signature.offset, signature.bytes) &&
         StandsAt(head, signature.secondOffset, signature.second);
}

}  // namespace

bool FileKind::IsOf(std::string_view extension) const {
  return std::ranges::find(extensions, extension) != extensions.end();
}

FileKind IdentifySignature(std::span<const uint8_t> head) {
  static const std::vector<SignatureOfRow> all = AllSignatures();
  FileKind kind;
  size_t length = 0;
  for (const auto& [extension, signature] : all) {
    if (length > Length(signature)) break;
    if (!Fits(head, signature)) continue;
    if (length == 0) kind.name = signature.name;
    length = Length(signature);
    if (!extension.empty()) kind.extensions.push_back(extension);
  }
  return kind;
}

FileKind IdentifyFile(const std::string& fileName) {
  platform::FileView file;
  if (!file.OpenHead(fileName.c_str(), kSignatureBytes)) return {};
  return IdentifySignature(file.Bytes());
}

FileKind KindBehindName(const std::string& fileName, int32_t formatIndex) {
  FileKind kind = IdentifyFile(fileName);
  if (formatIndex == kNoFormat) return kind;
  const FormatEntry& row = FormatRow(formatIndex);
  // Targa files have no signature, and many start with the same bytes as an icon or a cursor.
  const bool chance = row.signatures.empty() && (kind.IsOf("CUR") || kind.IsOf("ICO"));
  return chance || kind.IsOf(row.extension) ? FileKind() : kind;
}

}  // namespace fotomill
