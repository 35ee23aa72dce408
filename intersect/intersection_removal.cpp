// Listing and removing the records of the intersection engine.
//
// A record never exists without its twin, so removal always takes both.
// Removing the pair at one end of an overlap unlinks the pair at the other
// end of the shared stretch (it becomes an ordinary meeting) and lowers
// overlapCount by one for each of the two segments: by 2 in all, which keeps
// the count at twice the number of live overlaps. The later removal of the
// other pair, no longer linked, lowers it no further.
//
// Removal within a list is by pointer and keeps the order of the rest, so it
// costs the length of the list; removing r records of one segment costs
// O(r * list length).
#include <algorithm>

#include "engine_internal.h"

namespace OstraCrv {

namespace {

// Takes the record out of its segment's list; false if it is not there.
template <class T>
bool Detach(SegmentsT<T>& s, Intersection* r) {
  if (r->segment < 0 || r->segment >= static_cast<int>(s.segments.size())) return false;
  auto& list = s.segments[r->segment].intersections;
  const auto it = std::find(list.begin(), list.end(), r);
  if (it == list.end()) return false;
  list.erase(it);
  return true;
}

// Clears the overlap link of r and its back link; one segment's share of the
// overlap count.
template <class T>
void Unlink(SegmentsT<T>& s, Intersection* r) {
  if (!r->overlapEnd) return;
  if (r->overlapEnd->overlapEnd == r) r->overlapEnd->overlapEnd = nullptr;
  r->overlapEnd = nullptr;
  --s.overlapCount;
}

template <class T>
void NoteMeeting(SegmentsT<T>& s, const SegmentIntersections& segment, const Intersection* r) {
  s.hasIntersections = true;
  if (!r->other) return;
  const int curves = static_cast<int>(s.curves.size());
  const int other = r->other->segment;
  if (segment.curve < 0 || segment.curve >= curves || other < 0 || other >= static_cast<int>(s.segments.size()))
    return;
  const int otherCurve = s.segments[other].curve;
  if (otherCurve >= 0 && otherCurve < curves) s.curves[segment.curve].SetIntersectsWith(otherCurve);
}

template <class T>
void ClearMeetings(SegmentsT<T>& s) {
  for (auto& c : s.curves) c.intersectsWith.clear();
  s.hasIntersections = false;
}

}  // namespace

template <class T>
std::vector<Intersection*> SegmentsT<T>::GetAllIntersections() const {
  std::vector<Intersection*> all;
  const int n = static_cast<int>(segments.size());
  const int first = std::max(cursorSegment, 0);
  for (int s = first; s < n; ++s) {
    const auto& list = segments[s].intersections;
    const size_t from = s == first ? static_cast<size_t>(std::max(cursorIndex, 0)) : 0;
    for (size_t k = from; k < list.size(); ++k) all.push_back(list[k]);
  }
  return all;
}

template <class T>
void SegmentsT<T>::RemoveIntersection(Intersection* record) {
  if (!record) return;
  cursorSegment = 0;
  cursorIndex = 0;
  if (!Detach(*this, record)) return;
  Intersection* twin = record->other;
  if (twin && twin != record && Detach(*this, twin)) {
    Unlink(*this, twin);
    delete twin;
  }
  Unlink(*this, record);
  delete record;
}

template <class T>
void SegmentsT<T>::RemoveIntersections(int curve) {
  ClearMeetings(*this);
  for (auto& segment : segments) {
    if (segment.curve != curve) continue;
    while (!segment.intersections.empty()) {
      const size_t before = segment.intersections.size();
      RemoveIntersection(segment.intersections.back());
      if (segment.intersections.size() >= before) break;  // a record not owned here: leave it
    }
  }
  for (const auto& segment : segments)
    for (const Intersection* r : segment.intersections) NoteMeeting(*this, segment, r);
}

template <class T>
void SegmentsT<T>::RemoveInvalidIntersections() {
  ClearMeetings(*this);
  for (int s = 0; s < static_cast<int>(segments.size()); ++s) {
    auto& list = segments[s].intersections;
    size_t k = 0;
    while (k < list.size()) {
      Intersection* r = list[k];
      if (r->enabled) {
        NoteMeeting(*this, segments[s], r);
        ++k;
        continue;
      }
      // The twin of a loop of one segment sits in this same list; if it was
      // passed already, the list shrinks in front of k as well.
      const int twinAt = engine_detail::OnSegment(r->other, s) ? segments[s].GetIndex(r->other) : -1;
      const size_t before = list.size();
      RemoveIntersection(r);
      if (list.size() >= before) {
        ++k;  // not removed (not owned here): step over it
        continue;
      }
      if (twinAt >= 0 && static_cast<size_t>(twinAt) < k) --k;
    }
  }
}

template <class T>
T const* SegmentsT<T>::SegmentPoints(int segment) const noexcept {
  if (segment < 0 || segment >= static_cast<int>(segments.size())) return nullptr;
  const int curve = segments[segment].curve;
  if (curve < 0 || curve >= static_cast<int>(curves.size()) || !curves[curve].points) return nullptr;
  return curves[curve].points + segments[segment].firstNode;
}

using Framework::common_types::POINT;
using MavikMath::V;

#define OSTRACRV_INSTANTIATE(T)                                                 \
  template std::vector<Intersection*> SegmentsT<T>::GetAllIntersections() const; \
  template void SegmentsT<T>::RemoveIntersection(Intersection*);                \
  template void SegmentsT<T>::RemoveIntersections(int);                         \
  template void SegmentsT<T>::RemoveInvalidIntersections();                     \
  template T const* SegmentsT<T>::SegmentPoints(int) const noexcept;
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace OstraCrv
