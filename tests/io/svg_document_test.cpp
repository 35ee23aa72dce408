// Reading SVG documents (the tools' reader): the mirror into y-up
// coordinates, transforms of elements and nested groups against hand-computed
// coordinates, the basic shapes against their geometry, inherited fill rules,
// and what happens with broken or unreadable input.
#if OSTRACRV_WITH_SVG_DOCUMENT

#include <gtest/gtest.h>

#include <cmath>
#include <string>

#include "core/path_geometry.h"
#include "polycurve.h"
#include "svg_document.h"

namespace {

using MavikMath::V;
using OstraCrv::PolycurveD;
namespace sd = OstraCrv::svgdoc;

sd::Document Read(const std::string& body, const std::string& root = "viewBox=\"0 0 100 100\"") {
  sd::Document doc;
  std::string error;
  const std::string text = "<svg xmlns=\"http://www.w3.org/2000/svg\" " + root + ">" + body + "</svg>";
  EXPECT_TRUE(sd::ReadText(text, doc, error)) << error;
  return doc;
}

void ExpectPoint(const V& got, double x, double y, double tol = 1e-9) {
  EXPECT_NEAR(got.x, x, tol);
  EXPECT_NEAR(got.y, y, tol);
}

// Twice the signed area of the polygon through the nodes (counter-clockwise
// positive with y up).
double Shoelace(const PolycurveD& c) {
  double a = 0;
  const int n = int(c.GetPointCount());
  for (int i = 0; i + 1 < n; ++i) a += Cross(c.GetPoint(i), c.GetPoint(i + 1));
  return a;
}

TEST(SvgDocument, MirrorThroughTheViewBox) {
  auto first = [](const sd::Document& d) { return d.shapes.at(0).curve.GetPoint(0); };
  ExpectPoint(first(Read("<path d=\"M10 10 L20 10\"/>")), 10, 90);
  sd::Document shifted = Read("<path d=\"M10 30\"/>", "viewBox=\"10 20 100 50\"");
  EXPECT_EQ(shifted.frame.mirror, 90);
  ExpectPoint(first(shifted), 10, 60);
  // The view box keeps its place: its top edge (y 20) maps to 70 = 20 + 50.
  ExpectPoint(first(Read("<path d=\"M0 20\"/>", "viewBox=\"10 20 100 50\"")), 0, 70);
  ExpectPoint(first(Read("<path d=\"M1 10\"/>", "width=\"40\" height=\"30\"")), 1, 20);
  ExpectPoint(first(Read("<path d=\"M1 10\"/>", "height=\"1in\"")), 1, 86);
  ExpectPoint(first(Read("<path d=\"M1 10\"/>", "")), 1, -10);
}

TEST(SvgDocument, ClockwiseOnScreenIsClockwiseWithYUp) {
  const sd::Document d = Read(
      "<rect x=\"10\" y=\"10\" width=\"20\" height=\"10\"/>"
      "<path d=\"M50 50 L50 60 L70 60 Z\"/>");  // down, right: counter-clockwise on screen
  ASSERT_EQ(d.shapes.size(), 2u);
  EXPECT_NEAR(Shoelace(d.shapes[0].curve), -2 * 200, 1e-9);
  EXPECT_NEAR(Shoelace(d.shapes[1].curve), 2 * 100, 1e-9);
  // The library counts clockwise (with y up) positive.
  const auto& rect = d.shapes[0].curve;
  EXPECT_NEAR(OstraCrv::GetArea(rect.GetPoints(), rect.GetNodeTypes(), int(rect.GetPointCount())), 200, 1e-9);
}

TEST(SvgDocument, TransformListsMapPointsAsSvgDoes) {
  struct Case {
    const char* transform;
    V in, out;
  } cases[] = {
      {"translate(5) scale(2,3)", {1, 1}, {7, 3}},  // the rightmost applies first
      {"rotate(90 10 10)", {20, 10}, {10, 20}},
      {"rotate(90)", {1, 0}, {0, 1}},
      {"skewX(45)", {0, 10}, {10, 10}},
      {"skewY(45)", {10, 0}, {10, 10}},
      {"matrix(1 2 3 4 5 6)", {1, 1}, {9, 12}},
      {" scale( 2 ) ,translate(1,-1) ", {0, 0}, {2, -2}},
      {"translate(1e1 -.5e1)", {0, 0}, {10, -5}},
  };
  for (const auto& k : cases) {
    MATRIX m;
    ASSERT_TRUE(sd::ParseTransform(k.transform, m)) << k.transform;
    const V p = m(k.in);
    EXPECT_NEAR(p.x, k.out.x, 1e-12) << k.transform;
    EXPECT_NEAR(p.y, k.out.y, 1e-12) << k.transform;
  }
  for (const char* bad : {"translate(1", "scale()", "rotate(1 2)", "spin(3)", "matrix(1 2 3 4 5)", "translate(1,)",
                          "translate 1 2"}) {
    MATRIX m{2, 0, 0, 2, 0, 0};
    EXPECT_FALSE(sd::ParseTransform(bad, m)) << bad;
    EXPECT_EQ(m.m11, 2) << bad;
  }
  MATRIX id{2, 0, 0, 2, 0, 0};
  EXPECT_TRUE(sd::ParseTransform("", id));
  EXPECT_EQ(id, MATRIX{});
}

TEST(SvgDocument, NestedGroupsComposeTheirTransforms) {
  // (1, 0): rotate(90) -> (0, 1); scale(2) -> (0, 2); translate -> (10, 22);
  // mirror -> (10, 78). (3, 4) likewise: (-4, 3), (-8, 6), (2, 26), (2, 74).
  const sd::Document d = Read(
      "<g transform=\"translate(10,20)\"><g transform=\"scale(2)\">"
      "<path transform=\"rotate(90)\" d=\"M1 0 L3 4\"/></g></g>"
      "<svg x=\"5\" y=\"6\"><path d=\"M1 1\"/></svg>");
  ASSERT_EQ(d.shapes.size(), 2u);
  ExpectPoint(d.shapes[0].curve.GetPoint(0), 10, 78);
  ExpectPoint(d.shapes[0].curve.GetPoint(1), 2, 74);
  ExpectPoint(d.shapes[1].curve.GetPoint(0), 6, 93);
  // A bad transform is dropped with a warning; the element stays.
  const sd::Document bad = Read("<g transform=\"turn(3)\"><path d=\"M1 1\"/></g>");
  ASSERT_EQ(bad.shapes.size(), 1u);
  ExpectPoint(bad.shapes[0].curve.GetPoint(0), 1, 99);
  EXPECT_EQ(bad.warnings.size(), 1u);
}

// Every point of the curve's Beziers, sampled, lies on the ellipse
// ((x - cx) / rx)^2 + ((y - cy) / ry)^2 = 1 within the arc error.
void ExpectOnEllipse(const PolycurveD& c, double cx, double cy, double rx, double ry) {
  const int n = int(c.GetPointCount());
  for (int i = 3; i < n; ++i) {
    if (!IsCurve(c.GetNodeType(i))) continue;
    const V* p = c.GetPoints() + i - 3;
    for (int s = 0; s <= 20; ++s) {
      const V q = testgeo::Bezier(p, s / 20.0);
      EXPECT_NEAR(std::hypot((q.x - cx) / rx, (q.y - cy) / ry), 1.0, 2.8e-4);
    }
  }
}

TEST(SvgDocument, BasicShapes) {
  const sd::Document d = Read(
      "<circle cx=\"50\" cy=\"40\" r=\"10\"/>"
      "<ellipse cx=\"20\" cy=\"30\" rx=\"8\"/>"  // ry takes rx
      "<rect x=\"10\" y=\"10\" width=\"40\" height=\"20\" rx=\"30\" ry=\"4\"/>"  // rx clamped to 20
      "<rect x=\"0\" y=\"0\" width=\"10\" height=\"10\" ry=\"2\"/>"
      "<rect width=\"0\" height=\"10\"/><circle r=\"-1\"/>"  // not drawn
      "<line x1=\"1\" y1=\"2\" x2=\"3\" y2=\"4\"/>"
      "<polyline points=\"0,0 10,0 10,10\"/>"
      "<polygon points=\"0 0 10 0 10 10 0 0\"/>"
      "<polygon points=\"0 0 10 0 10 10\"/>");
  ASSERT_EQ(d.shapes.size(), 8u);
  const auto& circle = d.shapes[0].curve;
  EXPECT_EQ(CRV_HowManyCurves(circle.GetNodeTypes(), int(circle.GetPointCount())), 4);
  ExpectPoint(circle.GetPoint(0), 60, 60);  // (60, 40) mirrored
  ExpectPoint(circle.GetPoint(3), 50, 50);  // then down the screen: (50, 50)
  EXPECT_EQ(circle.GetNodeType(0), NodeTypes::Closed::move);
  EXPECT_TRUE(OstraCrv::IsValidCurve(circle.GetNodeTypes(), circle.GetPointCount()));
  ExpectOnEllipse(circle, 50, 60, 10, 10);
  ExpectOnEllipse(d.shapes[1].curve, 20, 70, 8, 8);

  // Rounded rectangle with rx clamped to half the width: the top and bottom
  // straight pieces vanish, leaving 4 arcs and 2 vertical lines.
  const auto& rounded = d.shapes[2].curve;
  const int rn = int(rounded.GetPointCount());
  EXPECT_EQ(CRV_HowManyCurves(rounded.GetNodeTypes(), rn), 4);
  EXPECT_EQ(CRV_HowManyLines(rounded.GetNodeTypes(), rn), 2);
  const auto box = MavikMath::GetPointsBBox(rounded.GetPoints(), rn);  // corners' controls stay inside
  EXPECT_NEAR(box.left, 10, 1e-12);
  EXPECT_NEAR(box.right, 50, 1e-12);
  EXPECT_NEAR(box.bottom, 70, 1e-12);
  EXPECT_NEAR(box.top, 90, 1e-12);
  // ry alone sets rx too.
  EXPECT_EQ(CRV_HowManyCurves(d.shapes[3].curve.GetNodeTypes(), int(d.shapes[3].curve.GetPointCount())), 4);

  const auto& line = d.shapes[4].curve;
  ASSERT_EQ(line.GetPointCount(), 2u);
  EXPECT_EQ(line.GetNodeType(0), NodeTypes::Open::move);
  ExpectPoint(line.GetPoint(1), 3, 96);
  EXPECT_EQ(d.shapes[5].curve.GetPointCount(), 3u);
  EXPECT_EQ(d.shapes[5].curve.GetNodeType(0), NodeTypes::Open::move);
  // A polygon that repeats its first point closes on it without a further
  // segment.
  EXPECT_EQ(d.shapes[6].curve.GetPointCount(), 4u);
  EXPECT_EQ(d.shapes[7].curve.GetPointCount(), 4u);
  EXPECT_EQ(d.shapes[7].curve.GetNodeType(3), NodeTypes::Closed::line);
  for (const auto& s : d.shapes) EXPECT_TRUE(OstraCrv::IsValidCurve(s.curve.GetNodeTypes(), s.curve.GetPointCount()));
}

TEST(SvgDocument, UnitsAndPercentages) {
  const sd::Document d = Read(
      "<rect x=\"1in\" y=\"0\" width=\"25.4mm\" height=\"50%\"/>"
      "<line x1=\"12pt\" y1=\"0\" x2=\"1pc\" y2=\"0\"/>",
      "viewBox=\"0 0 200 100\"");
  ASSERT_EQ(d.shapes.size(), 2u);
  ExpectPoint(d.shapes[0].curve.GetPoint(1), 96 + 96, 100);
  ExpectPoint(d.shapes[0].curve.GetPoint(2), 192, 50);
  ExpectPoint(d.shapes[1].curve.GetPoint(0), 16, 100);
  ExpectPoint(d.shapes[1].curve.GetPoint(1), 16, 100);
}

TEST(SvgDocument, FillRuleAndPaintAreInherited) {
  const sd::Document d = Read(
      "<g fill-rule=\"evenodd\" fill=\"red\">"
      "  <path d=\"M0 0 L1 1\"/>"
      "  <path d=\"M0 0 L1 1\" fill-rule=\"nonzero\"/>"
      "  <path d=\"M0 0 L1 1\" fill-rule=\"nonzero\" style=\"fill-rule: evenodd ; fill:blue\"/>"
      "  <g style=\"fill-rule:nonzero\"><path d=\"M0 0 L1 1\" fill-rule=\"inherit\"/>"
      "    <g><path d=\"M0 0 L1 1\" stroke=\"black\"/></g></g>"
      "</g>"
      "<path d=\"M0 0 L1 1\"/>");
  ASSERT_EQ(d.shapes.size(), 6u);
  const sd::FillRule want[] = {sd::FillRule::evenodd, sd::FillRule::nonzero, sd::FillRule::evenodd,
                               sd::FillRule::nonzero, sd::FillRule::nonzero, sd::FillRule::nonzero};
  for (int i = 0; i < 6; ++i) EXPECT_EQ(d.shapes[i].fillRule, want[i]) << i;
  EXPECT_EQ(d.shapes[0].fill, "red");
  EXPECT_EQ(d.shapes[2].fill, "blue");
  EXPECT_EQ(d.shapes[4].fill, "red");
  EXPECT_EQ(d.shapes[4].stroke, "black");
  EXPECT_EQ(d.shapes[5].fill, "");
}

TEST(SvgDocument, SkippedElementsAndBrokenGeometry) {
  const sd::Document d = Read(
      "<defs><path d=\"M0 0 L1 1\"/></defs>"
      "<g display=\"none\"><path d=\"M0 0 L1 1\"/></g>"
      "<path style=\"display : none\" d=\"M0 0 L1 1\"/>"
      "<text>hello</text><foo><path d=\"M0 0 L1 1\"/></foo>"
      "<path id=\"broken\" d=\"M0 0 L10 10 L\"/>"
      "<path d=\"\"/>"
      "<svg:path xmlns:svg=\"http://www.w3.org/2000/svg\" d=\"M5 5 L6 6\"/>");
  ASSERT_EQ(d.shapes.size(), 2u);
  EXPECT_EQ(d.shapes[0].id, "broken");
  EXPECT_EQ(d.shapes[0].curve.GetPointCount(), 2u);  // kept up to the fault
  EXPECT_NE(d.shapes[0].problem.find("offset 13"), std::string::npos) << d.shapes[0].problem;
  EXPECT_EQ(d.shapes[1].element, "path");
  // One warning for the text element, one for the broken path.
  EXPECT_EQ(d.warnings.size(), 2u);
}

TEST(SvgDocument, UnreadableInputFails) {
  sd::Document doc;
  std::string error;
  EXPECT_FALSE(sd::ReadText("<svg><path d=\"M0 0\"></svg>", doc, error));
  EXPECT_NE(error.find("XML"), std::string::npos);
  EXPECT_FALSE(sd::ReadText("<html/>", doc, error));
  EXPECT_NE(error.find("svg"), std::string::npos);
  EXPECT_FALSE(sd::ReadText("", doc, error));
  EXPECT_FALSE(sd::ReadFile("/nonexistent/file.svg", doc, error));
  EXPECT_EQ(error, "cannot open file");
}

TEST(SvgDocument, WritingBackMirrorsToTheDocument) {
  const sd::Document d = Read("<path d=\"M10 10 L20 10 L20 30 Z M1.5 2.25 C3 4 5 6 7 8\"/>");
  ASSERT_EQ(d.shapes.size(), 1u);
  EXPECT_EQ(sd::ToDocumentPathData(d.shapes[0].curve, d.frame), "M10 10H20V30ZM1.5 2.25C3 4 5 6 7 8");
  EXPECT_EQ(sd::XmlEscape("a<b & \"c\">"), "a&lt;b &amp; &quot;c&quot;&gt;");
}

}  // namespace

#endif  // OSTRACRV_WITH_SVG_DOCUMENT
