#pragma once

#include <string>

#include "batch/destination_name.h"
#include "batch/output_target.h"
#include "batch/run.h"

namespace fotomill {

// How the outputs of a run are made and written once they have a name. Threads may share one.
class OutputWriter {
 public:
  // Both must outlive it.
  OutputWriter(const BatchFunction& function, const BatchJob& job)
      : function_(function), job_(job) {}

  // The output's own work on a picture, then what its format asks for: orientation, colors, depth.
  // TooManyColors (12), UnsuitableImage (13) and whatever the work returns, with a hint.
  Status Prepare(PictureRecord& picture, const OutputTarget& target, std::string& hint) const;
  // What Prepare would return for a picture of which only the facts are known.
  Status Plan(const PictureRecord& picture, const OutputTarget& target, std::string& hint) const;
  // Writes it. Codecs may take fewer colors than their row says; they are reduced step by step
  // then, where that is allowed. Statuses as WritePicture, with a hint.
  Status Write(PictureRecord& picture, const Destination& destination, const OutputTarget& target,
               std::string& hint) const;
  // What Write would return, as far as the place of the output decides.
  Status PlanFile(const PictureRecord& picture, const Destination& destination,
                  const OutputTarget& target, std::string& hint) const;
  // Names what the format could not store, for a written output; empty for nothing.
  RecordedText Note(const PictureRecord& picture, const Destination& destination) const;

 private:
  // Whether the folder of an output is made if it is missing.
  bool MakesFolder(const Destination& destination, const OutputTarget& target) const;
  bool Reduces(const OutputTarget& target) const { return function_.reduce || target.kept; }
  Status WriteFile(PictureRecord& picture, const Destination& destination,
                   const OutputTarget& target, std::string& hint) const;
  std::string Hint(const Destination& destination, Status status, const PictureRecord& picture,
                   const OutputTarget& target) const;

  const BatchFunction& function_;
  const BatchJob& job_;
};

}  // namespace fotomill
