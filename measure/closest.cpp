// Closest points; see closest.h.
//
// The single nearest point. One pass over the segments. A line projects the
// target on its direction (t = d.(target - p0) / d.d); if the foot falls on
// the segment it is the line's nearest point, otherwise the nearer end is.
// A Bezier asks CubicBezier::FindClosestPointOnBezier (which only answers a
// point strictly nearer than the best so far), then tries its two ends. Every
// comparison is strict, so the first of equally near candidates stands.
//
// All local minima. Per subpath, every segment gives its interior feet (the
// perpendicular feet strictly inside a Bezier, the projection inside a line);
// every node between two segments is tested as a corner; and an open
// subpath's two ends are tested as ends. With d1 the arriving and d2 the
// leaving tangent at a node and w = target - node, the node is a minimum
// exactly when the target lies in the outer wedge, where no segment has a
// foot: d1.w > 0 (the distance falls while arriving) and d2.w < 0 (it grows
// while leaving). For a real turn this is the usual sign test of three cross
// products mirrored by the turn direction; written with the two dot products
// it also covers a node where the path turns straight back (d2 = -d1), whose
// tip is a minimum for every target beyond it, and it can never hold where
// the path runs straight on. A closed subpath tests its closing node with the
// leaving tangent of its first segment and has no ends. An end of an open
// subpath is a minimum when the target lies behind the start (d.w < 0 with
// the start tangent) or beyond the end (d.w > 0 with the end tangent).
//
// A foot exactly at a segment's end (the target on the normal there, or on
// the node itself) is a record of that segment with t = 0 or 1, for lines and
// Beziers alike; the wedge test is strict and leaves those to the segments.
//
// The interior flag is set only for points strictly inside a segment
// (0 < t < 1): a foot that lands exactly on an end is that end.
#include "ostracrv/measure/closest.h"

#include <algorithm>
#include <limits>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_closest.h"
#include "ostracrv/math/bezier_derivatives.h"
#include "ostracrv/measure/tangents.h"

