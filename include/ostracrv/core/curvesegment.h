// Segment views: one piece of a path seen through pointers into its arrays.
//
// A CurveSegmentT<T> owns nothing. It holds a node index and two borrowed
// array views (node bytes and points) over the entries of one piece:
//
//   shape  | entries                                  | number is
//   -------+------------------------------------------+---------------------
//   move   | 1: the move node                         | index of the move
//   line   | 2: start node, line node                 | index of the line
//   curve  | 4: start node, arc, arc, curve node      | index of the first arc
//
// So number is always the index of the first node after the segment's start
// node (of the move itself for a move view); it is a node index, not the
// ordinal of the segment. A walk over a path yields one view for every move as
// well as for every segment; consumers that want real segments skip move
// views by type() or with MavikUtils::skip_first on a one-subpath range.
//
// The shape is decided by the node at number alone (GetCurveSegment):
//   move -> move view; line -> line view starting one node earlier (none at
//   index 0); arc -> curve view starting one node earlier, if the next two
//   nodes are an arc and a curve and fit into the count; curve -> none.
//
// A view stays valid only as long as the arrays it points into: any non-const
// call on the owning handle may reallocate them. The ranges of details<T>
// carry their own copy of the curve for this reason.
//
// Cost: five machine words, no allocation; next/prev and the accessors touch
// only the bytes next to the view.
#pragma once

#include <type_traits>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/curveposition.h"
#include "ostracrv/core/mavikutils.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/core/polycurve.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/math/vector2d.h"

namespace OstraCrv {

template <class T>
class CurveSegmentT {
 public:
  using point_type = T;

  // The shapes as type() reports them; these values are the view's own and
  // differ from SegmentType.
  enum Shape : int { kNone = 0, kMove = 1, kLine = 2, kCurve = 3 };

  // An invalid view: all pointers null.
  CurveSegmentT() noexcept = default;
  // Stores its arguments as they are; the caller vouches for the shape.
  CurveSegmentT(unsigned long number, MavikUtils::array_view<NODETYPE const> nodes,
                MavikUtils::array_view<T const> points) noexcept
      : number_(number), nodes_(nodes), points_(points) {}
  // The view at number of the curve (GetCurveSegment with the curve's count);
  // an invalid view where that gives none.
  CurveSegmentT(PolycurveT<T> const& curve, unsigned long number) noexcept;
  // The view at number of raw arrays; an invalid view where GetCurveSegment
  // gives none. Without a count the arrays are read at number+2 unchecked.
  CurveSegmentT(NODETYPE const* nodes, T const* points, unsigned long number,
                MavikUtils::optional<unsigned long> count) noexcept;

  // GetCurveSegment with the curve's count.
  static MavikUtils::optional<CurveSegmentT> FromNumber(PolycurveT<T> const& curve, unsigned long number) noexcept;
  // The piece that starts at node i: the view at number i+1. Absent if i+1 is
  // not below the count. When node i ends its subpath, the node at i+1 is the
  // next subpath's move and the answer is that move view.
  static MavikUtils::optional<CurveSegmentT> FromStartIdx(PolycurveT<T> const& curve, unsigned long i) noexcept;
  // The piece that ends at node i: a move or line view for a move or line node,
  // the curve view for a curve node (absent if node i-2 is not an arc); absent
  // for an arc and for i not below the count.
  static MavikUtils::optional<CurveSegmentT> FromEndIdx(PolycurveT<T> const& curve, unsigned long i) noexcept;

  // ---- Accessors ----

