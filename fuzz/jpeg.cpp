#include "containers/jpeg_segments.h"
#include "files/turned_jpeg.h"
#include "support/codec_target.h"
#include "support/scratch_file.h"

namespace {

using namespace fotomill;

// A rotated file must have a valid JPEG header, and its EXIF, whatever it was, must
// be editable again.
void TurnFile(std::span<const uint8_t> file) {
  const uint8_t choice = file.empty() ? uint8_t{0} : file.back();
  std::vector<uint8_t> made;
  JpegTurnResult result;
  const JpegTurnRequest request{.turn = static_cast<Orientation>(1 + choice % 8),
                                .trim = (choice & 8) != 0};
  if (MakeTurnedJpeg(file, request, made, result) != Status::Ok || made.empty()) return;
  JpegHead head;
  fuzz::Require(ParseJpegHead(made, head) == Status::Ok);
}

}  // namespace

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  fotomill::fuzz::TryCodec("jpg", data, size);
  TurnFile({data, size});
  return 0;
}
