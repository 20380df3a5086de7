// The worker process's side of module_apart.h: loads modules, calls them, and puts what they return
// into the reply.

#include <algorithm>
#include <cstring>
#include <map>
#include <memory>

#include "core/limits.h"
#include "platform/module_memory.h"
#include "plugins/carried_configuration.h"
#include "plugins/module_apart.h"
#include "plugins/module_messages.h"
#include "plugins/plugin_bitmap.h"
#include "plugins/plugin_bridge.h"
#include "plugins/plugin_table.h"

namespace fotomill {

namespace {

constexpr int32_t kMostSteps = 64;  // sent of one operation

class Sender final : public ModuleListener {
 public:
  explicit Sender(const platform::ApartCall& call) : call_(call) {}
  void Begin() override { call_.tell(kModuleBegins); }
  void Step(int32_t done, int32_t total) override {
    const int64_t part = total > 0 ? int64_t{done} * kMostSteps / total : done;
    if (part == last_ || done < 0) return;
    last_ = part;
    call_.tell(done);
    call_.tell(total);
  }
  void End() override { call_.tell(kModuleEnds); }
  void SetText(const char* text) override {
    const auto place = call_.reply.subspan(kModuleTextPlace, kModuleTextSize);
    const size_t size = strnlen(text, place.size() - 1);
    std::copy_n(text, size, place.begin());
    place[size] = 0;
    call_.tell(kModuleSaysText);
  }
  ReadOptions Options() const override { return {}; }

 private:
  const platform::ApartCall& call_;
  int64_t last_ = -1;
};

// A request, taken apart.
struct Request {
  ModuleOrder order;
  std::string module, file, destination;
};

bool ParseRequest(std::span<const uint8_t> bytes, Request& request) {
  if (bytes.size() < sizeof request.order) return false;
  std::memcpy(&request.order, bytes.data(), sizeof request.order);
  bytes = bytes.subspan(sizeof request.order);
  const ModuleOrder& order = request.order;
  if (uint64_t{order.moduleSize} + order.fileSize + order.destinationSize != bytes.size())
    return false;
  const auto take = [&bytes](size_t size, std::string& text) {
    text.assign(bytes.begin(), bytes.begin() + static_cast<ptrdiff_t>(size));
    bytes = bytes.subspan(size);
  };
  take(order.moduleSize, request.module);
  take(order.fileSize, request.file);
  take(order.destinationSize, request.destination);
  return true;
}

// A module of this process.
struct KeptModule {
  LoadedModule module;
  ModuleFacts facts;
};

// Loads a module unless it has been; null if it cannot be used, and `error` may say why.
KeptModule* FindModule(const std::string& path, std::string& error) {
  static std::map<std::string, std::unique_ptr<KeptModule>> modules;
  const auto found = modules.find(path);
  if (found != modules.end()) return found->second.get();
  auto kept = std::make_unique<KeptModule>();
  if (!LoadModule(path, kept->module, kept->facts, error)) return nullptr;
  return modules.emplace(path, std::move(kept)).first->second.get();
}

// Where results are put, one after the other.
class ResultWriter {
 public:
  explicit ResultWriter(std::span<uint8_t> reply) : rest_(reply.subspan(kModuleAnswerBytes)) {}
  // The number of bytes that fit: all or none.
  uint64_t Put(std::span<const uint8_t> bytes, uint64_t most) {
    if (bytes.size() > rest_.size() || bytes.size() > most) return 0;
    std::ranges::copy(bytes, rest_.begin());
    rest_ = rest_.subspan(bytes.size());
    return bytes.size();
  }

