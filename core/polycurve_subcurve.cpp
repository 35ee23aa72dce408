// Pieces of a curve between two positions.
//
// A position is (start node of a segment, parameter t). The piece from
// (a, t0) to (b, t1) is a copy of the nodes from a through the end of the
// segment at b, cut in place: the first segment keeps what lies behind t0,
// the last what lies before t1 (one Subsection when both are the same
// segment). Only the two end segments are recomputed, so the cost is the copy:
// O(length of the piece).
//
// Positions on segment ends are moved onto the adjacent segment first: t0 = 1
// starts on the next segment (skipping dangling moves into the next subpath),
// t1 = 0 ends on the previous real segment. A piece that ends before it starts
// wraps round a closed subpath: it is the stretch up to the closing point plus
// the stretch from the first point on, joined at the closing point, which
// both share.
//
// Flags of the piece: its ends are open user nodes (the first a move); a node
// made by a cut is not selected. Where the piece crosses subpath borders, the
// partial subpath at its front and the one at its back are opened (the front
// one's end node and the back one's move lose the closed bit) and subpaths
// lying whole inside keep their closure, so the piece is a valid path.
#include <cmath>

#include "ostracrv/core/path_reverse.h"
#include "ostracrv/core/polycurve.h"
#include "ostracrv/core/segment_cut.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr double kEps = MavikMath::kEpsilon;
// The wrap joins its two stretches at the closing point, which both share.
constexpr double kWrapJoinDistance = 10.0;

bool NearOne(double t) noexcept { return std::fabs(t - 1.0) <= kEps; }
bool NearZero(double t) noexcept { return std::fabs(t) <= kEps; }

// The end node of the segment that starts at s, or -1 if no segment starts
// there.
long SegmentEnd(NODETYPE const* nodes, long n, long s) noexcept {
  if (s < 0 || s + 1 >= n) return -1;
  if (IsLine(nodes[s + 1])) return s + 1;
  if (s + 3 < n && IsArc(nodes[s + 1]) && IsArc(nodes[s + 2]) && IsCurve(nodes[s + 3])) return s + 3;
  return -1;
}

}  // namespace

template <class T>
PolycurveT<T> PolycurveT<T>::GetSubcurve(unsigned long first, unsigned long count) const {
  const unsigned long n = GetPointCount();
  if (first > n) first = n;
  if (count > n - first) count = n - first;
  if (count == 0) return PolycurveT();
  PolycurveT piece(GetPoints() + first, GetNodeTypes() + first, count);
  if (!IsMove(piece.GetNodeTypes()[0])) piece.SetSegmentType(0, SegmentType::move);
  return piece;
}

