// UUEncoded graphics (UUE); for the text format see uuencode.h. The embedded file is decoded to a
// temporary file, which is then read by its own row.
#include "formats/uuencode/uue.h"

#include <algorithm>
#include <functional>
#include <string>
#include <string_view>
#include <utility>
#include <vector>

#include "core/text.h"
#include "formats/gif/gif.h"
#include "formats/jpeg/jpeg.h"
#include "formats/rows.h"
#include "formats/uuencode/uuencode.h"
#include "platform/file_view.h"
#include "platform/paths.h"
#include "platform/temporary_file.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

constexpr size_t kShortExtension = 3;  // longer extensions match by their first characters

bool IsWrapper(const FormatEntry& row) {
  return row.info == UueInfo || (row.flags & FMT_ARCHIVE) != 0;
}

bool IsUsable(const FormatEntry& row) {
  return row.canRead && !IsWrapper(row) && (row.present == nullptr || row.present());
}

// Visits the rows of all families, in order.
template <typename Visit>
void ForEachRow(Visit visit) {
  for (const std::span<const FormatEntry> family : {
#define FAMILY(name) name##Rows(),
#include "formats/families.def"
#undef FAMILY
       }) {
    for (const FormatEntry& row : family) visit(row);
  }
}

// The row for an extension without its dot: an exact match, else one with the same first three
// characters. Null if there is none.
const FormatEntry* RowOfExtension(std::string_view extension) {
  const FormatEntry *exact = nullptr, *similar = nullptr;
  ForEachRow([&](const FormatEntry& row) {
    const std::string_view own = row.extension.view();
    if (exact == nullptr && EqualIgnoringCase(own, extension)) exact = &row;
    if (similar == nullptr && extension.size() > kShortExtension &&
        EqualIgnoringCase(own.substr(0, kShortExtension), extension.substr(0, kShortExtension)))
      similar = &row;
  });
  return exact != nullptr ? exact : similar;
}

bool Fits(const Signature& signature, std::span<const uint8_t> bytes) {
  const auto has = [&](size_t offset, std::string_view text) {
    return bytes.size() >= offset + text.size() &&
           std::equal(text.begin(), text.end(), bytes.begin() + static_cast<ptrdiff_t>(offset),
                      [](char a, uint8_t b) { return static_cast<uint8_t>(a) == b; });
  };
  return has(signature.offset, signature.bytes) && has(signature.secondOffset, signature.second);
}

// The decoded file, on disk for its row.
struct Unwrapped {
  std::string name;
  platform::TemporaryFile file;
  ReadRequest request;
  const FormatEntry* row = nullptr;
};

// A row accepts the file if its `info` succeeds.
bool Takes(const FormatEntry& row, const ReadRequest& request) {
  const PicturePointer picture = NewPictureRecord();
  return IsUsable(row) && picture != nullptr && row.info(*picture, request) == Status::Ok;
}

// The row that accepts the file, trying the longest matching signature first. Null if
// there is none.
const FormatEntry* RowOfContents(std::span<const uint8_t> bytes, const ReadRequest& request) {
  std::vector<std::pair<size_t, const FormatEntry*>> fitting;
  ForEachRow([&](const FormatEntry& row) {
    for (const Signature& signature : row.signatures) {
      if (Fits(signature, bytes))
        fitting.emplace_back(signature.bytes.size() + signature.second.size(), &row);
    }
  });
  std::ranges::stable_sort(fitting, std::greater(), [](const auto& pair) { return pair.first; });
  const auto found =
      std::ranges::find_if(fitting, [&](const auto& pair) { return Takes(*pair.second, request); });
  return found == fitting.end() ? nullptr : found->second;
}

Status Unwrap(const ReadRequest& request, uint64_t& fileSize, Unwrapped& inner) {
  platform::FileView text;
  if (!text.Open(request.fileName)) return Status::FileOpenError;
  fileSize = text.FileSize();
  UuencodedFile decoded;
  RETURN_IF_BAD(DecodeUuencoded(text.Bytes(), request.options.relaxedUuencode, decoded));
  if (!text.Intact()) return Status::FileReadError;
  inner.name = decoded.name;
  std::string_view extension = platform::ExtensionOf(inner.name);
  if (extension.starts_with('.')) extension.remove_prefix(1);
  const FormatEntry* const named = RowOfExtension(extension);
  if (named != nullptr && IsWrapper(*named)) return Status::UnsupportedFormat;
  // Some codecs select variants by extension, so the file gets its row's.
  std::string ending(named == nullptr ? "" : ".");
  if (named != nullptr) ending += LowerCase(named->extension.view());
  if (!inner.file.Create(ending) || !inner.file.Write(decoded.bytes))
    return Status::ErrorCreatingFile;
  inner.request = request;
  inner.request.fileName = inner.file.Path();
  inner.row = named;
  if (named == nullptr || !Takes(*named, inner.request)) {
    const FormatEntry* const meant = RowOfContents(decoded.bytes, inner.request);
    if (meant != nullptr) inner.row = meant;
  }
  return inner.row != nullptr && IsUsable(*inner.row) ? Status::Ok : Status::UnsupportedFormat;
}

void NameType(const Unwrapped& inner, PictureRecord& picture) {
  std::string type("UUEncoded ");
  picture.typeName.AssignCut(type.append(inner.name));
}

}  // namespace

Status UueInfo(PictureRecord& picture, const ReadRequest& request) {
  picture.typeName.Clear();
  Unwrapped inner;
  uint64_t fileSize = 0;
  RETURN_IF_BAD(Unwrap(request, fileSize, inner));
  RETURN_IF_BAD(inner.row->info(picture, inner.request));
  picture.fileSize = fileSize;
  NameType(inner, picture);
  return Status::Ok;
}

Status UueRead(PictureRecord& picture, const ReadRequest& request) {
  picture.image.Free();
  picture.alpha.Free();
  Unwrapped inner;
  uint64_t fileSize = 0;
  if (const Status status = Unwrap(request, fileSize, inner); status != Status::Ok) {
    const ProgressScope progress(picture);  // otherwise the inner row has one
    return status;
  }
  RETURN_IF_BAD(inner.row->read(picture, inner.request));
  NameType(inner, picture);
  return Status::Ok;
}

Status UueWrite(PictureRecord& picture, const WriteOptions& options) {
  const bool colors = picture.image.Bits() > 8;
  const std::string_view extension = colors ? ".jpg" : ".gif";
  platform::TemporaryFile file;
  if (picture.image.Empty() || !file.Create(extension)) {
    const ProgressScope progress(picture);  // otherwise the inner row has one
    return picture.image.Empty() ? Status::MemoryAllocationError : Status::ErrorCreatingFile;
  }
  const PathText destination = picture.fileName;
  WriteOptions inner = options;
  inner.existing = platform::Existing::Replace;
  inner.makeWay = {};
  picture.fileName.AssignCut(file.Path());
  const Status written = colors ? JpegWrite(picture, inner) : GifWrite(picture, inner);
  picture.fileName = destination;
  RETURN_IF_BAD(written);
  if (!colors) picture.lostMetadata = kAllMetadata;
  platform::FileView wrapped;
  if (!wrapped.Open(file.Path())) return Status::ErrorWritingFile;
  ByteWriter out;
  if (!out.Create(destination.c_str())) return Status::ErrorCreatingFile;
  std::string name(platform::SplitPath(destination.view()).base);
  EncodeUuencoded(wrapped.Bytes(), name.append(extension), out);
  if (!wrapped.Intact()) return Status::ErrorWritingFile;
  return CommitOutput(out, options);
}

}  // namespace fotomill
