#include "pages/generators/poster.h"

#include <algorithm>
#include <cmath>

#include "pages/model/placing.h"

namespace fotomill {

namespace {

constexpr double kTolerance = 1e-6;
constexpr int64_t kMostSheets = 10000;  // of all posters
constexpr double kCutLine = 0.1, kTickGap = 1, kTickLength = 4;
constexpr double kLabelHeight = 3;
constexpr Color kWhite = 0xFFFFFF, kGray = 0x808080;

// Replaces %1 to %4.
std::string Filled(const std::string& text, std::span<const std::string> values) {
  std::string filled;
  for (size_t i = 0; i < text.size(); ++i) {
    const size_t value =
        text[i] == '%' && i + 1 < text.size() ? static_cast<size_t>(text[i + 1] - '1') : SIZE_MAX;
    if (value < values.size()) {
      filled += values[value];
      ++i;
    } else {
      filled += text[i];
    }
  }
  return filled;
}

// Centimeters with one decimal.
std::string Centimeters(double mm) {
  const auto tenths = static_cast<int64_t>(std::lround(mm));
  return std::to_string(tenths / 10) + "." + std::to_string(tenths % 10);
}

int32_t SheetsFor(double length, double room, double overlap) {
  const double sheets = std::ceil((length - overlap) / (room - overlap) - kTolerance);
  return static_cast<int32_t>(std::clamp(sheets, 1.0, kMostSheets + 1.0));
}

double Reach(int32_t sheets, double room, double overlap) {
  return sheets * (room - overlap) + overlap;
}

PosterPlan PlanFor(const PosterOptions& options, const PagePicture& picture, bool turned) {
  PosterPlan plan;
  plan.paper = turned ? options.paper.Turned() : options.paper;
  plan.room = {plan.paper.width - 2 * options.margin, plan.paper.height - 2 * options.margin};
  plan.stepX = plan.room.width - options.overlap;
  plan.stepY = plan.room.height - options.overlap;
  Box box{0, 0, options.size.width, options.size.height};
  if (box.width > 0) {
    if (NeedsTurn(picture.width, picture.height, box)) std::swap(box.width, box.height);
  } else {
    constexpr double kEndless = 1e9;
    box.width = Reach(options.columns, plan.room.width, options.overlap);
    box.height =
        options.rows > 0 ? Reach(options.rows, plan.room.height, options.overlap) : kEndless;
  }
  const Box fitted = FittedBox(picture.width, picture.height, box, PictureFit::Inside);
  plan.size = {fitted.width, fitted.height};
  plan.columns = SheetsFor(fitted.width, plan.room.width, options.overlap);
  plan.rows = SheetsFor(fitted.height, plan.room.height, options.overlap);
  return plan;
}

class PosterMaker {
 public:
  PosterMaker(const PosterOptions& options, const PagePicture& picture)
      : options_(options), picture_(picture), plan_(PlanPoster(options, picture)) {}

  int64_t Sheets() const { return int64_t{plan_.columns} * plan_.rows; }

  void Make(std::vector<Page>& pages) const {
    for (int32_t row = 0; row < plan_.rows; ++row) {
      for (int32_t column = 0; column < plan_.columns; ++column)
        pages.push_back(Sheet(column, row));
    }
    if (options_.sketch) pages.push_back(Sketch());
  }

 private:
  Page Sheet(int32_t column, int32_t row) const {
    Page page{.width = plan_.paper.width, .height = plan_.paper.height};
    const Box part = plan_.Part(column, row);
    const double margin = options_.margin;
    const Box seen{margin, margin, part.width, part.height};
    page.items.emplace_back(PictureItem{.picture = picture_.id,
                                        .corner = {margin - part.x, margin - part.y},
                                        .across = {plan_.size.width, 0},
                                        .down = {0, plan_.size.height},
                                        .clip = CornersOf(seen)});
    if (options_.cutLines) AddCutLines(seen, column, row, page.items);
    if (options_.labels) AddLabel(column, row, page);
    return page;
  }

  // The edges of the picture, and beyond it ticks where the edges of the next sheets go.
  void AddCutLines(const Box& seen, int32_t column, int32_t row,
                   std::vector<PageItem>& items) const {
    AddOutline(seen, kCutLine, options_.cutLineColor, 0, items);
    const double length = std::min(kTickLength, options_.margin - kTickGap);
    if (length <= 0) return;
    AddCropMarks(seen, kTickGap, length, kCutLine, options_.cutLineColor, items);
    const auto tick = [&](Point from, Point to) {
      items.emplace_back(LineItem{
          .from = from, .to = to, .width = kCutLine, .color = options_.cutLineColor, .dash = 0.5});
    };
    const double right = options_.margin + plan_.stepX, bottom = options_.margin + plan_.stepY;
    if (column + 1 < plan_.columns) {
      tick({right, seen.y - kTickGap}, {right, seen.y - kTickGap - length});
      tick({right, seen.Bottom() + kTickGap}, {right, seen.Bottom() + kTickGap + length});
    }
    if (row + 1 < plan_.rows) {
      tick({seen.x - kTickGap, bottom}, {seen.x - kTickGap - length, bottom});
      tick({seen.Right() + kTickGap, bottom}, {seen.Right() + kTickGap + length, bottom});
    }
  }

