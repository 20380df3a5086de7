#pragma once

#include <cstdint>
#include <string>
#include <string_view>
#include <vector>

#include "core/status.h"
#include "picture/rectangle.h"
#include "texts/texts.h"

namespace fotomill {

// Everything that a progress box shows and how it is in its window, without a window.

// What each line of the list carries beside its text.
struct ProgressItem {
  // place of its file in the selection, from 0; -1: a line about the batch
  int32_t file = -1;
  Status status = Status::Ok;  // of that file
  bool skipped = false;        // the file was left out; no failure
};

// A line of the list, as it is shown.
struct ProgressLine {
  std::string text;
  ProgressItem item;
};

// The keys of a progress box.
struct ProgressSettings {
  bool closeWhenDone = true;
  bool optimizeWindow = true;
  bool thumbnails = true;
  bool showMissingThumbnails = false;
};

// The box's title, and the window class by which other programs find it.
inline constexpr const char* kProgressTitle = "Progress";
// Name of the window's class.
inline constexpr const char* kProgressBoxClass = "FotomillProfessionalProgressBox";

// Numbers of the box's controls.
inline constexpr int32_t kProgressCloseId = 1, kProgressAbortId = 3, kProgressListId = 10,
                         kProgressStatusId = 11;

// The state of one box from its opening to its end. Belongs to the thread that runs the batch.
class ProgressModel {
 public:
  // Empties the list; Abort is live, Close is not.
  void Open();
  void AddLine(ProgressLine line);  // at the end of the list
  void SetStatus(std::string_view text) { status_ = text; }  // the line below the list
  // Adds the closing lines: "There were errors" where there were, and, with `summary`, how many
  // files were processed; the last line is selected. Then closes the box, or leaves it open to be
  // read: with a scroll bar, Close live and Abort not.
  void Finish(bool errors, bool summary, const ProgressSettings& box);
  void Close() { open_ = abortLive_ = closeLive_ = false; }  // both buttons go dead with it

  // What the box shows: whether it is there, which of its buttons can be pressed, its lines and the
  // text below them.
  bool IsOpen() const { return open_; }
  bool AbortLive() const { return abortLive_; }  // the Abort button can be pressed
  bool CloseLive() const { return closeLive_; }  // the Close button can be pressed
  bool HasScrollBar() const { return scrollBar_; }  // the list of a box that was left open
  const std::vector<ProgressLine>& Lines() const { return lines_; }
  const std::string& StatusText() const { return status_; }
  int32_t Selected() const { return selected_; }  // -1: none
  uint32_t Files() const { return files_; }       // lines about a file

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

// Place and size of the box in its frame's client area.
Rectangle ProgressBoxPlace(int32_t frameWidth, int32_t frameHeight, const ProgressSettings& box);

// How the list draws its lines.
enum class ProgressListKind {
  Plain,         // texts
  FixedRows,     // drawn by the box, rows of one height
  VariableRows,  // drawn by the box, each row as high as it needs
};

// Where the controls are in a box of a client size; the same again whenever the size changes.
struct ProgressLayout {
  Rectangle list, status, abort, close;
  ProgressListKind kind = ProgressListKind::Plain;
  int32_t rowHeight = 0;  // of the list's rows; 0: the list's own, which is read back for drawing
};
// Lays out the controls for a client size in pixels.
ProgressLayout LayOutProgressBox(int32_t clientWidth, int32_t clientHeight,
                                 const ProgressSettings& box);

}  // namespace fotomill
