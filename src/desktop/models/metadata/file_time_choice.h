#pragma once

#include <functional>
#include <span>
#include <string>
#include <vector>

#include "core/workers/stop_token.h"
#include "files/file_time_change.h"
#include "metadata/tags/picture_tags.h"

namespace fotomill::desktop {

// Where new file times come from.
enum class FileTimeSource {
  Taken,      // when each picture was taken
  Given,      // a given time
  FirstFile,  // the time of the first file; the others follow
};

// New times for files, as in the controls of a window.
struct FileTimeChoice {
  FileTimeSource source = FileTimeSource::Taken;
  std::string time;       // Given: "2024-05-31 14:03:09", local time
  bool sequence = false;  // each file is later than the one before; Given, and always FirstFile
  std::string step;       // by that: "0:00:10", or seconds
  bool modification = true, access = false;  // the times that are set
};

// From the FileTime keys; without a stored time, the current one. And the other way round, except
// for the source; a time or step that is not valid is not stored.
FileTimeChoice FileTimeChoiceFromSettings();
void StoreFileTimeChoice(const FileTimeChoice& choice);

// The rule for a choice. Returns what is wrong with it, a sentence; empty if nothing.
std::string ReadFileTimeRule(const FileTimeChoice& choice, FileTimeRule& rule);

// A file with its old and new time, as texts.
struct FileTimeRow {
  std::string path;
  std::string before, after;  // may be empty if there is a problem
  std::string problem;  // why it keeps its time, a sentence; else empty
};
// Computes the new times without setting them, and reports each file in turn. May take long; any
// thread.
void PreviewFileTimes(std::span<const std::string> files, const FileTimeRule& rule,
                      const TagSources& sources, const StopToken& stop,
                      const std::function<void(const FileTimeRow& row)>& report);

}  // namespace fotomill::desktop
