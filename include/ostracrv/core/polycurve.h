// The path value type: a handle with copy-on-write storage.
//
// PolycurveT<T> holds one reference to a CurveDataBase<T> (see curvedata.h).
// Copies share the storage; the first write through a handle whose storage is
// shared or borrowed forks it, so other handles never see the write. Reads are
// const and never fork. Indices are int, as in the flat interface; counts of
// raw arrays are unsigned long, and a count with its top bit set (a negative
// count cast to unsigned) is refused like a null array.
//
// Both point kinds have the same class: T = Framework::common_types::POINT
// (integer) and T = MavikMath::V (double). Further methods of the class live
// in other source files of the library, each explicitly instantiated there for
// both kinds. Inside member bodies the members NodeTypes(), GetSegmentType()
// and GetContinuity() hide the namespace NodeTypes and the free node readers
// of the same names: write ::NodeTypes::Open::move, ::GetSegmentType(byte).
//
// Buffer protocol. Algorithms that edit raw arrays in place take mutable
// arrays with GetBuffer(worst-case count), edit them with the flat functions
// (which return the new node count) and give the final count back with
// ReleaseBufferInternal. The pointers stay valid until the next non-const call
// on the handle; since the arrays may be longer than the caller's count, code
// between the two calls works from its own count.
//
// Failures: the handle throws nothing of its own. Exhausted memory and
// oversized requests surface as std::bad_alloc or std::length_error and leave
// the handle with its old storage. Methods with a bool result return false on
// an index out of range, an empty curve or null arrays, as listed; accessors
// that return references answer a static default on a bad index.
#pragma once

#include <type_traits>
#include <vector>

#include "ostracrv/core/common_types.h"
#include "ostracrv/core/curvedata.h"
#include "ostracrv/core/curveposition.h"
#include "ostracrv/core/mavikutils.h"
#include "ostracrv/core/nodetype.h"
#include "ostracrv/core/subcurve_range.h"
#include "ostracrv/math/matrix.h"
#include "ostracrv/math/rect.h"
#include "ostracrv/math/side.h"
#include "ostracrv/math/vector2d.h"
#include "ostracrv/weld/weldflags.h"

namespace OstraCrv {

// Mutable arrays of a forked storage, from GetBuffer. count is the length of
// both arrays after the call.
template <class T>
struct CurveBuffer {
  T* points = nullptr;
  NODETYPE* nodes = nullptr;
  int count = 0;
};

// A read-only record of one subpath inside a path's arrays; owns nothing.
// limit is set by the subpath walks.
template <class T>
struct ConstDrawCurveT {
  T const* points = nullptr;
  NODETYPE const* nodes = nullptr;
  int count = 0;
  bool limit = false;
};

// The other point kind: V for POINT and POINT for V.
template <class T>
using OtherPointKind =
    std::conditional_t<std::is_same_v<T, Framework::common_types::POINT>, MavikMath::V, Framework::common_types::POINT>;

template <class T>
class PolycurveT {
 public:
  using point_type = T;
  using OtherT = OtherPointKind<T>;

  // ---- Construction and lifetime ----

  // An empty curve with its own storage.
  PolycurveT();
  // An empty curve with room for n nodes; an implausible n reserves nothing.
  // Throws std::length_error or std::bad_alloc for an impossible n.
  explicit PolycurveT(unsigned long n);
  // A copy of n entries of both arrays. Null arrays or an implausible count
  // give an empty curve; the arrays are then not read.
  PolycurveT(T const* points, NODETYPE const* nodes, unsigned long n);
  // Shares the storage of o: one atomic increment.
  PolycurveT(PolycurveT const& o) noexcept;
  // Takes o's storage and leaves o a valid empty curve (o gets a new empty
  // storage, allocated before anything changes).
  PolycurveT(PolycurveT&& o);
  // Takes over one reference to data without incrementing it. A null data
  // gives an empty curve.
  explicit PolycurveT(CurveDataBase<T>* data);
  // The conversion from the other point kind, never shared: node bytes are
  // copied unchanged; integer to double is exact, double to integer rounds
  // half away from zero (out-of-range values saturate, NaN becomes 0).
  explicit PolycurveT(PolycurveT<OtherT> const& o);
  // Gives up this handle's reference; the last holder deletes the storage.
  virtual ~PolycurveT();

  // Shares o's storage; nothing happens if both already hold the same one.
  PolycurveT& operator=(PolycurveT const& o) noexcept;
  // Swaps the storages: o ends up with this curve's old content.
  PolycurveT& operator=(PolycurveT&& o) noexcept;
  void Swap(PolycurveT& o) noexcept;

