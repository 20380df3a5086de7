#include "formats/cameraraw/raw_library.h"

#include <algorithm>
#include <cstring>

#include "core/limits.h"
#include "picture/packed_image.h"
#include "platform/shared_library.h"

namespace fotomill {

namespace {

// The functions used are the same in all of these versions. No structures are accessed directly, so
// their layout does not matter.
constexpr const char* kLibraryNames[] = {"libraw.so.23", "libraw.so.20"};

// CPU time per picture; damaged data may keep the decoder busy
constexpr unsigned kSecondsToDescribe = 10, kSecondsAtLeast = 30;
constexpr uint64_t kPixelsPerSecond = 500'000;

struct RawHandle;  // the library's state for one file
// A picture in LibRaw's memory.
struct RawImage {
  int32_t type;  // kBitmap for pixels
  uint16_t height, width, colors, bits;
  uint32_t size;
  uint8_t data[1];
};
constexpr int32_t kBitmap = 2;
// LibRaw errors with a specific status.
constexpr int kUnsupported = -2, kNoMemory = -100007;
using DataFault = void (*)(void* data, const char* file, int offset);

struct RawLibrary {
  RawLibrary() {
    for (const char* name : kLibraryNames) {
      if (library.LoadSystem(name)) break;
    }
    if (!library.Loaded()) return;
    version = library.FunctionNamed<const char*()>("libraw_version");
    init = library.FunctionNamed<RawHandle*(unsigned)>("libraw_init");
    open = library.FunctionNamed<int(RawHandle*, void*, size_t)>("libraw_open_buffer");
    adjust = library.FunctionNamed<int(RawHandle*)>("libraw_adjust_sizes_info_only");
    width = library.FunctionNamed<int(RawHandle*)>("libraw_get_iwidth");
    height = library.FunctionNamed<int(RawHandle*)>("libraw_get_iheight");
    balance = library.FunctionNamed<float(RawHandle*, int)>("libraw_get_cam_mul");
    setBalance = library.FunctionNamed<void(RawHandle*, int, float)>("libraw_set_user_mul");
    setGamma = library.FunctionNamed<void(RawHandle*, int, float)>("libraw_set_gamma");
    setFault =
        library.FunctionNamed<void(RawHandle*, DataFault, void*)>("libraw_set_dataerror_handler");
    camera = library.FunctionNamed<const char*(RawHandle*)>("libraw_get_iparams");
    unpack = library.FunctionNamed<int(RawHandle*)>("libraw_unpack");
    process = library.FunctionNamed<int(RawHandle*)>("libraw_dcraw_process");
    make = library.FunctionNamed<RawImage*(RawHandle*, int*)>("libraw_dcraw_make_mem_image");
    clear = library.FunctionNamed<void(RawImage*)>("libraw_dcraw_clear_mem");
    close = library.FunctionNamed<void(RawHandle*)>("libraw_close");
  }
  bool Whole() const {
    return version != nullptr && init != nullptr && open != nullptr && adjust != nullptr &&
           width != nullptr && height != nullptr && balance != nullptr && setBalance != nullptr &&
           setGamma != nullptr && setFault != nullptr && camera != nullptr && unpack != nullptr &&
           process != nullptr && make != nullptr && clear != nullptr && close != nullptr;
  }

