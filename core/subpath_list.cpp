// Subpath listing: one forward pass that jumps from each first node to the
// node before the next move, so the whole path is read once, O(n).
#include "ostracrv/core/subpath_list.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;

std::vector<SubcurveRange> GetSubpathRanges(NODETYPE const* nodes, int n) {
  std::vector<SubcurveRange> out;
  if (!nodes || n < 1) return out;
  for (int first = 0; first < n;) {
    const int last = CRV_LastNodeOfThisSubpath(nodes, n, first);
    out.push_back({static_cast<unsigned long>(first), static_cast<unsigned long>(last - first + 1)});
    first = last + 1;
  }
  return out;
}

template <class T>
bool GetSubPaths(T const* points, NODETYPE const* nodes, int n, std::vector<ConstDrawCurveT<T>>& out, int limit) {
  out.clear();
  if (!points || !nodes || n < 1) return false;
  for (int first = 0; first < n;) {
    const int last = CRV_LastNodeOfThisSubpath(nodes, n, first);
    out.push_back({points + first, nodes + first, last - first + 1, limit < 0 || first >= limit});
    first = last + 1;
  }
  return !out.empty();
}

template bool GetSubPaths<POINT>(POINT const*, NODETYPE const*, int, std::vector<ConstDrawCurveT<POINT>>&, int);
template bool GetSubPaths<V>(V const*, NODETYPE const*, int, std::vector<ConstDrawCurveT<V>>&, int);

}  // namespace OstraCrv
