// Building the weld graph and counting which sides of each edge its own
// operand fills.
//
// Constants:
//   weld tolerance 1.4142135624 (the square root of 2, so that its square is
//     2: end points that round to neighbouring integer points in both
//     coordinates still meet), or 1e-8 with WeldFlags::Precise.
//   angle tolerance 0.001 in pseudo-angle units (about 0.09 degrees), or 1e-8
//     with WeldFlags::Precise: tangents closer than this count as equal and
//     are told apart by curvature.
//   bounds margin 1000: probes start and end this far outside an operand's
//     box, well clear of anything the tolerances could snap to.
//
// Filled sides. For each subpath, the winding numbers of its own operand on
// the left and the right of one of its edges are found at a place where no
// other curve of the operand comes within the tolerance: exactly, by a ray
// over the operand's segments (the place's own edge, crossing the ray's
// line there, separates the two sides). Where no such place is found, a
// probe is run through the engine instead: a straight line along the normal
// at the place, clipped to the operand's box and split there, against every
// curve of the operand whose box it meets; the records on the half towards
// the left give the left winding, on the other half the right winding, each
// up to a sign that CountIntersection keeps consistent (touches preferred
// to crossings, so that a probe through a node counts the node once). From
// there the two counts are carried round the subpath: at a crossing with
// the own operand (another subpath or the subpath itself) both sides change
// together; where another curve of the operand joins or leaves along a
// shared stretch, only the side it lies on. A count is "filled" when it is
// non-zero under the non-zero rule or odd under even-odd.
#include <algorithm>
#include <cmath>
#include <limits>

#include "ostracrv/core/subpath_list.h"
#include "ostracrv/intersect/intersection_settings.h"
#include "ostracrv/math/line_rect.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/measure/tangents.h"
#include "ostracrv/weld/weldstate.h"
#include "weld_internal.h"

