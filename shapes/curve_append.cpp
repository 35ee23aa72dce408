// Joining appends.
//
// A piece joins the curve when its start lies within the join distance of the
// curve's end. The two points are then averaged, so that neither the old end
// nor the new start wins and the error of each is halved; the handle that
// arrives at the old end moves with it, which keeps that Bezier's end tangent.
// The smooth test uses a fixed squared distance of 4.0 (2 units): a join that
// continues straight is marked smooth, and a straight line continued by a
// straight line is merged into one node so that corner pieces do not grow
// the path.
//
// The integer form reads stored points as doubles, rounds each point it
// stores, and moves a control point by the shift rounded on its own. Each
// append is O(1) amortised.
#include "ostracrv/shapes/curve_append.h"

#include "ostracrv/math/collinear.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;
using MavikMath::CubicBezier::bezier2dT;

namespace {

// Within 2 units of one line: a straight continuation.
constexpr double kStraightSquared = 4.0;

void MakeSmooth(NODETYPE& b) noexcept { b = NODETYPE((b & ~0x20) | 0x10); }

// Whether the piece starting at `start` joins the curve's end.
template <class T>
bool Joins(const std::vector<T>& points, const V& start, double threshold, bool isFirst) noexcept {
  return !isFirst && points.size() >= 2 && MavikMath::SquaredDistance(start, MavikMath::ToV(points.back())) < threshold;
}

// Moves the curve's end to the midpoint of it and start; a curve node's
// incoming handle moves by the same shift. Returns the midpoint.
template <class T>
V MeetHalfway(std::vector<T>& points, std::vector<NODETYPE>& nodes, const V& start) {
  const size_t n = points.size();
  const V last = MavikMath::ToV(points[n - 1]);
  const V m = (start + last) * 0.5;
  if (IsCurve(nodes[n - 1])) {
    const MavikMath::D shift = m - last;
    if constexpr (MavikMath::IsIntegerPoint<T>) {
      // Summed in doubles so that a shift at the edge of the range saturates.
      const V moved{double(points[n - 2].x) + MavikMath::RoundToInt(shift.x),
                    double(points[n - 2].y) + MavikMath::RoundToInt(shift.y)};
      points[n - 2] = MavikMath::FromV<T>(moved);
    } else {
      points[n - 2] += shift;
    }
  }
  points[n - 1] = MavikMath::FromV<T>(m);
  return m;
}

template <class T>
void Push(std::vector<T>& points, std::vector<NODETYPE>& nodes, const V& p, NODETYPE b) {
  points.push_back(MavikMath::FromV<T>(p));
  nodes.push_back(b);
}

}  // namespace

template <class T>
void AddLineT(std::vector<T>& points, std::vector<NODETYPE>& nodes, const V& a, const V& b, double threshold,
              bool isFirst, bool checkCollinear) {
  if (!a.IsFinite() || !b.IsFinite() || points.size() != nodes.size()) return;
  if (Joins(points, a, threshold, isFirst)) {
    const size_t n = points.size();
    const bool straight =
        checkCollinear && MavikMath::AreCollinear(MavikMath::ToV(points[n - 2]), a, b, kStraightSquared);
    if (straight && IsLine(nodes[n - 1])) {
      points[n - 1] = MavikMath::FromV<T>(b);
      return;
    }
    if (straight) MakeSmooth(nodes[n - 1]);
    MeetHalfway(points, nodes, a);
    Push(points, nodes, b, 0x44);
    return;
  }
  Push(points, nodes, a, 0x04);
  Push(points, nodes, b, 0x44);
}

template <class T>
void AddBezierT(std::vector<T>& points, std::vector<NODETYPE>& nodes, const bezier2dT<V>& q, double threshold,
                bool isFirst, bool continuing) {
  if (!q[0].IsFinite() || !q[1].IsFinite() || !q[2].IsFinite() || !q[3].IsFinite()) return;
  if (points.size() != nodes.size()) return;
  if (Joins(points, q[0], threshold, isFirst)) {
    const size_t n = points.size();
    if (MavikMath::AreCollinear(MavikMath::ToV(points[n - 2]), q[0], q[1], kStraightSquared)) MakeSmooth(nodes[n - 1]);
    const V m = MeetHalfway(points, nodes, q[0]);
    Push(points, nodes, q[1] + (m - q[0]), 0xC0);
  } else {
    // A bridging line needs something to start from.
    Push(points, nodes, q[0], continuing && !points.empty() ? 0x44 : 0x04);
    Push(points, nodes, q[1], 0xC0);
  }
  Push(points, nodes, q[2], 0xC0);
  Push(points, nodes, q[3], 0x84);
}

template void AddLineT<V>(std::vector<V>&, std::vector<NODETYPE>&, const V&, const V&, double, bool, bool);
template void AddLineT<POINT>(std::vector<POINT>&, std::vector<NODETYPE>&, const V&, const V&, double, bool, bool);
template void AddBezierT<V>(std::vector<V>&, std::vector<NODETYPE>&, const bezier2dT<V>&, double, bool, bool);
template void AddBezierT<POINT>(std::vector<POINT>&, std::vector<NODETYPE>&, const bezier2dT<V>&, double, bool,
                                bool);

void AddLine(std::vector<V>& points, std::vector<NODETYPE>& nodes, const V& a, const V& b, double threshold,
             bool isFirst, bool checkCollinear) {
  AddLineT(points, nodes, a, b, threshold, isFirst, checkCollinear);
}
void AddLine(std::vector<POINT>& points, std::vector<NODETYPE>& nodes, const V& a, const V& b, double threshold,
             bool isFirst, bool checkCollinear) {
  AddLineT(points, nodes, a, b, threshold, isFirst, checkCollinear);
}
void AddBezier(std::vector<V>& points, std::vector<NODETYPE>& nodes, const bezier2dT<V>& bezier, double threshold,
               bool isFirst, bool continuing) {
  AddBezierT(points, nodes, bezier, threshold, isFirst, continuing);
}
void AddBezier(std::vector<POINT>& points, std::vector<NODETYPE>& nodes, const bezier2dT<V>& bezier,
               double threshold, bool isFirst, bool continuing) {
  AddBezierT(points, nodes, bezier, threshold, isFirst, continuing);
}

}  // namespace OstraCrv
