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

// One row per operation: all that the command line, recipes, dialogs and tests know about it.
//
// Kernels, the functions that compute pixels, are in src/processing and src/drawing; they take
// plain numbers and do not depend on this table. Its rows are in families/*.cpp, one file per
// family, as operations may need more than pixels: fonts, another picture, EXIF. Each file ends
// with a function that returns its rows; operations.cpp combines them. See docs/dev/processing.md
// for how to add an operation.
namespace fotomill {

// Families in list order. The first operation's family decides the prefix of the output name.
enum class Family : uint8_t { Crop, Transform, Effects, Filter, Annotate, Watermark, Matt };
std::string_view FamilyName(Family family);  // "crop", ...

// How an operation works; decides what the engine may optimize.
enum class Works : uint8_t {
  Point,         // maps each color on its own: can be fused, and applied to palettes
  Colors,        // chooses new colors for the whole picture: reduce, mono
  Geometry,      // moves pixels; may change the size
  Neighborhood,  // each pixel depends on others within `reach`; keeps the size
  WholePicture,  // anything else
};
// "point", "palette", "geometry", "neighborhood", "whole picture"
std::string_view WorksName(Works works);

// Expands the macros in a text about the picture. Set by the engine.
using TextExpander =
    std::function<std::string(const std::string& text, const PictureRecord& picture)>;

// The environment of a call.
struct OperationContext {
  Work work;
  // Previews compute only part of a picture: position of pixel (0, 0) in the whole picture, and the
  // size of the whole. For operations that depend on the position. Otherwise 0, 0 and the picture's
  // own size.
  int32_t left = 0, top = 0;
  Size whole{0, 0};
  TextExpander expand = {};  // empty: texts are used unchanged
  FaceOptions faces = {};    // for operations that detect faces

  // A text with its macros expanded.
  std::string Expanded(const std::string& text, const PictureRecord& picture) const {
    return expand ? expand(text, picture) : text;
  }
};

// Changes the picture in place; `image`, `alpha`, `palette`, `width`, `height` and `bitsPerPixel`
// stay consistent. On failure the picture is still valid, but may have been promoted. The engine
// updates metadata. EmptyImage (31) if there is no picture or nothing is left of it,
// MemoryAllocationError (6) if the result is too large, FunctionCancelled (4) if stopped.
using ApplyFunction = Status (*)(PictureRecord& picture, const Arguments& arguments,
                                 const OperationContext& context);
// Sets the effect of a point operation.
using PointFunction = void (*)(const Arguments& arguments, PointEffect& effect);
// The largest distance of pixels that influence a pixel.
using ReachFunction = int32_t (*)(const Arguments& arguments);
// An invalid combination of arguments: a sentence without the operation's name, and the parameter
// it is about; empty if valid.
struct ArgumentProblem {
  std::string parameter;
  RecordedText message;
};
// Called if each argument is valid.
using CheckFunction = ArgumentProblem (*)(const Arguments& arguments);

// Whether these arguments only move or crop pixels, without changing any color.
using MovesFunction = bool (*)(const Arguments& arguments);
// For an operation that comes first: the side of the square for which it needs a picture. A decoder
// may deliver any smaller size whose longer edge is at least twice this. `whole` is the original
// size. 0: full size needed.
using DecodedSideFunction = int32_t (*)(const Arguments& arguments, Size whole,
                                        const PictureMetadata& metadata);

// An operation: a constant row.
struct Operation {
  const char* name;     // lowercase, words joined by hyphens
  Family family;
  const char* label;    // in menus: "Gaussian blur"
  const char* help;     // one or two sentences
  const char* example;  // a recipe line that works on any picture
  std::span<const Parameter> parameters;
  Works works;
  ApplyFunction apply = nullptr;  // all but point operations
  PointFunction point = nullptr;  // point operations
  ReachFunction reach = nullptr;  // neighborhood operations
  CheckFunction check = nullptr;  // optional
  MovesFunction moves = nullptr;  // null: never
  DecodedSideFunction decodedSide = nullptr;  // null: full size needed
};

}  // namespace fotomill
