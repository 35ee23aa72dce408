// Closing, cutting and replacing nodes of a curve.
//
// Closing a subpath by tolerance averages its two ends: neither end is
// preferred and each moves by half the gap. The integer form halves the sum
// with truncation towards zero. A subpath needs three nodes to close that
// way: two nodes would make a closed subpath of one segment running out and
// straight back.
//
// CloseOpenSubpaths walks the subpaths from the last to the first and moves
// each one straight to its final place (its index plus the number of closing
// nodes inserted in front of it), so every entry moves at most once: O(n).
//
// DeleteSegment turns a closed subpath first so that the doomed segment is the
// closing one; removing it then leaves one open subpath running from the
// segment's end round to its start. In an open subpath the segment's nodes
// are cut out, and what follows starts a new subpath at the segment's end.
#include <algorithm>
#include <cstdint>
#include <vector>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/core/subpath_list.h"
#include "ostracrv/core/subpath_spin.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

constexpr NODETYPE kClosedUser = NodeMask::kClosed | NodeMask::kUser;

// The midpoint of two points: (a + b) / 2 in doubles; for integers the sum is
// halved with truncation towards zero.
template <class T>
T Midpoint(const T& a, const T& b) noexcept {
  if constexpr (MavikMath::IsIntegerPoint<T>) {
    return T{int32_t((int64_t(a.x) + b.x) / 2), int32_t((int64_t(a.y) + b.y) / 2)};
  } else {
    return (a + b) * 0.5;
  }
}

void CloseEnds(NODETYPE& first, NODETYPE& last) noexcept {
  first = NODETYPE(first | kClosedUser);
  last = NODETYPE((last & ~NodeMask::kUser) | NodeMask::kClosed);
}

}  // namespace

// ---- Closing -------------------------------------------------------------------------

template <class T>
bool PolycurveT<T>::CloseLastSubpath(double tolerance, bool addLine) {
  const unsigned long n0 = GetPointCount();
  if (n0 < 2) return false;
  CurveData<T>* d = ForkData();

  auto tryClose = [d](double tol) {
    const int n = int(d->points.size());
    const int l = n - 1;
    const int f = CRV_FirstNodeOfThisSubpath(d->nodes.data(), n, l);
    if (f < 0 || n <= f + 2) return false;
    const V a = MavikMath::ToV(d->points[f]), b = MavikMath::ToV(d->points[l]);
    // "At most": a tolerance of 0.0 closes ends that coincide.
    if (!(MavikMath::SquaredDistance(a, b) <= tol * tol)) return false;
    const T m = Midpoint(d->points[f], d->points[l]);
    d->points[f] = d->points[l] = m;
    CloseEnds(d->nodes[f], d->nodes[l]);
    return true;
  };

  if (tryClose(tolerance)) return true;
  if (!addLine) return false;
  const int f = CRV_FirstNodeOfThisSubpath(d->nodes.data(), int(n0), int(n0 - 1));
  if (f < 0) return false;
  const T start = d->points[f];
  // The old end becomes an inner node: a closing node there (a closed subpath
  // whose ends do not quite meet) stops being one.
  const NODETYPE oldEnd = d->nodes[n0 - 1];
  if (IsClosedNode(oldEnd)) d->nodes[n0 - 1] = NODETYPE((oldEnd & ~NodeMask::kClosed) | NodeMask::kUser);
  d->PushBack(start, ::NodeTypes::Open::line);
  // The new end lies on the first point, so this closes any subpath of three
  // nodes or more; a lone move does not close and gets its line taken away.
  if (tryClose(1.0)) return true;
  d->Truncate(n0);
  d->nodes[n0 - 1] = oldEnd;
  return false;
}

template <class T>
bool PolycurveT<T>::CloseLastSubpathWithOptionalLine() {
  return CloseLastSubpath(0.0, true);
}

