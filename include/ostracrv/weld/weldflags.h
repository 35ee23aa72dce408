// The flag word that a caller passes to the welding operations (union,
// intersection, difference, exclusive or, knife, boundary).
//
// The flags combine with |; HasWeldFlag tests one. The zero value asks for
// the plain operation: at an intersection the output turns onto the other
// curve where it can, the tolerance is the ordinary weld tolerance, and an
// output subpath that cannot be closed within that tolerance stays open.
#pragma once

namespace OstraCrv {

enum class WeldFlags : unsigned {
  None = 0,
  // At an intersection the output first goes straight on along its own
  // curve and turns only where that edge is not part of the result (the
  // knife always walks so).
  FollowCurve = 1,
  // Tolerances of 1e-8 instead of about 1.414 for meeting points and 0.001
  // for tangent directions: for double geometry that must not be snapped.
  Precise = 2,
  // An output subpath that does not close within the tolerance is closed
  // with a line anyway.
  ForceClose = 4,
  // The edges of the first operand are followed but not drawn: the result is
  // the open pieces of the second operand, broken where they meet the first.
  OpenResult = 8,
  // Edges of the first operand are drawn only between two crossings with
  // closed subpaths: dangling ends of an open first operand are dropped.
  TrimDangling = 16,
};

constexpr WeldFlags operator|(WeldFlags a, WeldFlags b) noexcept {
  return WeldFlags(unsigned(a) | unsigned(b));
}
constexpr WeldFlags operator&(WeldFlags a, WeldFlags b) noexcept {
  return WeldFlags(unsigned(a) & unsigned(b));
}
constexpr WeldFlags& operator|=(WeldFlags& a, WeldFlags b) noexcept { return a = a | b; }
// Whether every bit of flag is set in flags.
constexpr bool HasWeldFlag(WeldFlags flags, WeldFlags flag) noexcept {
  return (unsigned(flags) & unsigned(flag)) == unsigned(flag) && unsigned(flag) != 0;
}

}  // namespace OstraCrv
