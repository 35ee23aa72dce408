// Cleaning an operand of welding of the stretches that bound no area.
//
// Two kinds of stretch add nothing to a filling but stand in the way of the
// weld graph:
//  - a segment of zero length (a line to the point it starts from, a Bezier
//    whose four points coincide). The intersection engine keeps it as a
//    segment, so its two neighbours are no longer adjacent and the node
//    between them reads as a meeting of the curve with itself;
//  - a fold: a line that runs straight back along the line before it (a
//    spike of no width). Its two sides are the same place, so no count of
//    the filled sides carried along the curve can be right on both.
// Both are removed: a fold a -> b -> c of two lines becomes the line a -> c
// (nothing if c is a), repeatedly, round the closing point of a closed
// subpath too. The filled area under either rule is unchanged, since the
// removed stretches enclose none. Directions count as folded back when the
// sine of the angle between them is below 4 times the machine epsilon and
// they point against each other: only exact or practically exact spikes.
//
// Continuity bits are kept on the nodes that stay; a merged line's end node
// is a plain cusp line node. O(n): every merge removes a segment.
#include <cmath>
#include <vector>

#include "ostracrv/core/nodetype.h"
#include "weld_internal.h"

namespace OstraCrv::weld_detail {

namespace {

using MavikMath::D;
using MavikMath::V;

constexpr double kFoldSine = 4.0 * MavikMath::kEpsilon;

struct Piece {
  bool bezier;
  V c1, c2, end;
  NODETYPE n1, n2, endNode;
};

// Appends the kept pieces of a subpath after its start node; the closed
// bits are the caller's to set.
void Emit(std::vector<Piece> const& pieces, std::vector<V>& op, std::vector<NODETYPE>& on) {
  for (Piece const& s : pieces) {
    if (s.bezier) {
      op.push_back(s.c1);
      on.push_back(s.n1);
      op.push_back(s.c2);
      on.push_back(s.n2);
    }
    op.push_back(s.end);
    on.push_back(NODETYPE(s.endNode & ~NodeMask::kClosed));
  }
}

bool Folds(V const& a, V const& b, V const& c) {
  const D d1 = b - a, d2 = c - b;
  const double l = std::sqrt(Dot(d1, d1) * Dot(d2, d2));
  return Dot(d1, d2) < 0.0 && std::fabs(Cross(d1, d2)) <= kFoldSine * l;
}

bool Degenerate(V const& from, Piece const& s) {
  return from == s.end && (!s.bezier || (s.c1 == from && s.c2 == from));
}

// Pushes s after the pieces in out (which start at start), merging folds
// with the last line.
void Push(V const& start, std::vector<Piece>& out, Piece s) {
  for (;;) {
    const V from = out.empty() ? start : out.back().end;
    if (Degenerate(from, s)) return;
    if (s.bezier || out.empty() || out.back().bezier) break;
    const V a = out.size() >= 2 ? out[out.size() - 2].end : start;
    if (!Folds(a, from, s.end)) break;
    out.pop_back();
    s.endNode = ::NodeTypes::Open::line;
  }
  out.push_back(s);
}

}  // namespace

PolycurveT<V> CleanWeldOperand(PolycurveT<V> const& c) {
  V const* p = c.GetPoints();
  NODETYPE const* nodes = c.GetNodeTypes();
  const int n = int(c.GetPointCount());
  if (!p || !nodes || n < 2) return c;
  std::vector<V> op;
  std::vector<NODETYPE> on;
  op.reserve(size_t(n));
  on.reserve(size_t(n));
  std::vector<Piece> pieces;
  for (int i = 0; i < n;) {
    int end = i + 1;
    while (end < n && !IsMove(nodes[end])) ++end;
    V start = p[i];
    const NODETYPE startNode = nodes[i];
    const bool closed = IsClosedNode(startNode) && end - i >= 2;
    pieces.clear();
    for (int k = i + 1; k < end; ++k) {
      if (IsLine(nodes[k])) {
        Push(start, pieces, Piece{false, V{}, V{}, p[k], 0, 0, nodes[k]});
      } else if (IsCurve(nodes[k]) && k - 2 > i) {
        Push(start, pieces, Piece{true, p[k - 2], p[k - 1], p[k], nodes[k - 2], nodes[k - 1], nodes[k]});
      }
    }
    // Round the closing point: while the last and the first line fold back
    // at the start, the start moves to where the last line begins.
    for (size_t guard = pieces.size(); closed && guard > 0 && pieces.size() >= 2; --guard) {
      Piece const& last = pieces.back();
      Piece const& firstPiece = pieces.front();
      if (last.bezier || firstPiece.bezier) break;
      const V before = pieces[pieces.size() - 2].end;
      if (!Folds(before, start, firstPiece.end)) break;
      start = before;
      pieces.pop_back();
      pieces.back().endNode = NODETYPE(pieces.back().endNode | NodeMask::kClosed);
      // The first line now starts at the new start; it may vanish or fold
      // with the second.
      std::vector<Piece> again;
      again.swap(pieces);
      for (Piece const& s : again) Push(start, pieces, s);
    }
    op.push_back(start);
    on.push_back(startNode);
    Emit(pieces, op, on);
    // Closed bits: on the first node and on the last, which lies on it.
    if (closed && !pieces.empty()) {
      on.back() = NODETYPE((on.back() | NodeMask::kClosed) & ~NodeMask::kUser);
      op.back() = start;
    } else if (!on.empty()) {
      on.back() = NODETYPE(on.back() & ~NodeMask::kClosed);
    }
    i = end;
  }
  // Cleaning only removes nodes: the same count means nothing to clean, and
  // the operand is shared as it came.
  if (op.size() == size_t(n)) return c;
  PolycurveT<V> out;
  out.MoveData(op, on);
  return out;
}

PolycurveT<V> CollapseShortSegments(PolycurveT<V> const& c, double distance) {
  V const* p = c.GetPoints();
  NODETYPE const* nodes = c.GetNodeTypes();
  const int n = int(c.GetPointCount());
  if (!p || !nodes || n < 2 || !(distance > 0.0)) return c;
  const double d2 = distance * distance;
  std::vector<V> op;
  std::vector<NODETYPE> on;
  op.reserve(size_t(n));
  on.reserve(size_t(n));
  std::vector<Piece> pieces;
  for (int i = 0; i < n;) {
    int end = i + 1;
    while (end < n && !IsMove(nodes[end])) ++end;
    const V start = p[i];
    const bool closed = IsClosedNode(nodes[i]) && end - i >= 2;
    pieces.clear();
    V at = start;  // where the kept outline has got to
    for (int k = i + 1; k < end; ++k) {
      const bool bezier = IsCurve(nodes[k]) && k - 2 > i;
      if (!IsLine(nodes[k]) && !bezier) continue;
      Piece s = bezier ? Piece{true, p[k - 2], p[k - 1], p[k], nodes[k - 2], nodes[k - 1], nodes[k]}
                       : Piece{false, V{}, V{}, p[k], 0, 0, nodes[k]};
      const V from = bezier ? p[k - 3] : p[k - 1];
      const bool shortPiece = MavikMath::SquaredDistance(from, s.end) < d2 &&
                              (!bezier || (MavikMath::SquaredDistance(from, s.c1) < d2 &&
                                           MavikMath::SquaredDistance(from, s.c2) < d2));
      if (shortPiece) continue;
      // The piece now starts where the outline got to: a Bezier's first
      // handle moves with its start.
      if (bezier) s.c1 = s.c1 + (at - from);
      pieces.push_back(s);
      at = s.end;
    }
    if (closed && !pieces.empty()) {
      // The outline must end on its start: the last piece's end (and its
      // second handle) move there.
      Piece& last = pieces.back();
      if (last.bezier) last.c2 = last.c2 + (start - last.end);
      last.end = start;
    }
    // A closed outline of fewer than two pieces bounds nothing.
    if (closed && pieces.size() < 2) pieces.clear();
    op.push_back(start);
    on.push_back(nodes[i]);
    Emit(pieces, op, on);
    if (closed && !pieces.empty())
      on.back() = NODETYPE((on.back() | NodeMask::kClosed) & ~NodeMask::kUser);
    i = end;
  }
  if (op.size() == size_t(n)) return c;
  PolycurveT<V> out;
  out.MoveData(op, on);
  return CleanWeldOperand(out);
}

}  // namespace OstraCrv::weld_detail