  // ---- Reads: const, never fork ----

  // The raw arrays (null when empty) and their common length.
  T const* GetPoints() const noexcept { return data->GetPoints(); }
  NODETYPE const* GetNodeTypes() const noexcept { return data->GetNodeTypes(); }
  unsigned long GetPointCount() const noexcept { return data->GetSize(); }
  bool IsEmpty() const noexcept { return GetPointCount() == 0; }

  // The point at i; a static zero point if i is out of range.
  T const& GetPoint(int i) const noexcept;
  // The first or last point; a static zero point on an empty curve.
  T const& GetFirstPoint() const noexcept;
  T const& GetLastPoint() const noexcept;
  // The node byte at i; NodeTypes::Open::move if i is out of range.
  NODETYPE const& GetNodeType(int i) const noexcept;

  // Ranges over the arrays and over the indices 0 .. count.
  MavikUtils::RangeView<T const*> Points() const noexcept;
  MavikUtils::RangeView<NODETYPE const*> NodeTypes() const noexcept;
  MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>> Indexes() const;

  // Fields of node i. Out of range they answer move, cusp and false.
  SegmentType GetSegmentType(int i) const noexcept;
  ContinuityType GetContinuity(int i) const noexcept;
  bool IsUser(int i) const noexcept;
  bool IsClosed(int i) const noexcept;
  bool IsLetter(int i) const noexcept;

  // Copies both arrays out; the caller sizes them. A null destination array
  // is skipped.
  void CopyTo(T* points, NODETYPE* nodes) const;
  // Assigns both vectors the content of the curve.
  void GetCurve(std::vector<T>& points, std::vector<NODETYPE>& nodes) const;
  // Whether both handles hold the same storage object.
  bool IsSameData(PolycurveT const& o) const noexcept { return data == o.data; }
  // A hook for consistency checks in debugging builds; does nothing.
  void DebugCheck() const noexcept {}

  // ---- Writes: each forks first, unless it would change nothing ----

  // Forks and returns the (now unshared, owning) storage.
  CurveData<T>* GetCurveData();

  // Set one entry; false, without a fork, if i is out of range.
  bool SetPoint(int i, T const& p);
  bool SetNodeType(int i, NODETYPE const& n);
  // Set the first or last point; false on an empty curve.
  bool SetFirstPoint(T const& p);
  bool SetLastPoint(T const& p);
  // Change one field of node i and nothing else, not even the twin of a
  // closed end; no-op if i is out of range.
  void SetSegmentType(int i, SegmentType t);
  void SetNodeClosed(int i, bool closed);
  void SetUserNode(int i, bool user);
  void SetLetter(int i, bool letter);
  // Sets the continuity of node i and of its twin if i is a closed end;
  // no-op if i is out of range.
  void SetContinuity(int i, ContinuityType c);
  // Clears the letter bit of every node; returns whether any was set. Forks
  // only if there is a bit to clear.
  bool ClearLetterFlags();
  // Clears the user bit of every arc node. Forks only if one is set.
  void ClearUserFlagOnArcs();

  // Room for n nodes without reallocation. On shared storage the content is
  // copied once into arrays of that capacity. An implausible n does nothing.
  // Throws like the constructor.
  void Reserve(unsigned long n);
  // Cuts the arrays to n entries; nothing (no fork) if there are at most n.
  void Truncate(unsigned long n);
  // Empties the curve: an unshared storage object is kept, a shared or
  // borrowed one is replaced by a new empty storage.
  void Clear();
  // Puts the content of the two vectors in. On unshared storage the vectors
  // are swapped, so the caller gets the old content back; otherwise new
  // storage takes them and they end up empty. Never copies. A longer vector is
  // first cut to the length of the shorter.
  void MoveData(std::vector<T>& points, std::vector<NODETYPE>& nodes);
  // Makes the curve independent of borrowed arrays: borrowed storage is
  // copied, owning storage (even shared) is kept as it is.
  void EnsureDataOwnership();

  // Replace the whole content by a copy. The raw form refuses null arrays
  // with n > 0 and implausible counts (false, nothing changed); n = 0 empties
  // the curve. The vector form refuses an empty point vector and uses the
  // shorter of the two lengths. The curve form copies o's arrays.
  bool SetPoints(T const* points, NODETYPE const* nodes, unsigned long n);
  bool SetPoints(std::vector<T> const& points, std::vector<NODETYPE> const& nodes);
  bool SetPoints(PolycurveT const& o);

