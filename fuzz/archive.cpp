#include <cstdint>
#include <cstdlib>
#include <string>

#include "archive/archive_kind.h"
#include "archive/archive_walk.h"
#include "archive/entry_name.h"

namespace fotomill {
namespace {

void Require(bool holds) {
  if (!holds) std::abort();
}

// A name that is shown must be UTF-8 and stay as it is; a safe one must be stored as itself.
void TryName(std::string_view bytes) {
  const std::string shown = ReadableEntryName(bytes);
  Require(ReadableEntryName(shown) == shown);
  if (!IsSafeEntryName(shown)) return;
  Require(shown.find("..") == std::string::npos || StoredEntryName(shown) == shown);
  Require(StoredEntryName(shown) == shown && shown.front() != '/');
}

// Takes everything, and sees that calls come in order.
class Taker final : public ArchiveSink {
 public:
  bool Entry(const RawEntry&, std::string_view name) override {
    Require(!open_);
    TryName(name);
    return open_ = true;
  }
  void Data(std::span<const uint8_t> bytes) override {
    Require(open_);
    size_ += bytes.size();
    if (size_ > kMost) throw Enough();
  }
  void EndEntry(const ArchiveEnd&) override {
    Require(open_);
    open_ = false;
  }
  struct Enough {};

 private:
  static constexpr uint64_t kMost = 1 << 24;  // bytes; a small archive can hold terabytes
  bool open_ = false;
  uint64_t size_ = 0;
};

}  // namespace
}  // namespace fotomill

extern "C" int LLVMFuzzerTestOneInput(const uint8_t* data, size_t size) {
  using namespace fotomill;
  const std::span<const uint8_t> bytes(data, size);
  TryName({reinterpret_cast<const char*>(data), size});
  (void)ArchiveKindOf(bytes);
  Taker taker;
  try {
    (void)WalkArchive(bytes, "password", 1000, taker);
  } catch (const Taker::Enough&) {
  }
  return 0;
}
