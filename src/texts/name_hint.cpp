#include "texts/name_hint.h"

#include <algorithm>

#include "core/nearest_name.h"
#include "core/text.h"

namespace fotomill {

namespace {

struct Synonym {
  std::string_view typed, name;
};

// Words users may type, and our names for them; a word may have several meanings. Formats,
// commands, options, operations.
constexpr Synonym kSynonyms[] = {
    {"jxr", "hdp"},
    {"jpegxr", "hdp"},
    {"icon", "ico"},
    {"bitmap", "bmp"},
    {"photoshop", "psd"},
    {"apng", "png"},
    {"resize", "apply"},
    {"scale", "apply"},
    {"crop", "apply"},
    {"sharpen", "apply"},
    {"blur", "apply"},
    {"annotate", "apply"},
    {"watermark", "apply"},
    {"rotate", "turn"},
    {"flip", "turn"},
    {"mirror", "turn"},
    {"identify", "info"},
    {"metadata", "exif"},
    {"check", "verify"},
    {"validate", "verify"},
    {"test", "verify"},
    {"montage", "contact-sheet"},
    {"catalog", "contact-sheet"},
    {"catalogue", "contact-sheet"},
    {"thumbnail", "thumbs make"},
    {"thumbnails", "thumbs make"},
    {"settings", "config list"},
    {"set", "config set"},
    {"get", "config get"},
    {"config show", "config get"},
    {"config explain", "config describe"},
    {"config help", "config describe"},
    {"config reset", "config unset"},
    {"config delete", "config unset"},
    {"plugin", "plugins"},
    {"effects", "operations"},
    {"scale", "resize"},
    {"grayscale", "gray"},
    {"greyscale", "gray"},
    {"grey", "gray"},
    {"--output", "--out"},
    {"--outfile", "--out"},
    {"--output-dir", "--dest"},
    {"--outdir", "--dest"},
    {"--out-dir", "--dest"},
    {"--directory", "--dest"},
    {"--destination", "--dest"},
    {"--format", "--to"},
    {"--recurse", "--recursive"},
    {"--threads", "--jobs"},
    {"--parallel", "--jobs"},
    {"--silent", "--quiet"},
    {"--force", "--overwrite"},
    {"--yes", "--overwrite"},
    {"--language", "--lang"},
    {"--colour", "--color"},
    {"--config", "--set"},
    {"--option", "--set"},
    {"--simulate", "--dry-run"},
    {"--just-print", "--dry-run"},
    {"--strip", "--metadata"},
};

std::string_view KnownSynonym(std::string_view typed, std::span<const std::string_view> names) {
  for (const Synonym& row : kSynonyms) {
    if (EqualIgnoringCase(typed, row.typed) && std::ranges::find(names, row.name) != names.end())
      return row.name;
  }
  return {};
}

}  // namespace

std::string NearestNameHint(std::string_view typed, std::span<const std::string_view> names) {
  const RecordedText question = NearestNameQuestion(typed, names);
  return question.empty() ? std::string() : " " + question.shown;
}

RecordedText NearestNameQuestion(std::string_view typed, std::span<const std::string_view> names) {
  const std::string_view synonym = KnownSynonym(typed, names);
  const std::string_view nearest = synonym.empty() ? NearestName(typed, names) : synonym;
  return nearest.empty() ? RecordedText() : TrRecorded("Did you mean \"%1\"?", nearest);
}

}  // namespace fotomill
