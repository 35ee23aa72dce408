// Copy-on-write handles: sharing and forking, borrowed arrays, the buffer
// protocol, ordering, polylines, conversion between point kinds, bad input,
// and a long random run of edits checked against plain vectors.
#include <gtest/gtest.h>

#include <algorithm>
#include <climits>
#include <cmath>
#include <cstring>
#include <random>
#include <stdexcept>
#include <vector>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using OstraCrv::PolycurveRefT;
using OstraCrv::PolycurveT;
using OstraCrv::PolylineT;
using Bytes = std::vector<NODETYPE>;
using testgeo::NodesOf;

template <class T>
T Pt(double x, double y) {
  if constexpr (std::is_same_v<T, POINT>)
    return POINT{int32_t(x), int32_t(y)};
  else
    return V{x, y};
}

// Rounding half away from zero, written independently of the library.
int32_t RoundHalfAway(double x) { return int32_t(x < 0 ? std::ceil(x - 0.5) : std::floor(x + 0.5)); }

template <class T>
struct Model {
  std::vector<T> pts;
  std::vector<NODETYPE> nodes;
};

template <class T>
bool BytesEqual(const T* a, const T* b, size_t n) {
  return n == 0 || std::memcmp(a, b, n * sizeof(T)) == 0;
}

// The handle shows exactly the model's arrays, through every read path.
template <class T>
::testing::AssertionResult Matches(const PolycurveT<T>& c, const Model<T>& m) {
  const size_t n = m.pts.size();
  if (c.GetPointCount() != n) return ::testing::AssertionFailure() << "count " << c.GetPointCount() << " vs " << n;
  if (c.IsEmpty() != (n == 0)) return ::testing::AssertionFailure() << "IsEmpty";
  if (n == 0 && (c.GetPoints() || c.GetNodeTypes())) return ::testing::AssertionFailure() << "non-null when empty";
  if (!BytesEqual(c.GetPoints(), m.pts.data(), n)) return ::testing::AssertionFailure() << "points differ";
  if (!BytesEqual(c.GetNodeTypes(), m.nodes.data(), n)) return ::testing::AssertionFailure() << "nodes differ";
  std::vector<T> p;
  std::vector<NODETYPE> nd;
  c.GetCurve(p, nd);
  if (p.size() != n || nd != m.nodes || !BytesEqual(p.data(), m.pts.data(), n))
    return ::testing::AssertionFailure() << "GetCurve differs";
  const T zero{};
  if (!BytesEqual(&c.GetPoint(int(n)), &zero, 1) || c.GetNodeType(int(n)) != 0x04)
    return ::testing::AssertionFailure() << "default past the end";
  if (n > 0 && (!BytesEqual(&c.GetFirstPoint(), &m.pts.front(), 1) || !BytesEqual(&c.GetLastPoint(), &m.pts.back(), 1)))
    return ::testing::AssertionFailure() << "first/last";
  return ::testing::AssertionSuccess();
}

template <class T>
class PolycurveTyped : public ::testing::Test {};
using PointKinds = ::testing::Types<POINT, V>;
TYPED_TEST_SUITE(PolycurveTyped, PointKinds);

// An open path of lines through n points (x = i, y = 10 i).
template <class T>
Model<T> Line(int n, int offset = 0) {
  Model<T> m;
  for (int i = 0; i < n; ++i) {
    m.pts.push_back(Pt<T>(i + offset, 10 * i));
    m.nodes.push_back(i == 0 ? NodeTypes::Open::move : NodeTypes::Open::line);
  }
  return m;
}

template <class T>
PolycurveT<T> Make(const Model<T>& m) {
  return PolycurveT<T>(m.pts.data(), m.nodes.data(), m.pts.size());
}

// ---- Sharing ---------------------------------------------------------------

