#include "desktop/windows/view/overlay_bar.h"

#include <wx/control.h>
#include <wx/dc.h>
#include <wx/graphics.h>

#include <algorithm>
#include <memory>

#include "desktop/models/shell/event_log.h"
#include "desktop/windows/view/system_animations.h"
#include "desktop/windows/view/view_canvas.h"
#include "desktop/windows/view/view_commands.h"
#include "desktop/windows/view/view_frame.h"
#include "desktop/windows/widgets/bitmaps.h"
#include "desktop/windows/widgets/wx_text.h"
#include "platform/clock.h"
#include "platform/paths.h"
#include "settings/job_options.h"
#include "settings/settings.h"
#include "texts/grouped_count.h"
#include "texts/texts.h"

namespace fotomill::desktop {

namespace {

constexpr int kFadeMs = 15, kRestMs = 2000;
constexpr int kSymbolSide = 20, kCaptionHeight = 24;  // device-independent pixels
constexpr size_t kMostBitmaps = 200;

// The letters of ViewModeButtonList: symbols of buttons with a key of their command.
struct LetterButton {
  char letter;
  const char* symbol;
  int key;
};
constexpr LetterButton kLetterButtons[] = {
    {'a', "previous", WXK_HOME}, {'b', "next", WXK_END},     {'c', "info", 'I'},
    {'e', "back", 'P'},          {'f', "forward", 'N'},      {'g', "zoom-out", '-'},
    {'h', "zoom-in", '+'},       {'i', "fit", 'Z'},          {'j', "actual", 'A'},
    {'k', "rotate-left", 'L'},   {'l', "rotate-right", 'R'}, {'m', "slideshow", 'S'},
    {'n', "full-screen", 'F'},   {'o', "trash", WXK_DELETE}, {'p', "copy", WXK_CONTROL_C},
    {'q', "flip-across", 'H'},   {'r', "flip-down", 'V'},    {'s', "close", WXK_ESCAPE},
};

wxRect ToWx(const Rect& rect) { return {rect.x, rect.y, rect.width, rect.height}; }

void FillRounded(wxGraphicsContext& context, const Rect& rect, double radius,
                 const wxColour& color) {
  context.SetPen(wxNullGraphicsPen);
  context.SetBrush(wxBrush(color));
  context.DrawRoundedRectangle(rect.x, rect.y, rect.width, rect.height, radius);
}

}  // namespace

OverlayBar::OverlayBar(ViewCanvas& canvas, ThumbnailService& thumbnails, Events events)
    : canvas_(canvas), thumbnails_(thumbnails), events_(std::move(events)) {
  fadeTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) { FadeOn(); });
  restTimer_.Bind(wxEVT_TIMER, [this](wxTimerEvent&) {
    if (!Holds()) Turn(false);
  });
  canvas_.Bind(wxEVT_MOTION, [this](wxMouseEvent& event) {
    if (!canvas_.HasCapture()) Move(event.GetPosition());
    event.Skip();
  });
  canvas_.Bind(wxEVT_LEAVE_WINDOW, [this](wxMouseEvent& event) {
    Move(wxPoint(-1, -1));
    Turn(false);
    event.Skip();
  });
  for (const auto& type : {wxEVT_LEFT_DOWN, wxEVT_LEFT_DCLICK}) {
    canvas_.Bind(type, [this](wxMouseEvent& event) {
      if (!Press(event.GetPosition())) event.Skip();
    });
  }
  canvas_.Bind(wxEVT_LEFT_UP, [this](wxMouseEvent& event) {
    if (canvas_.HasCapture() || !Release(event.GetPosition())) event.Skip();
  });
  canvas_.Bind(wxEVT_SIZE, [this](wxSizeEvent& event) { Arrange(), event.Skip(); });
}

OverlayBar::~OverlayBar() { thumbnails_.EndStrip(this); }

void OverlayBar::SetFiles(const std::vector<std::string>& files, size_t current) {
  files_ = &files;
  current_ = current;
  Arrange();
}

// The bar shows the letters of the setting, in its order; unknown ones are ignored.
void OverlayBar::ReadButtons() {
  const std::string letters(settings.ViewModeButtonList.view());
  if (letters == letters_) return;
  letters_ = letters;
  buttons_.clear();
  for (const char letter : letters) {
    const auto* const row = std::ranges::find(kLetterButtons, letter, &LetterButton::letter);
    if (row == std::end(kLetterButtons)) continue;
    if (const Command* command = CommandOfKey(ViewCommands(), row->key))
      buttons_.push_back({command, Symbol(row->symbol, kSymbolSide, *wxWHITE)});
  }
}

