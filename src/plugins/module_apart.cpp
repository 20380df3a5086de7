#include "plugins/module_apart.h"

#include <algorithm>
#include <cstring>
#include <optional>

#include "core/limits.h"
#include "plugins/module_messages.h"
#include "plugins/plugin_bitmap.h"

namespace fotomill {

ModuleLimits moduleLimits;

namespace {

using platform::ApartKind;
using platform::ApartResult;
using platform::SharedBlock;

constexpr uint64_t kMostFacts = 1 << 20;  // bytes

std::vector<uint8_t> RequestBytes(ModuleOrder order, const std::string& module,
                                  const std::string& file, const std::string& destination = {}) {
  order.moduleSize = static_cast<uint32_t>(module.size());
  order.fileSize = static_cast<uint32_t>(file.size());
  order.destinationSize = static_cast<uint32_t>(destination.size());
  std::vector<uint8_t> bytes(sizeof order);
  std::memcpy(bytes.data(), &order, sizeof order);
  for (const std::string* text : {&module, &file, &destination})
    bytes.insert(bytes.end(), text->begin(), text->end());
  return bytes;
}

// Passes the numbers that the worker process sends on to the listener.
class SignalReader {
 public:
  SignalReader(ModuleListener* listener, const SharedBlock& reply)
      : listener_(listener), reply_(reply) {}
  void Take(int32_t number) {
    if (listener_ == nullptr) return;
    if (done_) {
      listener_->Step(*done_, number);
      done_.reset();
    } else if (number >= 0) {
      done_ = number;
    } else if (number == kModuleBegins) {
      listener_->Begin();
    } else if (number == kModuleEnds) {
      listener_->End();
    } else if (number == kModuleSaysText) {
      const auto* text = reinterpret_cast<const char*>(reply_.Bytes().data() + kModuleTextPlace);
      listener_->SetText(std::string(text, strnlen(text, kModuleTextSize)).c_str());
    }
  }

 private:
  ModuleListener* listener_;
  const SharedBlock& reply_;
  std::optional<int32_t> done_;
};

// Limits and rights of a call.
struct CallKind {
  unsigned seconds = 0;
  ApartKind kind = ApartKind::Module;
  Status broken = Status::DamagedFile;  // if the process dies
};

ApartResult Run(const std::vector<uint8_t>& request, std::span<const uint8_t> input,
                const CallKind& kind, const ApartSurroundings& surroundings, SharedBlock& reply,
                ModuleAnswer& answer) {
  SignalReader signals(surroundings.listener, reply);
  const ApartResult result =
      platform::RunApart({.task = kModuleTask.name,
                          .request = request,
                          .input = input,
                          .reply = reply,
                          .seconds = kind.seconds,
                          .patience = kind.seconds * moduleLimits.patience,
                          .kind = kind.kind,
                          .memory = moduleLimits.memory,
                          .goesOn = [&surroundings] { return !surroundings.stop.Asked(); }},
                         [&signals](int32_t number) { signals.Take(number); });
  if (result == ApartResult::Done) std::memcpy(&answer, reply.Bytes().data(), sizeof answer);
  return result;
}

Status StatusOf(ApartResult result, const ModuleAnswer& answer, Status broken) {
  switch (result) {
    case ApartResult::Done: return answer.loaded != 0 ? answer.status : Status::FeatureDisabled;
    case ApartResult::Failed:
    case ApartResult::NotStarted: return Status::MemoryAllocationError;
    case ApartResult::Stopped: return Status::FunctionCancelled;
    case ApartResult::Broken: break;
  }
  return broken;
}

// Takes results one after the other from behind the answer; shorter than claimed at the end.
class ResultReader {
 public:
  explicit ResultReader(const SharedBlock& reply) : rest_(reply.Bytes()) {
    rest_ = rest_.subspan(std::min(rest_.size(), kModuleAnswerBytes));
  }
  std::span<const uint8_t> Take(uint64_t size) {
    const auto taken = rest_.first(static_cast<size_t>(std::min<uint64_t>(size, rest_.size())));
    rest_ = rest_.subspan(taken.size());
    return taken;
  }
  void Take(uint64_t size, std::vector<uint8_t>& bytes) {
    const auto taken = Take(size);
    if (taken.size() <= limits.metadataBytes) bytes.assign(taken.begin(), taken.end());
  }

