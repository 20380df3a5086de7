// Pictures of Casio's QV cameras (CAM), big-endian: a table, then the areas it lists.
//
//   offset size  field
//        0    4  magic number 07 20 4D 4D
//        4    2  number of areas, usually 3
//        6       for each area: its number (2 bytes), its length (4), unused (10)
//
// Area 1 is a comment and area 2 a thumbnail of 52 x 36, which is not used. The picture is in
// area 3, or in another one if that is a complete JPEG file. Area 3 of the first cameras:
//
//        0    2  number of the area
//        2    6  sizes of the luma data and of both chroma data, 2 bytes each
//        8  128  quantization tables for luma and chroma, in zigzag order
//      136       entropy-coded data of 480 x 240 pixels, one scan each; luma is sampled 3 x 2
//
// and of later ones with 640 x 480 pixels, sampled 2 x 2:
//
//        4    4  length of the data
//        8  128  quantization tables
//      136       entropy-coded data, one scan
//
// JPEG headers are omitted, as are the Huffman tables, which are those of T.81, K.3. Pixels of
// 480 x 240 pictures are not square; they are shown as stored.
// Sources: "QV-10 CAM Format" (1996, unofficial); K. Hayashi, J. Itoh, QVplay (1998); PRONOM
// fmt/1772.
#include "formats/casio/cam.h"

#include <algorithm>
#include <array>
#include <string>
#include <vector>

#include "core/byte_reader.h"
#include "formats/jpeg/jpeg.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr std::string_view kMagic("\x07\x20MM", 4);
constexpr uint16_t kMostAreas = 64;
constexpr uint16_t kComment = 1, kPicture = 3;
constexpr uint64_t kUsualHead = 54;  // header size with three areas
constexpr uint64_t kScans = 136, kQuantizer = 64;

struct CamFile {
  uint16_t areas = 0;
  std::string comment;
  std::span<const uint8_t> jpeg = {};  // a complete stream, in the file or in `built`
  std::vector<uint8_t> built;
  bool narrow = false;  // pixel aspect ratio 2:3
};

bool BeginsJpeg(std::span<const uint8_t> bytes) {
  return bytes.size() >= 3 && bytes[0] == 0xFF && bytes[1] == 0xD8 && bytes[2] == 0xFF;
}

// Assembles a JPEG stream.
class StreamBuilder {
 public:
  explicit StreamBuilder(std::vector<uint8_t>& out) : out_(out) { out_ = {0xFF, 0xD8}; }
  void Quantizers(std::span<const uint8_t> both) {
    for (uint8_t table = 0; table < 2; ++table) {
      Segment(0xDB, 1 + kQuantizer);
      out_.push_back(table);
      Append(both.subspan(table * kQuantizer, kQuantizer));
    }
  }
  void Frame(uint16_t width, uint16_t height, uint8_t lumaSampling) {
    Segment(0xC0, 15);
    for (const int byte : {8, height >> 8, height & 255, width >> 8, width & 255, 3, 1,
                           int{lumaSampling}, 0, 2, 0x11, 1, 3, 0x11, 1})
      out_.push_back(static_cast<uint8_t>(byte));
  }
  // A scan of components `first` to `last`, numbered from 1.
  void Scan(uint8_t first, uint8_t last, std::span<const uint8_t> data) {
    const auto count = static_cast<uint8_t>(last - first + 1);
    Segment(0xDA, 4 + 2 * size_t{count});
    out_.push_back(count);
    for (uint8_t component = first; component <= last; ++component) {
      out_.push_back(component);
      out_.push_back(component == 1 ? uint8_t{0x00} : uint8_t{0x11});
    }
    out_.insert(out_.end(), {0, 63, 0});
    Append(data);
  }
  void End() { out_.insert(out_.end(), {0xFF, 0xD9}); }

 private:
  void Segment(uint8_t marker, size_t length) {
    for (const size_t byte : {size_t{0xFF}, size_t{marker}, (length + 2) >> 8, (length + 2) & 255})
      out_.push_back(static_cast<uint8_t>(byte));
  }
  void Append(std::span<const uint8_t> bytes) {
    out_.insert(out_.end(), bytes.begin(), bytes.end());
  }

  std::vector<uint8_t>& out_;
};

