// Turning the kept edges of the weld graph into a path.
//
// The walk. A loop starts on the first enabled edge with length in storage
// order and runs forward along it; at each far end FindNextEdge chooses the
// continuation (a turn onto another curve where one is kept, else straight
// on). Every edge walked is disabled, so each loop is drawn once and the
// whole output costs O(edges). A loop ends when the next edge is not
// enabled (which includes the start edge, already consumed); it is then
// closed if its ends lie within the weld tolerance (or always, with
// ForceClose). No orientation is imposed: a loop runs the way the walk
// found it. Loops through crossings come out consistently oriented with the
// curves they follow, while an untouched hole keeps the direction it had in
// its operand; results are therefore meant to be read under the even-odd
// rule (a shape minus an inner square of the same direction gives two loops
// of the same direction).
//
// Nodes. An edge that reaches the end of its segment copies the continuity
// of the input node there (symmetric becomes smooth, since the handles of a
// cut curve are no longer mirror images); a node at an intersection is a
// cusp. A node whose point lies within 10 units of the first operand is
// marked enabled, as is every node of an open piece that ends on the first
// operand. Most nodes lie on the first operand by construction (they end an
// edge of it, or an edge that meets it); only the others are measured, with
// a grid of segment boxes so that the test costs O(1) on average instead of
// a pass over the first operand.
//
// Integer output rounds every computed coordinate half away from zero;
// Bezier pieces are cut in doubles and rounded point by point.
#include <algorithm>
#include <cmath>
#include <limits>

#include "ostracrv/core/subpath_spin.h"
#include "ostracrv/math/bezier_closest.h"
#include "ostracrv/math/bezier_split.h"
#include "ostracrv/weld/weldstate.h"
#include "weld_internal.h"

namespace OstraCrv {

using Framework::common_types::POINT;
using MavikMath::V;
using namespace weld_detail;

namespace {

// Distance of the on-curve test of output nodes against the first operand.
constexpr double kOnFirstTolerance = 10.0;
// A segment whose box covers more grid cells than this is tested for every
// query instead of being entered into the cells.
constexpr long kMaxCellsPerSegment = 64;

// Whether a point lies within tol of a curve (squared distance at most tol
// squared to some segment), answered through a uniform grid of the
// segments' boxes inflated by tol. Built on first use.
class NearCurveIndex {
 public:
  NearCurveIndex(PolycurveT<V> const& curve, double tol) : curve_(curve), tol_(tol) {}

  bool IsNear(V const& p) {
    if (!std::isfinite(p.x) || !std::isfinite(p.y)) return false;
    if (!built_) Build();
    for (int s : wide_)
      if (Near(s, p)) return true;
    if (cells_.empty() || !MavikMath::IsPointInRect(p, box_)) return false;
    const long cx = std::clamp(long((p.x - box_.left) / cell_), 0L, nx_ - 1);
    const long cy = std::clamp(long((p.y - box_.bottom) / cell_), 0L, ny_ - 1);
    const long c = cy * nx_ + cx;
    for (int k = cellStart_[size_t(c)]; k < cellStart_[size_t(c) + 1]; ++k)
      if (Near(cells_[size_t(k)], p)) return true;
    return false;
  }

 private:
  struct Segment {
    int end;  // end node: a line node or the curve node of a Bezier
    bool bezier;
    MavikMath::BoundsT<double> box;
  };

  bool Near(int s, V const& p) const {
    const Segment& g = segs_[size_t(s)];
    if (!MavikMath::IsPointInRect(p, g.box)) return false;
    V const* pts = curve_.GetPoints();
    const double tol2 = tol_ * tol_;
    if (g.bezier) {
      double t = 0.0, d2 = std::numeric_limits<double>::max();
      V q;
      MavikMath::CubicBezier::FindClosestPointOnBezier(pts + g.end - 3, p, t, q, d2);
      return d2 <= tol2;
    }
    const V a = pts[g.end - 1], b = pts[g.end];
    const MavikMath::D d = b - a;
    const double len2 = Dot(d, d);
    double t = len2 > 0.0 ? Dot(p - a, d) / len2 : 0.0;
    t = std::clamp(t, 0.0, 1.0);
    return MavikMath::SquaredDistance(a + t * d, p) <= tol2;
  }

