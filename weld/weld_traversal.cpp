// Moves on the weld graph: the weld pass that carries the other operand's
// winding along every edge and asks the keep rule, the seeding of that
// winding at the start of each subpath, the choice of the next edge of an
// output walk, and the knife's colouring.
//
// Seeding. The winding of the other operand at the start of a subpath is
// found where it is safe to classify: on an edge that is long enough and not
// on a shared stretch. A horizontal ray from outside the other operand's box
// to the middle of that edge, run through the intersection engine against the
// other operand's curves, gives the winding there; walking back to the
// subpath's start undoes the records passed, so that the forward walk of the
// weld pass, which applies them again, arrives at the same count. The ray
// and the forward walk count with the same rule (CountIntersection), so the
// counts agree.
//
// The next edge of an output walk. At the far end of an edge several curves
// may meet, possibly with several records on one spot (a meeting at a node
// is reported once per segment there, joined by zero-length edges). The
// "turn" tries the other curve's branch on the turning side, then on the
// other side, at each record of the spot in turn; "straight" goes on along
// the own curve. Kept edges form loops, and at a simple crossing exactly one
// of the branches is kept, so the order of the tries matters only where
// several kept branches meet at one point.
//
// All walks are bounded by the number of edges of the graph.
#include <algorithm>
#include <cmath>
#include <limits>

#include "ostracrv/intersect/intersection_settings.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/weld/weldstate.h"
#include "weld_internal.h"