 private:
  std::span<uint8_t> rest_;
};

ModuleQuestion QuestionOf(const Request& request) {
  ModuleQuestion question;
  question.fileName = request.file;
  question.page = request.order.page;
  question.wantedSide = request.order.wantedSide;
  question.options = request.order.options;
  return question;
}

void AnswerFacts(const ModuleFacts& facts, std::span<uint8_t> reply, ModuleAnswer& answer) {
  const std::string text = FactsAsText(facts);
  answer.bitmap = ResultWriter(reply).Put(
      {reinterpret_cast<const uint8_t*>(text.data()), text.size()}, text.size());
  answer.status = Status::Ok;
}

void AnswerDescription(const KeptModule& kept, const Request& request,
                       const ModuleSurroundings& surroundings, std::span<uint8_t> reply,
                       ModuleAnswer& answer) {
  ModuleDescription description;
  answer.status = DescribeHere(kept.module, QuestionOf(request), surroundings, description);
  answer.info = description.info;
  answer.pages = description.pages;
  answer.rounds = description.rounds;
  answer.lost = description.lost;
  ResultWriter results(reply);
  answer.exif = results.Put(description.exif, limits.metadataBytes);
  answer.xmp = results.Put(description.xmp, limits.metadataBytes);
  answer.icc = results.Put(description.icc, limits.metadataBytes);
  answer.comment = results.Put(description.comment, limits.metadataBytes);
  answer.delays = results.Put(description.delays, limits.metadataBytes);
}

void AnswerBitmap(const KeptModule& kept, ModuleQuestion question, ModuleSurroundings surroundings,
                  std::span<uint8_t> reply, ModuleAnswer& answer) {
  surroundings.result = reply.subspan(kModuleAnswerBytes);
  void* handle = nullptr;
  answer.status = ReadHere(kept.module, question, surroundings, handle);
  if (answer.status != Status::Ok) return;
  if (handle == surroundings.result.data()) {
    answer.bitmap = surroundings.result.size();
    return;
  }
  // Larger than the picture was said to be: what fits is not enough, which the program notices.
  const auto block = platform::LockModuleBlock(handle);
  const size_t size = std::min(block.size(), surroundings.result.size());
  std::copy_n(block.begin(), size, surroundings.result.begin());
  answer.bitmap = size;
  platform::UnlockModuleBlock(handle);
  platform::FreeModuleBlock(handle);
}

void AnswerWrite(const KeptModule& kept, const Request& request,
                 const ModuleSurroundings& surroundings, std::span<uint8_t> reply,
                 ModuleAnswer& answer) {
  const ModuleOrder& order = request.order;
  std::span<uint8_t> rest = reply.subspan(kModuleAnswerBytes);
  const auto take = [&rest](uint64_t size) {
    const auto taken = rest.first(static_cast<size_t>(size));
    rest = rest.subspan(taken.size());
    return taken;
  };
  ModuleOutput output;
  output.fileName = request.file;
  output.quality = order.quality;
  output.lossless = order.lossless != 0;
  output.dpiX = order.dpiX;
  output.dpiY = order.dpiY;
  output.options = order.options;
  output.bitmap = take(order.bitmap);
  output.exif = take(order.exif);
  output.xmp = take(order.xmp);
  output.icc = take(order.icc);
  const auto text = take(order.comment);
  const std::string comment(text.begin(), text.end());
  output.comment = comment.empty() ? nullptr : comment.c_str();
  FrameFacts frames;
  if (order.delays > 0) {
    const auto delays = take(order.delays);
    frames = {.path = request.destination,
              .width = order.width,
              .height = order.height,
              .rounds = order.rounds,
              .transparent = order.transparent != 0,
              .delays = std::vector<int32_t>(delays.size() / sizeof(int32_t))};
    std::memcpy(frames.delays.data(), delays.data(), frames.delays.size() * sizeof(int32_t));
    output.frames = &frames;
  }
  answer.status = WriteHere(kept.module, output, surroundings);
}

void Do(const Request& request, const platform::ApartCall& call, ModuleAnswer& answer) {
  static ConfigurationCopy configuration;
  const auto input = call.input;
  const uint64_t commentSize = std::min<uint64_t>(request.order.commentSize, input.size());
  configuration.Take(input.first(input.size() - static_cast<size_t>(commentSize)));
  InstallPluginConfiguration(configuration.Rows().data(),
                             static_cast<int32_t>(configuration.Rows().size()));
  std::string error;
  KeptModule* const kept = FindModule(request.module, error);
  if (kept == nullptr) {
    std::copy_n(error.begin(), std::min(error.size(), sizeof answer.text - 1), answer.text);
    return;
  }
  answer.loaded = 1;
  UseModuleHere(request.module, kept->module, kept->facts);
  Sender sender(call);
  const ModuleSurroundings surroundings{.listener = &sender, .configuration = configuration.Rows()};
  switch (request.order.operation) {
    case ModuleOperation::Facts: AnswerFacts(kept->facts, call.reply, answer); break;
    case ModuleOperation::Describe:
      AnswerDescription(*kept, request, surroundings, call.reply, answer);
      break;
    case ModuleOperation::Read: {
      ModuleQuestion question = QuestionOf(request);
      const auto comment = input.last(static_cast<size_t>(commentSize));
      question.comment.assign(comment.begin(), comment.end());
      AnswerBitmap(*kept, std::move(question), surroundings, call.reply, answer);
      break;
    }
    case ModuleOperation::Write:
      AnswerWrite(*kept, request, surroundings, call.reply, answer);
      break;
    case ModuleOperation::Transcode:
      answer.status = TranscodeHere(kept->module, request.file, request.destination, surroundings);
      break;
  }
}

}  // namespace

bool RunModuleTask(const platform::ApartCall& call) {
  Request request;
  ModuleAnswer answer;
  if (call.reply.size() < kModuleAnswerBytes || !ParseRequest(call.request, request)) return false;
  Do(request, call, answer);
  std::memcpy(call.reply.data(), &answer, sizeof answer);
  return true;
}

}  // namespace fotomill
