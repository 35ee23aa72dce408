// A point inside a shape, by the parity of crossings along one row.
//
// The row runs through the middle of the first closed subpath's tight box,
// so it meets that subpath. The meetings of the outline with the row are
// taken in groups, each either a passage of the outline through the row or a
// place where it touches the row and turns back (probe_passages.cpp), and the
// groups are sorted along the row. The parity of the passages so far is the
// even-odd state of the stretch of row after a group. The first stretch with
// odd parity that has some length is inside, and its middle is taken: as far
// from both edges as the row allows.
//
// Probe ends. The integer probe runs from x = -100 to 2147483547, the double
// probe from -2147483548.0 to 2147483547.0: the whole coordinate range short
// of the extremes (a hundred units off at the top). The integer probe's start
// at -100 is kept as it is for the callers' sake, although it leaves out
// whatever lies left of it.
#include "ostracrv/measure/point_in_shape_interior.h"

#include <cmath>
#include <algorithm>
#include <cstdint>
#include <limits>
#include <type_traits>
#include <vector>

#include "ostracrv/intersect/segments.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/measure/bounds.h"
#include "probe_curves.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using Framework::common_types::RECT;
using MavikMath::V;

template <class T>
bool GetPointInShape(T const* points, NODETYPE const* nodes, int n, T& out) {
  if (!points || !nodes || n < 1) return false;
  int first = 0, count = 0;
  for (int f = 0; f >= 0 && f < n;) {
    const int last = CRV_LastNodeOfThisSubpath(nodes, n, f);
    if (last < f) break;
    if (IsClosedNode(nodes[f])) {
      first = f;
      count = last - f + 1;
      break;
    }
    f = last + 1;
  }
  if (count == 0) return false;
  const RECT box = GetTightBBox(points + first, nodes + first, count);
  if (MavikMath::IsRectEmpty(box)) return false;
  const double y = double((int64_t(box.top) + int64_t(box.bottom)) / 2);

  T ends[2];
  if constexpr (std::is_same_v<T, POINT>) {
    ends[0] = POINT{-100, int32_t(y)};
    ends[1] = POINT{2147483547, int32_t(y)};
  } else {
    ends[0] = V{-2147483548.0, y};
    ends[1] = V{2147483547.0, y};
  }
  std::vector<IntersectionCurveT<T>> curves;
  curves.emplace_back(ends, probe::kProbeNodes, 2, true, true);
  probe::AppendClosedSubpaths(points, nodes, n, curves);
  const SegmentsT<T> run = probe::RunProbe(curves);
  std::vector<probe::Passage> groups;
  const double nan = std::numeric_limits<double>::quiet_NaN();
  probe::FindPassages(run, false, y, V{nan, nan}, groups);
  if (groups.size() < 2) return false;
  std::sort(groups.begin(), groups.end(),
            [](const probe::Passage& a, const probe::Passage& b) { return a.from < b.from; });

  // Between two consecutive groups the row is clear of the outline; the
  // parity of the passages so far tells whether that stretch is inside.
  std::size_t k = 0;
  int parity = 0;
  for (; k + 1 < groups.size(); ++k) {
    if (groups[k].direction != 0) parity ^= 1;
    if (parity && groups[k + 1].from > groups[k].to) break;
  }
  if (k + 1 >= groups.size()) k = groups.size() - 2;
  const V at{(groups[k].to + groups[k + 1].from) * 0.5, y};
  if (!std::isfinite(at.x)) return false;
  out = MavikMath::FromV<T>(at);
  return true;
}

template bool GetPointInShape<POINT>(POINT const*, NODETYPE const*, int, POINT&);
template bool GetPointInShape<V>(V const*, NODETYPE const*, int, V&);

}  // namespace OstraCrv
