#include "platform/file_view.h"

#include <fcntl.h>
#include <signal.h>
#include <sys/mman.h>
#include <sys/stat.h>
#include <unistd.h>

#include <algorithm>
#include <atomic>
#include <cstring>
#include <mutex>
#include <utility>

#include "platform/fault.h"
#include "platform/posix/handle.h"
#include "platform/posix/kept_reason.h"
#include "platform/reason.h"

namespace fotomill::platform {

namespace {

constexpr uint64_t kMappedFrom = 256 * 1024;       // below this, reading is cheaper than mapping
constexpr uint64_t kDropStep = uint64_t{2} << 20;  // bytes released at a time
constexpr size_t kMostMappings = 256;

// The mapped views. Accessing a mapping beyond the end of a truncated file raises SIGBUS; the
// handler maps zero pages there and marks the view, so that one file cannot crash the program.
// Slots are reused, never freed.
struct MappedRange {
  std::atomic<uintptr_t> begin{0};  // 0: the slot is free
  std::atomic<uintptr_t> end{0};    // up to the end of the last page
  std::atomic<bool> damaged{false};
};
MappedRange mappedRanges[kMostMappings];
static_assert(std::atomic<uintptr_t>::is_always_lock_free,
              "the handler may only touch lock-free objects");
struct sigaction previousAction;
uintptr_t pageSize = 4096;

// Maps zero pages from the faulting page to the end of its view; false if the address is
// in no view.
bool ReplaceLostPages(uintptr_t address) {
  for (MappedRange& range : mappedRanges) {
    const uintptr_t begin = range.begin.load(), end = range.end.load();
    if (begin == 0 || address < begin || address >= end) continue;
    const uintptr_t page = address & ~(pageSize - 1);
    range.damaged = true;
    return mmap(reinterpret_cast<void*>(page), end - page, PROT_READ,
                MAP_PRIVATE | MAP_ANONYMOUS | MAP_FIXED, -1, 0) != MAP_FAILED;
  }
  return false;
}

void OnBusError(int signalNumber, siginfo_t* info, void*) {
  const bool fromMemory = info->si_code > 0;  // as opposed to kill()
  if (fromMemory && ReplaceLostPages(reinterpret_cast<uintptr_t>(info->si_addr))) return;
  sigaction(signalNumber, &previousAction, nullptr);
  if (!fromMemory) raise(signalNumber);  // a memory access raises it again by itself
}

void InstallBusHandler() {
  static std::once_flag once;
  std::call_once(once, [] {
    pageSize = static_cast<uintptr_t>(sysconf(_SC_PAGESIZE));
    struct sigaction action = {};
    action.sa_sigaction = OnBusError;
    action.sa_flags = SA_SIGINFO | SA_ONSTACK;
    sigemptyset(&action.sa_mask);
    sigaction(SIGBUS, &action, &previousAction);
  });
}

// Registers a mapping; null if the table is full.
MappedRange* EnterRange(const void* data, uint64_t size) {
  static std::mutex mutex;
  const std::lock_guard lock(mutex);
  for (MappedRange& range : mappedRanges) {
    if (range.begin != 0) continue;
    range.damaged = false;
    range.end = (reinterpret_cast<uintptr_t>(data) + static_cast<uintptr_t>(size) + pageSize - 1) &
                ~(pageSize - 1);
    range.begin = reinterpret_cast<uintptr_t>(data);
    return &range;
  }
  return nullptr;
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
  ForgetReason();
  if (FaultDue()) return false;
  struct stat facts;
  handle_ = OpenRegular(path, O_RDONLY, facts).Release();
  if (handle_ < 0) return false;
  fileSize_ = static_cast<uint64_t>(facts.st_size);
  size_ = std::min(fileSize_, most);
  if (size_ >= kMappedFrom && Map()) return true;
  const int64_t count = FaultDue() || !copy_.Allocate(size_, Fill::Unset)
                            ? -1
                            : ReadFully(static_cast<int>(handle_), copy_.Data(), size_, 0);
  if (count < 0) {
    KeepErrno();
    Close();
    return false;
  }
  if (static_cast<uint64_t>(count) < size_) size_ = fileSize_ = static_cast<uint64_t>(count);
  data_ = copy_.Data();
  return true;
}

bool FileView::Map() {
  if (size_ > SIZE_MAX / 2 || FaultDue()) return false;
  void* data = mmap(nullptr, static_cast<size_t>(size_), PROT_READ, MAP_PRIVATE,
                    static_cast<int>(handle_), 0);
  if (data == MAP_FAILED) return false;
  InstallBusHandler();
  mapping_ = EnterRange(data, size_);
  if (mapping_ == nullptr) {
    munmap(data, static_cast<size_t>(size_));
    return false;
  }
  madvise(data, static_cast<size_t>(size_), MADV_SEQUENTIAL);
  data_ = static_cast<const uint8_t*>(data);
  return true;
}

bool FileView::ReadAt(uint64_t offset, std::span<uint8_t> into) const {
  if (handle_ < 0 || into.size() > fileSize_ || offset > fileSize_ - into.size()) return false;
  if (mapping_ == nullptr && offset + into.size() <= size_) {
    if (!into.empty()) std::memcpy(into.data(), data_ + offset, into.size());
    return true;
  }
  const int64_t count = FaultDue() ? -1
                                   : ReadFully(static_cast<int>(handle_), into.data(), into.size(),
                                               static_cast<int64_t>(offset));
  return count == static_cast<int64_t>(into.size());
}

void FileView::Close() {
  if (mapping_ != nullptr) {
    // first: after munmap, the addresses may belong to another view
    static_cast<MappedRange*>(mapping_)->begin = 0;
    munmap(const_cast<uint8_t*>(data_), static_cast<size_t>(size_));
    mapping_ = nullptr;
  }
  if (handle_ >= 0) close(static_cast<int>(handle_));
  handle_ = -1;
  copy_.Free();
  data_ = nullptr;
  size_ = fileSize_ = dropped_ = 0;
}

// The partial last page of a truncated file reads as zeros without a signal, so the size is checked
// as well.
bool FileView::Intact() const {
  if (mapping_ == nullptr) return true;
  struct stat facts;
  return !static_cast<const MappedRange*>(mapping_)->damaged.load() &&
         fstat(static_cast<int>(handle_), &facts) == 0 &&
         static_cast<uint64_t>(facts.st_size) >= size_;
}

void FileView::DropBefore(uint64_t offset) {
  const uint64_t end = std::min(offset, size_) & ~(kDropStep - 1);
  if (mapping_ == nullptr || end <= dropped_) return;
  madvise(const_cast<uint8_t*>(data_) + dropped_, static_cast<size_t>(end - dropped_),
          MADV_DONTNEED);
  dropped_ = end;
}

}  // namespace fotomill::platform