void OverlayBar::Arrange() {
  ReadButtons();
  const wxSize size = canvas_.GetClientSize();
  OverlayLayout::Input input;
  input.width = size.x;
  input.height = size.y;
  input.buttons = buttons_.size();
  input.strip = settings.ViewModeFilmStrip != 0;
  input.files = files_ == nullptr ? 0 : files_->size();
  input.current = current_;
  input.caption = canvas_.FromDIP(kCaptionHeight);
  for (int32_t* edge : {&input.button, &input.cell, &input.gap, &input.margin})
    *edge = canvas_.FromDIP(*edge);
  layout_ = OverlayLayout(input);
  if (!fade_.Shown()) return;
  WantThumbnails();
  Refresh();
}

// --- appearing and fading ---

void OverlayBar::Move(const wxPoint& place) {
  const OverlayLayout::Hit hit = layout_.At(place.x, place.y);
  if (place.x >= 0) {
    Turn(true);
    restTimer_.StartOnce(kRestMs);
  }
  if (hit == hit_) return;
  hit_ = hit;
  if (hit.part == OverlayLayout::Part::Button) {
    const Command& command = *buttons_[hit.index].command;
    canvas_.SetToolTip(wxControl::RemoveMnemonics(Label(command.text)) + " (" + command.shownKey +
                       ")");
  } else if (hit.part == OverlayLayout::Part::Cell) {
    canvas_.SetToolTip(Shown(platform::FileNameOf((*files_)[hit.index])));
  } else {
    canvas_.UnsetToolTip();
  }
  Refresh();
}

void OverlayBar::Turn(bool shown) {
  if (shown == fade_.Shown()) return;
  fade_.Turn(shown, platform::MonotonicSeconds(), SystemAnimates());
  LogEvent("view-bar", shown ? "shown" : "hidden");
  if (shown) {
    Arrange();
  } else {
    thumbnails_.EndStrip(this);
  }
  fadeTimer_.Start(kFadeMs);
}

void OverlayBar::FadeOn() {
  if (!fade_.Changing(platform::MonotonicSeconds())) fadeTimer_.Stop();
  Refresh();
}

void OverlayBar::Refresh() { canvas_.RefreshRect(ToWx(layout_.Bar()), false); }

// --- clicks ---

bool OverlayBar::Press(const wxPoint& place) {
  const OverlayLayout::Hit hit = layout_.At(place.x, place.y);
  pressed_ = fade_.Shown() ? hit : OverlayLayout::Hit();
  return pressed_.part != OverlayLayout::Part::Outside;
}

bool OverlayBar::Release(const wxPoint& place) {
  const OverlayLayout::Hit pressed = std::exchange(pressed_, {});
  if (pressed.part == OverlayLayout::Part::Outside) return false;
  if (layout_.At(place.x, place.y) != pressed) return true;
  // last, as it may close the window
  if (pressed.part == OverlayLayout::Part::Cell) {
    events_.show(pressed.index);
  } else if (pressed.part == OverlayLayout::Part::Button) {
    events_.run(*buttons_[pressed.index].command);
  }
  return true;
}

// --- film strip ---

void OverlayBar::WantThumbnails() {
  std::vector<ThumbnailRequest> requests;
  const CellLayout::Range cells = layout_.Cells();
  for (size_t file = cells.first; file < cells.end; ++file) {
    const std::string& path = (*files_)[file];
    if (thumbnails_.FindAny(path) != nullptr) continue;
    ThumbnailRequest request;
    request.path = path;
    request.mode = settings.DefaultThumbnailMode;
    request.options = ThumbnailOptionsFromSettings();
    requests.push_back(std::move(request));
  }
  thumbnails_.WantForStrip(this, std::move(requests), [this] { Refresh(); });
}

const wxBitmap* OverlayBar::BitmapOfFile(const std::string& path) {
  const ThumbnailPointer thumbnail = thumbnails_.FindAny(path);
  if (thumbnail == nullptr || thumbnail->pixels.Empty()) return nullptr;
  if (bitmaps_.size() > kMostBitmaps) bitmaps_.clear();
  Drawn& drawn = bitmaps_[path];
  if (drawn.thumbnail != thumbnail) drawn = {thumbnail, BitmapOf(thumbnail->pixels)};
  return drawn.bitmap.IsOk() ? &drawn.bitmap : nullptr;
}

