#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "containers/file_pieces.h"
#include "core/status.h"

namespace fotomill {

// Replaces metadata blocks of a file; everything else is copied byte for byte and in order,
// including data after the end of the picture.

// The change to each block: none: kept; empty: removed; else it replaces the existing one,
// or is added.
struct MetadataBlocks {
  std::optional<std::vector<uint8_t>> exif = {};  // starting at the byte order
  std::optional<std::vector<uint8_t>> xmp = {};   // the packet
  // JPEG: the resources of the first APP13 segment with Photoshop's data; PNG: the data of the zTXt
  // chunk that replaces the first "Raw profile type" of IPTC; Photoshop: all resources, before
  // `exif` and `xmp` are put there. Not added, and ignored elsewhere.
  std::optional<std::vector<uint8_t>> iptc = {};
};

// The blocks of a file; empty if missing. Views into the file.
struct MetadataViews {
  std::span<const uint8_t> exif, xmp;
};

// Each finds a file's blocks, and makes the new file from parts of the old
// one, which must outlive it. DamagedFile (2) or FileReadError (3) if the
// file's structure is invalid, UnsuitableImage (13) if it cannot store the
// blocks or something would be lost, with a reason, a whole sentence.
Status FindJpegMetadata(std::span<const uint8_t> file, MetadataViews& views);
Status RewriteJpeg(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                   std::string& reason);
Status FindPngMetadata(std::span<const uint8_t> file, MetadataViews& views);
Status RewritePng(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                  std::string& reason);
// A chunk of a PNG file, with its CRC; and the one for an XMP packet.
std::vector<uint8_t> MakePngChunk(std::string_view type, std::span<const uint8_t> data);
std::vector<uint8_t> MakePngXmpChunk(std::span<const uint8_t> packet);
Status FindWebpMetadata(std::span<const uint8_t> file, MetadataViews& views);
Status RewriteWebp(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                   std::string& reason);
// GIF has no EXIF. A file of the older version becomes one of 1989 with its first XMP.
Status FindGifMetadata(std::span<const uint8_t> file, MetadataViews& views);
Status RewriteGif(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                  std::string& reason);
Status FindPsdMetadata(std::span<const uint8_t> file, MetadataViews& views);
Status RewritePsd(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                  std::string& reason);
// The resources of a Photoshop file; empty if there are none that can be found.
std::span<const uint8_t> PsdResources(std::span<const uint8_t> file);

}  // namespace fotomill
