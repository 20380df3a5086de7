#pragma once

#include <cstdint>
#include <optional>
#include <span>
#include <string>
#include <vector>

#include "containers/file_pieces.h"
#include "core/status.h"

namespace fotomill {

// Files with other blocks of metadata: everything else is the same bytes in the same order, what is
// behind the end of the picture included.

// What becomes of each block: none: it stays; empty: it goes; else it takes the place of the one
// that is there, or is added.
struct MetadataBlocks {
  std::optional<std::vector<uint8_t>> exif = {};  // from its byte order on
  std::optional<std::vector<uint8_t>> xmp = {};   // the packet
};

// The blocks of a file; empty without one. Views into the file.
struct MetadataViews {
  std::span<const uint8_t> exif, xmp;
};

// Each finds a file's blocks, and makes the new file from parts of the old one, which must stay.
// DamagedFile (2) or FileReadError (3) for a file that is not laid out as its format says,
// UnsuitableImage (13) where it cannot hold the blocks or would lose something, with a reason, a
// whole sentence.
Status FindJpegMetadata(std::span<const uint8_t> file, MetadataViews& views);
Status RewriteJpeg(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                   std::string& reason);
Status FindPngMetadata(std::span<const uint8_t> file, MetadataViews& views);
Status RewritePng(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                  std::string& reason);
Status FindWebpMetadata(std::span<const uint8_t> file, MetadataViews& views);
Status RewriteWebp(std::span<const uint8_t> file, const MetadataBlocks& blocks, FilePieces& made,
                   std::string& reason);

}  // namespace fotomill
