#include "plugins/plugin_bridge.h"

#include <algorithm>
#include <cstddef>
#include <string>
#include <vector>

#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/module_memory.h"
#include "platform/paths.h"
#include "platform/temporary_folder.h"
#include "plugins/module_call.h"
#include "plugins/plugin_bitmap.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// The settings table passed to modules.
const FMW_CONFIG_ENTRY* configuration = nullptr;
int32_t configurationCount = 0;

// The picture of the call running on this thread; the progress callbacks have no argument to
// identify it.
thread_local PictureRecord* currentPicture = nullptr;
// Its read options, also used for pictures that the module loads meanwhile.
thread_local const ReadOptions* currentOptions = nullptr;

ReadOptions CurrentOptions() { return currentOptions == nullptr ? ReadOptions() : *currentOptions; }

FMW_HANDLE FMW_CALL HostLoadPicture(const char* fileName, int32_t* error) {
  const platform::OwnCode ownCode;
  PicturePointer picture;
  Status status = fileName == nullptr
                      ? Status::FileOpenError
                      : LoadPicture({.fileName = fileName, .options = CurrentOptions()}, picture);
  void* block = status == Status::Ok ? platform::NewModuleBlock(picture->image.Bytes()) : nullptr;
  if (status == Status::Ok && block == nullptr) status = Status::MemoryAllocationError;
  if (error != nullptr) *error = StatusNumber(status);
  return block;
}
void FMW_CALL HostFreePicture(FMW_HANDLE bitmap) { platform::FreeModuleBlock(bitmap); }
ProgressSink* CurrentProgress() {
  return currentPicture == nullptr ? nullptr : currentPicture->progress;
}
void FMW_CALL HostProgressBegin() {
  if (ProgressSink* progress = CurrentProgress()) progress->Begin();
}
void FMW_CALL HostProgressStep(int32_t done, int32_t total) {
  if (ProgressSink* progress = CurrentProgress()) progress->Step(done, total);
}
void FMW_CALL HostProgressEnd() {
  if (ProgressSink* progress = CurrentProgress()) progress->End();
}
void FMW_CALL HostSetStatus(const char* text) {
  if (ProgressSink* progress = CurrentProgress(); progress != nullptr && text != nullptr)
    progress->SetText(text);
}

// One call into a module for a picture: sets the picture's name and holds the service block.
class PictureCall {
 public:
  PictureCall(const PluginEntry& entry, PictureRecord& picture,
              const ReadOptions* options = nullptr)
      : call_(std::string(entry.path.view()), ModuleStage::Working),
        before_(currentPicture),
        optionsBefore_(currentOptions) {
    currentPicture = &picture;
    currentOptions = options;
    services_.size = sizeof services_;
    services_.version = FMW_PLUGIN_VERSION;
    std::copy_n("RXaR", 4, services_.mark);
    services_.loadPicture = HostLoadPicture;
    services_.freePicture = HostFreePicture;
    services_.progressBegin = HostProgressBegin;
    services_.progressStep = HostProgressStep;
    services_.progressEnd = HostProgressEnd;
    services_.setStatus = HostSetStatus;
    services_.configuration = configuration;
    services_.configurationCount = configurationCount;
  }
  ~PictureCall() {
    currentPicture = before_;
    currentOptions = optionsBefore_;
  }
  PictureCall(const PictureCall&) = delete;
  PictureCall& operator=(const PictureCall&) = delete;
  FMW_HOST_SERVICES* Services() { return &services_; }

 private:
  ModuleCall call_;
  PictureRecord* before_;
  const ReadOptions* optionsBefore_;
  FMW_HOST_SERVICES services_ = {};
};

// Converts a module's error number to a status. A failure without a number is still a failure.
Status ModuleError(int32_t error) {
  return error == 0 ? Status::DamagedFile : static_cast<Status>(error);
}

std::string CommentText(const PictureRecord& picture) {
  return {picture.comment.begin(), picture.comment.end()};
}

