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

// A picture ready to be written.
struct PreparedOutput {
  PictureRecord& picture;
  const OutputTarget& target;
  std::vector<uint8_t> file = {};  // not empty: the complete file; nothing is encoded
  bool asSource = false;           // JPEG: encode with the quality of the source
  bool transparency = false;       // transparency not supported by the format
  bool allPages = false;           // the file has all pages of the source
  RecordedText note = {};          // remarks
  RecordedText detail = {};        // what was done to it
};

// Creates and writes the outputs of a run after their names are chosen. Thread-safe.
class OutputWriter {
 public:
  // Both must outlive this object.
  OutputWriter(const BatchFunction& function, const BatchJob& job)
      : function_(function), job_(job) {}

  // Applies the output's transform, then fits the picture to its format: orientation, colors,
  // depth. TooManyColors (12), UnsuitableImage (13) and the transform's statuses, with a hint.
  Status Prepare(PreparedOutput& output, std::string& hint) const;
  // As Prepare, but for a picture without pixels.
  Status Plan(const PictureRecord& picture, const OutputTarget& target, std::string& hint) const;
  // Writes an output. If a codec supports fewer colors than its row says, they are reduced step by
  // step, if allowed. Statuses of WritePicture, with a hint.
  Status Write(const PreparedOutput& output, const Destination& destination,
               std::string& hint) const;
  // The result of Write, as far as it depends on the destination.
  Status PlanFile(const PreparedOutput& output, const Destination& destination,
                  std::string& hint) const;
  // Names what is missing in a written output compared to its source; empty for nothing.
  RecordedText Note(const PreparedOutput& output) const;

  // Whether Prepare turns pictures upright: only if nothing but their metadata is removed, as their
  // files may be turned losslessly.
  bool TurnsItself() const;

 private:
  // Whether to create the folder of an output if it is missing.
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
