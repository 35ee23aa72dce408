// Intersections of two cubic Beziers by Bezier clipping; see
// bezier_intersect.h for the method.
//
// Constants:
//   kLeafWidth 1e-10: parameter width on both curves at which clipping stops
//     and Newton's method takes over (two steps reach full precision there).
//   kStallWidth 1e-6: a pair that clipping cannot shrink and that is
//     narrower than this is solved locally instead of halved further; only
//     a tangency, a shared end point or two crossings closer than this get
//     there.
//   kMinReduction 0.8: a clip that keeps more than 80 % of both widths has
//     stalled (the usual criterion of Bezier clipping).
//   kMergeWidth 1e-6: solutions closer than this in both parameters are one;
//     the same width as kStallWidth, so the solutions of one stalled region
//     merge.
//   kBandUlps 256: slack of every band, in units in the last place of the
//     coordinate magnitude, for the rounding of cut pieces and distances.
//   kContactRel 1e-10: a solution, a contact or a coincident stretch is
//     accepted when the curves are this close, relative to the magnitude.
//   kMaxSteps 4096, kOverlapCheckStep 64: clipping steps in all, and the
//     step after which the pair is examined for a shared stretch (a
//     transversal pair needs a few dozen steps, a shared stretch makes the
//     number of pieces explode).
//   kLeafIterations 4, kLocalIterations 12: Newton steps for a converged pair
//     and for a stalled one (linear convergence at a contact).
//   kStackSize 128: each halving adds one entry; the widths stop halving at
//     kStallWidth, some 20 halvings per curve.
//   kMaxCandidates 64, kMaxResults 9.
#include "ostracrv/math/bezier_intersect.h"

#include <algorithm>
#include <cmath>
#include <limits>

#include "bezier_common.h"
#include "ostracrv/math/bezier_closest.h"
#include "ostracrv/math/bezier_split.h"
#include "ostracrv/math/polynomial.h"

