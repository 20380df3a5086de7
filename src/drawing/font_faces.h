#pragma once

#include <ft2build.h>
#include FT_FREETYPE_H

#include <memory>
#include <span>
#include <string_view>
#include <vector>

#include "core/status.h"
#include "drawing/font_files.h"
#include "drawing/text_libraries.h"

namespace fotomill {

// The fonts used to draw a text at one size: its family's font, plus fallback fonts as needed for
// missing characters. Not thread-safe.
class FontFaces {
 public:
  FontFaces() = default;
  ~FontFaces() { Close(); }
  FontFaces(const FontFaces&) = delete;
  FontFaces& operator=(const FontFaces&) = delete;

  // Opens a family (see FontFiles) with the given em size, or line height, in pixels; the line
  // height is measured from the top of the tallest letters to the bottom of the deepest.
  // ResourceError if there is no font, or HarfBuzz or fontconfig is not installed.
  Status OpenForEm(std::string_view family, double em);
  Status OpenForLine(std::string_view family, double height);  // as above

  double Em() const { return em_; }             // pixels, of all faces
  double Ascent() const { return ascent_; }     // pixels above the baseline, of the family's font
  double Descent() const { return descent_; }   // pixels below it
  FT_Library Library() const { return library_; }  // owned, like the following; null until opened
  // `face` as returned by FaceFor.
  FT_Face Outlines(size_t face) const { return faces_[face].outlines; }
  hb_font_t* Shaper(size_t face) const { return faces_[face].shaper; }  // of the same face and size

  const FontFile& FileOf(size_t face) const { return files_->At(faces_[face].file); }

  // The first face that has all of the characters, else the first that has the first of them, else
  // the family's own.
  size_t FaceFor(std::span<const char32_t> characters);

 private:
  struct Face {
    size_t file;  // of files_
    FT_Face outlines;
    hb_font_t* shaper;
  };
  Status OpenFamily(std::string_view family);
  Status SetSize(double em);
  bool OpenFace(size_t file);
  bool SizeFace(const Face& face) const;
  bool HasAll(size_t file, std::span<const char32_t> characters) const;
  void Close();

  const HarfBuzz* shaping_ = nullptr;
  FT_Library library_ = nullptr;
  std::shared_ptr<const FontFiles> files_;
  std::vector<Face> faces_;  // the first is the family's own
  double em_ = 0, ascent_ = 0, descent_ = 0;
};

}  // namespace fotomill
