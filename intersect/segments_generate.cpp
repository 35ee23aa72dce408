// One run of the intersection engine: segments, pairs, sorting and the
// clean-up passes.
//
// The clean-up works on the list of all records taken after sorting. To
// disable a record is to clear `enabled` on it and on its twin; nothing is
// freed until the end, when every disabled record is removed with its twin,
// so pointers held during the passes stay valid. "At 0" and "at 1" of a
// parameter mean within kEpsilon; the touch clean-up asks for exactly 0 or 1,
// the values the end and touch tests write.
//
//  Overlaps. Without keepFullOverlaps, a segment wholly covered by an
//  overlap loses all its records. Otherwise, without keepOverlapEnds, every
//  record that opens or closes an overlap goes, and (unless
//  keepOverlapNeighbours) so does the meeting of the same two curves that
//  the neighbouring segment holds at the shared node: the overlap then
//  leaves no trace at its ends.
//
//  Node duplicates. Without keepNodeDuplicates, a meeting on a node of the
//  path is found twice, at the end of one segment and at the start of the
//  next, with the same other segment and parameter; the first goes.
//
//  Touch and crossing. A meeting near a node may be found as a touch (an end
//  near the other segment) and again as a crossing (in the interiors, a
//  little away because of the tolerances). For each touch at a segment end,
//  with its mirror on the neighbouring segment at the same node: if crossings
//  near both touch and mirror exist, the crossings are rounding echoes and
//  go; with preferTouch, or when the touch bounds an overlap, the touch
//  stands and the crossing goes; otherwise the crossing, being exact, stands
//  and the touch (with the mirrors of the touches involved) goes.
//
// Cost: O(r) for the passes over r records, each with a scan of one
// neighbouring list; O(r * list length) for the removals.
#include <cmath>

#include "engine_internal.h"
#include "ostracrv/intersect/touch_overlap.h"

