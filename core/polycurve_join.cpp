// Joining and breaking methods of PolycurveT: welding an appended curve to
// open ends, closing one subpath, opening all, and the buffer wrappers of the
// node edits.
//
// Each method takes the raw arrays through the buffer protocol at the
// worst-case size of its edit (breaking adds at most 4 entries: a Bezier split
// and a move; closing with lines adds one line per open subpath), calls the
// flat edit and cuts the arrays to the count it returns.
//
// JoinEndpoints asks for its welds with this curve's old last node standing
// where other's first node would be expected. That is the established
// behaviour of the method and is kept: with only other's last end near an
// open end, other's last node is welded to it; with only other's first end
// near, that open end is joined to this curve's old last node; with both near,
// the two requested joins do not describe one inserted subpath and nothing is
// welded. The append itself always stays.
#include <algorithm>

#include "ostracrv/core/polycurve.h"
#include "ostracrv/edit/node_edits.h"
#include "ostracrv/edit/node_selection.h"
#include "ostracrv/measure/closest.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

// A Bezier split (3 entries) and the move behind it.
constexpr int kBreakGrowth = 4;

}  // namespace

template <class T>
bool PolycurveT<T>::JoinEndpoints(PolycurveT const& other, double tolerance) {
  if (other.IsEmpty()) return false;
  const PolycurveT piece(other);  // other may be this curve
  if (IsEmpty()) {
    PushBack(piece);
    return false;
  }
  const T head = piece.GetFirstPoint(), tail = piece.GetLastPoint();
  unsigned long i1 = 0, i2 = 0;
  double d1 = FindClosestOpenPointOnCurve(*this, head, i1, -1);
  double d2 = FindClosestOpenPointOnCurve(*this, tail, i2, -1);
  if (i1 == i2) {
    // Both ends want the same open end: the farther one looks for another.
    if (d1 > d2) d1 = FindClosestOpenPointOnCurve(*this, head, i1, int(i1));
    else d2 = FindClosestOpenPointOnCurve(*this, tail, i2, int(i2));
  }
  const int m = int(GetPointCount());
  PushBack(piece);
  const int n = int(GetPointCount());
  const double tol2 = tolerance * tolerance;
  const bool near1 = d1 <= tol2, near2 = d2 <= tol2;
  if (!near1 && !near2) return false;
  const int a = near1 ? int(i1) : -1, b = near2 ? int(i2) : -1;
  const int c = near1 ? m - 1 : -1, d = near2 ? n - 1 : -1;
  CurveBuffer<T> buf = GetBuffer();
  const int r = CRV_JoinTwoNodesWithOpenSubpath(buf.points, buf.nodes, buf.count, a, b, c, d);
  if (r < 0) return false;
  ReleaseBufferInternal(r);
  return true;
}

template <class T>
bool PolycurveT<T>::CloseSubpath(unsigned long node) {
  const unsigned long n = GetPointCount();
  if (node >= n) return false;
  const int f = CRV_FirstNodeOfThisSubpath(GetNodeTypes(), int(n), int(node));
  const int l = CRV_LastNodeOfThisSubpath(GetNodeTypes(), int(n), int(node));
  if (f < 0 || l <= f) return false;
  CurveBuffer<T> buf = GetBuffer();
  CRV_DisableAllNodes(buf.nodes, buf.count);
  buf.nodes[f] = NODETYPE(buf.nodes[f] | NodeMask::kEnabled);
  buf.nodes[l] = NODETYPE(buf.nodes[l] | NodeMask::kEnabled);
  JoinEnabledAddingLineSegments();
  return true;
}

template <class T>
void PolycurveT<T>::OpenAllSubpaths() {
  const int n = int(GetPointCount());
  if (n == 0 || !CRV_ContainsClosedSubpath(GetNodeTypes(), n)) return;
  CurveBuffer<T> buf = GetBuffer();
  int count = buf.count;
  for (int i = 0; i < count; ++i) {
    if (!CRV_IsLastClosedSubpathNode(buf.nodes, count, i)) continue;
    // A break at the closing node adds nothing; its tidy-up may drop stray
    // moves anywhere, so the count follows the result and the walk steps
    // back by what was dropped, to where the next closing node can now be.
    const int r = CRV_BreakAtLocation(buf.points, buf.nodes, count, i, 1.0);
    if (r < 0) continue;
    const int dropped = count - r;
    count = r;
    i = std::max(-1, i - dropped);
  }
  ReleaseBufferInternal(count);
}

template <class T>
bool PolycurveT<T>::JoinEnabledAddingLineSegments() {
  const int n = int(GetPointCount());
  if (n < 1) return false;
  const int room = n + CRV_HowManyOpenSubpaths(GetNodeTypes(), n);
  CurveBuffer<T> buf = GetBuffer(room);
  const int r = CRV_JoinEnabledAddingLineSegments(buf.points, buf.nodes, n);
  ReleaseBufferInternal(r >= 0 ? r : n);
  return r >= 0;
}

template <class T>
bool PolycurveT<T>::BreakAt(unsigned long i, double t) {
  const unsigned long n = GetPointCount();
  if (n == 0 || i >= n) return false;
  CurveBuffer<T> buf = GetBuffer(int(n) + kBreakGrowth);
  const int r = CRV_BreakAtLocation(buf.points, buf.nodes, int(n), int(i), t);
  ReleaseBufferInternal(r >= 0 ? r : int(n));
  return r >= 0;
}

#define OSTRACRV_JOIN_MEMBERS(T)                                              \
  template bool PolycurveT<T>::JoinEndpoints(PolycurveT<T> const&, double); \
  template bool PolycurveT<T>::CloseSubpath(unsigned long);                  \
  template void PolycurveT<T>::OpenAllSubpaths();                            \
  template bool PolycurveT<T>::JoinEnabledAddingLineSegments();              \
  template bool PolycurveT<T>::BreakAt(unsigned long, double);

OSTRACRV_JOIN_MEMBERS(POINT)
OSTRACRV_JOIN_MEMBERS(V)
#undef OSTRACRV_JOIN_MEMBERS

}  // namespace OstraCrv
