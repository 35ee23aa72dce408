// Lines and rectangles.
//
// The plain rectangles are five nodes: a closed move, three lines and the
// closing line back on the first corner. The width-and-height form runs
// counter-clockwise from the origin; the RECT and bounds forms run clockwise
// from the top left corner (y up), and both give the same positive area for
// the same box, so that converting a rectangle between the point kinds never
// flips the sign of its area.
//
// The treated rectangle cuts each corner with a radius: a round corner is a
// Bezier whose handles stop 9/20 of the radius short of the corner point (so
// each handle is 11/20 of the radius long, close to the 0.5523 of a true
// quarter circle, and fixed to integer ratios so that the integer outline is
// reproducible); a scallop is a Bezier that leaves each edge at right angles
// with handles of 11/20 of the radius; anything else is a straight chamfer.
// From the radii on, the outline is integer arithmetic: radii are truncated
// to whole units, products and quotients by 20 truncate towards zero. They are
// computed in 64 bits and saturated to 32 bits, so that huge arguments give a
// clamped shape rather than overflow. A width or height below 1 negates the
// radii on that axis, which mirrors the corners along with the shape.
#include "ostracrv/shapes/rectangle.h"

#include <climits>
#include <cmath>

#include "ostracrv/math/matrix.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::V;

namespace {

constexpr double kEps = MavikMath::kEpsilon;
// Handles of a round corner stop this many twentieths short of the corner.
constexpr int64_t kRoundShort = 9;
// Handles of a scallop are this many twentieths of the radius long.
constexpr int64_t kScallopHandle = 11;
constexpr int64_t kTwentieths = 20;

constexpr NODETYPE kOpenFirst = 0x04;
constexpr NODETYPE kClosedFirst = 0x0C;
constexpr NODETYPE kClosedFirstSmooth = 0x1C;
constexpr NODETYPE kLineEnd = 0x44;
constexpr NODETYPE kLineEndSmooth = 0x54;
constexpr NODETYPE kClosingLine = 0x48;
constexpr NODETYPE kControl = 0xC0;
constexpr NODETYPE kCurveCusp = 0x84;
constexpr NODETYPE kCurveSmooth = 0x94;
constexpr NODETYPE kCurveSmoothPlain = 0x90;

// Conversion towards zero, saturated to int32; NaN gives 0.
int32_t TruncToInt(double x) noexcept {
  if (!(x == x)) return 0;
  if (x >= 2147483647.0) return INT32_MAX;
  if (x <= -2147483648.0) return INT32_MIN;
  return static_cast<int32_t>(x);
}

int32_t Saturate(int64_t v) noexcept {
  if (v > INT32_MAX) return INT32_MAX;
  if (v < INT32_MIN) return INT32_MIN;
  return static_cast<int32_t>(v);
}

POINT P(int64_t x, int64_t y) noexcept { return {Saturate(x), Saturate(y)}; }

// Twentieths of a radius, truncated towards zero as 32-bit division would.
int64_t Twentieths(int64_t k, int64_t r) noexcept { return k * r / kTwentieths; }

void WritePlainNodes(NODETYPE* nodes) noexcept {
  if (!nodes) return;
  nodes[0] = kClosedFirst;
  nodes[1] = nodes[2] = nodes[3] = kLineEnd;
  nodes[4] = kClosingLine;
}

bool IsFinite(const MavikMath::BoundsT<double>& b) noexcept {
  return std::isfinite(b.left) && std::isfinite(b.top) && std::isfinite(b.right) && std::isfinite(b.bottom);
}

// Appends the three points of a treated corner (or the one point of a
// chamfer) to the outline. `edge` is the index of the edge node written just
// before; a round corner makes it smooth, since the curve leaves tangent to
// the edge. `roundEnd` is the byte of a round corner's end node.
struct Outline {
  POINT* points;
  NODETYPE* nodes;
  unsigned long n = 0;

  void Put(POINT p, NODETYPE b) noexcept {
    points[n] = p;
    nodes[n] = b;
    ++n;
  }
  void Corner(RectangleCorner c, POINT roundA, POINT roundB, POINT scallopA, POINT scallopB, POINT end,
              NODETYPE roundEnd) noexcept {
    if (c == RectangleCorner::Round) {
      nodes[n - 1] = kLineEndSmooth;
      Put(roundA, kControl);
      Put(roundB, kControl);
      Put(end, roundEnd);
    } else if (c == RectangleCorner::Scallop) {
      Put(scallopA, kControl);
      Put(scallopB, kControl);
      Put(end, kCurveCusp);
    } else {
      Put(end, kLineEnd);
    }
  }
};

// The corners of a box clockwise (y up) from its top left and back to it:
// the outline of the RECT and bounds forms.
template <class P, class Box>
void WriteBoxCorners(P* points, const Box& r) noexcept {
  points[0] = {r.left, r.top};
  points[1] = {r.right, r.top};
  points[2] = {r.right, r.bottom};
  points[3] = {r.left, r.bottom};
  points[4] = {r.left, r.top};
}

RectangleCorner Normalised(RectangleCorner c) noexcept {
  if (c == RectangleCorner::Round || c == RectangleCorner::Scallop) return c;
  return RectangleCorner::Chamfer;
}

}  // namespace

unsigned long BuildLine(POINT* points, NODETYPE* nodes, const V& a, const V& b) {
  if (!points || !nodes) return 0;
  points[0] = MavikMath::FromV<POINT>(a);
  points[1] = MavikMath::FromV<POINT>(b);
  nodes[0] = kOpenFirst;
  nodes[1] = kLineEnd;
  return 2;
}

