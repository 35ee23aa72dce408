// The pairs of segments whose inflated boxes meet, in the engine's visiting
// order; see pair_pruning.h for the method.
//
// Constants:
//   kLeafSize 4: segments per leaf of the hierarchy; small leaves keep the
//     candidate tests few, and four boxes fit a cache line or two.
//   kDirectDrivers 8: with at most this many driving segments, testing each
//     against every segment (one pass each) is cheaper than building the
//     hierarchy, which costs O(a log a) with a larger constant.
#include "ostracrv/intersect/pair_pruning.h"

#include <algorithm>
#include <cmath>

#include "ostracrv/intersect/pair_intersections.h"

namespace OstraCrv {

namespace {

constexpr int kLeafSize = 4;
constexpr size_t kDirectDrivers = 8;

struct Item {
  int segment;
  double cx, cy;  // box centre
};

struct Node {
  SegmentBox box;
  int left = -1, right = -1;  // children; -1 for a leaf
  int begin = 0, end = 0;     // range of items of a leaf
  bool Leaf() const { return left < 0; }
  double Extent() const { return (box.maxX - box.minX) + (box.maxY - box.minY); }
};

SegmentBox Union(const SegmentBox& a, const SegmentBox& b) {
  return {std::min(a.minX, b.minX), std::min(a.minY, b.minY), std::max(a.maxX, b.maxX), std::max(a.maxY, b.maxY)};
}

class Hierarchy {
 public:
  Hierarchy(std::vector<Item>& items, const std::vector<SegmentBox>& boxes) : items_(items), boxes_(boxes) {
    nodes_.reserve(2 * items.size() / kLeafSize + 2);
    Build(0, static_cast<int>(items.size()));
  }

  // Every pair of items whose boxes meet, each once.
  template <class F>
  void SelfPairs(F&& found) const {
    std::vector<std::pair<int, int>> stack;
    stack.emplace_back(0, 0);
    while (!stack.empty()) {
      const auto [a, b] = stack.back();
      stack.pop_back();
      const Node& na = nodes_[a];
      const Node& nb = nodes_[b];
      if (a == b) {
        if (na.Leaf()) {
          for (int x = na.begin; x < na.end; ++x)
            for (int y = x + 1; y < na.end; ++y) Test(x, y, found);
        } else {
          stack.emplace_back(na.left, na.left);
          stack.emplace_back(na.right, na.right);
          stack.emplace_back(na.left, na.right);
        }
        continue;
      }
      if (!DoBoxesMeet(na.box, nb.box)) continue;
      if (na.Leaf() && nb.Leaf()) {
        for (int x = na.begin; x < na.end; ++x)
          for (int y = nb.begin; y < nb.end; ++y) Test(x, y, found);
      } else if (na.Leaf() || (!nb.Leaf() && nb.Extent() > na.Extent())) {
        stack.emplace_back(a, nb.left);
        stack.emplace_back(a, nb.right);
      } else {
        stack.emplace_back(na.left, b);
        stack.emplace_back(na.right, b);
      }
    }
  }

  // Every item whose box meets `box`.
  template <class F>
  void Query(const SegmentBox& box, std::vector<int>& stack, F&& found) const {
    stack.clear();
    stack.push_back(0);
    while (!stack.empty()) {
      const Node& n = nodes_[stack.back()];
      stack.pop_back();
      if (!DoBoxesMeet(n.box, box)) continue;
      if (n.Leaf()) {
        for (int x = n.begin; x < n.end; ++x)
          if (DoBoxesMeet(boxes_[items_[x].segment], box)) found(items_[x].segment);
      } else {
        stack.push_back(n.left);
        stack.push_back(n.right);
      }
    }
  }

 private:
  std::vector<Item>& items_;
  const std::vector<SegmentBox>& boxes_;
  std::vector<Node> nodes_;

  template <class F>
  void Test(int x, int y, F& found) const {
    const int a = items_[x].segment, b = items_[y].segment;
    if (DoBoxesMeet(boxes_[a], boxes_[b])) found(a, b);
  }

