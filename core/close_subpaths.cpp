// Closing all open subpaths into caller arrays, one forward pass, O(n).
//
// Single-node subpaths carry no segment and close into nothing, so they are
// left out; of a run of moves only the last, which starts a real subpath,
// survives. The closing node is always added to an open subpath (a closing
// line of zero length when its ends coincide), so the output count is known
// from the input alone.
#include "ostracrv/core/close_subpaths.h"

#include <algorithm>

namespace OstraCrv {

using Framework::common_types::POINT;

int CloseOpenSubpaths(POINT const* points, NODETYPE const* nodes, int n, POINT* outPoints, NODETYPE* outNodes) {
  if (!points || !nodes || !outPoints || !outNodes || n < 1) return 0;
  int out = 0;
  for (int f = 0; f < n;) {
    const int l = CRV_LastNodeOfThisSubpath(nodes, n, f);
    if (l > f) {
      const int start = out;
      std::copy(points + f, points + l + 1, outPoints + out);
      std::copy(nodes + f, nodes + l + 1, outNodes + out);
      out += l - f + 1;
      outNodes[start] = NODETYPE(outNodes[start] | NodeMask::kClosed);
      if (!IsClosedNode(nodes[f])) {
        outPoints[out] = points[f];
        outNodes[out] = NodeTypes::Closed::line;
        ++out;
      }
    }
    f = l + 1;
  }
  return out;
}

}  // namespace OstraCrv