  // Append one node.
  void PushBack(T const& p, NODETYPE const& n);
  // Append n entries. Refused (false, nothing changed) like SetPoints; n = 0
  // returns true without a fork. The vector form as in SetPoints.
  bool PushBack(T const* points, NODETYPE const* nodes, unsigned long n);
  bool PushBack(std::vector<T> const& points, std::vector<NODETYPE> const& nodes);
  // Append entries of the other point kind, converted as by the conversion
  // constructor.
  bool PushBack(OtherT const* points, NODETYPE const* nodes, unsigned long n);
  // Append the arrays of o. An empty curve shares o's storage instead of
  // copying (and copies only if o views borrowed arrays).
  void PushBack(PolycurveT const& o);

  // ---- Buffer protocol ----

  // Forks; returns the arrays and the current count.
  CurveBuffer<T> GetBuffer();
  // Arrays of at least n entries; new entries are zero.
  CurveBuffer<T> GetBuffer(int n) { return GetBuffer(n, false); }
  // Arrays of exactly n entries; new entries are zero.
  CurveBuffer<T> GetBufferSetCount(int n) { return GetBuffer(n, true); }
  // At least (setCount false) or exactly (setCount true) n entries. Shared
  // storage that must grow is copied once into arrays of the final length
  // rather than copied and then grown. A negative n behaves as GetBuffer().
  // Throws std::length_error or std::bad_alloc for an impossible n, with the
  // handle unchanged.
  CurveBuffer<T> GetBuffer(int n, bool setCount);
  // Does nothing.
  void ReleaseBuffer() noexcept {}
  // Forks and cuts the arrays to n entries if they are longer; never grows.
  // A negative n does nothing.
  void ReleaseBuffer(int n);
  // As ReleaseBuffer(n); false, with nothing changed, for a negative n.
  bool ReleaseBufferInternal(int n);

  // ---- Comparison ----

  // Orders by node count first (-1 fewer, 1 more), then by the bytes of the
  // point arrays, then of the node arrays; 0 if equal. Coordinates compare as
  // bit patterns, so 0.0 and -0.0 differ and a NaN equals the same NaN. The
  // result is -1, 0 or 1, but callers should rely only on its sign.
  int Compare(PolycurveT const& o) const noexcept;
  bool operator==(PolycurveT const& o) const noexcept { return Compare(o) == 0; }
  bool operator<(PolycurveT const& o) const noexcept { return Compare(o) < 0; }

 protected:
  // The storage this handle holds one reference to; never null.
  CurveDataBase<T>* data;

  // Forks data and returns it as the owning storage it now is.
  CurveData<T>* ForkData();
  // Appends m entries, copying shared storage once into arrays of the final
  // length. The arguments have been checked.
  void Append(T const* points, NODETYPE const* nodes, unsigned long m);

 public:
  // ---- Building: appends, joins, closing, cutting, makers ----
  //
  // Each forks the storage first. The plain appends do not validate: a curve
  // that does not start with MoveTo is not a valid path. Tolerances are plain
  // distances in the units of T unless named squared; a join or a closing
  // within tolerance compares the squared distance with the tolerance squared,
  // "at most", so a tolerance of 0.0 joins coincident points.

  // The coordinate type of T: int32 for POINT, double for V.
  using coordinate_type = decltype(T::x);

  // Push p as a move (a new subpath), a line end, or a Bezier (c1, c2 as arcs,
  // p as a curve node). Return true.
  bool MoveTo(T const& p);
  bool MoveTo(coordinate_type x, coordinate_type y);
  bool LineTo(T const& p);
  bool LineTo(coordinate_type x, coordinate_type y);
  // As LineTo, but on a curve that ends in a line whose previous point, end
  // and p lie within sqrt(10) units of one line, the end is moved to p instead
  // of adding a node. False, with nothing added, on an empty curve.
  bool LineTo(T const& p, bool mergeCollinear);
  bool LineTo(coordinate_type x, coordinate_type y, bool mergeCollinear);
  bool CubicTo(T const& c1, T const& c2, T const& p);
  // Appends the circular arc from the last point to p that leaves in the
  // direction tangent (a line where no arc fits). False, with nothing changed,
  // on an empty curve or when no arc or line can be built (non-finite input).
  bool CircularArcTo(T const& p, MavikMath::vector2dT<double, false> const& tangent);
  // The same with the direction in which the curve arrives at its end; after
  // a lone first node, the chord turned a quarter counter-clockwise, which
  // gives a clockwise half circle bulging to the left of the chord.
  bool CircularArcTo(T const& p);

