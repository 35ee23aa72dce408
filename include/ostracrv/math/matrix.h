// Affine transforms.
//
// A MATRIX maps (x, y) to (x m11 + y m21 + dx, x m12 + y m22 + dy): the first
// row is the image of the x axis, the second that of the y axis, the third the
// translation. Integer points are transformed in doubles and rounded half away
// from zero.
#pragma once

#include "ostracrv/core/common_types.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/math/vector2d.h"

namespace MavikMath {

struct MATRIX {
  double m11 = 1.0, m12 = 0.0;
  double m21 = 0.0, m22 = 1.0;
  double dx = 0.0, dy = 0.0;

  static constexpr MATRIX Identity() noexcept { return {}; }

  V operator()(const V& p) const noexcept { return {p.x * m11 + p.y * m21 + dx, p.x * m12 + p.y * m22 + dy}; }
  // Applies the linear part only: directions do not translate.
  D operator()(const D& d) const noexcept { return {d.x * m11 + d.y * m21, d.x * m12 + d.y * m22}; }
  // In place; a null pointer does nothing.
  void TransformPoints(Framework::common_types::POINT* points, unsigned long count) const noexcept;
  void TransformPoints(V* points, unsigned long count) const noexcept;
  double Determinant() const noexcept { return m11 * m22 - m12 * m21; }
  // Inverts in place. Fails, leaving the matrix unchanged, when the
  // determinant's magnitude is at most tolerance or not finite.
  bool Invert(double tolerance) noexcept;
  // This transform followed by then.
  MATRIX Then(const MATRIX& then) const noexcept;

  friend bool operator==(const MATRIX& a, const MATRIX& b) noexcept {
    return a.m11 == b.m11 && a.m12 == b.m12 && a.m21 == b.m21 && a.m22 == b.m22 && a.dx == b.dx && a.dy == b.dy;
  }
};

// How one rectangle maps onto another.
enum class MapMode {
  Stretch,  // each axis scaled on its own: the source fills the target exactly
  Fit,      // one scale, the whole source inside the target, centred
  Fill,     // one scale, the target covered by the source, centred
};

// The matrix from the images of the axes and a translation.
MATRIX ConstructMatrix(const D& xAxis, const D& yAxis, const D& translation) noexcept;
// The matrix that maps from onto to. A source of zero width or height keeps
// a scale of 1 on that axis so that the result stays invertible. An empty or
// non-finite rectangle has no size to map: the result is then not finite,
// so callers pass real rectangles.
MATRIX ConstructRectTransformMatrix(const BoundsT<double>& from, const BoundsT<double>& to, MapMode mode) noexcept;

}  // namespace MavikMath

using MavikMath::MATRIX;
