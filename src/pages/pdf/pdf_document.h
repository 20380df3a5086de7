#pragma once

#include <cstdint>
#include <map>
#include <string>
#include <vector>

#include "core/status.h"
#include "pages/model/page.h"
#include "pages/pdf/pdf_file.h"
#include "pages/pdf/pdf_fonts.h"
#include "pages/pdf/pdf_picture.h"

namespace fotomill {

// Draws pages as a PDF document: first all pictures, each once however often it is used, then the
// pages. Pictures are written as they come, so that only the pages' texts stay in memory.
class PdfDocument {
 public:
  // Begins a document at `path`, which appears when it is finished. ErrorCreatingFile,
  // MemoryAllocationError.
  Status Create(const std::string& path);
  // Writes a picture under its id. MemoryAllocationError.
  Status AddPicture(size_t id, const PdfPicture& picture);
  // Adds a page; pictures that were not added are left out. ResourceError if a font is missing.
  Status AddPage(const Page& page);
  // Writes what remains. `title` is the document's. ErrorWritingFile, ErrorCreatingFile if the name
  // was taken meanwhile and must not be replaced, ResourceError if a font cannot be embedded.
  Status Finish(const std::string& title, platform::Existing existing);
  // Whether a write has failed.
  bool Failed() const { return file_.Failed(); }

 private:
  struct Embedded {
    int32_t object = 0;
    Orientation orientation = Orientation::Upright;
  };
  struct Entry {
    std::string title;
    int32_t page = 0;  // object
    double y = 0;      // points from the bottom
  };
  void Put(const PictureItem& item, std::string& content, std::string& names) const;
  std::string LinksOf(const Page& page);
  int32_t WriteOutline();

  PdfFile file_;
  PdfFonts fonts_;
  PdfPictureWriter pictureWriter_;
  std::map<size_t, Embedded> pictures_;
  std::vector<int32_t> pages_;  // objects
  std::vector<Entry> bookmarks_;
  int32_t tree_ = 0, fontNames_ = 0;  // objects
};

}  // namespace fotomill