TYPED_TEST(PolycurveTyped, CopySharesUntilTheFirstWrite) {
  using T = TypeParam;
  const Model<T> m = Line<T>(5);
  PolycurveT<T> a = Make(m);
  PolycurveT<T> b(a);
  EXPECT_TRUE(a.IsSameData(b));
  EXPECT_EQ(a.GetPoints(), b.GetPoints());

  // Writes out of range change nothing and do not fork.
  EXPECT_FALSE(b.SetPoint(5, Pt<T>(1, 1)));
  EXPECT_FALSE(b.SetPoint(-1, Pt<T>(1, 1)));
  EXPECT_FALSE(b.SetNodeType(7, NodeTypes::arc));
  b.SetSegmentType(9, SegmentType::arc);
  b.SetContinuity(-2, ContinuityType::smooth);
  b.Truncate(5);
  EXPECT_FALSE(b.ReleaseBufferInternal(-1));
  EXPECT_TRUE(a.IsSameData(b));

  EXPECT_TRUE(b.SetPoint(2, Pt<T>(99, 98)));
  EXPECT_FALSE(a.IsSameData(b));  // (what each side then holds: the random run)

  // The sole holder writes in place.
  const T* before = b.GetPoints();
  b.SetPoint(0, Pt<T>(-1, -1));
  b.SetNodeType(1, NodeTypes::Open::curve);
  EXPECT_EQ(b.GetPoints(), before);

  // Assignment shares; self-assignment is harmless.
  b = a;
  EXPECT_TRUE(a.IsSameData(b));
  b = *&b;
  EXPECT_TRUE(Matches(b, m));
}

// ---- Borrowed arrays -------------------------------------------------------

TYPED_TEST(PolycurveTyped, ReferenceBorrowsUntilOwnershipIsTaken) {
  using T = TypeParam;
  Model<T> caller = Line<T>(6);
  caller.nodes[5] = NodeTypes::Open::line | NodeMask::kLetter;
  const Model<T> snapshot = caller;

  PolycurveRefT<T> r(caller.pts.data(), caller.nodes.data(), caller.pts.size());
  // Reads see the caller's memory directly and answer as an owning copy.
  EXPECT_EQ(r.GetPoints(), caller.pts.data());
  EXPECT_EQ(r.Compare(Make(caller)), 0);
  // (That writes through a view never reach the caller: the random run.)
  // Taking ownership copies borrowed arrays: later changes by the caller are
  // not seen.
  PolycurveRefT<T> view(caller.pts.data(), caller.nodes.data(), caller.pts.size());
  PolycurveT<T> keep(view);
  keep.EnsureDataOwnership();
  EXPECT_FALSE(keep.IsSameData(view));
  caller.pts[1] = Pt<T>(1000, 1000);
  EXPECT_TRUE(Matches(keep, snapshot));

  // On owning storage ownership is already there, and sharing stays; so
  // does appending to an empty curve, except from a borrowed view, which is
  // copied.
  PolycurveT<T> a = Make(snapshot), b(a), e1, e2;
  b.EnsureDataOwnership();
  EXPECT_TRUE(a.IsSameData(b));
  e1.PushBack(a);
  EXPECT_TRUE(e1.IsSameData(a));
  PolycurveRefT<T> v2(snapshot.pts.data(), snapshot.nodes.data(), snapshot.pts.size());
  e2.PushBack(v2);
  EXPECT_FALSE(e2.IsSameData(v2));
  EXPECT_NE(e2.GetPoints(), snapshot.pts.data());
  EXPECT_TRUE(Matches(e2, snapshot));
}

TYPED_TEST(PolycurveTyped, ImpossibleRequestsThrowAndLeaveTheCurve) {
  using T = TypeParam;
  const Model<T> m = Line<T>(3);
  PolycurveT<T> a = Make(m), b(a);
  const unsigned long huge = ~0ul >> 1;
  EXPECT_THROW(b.Reserve(huge), std::length_error);  // shared path
  EXPECT_TRUE(b.IsSameData(a));
  PolycurveT<T> c = Make(m);
  EXPECT_THROW(c.Reserve(huge), std::length_error);  // in-place path
  EXPECT_TRUE(Matches(c, m));
  EXPECT_TRUE(Matches(b, m));
}

