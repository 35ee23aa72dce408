// Corner arcs.
//
// A corner arc is drawn with a handle rule that is linear in the angle:
// h = r angle 0.55078 / (pi/2). At a quarter turn this is close to the exact
// 0.5523 of the circle approximation, and for the small angles of most
// corners it errs by far less than the tolerances of offsetting; the rule is
// kept because corners of existing outlines were made with it. The angle is
// pi/2 - atan(c/s) with c and s its cosine and sine, evaluated as
// pi/2 - atan2(c, s), which is the same angle and stays finite at c = +-1.
//
// The handles leave a and b perpendicular to the radii, on the side of the
// chord a->b, so that the Bezier bulges away from the centre.
//
// Wider corners (past a right angle by a cosine margin of 0.001) are split at
// a middle point on the circle: offsetting gives the direction of the middle,
// fillets take the ray through the chord's midpoint, which fails when the
// chord passes within 5.0 of the centre (a corner so sharp that the ray is
// ill-defined). Fillets refuse nearly straight corners (cosine 0.9999), where
// an arc would be a sliver.
#include "ostracrv/shapes/corner_arc.h"

#include <cmath>

#include "arc_common.h"
#include "ostracrv/shapes/curve_append.h"

namespace OstraCrv {

using namespace arc_internal;

namespace {

// Cosine below which a corner arc is split into two Beziers.
constexpr double kTwoPieceCosine = -0.001;
// Cosine at or above which a fillet arc is too straight to draw.
constexpr double kFilletStraightCosine = 0.9999;
// A fillet chord passing closer than this to the centre has no usable middle.
constexpr double kFilletMinMidDistance = 5.0;

// Cosine of the angle at center between a and b; NaN for a degenerate or
// non-finite pair. P is |a - center|^2 |b - center|^2.
double CornerCosine(const D& u, const D& v, double P) noexcept { return MavikMath::Dot(u, v) / std::sqrt(P); }

}  // namespace

int GetArcSegmentHandles(V* handles, const V& center, const V& a, const V& b) {
  if (!handles || !center.IsFinite() || !a.IsFinite() || !b.IsFinite()) return 0;
  const D u = a - center, v = b - center;
  const double uu = u.SquaredLength(), vv = v.SquaredLength();
  if (!(uu * vv > 0.0) || !std::isfinite(uu * vv)) return 0;
  const double r = std::sqrt(uu);
  double c = MavikMath::Dot(u, v) / (r * std::sqrt(vv));
  c = c > 1.0 ? 1.0 : (c < -1.0 ? -1.0 : c);
  const double s = std::sqrt(1.0 - c * c);
  const double angle = kHalfPi - std::atan2(c, s);
  const double h = r * angle * kCornerArcHandle / kHalfPi;
  const D p = ScaledLeftNormal(u, h), q = ScaledLeftNormal(v, h);
  if (MavikMath::Dot(b - a, p) < 0.0) {
    handles[0] = a - p;
    handles[1] = b + q;
  } else {
    handles[0] = a + p;
    handles[1] = b - q;
  }
  return 1;
}

namespace {

// A wide corner arc as two Beziers meeting at m, the arc's middle: writes the
// handles of both and m in between (h0, h1, m, h2, h3); 0 when either piece
// has none.
int SplitArcHandles(V* out, const V& center, const V& a, const V& m, const V& b) {
  out[2] = m;
  const int ok = GetArcSegmentHandles(out, center, a, m);
  return ok ? GetArcSegmentHandles(out + 3, center, m, b) : ok;
}

}  // namespace

int BuildCircularArc(const V& center, const D& direction, const V& a, const V& b, double radius, V* out,
                     int& count) {
  if (!out) return 0;
  const D u = a - center, v = b - center;
  const double P = u.SquaredLength() * v.SquaredLength();
  if (P != 0.0) {
    const double c = CornerCosine(u, v, P);
    if (c < kTwoPieceCosine) {
      D dir = direction;
      const V m = dir.Normalize() ? center + dir * radius : center + D{radius, direction.y};
      count = 5;
      return SplitArcHandles(out, center, a, m, b);
    }
    if (!(c < 1.0)) return 0;
  }
  count = 2;
  return GetArcSegmentHandles(out, center, a, b);
}

int BuildCircularArc(const V& center, const V& a, const V& b, double radius, V* out, unsigned long& count) {
  count = 0;
  if (!out) return 0;
  const D u = a - center, v = b - center;
  const double P = u.SquaredLength() * v.SquaredLength();
  if (P != 0.0) {
    const double c = CornerCosine(u, v, P);
    if (c < kTwoPieceCosine) {
      D toMid = (a + b) * 0.5 - center;
      // The chord passes too close to the centre (NaN fails as well).
      if (!(toMid.Length() >= kFilletMinMidDistance)) return 0;
      toMid.Normalize();
      const V m = center + toMid * radius;
      count = 5;
      return SplitArcHandles(out, center, a, m, b);
    }
    if (!(c < kFilletStraightCosine)) return 0;
  }
  const int ok = GetArcSegmentHandles(out, center, a, b);
  count = ok ? 2 : 0;
  return ok;
}

void AddArc(const V& center, const D& direction, const V& a, const V& b, double radius, std::vector<V>& points,
            std::vector<NODETYPE>& nodes, double tolerance) {
  V out[5];
  int count = 0;
  const int ok = BuildCircularArc(center, direction, a, b, radius, out, count);
  // An arc continues the outline it is added to: a start off the curve's end
  // is bridged by a line rather than opening a new subpath; an empty curve
  // starts with a move.
  const bool continuing = !points.empty();
  using Bezier = MavikMath::CubicBezier::bezier2dT<V>;
  if (ok && count == 5) {
    AddBezier(points, nodes, Bezier{{a, out[0], out[1], out[2]}}, tolerance, false, continuing);
    AddBezier(points, nodes, Bezier{{out[2], out[3], out[4], b}}, tolerance, false, true);
    return;
  }
  if (ok && count == 2) {
    AddBezier(points, nodes, Bezier{{a, out[0], out[1], b}}, tolerance, false, continuing);
    return;
  }
  if (!points.empty() && a.IsFinite() && b.IsFinite()) points.back() = (a + b) * 0.5;
}

}  // namespace OstraCrv
