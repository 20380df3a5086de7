#include "plugins/loaded_module.h"

#include <algorithm>
#include <cstring>
#include <string_view>
#include <type_traits>

namespace fotomill {

namespace {

// Texts from modules may lack the terminating NUL.
template <size_t size>
std::string_view TextOf(const char (&text)[size]) {
  const std::string_view whole(text, size - 1);
  return whole.substr(0, whole.find('\0'));
}

constexpr size_t kLongestText = 4096;  // of a version, a copyright, a label

std::string TextOf(const char* text) {
  return text == nullptr ? std::string() : std::string(text, strnlen(text, kLongestText));
}

// Sets a function of a module, by the type of its pointer.
template <class Pointer>
void LookUp(const platform::SharedLibrary& library, const char* name, Pointer& function) {
  function = library.FunctionNamed<std::remove_pointer_t<Pointer>>(name);
}

void LookUpExports(LoadedModule& module) {
  const platform::SharedLibrary& library = module.library;
  LookUp(library, "PLUGIN11GetVersion", module.exports.getVersion);
  LookUp(library, "PLUGIN11GetCopyright", module.exports.getCopyright);
  LookUp(library, "PLUGIN11GetPluginParams", module.exports.getParams);
  LookUp(library, "PLUGIN11ReadImage", module.exports.readImage);
  LookUp(library, "PLUGIN11WriteImage", module.exports.writeImage);
  LookUp(library, "PLUGIN11GetInfo", module.exports.getInfo);
  LookUp(library, "PLUGIN11GetComment", module.exports.getComment);
  LookUp(library, "PLUGIN11DoConfigure", module.exports.configure);
  LookUp(library, "PLUGIN12GetLibraries", module.exports.getLibraries);
  LookUp(library, "PLUGIN12GetOptions", module.exports.getOptions);
  LookUp(library, "PLUGIN12GetMetadata", module.exports.getMetadata);
  LookUp(library, "PLUGIN12ReadImage", module.exports.readImage12);
  LookUp(library, "PLUGIN12WriteImage", module.exports.writeImage12);
  LookUp(library, "PLUGIN12WriteAnimation", module.exports.writeAnimation);
  LookUp(library, "PLUGIN12Transcode", module.exports.transcode);
}

ModuleOption TakeOption(const FMW_OPTION& given) {
  ModuleOption option;
  option.name = TextOf(given.name);
  option.label = TextOf(given.label);
  option.kind = given.kind;
  option.least = given.least;
  option.most = given.most;
  const std::string choices = TextOf(given.choices);
  if (option.kind == FMW_OPTION_CHOICE) {
    for (int32_t i = 0; !ListItem(choices, i).empty(); ++i)
      option.choices.emplace_back(ListItem(choices, i));
  }
  option.standard = option.Nearest(given.standard);
  return option;
}

void TakeOptions(const LoadedModule& module, ModuleFacts& facts) {
  if (module.exports.getOptions == nullptr) return;
  int32_t count = 0;
  const FMW_OPTION* options = module.exports.getOptions(&count);
  if (options == nullptr) return;
  count = std::clamp(count, 0, FMW_OPTION_COUNT);
  for (int32_t i = 0; i < count; ++i) facts.options.push_back(TakeOption(options[i]));
}

bool TakeParams(const LoadedModule& module, ModuleFacts& facts) {
  FMW_PLUGIN_PARAMS params = {};
  params.size = sizeof params;
  params.version = FMW_PLUGIN_VERSION;
  if (module.exports.getParams(&params, 0) == 0) return false;
  facts.textA = TextOf(params.textA);
  facts.textB = TextOf(params.textB);
  facts.extensions = TextOf(params.extensions);
  facts.flags1 = params.flags1;
  facts.flags2 = params.flags2;
  return !ListItem(facts.extensions, 0).empty();
}

}  // namespace

bool LoadModule(const std::string& path, LoadedModule& module, ModuleFacts& facts,
                std::string& error) {
  if (!module.library.Load(path)) {
    error = module.library.Error();
    return false;
  }
  LookUpExports(module);
  const PluginExports& exports = module.exports;
  if (exports.getParams == nullptr || exports.readImage == nullptr || exports.getInfo == nullptr ||
      !TakeParams(module, facts))
    return false;
  facts.writes = exports.writeImage != nullptr || module.exports.writeImage12 != nullptr;
  facts.hasComments = exports.getComment != nullptr;
  facts.hasDialog = exports.configure != nullptr;
  facts.hasMetadata = module.exports.getMetadata != nullptr;
  facts.takesMetadata = module.exports.writeImage12 != nullptr;
  facts.writesFrames = exports.writeAnimation != nullptr;
  facts.transcodes = module.exports.transcode != nullptr;
  if (exports.getVersion != nullptr) facts.version = TextOf(exports.getVersion());
  if (exports.getCopyright != nullptr) facts.copyright = TextOf(exports.getCopyright());
  if (exports.getLibraries != nullptr) facts.libraries = TextOf(exports.getLibraries());
  TakeOptions(module, facts);
  return true;
}

}  // namespace fotomill
