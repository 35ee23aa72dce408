// Bezier against a line; see bezier_line_intersect.h for the method.
//
// Constants:
//   kEndSlack 1e-12: roots this far outside [0, 1] are the curve's ends; a
//     point on the line is off by a rounding error, which moves the root by
//     about that error over the speed of the curve.
//   kWideEndSlack 1e-6: the same for the wider second attempt.
//   kLineSlack 1e-9: tolerance of the parameter on the segment.
//   kAlongUlps 64: a control point this many ulps of the coordinate magnitude
//     from the line lies on it.
//   kTangentRel 1e-9: an extreme value of the distance this close to zero
//     (relative to the magnitude) is a touching root in the wider search.
//   kMergeWidth 1e-9: a root of the wider search this close to a plain
//     crossing is that crossing (the two searches run on different
//     intervals, so the same root may differ in the last digits).
#include "ostracrv/math/bezier_line_intersect.h"

#include <algorithm>
#include <cmath>

#include "bezier_common.h"
#include "ostracrv/math/polynomial.h"

namespace MavikMath::CubicBezier {

namespace {

using namespace internal;
using Framework::common_types::POINT;

constexpr double kEndSlack = 1e-12;
constexpr double kWideEndSlack = 1e-6;
constexpr double kLineSlack = 1e-9;
constexpr double kAlongUlps = 64.0;
constexpr double kTangentRel = 1e-9;
constexpr double kMergeWidth = 1e-9;

// Insertion sort of a handful of values.
void SortSmall(double* v, int n) noexcept {
  for (int i = 1; i < n; ++i)
    for (int j = i; j > 0 && v[j] < v[j - 1]; --j) std::swap(v[j], v[j - 1]);
}

bool Along(const double* e, double tol) noexcept {
  for (int i = 0; i < 4; ++i)
    if (std::fabs(e[i]) > tol) return false;
  return true;
}

// Roots of the cubic Bernstein function e, clamped into [0, 1], ascending,
// without duplicates. Roots are searched on [-endSlack, 1 + endSlack]; those
// within kEndSlack of an end snap to it. An
// interior root is kept if the function changes sign across it, or always
// with tangential; with tangential an extreme value within tangentTol of
// zero is a root as well. out holds 5 entries.
int Roots(const double* e, double endSlack, bool tangential, double tangentTol, double* out) noexcept {
  const double c[4] = {e[0], 3.0 * (e[1] - e[0]), 3.0 * (e[0] - 2.0 * e[1] + e[2]),
                       e[3] - e[0] + 3.0 * (e[1] - e[2])};
  double r[3];
  const int n = FindRootsInInterval(c, 3, -endSlack, 1.0 + endSlack, r);
  int m = 0;
  for (int k = 0; k < n; ++k) {
    const double t = r[k];
    const double snapped = t <= kEndSlack ? 0.0 : (t >= 1.0 - kEndSlack ? 1.0 : t);
    bool keep = tangential || snapped == 0.0 || snapped == 1.0;
    if (!keep) {
      // The sign is constant between neighbouring roots.
      const double left = k > 0 ? r[k - 1] : -endSlack;
      const double right = k + 1 < n ? r[k + 1] : 1.0 + endSlack;
      const double fl = BernsteinValue(e, 0.5 * (left + t)), fr = BernsteinValue(e, 0.5 * (t + right));
      keep = (fl < 0.0 && fr > 0.0) || (fl > 0.0 && fr < 0.0);
    }
    // A root within kEndSlack of an end is that end.
    if (keep) out[m++] = snapped;
  }
  if (tangential) {
    double q[2];
    const int nq = BernsteinStationary(e, q);
    for (int i = 0; i < nq; ++i)
      if (q[i] >= 0.0 && q[i] <= 1.0 && std::fabs(BernsteinValue(e, q[i])) <= tangentTol) out[m++] = q[i];
  }
  SortSmall(out, m);
  int w = 0;
  for (int i = 0; i < m; ++i)
    if (w == 0 || out[i] - out[w - 1] > 1e-12) out[w++] = out[i];
  return w;
}

// Signed distances of the control points from the line through l0 with unit
// normal n.
void Distances(const V* p, const V& l0, const D& n, double* e) noexcept {
  for (int i = 0; i < 4; ++i) e[i] = Dot(n, p[i] - l0);
}

// Common checks of a Bezier and a segment; false for bad input.
bool PrepareSegment(const V* p, const V& l0, const V& l1, D& d, double& L2, D& n, double& mag) noexcept {
  if (!l0.IsFinite() || !l1.IsFinite() || IsDot(p)) return false;
  d = l1 - l0;
  L2 = d.SquaredLength();
  if (!(L2 > kEpsilon)) return false;
  const double len = std::sqrt(L2);
  n = D{-d.y / len, d.x / len};
  const V ends[2] = {l0, l1};
  mag = std::max(Magnitude(p, 4), Magnitude(ends, 2));
  return true;
}

}  // namespace

bool FindBezierLineIntersection(const V* bezier, const V* line, std::vector<double>& tBezier,
                                std::vector<double>& tLine, bool /*wider*/) {
  V p[4];
  if (!LoadFinite(bezier, p) || !line) return false;
  D d, n;
  double L2, mag;
  if (!PrepareSegment(p, line[0], line[1], d, L2, n, mag)) return false;
  double e[4];
  Distances(p, line[0], n, e);
  if (Along(e, kAlongUlps * kEpsilon * mag)) return false;
  double r[5];
  const int m = Roots(e, kEndSlack, false, 0.0, r);
  bool any = false;
  for (int k = 0; k < m; ++k) {
    const double u = Dot(d, Evaluate(p, r[k]) - line[0]) / L2;
    if (u >= -kLineSlack && u <= 1.0 + kLineSlack) {
      tBezier.push_back(r[k]);
      tLine.push_back(Clamp01(u));
      any = true;
    }
  }
  return any;
}

void FindBezierIntersectionsAtX(const V* p, double x, std::vector<double>& ts, bool tryAgain) {
  V q[4];
  if (!LoadFinite(p, q) || !std::isfinite(x) || IsDot(q)) return;
  double e[4];
  for (int i = 0; i < 4; ++i) e[i] = q[i].x - x;
  const double mag = std::max(Magnitude(q, 4), std::fabs(x));
  if (Along(e, kAlongUlps * kEpsilon * mag)) return;
  double r[5];
  int m = Roots(e, kEndSlack, false, 0.0, r);
  if (tryAgain) {
    // The plain crossings as they are, plus what only the wider search sees.
    double w[5];
    const int n = Roots(e, kWideEndSlack, true, kTangentRel * mag, w);
    const int plain = m;
    for (int i = 0; i < n && m < 5; ++i) {
      bool known = false;
      for (int k = 0; k < plain; ++k) known = known || std::fabs(w[i] - r[k]) <= kMergeWidth;
      if (!known) r[m++] = w[i];
    }
    SortSmall(r, m);
  }
  ts.insert(ts.end(), r, r + m);
}

template <class T>
bool DoesBezierIntersectLineSegment(const T* p, const T* q) noexcept {
  V b[4];
  if (!LoadFinite(p, b) || !q) return false;
  const V l0 = ToV(q[0]), l1 = ToV(q[1]);
  D d, n;
  double L2, mag;
  if (!PrepareSegment(b, l0, l1, d, L2, n, mag)) return false;
  double e[4];
  Distances(b, l0, n, e);
  if (Along(e, kAlongUlps * kEpsilon * mag)) {
    // Running along the line: whether the two stretches of it overlap.
    double x[4], lo, hi;
    for (int i = 0; i < 4; ++i) x[i] = Dot(d, b[i] - l0) / L2;
    Range1D(x, lo, hi);
    return hi >= -kLineSlack && lo <= 1.0 + kLineSlack;
  }
  double r[5];
  const int m = Roots(e, kEndSlack, true, kTangentRel * mag, r);
  for (int k = 0; k < m; ++k) {
    const double u = Dot(d, Evaluate(b, r[k]) - l0) / L2;
    if (u >= -kLineSlack && u <= 1.0 + kLineSlack) return true;
  }
  return false;
}

template bool DoesBezierIntersectLineSegment<POINT>(const POINT*, const POINT*) noexcept;
template bool DoesBezierIntersectLineSegment<V>(const V*, const V*) noexcept;

}  // namespace MavikMath::CubicBezier
