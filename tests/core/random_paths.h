// Random valid node arrays for property tests, built together with a record of
// what was put where (subpath ranges, segment starts and ends), so that tests
// can check the byte queries against the construction rather than against a
// second reading of the bytes.
#pragma once

#include <random>
#include <vector>

#include "ostracrv/core/nodetype.h"

namespace testpaths {

struct Subpath {
  int first = 0;
  int last = 0;
  bool closed = false;
};

struct Segment {
  int start = 0;  // the non-arc node the segment leaves from
  int end = 0;    // its line or curve node
  bool bezier = false;
  int subpath = 0;
};

struct Path {
  std::vector<NODETYPE> nodes;
  std::vector<Subpath> subpaths;
  std::vector<Segment> segments;
  int n() const { return int(nodes.size()); }
  // Index of the subpath holding node i.
  int subpathOf(int i) const {
    for (int k = 0; k < int(subpaths.size()); ++k)
      if (subpaths[k].first <= i && i <= subpaths[k].last) return k;
    return -1;
  }
};

// Up to maxSubpaths subpaths of 1..maxSegments segments each (lines and
// Beziers, open or closed), some open dangling moves, random enabled and
// continuity flags kept equal on the twins of closed subpaths, letter bits per
// subpath, and arcs that are offered for picking only while enabled.
inline Path Make(std::mt19937& rng, int maxSubpaths = 5, int maxSegments = 6) {
  auto pick = [&](int k) { return int(rng() % unsigned(k)); };
  Path p;
  const int count = 1 + pick(maxSubpaths);
  for (int s = 0; s < count; ++s) {
    Subpath sp;
    sp.first = p.n();
    const NODETYPE letter = pick(4) == 0 ? NodeMask::kLetter : 0;
    auto flags = [&] { return NODETYPE(letter | pick(2) | (pick(3) << 4)); };
    if (pick(7) == 0) {  // dangling move
      p.nodes.push_back(NODETYPE(NodeTypes::Open::move | flags()));
      sp.last = sp.first;
      p.subpaths.push_back(sp);
      continue;
    }
    sp.closed = pick(2) == 0;
    const NODETYPE firstFlags = flags();
    p.nodes.push_back(NODETYPE((sp.closed ? NodeTypes::Closed::move : NodeTypes::Open::move) | firstFlags));
    const int segments = 1 + pick(maxSegments);
    for (int k = 0; k < segments; ++k) {
      Segment seg;
      seg.start = p.n() - 1;
      seg.subpath = int(p.subpaths.size());
      seg.bezier = pick(2) == 0;
      if (seg.bezier) {
        for (int a = 0; a < 2; ++a) {
          const int enabled = pick(2);
          const int offered = enabled && pick(2);
          p.nodes.push_back(NODETYPE(NodeTypes::arc | letter | enabled | (offered ? NodeMask::kUser : 0)));
        }
      }
      const bool closing = sp.closed && k + 1 == segments;
      // The closing node is the first node's twin: same enabled and continuity.
      const NODETYPE f = closing ? NODETYPE(firstFlags) : flags();
      const NODETYPE base = seg.bezier ? (closing ? NodeTypes::Closed::curve : NodeTypes::Open::curve)
                                       : (closing ? NodeTypes::Closed::line : NodeTypes::Open::line);
      p.nodes.push_back(NODETYPE(base | f));
      seg.end = p.n() - 1;
      p.segments.push_back(seg);
    }
    sp.last = p.n() - 1;
    p.subpaths.push_back(sp);
  }
  return p;
}

}  // namespace testpaths
