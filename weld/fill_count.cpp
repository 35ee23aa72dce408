// The winding count carried along a curve of the weld graph: what passing one
// intersection record does to it.
//
// A walk along the "own" curve passes the record `crossing`; its twin o lies
// on the "other" curve. The winding number of the other operand changes by
// one when the walk passes from one side of the other curve to the other
// side, with the sign telling the direction: -1 when the other curve runs to
// the walker's left (cross(own tangent, other tangent) > 0), +1 when to the
// right. Inside both segments that is all.
//
// At a node (t exactly 0 or 1 of either segment) a record says nothing on its
// own: a curve meeting another at a node is reported once per segment at the
// node, and the walk may touch the other curve there without crossing it. So
// each record contributes by comparing the directions in which the curves
// leave the point. A direction at a segment end points into the segment (the
// tangent, reversed at t 1, with its curvature reversed too); an interior
// point has two directions, forward and backward (curvature k and -k).
// Direction d1 "beats" d2 when its pseudo-angle is larger; directions closer
// than the angle tolerance are told apart by curvature, where a larger signed
// curvature (positive for a left turn, y up) means that d1 turns further
// counter-clockwise, and by the overlap state: a record that opens an overlap
// beats, one that closes it does not. The contributions of all records at
// one spot add up to the change of winding between the walk's arrival and
// departure, and to zero for a touch without a crossing.
//
// Overlaps: a record with overlapEnd opens a shared stretch when its partner
// lies ahead (larger t) and closes it otherwise; the count of open overlaps
// and the optional list follow.
#include <algorithm>

#include "ostracrv/weld/weldstate.h"
#include "ostracrv/weld/weldflags.h"
#include "weld_internal.h"

namespace OstraCrv {

namespace {

using MavikMath::D;

using weld_detail::Tie;

struct Direction {
  D d;
  double curvature;
};

// Whether the own direction a beats the other's direction b; see the file
// comment. Directions within the angle tolerance are told apart by `tie`.
bool Beats(Direction const& a, Direction const& b, double angleTolerance, weld_detail::Tie const& tie) {
  const double pa = PseudoAngle(a.d), pb = PseudoAngle(b.d);
  if (std::abs(pa - pb) <= angleTolerance) {
    if (tie.assign) return tie.ownForward == !tie.coincidentLeft;
    return tie.entering || (a.curvature > b.curvature && !tie.leaving);
  }
  return pa > pb;
}

// The direction into the segment from an end at t (0 or 1).
Direction IntoSegment(Intersection const& r) {
  if (r.t == 1.0) return {D{-r.tangent.x, -r.tangent.y}, -r.curvature};
  return {r.tangent, r.curvature};
}

}  // namespace

namespace weld_detail {

void CountPassage(FillStateData& state, Intersection const* crossing, double angleTolerance,
                  std::vector<Intersection const*>* list, bool ownAsInterior, bool otherAsInterior,
                  SidedCount sided) {
  int& winding = state.winding;
  int& overlaps = state.overlaps;
  if (!crossing || !crossing->other) return;
  bool entering = false, leaving = false;
  if (crossing->overlapEnd) {
    entering = crossing->t < crossing->overlapEnd->t;
    leaving = !entering;
    if (entering) {
      ++overlaps;
      if (list) list->push_back(crossing);
    } else {
      --overlaps;
      if (list) list->erase(std::remove(list->begin(), list->end(), crossing->overlapEnd), list->end());
    }
  }
  // On a shared stretch the other curve's branch runs along the own curve:
  // a sided count puts it on the side asked for; the plain count puts it
  // where the walk along the overlap expects it.
  Tie tie{entering, leaving, false, false, sided == SidedCount::CoincidentLeft};
  const bool assign = sided != SidedCount::Plain && crossing->overlapEnd;
  const Intersection& own = *crossing;
  const Intersection& o = *crossing->other;
  const bool ownEnd = !ownAsInterior && (own.t == 0.0 || own.t == 1.0);
  const bool otherEnd = !otherAsInterior && (o.t == 0.0 || o.t == 1.0);

  if (!ownEnd && !otherEnd) {
    const double c = Cross(own.tangent, o.tangent);
    if (c > 0.0)
      --winding;
    else if (c < 0.0)
      ++winding;
    return;
  }
  if (ownEnd && otherEnd) {
    tie.assign = assign;
    tie.ownForward = own.t == 0.0;
    if (Beats(IntoSegment(own), IntoSegment(o), angleTolerance, tie)) winding += own.t == o.t ? 1 : -1;
    return;
  }
  if (ownEnd) {
    const int s = own.t == 0.0 ? 1 : -1;
    const Direction mine = IntoSegment(own);
    const Direction forward{o.tangent, o.curvature};
    const Direction backward{D{-o.tangent.x, -o.tangent.y}, -o.curvature};
    tie.assign = assign;
    tie.ownForward = own.t == 0.0;
    if (Beats(mine, forward, angleTolerance, tie)) winding += s;
    if (Beats(mine, backward, angleTolerance, tie)) winding -= s;
    return;
  }
  const int s = o.t == 0.0 ? 1 : -1;
  const Direction theirs = IntoSegment(o);
  const Direction forward{own.tangent, own.curvature};
  const Direction backward{D{-own.tangent.x, -own.tangent.y}, -own.curvature};
  tie.assign = assign;
  tie.ownForward = true;
  if (Beats(forward, theirs, angleTolerance, tie)) winding += s;
  tie.ownForward = false;
  if (Beats(backward, theirs, angleTolerance, tie)) winding -= s;
}

}  // namespace weld_detail

void FillStateData::CountIntersection(Intersection const* crossing, double angleTolerance,
                                      std::vector<Intersection const*>* list, bool ownAsInterior,
                                      bool otherAsInterior) {
  weld_detail::CountPassage(*this, crossing, angleTolerance, list, ownAsInterior, otherAsInterior,
                            weld_detail::SidedCount::Plain);
}

}  // namespace OstraCrv
