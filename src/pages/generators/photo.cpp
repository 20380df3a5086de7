#include "pages/generators/photo.h"

#include <algorithm>
#include <functional>
#include <map>
#include <optional>
#include <tuple>

namespace fotomill {

namespace {

constexpr double kTolerance = 1e-6;  // rounding errors of sums of lengths
constexpr double kCutLine = 0.1;
constexpr size_t kMostTried = 2000;  // rectangles; for more, few strategies are tried
constexpr size_t kMostPrints = 100000;  // in all

// How a strategy chooses among the turns of a rectangle.
enum class Turning { Free, Never, Always };

// A sheet as the list of its maximal free rectangles, which may overlap.
class Sheet {
 public:
  explicit Sheet(const PaperSize& room) : free_{{0, 0, room.width, room.height}} {}

  // Takes the free place where the smaller of the remaining edges is smallest.
  std::optional<PackedPlace> Put(const PaperSize& size, Turning turning) {
    std::optional<PackedPlace> best;
    auto least = std::tuple(1e18, 1e18);
    for (const bool turned : {false, true}) {
      if ((turned && turning == Turning::Never) || (!turned && turning == Turning::Always))
        continue;
      const PaperSize box = turned ? size.Turned() : size;
      for (const Box& place : free_) {
        const double across = place.width - box.width, down = place.height - box.height;
        if (across < -kTolerance || down < -kTolerance) continue;
        const auto score = std::tuple(std::min(across, down), std::max(across, down));
        if (score >= least) continue;
        least = score;
        best = PackedPlace{.box = {place.x, place.y, box.width, box.height}, .turned = turned};
      }
    }
    if (best) Cut(best->box);
    return best;
  }

 private:
  static bool Within(const Box& inner, const Box& outer) {
    return inner.x >= outer.x - kTolerance && inner.y >= outer.y - kTolerance &&
           inner.Right() <= outer.Right() + kTolerance &&
           inner.Bottom() <= outer.Bottom() + kTolerance;
  }

  void Cut(const Box& used) {
    std::vector<Box> left;
    const auto keep = [&left](const Box& box) {
      if (box.width > kTolerance && box.height > kTolerance) left.push_back(box);
    };
    for (const Box& box : free_) {
      if (used.x >= box.Right() - kTolerance || used.Right() <= box.x + kTolerance ||
          used.y >= box.Bottom() - kTolerance || used.Bottom() <= box.y + kTolerance) {
        keep(box);
        continue;
      }
      keep({box.x, box.y, used.x - box.x, box.height});
      keep({used.Right(), box.y, box.Right() - used.Right(), box.height});
      keep({box.x, box.y, box.width, used.y - box.y});
      keep({box.x, used.Bottom(), box.width, box.Bottom() - used.Bottom()});
    }
    free_.clear();
    for (size_t i = 0; i < left.size(); ++i) {
      bool inner = false;
      for (size_t k = 0; k < left.size() && !inner; ++k)
        inner = k != i && Within(left[i], left[k]) && (k < i || !Within(left[k], left[i]));
      if (!inner) free_.push_back(left[i]);
    }
  }

