// Random raw paths with room to grow, and segment sets that ignore direction,
// for the tests of the node edits.
#pragma once

#include <algorithm>
#include <cmath>
#include <random>
#include <set>
#include <vector>

#include "core/path_geometry.h"
#include "core/random_paths.h"
#include "polycurve.h"

namespace testedit {

// A raw path: n live entries in arrays with spare room behind them.
template <class T>
struct Raw {
  std::vector<T> p;
  std::vector<NODETYPE> b;
  int n = 0;
  bool Valid() const { return OstraCrv::IsValidCurve(b.data(), unsigned(n)); }
  int Subpaths() const { return CRV_NumSubpaths(b.data(), n); }
  // Takes the live count an edit returned: true if the edit succeeded and
  // left a valid path.
  bool Take(int count) {
    if (count <= 0) return false;
    n = count;
    return Valid();
  }
  // Live entries only, so that untouched arrays compare equal.
  bool operator==(const Raw& o) const {
    return n == o.n && std::equal(p.begin(), p.begin() + n, o.p.begin()) &&
           std::equal(b.begin(), b.begin() + n, o.b.begin());
  }
};

// A random valid path (random_paths.h) with random points, closed subpaths
// ending on their first point. cusps: all continuity cleared, so that no edit
// re-aims handles of a geometry that was never smooth. letters false clears
// the letter bits (a text path keeps its stray moves through the tidy-up, and
// a join can bring a letter subpath to the front).
template <class T>
Raw<T> Random(std::mt19937& rng, testpaths::Path& path, bool cusps = true, int room = 16, bool letters = true) {
  path = testpaths::Make(rng, 4, 5);
  if (!letters)
    for (auto& x : path.nodes) x = NODETYPE(x & ~NodeMask::kLetter);
  Raw<T> r;
  r.n = path.n();
  r.p = testgeo::PointsFor<T>(path, rng, 500.0);
  r.b = path.nodes;
  if (cusps)
    for (auto& x : r.b) x = NODETYPE(x & ~NodeMask::kContinuity);
  r.p.resize(r.n + room);
  r.b.resize(r.n + room);
  return r;
}

// Every segment as its point coordinates, the lexically smaller of its two
// directions, so that turned subpaths compare equal.
using SegSet = std::multiset<std::vector<double>>;
template <class T>
SegSet Segments(const T* p, const NODETYPE* b, int n) {
  SegSet out;
  for (std::vector<double> s : testgeo::SegmentSet(p, b, n)) {
    std::vector<double> back;
    for (size_t k = s.size(); k >= 2; k -= 2) back.insert(back.end(), {s[k - 2], s[k - 1]});
    out.insert(std::min(s, back));
  }
  return out;
}
template <class T>
SegSet Segments(const Raw<T>& r) {
  return Segments(r.p.data(), r.b.data(), r.n);
}
inline std::vector<double> LineSeg(MavikMath::V a, MavikMath::V b) {
  return std::min(std::vector<double>{a.x, a.y, b.x, b.y}, std::vector<double>{b.x, b.y, a.x, a.y});
}

// Equal as sorted lists, coordinate by coordinate within tol.
inline bool Near(const SegSet& a, const SegSet& b, double tol) {
  if (a.size() != b.size()) return false;
  auto i = a.begin();
  for (auto j = b.begin(); j != b.end(); ++i, ++j) {
    if (i->size() != j->size()) return false;
    for (size_t k = 0; k < i->size(); ++k)
      if (!(std::fabs((*i)[k] - (*j)[k]) <= tol)) return false;
  }
  return true;
}

// The open ends (first and last nodes of open subpaths) of a path record.
inline std::vector<int> OpenEnds(const testpaths::Path& path) {
  std::vector<int> e;
  for (const auto& sp : path.subpaths) {
    if (sp.closed) continue;
    e.push_back(sp.first);
    if (sp.last != sp.first) e.push_back(sp.last);
  }
  return e;
}

// Lone moves of a path record: the tidy-up after an edit removes them
// unless the path is a text.
inline int Stray(const testpaths::Path& path) {
  return int(std::count_if(path.subpaths.begin(), path.subpaths.end(),
                           [](const testpaths::Subpath& s) { return s.first == s.last; }));
}

}  // namespace testedit
