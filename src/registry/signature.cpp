#include "registry/signature.h"

#include "platform/file_view.h"

namespace fotomill {

namespace {

using namespace std::string_view_literals;

// A second text that must stand further on, where the first alone says too little; the files' containers have one.
struct SignatureRow {
  size_t offset;
  std::string_view bytes;
  size_t secondOffset;
  std::string_view second;
  Signature signature;
};

// The first row that fits wins: brands before their container, long signatures before those of two bytes, which other
// files may begin with by chance.
// clang-format off
constexpr SignatureRow kSignatures[] = {
    {0, "\x89PNG\r\n\x1a\n"sv,            0, ""sv,     {"PNG", "PNG"}},
    {0, "\xff\xd8\xff"sv,                 0, ""sv,     {"JPEG", "JPG JFI JFIF JPE JPEG PIC KQP"}},
    {0, "GIF87a"sv,                       0, ""sv,     {"GIF", "GIF"}},
    {0, "GIF89a"sv,                       0, ""sv,     {"GIF", "GIF"}},
    {0, "RIFF"sv,                         8, "WEBP"sv, {"WebP", "WEBP"}},
    {0, "RIFF"sv,                         8, "AVI "sv, {"AVI", "AVI"}},
    {0, "RIFF"sv,                         8, "WAVE"sv, {"WAV", "WAV"}},
    {0, "RIFF"sv,                         8, "ACON"sv, {"an animated cursor", "ANI"}},
    {0, "RIFF"sv,                         8, "CDR"sv,  {"CorelDRAW", "CDR"}},
    {4, "ftyp"sv,                         8, "avif"sv, {"AVIF", ""}},
    {4, "ftyp"sv,                         8, "avis"sv, {"AVIF", ""}},
    {4, "ftyp"sv,                         8, "heic"sv, {"HEIC", ""}},
    {4, "ftyp"sv,                         8, "heix"sv, {"HEIC", ""}},
    {4, "ftyp"sv,                         8, "hevc"sv, {"HEIC", ""}},
    {4, "ftyp"sv,                         8, "mif1"sv, {"HEIF", ""}},
    {4, "ftyp"sv,                         8, "msf1"sv, {"HEIF", ""}},
    {4, "ftyp"sv,                         8, "crx "sv, {"Canon CR3", ""}},
    {4, "ftyp"sv,                         8, "qt  "sv, {"QuickTime", "MOV"}},
    {4, "ftyp"sv,                         0, ""sv,     {"MP4", "MP4 M4V MOV MPEG MPG"}},
    {4, "moov"sv,                         0, ""sv,     {"QuickTime", "MOV"}},
    {4, "mdat"sv,                         0, ""sv,     {"QuickTime", "MOV"}},
    {0, "\0\0\0\x0cJXL \r\n\x87\n"sv,     0, ""sv,     {"JPEG XL", ""}},
    {0, "\0\0\0\x0cjP  \r\n\x87\n"sv,     0, ""sv,     {"JPEG 2000", ""}},
    {0, "\xff\x4f\xff\x51"sv,             0, ""sv,     {"JPEG 2000", ""}},
    {0, "II\xbc\x01"sv,                   0, ""sv,     {"JPEG XR", "HDP WDP"}},
    {0, "II\x2a\0"sv,                     8, "CR"sv,   {"Canon CR2", ""}},
    {0, "II\x2a\0"sv,                     0, ""sv,     {"TIFF", "TIF KDC"}},
    {0, "MM\0\x2a"sv,                     0, ""sv,     {"TIFF", "TIF KDC"}},
    {0, "II\x2b\0"sv,                     0, ""sv,     {"TIFF", "TIF"}},
    {0, "MM\0\x2b"sv,                     0, ""sv,     {"TIFF", "TIF"}},
    {0, "8BPS\0\1"sv,                     0, ""sv,     {"Photoshop", "PSD PDD"}},
    {0, "8BPS\0\2"sv,                     0, ""sv,     {"Photoshop PSB", ""}},
    {0, "Paint Shop Pro Image File"sv,    0, ""sv,     {"Paint Shop Pro", "PSP"}},
    {0, "gimp xcf"sv,                     0, ""sv,     {"GIMP XCF", ""}},
    {0, "SIMPLE  ="sv,                    0, ""sv,     {"FITS", "FIT FTS"}},
    {0, "FORM"sv,                         8, "ILBM"sv, {"IFF", "IFF LBM HAM"}},
    {0, "FORM"sv,                         8, "PBM "sv, {"IFF", "IFF LBM HAM"}},
    {0, "FORM"sv,                         8, "ANIM"sv, {"IFF animation", ""}},
    {0, "qoif"sv,                         0, ""sv,     {"QOI", ""}},
    {0, "FLIF"sv,                         0, ""sv,     {"FLIF", ""}},
    {0, "icns"sv,                         0, ""sv,     {"an Apple icon", ""}},
    {0, "DDS "sv,                         0, ""sv,     {"DDS", ""}},
    {0, "\x76\x2f\x31\x01"sv,             0, ""sv,     {"OpenEXR", ""}},
    {0, "#?RADIANCE"sv,                   0, ""sv,     {"Radiance HDR", ""}},
    {0, "%PDF-"sv,                        0, ""sv,     {"PDF", ""}},
    {0, "%!PS"sv,                         0, ""sv,     {"PostScript", "EPS"}},
    {0, "\xc5\xd0\xd3\xc6"sv,             0, ""sv,     {"EPS", "EPS"}},
    {0, "\xd0\xcf\x11\xe0\xa1\xb1\x1a\xe1"sv, 0, ""sv, {"a compound file", "FPX"}},
    {0, "\x59\xa6\x6a\x95"sv,             0, ""sv,     {"Sun raster", "RAS"}},
    {0, "\xb1\x68\xde\x3a"sv,             0, ""sv,     {"DCX", "DCX"}},
    {0, "\xffWPC"sv,                      0, ""sv,     {"WordPerfect graphics", "WPG"}},
    {0, "\xd7\xcd\xc6\x9a"sv,             0, ""sv,     {"WMF", "WMF"}},
    {0, "\0\0\1\0"sv,                     0, ""sv,     {"an icon", "ICO CUR"}},
    {0, "\0\0\2\0"sv,                     0, ""sv,     {"a cursor", "CUR ICO"}},
    {4, "\x11\xaf"sv,                     0, ""sv,     {"FLIC", "FLI FLC"}},
    {4, "\x12\xaf"sv,                     0, ""sv,     {"FLIC", "FLC FLI"}},
    {0, "DanM"sv,                         0, ""sv,     {"Microsoft Paint", "MSP"}},
    {0, "LinS"sv,                         0, ""sv,     {"Microsoft Paint", "MSP"}},
    {0, "\x07\x20MM"sv,                   0, ""sv,     {"Casio CAM", "CAM"}},
    {0, "FIF\1"sv,                        0, ""sv,     {"FIF", "FIF"}},
    {0, "\x1a\x45\xdf\xa3"sv,             0, ""sv,     {"WebM or Matroska", ""}},
    {0, "\x30\x26\xb2\x75\x8e\x66\xcf\x11"sv, 0, ""sv, {"WMV", "WMV"}},
    {0, "\0\0\1\xba"sv,                   0, ""sv,     {"MPEG", "MPEG MPG"}},
    {0, "\0\0\1\xb3"sv,                   0, ""sv,     {"MPEG", "MPEG MPG"}},
    {0, "OggS"sv,                         0, ""sv,     {"Ogg", ""}},
    {0, "fLaC"sv,                         0, ""sv,     {"FLAC", ""}},
    {0, "ID3"sv,                          0, ""sv,     {"MP3", "MP3"}},
    {0, "MThd"sv,                         0, ""sv,     {"MIDI", "MID"}},
    {0, "FWS"sv,                          0, ""sv,     {"Flash", "SWF"}},
    {0, "CWS"sv,                          0, ""sv,     {"Flash", "SWF"}},
    {0, "PK\3\4"sv,                       0, ""sv,     {"ZIP", "ZIP CDR"}},
    {0, "Rar!\x1a\x07"sv,                 0, ""sv,     {"RAR", "RAR"}},
    {0, "7z\xbc\xaf\x27\x1c"sv,           0, ""sv,     {"7-Zip", ""}},
    {0, "\x1f\x8b\x08"sv,                 0, ""sv,     {"gzip", ""}},
    {0, "\0\1\0\0\0"sv,                   0, ""sv,     {"TrueType", "TTF OTF"}},
    {0, "OTTO"sv,                         0, ""sv,     {"OpenType", "OTF TTF"}},
    {0, "ttcf"sv,                         0, ""sv,     {"a TrueType collection", ""}},
    {0, "wOFF"sv,                         0, ""sv,     {"a web font", ""}},
    {0, "wOF2"sv,                         0, ""sv,     {"a web font", ""}},
    {0, "<svg"sv,                         0, ""sv,     {"SVG", ""}},
    {0, "<?xml"sv,                        0, ""sv,     {"XML", ""}},
    {0, "<!DOCTYPE html"sv,               0, ""sv,     {"HTML", ""}},
    {0, "<!doctype html"sv,               0, ""sv,     {"HTML", ""}},
    {0, "<html"sv,                        0, ""sv,     {"HTML", ""}},
    {0, "#define "sv,                     0, ""sv,     {"XBM", "XBM"}},
    {0, "/* XPM */"sv,                    0, ""sv,     {"XPM", ""}},
    {0, "begin "sv,                       0, ""sv,     {"UUE", "UUE"}},
    {0, "P1\n"sv,                         0, ""sv,     {"PBM", ""}},
    {0, "P2\n"sv,                         0, ""sv,     {"PGM", ""}},
    {0, "P3\n"sv,                         0, ""sv,     {"PPM", ""}},
    {0, "P4\n"sv,                         0, ""sv,     {"PBM", ""}},
    {0, "P5\n"sv,                         0, ""sv,     {"PGM", ""}},
    {0, "P6\n"sv,                         0, ""sv,     {"PPM", ""}},
    {0, "P7\n"sv,                         0, ""sv,     {"PAM", ""}},
    {0, "\xff\x0a"sv,                     0, ""sv,     {"JPEG XL", ""}},
    {0, "BA"sv,                          14, "BM"sv,   {"an OS/2 bitmap array", "BGA BMP DIB"}},
    {0, "BM"sv,                           6, "\0\0\0\0"sv, {"BMP", "BMP DIB RLE BGA PIC KQP"}},
    {0, "MZ"sv,                           0, ""sv,     {"a program", "EXE SCR"}},
    {0, "\x01\xda"sv,                     0, ""sv,     {"SGI", "SGI RGB"}},
    {0, "\x0a\5\1"sv,                     0, ""sv,     {"PCX", "PCX"}},
    {0, "\x34\x12"sv,                     0, ""sv,     {"Pictor", "PIC"}},
};
// clang-format on

bool StandsAt(std::span<const uint8_t> head, size_t offset, std::string_view text) {
  if (offset + text.size() > head.size()) return false;
  for (size_t i = 0; i < text.size(); ++i) {
    if (head[offset + i] != static_cast<uint8_t>(text[i])) return false;
  }
  return true;
}

}  // namespace

Signature IdentifySignature(std::span<const uint8_t> head) {
  for (const SignatureRow& row : kSignatures) {
    if (StandsAt(head, row.offset, row.bytes) && StandsAt(head, row.secondOffset, row.second)) return row.signature;
  }
  return {};
}

Signature IdentifyFile(const std::string& fileName) {
  platform::FileView file;
  if (!file.OpenHead(fileName.c_str(), kSignatureBytes)) return {};
  return IdentifySignature(file.Bytes());
}

}  // namespace fotomill