namespace OstraCrv {

namespace {

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;
namespace CB = MavikMath::CubicBezier;

template <class T>
inline double SqDist(T const& a, V const& q) noexcept {
  return MavikMath::SquaredDistance(MavikMath::ToV(a), q);
}

inline bool Inside(double t) noexcept { return t > 0.0 && t < 1.0; }

template <class T>
D BezierTangent(T const* p, double t) noexcept {
  const auto pb = CB::GetPowerBasis(p);
  return CB::SafeBezierTangent(t, pb.a, pb.b, pb.c, pb.d);
}

template <class T>
ClosestPoint<T, CurvePosition> Record(double t, int segment, int startNode, int endNode, T const& point,
                                      double distance, bool interior) {
  ClosestPoint<T, CurvePosition> r;
  r.position.t = t;
  r.position.segment = segment;
  r.position.startNode = startNode;
  r.position.endNode = endNode;
  r.point = point;
  r.distanceSquared = distance;
  r.interior = interior;
  return r;
}

}  // namespace

template <class T>
bool FindClosestPoint(T const* points, NODETYPE const* nodes, int n, T const& target,
                      ClosestPoint<T, CurvePosition>& out) {
  if (!points || !nodes || n < 2) return false;
  const V q = MavikMath::ToV(target);
  if (!q.IsFinite()) return false;

  ClosestPoint<T, CurvePosition> best;
  bool found = false;
  int segment = 0;
  auto take = [&](double t, T const& point, double distance, bool interior, int s, int e) {
    best = Record(t, segment, s, e, point, distance, interior);
    found = true;
  };

  for (int i = 0; i + 1 < n; ++i) {
    const NODETYPE next = nodes[i + 1];
    if (IsArc(next)) {
      if (IsArc(nodes[i])) continue;  // the second control point
      if (i + 3 >= n) break;          // an unfinished Bezier ends the path
      T const* p = points + i;
      double t = 0.0, d = best.distanceSquared;
      T point{};
      if (CB::FindClosestPointOnBezier(p, target, t, point, d) && d < best.distanceSquared)
        take(t, point, d, Inside(t), i, i + 3);
      const double d0 = SqDist(p[0], q);
      if (d0 < best.distanceSquared) take(0.0, p[0], d0, false, i, i + 3);
      const double d3 = SqDist(p[3], q);
      if (d3 < best.distanceSquared) take(1.0, p[3], d3, false, i, i + 3);
      ++segment;
    } else if (IsLine(next)) {
      const V p0 = MavikMath::ToV(points[i]), p1 = MavikMath::ToV(points[i + 1]);
      const D d = p1 - p0;
      const double dd = d.SquaredLength();
      bool onSegment = false;
      if (dd > MavikMath::kEpsilon) {
        const double t = MavikMath::Dot(d, q - p0) / dd;
        if (t >= 0.0 && t <= 1.0) {
          onSegment = true;
          const V foot = p0 + d * t;
          const double df = MavikMath::SquaredDistance(foot, q);
          if (df < best.distanceSquared) take(t, MavikMath::FromV<T>(foot), df, Inside(t), i, i + 1);
        }
      }
      if (!onSegment) {
        const double d0 = SqDist(points[i], q);
        if (d0 < best.distanceSquared) take(0.0, points[i], d0, false, i, i + 1);
        const double d1 = SqDist(points[i + 1], q);
        if (d1 < best.distanceSquared) take(1.0, points[i + 1], d1, false, i, i + 1);
      }
      ++segment;
    }
  }
  if (!found) return false;
  out = best;
  return true;
}

template <class T>
void FindClosestPointsOnSubpathT(int& segment, T const* p, NODETYPE const* nd, int n, T const& target,
                                 unsigned long first, std::vector<ClosestPoint<T, CurvePosition>>& out) {
  if (!p || !nd || n < 1) return;
  const V q = MavikMath::ToV(target);
  if (!q.IsFinite()) return;
  const bool closed = IsClosedNode(nd[0]);
  const int base = int(first);
  const int entry = segment;
  int firstEnd = -1, lastStart = -1, lastEnd = -1;  // local indices
  std::vector<double> ts, ds;
  std::vector<T> pts;

  // The corner at the segment end i: a minimum if the target lies in its
  // outer wedge.
  auto corner = [&](int i) {
    if (i == n - 1 && !closed) return;
    // A zero-length arriving segment leaves the corner to the node before
    // it; a zero-length leaving one is looked through.
    const D d1 = IsLine(nd[i]) ? D(MavikMath::ToV(p[i]) - MavikMath::ToV(p[i - 1])) : BezierTangent(p + i - 3, 1.0);
    if (!d1.IsNonZero()) return;
    const D d2 = GetForwardTangentAt(p, nd, n, i);
    // Past the arriving segment and before the leaving one.
    const D w = q - MavikMath::ToV(p[i]);
    if (MavikMath::Dot(d1, w) > 0.0 && MavikMath::Dot(d2, w) < 0.0) {
      const int start = IsLine(nd[i]) ? i - 1 : i - 3;
      out.push_back(Record(1.0, segment - 1, base + start, base + i, p[i], SqDist(p[i], q), false));
    }
  };

  int i = 1;
  while (i < n) {
    const NODETYPE node = nd[i];
    if (IsArc(node)) {
      if (i + 2 >= n || !IsArc(nd[i + 1]) || !IsCurve(nd[i + 2])) break;  // malformed: stop here
      ts.clear();
      pts.clear();
      ds.clear();
      CB::FindClosestPointsOnBezier(p + i - 1, target, ts, pts, ds);
      for (size_t k = 0; k < ts.size(); ++k) {
        if (!Inside(ts[k])) {
          // A minimum at an end is the corner's or the subpath end's
          // business, unless the target lies exactly on that end's normal
          // (a foot at t = 0 or 1, as a line's projection may give).
          const bool atStart = ts[k] <= 0.0;
          const V e = MavikMath::ToV(p[atStart ? i - 1 : i + 2]);
          if (MavikMath::Dot(BezierTangent(p + i - 1, atStart ? 0.0 : 1.0), q - e) != 0.0) continue;
        }
        out.push_back(Record(ts[k], segment, base + i - 1, base + i + 2, pts[k], ds[k], Inside(ts[k])));
      }
      lastStart = i - 1;
      lastEnd = i + 2;
    } else if (IsLine(node)) {
      const V p0 = MavikMath::ToV(p[i - 1]), p1 = MavikMath::ToV(p[i]);
      const D d = p1 - p0;
      const double dd = d.SquaredLength();
      if (dd > MavikMath::kEpsilon) {
        const double t = MavikMath::Dot(d, q - p0) / dd;
        if (t >= 0.0 && t <= 1.0) {
          const V foot = p0 + d * t;
          out.push_back(Record(t, segment, base + i - 1, base + i, MavikMath::FromV<T>(foot),
                               MavikMath::SquaredDistance(foot, q), Inside(t)));
        }
      }
      lastStart = i - 1;
      lastEnd = i;
    } else {
      break;  // a move or a lone curve node inside a subpath: malformed
    }
    if (firstEnd < 0) firstEnd = lastEnd;
    ++segment;
    corner(lastEnd);
    i = lastEnd + 1;
  }

  if (firstEnd < 0) return;
  // A subpath whose segments all have no length is a single place: with no
  // direction anywhere, the tests above find nothing, yet it is a minimum.
  bool point = true;
  for (int k = 1; k <= lastEnd && point; ++k) point = p[k] == p[0];
  if (point) {
    out.push_back(Record(0.0, entry, base, base + firstEnd, p[0], SqDist(p[0], q), false));
    return;
  }
  if (closed) return;
  // Behind the start of an open subpath, or beyond its end (directions
  // looked through zero-length segments).
  const D start = GetForwardTangentAt(p, nd, n, 0);
  if (MavikMath::Dot(start, q - MavikMath::ToV(p[0])) < 0.0)
    out.push_back(Record(0.0, entry, base, base + firstEnd, p[0], SqDist(p[0], q), false));
  const D end = -GetReverseTangentAt(p, nd, n, lastEnd);
  if (MavikMath::Dot(end, q - MavikMath::ToV(p[lastEnd])) > 0.0)
    out.push_back(Record(1.0, segment - 1, base + lastStart, base + lastEnd, p[lastEnd], SqDist(p[lastEnd], q), false));
}

template <class T>
bool FindClosestPoints(T const* points, NODETYPE const* nodes, int n, T const& target,
                       std::vector<ClosestPoint<T, CurvePosition>>& out) {
  if (!points || !nodes || n < 1 || !MavikMath::ToV(target).IsFinite()) return false;
  int segment = 0;
  for (int first = 0; first < n;) {
    int last = first;
    while (last + 1 < n && !IsMove(nodes[last + 1])) ++last;
    FindClosestPointsOnSubpathT(segment, points + first, nodes + first, last - first + 1, target, (unsigned long)first,
                                out);
    first = last + 1;
  }
  std::sort(out.begin(), out.end());
  return !out.empty();
}

template <class T>
double FindClosestOpenPointOnCurve(PolycurveT<T> const& curve, T p, unsigned long& node, int exclude) {
  node = 0;
  double best = std::numeric_limits<double>::max();
  T const* points = curve.GetPoints();
  NODETYPE const* nodes = curve.GetNodeTypes();
  const long n = long(curve.GetPointCount());
  if (!points || !nodes) return best;
  const V q = MavikMath::ToV(p);
  for (long first = 0; first < n;) {
    long last = first;
    while (last + 1 < n && !IsMove(nodes[last + 1])) ++last;
    if (last > first && !IsClosedNode(nodes[first])) {
      for (long end : {first, last}) {
        if (end == exclude) continue;
        const double d = SqDist(points[end], q);
        if (d < best) {
          best = d;
          node = (unsigned long)end;
        }
      }
    }
    first = last + 1;
  }
  return best;
}

#define OSTRACRV_INSTANTIATE_CLOSEST(T)                                                                         \
  template bool FindClosestPoint<T>(T const*, NODETYPE const*, int, T const&, ClosestPoint<T, CurvePosition>&); \
  template bool FindClosestPoints<T>(T const*, NODETYPE const*, int, T const&,                                  \
                                     std::vector<ClosestPoint<T, CurvePosition>>&);                             \
  template void FindClosestPointsOnSubpathT<T>(int&, T const*, NODETYPE const*, int, T const&, unsigned long,   \
                                               std::vector<ClosestPoint<T, CurvePosition>>&);                   \
  template double FindClosestOpenPointOnCurve<T>(PolycurveT<T> const&, T, unsigned long&, int);

OSTRACRV_INSTANTIATE_CLOSEST(POINT)
OSTRACRV_INSTANTIATE_CLOSEST(V)

#undef OSTRACRV_INSTANTIATE_CLOSEST

}  // namespace OstraCrv
