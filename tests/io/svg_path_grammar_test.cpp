// Reading path data: the grammar's corner cases, the mapping of each command
// onto nodes, and the error positions with the path kept up to the fault.
#include <gtest/gtest.h>

#include <cmath>
#include <string>
#include <vector>

#include "core/path_geometry.h"
#include "polycurve.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;

struct Node {
  NODETYPE type;
  V p;
};

PolycurveD Parse(std::string_view d) {
  PolycurveD c;
  OstraCrv::SvgPathError e;
  EXPECT_TRUE(OstraCrv::ParseSvgPathData(d, c, &e)) << d << ": " << (e.reason ? e.reason : "") << " at " << e.offset;
  return c;
}

std::vector<Node> Nodes(const PolycurveD& c) {
  std::vector<Node> r;
  for (int i = 0; i < int(c.GetPointCount()); ++i) r.push_back({c.GetNodeType(i), c.GetPoint(i)});
  return r;
}

void ExpectNodes(std::string_view d, const std::vector<Node>& want) {
  const PolycurveD c = Parse(d);
  const auto got = Nodes(c);
  ASSERT_EQ(got.size(), want.size()) << d;
  for (std::size_t i = 0; i < want.size(); ++i) {
    EXPECT_TRUE(got[i].type == want[i].type && got[i].p == want[i].p) << d << " node " << i;
  }
  EXPECT_TRUE(OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount())) << d;
}

const NODETYPE kMove = NodeTypes::Open::move, kLine = NodeTypes::Open::line, kCurve = NodeTypes::Open::curve,
               kArc = NodeTypes::arc, kCMove = NodeTypes::Closed::move, kCLine = NodeTypes::Closed::line,
               kCCurve = NodeTypes::Closed::curve;

struct NodeCase {
  const char* d;
  std::vector<Node> want;
};

