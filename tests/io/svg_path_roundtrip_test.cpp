// Writing path data and reading it back: exact round trips on random double
// curves (coordinates chosen to hit every shortcut of the writer: H, V, S,
// relative steps, Z for the closing line, negative zero, huge and tiny
// values), rounding at a chosen precision, compact output, refusals; and a
// mutation run that feeds thousands of damaged texts through the reader.
#include <gtest/gtest.h>

#include <cmath>
#include <cstring>
#include <random>
#include <string>
#include <vector>

#include "polycurve.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;

class CurveMaker {
 public:
  explicit CurveMaker(unsigned seed) : rng_(seed) {}

  double Coord() {
    switch (rng_() % 8) {
      case 0: return double(int(rng_() % 41) - 20);
      case 1: return std::uniform_real_distribution<double>(-1000, 1000)(rng_);
      case 2: {
        // Any finite double, from its bits.
        for (;;) {
          uint64_t bits = (uint64_t(rng_()) << 32) | rng_();
          double d;
          std::memcpy(&d, &bits, sizeof d);
          if (std::isfinite(d) && std::fabs(d) < 1e300) return d;
        }
      }
      case 3: return rng_() % 2 ? 0.0 : -0.0;
      case 4: return std::uniform_real_distribution<double>(-1, 1)(rng_) * 1e-7;
      default: return std::round(std::uniform_real_distribution<double>(-500, 500)(rng_) * 100) / 100;
    }
  }
  V Point(const V& cur) {
    switch (rng_() % 6) {
      case 0: return {Coord(), cur.y};  // a horizontal line
      case 1: return {cur.x, Coord()};  // a vertical line
      default: return {Coord(), Coord()};
    }
  }

  // A curve in the bytes the reader produces: cusp, unselected, closed ends
  // on one point.
  PolycurveD Make() {
    PolycurveD c;
    const int subpaths = int(rng_() % 5);
    for (int s = 0; s < subpaths; ++s) {
      const V start{Coord(), Coord()};
      const int first = int(c.GetPointCount());
      c.PushBack(start, NodeTypes::Open::move);
      const int segments = int(rng_() % 6);
      const bool closed = rng_() % 2;
      V cur = start, lastCtrl = start;
      bool prevCubic = false;
      for (int k = 0; k < segments; ++k) {
        const bool last = k + 1 == segments;
        V end = last && closed ? start : Point(cur);
        if (last && closed && rng_() % 4 == 0) {
          // A zero-length closing line: the previous segment reached the start.
          c.PushBack(start, NodeTypes::Open::line);
          cur = start;
          end = start;
        }
        if (rng_() % 2) {
          c.PushBack(end, NodeTypes::Open::line);
          prevCubic = false;
        } else {
          V c1 = rng_() % 3 == 0 ? (prevCubic ? V{cur.x + (cur.x - lastCtrl.x), cur.y + (cur.y - lastCtrl.y)} : cur)
                                 : Point(cur);
          if (!c1.IsFinite()) c1 = cur;
          const V c2 = Point(c1);
          c.PushBack(c1, NodeTypes::arc);
          c.PushBack(c2, NodeTypes::arc);
          c.PushBack(end, NodeTypes::Open::curve);
          lastCtrl = c2;
          prevCubic = true;
        }
        cur = end;
      }
      if (closed) {
        c.SetNodeType(first, NodeTypes::Closed::move);
        if (segments > 0) {
          const int lastNode = int(c.GetPointCount()) - 1;
          c.SetNodeType(lastNode, IsLine(c.GetNodeType(lastNode)) ? NodeTypes::Closed::line : NodeTypes::Closed::curve);
        }
      }
    }
    return c;
  }
  std::mt19937& rng() { return rng_; }

 private:
  std::mt19937 rng_;
};

std::string Write(const PolycurveD& c, OstraCrv::SvgPathWriteOptions o = {}) {
  std::string s;
  EXPECT_TRUE(OstraCrv::WriteSvgPathData(c, s, o));
  return s;
}

PolycurveD Read(const std::string& d) {
  PolycurveD c;
  OstraCrv::SvgPathError e;
  EXPECT_TRUE(OstraCrv::ParseSvgPathData(d, c, &e)) << d << "\n" << (e.reason ? e.reason : "") << " at " << e.offset;
  return c;
}

TEST(SvgPathRoundTrip, FullPrecisionIsExactBitForBit) {
  CurveMaker maker(12345);
  for (int i = 0; i < 3000; ++i) {
    const PolycurveD c = maker.Make();
    ASSERT_TRUE(OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount()));
    for (bool relative : {true, false}) {
      OstraCrv::SvgPathWriteOptions o;
      o.allowRelative = relative;
      const std::string d = Write(c, o);
      const PolycurveD back = Read(d);
      ASSERT_EQ(back.Compare(c), 0) << d;
    }
  }
}

TEST(SvgPathRoundTrip, ChosenPrecisionRoundsEachCoordinate) {
  CurveMaker maker(777);
  for (int i = 0; i < 1500; ++i) {
    const PolycurveD c = maker.Make();
    for (int precision : {0, 2, 5}) {
      OstraCrv::SvgPathWriteOptions o;
      o.precision = precision;
      const std::string d = Write(c, o);
      const PolycurveD back = Read(d);
      ASSERT_EQ(back.GetPointCount(), c.GetPointCount()) << d;
      const double half = 0.5 * std::pow(10.0, -precision);
      for (int k = 0; k < int(c.GetPointCount()); ++k) {
        ASSERT_EQ(back.GetNodeType(k), c.GetNodeType(k)) << d;
        const V a = c.GetPoint(k), b = back.GetPoint(k);
        ASSERT_LE(std::fabs(a.x - b.x), half * (1 + 1e-9) + 4e-16 * std::fabs(a.x)) << d << " node " << k;
        ASSERT_LE(std::fabs(a.y - b.y), half * (1 + 1e-9) + 4e-16 * std::fabs(a.y)) << d << " node " << k;
      }
      // Writing what was read gives the same text.
      EXPECT_EQ(Write(back, o), d);
    }
  }
}

