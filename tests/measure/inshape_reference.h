// Independent references for the point-in-shape and hierarchy tests: a fine
// flattening of the closed subpaths written here (Bernstein evaluation, a
// chord count from the size of the second differences), the winding number
// and the distance to the outline on that flattening, and shape makers.
#pragma once

#include <algorithm>
#include <cmath>
#include <fstream>
#include <random>
#include <sstream>
#include <string>
#include <vector>

#include "measure/sampled_paths.h"
#include "polycurve.h"

namespace inref {

using Framework::common_types::POINT;
using MavikMath::V;
using Ring = std::vector<V>;

// The closed subpaths as polygons. A Bezier with second differences of size
// M gets k >= sqrt(6 M) chords, so that no chord strays more than 1/8 unit
// from the curve (|B''| <= 6 M, deviation <= |B''| / (8 k^2)).
template <class T>
std::vector<Ring> Flatten(const T* pts, const NODETYPE* nodes, int n) {
  std::vector<Ring> rings;
  for (int i = 0; i < n;) {
    int j = i + 1;
    while (j < n && !IsMove(nodes[j])) ++j;
    if (IsClosedNode(nodes[i]) && j - i >= 2) {
      Ring r{MavikMath::ToV(pts[i])};
      for (int k = i + 1; k < j; ++k) {
        if (IsLine(nodes[k])) {
          r.push_back(MavikMath::ToV(pts[k]));
        } else if (IsCurve(nodes[k])) {
          const T* b = pts + k - 3;
          double m = 0;
          for (int d = 0; d < 2; ++d)
            m = std::max(m, std::hypot(double(b[d].x) - 2.0 * b[d + 1].x + b[d + 2].x,
                                       double(b[d].y) - 2.0 * b[d + 1].y + b[d + 2].y));
          const int steps = std::max(8, int(std::ceil(std::sqrt(6.0 * m))));
          for (int s = 1; s <= steps; ++s) r.push_back(testgeo::Bezier(b, double(s) / steps));
        }
      }
      rings.push_back(std::move(r));
    }
    i = j;
  }
  return rings;
}

inline int Winding(const std::vector<Ring>& rings, V p) {
  int w = 0;
  for (const Ring& r : rings)
    for (std::size_t k = 0; k + 1 < r.size(); ++k) {
      const V a = r[k], b = r[k + 1];
      const double c = (b.x - a.x) * (p.y - a.y) - (b.y - a.y) * (p.x - a.x);
      if (a.y <= p.y) {
        if (b.y > p.y && c > 0) ++w;
      } else if (b.y <= p.y && c < 0) {
        --w;
      }
    }
  return w;
}

inline double Distance(const std::vector<Ring>& rings, V p) {
  double best = INFINITY;
  for (const Ring& r : rings)
    for (std::size_t k = 0; k + 1 < r.size(); ++k) {
      const V a = r[k], b = r[k + 1];
      const double dx = b.x - a.x, dy = b.y - a.y, len = dx * dx + dy * dy;
      double t = len > 0 ? ((p.x - a.x) * dx + (p.y - a.y) * dy) / len : 0.0;
      t = std::clamp(t, 0.0, 1.0);
      best = std::min(best, std::hypot(a.x + t * dx - p.x, a.y + t * dy - p.y));
    }
  return best;
}

// A path under construction, with the letter of the node kinds.
template <class T>
struct Builder {
  std::vector<T> points;
  std::vector<NODETYPE> nodes;
  static T P(double x, double y) { return MavikMath::FromV<T>(V{x, y}); }

  void Polygon(const std::vector<V>& corners, bool closed = true, NODETYPE extra = 0) {
    points.push_back(P(corners[0].x, corners[0].y));
    nodes.push_back(NODETYPE((closed ? NodeTypes::Closed::move : NodeTypes::Open::move) | extra));
    for (std::size_t k = 1; k < corners.size(); ++k) {
      points.push_back(P(corners[k].x, corners[k].y));
      nodes.push_back(NodeTypes::Open::line);
    }
    if (closed) {
      points.push_back(points[points.size() - corners.size()]);
      nodes.push_back(NodeTypes::Closed::line);
    }
  }
  // A circle of four quarter Beziers, clockwise (y up) or not.
  void Circle(V c, double r, bool clockwise, NODETYPE extra = 0) {
    const double s = clockwise ? -1.0 : 1.0, k = 0.5522847498 * r;
    auto on = [&](double a, double along) {  // the point at angle a, moved along the direction of travel
      return V{c.x + r * std::cos(a) - along * s * std::sin(a), c.y + r * std::sin(a) + along * s * std::cos(a)};
    };
    const int first = n();
    for (int i = 0; i < 12; ++i) {
      const double a = s * (i / 3 + (i % 3 == 2)) * M_PI / 2;
      const V at = on(a, i % 3 == 0 ? 0.0 : i % 3 == 1 ? k : -k);
      points.push_back(P(at.x, at.y));
      nodes.push_back(i == 0 ? NODETYPE(NodeTypes::Closed::move | extra) : i % 3 ? NodeTypes::arc : NodeTypes::Open::curve);
    }
    points.push_back(points[first]);
    nodes.push_back(NodeTypes::Closed::curve);
  }
  int n() const { return int(points.size()); }
};

// Rings of the clipper2 corpus: every polygon line of every case is one
// closed ring; each case gives one shape of all its polygons.
inline std::vector<std::vector<Ring>> ClipperShapes(const std::string& file) {
  std::vector<std::vector<Ring>> shapes;
  std::ifstream in(file);
  for (std::string line; std::getline(in, line);) {
    if (line.rfind("CAPTION", 0) == 0) shapes.emplace_back();
    if (shapes.empty() || line.empty() || !(std::isdigit(line[0]) || line[0] == '-')) continue;
    std::replace(line.begin(), line.end(), ',', ' ');
    std::istringstream s(line);
    Ring r;
    for (double x, y; s >> x >> y;) r.push_back(V{x, y});
    if (r.size() >= 3) shapes.back().push_back(std::move(r));
  }
  return shapes;
}

}  // namespace inref
