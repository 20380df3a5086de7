#pragma once

#include <cstdint>
#include <string>

#include "core/status.h"
#include "core/workers/stop_token.h"
#include "metadata/tags/picture_tags.h"
#include "picture/read_request.h"
#include "processing/faces/face_options.h"

namespace fotomill {

// Parts of PictureFacts, from the cheapest to read to the most expensive one.
inline constexpr uint32_t kFactsTags = 1;
inline constexpr uint32_t kFactsHeader = 2;  // format and size of the picture
inline constexpr uint32_t kFactsFaces = 4;   // decodes the picture
inline constexpr uint32_t kFactsDamage = 8;  // decodes all pages

// What a search needs to know about a picture file.
struct PictureFacts {
  uint32_t parts = 0;  // which of the following are known

  // kFactsTags
  PictureTags tags = {};

  // kFactsHeader
  Status header = Status::Ok;     // DamagedFile or FileReadError: the rest is unknown
  std::string format = {};        // extension of the format's row
  int32_t width = 0, height = 0;  // of the first page, as stored

  // kFactsFaces
  int32_t faces = 0;
  uint32_t faceKey = 0;  // digest of the FaceOptions they were found with

  // kFactsDamage
  Status decoded = Status::Ok;

  bool operator==(const PictureFacts&) const = default;
};

// The settings that facts depend on.
struct FactsOptions {
  ReadOptions read = {};
  FaceOptions faces = {};
  TagSources tags = {};
  StopToken stop = {};
};

// The digest of the options for PictureFacts::faceKey.
uint32_t FaceKeyOf(const FaceOptions& options);

// Reads the missing ones of `parts` and adds them. A damaged picture is Ok, with its status in the
// facts; other failures leave the part unknown: FileOpenError (1), MemoryAllocationError (6),
// UnsupportedFormat (8), FeatureDisabled (22) if a library or the face detector is not installed,
// FunctionCancelled (4).
Status ReadPictureFacts(const std::string& path, uint32_t parts, const FactsOptions& options,
                        PictureFacts& facts);

}  // namespace fotomill
