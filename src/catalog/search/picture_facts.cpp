#include "catalog/search/picture_facts.h"

#include "core/text.h"
#include "metadata/exif/picture_exif.h"
#include "processing/faces/face_finder.h"
#include "registry/registry.h"
#include "registry/verify_picture.h"

namespace fotomill {

namespace {

// Whether a status says that the file itself is at fault, so that reading it again is of no use.
bool IsDamage(Status status) {
  return status == Status::DamagedFile || status == Status::FileReadError;
}

Status ReadTags(const std::string& path, const FactsOptions& options, PictureFacts& facts) {
  return ReadPictureTags(path, options.tags, facts.tags);
}

Status ReadHeader(const std::string& path, const FactsOptions& options, PictureFacts& facts) {
  PicturePointer picture;
  facts.header =
      LoadPictureInfo({.fileName = path, .stop = options.stop, .options = options.read}, picture);
  if (IsDamage(facts.header)) return Status::Ok;
  RETURN_IF_BAD(facts.header);
  facts.format = UpperCase(FormatRow(picture->formatIndex).extension.view());
  facts.width = picture->width;
  facts.height = picture->height;
  return Status::Ok;
}

Status CountFaces(const std::string& path, const FactsOptions& options, PictureFacts& facts) {
  facts.faces = 0;
  facts.faceKey = FaceKeyOf(options.faces);
  PicturePointer picture;
  Status status =
      LoadPicture({.fileName = path, .stop = options.stop, .options = options.read}, picture);
  if (IsDamage(status)) return Status::Ok;
  std::vector<Rectangle> faces;
  if (status == Status::Ok) status = TurnUpright(*picture);
  if (status == Status::Ok) {
    status = FindFaces(picture->image, options.faces, faces,
                       [&options] { return !options.stop.Asked(); });
  }
  facts.faces = static_cast<int32_t>(faces.size());
  return status;
}

Status Verify(const std::string& path, const FactsOptions& options, PictureFacts& facts) {
  std::string hint, note;
  facts.decoded = VerifyPicture(path, options.read, hint, note, options.stop);
  return IsDamage(facts.decoded) ? Status::Ok : facts.decoded;
}

struct PartReader {
  uint32_t part;
  Status (*read)(const std::string& path, const FactsOptions& options, PictureFacts& facts);
};
constexpr PartReader kReaders[] = {
    {kFactsTags, ReadTags},
    {kFactsHeader, ReadHeader},
    {kFactsFaces, CountFaces},
    {kFactsDamage, Verify},
};

}  // namespace

uint32_t FaceKeyOf(const FaceOptions& options) {
  uint32_t key = 0x811c9dc5u;
  for (const char c : options.cascade + "/" + std::to_string(options.smallestPercent))
    key = (key ^ static_cast<uint8_t>(c)) * 0x01000193u;
  return key;
}

Status ReadPictureFacts(const std::string& path, uint32_t parts, const FactsOptions& options,
                        PictureFacts& facts) {
  for (const PartReader& reader : kReaders) {
    if ((parts & ~facts.parts & reader.part) == 0) continue;
    RETURN_IF_BAD(reader.read(path, options, facts));
    facts.parts |= reader.part;
  }
  return Status::Ok;
}

}  // namespace fotomill
