// Handles that share one storage, used from several threads: copies and
// destructions must keep the reference count exact, and concurrent writes
// through two handles must each fork away with the right content. Meant to be
// run under ThreadSanitizer too.
#include <gtest/gtest.h>

#include <latch>
#include <thread>
#include <vector>

#include "polycurve.h"

namespace {

using Framework::common_types::POINT;
using OstraCrv::Polycurve;

Polycurve MakeCurve(int n) {
  std::vector<POINT> pts(n);
  std::vector<NODETYPE> nodes(n, NodeTypes::Open::line);
  for (int i = 0; i < n; ++i) pts[i] = {i, -i};
  nodes[0] = NodeTypes::Open::move;
  return Polycurve(pts.data(), nodes.data(), n);
}

bool HasContent(const Polycurve& c, int n, int fill) {
  if (c.GetPointCount() != unsigned(n)) return false;
  for (int i = 0; i < n; ++i) {
    const POINT want = fill == 0 ? POINT{i, -i} : POINT{fill, fill};
    if (c.GetPoint(i) != want) return false;
  }
  return true;
}

TEST(PolycurveThreads, CopiesAndDestructionsKeepTheCountExact) {
  constexpr int kThreads = 4, kRounds = 20000, kN = 64;
  Polycurve source = MakeCurve(kN);
  const POINT* storage = source.GetPoints();
  std::latch start(kThreads);
  std::vector<std::thread> threads;
  for (int t = 0; t < kThreads; ++t) {
    threads.emplace_back([&, t] {
      start.arrive_and_wait();
      std::vector<Polycurve> held;
      for (int r = 0; r < kRounds; ++r) {
        held.push_back(source);
        Polycurve again(held.back());
        again = held[held.size() / 2];
        if ((r + t) % 7 == 0) held.clear();
      }
      EXPECT_TRUE(HasContent(held.empty() ? source : held.front(), kN, 0));
    });
  }
  for (auto& th : threads) th.join();

  // Every copy is gone, so the source is the sole holder again: a write
  // happens in place instead of forking.
  EXPECT_TRUE(source.SetPoint(0, POINT{5, 5}));
  EXPECT_EQ(source.GetPoints(), storage);
}

TEST(PolycurveThreads, TwoHandlesWrittenAtOnceEachForkAway) {
  constexpr int kRounds = 300, kN = 200;
  for (int round = 0; round < kRounds; ++round) {
    // Odd rounds keep a third holder, so that the last one to leave differs.
    Polycurve keeper = MakeCurve(kN);
    Polycurve a(keeper), b(keeper);
    if (round % 2 == 0) keeper = Polycurve();
    std::latch start(2);
    std::thread ta([&] {
      start.arrive_and_wait();
      for (int i = 0; i < kN; ++i) a.SetPoint(i, POINT{1, 1});
    });
    std::thread tb([&] {
      start.arrive_and_wait();
      auto buf = b.GetBuffer(kN + 10);
      for (int i = 0; i < buf.count; ++i) buf.points[i] = POINT{2, 2};
      b.ReleaseBufferInternal(kN);
    });
    ta.join();
    tb.join();
    ASSERT_FALSE(a.IsSameData(b));
    ASSERT_TRUE(HasContent(a, kN, 1)) << round;
    ASSERT_TRUE(HasContent(b, kN, 2)) << round;
    if (round % 2 == 1) {
      ASSERT_TRUE(HasContent(keeper, kN, 0)) << round;
    }
  }
}

// Borrowed arrays read by forks on several threads at once stay untouched.
TEST(PolycurveThreads, SharedViewForksOnEveryThread) {
  constexpr int kThreads = 4, kN = 100;
  std::vector<POINT> pts(kN);
  std::vector<NODETYPE> nodes(kN, NodeTypes::Open::line);
  for (int i = 0; i < kN; ++i) pts[i] = {i, -i};
  nodes[0] = NodeTypes::Open::move;
  const std::vector<POINT> snapshot = pts;
  for (int round = 0; round < 50; ++round) {
    OstraCrv::PolycurveRef view(pts.data(), nodes.data(), kN);
    std::vector<Polycurve> copies(kThreads, view);
    view = Polycurve();
    std::latch start(kThreads);
    std::vector<std::thread> threads;
    for (int t = 0; t < kThreads; ++t)
      threads.emplace_back([&, t] {
        start.arrive_and_wait();
        copies[t].SetPoint(t, POINT{100 + t, 0});
      });
    for (auto& th : threads) th.join();
    for (int t = 0; t < kThreads; ++t) {
      ASSERT_EQ(copies[t].GetPoint(t), (POINT{100 + t, 0}));
      ASSERT_EQ(copies[t].GetPoint((t + 1) % kThreads), pts[(t + 1) % kThreads]);
    }
    ASSERT_EQ(pts, snapshot);
  }
}

}  // namespace
