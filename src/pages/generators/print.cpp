#include "pages/generators/print.h"

#include <algorithm>
#include <cmath>
#include <numbers>

#include "pages/model/placing.h"

namespace fotomill {

namespace {

constexpr double kMarkGap = 2, kMarkLength = 5, kMarkLine = 0.1;
constexpr double kShadow = 1;  // offset
constexpr Color kShade = 0xB0B0B0;
constexpr double kTextGap = 1.5;
constexpr double kTolerance = 1e-6;  // rounding errors of lengths

bool WholeDots(const PrintOptions& options, const PagePicture& picture) {
  return options.wholeDots || (options.expandHalftones && picture.bits == 1);
}

// The size of a picture in millimeters, given the room for it.
PaperSize SizeOf(const PrintOptions& options, const PagePicture& picture, const Box& room) {
  const double dpi = picture.dpi > 0 ? picture.dpi : options.dpi;
  const double down = picture.dpi > 0 && picture.dpiDown > 0 ? picture.dpiDown : dpi;
  const PaperSize actual{picture.width / dpi * kMmPerInch, picture.height / down * kMmPerInch};
  Box box = room;
  if (options.sizing == PrintSizing::Actual || options.sizing == PrintSizing::Percent) {
    const double factor = options.sizing == PrintSizing::Percent ? options.percent / 100 : 1;
    return {actual.width * factor, actual.height * factor};
  }
  if (options.sizing == PrintSizing::Given) {
    const bool turn =
        NeedsTurn(picture.width, picture.height, {0, 0, options.size.width, options.size.height});
    const PaperSize size = turn ? options.size.Turned() : options.size;
    box = {0, 0, size.width, size.height};
  }
  const Box fitted = FittedBox(picture.width, picture.height, box, PictureFit::Inside);
  if (!WholeDots(options, picture)) return {fitted.width, fitted.height};
  const double dot = kMmPerInch / options.dpi;
  const double dots = std::max(std::floor(fitted.width / picture.width / dot + 1e-9), 1.0);
  return {picture.width * dots * dot, picture.height * dots * dot};
}

double Placed(double start, double room, double size, int32_t side) {
  const double rest = room - size;
  return start + (side < 0 ? 0 : side > 0 ? rest : rest / 2);
}

void AddRegisterMark(Point center, std::vector<PageItem>& items) {
  constexpr double kArm = 2.5, kRadius = 1.5;
  constexpr int kSides = 24;
  for (const Point arm : {Point{kArm, 0}, Point{0, kArm}})
    items.emplace_back(LineItem{.from = center - arm, .to = center + arm, .width = kMarkLine});
  const auto on = [&](int i) {
    const double angle = 2 * std::numbers::pi * i / kSides;
    return center + Point{std::cos(angle), std::sin(angle)} * kRadius;
  };
  for (int i = 0; i < kSides; ++i)
    items.emplace_back(LineItem{.from = on(i), .to = on(i + 1), .width = kMarkLine});
}

void AddMarks(const PrintOptions& options, const Box& box, std::vector<PageItem>& items) {
  if (options.cropMarks) AddCropMarks(box, kMarkGap, kMarkLength, kMarkLine, 0, items);
  if (!options.registerMarks) return;
  constexpr double kOut = kMarkGap + 2.5;
  const Point center = box.Center();
  for (const Point mark : {Point{center.x, box.y - kOut}, Point{center.x, box.Bottom() + kOut},
                           Point{box.x - kOut, center.y}, Point{box.Right() + kOut, center.y}})
    AddRegisterMark(mark, items);
}

class PrintPage {
 public:
  PrintPage(const PrintOptions& options, const PagePicture& picture)
      : options_(options), picture_(picture) {
    PaperSize paper = options.paper;
    if (options.turnPage &&
        NeedsTurn(picture.width, picture.height, {0, 0, paper.width, paper.height}))
      paper = paper.Turned();
    page_ = {.width = paper.width, .height = paper.height, .background = options.background};
    room_ = {options.margin, options.margin, paper.width - 2 * options.margin,
             paper.height - 2 * options.margin};
  }

  Page Make() {
    const double line = options_.lineHeight + kTextGap;
    const std::string title = TextOf(0), comment = TextOf(1);
    if (!title.empty()) {
      AddText(title, room_.y);
      room_.y += line;
      room_.height -= line;
    }
    if (!comment.empty()) AddLast(comment, line);
    if (options_.names) AddLast(picture_.name, line);
    if (options_.cropMarks || options_.registerMarks) Shrink(kMarkGap + kMarkLength);
    Shrink(options_.matte + (options_.ruleShadow && options_.rule > 0 ? kShadow : 0));
    AddPicture();
    page_.bookmarks.push_back({picture_.name, 0});
    return std::move(page_);
  }

 private:
  std::string TextOf(size_t index) const {
    return options_.texts && index < picture_.texts.size() ? picture_.texts[index] : std::string();
  }
  void Shrink(double by) {
    by = std::max(std::min({by, room_.width / 2 - 1, room_.height / 2 - 1}), 0.0);
    room_ = {room_.x + by, room_.y + by, room_.width - 2 * by, room_.height - 2 * by};
  }
  void AddText(const std::string& text, double y) {
    page_.items.emplace_back(TextItem{.text = text,
                                      .box = {room_.x, y, room_.width, options_.lineHeight * 1.1},
                                      .font = options_.font,
                                      .lineHeight = options_.lineHeight});
  }
  void AddLast(const std::string& text, double line) {
    AddText(text, room_.Bottom() - options_.lineHeight);
    room_.height -= line;
  }

  void AddPicture() {
    Box box = room_;
    PictureItem item;
    if (options_.sizing == PrintSizing::Fill) {
      item = PlacePicture(picture_, box, PictureFit::Cover, false);
    } else {
      const PaperSize size = SizeOf(options_, picture_, room_);
      box = {Placed(room_.x, room_.width, size.width, options_.across),
             Placed(room_.y, room_.height, size.height, options_.down), size.width, size.height};
      item = PlacePicture(picture_, box, PictureFit::Stretch, false);
      // larger than the page: only what is within the margins
      if (box.width > room_.width + kTolerance || box.height > room_.height + kTolerance)
        item.clip = CornersOf(room_);
    }
    std::vector<PageItem>& items = page_.items;
    const Box outer{box.x - options_.matte, box.y - options_.matte, box.width + 2 * options_.matte,
                    box.height + 2 * options_.matte};
    if (options_.rule > 0 && options_.ruleShadow)
      items.emplace_back(
          FilledBox({outer.x + kShadow, outer.y + kShadow, outer.width, outer.height}, kShade));
    if (options_.matte > 0) items.emplace_back(FilledBox(outer, options_.matteColor));
    items.emplace_back(std::move(item));
    if (options_.rule > 0) AddOutline(outer, options_.rule, options_.ruleColor, 0, items);
    AddMarks(options_, outer, items);
  }

  const PrintOptions& options_;
  const PagePicture& picture_;
  Page page_;
  Box room_;
};

}  // namespace

std::vector<Page> PrintPages(const PrintOptions& options, std::span<const PagePicture> pictures) {
  std::vector<Page> pages;
  for (const PagePicture& picture : pictures) pages.push_back(PrintPage(options, picture).Make());
  return pages;
}

}  // namespace fotomill
