// Winding numbers of an operand at single places, by exact ray casting, for
// seeding the counts of the weld graph.
//
// The counts carried along the graph need a start: the winding number of
// the other operand at a place on each subpath, and the winding of the own
// operand beside it. A place that no other curve comes near (within the weld
// tolerance) has the same winding number in the graph as in the exact
// geometry, since the graph only snaps curves that close; so it is found
// here exactly, without building an intersection engine per place.
//
// Method: a ray from the place towards -x. A segment counts where it crosses
// the ray's line left of the place: a line by the half-open rule on its end
// heights ((a.y <= y) != (b.y <= y)); a Bezier after splitting it into
// pieces monotone in y at the roots of y'(t), each piece by the same rule on
// its end heights, where the end heights of the Bezier are its stored end
// points (so that neighbouring segments agree at their shared node) and the
// crossing parameter comes from bisection on the monotone piece. A crossing
// that goes down counts +1, up -1: counter-clockwise loops wind +1.
//
// The segments are sorted into horizontal bands of their boxes, so that a
// query visits the segments of one band: O(n) to build for n segments, and
// per query the segments whose heights span the place's. A query fails (the
// caller falls back to a probe through the engine) when some segment other
// than the one the place lies on comes within the tolerance of the place.
#include <algorithm>
#include <cmath>
#include <limits>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_closest.h"
#include "ostracrv/math/polynomial.h"
#include "weld_internal.h"

namespace OstraCrv::weld_detail {

using MavikMath::D;
using MavikMath::V;

namespace {

constexpr int kBisections = 60;  // halvings of a monotone piece: past double precision

}  // namespace

RayWinding::RayWinding(std::vector<WeldCurve> const& curves, size_t from, size_t to) {
  for (size_t c = from; c < to && c < curves.size(); ++c) {
    WeldCurve const& wc = curves[c];
    if (!wc.points || !wc.nodes) continue;
    for (int i = 1; i < wc.count; ++i) {
      const bool line = IsLine(wc.nodes[i]);
      const bool bezier = IsCurve(wc.nodes[i]) && i >= 3;
      if (!line && !bezier) continue;
      Piece s;
      s.points = wc.points + (line ? i - 1 : i - 3);
      s.bezier = bezier;
      for (int k = 0; k <= (bezier ? 3 : 1); ++k) s.box.Add(s.points[k]);
      if (s.box.IsEmpty() || !std::isfinite(s.box.left) || !std::isfinite(s.box.right) ||
          !std::isfinite(s.box.bottom) || !std::isfinite(s.box.top))
        continue;
      box_.Add(s.box);
      pieces_.push_back(s);
    }
  }
  if (pieces_.empty()) return;
  bands_.resize(std::max<size_t>(1, pieces_.size() / 2));
  for (size_t k = 0; k < pieces_.size(); ++k)
    for (size_t b = Band(pieces_[k].box.bottom); b <= Band(pieces_[k].box.top); ++b) bands_[b].push_back(k);
}

size_t RayWinding::Band(double y) const noexcept {
  const double h = box_.top - box_.bottom;
  if (!(h > 0.0)) return 0;
  const double f = (y - box_.bottom) / h * double(bands_.size());
  return size_t(std::clamp(f, 0.0, double(bands_.size() - 1)));
}

bool RayWinding::Winding(V q, double tolerance, V const* skip, double skipT, int& winding) const {
  winding = 0;
  if (!std::isfinite(q.x) || !std::isfinite(q.y)) return false;
  if (pieces_.empty() || q.y + tolerance < box_.bottom || q.y - tolerance > box_.top) return true;
  const double t2 = tolerance * tolerance;
  const size_t lo = Band(q.y - tolerance), hi = Band(q.y + tolerance);
  // A segment can sit in several bands: visit each once by its first band
  // within the query's range.
  for (size_t b = lo; b <= hi; ++b)
    for (size_t k : bands_[b]) {
      Piece const& s = pieces_[k];
      if (std::max(Band(s.box.bottom), lo) != b) continue;
      const bool own = s.points == skip;
      // Nearness: no other segment may come within the tolerance.
      if (!own && q.x >= s.box.left - tolerance && q.x <= s.box.right + tolerance &&
          q.y >= s.box.bottom - tolerance && q.y <= s.box.top + tolerance) {
        double d2;
        if (s.bezier) {
          double t = 0.0;
          V nearest;
          d2 = std::numeric_limits<double>::max();
          MavikMath::CubicBezier::FindClosestPointOnBezier(s.points, q, t, nearest, d2);
        } else {
          const D d = s.points[1] - s.points[0];
          const double l2 = Dot(d, d);
          const double t = l2 > 0.0 ? std::clamp(Dot(q - s.points[0], d) / l2, 0.0, 1.0) : 0.0;
          d2 = MavikMath::SquaredDistance(s.points[0] + t * d, q);
        }
        if (!(d2 > t2)) return false;
      }
      if (!(q.y >= s.box.bottom && q.y <= s.box.top) || s.box.left >= q.x) continue;
      winding += Crossings(s, q, own ? skipT : std::numeric_limits<double>::quiet_NaN());
    }
  return true;
}

int RayWinding::Crossings(Piece const& s, V q, double skipT) const {
  const double y = q.y;
  if (!s.bezier) {
    const V a = s.points[0], b = s.points[1];
    if ((a.y <= y) == (b.y <= y)) return 0;
    const double t = (y - a.y) / (b.y - a.y);
    if (std::isfinite(skipT) && std::fabs(t - skipT) <= 1e-9) return 0;
    const double x = a.x + t * (b.x - a.x);
    if (!(x < q.x)) return 0;
    return b.y < a.y ? 1 : -1;
  }
  const auto pb = MavikMath::CubicBezier::GetPowerBasis(s.points);
  // y'(t) = 3 a t^2 + 2 b t + c: its roots (in ascending order) cut the
  // curve into monotone pieces.
  double roots[2];
  const int nr = MavikMath::SolveQuadratic(3.0 * pb.a.y, 2.0 * pb.b.y, pb.c.y, roots);
  double cuts[4] = {0.0, 0.0, 0.0, 1.0};
  int nc = 1;
  for (int r = 0; r < nr; ++r)
    if (roots[r] > 0.0 && roots[r] < 1.0) cuts[nc++] = roots[r];
  cuts[nc++] = 1.0;
  auto yAt = [&](double t) {
    if (t == 0.0) return s.points[0].y;
    if (t == 1.0) return s.points[3].y;
    return ((pb.a.y * t + pb.b.y) * t + pb.c.y) * t + pb.d.y;
  };
  int w = 0;
  for (int k = 0; k + 1 < nc; ++k) {
    double t0 = cuts[k], t1 = cuts[k + 1];
    const double y0 = yAt(t0), y1 = yAt(t1);
    if ((y0 <= y) == (y1 <= y)) continue;
    // Bisection on the monotone piece for y(t) = y.
    const bool rising = y1 > y0;
    for (int it = 0; it < kBisections && t1 - t0 > 0.0; ++it) {
      const double m = 0.5 * (t0 + t1);
      if (m <= t0 || m >= t1) break;
      if ((yAt(m) <= y) == rising)
        t0 = m;
      else
        t1 = m;
    }
    const double t = 0.5 * (t0 + t1);
    if (std::isfinite(skipT) && std::fabs(t - skipT) <= 1e-9) continue;
    const double x = ((pb.a.x * t + pb.b.x) * t + pb.c.x) * t + pb.d.x;
    if (!(x < q.x)) continue;
    w += rising ? -1 : 1;
  }
  return w;
}

}  // namespace OstraCrv::weld_detail
