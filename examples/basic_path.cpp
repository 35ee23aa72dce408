// A first look at the library: builds a closed triangle in the raw encoding
// and prints what the path queries answer about it.
#include <cstdio>

#include "polycurve.h"

int main() {
  const NODETYPE nodes[] = {NodeTypes::Closed::move, NodeTypes::Open::line, NodeTypes::Open::line,
                            NodeTypes::Closed::line};
  const int n = 4;
  std::printf("closed triangle: valid=%d segments=%d subpaths=%d user nodes=%d\n",
              int(OstraCrv::IsValidCurve(nodes, n)), OstraCrv::GetSegmentCount(nodes, n), CRV_NumSubpaths(nodes, n),
              CRV_GetNumberOfUserNodes(nodes, n, false));
  std::printf("NN(3)=%d PN(1)=%d PN(0)=%d twin of 0=%d\n", NN(nodes, 3, n), PN(nodes, 1, n), PN(nodes, 0, n),
              OtherClosedEnd(nodes, 0, n));
  return 0;
}
