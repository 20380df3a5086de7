#include "plugins/module_call.h"

#include "core/shown_text.h"
#include "platform/paths.h"
#include "plugins/bad_modules.h"
#include "texts/texts.h"

namespace fotomill {

namespace {

std::recursive_mutex& CallMutex() {  // recursive: a module may load pictures
  static std::recursive_mutex mutex;
  return mutex;
}

platform::ModuleRisk RiskOf(const std::string& path, ModuleStage stage) {
  const std::string name = EscapeControls(platform::FileNameOf(path));
  platform::ModuleRisk risk;
  if (stage == ModuleStage::Working) {
    risk.message = Tr("fotomill: The plug-in %1 ended the program.", name);
    return risk;
  }
  risk.message =
      Tr("fotomill: The plug-in %1 ended the program. It will not be loaded again.", name);
  risk.recordFile = BadModuleFile();
  risk.record = BadModuleLine(path);
  return risk;
}

}  // namespace

ModuleCall::ModuleCall(const std::string& modulePath, ModuleStage stage)
    : lock_(CallMutex()), guard_(RiskOf(modulePath, stage)) {}

}  // namespace fotomill