namespace MavikMath::CubicBezier {

namespace {

using namespace internal;
using Framework::common_types::POINT;

constexpr double kLeafWidth = 1e-10;
constexpr double kStallWidth = 1e-6;
constexpr double kMinReduction = 0.8;
constexpr double kMergeWidth = 1e-6;
constexpr double kBandUlps = 256.0;
constexpr double kContactRel = 1e-10;
constexpr int kMaxSteps = 4096;
constexpr int kOverlapCheckStep = 64;
constexpr int kLeafIterations = 4;
constexpr int kLocalIterations = 12;
constexpr int kStackSize = 128;
constexpr int kMaxCandidates = 64;
constexpr int kMaxResults = 9;

struct Piece {
  V p[4];
  double t0, t1;
};

struct Job {
  Piece a, b;
};

struct Candidate {
  double ta, tb;
  double err2;  // squared distance of the two curve points; -1 for exact stretch ends
};

bool BoxesOverlap(const V* p, const V* q, double tol) noexcept {
  double plx, phx, ply, phy, qlx, qhx, qly, qhy;
  ControlBox(p, plx, phx, ply, phy);
  ControlBox(q, qlx, qhx, qly, qhy);
  return plx <= qhx + tol && qlx <= phx + tol && ply <= qhy + tol && qly <= phy + tol;
}

double ExtentSquared(const V* p) noexcept {
  double lx, hx, ly, hy;
  ControlBox(p, lx, hx, ly, hy);
  return (hx - lx) * (hx - lx) + (hy - ly) * (hy - ly);
}

// The parameter range in [0, 1] where the cubic Bernstein function with
// control values e[0..3] (at abscissae 0, 1/3, 2/3, 1) can lie in [lo, hi]:
// the extent of the intersection of its control polygon's convex hull with
// the band. The hull's vertices in the band and the crossings of its edges
// with the band's lines span that intersection; the edges are among the six
// segments between control points, and crossings of the other segments lie
// inside the hull, so taking all six is exact. False if empty.
bool ClipRange(const double* e, double lo, double hi, double& u0, double& u1) noexcept {
  double a = 2.0, b = -1.0;
  for (int i = 0; i < 4; ++i) {
    if (e[i] >= lo && e[i] <= hi) {
      a = std::min(a, i / 3.0);
      b = std::max(b, i / 3.0);
    }
  }
  for (int i = 0; i < 4; ++i) {
    for (int j = i + 1; j < 4; ++j) {
      const double de = e[j] - e[i];
      for (const double level : {lo, hi}) {
        if ((e[i] - level) * (e[j] - level) < 0.0) {
          const double x = (i + (j - i) * (level - e[i]) / de) / 3.0;
          a = std::min(a, x);
          b = std::max(b, x);
        }
      }
    }
  }
  if (a > b) return false;
  u0 = std::max(0.0, a);
  u1 = std::min(1.0, b);
  return u0 <= u1;
}

// Clips the piece p of the curve orig against the fat lines of q. False if
// the two cannot meet.
bool ClipAgainst(Piece& p, const V* orig, const Piece& q, double tol) noexcept {
  const V* c = q.p;
  D dir = c[3] - c[0];
  bool chord = true;
  if (dir.SquaredLength() <= 16.0 * tol * tol) {
    // A closed or nearly closed piece: the line through its start and its
    // farthest control point.
    chord = false;
    int far = 1;
    for (int i = 2; i < 4; ++i)
      if (SquaredDistance(c[i], c[0]) > SquaredDistance(c[far], c[0])) far = i;
    dir = c[far] - c[0];
    if (dir.SquaredLength() <= 16.0 * tol * tol) return true;  // a point: no line to clip by
  }
  const double len = std::sqrt(dir.SquaredLength());
  const D u{dir.x / len, dir.y / len};
  const D n{-u.y, u.x};

  // Band across the chord.
  double d[4];
  for (int i = 0; i < 4; ++i) d[i] = Dot(n, c[i] - c[0]);
  double dmin, dmax;
  if (chord) {
    const double f = d[1] * d[2] > 0.0 ? 0.75 : 4.0 / 9.0;
    dmin = f * std::min({0.0, d[1], d[2]});
    dmax = f * std::max({0.0, d[1], d[2]});
  } else {
    dmin = std::min({d[0], d[1], d[2], d[3]});
    dmax = std::max({d[0], d[1], d[2], d[3]});
  }
  double e[4];
  for (int i = 0; i < 4; ++i) e[i] = Dot(n, p.p[i] - c[0]);
  double u0, u1;
  if (!ClipRange(e, dmin - tol, dmax + tol, u0, u1)) return false;

  // Band along the chord.
  double amin = Dot(u, c[0] - c[0]), amax = amin;
  for (int i = 1; i < 4; ++i) {
    const double a = Dot(u, c[i] - c[0]);
    amin = std::min(amin, a);
    amax = std::max(amax, a);
  }
  for (int i = 0; i < 4; ++i) e[i] = Dot(u, p.p[i] - c[0]);
  double v0, v1;
  if (!ClipRange(e, amin - tol, amax + tol, v0, v1)) return false;

  const double lo = std::max(u0, v0), hi = std::min(u1, v1);
  if (lo > hi) return false;
  if (lo > 0.0 || hi < 1.0) {
    const double w = p.t1 - p.t0;
    const double t0 = p.t0 + lo * w;
    const double t1 = hi < 1.0 ? p.t0 + hi * w : p.t1;
    p.t0 = t0;
    p.t1 = std::max(t0, t1);
    Subsection(p.t0, p.t1, orig, p.p);
  }
  return true;
}

class Search {
 public:
  Search(const V* a, const V* b, bool stopAtFirst) noexcept : stopAtFirst_(stopAtFirst) {
    for (int i = 0; i < 4; ++i) {
      A_[i] = a[i];
      B_[i] = b[i];
    }
    const double mag = std::max(Magnitude(A_, 4), Magnitude(B_, 4));
    bandTol_ = kBandUlps * kEpsilon * mag;
    contactTol_ = kContactRel * mag;
    contactTol2_ = contactTol_ * contactTol_;
  }