 private:
  std::span<const uint8_t> rest_;
};

ModuleOrder OrderOf(ModuleOperation operation, const ModuleQuestion& question) {
  ModuleOrder order;
  order.operation = operation;
  order.page = question.page;
  order.wantedSide = question.wantedSide;
  order.options = question.options;
  return order;
}

unsigned SecondsFor(unsigned atLeast, int32_t width, int32_t height) {
  const uint64_t pixels = static_cast<uint64_t>(width) * static_cast<uint64_t>(height);
  return atLeast + static_cast<unsigned>(pixels / moduleLimits.pixelsPerSecond);
}

unsigned SecondsForFrames(const FrameFacts& frames) {
  constexpr uint64_t kMost = 86400;
  const uint64_t pixels =
      static_cast<uint64_t>(frames.width) * static_cast<uint64_t>(frames.height);
  const uint64_t more = pixels * frames.delays.size() / moduleLimits.pixelsPerSecond;
  return moduleLimits.writeSeconds + static_cast<unsigned>(std::min(more, kMost));
}

void Put(std::span<const uint8_t> bytes, std::span<uint8_t>& target) {
  std::ranges::copy(bytes, target.begin());
  target = target.subspan(bytes.size());
}

}  // namespace

FactsResult AskFactsApart(const std::string& module, ModuleFacts& facts, std::string& error) {
  SharedBlock reply;
  if (!reply.Allocate(kModuleAnswerBytes + kMostFacts)) return FactsResult::Unasked;
  ModuleAnswer answer;
  const ApartResult result =
      Run(RequestBytes({}, module, {}), {}, {moduleLimits.describeSeconds}, {}, reply, answer);
  if (result == ApartResult::Broken || result == ApartResult::Failed) return FactsResult::Crashed;
  if (result != ApartResult::Done) return FactsResult::Unasked;
  if (answer.loaded == 0) {
    error.assign(answer.text, strnlen(answer.text, sizeof answer.text));
    return FactsResult::Declined;
  }
  const auto text = ResultReader(reply).Take(answer.bitmap);
  return FactsFromText({reinterpret_cast<const char*>(text.data()), text.size()}, facts)
             ? FactsResult::Known
             : FactsResult::Declined;
}

Status DescribeApart(const std::string& module, const ModuleQuestion& question,
                     const ApartSurroundings& surroundings, ModuleDescription& description) {
  SharedBlock reply;
  if (!reply.Allocate(kModuleAnswerBytes + 4 * limits.metadataBytes))
    return Status::MemoryAllocationError;
  ModuleAnswer answer;
  const ApartResult result =
      Run(RequestBytes(OrderOf(ModuleOperation::Describe, question), module, question.fileName),
          surroundings.configuration, {moduleLimits.describeSeconds}, surroundings, reply, answer);
  RETURN_IF_BAD(StatusOf(result, answer, Status::DamagedFile));
  description.info = answer.info;
  description.pages = answer.pages;
  description.rounds = answer.rounds;
  description.lost = answer.lost;
  ResultReader results(reply);
  results.Take(answer.exif, description.exif);
  results.Take(answer.xmp, description.xmp);
  results.Take(answer.icc, description.icc);
  results.Take(answer.comment, description.comment);
  results.Take(answer.delays, description.delays);
  return Status::Ok;
}

Status ReadApart(const std::string& module, const ModuleQuestion& question, int32_t width,
                 int32_t height, const ApartSurroundings& surroundings, ApartBitmap& bitmap) {
  RETURN_IF_BAD(CheckPackedSize(width, height, 24));
  const uint64_t largest = LargestModuleBitmap(width, height);
  RETURN_IF_BAD(CheckFileMemory(2 * largest));
  if (!bitmap.block.Allocate(kModuleAnswerBytes + largest)) return Status::MemoryAllocationError;
  ModuleOrder order = OrderOf(ModuleOperation::Read, question);
  order.commentSize = question.comment.size();
  std::vector<uint8_t> input(surroundings.configuration.begin(), surroundings.configuration.end());
  input.insert(input.end(), question.comment.begin(), question.comment.end());
  ModuleAnswer answer;
  const ApartResult result = Run(RequestBytes(order, module, question.fileName), input,
                                 {SecondsFor(moduleLimits.readSeconds, width, height)},
                                 surroundings, bitmap.block, answer);
  RETURN_IF_BAD(StatusOf(result, answer, Status::DamagedFile));
  bitmap.bytes = ResultReader(bitmap.block).Take(answer.bitmap);
  return Status::Ok;
}

Status WriteApart(const std::string& module, const ModuleOutput& output, const PackedImage& image,
                  const PackedImage& alpha, const ApartSurroundings& surroundings) {
  const std::string_view comment = output.comment == nullptr ? "" : output.comment;
  ModuleOrder order;
  order.operation = ModuleOperation::Write;
  order.quality = output.quality;
  order.lossless = output.lossless ? 1 : 0;
  order.dpiX = output.dpiX;
  order.dpiY = output.dpiY;
  order.options = output.options;
  order.bitmap = ModuleBitmapSize(image, alpha);
  order.exif = output.exif.size();
  order.xmp = output.xmp.size();
  order.icc = output.icc.size();
  order.comment = comment.size();
  std::span<const uint8_t> delays;
  unsigned seconds = SecondsFor(moduleLimits.writeSeconds, image.Width(), image.Height());
  if (output.frames != nullptr) {
    const FrameFacts& frames = *output.frames;
    delays = {reinterpret_cast<const uint8_t*>(frames.delays.data()),
              frames.delays.size() * sizeof(int32_t)};
    order.bitmap = 0;
    order.delays = delays.size();
    order.width = frames.width;
    order.height = frames.height;
    order.rounds = frames.rounds;
    order.transparent = frames.transparent ? 1 : 0;
    seconds = SecondsForFrames(frames);
  }
  SharedBlock block;
  if (!block.Allocate(kModuleAnswerBytes + order.bitmap + order.exif + order.xmp + order.icc +
                      order.comment + order.delays))
    return Status::MemoryAllocationError;
  std::span<uint8_t> rest = block.Bytes().subspan(kModuleAnswerBytes);
  if (order.bitmap > 0) PutModuleBitmap(image, alpha, rest.first(order.bitmap));
  rest = rest.subspan(order.bitmap);
  for (const auto bytes : {output.exif, output.xmp, output.icc}) Put(bytes, rest);
  Put({reinterpret_cast<const uint8_t*>(comment.data()), comment.size()}, rest);
  Put(delays, rest);
  ModuleAnswer answer;
  const std::string frameFile = output.frames == nullptr ? "" : output.frames->path;
  const ApartResult result =
      Run(RequestBytes(order, module, output.fileName, frameFile), surroundings.configuration,
          {seconds, ApartKind::ModuleWriter}, surroundings, block, answer);
  return StatusOf(result, answer, Status::ErrorWritingFile);
}

Status TranscodeApart(const std::string& module, const std::string& source,
                      const std::string& destination, const ApartSurroundings& surroundings) {
  SharedBlock block;
  if (!block.Allocate(kModuleAnswerBytes)) return Status::MemoryAllocationError;
  ModuleOrder order;
  order.operation = ModuleOperation::Transcode;
  ModuleAnswer answer;
  const ApartResult result =
      Run(RequestBytes(order, module, source, destination), surroundings.configuration,
          {moduleLimits.writeSeconds, ApartKind::ModuleWriter}, surroundings, block, answer);
  return StatusOf(result, answer, Status::ErrorWritingFile);
}

}  // namespace fotomill
