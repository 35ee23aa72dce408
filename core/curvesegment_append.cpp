// Appending one segment view to a curve.
//
// The view's end node decides what is appended; the start point goes in only
// when the target is empty, since otherwise the piece continues wherever the
// target ends. A closing segment closes the target with a tolerance of 0.0:
// the ends coincide when whole subpaths are copied view by view, and then no
// closing line is needed. A move view onto a target that ends in a lone move
// replaces that move, so that copying a path view by view never leaves two
// moves in a row. O(1) amortised.
#include "ostracrv/core/curvesegment.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

template <class T>
void CurveSegmentT<T>::AppendTo(PolycurveT<T>& target, bool keepClosed) const {
  if (nodes_.empty() || points_.size() != nodes_.size()) return;
  const NODETYPE end = node();
  // Copies: the view may point into the target's own arrays.
  const T start = startpoint(), last = endpoint();
  switch (::GetSegmentType(end)) {
    case SegmentType::move: {
      const unsigned long n = target.GetPointCount();
      if (n > 0 && IsMove(target.GetNodeType(int(n - 1))))
        target.SetLastPoint(start);
      else
        target.MoveTo(start);
      return;  // a move closes nothing
    }
    case SegmentType::line:
      if (target.IsEmpty()) target.MoveTo(start);
      target.LineTo(last);
      break;
    case SegmentType::curve: {
      if (points_.size() != 4) return;
      const T c1 = points_[1], c2 = points_[2];
      if (target.IsEmpty()) target.MoveTo(start);
      target.CubicTo(c1, c2, last);
      break;
    }
    case SegmentType::arc:
      return;
  }
  if (keepClosed && IsClosedNode(end)) target.CloseLastSubpath(0.0, false);
}

template void CurveSegmentT<POINT>::AppendTo(PolycurveT<POINT>&, bool) const;
template void CurveSegmentT<V>::AppendTo(PolycurveT<V>&, bool) const;

}  // namespace OstraCrv