  // Appends p as a start node unless the curve ends exactly at p; then the
  // last node only takes over the enabled bit and the continuity of node.
  // The pushed byte keeps the low six bits of node, so it is a move.
  void PushBackWithJoinCheck(T const& p, NODETYPE const& node);
  // PushBackWithJoinCheck(p[0], node), then p[1] as a line end. False for a
  // null p.
  bool AppendLineWithJoin(T const* p, NODETYPE const& node);
  // PushBackWithJoinCheck(p[0], node), then p[1], p[2] as arcs and p[3] as a
  // curve end. False for a null p.
  bool AppendBezierWithJoin(T const* p, NODETYPE const& node);
  // Appends other. If this curve's open end lies within tolerance of other's
  // start, other continues it: the seam node loses its continuity, keeps its
  // point, and other's first node is dropped (a closed first subpath of
  // other opens there). Otherwise (also when this curve ends closed) other is
  // appended whole. closeAfter then tries CloseLastSubpath(tolerance, false).
  // An empty other changes nothing.
  void AppendWithJoin(PolycurveT const& other, bool closeAfter, double tolerance);
  // Appends other and welds its ends to the nearest open ends of this curve
  // (FindClosestOpenPointOnCurve; squared distances at most tolerance
  // squared; if both ends find the same node, the farther one searches again
  // without it). The weld is asked with this curve's old last node standing
  // in for other's first node, an established quirk: a weld of other's first
  // end joins its nearest open end to this curve's old last node, a weld of
  // other's last end joins it to its nearest open end, and with both ends
  // within tolerance the request is refused. Returns whether a weld was
  // made; the append stays in any case. An empty other changes nothing; on
  // an empty curve other is appended.
  bool JoinEndpoints(PolycurveT const& other, double tolerance);

  // Closes the last subpath when it has at least three nodes and its ends lie
  // within tolerance: both ends move to their midpoint (the integer form
  // truncates the halved sum), the first node gets the closed and user bits,
  // the last the closed bit without the user bit. With addLine, ends further
  // apart first get a line back to the first point, and the subpath closes on
  // it; if even that cannot close (a subpath of one node), the line is taken
  // away again. Returns whether it closed; false on fewer than two nodes.
  bool CloseLastSubpath(double tolerance, bool addLine);
  bool CloseLastSubpathWithOptionalLine();
  // Closes every open subpath: ends that coincide exactly are closed in
  // place, others get a closing line back to the first point. With skipShort,
  // subpaths of fewer than three nodes stay open. Returns whether any subpath
  // was open (also if only short ones were); false on an empty curve, with
  // nothing touched. O(n).
  bool CloseOpenSubpaths(bool skipShort);
  // The closed bit of the final node, and its opposite; both false on an
  // empty curve.
  bool IsLastSubpathClosed() const noexcept;
  bool IsLastSubpathOpen() const noexcept;

  // Removes the last segment (3 nodes for a Bezier, 1 otherwise; a final move
  // goes like a line). If it closed a subpath, the subpath's first node
  // becomes a plain open move. False, with nothing changed, on fewer than two
  // nodes or too few nodes for the segment.
  bool PopLastSegment();
  // Removes the segment that ends at endNode. A middle segment of an open
  // subpath splits it in two; a first or last segment shortens it; a closed
  // subpath of several segments opens at that segment (turned so that it
  // runs from the segment's end round to its start); the only segment of a
  // subpath takes the whole subpath with it. False for an endNode out of
  // range, a move or an arc; otherwise whether the count changed. O(n).
  bool DeleteSegment(unsigned long endNode);
  // Replace count nodes at pos by n new ones (pos clamped to the size, count
  // to the nodes behind pos). False, with nothing changed, for null arrays
  // with n > 0 or an implausible n.
  bool ReplacePoints(unsigned long pos, unsigned long count, T const* points, NODETYPE const* nodes,
                     unsigned long n);
  bool ReplacePoints(unsigned long pos, unsigned long count, PolycurveT const& a);
  // As above, then b's nodes from its second on directly behind a's: b's
  // move is dropped so that a and b form one chain.
  bool ReplacePoints(unsigned long pos, unsigned long count, PolycurveT const& a, PolycurveT const& b);
  bool DeletePoints(unsigned long pos, unsigned long count);
  bool InsertPoints(unsigned long pos, T const* points, NODETYPE const* nodes, unsigned long n);

  // Appends o (PushBack), or each curve of a vector in order.
  PolycurveT& operator+=(PolycurveT const& o);
  PolycurveT& operator+=(std::vector<PolycurveT> const& curves);
  // Moves every point, control points included, by offset; the integer form
  // rounds the offset once, half away from zero.
  PolycurveT& operator+=(MavikMath::vector2dT<double, false> const& offset);
  // Transforms every point; the integer form rounds half away from zero.
  PolycurveT& operator*=(MavikMath::MATRIX const& m);
  // Transforms by the inverse of m. A singular m is applied uninverted.
  PolycurveT& operator/=(MavikMath::MATRIX const& m);

