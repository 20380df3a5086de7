#include "drawing/caption_font.h"

#include <ft2build.h>
#include FT_FREETYPE_H

#include <algorithm>
#include <map>
#include <utility>
#include <vector>

#include "core/text.h"
#include "core/utf8.h"
#include "platform/files.h"
#include "platform/folders.h"
#include "platform/paths.h"
#include "processing/color/blend.h"

namespace fotomill {

namespace {

constexpr int kDeepestFontFolder = 6;
constexpr uint32_t kUnknownCharacter = 0xFFFD;
constexpr std::string_view kEllipsis = "\xE2\x80\xA6";

// Tried in this order when a family is missing, and for letters that the family lacks. The first
// has Arial's widths.
constexpr std::string_view kOtherFamilies[] = {
    "Liberation Sans",
    "Arial",
    "Arimo",
    "Helvetica",
    "Nimbus Sans",
    "DejaVu Sans",
    "Noto Sans",
    "Free Sans",
    "Noto Sans CJK",
    "Droid Sans Fallback",
    "Droid Sans Fallback Full",
    "WQY Zen Hei",
};

// A font's name as files and people write it: "Liberation Sans" and "LiberationSans-Regular.ttf"
// are the same.
std::string PlainFamily(std::string_view name) {
  std::string plain;
  for (const char c : LowerCase(name)) {
    if (c != ' ' && c != '-' && c != '_') plain += c;
  }
  if (plain.ends_with("regular")) plain.resize(plain.size() - 7);
  return plain;
}

bool IsFontFile(std::string_view name) {
  const std::string extension = LowerCase(platform::ExtensionOf(name));
  return extension == "ttf" || extension == "otf" || extension == "ttc" || extension == "pfb" ||
         extension == "t1";
}

using FontFiles = std::multimap<std::string, std::string>;  // path by plain family

void CollectFonts(const std::string& folder, int depth, FontFiles& fonts) {
  const auto entries = platform::ListFolder(folder);
  if (!entries || depth > kDeepestFontFolder) return;
  for (const platform::FolderEntry& entry : *entries) {
    const std::string path = platform::JoinFolder(folder, entry.name);
    if (entry.kind == platform::FileKind::Folder && !entry.link)
      CollectFonts(path, depth + 1, fonts);
    if (entry.kind == platform::FileKind::Regular && IsFontFile(entry.name)) {
      fonts.emplace(PlainFamily(platform::SplitPath(entry.name).base), path);
    }
  }
}

}  // namespace

struct CaptionFont::Fonts {
  Fonts() {
    if (FT_Init_FreeType(&library) != 0) library = nullptr;
  }
  ~Fonts() {
    for (const FT_Face face : faces) FT_Done_Face(face);
    if (library != nullptr) FT_Done_FreeType(library);
  }
  Fonts(const Fonts&) = delete;
  Fonts& operator=(const Fonts&) = delete;

  bool OpenFile(const std::string& path) {
    FT_Face face = nullptr;
    if (FT_New_Face(library, path.c_str(), 0, &face) != 0) return false;
    FT_Size_RequestRec size = {FT_SIZE_REQUEST_TYPE_CELL, 0, height << 6, 0, 0};
    if (FT_Request_Size(face, &size) != 0) {
      FT_Done_Face(face);
      return false;
    }
    faces.push_back(face);
    return true;
  }

  bool OpenFamily(std::string_view family) {
    const auto [first, last] = files.equal_range(PlainFamily(family));
    return std::any_of(first, last, [&](const auto& file) { return OpenFile(file.second); });
  }

  // Opens the next of the other families that is there.
  bool OpenOther() {
    while (other < std::size(kOtherFamilies)) {
      if (OpenFamily(kOtherFamilies[other++])) return true;
    }
    return false;
  }

  // The face that has a character, and its number there; when none has, those of the sign for an
  // unknown one.
  std::pair<FT_Face, FT_UInt> FaceFor(uint32_t character) {
    for (size_t i = 0; i < faces.size() || OpenOther(); ++i) {
      if (const FT_UInt glyph = FT_Get_Char_Index(faces[i], character); glyph != 0)
        return {faces[i], glyph};
    }
    return character == kUnknownCharacter ? std::pair{faces[0], FT_UInt{0}}
                                          : FaceFor(kUnknownCharacter);
  }

