#include "batch/job.h"

#include <algorithm>

#include "settings/settings.h"

namespace fotomill {

namespace {

constexpr int32_t kDigits = 4;

}  // namespace

OverwritePolicy OverwritePolicyFromSettings() {
  return {.prompt = settings.PromptBeforeOverwrite != 0,
          .keepBoth = settings.OverwriteKeepBoth != 0,
          .recycle = settings.OverwritePromptRecycle != 0,
          .previews = settings.OverwritePromptPreviews != 0};
}

NamingRules NamingRulesFromSettings() {
  return {.extensionCase = settings.ExtensionCaseStyle,
          .askName = settings.PromptForDestName != 0,
          .beside = settings.DestForceSourceDir != 0,
          .askPassword = settings.PasswordProtect != 0,
          .firstVariant = settings.NumberedVariantMin,
          .lastVariant = settings.NumberedVariantMax};
}

SequentialRenameState SequentialRenameFromSettings() {
  return {.number = static_cast<uint32_t>(std::max(settings.SequentialRenameBaseNumber, 0)),
          .digits = kDigits,
          .baseName = settings.SequentialRenameBaseName};
}

}  // namespace fotomill
