// Nearest points of a cubic Bezier; see bezier_closest.h for the method.
//
// Constants:
//   kMergeTolerance 1e-12: stationary points closer than this in t to each
//     other or to an end are one point: the roots themselves are only about
//     that accurate where two of them come close.
//   Four Newton steps polish a root that root isolation already found to
//     near full precision in the power basis; a step is kept only if it
//     brings the point closer.
#include "ostracrv/math/bezier_closest.h"

#include "bezier_common.h"
#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/polynomial.h"

namespace MavikMath::CubicBezier {

namespace {

using namespace internal;
using Framework::common_types::POINT;

constexpr double kMergeTolerance = 1e-12;
constexpr int kPolishSteps = 4;

// g at t from the Bernstein form.
double StationaryValue(const V* q, double t) noexcept {
  V b;
  D d1;
  PointAndTangent(q, t, b, d1);
  return b.x * d1.x + b.y * d1.y;
}

// Common preparation: the curve moved so that the target is the origin.
// False for unusable input.
template <class T>
bool Prepare(const T* p, const T& target, V* raw, V* q, V& origin) noexcept {
  if (!LoadFinite(p, raw)) return false;
  origin = ToV(target);
  if (!origin.IsFinite()) return false;
  if (IsDot(raw)) return false;
  Translate(raw, origin, q);
  return true;
}

// Squared distance from the origin to the control-point box of q, a lower
// bound of the distance to the curve.
double BoxSquaredDistance(const V* q) noexcept {
  double lx, hx, ly, hy;
  ControlBox(q, lx, hx, ly, hy);
  const double dx = lx > 0.0 ? lx : (hx < 0.0 ? -hx : 0.0);
  const double dy = ly > 0.0 ? ly : (hy < 0.0 ? -hy : 0.0);
  return dx * dx + dy * dy;
}

}  // namespace

template <class T>
bool FindClosestPointOnBezier(const T* p, const T& target, double& t, T& point, double& squaredDistance) noexcept {
  V raw[4], q[4], origin;
  if (!Prepare(p, target, raw, q, origin)) return false;
  if (BoxSquaredDistance(q) >= squaredDistance) return false;

  double g[6], roots[5];
  StationaryPolynomial(q, g);
  const int n = FindRootsInInterval(g, 5, 0.0, 1.0, roots);

  // Candidates in the order t = 0, the interior roots, t = 1; of equal
  // distances the first stands.
  double bestT = 0.0;
  double bestD = q[0].SquaredLength();
  for (int i = 0; i < n; ++i) {
    double r = roots[i];
    const double d = PolishNearest(q, V{0.0, 0.0}, r, 0.0, 1.0, kPolishSteps);
    if (d < bestD) {
      bestD = d;
      bestT = r;
    }
  }
  const double d1 = q[3].SquaredLength();
  if (d1 < bestD) {
    bestD = d1;
    bestT = 1.0;
  }
  if (!(bestD < squaredDistance)) return false;
  t = bestT;
  point = FromV<T>(Evaluate(raw, bestT));
  squaredDistance = bestD;
  return true;
}

template <class T>
bool FindClosestPointsOnBezier(const T* p, const T& target, std::vector<double>& ts, std::vector<T>& points,
                               std::vector<double>& squaredDistances) {
  V raw[4], q[4], origin;
  if (!Prepare(p, target, raw, q, origin)) return false;

  double g[6], roots[5];
  StationaryPolynomial(q, g);
  const int n = FindRootsInInterval(g, 5, 0.0, 1.0, roots);

  // Stationary points with the two ends, ascending and merged.
  double nodes[7];
  int m = 0;
  nodes[m++] = 0.0;
  for (int i = 0; i < n; ++i)
    if (roots[i] > nodes[m - 1] + kMergeTolerance && roots[i] < 1.0 - kMergeTolerance) nodes[m++] = roots[i];
  nodes[m++] = 1.0;

  // The sign of g between neighbouring nodes tells whether the distance
  // falls (-1) or grows (+1) there.
  int sign[6];
  for (int j = 0; j + 1 < m; ++j) {
    const double v = StationaryValue(q, 0.5 * (nodes[j] + nodes[j + 1]));
    sign[j] = v > 0.0 ? 1 : (v < 0.0 ? -1 : 0);
  }

  bool any = false;
  for (int j = 0; j < m; ++j) {
    bool isMin;
    if (j == 0) {
      isMin = sign[0] > 0;
    } else if (j == m - 1) {
      isMin = sign[m - 2] < 0;
    } else {
      isMin = sign[j - 1] <= 0 && sign[j] >= 0 && !(sign[j - 1] == 0 && sign[j] == 0);
    }
    if (!isMin) continue;
    double t = nodes[j];
    const double d = (j == 0 || j == m - 1) ? Evaluate(q, t).SquaredLength()
                                            : PolishNearest(q, V{0.0, 0.0}, t, nodes[j - 1], nodes[j + 1], kPolishSteps);
    ts.push_back(t);
    points.push_back(FromV<T>(Evaluate(raw, t)));
    squaredDistances.push_back(d);
    any = true;
  }
  return any;
}

#define OSTRACRV_INSTANTIATE(T)                                                                                    \
  template bool FindClosestPointOnBezier<T>(const T*, const T&, double&, T&, double&) noexcept;                    \
  template bool FindClosestPointsOnBezier<T>(const T*, const T&, std::vector<double>&, std::vector<T>&, \
                                             std::vector<double>&);
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace MavikMath::CubicBezier
