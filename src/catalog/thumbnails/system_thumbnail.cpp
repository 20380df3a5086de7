#include "catalog/thumbnails/system_thumbnail.h"

#include <algorithm>

#include "containers/png_chunks.h"
#include "core/byte_reader.h"
#include "core/md5.h"
#include "core/whole_number.h"
#include "formats/png/png.h"
#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"

namespace fotomill {

namespace {

constexpr std::string_view kUriKey = "Thumb::URI", kTimeKey = "Thumb::MTime";
constexpr std::string_view kAllowedMarks = "-_.!~*'():@&=+$,/";

// Folders of the cache, with the maximum side of their thumbnails.
struct CacheFolder {
  const char* name;
  int32_t side;
};
constexpr CacheFolder kLargeFolder = {"large", 256};
constexpr CacheFolder kCacheFolders[] = {
    {"normal", 128}, kLargeFolder, {"x-large", 512}, {"xx-large", 1024}};

std::string CachedFile(const CacheFolder& folder, std::string_view uri) {
  const std::string cache = platform::SpecialFolderPath(platform::SpecialFolder::Cache);
  if (cache.empty()) return {};
  const std::span bytes(reinterpret_cast<const uint8_t*>(uri.data()), uri.size());
  return platform::JoinFolder(
      platform::JoinFolder(platform::JoinFolder(cache, "thumbnails"), folder.name),
      Md5Text(bytes) + ".png");
}

// Finds the value of a text chunk by key.
bool HasText(std::span<const uint8_t> file, std::string_view key, std::string_view& value) {
  PngChunks chunks(file);
  for (PngChunk chunk; chunks.Next(chunk);) {
    if (chunk.type != "tEXt") continue;
    const std::string_view text(reinterpret_cast<const char*>(chunk.data.data()),
                                chunk.data.size());
    const size_t end = text.find('\0');
    if (end == std::string_view::npos || text.substr(0, end) != key) continue;
    value = text.substr(end + 1);
    return true;
  }
  return false;
}

bool IsOf(std::span<const uint8_t> file, std::string_view uri, int64_t modified) {
  std::string_view savedUri, savedTime;
  if (!HasText(file, kUriKey, savedUri) || !HasText(file, kTimeKey, savedTime)) return false;
  return savedUri == uri && ParseNumber<int64_t>(savedTime) == modified;
}

PicturePointer ReadCached(const std::string& picturePath, const CacheFolder& folder) {
  const platform::FileFacts facts = platform::FactsOf(picturePath);
  if (facts.kind != platform::FileKind::Regular) return nullptr;
  const std::string uri = FileUri(platform::AbsolutePath(picturePath));
  const std::string path = CachedFile(folder, uri);
  platform::FileView file;
  if (path.empty() || !file.Open(path) || !IsOf(file.Bytes(), uri, facts.modified)) return nullptr;
  PicturePointer picture = NewPictureRecord();
  if (picture == nullptr || DescribePng(file.Bytes(), {}, *picture) != Status::Ok) return nullptr;
  if (std::max(picture->width, picture->height) > folder.side) return nullptr;
  return DecodePng(file.Bytes(), {}, *picture) == Status::Ok ? std::move(picture) : nullptr;
}

}  // namespace

std::string FileUri(std::string_view path) {
  std::string uri = "file://";
  for (const char c : path) {
    const bool letter = (c >= 'a' && c <= 'z') || (c >= 'A' && c <= 'Z') || (c >= '0' && c <= '9');
    if (letter || kAllowedMarks.find(c) != std::string_view::npos) {
      uri += c;
      continue;
    }
    const auto byte = static_cast<unsigned char>(c);
    uri += '%';
    uri += "0123456789ABCDEF"[byte >> 4];
    uri += "0123456789ABCDEF"[byte & 15];
  }
  return uri;
}

PicturePointer ReadSystemPicture(const std::string& picturePath, int32_t side) {
  for (const CacheFolder& folder : kCacheFolders) {
    PicturePointer picture = folder.side >= side ? ReadCached(picturePath, folder) : nullptr;
    if (picture != nullptr) return picture;
  }
  return nullptr;
}

bool ReadSystemThumbnail(const std::string& picturePath, Color matte,
                         LargeThumbnailRecord& record) {
  const PicturePointer picture = ReadCached(picturePath, kLargeFolder);
  return picture != nullptr && MakeLargeThumbnailRecord(record, *picture, matte);
}

}  // namespace fotomill
