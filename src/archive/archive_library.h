#pragma once

#include <archive.h>
#include <archive_entry.h>

#include "platform/shared_library.h"

namespace fotomill {

// The libarchive functions used, without their prefix "archive_".
// clang-format off
#define ARCHIVE_FUNCTIONS(FUNCTION) \
  FUNCTION(version_string) FUNCTION(error_string) FUNCTION(read_new) FUNCTION(read_free) \
  FUNCTION(read_support_format_zip_seekable) FUNCTION(read_support_format_rar) \
  FUNCTION(read_support_format_rar5) FUNCTION(read_add_passphrase) FUNCTION(read_open_memory) \
  FUNCTION(read_next_header) FUNCTION(read_data) FUNCTION(entry_pathname) \
  FUNCTION(entry_filetype) FUNCTION(entry_hardlink) FUNCTION(entry_size) \
  FUNCTION(entry_size_is_set) FUNCTION(entry_mtime) FUNCTION(entry_mtime_is_set) \
  FUNCTION(entry_is_data_encrypted) FUNCTION(write_new) FUNCTION(write_free) \
  FUNCTION(write_set_format_zip) FUNCTION(write_set_options) FUNCTION(write_set_passphrase) \
  FUNCTION(write_set_bytes_in_last_block) FUNCTION(write_open) FUNCTION(write_close) \
  FUNCTION(write_zip_set_compression_store) FUNCTION(write_zip_set_compression_deflate) \
  FUNCTION(write_header) FUNCTION(write_data) FUNCTION(write_finish_entry) FUNCTION(entry_new) \
  FUNCTION(entry_free) FUNCTION(entry_set_pathname) FUNCTION(entry_set_size) \
  FUNCTION(entry_set_mtime) FUNCTION(entry_set_filetype) FUNCTION(entry_set_perm)
// clang-format on

// libarchive, loaded on first use, as most runs do not need it.
struct ArchiveLibrary {
  ArchiveLibrary();
  bool Whole() const;  // installed, with all of these functions

  platform::SharedLibrary library;
#define FUNCTION(name) decltype(::archive_##name)* name = nullptr;
  ARCHIVE_FUNCTIONS(FUNCTION)
#undef FUNCTION
};
const ArchiveLibrary& LibArchive();

}  // namespace fotomill
