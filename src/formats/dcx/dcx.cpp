// DCX, a collection of PCX pictures, little-endian. Fax programs store one page in each.
//
//   offset size  field
//        0    4  signature 0x3ADE68B1
//        4  4 x n  file offsets of the pages, at most 1023, then 0
//        .       pages, each a PCX file
//
// A page ends where the next one in the file begins; pages are ordered as in the offset table. The
// writer reserves space for all offsets, as other programs do. Source: ZSoft Corporation, "PCX
// Technical Reference Manual", revision 5 (1991).
#include "formats/dcx/dcx.h"

#include <algorithm>
#include <memory>
#include <string>
#include <utility>
#include <vector>

#include "core/byte_reader.h"
#include "formats/pcx/pcx_page.h"
#include "platform/file_view.h"

namespace fotomill {

namespace {

constexpr uint32_t kSignature = 0x3ADE68B1;
constexpr size_t kMostPages = 1023;
constexpr uint64_t kDirectorySize = 4 + 4 * (kMostPages + 1);

// FileReadError if the signature is truncated, DamagedFile, NoImages for a
// collection without pages.
Status ReadDirectory(std::span<const uint8_t> head, std::vector<uint32_t>& pages) {
  ByteReader bytes(head);
  const uint32_t signature = bytes.Le32();
  if (!bytes.Ok()) return Status::FileReadError;
  if (signature != kSignature) return Status::DamagedFile;
  for (uint32_t offset = bytes.Le32(); offset != 0 && pages.size() < kMostPages;
       offset = bytes.Le32())
    pages.push_back(offset);
  return pages.empty() ? Status::NoImages : Status::Ok;
}

// Position of a page in the file. NoImages if it does not exist, FileReadError if it is beyond the
// end of the file.
Status FindPage(const platform::FileView& file, int32_t page, PictureRecord& picture,
                PcxPlace& place) {
  picture.typeName.Clear();
  picture.fileSize = file.FileSize();
  std::vector<uint32_t> pages;
  RETURN_IF_BAD(ReadDirectory(file.Bytes().first(std::min<size_t>(file.Bytes().size(), kDirectorySize)), pages));
  picture.pageCount = static_cast<int32_t>(pages.size());
  if (page < 0 || page >= picture.pageCount) return Status::NoImages;
  place = {pages[static_cast<size_t>(page)], file.FileSize()};
  for (const uint32_t other : pages) {
    if (other > place.begin) place.end = std::min<uint64_t>(place.end, other);
  }
  return place.begin < place.end ? Status::Ok : Status::FileReadError;
}

}  // namespace

Status DcxInfo(PictureRecord& picture, const ReadRequest& request) {
  platform::FileView file;
  if (!file.OpenHead(request.fileName.c_str(), kDirectorySize)) return Status::FileOpenError;
  PcxPlace place;
  RETURN_IF_BAD(FindPage(file, request.page, picture, place));
  return DescribePcx(file, place, picture);
}

Status DcxRead(PictureRecord& picture, const ReadRequest& request) {
  const ProgressScope progress(picture);
  picture.image.Free();
  picture.alpha.Free();
  platform::FileView file;
  if (!file.Open(request.fileName)) return Status::FileOpenError;
  PcxPlace place;
  RETURN_IF_BAD(FindPage(file, request.page, picture, place));
  return ReadPcx(file, place, request, picture);
}

namespace {

class DcxSequence final : public SequenceWriter {
 public:
  explicit DcxSequence(const WriteOptions& options) : options_(options) {}
  Status Create(const std::string& path) {
    if (!out_.Create(path)) return Status::ErrorCreatingFile;
    out_.Le32(kSignature);
    out_.Zeros(kDirectorySize - out_.Position());
    return Status::Ok;
  }

  Status Add(PictureRecord& picture, int32_t) override {
    if (picture.image.Empty()) return Status::EmptyImage;
    if (pages_ == kMostPages || out_.Position() > UINT32_MAX) return Status::UnsuitableImage;
    out_.PatchLe32(4 + 4 * pages_, static_cast<uint32_t>(out_.Position()));
    ++pages_;
    return WritePcx(out_, picture);
  }

  Status Finish() override { return CommitOutput(out_, options_); }

 private:
  const WriteOptions options_;
  ByteWriter out_;
  uint64_t pages_ = 0;
};

}  // namespace

Status DcxSequenceBegin(const std::string& path, const SequenceFacts&, const WriteOptions& options,
                        SequencePointer& sequence) {
  auto made = std::make_unique<DcxSequence>(options);
  RETURN_IF_BAD(made->Create(path));
  sequence = std::move(made);
  return Status::Ok;
}

Status DcxWrite(PictureRecord& picture, const WriteOptions& options) {
  const ProgressScope progress(picture);
  if (picture.image.Empty()) return Status::MemoryAllocationError;
  DcxSequence file(options);
  RETURN_IF_BAD(file.Create(picture.fileName.c_str()));
  RETURN_IF_BAD(file.Add(picture, 0));
  return file.Finish();
}

}  // namespace fotomill
