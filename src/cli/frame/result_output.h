#pragma once

#include <chrono>
#include <cstdint>
#include <nlohmann/json.hpp>
#include <string>
#include <string_view>

#include "cli/frame/command.h"
#include "cli/frame/terminal_progress.h"
#include "core/status.h"

namespace fotomill::cli {

// Members keep the order in which they were set.
using Json = nlohmann::ordered_json;

// Sets `key` to a name. One that is not UTF-8 also sets `key` + "Bytes", its bytes in base64; `key` then has U+FFFD in
// the places that are none.
void PutName(Json& object, const std::string& key, std::string_view name);
// Sets `status` and `message`.
void PutStatus(Json& object, Status status);

// The output of one command over many things, in the order in which they happen: results on the standard output, as
// lines or as one JSON array with an element a line, and messages on the standard error. Nothing is held back,
// except that results for a file are written a few times a second only.
class ResultOutput {
 public:
  ResultOutput(const CommandContext& context, bool json);
  ResultOutput(const ResultOutput&) = delete;
  ResultOutput& operator=(const ResultOutput&) = delete;
  ~ResultOutput();  // ends the array, whatever happened

  // Whether results are elements of a JSON array.
  bool IsJson() const { return json_; }
  // A name as a line shows it: escaped on a terminal, byte for byte elsewhere.
  std::string Shown(std::string_view name) const;
  // The same for messages.
  std::string ShownMessage(std::string_view name) const;

  // One result line, without its end; the caller has escaped what needs it. Not for JSON.
  void Line(std::string_view line);
  // One element of the array. Only for JSON.
  void Element(const Json& element);
  // Counts a thing that was dealt with: the closing line tells how many there were.
  void CountFile();
  // The message of a file that failed, "NAME: MESSAGE", with a hint behind it where there is one. Counts it as well.
  void Failure(std::string_view name, Status status, std::string_view hint = {});
  // A remark on the standard error that is no failure; left out by --quiet.
  void Note(std::string_view text);
  // A line on the standard error.
  void Message(std::string_view text);

  // How far the command is, for who watches it on a terminal: told each time, or counted by itself up to `files`.
  void ShowProgress(uint64_t done, uint64_t total);
  void Expect(uint64_t files);
  // Time to tell the time again.
  void Tick() { progress_.Tick(); }
  // Everything printed so far is on its way, and the line of the progress is gone: before a question.
  void MakeWay();

  // False once the standard output takes nothing more, or the user has asked the program to end: loops over files end
  // then.
  bool GoesOn() const;
  bool Failed() const { return failures_ > 0; }
  // Ends the array, prints the closing lines ("There were errors", "3 files were processed.") and returns the exit
  // status.
  int Finish();
  // Ends the array: no results come any more.
  void EndArray();

 private:
  void ClearForResult();
  void Deliver(bool now);

  const CommandContext& context_;
  const bool json_;
  bool colored_;
  bool begun_ = false;  // the array has an element
  bool ended_ = false;
  std::chrono::steady_clock::time_point delivered_;
  TerminalProgress progress_;
  uint64_t expected_ = 0;
  bool counts_ = false;  // how far it is shows by the files that were counted
  uint64_t files_ = 0;
  uint64_t failures_ = 0;
};

}  // namespace fotomill::cli
