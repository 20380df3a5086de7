#include "batch/new_job.h"

#include <algorithm>

#include "settings/configuration.h"
#include "settings/job_options.h"
#include "settings/key_table.h"
#include "settings/settings.h"

namespace fotomill {

namespace {

// In the order of PrefixedFunction.
constexpr SettingPrefix Settings::*kPrefixes[] = {
    &Settings::PrefixAnnotate,
    &Settings::PrefixCatalog,
    &Settings::PrefixCrop,
    &Settings::PrefixDuplicate,
    &Settings::PrefixEffects,
    &Settings::PrefixFilter,
    &Settings::PrefixMatt,
    &Settings::PrefixSocialMedia,
    &Settings::PrefixTransform,
    &Settings::PrefixWatermark,
    &Settings::SupercompressorSaveFilePrefix,
};
static_assert(std::size(kPrefixes) == kPrefixedFunctionCount);

struct FunctionPrefix {
  FileFunction function;
  PrefixedFunction prefix;
};
constexpr FunctionPrefix kFunctionPrefixes[] = {
    {FileFunction::Annotate, PrefixedFunction::Annotate},
    {FileFunction::Catalog, PrefixedFunction::Catalog},
    {FileFunction::Crop, PrefixedFunction::Crop},
    {FileFunction::Effects, PrefixedFunction::Effects},
    {FileFunction::Filter, PrefixedFunction::Filter},
    {FileFunction::Matt, PrefixedFunction::Matt},
    {FileFunction::Transform, PrefixedFunction::Transform},
    {FileFunction::Watermark, PrefixedFunction::Watermark},
};

OverwritePolicy OverwritePolicyFromSettings() {
  return {.prompt = settings.PromptBeforeOverwrite != 0,
          .keepBoth = settings.OverwriteKeepBoth != 0,
          .recycle = settings.OverwritePromptRecycle != 0,
          .previews = settings.OverwritePromptPreviews != 0};
}

// Applies FilenameUnderbars to a prefix: if off, replaces underscores with single blanks.
std::string WithUnderbars(std::string_view prefix) {
  std::string text(prefix);
  if (settings.FilenameUnderbars != 0 || text.find('_') == std::string::npos) return text;
  std::ranges::replace(text, '_', ' ');
  const auto both = [](char a, char b) { return a == ' ' && b == ' '; };
  text.erase(std::ranges::unique(text, both).begin(), text.end());
  return text;
}

NamingOptions NamingOptionsFromSettings() {
  NamingOptions naming{.extensionCase = settings.ExtensionCaseStyle,
                       .askName = settings.PromptForDestName != 0,
                       .beside = settings.DestForceSourceDir != 0,
                       .askPassword = settings.PasswordProtect != 0,
                       .confirmFormat = settings.WarnDestinationWrite != 0,
                       .firstVariant = settings.NumberedVariantMin,
                       .lastVariant = settings.NumberedVariantMax};
  for (size_t i = 0; i < kPrefixedFunctionCount; ++i)
    naming.prefixes[i].AssignCut(WithUnderbars(settings.*kPrefixes[i]));
  return naming;
}

KeyNumber NumberOf(Remembered what) {
  switch (what) {
    case Remembered::PromptBeforeOverwrite: return KeyNumber::PromptBeforeOverwrite;
    case Remembered::OverwriteKeepBoth: return KeyNumber::OverwriteKeepBoth;
    case Remembered::OverwriteRecycle: return KeyNumber::OverwritePromptRecycle;
    case Remembered::OverwritePreviews: return KeyNumber::OverwritePromptPreviews;
    case Remembered::NextRenameNumber: break;
  }
  return KeyNumber::SequentialRenameBaseNumber;
}

}  // namespace

std::string_view NamingOptions::PrefixOf(FileFunction function) const {
  const auto* const found =
      std::ranges::find(kFunctionPrefixes, function, &FunctionPrefix::function);
  return found == std::end(kFunctionPrefixes) ? std::string_view() : PrefixOf(found->prefix);
}

BatchJob NewBatchJob() {
  BatchJob job;
  job.overwrite = OverwritePolicyFromSettings();
  job.faces = FaceOptionsFromSettings();
  if (settings.MultipleImageGIF != 0) job.everyPage.push_back("GIF");
  if (settings.IconCompleteStack != 0) job.everyPage.push_back("ICO");
  job.naming = NamingOptionsFromSettings();
  job.read = ReadOptionsFromSettings();
  job.encode = EncodeOptionsFromSettings();
  job.reduction = ReduceOptionsFromSettings();
  job.boxSettings = ProgressSettingsFromSettings();
  job.historyFunctions = static_cast<uint32_t>(settings.FileHistoryFunctions);
  job.writeComments = WritesCommentsFromSettings();
  job.turnsUpright = settings.ExifAdjustOrientation != 0;
  job.remember = StoreRemembered;
  return job;
}

ProgressSettings ProgressSettingsFromSettings() {
  return {.closeWhenDone = settings.CloseProgressWhenDone != 0,
          .optimizeWindow = settings.ProgressOptimizeWindow != 0,
          .thumbnails = settings.ProgressThumbnails != 0,
          .showMissingThumbnails = settings.ProgressShowMissingThumbnails != 0};
}

SequentialRenameRules SequentialRenameRulesFromSettings() {
  return {.baseName = std::string(settings.SequentialRenameBaseName),
          .number = static_cast<uint32_t>(std::max(settings.SequentialRenameBaseNumber, 0)),
          .increment = static_cast<uint32_t>(std::max(settings.SequentialRenameIncrement, 1)),
          .maxAttempts = static_cast<uint32_t>(std::max(settings.SequentialRenameMaxAttempts, 1)),
          .separator = settings.SequentialRenameHyphen != 0
                           ? std::string(settings.SequentialRenameSep)
                           : std::string(),
          .numberFirst = settings.SequentialRenamePrefix != 0,
          .skipColliding = settings.SequentialRenameSkipCollide != 0,
          .update = settings.SequentialRenameUpdate != 0,
          .random = settings.SequentialRenameRandom != 0};
}

void StoreRemembered(Remembered what, int32_t value) {
  const KeyRow& row = KeyOf(NumberOf(what));
  SettingValue stored;
  stored.number = value;
  if (StoreSetting(row, stored) != SaveResult::Done) StoreNumber(row, value);
}

}  // namespace fotomill
