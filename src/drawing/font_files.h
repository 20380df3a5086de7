#pragma once

#include <cstdint>
#include <memory>
#include <string>
#include <string_view>

namespace fotomill {

// A font of the system: its file, and which of the fonts in it.
struct FontFile {
  std::string path;
  int32_t index = 0;
};

// The fonts of the system for one family, the best one first and those that stand in for letters
// that it lacks behind it. Only fonts with outlines count (TrueType and OpenType).
class FontFiles {
 public:
  // Fonts for a family as people write it: "Arial", "DejaVu Sans Bold", "Georgia Italic". Where the
  // system has no such family, the one that fontconfig takes for it comes first. Empty when the
  // system has no font, or no fontconfig. Kept for the next call; from any thread.
  static std::shared_ptr<const FontFiles> Of(std::string_view family);

  explicit FontFiles(std::string_view family);
  ~FontFiles();
  FontFiles(const FontFiles&) = delete;
  FontFiles& operator=(const FontFiles&) = delete;

  size_t Count() const;
  const FontFile& At(size_t index) const;
  // Whether a font has a character.
  bool Has(size_t index, char32_t character) const;

 private:
  struct List;
  std::unique_ptr<List> list_;
};

}  // namespace fotomill
