#pragma once

#include <string>

#include "platform/shared_library.h"
#include "plugins/fotomill_plugin.h"
#include "plugins/module_facts.h"

namespace fotomill {

// A module's exports, in lookup order; missing ones are null. Those from getLibraries on are of the
// newer interface.
struct PluginExports {
  FMW_GET_VERSION getVersion = nullptr;
  FMW_GET_COPYRIGHT getCopyright = nullptr;
  FMW_GET_PARAMS getParams = nullptr;
  FMW_READ_IMAGE readImage = nullptr;
  FMW_WRITE_IMAGE writeImage = nullptr;
  FMW_GET_INFO getInfo = nullptr;
  FMW_GET_COMMENT getComment = nullptr;
  FMW_CONFIGURE_CALL configure = nullptr;
  FMW_GET_LIBRARIES getLibraries = nullptr;
  FMW_GET_OPTIONS getOptions = nullptr;
  FMW_GET_METADATA getMetadata = nullptr;
  FMW_READ_IMAGE_12 readImage12 = nullptr;
  FMW_WRITE_IMAGE_12 writeImage12 = nullptr;
  FMW_WRITE_ANIMATION writeAnimation = nullptr;
  FMW_TRANSCODE transcode = nullptr;
};

// A module that is loaded into this process, as long as the object lives.
struct LoadedModule {
  platform::SharedLibrary library;
  PluginExports exports;
};

// Loads a module and asks it about itself. False if it cannot be loaded, lacks a required export or
// declines; `error` then has the system's message, if there is one.
bool LoadModule(const std::string& path, LoadedModule& module, ModuleFacts& facts,
                std::string& error);

}  // namespace fotomill
