#include "drawing/text_libraries.h"

namespace fotomill {

namespace {

// Loads a library and all its functions; `table` has no library if one of them is missing.
#define FOTOMILL_FIND(name)                                                             \
  table.name = table.library.template FunctionNamed<decltype(::name)>(#name);           \
  whole = whole && table.name != nullptr;

HarfBuzz LoadHarfBuzz() {
  HarfBuzz table;
  bool whole = table.library.LoadSystem("libharfbuzz.so.0");
  if (whole) {
    HARFBUZZ_FUNCTIONS(FOTOMILL_FIND)
  }
  return whole ? std::move(table) : HarfBuzz{};
}

Fontconfig LoadFontconfig() {
  Fontconfig table;
  bool whole = table.library.LoadSystem("libfontconfig.so.1");
  if (whole) {
    FONTCONFIG_FUNCTIONS(FOTOMILL_FIND)
  }
  return whole ? std::move(table) : Fontconfig{};
}

#undef FOTOMILL_FIND

}  // namespace

const HarfBuzz* LoadedHarfBuzz() {
  static const HarfBuzz table = LoadHarfBuzz();
  return table.library.Loaded() ? &table : nullptr;
}

const Fontconfig* LoadedFontconfig() {
  static const Fontconfig table = LoadFontconfig();
  return table.library.Loaded() ? &table : nullptr;
}

}  // namespace fotomill