  // Runs the whole search. Returns whether anything was found.
  bool Run() {
    if (!BoxesOverlap(A_, B_, bandTol_)) return false;
    if (Collinear()) return count_ > 0;
    if (Identical()) return true;
    Job& j = stack_[top_++];
    for (int i = 0; i < 4; ++i) {
      j.a.p[i] = A_[i];
      j.b.p[i] = B_[i];
    }
    j.a.t0 = j.b.t0 = 0.0;
    j.a.t1 = j.b.t1 = 1.0;
    while (top_ > 0 && !(stopAtFirst_ && nCand_ > 0)) {
      if (!overlapChecked_ && steps_ >= kOverlapCheckStep) {
        overlapChecked_ = true;
        DetectOverlap();
        if (stopAtFirst_ && overlap_) return true;
      }
      if (steps_ >= kMaxSteps) break;
      Job job = stack_[--top_];
      Process(job);
    }
    Finish();
    return count_ > 0;
  }

  // The merged results, ascending in ta.
  int Count() const noexcept { return count_; }
  const Candidate& Result(int i) const noexcept { return results_[i]; }
  V PointOf(const Candidate& c) const noexcept {
    const V pa = Evaluate(A_, c.ta), pb = Evaluate(B_, c.tb);
    return V{0.5 * (pa.x + pb.x), 0.5 * (pa.y + pb.y)};
  }

 private:
  void Process(Job& job) noexcept {
    for (;;) {
      if (++steps_ > kMaxSteps) return;
      if (Excluded(job)) return;
      if (!BoxesOverlap(job.a.p, job.b.p, bandTol_)) return;
      const double wa = job.a.t1 - job.a.t0, wb = job.b.t1 - job.b.t0;
      const double tiny = 16.0 * bandTol_ * bandTol_;
      if ((wa <= kLeafWidth && wb <= kLeafWidth) ||
          (ExtentSquared(job.a.p) <= tiny && ExtentSquared(job.b.p) <= tiny)) {
        Solve(job, kLeafIterations);
        return;
      }
      if (!ClipAgainst(job.a, A_, job.b, bandTol_)) return;
      if (!ClipAgainst(job.b, B_, job.a, bandTol_)) return;
      const double na = job.a.t1 - job.a.t0, nb = job.b.t1 - job.b.t0;
      if (na <= kLeafWidth && nb <= kLeafWidth) {
        Solve(job, kLeafIterations);
        return;
      }
      if (na > kMinReduction * wa && nb > kMinReduction * wb) {
        if (std::max(na, nb) <= kStallWidth || top_ + 2 > kStackSize) {
          Solve(job, kLocalIterations);
          return;
        }
        Halve(job);
        return;
      }
    }
  }

  // Halves the geometrically larger piece and pushes both halves.
  void Halve(const Job& job) noexcept {
    const bool splitA = ExtentSquared(job.a.p) >= ExtentSquared(job.b.p);
    const Piece& src = splitA ? job.a : job.b;
    const double mid = 0.5 * (src.t0 + src.t1);
    Piece left, right;
    Split(0.5, src.p, left.p, right.p);
    left.t0 = src.t0;
    left.t1 = mid;
    right.t0 = mid;
    right.t1 = src.t1;
    Job& j1 = stack_[top_++];
    j1 = job;
    (splitA ? j1.a : j1.b) = right;
    Job& j2 = stack_[top_++];
    j2 = job;
    (splitA ? j2.a : j2.b) = left;
  }

