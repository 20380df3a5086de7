#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"

namespace fotomill {

// What people say about a picture: titles, keywords, ratings. Texts in UTF-8, empty if missing.
struct PictureTags {
  std::string title;
  std::string description;  // the caption
  // of the file: the comment of its format, EXIF or a text file beside it
  std::string comment;
  std::vector<std::string> keywords;
  int32_t rating = 0;   // 1 to 5 stars; 0: none, -1: rejected
  std::string label;    // "Red" and the like; programs may use other words
  std::string creator;  // several are separated by "; "
  std::string copyright;
  std::string sublocation, city, state, country, countryCode;
  int64_t taken = 0;   // by the camera's clock: 20040831223208; 0 if unknown
  std::string camera;  // maker and model

  bool operator==(const PictureTags&) const = default;
};

// Where to look for tags, besides XMP, IPTC and a sidecar.
struct TagSources {
  std::string commentFolder = {};     // of text files with comments; empty: the picture's folder
  std::string commentExtension = {};  // empty: text files are not read
  bool exif = true;
};

// Reads the tags of a picture from its metadata (XMP, IPTC, EXIF), its sidecar and its text file,
// without decoding pixels. Where they differ, the sidecar wins; then, following the guidelines of
// the Metadata Working Group, EXIF for description, creator and copyright; then XMP, unless another
// program changed IPTC without updating XMP. Plug-ins are asked about files of their formats. Files
// without tags and files of other formats are Ok.
// FileOpenError (1) if the picture cannot be opened. On any thread.
Status ReadPictureTags(const std::string& path, const TagSources& sources, PictureTags& tags);

// As above, but only what the file itself says.
PictureTags TagsOfFile(std::span<const uint8_t> file, bool exif = true);

// The colors of labels, in the order of their keys; English names as stored in files.
inline constexpr std::string_view kLabelNames[] = {"Red", "Yellow", "Green", "Blue", "Purple"};

}  // namespace fotomill
