// Mapping a point onto a Bezier by arc length and normal distance; see
// bezier_map.h. One arc-length inversion per point (bezier_length.h).
#include "ostracrv/math/bezier_map.h"

#include <cmath>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_derivatives.h"
#include "ostracrv/math/bezier_length.h"

namespace MavikMath::CubicBezier {

V MapToBezier(const V* p, double fraction, double distance, double offset) noexcept {
  if (!IsFinite(p)) return V{0.0, 0.0};
  if (!std::isfinite(fraction) || !std::isfinite(distance) || !std::isfinite(offset)) return p[0];
  const PowerBasis q = GetPowerBasis(p);
  V point;
  D tangent;
  if (fraction < 0.0 || fraction > 1.0) {
    const bool beyondEnd = fraction > 1.0;
    const double t = beyondEnd ? 1.0 : 0.0;
    tangent = SafeBezierTangent(t, q.a, q.b, q.c, q.d);
    tangent.Normalize();
    const double excess = (beyondEnd ? fraction - 1.0 : fraction) * Length(q.a, q.b, q.c, kLengthPrecise);
    point = (beyondEnd ? p[3] : p[0]) + tangent * excess;
  } else {
    const double t = GetCurveRelativeLengthParameter(fraction, q.a, q.b, q.c, kLengthPrecise);
    point = Evaluate(p, t);
    tangent = SafeBezierTangent(t, q.a, q.b, q.c, q.d);
  }
  if (!tangent.Normalize()) return point;
  const V result = point + tangent.Perpendicular() * (distance + offset);
  return result.IsFinite() ? result : point;
}

}  // namespace MavikMath::CubicBezier
