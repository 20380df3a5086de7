#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

namespace fotomill {

// A system font: its file, and the index of the font in it.
struct FontFile {
  std::string path;
  int32_t index = 0;
};

// The system's fonts for one family, the best match first, followed by fallbacks for missing
// characters. Only outline fonts (TrueType and OpenType).
class FontFiles {
 public:
  // Fonts for a family by its common name: "Arial", "DejaVu Sans Bold", "Georgia Italic". If the
  // family is not installed, fontconfig's substitute comes first. Empty if there are no fonts or no
  // fontconfig. Cached; thread-safe.
  static std::shared_ptr<const FontFiles> Of(std::string_view family);

  // Queries fontconfig, which is slow; Of caches the result.
  explicit FontFiles(std::string_view family);
  ~FontFiles();
  FontFiles(const FontFiles&) = delete;
  FontFiles& operator=(const FontFiles&) = delete;

  size_t Count() const;                    // 0 if there are no fonts
  const FontFile& At(size_t index) const;  // index < Count; best match first
  // Whether a font has a glyph for a character.
  bool Has(size_t index, char32_t character) const;

 private:
  struct List;
  std::unique_ptr<List> list_;
};

}  // namespace fotomill