Status TakeInfo(const FMW_PICTURE_INFO& info, PictureRecord& picture) {
  const bool depthFits = (info.bitsPerPixel >= 1 && info.bitsPerPixel <= 8) ||
                         info.bitsPerPixel == 16 || info.bitsPerPixel == 24 ||
                         info.bitsPerPixel == 32;
  if (info.width < 1 || info.height < 1 || !depthFits) return Status::DamagedFile;
  picture.width = info.width;
  picture.height = info.height;
  picture.bitsPerPixel = info.bitsPerPixel > 8 ? 24 : info.bitsPerPixel;
  if (info.bitsPerPixel > 24) picture.alphaFlags |= kHasAlpha;
  picture.pageCount = std::clamp(info.frame, 1, 1 << 20);
  picture.metadata.dpiX = std::clamp(info.dpiX, 0, 1 << 20);
  picture.metadata.dpiY = std::clamp(info.dpiY, 0, 1 << 20);
  picture.imageBytes = info.imageBytes > 0
                           ? static_cast<uint64_t>(info.imageBytes)
                           : EstimateImageBytes(info.width, info.height, picture.bitsPerPixel);
  picture.background = static_cast<Color>(info.background) & 0xffffff;
  std::copy(std::begin(info.palette), std::end(info.palette), picture.palette.begin());
  picture.typeName.Clear();
  if (info.version >= FMW_PLUGIN_VERSION)
    picture.typeName.AssignCut({info.typeName, sizeof info.typeName - 1});
  return Status::Ok;
}

// The module that reads a file: by file name or, if no module claims the name, the one the registry
// bound by content. Null if there is none.
const PluginEntry* ReaderOf(std::string_view fileName) {
  const PluginEntry* const named = FindPluginEntry(fileName);
  if (named != nullptr) return named;
  const std::string_view bound = FormatRow(kSpareRow).extension;
  return bound.empty() ? nullptr : FindPluginEntry(std::string("x.").append(bound));
}

// Has the module write the picture to `path`.
Status CallWriter(const PluginEntry& entry, PictureRecord& picture, const std::string& path,
                  bool withComment) {
  const std::string comment = withComment ? CommentText(picture) : std::string();
  void* bitmap = NewModuleBitmap(picture.image, picture.alpha);
  if (bitmap == nullptr) return Status::MemoryAllocationError;
  int32_t error = 0;
  PictureCall call(entry, picture);
  const int32_t written = entry.exports.writeImage(
      path.c_str(), bitmap, comment.empty() ? nullptr : comment.c_str(), &error, call.Services());
  platform::FreeModuleBlock(bitmap);
  if (written != 0) return Status::Ok;
  return error == 0 ? Status::ErrorWritingFile : static_cast<Status>(error);
}

// The path the module writes to: in a separate folder, but with the destination's file name,
// as some formats store their own name. A name too long for the plug-in interface is
// replaced by "picture".
std::string WorkingName(const std::string& folder, const std::string& destination) {
  std::string path = platform::JoinFolder(folder, platform::FileNameOf(destination));
  if (path.size() > PathText::Capacity()) {
    path = platform::JoinFolder(
        folder, std::string("picture").append(platform::SplitPath(destination).extension));
  }
  return path;
}

// Whether the module recognizes the file it has written. Write-only modules cannot tell and pass.
bool ReadsBack(const PluginEntry& entry, const std::string& path) {
  FMW_PICTURE_INFO info = {};
  info.size = sizeof info;
  info.version = FMW_PLUGIN_VERSION;
  int32_t error = 0;
  PictureRecord record;
  PictureCall call(entry, record);
  return entry.exports.getInfo(&info, path.c_str(), &error, call.Services()) != 0 ||
         error == FMW_ERROR_UNSUPPORTED || error == FMW_ERROR_FORMAT;
}

// Flags that a module may set on its formats; all others are set by the program.
constexpr uint32_t kModuleFlags = FMT_BITMAP | FMT_MULTI | FMT_ALPHA;
constexpr uint32_t kMostBits = 24;  // of a picture without alpha

}  // namespace