template <class T>
PolycurveT<T> PolycurveT<T>::GetSubcurve(unsigned long ua, double t0, unsigned long ub, double t1,
                                         bool reversed) const {
  if (reversed) {
    PolycurveT piece = GetSubcurve(ub, t1, ua, t0, false);
    piece.Reverse();
    return piece;
  }
  // Outside 0..1 (NaN included) a parameter names no place on a segment.
  if (!(t0 >= 0.0 && t0 <= 1.0 && t1 >= 0.0 && t1 <= 1.0)) return PolycurveT();
  const long n = long(GetPointCount());
  if (ua >= (unsigned long)n || ub >= (unsigned long)n) return PolycurveT();
  long a = long(ua), b = long(ub);
  NODETYPE const* nodes = GetNodeTypes();

  if (a > b || (a == b && t0 >= t1)) {
    // Wrap round the closing point of a's subpath.
    const long f = CRV_FirstNodeOfThisSubpath(nodes, int(n), int(a));
    const long l = CRV_LastNodeOfThisSubpath(nodes, int(n), int(a));
    if (f < 0 || l <= f || b < f || b > l + 1 || !IsClosedNode(nodes[f])) return PolycurveT();
    const long s = IsCurve(nodes[l]) ? l - 3 : l - 1;  // start of the closing segment
    if (a > s) return PolycurveT();
    PolycurveT result;
    if (!(NearOne(t0) && a == s)) result = GetSubcurve(a, t0, s, 1.0, false);
    if (!(NearZero(t1) && b == f)) result.AppendWithJoin(GetSubcurve(f, 0.0, b, t1, false), false, kWrapJoinDistance);
    return result;
  }

  if (a + 1 >= n || b + 1 >= n) return PolycurveT();
  if (NearOne(t0)) {
    // Start on the next segment, past any dangling moves.
    if (IsLine(nodes[a + 1]))
      a += 1;
    else if (IsArc(nodes[a + 1]))
      a += 3;
    while (a + 1 < n && IsMove(nodes[a + 1])) ++a;
    t0 = 0.0;
    if (a >= n) return PolycurveT();
  }
  if (NearZero(t1)) {
    // End on the previous real segment: the one that ends at b, or, at a
    // move, at the last node before it (and any dangling moves).
    long j = b;
    if (IsMove(nodes[j])) {
      --j;
      while (j >= 0 && IsMove(nodes[j])) --j;
    }
    if (j < 0 || IsArc(nodes[j])) return PolycurveT();
    b = IsCurve(nodes[j]) ? j - 3 : j - 1;
    t1 = 1.0;
    if (b < 0) return PolycurveT();
  }
  if (b < a || (b == a && t0 >= t1)) return PolycurveT();
  const long endA = SegmentEnd(nodes, n, a), endB = SegmentEnd(nodes, n, b);
  if (endA < 0 || endB < 0) return PolycurveT();

  const unsigned long count = static_cast<unsigned long>(endB - a + 1);
  PolycurveT piece(GetPoints() + a, nodes + a, count);
  CurveData<T>* d = piece.ForkData();
  T* p = d->points.data();
  NODETYPE* nd = d->nodes.data();
  // A cut exactly at the end it keeps is skipped: it would only add rounding.
  if (a == b && t0 != 0.0 && t1 != 1.0) {
    OstraCrv::Subsection(t0, t1, p, nd);
  } else {
    if (t0 != 0.0) OstraCrv::RightOf(t0, p, nd);
    if (t1 != 1.0) OstraCrv::LeftOf(t1, p + (b - a), nd + (b - a));
  }

  const long c = long(count);
  nd[0] = NODETYPE((nd[0] & ~(NodeMask::kType | NodeMask::kClosed)) | NodeMask::kUser);
  nd[c - 1] = NODETYPE((nd[c - 1] & ~NodeMask::kClosed) | NodeMask::kUser);
  if (!NearZero(t0)) nd[0] = NODETYPE(nd[0] & ~NodeMask::kEnabled);
  if (!NearOne(t1)) nd[c - 1] = NODETYPE(nd[c - 1] & ~NodeMask::kEnabled);
  if (c >= 3) {
    // The partial subpath at the front ends before the first inner move; the
    // one at the back starts at the last inner move. Both are open now.
    for (long j = 1; j < c; ++j) {
      if (IsMove(nd[j])) {
        nd[j - 1] = NODETYPE((nd[j - 1] & ~NodeMask::kClosed) | NodeMask::kUser);
        break;
      }
    }
    for (long j = c - 1; j >= 1; --j) {
      if (IsMove(nd[j])) {
        nd[j] = NODETYPE(nd[j] & ~NodeMask::kClosed);
        break;
      }
    }
  }
  return piece;
}

template <class T>
PolycurveT<T> PolycurveT<T>::GetLeftSubcurve(unsigned long node, double t) const {
  if (IsEmpty() || (node == 0 && NearZero(t))) return PolycurveT();
  return GetSubcurve(0, 0.0, node, t, false);
}

template <class T>
PolycurveT<T> PolycurveT<T>::GetRightSubcurve(unsigned long node, double t) const {
  const long n = long(GetPointCount());
  if (n == 0) return PolycurveT();
  // The start of the path's last segment.
  const long s = IsLine(GetNodeTypes()[n - 1]) ? n - 2 : n - 4;
  if (s < 0 || (s == long(node) && NearOne(t))) return PolycurveT();
  return GetSubcurve(node, t, static_cast<unsigned long>(s), 1.0, false);
}

#define OSTRACRV_SUBCURVE_MEMBERS(T)                                                                 \
  template PolycurveT<T> PolycurveT<T>::GetSubcurve(unsigned long, unsigned long) const;             \
  template PolycurveT<T> PolycurveT<T>::GetSubcurve(unsigned long, double, unsigned long, double, bool) \
      const;                                                                                         \
  template PolycurveT<T> PolycurveT<T>::GetLeftSubcurve(unsigned long, double) const;                \
  template PolycurveT<T> PolycurveT<T>::GetRightSubcurve(unsigned long, double) const;

OSTRACRV_SUBCURVE_MEMBERS(POINT)
OSTRACRV_SUBCURVE_MEMBERS(V)
#undef OSTRACRV_SUBCURVE_MEMBERS

}  // namespace OstraCrv