  // Makers: the Create*Subpath methods append a shape as a new subpath, the
  // static Create* return a curve of that shape alone. A shape builder that
  // writes nothing (non-finite arguments) leaves the curve as it was and the
  // method returns false.
  //
  // The line a (move) to b (line end).
  static PolycurveT CreateLine(T const& a, T const& b);
  bool CreateLineSubpath(T const& a, T const& b);
  // The rectangle's corners (left, top), (right, top), (right, bottom),
  // (left, bottom), closed: clockwise with y up, positive area in both point
  // kinds.
  static PolycurveT CreateRectangle(Framework::common_types::RECT const& rect);
  bool CreateRectangleSubpath(Framework::common_types::RECT const& rect);
  // The closed 13-node circle starting at angle 0.
  static PolycurveT CreateCircle(T const& centre, double radius);
  bool CreateCircleSubpath(T const& centre, double radius);
  // The closed ellipse with radii.x and radii.y, starting at angle 0.
  static PolycurveT CreateEllipse(T const& centre, T const& radii);
  bool CreateEllipseSubpath(T const& centre, T const& radii);
  // The circular arc from a to b through c (a line where no arc fits).
  bool Create3PointArcSubpath(T const& a, T const& b, T const& c);

 public:
  // ---- Subpaths and subcurves ----
  //
  // A position on the curve is a segment's start node and a parameter t in
  // 0..1 on that segment. Parameters within 2.2e-16 of 0 or 1 count as the
  // segment's ends. Results that are curves are new, independent curves; the
  // Get* family answers an empty curve (or vector) rather than failing.

  // A copy of count nodes from first (first clamped to the size, count to the
  // nodes behind it); a first node that is not a move is made one.
  PolycurveT GetSubcurve(unsigned long first, unsigned long count) const;
  // The piece from (a, t0) to (b, t1). It may cross subpath borders going
  // forward; with (b, t1) before (a, t0) it wraps round the closing point of
  // a's subpath, which must be closed. The piece is an open chain: its ends
  // are user nodes, and a cut end is not selected. With reversed, the piece
  // of GetSubcurve(b, t1, a, t0, false) is returned turned round, running
  // from (a, t0) to (b, t1) against the curve's direction. Empty for
  // positions that are not segment starts, parameters outside 0..1 (or NaN),
  // an empty stretch, or a wrap on an open subpath. O(length of the piece).
  PolycurveT GetSubcurve(unsigned long a, double t0, unsigned long b, double t1, bool reversed) const;
  // The curve from its start up to (node, t), and from (node, t) to its end.
  // Empty on an empty curve and for a piece of no length at the ends.
  PolycurveT GetLeftSubcurve(unsigned long node, double t) const;
  PolycurveT GetRightSubcurve(unsigned long node, double t) const;
  // A copy of the subpath that holds node; empty for a node out of range or a
  // subpath of a single node.
  PolycurveT GetSubpath(unsigned long node) const;
  // The first node and one past the last node of node's subpath; false (and
  // nothing written) for a node out of range or a single-node subpath.
  bool GetSubpathRange(unsigned long node, unsigned long& begin, unsigned long& end) const;
  MavikUtils::optional<MavikUtils::RangeView<MavikUtils::IndexT<unsigned long>>> GetSubpathRange(
      unsigned long node) const;
  // The first and last node of node's subpath; -1 out of range.
  int FirstNodeOfSubpath(unsigned long node) const;
  int LastNodeOfSubpath(unsigned long node) const;
  // (first, count) of every subpath in array order, lone moves included.
  std::vector<SubcurveRange> GetSubpathIndices() const;
  // The subpaths with at least one node (arcs included) whose enabled bit
  // equals wanted; the form without argument asks for enabled ones.
  std::vector<SubcurveRange> GetEnabledSubpathIndices(bool wanted) const;
  std::vector<SubcurveRange> GetEnabledSubpathIndices() const;
  // The number of moves.
  int GetNumberOfSubpaths() const;
  // True for the last node, a move and a node followed by a move; false out
  // of range.
  bool IsSubpathStartOrEnd(unsigned long node) const;
  // Records over this curve's arrays (no copy; valid while the storage is
  // unchanged): all subpaths with limit true, or those holding an enabled
  // node with limit false.
  std::vector<ConstDrawCurveT<T>> GetSubpathCurves() const;
  std::vector<ConstDrawCurveT<T>> GetEnabledSubpathCurves() const;
  // Each subpath as an owning copy.
  std::vector<PolycurveT> GetSubpaths() const;
  // Each subpath as a handle over a view into this curve's arrays: no point
  // is copied, and the handles are valid as long as this curve's storage
  // stays as it is (writes through them fork away).
  std::vector<PolycurveT> GetSubpathRefs() const;
  // The glyphs of a text curve: a subpath whose first node has the letter bit
  // starts a new curve, and the subpaths behind it without the bit (its inner
  // contours) join that curve. A letter subpath of a single node only starts
  // the group. Subpaths before the first letter are left out; no letter bit
  // gives an empty vector.
  std::vector<PolycurveT> GetLetterCurves() const;
  // Turns the closed subpath of range (or of anyNode) so that node becomes
  // its first node; shape, count and closure stay. False, with nothing
  // changed, for a range outside the curve or a subpath that is not closed.
  bool SpinSubpath(SubcurveRange range, unsigned long node);
  bool SpinSubpath(unsigned long anyNode, unsigned long node);
  // Removes the subpath that holds node; false out of range or for a
  // single-node subpath.
  bool DeleteSubpath(unsigned long node);
  // Turns a curve of one closed subpath so that it starts at node. No check
  // is made that the curve is one closed subpath. False, with nothing
  // changed, unless 1 <= node <= count - 2 (node 0 and the closing node are
  // the start already).
  bool SetPathStartAt(unsigned long node);
  // Reverses the direction of every subpath (and their order). O(n).
  void Reverse();
  // Moves all open subpaths out of this curve into the returned curve, in
  // order. With dropDangling, open stretches of a single node are removed
  // from this curve and not returned. O(n).
  PolycurveT ExtractOpenSubpaths(bool dropDangling);
  // Closes the subpath that holds node: the selection is replaced by its two
  // ends, which are then joined with a line where they do not meet
  // (JoinEnabledAddingLineSegments). A subpath of a single line stays open.
  // False for a node out of range or a single-node subpath; true otherwise,
  // also when nothing could be closed.
  bool CloseSubpath(unsigned long node);
  // Opens every closed subpath at its closing point; no node is added, and
  // the segments stay. Stray moves are tidied away. O(n) per closed subpath.
  void OpenAllSubpaths();

