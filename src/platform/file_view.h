#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "platform/memory.h"

namespace fotomill::platform {

// A read-only view of a regular file, mapped or read at once, whichever
// is cheaper for its size. Anything else (folder, FIFO, device, socket)
// fails to open, and opening never blocks. If another program truncates
// the file meanwhile, the lost bytes read as 0 and Intact() turns false.
class FileView {
 public:
  FileView() = default;
  FileView(FileView&& other) noexcept;
  FileView& operator=(FileView&& other) noexcept;
  FileView(const FileView&) = delete;
  FileView& operator=(const FileView&) = delete;
  ~FileView() { Close(); }

  // Opens `path` for reading. False if it is missing, not a regular file, not readable, or memory
  // runs out.
  [[nodiscard]] bool Open(const char* path);
  // Closes the previous file first.
  [[nodiscard]] bool Open(const std::string& path) { return Open(path.c_str()); }
  // Opens `path` but makes only its first `count` bytes visible; FileSize() is still the size of
  // the whole file. For headers.
  [[nodiscard]] bool OpenHead(const char* path, uint64_t count);
  void Close();  // invalidates spans into the file

  // The visible bytes, valid until Close or the next Open; and the size of the whole file when it
  // was opened.
  std::span<const uint8_t> Bytes() const { return {data_, static_cast<size_t>(size_)}; }
  uint64_t FileSize() const { return fileSize_; }  // bytes when it was opened
  // Copies bytes from `offset` into `into`, including those that OpenHead left out, without adding
  // them to the view: cheaper if the caller needs its own copy anyway. False at the end of the file
  // or on an error.
  [[nodiscard]] bool ReadAt(uint64_t offset, std::span<uint8_t> into) const;
  // Whether all bytes read so far really came from the file.
  bool Intact() const;
  // Hints that bytes before `offset` are no longer needed, so that a large file need not stay in
  // memory. They can still be read; the system loads them again.
  void DropBefore(uint64_t offset);

 private:
  [[nodiscard]] bool OpenPart(const char* path, uint64_t most);
  [[nodiscard]] bool Map();
  const uint8_t* data_ = nullptr;
  uint64_t size_ = 0;
  uint64_t fileSize_ = 0;
  uint64_t dropped_ = 0;     // bytes released so far, a multiple of the page size
  void* mapping_ = nullptr;  // null if not mapped
  intptr_t handle_ = -1;     // the open file
  MemoryBlock copy_;         // the contents if not mapped
};

}  // namespace fotomill::platform
