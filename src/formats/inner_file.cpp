#include "formats/inner_file.h"

#include <algorithm>
#include <functional>
#include <string_view>
#include <utility>
#include <vector>

#include "core/text.h"
#include "formats/rows.h"
#include "platform/file_view.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr size_t kShortExtension = 3;  // longer extensions match by their first three characters

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

// The row for an extension without dot: an exact match, else one with the same first three
// characters. Null if not found.
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

// A row accepts the file if its `info` succeeds.
bool Takes(const FormatEntry& row, const ReadRequest& request) {
  const PicturePointer picture = NewPictureRecord();
  return IsInnerRow(row) && picture != nullptr && row.info(*picture, request) == Status::Ok;
}

// The row that accepts the file, trying the longest matching signature first. Null if there is
// none.
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

}  // namespace

const FormatEntry* InnerRowOfName(std::string_view name) {
  return RowOfExtension(platform::ExtensionOf(name));
}

bool IsWrapper(const FormatEntry& row) {
  return row.extension.view() == "UUE" || (row.flags & FMT_ARCHIVE) != 0;
}

bool IsInnerRow(const FormatEntry& row) {
  return row.canRead && !IsWrapper(row) && (row.present == nullptr || row.present());
}

Status CreateInnerFile(const ReadRequest& request, InnerFile& inner) {
  const FormatEntry* const named = InnerRowOfName(inner.name);
  if (named != nullptr && IsWrapper(*named)) return Status::UnsupportedFormat;
  // Some codecs select variants by extension, so use the row's extension.
  std::string ending(named == nullptr ? "" : ".");
  if (named != nullptr) ending += LowerCase(named->extension.view());
  if (!inner.file.Create(ending)) return Status::ErrorCreatingFile;
  inner.request = request;
  inner.request.fileName = inner.file.Path();
  inner.row = named;
  return Status::Ok;
}

Status FindInnerRow(InnerFile& inner) {
  if (inner.row == nullptr || !Takes(*inner.row, inner.request)) {
    platform::FileView file;
    if (!file.Open(inner.request.fileName)) return Status::FileOpenError;
    const FormatEntry* const meant = RowOfContents(file.Bytes(), inner.request);
    if (meant != nullptr) inner.row = meant;
  }
  return inner.row != nullptr && IsInnerRow(*inner.row) ? Status::Ok : Status::UnsupportedFormat;
}

}  // namespace fotomill
