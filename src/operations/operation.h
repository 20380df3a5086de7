#pragma once

#include <cstdint>
#include <functional>
#include <span>
#include <string>
#include <string_view>

#include "core/status.h"
#include "operations/parameter.h"
#include "picture/picture_record.h"
#include "processing/bands.h"
#include "processing/color/point_effect.h"
#include "processing/faces/face_options.h"

// One row per operation: this is all that the command line, recipes, dialogs and tests know of it.
//
// Kernels, the functions that compute pixels, are in src/processing (and src/drawing), take plain
// numbers and know nothing of this table. The rows are in this room, one file a family
// (families/*.cpp), because a family may need more than pixels: fonts, another picture, EXIF. Each
// file ends with one function that hands out its rows; operations.cpp joins them.
// docs/dev/processing.md shows how to add an operation.
namespace fotomill {

// Families in the order of lists. A run's output prefix is that of its first operation's family.
enum class Family : uint8_t { Crop, Transform, Effects, Filter, Annotate, Watermark, Matt };
std::string_view FamilyName(Family family);  // "crop", ...

// How an operation works, which tells the engine what it may do with it.
enum class Works : uint8_t {
  Point,         // a new color from an old color: fused with neighbors, applied to palettes
  Colors,        // chooses new colors for the whole picture: reduce, mono
  Geometry,      // moves pixels; the size may change
  Neighborhood,  // each pixel depends on those within `reach`; the size stays
  WholePicture,  // anything else
};
// "point", "palette", "geometry", "neighborhood", "whole picture"
std::string_view WorksName(Works works);

// What texts of a step may say about the picture: expands macros. The engine sets it.
using TextExpander =
    std::function<std::string(const std::string& text, const PictureRecord& picture)>;

// What surrounds one call.
struct OperationContext {
  Work work;
  // A preview computes only part of a picture: the place of the record's pixel (0, 0) in the whole
  // picture and the whole's size. Operations whose result depends on the position add these.
  // `whole` is the record's own size otherwise.
  int32_t left = 0, top = 0;
  Size whole{0, 0};
  TextExpander expand = {};  // empty: texts are taken as they are
  FaceOptions faces = {};    // for operations that look for faces

  // A text with its macros replaced by facts of the picture.
  std::string Expanded(const std::string& text, const PictureRecord& picture) const {
    return expand ? expand(text, picture) : text;
  }
};

// Changes the picture in place: `image`, `alpha`, `palette`, `width`, `height` and `bitsPerPixel`
// stay consistent. On failure the picture is whole, but may have been promoted. Metadata is the
// engine's. EmptyImage (31) when nothing is left of the picture or there is none,
// MemoryAllocationError (6) when the result cannot be held, FunctionCancelled (4) when stopped.
using ApplyFunction = Status (*)(PictureRecord& picture, const Arguments& arguments,
                                 const OperationContext& context);
// Fills in the effect of a point operation.
using PointFunction = void (*)(const Arguments& arguments, PointEffect& effect);
// How many pixels around a pixel count for it, at most.
using ReachFunction = int32_t (*)(const Arguments& arguments);
// What is wrong with the arguments together, once each of them is right: a sentence without the
// operation's name, and the parameter that it is about; empty when nothing is.
struct ArgumentProblem {
  std::string parameter;
  RecordedText message;
};
// Called once each argument is right.
using CheckFunction = ArgumentProblem (*)(const Arguments& arguments);

// Whether an operation with these arguments moves or cuts off pixels and gives none another color.
using MovesFunction = bool (*)(const Arguments& arguments);
// The side of the square that an operation needs a picture for when it comes first: a decoder may
// deliver any smaller size whose longer edge is at least twice this. `whole` is the picture's own
// size. 0: every pixel counts.
using DecodedSideFunction = int32_t (*)(const Arguments& arguments, Size whole,
                                        const PictureMetadata& metadata);

// One operation: a constant row.
struct Operation {
  const char* name;     // lower case, words joined by hyphens
  Family family;
  const char* label;    // in menus: "Gaussian blur"
  const char* help;     // one or two sentences
  const char* example;  // a line of a recipe that works on any picture
  std::span<const Parameter> parameters;
  Works works;
  ApplyFunction apply = nullptr;  // all but point operations
  PointFunction point = nullptr;  // point operations
  ReachFunction reach = nullptr;  // neighborhood operations
  CheckFunction check = nullptr;  // may be missing
  MovesFunction moves = nullptr;  // missing: it never does
  DecodedSideFunction decodedSide = nullptr;  // may be missing: every pixel counts
};

}  // namespace fotomill