  int Build(int begin, int end) {
    const int index = static_cast<int>(nodes_.size());
    nodes_.emplace_back();
    SegmentBox box = boxes_[items_[begin].segment];
    double lx = items_[begin].cx, hx = lx, ly = items_[begin].cy, hy = ly;
    for (int i = begin + 1; i < end; ++i) {
      box = Union(box, boxes_[items_[i].segment]);
      lx = std::min(lx, items_[i].cx);
      hx = std::max(hx, items_[i].cx);
      ly = std::min(ly, items_[i].cy);
      hy = std::max(hy, items_[i].cy);
    }
    nodes_[index].box = box;
    if (end - begin <= kLeafSize) {
      nodes_[index].begin = begin;
      nodes_[index].end = end;
      return index;
    }
    const bool alongX = hx - lx >= hy - ly;
    const int mid = begin + (end - begin) / 2;
    if (alongX)
      std::nth_element(items_.begin() + begin, items_.begin() + mid, items_.begin() + end,
                       [](const Item& p, const Item& q) { return p.cx < q.cx; });
    else
      std::nth_element(items_.begin() + begin, items_.begin() + mid, items_.begin() + end,
                       [](const Item& p, const Item& q) { return p.cy < q.cy; });
    const int left = Build(begin, mid);
    const int right = Build(mid, end);
    nodes_[index].left = left;
    nodes_[index].right = right;
    return index;
  }
};

}  // namespace

template <class T>
void CollectSegmentPairs(const SegmentsT<T>& s, const SegmentIntersectionSettings& settings,
                         std::vector<SegmentPair>& pairs) {
  pairs.clear();
  const int n = static_cast<int>(s.segments.size());
  const int curveCount = static_cast<int>(s.curves.size());
  const double inflation = GetBoxInflation(settings);

  // Segments that can take part: a readable, finite, non-degenerate segment
  // of a valid curve. The others fail the box test or are skipped anyway.
  std::vector<SegmentBox> boxes(n);
  std::vector<Item> drivers;
  std::vector<int> targets;
  drivers.reserve(size_t(n));
  bool centresFinite = true;
  for (int j = 0; j < n; ++j) {
    const SegmentIntersections& seg = s.segments[j];
    if (seg.degenerate || seg.curve < 0 || seg.curve >= curveCount) continue;
    T const* p = s.SegmentPoints(j);
    if (!p || !GetSegmentBox(p, seg.type, inflation, boxes[j])) continue;
    if (s.curves[seg.curve].active) {
      const double cx = 0.5 * boxes[j].minX + 0.5 * boxes[j].maxX;
      const double cy = 0.5 * boxes[j].minY + 0.5 * boxes[j].maxY;
      centresFinite = centresFinite && std::isfinite(cx) && std::isfinite(cy);
      drivers.push_back({j, cx, cy});
    } else {
      targets.push_back(j);
    }
  }
  if (drivers.empty()) return;

  std::vector<SegmentPair> found;
  // A pair of two drivers is visited from the lower index; a driver and a
  // target from the driver. Segments of one curve meet only if it is
  // self-tested.
  auto addPair = [&](int a, int b) {
    const int ca = s.segments[a].curve, cb = s.segments[b].curve;
    if (ca == cb && !s.curves[ca].selfTest) return;
    const bool aDrives = s.curves[ca].active, bDrives = s.curves[cb].active;
    if (aDrives && bDrives)
      found.push_back(a < b ? SegmentPair{a, b} : SegmentPair{b, a});
    else if (aDrives)
      found.push_back({a, b});
    else if (bDrives)
      found.push_back({b, a});
  };

  if (drivers.size() <= kDirectDrivers || !centresFinite) {
    // Few drivers (a probe), or boxes too large for centres: one pass each.
    for (size_t x = 0; x < drivers.size(); ++x) {
      const int a = drivers[x].segment;
      for (size_t y = x + 1; y < drivers.size(); ++y)
        if (DoBoxesMeet(boxes[a], boxes[drivers[y].segment])) addPair(a, drivers[y].segment);
      for (int t : targets)
        if (DoBoxesMeet(boxes[a], boxes[t])) addPair(a, t);
    }
  } else {
    const Hierarchy tree(drivers, boxes);
    tree.SelfPairs([&](int a, int b) { addPair(a, b); });
    std::vector<int> stack;
    for (int t : targets) tree.Query(boxes[t], stack, [&](int a) { addPair(a, t); });
  }

  // Visiting order: bucket by driver, then each bucket by target.
  std::vector<int> start(n + 1, 0);
  for (const SegmentPair& p : found) ++start[p.driver + 1];
  for (int i = 0; i < n; ++i) start[i + 1] += start[i];
  pairs.resize(found.size());
  {
    std::vector<int> fill(start.begin(), start.end() - 1);
    for (const SegmentPair& p : found) pairs[fill[p.driver]++] = p;
  }
  for (int i = 0; i < n; ++i)
    if (start[i + 1] - start[i] > 1)
      std::sort(pairs.begin() + start[i], pairs.begin() + start[i + 1],
                [](const SegmentPair& p, const SegmentPair& q) { return p.target < q.target; });
}

using Framework::common_types::POINT;
using MavikMath::V;

template void CollectSegmentPairs<POINT>(const SegmentsT<POINT>&, const SegmentIntersectionSettings&,
                                         std::vector<SegmentPair>&);
template void CollectSegmentPairs<V>(const SegmentsT<V>&, const SegmentIntersectionSettings&,
                                     std::vector<SegmentPair>&);

}  // namespace OstraCrv