  // Newton's method on A(s) - B(u) = 0 from the middle of the pair, with a
  // tiny Levenberg-Marquardt damping so that a singular Jacobian (a contact)
  // still gives a step along the well-determined direction.
  void Solve(const Job& job, int iterations) noexcept {
    double s = 0.5 * (job.a.t0 + job.a.t1), u = 0.5 * (job.b.t0 + job.b.t1);
    double bestS = s, bestU = u, best2 = std::numeric_limits<double>::infinity();
    for (int it = 0;; ++it) {
      V pa, pb;
      D da, db;
      PointAndTangent(A_, s, pa, da);
      PointAndTangent(B_, u, pb, db);
      const D F = pa - pb;
      const double f2 = F.SquaredLength();
      if (f2 < best2) {
        best2 = f2;
        bestS = s;
        bestU = u;
      }
      if (f2 == 0.0 || it == iterations) break;
      double a11 = Dot(da, da), a22 = Dot(db, db);
      const double a12 = -Dot(da, db);
      const double r1 = -Dot(da, F), r2 = Dot(db, F);
      const double damping = 1e-12 * (a11 + a22);
      a11 += damping;
      a22 += damping;
      const double det = a11 * a22 - a12 * a12;
      if (!(det > 0.0)) break;
      const double ns = Clamp01(s + (r1 * a22 - a12 * r2) / det);
      const double nu = Clamp01(u + (a11 * r2 - a12 * r1) / det);
      if (ns == s && nu == u) break;
      s = ns;
      u = nu;
    }
    if (best2 <= contactTol2_) AddCandidate(bestS, bestU, best2);
  }

  void AddCandidate(double ta, double tb, double err2) noexcept {
    for (int i = 0; i < nCand_; ++i) {
      Candidate& c = cand_[i];
      if (std::fabs(c.ta - ta) <= kMergeWidth && std::fabs(c.tb - tb) <= kMergeWidth) {
        if (err2 < c.err2) c = Candidate{ta, tb, err2};
        return;
      }
    }
    if (nCand_ < kMaxCandidates) cand_[nCand_++] = Candidate{ta, tb, err2};
  }

  // Both curves straight and on one line: the ends of the shared part of
  // the line. Returns whether this case applied.
  bool Collinear() {
    const V* pts[8] = {&A_[0], &A_[1], &A_[2], &A_[3], &B_[0], &B_[1], &B_[2], &B_[3]};
    int bi = 0, bj = 0;
    double best = -1.0;
    for (int i = 0; i < 8; ++i)
      for (int j = i + 1; j < 8; ++j) {
        const double d = SquaredDistance(*pts[i], *pts[j]);
        if (d > best) {
          best = d;
          bi = i;
          bj = j;
        }
      }
    if (!(best > contactTol2_)) return true;  // everything within tolerance of a point
    const V o = *pts[bi];
    const double len = std::sqrt(best);
    const D u{(pts[bj]->x - o.x) / len, (pts[bj]->y - o.y) / len};
    const D n{-u.y, u.x};
    for (int i = 0; i < 8; ++i)
      if (std::fabs(Dot(n, *pts[i] - o)) > contactTol_) return false;

    double xa[4], xb[4];
    for (int i = 0; i < 4; ++i) {
      xa[i] = Dot(u, A_[i] - o);
      xb[i] = Dot(u, B_[i] - o);
    }
    double alo, ahi, blo, bhi;
    Range1D(xa, alo, ahi);
    Range1D(xb, blo, bhi);
    const double lo = std::max(alo, blo), hi = std::min(ahi, bhi);
    if (lo > hi + contactTol_) return true;
    const double ends[2] = {hi - lo <= contactTol_ ? 0.5 * (lo + hi) : lo, hi};
    const int nEnds = hi - lo <= contactTol_ ? 1 : 2;
    for (int k = 0; k < nEnds; ++k) {
      const V x{o.x + u.x * ends[k], o.y + u.y * ends[k]};
      double sa = 0.0, sb = 0.0, da = std::numeric_limits<double>::max(), db = da;
      V pa, pb;
      FindClosestPointOnBezier(A_, x, sa, pa, da);
      FindClosestPointOnBezier(B_, x, sb, pb, db);
      results_[count_++] = Candidate{sa, sb, -1.0};
      if (stopAtFirst_) break;
    }
    SortResults();
    return true;
  }

