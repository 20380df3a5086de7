#include "plugins/plugin_bridge.h"

#include <algorithm>
#include <cstring>
#include <string>
#include <vector>

#include "platform/file_view.h"
#include "platform/files.h"
#include "platform/module_memory.h"
#include "platform/paths.h"
#include "platform/temporary_folder.h"
#include "plugins/carried_configuration.h"
#include "plugins/module_apart.h"
#include "plugins/module_call.h"
#include "plugins/plugin_animation.h"
#include "plugins/plugin_bitmap.h"
#include "plugins/plugin_table.h"
#include "registry/registry.h"

namespace fotomill {

namespace {

// The settings table passed to modules.
std::span<const FMW_CONFIG_ENTRY> configuration;

// Passes what a module reports on to the picture's progress.
class PictureListener final : public ModuleListener {
 public:
  explicit PictureListener(const PictureRecord& picture, const ReadOptions& options = {})
      : progress_(picture.progress), options_(options) {}
  void Begin() override {
    if (progress_ != nullptr) progress_->Begin();
  }
  void Step(int32_t done, int32_t total) override {
    if (progress_ != nullptr) progress_->Step(done, total);
  }
  void End() override {
    if (progress_ != nullptr) progress_->End();
  }
  void SetText(const char* text) override {
    if (progress_ != nullptr) progress_->SetText(text);
  }
  ReadOptions Options() const override { return options_; }

