#include <gmock/gmock.h>
#include <gtest/gtest.h>

#include <array>
#include <cmath>
#include <numbers>

#include "pages/generators/cutout.h"
#include "pages/generators/poster.h"
#include "pages/model/placing.h"

namespace fotomill::test {
namespace {

constexpr double kClose = 1e-9;

struct Vector {
  double x, y, z;
};
Vector operator+(Vector a, Vector b) { return {a.x + b.x, a.y + b.y, a.z + b.z}; }
Vector operator-(Vector a, Vector b) { return {a.x - b.x, a.y - b.y, a.z - b.z}; }
Vector operator*(Vector a, double s) { return {a.x * s, a.y * s, a.z * s}; }
double Dot(Vector a, Vector b) { return a.x * b.x + a.y * b.y + a.z * b.z; }
Vector Cross(Vector a, Vector b) {
  return {a.y * b.z - a.z * b.y, a.z * b.x - a.x * b.z, a.x * b.y - a.y * b.x};
}
double Distance(Vector a, Vector b) { return std::sqrt(Dot(a - b, a - b)); }

// Rotates a point about the line through two others. Source: Rodrigues' formula.
Vector Folded(Vector point, Vector from, Vector to, double angle) {
  const Vector axis = (to - from) * (1 / Distance(from, to)), out = point - from;
  return from + out * std::cos(angle) + Cross(axis, out) * std::sin(angle) +
         axis * (Dot(axis, out) * (1 - std::cos(angle)));
}

using Solid = std::vector<std::vector<Vector>>;

Solid Flat(const CutoutNet& net) {
  Solid faces;
  for (const CutoutNet::Face& face : net.faces) {
    std::vector<Vector>& corners = faces.emplace_back();
    for (const Point& corner : face.corners) corners.push_back({corner.x, corner.y, 0});
  }
  return faces;
}

void ExpectRegular(const CutoutNet& net, size_t sides) {
  for (const CutoutNet::Face& face : net.faces) {
    ASSERT_EQ(face.corners.size(), sides);
    Point sum;
    for (const Point& corner : face.corners) sum = sum + corner;
    const Point center = sum * (1.0 / static_cast<double>(sides));
    for (size_t i = 0; i < sides; ++i) {
      const Point edge = face.corners[(i + 1) % sides] - face.corners[i];
      const Point out = face.corners[i] - center;
      EXPECT_NEAR(std::hypot(edge.x, edge.y), 1, kClose);
      EXPECT_NEAR(std::hypot(out.x, out.y),
                  0.5 / std::sin(std::numbers::pi / static_cast<double>(sides)), kClose);
    }
    EXPECT_NEAR(std::hypot(face.up.x, face.up.y), 1, kClose);
  }
}

// Every edge of the folded solids is shared by exactly two faces, and of the two sides of a joint
// that is not a fold, exactly one has a flap.
void ExpectClosed(std::span<const CutoutNet> nets, std::span<const Solid> solids, size_t edges) {
  struct Side {
    size_t net, face, edge;
    Vector from, to;
  };
  std::vector<Side> sides;
  for (size_t n = 0; n < solids.size(); ++n) {
    for (size_t f = 0; f < solids[n].size(); ++f) {
      for (size_t e = 0; e < solids[n][f].size(); ++e)
        sides.push_back({n, f, e, solids[n][f][e], solids[n][f][(e + 1) % solids[n][f].size()]});
    }
  }
  EXPECT_EQ(sides.size(), 2 * edges);
  const auto hasFlap = [&](const Side& side) {
    return std::ranges::any_of(nets[side.net].flaps, [&](const CutoutNet::Flap& flap) {
      return flap.face == side.face && flap.edge == side.edge;
    });
  };
  for (const Side& side : sides) {
    int partners = 0, flaps = hasFlap(side);
    for (const Side& other : sides) {
      if (&other == &side) continue;
      const bool same =
          (Distance(side.from, other.to) < 1e-6 && Distance(side.to, other.from) < 1e-6) ||
          (Distance(side.from, other.from) < 1e-6 && Distance(side.to, other.to) < 1e-6);
      if (!same) continue;
      ++partners;
      flaps += hasFlap(other);
    }
    EXPECT_EQ(partners, 1) << side.net << ' ' << side.face << ' ' << side.edge;
    EXPECT_EQ(flaps, nets[side.net].IsFold(side.face, side.edge) ? 0 : 1)
        << side.net << ' ' << side.face << ' ' << side.edge;
  }
}

TEST(CutoutNet, FoldsToACube) {
  const CutoutNet net = CubeNet();
  ExpectRegular(net, 4);
  Solid solid = Flat(net);
  constexpr double kRight = std::numbers::pi / 2;
  const auto fold = [&](std::initializer_list<size_t> faces, Vector from, Vector to, double angle) {
    for (const size_t face : faces) {
      for (Vector& corner : solid[face]) corner = Folded(corner, from, to, angle);
    }
  };
  // the front face lies; outer folds first
  fold({3}, {1, 3, 0}, {2, 3, 0}, -kRight);
  fold({2, 3}, {1, 2, 0}, {2, 2, 0}, -kRight);
  fold({0}, {1, 1, 0}, {2, 1, 0}, kRight);
  fold({4}, {1, 1, 0}, {1, 2, 0}, -kRight);
  fold({5}, {2, 1, 0}, {2, 2, 0}, kRight);
  ExpectClosed({&net, 1}, {&solid, 1}, 12);
  // the direction of every picture but top and bottom is up, from the bottom to the top face
  for (const size_t face : {1, 3, 4, 5}) {
    const CutoutNet::Face& flat = net.faces[face];
    for (size_t i = 0; i < 4; ++i) {
      const Point edge = flat.corners[(i + 1) % 4] - flat.corners[i];
      if (std::abs(edge.x - flat.up.x) > 1e-6 || std::abs(edge.y - flat.up.y) > 1e-6) continue;
      const Vector up = solid[face][(i + 1) % 4] - solid[face][i];
      EXPECT_NEAR(up.y, -1, 1e-6) << face;
    }
  }
}

TEST(CutoutNet, FoldsToADodecahedron) {
  const std::vector<CutoutNet> nets{DodecahedronNet(false), DodecahedronNet(true)};
  std::vector<Solid> solids;
  const double golden = (1 + std::sqrt(5)) / 2;
  const double dihedral = 2 * std::atan(golden);  // about 116.57 degrees
  // the distance of opposite faces of a dodecahedron with edges of length 1
  const double height = golden * golden / std::sqrt(3 - golden);
  for (const CutoutNet& net : nets) {
    ExpectRegular(net, 5);
    EXPECT_EQ(net.flaps.size(), 10u);
    Solid solid = Flat(net);
    for (size_t petal = 1; petal <= 5; ++petal) {
      const Vector from = solid[petal][0], to = solid[petal][1];
      for (Vector& corner : solid[petal])
        corner = Folded(corner, from, to, std::numbers::pi - dihedral);
    }
    // both are folded to the same side
    EXPECT_GT(std::abs(solid[1][3].z), 1);
    solids.push_back(solid);
  }
  // the second half turned over and on top of the first
  const double side = solids[0][1][3].z > 0 ? 1 : -1;
  for (std::vector<Vector>& face : solids[1]) {
    for (Vector& corner : face) corner = {corner.x, -corner.y, side * height - corner.z};
  }
  ExpectClosed(nets, solids, 30);
}

TEST(CutoutPages, FacesAreExactAndFit) {
  const std::vector<CutoutNet> nets{DodecahedronNet(false), DodecahedronNet(true)};
  const std::vector<PagePicture> pictures(7, {.width = 300, .height = 200});
  CutoutOptions options{.edge = 30, .note = "glue"};
  const std::vector<Page> pages = CutoutPages(options, nets, pictures);
  ASSERT_EQ(pages.size(), 2u);
  for (size_t half = 0; half < 2; ++half) {
    const Page& page = pages[half];
    size_t faces = 0;
    for (const PageItem& item : page.items) {
      std::vector<Point> corners;
      if (const auto* const picture = std::get_if<PictureItem>(&item)) {
        const Point up = nets[half].faces[faces++].up;
        EXPECT_LT(picture->down.x * up.x + picture->down.y * up.y, 0);
        EXPECT_NEAR(picture->across.x * up.x + picture->across.y * up.y, 0, kClose);
        EXPECT_GT(picture->across.x * picture->down.y - picture->across.y * picture->down.x, 0);
        corners = picture->clip;
        for (size_t i = 0; i < 5; ++i) {
          const Point edge = corners[(i + 1) % 5] - corners[i];
          EXPECT_NEAR(std::hypot(edge.x, edge.y), 30, 0.001);
        }
        // the picture covers its face: each corner is within it
        for (const Point& corner : corners) {
          const Point out = corner - picture->corner;
          const Point a = picture->across, d = picture->down;
          EXPECT_NEAR(std::hypot(a.x, a.y) / std::hypot(d.x, d.y), 1.5, kClose);
          const double s = (out.x * a.x + out.y * a.y) / (a.x * a.x + a.y * a.y),
                       t = (out.x * d.x + out.y * d.y) / (d.x * d.x + d.y * d.y);
          EXPECT_TRUE(s > -kClose && s < 1 + kClose && t > -kClose && t < 1 + kClose) << s << t;
        }
      }
      if (const auto* const line = std::get_if<LineItem>(&item)) corners = {line->from, line->to};
      for (const Point& corner : corners) {
        EXPECT_TRUE(corner.x > 10 - kClose && corner.x < 200 + kClose);
        EXPECT_TRUE(corner.y > 10 - kClose && corner.y < 287 - 6 + kClose);
      }
    }
    EXPECT_EQ(faces, 6u);
  }
  const double largest = LargestEdge(options, nets);
  options.edge = largest;
  EXPECT_FALSE(CutoutPages(options, nets, pictures).empty());
  options.edge = largest + 0.1;
  EXPECT_TRUE(CutoutPages(options, nets, pictures).empty());
}

TEST(PosterPages, SheetsOverlapAndCoverThePicture) {
  const PagePicture wide{.name = "w", .width = 3000, .height = 2000};
  const struct {
    const char* name;
    PosterOptions options;
    PaperSize size, paper;
    int32_t columns, rows;
  } rows[] = {
      {"60x40 cm", {.turnPaper = false, .size = {600, 400}}, {600, 400}, {210, 297}, 4, 2},
      {"given upright", {.turnPaper = false, .size = {400, 600}}, {600, 400}, {210, 297}, 4, 2},
      {"the paper lies if that saves sheets", {.size = {530, 900}}, {795, 530}, {297, 210}, 3, 3},
      {"exactly two sheets, no third",
       {.turnPaper = false, .size = {370, 300}},
       {370, 370 * 2 / 3.0},
       {210, 297},
       2,
       1},
      {"2x3 sheets", {.columns = 2, .rows = 3}, {370, 370 * 2 / 3.0}, {210, 297}, 2, 1},
      {"two across", {.turnPaper = false}, {370, 370 * 2 / 3.0}, {210, 297}, 2, 1},
      {"no overlap",
       {.turnPaper = false, .overlap = 0, .size = {570, 554}},
       {570, 380},
       {210, 297},
       3,
       2},
      {"smaller than a sheet", {.turnPaper = false, .size = {90, 60}}, {90, 60}, {210, 297}, 1, 1},
  };
  for (const auto& row : rows) {
    SCOPED_TRACE(row.name);
    const PosterPlan plan = PlanPoster(row.options, wide);
    EXPECT_NEAR(plan.size.width, row.size.width, 1e-6);
    EXPECT_NEAR(plan.size.height, row.size.height, 1e-6);
    EXPECT_EQ(plan.paper, row.paper);
    EXPECT_EQ(plan.columns, row.columns);
    EXPECT_EQ(plan.rows, row.rows);
    const std::vector<Page> pages = PosterPages(row.options, {&wide, 1});
    ASSERT_EQ(pages.size(), static_cast<size_t>(row.columns * row.rows) + 1);
    for (int32_t index = 0; index < row.columns * row.rows; ++index) {
      const auto& item = std::get<PictureItem>(pages[static_cast<size_t>(index)].items[0]);
      const Box seen = BoundsOf(item.clip),
                part = plan.Part(index % row.columns, index / row.columns);
      // what is seen at the margin is that part of the poster
      EXPECT_NEAR(seen.x - item.corner.x, part.x, kClose);
      EXPECT_NEAR(seen.y - item.corner.y, part.y, kClose);
      EXPECT_NEAR(item.across.x, plan.size.width, kClose);
      EXPECT_TRUE(part.width > 0 && part.width <= plan.room.width + kClose);
      if (index % row.columns > 0) {
        const Box left = plan.Part(index % row.columns - 1, index / row.columns);
        EXPECT_NEAR(left.Right() - part.x, row.options.overlap, 1e-6);
      }
      if (index == row.columns * row.rows - 1) {
        EXPECT_NEAR(part.Right(), plan.size.width, 1e-6);
        EXPECT_NEAR(part.Bottom(), plan.size.height, 1e-6);
      }
    }
  }
  // a poster of 20000 sheets is left out, not cut
  const PagePicture pictures[] = {{.id = 0, .name = "n", .width = 2, .height = 20000}, wide};
  EXPECT_EQ(PosterPages({.turnPaper = false}, pictures).size(), 3u);
}

}  // namespace
}  // namespace fotomill::test
