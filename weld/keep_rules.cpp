// The keep rules of the set operations; see keep_rules.h.
//
// `a` is the state of the first operand, `b` of the second. onEdge is true
// for the operand the edge lies on and, for the other, on a shared stretch.
// a.sides | b.sides == 3 means that between them the operands fill both
// sides of the stretch (the fillings lie on opposite sides, or one operand
// fills both).
#include "ostracrv/weld/keep_rules.h"

namespace OstraCrv {

bool UnionKeepRule(bool fromFirst, EdgeStateData a, EdgeStateData b) {
  if (a.onEdge && b.onEdge) {
    if ((a.sides | b.sides) == 3) return false;
    if (a.sides == b.sides) return fromFirst;
  }
  if (a.onEdge && !b.inside) return true;
  return !a.inside && b.onEdge;
}

bool IntersectKeepRule(bool fromFirst, EdgeStateData a, EdgeStateData b) {
  if (!(a.onEdge && b.onEdge)) return a.inside && b.inside;
  if (a.sides != 3 && (a.sides & b.sides) != 0) return fromFirst;
  if ((a.sides | b.sides) == 3) return false;
  return a.inside && b.inside;
}

bool SubtractKeepRule(bool fromFirst, EdgeStateData a, EdgeStateData b) {
  if (a.onEdge && b.onEdge) return fromFirst && b.sides != 3 && (a.sides | b.sides) == 3;
  if (a.onEdge && !b.inside) return true;
  return b.onEdge && a.inside;
}

bool XorKeepRule(bool fromFirst, EdgeStateData a, EdgeStateData b) {
  (void)fromFirst;
  if (!(a.onEdge && b.onEdge)) return true;
  const bool differ = a.sides != b.sides;
  if ((a.sides | b.sides) == 3) return differ && (a.sides & b.sides) != 0;
  return differ;
}

}  // namespace OstraCrv