// ---- Ordering --------------------------------------------------------------

// (Compare itself is checked against the model by the random run.)
TYPED_TEST(PolycurveTyped, OperatorsFollowCompare) {
  using T = TypeParam;
  const PolycurveT<T> small = Make(Line<T>(2, 1000)), big = Make(Line<T>(3, -1000));
  EXPECT_TRUE(small < big);
  EXPECT_FALSE(big < small);
  PolycurveT<T> x = Make(Line<T>(3)), y = Make(Line<T>(3));
  EXPECT_TRUE(x == y);
  y.SetNodeType(2, NodeTypes::Open::curve);
  EXPECT_FALSE(x == y);
}

TEST(PolycurveCompare, DoubleCoordinatesCompareAsBits) {
  const V p0[] = {{0.0, 1.0}}, p1[] = {{-0.0, 1.0}};
  const NODETYPE n[] = {NodeTypes::Open::move};
  const OstraCrv::PolycurveD a(p0, n, 1), b(p1, n, 1);
  EXPECT_NE(a.Compare(b), 0);
  EXPECT_FALSE(a == b);
  EXPECT_EQ(a.Compare(b) < 0, b.Compare(a) > 0);
  const V q[] = {{std::nan(""), 2.0}};
  const OstraCrv::PolycurveD c(q, n, 1), d(q, n, 1);
  EXPECT_TRUE(c == d);
}

// ---- Polylines -------------------------------------------------------------

TYPED_TEST(PolycurveTyped, PolylineNodes) {
  using T = TypeParam;
  const T tri[] = {Pt<T>(0, 0), Pt<T>(10, 0), Pt<T>(10, 10)};
  EXPECT_EQ(NodesOf(PolylineT<T>(tri, 3, false)), (Bytes{0x04, 0x44, 0x44}));
  const PolylineT<T> closed(tri, 3, true);
  EXPECT_EQ(NodesOf(closed), (Bytes{0x0C, 0x44, 0x44, 0x48}));
  EXPECT_TRUE(BytesEqual(&closed.GetLastPoint(), &tri[0], 1));
  const T ring[] = {Pt<T>(0, 0), Pt<T>(10, 0), Pt<T>(0, 0)};  // already ends on its start
  EXPECT_EQ(NodesOf(PolylineT<T>(ring, 3, true)), (Bytes{0x0C, 0x44, 0x48}));
  EXPECT_EQ(NodesOf(PolylineT<T>(tri, 1, true)), (Bytes{0x04}));
  EXPECT_TRUE(PolylineT<T>(tri, 0, true).IsEmpty());
  EXPECT_TRUE(PolylineT<T>(nullptr, 5, true).IsEmpty());
}

// ---- Conversion between point kinds ------------------------------------------

TEST(PolycurveConversion, DoublesRoundHalfAwayFromZero) {
  const V pts[] = {{2.5, -2.5}, {2.4999, -2.4999}, {0.5, -0.5}, {1e12, -1e12}, {-0.0, 7.0}};
  const NODETYPE nodes[] = {0x04, 0x45, 0x46, 0x54, 0x48};
  const OstraCrv::PolycurveD d(pts, nodes, 5);
  const OstraCrv::Polycurve i(d);
  const POINT want[] = {{3, -3}, {2, -2}, {1, -1}, {INT32_MAX, INT32_MIN}, {0, 7}};
  ASSERT_EQ(i.GetPointCount(), 5u);
  for (int k = 0; k < 5; ++k) {
    EXPECT_EQ(i.GetPoint(k), want[k]) << k;
    EXPECT_EQ(i.GetNodeType(k), nodes[k]);
  }
  // The raw cross-kind append (its rounding: the random run) forks nothing
  // for n = 0.
  OstraCrv::Polycurve k2 = i;
  EXPECT_TRUE(k2.PushBack(static_cast<const V*>(nullptr), nullptr, 0));
  EXPECT_TRUE(k2.IsSameData(i));
}

