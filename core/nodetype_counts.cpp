// Whole-path counting queries over node bytes.
//
// Each count is one branch-free pass over the bytes (see node_lanes.h for the
// eight-bytes-per-word method), O(n) with no allocation. A null array or a
// count below 1 holds nothing and counts 0; an unsigned count above INT_MAX
// is taken for a negative int that crossed the interface and also counts 0.
#include <climits>

#include "node_lanes.h"
#include "ostracrv/core/nodetype.h"

namespace {

template <class Sel>
int countIf(NODETYPE const* nodes, long long n) noexcept {
  if (!nodes || n < 1 || n > INT_MAX) return 0;
  return static_cast<int>(OstraCrv::lanes::Count<Sel>(nodes, static_cast<std::size_t>(n)));
}

}  // namespace

int CRV_HowManyLines(NODETYPE const* nodes, int n) { return countIf<OstraCrv::lanes::Line>(nodes, n); }

int CRV_HowManyCurves(NODETYPE const* nodes, int n) { return countIf<OstraCrv::lanes::Curve>(nodes, n); }

int CRV_HowManyOpenSubpaths(NODETYPE const* nodes, int n) { return countIf<OstraCrv::lanes::OpenMove>(nodes, n); }

int CRV_NumSubpaths(NODETYPE const* nodes, int n) { return countIf<OstraCrv::lanes::Move>(nodes, n); }

int CRV_GetNumberOfUserNodes(NODETYPE const* nodes, unsigned n, bool enabledOnly) {
  return enabledOnly ? countIf<OstraCrv::lanes::EnabledUserNode>(nodes, n)
                     : countIf<OstraCrv::lanes::UserNode>(nodes, n);
}

bool CRV_ContainsClosedSubpath(NODETYPE const* nodes, int n) {
  return countIf<OstraCrv::lanes::Closed>(nodes, n) > 0;
}

bool CRV_ContainsOpenSubpath(NODETYPE const* nodes, int n, bool mustHaveSegment) {
  if (!nodes || n < 1) return false;
  if (!mustHaveSegment) return countIf<OstraCrv::lanes::OpenMove>(nodes, n) > 0;
  // A dangling move (next node is a move, or none) has no segment.
  for (int i = 0; i + 1 < n; ++i)
    if (OstraCrv::lanes::Matches<OstraCrv::lanes::OpenMove>(nodes[i]) && !IsMove(nodes[i + 1])) return true;
  return false;
}

// The length of the subpath that starts at index first. The pointer already
// points at that first node while first and n index the whole array, so node
// j is read at subpathNodes[j - first]. A subpath that does not exist (null
// pointer, first outside 0..n-1) has no nodes.
int CRV_CountNodesInSubpath(NODETYPE const* subpathNodes, int first, int n) {
  if (!subpathNodes || first < 0 || first >= n) return 0;
  int j = first + 1;
  while (j < n && !IsMove(subpathNodes[j - first])) ++j;
  return j - first;
}

namespace OstraCrv {

int GetSegmentCount(NODETYPE const* nodes, int n) { return countIf<lanes::SegmentEnd>(nodes, n); }

}  // namespace OstraCrv
