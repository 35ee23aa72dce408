// Segment views: construction, walking, ranges and the shape check; see
// curvesegment.h.
//
// Every view is made by one routine, MakeView, from the node and point at the
// view's number, so that next() and prev() can step from a view without
// knowing where its arrays begin: all offsets are taken relative to the entry
// at number (-1 for the start node, +1 and +2 for the rest of a Bezier).
#include "ostracrv/core/curvesegment.h"

#include <algorithm>
#include <memory>

namespace OstraCrv {

namespace {

using Framework::common_types::POINT;
using MavikUtils::array_view;
using MavikUtils::optional;

// The view at number, given pointers to the node and the point at number.
// count, if given, bounds the indices; number itself has been checked.
template <class T>
optional<CurveSegmentT<T>> MakeView(unsigned long number, NODETYPE const* atNode, T const* atPoint,
                                    optional<unsigned long> count) noexcept {
  switch (GetSegmentType(atNode[0])) {
    case SegmentType::move:
      return CurveSegmentT<T>(number, array_view<NODETYPE const>(atNode, 1), array_view<T const>(atPoint, 1));
    case SegmentType::line:
      if (number == 0) return MavikUtils::nullopt;
      return CurveSegmentT<T>(number, array_view<NODETYPE const>(atNode - 1, 2), array_view<T const>(atPoint - 1, 2));
    case SegmentType::curve:
      return MavikUtils::nullopt;
    case SegmentType::arc:
      if (number == 0) return MavikUtils::nullopt;
      if (count && number + 2 >= *count) return MavikUtils::nullopt;
      if (!IsArc(atNode[1]) || !IsCurve(atNode[2])) return MavikUtils::nullopt;
      return CurveSegmentT<T>(number, array_view<NODETYPE const>(atNode - 1, 4), array_view<T const>(atPoint - 1, 4));
  }
  return MavikUtils::nullopt;
}

}  // namespace

template <class T>
optional<CurveSegmentT<T>> GetCurveSegment(unsigned long number, NODETYPE const* nodes, T const* points,
                                           optional<unsigned long> count) noexcept {
  if (!nodes || !points) return MavikUtils::nullopt;
  if (count && number >= *count) return MavikUtils::nullopt;
  return MakeView(number, nodes + number, points + number, count);
}

template <class T>
CurveSegmentT<T>::CurveSegmentT(PolycurveT<T> const& curve, unsigned long number) noexcept
    : CurveSegmentT(curve.GetNodeTypes(), curve.GetPoints(), number, curve.GetPointCount()) {}

template <class T>
CurveSegmentT<T>::CurveSegmentT(NODETYPE const* nodes, T const* points, unsigned long number,
                                optional<unsigned long> count) noexcept {
  if (auto v = GetCurveSegment<T>(number, nodes, points, count)) *this = *v;
}

template <class T>
optional<CurveSegmentT<T>> CurveSegmentT<T>::FromNumber(PolycurveT<T> const& curve, unsigned long number) noexcept {
  return GetCurveSegment<T>(number, curve.GetNodeTypes(), curve.GetPoints(), curve.GetPointCount());
}

template <class T>
optional<CurveSegmentT<T>> CurveSegmentT<T>::FromStartIdx(PolycurveT<T> const& curve, unsigned long i) noexcept {
  const unsigned long n = curve.GetPointCount();
  if (i >= n || i + 1 >= n) return MavikUtils::nullopt;
  return GetCurveSegment<T>(i + 1, curve.GetNodeTypes(), curve.GetPoints(), n);
}

template <class T>
optional<CurveSegmentT<T>> CurveSegmentT<T>::FromEndIdx(PolycurveT<T> const& curve, unsigned long i) noexcept {
  const unsigned long n = curve.GetPointCount();
  NODETYPE const* nodes = curve.GetNodeTypes();
  if (i >= n || !nodes) return MavikUtils::nullopt;
  switch (::GetSegmentType(nodes[i])) {
    case SegmentType::move:
    case SegmentType::line:
      return GetCurveSegment<T>(i, nodes, curve.GetPoints(), n);
    case SegmentType::curve:
      if (i < 2 || !IsArc(nodes[i - 2])) return MavikUtils::nullopt;
      return GetCurveSegment<T>(i - 2, nodes, curve.GetPoints(), n);
    case SegmentType::arc:
      break;
  }
  return MavikUtils::nullopt;
}

template <class T>
unsigned long CurveSegmentT<T>::next_number() const noexcept {
  if (nodes_.empty()) return number_;
  return NextCurveSegment<T>::Step(nodes_[number_ - startIndex()], number_);
}

template <class T>
unsigned long CurveSegmentT<T>::prev_number() const noexcept {
  if (nodes_.empty() || number_ == 0) return 0;
  // The node before number: inside a line or curve view it is the view's
  // first entry; before a move view it lies outside the view.
  NODETYPE const before = nodes_.size() > 1 ? nodes_[0] : *(nodes_.data() - 1);
  switch (GetSegmentType(before)) {
    case SegmentType::move:
    case SegmentType::line:
      return number_ - 1;
    case SegmentType::curve:
      return number_ >= 3 ? number_ - 3 : 0;
    case SegmentType::arc:
      break;
  }
  return 0;
}

template <class T>
optional<CurveSegmentT<T>> CurveSegmentT<T>::next() const noexcept {
  if (nodes_.empty()) return MavikUtils::nullopt;
  const unsigned long to = next_number();
  // Offsets from the entry at number_; the next view never starts before it
  // except after the curve-node row, whose 1 is taken literally.
  const long delta = long(to) - long(number_);
  const long at = long(number_ - startIndex());
  return MakeView<T>(to, nodes_.data() + at + delta, points_.data() + at + delta, MavikUtils::nullopt);
}

template <class T>
optional<CurveSegmentT<T>> CurveSegmentT<T>::prev() const noexcept {
  if (nodes_.empty() || number_ == 0) return MavikUtils::nullopt;
  const unsigned long to = prev_number();
  const long delta = long(to) - long(number_);
  const long at = long(number_ - startIndex());
  return MakeView<T>(to, nodes_.data() + at + delta, points_.data() + at + delta, MavikUtils::nullopt);
}

// ---- Ranges ----

namespace {

template <class T>
typename details<T>::range MakeRange(NODETYPE const* nodes, T const* points, unsigned long begin, unsigned long end,
                                     std::shared_ptr<const void> keep) {
  using It = typename details<T>::iterator;
  if (!nodes || !points || begin >= end) return typename details<T>::range(It::End(), It::End(), std::move(keep));
  It first(CurveSegmentGetter<T>(nodes, points, end), NextCurveSegment<T>(nodes), begin, end);
  return typename details<T>::range(first, It::End(), std::move(keep));
}

}  // namespace

template <class T>
typename details<T>::range details<T>::GetCurveSegments_Base(PolycurveT<T> curve) {
  auto keep = std::make_shared<const PolycurveT<T>>(curve);
  return MakeRange<T>(keep->GetNodeTypes(), keep->GetPoints(), 0, keep->GetPointCount(), keep);
}

template <class T>
typename details<T>::range details<T>::GetCurveSegments_Range(
    PolycurveT<T> curve, MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>> r) {
  auto keep = std::make_shared<const PolycurveT<T>>(curve);
  // A range that ends beyond the curve is clipped, so no view reads past it.
  const unsigned long end = std::min((*r.end()), keep->GetPointCount());
  return MakeRange<T>(keep->GetNodeTypes(), keep->GetPoints(), *r.begin(), end, keep);
}

template <class T>
typename details<T>::range details<T>::GetCurveSegments_Raw(
    NODETYPE const* nodes, T const* points, MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>> r) {
  return MakeRange<T>(nodes, points, *r.begin(), *r.end(), nullptr);
}

// ---- Shape check ----

namespace {

// Walks numbers begin .. end over arrays of at least end entries.
template <class T>
bool WalkLandsOnEnd(NODETYPE const* nodes, T const* points, unsigned long begin, unsigned long end) {
  unsigned long number = begin;
  while (number < end) {
    auto v = GetCurveSegment<T>(number, nodes, points, end);
    if (!v) return false;
    const NODETYPE last = v->node();
    switch (GetSegmentType(last)) {
      case SegmentType::move:
        if (v->nodes().size() != 1) return false;
        break;
      case SegmentType::line:
        if (v->nodes().size() != 2) return false;
        break;
      case SegmentType::curve:
        if (v->nodes().size() != 4 || !IsArc(v->nodes()[1]) || !IsArc(v->nodes()[2])) return false;
        break;
      case SegmentType::arc:
        return false;
    }
    number = v->next_number();
  }
  return number == end;
}

}  // namespace

template <class T>
bool ValidSegments(PolycurveT<T> const& curve) {
  const unsigned long n = curve.GetPointCount();
  if (n == 0) return true;
  return WalkLandsOnEnd<T>(curve.GetNodeTypes(), curve.GetPoints(), 0, n);
}

template <class T>
bool ValidSegments(PolycurveT<T> const& curve, MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>> r) {
  const unsigned long n = curve.GetPointCount();
  const unsigned long begin = *r.begin(), end = *r.end();
  if (n == 0) return true;
  if (end > n || begin > end) return false;
  return WalkLandsOnEnd<T>(curve.GetNodeTypes(), curve.GetPoints(), begin, end);
}

#define OSTRACRV_INSTANTIATE_SEGMENT_VIEWS(T)                                                                       \
  template class CurveSegmentT<T>;                                                                                  \
  template struct details<T>;                                                                                       \
  template MavikUtils::optional<CurveSegmentT<T>> GetCurveSegment<T>(unsigned long, NODETYPE const*, T const*,      \
                                                                     MavikUtils::optional<unsigned long>) noexcept; \
  template bool ValidSegments<T>(PolycurveT<T> const&);                                                             \
  template bool ValidSegments<T>(PolycurveT<T> const&, MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>>);

OSTRACRV_INSTANTIATE_SEGMENT_VIEWS(POINT)
OSTRACRV_INSTANTIATE_SEGMENT_VIEWS(MavikMath::V)

#undef OSTRACRV_INSTANTIATE_SEGMENT_VIEWS

}  // namespace OstraCrv