  std::vector<Box> free_;
};

// The order in which a strategy places rectangles.
using Order = std::function<double(const PaperSize&)>;

// Rectangles of one size, in their order, and how many of them are placed.
struct SizeGroup {
  PaperSize size;
  std::vector<size_t> members = {};
  size_t placed = 0;
};

std::vector<SizeGroup> GroupsOf(std::span<const PaperSize> sizes, const Order& order) {
  std::vector<SizeGroup> groups;
  std::map<std::pair<double, double>, size_t> known;
  for (size_t i = 0; i < sizes.size(); ++i) {
    const auto [group, added] = known.try_emplace({sizes[i].width, sizes[i].height}, groups.size());
    if (added) groups.push_back({.size = sizes[i]});
    groups[group->second].members.push_back(i);
  }
  std::ranges::stable_sort(groups, std::greater<>(),
                           [&](const SizeGroup& group) { return order(group.size); });
  return groups;
}

// Work is proportional to the number of rectangles, and of sheets times sizes.
std::vector<PackedPlace> PackInOrder(std::span<const PaperSize> sizes, const PaperSize& room,
                                     const Order& order, Turning turning) {
  std::vector<SizeGroup> groups = GroupsOf(sizes, order);
  std::vector<PackedPlace> places(sizes.size());
  size_t placed = 0;
  for (size_t sheet = 0; placed < sizes.size(); ++sheet) {
    Sheet bin(room);
    const size_t before = placed;
    for (SizeGroup& group : groups) {
      while (group.placed < group.members.size()) {
        std::optional<PackedPlace> place = bin.Put(group.size, turning);
        if (!place && turning != Turning::Free) place = bin.Put(group.size, Turning::Free);
        if (!place) break;
        place->sheet = sheet;
        places[group.members[group.placed++]] = *place;
        ++placed;
      }
    }
    if (placed == before) return {};
  }
  return places;
}

size_t SheetCount(std::span<const PackedPlace> places) {
  size_t count = 0;
  for (const PackedPlace& place : places) count = std::max(count, place.sheet + 1);
  return count;
}

int32_t Fits(double length, double side) {
  return static_cast<int32_t>((length + kTolerance) / side);
}

// Adds as many rectangles as fit into an area, in rows and columns.
void FillBlock(const Box& area, const PaperSize& size, bool turned,
               std::vector<PackedPlace>& sheet) {
  const PaperSize one = turned ? size.Turned() : size;
  for (int32_t y = 0; y < Fits(area.height, one.height); ++y) {
    for (int32_t x = 0; x < Fits(area.width, one.width); ++x) {
      sheet.push_back(
          {0, {area.x + x * one.width, area.y + y * one.height, one.width, one.height}, turned});
    }
  }
}

// Upright rectangles in full columns, or rows, and turned ones in the strip that is left; the split
// that holds the most.
void FillTwoBlocks(const PaperSize& size, const PaperSize& room, std::vector<PackedPlace>& best) {
  for (const bool first : {false, true}) {
    const PaperSize box = first ? size.Turned() : size;
    for (const bool columns : {false, true}) {
      const int32_t most = columns ? Fits(room.width, box.width) : Fits(room.height, box.height);
      for (int32_t lines = 0; lines <= most; ++lines) {
        std::vector<PackedPlace> sheet;
        const double taken = lines * (columns ? box.width : box.height);
        FillBlock(columns ? Box{0, 0, taken, room.height} : Box{0, 0, room.width, taken}, size,
                  first, sheet);
        FillBlock(columns ? Box{taken, 0, room.width - taken, room.height}
                          : Box{0, taken, room.width, room.height - taken},
                  size, !first, sheet);
        if (sheet.size() > best.size()) best = std::move(sheet);
      }
    }
  }
}

// Four blocks around a hole: upright ones at the top left and bottom right, turned ones in the
// other corners.
void FillPinwheel(const PaperSize& size, const PaperSize& room, std::vector<PackedPlace>& best) {
  for (int32_t i = 1; i <= Fits(room.width, size.width); ++i) {
    for (int32_t j = 1; j <= Fits(room.height, size.height); ++j) {
      const double across = i * size.width, down = j * size.height;
      const int32_t k = Fits(room.width - across, size.height),
                    l = Fits(room.height - down, size.width);
      const double turnedAcross = k * size.height, turnedDown = l * size.width;
      const auto overlap = [&room](double width, double height) {
        return 2 * width > room.width + kTolerance && 2 * height > room.height + kTolerance;
      };
      const auto count = 2 * (int64_t{i} * j + int64_t{k} * l);
      if (count <= static_cast<int64_t>(best.size()) || overlap(across, down) ||
          overlap(turnedAcross, turnedDown))
        continue;
      best.clear();
      FillBlock({0, 0, across, down}, size, false, best);
      FillBlock({room.width - turnedAcross, 0, turnedAcross, turnedDown}, size, true, best);
      FillBlock({room.width - across, room.height - down, across, down}, size, false, best);
      FillBlock({0, room.height - turnedDown, turnedAcross, turnedDown}, size, true, best);
    }
  }
}

// Rectangles of one size, on sheets that are all alike.
std::vector<PackedPlace> PackEqual(size_t count, const PaperSize& size, const PaperSize& room) {
  constexpr double kMostOnSheet = 10000;
  if (room.width * room.height / (size.width * size.height) > kMostOnSheet) return {};
  std::vector<PackedPlace> best;
  FillTwoBlocks(size, room, best);
  FillPinwheel(size, room, best);
  std::vector<PackedPlace> places;
  for (size_t i = 0; i < count && !best.empty(); ++i) {
    places.push_back(best[i % best.size()]);
    places.back().sheet = i / best.size();
  }
  return places;
}

// Rotates a picture that was placed in an upright box into a box that lies.
PictureItem Turned(PictureItem item, const Box& box) {
  const auto turn = [&](Point point) { return Point{box.Right() - point.y, box.y + point.x}; };
  const auto turnVector = [](Point vector) { return Point{-vector.y, vector.x}; };
  item.corner = turn(item.corner);
  item.across = turnVector(item.across);
  item.down = turnVector(item.down);
  for (Point& point : item.clip) point = turn(point);
  return item;
}

// A print of one picture.
struct Print {
  const PagePicture* picture;
  PaperSize size;
};

std::vector<Print> PrintsOf(const PhotoOptions& options, std::span<const PagePicture> pictures) {
  std::vector<Print> prints;
  size_t copies = 0;
  for (const PhotoSize& photo : options.sizes) copies += static_cast<size_t>(photo.copies);
  for (const PagePicture& picture : pictures) {
    if (prints.size() + copies > kMostPrints) break;
    for (const PhotoSize& photo : options.sizes) {
      const bool turn = !photo.upright && NeedsTurn(picture.width, picture.height,
                                                    {0, 0, photo.size.width, photo.size.height});
      prints.insert(prints.end(), static_cast<size_t>(photo.copies),
                    {&picture, turn ? photo.size.Turned() : photo.size});
    }
  }
  return prints;
}

PaperSize RoomOf(const PhotoOptions& options) {
  return {options.paper.width - 2 * options.margin, options.paper.height - 2 * options.margin};
}

// For each sheet, how far to move its prints to center them.
std::vector<Point> ShiftsOf(const PhotoOptions& options, std::span<const PackedPlace> places) {
  const PaperSize room = RoomOf(options);
  std::vector<Point> ends(SheetCount(places));
  for (const PackedPlace& place : places) {
    Point& end = ends[place.sheet];
    end = {std::max(end.x, place.box.Right()), std::max(end.y, place.box.Bottom())};
  }
  for (Point& end : ends) {
    end = {options.margin + (room.width - end.x) / 2, options.margin + (room.height - end.y) / 2};
  }
  return ends;
}

}  // namespace

std::vector<PackedPlace> PackSheets(std::span<const PaperSize> sizes, const PaperSize& room,
                                    double gap) {
  // A gap belongs to the rectangle before it; the last one of a row needs none.
  std::vector<PaperSize> grown(sizes.begin(), sizes.end());
  for (PaperSize& size : grown) size = {size.width + gap, size.height + gap};
  const PaperSize space{room.width + gap, room.height + gap};
  const Order orders[] = {[](const PaperSize& s) { return s.width * s.height; },
                          [](const PaperSize& s) { return std::max(s.width, s.height); },
                          [](const PaperSize& s) { return std::min(s.width, s.height); },
                          [](const PaperSize& s) { return s.width + s.height; }};
  std::vector<PackedPlace> best;
  const auto consider = [&best](std::vector<PackedPlace> places) {
    if (!places.empty() && (best.empty() || SheetCount(places) < SheetCount(best)))
      best = std::move(places);
  };
  const auto like = [&grown](const PaperSize& size) {
    return size == grown[0] || size.Turned() == grown[0];
  };
  if (!grown.empty() && std::ranges::all_of(grown, like)) {
    consider(PackEqual(grown.size(), grown[0], space));
    for (size_t i = 0; i < best.size(); ++i) {
      if (grown[i] != grown[0]) best[i].turned = !best[i].turned;
    }
  }
  const bool many = grown.size() > kMostTried;
  for (const Order& order : std::span(orders).first(many ? 1 : std::size(orders))) {
    if (many && !best.empty()) break;
    for (const Turning turning : {Turning::Free, Turning::Never, Turning::Always})
      consider(PackInOrder(grown, space, order, turning));
  }
  for (PackedPlace& place : best) {
    place.box.width -= gap;
    place.box.height -= gap;
  }
  return best;
}

bool PhotosFit(const PhotoOptions& options) {
  const PaperSize room = RoomOf(options);
  return std::ranges::all_of(options.sizes, [&](const PhotoSize& photo) {
    return std::max(photo.size.width, photo.size.height) <=
               std::max(room.width, room.height) + kTolerance &&
           std::min(photo.size.width, photo.size.height) <=
               std::min(room.width, room.height) + kTolerance;
  });
}

std::vector<Page> PhotoPages(const PhotoOptions& options, std::span<const PagePicture> pictures) {
  const std::vector<Print> prints = PrintsOf(options, pictures);
  std::vector<PaperSize> sizes;
  for (const Print& print : prints) sizes.push_back(print.size);
  const std::vector<PackedPlace> places = PackSheets(sizes, RoomOf(options), options.gap);
  std::vector<Page> pages(SheetCount(places),
                          {.width = options.paper.width, .height = options.paper.height});
  const std::vector<Point> shifts = ShiftsOf(options, places);
  for (size_t i = 0; i < places.size(); ++i) {
    const PackedPlace& place = places[i];
    Page& page = pages[place.sheet];
    const Point shift = shifts[place.sheet];
    const Box box{place.box.x + shift.x, place.box.y + shift.y, place.box.width, place.box.height};
    page.items.push_back(
        place.turned ? Turned(PlacePicture(*prints[i].picture, {0, 0, box.height, box.width},
                                           options.fit, false),
                              box)
                     : PlacePicture(*prints[i].picture, box, options.fit, false));
    if (page.bookmarks.empty() || page.bookmarks.back().title != prints[i].picture->name)
      page.bookmarks.push_back({prints[i].picture->name, box.y});
  }
  // over the pictures, so that none covers the line of its neighbor
  for (size_t i = 0; i < places.size() && options.cutLines; ++i) {
    const Point shift = shifts[places[i].sheet];
    const Box& box = places[i].box;
    AddOutline({box.x + shift.x, box.y + shift.y, box.width, box.height}, kCutLine,
               options.cutLineColor, 0, pages[places[i].sheet].items);
  }
  return pages;
}

}  // namespace fotomill