TEST(SvgPathRoundTrip, OutputIsCompact) {
  EXPECT_EQ(Write(Read("M0 0 L10 0 L10 10 L0 10 Z")), "M0 0H10V10H0Z");
  EXPECT_EQ(Write(Read("M1.5 0.5 L-2 -3")), "M1.5.5-2-3");
  EXPECT_EQ(Write(Read("M0 0 C1 1 2 1 3 0 C4 -1 5 -1 6 0")), "M0 0C1 1 2 1 3 0S5-1 6 0");
  EXPECT_EQ(Write(Read("M100 100 L101 101 L102 103")), "M100 100l1 1 1 2");
  EXPECT_EQ(Write(Read("M5 5 Z M1e21 1e-7")), "M5 5ZM1e21 1e-7");
  // A closing line of zero length must stay, or the reader would not make it.
  EXPECT_EQ(Write(Read("M3 3 L3 3 Z")), "M3 3V3Z");
  EXPECT_EQ(Read(Write(Read("M3 3 L3 3 Z"))).GetPointCount(), 2u);
  OstraCrv::SvgPathWriteOptions o;
  o.precision = 2;
  EXPECT_EQ(Write(Read("M0.123 -0.004 L1.005 2"), o), "M.12 0 1 2");
  EXPECT_EQ(Write(PolycurveD()), "");
}

TEST(SvgPathRoundTrip, RefusesCurvesItCannotWrite) {
  std::string out = "unchanged";
  PolycurveD bad;
  bad.PushBack(V{0, 0}, NodeTypes::Open::line);  // no move first
  EXPECT_FALSE(OstraCrv::WriteSvgPathData(bad, out));
  PolycurveD nan;
  nan.PushBack(V{0, 0}, NodeTypes::Open::move);
  nan.PushBack(V{NAN, 1}, NodeTypes::Open::line);
  EXPECT_FALSE(OstraCrv::WriteSvgPathData(nan, out));
  PolycurveD inf;
  inf.PushBack(V{INFINITY, 0}, NodeTypes::Open::move);
  EXPECT_FALSE(OstraCrv::WriteSvgPathData(inf, out));
  EXPECT_EQ(out, "unchanged");
}

// Damaged texts: insertions, deletions and replacements of path characters,
// and cut-offs. Whatever comes in, the reader must stop with a sane error or
// succeed, and hand back a valid, finite curve that itself round-trips.
TEST(SvgPathRoundTrip, MutatedTextsNeverBreakTheReader) {
  const std::vector<std::string> seeds = {
      "M10 10 L20 20 H30 V40 Z",
      "m1.5.5-2e1-3e-2l.1.2.3.4z",
      "M0 0 C1 1 2 2 3 3 S4 4 5 5 Q6 6 7 7 T8 8 9 9",
      "M0,0 A10 20 30 1 1 40 50 a5 5 0 00 1 1 Z m1 1 z",
      "M 1e308 1e308 l 1e308 0 L -1e308 -1e-308",
      "M0 0 A1e-300 1e300 90 0 1 1e300 1e-300",
      "M0 0 h1 v1 h-1 z M5 5 q1 1 2 0 t2 0 t2 0 s1 1 2 0",
  };
  const std::string alphabet = "MmLlHhVvCcSsQqTtAaZz0123456789.,-+eE \n#";
  std::mt19937 rng(99);
  int failures = 0;
  for (int i = 0; i < 20000; ++i) {
    std::string d = seeds[rng() % seeds.size()];
    const int edits = 1 + int(rng() % 4);
    for (int k = 0; k < edits; ++k) {
      const std::size_t at = d.empty() ? 0 : rng() % (d.size() + 1);
      switch (rng() % 4) {
        case 0: d.insert(at, 1, alphabet[rng() % alphabet.size()]); break;
        case 1: if (at < d.size()) d.erase(at, 1); break;
        case 2: if (at < d.size()) d[at] = alphabet[rng() % alphabet.size()]; break;
        case 3: d.resize(at); break;
      }
    }
    PolycurveD c;
    OstraCrv::SvgPathError e;
    const bool ok = OstraCrv::ParseSvgPathData(d, c, &e);
    if (!ok) {
      ++failures;
      ASSERT_NE(e.reason, nullptr) << d;
      ASSERT_LE(e.offset, d.size()) << d;
    }
    ASSERT_TRUE(OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount())) << d;
    for (const V& p : c.Points()) ASSERT_TRUE(p.IsFinite()) << d;
    std::string w;
    ASSERT_TRUE(OstraCrv::WriteSvgPathData(c, w)) << d;
    PolycurveD back;
    ASSERT_TRUE(OstraCrv::ParseSvgPathData(w, back)) << d << " -> " << w;
    ASSERT_EQ(back.Compare(c), 0) << d << " -> " << w;
  }
  // Both outcomes were exercised.
  EXPECT_GT(failures, 1000);
  EXPECT_LT(failures, 19000);
}

}  // namespace