TEST(PolycurveConversion, IntegersSurviveARoundTrip) {
  std::mt19937 rng(7);
  std::uniform_int_distribution<int32_t> any(INT32_MIN, INT32_MAX);
  std::vector<POINT> pts(500);
  std::vector<NODETYPE> nodes(500);
  for (auto& p : pts) p = {any(rng), any(rng)};
  pts[0] = {INT32_MIN, INT32_MAX};
  for (auto& n : nodes) n = NODETYPE(rng());
  const OstraCrv::Polycurve a(pts.data(), nodes.data(), pts.size());
  const OstraCrv::PolycurveD d(a);
  for (size_t k = 0; k < pts.size(); ++k) ASSERT_EQ(d.GetPoint(int(k)), (V{double(pts[k].x), double(pts[k].y)}));
  const OstraCrv::Polycurve back(d);
  EXPECT_TRUE(back == a);
  EXPECT_FALSE(back.IsSameData(a));
}

// ---- Bad input ---------------------------------------------------------------

TYPED_TEST(PolycurveTyped, BadInputGivesFailureValues) {
  using T = TypeParam;
  const Model<T> m = Line<T>(3);
  const unsigned long negative = static_cast<unsigned long>(-1L);

  // Null arrays and negative counts are never read.
  EXPECT_TRUE(PolycurveT<T>(m.pts.data(), nullptr, 3).IsEmpty());
  EXPECT_TRUE(PolycurveT<T>(nullptr, m.nodes.data(), 3).IsEmpty());
  EXPECT_TRUE(PolycurveT<T>(m.pts.data(), m.nodes.data(), negative).IsEmpty());
  EXPECT_TRUE(PolycurveRefT<T>(m.pts.data(), nullptr, 3).IsEmpty());
  EXPECT_TRUE(PolycurveRefT<T>(m.pts.data(), m.nodes.data(), negative).IsEmpty());
  EXPECT_TRUE(PolycurveT<T>(negative).IsEmpty());

  PolycurveT<T> a = Make(m), b(a);
  EXPECT_FALSE(b.SetPoints(m.pts.data(), nullptr, 2));
  EXPECT_FALSE(b.SetPoints(m.pts.data(), m.nodes.data(), negative));
  EXPECT_FALSE(b.SetPoints(std::vector<T>{}, m.nodes));
  EXPECT_FALSE(b.PushBack(static_cast<const T*>(nullptr), m.nodes.data(), 2));
  EXPECT_FALSE(b.PushBack(m.pts.data(), m.nodes.data(), negative));
  EXPECT_FALSE(b.PushBack(std::vector<T>{}, m.nodes));
  EXPECT_FALSE(b.PushBack(static_cast<const typename PolycurveT<T>::OtherT*>(nullptr), m.nodes.data(), 1));
  b.Reserve(negative);
  EXPECT_TRUE(b.IsSameData(a));
  EXPECT_TRUE(Matches(b, m));

  // Reads out of range answer the static defaults.
  const T zero{};
  for (int i : {-1, 3, INT_MAX}) EXPECT_TRUE(BytesEqual(&a.GetPoint(i), &zero, 1) && a.GetNodeType(i) == 0x04) << i;
  EXPECT_EQ(a.GetSegmentType(3), SegmentType::move);
  EXPECT_FALSE(a.IsLetter(3));
  EXPECT_FALSE(a.IsUser(-1));
  EXPECT_EQ(a.GetContinuity(99), ContinuityType::cusp);
  PolycurveT<T> e2;
  EXPECT_TRUE(BytesEqual(&e2.GetFirstPoint(), &zero, 1) && BytesEqual(&e2.GetLastPoint(), &zero, 1));
  EXPECT_FALSE(e2.SetFirstPoint(Pt<T>(1, 1)));
  EXPECT_FALSE(e2.SetLastPoint(Pt<T>(1, 1)));
  EXPECT_TRUE(e2.Points().empty());
  EXPECT_TRUE(e2.Indexes().empty());

  // The vector forms use the shorter length.
  std::vector<NODETYPE> two(m.nodes.begin(), m.nodes.begin() + 2);
  EXPECT_TRUE(e2.SetPoints(m.pts, two));
  EXPECT_EQ(e2.GetPointCount(), 2u);
  // A raw count of zero empties.
  EXPECT_TRUE(e2.SetPoints(nullptr, nullptr, 0));
  EXPECT_TRUE(e2.IsEmpty());
}

