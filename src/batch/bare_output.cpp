#include "batch/bare_output.h"

#include <utility>

#include "files/turned_jpeg.h"
#include "metadata/exif/picture_exif.h"
#include "platform/file_view.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// Turns a JPEG file losslessly; `turned` is empty if that is not possible.
Status TurnUprightWithoutLoss(std::span<const uint8_t> file, std::vector<uint8_t>& turned) {
  JpegTurnResult result;
  RETURN_IF_BAD(MakeTurnedJpeg(file, {}, turned, result));
  if (result.method != JpegTurnMethod::Pixels) turned.clear();
  return Status::Ok;
}

}  // namespace

BareOutput MakeBareOutput(const PictureRecord& picture, bool upright) {
  const FormatEntry& row = FormatRow(picture.formatIndex);
  const bool turns = upright && OrientationOf(picture) != Orientation::Upright;
  // Keep the orientation tag if re-encoding would lose more.
  const bool keepsTag = row.bareKeepsOrientation && (picture.simplified || picture.pageCount > 1);
  BareOutput output;
  if (row.bare == nullptr || (turns && !row.turnsWithoutLoss && !keepsTag)) return output;
  platform::FileView file;
  const uint64_t held = picture.image.Bytes().size() + picture.alpha.Bytes().size();
  if (!file.Open(picture.fileName.c_str())) return output;
  if (CheckFileMemory(held + 2 * file.FileSize()) != Status::Ok) return output;
  std::vector<uint8_t> turned;
  if (turns && row.turnsWithoutLoss) {
    if (TurnUprightWithoutLoss(file.Bytes(), turned) != Status::Ok) return output;
    if (turned.empty()) {
      output.note = TrRecorded("It cannot be rotated losslessly, so it was re-encoded.");
      output.asSource = true;
      return output;
    }
  }
  const Status status = row.bare(turned.empty() ? file.Bytes() : turned, output.file);
  if (status != Status::Ok || !file.Intact()) {
    output.file.clear();
    output.asSource = true;
    output.note = TrRecorded("Its structure does not follow the format, so it was re-encoded.");
  }
  return output;
}

}  // namespace fotomill