// --- painting ---

void OverlayBar::Draw(wxDC& dc) {
  const double opacity = fade_.Opacity(platform::MonotonicSeconds());
  if (opacity == 0 || layout_.Bar().width == 0 || files_ == nullptr) return;
  if (layout_.Cells().end > files_->size() || current_ >= files_->size()) return;  // has shrunk
  const std::unique_ptr<wxGraphicsContext> context(wxGraphicsContext::CreateFromUnknownDC(dc));
  if (context == nullptr) return;
  context->SetInterpolationQuality(wxINTERPOLATION_FAST);
  context->BeginLayer(opacity);
  FillRounded(*context, layout_.Bar(), canvas_.FromDIP(8), wxColour(24, 24, 24, 216));
  DrawCaption(*context, dc);
  DrawCells(*context);
  DrawButtons(*context);
  context->EndLayer();
}

// The name of the file on the left, its place in the list on the right.
void OverlayBar::DrawCaption(wxGraphicsContext& context, wxDC& dc) {
  const Rect caption = layout_.Caption();
  dc.SetFont(canvas_.GetFont());
  context.SetFont(canvas_.GetFont(), *wxWHITE);
  const wxString place = Shown(Tr("%1 of %2", current_ + 1, ThousandsText(files_->size())));
  const wxSize extent = dc.GetTextExtent(place);
  const int gap = canvas_.FromDIP(10);
  const int top = caption.y + (caption.height - extent.y) / 2 + canvas_.FromDIP(2);
  context.DrawText(place, caption.x + caption.width - gap - extent.x, top);
  const wxString name =
      wxControl::Ellipsize(Shown(platform::FileNameOf((*files_)[current_])), dc, wxELLIPSIZE_MIDDLE,
                           caption.width - 3 * gap - extent.x);
  context.DrawText(name, caption.x + gap, top);
}

void OverlayBar::DrawButtons(wxGraphicsContext& context) {
  const int side = canvas_.FromDIP(kSymbolSide);
  for (size_t i = 0; i < buttons_.size(); ++i) {
    const Rect rect = layout_.Button(i);
    const OverlayLayout::Hit own{OverlayLayout::Part::Button, i};
    if (hit_ == own) {
      const unsigned char shine = pressed_ == own ? 90 : 50;
      FillRounded(context, rect, canvas_.FromDIP(5), wxColour(255, 255, 255, shine));
    }
    context.DrawBitmap(buttons_[i].symbol.GetBitmapFor(&canvas_), rect.x + (rect.width - side) / 2,
                       rect.y + (rect.height - side) / 2, side, side);
  }
}

void OverlayBar::DrawCells(wxGraphicsContext& context) {
  const CellLayout::Range cells = layout_.Cells();
  for (size_t file = cells.first; file < cells.end; ++file) DrawCell(context, file);
}

void OverlayBar::DrawCell(wxGraphicsContext& context, size_t file) {
  const Rect cell = layout_.Cell(file);
  const OverlayLayout::Hit own{OverlayLayout::Part::Cell, file};
  const int edge = canvas_.FromDIP(3);
  if (file == current_ || hit_ == own) {
    FillRounded(context, cell, canvas_.FromDIP(4),
                file == current_ ? wxColour(255, 255, 255, 230) : wxColour(255, 255, 255, 80));
  }
  const double room = cell.width - 2 * edge;
  const wxBitmap* const bitmap = BitmapOfFile((*files_)[file]);
  if (bitmap == nullptr) {
    const Rect inner{cell.x + edge, cell.y + edge, cell.width - 2 * edge, cell.height - 2 * edge};
    return FillRounded(context, inner, canvas_.FromDIP(2), wxColour(70, 70, 70));
  }
  const double scale = room / std::max(bitmap->GetWidth(), bitmap->GetHeight());
  const double width = bitmap->GetWidth() * scale, height = bitmap->GetHeight() * scale;
  context.DrawBitmap(*bitmap, cell.x + (cell.width - width) / 2,
                     cell.y + (cell.height - height) / 2, width, height);
}

}  // namespace fotomill::desktop