// ---- Field writers ----------------------------------------------------------

// (The single-field writers and ClearLetterFlags are checked by the random run.)
TEST(PolycurveFields, ContinuityReachesTheTwinArcsLoseTheUserBit) {
  // A closed triangle of lines: nodes 0 and 3 are twins.
  const POINT pts[] = {{0, 0}, {10, 0}, {10, 10}, {0, 0}};
  const OstraCrv::PolylineT<POINT> tri(pts, 3, true);
  OstraCrv::Polycurve c(tri);
  c.SetContinuity(3, ContinuityType::smooth);
  EXPECT_EQ(c.GetContinuity(0), ContinuityType::smooth);
  EXPECT_EQ(c.GetContinuity(3), ContinuityType::smooth);
  EXPECT_EQ(tri.GetContinuity(0), ContinuityType::cusp);

  const POINT bz[] = {{0, 0}, {1, 1}, {2, 1}, {3, 0}};
  const NODETYPE bn[] = {0x04, 0xC4, 0xC5, 0x84};
  OstraCrv::Polycurve f(bz, bn, 4);
  f.ClearUserFlagOnArcs();
  EXPECT_EQ(f.GetNodeType(1), 0xC0);
  EXPECT_EQ(f.GetNodeType(2), 0xC1);
  EXPECT_EQ(f.GetNodeType(3), 0x84);

  POINT outP[4] = {};
  NODETYPE outN[4] = {};
  f.CopyTo(outP, outN);
  EXPECT_TRUE(BytesEqual(outP, bz, 4));
  EXPECT_EQ(outN[1], 0xC0);
  f.CopyTo(nullptr, outN);  // a null destination is skipped
}

// ---- Random edits against a reference model ----------------------------------

// The storage's Replace against vector erase/insert, including clamped
// positions and sources inside the storage itself.
TEST(CurveDataReplace, MatchesVectorSplicing) {
  std::mt19937 rng(99);
  auto pick = [&](int lo, int hi) { return std::uniform_int_distribution<int>(lo, hi)(rng); };
  OstraCrv::CurveData<POINT> d;
  std::vector<POINT> mp;
  std::vector<NODETYPE> mn;
  for (int step = 0; step < 5000; ++step) {
    const int size = int(mp.size());
    const int pos = pick(0, size + 3), count = pick(0, size + 3), m = pick(0, 6);
    std::vector<POINT> sp(m);
    std::vector<NODETYPE> sn(m);
    for (int i = 0; i < m; ++i) sp[i] = {pick(-9, 9), pick(-9, 9)}, sn[i] = NODETYPE(rng());
    const POINT* src = sp.data();
    const NODETYPE* srcN = sn.data();
    int mm = m;
    if (size > 0 && pick(0, 2) == 0) {  // take the source from the storage itself
      const int from = pick(0, size - 1);
      mm = pick(0, size - from);
      src = d.points.data() + from;
      srcN = d.nodes.data() + from;
      sp.assign(mp.begin() + from, mp.begin() + from + mm);
      sn.assign(mn.begin() + from, mn.begin() + from + mm);
    }
    d.Replace(unsigned(pos), unsigned(count), src, srcN, unsigned(mm));
    const int p0 = std::min(pos, size), c0 = std::min(count, size - p0);
    mp.erase(mp.begin() + p0, mp.begin() + p0 + c0);
    mp.insert(mp.begin() + p0, sp.begin(), sp.begin() + mm);
    mn.erase(mn.begin() + p0, mn.begin() + p0 + c0);
    mn.insert(mn.begin() + p0, sn.begin(), sn.begin() + mm);
    ASSERT_EQ(d.points, mp) << step;
    ASSERT_EQ(d.nodes, mn) << step;
    if (mp.size() > 40) {
      d.Truncate(5);
      mp.resize(5);
      mn.resize(5);
    }
  }
  // Null sources with a count change nothing.
  const auto before = d.points;
  d.Replace(0, 2, nullptr, nullptr, 3);
  EXPECT_EQ(d.points, before);
}

