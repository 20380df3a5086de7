// HEIC and other HEIF files with HEVC pictures, through libheif. Read only: the encoder that it
// would need is not free for all uses.
//
// The library applies rotation, mirroring and cropping, so EXIF is passed on with orientation 1.
// Source: ISO/IEC 23008-12 (HEIF).
#include <libheif/heif.h>

#include <algorithm>
#include <memory>
#include <vector>

#include "fotomill_plugin_exports.h"

namespace {

constexpr int kMostPictures = 4096;

struct ContextDeleter {
  void operator()(heif_context* context) const { heif_context_free(context); }
};
struct HandleDeleter {
  void operator()(heif_image_handle* handle) const { heif_image_handle_release(handle); }
};
struct ImageDeleter {
  void operator()(heif_image* image) const { heif_image_release(image); }
};
struct OptionsDeleter {
  void operator()(heif_decoding_options* options) const { heif_decoding_options_free(options); }
};
using Handle = std::unique_ptr<heif_image_handle, HandleDeleter>;
using Image = std::unique_ptr<heif_image, ImageDeleter>;

int32_t ErrorOf(const heif_error& error) {
  switch (error.code) {
    case heif_error_Ok: return 0;
    case heif_error_Input_does_not_exist: return FMW_ERROR_OPEN;
    case heif_error_Invalid_input:
      return error.subcode == heif_suberror_End_of_data ? FMW_ERROR_READ : FMW_ERROR_DAMAGED;
    case heif_error_Unsupported_filetype:
    case heif_error_Unsupported_feature: return FMW_ERROR_FORMAT;
    case heif_error_Memory_allocation_error: return FMW_ERROR_MEMORY;
    default: return FMW_ERROR_DAMAGED;
  }
}

// An opened file.
class HeifFile {
 public:
  int32_t Open(const char* fileName) {
    context_.reset(heif_context_alloc());
    if (context_ == nullptr) return FMW_ERROR_MEMORY;
    return ErrorOf(heif_context_read_from_file(context_.get(), fileName, nullptr));
  }

  int32_t Count() const {
    return std::clamp(heif_context_get_number_of_top_level_images(context_.get()), 1,
                      kMostPictures);
  }

  // Picture `page`: the primary one first, then the others in the order of the file.
  int32_t Picture(int32_t page, Handle& handle) const {
    heif_item_id primary = 0;
    int32_t error = ErrorOf(heif_context_get_primary_image_ID(context_.get(), &primary));
    if (error != 0) return error;
    std::vector<heif_item_id> others(static_cast<size_t>(Count()));
    others.resize(static_cast<size_t>(heif_context_get_list_of_top_level_image_IDs(
        context_.get(), others.data(), static_cast<int>(others.size()))));
    std::erase(others, primary);
    others.insert(others.begin(), primary);
    if (page < 0 || static_cast<size_t>(page) >= others.size()) return FMW_ERROR_DAMAGED;
    heif_image_handle* found = nullptr;
    error = ErrorOf(
        heif_context_get_image_handle(context_.get(), others[static_cast<size_t>(page)], &found));
    handle.reset(found);
    return error;
  }

