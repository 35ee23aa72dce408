// The side of a directed curve on which something lies.
//
// Sides are named in the curve's own forward frame with the y axis up: left
// is counter-clockwise of the direction of travel. The values form a small
// bit field, so that "both sides" is the union of left and right and a side
// mask can be built with |.
#pragma once

namespace MavikMath {

enum Side : int {
  SideNone = 0,   // on the curve, or no answer
  SideLeft = 1,   // left of the forward direction
  SideRight = 2,  // right of the forward direction
  SideBoth = 3,   // left and right
};

constexpr Side operator|(Side a, Side b) noexcept { return Side(int(a) | int(b)); }
constexpr Side& operator|=(Side& a, Side b) noexcept { return a = a | b; }
constexpr Side operator&(Side a, Side b) noexcept { return Side(int(a) & int(b)); }
// Left becomes right and right becomes left: the side seen walking backwards.
constexpr Side Opposite(Side s) noexcept {
  return Side(((int(s) & 1) << 1) | ((int(s) & 2) >> 1));
}

}  // namespace MavikMath
