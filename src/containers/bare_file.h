#pragma once

#include <cstdint>
#include <span>
#include <vector>

#include "containers/file_pieces.h"
#include "core/status.h"

namespace fotomill {

// Copies of files stripped of private data: EXIF, XMP, IPTC, comments, texts, thumbnails, dates,
// and everything not known to belong to the picture. Compressed pixels, palette, transparency,
// frames, pages, resolution and color profile are copied byte for byte. `bare` receives the new
// file. DamagedFile (2) or FileReadError (3) if the file's structure is invalid; nothing is
// decoded, so damaged pixels go unnoticed.

// What to keep, and what to add.
struct BareOptions {
  bool profile = true;      // the color profile
  bool orientation = true;  // of directories, where it is part of the picture's own
  bool texts = false;       // JPEG comments, PNG texts other than XMP
  bool iptc = false;        // in JPEG and TIFF
  bool xmp = false;         // in TIFF directories; added anew in other formats
  // JPEG: new blocks, starting at the byte order; empty: none
  std::span<const uint8_t> newExif = {}, newXmp = {};
};

// Also removes everything after the end of the picture: further pictures, movies.
Status MakeBareJpeg(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
Status MakeBarePng(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
Status MakeBareWebp(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
// Directories and values keep their offsets, and removed ones are overwritten with zeros; the file
// is truncated after the last byte in use. The orientation is kept, as it is part of the picture's
// own directory. Also for HD Photo. UnsuitableImage (13) for camera raw pictures, which cannot be
// decoded without their metadata.
Status MakeBareTiff(std::span<const uint8_t> file, std::vector<uint8_t>& bare);

// As above, with options; a JPEG file as parts of the old one, which must outlive them.
Status MakeBareJpeg(std::span<const uint8_t> file, const BareOptions& options, FilePieces& bare);
Status MakeBarePng(std::span<const uint8_t> file, const BareOptions& options,
                   std::vector<uint8_t>& bare);
Status MakeBareWebp(std::span<const uint8_t> file, const BareOptions& options,
                    std::vector<uint8_t>& bare);
Status MakeBareTiff(std::span<const uint8_t> file, const BareOptions& options,
                    std::vector<uint8_t>& bare);
// Repetitions are kept; comments if `texts` is on.
Status MakeBareGif(std::span<const uint8_t> file, const BareOptions& options,
                   std::vector<uint8_t>& bare);
// Layers are part of the picture, with whatever they contain.
Status MakeBarePsd(std::span<const uint8_t> file, const BareOptions& options,
                   std::vector<uint8_t>& bare);
// Whether a resource is always kept there; the profile is not.
bool IsPsdPictureResource(uint16_t number);

}  // namespace fotomill
