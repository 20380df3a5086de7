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
inline constexpr uint32_t FMT_RENDERED = 0x2;  // complete after `info`; `read` is never called
inline constexpr uint32_t FMT_MULTI = 0x4;     // can hold more than one picture
// Left out of the destination list unless FMT_SAVE_ANYWAY is set.
inline constexpr uint32_t FMT_ANIMATED = 0x8;
inline constexpr uint32_t FMT_CLIPBOARD = 0x20;  // in no list and never matched by extension
inline constexpr uint32_t FMT_HIDDEN = 0x40;  // left out of other lists of formats
inline constexpr uint32_t FMT_PAGES = 0x100;  // of those with FMT_MULTI: the pictures are pages
inline constexpr uint32_t FMT_TIMED = 0x200;  // plays in time: frames or sound
inline constexpr uint32_t FMT_FRAMES = 0x400;  // of those with FMT_MULTI: the pictures are frames
// Left out of the open-file filter and the destination list.
inline constexpr uint32_t FMT_WALLPAPER = 0x800;
inline constexpr uint32_t FMT_CONTAINER = 0x1000;  // holds whole files
inline constexpr uint32_t FMT_PNG = 0x2000;
inline constexpr uint32_t FMT_SOUND = 0x4000;
inline constexpr uint32_t FMT_LAYERED = 0x8000;
inline constexpr uint32_t FMT_SECONDARY = 0x10000;  // left out of the destination list
inline constexpr uint32_t FMT_NO_OPEN = 0x20000;    // left out of the open-file filter
inline constexpr uint32_t FMT_TRANSPARENT = 0x40000;
inline constexpr uint32_t FMT_MEDIA = 0x80000;
inline constexpr uint32_t FMT_MIDI = 0x100000;  // music as notes
inline constexpr uint32_t FMT_SPARE = 0x200000;  // free slot for a plug-in format
inline constexpr uint32_t FMT_FLASH = 0x400000;
inline constexpr uint32_t FMT_ARCHIVE = 0x800000;  // an archive of files
// in the destination list whatever else is set
inline constexpr uint32_t FMT_SAVE_ANYWAY = 0x1000000;
inline constexpr uint32_t FMT_ALPHA = 0x2000000;        // stores an alpha channel

// Operations of a row. Codecs implement them as plain functions; none of them knows the registry.
// fills `detailLines` of a record that `info` has filled
using DetailsOperation = Status (*)(PictureRecord& picture);
// Fills the facts; no pixel is decoded, unless the row is rendered.
using InfoOperation = Status (*)(PictureRecord& picture, const ReadRequest& request);
// Fills the pixels.
using ReadOperation = Status (*)(PictureRecord& picture, const ReadRequest& request);
// to picture.fileName
using WriteOperation = Status (*)(PictureRecord& picture, const WriteOptions& options);
// opens a file's frames
using AnimateOperation = Status (*)(const ReadRequest& request, AnimationPointer& animation);
// Makes a copy of a file without EXIF, XMP, IPTC, comments and what else tells more than the
// picture shows; all pages, compressed pixels and the color profile stay as they are. DamagedFile
// (2), FileReadError (3) or UnsupportedFormat (8) for a file that is not laid out as expected.
using BareOperation = Status (*)(std::span<const uint8_t> file, std::vector<uint8_t>& bare);
// Begins a file that takes several pictures, one after the other.
using SequenceOperation = Status (*)(const std::string& path, const SequenceFacts& facts,
                                     const WriteOptions& options, SequencePointer& sequence);
using LifeOperation = int32_t (*)();  // once for each run of the program
// Modal over the parent window.
using OptionsOperation = int32_t (*)(void* parentWindow, int32_t parameter);

// How large a picture `write` makes, in pixels.
struct WriterLimits {
  int32_t width = INT32_MAX;
  int32_t height = INT32_MAX;
  bool exact = false;  // no other size either
  constexpr bool Allow(int32_t pictureWidth, int32_t pictureHeight) const {
    return exact ? pictureWidth == width && pictureHeight == height
                 : pictureWidth <= width && pictureHeight <= height;
  }
};

// What files of a format begin with: one text, and where that says too little a second one further
// on.
struct Signature {
  size_t offset = 0;
  std::string_view bytes = {};
  std::string_view name =
      {};  // what such a file is, as people say: "TIFF", "an icon". Empty: another format is better known for it
  size_t secondOffset = 0;
  std::string_view second = {};
};

// A key of the configuration that matters to a codec.
struct FormatSetting {
  std::string_view key = {};  // "JpegCompression"
  const char* label = "";     // of its control in Setup; empty for a key that Setup shows elsewhere
};

// The settings of a codec. Setup shows those with a label under one heading; the format's own box
// shows all.
struct FormatSettings {
  const char* extension;  // names the format in the box's title
  const char* box;        // the box's name, "OverrideJpgBox"
  const char* group;      // the heading in Setup
  std::span<const FormatSetting> keys = {};
};

// A library that a codec uses.
struct FormatLibrary {
  const char* name;
  std::string (*version)();
  const char* purpose;  // the formats that it serves
};

// Everything that `keepsMetadata` can say; the bits are those of PictureRecord::lostMetadata.
inline constexpr uint8_t kAllMetadata =
    kLostExif | kLostXmp | kLostIcc | kLostComment | kLostMakerNote | kLostGrayIcc;

// What a row says when its files can be read but not written.
inline constexpr std::string_view kOnlyRead = TrLater("Files of this format can only be read.");

// One row of the registry: everything that the program knows about a format. A family of codecs has
// its rows in formats/FAMILY/rows.cpp.
struct FormatEntry {
  DetailsOperation details = nullptr;
  InfoOperation info = nullptr;
  ReadOperation read = nullptr;
  WriteOperation write = nullptr;
  LifeOperation startup = nullptr;
  LifeOperation shutdown = nullptr;
  uint32_t reserved = 0;
  // Deepest picture that `write` takes, bits per pixel, and the largest. The registry checks both
  // before it calls `write`.
  uint32_t maxBits = 0;
  WriterLimits limits = {};
  PathText extension = {};             // upper case, without the dot
  PathText description = {};           // as shown to the user
  int32_t enabled = 0;                 // the user's switch, 1 or 0
  uint32_t flags = 0;                  // FMT_ bits
  OptionsOperation options = nullptr;  // the row's override dialog, set by the desktop

  AnimateOperation animate = nullptr;
  bool canRead = false;          // `info` and `read` do their work in this build
  bool canWrite = false;         // so does `write`
  bool canStartUp = false;       // so does `startup`
  // What `info` and `read` leave to a child process; null: they work in this one.
  const platform::ApartTask* childTask = nullptr;
  // whether what the codec loads when it is needed is on this machine; null: nothing is
  bool (*present)() = nullptr;
  std::string_view whyNot = {};  // why the row cannot be read or cannot be written, in one sentence
  std::span<const Signature> signatures = {};
  // kLost bits: what its files can hold, and so does not get lost
  uint8_t keepsMetadata = 0;
  BareOperation bare = nullptr;
  bool bareKeepsOrientation = false;  // it is a part of the picture's own directory
  SequenceOperation sequence = nullptr;
  bool turnsWithoutLoss = false;             // JPEG files, which are turned without being decoded
  // `write` protects files by the password of its options
  bool takesPassword = false;
  bool hasOptionsBox = false;                // the row gets `options`
  const FormatSettings* settings = nullptr;  // shared by the rows of one codec; null: none
  std::span<const FormatLibrary> libraries = {};
};

}  // namespace fotomill
