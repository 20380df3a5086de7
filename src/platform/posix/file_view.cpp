#include "platform/file_view.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <atomic>
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

// Reads up to `size` bytes into `data`; the number of bytes read, or -1 on an error.
int64_t ReadAll(int handle, uint8_t* data, uint64_t size) {
  uint64_t done = 0;
  while (done < size) {
    const ssize_t count = read(handle, data + done, size - done);
    if (count < 0) return -1;
    if (count == 0) break;
    done += static_cast<uint64_t>(count);
  }
  return static_cast<int64_t>(done);
}

// An open handle that closes itself.
struct Handle {
  int number;
  ~Handle() {
    if (number >= 0) close(number);
  }
};

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
    copy_ = std::move(other.copy_);
  }
  return *this;
}

bool FileView::Open(const char* path) { return OpenPart(path, UINT64_MAX); }

bool FileView::OpenHead(const char* path, uint64_t count) { return OpenPart(path, count); }

bool FileView::OpenPart(const char* path, uint64_t most) {
  Close();
  if (FaultDue()) return false;
  const Handle handle{open(path, O_RDONLY | O_CLOEXEC | O_NONBLOCK | O_NOCTTY)};
  struct stat facts;
  if (handle.number < 0 || fstat(handle.number, &facts) != 0 || !S_ISREG(facts.st_mode)) return false;
  const uint64_t fileSize = static_cast<uint64_t>(facts.st_size);
  const uint64_t wanted = fileSize < most ? fileSize : most;
  if (wanted >= kMappedFrom) {
    void* data = mmap(nullptr, wanted, PROT_READ, MAP_PRIVATE, handle.number, 0);
    if (data != MAP_FAILED) {
      InstallBusHandler();
      if (MappedRange* range = EnterRange(data, wanted)) {
        madvise(data, wanted, MADV_SEQUENTIAL);
        data_ = static_cast<const uint8_t*>(data);
        mapping_ = range;
        size_ = wanted;
        fileSize_ = fileSize;
        return true;
      }
      munmap(data, wanted);
    }
  }
  if (!copy_.Allocate(wanted, Fill::Unset)) return false;
  const int64_t count = FaultDue() ? -1 : ReadAll(handle.number, copy_.Data(), wanted);
  if (count < 0) {
    copy_.Free();
    return false;
  }
  data_ = copy_.Data();
  size_ = static_cast<uint64_t>(count);
  fileSize_ = count < static_cast<int64_t>(wanted) ? size_ : fileSize;
  return true;
}

void FileView::Close() {
  if (mapping_ != nullptr) {
    munmap(const_cast<uint8_t*>(data_), size_);
    static_cast<MappedRange*>(mapping_)->begin = 0;
    mapping_ = nullptr;
  }
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