template <class T>
bool PolycurveT<T>::CloseOpenSubpaths(bool skipShort) {
  const unsigned long n = GetPointCount();
  if (n == 0) return false;
  const std::vector<SubcurveRange> ranges = GetSubpathRanges(GetNodeTypes(), int(n));
  T const* pts = GetPoints();
  NODETYPE const* nds = GetNodeTypes();

  // Per subpath: 0 nothing to do, 1 close in place, 2 close with a new line.
  std::vector<unsigned char> action(ranges.size(), 0);
  unsigned long open = 0, inserts = 0;
  for (size_t i = 0; i < ranges.size(); ++i) {
    const SubcurveRange& r = ranges[i];
    if (IsClosedNode(nds[r.first])) continue;
    ++open;
    if (skipShort && r.count < 3) continue;
    const bool meet = pts[r.first] == pts[r.first + r.count - 1];
    action[i] = meet ? 1 : 2;
    inserts += meet ? 0 : 1;
  }
  if (open == 0) return false;

  CurveBuffer<T> buf = GetBuffer(int(n + inserts));
  T* p = buf.points;
  NODETYPE* nd = buf.nodes;
  unsigned long shift = inserts;  // closing lines inserted in front of subpath i
  for (size_t i = ranges.size(); i-- > 0;) {
    const SubcurveRange& r = ranges[i];
    if (action[i] == 2) --shift;
    const unsigned long to = r.first + shift;
    if (to != r.first) {
      std::move_backward(p + r.first, p + r.first + r.count, p + to + r.count);
      std::move_backward(nd + r.first, nd + r.first + r.count, nd + to + r.count);
    }
    if (action[i] == 0) continue;
    const unsigned long last = to + r.count - 1;
    nd[to] = NODETYPE(nd[to] | kClosedUser);
    if (action[i] == 1) {
      // A lone move is its own first and last node; as a move it keeps the
      // user bit.
      if (last != to) CloseEnds(nd[to], nd[last]);
    } else {
      p[last + 1] = p[to];
      nd[last + 1] = ::NodeTypes::Closed::line;
    }
  }
  ReleaseBuffer(int(n + inserts));
  return true;
}

template <class T>
bool PolycurveT<T>::IsLastSubpathClosed() const noexcept {
  const unsigned long n = GetPointCount();
  return n > 0 && IsClosedNode(GetNodeTypes()[n - 1]);
}

template <class T>
bool PolycurveT<T>::IsLastSubpathOpen() const noexcept {
  const unsigned long n = GetPointCount();
  return n > 0 && !IsClosedNode(GetNodeTypes()[n - 1]);
}

// ---- Cutting ---------------------------------------------------------------------------

template <class T>
bool PolycurveT<T>::PopLastSegment() {
  const unsigned long n = GetPointCount();
  if (n < 2) return false;
  const NODETYPE last = GetNodeTypes()[n - 1];
  const unsigned long k = IsCurve(last) ? 3 : 1;
  if (n < k) return false;
  CurveData<T>* d = ForkData();
  if (IsClosedNode(last)) {
    const int f = CRV_FirstNodeOfThisSubpath(d->nodes.data(), int(n), int(n - 1));
    if (f >= 0) d->nodes[f] = ::NodeTypes::Open::move;
  }
  d->Truncate(n - k);
  return true;
}

template <class T>
bool PolycurveT<T>::DeleteSegment(unsigned long endNode) {
  const unsigned long count = GetPointCount();
  if (endNode >= count) return false;
  const int n = int(count), e = int(endNode);
  NODETYPE const* nds = GetNodeTypes();
  const NODETYPE end = nds[e];
  if (IsMove(end) || IsArc(end)) return false;
  const int k = IsCurve(end) ? 3 : 1;
  const int f = CRV_FirstNodeOfThisSubpath(nds, n, e);
  const int l = CRV_LastNodeOfThisSubpath(nds, n, e);
  if (f < 0 || e - k < f) return false;
  const bool single = (l - f == 3 && IsCurve(nds[l])) || (l - f == 1 && IsLine(nds[l]));

  if (IsClosedNode(nds[f]) && !single) {
    CurveBuffer<T> buf = GetBuffer();
    // Turn the subpath so that the segment closes it, then drop it.
    if (!OstraCrv::SpinSubpath(buf.points, buf.nodes, n, f, e)) return false;
    buf.nodes[f] = ::NodeTypes::Open::move;
    PathDelNext(buf.nodes, buf.points, l - k + 1, k, n);
    ReleaseBuffer(n - k);
    return true;
  }

  const int a = e - k;          // the segment's start node
  const int b = a == f ? a : a + 1;
  const int from = e == l ? e + 1 : e;
  CurveBuffer<T> buf = GetBuffer();
  if (from > b) PathDelNext(buf.nodes, buf.points, b, from - b, n);
  // What followed the segment starts a subpath of its own at the segment's
  // end (or, for a first segment, replaces the old start).
  if (e != l) buf.nodes[b] = ::NodeTypes::Open::move;
  ReleaseBuffer(n - (from - b));
  return true;
}

