#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"
#include "picture/rectangle.h"
#include "texts/texts.h"

namespace fotomill {

// The state of a progress box, independent of its window.

// Data of a list line besides its text.
struct ProgressItem {
  // index of the file in the selection, from 0; -1: a line about the batch
  int32_t file = -1;
  Status status = Status::Ok;  // of that file
  bool skipped = false;        // skipped, not failed
};

// A line of the list.
struct ProgressLine {
  std::string text;
  ProgressItem item;
};

// Settings of a progress box.
struct ProgressSettings {
  bool closeWhenDone = true;
  bool optimizeWindow = true;
  bool thumbnails = true;
  bool showMissingThumbnails = false;
};

// Title of the box; with the window class, lets other programs find it.
inline constexpr const char* kProgressTitle = "Progress";
// Name of the window's class.
inline constexpr const char* kProgressBoxClass = "FotomillProfessionalProgressBox";

// IDs of the box's controls.
inline constexpr int32_t kProgressCloseId = 1, kProgressAbortId = 3, kProgressListId = 10,
                         kProgressStatusId = 11;

// The state of a box while it is open. Belongs to the thread that runs the batch.
class ProgressModel {
 public:
  // Clears the list; Abort is enabled, Close is not.
  void Open();
  void AddLine(ProgressLine line);  // at the end of the list
  void SetStatus(std::string_view text) { status_ = text; }  // the line below the list
  // Adds the closing lines: "There were errors" if there were any, and with `summary` the number of
  // processed files; selects the last line. Then closes the box, or leaves it open: with a scroll
  // bar, Close enabled and Abort disabled.
  void Finish(bool errors, bool summary, const ProgressSettings& box);
  void Close() { open_ = abortLive_ = closeLive_ = false; }  // disables both buttons

  // What to show: whether the box is open, which buttons are enabled, its lines and the text below
  // them.
  bool IsOpen() const { return open_; }
  bool AbortLive() const { return abortLive_; }     // the Abort button is enabled
  bool CloseLive() const { return closeLive_; }     // the Close button is enabled
  bool HasScrollBar() const { return scrollBar_; }  // if the box was left open
  const std::vector<ProgressLine>& Lines() const { return lines_; }
  const std::string& StatusText() const { return status_; }
  int32_t Selected() const { return selected_; }  // -1: none
  uint32_t Files() const { return files_; }       // number of lines about files

 private:
  std::vector<ProgressLine> lines_;
  std::string status_;
  uint32_t files_ = 0;
  int32_t selected_ = -1;
  bool open_ = false, abortLive_ = false, closeLive_ = false, scrollBar_ = false;
};

// The closing line of a batch in which a file failed.
inline constexpr std::string_view kErrorsLine = TrLater("There were errors");
// "No files were processed.", "One file was processed." or "7 files were processed."
std::string CountLine(uint32_t files);

// Position and size of the box in the client area of its frame.
Rectangle ProgressBoxPlace(int32_t frameWidth, int32_t frameHeight, const ProgressSettings& box);

// How to draw the list.
enum class ProgressListKind {
  Plain,         // text only
  FixedRows,     // owner-drawn, fixed row height
  VariableRows,  // owner-drawn, variable row height
};

// Positions of the controls for a client size; recompute when the size changes.
struct ProgressLayout {
  Rectangle list, status, abort, close;
  ProgressListKind kind = ProgressListKind::Plain;
  int32_t rowHeight = 0;  // of the list's rows; 0: default, read back for drawing
};
// Lays out the controls for a client size in pixels.
ProgressLayout LayOutProgressBox(int32_t clientWidth, int32_t clientHeight,
                                 const ProgressSettings& box);

}  // namespace fotomill
