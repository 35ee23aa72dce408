// Moves of array stretches against std::vector erase/insert, and the failure
// answers of the raw path functions on bad input.
#include <gtest/gtest.h>

#include <random>
#include <vector>

#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using MavikMath::V;
using Nodes = std::vector<NODETYPE>;

template <class T>
T pointOf(int k) {
  return T{decltype(T::x)(k), decltype(T::y)(-k)};
}

template <class T>
class PathMove : public ::testing::Test {};
using PointTypes = ::testing::Types<POINT, V>;
TYPED_TEST_SUITE(PathMove, PointTypes);

// Entry k holds point k and byte k in both arrays, so every move can be
// checked against the same move of a plain vector of indices.
TYPED_TEST(PathMove, GapsAndMovesMatchVectorEdits) {
  using T = TypeParam;
  std::mt19937 rng(1212);
  for (int trial = 0; trial < 500; ++trial) {
    const int n = 1 + int(rng() % 40);
    const int cap = n + 8;
    std::vector<T> pts(cap);
    Nodes nodes(cap);
    std::vector<int> ref(cap);
    for (int k = 0; k < cap; ++k) pts[k] = pointOf<T>(k), nodes[k] = NODETYPE(k), ref[k] = k;
    const int i = int(rng() % unsigned(n));
    const int op = int(rng() % 3);
    // Entries past the new end keep their values.
    std::vector<int> expected(ref);
    if (op == 0) {
      const int count = 1 + int(rng() % unsigned(n - i));
      PathDelNext(nodes.data(), pts.data(), i, count, n);
      std::copy(ref.begin() + i + count, ref.begin() + n, expected.begin() + i);
    } else if (op == 1) {
      const int count = 1 + int(rng() % 8);
      PathInsNext(nodes.data(), pts.data(), i, count, n);
      std::copy(ref.begin() + i, ref.begin() + n, expected.begin() + i + count);
    } else {
      const int count = 1 + int(rng() % unsigned(n));
      const int from = int(rng() % unsigned(cap - count + 1)), to = int(rng() % unsigned(cap - count + 1));
      OstraCrv::MovePath(pts.data(), nodes.data(), to, from, count);
      std::copy(ref.begin() + from, ref.begin() + from + count, expected.begin() + to);
    }
    ref = expected;
    for (int k = 0; k < cap; ++k) {
      ASSERT_EQ(pts[k], pointOf<T>(ref[k]));
      ASSERT_EQ(nodes[k], NODETYPE(ref[k]));
    }
  }
}

TYPED_TEST(PathMove, CopyBetweenPathsAndBadArguments) {
  using T = TypeParam;
  std::vector<T> src(6), dst(6);
  Nodes srcNodes(6), dstNodes(6, 0xEE);
  for (int k = 0; k < 6; ++k) src[k] = pointOf<T>(k + 1), srcNodes[k] = NODETYPE(k);
  OstraCrv::CopyPath(dst.data(), dstNodes.data(), 1, src.data(), srcNodes.data(), 3, 3);
  EXPECT_EQ(dst[0], T{});
  for (int k = 0; k < 3; ++k) {
    EXPECT_EQ(dst[1 + k], pointOf<T>(4 + k));
    EXPECT_EQ(dstNodes[1 + k], NODETYPE(3 + k));
  }
  EXPECT_EQ(dstNodes[4], 0xEE);

  const auto before = dst;
  const auto beforeNodes = dstNodes;
  OstraCrv::CopyPath(dst.data(), dstNodes.data(), -1, src.data(), srcNodes.data(), 0, 2);
  OstraCrv::CopyPath<T>(dst.data(), dstNodes.data(), 0, nullptr, srcNodes.data(), 0, 2);
  OstraCrv::MovePath(dst.data(), dstNodes.data(), 0, 2, -3);
  OstraCrv::MovePath<T>(nullptr, dstNodes.data(), 0, 2, 3);
  PathDelNext(dstNodes.data(), dst.data(), -1, 2, 6);
  PathDelNext(dstNodes.data(), dst.data(), 4, 5, 6);  // gap reaches past the end: no tail
  PathInsNext(dstNodes.data(), dst.data(), 6, 2, 6);  // nothing behind i
  PathInsNext<T>(nullptr, dst.data(), 0, 2, 6);
  EXPECT_EQ(dst, before);
  EXPECT_EQ(dstNodes, beforeNodes);
}

