// Tolerances and switches of one run of the intersection engine, and the
// ready-made settings of each of the library's callers.
//
// SegmentIntersectionSettings is a plain record with no defaults of its own:
// every caller fills it completely. The squared tolerances are separate fields
// that callers set themselves (they are not derived), so that the inner tests
// compare squared distances without square roots. Tolerances are absolute, in
// the units of the curves; no caller scales them by the size of a curve, and
// integer and double callers pass the same numbers.
//
// The ready-made settings below are the values of the library's callers:
//
//   caller                         end   touch  end^2  touch^2 normalize fullOvl ovlEnds dups preferTouch
//   weld graph                     tol   tol    tol^2  tol^2   yes       yes     yes     yes  no
//   weld fill-count probe          tol   tol    tol^2  tol^2   no        yes     yes     yes  yes
//   other weld probes              tol   tol    tol^2  tol^2   no        yes     yes     yes  no
//   breaking and clipping          10    10     100    100     no        yes     yes     yes  no
//   breaking at self-crossings     10    10     100    100     no        yes     (arg)   yes  no
//   point in shape, trimming       0.5   0.5    0.25   0.25    no        yes     yes     yes  no
//   offset cleaning and combining  0.1   1e-8   0.01   1e-16   yes       yes     yes     yes  no
//
// The squared values are written out, not computed (0.1 * 0.1 is not the double
// 0.01); only the weld tolerance is squared by multiplication.
//
// In all of them keepOverlapNeighbours and useExtendedTouch are false,
// extendedTouchDistance is 0 and spareTolerance 0.0001 (read by nothing). tol
// is the weld tolerance: kWeldTolerance (about the square root of 2, so that
// its square is 2: nodes that round to neighbouring integer points in both
// coordinates still count as one) or, for precise welding, kPreciseWeldTolerance.
#pragma once

namespace OstraCrv {

struct SegmentIntersectionSettings {
  double endTolerance;            // with touchTolerance: how far segment boxes are inflated
  double touchTolerance;          // see endTolerance
  double spareTolerance;          // always 0.0001; read by nothing
  double endToleranceSquared;     // two segment ends closer than this are one point
  double touchToleranceSquared;   // an end this close to a segment touches it; also overlaps
  double extendedTouchDistance;   // plain distance of the second-chance touch search
  bool normalizeTangents;         // records store unit tangents
  bool keepFullOverlaps;          // keep the records of a segment wholly overlapped
  bool keepOverlapEnds;           // keep the records that open and close an overlap
  bool keepOverlapNeighbours;     // when dropping overlap ends, keep the neighbours' twins
  bool keepNodeDuplicates;        // keep a crossing on a node found on both segments there
  bool preferTouch;               // a touch beats a crossing found at the same place
  bool useExtendedTouch;          // run the second-chance touch search
};

// The weld tolerance and its precise form.
inline constexpr double kWeldTolerance = 1.4142135624;
inline constexpr double kPreciseWeldTolerance = 1e-8;

namespace detail {
constexpr SegmentIntersectionSettings MakeIntersectionSettings(double end, double touch, double endSquared,
                                                               double touchSquared, bool normalize,
                                                               bool keepOverlapEnds, bool preferTouch) {
  return SegmentIntersectionSettings{.endTolerance = end,
                                     .touchTolerance = touch,
                                     .spareTolerance = 0.0001,
                                     .endToleranceSquared = endSquared,
                                     .touchToleranceSquared = touchSquared,
                                     .extendedTouchDistance = 0.0,
                                     .normalizeTangents = normalize,
                                     .keepFullOverlaps = true,
                                     .keepOverlapEnds = keepOverlapEnds,
                                     .keepOverlapNeighbours = false,
                                     .keepNodeDuplicates = true,
                                     .preferTouch = preferTouch,
                                     .useExtendedTouch = false};
}
}  // namespace detail

// The graph of welding: all subpaths of both operands, unit tangents.
constexpr SegmentIntersectionSettings WeldGraphIntersectionSettings(double tolerance) {
  const double squared = tolerance * tolerance;
  return detail::MakeIntersectionSettings(tolerance, tolerance, squared, squared, true, true, false);
}
// The probe that counts the filled sides of a weld edge: a touch at the probe
// beats a crossing, so that a probe through a node counts the node once.
constexpr SegmentIntersectionSettings WeldFillProbeIntersectionSettings(double tolerance) {
  const double squared = tolerance * tolerance;
  return detail::MakeIntersectionSettings(tolerance, tolerance, squared, squared, false, true, true);
}
// The other probes of welding: seeding the fill state, boundary and the knife's
// test for inner subpaths.
constexpr SegmentIntersectionSettings WeldProbeIntersectionSettings(double tolerance) {
  const double squared = tolerance * tolerance;
  return detail::MakeIntersectionSettings(tolerance, tolerance, squared, squared, false, true, false);
}
// Breaking a curve where it meets another, and clipping a curve to a shape.
constexpr SegmentIntersectionSettings BreakIntersectionSettings() {
  return detail::MakeIntersectionSettings(10.0, 10.0, 100.0, 100.0, false, true, false);
}
// Breaking a curve at its self-crossings; keepOverlapEnds is the caller's.
constexpr SegmentIntersectionSettings SelfBreakIntersectionSettings(bool keepOverlapEnds) {
  return detail::MakeIntersectionSettings(10.0, 10.0, 100.0, 100.0, false, keepOverlapEnds, false);
}
// Point-in-shape probes, finding a point inside a shape, and the trimming of
// parallel curve pieces.
constexpr SegmentIntersectionSettings PointInShapeIntersectionSettings() {
  return detail::MakeIntersectionSettings(0.5, 0.5, 0.25, 0.25, false, true, false);
}
// Cleaning raw offsets of their loops and combining offset outlines: nodes
// match at 0.1, but a touch must be practically exact.
constexpr SegmentIntersectionSettings OffsetIntersectionSettings() {
  return detail::MakeIntersectionSettings(0.1, 1e-8, 0.01, 1e-16, true, true, false);
}

}  // namespace OstraCrv
