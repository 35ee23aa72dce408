// Affine transforms. See matrix.h for the row convention.
#include "ostracrv/math/matrix.h"

#include <algorithm>
#include <cmath>

namespace MavikMath {

void MATRIX::TransformPoints(Framework::common_types::POINT* points, unsigned long count) const noexcept {
  if (!points) return;
  for (unsigned long i = 0; i < count; ++i) points[i] = FromV<Framework::common_types::POINT>((*this)(ToV(points[i])));
}

void MATRIX::TransformPoints(V* points, unsigned long count) const noexcept {
  if (!points) return;
  for (unsigned long i = 0; i < count; ++i) points[i] = (*this)(points[i]);
}

bool MATRIX::Invert(double tolerance) noexcept {
  const double det = Determinant();
  if (!std::isfinite(det) || !(std::fabs(det) > tolerance)) return false;
  MATRIX inv;
  inv.m11 = m22 / det;
  inv.m12 = -m12 / det;
  inv.m21 = -m21 / det;
  inv.m22 = m11 / det;
  inv.dx = -(dx * inv.m11 + dy * inv.m21);
  inv.dy = -(dx * inv.m12 + dy * inv.m22);
  *this = inv;
  return true;
}

MATRIX MATRIX::Then(const MATRIX& t) const noexcept {
  MATRIX r;
  r.m11 = m11 * t.m11 + m12 * t.m21;
  r.m12 = m11 * t.m12 + m12 * t.m22;
  r.m21 = m21 * t.m11 + m22 * t.m21;
  r.m22 = m21 * t.m12 + m22 * t.m22;
  r.dx = dx * t.m11 + dy * t.m21 + t.dx;
  r.dy = dx * t.m12 + dy * t.m22 + t.dy;
  return r;
}

MATRIX ConstructMatrix(const D& xAxis, const D& yAxis, const D& translation) noexcept {
  MATRIX m;
  m.m11 = xAxis.x;
  m.m12 = xAxis.y;
  m.m21 = yAxis.x;
  m.m22 = yAxis.y;
  m.dx = translation.x;
  m.dy = translation.y;
  return m;
}

MATRIX ConstructRectTransformMatrix(const BoundsT<double>& from, const BoundsT<double>& to, MapMode mode) noexcept {
  const double fw = from.Width(), fh = from.Height();
  const double tw = to.Width(), th = to.Height();
  double sx = fw != 0.0 ? tw / fw : 1.0;
  double sy = fh != 0.0 ? th / fh : 1.0;
  if (mode != MapMode::Stretch) {
    double s;
    if (fw == 0.0) s = sy;
    else if (fh == 0.0) s = sx;
    else s = mode == MapMode::Fit ? std::min(sx, sy) : std::max(sx, sy);
    sx = sy = s;
  }
  // Centre of from goes to centre of to.
  const V fc = GetRectCenter(from), tc = GetRectCenter(to);
  return ConstructMatrix({sx, 0.0}, {0.0, sy}, {tc.x - fc.x * sx, tc.y - fc.y * sy});
}

}  // namespace MavikMath