  void Build() {
    built_ = true;
    V const* pts = curve_.GetPoints();
    NODETYPE const* nodes = curve_.GetNodeTypes();
    const int n = int(curve_.GetPointCount());
    for (int i = 1; i < n; ++i) {
      const bool line = IsLine(nodes[i]) && !IsArc(nodes[i - 1]);
      const bool bezier = IsCurve(nodes[i]) && i >= 3 && IsArc(nodes[i - 1]) && IsArc(nodes[i - 2]);
      if (!line && !bezier) continue;
      Segment g{i, bezier, {}};
      bool finite = true;
      for (int k = bezier ? i - 3 : i - 1; k <= i; ++k) {
        finite = finite && std::isfinite(pts[k].x) && std::isfinite(pts[k].y);
        g.box.Add(pts[k]);
      }
      if (!finite) continue;
      MavikMath::InflateRect(g.box, tol_, tol_);
      box_.Add(g.box);
      segs_.push_back(g);
    }
    if (segs_.empty()) return;
    const double w = box_.Width(), h = box_.Height();
    cell_ = std::sqrt(w * h / double(segs_.size()));
    if (!(cell_ > 0.0) || !std::isfinite(cell_)) cell_ = std::max(w, h);
    if (!(cell_ > 0.0) || !std::isfinite(cell_)) {
      for (size_t s = 0; s < segs_.size(); ++s) wide_.push_back(int(s));
      return;
    }
    nx_ = std::clamp(long(std::ceil(w / cell_)), 1L, 2048L);
    ny_ = std::clamp(long(std::ceil(h / cell_)), 1L, 2048L);
    cell_ = std::max(w / double(nx_), h / double(ny_));
    auto range = [&](Segment const& g, long& x0, long& x1, long& y0, long& y1) {
      x0 = std::clamp(long((g.box.left - box_.left) / cell_), 0L, nx_ - 1);
      x1 = std::clamp(long((g.box.right - box_.left) / cell_), 0L, nx_ - 1);
      y0 = std::clamp(long((g.box.bottom - box_.bottom) / cell_), 0L, ny_ - 1);
      y1 = std::clamp(long((g.box.top - box_.bottom) / cell_), 0L, ny_ - 1);
    };
    cellStart_.assign(size_t(nx_ * ny_ + 1), 0);
    std::vector<char> inCells(segs_.size(), 0);
    for (size_t s = 0; s < segs_.size(); ++s) {
      long x0, x1, y0, y1;
      range(segs_[s], x0, x1, y0, y1);
      if ((x1 - x0 + 1) * (y1 - y0 + 1) > kMaxCellsPerSegment) {
        wide_.push_back(int(s));
        continue;
      }
      inCells[s] = 1;
      for (long y = y0; y <= y1; ++y)
        for (long x = x0; x <= x1; ++x) ++cellStart_[size_t(y * nx_ + x + 1)];
    }
    for (size_t c = 1; c < cellStart_.size(); ++c) cellStart_[c] += cellStart_[c - 1];
    cells_.resize(size_t(cellStart_.back()));
    std::vector<int> fill(cellStart_.begin(), cellStart_.end() - 1);
    for (size_t s = 0; s < segs_.size(); ++s) {
      if (!inCells[s]) continue;
      long x0, x1, y0, y1;
      range(segs_[s], x0, x1, y0, y1);
      for (long y = y0; y <= y1; ++y)
        for (long x = x0; x <= x1; ++x) cells_[size_t(fill[size_t(y * nx_ + x)]++)] = int(s);
    }
  }

