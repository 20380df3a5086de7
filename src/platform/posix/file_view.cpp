#include "platform/file_view.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
#include <cerrno>
#include <cstring>
#include <mutex>
#include <utility>

#include "platform/fault.h"

namespace fotomill::platform {

namespace {

constexpr uint64_t kMappedFrom = 256 * 1024;         // up to here one read is cheaper than a mapping
constexpr uint64_t kDropStep = uint64_t{2} << 20;    // bytes given back at a time
constexpr size_t kMostMappings = 256;

// The mapped views. A mapping whose file was cut short raises SIGBUS when the lost part is touched; the handler puts
// zero pages there and marks the view, so that one file cannot take the program down. Slots are only ever reused.
struct MappedRange {
  std::atomic<uintptr_t> begin{0};
  std::atomic<uintptr_t> end{0};
  std::atomic<bool> damaged{false};
};
MappedRange mappedRanges[kMostMappings];
struct sigaction previousAction;

void OnBusError(int signalNumber, siginfo_t* info, void*) {
  const auto address = reinterpret_cast<uintptr_t>(info->si_addr);
  for (MappedRange& range : mappedRanges) {
    const uintptr_t begin = range.begin.load(), end = range.end.load();
    if (address < begin || address >= end) continue;
    const uintptr_t page = address & ~static_cast<uintptr_t>(4095);
    const size_t rest = end - page;
    if (mmap(reinterpret_cast<void*>(page), rest, PROT_READ, MAP_PRIVATE | MAP_ANONYMOUS | MAP_FIXED, -1, 0) ==
        MAP_FAILED) {
      break;
    }
    range.damaged = true;
    return;
  }
  sigaction(signalNumber, &previousAction, nullptr);  // not ours: the same access raises it again for the old handler
}

void InstallBusHandler() {
  static std::once_flag once;
  std::call_once(once, [] {
    struct sigaction action = {};
    action.sa_sigaction = OnBusError;
    action.sa_flags = SA_SIGINFO;
    sigemptyset(&action.sa_mask);
    sigaction(SIGBUS, &action, &previousAction);
  });
}

// Enters a mapping into the table; null when the table is full.
MappedRange* EnterRange(const void* data, uint64_t size) {
  static std::mutex mutex;
  const std::lock_guard lock(mutex);
  for (MappedRange& range : mappedRanges) {
    if (range.begin != 0) continue;
    range.damaged = false;
    range.end = reinterpret_cast<uintptr_t>(data) + size;
    range.begin = reinterpret_cast<uintptr_t>(data);
    return &range;
  }
  return nullptr;
}

// Reads up to `size` bytes at `offset` into `data`; the number of bytes read, or -1 on an error.
int64_t ReadAll(int handle, uint64_t offset, uint8_t* data, uint64_t size) {
  uint64_t done = 0;
  while (done < size) {
    const ssize_t count = pread(handle, data + done, size - done, static_cast<off_t>(offset + done));
    if (count < 0 && errno == EINTR) continue;
    if (count < 0) return -1;
    if (count == 0) break;
    done += static_cast<uint64_t>(count);
  }
  return static_cast<int64_t>(done);
}

}  // namespace

FileView::FileView(FileView&& other) noexcept { *this = std::move(other); }

FileView& FileView::operator=(FileView&& other) noexcept {
  if (this != &other) {
    Close();
    data_ = std::exchange(other.data_, nullptr);
    size_ = std::exchange(other.size_, 0);
    fileSize_ = std::exchange(other.fileSize_, 0);
    dropped_ = std::exchange(other.dropped_, 0);
    mapping_ = std::exchange(other.mapping_, nullptr);
    handle_ = std::exchange(other.handle_, -1);
    copy_ = std::move(other.copy_);
  }
  return *this;
}

bool FileView::Open(const char* path) { return OpenPart(path, UINT64_MAX); }

bool FileView::OpenHead(const char* path, uint64_t count) { return OpenPart(path, count); }

bool FileView::OpenPart(const char* path, uint64_t most) {
  Close();
  if (FaultDue()) return false;
  const int handle = open(path, O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY);
  if (handle < 0) return false;
  handle_ = handle;
  struct stat facts;
  if (fstat(handle, &facts) != 0 || !S_ISREG(facts.st_mode)) {
    Close();
    return false;
  }
  fileSize_ = static_cast<uint64_t>(facts.st_size);
  size_ = fileSize_ < most ? fileSize_ : most;
  if (size_ >= kMappedFrom && Map()) return true;
  const int64_t count =
      FaultDue() || !copy_.Allocate(size_, Fill::Unset) ? -1 : ReadAll(handle, 0, copy_.Data(), size_);
  if (count < 0) {
    Close();
    return false;
  }
  if (static_cast<uint64_t>(count) < size_) size_ = fileSize_ = static_cast<uint64_t>(count);
  data_ = copy_.Data();
  return true;
}

bool FileView::Map() {
  void* data = mmap(nullptr, size_, PROT_READ, MAP_PRIVATE, static_cast<int>(handle_), 0);
  if (data == MAP_FAILED) return false;
  InstallBusHandler();
  mapping_ = EnterRange(data, size_);
  if (mapping_ == nullptr) {
    munmap(data, size_);
    return false;
  }
  madvise(data, size_, MADV_SEQUENTIAL);
  data_ = static_cast<const uint8_t*>(data);
  return true;
}

bool FileView::ReadAt(uint64_t offset, std::span<uint8_t> into) const {
  if (into.size() > fileSize_ || offset > fileSize_ - into.size()) return false;
  if (mapping_ == nullptr && offset + into.size() <= size_) {
    if (!into.empty()) std::memcpy(into.data(), data_ + offset, into.size());
    return true;
  }
  return !FaultDue() && ReadAll(static_cast<int>(handle_), offset, into.data(), into.size()) ==
                            static_cast<int64_t>(into.size());
}

void FileView::Close() {
  if (mapping_ != nullptr) {
    munmap(const_cast<uint8_t*>(data_), size_);
    static_cast<MappedRange*>(mapping_)->begin = 0;
    mapping_ = nullptr;
  }
  if (handle_ >= 0) close(static_cast<int>(handle_));
  handle_ = -1;
  copy_.Free();
  data_ = nullptr;
  size_ = fileSize_ = dropped_ = 0;
}

bool FileView::Intact() const {
  return mapping_ == nullptr || !static_cast<const MappedRange*>(mapping_)->damaged.load();
}

void FileView::DropBefore(uint64_t offset) {
  if (mapping_ == nullptr || offset < dropped_ + kDropStep || offset > size_) return;
  const uint64_t end = offset & ~(kDropStep - 1);
  madvise(const_cast<uint8_t*>(data_) + dropped_, end - dropped_, MADV_DONTNEED);
  dropped_ = end;
}

}  // namespace fotomill::platform