  void AddLabel(int32_t column, int32_t row, Page& page) const {
    const int32_t number = row * plan_.columns + column + 1;
    const std::string values[] = {std::to_string(number),
                                  std::to_string(plan_.columns * plan_.rows),
                                  std::to_string(row + 1), std::to_string(column + 1)};
    const std::string label = Filled(options_.label, values);
    page.bookmarks.push_back({picture_.name + ", " + label, 0});
    if (options_.margin < kLabelHeight + 1) return;
    const double y = page.height - options_.margin / 2 - kLabelHeight / 2;
    page.items.emplace_back(
        TextItem{.text = label,
                 .box = {options_.margin + 8, y, plan_.room.width - 16, kLabelHeight * 1.2},
                 .font = options_.font,
                 .lineHeight = kLabelHeight,
                 .color = kGray});
  }

  Page Sketch() const {
    Page page{.width = plan_.paper.width, .height = plan_.paper.height};
    constexpr double kTitle = 5, kSpace = 12;
    const std::string values[] = {picture_.name, Centimeters(plan_.size.width),
                                  Centimeters(plan_.size.height),
                                  std::to_string(plan_.columns * plan_.rows)};
    const std::string title = Filled(options_.sketchTitle, values);
    const double margin = std::max(options_.margin, 10.0);
    page.items.emplace_back(TextItem{.text = title,
                                     .box = {margin, margin, page.width - 2 * margin, kTitle * 1.2},
                                     .font = options_.font,
                                     .lineHeight = kTitle});
    page.bookmarks.push_back({title, 0});
    const Box room{margin, margin + kSpace, page.width - 2 * margin,
                   page.height - 2 * margin - kSpace};
    const Box place = FittedBox(plan_.size.width, plan_.size.height, room, PictureFit::Inside);
    page.items.emplace_back(PlacePicture(picture_, place, PictureFit::Stretch, false));
    const double scale = place.width / plan_.size.width;
    for (int32_t row = 0; row < plan_.rows; ++row) {
      for (int32_t column = 0; column < plan_.columns; ++column) {
        const Box part = plan_.Part(column, row);
        const Box cell{place.x + part.x * scale, place.y + part.y * scale, part.width * scale,
                       part.height * scale};
        AddOutline(cell, 0.5, kWhite, 0, page.items);
        AddOutline(cell, 0.2, 0, 0, page.items);
        AddNumber(row * plan_.columns + column + 1, cell, page.items);
      }
    }
    return page;
  }

  void AddNumber(int32_t number, const Box& cell, std::vector<PageItem>& items) const {
    const double height = std::min({8.0, cell.width / 3, cell.height / 3});
    const Point center = cell.Center();
    const Box tile{center.x - height, center.y - height * 0.7, 2 * height, height * 1.4};
    items.emplace_back(FilledBox(tile, kWhite));
    items.emplace_back(TextItem{.text = std::to_string(number),
                                .box = {tile.x, center.y - height / 2, tile.width, height * 1.2},
                                .font = options_.font,
                                .lineHeight = height});
  }

  const PosterOptions& options_;
  const PagePicture& picture_;
  const PosterPlan plan_;
};

}  // namespace

Box PosterPlan::Part(int32_t column, int32_t row) const {
  const double x = column * stepX, y = row * stepY;
  return {x, y, std::min(room.width, size.width - x), std::min(room.height, size.height - y)};
}

PosterPlan PlanPoster(const PosterOptions& options, const PagePicture& picture) {
  const PosterPlan plan = PlanFor(options, picture, false);
  if (!options.turnPaper || options.rows > 0) return plan;
  const PosterPlan turned = PlanFor(options, picture, true);
  if (options.size.width > 0)
    return int64_t{turned.columns} * turned.rows < int64_t{plan.columns} * plan.rows ? turned
                                                                                     : plan;
  // a given number of columns: the orientation that leaves less paper empty
  const auto waste = [](const PosterPlan& p) {
    return double{1} * p.columns * p.rows * p.room.width * p.room.height /
           (p.size.width * p.size.height);
  };
  return waste(turned) + kTolerance < waste(plan) ? turned : plan;
}

std::vector<Page> PosterPages(const PosterOptions& options, std::span<const PagePicture> pictures) {
  std::vector<Page> pages;
  int64_t sheets = 0;
  for (const PagePicture& picture : pictures) {
    const PosterMaker poster(options, picture);
    if (sheets + poster.Sheets() > kMostSheets) continue;
    sheets += poster.Sheets();
    poster.Make(pages);
  }
  return pages;
}

}  // namespace fotomill
