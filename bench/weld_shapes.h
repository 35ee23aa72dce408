// Shapes of the welding benchmarks, shared by the comparison with lib2geom.
#pragma once

#include <algorithm>
#include <cmath>
#include <random>
#include <vector>

#include "polycurve.h"

namespace weldbench {

using MavikMath::V;
using OstraCrv::PolycurveD;

// A disc of four Beziers and a ten-pointed star crossing it: a drawing-like
// pair.
inline PolycurveD Disc() { return PolycurveD::CreateCircle(V{75, 80}, 55); }
inline PolycurveD Star() {
  const double pts[] = {140, 20, 154, 62, 196, 62, 162, 88, 176, 130, 140, 104, 104, 130, 118, 88, 84, 62, 126, 62};
  PolycurveD star;
  star.MoveTo(V{pts[0], pts[1]});
  for (int k = 2; k < 20; k += 2) star.LineTo(V{pts[k], pts[k + 1]});
  star.LineTo(V{pts[0], pts[1]});
  star.CloseLastSubpath(0.0, false);
  return star;
}

// An outline of n segments round c whose radius wanders smoothly (a few
// slow waves and a little noise, well below the length of a segment), so
// that it and a copy turned by half a segment cross a bounded number of
// times per segment whatever n is.
inline PolycurveD Outline(int n, V c, double r, double turn, bool curved) {
  std::mt19937 rng(7);
  const double chord = 2 * M_PI * r / n;
  std::uniform_real_distribution<double> noise(-0.1 * chord, 0.1 * chord);
  std::vector<double> radius(static_cast<size_t>(n), 0.0);
  for (int k = 0; k < n; ++k)
    radius[size_t(k)] = r * (1 + 0.05 * std::sin(2 * M_PI * 5 * k / n) + 0.03 * std::sin(2 * M_PI * 17 * k / n)) +
                        noise(rng);
  auto at = [&](int k) {
    const double a = 2 * M_PI * k / n + turn;
    const double rr = radius[size_t(k % n)];
    return V{c.x + rr * std::cos(a), c.y + rr * std::sin(a)};
  };
  PolycurveD p;
  p.MoveTo(at(0));
  for (int k = 1; k <= n; ++k) {
    if (curved) {
      // Handles a third of the way along, pushed out by a tenth of the chord.
      const V a = at(k - 1), b = at(k);
      p.CubicTo(V{a.x + (b.x - a.x) / 3 + (b.y - a.y) * 0.1, a.y + (b.y - a.y) / 3 - (b.x - a.x) * 0.1},
                V{a.x + 2 * (b.x - a.x) / 3 + (b.y - a.y) * 0.1, a.y + 2 * (b.y - a.y) / 3 - (b.x - a.x) * 0.1}, b);
    } else {
      p.LineTo(at(k));
    }
  }
  p.CloseLastSubpath(1e-9, false);
  return p;
}

// A square plate with n / 4 - 1 square holes in a grid (about n segments),
// the holes turning against the outline so that both fill rules see holes.
inline PolycurveD Plate(int n) {
  const int holes = std::max(1, n / 4 - 1);
  const int side = int(std::ceil(std::sqrt(double(holes))));
  PolycurveD p = PolycurveD::CreateRectangle(Framework::common_types::RECT{0, side * 100, side * 100, 0});
  for (int k = 0; k < holes; ++k) {
    const double x = (k % side) * 100.0 + 20, y = (k / side) * 100.0 + 20;
    p.MoveTo(V{x, y});
    p.LineTo(V{x + 60, y});
    p.LineTo(V{x + 60, y + 60});
    p.LineTo(V{x, y + 60});
    p.LineTo(V{x, y});
    p.CloseLastSubpath(0.0, false);
  }
  return p;
}
// A band across the middle of that plate, through a row of holes.
inline PolycurveD Band(int n) {
  const int side = int(std::ceil(std::sqrt(double(std::max(1, n / 4 - 1)))));
  return PolycurveD::CreateRectangle(Framework::common_types::RECT{-10, side * 50 + 30, side * 100 + 10, side * 50 - 30});
}

}  // namespace weldbench