 public:
  // ---- Measurement ----
  // Thin wrappers over the raw measures of the measure/ headers (bounds.h,
  // area.h, length.h, pointoncurve.h, tangents.h) on this curve's arrays;
  // each answers what its raw form answers for bad input.

  // Tight box around the true shape, rounded outward; empty for an empty
  // curve.
  Framework::common_types::RECT GetTightBBox() const;
  // Box of all points, control points included, rounded outward.
  Framework::common_types::RECT GetLooseBBox() const;
  // Tight box of the segments that touch an enabled node; empty if none.
  Framework::common_types::RECT GetTightEnabledBBox() const;
  // Tight box after the transform, in doubles.
  MavikMath::BoundsT<double> GetTightTransformedBBox(MavikMath::MATRIX const& m) const;
  // Box of every point (control points included) after the transform.
  MavikMath::BoundsT<double> GetLooseTransformedBBox(MavikMath::MATRIX const& m) const;
  // Signed area of the closed subpaths, positive for clockwise (y up).
  double GetArea() const;
  // Length of all segments, at accuracy 10.
  double GetLength() const;
  // The point at t on the segment that ends at node i (rounded for integer
  // curves); the zero point, or false, where that segment does not exist.
  T GetPointOnCurve(unsigned long i, double t) const;
  bool GetPointOnCurve(unsigned long i, double t, T& out) const;
  // The same at a position's end node and t; the zero point, or false, for a
  // position whose segment is negative.
  T GetPointOnCurve(CurvePosition const& pos) const;
  bool GetPointOnCurve(CurvePosition const& pos, T& out) const;
  // In doubles without rounding, for an integer curve.
  bool GetPointOnCurve(unsigned long i, double t, MavikMath::V& out) const
    requires(!std::is_same_v<T, MavikMath::V>);
  // In doubles without rounding; the zero point where there is no segment.
  MavikMath::V GetPoint2dOnCurve(unsigned long i, double t) const;
  // Some point on the curve: the middle of the first segment if node 1 is a
  // line or node 3 a curve; otherwise the zero point.
  T GetPointOnCurve() const;
  // Derivative at t of the segment ending at i; see tangents.h.
  MavikMath::D GetTangentAt(unsigned long i, double t, bool normalise) const;
  // Direction in which the curve leaves node i, or arrives from behind it
  // (pointing away from i); (0, 0) where there is none.
  MavikMath::D GetForwardTangentAt(int i) const;
  MavikMath::D GetReverseTangentAt(int i) const;
  // Signed curvature just after / just before node i, positive for a left
  // turn; 0.0 on lines and where there is no segment.
  double GetForwardCurvatureAt(int i) const;
  double GetReverseCurvatureAt(int i) const;
  // Whether the segment ending at i passes centre clockwise at t; tangent,
  // if not null, receives the direction of travel there.
  bool IsClockwise(unsigned long i, double t, T const& centre, MavikMath::D* tangent) const;
  // Whether node i is a corner: marked cusp and its two sides not opposite.
  bool IsCuspNode(unsigned long i) const;
  // The number of line and curve nodes.
  int GetNumberOfSegments() const;
  // True if the curve is not empty and holds only move and line nodes.
  bool AllLineSegments() const;