  platform::SharedLibrary library;
  const char* (*version)() = nullptr;
  RawHandle* (*init)(unsigned) = nullptr;
  int (*open)(RawHandle*, void*, size_t) = nullptr;
  int (*adjust)(RawHandle*) = nullptr;
  int (*width)(RawHandle*) = nullptr;
  int (*height)(RawHandle*) = nullptr;
  float (*balance)(RawHandle*, int) = nullptr;
  void (*setBalance)(RawHandle*, int, float) = nullptr;
  void (*setGamma)(RawHandle*, int, float) = nullptr;
  void (*setFault)(RawHandle*, DataFault, void*) = nullptr;
  const char* (*camera)(RawHandle*) = nullptr;  // see CameraName
  int (*unpack)(RawHandle*) = nullptr;
  int (*process)(RawHandle*) = nullptr;
  RawImage* (*make)(RawHandle*, int*) = nullptr;
  void (*clear)(RawImage*) = nullptr;
  void (*close)(RawHandle*) = nullptr;
};

const RawLibrary& Library() {
  static const RawLibrary library;
  return library;
}

// Reply of the worker process: at the start of its block, before the pixels.
struct Answer {
  Status status = Status::DamagedFile;
  int32_t damaged = 0;
  RawFacts facts;
};
constexpr uint64_t kAnswerBytes = 128;
static_assert(sizeof(Answer) <= kAnswerBytes);

uint64_t RowBytes(const RawFacts& facts) { return 3 * static_cast<uint64_t>(facts.width); }

Status StatusOf(int answer) {
  switch (answer) {
    case 0: return Status::Ok;
    case kUnsupported: return Status::UnsupportedFormat;
    case kNoMemory: return Status::MemoryAllocationError;
    default: return Status::DamagedFile;
  }
}

// LibRaw's camera information starts with four bytes, then maker and model, 64 bytes each.
void CameraName(const char* facts, std::span<char> name) {
  constexpr size_t kMaker = 4, kModel = 68, kMost = 64;
  std::string text(facts + kMaker, strnlen(facts + kMaker, kMost));
  text.append(" ").append(facts + kModel, strnlen(facts + kModel, kMost));
  const size_t count = std::min(text.size(), name.size() - 1);
  std::copy_n(text.begin(), count, name.begin());
  name[count] = 0;
}

// A file opened in LibRaw, closed by the destructor. Only used in the worker process.
class OpenRaw {
 public:
  explicit OpenRaw(std::span<const uint8_t> file) : handle_(Library().init(0)) {
    if (handle_ == nullptr) return;
    Library().setFault(
        handle_, [](void* damaged, const char*, int) { *static_cast<int32_t*>(damaged) = 1; },
        &damaged_);
    opened_ = StatusOf(Library().open(handle_, const_cast<uint8_t*>(file.data()), file.size()));
  }
  ~OpenRaw() {
    if (image_ != nullptr) Library().clear(image_);
    if (handle_ != nullptr) Library().close(handle_);
  }
  OpenRaw(const OpenRaw&) = delete;
  OpenRaw& operator=(const OpenRaw&) = delete;

  Status Describe(RawFacts& facts) {
    RETURN_IF_BAD(opened_);
    RETURN_IF_BAD(StatusOf(Library().adjust(handle_)));
    facts.width = Library().width(handle_);
    facts.height = Library().height(handle_);
    if (const char* camera = Library().camera(handle_)) CameraName(camera, facts.camera);
    return facts.width > 0 && facts.height > 0 ? Status::Ok : Status::DamagedFile;
  }

  // Decodes the pixels, with the size in `facts`.
  Status Develop(const RawFacts& facts, std::span<uint8_t> pixels) {
    RETURN_IF_BAD(opened_);
    RETURN_IF_BAD(StatusOf(Library().unpack(handle_)));
    TakeBalance();
    Library().setGamma(handle_, 0, 1 / 2.4F);  // the sRGB curve
    Library().setGamma(handle_, 1, 12.92F);
    RETURN_IF_BAD(StatusOf(Library().process(handle_)));
    int fault = 0;
    image_ = Library().make(handle_, &fault);
    if (image_ == nullptr) return fault == 0 ? Status::MemoryAllocationError : StatusOf(fault);
    const bool fits = image_->type == kBitmap && image_->bits == 8 &&
                      (image_->colors == 3 || image_->colors == 1) &&
                      image_->width == facts.width && image_->height == facts.height;
    const uint64_t count = pixels.size() / 3 * image_->colors;
    if (!fits || image_->size < count) return Status::DamagedFile;
    for (uint64_t i = 0; i < pixels.size(); ++i)
      pixels[i] = image_->data[image_->colors == 1 ? i / 3 : i];
    return Status::Ok;
  }

  bool Damaged() const { return damaged_ != 0; }