 private:
  ProgressSink* progress_;
  const ReadOptions& options_;
};

std::string PathOf(const PluginFormat& format) { return std::string(format.entry.path.view()); }

ModuleOptionValues OptionsOf(const PluginFormat& format) {
  return OptionValuesOf(std::string(platform::FileNameOf(format.entry.path.view())), *format.facts);
}

ModuleQuestion QuestionOf(const PluginFormat& format, const ReadRequest& request) {
  ModuleQuestion question;
  question.fileName = request.fileName;
  question.page = request.page;
  // A reduced picture is at least twice as large as it is shown.
  question.wantedSide = std::min(request.thumbnailSide, INT32_MAX / 2) * 2;
  question.options = OptionsOf(format);
  return question;
}

Status Describe(const PluginFormat& format, const ModuleQuestion& question,
                const PictureRecord& picture, const ReadOptions& options,
                ModuleDescription& description) {
  PictureListener listener(picture, options);
  if (format.here != nullptr) {
    const ModuleCall call(PathOf(format), ModuleStage::Working);
    return DescribeHere(*format.here, question,
                        {.listener = &listener, .configuration = configuration}, description);
  }
  const auto carried = CarriedConfiguration(configuration);
  return DescribeApart(PathOf(format), question,
                       {.listener = &listener, .configuration = carried, .stop = picture.stop},
                       description);
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

// What modules may say about contents that a record cannot hold.
constexpr uint8_t kModuleLost = kUnreadDepth | kUnreadInks | kUnreadLayers;
static_assert(FMW_LOST_DEPTH == kUnreadDepth && FMW_LOST_INKS == kUnreadInks &&
              FMW_LOST_LAYERS == kUnreadLayers);

void TakeMetadata(ModuleDescription& description, PictureRecord& picture) {
  if (description.pages > 0) picture.pageCount = std::min(description.pages, 1 << 20);
  picture.unread = static_cast<uint8_t>(description.lost & kModuleLost);
  picture.simplified = picture.unread != 0;
  picture.metadata.exif = std::move(description.exif);
  picture.metadata.xmp = std::move(description.xmp);
  picture.metadata.icc = std::move(description.icc);
  picture.comment = std::move(description.comment);
}

// The module that reads a file: by file name or, if no module claims the name, the one the registry
// bound by content. Null if there is none.
const PluginFormat* ReaderOf(std::string_view fileName) {
  const PluginFormat* const named = PluginFormatOf(fileName);
  if (named != nullptr) return named;
  const std::string_view bound = FormatRow(kSpareRow).extension;
  return bound.empty() ? nullptr : PluginFormatOf(std::string("x.").append(bound));
}

Status ReadInProgram(const PluginFormat& format, const ModuleQuestion& question,
                     PictureRecord& picture, const ReadOptions& options) {
  PictureListener listener(picture, options);
  const ModuleSurroundings surroundings{.listener = &listener, .configuration = configuration};
  const ModuleCall call(PathOf(format), ModuleStage::Working);
  void* handle = nullptr;
  RETURN_IF_BAD(ReadHere(*format.here, question, surroundings, handle));
  const auto block = platform::LockModuleBlock(handle);
  Status status = Status::MemoryAllocationError;
  if (!block.empty()) {
    status = TakeModuleBitmap(block, picture.image, picture.alpha, picture.palette);
    platform::UnlockModuleBlock(handle);
  }
  FreeModuleResult(handle, surroundings);
  return status;
}

Status ReadInWorker(const PluginFormat& format, const ModuleQuestion& question,
                    PictureRecord& picture, const ReadOptions& options) {
  PictureListener listener(picture, options);
  const auto carried = CarriedConfiguration(configuration);
  ApartBitmap bitmap;
  RETURN_IF_BAD(ReadApart(PathOf(format), question, picture.width, picture.height,
                          {.listener = &listener, .configuration = carried, .stop = picture.stop},
                          bitmap));
  return TakeModuleBitmap(bitmap.bytes, picture.image, picture.alpha, picture.palette);
}

// Sets the record's size and scale after a picture was decoded, perhaps smaller than it is.
void TakeSize(bool mayBeReduced, PictureRecord& picture) {
  const int32_t width = picture.image.Width(), height = picture.image.Height();
  picture.bitsPerPixel = picture.image.Bits();
  picture.reduction = 1;
  if (!mayBeReduced || width >= picture.width || height >= picture.height) {
    picture.width = width;
    picture.height = height;
    return;
  }
  picture.reduction = (picture.width + width - 1) / width;
}

// Has the module write the picture, or the frames instead of its image, to `path`.
Status CallWriter(const PluginFormat& format, PictureRecord& picture, const FrameFacts* frames,
                  const std::string& path, const WriteOptions& options) {
  const std::string comment =
      options.comment ? std::string(picture.comment.begin(), picture.comment.end()) : "";
  ModuleOutput output;
  output.fileName = path;
  output.quality = std::clamp(options.encode.quality, 0, 100);
  output.lossless = options.lossless;
  output.dpiX = static_cast<int32_t>(picture.metadata.dpiX);
  output.dpiY = static_cast<int32_t>(picture.metadata.dpiY);
  output.options = OptionsOf(format);
  output.icc = picture.metadata.icc;
  if (options.KeepsMetadata()) {
    output.exif = picture.metadata.exif;
    output.xmp = picture.metadata.xmp;
  }
  output.comment = comment.empty() ? nullptr : comment.c_str();
  output.frames = frames;
  PictureListener listener(picture);
  if (format.here == nullptr) {
    const auto carried = CarriedConfiguration(configuration);
    return WriteApart(PathOf(format), output, picture.image, picture.alpha,
                      {.listener = &listener, .configuration = carried, .stop = picture.stop});
  }
  platform::MemoryBlock bitmap;
  if (frames == nullptr) {
    if (!bitmap.Allocate(static_cast<size_t>(ModuleBitmapSize(picture.image, picture.alpha)),
                         platform::Fill::Unset))
      return Status::MemoryAllocationError;
    PutModuleBitmap(picture.image, picture.alpha, bitmap.Bytes());
    output.bitmap = bitmap.Bytes();
  }
  const ModuleCall call(PathOf(format), ModuleStage::Working);
  return WriteHere(*format.here, output, {.listener = &listener, .configuration = configuration});
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
bool ReadsBack(const PluginFormat& format, const std::string& path) {
  ModuleQuestion question;
  question.fileName = path;
  question.options = OptionsOf(format);
  ModuleDescription description;
  const Status status = Describe(format, question, {}, {}, description);
  return status == Status::Ok || status == Status::UnsupportedFunction ||
         status == Status::UnsupportedFormat;
}

// Flags that a module may set on its formats; all others are set by the program.
constexpr uint32_t kModuleFlags = FMT_BITMAP | FMT_MULTI | FMT_ALPHA;
constexpr uint32_t kMostBits = 24;  // of a picture without alpha

// Metadata that the writer of the newer interface stores.
uint8_t KeptMetadata(const PluginFormat& format) {
  if (!format.facts->takesMetadata) return 0;
  constexpr std::pair<uint32_t, uint8_t> kKinds[] = {{FMW_FORMAT_EXIF, kLostExif | kLostMakerNote},
                                                     {FMW_FORMAT_XMP, kLostXmp},
                                                     {FMW_FORMAT_ICC, kLostIcc},
                                                     {FMW_FORMAT_COMMENT, kLostComment}};
  uint32_t kept = 0;
  for (const auto& [flag, bits] : kKinds) kept |= (format.entry.flags2 & flag) != 0 ? bits : 0u;
  return static_cast<uint8_t>(kept);
}

}  // namespace

Status PluginInfo(PictureRecord& picture, const ReadRequest& request) {
  const PluginFormat* format = ReaderOf(request.fileName);
  if (format == nullptr) return Status::UnsupportedFunction;
  ModuleDescription description;
  RETURN_IF_BAD(
      Describe(*format, QuestionOf(*format, request), picture, request.options, description));
  picture.fileSize = platform::FactsOf(request.fileName).size;
  RETURN_IF_BAD(TakeInfo(description.info, picture));
  TakeMetadata(description, picture);
  return Status::Ok;
}

Status PluginRead(PictureRecord& picture, const ReadRequest& request) {
  const PluginFormat* format = ReaderOf(request.fileName);
  if (format == nullptr) return Status::UnsupportedFunction;
  ModuleQuestion question = QuestionOf(*format, request);
  question.comment.assign(picture.comment.begin(), picture.comment.end());
  RETURN_IF_BAD(format->here != nullptr
                    ? ReadInProgram(*format, question, picture, request.options)
                    : ReadInWorker(*format, question, picture, request.options));
  TakeSize(question.wantedSide > 0, picture);
  return Status::Ok;
}

namespace {

Status WriteFile(PictureRecord& picture, const FrameFacts* frames, const WriteOptions& options) {
  const PluginFormat* format = PluginFormatOf(picture.fileName);
  if (format == nullptr || !format->facts->writes) return Status::UnsupportedFunction;
  const std::string destination(picture.fileName.view());
  ByteWriter out;
  platform::TemporaryFolder folder;
  if (!out.Create(destination) || !folder.Create()) return Status::ErrorCreatingFile;
  const std::string working = WorkingName(folder.Path(), destination);
  RETURN_IF_BAD(CallWriter(*format, picture, frames, working, options));
  if (!ReadsBack(*format, working)) return Status::ErrorWritingFile;
  platform::FileView written;
  if (!written.Open(working) || written.Bytes().empty()) return Status::ErrorWritingFile;
  out.Bytes(written.Bytes());
  return written.Intact() ? CommitOutput(out, options) : Status::ErrorWritingFile;
}

}  // namespace

Status PluginWrite(PictureRecord& picture, const WriteOptions& options) {
  return WriteFile(picture, nullptr, options);
}

Status PluginWriteFrames(PictureRecord& picture, const FrameFacts& frames,
                         const WriteOptions& options) {
  return WriteFile(picture, &frames, options);
}

Status DescribePluginFrames(const ReadRequest& request, PluginFrames& frames) {
  const PluginFormat* format = ReaderOf(request.fileName);
  if (format == nullptr) return Status::UnsupportedFunction;
  const PicturePointer picture = NewPictureRecord(request.options.alphaBackground);
  if (picture == nullptr) return Status::MemoryAllocationError;
  ModuleDescription description;
  RETURN_IF_BAD(
      Describe(*format, QuestionOf(*format, request), *picture, request.options, description));
  RETURN_IF_BAD(TakeInfo(description.info, *picture));
  frames.width = picture->width;
  frames.height = picture->height;
  frames.rounds = std::max(description.rounds, 0);
  frames.delays.resize(std::min(description.delays.size() / sizeof(int32_t), size_t{1} << 16));
  std::memcpy(frames.delays.data(), description.delays.data(),
              frames.delays.size() * sizeof(int32_t));
  for (int32_t& delay : frames.delays) delay = std::max(delay, 0);
  if (frames.delays.empty()) frames.delays.push_back(0);
  return Status::Ok;
}

bool PluginMetadata(const std::string& path, ForeignMetadata& metadata) {
  const PluginFormat* format = PluginFormatOf(path);
  if (format == nullptr || !format->facts->hasMetadata) return false;
  const PicturePointer picture = NewPictureRecord({});
  ModuleDescription description;
  if (picture == nullptr || Describe(*format, QuestionOf(*format, {.fileName = path}), *picture, {},
                                     description) != Status::Ok)
    return false;
  metadata.exif = std::move(description.exif);
  metadata.xmp = std::move(description.xmp);
  return true;
}

void InstallPluginConfiguration(const FMW_CONFIG_ENTRY* rows, int32_t count) {
  configuration = {rows, static_cast<size_t>(count)};
}

int32_t BindPluginFormat(std::string_view fileName) {
  const PluginFormat* format = PluginFormatOf(fileName);
  if (format == nullptr) return kNoFormat;
  const PluginEntry& entry = format->entry;
  FormatEntry& row = FormatRow(kSpareRow);
  row.details = nullptr;
  row.info = PluginInfo;
  row.read = PluginRead;
  row.write = PluginWrite;
  const bool frames = (entry.flags2 & FMW_FORMAT_FRAMES) != 0 && format->facts->hasMetadata;
  row.animate = frames ? PluginAnimate : nullptr;
  row.sequence = frames && format->facts->writesFrames ? PluginSequenceBegin : nullptr;
  row.canRead = true;
  row.canWrite = format->facts->writes;
  row.reserved = 0;
  row.maxBits = std::min(entry.flags1, kMostBits);
  row.extension = entry.extension;
  row.description = entry.textB;
  row.enabled = 1;
  row.flags = (entry.flags2 & kModuleFlags) | FMT_SPARE | (frames ? FMT_FRAMES | FMT_TIMED : 0u);
  row.keepsMetadata = KeptMetadata(*format);
  row.whyNot = row.canWrite ? std::string_view() : kOnlyRead;
  return kSpareRow;
}

}  // namespace fotomill
