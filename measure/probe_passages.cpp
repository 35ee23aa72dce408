// Passages of an outline through a straight probe.
//
// Why not count the meetings one by one. The engine reports a node that lies
// within its tolerance (0.5) of the probe as a touch, whether or not the node
// is exactly on the probe, and it merges a touch with a nearby crossing only
// when the two lie within that distance. A touch at a node just off the
// probe, a crossing further along a shallow edge, a chain of tiny segments
// running along the probe, or a zero-length segment between two of them then
// leave reports that do not add up: counted one by one they can miss or
// double a crossing. What stays reliable is the side of the probe on which
// the outline lies wherever it is clearly off the probe.
//
// Method. Each closed subpath is walked in order as a cycle of pieces: every
// segment is cut at the parameters of its meetings with the probe, and each
// piece gets a side from the point of the piece farthest from the probe's
// line: +1 or -1 when that distance is at least the tolerance, 0 when the
// whole piece lies within the tolerance band (a stretch along the probe).
// The meetings met between one piece with a side and the next form a group;
// if the two sides differ the outline passed through the probe there, once,
// in that direction, otherwise it only touched the probe and turned back.
// Between two meetings a piece does not cross the probe except in the band
// next to a node within the tolerance, where the engine may have merged the
// crossing into the node's touch; the farthest point lies outside that band,
// so the side is right. A side change that no meeting marks happened beyond
// an end of the probe, which is a segment, and is no passage.
//
// The farthest point of a line piece is one of its ends; for a Bezier the
// distance across is a cubic in t, so the candidates are the piece's ends and
// the roots of its derivative. A segment without meetings whose points all
// lie clear of the band on one side needs no search. Cost: O(1) per segment
// and per meeting.
#include <algorithm>
#include <cmath>
#include <limits>

#include "ostracrv/math/polynomial.h"
#include "probe_curves.h"

