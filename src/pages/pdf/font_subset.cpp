#include "pages/pdf/font_subset.h"

#include <hb-subset.h>

#include <memory>

#include "platform/shared_library.h"

namespace fotomill {

namespace {

// clang-format off
#define SUBSET_FUNCTIONS(X)                                                                       \
  X(hb_blob_create_from_file_or_fail) X(hb_blob_destroy) X(hb_blob_get_data) X(hb_face_create)    \
  X(hb_face_destroy) X(hb_face_reference_blob) X(hb_face_reference_table) X(hb_set_add)           \
  X(hb_subset_input_create_or_fail) X(hb_subset_input_destroy) X(hb_subset_input_glyph_set)       \
  X(hb_subset_input_set_flags) X(hb_subset_or_fail)
// clang-format on

#define SUBSET_MEMBER(name) decltype(::name)* name = nullptr;
// HarfBuzz's subsetting functions, and those of HarfBuzz itself, which that library loads.
struct Subsetting {
  platform::SharedLibrary library;
  SUBSET_FUNCTIONS(SUBSET_MEMBER)
};
#undef SUBSET_MEMBER

#define SUBSET_FIND(name)                                                     \
  table.name = table.library.template FunctionNamed<decltype(::name)>(#name); \
  whole = whole && table.name != nullptr;
Subsetting LoadSubsetting() {
  Subsetting table;
  bool whole = table.library.LoadSystem("libharfbuzz-subset.so.0");
  if (whole) {
    SUBSET_FUNCTIONS(SUBSET_FIND)
  }
  return whole ? std::move(table) : Subsetting{};
}
#undef SUBSET_FIND

const Subsetting* LoadedSubsetting() {
  static const Subsetting table = LoadSubsetting();
  return table.library.Loaded() ? &table : nullptr;
}

constexpr hb_tag_t kCompactTable = HB_TAG('C', 'F', 'F', ' ');

std::vector<uint8_t> BytesOf(const Subsetting& hb, hb_blob_t* blob) {
  unsigned length = 0;
  const char* const data = hb.hb_blob_get_data(blob, &length);
  std::vector<uint8_t> bytes(data, data + length);
  hb.hb_blob_destroy(blob);
  return bytes;
}

// Takes over `face`.
FontProgram ProgramOf(const Subsetting& hb, hb_face_t* face) {
  FontProgram program;
  program.bytes = BytesOf(hb, hb.hb_face_reference_table(face, kCompactTable));
  program.compact = !program.bytes.empty();
  if (!program.compact) program.bytes = BytesOf(hb, hb.hb_face_reference_blob(face));
  hb.hb_face_destroy(face);
  return program;
}

hb_face_t* Reduced(const Subsetting& hb, hb_face_t* face, std::span<const uint32_t> glyphs) {
  hb_subset_input_t* const input = hb.hb_subset_input_create_or_fail();
  if (input == nullptr) return nullptr;
  for (const uint32_t glyph : glyphs) hb.hb_set_add(hb.hb_subset_input_glyph_set(input), glyph);
  hb.hb_subset_input_set_flags(input, HB_SUBSET_FLAGS_RETAIN_GIDS | HB_SUBSET_FLAGS_NO_HINTING);
  hb_face_t* const reduced = hb.hb_subset_or_fail(face, input);
  hb.hb_subset_input_destroy(input);
  return reduced;
}

}  // namespace

Status SubsetFont(const FontFile& font, std::span<const uint32_t> glyphs, FontProgram& program) {
  const Subsetting* const hb = LoadedSubsetting();
  if (hb == nullptr) return Status::ResourceError;
  hb_blob_t* const file = hb->hb_blob_create_from_file_or_fail(font.path.c_str());
  if (file == nullptr) return Status::ResourceError;
  hb_face_t* const face = hb->hb_face_create(file, static_cast<unsigned>(font.index));
  hb->hb_blob_destroy(file);
  hb_face_t* const reduced = Reduced(*hb, face, glyphs);
  hb->hb_face_destroy(face);
  if (reduced == nullptr) return Status::ResourceError;
  program = ProgramOf(*hb, reduced);
  return program.bytes.empty() ? Status::ResourceError : Status::Ok;
}

}  // namespace fotomill