TEST(SvgPathGrammar, CommandsMapOntoNodes) {
  const NodeCase cases[] = {
      // Number forms; decimal conversion gives the nearest double, as a C
      // library reads it.
      {"M1.5.5", {{kMove, {1.5, 0.5}}}},
      {"M1e2-3", {{kMove, {100, -3}}}},
      {"M.5-.5e1", {{kMove, {0.5, -5}}}},
      {"M+1E+2,-1e-2", {{kMove, {100, -0.01}}}},
      {"M1.-2.", {{kMove, {1, -2}}}},
      {"M0.1e1.5", {{kMove, {1, 0.5}}}},
      {"M1e2.5", {{kMove, {100, 0.5}}}},
      {"M0.1 123456789.123456789", {{kMove, {0.1, 123456789.123456789}}}},
      // Moves, lines and implicit repetition.
      {"M1,2 3,4", {{kMove, {1, 2}}, {kLine, {3, 4}}}},
      {"m1 2 3 4", {{kMove, {1, 2}}, {kLine, {4, 6}}}},
      {"M1 2 l3 4 5 6", {{kMove, {1, 2}}, {kLine, {4, 6}}, {kLine, {9, 12}}}},
      {"M0 0L1 1,2 2", {{kMove, {0, 0}}, {kLine, {1, 1}}, {kLine, {2, 2}}}},
      {"M0 0 H5 V5 h-5 v-5 H1 2",
       {{kMove, {0, 0}}, {kLine, {5, 0}}, {kLine, {5, 5}}, {kLine, {0, 5}}, {kLine, {0, 0}}, {kLine, {1, 0}},
        {kLine, {2, 0}}}},
      // A move after a move leaves a dangling move; a later relative move is
      // relative to the previous one.
      {"M1 1 M2 2 m1 1", {{kMove, {1, 1}}, {kMove, {2, 2}}, {kMove, {3, 3}}}},
      // Close stores the closing point twice; a last segment that already ends
      // on the start is the closing segment; a lone move can close; Z Z is one Z.
      {"M0 0 L10 0 L10 10 Z", {{kCMove, {0, 0}}, {kLine, {10, 0}}, {kLine, {10, 10}}, {kCLine, {0, 0}}}},
      {"M0 0 L10 0 L0 0 z", {{kCMove, {0, 0}}, {kLine, {10, 0}}, {kCLine, {0, 0}}}},
      {"M0 0 C1 1 2 1 0 0 Z", {{kCMove, {0, 0}}, {kArc, {1, 1}}, {kArc, {2, 1}}, {kCCurve, {0, 0}}}},
      {"M5 5 Z", {{kCMove, {5, 5}}}},
      {"M0 0 L1 0 Z Z", {{kCMove, {0, 0}}, {kLine, {1, 0}}, {kCLine, {0, 0}}}},
      // After a close the next subpath starts at the closed point.
      {"M1 1 L10 1 L10 10 Z l 5 5",
       {{kCMove, {1, 1}}, {kLine, {10, 1}}, {kLine, {10, 10}}, {kCLine, {1, 1}}, {kMove, {1, 1}}, {kLine, {6, 6}}}},
      {"M1 1 L10 1 z m 1 1 h2",
       {{kCMove, {1, 1}}, {kLine, {10, 1}}, {kCLine, {1, 1}}, {kMove, {2, 2}}, {kLine, {4, 2}}}},
      {"M1 1 L10 1 Z C1 2 3 4 5 6",
       {{kCMove, {1, 1}}, {kLine, {10, 1}}, {kCLine, {1, 1}}, {kMove, {1, 1}}, {kArc, {1, 2}}, {kArc, {3, 4}},
        {kCurve, {5, 6}}}},
      // A smooth cubic reflects the control only after a cubic; after a line
      // the first control is the current point.
      {"M0 0 C1 1 2 1 3 0 S5 -1 6 0 s1 1 2 0",
       {{kMove, {0, 0}}, {kArc, {1, 1}}, {kArc, {2, 1}}, {kCurve, {3, 0}}, {kArc, {4, -1}}, {kArc, {5, -1}},
        {kCurve, {6, 0}}, {kArc, {7, 1}}, {kArc, {7, 1}}, {kCurve, {8, 0}}}},
      {"M0 0 L3 0 S5 -1 6 0", {{kMove, {0, 0}}, {kLine, {3, 0}}, {kArc, {3, 0}}, {kArc, {5, -1}}, {kCurve, {6, 0}}}},
  };
  for (const auto& k : cases) ExpectNodes(k.d, k.want);
  EXPECT_EQ(Parse("M0 0 Q3 3 6 0 S8 1 9 0").GetPoint(4), (V{6, 0}));  // after a quadratic too
  // Underflow reads as zero with its sign; the sign of zero is kept.
  const PolycurveD c = Parse("M1e-400-0");
  EXPECT_EQ(c.GetPoint(0).x, 0.0);
  EXPECT_TRUE(std::signbit(c.GetPoint(0).y));
  EXPECT_FALSE(std::signbit(c.GetPoint(0).x));
}

// The point of a quadratic at t.
V Quad(V a, V b, V c, double t) {
  const double s = 1 - t;
  return {s * s * a.x + 2 * s * t * b.x + t * t * c.x, s * s * a.y + 2 * s * t * b.y + t * t * c.y};
}

TEST(SvgPathGrammar, QuadraticsBecomeTheSameCurveAsCubics) {
  // Q, then T reflecting Q's control, then t reflecting T's, then T after a
  // line (control on the current point: a straight piece).
  const PolycurveD c = Parse("M1 2 Q7 9 13 -1 T20 5 t4 4 L30 0 T40 3");
  const V* p = c.GetPoints();
  ASSERT_EQ(c.GetPointCount(), 14u);
  const V quads[][3] = {{{1, 2}, {7, 9}, {13, -1}},
                        {{13, -1}, {19, -11}, {20, 5}},
                        {{20, 5}, {21, 21}, {24, 9}},
                        {{30, 0}, {30, 0}, {40, 3}}};
  const int starts[] = {0, 3, 6, 10};
  for (int k = 0; k < 4; ++k) {
    for (int s = 0; s <= 16; ++s) {
      const double t = s / 16.0;
      const V a = Quad(quads[k][0], quads[k][1], quads[k][2], t), b = testgeo::Bezier(p + starts[k], t);
      EXPECT_NEAR(a.x, b.x, 1e-12) << k << " " << t;
      EXPECT_NEAR(a.y, b.y, 1e-12) << k << " " << t;
    }
  }
}

