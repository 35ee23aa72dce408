// The farthest point; see farthest.h. One pass, strict comparison.
#include "ostracrv/measure/farthest.h"

#include <limits>

namespace OstraCrv {

template <class T>
std::pair<int, double> FindFarthestPoint(T const* points, int n, T const& p) {
  std::pair<int, double> best(-1, std::numeric_limits<double>::max());
  if (!points || n < 1) return best;
  const MavikMath::V q = MavikMath::ToV(p);
  double far = -1.0;
  for (int i = 0; i < n; ++i) {
    const double d = MavikMath::SquaredDistance(MavikMath::ToV(points[i]), q);
    if (d > far) {
      far = d;
      best = {i, d};
    }
  }
  return best;
}

template std::pair<int, double> FindFarthestPoint<Framework::common_types::POINT>(
    Framework::common_types::POINT const*, int, Framework::common_types::POINT const&);
template std::pair<int, double> FindFarthestPoint<MavikMath::V>(MavikMath::V const*, int, MavikMath::V const&);

}  // namespace OstraCrv
