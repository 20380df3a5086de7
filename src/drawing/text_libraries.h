#pragma once

#include <fontconfig/fontconfig.h>
#include <hb-ot.h>
#include <hb.h>

#include <string>

#include "platform/shared_library.h"

// HarfBuzz (text shaping) and fontconfig (font lookup), loaded when text is first drawn, as linking
// them would slow down every start of the program.
namespace fotomill {

// clang-format off
#define HARFBUZZ_FUNCTIONS(X)                                                                     \
  X(hb_blob_create_from_file_or_fail) X(hb_blob_destroy) X(hb_buffer_add_utf32)                   \
  X(hb_buffer_clear_contents) X(hb_buffer_create) X(hb_buffer_destroy)                            \
  X(hb_buffer_get_glyph_infos) X(hb_buffer_get_glyph_positions) X(hb_buffer_get_length)           \
  X(hb_buffer_guess_segment_properties) X(hb_buffer_set_direction) X(hb_buffer_set_script)        \
  X(hb_face_create) X(hb_face_destroy) X(hb_font_create) X(hb_font_destroy)                       \
  X(hb_font_set_scale) X(hb_ot_font_set_funcs) X(hb_shape)                                        \
  X(hb_unicode_funcs_get_default) X(hb_unicode_general_category) X(hb_unicode_script)

#define FONTCONFIG_FUNCTIONS(X)                                                                   \
  X(FcCharSetHasChar) X(FcConfigSubstitute) X(FcDefaultSubstitute) X(FcFontSetDestroy)            \
  X(FcFontSort) X(FcPatternAddBool) X(FcPatternAddInteger) X(FcPatternAddString)                  \
  X(FcPatternCreate) X(FcPatternDestroy) X(FcPatternGetBool) X(FcPatternGetCharSet)               \
  X(FcPatternGetInteger) X(FcPatternGetString)
// clang-format on

#define FOTOMILL_MEMBER(name) decltype(::name)* name = nullptr;

// The HarfBuzz functions the program uses, under their own names.
struct HarfBuzz {
  platform::SharedLibrary library;
  HARFBUZZ_FUNCTIONS(FOTOMILL_MEMBER)
};

// The fontconfig functions the program uses, under their own names.
struct Fontconfig {
  platform::SharedLibrary library;
  FONTCONFIG_FUNCTIONS(FOTOMILL_MEMBER)
};

#undef FOTOMILL_MEMBER

// The libraries, loaded at the first call; null if not installed or too old. They stay loaded until
// the program ends. Thread-safe.
const HarfBuzz* LoadedHarfBuzz();
const Fontconfig* LoadedFontconfig();  // as above

}  // namespace fotomill