  bool valid() const noexcept { return !nodes_.empty(); }
  explicit operator bool() const noexcept { return valid(); }
  // By the number of entries: 1 move, 2 line, 4 curve, anything else none.
  int type() const noexcept {
    switch (nodes_.size()) {
      case 1:
        return kMove;
      case 2:
        return kLine;
      case 4:
        return kCurve;
      default:
        return kNone;
    }
  }
  unsigned long number() const noexcept { return number_; }
  // Index of the first entry: number for a move view, number-1 otherwise.
  unsigned long startIndex() const noexcept { return nodes_.size() > 1 ? number_ - 1 : number_; }
  // Index of the last entry.
  unsigned long endIndex() const noexcept { return points_.empty() ? startIndex() : startIndex() + points_.size() - 1; }
  // The last node, the one that carries the segment's type; a move byte (0)
  // for an invalid view.
  NODETYPE node() const noexcept { return nodes_.empty() ? NODETYPE(0) : nodes_.back(); }
  MavikUtils::array_view<NODETYPE const> nodes() const noexcept { return nodes_; }
  MavikUtils::array_view<T const> points() const noexcept { return points_; }
  // First and last point; the same point in a move view. A static zero point
  // for an invalid view.
  T const& startpoint() const noexcept { return points_.empty() ? Zero() : points_.front(); }
  T const& endpoint() const noexcept { return points_.empty() ? Zero() : points_.back(); }
  // The entries without the first and the last: the two control points of a
  // curve view, empty otherwise.
  MavikUtils::array_view<T const> arc_points() const noexcept {
    return points_.size() > 2 ? points_.subview(1, points_.size() - 2) : MavikUtils::array_view<T const>();
  }
  MavikUtils::array_view<NODETYPE const> arc_nodes() const noexcept {
    return nodes_.size() > 2 ? nodes_.subview(1, nodes_.size() - 2) : MavikUtils::array_view<NODETYPE const>();
  }
  // The bounds of the view's points, control points included: a RECT for
  // integer points, BoundsT<double> for doubles; empty for an invalid view.
  auto GetPointsBBox() const noexcept { return MavikMath::GetPointsBBox(points_.data(), int(points_.size())); }

  // ---- Walking ----
  //
  // next and prev run over the whole arrays across subpath boundaries and
  // never wrap at a closed subpath. They have no bound: next() at the last
  // piece reads past the arrays, so callers stop by comparing number() with
  // the count, or walk a range instead.

  // By the node at number: move or line number+1, arc number+3; a curve node
  // (never met at the number of a view on a valid path) gives 1.
  unsigned long next_number() const noexcept;
  // By the node at number-1: move or line number-1, curve number-3, arc 0.
  // 0 at number 0.
  unsigned long prev_number() const noexcept;
  // GetCurveSegment at next_number() / prev_number(), without a count. prev()
  // at number 0 is absent.
  MavikUtils::optional<CurveSegmentT> next() const noexcept;
  MavikUtils::optional<CurveSegmentT> prev() const noexcept;

  // ---- Geometry ----
  //
  // Calls on an invalid view return false and leave their outputs alone.

  // The nearest point of the view to p. A move view answers its point with
  // t = 0; line and curve views search their segment (see closest.h). False
  // if nothing is found; out is then unchanged.
  bool FindClosestPoint(T p, ClosestPoint<T, SegmentPosition>& out) const;
  // Whether p lies within tolerance of the view: squared distance at most
  // tolerance squared. False for NaN input or when no nearest point exists.
  bool IsPointOnCurve(T const& p, double tolerance) const;
  // Whether the two views meet. With includeProximity an end point of either
  // within 10 units (squared distance at most 100) of the other view counts.
  // Move views never intersect. Line pairs use a strict crossing test (see
  // curvesegment_intersect.cpp); pairs with a Bezier first reject on their
  // control-point boxes.
  bool DoesIntersectWith(CurveSegmentT other, bool includeProximity) const;

  // ---- Appending ----
  //
  // Appends the view's piece to target, attached wherever target ends (no
  // check that the points agree): a move view moves a final lone move of the
  // target, or else starts a subpath; a line or curve view adds its end (with
  // its control points), preceded by a move to its start only when target is
  // empty. With keepClosed, a closing segment (closed bit on its end node)
  // then closes target's last subpath with CloseLastSubpath(0.0, false), so
  // no line is added. An invalid view appends nothing.
  void AppendTo(PolycurveT<T>& target, bool keepClosed) const;

 private:
  static T const& Zero() noexcept {
    static const T zero{};
    return zero;
  }

