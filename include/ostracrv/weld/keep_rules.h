// The keep rules of the set operations: which edges of the weld graph belong
// to the outline of the result.
//
// A rule sees, for the edge being decided, the state of each operand there
// (EdgeStateData: its fill rule, whether the place is inside or on its
// filling, whether the edge lies on its outline, and which sides of a shared
// stretch it fills) and on which operand the edge lies. An edge off the
// other operand's outline is kept by its position alone. On a stretch that
// both outlines share, the filled sides decide: when the two fillings lie on
// opposite sides (sides 1 | 2 = 3), the stretch is inside the union and the
// boundary of the intersection's two parts meeting at a line; when they lie
// on the same side, the stretch is kept once, as the copy on the first
// operand.
#pragma once

#include "ostracrv/weld/weldstate.h"

namespace OstraCrv {

// A ∪ B: outlines of each operand outside the other; shared stretches with
// the fillings on one side, once.
bool UnionKeepRule(bool fromFirst, EdgeStateData a, EdgeStateData b);
// A ∩ B: outlines of each operand inside the other; shared stretches with
// the fillings on one side, once.
bool IntersectKeepRule(bool fromFirst, EdgeStateData a, EdgeStateData b);
// A − B: A's outline outside B and B's outline inside A; shared stretches
// where the fillings lie on opposite sides, once.
bool SubtractKeepRule(bool fromFirst, EdgeStateData a, EdgeStateData b);
// A xor B: every outline outside shared stretches; on those, the copy on
// the first operand where the two fillings differ.
bool XorKeepRule(bool fromFirst, EdgeStateData a, EdgeStateData b);

}  // namespace OstraCrv
