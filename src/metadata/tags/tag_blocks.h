#pragma once

#include <cstdint>
#include <span>
#include <string>
#include <vector>

#include "containers/exif_directories.h"
#include "metadata/edit/picture_edit.h"
#include "metadata/iptc/iptc_records.h"
#include "metadata/xmp/xmp_tags.h"

namespace fotomill {

// The parts of a file that hold tags. Spans are into the file or `made`.
struct TagBlocks {
  MetadataForm form = MetadataForm::None;
  std::span<const uint8_t> xmp, iptc;
  // digest of the IPTC data at the time XMP was last in agreement with it
  std::span<const uint8_t> iptcDigest;
  std::span<const uint8_t> extension;  // a second packet with further properties
  // Photoshop's resources around the IPTC data: of the first JPEG segment, a PNG profile, or all of
  // a Photoshop file
  std::span<const uint8_t> resources;
  std::string iptcKeyword;  // of the PNG text chunk that holds the IPTC data
  // starting at the byte order; empty in TIFF files, and if it is not stored as such
  std::span<const uint8_t> exifBlock;
  std::string comment;  // of the format: a JPEG or PNG comment
  ExifDirectories exif;
  // what the blocks say
  XmpTags xmpTags;
  IptcTags iptcTags;
  bool xmpDamaged = false;  // there is a packet that cannot be read
  // what is not in the file as such: inflated, or put together from several segments
  std::vector<std::vector<uint8_t>> made;

  // Whether another program changed the IPTC data without updating XMP.
  bool IptcIsNewer() const;
};

TagBlocks FindTagBlocks(std::span<const uint8_t> file);

}  // namespace fotomill
