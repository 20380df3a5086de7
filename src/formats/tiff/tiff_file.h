#pragma once

#include <tiffio.h>

#include <cstdint>
#include <span>
#include <vector>

#include "core/byte_writer.h"
#include "core/status.h"

namespace fotomill {

// The library's messages for one file; never printed.
struct TiffMessages {
  char error[160] = {};    // the first error
  char warning[160] = {};  // the first warning about pixel data
  bool inPixels = false;   // pixels are being decoded, so warnings are recorded
};

// A TIFF file in memory, opened for reading at its first directory. `bytes` must outlive it.
class TiffInput {
 public:
  explicit TiffInput(std::span<const uint8_t> bytes) : bytes_(bytes) {}  // does not own the bytes
  ~TiffInput();
  TiffInput(const TiffInput&) = delete;
  TiffInput& operator=(const TiffInput&) = delete;

  // Ok; FileReadError (3) if the file is truncated, DamagedFile (2) if it is not a TIFF file or its
  // directory is invalid.
  Status Open();
  // Reopens the file at another directory, as if its header pointed there: the library would
  // otherwise walk the whole chain for each page. Statuses of Open.
  Status OpenAt(uint64_t directory);
  // Offsets of all page directories, up to the limit; stops at a repeated one. The file
  // must be open.
  std::vector<uint64_t> PageOffsets() const;
  // The status for a failed library call, by its message.
  Status Failure() const;
  TIFF* Handle() const { return tiff_; }  // the library's handle; null until Open
  TiffMessages& Messages() { return messages_; }  // the library's messages so far
  std::span<const uint8_t> Bytes() const { return bytes_; }

  // Callbacks of the library.
  tmsize_t Read(void* target, tmsize_t count);
  uint64_t Seek(uint64_t offset, int from);

 private:
  void NameDirectory(uint64_t offset, std::span<uint8_t> bytes) const;

  std::span<const uint8_t> bytes_;
  uint64_t position_ = 0;
  uint64_t directory_ = 0;  // replaces the offset in the header; 0: not replaced
  TIFF* tiff_ = nullptr;
  TiffMessages messages_;
};

// A TIFF file being written into `out`, which must outlive it.
class TiffOutput {
 public:
  explicit TiffOutput(ByteWriter& out) : out_(out) {}  // opens nothing yet
  ~TiffOutput();
  TiffOutput(const TiffOutput&) = delete;
  TiffOutput& operator=(const TiffOutput&) = delete;

  [[nodiscard]] bool Open();  // false if memory runs out
  TIFF* Handle() const { return tiff_; }
  // The current size; and appends bytes that are not written by the library.
  uint64_t End() const { return out_.Position(); }
  // Bypasses the library.
  void Append(std::span<const uint8_t> bytes) { out_.Bytes(bytes); }
  // Offset of the last directory, and the position of the next one's offset in it.
  uint32_t Directory() const { return directory_; }
  uint32_t NextPlace() const { return directory_ + 2 + 12 * entries_; }

  tmsize_t Write(const void* source, tmsize_t count);
  uint64_t Seek(uint64_t offset, int from);

 private:
  void NoteDirectory(std::span<const uint8_t> bytes);

  ByteWriter& out_;
  uint64_t position_ = 0;
  uint32_t directory_ = 0, entries_ = 0;
  TIFF* tiff_ = nullptr;
  TiffMessages messages_;
};

}  // namespace fotomill