template <class T>
T RandomPoint(std::mt19937& rng) {
  std::uniform_int_distribution<int> d(-40, 40);
  if constexpr (std::is_same_v<T, POINT>) {
    return POINT{d(rng), d(rng)};
  } else {
    const int k = d(rng);
    // Include signed zeros and halves so that bit-wise comparison matters.
    return V{k == 0 ? -0.0 : k / 2.0, double(d(rng)) / 4.0};
  }
}

template <class T>
Model<T> RandomArrays(std::mt19937& rng, int maxN) {
  Model<T> m;
  const int n = std::uniform_int_distribution<int>(0, maxN)(rng);
  for (int i = 0; i < n; ++i) {
    m.pts.push_back(RandomPoint<T>(rng));
    m.nodes.push_back(NODETYPE(rng()));
  }
  return m;
}

template <class T>
int ModelCompare(const Model<T>& a, const Model<T>& b) {
  if (a.pts.size() != b.pts.size()) return a.pts.size() < b.pts.size() ? -1 : 1;
  if (a.pts.empty()) return 0;
  const auto* pa = reinterpret_cast<const unsigned char*>(a.pts.data());
  const auto* pb = reinterpret_cast<const unsigned char*>(b.pts.data());
  const size_t bytes = a.pts.size() * sizeof(T);
  if (std::lexicographical_compare(pa, pa + bytes, pb, pb + bytes)) return -1;
  if (std::lexicographical_compare(pb, pb + bytes, pa, pa + bytes)) return 1;
  if (a.nodes < b.nodes) return -1;
  if (b.nodes < a.nodes) return 1;
  return 0;
}