unsigned long BuildRectangle(POINT* points, NODETYPE* nodes, double width, double height) {
  if (!points || !nodes) return 0;
  const int32_t w = MavikMath::RoundToInt(width), h = MavikMath::RoundToInt(height);
  points[0] = {0, 0};
  points[1] = {w, 0};
  points[2] = {w, h};
  points[3] = {0, h};
  points[4] = {0, 0};
  WritePlainNodes(nodes);
  return 5;
}

unsigned long BuildRectangle(POINT* points, const RECT& r) {
  if (!points) return 0;
  WriteBoxCorners(points, r);
  return 5;
}

unsigned long BuildRectangle(POINT* points, NODETYPE* nodes, const RECT& rect) {
  const unsigned long n = BuildRectangle(points, rect);
  if (n) WritePlainNodes(nodes);
  return n;
}

unsigned long BuildRectangle(V* points, const MavikMath::BoundsT<double>& b) {
  if (!points || !IsFinite(b)) return 0;
  // The bounds' top is their largest y: the same corners as the RECT form.
  WriteBoxCorners(points, b);
  return 5;
}

unsigned long BuildRectangle(V* points, NODETYPE* nodes, const MavikMath::BoundsT<double>& bounds) {
  const unsigned long n = BuildRectangle(points, bounds);
  if (n) WritePlainNodes(nodes);
  return n;
}

unsigned long BuildRectangle(POINT* points, NODETYPE* nodes, double width, double height, double r1,
                             RectangleCorner c1, double r2, RectangleCorner c2, double r3, RectangleCorner c3,
                             double r4, RectangleCorner c4, double scaleX, double scaleY, bool limitRadii) {
  if (!points || !nodes) return 0;
  if (std::fabs(r1) <= kEps && std::fabs(r2) <= kEps && std::fabs(r3) <= kEps && std::fabs(r4) <= kEps)
    return BuildRectangle(points, nodes, width, height);

  // W is round(width x scaleX): the product is rounded, not the width.
  const int64_t W = MavikMath::RoundToInt(width * scaleX);
  const int64_t H = MavikMath::RoundToInt(height * scaleY);

  if (limitRadii) {
    const double w = std::fabs(width * scaleX), h = std::fabs(height * scaleY);
    // Each step sees the radii the step before left. The far edge has the
    // same length as the origin edge, so r3 + r4 is held against the width.
    auto shrink = [](double& a, double& b, double limit) {
      const double sum = a + b;
      if (sum > limit) {
        const double f = limit / sum;
        a *= f;
        b *= f;
      }
    };
    shrink(r1, r2, w);
    shrink(r3, r4, w);
    shrink(r2, r3, h);
    shrink(r1, r4, h);
  }

  // Integer radii per axis; a width or height below 1 mirrors the corner.
  const double r[4] = {r1, r2, r3, r4};
  int64_t a[4], b[4];
  for (int i = 0; i < 4; ++i) {
    a[i] = TruncToInt(W < 1 ? -r[i] : r[i]);
    b[i] = TruncToInt(H < 1 ? -r[i] : r[i]);
  }
  const RectangleCorner c[4] = {Normalised(c1), Normalised(c2), Normalised(c3), Normalised(c4)};
  auto round = [](int64_t v) { return Twentieths(kRoundShort, v); };
  auto scal = [](int64_t v) { return Twentieths(kScallopHandle, v); };

  Outline o{points, nodes};
  // The seam at the first corner is smooth when that corner is round.
  o.Put(P(a[0], 0), a[0] != 0 && c[0] == RectangleCorner::Round ? kClosedFirstSmooth : kClosedFirst);

  o.Put(P(W - a[1], 0), kLineEnd);
  if (a[1] != 0)
    o.Corner(c[1], P(W - round(a[1]), 0), P(W, round(b[1])), P(W - a[1], scal(b[1])), P(W - scal(a[1]), b[1]),
             P(W, b[1]), kCurveSmooth);

  o.Put(P(W, H - b[2]), kLineEnd);
  if (a[2] != 0)
    o.Corner(c[2], P(W, H - round(b[2])), P(W - round(a[2]), H), P(W - scal(a[2]), H - b[2]),
             P(W - a[2], H - scal(b[2])), P(W - a[2], H), kCurveSmooth);

  o.Put(P(a[3], H), kLineEnd);
  if (a[3] != 0)
    o.Corner(c[3], P(round(a[3]), H), P(0, H - round(b[3])), P(a[3], H - scal(b[3])), P(scal(a[3]), H - b[3]),
             P(0, H - b[3]), kCurveSmooth);

  o.Put(P(0, b[0]), kLineEnd);
  if (a[0] != 0)
    o.Corner(c[0], P(0, round(b[0])), P(round(a[0]), 0), P(scal(a[0]), b[0]), P(a[0], scal(b[0])), P(a[0], 0),
             kCurveSmoothPlain);

  // The last node closes the shape.
  NODETYPE& last = nodes[o.n - 1];
  last = NODETYPE((last & ~0x0C) | 0x08);

  // Back from the scaled layout space.
  const MATRIX m = MavikMath::ConstructMatrix({1.0 / scaleX, 0.0}, {0.0, 1.0 / scaleY}, {0.0, 0.0});
  m.TransformPoints(points, o.n);
  return o.n;
}

unsigned long BuildRectangle(POINT* points, NODETYPE* nodes, double width, double height, double radius,
                             RectangleCorner corner, bool limitRadii) {
  return BuildRectangle(points, nodes, width, height, radius, corner, radius, corner, radius, corner, radius,
                        corner, 1.0, 1.0, limitRadii);
}

}  // namespace OstraCrv