// FileReadError if the data are truncated.
Status BuildPicture(std::span<const uint8_t> area, CamFile& cam) {
  ByteReader bytes(area);
  bytes.Skip(2);
  const std::array<uint16_t, 3> lengths = {bytes.Be16(), bytes.Be16(), bytes.Be16()};
  const auto quantizers = bytes.Take(2 * kQuantizer);
  if (!bytes.Ok()) return Status::FileReadError;
  StreamBuilder stream(cam.built);
  stream.Quantizers(quantizers);
  // the chroma of 480 x 240 pictures cannot be empty
  if (lengths[1] >= 8 && lengths[2] >= 8) {
    cam.narrow = true;
    stream.Frame(480, 240, 0x32);
    for (uint8_t i = 0; i < 3; ++i) {
      const auto component = static_cast<uint8_t>(i + 1);
      stream.Scan(component, component, bytes.Take(lengths[i]));
    }
  } else {
    stream.Frame(640, 480, 0x22);
    stream.Scan(1, 3, bytes.Take(uint64_t{lengths[1]} << 16 | lengths[2]));
  }
  stream.End();
  cam.jpeg = cam.built;
  return bytes.Ok() ? Status::Ok : Status::FileReadError;
}

std::string CommentOf(std::span<const uint8_t> area) {
  std::string text;
  for (const uint8_t byte : area) {
    if (byte < ' ' || byte > '~') break;
    text += static_cast<char>(byte);
  }
  return text;
}

Status ParseCam(std::span<const uint8_t> file, CamFile& cam) {
  ByteReader table(file);
  if (!table.Match(kMagic)) return Status::DamagedFile;
  cam.areas = table.Be16();
  if (!table.Ok()) return Status::FileReadError;
  if (cam.areas == 0 || cam.areas > kMostAreas) return Status::DamagedFile;
  ByteReader content(file);
  content.Seek(6 + 16 * uint64_t{cam.areas});
  std::span<const uint8_t> picture;
  bool cutShort = false;
  for (uint16_t i = 0; i < cam.areas && content.Ok() && cam.jpeg.empty(); ++i) {
    const uint16_t number = table.Be16();
    const uint32_t length = table.Be32();
    table.Skip(10);
    cutShort = cutShort || length > content.Left();
    const auto area = content.Take(std::min<uint64_t>(length, content.Left()));
    if (number == kComment) cam.comment = CommentOf(area);
    if (number == kPicture) picture = area;
    if (BeginsJpeg(area)) cam.jpeg = area;
  }
  if (cam.jpeg.empty() && file.size() > kUsualHead && BeginsJpeg(file.subspan(kUsualHead)))
    cam.jpeg = file.subspan(kUsualHead);
  if (!cam.jpeg.empty()) return Status::Ok;
  if (!content.Ok() || (cutShort && picture.empty())) return Status::FileReadError;
  return picture.empty() ? Status::NoImages : BuildPicture(picture, cam);
}

void NameCam(const CamFile& cam, PictureRecord& picture) {
  picture.typeName.AssignCut(cam.built.empty() ? "Casio QV, JPEG" : "Casio QV");
}

}  // namespace

Status CamInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  picture.fileSize = file.FileSize();
  CamFile cam;
  RETURN_IF_BAD(ParseCam(file.Bytes(), cam));
  RETURN_IF_BAD(JpegStreamInfo(picture, {cam.jpeg}));
  NameCam(cam, picture);
  return Status::Ok;
}

Status CamRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  CamFile cam;
  RETURN_IF_BAD(ParseCam(file.Bytes(), cam));
  RETURN_IF_BAD(JpegStreamRead(picture, request, {cam.jpeg}, file));
  NameCam(cam, picture);
  return Status::Ok;
}

Status CamDetails(PictureRecord& picture) {
  picture.detailLines.Clear();
  platform::FileView file;
  if (!file.Open(picture.fileName.c_str())) return Status::FileOpenError;
  CamFile cam;
  RETURN_IF_BAD(ParseCam(file.Bytes(), cam));
  picture.detailLines.AddFormat("        Areas: %u", unsigned{cam.areas});
  if (cam.narrow) picture.detailLines.Add(" Pixel aspect: 2:3");
  if (!cam.comment.empty()) picture.detailLines.Add("      Comment: " + cam.comment);
  return JpegStreamDetails(picture, {cam.jpeg});
}

}  // namespace fotomill
