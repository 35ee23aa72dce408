// Line against rectangle; see line_rect.h. Four side tests, O(1).
#include "ostracrv/math/line_rect.h"

#include <cmath>

namespace MavikMath {

namespace {
using Framework::common_types::POINT;
using Framework::common_types::RECT;
}  // namespace

template <class P, class R>
bool LineRectIntersection(const P& fromP, const P& toP, const R& rect, double& enter, double& leave) noexcept {
  const V from = ToV(fromP), to = ToV(toP);
  const double left = rect.left, right = rect.right, top = rect.top, bottom = rect.bottom;
  if (!from.IsFinite() || !to.IsFinite() || !std::isfinite(left) || !std::isfinite(right) ||
      !std::isfinite(top) || !std::isfinite(bottom))
    return false;
  if (left > right || bottom > top) return false;
  const D d = to - from;
  double hits[2];
  int n = 0;
  auto vertical = [&](double x) {
    if (n == 2 || d.x == 0.0) return;
    const double s = (x - from.x) / d.x;
    const double y = from.y + s * d.y;
    if (y >= bottom && y <= top) hits[n++] = s;
  };
  auto horizontal = [&](double y) {
    if (n == 2 || d.y == 0.0) return;
    const double s = (y - from.y) / d.y;
    const double x = from.x + s * d.x;
    if (x >= left && x <= right) hits[n++] = s;
  };
  vertical(left);
  vertical(right);
  horizontal(top);
  horizontal(bottom);
  if (n < 2) return false;
  enter = hits[0] < hits[1] ? hits[0] : hits[1];
  leave = hits[0] < hits[1] ? hits[1] : hits[0];
  return true;
}

template bool LineRectIntersection<V, RECT>(const V&, const V&, const RECT&, double&, double&) noexcept;
template bool LineRectIntersection<V, BoundsT<double>>(const V&, const V&, const BoundsT<double>&, double&,
                                                       double&) noexcept;
template bool LineRectIntersection<POINT, RECT>(const POINT&, const POINT&, const RECT&, double&, double&) noexcept;
template bool LineRectIntersection<POINT, BoundsT<double>>(const POINT&, const POINT&, const BoundsT<double>&,
                                                           double&, double&) noexcept;

}  // namespace MavikMath
