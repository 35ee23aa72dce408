// Edges of the weld graph: addressing, walking, geometry and the crossing
// onto the other curve at an intersection.
//
// An edge is addressed by its segment and the list position of the record at
// its end (the list size for the last edge). Walking along a curve follows
// the segments' next and prev links, which wrap in a closed subpath; walking
// in storage order follows the segment indices. Walks that skip edges of
// zero length stop when they come back to where they began, so that a loop
// of nothing but zero-length edges cannot hold them.
//
// The pseudo-angle: for a direction (x, y), 1 - x / (|x| + |y|) is 0 along
// +x, 1 along +-y and 2 along -x and grows monotonically with the angle on
// each half plane; giving it the sign of y and adding 4 modulo 4 makes it
// grow over the whole turn. Comparing pseudo-angles orders directions as
// their polar angles do, without trigonometry.
#include <cmath>

#include "ostracrv/intersect/segments.h"
#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_length.h"
#include "ostracrv/math/bezier_split.h"
#include "ostracrv/weld/weldstate.h"
#include "weld_internal.h"

namespace OstraCrv {

using MavikMath::D;
using MavikMath::Side;
using MavikMath::V;

double PseudoAngle(D const& d) noexcept {
  const double s = std::fabs(d.x) + std::fabs(d.y);
  if (s == 0.0) return 0.0;
  double r = 1.0 - d.x / s;
  if (d.y < 0.0) r = -r;
  r += 4.0;
  if (r >= 4.0) r -= 4.0;
  return r;
}

namespace weld_detail {

int IndexOfRecord(SegmentIntersections const& s, Intersection const* record) noexcept {
  // The list is sorted by t: search the run of records with the same t
  // first, then fall back to a plain scan (a record whose t is NaN).
  auto const& list = s.intersections;
  size_t lo = 0, hi = list.size();
  const double t = record->t;
  while (lo < hi) {
    const size_t mid = (lo + hi) / 2;
    if (list[mid]->t < t)
      lo = mid + 1;
    else
      hi = mid;
  }
  for (size_t i = lo; i < list.size() && list[i]->t == t; ++i)
    if (list[i] == record) return int(i);
  return s.GetIndex(record);
}

SegmentView ViewOf(WeldSegments const& segments, SegmentIntersections const& s) noexcept {
  SegmentView v;
  if (s.curve < 0 || size_t(s.curve) >= segments.curves.size()) return v;
  const WeldCurve& c = segments.curves[size_t(s.curve)];
  if (!c.points) return v;
  v.bezier = s.type == SegmentIntersections::Bezier;
  v.points = c.points + s.firstNode;
  v.nodes = c.nodes + s.firstNode;
  v.last = v.bezier ? 3 : 1;
  return v;
}

V PointOn(SegmentView const& v, double t) noexcept {
  if (!v.points) return V{};
  if (v.bezier) return MavikMath::CubicBezier::Evaluate(v.points, t);
  return MavikMath::Lerp(v.points[0], v.points[1], t);
}

MavikMath::D TangentOn(SegmentView const& v, double t) noexcept {
  if (!v.points) return MavikMath::D{1.0, 0.0};
  if (!v.bezier) return v.points[1] - v.points[0];
  const auto pb = MavikMath::CubicBezier::GetPowerBasis(v.points);
  const MavikMath::D d = MavikMath::CubicBezier::Derivative(pb.a, pb.b, pb.c, t);
  if (Dot(d, d) > MavikMath::kEpsilon) return d;
  return v.points[3] - v.points[0];
}

}  // namespace weld_detail

using namespace weld_detail;

Edge Edge::At(WeldSegments* segments, SegmentIntersections* segment, int index) noexcept {
  Edge e;
  if (!segments || !segment) return e;
  const int n = int(segment->intersections.size());
  if (index < 0 || index > n) return e;
  e.segments = segments;
  e.segment = segment;
  e.index = index;
  e.start = index > 0 ? segment->intersections[size_t(index - 1)] : nullptr;
  e.end = index < n ? segment->intersections[size_t(index)] : nullptr;
  return e;
}

Edge Edge::First(WeldSegments* segments, int s) noexcept {
  if (!segments || s < 0 || size_t(s) >= segments->segments.size()) return Edge{};
  return At(segments, &segments->segments[size_t(s)], 0);
}

bool Edge::isZeroLength() const noexcept {
  if (!valid() || segment->degenerate) return true;
  return !(endT() > startT());
}

bool Edge::enabled() const noexcept {
  if (!valid()) return false;
  return end ? end->enabled : segment->enabled;
}
void Edge::setEnabled(bool on) const noexcept {
  if (!valid()) return;
  (end ? end->enabled : segment->enabled) = on;
}
int Edge::sides() const noexcept {
  if (!valid()) return 0;
  return start ? start->sides : segment->sides;
}
void Edge::setSides(int s) const noexcept {
  if (!valid()) return;
  (start ? start->sides : segment->sides) = s;
}
uint32_t Edge::leftColor() const noexcept {
  if (!valid()) return 0;
  return end ? end->leftColor : segment->leftColor;
}
uint32_t Edge::rightColor() const noexcept {
  if (!valid()) return 0;
  return end ? end->rightColor : segment->rightColor;
}
void Edge::setLeftColor(uint32_t c) const noexcept {
  if (!valid()) return;
  (end ? end->leftColor : segment->leftColor) = c;
}
void Edge::setRightColor(uint32_t c) const noexcept {
  if (!valid()) return;
  (end ? end->rightColor : segment->rightColor) = c;
}

Edge Edge::nextEdge() const noexcept {
  if (!valid()) return Edge{};
  if (index < int(segment->intersections.size())) return At(segments, segment, index + 1);
  return First(segments, segment->next);
}

Edge Edge::prevEdge() const noexcept {
  if (!valid()) return Edge{};
  if (index > 0) return At(segments, segment, index - 1);
  const int p = segment->prev;
  if (p < 0 || size_t(p) >= segments->segments.size()) return Edge{};
  SegmentIntersections* s = &segments->segments[size_t(p)];
  return At(segments, s, int(s->intersections.size()));
}

Edge Edge::prevEdgeNonZero() const noexcept {
  Edge e = prevEdge();
  while (e.valid() && e.isZeroLength()) {
    if (e == *this) return Edge{};
    e = e.prevEdge();
  }
  return e;
}

Edge Edge::nextEdgeNonZero() const noexcept {
  Edge e = nextEdge();
  while (e.valid() && e.isZeroLength()) {
    if (e == *this) return Edge{};
    e = e.nextEdge();
  }
  return e;
}

Edge Edge::nextEdgeAbsolute() const noexcept {
  if (!valid()) return Edge{};
  if (index < int(segment->intersections.size())) return At(segments, segment, index + 1);
  return First(segments, segment->index + 1);
}

V Edge::pointAt(double t) const noexcept {
  if (!valid()) return V{};
  return PointOn(ViewOf(*segments, *segment), t);
}

double Edge::length() const noexcept {
  if (!valid() || isZeroLength()) return 0.0;
  const SegmentView v = ViewOf(*segments, *segment);
  if (!v.points) return 0.0;
  const double t0 = startT(), t1 = endT();
  if (!v.bezier) return MavikMath::Distance(PointOn(v, t0), PointOn(v, t1));
  V piece[4];
  MavikMath::CubicBezier::Subsection(t0, t1, v.points, piece);
  return MavikMath::CubicBezier::Length(piece, MavikMath::kLengthPrecise);
}

Edge Edge::nextEdgeFollowingIntersection(int endSel, int dir, Side side, int& newDir, Side& newSide) const noexcept {
  if (!valid()) return Edge{};
  Intersection* record = endSel > 0 ? start : end;
  if (!record || !record->other) return Edge{};
  if (side != MavikMath::SideLeft && side != MavikMath::SideRight) return Edge{};
  Intersection* o = record->other;
  if (o->segment < 0 || size_t(o->segment) >= segments->segments.size()) return Edge{};
  SegmentIntersections* os = &segments->segments[size_t(o->segment)];
  const int oi = IndexOfRecord(*os, o);
  if (oi < 0) return Edge{};

  // c >= 0: the other curve's forward direction lies to the walker's left.
  const double c = Cross(record->tangent, o->tangent) * double(dir);
  const bool left = c >= 0.0;
  const int s = left ? 1 : -1;
  const Side ns = (endSel == dir) ? (left ? MavikMath::SideRight : MavikMath::SideLeft)
                                  : (left ? MavikMath::SideLeft : MavikMath::SideRight);
  const bool turning = dir > 0 ? side == MavikMath::SideLeft : side == MavikMath::SideRight;
  const Edge startsAtOther = At(segments, os, oi + 1);
  const Edge endsAtOther = At(segments, os, oi);
  Edge r;
  int nd;
  if (turning) {
    r = left ? startsAtOther : endsAtOther;
    nd = s;
  } else {
    r = left ? endsAtOther : startsAtOther;
    nd = -s;
  }
  newDir = nd;
  newSide = ns;
  return r;
}

double Edge::pseudoAngleToNext(int dir) const noexcept {
  if (!valid()) return 2.0;
  // Inside a segment the curve goes straight on: half a turn.
  if (dir >= 1 && end && end->t != 1.0) return 2.0;
  if (dir < 0 && start && start->t != 0.0) return 2.0;
  const bool forward = dir >= 1;
  const SegmentView v = ViewOf(*segments, *segment);
  if (!v.points) return 2.0;
  const D back = forward ? D(v.points[v.last - 1] - v.points[v.last]) : D(v.points[1] - v.points[0]);
  const Edge next = forward ? nextEdgeNonZero() : prevEdgeNonZero();
  if (!next.valid()) return 2.0;
  const SegmentView w = ViewOf(*segments, *next.segment);
  if (!w.points) return 2.0;
  const D on = forward ? D(w.points[1] - w.points[0]) : D(w.points[w.last - 1] - w.points[w.last]);
  const double r = PseudoAngle(back) - PseudoAngle(on);
  double reduced = r - 4.0 * std::floor(r / 4.0);
  if (reduced >= 4.0) reduced = 0.0;
  return reduced;
}

}  // namespace OstraCrv
