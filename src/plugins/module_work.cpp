#include "plugins/module_work.h"

#include <algorithm>
#include <cstring>

#include "platform/module_guard.h"
#include "platform/module_memory.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// The call running on this thread; the services have no argument to identify it.
thread_local const ModuleSurroundings* current = nullptr;
thread_local bool resultTaken = false;  // the memory for its result is in use

ModuleListener* Listener() { return current == nullptr ? nullptr : current->listener; }

FMW_HANDLE FMW_CALL HostLoadPicture(const char* fileName, int32_t* error) {
  const platform::OwnCode ownCode;
  const ReadOptions options = Listener() == nullptr ? ReadOptions() : Listener()->Options();
  PicturePointer picture;
  Status status = fileName == nullptr
                      ? Status::FileOpenError
                      : LoadPicture({.fileName = fileName, .options = options}, picture);
  void* block = status == Status::Ok ? platform::NewModuleBlock(picture->image.Bytes()) : nullptr;
  if (status == Status::Ok && block == nullptr) status = Status::MemoryAllocationError;
  if (error != nullptr) *error = StatusNumber(status);
  return block;
}
void FMW_CALL HostFreePicture(FMW_HANDLE bitmap) { platform::FreeModuleBlock(bitmap); }
void FMW_CALL HostProgressBegin() {
  if (Listener() != nullptr) Listener()->Begin();
}
void FMW_CALL HostProgressStep(int32_t done, int32_t total) {
  if (Listener() != nullptr) Listener()->Step(done, total);
}
void FMW_CALL HostProgressEnd() {
  if (Listener() != nullptr) Listener()->End();
}
void FMW_CALL HostSetStatus(const char* text) {
  if (Listener() != nullptr && text != nullptr) Listener()->SetText(text);
}

FMW_HANDLE FMW_CALL HostAllocate(uint64_t bytes) {
  if (current != nullptr && !resultTaken && bytes <= current->result.size()) {
    resultTaken = true;
    return current->result.data();
  }
  return bytes > PTRDIFF_MAX ? nullptr : platform::NewModuleMemory(bytes);
}
void FMW_CALL HostRelease(FMW_HANDLE block) {
  if (current != nullptr && block == current->result.data()) {
    resultTaken = false;
  } else {
    platform::FreeModuleBlock(block);
  }
}

// One call into a module, with its service block.
class Call {
 public:
  explicit Call(const ModuleSurroundings& surroundings)
      : before_(current), takenBefore_(resultTaken) {
    current = &surroundings;
    resultTaken = false;
    services_.size = sizeof services_;
    services_.version = FMW_PLUGIN_VERSION;
    std::copy_n("RXaR", 4, services_.mark);
    services_.loadPicture = HostLoadPicture;
    services_.freePicture = HostFreePicture;
    services_.progressBegin = HostProgressBegin;
    services_.progressStep = HostProgressStep;
    services_.progressEnd = HostProgressEnd;
    services_.setStatus = HostSetStatus;
    services_.configuration = surroundings.configuration.data();
    services_.configurationCount = static_cast<int32_t>(surroundings.configuration.size());
  }
  ~Call() {
    current = before_;
    resultTaken = takenBefore_;
  }
  Call(const Call&) = delete;
  Call& operator=(const Call&) = delete;
  FMW_HOST_SERVICES* Services() { return &services_; }

 private:
  const ModuleSurroundings* before_;
  bool takenBefore_;
  FMW_HOST_SERVICES services_ = {};
};

// A failure without a number is still a failure.
Status ModuleError(int32_t error, Status otherwise) {
  return error == 0 ? otherwise : static_cast<Status>(error);
}

FMW_READ_REQUEST RequestOf(const ModuleQuestion& question) {
  FMW_READ_REQUEST request = {};
  request.size = sizeof request;
  request.version = FMW_PLUGIN_VERSION_12;
  request.page = question.page;
  request.wantedSide = question.wantedSide;
  std::ranges::copy(question.options, request.options);
  request.allocate = HostAllocate;
  request.release = HostRelease;
  return request;
}

// Copies a module's block, whose size is limited to what it has allocated, and frees it.
void TakeBlock(const FMW_BLOCK& block, std::vector<uint8_t>& bytes) {
  if (block.data == nullptr) return;
  const auto whole = platform::LockModuleBlock(block.data);
  const uint64_t claimed = block.size;  // copied: fields of packed structs may be misaligned
  const auto size = static_cast<size_t>(std::min<uint64_t>(claimed, whole.size()));
  bytes.assign(whole.begin(), whole.begin() + static_cast<ptrdiff_t>(size));
  platform::UnlockModuleBlock(block.data);
  platform::FreeModuleBlock(block.data);
}

void TakeMetadata(const LoadedModule& module, const ModuleQuestion& question, Call& call,
                  ModuleDescription& description) {
  if (module.exports.getMetadata == nullptr) return;
  FMW_METADATA metadata = {};
  metadata.size = sizeof metadata;
  metadata.version = FMW_PLUGIN_VERSION_12;
  const FMW_READ_REQUEST request = RequestOf(question);
  int32_t error = 0;
  const int32_t done = module.exports.getMetadata(&metadata, question.fileName.c_str(), &request,
                                                  &error, call.Services());
  ModuleDescription taken;
  TakeBlock(metadata.exif, taken.exif);
  TakeBlock(metadata.xmp, taken.xmp);
  TakeBlock(metadata.icc, taken.icc);
  TakeBlock(metadata.delays, taken.delays);
  if (done == 0) return;
  taken.info = description.info;
  if (metadata.width > 0 && metadata.height > 0) {
    taken.info.width = metadata.width;
    taken.info.height = metadata.height;
  }
  taken.pages = metadata.pages;
  taken.rounds = metadata.rounds;
  taken.lost = metadata.lost;
  description = std::move(taken);
}