namespace OstraCrv {

using MavikMath::D;
using MavikMath::V;
using namespace weld_detail;

namespace {

constexpr double kWeldAngleTolerance = 0.001;
constexpr double kPreciseAngleTolerance = 1e-8;
constexpr double kBoundsMargin = 1000.0;

bool Finite(V const& p) { return std::isfinite(p.x) && std::isfinite(p.y); }

// Loose box of the finite points of an operand.
MavikMath::BoundsT<double> LooseBounds(PolycurveT<V> const& c) {
  MavikMath::BoundsT<double> b;
  V const* p = c.GetPoints();
  for (unsigned long i = 0; i < c.GetPointCount(); ++i)
    if (Finite(p[i])) b.Add(p[i]);
  return b;
}

bool Filled(int count, bool nonZero) { return nonZero ? count != 0 : (count & 1) != 0; }

}  // namespace

WeldStateData::WeldStateData(PolycurveT<V> const& firstIn, bool firstNonZeroIn, PolycurveT<V> const& secondIn,
                             bool secondNonZeroIn, bool includeOpen, bool alwaysFillSides, WeldFlags flagsIn)
    : first(CleanWeldOperand(firstIn)),
      second(CleanWeldOperand(secondIn)),
      firstNonZero(firstNonZeroIn),
      secondNonZero(secondNonZeroIn),
      flags(flagsIn) {
  const bool precise = HasWeldFlag(flags, WeldFlags::Precise);
  tolerance = precise ? kPreciseWeldTolerance : kWeldTolerance;
  angleTolerance = precise ? kPreciseAngleTolerance : kWeldAngleTolerance;

  auto addOperand = [&](PolycurveT<V> const& op) {
    V const* pts = op.GetPoints();
    NODETYPE const* nodes = op.GetNodeTypes();
    const int n = int(op.GetPointCount());
    if (!pts || !nodes || n < 1) return;
    for (SubcurveRange const& r : GetSubpathRanges(nodes, n)) {
      const bool open = !IsClosedNode(nodes[r.first]);
      openSubpaths.push_back(open);
      if (r.count < 2 || (!includeOpen && open)) continue;
      bool finite = true;
      for (unsigned long i = r.first; i < r.first + r.count && finite; ++i) finite = Finite(pts[i]);
      if (!finite) continue;
      curves.emplace_back(pts + r.first, nodes + r.first, int(r.count), true, true);
    }
  };
  addOperand(first);
  firstCurveCount = int(curves.size());
  addOperand(second);

  firstBounds = LooseBounds(first);
  if (second.IsEmpty())
    secondBounds = MavikMath::BoundsT<double>{0.0, 0.0, 0.0, 0.0};
  else
    secondBounds = LooseBounds(second);
  MavikMath::InflateRect(firstBounds, kBoundsMargin, kBoundsMargin);
  MavikMath::InflateRect(secondBounds, kBoundsMargin, kBoundsMargin);

  curveBoxes_.reserve(curves.size());
  for (WeldCurve const& c : curves) curveBoxes_.push_back(MavikMath::GetPointsBBox(c.points, c.count));
  segments = std::make_unique<WeldSegments>(curves, WeldGraphIntersectionSettings(tolerance));
  for (SegmentIntersections const& s : segments->segments) {
    edgeTotal += int(s.intersections.size()) + 1;
    if (IsFirstCurve(s.curve)) ++firstSegmentCount_;
  }

  if (alwaysFillSides || firstNonZero || secondNonZero || segments->overlapCount > 0) PopulateFilledSides();
}

WeldStateData::~WeldStateData() = default;

RayWinding const& WeldStateData::Rays(bool firstOperand) const {
  std::unique_ptr<RayWinding>& r = rays_[firstOperand ? 0 : 1];
  if (!r)
    r = std::make_unique<RayWinding>(curves, firstOperand ? 0 : size_t(firstCurveCount),
                                     firstOperand ? size_t(firstCurveCount) : curves.size());
  return *r;
}

Edge WeldStateData::FirstEdge() const noexcept { return Edge::First(segments.get(), 0); }

bool WeldStateData::IsOpenCurve(int c) const noexcept {
  return c >= 0 && size_t(c) < openSubpaths.size() && openSubpaths[size_t(c)];
}

std::vector<WeldCurve> WeldStateData::ProbeCurves(V const* points, NODETYPE const* nodes, int count,
                                                  bool ownFirst) const {
  // Only curves whose box meets the probe's can meet it: the engine tests
  // every pair of segments by their boxes first, inflated by the tolerance,
  // so leaving the others out changes no record and saves a pass over all
  // their segments per probe.
  MavikMath::BoundsT<double> box;
  for (int i = 0; i < count; ++i) box.Add(points[i]);
  MavikMath::InflateRect(box, 4.0 * tolerance, 4.0 * tolerance);
  std::vector<WeldCurve> list;
  const size_t from = ownFirst ? 0 : size_t(firstCurveCount);
  const size_t to = ownFirst ? size_t(firstCurveCount) : curves.size();
  list.emplace_back(points, nodes, count, true, true);
  for (size_t i = from; i < to; ++i)
    if (MavikMath::DoRectsOverlap(curveBoxes_[i], box))
      list.emplace_back(curves[i].points, curves[i].nodes, curves[i].count, false, true);
  return list;
}

FillStateData WeldStateData::CountProbe(SegmentIntersections const& s, double angleTolerance, double skipT) {
  FillStateData state;
  for (Intersection const* r : s.intersections)
    if (!(r->t == skipT)) state.CountIntersection(r, angleTolerance, nullptr, false, false);
  return state;
}

void WeldStateData::PopulateFilledSides() {
  sidesFilled_ = true;
  // A crossing with the own operand changes both sides together; where
  // another curve of the operand joins or leaves this one along a shared
  // stretch, only the side it lies on changes.
  auto pass = [&](Intersection const* r, bool ownFirst, int& left, int& right) {
    Intersection const* o = r ? r->other : nullptr;
    if (!o || IsFirstCurve(segments->segments[size_t(o->segment)].curve) != ownFirst) return;
    FillStateData l, rt;
    CountPassage(l, r, angleTolerance, nullptr, false, false, SidedCount::CoincidentRight);
    CountPassage(rt, r, angleTolerance, nullptr, false, false, SidedCount::CoincidentLeft);
    left -= l.winding;
    right += rt.winding;
  };
  auto store = [&](Edge const& e, int left, int right, bool rule) {
    e.setSides(e.isZeroLength() ? 0 : (Filled(left, rule) ? 1 : 0) | (Filled(right, rule) ? 2 : 0));
  };
  int guard = 2 * edgeTotal + 2;
  for (size_t s = 0; s < segments->segments.size() && guard > 0;) {
    // One subpath: its segments are consecutive in storage.
    size_t after = s + 1;
    while (after < segments->segments.size() && !IsSubpathStart(segments->segments[after])) ++after;
    const Edge first = Edge::First(segments.get(), int(s));
    s = after;
    const bool ownFirst = IsOnFirst(first);
    const bool rule = ownFirst ? firstNonZero : secondNonZero;
    int left = 0, right = 0;
    if (first.segment->prev >= 0) {
      // A closed loop: seed on one of its longest edges off every shared
      // stretch, preferring a probe that meets nothing but plain crossings,
      // then carry the counts once round the loop.
      // Only the operand's own curves take part in the probe; if every edge
      // lies on a stretch shared with another of them (a loop drawn twice),
      // any edge will do.
      SafeEdgeList candidates = SafeEdges(first, SharedWith::OwnOperand, kSeedCandidates);
      if (candidates.empty()) candidates = SafeEdges(first, SharedWith::Nothing, kSeedCandidates);
      Edge seed;
      for (ProbePlace const& place : kProbePlan) {
        if (place.candidate >= candidates.size) continue;
        Edge const& c = candidates.edges[place.candidate];
        int l = 0, r = 0;
        const bool clean = SeedSides(c, place.fraction, ownFirst, l, r);
        if (!seed.valid() || clean) {
          seed = c;
          left = l;
          right = r;
        }
        if (clean) break;
      }
      if (!seed.valid()) continue;  // nothing of it has length off a shared stretch: sides stay 0
      const int seedLeft = left, seedRight = right;
      store(seed, left, right, rule);
      Edge e = seed.nextEdge();
      for (; e.valid() && !(e == seed) && guard-- > 0; e = e.nextEdge()) {
        pass(e.start, ownFirst, left, right);
        store(e, left, right, rule);
      }
      // Round the loop both counts come back to the probe's, unless the
      // graph misses a meeting.
      pass(seed.start, ownFirst, left, right);
      if (left != seedLeft || right != seedRight) consistent_ = false;
    } else {
      // An open subpath: seed on its first edge with length, carry the
      // counts to its end; the zero-length edges before keep sides 0.
      Edge e = first;
      while (e.valid() && e.isZeroLength() && guard-- > 0) e = e.nextEdge();
      if (!e.valid()) continue;
      for (ProbePlace const& place : kProbePlan) {
        if (place.candidate != 0) continue;
        int l = 0, r = 0;
        const bool clean = SeedSides(e, place.fraction, ownFirst, l, r);
        if (place.fraction == 0.5 || clean) {
          left = l;
          right = r;
        }
        if (clean) break;
      }
      store(e, left, right, rule);
      for (e = e.nextEdge(); e.valid() && guard-- > 0; e = e.nextEdge()) {
        pass(e.start, ownFirst, left, right);
        store(e, left, right, rule);
      }
    }
  }
}

bool WeldStateData::SeedSides(Edge const& cur, double fraction, bool ownFirst, int& left, int& right) const {
  left = right = 0;
  const SegmentView v = ViewOf(*segments, *cur.segment);
  if (!v.points) return false;
  const WeldCurve& wc = curves[size_t(cur.curve())];
  const double u = cur.startT() + fraction * (cur.endT() - cur.startT());
  const V p = PointOn(v, u);
  const D tangent =
      GetTangentAt(wc.points, wc.nodes, (unsigned long)wc.count, cur.segment->firstNode + v.last, u, false);
  // Where no other curve of the operand comes within the tolerance, the
  // winding numbers beside the edge are exact: a horizontal ray gives the one
  // just left of the place, and the edge itself, crossing the ray's line
  // there, adds its one to the other side. A horizontal edge, which that ray
  // would run along, takes a ray downwards instead: it gives the winding
  // just below, and the edge adds its one above.
  if (tangent.y != 0.0) {
    int w = 0;
    if (Rays(ownFirst).Winding(p, tolerance, v.points, u, w, 0)) {
      const int beyond = w + (tangent.y < 0.0 ? 1 : -1);  // just right of the place
      // Going up, the edge has its left side towards -x.
      const int wLeft = tangent.y > 0.0 ? w : beyond, wRight = tangent.y > 0.0 ? beyond : w;
      left = -wLeft;
      right = wRight;
      return true;
    }
  } else if (tangent.x != 0.0) {
    int w = 0;
    if (Rays(ownFirst).Winding(p, tolerance, v.points, u, w, 1)) {
      const int beyond = w + (tangent.x > 0.0 ? 1 : -1);  // just above the place
      // Going right, the edge has its left side towards +y.
      const int wLeft = tangent.x > 0.0 ? beyond : w, wRight = tangent.x > 0.0 ? w : beyond;
      left = -wLeft;
      right = wRight;
      return true;
    }
  }
  // The normal (-y, x) points to the left of the edge.
  const D n{-tangent.y, tangent.x};
  double enter = 0.0, leave = 0.0;
  if (!Finite(p) ||
      !MavikMath::LineRectIntersection(p, V(p + n), ownFirst ? firstBounds : secondBounds, enter, leave))
    return false;
  const V probe[3] = {p + enter * n, p, p + leave * n};
  const NODETYPE probeNodes[3] = {NodeTypes::Open::move, NodeTypes::Open::line, NodeTypes::Open::line};
  const WeldSegments engine(ProbeCurves(probe, probeNodes, 3, ownFirst), WeldFillProbeIntersectionSettings(tolerance));
  if (engine.segments.size() < 2) return false;
  left = CountProbe(engine.segments[1], angleTolerance, 0.0).winding;
  right = CountProbe(engine.segments[0], angleTolerance, 1.0).winding;
  // Clean: at the edge the probe meets only the edge itself, and elsewhere
  // only plain crossings (a probe that meets another curve within the
  // tolerance of the edge, or a node within the tolerance of the probe, may
  // count a crossing twice).
  auto clean = [&](SegmentIntersections const& s, double at) {
    for (Intersection const* x : s.intersections) {
      if (x->t == at) {
        SegmentIntersections const& seg = engine.segments[size_t(x->other->segment)];
        if (engine.curves[size_t(seg.curve)].points != wc.points || seg.firstNode != cur.segment->firstNode)
          return false;
      } else if (x->touch || x->overlapEnd) {
        return false;
      }
    }
    return true;
  };
  return clean(engine.segments[1], 0.0) && clean(engine.segments[0], 1.0);
}

Edge WeldStateData::FindNonZeroNonOverlappingEdge(Edge edge) const {
  const SafeEdgeList found = SafeEdges(edge, SharedWith::Anything, 0);
  return found.empty() ? Edge{} : found.edges[0];
}

WeldStateData::SafeEdgeList WeldStateData::SafeEdges(Edge edge, SharedWith avoid, size_t count) const {
  static_assert(kSeedCandidates <= kMaxSafeEdges);
  count = std::min(count, kMaxSafeEdges);
  // The shared stretches open at the current place, counted per segment
  // (an overlap opens and closes on the same segment, so a segment starts
  // outside all of them).
  auto counts = [&](Intersection const* r) {
    if (!r || !r->overlapEnd || !r->other || avoid == SharedWith::Nothing) return false;
    if (avoid == SharedWith::Anything) return true;
    const int c = segments->segments[size_t(r->other->segment)].curve;
    const bool sameOperand = IsFirstCurve(c) == IsFirstCurve(segments->segments[size_t(r->segment)].curve);
    return sameOperand == (avoid == SharedWith::OwnOperand);
  };
  SafeEdgeList out;
  std::vector<std::pair<double, Edge>>& found = safeScratch_;
  found.clear();
  // Only the `count` longest chords are kept. The partial sort below (a
  // heap selection in the standard library we build with) takes a later
  // edge only when its chord is strictly longer than the shortest it holds,
  // the count-th longest so far; an edge surely shorter than that (by its
  // squared chord, with a margin for the rounding of the exact length)
  // changes nothing, not even the order among equal chords, so it is
  // neither measured exactly nor listed. The count-th longest is tracked in
  // `longest`, in descending order. O(edges of the subpath).
  double longest[kMaxSafeEdges] = {};
  size_t seen = 0;
  int open = 0;
  Edge e = edge;
  for (int guard = edgeTotal + 1; e.valid() && guard > 0; --guard) {
    if (e.index == 0) open = 0;
    if (counts(e.start)) open += e.start->t < e.start->overlapEnd->t ? 1 : -1;
    if (open < 0) open = 0;
    if (open == 0 && e.endT() - e.startT() > angleTolerance && !e.segment->degenerate) {
      if (count == 0) {
        out.edges[0] = e;
        out.size = 1;
        return out;
      }
      const V a = e.pointAt(e.startT()), b = e.pointAt(e.endT());
      const double limit = seen >= count ? longest[count - 1] : 0.0;
      if (seen < count || !(MavikMath::SquaredDistance(a, b) < limit * limit * (1.0 - 1e-9))) {
        const double d = MavikMath::Distance(a, b);
        found.emplace_back(d, e);
        // Insert d into the descending list of the longest so far.
        size_t k = std::min(seen, count);
        if (k < count || d > longest[count - 1]) {
          if (k == count) --k;  // the shortest of them drops out
          while (k > 0 && longest[k - 1] < d) {
            longest[k] = longest[k - 1];
            --k;
          }
          longest[k] = d;
        }
        ++seen;
      }
    }
    const Edge next = e.nextEdge();
    if (next == edge) break;
    e = next;
  }
  const size_t keep = std::min(count, found.size());
  std::partial_sort(found.begin(), found.begin() + long(keep), found.end(),
                    [](auto const& a, auto const& b) { return a.first > b.first; });
  for (size_t i = 0; i < keep; ++i) out.edges[i] = found[i].second;
  out.size = keep;
  return out;
}

}  // namespace OstraCrv
