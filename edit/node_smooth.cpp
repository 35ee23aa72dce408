// Keeping a node's handles in line with its continuity.
//
// A smooth node has its incoming and outgoing directions on one line; a
// symmetric node has, in addition, handles of equal length. With a handle on
// both sides, the common direction is the one from the incoming handle to the
// outgoing one, and each handle keeps its length (or both take their mean).
// Next to a line there is nothing to turn on the line's side: the handle on
// the other side is turned onto the line's direction. That turned offset is
// rounded by adding half a unit before truncation; the double form adds the
// half unit as well, which places its handle up to half a unit off. This is
// the established behaviour of the edit and is kept so that both point kinds
// agree. A node between two lines has nothing to do. O(1), plus one walk of
// the subpath at a closed end.
#include <cmath>
#include <initializer_list>

#include "ostracrv/edit/node_edits.h"

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;

namespace OstraCrv {

namespace {

// p + sign * off; in the integer form the offset truncates towards zero.
template <class T>
T offsetBy(const V& p, double sign, const D& off) noexcept {
  if constexpr (MavikMath::IsIntegerPoint<T>) {
    // The sum is whole already; the conversion only saturates.
    return T{MavikMath::RoundToInt(p.x + sign * std::trunc(off.x)), MavikMath::RoundToInt(p.y + sign * std::trunc(off.y))};
  } else {
    return T{p.x + sign * off.x, p.y + sign * off.y};
  }
}

bool finite(const D& d) noexcept { return std::isfinite(d.x) && std::isfinite(d.y); }

}  // namespace

template <class T>
void SmoothNode(T* points, NODETYPE* nodes, int n, int i) {
  if (!points || !nodes || i < 0 || i >= n) return;
  const NODETYPE b = nodes[i];
  if (IsArc(b) || GetContinuity(b) == ContinuityType::cusp) return;
  if (!IsUserNode(b) && !IsClosedNode(b)) return;

  // The node where the incoming segment ends: the node itself, or for the
  // first node of a closed subpath its closing node (the same place).
  int inEnd = i;
  if (IsMove(b)) {
    inEnd = IsClosedNode(b) ? OtherClosedEnd(nodes, i, n) : -1;
    if (inEnd == i) inEnd = -1;
  }
  int hin = -1, qin = -1, hout = -1, qout = -1;
  if (inEnd >= 1) {
    if (IsCurve(nodes[inEnd]) && IsArc(nodes[inEnd - 1])) hin = inEnd - 1;
    else if (IsLine(nodes[inEnd])) qin = inEnd - 1;
  }
  const int next = NN(nodes, i, n);
  if (next != i) {
    if (IsArc(nodes[next])) hout = next;
    else if (IsLine(nodes[next])) qout = next;
  }

  const V p = MavikMath::ToV(points[i]);
  const double eps = MavikMath::kEpsilon;
  if (hin >= 0 && hout >= 0) {
    const V vin = MavikMath::ToV(points[hin]), vout = MavikMath::ToV(points[hout]);
    const D d = vout - vin;
    double a = (p - vin).Length(), c = (p - vout).Length();
    if (GetContinuity(b) == ContinuityType::symm) a = c = (a + c) * 0.5;
    const double len = d.Length();
    if (!(len > eps)) return;
    const D u = d * (1.0 / len);
    const D offIn = u * a, offOut = u * c;
    if (!finite(offIn) || !finite(offOut)) return;
    points[hin] = offsetBy<T>(p, -1.0, offIn);
    points[hout] = offsetBy<T>(p, 1.0, offOut);
  } else if (hin >= 0 && qout >= 0) {
    const V q = MavikMath::ToV(points[qout]);
    const double len = (p - q).Length();
    if (!(len > eps)) return;
    const double a = (p - MavikMath::ToV(points[hin])).Length();
    const D off = (q - p) * (a / len) + D{0.5, 0.5};
    if (!finite(off)) return;
    points[hin] = offsetBy<T>(p, -1.0, off);
  } else if (hout >= 0 && qin >= 0) {
    const V q = MavikMath::ToV(points[qin]);
    const double len = (p - q).Length();
    if (!(len > eps)) return;
    const double c = (p - MavikMath::ToV(points[hout])).Length();
    const D off = (p - q) * (c / len) + D{0.5, 0.5};
    if (!finite(off)) return;
    points[hout] = offsetBy<T>(p, 1.0, off);
  }
}

void SmoothEndNodes(NODETYPE* nodes, int a, int b, int n) {
  if (!nodes) return;
  for (const int k : {a, b}) {
    if (k < 0 || k >= n) continue;
    if (GetContinuity(nodes[k]) == ContinuityType::symm && IsNodeSmoothable(nodes, k, n))
      CRV_SetCont(nodes, n, k, ContinuityType::smooth);
  }
}

template void SmoothNode<POINT>(POINT*, NODETYPE*, int, int);
template void SmoothNode<V>(V*, NODETYPE*, int, int);

}  // namespace OstraCrv
