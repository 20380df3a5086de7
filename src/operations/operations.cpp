#include "operations/operations.h"

#include <vector>

namespace fotomill {

namespace {

// To add an operation, only change the file of its family.
constexpr std::span<const Operation> (*kFamilies[])() = {
    CropOperations,   TransformOperations, EffectOperations,    PaletteOperations, FilterOperations,
    DistortOperations, AnnotateOperations, WatermarkOperations, MattOperations,
};

}  // namespace

std::string_view FamilyName(Family family) {
  constexpr std::string_view kNames[] = {"crop",     "transform", "effects", "filter",
                                         "annotate", "watermark", "matt"};
  return kNames[static_cast<size_t>(family)];
}

std::string_view WorksName(Works works) {
  constexpr std::string_view kNames[] = {"point", "palette", "geometry", "neighborhood",
                                         "whole picture"};
  return kNames[static_cast<size_t>(works)];
}

std::span<const Operation* const> Operations() {
  static const std::vector<const Operation*> all = [] {
    std::vector<const Operation*> operations;
    for (const auto family : kFamilies) {
      for (const Operation& operation : family()) operations.push_back(&operation);
    }
    return operations;
  }();
  return all;
}

const Operation* FindOperation(std::string_view name) {
  for (const Operation* operation : Operations()) {
    if (operation->name == name) return operation;
  }
  return nullptr;
}

}  // namespace fotomill