namespace OstraCrv {

using MavikMath::Side;
using MavikMath::V;
using namespace weld_detail;

namespace {

bool Inside(int winding, bool nonZero) { return nonZero ? winding != 0 : (winding & 1) != 0; }

// Swaps the left and right bits of a side mask.
int Mirror(int sides) { return ((sides & 1) << 1) | ((sides & 2) >> 1); }

}  // namespace

FillStateData WeldStateData::SeedFillState(Edge edge) {
  openOverlaps.clear();
  FillStateData state;
  // A subpath whose box lies clear of the other operand's box (which has a
  // wide margin already) meets nothing of it and has no place inside that
  // box: whatever place were chosen below, it counts 0 and there is no
  // record to undo. The small margin covers the rounding of a point
  // evaluated on a curve, which lies in its control points' box.
  const int c = edge.curve();
  if (c >= 0 && size_t(c) < curveBoxes_.size()) {
    MavikMath::BoundsT<double> const& box = curveBoxes_[size_t(c)];
    MavikMath::BoundsT<double> const& other = IsOnFirst(edge) ? secondBounds : firstBounds;
    const double mag = std::fmax(std::fmax(std::fabs(box.left), std::fabs(box.right)),
                                 std::fmax(std::fabs(box.bottom), std::fabs(box.top)));
    const double m = 1e-9 * (mag + 1.0);
    if (box.right + m < other.left || other.right + m < box.left || box.top + m < other.bottom ||
        other.top + m < box.bottom)
      return state;
  }
  // A safe place: on no stretch shared with the other operand (a ray ending
  // on one could not say which side it is on), and as far from the meetings
  // as the subpath allows: the middle of one of its longest free edges (a
  // short edge next to a near miss could end the ray within the weld
  // tolerance of the other operand, where the count is not defined). A ray
  // that passes a node of the other operand within the tolerance meets it
  // as a touch there and may meet the same edge again as a crossing a
  // little further on, counting one crossing twice; such a ray is cast
  // again through another place, on the same or another long edge.
  Edge e;
  const SafeEdgeList candidates = SafeEdges(edge, SharedWith::OtherOperand, kSeedCandidates);
  const bool onFirst = IsOnFirst(edge);
  const MavikMath::BoundsT<double>& bounds = onFirst ? secondBounds : firstBounds;
  for (ProbePlace const& place : kProbePlan) {
    if (place.candidate >= candidates.size) continue;
    Edge const& c = candidates.edges[place.candidate];
    const V p = c.pointAt(c.startT() + place.fraction * (c.endT() - c.startT()));
    FillStateData found;
    bool clean = true;  // outside the other operand's box: outside it
    int w = 0;
    if (MavikMath::IsPointInRect(p, bounds) && Rays(!onFirst).Winding(p, tolerance, nullptr, 0.0, w)) {
      // No curve of the other operand within the tolerance: its winding
      // number here is exact.
      found.winding = w;
    } else if (MavikMath::IsPointInRect(p, bounds)) {
      const V probe[2] = {V{bounds.left, p.y}, p};
      const NODETYPE probeNodes[2] = {NodeTypes::Open::move, NodeTypes::Open::line};
      const WeldSegments engine(ProbeCurves(probe, probeNodes, 2, !onFirst), WeldProbeIntersectionSettings(tolerance));
      if (engine.segments.empty()) continue;
      found = CountProbe(engine.segments[0], angleTolerance, std::numeric_limits<double>::quiet_NaN());
      clean = IsCleanProbe(engine.segments[0], -1.0, 2.0);
    }
    if (!e.valid() || clean) {
      e = c;
      state = found;
    }
    if (clean) break;
  }
  if (!e.valid()) return state;
  // Walk back to edge, undoing the records of the other operand passed.
  Edge cur = e;
  for (int guard = edgeTotal + 1; cur.valid() && !(cur == edge) && guard > 0; --guard) {
    Intersection const* r = cur.start;
    if (r && r->other && IsFirstCurve(segments->segments[size_t(r->other->segment)].curve) != onFirst) {
      // A record at the very start of a segment whose walk arrives through
      // an edge that is not part of anything counts as a plain crossing.
      bool ownAsInterior = false;
      if (r->t == 0.0) {
        const Edge zero = cur.prevEdge();
        const Edge before = zero.valid() ? zero.prevEdge() : Edge{};
        ownAsInterior = !before.valid() || !before.enabled();
      }
      FillStateData f;
      f.CountIntersection(r, angleTolerance, nullptr, ownAsInterior, false);
      state.winding -= f.winding;
      state.overlaps -= f.overlaps;
    }
    cur = cur.prevEdge();
  }
  return state;
}

int WeldStateData::OverlapSides(Edge const& edge, Intersection const* entry) const {
  if (!entry || !entry->overlapEnd || !entry->other || !entry->other->overlapEnd) return 0;
  const double span = entry->overlapEnd->t - entry->t;
  const double m = 0.5 * (edge.startT() + edge.endT());
  const double f = span != 0.0 ? (m - entry->t) / span : 0.0;
  const double a = entry->other->t, b = entry->other->overlapEnd->t;
  const double u = a + f * (b - a);
  const int s = entry->other->segment;
  if (s < 0 || size_t(s) >= segments->segments.size()) return 0;
  Edge e = Edge::First(segments.get(), s);
  for (int guard = edgeTotal + 1; e.valid() && guard > 0; --guard) {
    const double t0 = e.startT(), t1 = e.endT();
    if (std::min(t0, t1) <= u && u <= std::max(t0, t1)) {
      const int sides = e.sides();
      // Curves running against each other see each other's sides mirrored.
      return b > a ? sides : Mirror(sides);
    }
    e = e.nextEdge();
    if (e.valid() && e.segment->index == s && e.index == 0) break;  // came round
  }
  return 0;
}

// Whether edge is the last one of a closed subpath in storage order.
static bool EndsClosedSubpath(Edge const& e) {
  if (e.segment->next < 0 || e.index != int(e.segment->intersections.size())) return false;
  const Edge next = e.nextEdgeAbsolute();
  return !next.valid() || IsSubpathStart(*next.segment);
}

void WeldStateData::PerformWeld(WeldKeepRule keep) {
  FillStateData state, seed;
  openOverlaps.clear();
  // Stretches where this operand's own curves run on top of each other: of
  // the copies only the one on the lowest segment may stay, so that a
  // doubled outline is drawn once.
  std::vector<Intersection const*> ownOverlaps;

  auto decide = [&](Edge const& e, bool onFirst) {
    if (e.isZeroLength()) return false;
    EdgeStateData own;
    own.nonZero = onFirst ? firstNonZero : secondNonZero;
    own.inside = true;
    own.onEdge = true;
    own.sides = e.sides();
    // Inside the own filling: no outline. Once sides are known, an edge
    // with both sides filled under even-odd, or neither side under either
    // rule, lies on a doubled stretch that is no outline either.
    if ((own.nonZero || sidesFilled_) && own.sides == 3) return false;
    if (sidesFilled_ && own.sides == 0) return false;
    for (Intersection const* entry : ownOverlaps)
      if (entry->other && entry->other->segment < e.segment->index) return false;
    EdgeStateData foreign;
    foreign.nonZero = onFirst ? secondNonZero : firstNonZero;
    foreign.onEdge = state.overlaps > 0;
    if (state.overlaps < 1) {
      foreign.inside = Inside(state.winding, foreign.nonZero);
      foreign.sides = 0;
    } else {
      foreign.inside = true;
      if (e.start)
        for (Intersection const* entry : openOverlaps) foreign.sides |= OverlapSides(e, entry);
    }
    // Where the other operand's copies fill both sides (its own interior,
    // or under even-odd a doubled edge) the stretch is no outline of it;
    // where they fill neither (copies that cancel) it is outside.
    if ((foreign.nonZero || sidesFilled_) && foreign.sides == 3) foreign.onEdge = false;
    if (sidesFilled_ && state.overlaps > 0 && e.start && !openOverlaps.empty() && foreign.sides == 0) {
      foreign.onEdge = false;
      foreign.inside = false;
    }
    return onFirst ? keep(true, own, foreign) : keep(false, foreign, own);
  };

  int guard = edgeTotal + 1;
  for (Edge e = FirstEdge(); e.valid() && guard-- > 0; e = e.nextEdgeAbsolute()) {
    currentCurve = e.curve();
    const bool onFirst = IsFirstCurve(currentCurve);
    if (e.start) {
      Intersection const* o = e.start->other;
      const bool foreignRecord = o && IsFirstCurve(segments->segments[size_t(o->segment)].curve) != onFirst;
      if (foreignRecord) {
        state.CountIntersection(e.start, angleTolerance, &openOverlaps, false, false);
      } else if (o && e.start->overlapEnd) {
        if (e.start->t < e.start->overlapEnd->t)
          ownOverlaps.push_back(e.start);
        else
          ownOverlaps.erase(std::remove(ownOverlaps.begin(), ownOverlaps.end(), e.start->overlapEnd),
                            ownOverlaps.end());
      }
    } else if (IsSubpathStart(*e.segment)) {
      state = seed = SeedFillState(e);
      ownOverlaps.clear();
    }
    e.setEnabled(decide(e, onFirst));
    // Once round a closed loop, every record has been passed once and the
    // count is back where it started, unless the graph misses a meeting.
    if (EndsClosedSubpath(e) && (state.winding != seed.winding || state.overlaps != seed.overlaps))
      consistent_ = false;
  }
}

Edge WeldStateData::FindNextEdge(Edge edge, bool stopAtKnife, Side& side, int& dir) {
  auto straight = [&]() -> Edge {
    if (stopAtKnife && !IsOnFirst(edge) && DoesIntersectWithValidKnife(edge, dir)) return Edge{};
    return dir < 1 ? edge.prevEdgeNonZero() : edge.nextEdgeNonZero();
  };
  auto turn = [&]() -> Edge {
    Edge cur = edge;
    Edge last;
    for (int guard = edgeTotal + 1; cur.valid() && guard > 0; --guard) {
      const Side tries[2] = {side, MavikMath::Opposite(side)};
      for (Side s : tries) {
        int newDir = dir;
        Side newSide = side;
        Edge r = cur.nextEdgeFollowingIntersection(-dir, dir, s, newDir, newSide);
        if (r.valid() && r.isZeroLength()) r = newDir < 1 ? r.prevEdgeNonZero() : r.nextEdgeNonZero();
        last = r;
        if (r.valid() && r.enabled()) {
          dir = newDir;
          side = newSide;
          return r;
        }
      }
      // Several records may sit on one spot: each is a chance to turn.
      cur = dir < 1 ? cur.prevEdge() : cur.nextEdge();
      if (!cur.valid() || !cur.isZeroLength() || cur == edge) break;
    }
    return last;
  };
  if (HasWeldFlag(flags, WeldFlags::FollowCurve)) {
    const Edge s = straight();
    if (s.valid() && s.enabled()) return s;
    return turn();
  }
  const Edge t = turn();
  if (t.valid() && t.enabled()) return t;
  const Edge st = straight();
  if (st.valid() && st.enabled()) return st;
  if (stopAtKnife) return st;
  // Neither the own records nor the curve going on: where three or more
  // curves meet at one place, the records link them only in pairs, and the
  // kept continuation may lie on a curve that shares no record with this
  // one (two outlines running on top of each other, met by the corner of a
  // third). Look at every record of the junction.
  const Edge j = FindJunctionEdge(edge, side, dir);
  return j.valid() ? j : st;
}

Edge WeldStateData::FindJunctionEdge(Edge const& edge, Side& side, int& dir) const {
  Intersection* start = dir >= 1 ? edge.end : edge.start;
  if (!start) return Edge{};
  // The junction: records reached from the far record through twins, equal
  // parameters on one segment, and the node between a segment's end and the
  // next one's start. Bounded, so that a pile of records cannot run away.
  constexpr size_t kMaxJunction = 64;
  std::vector<Intersection*> junction{start};
  auto add = [&](Intersection* r) {
    if (r && junction.size() < kMaxJunction && std::find(junction.begin(), junction.end(), r) == junction.end())
      junction.push_back(r);
  };
  auto addAt = [&](int s, double t) {
    if (s < 0 || size_t(s) >= segments->segments.size()) return;
    for (Intersection* r : segments->segments[size_t(s)].intersections)
      if (r->t == t) add(r);
  };
  for (size_t k = 0; k < junction.size(); ++k) {
    Intersection* r = junction[k];
    add(r->other);
    if (r->segment < 0 || size_t(r->segment) >= segments->segments.size()) continue;
    const SegmentIntersections& s = segments->segments[size_t(r->segment)];
    addAt(r->segment, r->t);
    if (r->t == 1.0) addAt(s.next, 0.0);
    if (r->t == 0.0) addAt(s.prev, 1.0);
  }
  // The direction of arrival, and each candidate's direction of departure.
  const SegmentView v = ViewOf(*segments, *edge.segment);
  const MavikMath::D arrive = TangentOn(v, dir >= 1 ? edge.endT() : edge.startT()) * double(dir >= 1 ? 1 : -1);
  const double back = PseudoAngle(MavikMath::D{-arrive.x, -arrive.y});
  Edge best;
  int bestDir = 1;
  double bestTurn = 5.0;
  for (Intersection* r : junction) {
    SegmentIntersections* rs = &segments->segments[size_t(r->segment)];
    const int i = IndexOfRecord(*rs, r);
    if (i < 0) continue;
    for (int d : {1, -1}) {
      Edge c = Edge::At(segments.get(), rs, d > 0 ? i + 1 : i);
      if (c.valid() && c.isZeroLength()) c = d > 0 ? c.nextEdgeNonZero() : c.prevEdgeNonZero();
      if (!c.valid() || !c.enabled() || c == edge) continue;
      const SegmentView w = ViewOf(*segments, *c.segment);
      const MavikMath::D leave = TangentOn(w, d > 0 ? c.startT() : c.endT()) * double(d);
      // Clockwise from the way back: the sharpest left turn comes first,
      // as the turn above prefers the walker's left.
      double turn = back - PseudoAngle(leave);
      turn -= 4.0 * std::floor(turn / 4.0);
      if (!(turn > 0.0)) turn += 4.0;
      if (turn < bestTurn) {
        bestTurn = turn;
        best = c;
        bestDir = d;
      }
    }
  }
  if (best.valid()) {
    dir = bestDir;
    side = MavikMath::SideLeft;
  }
  return best;
}

bool WeldStateData::DoesIntersectWithValidKnife(Edge edge, int dir) const {
  if (!edge.valid()) return false;
  Intersection* record = dir >= 1 ? edge.end : edge.start;
  if (!record || !record->other) return false;
  Intersection* o = record->other;
  if (o->segment < 0 || size_t(o->segment) >= segments->segments.size()) return false;
  SegmentIntersections* os = &segments->segments[size_t(o->segment)];
  if (!IsFirstCurve(os->curve)) return false;
  const int i = IndexOfRecord(*os, o);
  if (i < 0) return false;
  return Edge::At(segments.get(), os, i + 1).enabled() || Edge::At(segments.get(), os, i).enabled();
}

void WeldStateData::ColorAndFollow(Edge edge, unsigned int color, int dir, Side side, bool fromKnife) {
  struct Record {
    Edge edge;
    Edge origin;
    int dir;
    int sideMask;
    bool fromKnife;
    bool followed;
  };
  std::vector<Record> stack;
  stack.push_back(Record{edge, edge, dir, int(side), fromKnife, false});
  // Every push either follows a colour change or steps once along a curve
  // after one, so the work is bounded by a few times the edges and sides.
  while (!stack.empty()) {
    Record r = stack.back();
    stack.pop_back();
    if (!r.edge.valid()) continue;
    const bool onKnife = IsOnFirst(r.edge);
    if (!r.followed) {
      if (secondNonZero && !onKnife && r.edge.sides() == 3) continue;  // interior: no colour
      if (onKnife && !r.edge.enabled()) continue;
      bool changed = false;
      if ((r.sideMask & 1) && r.edge.leftColor() != color) {
        r.edge.setLeftColor(color);
        changed = true;
      }
      if ((r.sideMask & 2) && r.edge.rightColor() != color) {
        r.edge.setRightColor(color);
        changed = true;
      }
      if (!changed) continue;
      stack.push_back(Record{r.edge, r.origin, r.dir, r.sideMask, r.fromKnife, true});
      struct Branch {
        int dir;
        Side side;
      };
      const Branch branches[4] = {{-r.dir, MavikMath::SideRight},
                                  {-r.dir, MavikMath::SideLeft},
                                  {r.dir, MavikMath::SideRight},
                                  {r.dir, MavikMath::SideLeft}};
      const int count = r.fromKnife ? 4 : 2;
      for (int k = 0; k < count; ++k) {
        if (!(r.sideMask & int(branches[k].side))) continue;
        int newDir = r.dir;
        Side newSide = branches[k].side;
        const Edge next = r.edge.nextEdgeFollowingIntersection(branches[k].dir, r.dir, branches[k].side, newDir, newSide);
        if (!next.valid()) continue;
        stack.push_back(Record{next, next, newDir, IsOnFirst(next) ? int(newSide) : 3, false, false});
      }
    } else {
      if (DoesIntersectWithValidKnife(r.edge, r.dir)) continue;
      const Edge step = r.dir >= 1 ? r.edge.nextEdge() : r.edge.prevEdge();
      if (!step.valid() || step == r.origin) continue;
      stack.push_back(Record{step, r.origin, r.dir, r.sideMask, r.fromKnife, false});
    }
  }
}

void WeldStateData::ResetState(unsigned int color) {
  int guard = edgeTotal + 1;
  for (Edge e = FirstEdge(); e.valid() && guard-- > 0; e = e.nextEdgeAbsolute())
    e.setEnabled((e.leftColor() == color || e.rightColor() == color) && !e.isZeroLength());
}

}  // namespace OstraCrv
