#include "pages/generators/catalog.h"

#include <algorithm>

#include "operations/macros.h"
#include "pages/model/placing.h"
#include "picture/picture_record.h"

namespace fotomill {

namespace {

constexpr double kGap = 5, kFrame = 0.2, kPadding = 2;
constexpr double kFooterHeight = 3.5, kFooterGap = 4;
constexpr Color kWhite = 0xFFFFFF;

class CatalogMaker {
 public:
  explicit CatalogMaker(const CatalogOptions& options)
      : options_(options), dark_(IsDark(options.background)) {
    const double footer = options.footer.empty() ? 0 : kFooterHeight + kFooterGap;
    stepX_ = (options.paper.width - 2 * options.margin + kGap) / options.columns;
    stepY_ = (options.paper.height - 2 * options.margin - footer + kGap) / options.rows;
    line_ = std::min({3.6, (stepX_ - kGap) / 8, (stepY_ - kGap) / 8});
  }

  Page NewPage(size_t number) const {
    Page page{.width = options_.paper.width,
              .height = options_.paper.height,
              .background = options_.background};
    if (options_.footer.empty()) return page;
    PictureRecord record;
    record.page = static_cast<int32_t>(number);
    page.items.emplace_back(
        TextItem{.text = ExpandMacros(options_.footer, {}, record),
                 .box = {options_.margin, page.height - options_.margin - kFooterHeight,
                         page.width - 2 * options_.margin, kFooterHeight * 1.2},
                 .font = options_.font,
                 .lineHeight = kFooterHeight,
                 .color = dark_ ? 0xC0C0C0u : 0x606060u});
    return page;
  }

  void AddCell(int32_t index, const PagePicture& picture, Page& page) const {
    const Box cell{options_.margin + index % options_.columns * stepX_,
                   options_.margin + index / options_.columns * stepY_, stepX_ - kGap,
                   stepY_ - kGap};
    const double bar = line_ * 1.6;
    Box room{cell.x + kPadding, cell.y + kPadding, cell.width - 2 * kPadding,
             cell.height - 2 * kPadding};
    const Color frame = dark_ ? 0x909090u : 0xB0B0B0u, text = dark_ ? kWhite : 0x202020u;
    std::vector<PageItem>& items = page.items;
    const std::string details = picture.texts.empty() ? std::string() : picture.texts[0];
    if (options_.frameTitles) {
      items.emplace_back(FilledBox({cell.x, cell.y, cell.width, bar}, frame));
      AddText(picture.name, cell.y + (bar - line_) / 2, dark_ ? kWhite : 0, room, items);
      room.y += bar;
      room.height -= bar;
    }
    const double below = ((options_.frameTitles ? 0 : 1) + (details.empty() ? 0 : 1)) * line_ * 1.3;
    room.height -= below;
    double y = room.Bottom() + line_ * 0.4;
    if (!options_.frameTitles) {
      AddText(picture.name, y, text, room, items);
      y += line_ * 1.3;
    }
    if (!details.empty()) AddText(details, y, dark_ ? 0xC0C0C0u : 0x606060u, room, items);
    if (room.width > 1 && room.height > 1)
      items.emplace_back(PlacePicture(picture, room, PictureFit::Inside, false));
    AddOutline(cell, kFrame, frame, 0, items);
    if (options_.links) items.emplace_back(LinkItem{cell, picture.file});
    page.bookmarks.push_back({picture.name, cell.y});
  }

 private:
  void AddText(const std::string& text, double y, Color color, const Box& room,
               std::vector<PageItem>& items) const {
    items.emplace_back(TextItem{.text = text,
                                .box = {room.x, y, room.width, line_ * 1.2},
                                .font = options_.font,
                                .lineHeight = line_,
                                .color = color});
  }

  const CatalogOptions& options_;
  const bool dark_;  // the background
  double stepX_ = 0, stepY_ = 0, line_ = 0;
};

}  // namespace

std::vector<Page> CatalogPages(const CatalogOptions& options,
                               std::span<const PagePicture> pictures) {
  const CatalogMaker maker(options);
  std::vector<Page> pages;
  const auto cells = static_cast<size_t>(options.columns) * static_cast<size_t>(options.rows);
  for (size_t i = 0; i < pictures.size(); ++i) {
    if (i % cells == 0) pages.push_back(maker.NewPage(pages.size()));
    maker.AddCell(static_cast<int32_t>(i % cells), pictures[i], pages.back());
  }
  return pages;
}

}  // namespace fotomill
