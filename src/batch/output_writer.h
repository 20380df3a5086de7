#pragma once

#include <cstdint>
#include <string>
#include <vector>

#include "batch/destination_name.h"
#include "batch/output_target.h"
#include "batch/run.h"
#include "picture/sequence.h"
#include "picture/write_options.h"
#include "texts/texts.h"

namespace fotomill {

// A picture on its way into a file.
struct PreparedOutput {
  PictureRecord& picture;
  const OutputTarget& target;
  std::vector<uint8_t> file = {};  // not empty: the whole file, nothing is encoded
  bool asSource = false;           // JPEG with the quality of its source
  bool transparency = false;       // which the format cannot hold
  bool allPages = false;           // the file has every page of the source
  RecordedText note = {};          // what is remarkable about it
  RecordedText detail = {};        // what was done to it
};

// How the outputs of a run are made and written once they have a name. Threads may share one.
class OutputWriter {
 public:
  // Both must outlive it.
  OutputWriter(const BatchFunction& function, const BatchJob& job)
      : function_(function), job_(job) {}

  // The output's own work on a picture, then what its format asks for: orientation, colors, depth.
  // TooManyColors (12), UnsuitableImage (13) and whatever the work returns, with a hint.
  Status Prepare(PreparedOutput& output, std::string& hint) const;
  // What Prepare would return for a picture of which only the facts are known.
  Status Plan(const PictureRecord& picture, const OutputTarget& target, std::string& hint) const;
  // Writes it. Codecs may take fewer colors than their row says; they are reduced step by step
  // then, where that is allowed. Statuses as WritePicture, with a hint.
  Status Write(const PreparedOutput& output, const Destination& destination,
               std::string& hint) const;
  // What Write would return, as far as the place of the output decides.
  Status PlanFile(const PreparedOutput& output, const Destination& destination,
                  std::string& hint) const;
  // Names what of the source a written output does not have; empty for nothing.
  RecordedText Note(const PreparedOutput& output) const;

  // Whether Prepare turns pictures that are to be upright: those that lose their metadata and
  // nothing else, as their files may be turned without loss.
  bool TurnsItself() const;

 private:
  // Whether the folder of an output is made if it is missing.
  bool MakesFolder(const Destination& destination, const OutputTarget& target) const;
  bool Reduces(const OutputTarget& target) const { return function_.reduce || target.kept; }
  bool KeepsMetadata() const { return function_.keepMetadata && job_.encode.preserveMetadata; }
  bool TurnsUpright() const { return job_.turnsUpright || function_.autoOrient; }
  bool OnlyDropsMetadata(const PictureRecord& picture, const OutputTarget& target) const;
  Status FitPage(PictureRecord& picture, const OutputTarget& target, std::string& hint) const;
  Status AddPage(SequenceWriter& sequence, PictureRecord& picture, int32_t delayMs,
                 const OutputTarget& target, std::string& hint) const;
  Status WriteSequence(const PreparedOutput& output, const Destination& destination,
                       const WriteOptions& options, std::string& hint) const;
  Status WriteFile(const PreparedOutput& output, const Destination& destination,
                   std::string& hint) const;
  WriteOptions OptionsFor(const PreparedOutput& output, const Destination& destination) const;
  std::string Hint(const Destination& destination, Status status, const PictureRecord& picture,
                   const OutputTarget& target) const;

  const BatchFunction& function_;
  const BatchJob& job_;
};

}  // namespace fotomill