TEST(SvgPathGrammar, ArcFlagsNeedNoSeparators) {
  const PolycurveD a = Parse("M0 0 a1 1 0 00 1 1");
  const PolycurveD b = Parse("M0 0 a 1,1 0 0,0 1,1");
  EXPECT_EQ(a, b);
  EXPECT_EQ(a.GetLastPoint(), (V{1, 1}));
  // "101 1": large arc 1, sweep 0, x 1, y 1.
  EXPECT_EQ(Parse("M0 0 a1 1 0 101 1"), Parse("M0 0 a1 1 0 1 0 1 1"));
  // Implicit repetition of arcs.
  const PolycurveD two = Parse("M0 0 A1 1 0 0 1 2 0 1 1 0 0 1 4 0");
  EXPECT_EQ(two.GetLastPoint(), (V{4, 0}));
  EXPECT_EQ(OstraCrv::GetSegmentCount(two.GetNodeTypes(), int(two.GetPointCount())), 4);
}

struct ErrorCase {
  const char* d;
  std::size_t offset;
  int nodesKept;
  const char* named = nullptr;  // a word the reason must contain
};

TEST(SvgPathGrammar, ErrorsGivePositionReasonAndThePathUpToThem) {
  const ErrorCase cases[] = {
      {"L1 2", 0, 0, "move"},               // must begin with a move
      {"  l1 2", 2, 0},
      {"5", 0, 0},
      {"M1 2 L", 6, 1, "number"},           // group missing
      {"M1 2 L3 4 5", 11, 2},               // second group incomplete
      {"M1 2 X3", 5, 1, "command"},         // unknown command
      {"M1,,2", 3, 0, "comma"},             // two commas
      {"M,1 2", 1, 0},
      {"M1 2,", 4, 1},                      // comma before a command
      {"M1 2, L3 4", 4, 1},
      {"M1 2 a1 1 0 2 0 3 3", 12, 1, "flag"},  // flag out of range
      {"M1 2 a1 1 0 1", 13, 1},             // missing flag at the end
      {"M1e400 0", 1, 0, "range"},          // out of double range
      {"M1 2 z 3", 7, 1},                    // Z takes no arguments (lone move closed)
      {"M1 2 e", 5, 1},
      {"M1e 2", 2, 0},                      // an exponent needs digits
      {"M0 0 L1e308 0 l1e308 0", 15, 2},    // the sum overflows: the group is named
      {"M0 0 L1 1 #", 10, 2},
      {"M0 0 C1 1 2 2 3 3 4", 19, 4},
  };
  for (const auto& k : cases) {
    PolycurveD c;
    c.PushBack(V{9, 9}, NodeTypes::Open::move);  // replaced even on failure
    OstraCrv::SvgPathError e;
    EXPECT_FALSE(OstraCrv::ParseSvgPathData(k.d, c, &e)) << k.d;
    EXPECT_EQ(e.offset, k.offset) << k.d << ": " << (e.reason ? e.reason : "(null)");
    ASSERT_NE(e.reason, nullptr) << k.d;
    if (k.named) {
      EXPECT_NE(std::string(e.reason).find(k.named), std::string::npos) << k.d << ": " << e.reason;
    }
    EXPECT_EQ(int(c.GetPointCount()), k.nodesKept) << k.d;
    EXPECT_TRUE(OstraCrv::IsValidCurve(c.GetNodeTypes(), c.GetPointCount())) << k.d;
  }
  // Without an error record the result is still reported; empty and blank
  // texts are empty curves.
  EXPECT_TRUE(Parse("").IsEmpty());
  EXPECT_TRUE(Parse(" \t\r\n\f").IsEmpty());
  PolycurveD c;
  EXPECT_FALSE(OstraCrv::ParseSvgPathData("M1", c));
  OstraCrv::SvgPathError e{5, "x"};
  EXPECT_TRUE(OstraCrv::ParseSvgPathData("M1 1", c, &e));
  EXPECT_EQ(e.reason, nullptr);
}

}  // namespace
