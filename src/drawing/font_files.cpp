#include "drawing/font_files.h"

#include <map>
#include <mutex>
#include <vector>

#include "core/text.h"
#include "drawing/text_libraries.h"

namespace fotomill {

namespace {

constexpr int kCollectionIndex = 0xffff;  // the upper bits select an instance of a variable font

// A family, with the weight and slant named by its last words.
struct Wanted {
  std::string family;
  int weight = FC_WEIGHT_REGULAR, slant = FC_SLANT_ROMAN;
};

Wanted Parsed(std::string_view name) {
  Wanted wanted{.family = std::string(name)};
  for (;;) {
    const size_t blank = wanted.family.find_last_of(' ');
    if (blank == std::string::npos || blank == 0) return wanted;
    const std::string last = LowerCase(std::string_view(wanted.family).substr(blank + 1));
    if (last == "bold") {
      wanted.weight = FC_WEIGHT_BOLD;
    } else if (last == "italic" || last == "oblique") {
      wanted.slant = FC_SLANT_ITALIC;
    } else if (last != "regular" && !last.empty()) {
      return wanted;
    }
    wanted.family.resize(blank);
  }
}

const FcChar8* FcText(const char* text) { return reinterpret_cast<const FcChar8*>(text); }

}  // namespace

struct FontFiles::List {
  struct Entry {
    FontFile file;
    FcCharSet* characters;  // owned by the set below
  };
  const Fontconfig* fontconfig = LoadedFontconfig();
  FcFontSet* set = nullptr;
  std::vector<Entry> entries;

  void Sort(const Wanted& wanted) {
    FcPattern* const pattern = fontconfig->FcPatternCreate();
    if (pattern == nullptr) return;
    fontconfig->FcPatternAddString(pattern, FC_FAMILY, FcText(wanted.family.c_str()));
    fontconfig->FcPatternAddInteger(pattern, FC_WEIGHT, wanted.weight);
    fontconfig->FcPatternAddInteger(pattern, FC_SLANT, wanted.slant);
    fontconfig->FcPatternAddBool(pattern, FC_OUTLINE, FcTrue);
    fontconfig->FcConfigSubstitute(nullptr, pattern, FcMatchPattern);
    fontconfig->FcDefaultSubstitute(pattern);
    FcResult result = FcResultNoMatch;
    set = fontconfig->FcFontSort(nullptr, pattern, FcFalse, nullptr, &result);
    fontconfig->FcPatternDestroy(pattern);
    for (int i = 0; set != nullptr && i < set->nfont; ++i) Take(set->fonts[i]);
  }

  void Take(FcPattern* font) {
    FcChar8 *path = nullptr, *format = nullptr;
    FcCharSet* characters = nullptr;
    FcBool outline = FcFalse;
    int index = 0;
    const bool known =
        fontconfig->FcPatternGetString(font, FC_FILE, 0, &path) == FcResultMatch &&
        fontconfig->FcPatternGetString(font, FC_FONTFORMAT, 0, &format) == FcResultMatch &&
        fontconfig->FcPatternGetBool(font, FC_OUTLINE, 0, &outline) == FcResultMatch &&
        fontconfig->FcPatternGetCharSet(font, FC_CHARSET, 0, &characters) == FcResultMatch;
    if (!known || outline == FcFalse) return;
    const std::string_view kind = reinterpret_cast<const char*>(format);
    if (kind != "TrueType" && kind != "CFF") return;
    (void)fontconfig->FcPatternGetInteger(font, FC_INDEX, 0, &index);
    entries.push_back(
        {{reinterpret_cast<const char*>(path), index & kCollectionIndex}, characters});
  }

  ~List() {
    if (set != nullptr) fontconfig->FcFontSetDestroy(set);
  }
};

FontFiles::FontFiles(std::string_view family) : list_(std::make_unique<List>()) {
  if (list_->fontconfig != nullptr) list_->Sort(Parsed(family));
}
FontFiles::~FontFiles() = default;

size_t FontFiles::Count() const { return list_->entries.size(); }
const FontFile& FontFiles::At(size_t index) const { return list_->entries[index].file; }

bool FontFiles::Has(size_t index, char32_t character) const {
  return list_->fontconfig->FcCharSetHasChar(list_->entries[index].characters, character) !=
         FcFalse;
}

std::shared_ptr<const FontFiles> FontFiles::Of(std::string_view family) {
  (void)LoadedFontconfig();  // loaded before the map is created, so unloaded after it is destroyed
  static std::mutex mutex;
  static std::map<std::string, std::shared_ptr<const FontFiles>, std::less<>> known;
  const std::scoped_lock lock(mutex);
  auto& fonts = known[std::string(family)];
  if (fonts == nullptr) fonts = std::make_shared<FontFiles>(family);
  return fonts;
}

}  // namespace fotomill