namespace OstraCrv::probe {

using Framework::common_types::POINT;
using MavikMath::V;

namespace {

// One element of the cycle: a piece of a segment or a meeting between two.
struct Item {
  bool meeting = false;
  int side = 0;         // pieces: -1, 0 or +1
  double along = 0.0;   // meetings: position along the probe
  double squared = 0.0; // meetings: squared distance from p
};

struct Frame {
  bool swap;
  double row;
  double Along(const V& q) const { return swap ? q.y : q.x; }
  double Across(const V& q) const { return (swap ? q.x : q.y) - row; }
};

// The signed distance across the probe of largest size over [ta, tb].
double FarthestAcross(const V* p, bool bezier, double ta, double tb, const Frame& f) {
  if (!bezier) {
    const double a = f.Across(p[0]), b = f.Across(p[1]);
    const double da = a + (b - a) * ta, db = a + (b - a) * tb;
    return std::fabs(da) >= std::fabs(db) ? da : db;
  }
  const double c0 = f.Across(p[0]), c1 = f.Across(p[1]), c2 = f.Across(p[2]), c3 = f.Across(p[3]);
  const double a = c3 - 3.0 * c2 + 3.0 * c1 - c0, b = 3.0 * (c0 - 2.0 * c1 + c2), c = 3.0 * (c1 - c0);
  auto at = [&](double t) { return ((a * t + b) * t + c) * t + c0; };
  double best = at(ta);
  const double end = at(tb);
  if (std::fabs(end) > std::fabs(best)) best = end;
  double roots[2];
  const int k = MavikMath::SolveQuadratic(3.0 * a, 2.0 * b, c, roots);
  for (int i = 0; i < k; ++i)
    if (roots[i] > ta && roots[i] < tb) {
      const double v = at(roots[i]);
      if (std::fabs(v) > std::fabs(best)) best = v;
    }
  return best;
}

double Squared(const V& a, const V& b) { return (a.x - b.x) * (a.x - b.x) + (a.y - b.y) * (a.y - b.y); }

// Appends the pieces and meetings of segment k to items.
template <class T>
void AppendSegment(const SegmentsT<T>& run, int k, const Frame& f, const V& p, double band, std::vector<Item>& items) {
  const SegmentIntersections& seg = run.segments[k];
  const T* pts = run.SegmentPoints(k);
  if (seg.degenerate || !pts) return;
  const bool bezier = seg.type == SegmentIntersections::Bezier;
  V q[4];
  for (int i = 0; i < (bezier ? 4 : 2); ++i) q[i] = MavikMath::ToV(pts[i]);
  const V endPoint = q[bezier ? 3 : 1];
  auto piece = [&](double ta, double tb) {
    int side = 0;
    // A whole segment with every point clear of the band on one side lies on
    // that side (the curve stays in the hull of its points): no search.
    const double lo = std::min({f.Across(q[0]), f.Across(q[1]), f.Across(q[bezier ? 2 : 1]), f.Across(endPoint)});
    const double hi = std::max({f.Across(q[0]), f.Across(q[1]), f.Across(q[bezier ? 2 : 1]), f.Across(endPoint)});
    if (ta == 0.0 && tb == 1.0 && (lo >= band || hi <= -band)) {
      side = lo >= band ? 1 : -1;
    } else {
      const double d = FarthestAcross(q, bezier, ta, tb, f);
      side = std::fabs(d) < band ? 0 : (d > 0 ? 1 : -1);
    }
    // Runs of pieces on one side are one piece for the walk.
    if (!items.empty() && !items.back().meeting && items.back().side == side) return;
    Item it;
    it.side = side;
    items.push_back(it);
  };
  double t = 0.0;
  for (const Intersection* r : seg.intersections) {
    if (!r->other || run.segments[r->other->segment].curve != 0) continue;
    const double u = std::clamp(r->t, 0.0, 1.0);
    if (u > t) piece(t, u);
    Item m;
    m.meeting = true;
    m.along = f.Along(r->point);
    m.squared = Squared(Seen<T>(r->point), p);
    items.push_back(m);
    t = u;
  }
  if (t < 1.0) piece(t, 1.0);
}

// Turns the cycle of one closed subpath into passages.
void Emit(const std::vector<Item>& items, std::vector<Passage>& out) {
  const std::size_t n = items.size();
  std::size_t start = n;
  for (std::size_t i = 0; i < n; ++i)
    if (!items[i].meeting && items[i].side != 0) {
      start = i;
      break;
    }
  if (start == n) return;  // the whole outline lies along the probe
  int side = items[start].side;
  bool any = false;
  Passage g;
  for (std::size_t step = 1; step <= n; ++step) {
    const Item& it = items[(start + step) % n];
    if (it.meeting) {
      if (!any) {
        g.from = g.to = it.along;
        g.nearestSquared = it.squared;
        any = true;
      } else {
        g.from = std::min(g.from, it.along);
        g.to = std::max(g.to, it.along);
        g.nearestSquared = std::min(g.nearestSquared, it.squared);
      }
      continue;
    }
    if (it.side == 0) continue;
    if (any) {
      g.direction = it.side == side ? 0 : (it.side > side ? 1 : -1);
      out.push_back(g);
    }
    side = it.side;
    any = false;
    g = Passage();
  }
}

}  // namespace

template <class T>
void FindPassages(const SegmentsT<T>& run, bool swap, double row, const V& p, std::vector<Passage>& out) {
  const Frame f{swap, row};
  const double band = PointInShapeIntersectionSettings().touchTolerance;
  std::vector<Item> items;
  const int count = int(run.segments.size());
  for (int s = 0; s < count;) {
    // One subpath: segments linked by next, in order.
    int e = s;
    while (e + 1 < count && run.segments[e].next == e + 1) ++e;
    if (run.segments[s].curve != 0 && run.segments[e].next == s) {
      items.clear();
      for (int k = s; k <= e; ++k) AppendSegment(run, k, f, p, band, items);
      Emit(items, out);
    }
    s = e + 1;
  }
}

template void FindPassages<POINT>(const SegmentsT<POINT>&, bool, double, const V&, std::vector<Passage>&);
template void FindPassages<V>(const SegmentsT<V>&, bool, double, const V&, std::vector<Passage>&);

}  // namespace OstraCrv::probe
