#pragma once

#include <map>
#include <memory>
#include <mutex>
#include <string>

#include "desktop/models/browser/file_deeds.h"
#include "platform/held_file.h"
#include "platform/temporary_file.h"
#include "processing/geometry/orient.h"

namespace fotomill::desktop {

// What a file was before a function replaced it, kept in the data folder until nobody can take that back any more.
class PreviousFile {
 public:
  // Keeps the file as it is now. False if there is no room for it.
  [[nodiscard]] bool Keep(const std::string& path);
  // The file was replaced; what it is now is remembered.
  void Replaced(const std::string& path) { replaced_ = platform::StampOf(path); }
  // Whether somebody else has changed the file since it was replaced.
  bool HasChanged(const std::string& path) const;
  void Swap(PreviousFile& other) { kept_.Swap(other.kept_); }
  const std::string& Path() const { return kept_.Path(); }

 private:
  platform::TemporaryFile kept_;
  platform::FileStamp replaced_;
};

// The previous files of one batch; from any thread.
class PreviousFiles {
 public:
  // To be called before a file is replaced; its thumbnails go. False: it should not be.
  [[nodiscard]] bool Keep(const std::string& path);
  // To be called at once when a file that was kept has been replaced; what it becomes later is somebody else's work.
  void Replaced(const std::string& path);
  // The deed of those that were replaced, in the order of their paths; they are handed over.
  FileDeed Deed();

 private:
  std::mutex mutex_;
  std::map<std::string, std::shared_ptr<PreviousFile>> kept_, replaced_;
};

// Deletes what a program that was killed a month ago or longer left in the data folder.
void DeleteOldPreviousFiles();

// Turns the picture in a file and keeps what the file was. Neither step nor failure where it stands so already.
DeedResult TurnOneFile(const std::string& path, Orientation turn);

}  // namespace fotomill::desktop
