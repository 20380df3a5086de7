#include "metadata/exif/taken_date.h"

#include "metadata/exif/exif_source.h"
#include "metadata/exif/exif_walk.h"
#include "metadata/exif/foreign_metadata.h"

namespace fotomill {

namespace {

class DateFinder : public ExifSink {
 public:
  int64_t number = 0;
  void Directory(int32_t, std::string_view) override {}
  void Line(const ExifLine& line) override {
    constexpr uint16_t kDateTimeOriginal = 0x9003;
    if (line.value.tag != kDateTimeOriginal) return;
    number = 0;
    for (const char c : line.text.substr(0, 19)) {
      if (c >= '0' && c <= '9') number = number * 10 + (c - '0');
    }
  }
};

}  // namespace

int64_t TakenDate(const std::string& path) {
  ExifSource exif;
  DateFinder date;
  const bool found = exif.Open(path.c_str()) == Status::Ok && WalkExif(exif.Block(), &date);
  ForeignMetadata foreign;
  if (!found && ReadForeignMetadata(path, foreign)) (void)WalkExif(foreign.exif, &date);
  return date.number;
}

}  // namespace fotomill