namespace OstraCrv {

namespace {

using namespace engine_detail;
using Framework::common_types::POINT;

void Disable(Intersection* r) {
  if (!r) return;
  r->enabled = false;
  if (r->other) r->other->enabled = false;
}

bool ValidIndex(const std::vector<SegmentIntersections>& segments, int s) {
  return s >= 0 && s < static_cast<int>(segments.size());
}

// The same touch seen from the neighbouring segment at the same node: on
// `next` when r is at exactly 1 and on `prev` otherwise, the first touch
// record meeting the same other segment at parameter 1 - r.t.
template <class T>
Intersection* FindMirror(SegmentsT<T>& s, const Intersection* r) {
  if (!r || !r->other || !ValidIndex(s.segments, r->segment)) return nullptr;
  const SegmentIntersections& own = s.segments[r->segment];
  const int neighbour = r->t == 1.0 ? own.next : own.prev;
  if (!ValidIndex(s.segments, neighbour)) return nullptr;
  for (Intersection* m : s.segments[neighbour].intersections)
    if (m->touch && OnSegment(m->other, r->other->segment) && m->t == 1.0 - r->t) return m;
  return nullptr;
}

template <class T>
bool CleanOverlaps(SegmentsT<T>& s, const std::vector<Intersection*>& all,
                   const SegmentIntersectionSettings& settings) {
  bool changed = false;
  if (!settings.keepFullOverlaps) {
    for (Intersection* r : all) {
      if (!r->overlapEnd || !AtZero(r->t) || !AtOne(r->overlapEnd->t)) continue;
      for (Intersection* x : s.segments[r->segment].intersections) {
        Disable(x);
        changed = true;
      }
    }
    return changed;
  }
  if (settings.keepOverlapEnds) return false;
  for (Intersection* r : all) {
    if (!r->overlapEnd) continue;
    r->enabled = false;  // its twin has an overlapEnd of its own and takes its own turn
    changed = true;
    if (settings.keepOverlapNeighbours || !r->other) continue;
    const int otherSegment = r->other->segment;
    const SegmentIntersections& own = s.segments[r->segment];
    if (AtZero(r->t) && ValidIndex(s.segments, own.prev)) {
      const auto& list = s.segments[own.prev].intersections;
      for (size_t k = list.size(); k-- > 0 && AtOne(list[k]->t);) {
        if (OnSegment(list[k]->other, otherSegment)) {
          Disable(list[k]);
          break;
        }
      }
    }
    if (AtOne(r->t) && ValidIndex(s.segments, own.next)) {
      const auto& list = s.segments[own.next].intersections;
      for (size_t k = 0; k < list.size() && AtZero(list[k]->t); ++k) {
        if (OnSegment(list[k]->other, otherSegment)) {
          Disable(list[k]);
          break;
        }
      }
    }
  }
  return changed;
}

template <class T>
bool CleanNodeDuplicates(SegmentsT<T>& s, const std::vector<Intersection*>& all) {
  bool changed = false;
  for (Intersection* r : all) {
    if (!AtOne(r->t) || !r->other) continue;
    const int next = s.segments[r->segment].next;
    if (!ValidIndex(s.segments, next)) continue;
    const auto& list = s.segments[next].intersections;
    for (size_t k = 0; k < list.size() && AtZero(list[k]->t); ++k) {
      const Intersection* o = list[k]->other;
      if (OnSegment(o, r->other->segment) && std::fabs(o->t - r->other->t) <= MavikMath::kEpsilon) {
        Disable(r);
        changed = true;
        break;
      }
    }
  }
  return changed;
}

template <class T>
bool CleanTouches(SegmentsT<T>& s, const std::vector<Intersection*>& all,
                  const SegmentIntersectionSettings& settings) {
  bool changed = false;
  const double q = settings.touchToleranceSquared;
  for (Intersection* r : all) {
    if (!r->touch || !r->enabled || !(r->t == 0.0 || r->t == 1.0)) continue;
    Intersection* mirror = FindMirror(s, r);
    Intersection* c = FindIntersectionCloseToTouch(s, r, q);
    Intersection* d = nullptr;
    if (mirror) {
      d = FindIntersectionCloseToTouch(s, mirror, q);
      if (!c && !d) continue;
      if (c && d) {
        Disable(c);
        Disable(d);
        changed = true;
        continue;
      }
    } else if (!c) {
      continue;
    }
    if (settings.preferTouch || r->overlapEnd || (mirror && mirror->overlapEnd)) {
      Disable(c);
      Disable(d);
      changed = true;
      continue;
    }
    // The crossing stands; the touch goes, and with it the mirror of each
    // touch involved.
    Disable(r);
    if (r->other && r->other->touch) Disable(FindMirror(s, r->other));
    if (mirror) {
      Disable(mirror);
      if (mirror->other && mirror->other->touch) Disable(FindMirror(s, mirror->other));
    }
    changed = true;
  }
  return changed;
}

}  // namespace

template <class T>
SegmentsT<T>::SegmentsT(const std::vector<IntersectionCurveT<T>>& curves_,
                        const SegmentIntersectionSettings& settings, PairSearch search)
    : curves(curves_) {
  GenerateIntersections(settings, search);
}

template <class T>
void SegmentsT<T>::GenerateIntersections(const SegmentIntersectionSettings& settings, PairSearch search) {
  // 1. A fresh start.
  segments.clear();
  hasIntersections = false;
  cursorSegment = 0;
  cursorIndex = 0;
  overlapCount = 0;
  for (auto& c : curves) c.intersectsWith.clear();

  // 2. Segments, curve after curve. A curve of n nodes has at most n - 1
  // segments: room for them all up front spares the moves of regrowing.
  size_t most = 0;
  for (const auto& c : curves)
    if (c.count > 1) most += static_cast<size_t>(c.count - 1);
  segments.reserve(most);
  for (int k = 0; k < static_cast<int>(curves.size()); ++k)
    InitializeSegments(k, curves[k].points, curves[k].nodes, curves[k].count, segments);

  // 3. Pairs, 4. sorted lists.
  if (search == PairSearch::AllPairs)
    FindAllIntersections(*this, settings);
  else
    FindAllIntersectionsPruned(*this, settings);
  for (auto& s : segments) s.Sort();

  // 5.-9. Clean-up.
  const std::vector<Intersection*> all = GetAllIntersections();
  if (all.empty()) return;
  bool changed = CleanOverlaps(*this, all, settings);
  if (!settings.keepNodeDuplicates) changed |= CleanNodeDuplicates(*this, all);
  changed |= CleanTouches(*this, all, settings);
  if (changed) RemoveInvalidIntersections();
}

template <class T>
Intersection* FindIntersectionCloseToTouch(SegmentsT<T>& s, Intersection* touch, double squaredTolerance) {
  if (!touch || !touch->other || !ValidIndex(s.segments, touch->segment)) return nullptr;
  const int otherSegment = touch->other->segment;
  const auto& list = s.segments[touch->segment].intersections;
  auto candidate = [&](const Intersection* x) {
    return x->enabled && !x->touch && !x->overlapEnd && OnSegment(x->other, otherSegment);
  };
  Intersection* x = nullptr;
  if (touch->t == 1.0) {
    for (size_t k = list.size(); k-- > 0;)
      if (candidate(list[k])) {
        x = list[k];
        break;
      }
  } else {
    for (Intersection* r : list)
      if (candidate(r)) {
        x = r;
        break;
      }
  }
  if (!x) return nullptr;
  const double d = SquaredDistance(touch->point, x->point);
  if (d < squaredTolerance) return x;
  if (!(d < 2.0 * squaredTolerance)) return nullptr;
  // A little further away, the crossing still reports the touch when the two
  // segments run together between them.
  T const* own = s.SegmentPoints(touch->segment);
  T const* other = s.SegmentPoints(otherSegment);
  if (!own || !other) return nullptr;
  if (DoSegmentsOverlap(own, other, s.segments[touch->segment].type, s.segments[otherSegment].type, touch->t, x->t,
                        touch->other->t, x->other->t, squaredTolerance))
    return x;
  return nullptr;
}

using MavikMath::V;

#define OSTRACRV_INSTANTIATE(T)                                                                                  \
  template SegmentsT<T>::SegmentsT(const std::vector<IntersectionCurveT<T>>&, const SegmentIntersectionSettings&, \
                                   PairSearch);                                                                  \
  template void SegmentsT<T>::GenerateIntersections(const SegmentIntersectionSettings&, PairSearch);             \
  template Intersection* FindIntersectionCloseToTouch<T>(SegmentsT<T>&, Intersection*, double);
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace OstraCrv
