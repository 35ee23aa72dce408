// Helpers of the intersection engine tests: building raw paths, running the
// engine, snapshots of its records for exact comparison, an invariant check
// with an independent curve evaluation, and the real shapes of the corpus.
#pragma once

#include <gtest/gtest.h>

#include <algorithm>
#include <cmath>
#include <fstream>
#include <string>
#include <vector>

#include "core/path_geometry.h"
#include "ostracrv/intersect/segments.h"
#include "ostracrv/io/svg_path.h"

namespace engine_test {

using Framework::common_types::POINT;
using MavikMath::D;
using MavikMath::V;
using OstraCrv::Intersection;
using OstraCrv::IntersectionCurveT;
using OstraCrv::PairSearch;
using OstraCrv::SegmentIntersectionSettings;
using OstraCrv::SegmentIntersections;
using OstraCrv::SegmentsT;

// A raw path under construction (one or more subpaths).
template <class T>
struct Path {
  std::vector<T> points;
  std::vector<NODETYPE> nodes;
  int subpathStart = -1;

  Path& Move(T p) {
    subpathStart = static_cast<int>(points.size());
    points.push_back(p);
    nodes.push_back(0x04);
    return *this;
  }
  Path& Line(T p) {
    points.push_back(p);
    nodes.push_back(0x44);
    return *this;
  }
  Path& Cubic(T c1, T c2, T p) {
    points.push_back(c1);
    nodes.push_back(0xC0);
    points.push_back(c2);
    nodes.push_back(0xC0);
    points.push_back(p);
    nodes.push_back(0x84);
    return *this;
  }
  // Closes the subpath, with a line back to its start if it ends elsewhere.
  Path& Close() {
    if (!(points.back() == points[subpathStart])) Line(points[subpathStart]);
    nodes[subpathStart] = 0x0C;
    nodes.back() = static_cast<NODETYPE>((nodes.back() & 0xC0) | 0x08);
    return *this;
  }
  int size() const { return static_cast<int>(points.size()); }
  IntersectionCurveT<T> Curve(bool active = true, bool selfTest = true) const {
    return IntersectionCurveT<T>(points.data(), nodes.data(), size(), active, selfTest);
  }
};

inline POINT P(int x, int y) { return POINT{x, y}; }

// Independent evaluation: the Bernstein form of path_geometry.h.
using testgeo::Bezier;
using MavikMath::SquaredDistance;

// The segment's points as doubles.
template <class T>
std::vector<V> SegmentPointsOf(const SegmentsT<T>& s, int segment) {
  const SegmentIntersections& seg = s.segments[segment];
  const T* p = s.curves[seg.curve].points + seg.firstNode;
  const int n = seg.type == SegmentIntersections::Bezier ? 4 : 2;
  std::vector<V> out;
  for (int i = 0; i < n; ++i) out.push_back(MavikMath::ToV(p[i]));
  return out;
}
template <class T>
V SegmentAt(const SegmentsT<T>& s, int segment, double t) {
  const std::vector<V> p = SegmentPointsOf(s, segment);
  if (p.size() == 2) return V{p[0].x + (p[1].x - p[0].x) * t, p[0].y + (p[1].y - p[0].y) * t};
  return Bezier(p.data(), t);
}

// One record, with its links as list positions, for exact comparison.
struct RecordView {
  int segment, index, otherSegment, otherIndex, overlapEndIndex;
  double t;
  V point;
  D tangent;
  double curvature;
  bool enabled, touch;
  bool operator==(const RecordView& o) const {
    return segment == o.segment && index == o.index && otherSegment == o.otherSegment &&
           otherIndex == o.otherIndex && overlapEndIndex == o.overlapEndIndex && t == o.t && point == o.point &&
           tangent == o.tangent && curvature == o.curvature && enabled == o.enabled && touch == o.touch;
  }
};
inline std::ostream& operator<<(std::ostream& os, const RecordView& r) {
  return os << "{seg " << r.segment << "#" << r.index << " t " << r.t << " other " << r.otherSegment << "#"
            << r.otherIndex << " end " << r.overlapEndIndex << " at (" << r.point.x << ", " << r.point.y << ")"
            << (r.touch ? " touch" : "") << "}";
}

template <class T>
std::vector<RecordView> Snapshot(const SegmentsT<T>& s) {
  std::vector<RecordView> out;
  for (size_t si = 0; si < s.segments.size(); ++si) {
    const auto& list = s.segments[si].intersections;
    for (size_t k = 0; k < list.size(); ++k) {
      const Intersection* r = list[k];
      RecordView v{};
      v.segment = static_cast<int>(si);
      v.index = static_cast<int>(k);
      v.otherSegment = r->other ? r->other->segment : -1;
      v.otherIndex = r->other ? s.segments[r->other->segment].GetIndex(r->other) : -1;
      v.overlapEndIndex = r->overlapEnd ? s.segments[si].GetIndex(r->overlapEnd) : -1;
      v.t = r->t;
      v.point = r->point;
      v.tangent = r->tangent;
      v.curvature = r->curvature;
      v.enabled = r->enabled;
      v.touch = r->touch;
      out.push_back(v);
    }
  }
  return out;
}

// The invariants every run must keep. maxDistance: how far a record's point
// may lie from its own segment at its parameter (a touch lies at the end
// that touched, within the touch tolerance of the foot).
template <class T>
void CheckInvariants(const SegmentsT<T>& s, double maxDistance) {
  int withOverlapEnd = 0;
  bool any = false;
  for (size_t si = 0; si < s.segments.size(); ++si) {
    const auto& list = s.segments[si].intersections;
    for (size_t k = 0; k < list.size(); ++k) {
      const Intersection* r = list[k];
      any = true;
      ASSERT_EQ(r->segment, static_cast<int>(si));
      ASSERT_NE(r->other, nullptr);
      ASSERT_EQ(r->other->other, r);
      ASSERT_GE(s.segments[r->other->segment].GetIndex(r->other), 0);
      EXPECT_EQ(r->other->point, r->point);
      EXPECT_EQ(r->other->touch, r->touch);
      EXPECT_TRUE(r->enabled);
      EXPECT_TRUE(r->t >= 0.0 && r->t <= 1.0) << r->t;
      EXPECT_TRUE(r->point.IsFinite());
      if (k > 0) {
        EXPECT_LE(list[k - 1]->t, r->t);
      }
      const double d = std::sqrt(SquaredDistance(SegmentAt(s, static_cast<int>(si), r->t), r->point));
      EXPECT_LE(d, maxDistance) << "segment " << si << " t " << r->t;
      if (r->overlapEnd) {
        ++withOverlapEnd;
        EXPECT_EQ(r->overlapEnd->overlapEnd, r);
        EXPECT_EQ(r->overlapEnd->segment, r->segment);
        ASSERT_NE(r->other->overlapEnd, nullptr);
        EXPECT_EQ(r->other->overlapEnd, r->overlapEnd->other);
      }
      const auto& iw = s.curves[s.segments[si].curve].intersectsWith;
      EXPECT_NE(std::find(iw.begin(), iw.end(), s.segments[r->other->segment].curve), iw.end());
    }
  }
  EXPECT_EQ(s.hasIntersections, any);
  // Four records per overlap, two per live overlap in the count.
  EXPECT_EQ(withOverlapEnd % 4, 0);
  EXPECT_EQ(s.overlapCount, withOverlapEnd / 2);
}

template <class T>
int RecordCount(const SegmentsT<T>& s) {
  int n = 0;
  for (const auto& seg : s.segments) n += static_cast<int>(seg.intersections.size());
  return n;
}

// Settings with every field given, for tests that need unusual values.
inline SegmentIntersectionSettings Settings(double end, double touch) {
  SegmentIntersectionSettings s = OstraCrv::PointInShapeIntersectionSettings();
  s.endTolerance = end;
  s.touchTolerance = touch;
  s.endToleranceSquared = end * end;
  s.touchToleranceSquared = touch * touch;
  return s;
}

// The two operands of a corpus file (two lines of SVG path data), or none if
// the file is missing.
inline std::vector<Path<V>> ReadCorpusPair(const std::string& file) {
  std::ifstream in(file);
  std::vector<Path<V>> out;
  std::string line;
  while (std::getline(in, line)) {
    OstraCrv::PolycurveT<V> curve;
    if (line.empty() || !OstraCrv::ParseSvgPathData(line, curve)) continue;
    Path<V> p;
    const V* pts = curve.GetPoints();
    const NODETYPE* nodes = curve.GetNodeTypes();
    p.points.assign(pts, pts + curve.GetPointCount());
    p.nodes.assign(nodes, nodes + curve.GetPointCount());
    out.push_back(p);
  }
  return out;
}

// The path with integer points, scaled and rounded.
inline Path<POINT> ToInteger(const Path<V>& p, double scale) {
  Path<POINT> out;
  out.nodes = p.nodes;
  out.subpathStart = p.subpathStart;
  for (const V& v : p.points) out.points.push_back(MavikMath::FromV<POINT>(V{v.x * scale, v.y * scale}));
  return out;
}

}  // namespace engine_test