  PolycurveT<V> const& curve_;
  double tol_;
  bool built_ = false;
  std::vector<Segment> segs_;
  MavikMath::BoundsT<double> box_;
  double cell_ = 0.0;
  long nx_ = 0, ny_ = 0;
  std::vector<int> cellStart_;
  std::vector<int> cells_;
  std::vector<int> wide_;
};

// Continuity bits of an input node for the output: symmetric becomes smooth.
ContinuityType OutputContinuity(NODETYPE n) {
  const ContinuityType c = GetContinuity(n);
  return c == ContinuityType::symm ? ContinuityType::smooth : c;
}

template <class T>
void EnableNode(PolycurveT<T>& c, int i) {
  c.SetNodeType(i, NODETYPE(c.GetNodeType(i) | NodeMask::kEnabled));
}

// Opens the curve at its enabled nodes, as the node editor's break does: the
// first node of a closed subpath opens the subpath in place; an enabled line
// or curve node inside a subpath is doubled, the copy starting a new subpath.
// Cut nodes lose their continuity. Ends of open subpaths and arcs are left.
template <class T>
void BreakAtEnabledNodes(PolycurveT<T>& c) {
  const int n = int(c.GetPointCount());
  T const* pts = c.GetPoints();
  NODETYPE const* nodes = c.GetNodeTypes();
  std::vector<T> op;
  std::vector<NODETYPE> on;
  op.reserve(size_t(n) + 8);
  on.reserve(size_t(n) + 8);
  for (int f = 0; f < n;) {
    int l = f;
    while (l + 1 < n && !IsMove(nodes[l + 1])) ++l;
    const bool closed = IsClosedNode(nodes[f]) && l > f;
    bool opened = false;
    for (int i = f; i <= l; ++i) {
      NODETYPE b = nodes[i];
      if (i == f && closed && IsEnabledNode(b)) {
        opened = true;
        b = WithContinuity(NODETYPE(b & ~NodeMask::kClosed), ContinuityType::cusp);
      } else if (i == l && opened) {
        b = WithContinuity(NODETYPE((b & ~NodeMask::kClosed & ~NodeMask::kEnabled) | NodeMask::kUser),
                           ContinuityType::cusp);
      } else if (i > f && i < l && IsEnabledNode(b) && (IsLine(b) || IsCurve(b))) {
        op.push_back(pts[i]);
        on.push_back(WithContinuity(NODETYPE((b & ~NodeMask::kEnabled & ~NodeMask::kClosed) | NodeMask::kUser),
                                    ContinuityType::cusp));
        op.push_back(pts[i]);
        on.push_back(NODETYPE((::NodeTypes::Open::move) | NodeMask::kEnabled));
        continue;
      }
      op.push_back(pts[i]);
      on.push_back(b);
    }
    // A closed subpath broken inside is no longer closed at its ends.
    f = l + 1;
  }
  // Inner breaks of a closed subpath leave its ends closed only if nothing
  // in between was cut: recompute the closed bits per subpath.
  const int m = int(on.size());
  for (int f = 0; f < m;) {
    int l = f;
    while (l + 1 < m && !IsMove(on[size_t(l) + 1])) ++l;
    if (IsClosedNode(on[size_t(f)]) != IsClosedNode(on[size_t(l)]) || (IsClosedNode(on[size_t(f)]) && !(op[size_t(f)] == op[size_t(l)]))) {
      on[size_t(f)] = NODETYPE(on[size_t(f)] & ~NodeMask::kClosed);
      on[size_t(l)] = NODETYPE((on[size_t(l)] & ~NodeMask::kClosed) | NodeMask::kUser);
    }
    f = l + 1;
  }
  c.MoveData(op, on);
}

template <class T>
void DisableAll(PolycurveT<T>& c) {
  const int n = int(c.GetPointCount());
  for (int i = 0; i < n; ++i) {
    const NODETYPE b = c.GetNodeType(i);
    NODETYPE nb = NODETYPE(b & ~NodeMask::kEnabled);
    if (IsArc(b)) nb = NODETYPE(nb & ~NodeMask::kUser);
    if (nb != b) c.SetNodeType(i, nb);
  }
}

}  // namespace

template <class T>
PolycurveT<T> RotateToFirstEnabled(PolycurveT<T> curve) {
  const int n = int(curve.GetPointCount());
  if (n < 2) return curve;
  NODETYPE const* nodes = curve.GetNodeTypes();
  int moves = 0;
  for (int i = 0; i < n; ++i) moves += IsMove(nodes[i]) ? 1 : 0;
  if (moves != 1 || !IsMove(nodes[0]) || !(curve.GetPoint(0) == curve.GetPoint(n - 1))) return curve;
  const bool wasClosed = curve.IsClosed(0);
  curve.SetNodeClosed(0, true);
  curve.SetNodeClosed(n - 1, true);
  int start = -1;
  for (int i = 0; i < n; ++i) {
    const NODETYPE b = curve.GetNodeType(i);
    if (!IsArc(b) && IsEnabledNode(b)) {
      start = i;
      break;
    }
  }
  if (start > 0 && start < n - 1) {
    CurveBuffer<T> buf = curve.GetBuffer();
    SpinSubpath(buf.points, buf.nodes, buf.count, 0, start);
  }
  curve.SetNodeClosed(0, wasClosed);
  curve.SetNodeClosed(n - 1, wasClosed);
  if (!wasClosed) curve.SetUserNode(n - 1, true);
  return curve;
}

template <class T>
PolycurveT<T> WeldStateData::GenerateOutputCurve(bool knife) {
  PolycurveT<T> result;
  const bool openResult = HasWeldFlag(flags, WeldFlags::OpenResult);
  const bool trim = HasWeldFlag(flags, WeldFlags::TrimDangling);
  const bool forceClose = HasWeldFlag(flags, WeldFlags::ForceClose);
  NearCurveIndex nearFirst(first, kOnFirstTolerance);
  // Whether a point known to be on the first operand (penOnFirst) or
  // measured lies within the on-curve distance of it.
  auto onFirst = [&](V const& p, bool known) { return known || nearFirst.IsNear(p); };

  Edge scan = FirstEdge();
  int walkGuard = 2 * edgeTotal + 2;
  while (walkGuard > 0) {
    // Find a start: the first enabled edge that has length.
    Edge startEdge;
    for (Edge e = knife ? FirstEdge() : scan; e.valid(); e = e.nextEdgeAbsolute()) {
      if (!e.enabled()) continue;
      if (e.isZeroLength()) {
        e.setEnabled(false);
        continue;
      }
      startEdge = e;
      break;
    }
    if (!startEdge.valid()) break;
    scan = startEdge;

    PolycurveT<T> w;
    int dir = 1;
    MavikMath::Side side = MavikMath::SideLeft;
    V pen;
    bool penOnFirst = false;
    bool hasPending = false;
    ContinuityType pending = ContinuityType::cusp;
    if (startEdge.start) {
      pen = startEdge.start->point;
      penOnFirst = IsOnFirst(startEdge) ||
                   IsFirstCurve(segments->segments[size_t(startEdge.start->other->segment)].curve);
    } else {
      const SegmentView v = ViewOf(*segments, *startEdge.segment);
      pen = v.points ? v.points[0] : V{};
      penOnFirst = IsOnFirst(startEdge);
      if (v.nodes) {
        pending = OutputContinuity(v.nodes[0]);
        hasPending = true;
      }
    }
    bool needMove = true, closable = false, skipping = false, closed = false;

    Edge edge = startEdge;
    while (walkGuard-- > 0) {
      const bool edgeOnFirst = IsOnFirst(edge);
      if (trim && edgeOnFirst && !skipping)
        skipping = !IsBounded(edge);
      else if (trim && !edgeOnFirst)
        skipping = false;

      const SegmentView v = ViewOf(*segments, *edge.segment);
      const double tNear = dir > 0 ? edge.startT() : edge.endT();
      const double tFar = dir > 0 ? edge.endT() : edge.startT();
      Intersection const* farRecord = dir > 0 ? edge.end : edge.start;
      const V far = PointOn(v, tFar);
      const bool farOnFirst =
          edgeOnFirst ||
          (farRecord && farRecord->other &&
           IsFirstCurve(segments->segments[size_t(farRecord->other->segment)].curve));

      bool drawn = true;
      if (edgeOnFirst && (skipping || openResult)) {
        drawn = false;
        pen = far;
        penOnFirst = farOnFirst;
        needMove = true;
        hasPending = false;
        if (v.bezier) closable = false;
      } else if (openResult && !edgeOnFirst && !v.bezier) {
        if (needMove && MavikMath::Distance(pen, far) < kOnFirstTolerance) {
          drawn = false;
          pen = far;
          penOnFirst = farOnFirst;
          closable = false;
        } else if (!w.IsEmpty() && !IsArc(w.GetNodeType(int(w.GetPointCount()) - 1)) &&
                   w.GetLastPoint() == MavikMath::FromV<T>(far)) {
          drawn = false;
        }
      }

      if (drawn) {
        if (needMove) {
          const bool wasEmpty = w.IsEmpty();
          w.MoveTo(MavikMath::FromV<T>(pen));
          const int last = int(w.GetPointCount()) - 1;
          if (hasPending) w.SetContinuity(last, pending);
          hasPending = false;
          if (onFirst(MavikMath::ToV(w.GetLastPoint()), penOnFirst)) {
            EnableNode(w, last);
            closable = false;
          } else {
            closable = true;
          }
          if (wasEmpty) closable = false;
        }
        if (v.bezier && v.points) {
          V piece[4];
          MavikMath::CubicBezier::Subsection(tNear < tFar ? tNear : tFar, tNear < tFar ? tFar : tNear, v.points,
                                             piece);
          if (dir < 1) {
            std::swap(piece[0], piece[3]);
            std::swap(piece[1], piece[2]);
          }
          w.CubicTo(MavikMath::FromV<T>(piece[1]), MavikMath::FromV<T>(piece[2]), MavikMath::FromV<T>(piece[3]));
        } else {
          w.LineTo(MavikMath::FromV<T>(far));
        }
        needMove = false;
        pen = far;
        penOnFirst = farOnFirst;
      }

      if (!w.IsEmpty()) {
        const bool on = onFirst(MavikMath::ToV(w.GetLastPoint()), drawn ? farOnFirst : penOnFirst);
        if (on) EnableNode(w, int(w.GetPointCount()) - 1);
        closed = closable && !on;
      } else {
        closed = false;
      }

      // At the end of the segment the input node's continuity carries over.
      if (!farRecord && v.nodes) {
        const ContinuityType c = OutputContinuity(v.nodes[dir > 0 ? v.last : 0]);
        if (drawn) {
          w.SetContinuity(int(w.GetPointCount()) - 1, c);
        } else {
          pending = c;
          hasPending = true;
        }
      }

      // Consume the edge; a knife edge with one colour on both sides stays
      // for the walk of its other side.
      if (!knife || !edgeOnFirst) {
        edge.setEnabled(false);
      } else if (edge.leftColor() != edge.rightColor()) {
        edge.setEnabled(false);
      } else {
        edge.setRightColor(0);
      }

      const Edge next = FindNextEdge(edge, knife, side, dir);
      if (!next.valid() || !next.enabled()) break;
      if (next == startEdge && dir == 1) break;
      closable = closed;
      edge = next;
    }

    if (!w.IsEmpty() && (closed || !openResult)) {
      if (!w.CloseLastSubpath(tolerance, false)) {
        if (!openResult) ++unclosedLoops_;
        if (forceClose) w.CloseLastSubpath(tolerance, true);
      }
    }
    if (openResult) {
      w = RotateToFirstEnabled(w);
      BreakAtEnabledNodes(w);
      DisableAll(w);
    }
    result.PushBack(w);
  }
  return result;
}

bool WeldStateData::IsBounded(Edge const& edge) const {
  auto closedMeeting = [&](Intersection const* r) {
    return r && r->other && !IsOpenCurve(segments->segments[size_t(r->other->segment)].curve);
  };
  bool back = false;
  Edge e = edge;
  for (int guard = edgeTotal + 1; e.valid() && guard > 0; --guard) {
    if (closedMeeting(e.start)) {
      back = true;
      break;
    }
    e = e.prevEdge();
    if (e == edge) break;
  }
  if (!back) return false;
  e = edge;
  for (int guard = edgeTotal + 1; e.valid() && guard > 0; --guard) {
    if (closedMeeting(e.end)) return true;
    e = e.nextEdge();
    if (e == edge) break;
  }
  return false;
}

template PolycurveT<POINT> WeldStateData::GenerateOutputCurve<POINT>(bool);
template PolycurveT<V> WeldStateData::GenerateOutputCurve<V>(bool);
template PolycurveT<POINT> RotateToFirstEnabled<POINT>(PolycurveT<POINT>);
template PolycurveT<V> RotateToFirstEnabled<V>(PolycurveT<V>);

}  // namespace OstraCrv