  unsigned long number_ = 0;
  MavikUtils::array_view<NODETYPE const> nodes_;
  MavikUtils::array_view<T const> points_;
};

// The view at number of raw arrays of count entries (count absent: unknown,
// the arrays are read up to number+2 unchecked):
//   - absent if count is given and number >= count, or an array is null;
//   - the node at number decides: move -> move view; line -> line view from
//     number-1 (absent at 0); curve -> absent; arc -> curve view from number-1,
//     absent at 0, when number+2 is not below the count, or unless number+1 is
//     an arc and number+2 a curve.
template <class T>
MavikUtils::optional<CurveSegmentT<T>> GetCurveSegment(unsigned long number, NODETYPE const* nodes, T const* points,
                                                       MavikUtils::optional<unsigned long> count) noexcept;

// The getter of a segment walk: the view at a number of fixed arrays.
template <class T>
struct CurveSegmentGetter {
  using state_type = unsigned long;
  using value_type = CurveSegmentT<T>;

  NODETYPE const* nodes = nullptr;
  T const* points = nullptr;
  unsigned long count = 0;

  CurveSegmentGetter() = default;
  CurveSegmentGetter(NODETYPE const* n, T const* p, unsigned long c) : nodes(n), points(p), count(c) {}
  // Over the curve's arrays; the count falls back on GetPointCount().
  explicit CurveSegmentGetter(PolycurveT<T> const& curve, MavikUtils::optional<unsigned long> c = MavikUtils::nullopt)
      : nodes(curve.GetNodeTypes()), points(curve.GetPoints()), count(c ? *c : curve.GetPointCount()) {}

  MavikUtils::optional<CurveSegmentT<T>> operator()(unsigned long number) const noexcept {
    return GetCurveSegment<T>(number, nodes, points, count);
  }
};

// The step of a segment walk, by the node at number: move or line number+1,
// arc number+3, curve 1. A walk never steps from a curve node, because no
// view exists at one.
template <class T>
struct NextCurveSegment {
  NODETYPE const* nodes = nullptr;

  NextCurveSegment() = default;
  explicit NextCurveSegment(NODETYPE const* n) : nodes(n) {}

  unsigned long operator()(unsigned long number) const noexcept { return Step(nodes[number], number); }

  // The step from number, whose node byte is node.
  static unsigned long Step(NODETYPE node, unsigned long number) noexcept {
    switch (GetSegmentType(node)) {
      case SegmentType::move:
      case SegmentType::line:
        return number + 1;
      case SegmentType::arc:
        return number + 3;
      case SegmentType::curve:
        break;
    }
    return 1;
  }
};

// Ranges of views. Each is a RangeView of factory iterators that evaluate the
// view at their number on demand and end when the getter yields none or the
// number reaches the range's end. The curve forms keep a copy of the curve
// inside the range (one reference), so the views stay valid while the range
// lives even if the original handle is written to or dropped.
template <class T>
struct details {
  using iterator = MavikUtils::factory_iterator_t<CurveSegmentGetter<T>, NextCurveSegment<T>>;
  using range = MavikUtils::RangeView<iterator>;

  // All views of the curve, from number 0.
  static range GetCurveSegments_Base(PolycurveT<T> curve);
  // The views with numbers from the range's begin up to its end; the getter's
  // count is the range's end (clipped to the curve), so a piece that would
  // reach past it is absent and ends the walk. The begin must be a number.
  static range GetCurveSegments_Range(PolycurveT<T> curve, MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>> r);
  // The same over raw arrays, which must hold at least the range's end
  // entries. Null arrays give an empty range.
  static range GetCurveSegments_Raw(NODETYPE const* nodes, T const* points,
                                    MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>> r);
};

// Whether the walk over the curve (or over the numbers of r) consists of
// well-formed pieces and lands exactly on the end: a move view of 1 node, a
// line view of 2, a curve view of 4 with two arcs inside, and never an arc
// at the end of a view. An empty curve is valid; a walk that stops early at a
// number with no view is not. A range end beyond the curve gives false. O(n).
template <class T>
bool ValidSegments(PolycurveT<T> const& curve);
template <class T>
bool ValidSegments(PolycurveT<T> const& curve, MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>> r);

using CurveSegment = CurveSegmentT<Framework::common_types::POINT>;
using CurveSegmentD = CurveSegmentT<MavikMath::V>;

extern template class CurveSegmentT<Framework::common_types::POINT>;
extern template class CurveSegmentT<MavikMath::V>;
extern template struct details<Framework::common_types::POINT>;
extern template struct details<MavikMath::V>;

}  // namespace OstraCrv
