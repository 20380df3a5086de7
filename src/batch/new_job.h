#pragma once

#include "batch/job.h"
#include "batch/rename/sequential_rename.h"

namespace fotomill {

// Creates jobs from the settings; the only part of the batch code that accesses them. Main thread
// only.

// A job with the current policies, names and options. Later
// changes to the settings do not affect it; changes made by
// the user during the job are saved with StoreRemembered.
BatchJob NewBatchJob();
// The current keys of the progress box.
ProgressSettings ProgressSettingsFromSettings();
// The SequentialRename... keys.
SequentialRenameRules SequentialRenameRulesFromSettings();

// Saves a value under its key. If it cannot be written, it applies to this run only.
void StoreRemembered(Remembered what, int32_t value);

}  // namespace fotomill
