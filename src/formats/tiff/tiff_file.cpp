#include "formats/tiff/tiff_file.h"

#include <algorithm>
#include <cstdio>
#include <cstring>
#include <memory>
#include <string_view>
#include <unordered_set>

#include "core/byte_reader.h"
#include "core/limits.h"

namespace fotomill {

namespace {

constexpr uint64_t kPlaceOfFirst = 4;  // position of the first directory's offset

TiffMessages& MessagesOf(void* user) { return *static_cast<TiffMessages*>(user); }

// Both return 1: the message is handled and must not be printed.
int OnError(TIFF*, void* user, const char*, const char* format, va_list arguments) {
  TiffMessages& messages = MessagesOf(user);
  if (messages.error[0] == 0)
    std::vsnprintf(messages.error, sizeof messages.error, format, arguments);
  return 1;
}

// Warnings about directories are harmless, and old-style LZW codes are valid.
int OnWarning(TIFF*, void* user, const char* module, const char* format, va_list arguments) {
  TiffMessages& messages = MessagesOf(user);
  const bool counts =
      messages.inPixels && messages.warning[0] == 0 && !std::string_view(module).starts_with("LZW");
  if (counts) std::vsnprintf(messages.warning, sizeof messages.warning, format, arguments);
  return 1;
}

uint64_t NewPosition(uint64_t position, uint64_t size, uint64_t offset, int from) {
  return from == SEEK_SET ? offset : from == SEEK_CUR ? position + offset : size + offset;
}

struct OptionsDeleter {
  void operator()(TIFFOpenOptions* options) const { TIFFOpenOptionsFree(options); }
};
using Options = std::unique_ptr<TIFFOpenOptions, OptionsDeleter>;

Options NewOptions(TiffMessages& messages) {
  // Some messages are not associated with a file.
  static const bool silenced = [] {
    TIFFSetErrorHandler(nullptr);
    TIFFSetWarningHandler(nullptr);
    return true;
  }();
  Options options(silenced ? TIFFOpenOptionsAlloc() : nullptr);
  if (options == nullptr) return options;
  TIFFOpenOptionsSetMaxSingleMemAlloc(options.get(),
                                      static_cast<tmsize_t>(limits.packedBlockBytes));
  TIFFOpenOptionsSetErrorHandlerExtR(options.get(), OnError, &messages);
  TIFFOpenOptionsSetWarningHandlerExtR(options.get(), OnWarning, &messages);
  return options;
}

TiffInput& InputOf(thandle_t handle) { return *static_cast<TiffInput*>(handle); }
TiffOutput& OutputOf(thandle_t handle) { return *static_cast<TiffOutput*>(handle); }

tmsize_t ReadInput(thandle_t handle, void* target, tmsize_t count) {
  return InputOf(handle).Read(target, count);
}
tmsize_t WriteNothing(thandle_t, void*, tmsize_t) { return -1; }
uint64_t SeekInput(thandle_t handle, uint64_t offset, int from) {
  return InputOf(handle).Seek(offset, from);
}
uint64_t InputSize(thandle_t handle) { return InputOf(handle).Bytes().size(); }
int MapInput(thandle_t handle, void** base, toff_t* size) {
  *base = const_cast<uint8_t*>(InputOf(handle).Bytes().data());  // the library does not write to it
  *size = InputOf(handle).Bytes().size();
  return 1;
}
tmsize_t ReadNothing(thandle_t, void*, tmsize_t) { return -1; }
tmsize_t WriteOutput(thandle_t handle, void* source, tmsize_t count) {
  return OutputOf(handle).Write(source, count);
}
uint64_t SeekOutput(thandle_t handle, uint64_t offset, int from) {
  return OutputOf(handle).Seek(offset, from);
}
uint64_t OutputSize(thandle_t handle) { return OutputOf(handle).Seek(0, SEEK_END); }
int CloseNothing(thandle_t) { return 0; }
int MapNothing(thandle_t, void**, toff_t*) { return 0; }
void UnmapNothing(thandle_t, void*, toff_t) {}

}  // namespace

TiffInput::~TiffInput() {
  if (tiff_ != nullptr) TIFFClose(tiff_);
}

Status TiffInput::Open() {
  if (bytes_.size() < 8) return Status::FileReadError;
  const Options options = NewOptions(messages_);
  if (options == nullptr) return Status::MemoryAllocationError;
  tiff_ = TIFFClientOpenExt("", "r", this, ReadInput, WriteNothing, SeekInput, CloseNothing,
                            InputSize, MapInput, UnmapNothing, options.get());
  return tiff_ != nullptr ? Status::Ok : Failure();
}

Status TiffInput::OpenAt(uint64_t directory) {
  TIFFClose(tiff_);
  tiff_ = nullptr;
  position_ = 0;
  directory_ = directory;
  return Open();
}

// Replaces the first directory's offset in header bytes read from `offset` on: it follows the 4
// bytes of signature and version, in BigTIFF 8 bytes.
void TiffInput::NameDirectory(uint64_t offset, std::span<uint8_t> bytes) const {
  const bool bigEndian = bytes_[0] == 'M', big = (bigEndian ? bytes_[3] : bytes_[2]) == 43;
  const uint64_t field = big ? 8 : 4, size = field;
  for (uint64_t i = 0; i < size; ++i) {
    const uint64_t place = field + i;
    if (place < offset || place - offset >= bytes.size()) continue;
    bytes[place - offset] = static_cast<uint8_t>(directory_ >> 8 * (bigEndian ? size - 1 - i : i));
  }
}

// Visited directories are only tracked once the chain goes backward.
std::vector<uint64_t> TiffInput::PageOffsets() const {
  const bool big = TIFFIsBigTIFF(tiff_) != 0;
  const bool bigEndian = TIFFIsBigEndian(tiff_) != 0;
  ByteReader bytes(bytes_);
  const auto number = [&](int size) -> uint64_t {
    if (size == 2) return bigEndian ? bytes.Be16() : bytes.Le16();
    const uint64_t first = bigEndian ? bytes.Be32() : bytes.Le32();
    if (size == 4) return first;
    return bigEndian ? first << 32 | bytes.Be32() : first | uint64_t{bytes.Le32()} << 32;
  };
  std::vector<uint64_t> offsets;
  std::unordered_set<uint64_t> visited;
  uint64_t furthest = 0;
  bytes.Seek(big ? 8 : 4);
  for (uint64_t next = number(big ? 8 : 4); next != 0 && offsets.size() < limits.filePages;) {
    bytes.Seek(next);
    const uint64_t entries = number(big ? 8 : 2);
    const uint64_t entrySize = big ? 20 : 12;
    if (!bytes.Ok() || entries == 0 || entries > bytes.Left() / entrySize) break;
    if (next <= furthest && visited.empty()) visited.insert(offsets.begin(), offsets.end());
    if ((next <= furthest || !visited.empty()) && !visited.insert(next).second) break;
    furthest = std::max(furthest, next);
    offsets.push_back(next);
    bytes.Skip(entries * entrySize);
    next = number(big ? 8 : 4);
    if (!bytes.Ok()) break;
  }
  return offsets;
}

Status TiffInput::Failure() const {
  const std::string_view message(messages_.error);
  const auto says = [&](std::string_view words) {
    return message.find(words) != std::string_view::npos;
  };
  if (says("ot configured") || says("not supported") || says("nsupported") ||
      says("not implemented") || says("can not handle") || says("Sorry")) {
    return Status::UnsupportedFormat;
  }
  if (says("emory") || says("No space")) return Status::MemoryAllocationError;
  if (says("ead error") || says("an not read TIFF") || says("eek error") || says("ot enough data"))
    return Status::FileReadError;
  return Status::DamagedFile;
}

tmsize_t TiffInput::Read(void* target, tmsize_t count) {
  if (count <= 0 || position_ >= bytes_.size()) return 0;
  const size_t taken =
      std::min(static_cast<size_t>(count), static_cast<size_t>(bytes_.size() - position_));
  std::memcpy(target, bytes_.data() + position_, taken);
  if (directory_ != 0) NameDirectory(position_, {static_cast<uint8_t*>(target), taken});
  position_ += taken;
  return static_cast<tmsize_t>(taken);
}

uint64_t TiffInput::Seek(uint64_t offset, int from) {
  position_ = NewPosition(position_, bytes_.size(), offset, from);
  return position_;
}

TiffOutput::~TiffOutput() {
  if (tiff_ != nullptr) TIFFClose(tiff_);
}

bool TiffOutput::Open() {
  const Options options = NewOptions(messages_);
  if (options == nullptr) return false;
  tiff_ = TIFFClientOpenExt("", "wl", this, ReadNothing, WriteOutput, SeekOutput, CloseNothing,
                            OutputSize, MapNothing, UnmapNothing, options.get());
  return tiff_ != nullptr;
}

// The file header has the offset of the directory, which starts with the number of its entries.
void TiffOutput::NoteDirectory(std::span<const uint8_t> bytes) {
  ByteReader reader(bytes);
  if (position_ == kPlaceOfFirst && bytes.size() == 4) directory_ = reader.Le32();
  if (directory_ != 0 && position_ == directory_) entries_ = reader.Le16();
}

tmsize_t TiffOutput::Write(const void* source, tmsize_t count) {
  std::span<const uint8_t> bytes(static_cast<const uint8_t*>(source), static_cast<size_t>(count));
  NoteDirectory(bytes);
  if (position_ > out_.Position()) out_.Zeros(position_ - out_.Position());
  const auto inside = std::min<uint64_t>(bytes.size(), out_.Position() - position_);
  out_.Patch(position_, bytes.first(inside));
  out_.Bytes(bytes.subspan(inside));
  position_ += bytes.size();
  return out_.Failed() ? -1 : count;
}

uint64_t TiffOutput::Seek(uint64_t offset, int from) {
  position_ = NewPosition(position_, out_.Position(), offset, from);
  return position_;
}

}  // namespace fotomill
