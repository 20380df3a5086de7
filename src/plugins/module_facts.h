#pragma once

#include <array>
#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "plugins/fotomill_plugin.h"

namespace fotomill {

// An option of a module; see FMW_OPTION.
struct ModuleOption {
  std::string name, label;
  int32_t kind = FMW_OPTION_NUMBER;
  int32_t least = 0, most = 0, standard = 0;
  std::vector<std::string> choices;

  // The nearest value that the option can have.
  int32_t Nearest(int32_t value) const;
};

using ModuleOptionValues = std::array<int32_t, FMW_OPTION_COUNT>;

// What a module says about itself.
struct ModuleFacts {
  std::string textA, textB;  // name of the module, description of its formats
  std::string extensions;    // separated by ";"
  uint32_t flags1 = 0;       // maximum bits per pixel the writer accepts
  uint32_t flags2 = 0;       // FMW_FORMAT_ bits
  bool writes = false, hasComments = false, hasDialog = false, hasMetadata = false;
  bool takesMetadata = false;  // the writer is that of the newer interface
  bool writesFrames = false;
  bool transcodes = false;
  std::string version, copyright;
  std::string libraries;  // a line each: name, version, license, separated by tabs
  std::vector<ModuleOption> options;
};

// Facts as text, a line "KEY=VALUE" each, and back. False for text that no program has written.
std::string FactsAsText(const ModuleFacts& facts);
bool FactsFromText(std::string_view text, ModuleFacts& facts);

// Item `index` of a list separated by one or more ";", empty if out of range.
std::string_view ListItem(std::string_view list, int32_t index);

}  // namespace fotomill