 private:
  // Uses the camera's white balance, if there is one.
  void TakeBalance() {
    float factors[4];
    for (int i = 0; i < 4; ++i) factors[i] = Library().balance(handle_, i);
    if (!(factors[0] > 0 && factors[1] > 0 && factors[2] > 0)) return;
    for (int i = 0; i < 4; ++i) Library().setBalance(handle_, i, factors[i]);
  }

  RawHandle* handle_;
  RawImage* image_ = nullptr;
  Status opened_ = Status::MemoryAllocationError;
  int32_t damaged_ = 0;
};

Status RunApartFor(std::span<const uint8_t> file, const RawFacts* wanted, unsigned seconds,
                   const StopToken& stop, platform::SharedBlock& block, Answer& answer) {
  if (!HasRawLibrary()) return Status::FeatureDisabled;
  const uint64_t pixels =
      wanted == nullptr ? 0 : RowBytes(*wanted) * static_cast<uint64_t>(wanted->height);
  if (!block.Allocate(kAnswerBytes + pixels)) return Status::MemoryAllocationError;
  const RawFacts request = wanted == nullptr ? RawFacts() : *wanted;
  const platform::ApartResult result =
      platform::RunApart({.task = kRawTask.name,
                          .request = {reinterpret_cast<const uint8_t*>(&request), sizeof request},
                          .input = file,
                          .reply = block,
                          .seconds = seconds,
                          .goesOn = [&stop] { return !stop.Asked(); }},
                         [](int32_t) {});
  switch (result) {
    case platform::ApartResult::Done:
      std::memcpy(&answer, block.Bytes().data(), sizeof answer);
      return answer.status;
    case platform::ApartResult::NotStarted: return Status::MemoryAllocationError;
    case platform::ApartResult::Stopped: return Status::FunctionCancelled;
    default: return Status::DamagedFile;
  }
}

}  // namespace

bool HasRawLibrary() { return Library().Whole(); }

std::string RawLibraryVersion() { return HasRawLibrary() ? Library().version() : "missing"; }

const uint8_t* RawPixels::Row(const RawFacts& facts, int32_t y) const {
  return block.Bytes().data() + kAnswerBytes + RowBytes(facts) * static_cast<uint64_t>(y);
}

Status DescribeRaw(std::span<const uint8_t> file, const StopToken& stop, RawFacts& facts) {
  platform::SharedBlock block;
  Answer answer;
  RETURN_IF_BAD(RunApartFor(file, nullptr, kSecondsToDescribe, stop, block, answer));
  facts = answer.facts;
  facts.camera[sizeof facts.camera - 1] = 0;
  return CheckPackedSize(facts.width, facts.height, 24);
}

Status DevelopRaw(std::span<const uint8_t> file, const RawFacts& facts, const StopToken& stop,
                  RawPixels& pixels) {
  const uint64_t size = RowBytes(facts) * static_cast<uint64_t>(facts.height);
  RETURN_IF_BAD(CheckFileMemory(2 * size));  // plus the picture itself
  const auto seconds = static_cast<unsigned>(kSecondsAtLeast + size / 3 / kPixelsPerSecond);
  Answer answer;
  RETURN_IF_BAD(RunApartFor(file, &facts, seconds, stop, pixels.block, answer));
  pixels.damaged = answer.damaged != 0;
  return Status::Ok;
}

bool RunRawTask(const platform::ApartCall& call) {
  RawFacts wanted;
  if (call.request.size() != sizeof wanted || call.reply.size() < kAnswerBytes || !HasRawLibrary())
    return false;
  std::memcpy(&wanted, call.request.data(), sizeof wanted);
  const std::span<uint8_t> pixels = call.reply.subspan(kAnswerBytes);
  const bool develops = wanted.width > 0 && wanted.height > 0;
  if (develops && pixels.size() != RowBytes(wanted) * static_cast<uint64_t>(wanted.height))
    return false;
  OpenRaw raw(call.input);
  Answer answer;
  answer.status = develops ? raw.Develop(wanted, pixels) : raw.Describe(answer.facts);
  answer.damaged = raw.Damaged();
  std::memcpy(call.reply.data(), &answer, sizeof answer);
  return true;
}

}  // namespace fotomill
