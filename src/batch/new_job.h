#pragma once

#include "batch/job.h"
#include "batch/sequential_rename.h"

namespace fotomill {

// Where jobs are made, and the only place of the batch that knows the settings. All of this belongs
// to the main thread.

// A job with the policies, names and options of the settings in force. It runs with them, whatever
// is changed until it does, and keeps permanently by StoreRemembered what its user changes on the
// way.
BatchJob NewBatchJob();
// The keys of the progress box, as they are in force.
ProgressSettings ProgressSettingsFromSettings();
// The SequentialRename... keys.
SequentialRenameRules SequentialRenameRulesFromSettings();

// Stores what is remembered under its key. What cannot be written holds for this run at least.
void StoreRemembered(Remembered what, int32_t value);

}  // namespace fotomill