// ---- Replacing ---------------------------------------------------------------------------

template <class T>
bool PolycurveT<T>::ReplacePoints(unsigned long pos, unsigned long count, T const* points, NODETYPE const* nodes,
                                  unsigned long n) {
  if (n > 0 && (!points || !nodes || !IsPlausibleCount(n))) return false;
  ForkData()->Replace(pos, count, points, nodes, n);
  return true;
}

template <class T>
bool PolycurveT<T>::ReplacePoints(unsigned long pos, unsigned long count, PolycurveT const& a) {
  const PolycurveT keep(a);  // the source outlives the fork, also if a is this curve
  return ReplacePoints(pos, count, keep.GetPoints(), keep.GetNodeTypes(), keep.GetPointCount());
}

template <class T>
bool PolycurveT<T>::ReplacePoints(unsigned long pos, unsigned long count, PolycurveT const& a,
                                  PolycurveT const& b) {
  const PolycurveT keepA(a), keepB(b);
  const unsigned long at = std::min(pos, GetPointCount());
  if (!ReplacePoints(pos, count, keepA)) return false;
  const unsigned long m = keepB.GetPointCount();
  if (m > 1)
    ForkData()->Replace(at + keepA.GetPointCount(), 0, keepB.GetPoints() + 1, keepB.GetNodeTypes() + 1, m - 1);
  return true;
}

template <class T>
bool PolycurveT<T>::DeletePoints(unsigned long pos, unsigned long count) {
  return ReplacePoints(pos, count, nullptr, nullptr, 0);
}

template <class T>
bool PolycurveT<T>::InsertPoints(unsigned long pos, T const* points, NODETYPE const* nodes, unsigned long n) {
  return ReplacePoints(pos, 0, points, nodes, n);
}

// ---- Instantiation -------------------------------------------------------------------------

#define OSTRACRV_EDIT_MEMBERS(T)                                                                                 \
  template bool PolycurveT<T>::CloseLastSubpath(double, bool);                                                   \
  template bool PolycurveT<T>::CloseLastSubpathWithOptionalLine();                                               \
  template bool PolycurveT<T>::CloseOpenSubpaths(bool);                                                          \
  template bool PolycurveT<T>::IsLastSubpathClosed() const noexcept;                                             \
  template bool PolycurveT<T>::IsLastSubpathOpen() const noexcept;                                               \
  template bool PolycurveT<T>::PopLastSegment();                                                                 \
  template bool PolycurveT<T>::DeleteSegment(unsigned long);                                                     \
  template bool PolycurveT<T>::ReplacePoints(unsigned long, unsigned long, T const*, NODETYPE const*,            \
                                             unsigned long);                                                     \
  template bool PolycurveT<T>::ReplacePoints(unsigned long, unsigned long, PolycurveT<T> const&);                \
  template bool PolycurveT<T>::ReplacePoints(unsigned long, unsigned long, PolycurveT<T> const&,                 \
                                             PolycurveT<T> const&);                                              \
  template bool PolycurveT<T>::DeletePoints(unsigned long, unsigned long);                                       \
  template bool PolycurveT<T>::InsertPoints(unsigned long, T const*, NODETYPE const*, unsigned long);

OSTRACRV_EDIT_MEMBERS(POINT)
OSTRACRV_EDIT_MEMBERS(V)
#undef OSTRACRV_EDIT_MEMBERS

}  // namespace OstraCrv
