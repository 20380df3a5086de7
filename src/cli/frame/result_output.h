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

// Members keep the order in which they were set.
using Json = nlohmann::ordered_json;

// Sets `key` to a name. If it is not UTF-8, also sets `key` + "Bytes" to its bytes in base64; `key`
// then has U+FFFD in place of invalid bytes.
void PutName(Json& object, const std::string& key, std::string_view name);
// Sets `status` and `message`; the message is English in every language.
void PutStatus(Json& object, Status status);

// The output of one command, in order: results on standard output, as lines or as one JSON array
// with one element per line, and messages on standard error. Only results that go to a file are
// buffered, for a tenth of a second.
class ResultOutput {
 public:
  // `json`: results are one JSON document instead of lines.
  ResultOutput(const CommandContext& context, bool json);
  ResultOutput(const ResultOutput&) = delete;
  ResultOutput& operator=(const ResultOutput&) = delete;
  ~ResultOutput();  // ends the array

  // Whether results are elements of a JSON array.
  bool IsJson() const { return json_; }
  // A name for a result line: escaped on a terminal, else byte for byte.
  std::string Shown(std::string_view name) const;
  // The same for messages.
  std::string ShownMessage(std::string_view name) const;

  // From here on results and messages call the file at `path` "-": it stands for a standard stream.
  void ShowAsStream(const std::string& path) { streams_.push_back(path); }
  // The name of a file in results.
  std::string_view NameOf(std::string_view name) const;
  // The command changes files: it finishes its work although no one reads the results any more.
  void KeepGoing() { keepsGoing_ = true; }

  // One result line, without line end, already escaped. Not for JSON.
  void Line(std::string_view line);
  // One element of the array. Only for JSON.
  void Element(const Json& element);
  // Counts a processed file, for the closing line.
  void CountFile();
  // Prints the message of a failed file, "NAME: MESSAGE", followed by the hint if any, and counts
  // it.
  void Failure(std::string_view name, Status status, std::string_view hint = {});
  // A file that is done: a result line, "FILE" or "FILE -> DESTINATION", or an element {file,
  // destination, status, message}; counted.
  void FileDone(std::string_view file, std::string_view destination = {});
  // A file that failed: as Failure, with an element of its own in JSON.
  void FileFailed(std::string_view file, Status status, std::string_view hint = {});
  // A note on standard error, not a failure; suppressed by --quiet.
  void Note(std::string_view text);
  // A note to be printed once after the last result.
  void CloseWith(std::string note) { closing_ = std::move(note); }
  // A line on standard error.
  void Message(std::string_view text);

  // Progress on a terminal: either set each time, or counted by CountFile up to `files`.
  void ShowProgress(uint64_t done, uint64_t total);
  void Expect(uint64_t files);  // how many files CountFile will count
  // Redraws the progress if it is time.
  void Tick() { progress_.Tick(); }
  // Flushes everything and clears the progress line, before a question.
  void MakeWay();

  // False once standard output fails or the user has interrupted the program: loops over files end
  // then.
  bool GoesOn() const;
  uint64_t Failures() const { return failures_; }  // files that failed
  bool Failed() const { return failures_ > 0; }  // a file failed, so the exit status is not 0
  // Ends the array, prints the closing lines ("There were errors", "3 files were processed.") and
  // returns the exit status.
  int Finish();
  // Ends the array; no more results follow.
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
  bool begun_ = false;  // the array has an element
  bool ended_ = false;
  std::string closing_;
  std::chrono::steady_clock::time_point delivered_;
  TerminalProgress progress_;
  uint64_t expected_ = 0;
  bool counts_ = false;  // CountFile drives the progress
  uint64_t files_ = 0;
  uint64_t failures_ = 0;
};

}  // namespace fotomill::cli
