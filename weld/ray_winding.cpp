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
// The same with the roles of x and y swapped gives a ray towards -y, for a
// place on a horizontal edge (which a horizontal ray would run along): there
// a crossing that goes right counts +1 and left -1 (swapping the axes
// mirrors the plane, which turns the sign).
//
// The segments are sorted into bands of their boxes across the ray (one
// flat array of segment indices per band, found by counting first), built
// for each direction of ray on its first query, so that a query visits the
// segments of one band, in order along the ray up to the place: O(n) to
// build for n segments (bands as wide as a segment's mean extent keep each
// in a few bands on average), O(m log m) to order a band of m segments on
// its first visit, and per query the segments of the band that begin
// before the place. A query fails (the caller falls back to a
// probe through the engine) when some segment other than the one the place
// lies on comes within the tolerance of the place.
#include <algorithm>
#include <cmath>
#include <limits>
#include <utility>

#include "ostracrv/math/bezier_basis.h"
#include "ostracrv/math/bezier_closest.h"
#include "ostracrv/math/polynomial.h"
#include "weld_internal.h"

namespace OstraCrv::weld_detail {

using MavikMath::D;
using MavikMath::V;

namespace {

constexpr int kBisections = 60;  // halvings of a monotone piece: past double precision

// The coordinate across the ray (the one whose value the ray keeps) and the
// one along it, for a ray towards -x (axis 0) or -y (axis 1).
inline double Across(V const& p, int axis) noexcept { return axis == 0 ? p.y : p.x; }
inline double Along(V const& p, int axis) noexcept { return axis == 0 ? p.x : p.y; }
// A box's extent across the ray, and where it begins along it.
inline double Low(MavikMath::BoundsT<double> const& b, int axis) noexcept { return axis == 0 ? b.bottom : b.left; }
inline double High(MavikMath::BoundsT<double> const& b, int axis) noexcept { return axis == 0 ? b.top : b.right; }
inline double LowAlong(MavikMath::BoundsT<double> const& b, int axis) noexcept {
  return axis == 0 ? b.left : b.bottom;
}

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
}

void RayWinding::Build(int axis) const {
  Index& x = index_[axis];
  x.built = true;
  if (pieces_.empty()) return;
  // Bands about as wide as the mean extent of a piece across the ray: a
  // piece then sits in about two bands (the index stays O(n)), and a band
  // holds about twice the pieces that span its middle. At most one band per
  // two pieces, for long thin shapes.
  double extent = 0.0;
  for (Piece const& p : pieces_) extent += High(p.box, axis) - Low(p.box, axis);
  const double span = High(box_, axis) - Low(box_, axis);
  const double maxBands = double(std::max<size_t>(1, pieces_.size() / 2));
  const double bands = extent > 0.0 ? span * double(pieces_.size()) / extent : maxBands;
  x.bandCount = size_t(std::clamp(bands, 1.0, maxBands));
  // Count the pieces of each band, turn the counts into offsets, then fill
  // in storage order. A band is put in order along the ray when a query
  // first visits it (see Winding).
  x.firstBand.resize(pieces_.size());
  std::vector<uint32_t> lastBand(pieces_.size());
  x.bandStart.assign(x.bandCount + 1, 0);
  for (size_t k = 0; k < pieces_.size(); ++k) {
    x.firstBand[k] = uint32_t(Band(x, Low(pieces_[k].box, axis), axis));
    lastBand[k] = uint32_t(Band(x, High(pieces_[k].box, axis), axis));
    for (size_t b = x.firstBand[k]; b <= lastBand[k]; ++b) ++x.bandStart[b + 1];
  }
  for (size_t b = 0; b < x.bandCount; ++b) x.bandStart[b + 1] += x.bandStart[b];
  x.items.resize(x.bandStart[x.bandCount]);
  std::vector<uint32_t> fill(x.bandStart.begin(), x.bandStart.end() - 1);
  for (uint32_t k = 0; k < uint32_t(pieces_.size()); ++k)
    for (size_t b = x.firstBand[k]; b <= lastBand[k]; ++b) x.items[fill[b]++] = k;
  x.sorted.assign(x.bandCount, 0);
}

size_t RayWinding::Band(Index const& x, double across, int axis) const noexcept {
  const double lowAll = Low(box_, axis), h = High(box_, axis) - lowAll;
  if (!(h > 0.0)) return 0;
  const double f = (across - lowAll) / h * double(x.bandCount);
  return size_t(std::clamp(f, 0.0, double(x.bandCount - 1)));
}

bool RayWinding::Winding(V q, double tolerance, V const* skip, double skipT, int& winding, int axis) const {
  winding = 0;
  if (!std::isfinite(q.x) || !std::isfinite(q.y)) return false;
  axis = axis == 0 ? 0 : 1;
  const double qa = Across(q, axis), qb = Along(q, axis);
  if (pieces_.empty() || qa + tolerance < Low(box_, axis) || qa - tolerance > High(box_, axis)) return true;
  if (!index_[axis].built) Build(axis);
  Index& x = index_[axis];
  const double t2 = tolerance * tolerance;
  const size_t lo = Band(x, qa - tolerance, axis), hi = Band(x, qa + tolerance, axis);
  // A segment can sit in several bands: visit each once by its first band
  // within the query's range.
  for (size_t b = lo; b <= hi; ++b) {
    if (!x.sorted[b]) {
      // In order of where the pieces begin along the ray (then storage
      // order), O(m log m) for the m pieces of the band, once: a query then
      // stops at the first piece that begins beyond the place (plus the
      // tolerance), since nothing from there on crosses the ray or comes
      // near. Only the bands that queries visit are sorted.
      x.sorted[b] = 1;
      std::sort(x.items.begin() + long(x.bandStart[b]), x.items.begin() + long(x.bandStart[b + 1]),
                [&](uint32_t p, uint32_t q) {
                  const double lp = LowAlong(pieces_[p].box, axis), lq = LowAlong(pieces_[q].box, axis);
                  return lp < lq || (lp == lq && p < q);
                });
    }
    for (size_t i = x.bandStart[b]; i < x.bandStart[b + 1]; ++i) {
      const uint32_t k = x.items[i];
      Piece const& s = pieces_[k];
      if (LowAlong(s.box, axis) > qb + tolerance) break;
      if (std::max(size_t(x.firstBand[k]), lo) != b) continue;
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
      if (!(qa >= Low(s.box, axis) && qa <= High(s.box, axis)) || LowAlong(s.box, axis) >= qb) continue;
      winding += Crossings(s, q, own ? skipT : std::numeric_limits<double>::quiet_NaN(), axis);
    }
  }
  return true;
}

int RayWinding::Crossings(Piece const& s, V q, double skipT, int axis) {
  const double y = Across(q, axis), qx = Along(q, axis);
  // A crossing towards smaller values across the ray counts +1 for the ray
  // towards -x, -1 for the ray towards -y (see the file comment).
  const int falling = axis == 0 ? 1 : -1;
  if (!s.bezier) {
    const V a = s.points[0], b = s.points[1];
    const double ay = Across(a, axis), by = Across(b, axis);
    if ((ay <= y) == (by <= y)) return 0;
    const double t = (y - ay) / (by - ay);
    if (std::isfinite(skipT) && std::fabs(t - skipT) <= 1e-9) return 0;
    const double ax = Along(a, axis);
    const double x = ax + t * (Along(b, axis) - ax);
    if (!(x < qx)) return 0;
    return by < ay ? falling : -falling;
  }
  const auto pb = MavikMath::CubicBezier::GetPowerBasis(s.points);
  const double pa = Across(pb.a, axis), pbb = Across(pb.b, axis), pc = Across(pb.c, axis), pd = Across(pb.d, axis);
  // y'(t) = 3 a t^2 + 2 b t + c: its roots (in ascending order) cut the
  // curve into monotone pieces.
  double roots[2];
  const int nr = MavikMath::SolveQuadratic(3.0 * pa, 2.0 * pbb, pc, roots);
  double cuts[4] = {0.0, 0.0, 0.0, 1.0};
  int nc = 1;
  for (int r = 0; r < nr; ++r)
    if (roots[r] > 0.0 && roots[r] < 1.0) cuts[nc++] = roots[r];
  cuts[nc++] = 1.0;
  const double y0End = Across(s.points[0], axis), y1End = Across(s.points[3], axis);
  auto yAt = [&](double t) {
    if (t == 0.0) return y0End;
    if (t == 1.0) return y1End;
    return ((pa * t + pbb) * t + pc) * t + pd;
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
    const double x = ((Along(pb.a, axis) * t + Along(pb.b, axis)) * t + Along(pb.c, axis)) * t + Along(pb.d, axis);
    if (!(x < qx)) continue;
    w += rising ? -falling : falling;
  }
  return w;
}

}  // namespace OstraCrv::weld_detail
