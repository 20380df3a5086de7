#include "desktop/models/edit/crop_area.h"

#include <algorithm>
#include <charconv>
#include <cmath>
#include <cstdio>
#include <numbers>
#include <optional>

namespace fotomill::desktop {

namespace {

std::optional<double> ReadPositive(std::string_view text) {
  double number = 0;
  const auto [end, error] = std::from_chars(text.data(), text.data() + text.size(), number);
  const bool whole = error == std::errc() && end == text.data() + text.size();
  return whole && number >= 0.01 && number <= 10000 ? std::optional(number) : std::nullopt;
}

bool MovesLeft(CropGrip grip) {
  return grip == CropGrip::Left || grip == CropGrip::TopLeft || grip == CropGrip::BottomLeft;
}
bool MovesRight(CropGrip grip) {
  return grip == CropGrip::Right || grip == CropGrip::TopRight || grip == CropGrip::BottomRight;
}
bool MovesTop(CropGrip grip) {
  return grip == CropGrip::Top || grip == CropGrip::TopLeft || grip == CropGrip::TopRight;
}
bool MovesBottom(CropGrip grip) {
  return grip == CropGrip::Bottom || grip == CropGrip::BottomLeft || grip == CropGrip::BottomRight;
}

}  // namespace

bool ReadCropRatio(std::string_view text, CropRatio& ratio) {
  const size_t colon = text.find(':');
  const auto width = ReadPositive(text.substr(0, colon));
  const auto height =
      colon == std::string_view::npos ? std::optional(1.0) : ReadPositive(text.substr(colon + 1));
  if (!width || !height) return false;
  ratio = {*width, *height};
  return true;
}

void CropArea::SetPicture(Size size) {
  picture_ = {std::max(size.width, 1), std::max(size.height, 1)};
  area_ = Suggested();
}

Rectangle CropArea::Suggested() const {
  if (ratio_.Free()) return {0, 0, picture_.width, picture_.height};
  const double scale = std::min(picture_.width / ratio_.width, picture_.height / ratio_.height);
  const auto width =
      std::clamp(static_cast<int32_t>(std::lround(scale * ratio_.width)), 1, picture_.width);
  const auto height =
      std::clamp(static_cast<int32_t>(std::lround(scale * ratio_.height)), 1, picture_.height);
  return {(picture_.width - width) / 2, (picture_.height - height) / 2, width, height};
}

// Rounds, then moves into the picture; larger rectangles are cut.
void CropArea::Fit(double left, double top, double width, double height) {
  area_.width = static_cast<int32_t>(std::lround(std::clamp(width, 1.0, 1.0 * picture_.width)));
  area_.height = static_cast<int32_t>(std::lround(std::clamp(height, 1.0, 1.0 * picture_.height)));
  area_.x =
      static_cast<int32_t>(std::lround(std::clamp(left, 0.0, 1.0 * picture_.width - area_.width)));
  area_.y =
      static_cast<int32_t>(std::lround(std::clamp(top, 0.0, 1.0 * picture_.height - area_.height)));
}

void CropArea::SetRatio(const CropRatio& ratio) {
  ratio_ = ratio;
  if (ratio.Free()) return;
  const double scale = std::min(area_.width / ratio.width, area_.height / ratio.height);
  const double width = scale * ratio.width, height = scale * ratio.height;
  Fit(area_.x + (area_.width - width) / 2, area_.y + (area_.height - height) / 2, width, height);
}

void CropArea::SetArea(const Rectangle& area) {
  double width = std::clamp(area.width, 1, picture_.width);
  double height = std::clamp(area.height, 1, picture_.height);
  if (!ratio_.Free()) {
    width = std::min(width, picture_.height * ratio_.width / ratio_.height);
    height = width * ratio_.height / ratio_.width;
  }
  Fit(area.x, area.y, width, height);
}

void CropArea::MoveBy(int32_t right, int32_t down) {
  Fit(area_.x + right, area_.y + down, area_.width, area_.height);
}

void CropArea::Drag(CropGrip grip, const Rectangle& start, double right, double down) {
  if (grip == CropGrip::None) return;
  if (grip == CropGrip::Inside)
    return Fit(start.x + right, start.y + down, start.width, start.height);
  double left = start.x, top = start.y, far = left + start.width, bottom = top + start.height;
  if (MovesLeft(grip)) left = std::clamp(left + right, 0.0, far - 1);
  if (MovesRight(grip)) far = std::clamp(far + right, left + 1, 1.0 * picture_.width);
  if (MovesTop(grip)) top = std::clamp(top + down, 0.0, bottom - 1);
  if (MovesBottom(grip)) bottom = std::clamp(bottom + down, top + 1, 1.0 * picture_.height);
  double width = far - left, height = bottom - top;
  if (ratio_.Free()) return Fit(left, top, width, height);
  // An edge leads; the other side follows around its middle. Of a corner, the larger change leads.
  const bool across = MovesLeft(grip) || MovesRight(grip);
  const bool downward = MovesTop(grip) || MovesBottom(grip);
  const double ratio = ratio_.width / ratio_.height;
  const bool widthLeads = across && (!downward || std::abs(width - start.width) >=
                                                      ratio * std::abs(height - start.height));
  const double middleX = start.x + start.width / 2.0, middleY = start.y + start.height / 2.0;
  // The room on the sides that may grow.
  const double roomX = !across           ? 2 * std::min(middleX, picture_.width - middleX)
                       : MovesLeft(grip) ? far
                                         : picture_.width - left;
  const double roomY = !downward        ? 2 * std::min(middleY, picture_.height - middleY)
                       : MovesTop(grip) ? bottom
                                        : picture_.height - top;
  width = std::min({widthLeads ? width : height * ratio, roomX, roomY * ratio});
  height = width / ratio;
  Fit(!across           ? middleX - width / 2
      : MovesLeft(grip) ? far - width
                        : left,
      !downward        ? middleY - height / 2
      : MovesTop(grip) ? bottom - height
                       : top,
      width, height);
}

void CropArea::Span(double fromX, double fromY, double toX, double toY) {
  const double x = std::clamp(fromX, 0.0, picture_.width - 1.0);
  const double y = std::clamp(fromY, 0.0, picture_.height - 1.0);
  const Rectangle start{static_cast<int32_t>(x), static_cast<int32_t>(y), 1, 1};
  const bool left = toX < fromX, up = toY < fromY;
  const CropGrip grip = left ? (up ? CropGrip::TopLeft : CropGrip::BottomLeft)
                             : (up ? CropGrip::TopRight : CropGrip::BottomRight);
  Drag(grip, start, toX - fromX, toY - fromY);
}

CropGrip GripAt(const Rectangle& shown, int32_t x, int32_t y, int32_t near) {
  const int32_t right = shown.x + shown.width, bottom = shown.y + shown.height;
  if (x < shown.x - near || x > right + near || y < shown.y - near || y > bottom + near)
    return CropGrip::None;
  const bool atLeft = std::abs(x - shown.x) <= near, atRight = std::abs(x - right) <= near;
  const bool atTop = std::abs(y - shown.y) <= near, atBottom = std::abs(y - bottom) <= near;
  if (atTop && atLeft) return CropGrip::TopLeft;
  if (atTop && atRight) return CropGrip::TopRight;
  if (atBottom && atLeft) return CropGrip::BottomLeft;
  if (atBottom && atRight) return CropGrip::BottomRight;
  if (atLeft) return CropGrip::Left;
  if (atRight) return CropGrip::Right;
  if (atTop) return CropGrip::Top;
  return atBottom ? CropGrip::Bottom : CropGrip::Inside;
}

Rectangle SamePart(const Rectangle& area, Size from, Size to) {
  const auto scaled = [](int32_t place, int32_t old, int32_t size) {
    return static_cast<int32_t>(std::lround(1.0 * place * size / old));
  };
  const int32_t left = scaled(area.x, from.width, to.width);
  const int32_t top = scaled(area.y, from.height, to.height);
  return {left, top, std::max(1, scaled(area.x + area.width, from.width, to.width) - left),
          std::max(1, scaled(area.y + area.height, from.height, to.height) - top)};
}

double StraighteningAngle(double fromX, double fromY, double toX, double toY) {
  if (fromX == toX && fromY == toY) return 0;
  double angle = std::atan2(toY - fromY, toX - fromX) * 180 / std::numbers::pi;
  while (angle > 45) angle -= 90;
  while (angle < -45) angle += 90;
  return angle == 0 ? 0 : -angle;
}

std::string CropRecipe(double angle, const Rectangle& area, Size picture) {
  char text[120];
  std::string recipe;
  if (angle != 0) {
    std::snprintf(text, sizeof text, "straighten %.2f\n", angle);
    recipe = text;
  }
  if (area == Rectangle{0, 0, picture.width, picture.height}) return recipe;
  std::snprintf(text, sizeof text, "crop %dx%d+%d+%d\n", area.width, area.height, area.x, area.y);
  return recipe + text;
}

}  // namespace fotomill::desktop