 public:
  // ---- Closest points ----
  // See closest.h for the searches.

  // The nearest point of the curve to p; false, out unchanged, if the curve
  // has no segment or p is not finite.
  bool FindClosestPoint(T p, ClosestPoint<T, CurvePosition>& out) const;
  // The nearest end of an open subpath of more than one node: node is set to
  // 0, then to that end's index; true if such an end exists.
  bool FindClosestOpenPoint(T p, unsigned long& node) const;
  // Whether the nearest point of the curve lies within tolerance of p
  // (squared distance at most tolerance squared). False for an empty curve,
  // a curve without segments or non-finite input.
  bool IsPointOnCurve(T const& p, double tolerance) const;
  // The length from the start of the curve to its nearest point to p; 0.0
  // if there is none.
  double GetLengthAlongCurveTo(T p) const;
  // The length from the start of the curve, across subpaths, to t on the
  // segment ending at endNode; and from there to the end of the curve.
  double GetLengthAlongCurveTo(unsigned long endNode, double t) const;
  double GetLengthFrom(unsigned long endNode, double t) const;

 public:
  // ---- Node selection ----
  // The enabled bit of each node (see node_selection.h). Every method that
  // changes bits forks first; none of them keeps the twins of a closed
  // subpath in step unless it says so. An arc that loses the enabled bit
  // loses its user bit as well (a control point is offered only while it
  // follows the selection).

  // Indices of the nodes with the enabled bit, in order; arcs only with
  // includeArcs.
  std::vector<unsigned long> GetEnabledNodes(bool includeArcs) const;
  // Filters indices in list order, dropping those out of range and those not
  // enabled. With treatArcsByNeighbours an arc stays only when the node kept
  // before it was enabled and the Bezier's end node is an enabled curve: a
  // control point counts as selected when both ends of its Bezier are.
  std::vector<unsigned long> GetEnabledNodesFrom(std::vector<unsigned long> indices,
                                                 bool treatArcsByNeighbours) const;
  std::vector<unsigned long> GetEnabledNodesFrom(SubcurveRange range, bool treatArcsByNeighbours) const;
  // Enabled non-arc nodes that are the first or last node of an open subpath.
  std::vector<unsigned long> GetEnabledOpenEndNodes() const;
  // Clears the selection (CRV_DisableAllNodes), then enables each listed
  // index inside the curve.
  void SetEnabledNodes(std::vector<unsigned long> const& indices);
  void DisableAllNodes();
  // Enables every node and refreshes the arc marks.
  void EnableAllNodes();
  // The arc refresh; returns the number of selected nodes.
  int EnableAllControls();
  // Every node gets the enabled bit exactly when it is an end of an open
  // (respectively closed) subpath.
  void EnableFirstAndLastInOpenSubpaths();
  void EnableFirstAndLastInClosedSubpaths();
  // One bit of node i; ignored out of range.
  void SetEnabled(unsigned long i, bool on);
  // The bit on first .. first+count-1, cut at the size.
  void SetEnabled(unsigned long first, unsigned long count, bool on);
  // The bit on all nodes of node's subpath, arcs included; ignored out of
  // range.
  void SetSubpathEnabled(unsigned long node, bool on);
  // Whether any byte, arcs included, has the enabled bit.
  bool AnyEnabled() const;
  // The bit of node i; false out of range.
  bool IsEnabled(unsigned long i) const;
  // Clears the selection, then copies the enabled bit of other's first
  // min(count, other's count) nodes. other may be this curve.
  void CopyEnabledFrom(PolycurveT other);

 public:
  // ---- Structural node edits ----

