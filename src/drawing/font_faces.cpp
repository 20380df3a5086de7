#include "drawing/font_faces.h"

#include <algorithm>
#include <cmath>

namespace fotomill {

namespace {

constexpr double kFraction = 64;           // FreeType and HarfBuzz use 64ths of a pixel
constexpr double kMostEm = 20000;          // FreeType pixel coordinates are 16-bit

}  // namespace

Status FontFaces::OpenForEm(std::string_view family, double em) {
  RETURN_IF_BAD(OpenFamily(family));
  return SetSize(em);
}

Status FontFaces::OpenForLine(std::string_view family, double height) {
  RETURN_IF_BAD(OpenFamily(family));
  const FT_Face face = faces_[0].outlines;
  const int units = std::max(face->ascender - face->descender, 1);
  return SetSize(height * face->units_per_EM / units);
}

Status FontFaces::OpenFamily(std::string_view family) {
  Close();
  shaping_ = LoadedHarfBuzz();
  if (shaping_ == nullptr) return Status::ResourceError;
  if (FT_Init_FreeType(&library_) != 0) return Status::MemoryAllocationError;
  files_ = FontFiles::Of(family);
  for (size_t file = 0; file < files_->Count(); ++file) {
    if (OpenFace(file)) return Status::Ok;
  }
  return Status::ResourceError;
}

Status FontFaces::SetSize(double em) {
  em_ = std::clamp(em, 1.0, kMostEm);
  const FT_Face face = faces_[0].outlines;
  ascent_ = em_ * face->ascender / face->units_per_EM;
  descent_ = -em_ * face->descender / face->units_per_EM;
  return SizeFace(faces_[0]) ? Status::Ok : Status::ResourceError;
}

bool FontFaces::SizeFace(const Face& face) const {
  const auto size = static_cast<int>(std::lround(em_ * kFraction));
  constexpr FT_UInt kPointsPerInch = 72;
  shaping_->hb_font_set_scale(face.shaper, size, size);
  return FT_Set_Char_Size(face.outlines, 0, size, kPointsPerInch, kPointsPerInch) == 0;
}

bool FontFaces::OpenFace(size_t file) {
  const FontFile& font = files_->At(file);
  Face face{.file = file, .outlines = nullptr, .shaper = nullptr};
  if (FT_New_Face(library_, font.path.c_str(), font.index, &face.outlines) != 0) return false;
  hb_blob_t* const bytes = FT_IS_SCALABLE(face.outlines) && face.outlines->units_per_EM > 0
                               ? shaping_->hb_blob_create_from_file_or_fail(font.path.c_str())
                               : nullptr;
  if (bytes == nullptr) {
    FT_Done_Face(face.outlines);
    return false;
  }
  hb_face_t* const tables = shaping_->hb_face_create(bytes, static_cast<unsigned>(font.index));
  face.shaper = shaping_->hb_font_create(tables);
  shaping_->hb_ot_font_set_funcs(face.shaper);
  shaping_->hb_face_destroy(tables);
  shaping_->hb_blob_destroy(bytes);
  faces_.push_back(face);
  return true;
}

bool FontFaces::HasAll(size_t file, std::span<const char32_t> characters) const {
  return std::ranges::all_of(characters, [&](char32_t c) { return files_->Has(file, c); });
}

size_t FontFaces::FaceFor(std::span<const char32_t> characters) {
  for (const auto wanted : {characters, characters.first(1)}) {
    for (size_t i = 0; i < faces_.size(); ++i) {
      if (HasAll(faces_[i].file, wanted)) return i;
    }
    for (size_t file = faces_[0].file + 1; file < files_->Count(); ++file) {
      if (!HasAll(file, wanted) || !OpenFace(file)) continue;
      if (SizeFace(faces_.back())) return faces_.size() - 1;
    }
  }
  return 0;
}

void FontFaces::Close() {
  for (const Face& face : faces_) {
    FT_Done_Face(face.outlines);
    shaping_->hb_font_destroy(face.shaper);
  }
  faces_.clear();
  if (library_ != nullptr) FT_Done_FreeType(library_);
  library_ = nullptr;
}

}  // namespace fotomill
