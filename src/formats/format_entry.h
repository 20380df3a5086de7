#pragma once

#include <cstddef>
#include <cstdint>
#include <span>
#include <string>
#include <string_view>
#include <vector>

#include "core/fixed_text.h"
#include "core/status.h"
#include "picture/animation.h"
#include "picture/picture_record.h"
#include "picture/read_request.h"
#include "picture/sequence.h"
#include "picture/write_options.h"
#include "texts/texts.h"

namespace fotomill::platform {
struct ApartTask;
}

namespace fotomill {

// Capability bits of a format row.
inline constexpr uint32_t FMT_BITMAP = 0x1;
inline constexpr uint32_t FMT_RENDERED = 0x2;  // fully decoded by `info`; `read` is never called
inline constexpr uint32_t FMT_MULTI = 0x4;     // may contain several pictures
// Excluded from the destination list unless FMT_SAVE_ANYWAY is set.
inline constexpr uint32_t FMT_ANIMATED = 0x8;
inline constexpr uint32_t FMT_CLIPBOARD = 0x20;  // not in any list and never matched by extension
inline constexpr uint32_t FMT_HIDDEN = 0x40;  // excluded from other lists of formats
inline constexpr uint32_t FMT_PAGES = 0x100;  // with FMT_MULTI: the pictures are pages
inline constexpr uint32_t FMT_TIMED = 0x200;  // time-based: frames or sound
inline constexpr uint32_t FMT_FRAMES = 0x400;  // with FMT_MULTI: the pictures are frames
// Excluded from the open-file filter and the destination list.
inline constexpr uint32_t FMT_WALLPAPER = 0x800;
inline constexpr uint32_t FMT_CONTAINER = 0x1000;  // contains complete files
inline constexpr uint32_t FMT_PNG = 0x2000;
inline constexpr uint32_t FMT_SOUND = 0x4000;
inline constexpr uint32_t FMT_LAYERED = 0x8000;
inline constexpr uint32_t FMT_SECONDARY = 0x10000;  // excluded from the destination list
inline constexpr uint32_t FMT_NO_OPEN = 0x20000;    // excluded from the open-file filter
inline constexpr uint32_t FMT_TRANSPARENT = 0x40000;
inline constexpr uint32_t FMT_MEDIA = 0x80000;
inline constexpr uint32_t FMT_MIDI = 0x100000;  // MIDI music
inline constexpr uint32_t FMT_SPARE = 0x200000;  // free slot for a plug-in format
inline constexpr uint32_t FMT_FLASH = 0x400000;
inline constexpr uint32_t FMT_ARCHIVE = 0x800000;  // an archive of files
// in the destination list regardless of other flags
inline constexpr uint32_t FMT_SAVE_ANYWAY = 0x1000000;
inline constexpr uint32_t FMT_ALPHA = 0x2000000;        // supports an alpha channel

// Operations of a row, implemented by codecs as plain functions; codecs do not depend on the
// registry. Fills `detailLines` of a record after `info`
using DetailsOperation = Status (*)(PictureRecord& picture);
// Fills the header fields without decoding pixels, unless the row is rendered.
using InfoOperation = Status (*)(PictureRecord& picture, const ReadRequest& request);
// Decodes the pixels.
using ReadOperation = Status (*)(PictureRecord& picture, const ReadRequest& request);
// to picture.fileName
using WriteOperation = Status (*)(PictureRecord& picture, const WriteOptions& options);
// opens a file for frame-by-frame reading
using AnimateOperation = Status (*)(const ReadRequest& request, AnimationPointer& animation);
// Copies a file without EXIF, XMP, IPTC, comments and other private data; pages, compressed pixels
// and the color profile are unchanged. DamagedFile (2), FileReadError (3) or UnsupportedFormat (8)
// if the file has an unexpected structure.
using BareOperation = Status (*)(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
// Starts a file with several pictures.
using SequenceOperation = Status (*)(const std::string& path, const SequenceFacts& facts,
                                     const WriteOptions& options, SequencePointer& sequence);
using LifeOperation = int32_t (*)();  // once per run of the program
// Modal over the parent window.
using OptionsOperation = int32_t (*)(void* parentWindow, int32_t parameter);

// Maximum picture size for `write`, in pixels.
struct WriterLimits {
  int32_t width = INT32_MAX;
  int32_t height = INT32_MAX;
  bool exact = false;  // the only size possible
  constexpr bool Allow(int32_t pictureWidth, int32_t pictureHeight) const {
    return exact ? pictureWidth == width && pictureHeight == height
                 : pictureWidth <= width && pictureHeight <= height;
  }
};

// A signature of a format's files: a byte string,
// plus optionally a second one at another offset.
struct Signature {
  size_t offset = 0;
  std::string_view bytes = {};
  std::string_view name =
      {};  // common name: "TIFF", "an icon"; empty: the signature of a better-known format
  size_t secondOffset = 0;
  std::string_view second = {};
};

// A configuration key used by a codec.
struct FormatSetting {
  std::string_view key = {};  // "JpegCompression"
  const char* label = "";     // of its control in Setup; empty if Setup shows the key elsewhere
};

// The settings of a codec. Setup shows those with a label under one heading; the format's options
// box shows all.
struct FormatSettings {
  const char* extension;  // names the format in the title of the box
  const char* box;        // name of the box, "OverrideJpgBox"
  const char* group;      // heading in Setup
  std::span<const FormatSetting> keys = {};
};

// A library that a codec uses.
struct FormatLibrary {
  const char* name;
  std::string (*version)();
  const char* purpose;  // the formats it is used for
};

// All bits of `keepsMetadata`, which are those of PictureRecord::lostMetadata.
inline constexpr uint8_t kAllMetadata =
    kLostExif | kLostXmp | kLostIcc | kLostComment | kLostMakerNote | kLostGrayIcc;

// Message for read-only formats.
inline constexpr std::string_view kOnlyRead = TrLater("Files of this format can only be read.");

// One row of the registry: everything the program knows about a format. A codec family's rows are
// in formats/FAMILY/rows.cpp.
struct FormatEntry {
  DetailsOperation details = nullptr;
  InfoOperation info = nullptr;
  ReadOperation read = nullptr;
  WriteOperation write = nullptr;
  LifeOperation startup = nullptr;
  LifeOperation shutdown = nullptr;
  uint32_t reserved = 0;
  // Maximum bits per pixel for `write`, and the maximum size. The registry checks both before
  // calling `write`.
  uint32_t maxBits = 0;
  WriterLimits limits = {};
  PathText extension = {};             // uppercase, without the dot
  PathText description = {};           // for display
  int32_t enabled = 0;                 // the user's switch, 1 or 0
  uint32_t flags = 0;                  // FMT_ bits
  OptionsOperation options = nullptr;  // the row's options dialog, set by the desktop

  AnimateOperation animate = nullptr;
  bool canRead = false;          // `info` and `read` are implemented in this build
  bool canWrite = false;         // likewise `write`
  bool canStartUp = false;       // likewise `startup`
  // The task that `info` and `read` run in a child process; null if none.
  const platform::ApartTask* childTask = nullptr;
  // whether libraries loaded at run time are installed; null if there are none
  bool (*present)() = nullptr;
  std::string_view whyNot = {};  // why the row cannot be read or written, in one sentence
  std::span<const Signature> signatures = {};
  // kLost bits: metadata the format can store
  uint8_t keepsMetadata = 0;
  BareOperation bare = nullptr;
  bool bareKeepsOrientation = false;  // it is part of the picture's own directory
  SequenceOperation sequence = nullptr;
  bool turnsWithoutLoss = false;             // lossless rotation, for JPEG files
  // `write` supports encryption with the password in its options
  bool takesPassword = false;
  bool hasOptionsBox = false;                // `options` will be set
  const FormatSettings* settings = nullptr;  // shared by the rows of a codec; null if none
  std::span<const FormatLibrary> libraries = {};
};

}  // namespace fotomill