  // Calls `put` with the glyph slot and the place of each letter, in 64ths of a pixel, and returns
  // where the line ends.
  template <typename Put>
  FT_Pos Walk(std::string_view text, FT_Int32 load, Put put) {
    FT_Pos pen = 0;
    FT_Face before = nullptr;
    FT_UInt glyphBefore = 0;
    while (!text.empty()) {
      uint32_t character = NextCharacter(text, kUnknownCharacter);
      if (character < 0x20 || (character >= 0x7F && character < 0xA0))
        character = kUnknownCharacter;
      const auto [face, glyph] = FaceFor(character);
      FT_Vector kerning = {0, 0};
      if (face == before)
        (void)FT_Get_Kerning(face, glyphBefore, glyph, FT_KERNING_DEFAULT, &kerning);
      pen += kerning.x;
      if (FT_Load_Glyph(face, glyph, load) != 0) continue;
      put(*face->glyph, pen);
      pen += face->glyph->advance.x;
      before = face;
      glyphBefore = glyph;
    }
    return pen;
  }

  FT_Library library = nullptr;
  FontFiles files;
  std::vector<FT_Face> faces;  // the first is the font, the others stand in
  size_t other = 0;            // of kOtherFamilies
  int32_t height = 0;
};

CaptionFont::CaptionFont() : fonts_(std::make_unique<Fonts>()) {}
CaptionFont::~CaptionFont() = default;

Status CaptionFont::Open(std::string_view family, int32_t height) {
  fonts_ = std::make_unique<Fonts>();
  if (fonts_->library == nullptr) return Status::MemoryAllocationError;
  fonts_->height = height;
  for (const std::string& folder : platform::FontFolders()) CollectFonts(folder, 0, fonts_->files);
  if (fonts_->OpenFamily(family) || fonts_->OpenOther()) return Status::Ok;
  const bool any = std::ranges::any_of(
      fonts_->files, [&](const auto& file) { return fonts_->OpenFile(file.second); });
  return any ? Status::Ok : Status::ResourceError;
}

int32_t CaptionFont::WidthOf(std::string_view text) {
  const FT_Pos width = fonts_->Walk(text, FT_LOAD_DEFAULT, [](const FT_GlyphSlotRec&, FT_Pos) {});
  return static_cast<int32_t>((width + 63) >> 6);
}

std::string CaptionFont::Fitted(std::string_view text, int32_t width) {
  if (WidthOf(text) <= width) return std::string(text);
  std::string fitted(kEllipsis);
  for (std::string_view rest = text; !rest.empty();) {
    (void)NextCharacter(rest, kUnknownCharacter);
    std::string longer = std::string(text.substr(0, text.size() - rest.size())).append(kEllipsis);
    if (WidthOf(longer) > width) break;
    fitted = std::move(longer);
  }
  return fitted;
}

void CaptionFont::DrawCentred(PackedImage& image, const Rectangle& band, std::string_view text,
                              Color color) {
  const int32_t left = std::max(band.x, 0), right = std::min(band.x + band.width, image.Width());
  const int32_t top = std::max(band.y, 0), bottom = std::min(band.y + band.height, image.Height());
  const int32_t start = band.x + (band.width - WidthOf(text)) / 2;
  const auto baseline =
      band.y + static_cast<int32_t>(fonts_->faces[0]->size->metrics.ascender >> 6);
  const uint8_t ink[] = {static_cast<uint8_t>(color >> 16), static_cast<uint8_t>(color >> 8),
                         static_cast<uint8_t>(color)};
  fonts_->Walk(text, FT_LOAD_RENDER, [&](const FT_GlyphSlotRec& glyph, FT_Pos pen) {
    const FT_Bitmap& bitmap = glyph.bitmap;
    if (bitmap.pixel_mode != FT_PIXEL_MODE_GRAY) return;
    const int32_t glyphX = start + static_cast<int32_t>((pen + 32) >> 6) + glyph.bitmap_left;
    const int32_t glyphY = baseline - glyph.bitmap_top;
    for (int32_t row = std::max(0, top - glyphY);
         row < std::min(static_cast<int32_t>(bitmap.rows), bottom - glyphY); ++row) {
      uint8_t* const pixels = image.Row(glyphY + row).data();
      const uint8_t* const coverage = bitmap.buffer + row * bitmap.pitch;
      for (int32_t x = std::max(0, left - glyphX);
           x < std::min(static_cast<int32_t>(bitmap.width), right - glyphX); ++x) {
        uint8_t* const pixel = pixels + (glyphX + x) * 3;
        for (int32_t channel = 0; channel < 3; ++channel)
          pixel[channel] = Blend(pixel[channel], ink[channel], coverage[x]);
      }
    }
  });
}

}  // namespace fotomill
