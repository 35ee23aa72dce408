// SVG elliptical arcs as cubic Beziers.
//
// Method. An SVG arc is given by its end points, radii, axis rotation phi and
// two flags. Following the centre parameterisation of the SVG implementation
// notes, the half chord is turned by -phi and divided by the radii, which
// takes the ellipse to the unit circle: the start is u and the end -u around
// the chord's midpoint. With L = |u|^2:
//   - L > 1: the radii cannot reach; they grow by sqrt(L), which makes L = 1
//     and puts the centre on the midpoint (the arc is half the ellipse).
//   - otherwise the centre lies at s sqrt((1 - L) / L) (u.y, -u.x), s = -1
//     when the large-arc flag equals the sweep flag and +1 otherwise.
// Working in this unit space avoids the squares of the radii of the textbook
// formula, which overflow for large radii.
// The start angle is that of u - centre; the sweep runs to -u - centre,
// taken positive (sweep flag 1) or negative (0) and within one turn.
//
// A circular arc of angle a from (1, 0) is best matched, with tangents kept,
// by the cubic with controls at distance k = 4/3 tan(a/4) along the end
// tangents. Its largest radial error is 2 sin^6(a/4) / (27 cos^2(a/4)) of the
// radius: 2.73e-4 for a quarter turn, falling with a^6 for smaller pieces.
// The ellipse's pieces are the affine images of these unit-circle pieces, so
// their distance from the ellipse is at most that error times the larger
// radius. The arc is cut into n equal pieces of at most 90 degrees, more if a
// tolerance asks for them.
//
// The first piece starts at `from` and the last ends at `to` exactly; the
// joints between pieces are computed, not accumulated.
#include <algorithm>
#include <cmath>
#include <numbers>

#include "ostracrv/io/svg_path.h"

namespace OstraCrv {

namespace {

// Largest radial error of the cubic for a unit circular arc of angle a.
double unit_arc_error(double a) {
  const double s = std::sin(a / 4.0), c = std::cos(a / 4.0);
  const double s2 = s * s;
  return 2.0 * s2 * s2 * s2 / (27.0 * c * c);
}

constexpr int kMaxPieces = 1024;

}  // namespace

int SvgArcToCubics(MavikMath::V from, double rx, double ry, double xAxisRotationDegrees, bool largeArc, bool sweep,
                   MavikMath::V to, double tolerance, std::vector<MavikMath::V>& controls) {
  using MavikMath::V;
  constexpr double pi = std::numbers::pi;
  if (!from.IsFinite() || !to.IsFinite() || !std::isfinite(rx) || !std::isfinite(ry) ||
      !std::isfinite(xAxisRotationDegrees))
    return -1;
  if (from == to) return 0;
  rx = std::fabs(rx);
  ry = std::fabs(ry);
  if (rx == 0.0 || ry == 0.0) return -1;

  // Degrees are reduced before the conversion so that 90 and 450 give the
  // same cosine to the last bit.
  const double phi = std::fmod(xAxisRotationDegrees, 360.0) * (pi / 180.0);
  const double cosPhi = std::cos(phi), sinPhi = std::sin(phi);

  // Half chord, turned into the ellipse's frame and scaled to the unit circle.
  const double hx = (from.x - to.x) * 0.5, hy = (from.y - to.y) * 0.5;
  double ux = (cosPhi * hx + sinPhi * hy) / rx;
  double uy = (-sinPhi * hx + cosPhi * hy) / ry;
  if (!std::isfinite(ux) || !std::isfinite(uy)) return -1;
  const double L = ux * ux + uy * uy;
  if (!(L > 0.0)) return -1;  // the chord vanished below the radii's scale
  double cx = 0.0, cy = 0.0;  // centre in unit space, relative to the midpoint
  if (L >= 1.0) {
    const double grow = std::sqrt(L);
    rx *= grow;
    ry *= grow;
    ux /= grow;
    uy /= grow;
  } else {
    double f = std::sqrt((1.0 - L) / L);
    if (largeArc == sweep) f = -f;
    cx = f * uy;
    cy = -f * ux;
  }
  if (!std::isfinite(rx) || !std::isfinite(ry)) return -1;
  const double theta1 = std::atan2(uy - cy, ux - cx);
  double dtheta = std::atan2(-uy - cy, -ux - cx) - theta1;
  if (sweep && dtheta < 0.0) dtheta += 2.0 * pi;
  if (!sweep && dtheta > 0.0) dtheta -= 2.0 * pi;

  // Pieces: at most a quarter turn each (with a little slack so that an exact
  // half turn is two pieces, not three), more if the tolerance asks for them.
  int n = std::max(1, int(std::ceil(std::fabs(dtheta) / (pi / 2.0) - 1e-9)));
  if (tolerance > 0.0) {
    const double rmax = std::max(rx, ry);
    while (n < kMaxPieces && unit_arc_error(std::fabs(dtheta) / n) * rmax > tolerance) ++n;
  }
  const double step = dtheta / n;
  const double k = 4.0 / 3.0 * std::tan(step / 4.0);

  // Unit space to user space: scale by the radii, turn by phi, move to the
  // centre.
  const double mx = (from.x + to.x) * 0.5, my = (from.y + to.y) * 0.5;
  auto map = [&](double x, double y) {
    const double ex = (x + cx) * rx, ey = (y + cy) * ry;
    return V{mx + cosPhi * ex - sinPhi * ey, my + sinPhi * ex + cosPhi * ey};
  };
  // Unit-circle points relative to the centre; map() takes them relative to
  // the midpoint, hence the centre is added there.
  controls.reserve(controls.size() + 3 * std::size_t(n));
  double a0 = theta1;
  double c0 = std::cos(a0), s0 = std::sin(a0);
  for (int i = 0; i < n; ++i) {
    const double a1 = theta1 + step * (i + 1);
    const double c1 = std::cos(a1), s1 = std::sin(a1);
    controls.push_back(map(c0 - k * s0, s0 + k * c0));
    controls.push_back(map(c1 + k * s1, s1 - k * c1));
    controls.push_back(i + 1 == n ? to : map(c1, s1));
    a0 = a1;
    c0 = c1;
    s0 = s1;
  }
  return n;
}

}  // namespace OstraCrv