  // Joins the selected open ends, bridging gaps with lines (see
  // CRV_JoinEnabledAddingLineSegments). Returns whether the join ran (false,
  // nothing changed, with fewer than two selected open ends).
  bool JoinEnabledAddingLineSegments();
  // Breaks the curve at t on the segment that ends at node i (see
  // CRV_BreakAtLocation). Returns whether it broke; nothing changes on an
  // empty curve or a position that cannot be broken.
  bool BreakAt(unsigned long i, double t);

 public:
  // ---- Point in shape ----
  // See point_in_shape.h, point_in_shape_interior.h and curve_side.h.

  // Whether p lies inside the closed subpaths of the curve, by non-zero
  // winding or by even-odd; a point on the outline answers resultOnEdge.
  bool IsPointInShape(T const& p, bool resultOnEdge, bool nonZero) const;
  // Some point strictly inside the curve's shape (GetPointInShape); false,
  // out unchanged, if none is found.
  bool FindPointInShape(T& out) const;
  // The side of the nearest segment on which p lies, in its forward frame
  // with y up; SideNone on the curve or for a curve without segments.
  MavikMath::Side GetSide(T const& p) const;
  // The side of this curve on which a point inside `other` lies; SideNone if
  // no point inside other is found.
  MavikMath::Side OnLeftOrRight(PolycurveT const& other) const;

 public:
  // ---- Welding ----
  // Boolean operations on the filled areas of two curves (see weld/weldstate.h
  // for the method). Only closed subpaths take part; each operand is filled
  // by its own rule (true: non-zero winding, false: even-odd). The result is
  // a new curve of closed loops whose fill under the even-odd rule is the
  // answer; loops through crossings follow the operands' directions, an
  // untouched subpath keeps its own. Computed in doubles, rounded half away
  // from zero for integer curves. Never fails: empty operands, operands of
  // open subpaths only and degenerate input give a valid, possibly empty,
  // result; subpaths with non-finite coordinates take no part.

  // The area covered by either operand.
  static PolycurveT Union(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                          bool secondNonZero, WeldFlags flags = WeldFlags::None);
  // The area covered by both.
  static PolycurveT Intersect(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                              bool secondNonZero, WeldFlags flags = WeldFlags::None);
  // The area of first not covered by second.
  static PolycurveT Subtract(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                             bool secondNonZero, WeldFlags flags = WeldFlags::None);
  // The area covered by exactly one of them.
  static PolycurveT Xor(PolycurveT const& first, PolycurveT const& second, bool firstNonZero,
                        bool secondNonZero, WeldFlags flags = WeldFlags::None);
  // A factor by which a host may scale this curve before an operation so
  // that its coordinates use the range up to 2^28: with m the largest of
  // |smallest x|, |largest x|, the width, |smallest y| and the height, 2^28 / m,
  // or 1 when m exceeds 2^28 or the width or the height is at most 2^-52.
  // Not used by the library itself; 1 for an empty curve.
  double GetWeldingUpScale() const;
};

// A handle over arrays that the caller owns and keeps alive as long as any
// handle shares the view. Reads see the caller's arrays without a copy; the
// first write through any handle forks away, so the arrays are never written.
template <class T>
class PolycurveRefT : public PolycurveT<T> {
 public:
  // A view of n entries; null arrays or an implausible count give an empty
  // curve.
  PolycurveRefT(T const* points, NODETYPE const* nodes, unsigned long n);
  using PolycurveT<T>::operator=;
};

// A curve of straight lines through n points, owning a copy. Closed only if
// closed is true and n >= 2; a closed polyline ends on a copy of its first
// point (added if the last point differs from the first). Null points with
// n > 0 give an empty curve.
template <class T>
class PolylineT : public PolycurveT<T> {
 public:
  PolylineT(T const* points, unsigned long n, bool closed);
  using PolycurveT<T>::operator=;
};

using Polycurve = PolycurveT<Framework::common_types::POINT>;
using PolycurveD = PolycurveT<MavikMath::V>;
using PolycurveRef = PolycurveRefT<Framework::common_types::POINT>;
using PolycurveRefD = PolycurveRefT<MavikMath::V>;
using Polyline = PolylineT<Framework::common_types::POINT>;
using PolylineD = PolylineT<MavikMath::V>;

extern template class PolycurveT<Framework::common_types::POINT>;
extern template class PolycurveT<MavikMath::V>;
extern template class PolycurveRefT<Framework::common_types::POINT>;
extern template class PolycurveRefT<MavikMath::V>;
extern template class PolylineT<Framework::common_types::POINT>;
extern template class PolylineT<MavikMath::V>;

}  // namespace OstraCrv
