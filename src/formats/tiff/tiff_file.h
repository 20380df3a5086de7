#pragma once

#include <tiffio.h>

#include <cstdint>
#include <span>
#include <vector>

#include "core/byte_writer.h"
#include "core/status.h"

namespace fotomill {

// What the library says while it works on one file; nothing is printed.
struct TiffMessages {
  char error[160] = {};    // the first error
  char warning[160] = {};  // the first fault in pixel data that was passed over
  bool inPixels = false;   // pixels are being decoded: warnings count from here on
};

// A TIFF file in memory, opened for reading at its first directory. `bytes` must outlive it.
class TiffInput {
 public:
  explicit TiffInput(std::span<const uint8_t> bytes) : bytes_(bytes) {}  // does not own the bytes
  ~TiffInput();
  TiffInput(const TiffInput&) = delete;
  TiffInput& operator=(const TiffInput&) = delete;

  // Ok; FileReadError (3) when the file ends too early, DamagedFile (2) when it is none or its
  // directory makes no sense.
  Status Open();
  // Opens the file again at another directory, as if its header named that one: the library would
  // otherwise follow the whole chain for each page. Statuses of Open.
  Status OpenAt(uint64_t directory);
  // Offsets of the page directories within the file, up to the limit; a second visit ends the
  // chain. Of a file that is open.
  std::vector<uint64_t> PageOffsets() const;
  // What a failed call of the library means, by its message.
  Status Failure() const;
  TIFF* Handle() const { return tiff_; }  // of the library; null until Open
  TiffMessages& Messages() { return messages_; }  // what the library has said so far
  std::span<const uint8_t> Bytes() const { return bytes_; }

  // The library's doors to the bytes.
  tmsize_t Read(void* target, tmsize_t count);
  uint64_t Seek(uint64_t offset, int from);

 private:
  void NameDirectory(uint64_t offset, std::span<uint8_t> bytes) const;

  std::span<const uint8_t> bytes_;
  uint64_t position_ = 0;
  uint64_t directory_ = 0;  // what the header is said to name; 0: what it does name
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

  [[nodiscard]] bool Open();  // false if there is no memory
  TIFF* Handle() const { return tiff_; }
  // Bytes that the file has; and more of them, which the library knows nothing of.
  uint64_t End() const { return out_.Position(); }
  void Append(std::span<const uint8_t> bytes) { out_.Bytes(bytes); }
  // Of the directory that was written: its place, and where in it the place of the next one is.
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