TYPED_TEST(PolycurveTyped, RandomEditsMatchTheReferenceModel) {
  using T = TypeParam;
  using Other = typename PolycurveT<T>::OtherT;
  std::mt19937 rng(20240611);
  auto pick = [&](int lo, int hi) { return std::uniform_int_distribution<int>(lo, hi)(rng); };

  // Borrowed arrays that must never change, with their snapshots.
  std::vector<Model<T>> pool, poolSnap;
  for (int k = 0; k < 3; ++k) pool.push_back(RandomArrays<T>(rng, 8));
  poolSnap = pool;

  constexpr int kSlots = 5;
  std::vector<PolycurveT<T>> h(kSlots);
  std::vector<Model<T>> m(kSlots);

  for (int step = 0; step < 20000; ++step) {
    const int a = pick(0, kSlots - 1), b = pick(0, kSlots - 1);
    PolycurveT<T>& c = h[a];
    Model<T>& mm = m[a];
    // Model edits: keep the first k nodes (when fewer), append nodes of another model.
    auto cut = [&mm](int k) {
      if (k >= 0 && k < int(mm.pts.size())) mm.pts.resize(k), mm.nodes.resize(k);
    };
    auto add = [&mm](const Model<T>& r, int from, int k) {
      mm.pts.insert(mm.pts.end(), r.pts.begin() + from, r.pts.begin() + from + k);
      mm.nodes.insert(mm.nodes.end(), r.nodes.begin() + from, r.nodes.begin() + from + k);
    };
    const int n = int(mm.pts.size());
    const int op = pick(0, 25);
    switch (op) {
      case 0:
        c = h[b];
        mm = m[b];
        break;
      case 1: {
        const int k = pick(-1, n + 1);
        c.ReleaseBuffer(k);
        cut(k);
        break;
      }
      case 2: {
        const int i = pick(-2, n + 1);
        const T p = RandomPoint<T>(rng);
        EXPECT_EQ(c.SetPoint(i, p), i >= 0 && i < n);
        if (i >= 0 && i < n) mm.pts[i] = p;
        break;
      }
      case 3: {
        const int i = pick(-2, n + 1);
        const NODETYPE v = NODETYPE(rng());
        EXPECT_EQ(c.SetNodeType(i, v), i >= 0 && i < n);
        if (i >= 0 && i < n) mm.nodes[i] = v;
        break;
      }
      case 4: {
        const T p = RandomPoint<T>(rng);
        const NODETYPE v = NODETYPE(rng());
        c.PushBack(p, v);
        add(Model<T>{{p}, {v}}, 0, 1);
        break;
      }
      case 5: {
        const Model<T> r = RandomArrays<T>(rng, 5);
        EXPECT_TRUE(c.PushBack(r.pts.data(), r.nodes.data(), r.pts.size()));
        add(r, 0, int(r.pts.size()));
        break;
      }
      case 6: {
        const Model<T> other = m[b];  // b may be a itself
        c.PushBack(h[b]);
        add(other, 0, int(other.pts.size()));
        break;
      }
      case 7: {
        const Model<T> r = RandomArrays<T>(rng, 9);
        EXPECT_TRUE(c.SetPoints(r.pts.data(), r.nodes.data(), r.pts.size()));
        mm = r;
        break;
      }
      case 8:
        EXPECT_TRUE(c.SetPoints(h[b]));
        mm = m[b];
        break;
      case 9: {
        const int k = pick(0, n + 2);
        c.Truncate(unsigned(k));
        cut(k);
        break;
      }
      case 10:
        c.Clear();
        mm = Model<T>();
        break;
      case 11: {
        const int want = pick(-1, n + 5);
        const bool exact = pick(0, 1) == 1;
        auto buf = c.GetBuffer(want, exact);
        if (want >= 0 && (exact ? want != n : want > n)) {
          mm.pts.resize(want);
          mm.nodes.resize(want);
        }
        ASSERT_EQ(buf.count, int(mm.pts.size()));
        for (int w = pick(0, 3); w > 0 && buf.count > 0; --w) {
          const int i = pick(0, buf.count - 1);
          buf.points[i] = mm.pts[i] = RandomPoint<T>(rng);
          buf.nodes[i] = mm.nodes[i] = NODETYPE(rng());
        }
        const int keep = pick(-1, buf.count + 2);
        EXPECT_EQ(c.ReleaseBufferInternal(keep), keep >= 0);
        cut(keep);
        break;
      }
      case 12: {
        Model<T> r = RandomArrays<T>(rng, 6);
        const Model<T> in = r, old = mm;
        c.MoveData(r.pts, r.nodes);
        mm = in;
        // The caller gets the old arrays back or empty vectors.
        const bool gotOld = r.pts.size() == old.pts.size() && BytesEqual(r.pts.data(), old.pts.data(), r.pts.size()) &&
                            r.nodes == old.nodes;
        EXPECT_TRUE(gotOld || (r.pts.empty() && r.nodes.empty()));
        break;
      }
      case 13:
        c.Swap(h[b]);
        if (a != b) std::swap(mm, m[b]);
        break;
      case 14:
        c = std::move(h[b]);
        if (a != b) std::swap(mm, m[b]);
        break;
      case 15: {
        PolycurveT<T> t(std::move(h[b]));
        EXPECT_TRUE(h[b].IsEmpty());  // NOLINT(bugprone-use-after-move)
        h[a] = t;
        if (a != b) {
          m[a] = m[b];
          m[b] = Model<T>();
        }
        break;
      }
      case 16: {
        const int i = pick(-1, n);
        const auto cont = ContinuityType(pick(0, 2));
        c.SetContinuity(i, cont);
        CRV_SetCont(mm.nodes.data(), n, i, cont);
        break;
      }
      case 17:
        c.Reserve(unsigned(pick(0, 3 * n + 3)));
        break;
      case 18:
        c.EnsureDataOwnership();
        break;
      case 19: {
        const Model<T>& src = pool[pick(0, 2)];
        c = PolycurveRefT<T>(src.pts.data(), src.nodes.data(), src.pts.size());
        mm = src;
        break;
      }
      case 20: {
        const int i = pick(-1, n);
        const bool on = pick(0, 1) == 1;
        const int which = pick(0, 3);
        if (i >= 0 && i < n) {
          NODETYPE& v = mm.nodes[i];
          const NODETYPE mask = which == 1 ? NodeMask::kClosed : which == 2 ? NodeMask::kUser : NodeMask::kLetter;
          if (which == 0) {
            v = NODETYPE((v & 0x3F) | (on ? 0x80 : 0x40));
          } else {
            v = NODETYPE(on ? (v | mask) : (v & ~mask));
          }
        }
        if (which == 0) c.SetSegmentType(i, on ? SegmentType::curve : SegmentType::line);
        if (which == 1) c.SetNodeClosed(i, on);
        if (which == 2) c.SetUserNode(i, on);
        if (which == 3) c.SetLetter(i, on);
        break;
      }
      case 21: {
        bool any = false;
        for (auto& v : mm.nodes) {
          any |= (v & NodeMask::kLetter) != 0;
          v = NODETYPE(v & ~NodeMask::kLetter);
        }
        EXPECT_EQ(c.ClearLetterFlags(), any);
        break;
      }
      case 22: {
        const Model<Other> r = RandomArrays<Other>(rng, 4);
        EXPECT_TRUE(c.PushBack(r.pts.data(), r.nodes.data(), r.pts.size()));
        for (size_t k = 0; k < r.pts.size(); ++k) {
          if constexpr (std::is_same_v<T, POINT>)
            mm.pts.push_back(POINT{RoundHalfAway(r.pts[k].x), RoundHalfAway(r.pts[k].y)});
          else
            mm.pts.push_back(V{double(r.pts[k].x), double(r.pts[k].y)});
          mm.nodes.push_back(r.nodes[k]);
        }
        break;
      }
      case 23: {
        c = PolycurveT<T>(PolycurveT<Other>(c));
        if constexpr (std::is_same_v<T, V>)
          for (auto& p : mm.pts) p = V{double(RoundHalfAway(p.x)), double(RoundHalfAway(p.y))};
        break;
      }
      case 24: {
        // Append a stretch of the curve's own arrays (they may move meanwhile).
        const int from = pick(0, n), k = pick(0, n - from);
        EXPECT_TRUE(c.PushBack(c.GetPoints() + from, c.GetNodeTypes() + from, unsigned(k)));
        add(Model<T>(mm), from, k);
        break;
      }
      case 25: {
        // Replace the content by an overlapping stretch of itself.
        const int from = pick(0, n), k = pick(0, n - from);
        EXPECT_TRUE(c.SetPoints(c.GetPoints() + from, c.GetNodeTypes() + from, unsigned(k)));
        const Model<T> old = mm;
        mm = Model<T>();
        add(old, from, k);
        break;
      }
    }
    for (int k = 0; k < kSlots; ++k) ASSERT_TRUE(Matches(h[k], m[k])) << "step " << step << " op " << op << " slot " << k;
    for (int k = 0; k < 3; ++k) {
      ASSERT_TRUE(BytesEqual(pool[k].pts.data(), poolSnap[k].pts.data(), pool[k].pts.size()));
      ASSERT_EQ(pool[k].nodes, poolSnap[k].nodes);
    }
    if (step % 16 == 0) {
      for (int x = 0; x < kSlots; ++x)
        for (int y = 0; y < kSlots; ++y) ASSERT_EQ(h[x].Compare(h[y]), ModelCompare(m[x], m[y]));
    }
  }
}

}  // namespace
