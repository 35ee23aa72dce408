// The axes of an edge count along a straight probe.
//
// A count of the edges that cross a probe line needs two things from the
// frame: which coordinate orders positions along the probe, and which
// component of an edge's tangent says in which direction the edge crosses.
// For a horizontal probe (Normal) positions compare by x and the tangent's y
// gives the direction; for a vertical probe (FlipX_Rotate270) the two roles
// swap. The whole distinction is the low bit of the first word.
#pragma once

#include <cstdint>

struct CoordinateSystem {
  uint32_t flags = 0;  // bit 0 set: axes swapped (positions by y, crossings by x)

  static const CoordinateSystem Normal;
  static const CoordinateSystem FlipX_Rotate270;

  // Whether positions along the probe compare by y rather than by x.
  constexpr bool SwapsAxes() const noexcept { return (flags & 1u) != 0; }
};

inline constexpr CoordinateSystem CoordinateSystem::Normal{0u};
inline constexpr CoordinateSystem CoordinateSystem::FlipX_Rotate270{1u};