void TakeComment(const LoadedModule& module, const ModuleQuestion& question,
                 ModuleDescription& description) {
  if (module.exports.getComment == nullptr) return;
  int32_t error = 0;
  void* handle = module.exports.getComment(question.fileName.c_str(), &error, 0);
  if (handle == nullptr) return;
  const auto block = platform::LockModuleBlock(handle);
  description.comment.assign(block.begin(), std::find(block.begin(), block.end(), uint8_t{0}));
  platform::UnlockModuleBlock(handle);
  platform::FreeModuleBlock(handle);
}

FMW_BLOCK BlockOf(std::span<const uint8_t> bytes) {
  return {bytes.empty() ? nullptr : const_cast<uint8_t*>(bytes.data()), bytes.size()};
}

FMW_WRITE_REQUEST WriteRequestOf(const ModuleOutput& output) {
  FMW_WRITE_REQUEST request = {};
  request.size = sizeof request;
  request.version = FMW_PLUGIN_VERSION_12;
  request.quality = output.quality;
  request.lossless = output.lossless ? 1 : 0;
  request.dpiX = output.dpiX;
  request.dpiY = output.dpiY;
  std::ranges::copy(output.options, request.options);
  request.exif = BlockOf(output.exif);
  request.xmp = BlockOf(output.xmp);
  request.icc = BlockOf(output.icc);
  request.comment = output.comment;
  return request;
}

Status WriteFrames(const LoadedModule& module, const ModuleOutput& output, Call& call) {
  if (module.exports.writeAnimation == nullptr) return Status::UnsupportedFunction;
  FrameFileReader frames;
  RETURN_IF_BAD(frames.Open(*output.frames));
  const FMW_WRITE_REQUEST request = WriteRequestOf(output);
  int32_t error = 0;
  const int32_t written = module.exports.writeAnimation(output.fileName.c_str(), &frames.Frames(),
                                                        &request, &error, call.Services());
  return written != 0 ? Status::Ok : ModuleError(error, Status::ErrorWritingFile);
}

}  // namespace

Status DescribeHere(const LoadedModule& module, const ModuleQuestion& question,
                    const ModuleSurroundings& surroundings, ModuleDescription& description) {
  Call call(surroundings);
  FMW_PICTURE_INFO& info = description.info;
  info.size = sizeof info;
  info.version = FMW_PLUGIN_VERSION;
  info.frame = question.page;
  int32_t error = 0;
  if (module.exports.getInfo(&info, question.fileName.c_str(), &error, call.Services()) == 0)
    return ModuleError(error, Status::DamagedFile);
  TakeMetadata(module, question, call, description);
  TakeComment(module, question, description);
  return Status::Ok;
}

Status ReadHere(const LoadedModule& module, const ModuleQuestion& question,
                const ModuleSurroundings& surroundings, void*& handle) {
  Call call(surroundings);
  call.Services()->comment = question.comment.empty() ? nullptr : question.comment.c_str();
  int32_t error = 0;
  if (module.exports.readImage12 != nullptr) {
    const FMW_READ_REQUEST request = RequestOf(question);
    handle =
        module.exports.readImage12(question.fileName.c_str(), &request, &error, call.Services());
  } else {
    handle = module.exports.readImage(question.fileName.c_str(), &error, call.Services());
  }
  return handle == nullptr ? ModuleError(error, Status::DamagedFile) : Status::Ok;
}

Status WriteHere(const LoadedModule& module, const ModuleOutput& output,
                 const ModuleSurroundings& surroundings) {
  Call call(surroundings);
  if (output.frames != nullptr) return WriteFrames(module, output, call);
  void* const bitmap = const_cast<uint8_t*>(output.bitmap.data());
  int32_t error = 0, written = 0;
  if (module.exports.writeImage12 != nullptr) {
    const FMW_WRITE_REQUEST request = WriteRequestOf(output);
    written = module.exports.writeImage12(output.fileName.c_str(), bitmap, &request, &error,
                                          call.Services());
  } else if (module.exports.writeImage != nullptr) {
    written = module.exports.writeImage(output.fileName.c_str(), bitmap, output.comment, &error,
                                        call.Services());
  } else {
    return Status::UnsupportedFunction;
  }
  return written != 0 ? Status::Ok : ModuleError(error, Status::ErrorWritingFile);
}

Status TranscodeHere(const LoadedModule& module, const std::string& source,
                     const std::string& destination, const ModuleSurroundings& surroundings) {
  if (module.exports.transcode == nullptr) return Status::UnsupportedFunction;
  Call call(surroundings);
  int32_t error = 0;
  const int32_t done =
      module.exports.transcode(source.c_str(), destination.c_str(), &error, call.Services());
  return done != 0 ? Status::Ok : ModuleError(error, Status::ErrorWritingFile);
}

void FreeModuleResult(void* handle, const ModuleSurroundings& surroundings) {
  if (handle != surroundings.result.data()) platform::FreeModuleBlock(handle);
}

}  // namespace fotomill