  // The same four points, or the same four in reverse.
  bool Identical() noexcept {
    bool same = true, reversed = true;
    for (int i = 0; i < 4; ++i) {
      same = same && SquaredDistance(A_[i], B_[i]) <= contactTol2_;
      reversed = reversed && SquaredDistance(A_[i], B_[3 - i]) <= contactTol2_;
    }
    if (same) {
      results_[count_++] = Candidate{0.0, 0.0, -1.0};
      results_[count_++] = Candidate{1.0, 1.0, -1.0};
      return true;
    }
    if (reversed) {
      results_[count_++] = Candidate{0.0, 1.0, -1.0};
      results_[count_++] = Candidate{1.0, 0.0, -1.0};
      return true;
    }
    return false;
  }

  // Looks for a stretch shared by the two curves. Two curved cubics share a
  // stretch only as pieces of one polynomial curve, related by a linear
  // change of parameter u = alpha s + beta, and the stretch ends at end
  // points of the two. So the end points of each curve that lie on the
  // other give pairs (s, u); every two such pairs propose a map, which is
  // accepted if the curves agree at nine points spread over the stretch.
  void DetectOverlap() {
    struct Pair {
      double s, u;
    };
    Pair pairs[16];
    int np = 0;
    std::vector<double> ts, ds;
    std::vector<V> ps;
    auto collect = [&](const V* curve, const V& target, bool onB, double fixed) {
      ts.clear();
      ds.clear();
      ps.clear();
      FindClosestPointsOnBezier(curve, target, ts, ps, ds);
      for (size_t i = 0; i < ts.size() && np < 16; ++i)
        if (ds[i] <= contactTol2_) pairs[np++] = onB ? Pair{fixed, ts[i]} : Pair{ts[i], fixed};
    };
    collect(B_, A_[0], true, 0.0);
    collect(B_, A_[3], true, 1.0);
    collect(A_, B_[0], false, 0.0);
    collect(A_, B_[3], false, 1.0);

    for (int i = 0; i < np; ++i) {
      for (int j = i + 1; j < np; ++j) {
        const double dsv = pairs[j].s - pairs[i].s, du = pairs[j].u - pairs[i].u;
        if (std::fabs(dsv) <= kMergeWidth || std::fabs(du) <= kMergeWidth) continue;
        const double alpha = du / dsv, beta = pairs[i].u - alpha * pairs[i].s;
        // s where u = alpha s + beta stays in [0, 1].
        double lo = (0.0 - beta) / alpha, hi = (1.0 - beta) / alpha;
        if (lo > hi) std::swap(lo, hi);
        lo = std::max(lo, 0.0);
        hi = std::min(hi, 1.0);
        if (!(hi - lo > kMergeWidth)) continue;
        bool agree = true;
        for (int k = 0; k <= 8 && agree; ++k) {
          const double s = lo + (hi - lo) * k / 8.0;
          agree = SquaredDistance(Evaluate(A_, s), Evaluate(B_, Clamp01(alpha * s + beta))) <= 4.0 * contactTol2_;
        }
        if (!agree) continue;
        overlap_ = true;
        alpha_ = alpha;
        beta_ = beta;
        ovLo_ = lo;
        ovHi_ = hi;
        return;
      }
    }
  }

  // A pair that lies inside the shared stretch, along its diagonal.
  bool Excluded(const Job& job) const noexcept {
    if (!overlap_) return false;
    if (job.a.t0 < ovLo_ || job.a.t1 > ovHi_) return false;
    double lo = alpha_ * job.a.t0 + beta_, hi = alpha_ * job.a.t1 + beta_;
    if (lo > hi) std::swap(lo, hi);
    return lo <= job.b.t1 + kMergeWidth && hi >= job.b.t0 - kMergeWidth;
  }

