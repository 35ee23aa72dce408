// Closed-form area under a cubic Bezier; see bezier_area.h.
#include "ostracrv/math/bezier_area.h"

namespace MavikMath::CubicBezier {

double GetAreaUnderBezier(const V& a, const V& b, const V& c, const V& d) noexcept {
  if (!a.IsFinite() || !b.IsFinite() || !c.IsFinite() || !d.IsFinite()) return 0.0;
  const double y[4] = {d.y, c.y, b.y, a.y};
  const double dx[3] = {c.x, 2.0 * b.x, 3.0 * a.x};
  double sum = 0.0;
  for (int i = 0; i < 4; ++i)
    for (int j = 0; j < 3; ++j) sum += y[i] * dx[j] / double(i + j + 1);
  return sum;
}

}  // namespace MavikMath::CubicBezier
