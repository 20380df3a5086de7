#pragma once

#include <cstdint>
#include <span>
#include <string>

#include "platform/memory.h"

namespace fotomill::platform {

// A whole regular file as read-only bytes, mapped or read in one piece, whichever is cheaper for
// its size. Anything that is not a regular file (folder, FIFO, device, socket) does not open, and
// opening never blocks. Another program may cut the file short while it is viewed: the lost bytes
// then read as 0 and Intact() turns false.
class FileView {
 public:
  FileView() = default;
  FileView(FileView&& other) noexcept;
  FileView& operator=(FileView&& other) noexcept;
  FileView(const FileView&) = delete;
  FileView& operator=(const FileView&) = delete;
  ~FileView() { Close(); }

  // Opens `path` for reading. False when it is missing, not a regular file, not readable, or there
  // is no memory for it.
  [[nodiscard]] bool Open(const char* path);
  // Closes what was open before.
  [[nodiscard]] bool Open(const std::string& path) { return Open(path.c_str()); }
  // Opens `path` but makes only its first `count` bytes visible; FileSize() still tells the whole
  // length. For headers.
  [[nodiscard]] bool OpenHead(const char* path, uint64_t count);
  void Close();  // spans into the file end here

  // What is visible, until Close or another Open; and the length of the whole file when it was
  // opened.
  std::span<const uint8_t> Bytes() const { return {data_, static_cast<size_t>(size_)}; }
  uint64_t FileSize() const { return fileSize_; }  // bytes when it was opened
  // Copies the bytes of the file from `offset` on into `into`, also those that OpenHead left out,
  // without making them a part of the view: the cheapest way to a block that holds them anyway.
  // False when the file ends before, or on an error.
  [[nodiscard]] bool ReadAt(uint64_t offset, std::span<uint8_t> into) const;
  // Whether every byte handed out so far really came from the file.
  bool Intact() const;
  // Says that bytes before `offset` will not be read again for now, so that a long file need not
  // stay in memory. They may still be read: the system fetches them again.
  void DropBefore(uint64_t offset);

 private:
  [[nodiscard]] bool OpenPart(const char* path, uint64_t most);
  [[nodiscard]] bool Map();
  const uint8_t* data_ = nullptr;
  uint64_t size_ = 0;
  uint64_t fileSize_ = 0;
  uint64_t dropped_ = 0;     // bytes given back so far, a multiple of the page size
  void* mapping_ = nullptr;  // set when mapped
  intptr_t handle_ = -1;     // the open file
  MemoryBlock copy_;         // holds the bytes when not mapped
};

}  // namespace fotomill::platform
