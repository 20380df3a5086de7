#include "pages/generators/contact.h"

#include <algorithm>

#include "pages/model/placing.h"

namespace fotomill {

namespace {

void AddFrame(const ContactLayout& layout, const Box& area, std::vector<PageItem>& items) {
  if (layout.frame == CellFrame::None) return;
  const double line = layout.frameWidth;
  const Box frame{area.x - layout.inset, area.y - layout.inset,
                  area.width + layout.frameReach + line, area.height + layout.frameReach + line};
  items.emplace_back(FilledBox({frame.x, frame.y, frame.width, line}, layout.light));
  items.emplace_back(FilledBox({frame.x, frame.y, line, frame.height}, layout.light));
  items.emplace_back(FilledBox({frame.x, frame.Bottom() - line, frame.width, line}, layout.dark));
  items.emplace_back(FilledBox({frame.Right() - line, frame.y, line, frame.height}, layout.dark));
}

}  // namespace

Box ContactArea(const ContactLayout& layout, int32_t index) {
  return {layout.left + index % layout.columns * layout.stepX + layout.inset,
          layout.top + index / layout.columns * layout.stepY + layout.inset, layout.cellWidth,
          layout.cellHeight};
}

void AddContactCell(const ContactLayout& layout, int32_t index, const PagePicture& picture,
                    std::vector<PageItem>& items) {
  const Box area = ContactArea(layout, index);
  AddFrame(layout, area, items);
  PictureItem place = PlacePicture(picture, area, PictureFit::Inside, false);
  if (layout.onBaseline) place.corner.y = area.Bottom() - place.down.y;
  items.emplace_back(std::move(place));
  if (!layout.names) return;
  items.emplace_back(
      TextItem{.text = picture.name,
               .box = {area.x, area.Bottom() + layout.captionGap, area.width, layout.captionHeight},
               .font = layout.font,
               .lineHeight = layout.lineHeight,
               .color = layout.text});
}

void FitContactGrid(double margin, ContactLayout& layout) {
  const double across = (layout.pageWidth - 2 * margin) / layout.columns,
               down = (layout.pageHeight - 2 * margin) / layout.rows;
  // names shrink with small cells
  layout.lineHeight = std::min({4.0, across / 6, down / 6});
  layout.captionGap = layout.lineHeight / 4;
  layout.captionHeight = layout.names ? layout.lineHeight * 1.1 : 0;
  const double caption = layout.names ? layout.captionGap + layout.captionHeight : 0;
  const double gap = std::min(4.0, std::min(across, down) / 8);
  layout.left = layout.top = margin;
  layout.stepX = (layout.pageWidth - 2 * margin + gap) / layout.columns;
  layout.stepY = (layout.pageHeight - 2 * margin + gap) / layout.rows;
  layout.cellWidth = layout.stepX - gap;
  layout.cellHeight = layout.stepY - gap - caption;
  layout.inset = 0;
  layout.onBaseline = layout.names && layout.frame == CellFrame::None;
  layout.frameReach = -layout.frameWidth;
}

std::vector<Page> ContactPages(const ContactLayout& layout, std::span<const PagePicture> pictures) {
  std::vector<Page> pages;
  const auto cells = static_cast<size_t>(layout.columns) * static_cast<size_t>(layout.rows);
  for (size_t i = 0; i < pictures.size(); ++i) {
    if (i % cells == 0) {
      pages.push_back({.width = layout.pageWidth,
                       .height = layout.pageHeight,
                       .background = layout.background});
    }
    const auto index = static_cast<int32_t>(i % cells);
    AddContactCell(layout, index, pictures[i], pages.back().items);
    pages.back().bookmarks.push_back({pictures[i].name, ContactArea(layout, index).y});
  }
  return pages;
}

}  // namespace fotomill
