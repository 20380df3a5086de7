#include "cli/frame/result_output.h"

#include <algorithm>
#include <utility>

#include "batch/progress_model.h"
#include "cli/frame/shown_text.h"
#include "core/utf8.h"
#include "platform/process.h"
#include "texts/status_text.h"
#include "texts/texts.h"

namespace fotomill::cli {

namespace {

constexpr std::string_view kRed = "\x1b[31m", kPlain = "\x1b[0m";

void Write(std::FILE* stream, std::string_view text) {
  std::fwrite(text.data(), 1, text.size(), stream);
}

// JSON that also escapes DEL and C1 control characters, as it may be printed on a terminal.
std::string SafeJson(const Json& value) {
  const std::string text = value.dump(-1, ' ', false, Json::error_handler_t::replace);
  if (text.find('\x7F') == std::string::npos && text.find('\xC2') == std::string::npos) return text;
  std::string result;
  result.reserve(text.size());
  for (size_t i = 0; i < text.size(); ++i) {
    const auto byte = static_cast<uint8_t>(text[i]);
    const auto next = static_cast<uint8_t>(i + 1 < text.size() ? text[i + 1] : 0);
    char escaped[8];
    if (byte == 0x7F) {
      result += "\\u007f";
    } else if (byte == 0xC2 && next < 0xA0) {
      std::snprintf(escaped, sizeof escaped, "\\u00%02x", next);
      result += escaped;
      ++i;
    } else {
      result += text[i];
    }
  }
  return result;
}

}  // namespace

void PutName(Json& object, const std::string& key, std::string_view name) {
  object[key] = name;
  if (!IsUtf8(name)) object[key + "Bytes"] = Base64(name);
}

void PutStatus(Json& object, Status status) {
  object["status"] = StatusNumber(status);
  object["message"] = EnglishStatusText(status);
}

ResultOutput::ResultOutput(const CommandContext& context, bool json)
    : context_(context),
      json_(json),
      colored_(context.ColorOn(context.io.errTerminal)),
      progress_(context.io.err, context.ProgressOn()) {
  if (json_) Write(context_.io.out, "[");
}

ResultOutput::~ResultOutput() { EndArray(); }

std::string_view ResultOutput::NameOf(std::string_view name) const {
  return std::ranges::find(streams_, name) != streams_.end() ? "-" : name;
}

std::string ResultOutput::Shown(std::string_view name) const {
  name = NameOf(name);
  return context_.io.outTerminal ? EscapeControls(name) : std::string(name);
}

std::string ResultOutput::ShownMessage(std::string_view name) const {
  name = NameOf(name);
  return context_.io.errTerminal ? EscapeControls(name) : std::string(name);
}

void ResultOutput::ShowProgress(uint64_t done, uint64_t total) {
  if (expected_ != total) progress_.Begin(expected_ = total);
  progress_.Done(done);
}

void ResultOutput::Expect(uint64_t files) {
  counts_ = true;
  progress_.Begin(files);
}

void ResultOutput::MakeWay() {
  progress_.Clear();
  Deliver(true);
}

void ResultOutput::Line(std::string_view line) {
  ClearForResult();
  Write(context_.io.out, line);
  Write(context_.io.out, "\n");
  Deliver(false);
}

void ResultOutput::Element(const Json& element) {
  ClearForResult();
  Write(context_.io.out, begun_ ? ",\n" : "\n");
  Write(context_.io.out, SafeJson(element));
  Deliver(false);
  begun_ = true;
}

void ResultOutput::CountFile() {
  ++files_;
  if (counts_) progress_.Done(files_);
}

void ResultOutput::Failure(std::string_view name, Status status, std::string_view hint) {
  CountFile();
  ++failures_;
  std::string text = ShownMessage(name) + ": ";
  if (colored_) text += kRed;
  text += StatusText(status);
  if (colored_) text += kPlain;
  if (!hint.empty()) text += " " + ShownMessage(hint);
  Message(text);
}

void ResultOutput::FileDone(std::string_view file, std::string_view destination) {
  CountFile();
  if (!json_)
    return Line(destination.empty() ? Shown(file) : Shown(file) + " -> " + Shown(destination));
  Json element;
  PutName(element, "file", file);
  if (!destination.empty()) PutName(element, "destination", destination);
  PutStatus(element, Status::Ok);
  Element(element);
}

void ResultOutput::FileFailed(std::string_view file, Status status, std::string_view hint) {
  if (json_) {
    Json element;
    PutName(element, "file", file);
    PutStatus(element, status);
    Element(element);
  }
  Failure(file, status, hint);
}

void ResultOutput::Note(std::string_view text) {
  if (!context_.global.quiet) Message(text);
}

bool ResultOutput::GoesOn() const {
  if (platform::PendingExit() != 0) return false;
  return std::ferror(context_.io.out) == 0 || (keepsGoing_ && ReaderGone());
}

bool ResultOutput::ReaderGone() const {
  return (context_.io.out == stdout && platform::IsReaderGone(1)) ||
         (context_.io.out == stderr && platform::IsReaderGone(2));
}

int ResultOutput::Finish() {
  progress_.Clear();
  EndArray();
  const bool givenUp = !keepsGoing_ && std::ferror(context_.io.out) != 0 && ReaderGone();
  if (!context_.global.quiet && !givenUp) {
    if (failures_ > 0) Message(Tr(kErrorsLine));
    Message(failures_ == 0 ? CountLine(static_cast<uint32_t>(files_))
                           : TrCount("One file was processed, %2 failed.",
                                     "%1 files were processed, %2 failed.", files_, failures_));
  }
  return failures_ > 0 ? kExitFailed : kExitOk;
}

void ResultOutput::EndArray() {
  if (json_ && !ended_) {
    Write(context_.io.out, "\n]\n");
    Deliver(true);
  }
  ended_ = true;
  if (!closing_.empty()) Note(std::exchange(closing_, {}));
}

// Flushes earlier results first, so that both streams stay in order on a terminal.
void ResultOutput::Message(std::string_view text) {
  MakeWay();
  std::string line(text);
  line += "\n";
  Write(context_.io.err, line);
  std::fflush(context_.io.err);
}

// Clears the progress line before a result on a terminal.
void ResultOutput::ClearForResult() {
  if (context_.io.outTerminal) progress_.Clear();
}

// Flushes results, to files at most ten times a second: thousands of small writes cost more than
// some commands.
void ResultOutput::Deliver(bool now) {
  constexpr std::chrono::milliseconds kLongestWait{100};
  if (context_.io.outStored && !now) {
    const auto time = std::chrono::steady_clock::now();
    if (time - delivered_ < kLongestWait) return;
    delivered_ = time;
  }
  std::fflush(context_.io.out);
}

}  // namespace fotomill::cli