Status PluginInfo(PictureRecord& picture, const ReadRequest& request) {
  const PluginEntry* entry = ReaderOf(request.fileName);
  if (entry == nullptr || entry->exports.getInfo == nullptr) return Status::UnsupportedFunction;
  FMW_PICTURE_INFO info = {};
  info.size = sizeof info;
  info.version = FMW_PLUGIN_VERSION;
  info.frame = request.page;
  int32_t error = 0;
  PictureCall call(*entry, picture, &request.options);
  if (entry->exports.getInfo(&info, request.fileName.c_str(), &error, call.Services()) == 0)
    return ModuleError(error);
  picture.fileSize = platform::FactsOf(request.fileName).size;
  RETURN_IF_BAD(TakeInfo(info, picture));
  (void)PluginComment(picture, request.fileName.c_str());  // a missing comment is not an error
  return Status::Ok;
}

Status PluginRead(PictureRecord& picture, const ReadRequest& request) {
  const PluginEntry* entry = ReaderOf(request.fileName);
  if (entry == nullptr || entry->exports.readImage == nullptr) return Status::UnsupportedFunction;
  const std::string comment = CommentText(picture);
  int32_t error = 0;
  PictureCall call(*entry, picture, &request.options);
  call.Services()->comment = comment.empty() ? nullptr : comment.c_str();
  void* handle = entry->exports.readImage(request.fileName.c_str(), &error, call.Services());
  if (handle == nullptr) return ModuleError(error);
  const auto block = platform::LockModuleBlock(handle);
  Status status = Status::MemoryAllocationError;
  if (!block.empty()) {
    status = TakeModuleBitmap(block, picture.image, picture.alpha, picture.palette);
    platform::UnlockModuleBlock(handle);
  }
  platform::FreeModuleBlock(handle);
  RETURN_IF_BAD(status);
  picture.width = picture.image.Width();
  picture.height = picture.image.Height();
  picture.bitsPerPixel = picture.image.Bits();
  return Status::Ok;
}

Status PluginWrite(PictureRecord& picture, const WriteOptions& options) {
  const PluginEntry* entry = FindPluginEntry(picture.fileName);
  if (entry == nullptr || entry->exports.writeImage == nullptr) return Status::UnsupportedFunction;
  const std::string destination(picture.fileName.view());
  ByteWriter out;
  platform::TemporaryFolder folder;
  if (!out.Create(destination) || !folder.Create()) return Status::ErrorCreatingFile;
  const std::string working = WorkingName(folder.Path(), destination);
  RETURN_IF_BAD(CallWriter(*entry, picture, working, options.comment));
  if (!ReadsBack(*entry, working)) return Status::ErrorWritingFile;
  platform::FileView written;
  if (!written.Open(working) || written.Bytes().empty()) return Status::ErrorWritingFile;
  out.Bytes(written.Bytes());
  return written.Intact() ? CommitOutput(out, options) : Status::ErrorWritingFile;
}

Status PluginComment(PictureRecord& picture, const char* fileName) {
  const PluginEntry* entry = ReaderOf(fileName);
  if (entry == nullptr) return Status::UnsupportedFunction;
  if (entry->exports.getComment == nullptr) return Status::Ok;
  int32_t error = 0;
  PictureCall call(*entry, picture);
  void* handle = entry->exports.getComment(fileName, &error, 0);
  if (handle == nullptr) return Status::Ok;
  const auto block = platform::LockModuleBlock(handle);
  if (!block.empty()) {
    picture.comment.assign(block.begin(), std::find(block.begin(), block.end(), uint8_t{0}));
    platform::UnlockModuleBlock(handle);
  }
  platform::FreeModuleBlock(handle);
  return block.empty() ? Status::MemoryAllocationError : Status::Ok;
}

void InstallPluginConfiguration(const FMW_CONFIG_ENTRY* rows, int32_t count) {
  configuration = rows;
  configurationCount = count;
}

int32_t BindPluginFormat(std::string_view fileName) {
  const PluginEntry* entry = FindPluginEntry(fileName);
  if (entry == nullptr) return kNoFormat;
  FormatEntry& row = FormatRow(kSpareRow);
  row.details = nullptr;
  row.info = PluginInfo;
  row.read = PluginRead;
  row.write = PluginWrite;
  row.canRead = row.canWrite = true;
  row.reserved = 0;
  row.maxBits = std::min(entry->flags1, kMostBits);
  row.extension = entry->extension;
  row.description = entry->textB;
  row.enabled = 1;
  row.flags = (entry->flags2 & kModuleFlags) | FMT_SPARE;
  return kSpareRow;
}

}  // namespace fotomill