  bool OnStretch(const Candidate& c) const noexcept {
    return overlap_ && c.ta >= ovLo_ - kMergeWidth && c.ta <= ovHi_ + kMergeWidth &&
           std::fabs(alpha_ * c.ta + beta_ - c.tb) <= kMergeWidth;
  }

  void Push(const Candidate& c) noexcept {
    for (int i = 0; i < count_; ++i) {
      Candidate& r = results_[i];
      if (std::fabs(r.ta - c.ta) <= kMergeWidth && std::fabs(r.tb - c.tb) <= kMergeWidth) {
        if (c.err2 < r.err2) r = c;
        return;
      }
    }
    if (count_ < kMaxCandidates + 2) results_[count_++] = c;
  }

  void SortResults() noexcept {
    std::sort(results_, results_ + count_, [](const Candidate& x, const Candidate& y) { return x.ta < y.ta; });
  }

  // Merged, bounded, sorted results.
  void Finish() noexcept {
    if (overlap_) {
      Push(Candidate{ovLo_, Clamp01(alpha_ * ovLo_ + beta_), -1.0});
      Push(Candidate{ovHi_, Clamp01(alpha_ * ovHi_ + beta_), -1.0});
    }
    for (int i = 0; i < nCand_; ++i)
      if (!OnStretch(cand_[i])) Push(cand_[i]);
    const int limit = kMaxResults + (overlap_ ? 2 : 0);
    if (count_ > limit) {
      std::sort(results_, results_ + count_, [](const Candidate& x, const Candidate& y) { return x.err2 < y.err2; });
      count_ = limit;
    }
    SortResults();
  }

  V A_[4], B_[4];
  bool stopAtFirst_;
  double bandTol_ = 0.0, contactTol_ = 0.0, contactTol2_ = 0.0;
  bool overlapChecked_ = false, overlap_ = false;
  double alpha_ = 1.0, beta_ = 0.0, ovLo_ = 0.0, ovHi_ = 0.0;
  int steps_ = 0;
  Job stack_[kStackSize];
  int top_ = 0;
  Candidate cand_[kMaxCandidates];
  int nCand_ = 0;
  Candidate results_[kMaxCandidates + 2];
  int count_ = 0;
};

}  // namespace

template <class T>
void FindBezierIntersections(const T* a, const T* b, std::vector<double>& ta, std::vector<double>& tb,
                             std::vector<V>& points) {
  V pa[4], pb[4];
  if (!LoadFinite(a, pa) || !LoadFinite(b, pb)) return;
  if (IsDot(pa) || IsDot(pb)) return;
  Search search(pa, pb, false);
  if (!search.Run()) return;
  for (int i = 0; i < search.Count(); ++i) {
    const Candidate& c = search.Result(i);
    ta.push_back(c.ta);
    tb.push_back(c.tb);
    points.push_back(search.PointOf(c));
  }
}

template <class T>
bool DoBeziersIntersect(const T* p, const T* q) {
  V pa[4], pb[4];
  if (!LoadFinite(p, pa) || !LoadFinite(q, pb)) return false;
  if (IsDot(pa) || IsDot(pb)) return false;
  Search search(pa, pb, true);
  return search.Run();
}

#define OSTRACRV_INSTANTIATE(T)                                                                                  \
  template void FindBezierIntersections<T>(const T*, const T*, std::vector<double>&, std::vector<double>&, \
                                           std::vector<V>&);                                                 \
  template bool DoBeziersIntersect<T>(const T*, const T*);
OSTRACRV_INSTANTIATE(POINT)
OSTRACRV_INSTANTIATE(V)
#undef OSTRACRV_INSTANTIATE

}  // namespace MavikMath::CubicBezier
