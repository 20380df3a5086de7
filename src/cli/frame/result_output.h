#pragma once

#include <chrono>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>
#include <vector>

#include "cli/frame/command.h"
#include "cli/frame/terminal_progress.h"
#include "core/status.h"

namespace fotomill::cli {

// Keeps members in insertion order.
using Json = nlohmann::ordered_json;

// Sets `key` to a name. If it is not UTF-8, `key` has U+FFFD for invalid bytes, and `key` + "Bytes"
// is set to its bytes in base64.
void PutName(Json& object, const std::string& key, std::string_view name);
// Sets `status` and `message`; the message is always in English.
void PutStatus(Json& object, Status status);

// The output of a command, in order: results on standard output, as lines or as a JSON array with
// one element per line, and messages on standard error. Results are buffered only if they go to a
// file, for up to a tenth of a second.
class ResultOutput {
 public:
  // `json`: print results as one JSON document.
  ResultOutput(const CommandContext& context, bool json);
  ResultOutput(const ResultOutput&) = delete;
  ResultOutput& operator=(const ResultOutput&) = delete;
  ~ResultOutput();  // closes the array

  // Whether results are printed as JSON.
  bool IsJson() const { return json_; }
  // A name for a result line: escaped on a terminal, else byte for byte.
  std::string Shown(std::string_view name) const;
  // The same for messages.
  std::string ShownMessage(std::string_view name) const;

  // From now on, results and messages show "-" for the file at `path`, which represents a standard
  // stream.
  void ShowAsStream(const std::string& path) { streams_.push_back(path); }
  // The name of a file in results.
  std::string_view NameOf(std::string_view name) const;
  // For commands that change files: continue even if standard output fails.
  void KeepGoing() { keepsGoing_ = true; }

  // Prints a result line, already escaped, without line end. Not for JSON.
  void Line(std::string_view line);
  // Prints an array element. Only for JSON.
  void Element(const Json& element);
  // Counts a processed file for the summary.
  void CountFile();
  // Prints the message for a failed file, "NAME:
  // MESSAGE", with the hint, if any, and counts it.
  void Failure(std::string_view name, Status status, std::string_view hint = {});
  // Reports a processed file: a result line, "FILE" or "FILE -> DESTINATION", or an element {file,
  // destination, status, message}. Counts it.
  void FileDone(std::string_view file, std::string_view destination = {});
  // Reports a failed file: as Failure, in JSON also with an element.
  void FileFailed(std::string_view file, Status status, std::string_view hint = {});
  // Prints a note on standard error; suppressed by --quiet.
  void Note(std::string_view text);
  // Sets a note to print after the last result.
  void CloseWith(std::string note) { closing_ = std::move(note); }
  // Prints a line on standard error.
  void Message(std::string_view text);

  // Sets the progress; or let CountFile count up to `files`.
  void ShowProgress(uint64_t done, uint64_t total);
  void Expect(uint64_t files);  // number of files for CountFile
  // Redraws the progress if due.
  void Tick() { progress_.Tick(); }
  // Flushes all output and clears the progress line, before a prompt.
  void MakeWay();

  // False after standard output failed or the user interrupted the program; loops over files must
  // end then.
  bool GoesOn() const;
  uint64_t Failures() const { return failures_; }  // number of failed files
  bool Failed() const { return failures_ > 0; }  // the exit status will not be 0
  // Closes the array, prints the summary ("There were errors", "3 files were processed.") and
  // returns the exit status.
  int Finish();
  // Closes the array; no more results may follow.
  void EndArray();

 private:
  void ClearForResult();
  void Deliver(bool now);
  bool ReaderGone() const;

  const CommandContext& context_;
  const bool json_;
  bool keepsGoing_ = false;
  std::vector<std::string> streams_;
  bool colored_;
  bool begun_ = false;  // the array has elements
  bool ended_ = false;
  std::string closing_;
  std::chrono::steady_clock::time_point delivered_;
  TerminalProgress progress_;
  uint64_t expected_ = 0;
  bool counts_ = false;  // CountFile updates the progress
  uint64_t files_ = 0;
  uint64_t failures_ = 0;
};

}  // namespace fotomill::cli