// Null arrays with a count, negative counts and out-of-range indices give the
// failure answers and never touch memory outside the array (the sanitizer
// build checks the latter).
TEST(NodeBadInput, FailureValues) {
  using namespace OstraCrv;
  const Nodes path = {NodeTypes::Closed::move, NodeTypes::Open::line, NodeTypes::Open::line,
                      NodeTypes::Closed::line};
  for (const NODETYPE* v : {static_cast<const NODETYPE*>(nullptr), path.data()}) {
    for (int n : {-5, -1, 0, 4}) {
      if (v && n == 4) continue;  // the valid call
      for (int i : {-1, 0, 3, 4, 1 << 30}) {
        if (v && n > 0 && i >= 0 && i < n) continue;
        EXPECT_EQ(NN(v, i, n), i);
        EXPECT_EQ(PN(v, i, n), i);
        EXPECT_EQ(NNControl(v, i, n), i);
        EXPECT_EQ(PNControl(v, i, n), i);
        EXPECT_EQ(OtherClosedEnd(v, i, n), -1);
        EXPECT_FALSE(CRV_IsFirstOrLastSubpathNode(v, n, i));
        EXPECT_FALSE(CRV_IsFirstOrLastClosedSubpathNode(v, n, i));
        EXPECT_FALSE(CRV_IsLastOpenSubpathNode(v, n, i));
        EXPECT_FALSE(CRV_IsThisSubpathClosed(v, n, i));
        EXPECT_FALSE(CRV_TwoNodesInSameSubpath(v, n, i, 0));
        EXPECT_FALSE(IsNodeSmoothable(v, i, n));
        EXPECT_FALSE(IsNodeSymmetable(v, i, n));
        EXPECT_EQ(CRV_FirstNodeOfThisSubpath(v, n, i), -1);
        EXPECT_EQ(CRV_LastNodeOfThisSubpath(v, n, i), -1);
        EXPECT_EQ(CRV_GetUserNode(v, n, i), -1);
        EXPECT_EQ(CRV_CountNodesInSubpath(v, i, n), 0);
        EXPECT_EQ(LastNodeToSegmentIndex(v, n, i), -1);
        EXPECT_EQ(FirstNodeToSegmentIndex(v, n, i), -1);
        EXPECT_EQ(SegmentToLastNodeIndex(v, n, i), -1);
        EXPECT_EQ(SegmentToFirstNodeIndex(v, n, i), -1);
      }
      if (n == 4) continue;
      EXPECT_EQ(CRV_HowManyLines(v, n), 0);
      EXPECT_EQ(CRV_HowManyCurves(v, n), 0);
      EXPECT_EQ(CRV_HowManyOpenSubpaths(v, n), 0);
      EXPECT_EQ(CRV_NumSubpaths(v, n), 0);
      EXPECT_EQ(GetSegmentCount(v, n), 0);
      EXPECT_EQ(CRV_GetNumberOfUserNodes(v, unsigned(n), false), 0);
      EXPECT_FALSE(CRV_ContainsClosedSubpath(v, n));
      EXPECT_FALSE(CRV_ContainsOpenSubpath(v, n, false));
    }
  }
  EXPECT_EQ(CRV_GetNumberOfUserNodes(nullptr, 4, false), 0);
  EXPECT_FALSE(FixNodeTypes(nullptr, 4));
  EXPECT_EQ(crvProblem(), 0);

  // Writers leave the array alone on a bad index or count.
  Nodes w = path;
  for (int i : {-1, 4, 100}) {
    CRV_SetEnabled(w.data(), 4, i, 1);
    CRV_SetCont(w.data(), 4, i, ContinuityType::symm);
  }
  CRV_SetEnabled(w.data(), -4, 0, 1);
  CRV_SetEnabled(nullptr, 4, 0, 1);
  Nodes big = path;
  EXPECT_FALSE(FixNodeTypes(big.data(), static_cast<unsigned long>(-4)));
  EXPECT_EQ(w, path);
  EXPECT_EQ(big, path);
}

// Paths that break the rules are read without stepping outside the array.
TEST(NodeBadInput, InvalidKindsStayInBounds) {
  std::mt19937 rng(1313);
  for (int trial = 0; trial < 3000; ++trial) {
    const int n = 1 + int(rng() % 12);
    Nodes v(n);
    for (auto& b : v) b = NODETYPE(rng());
    for (int i = 0; i < n; ++i) {
      for (int r : {NN(v.data(), i, n), PN(v.data(), i, n), NNControl(v.data(), i, n), PNControl(v.data(), i, n)}) {
        ASSERT_GE(r, 0);
        ASSERT_LT(r, n);
      }
      const int twin = OtherClosedEnd(v.data(), i, n);
      ASSERT_LT(twin, n);
      IsNodeSmoothable(v.data(), i, n);
      IsNodeSymmetable(v.data(), i, n);
      CRV_GetUserNode(v.data(), n, i);
      const int s = OstraCrv::FirstNodeToSegmentIndex(v.data(), n, i);
      ASSERT_LT(s, n);
      const int start = OstraCrv::SegmentToFirstNodeIndex(v.data(), n, i);
      ASSERT_LT(start, n);
      ASSERT_GE(start, -1);
    }
    Nodes fixed = v;
    OstraCrv::FixNodeTypes(fixed.data(), fixed.size());
    EXPECT_FALSE(OstraCrv::FixNodeTypes(fixed.data(), fixed.size()));
  }
}

}  // namespace
