#pragma once

#include <vector>

#include "pages/model/page.h"

namespace fotomill {

// A flat net of a solid, with edges of length 1, y downward.
struct CutoutNet {
  struct Face {
    std::vector<Point> corners;  // the edge i is from corner i to the next
    Point up;                    // direction of the top of its picture, of length 1
  };
  struct Flap {
    size_t face, edge;
  };
  std::vector<Face> faces;
  std::vector<Flap> flaps;  // edges to glue to others, one of each pair

  // Whether another face of the net has this edge, so that it is folded.
  bool IsFold(size_t face, size_t edge) const;
};

// A cross of six squares: top, front, bottom, back, left, right. Standing on its bottom, all of the
// pictures around it are upright.
CutoutNet CubeNet();
// Half of a dodecahedron: a pentagon with five others around it. The two halves interlock; each has
// the flaps that the other lacks. The first half is the upper one, whose pictures are upright.
CutoutNet DodecahedronNet(bool lower);

}  // namespace fotomill