 private:
  std::unique_ptr<heif_context, ContextDeleter> context_;
};

int32_t OpenPicture(const char* fileName, int32_t page, HeifFile& file, Handle& handle) {
  const int32_t error = file.Open(fileName);
  return error != 0 ? error : file.Picture(page, handle);
}

// The smallest thumbnail in the file that is large enough, if there is one.
void PreferThumbnail(int32_t wantedSide, Handle& handle) {
  const int count = std::min(heif_image_handle_get_number_of_thumbnails(handle.get()), 16);
  std::vector<heif_item_id> ids(static_cast<size_t>(std::max(count, 0)));
  if (wantedSide <= 0 || ids.empty()) return;
  ids.resize(static_cast<size_t>(
      heif_image_handle_get_list_of_thumbnail_IDs(handle.get(), ids.data(), count)));
  Handle best;
  int32_t bestSide = 0;
  for (const heif_item_id id : ids) {
    heif_image_handle* found = nullptr;
    if (heif_image_handle_get_thumbnail(handle.get(), id, &found).code != heif_error_Ok) continue;
    Handle thumbnail(found);
    const int32_t side =
        std::max(heif_image_handle_get_width(found), heif_image_handle_get_height(found));
    if (side < wantedSide || (best != nullptr && side >= bestSide)) continue;
    best = std::move(thumbnail);
    bestSide = side;
  }
  if (best != nullptr) handle = std::move(best);
}

int32_t Decode(const Handle& handle, bool alpha, Image& image) {
  const std::unique_ptr<heif_decoding_options, OptionsDeleter> options(
      heif_decoding_options_alloc());
  if (options == nullptr) return FMW_ERROR_MEMORY;
  options->convert_hdr_to_8bit = 1;
  heif_image* decoded = nullptr;
  const int32_t error = ErrorOf(heif_decode_image(
      handle.get(), &decoded, heif_colorspace_RGB,
      alpha ? heif_chroma_interleaved_RGBA : heif_chroma_interleaved_RGB, options.get()));
  image.reset(decoded);
  return error;
}

int32_t ToBitmap(const Image& image, bool alpha, const FMW_READ_REQUEST* request,
                 FmwBitmap& bitmap) {
  const int width = heif_image_get_width(image.get(), heif_channel_interleaved);
  const int height = heif_image_get_height(image.get(), heif_channel_interleaved);
  int stride = 0;
  const uint8_t* pixels =
      heif_image_get_plane_readonly(image.get(), heif_channel_interleaved, &stride);
  if (pixels == nullptr || width < 1 || height < 1 || stride < width * (alpha ? 4 : 3))
    return FMW_ERROR_DAMAGED;
  bitmap = FmwNewBitmap(static_cast<uint32_t>(width), static_cast<uint32_t>(height),
                        alpha ? 32 : 24, request);
  if (bitmap.block == nullptr) return FMW_ERROR_MEMORY;
  for (uint32_t y = 0; y < bitmap.height; ++y)
    FmwPutRgbRow(&bitmap, y, pixels + static_cast<size_t>(stride) * y);
  return 0;
}

int32_t Read(const char* fileName, const FMW_READ_REQUEST* request, FmwBitmap* bitmap) {
  HeifFile file;
  Handle handle;
  int32_t error = OpenPicture(fileName, request->page, file, handle);
  if (error != 0) return error;
  PreferThumbnail(request->wantedSide, handle);
  const bool alpha = heif_image_handle_has_alpha_channel(handle.get()) != 0;
  Image image;
  error = Decode(handle, alpha, image);
  return error != 0 ? error : ToBitmap(image, alpha, request, *bitmap);
}

int32_t Describe(const char* fileName, FMW_PICTURE_INFO* info) {
  HeifFile file;
  Handle handle;
  const int32_t error = OpenPicture(fileName, info->frame, file, handle);
  if (error != 0) return error;
  info->width = heif_image_handle_get_width(handle.get());
  info->height = heif_image_handle_get_height(handle.get());
  info->bitsPerPixel = heif_image_handle_has_alpha_channel(handle.get()) != 0 ? 32 : 24;
  info->frame = file.Count();
  snprintf(info->typeName, sizeof info->typeName, "HEIF, %d bits per sample",
           heif_image_handle_get_luma_bits_per_pixel(handle.get()));
  return 0;
}

FMW_BLOCK ReadProfile(const heif_image_handle* handle) {
  const size_t size = heif_image_handle_get_raw_color_profile_size(handle);
  FMW_BLOCK block = {nullptr, 0};
  if (size == 0) return block;
  block.data = malloc(size);
  if (block.data == nullptr) return block;
  block.size = size;
  if (heif_image_handle_get_raw_color_profile(handle, block.data).code != heif_error_Ok)
    block.size = 0;
  return block;
}

// The first metadata block of a kind, without its first `skipped` bytes.
FMW_BLOCK ReadBlock(const heif_image_handle* handle, heif_item_id id, size_t skipped) {
  const size_t size = heif_image_handle_get_metadata_size(handle, id);
  std::vector<uint8_t> bytes(size);
  if (size <= skipped ||
      heif_image_handle_get_metadata(handle, id, bytes.data()).code != heif_error_Ok)
    return {nullptr, 0};
  return FmwBlock(bytes.data() + skipped, size - skipped);
}

// EXIF starts with the big-endian offset of its TIFF header from the byte behind that offset.
FMW_BLOCK ReadExif(const heif_image_handle* handle, heif_item_id id) {
  FMW_BLOCK block = ReadBlock(handle, id, 0);
  auto* bytes = static_cast<uint8_t*>(block.data);
  if (block.size < 4) return block;
  const uint64_t start = 4 + uint64_t{FmwGetBe(bytes, 4)};
  if (start >= block.size) {
    block.size = 0;
    return block;
  }
  memmove(bytes, bytes + start, block.size - start);
  block.size -= start;
  FmwSetUpright(bytes, block.size);
  return block;
}

void ReadBlocks(const heif_image_handle* handle, FMW_METADATA& metadata) {
  constexpr int kMost = 64;
  heif_item_id ids[kMost];
  const int count = heif_image_handle_get_list_of_metadata_block_IDs(handle, nullptr, ids, kMost);
  for (int i = 0; i < std::min(count, kMost); ++i) {
    const char* type = heif_image_handle_get_metadata_type(handle, ids[i]);
    const char* content = heif_image_handle_get_metadata_content_type(handle, ids[i]);
    if (type == nullptr) continue;
    if (metadata.exif.data == nullptr && strcmp(type, "Exif") == 0)
      metadata.exif = ReadExif(handle, ids[i]);
    if (metadata.xmp.data == nullptr && strcmp(type, "mime") == 0 && content != nullptr &&
        strcmp(content, "application/rdf+xml") == 0)
      metadata.xmp = ReadBlock(handle, ids[i], 0);
  }
}

int32_t ReadMetadata(const char* fileName, const FMW_READ_REQUEST* request,
                     FMW_METADATA* metadata) {
  HeifFile file;
  Handle handle;
  const int32_t error = OpenPicture(fileName, request->page, file, handle);
  if (error != 0) return error;
  if (heif_image_handle_get_luma_bits_per_pixel(handle.get()) > 8) metadata->lost = FMW_LOST_DEPTH;
  metadata->icc = ReadProfile(handle.get());
  ReadBlocks(handle.get(), *metadata);
  return 0;
}

constexpr FmwModule kModule = {
    .name = "HEIC",
    .extensions = "heic;heif;hif;heics;heifs",
    .description = "High Efficiency Image",
    .bits = 0,
    .flags = FMW_FORMAT_BITMAP | FMW_FORMAT_MULTI,
    .options = nullptr,
    .optionCount = 0,
};

}  // namespace

FMW_MODULE(kModule)
FMW_MODULE_LIBRARIES("libheif\t%s\tLGPL-3.0-or-later", heif_get_version())
FMW_MODULE_READS(Describe, Read)
FMW_MODULE_METADATA(ReadMetadata)
