#pragma once

#include "lumenkey/foundation/BXExport.h"
#include "lumenkey/foundation/BXLocks.h"
#include "lumenkey/foundation/BXRelaxed.h"
#include "lumenkey/foundation/Tempus.h"
#include "lumenkey/splines/KFInterpolation.h"
#include "lumenkey/splines/KFInterpolators.h"
#include "lumenkey/splines/KFSplineOwner.h"
#include "lumenkey/splines/KFSplineState.h"
#include "lumenkey/splines/KFVertexIterator.h"

#include <atomic>
#include <cstddef>
#include <cstdint>
#include <memory>
#include <utility>
#include <vector>

class KFCustomInterpolator;
class KFVertex;
class KFVertexStore;
struct KFSegmentCache;
class KFSegmentPlace;

/// An ordered store of vertices with everything needed to evaluate it.
///
/// U, the position of a vertex, is a time on an ordinary spline and a running parameter on a parametric one. Vertices
/// stand in ascending order of U; several may share one U, the newest first. A disabled vertex is not valid: it stays
/// in the store, but the curve passes it by. The segment between two neighbouring valid vertices is drawn by the
/// interpolator that the first of them names, and everything outside the valid vertices by an extrapolation mode. A
/// closed spline wraps from its last valid vertex to its first instead of being extrapolated.
///
/// A handle is a `void*` that holds a `KFVertex*`. It stays good as long as its vertex stays in the spline, whatever
/// happens to the others. The spline owns its vertices. Its state is its user's and outlives it.
///
/// The last `Tempus` argument of most operations, `t`, is the time at which attributes of vertices are read; plain
/// vertices ignore it, and plain callers pass `kTempusZero`.
///
/// Out-parameters that are pointers may be null unless an operation says otherwise. A null handle gives false or null
/// where an operation says "handle or null"; elsewhere a good handle is required: `isValidHandle` tells.
/// Nothing throws but for a lack of memory, and nothing prints.
///
/// Threads. Any number of threads may evaluate while one edits. The guard is one spin lock, not recursive: the
/// owner's `_customLock` when there is one, else the spline's own. Each block of operations below says whether its
/// operations take the lock; an argument named `lock` says whether to take it. Operations that don't take it are for
/// callers that hold it, or that know that no other thread edits; `findVertex` and reads of types BSpline and XSpline,
/// which keep tables, for callers that know that no other thread uses the spline. `preSplineAccess` and
/// `postSplineAccess` hold the lock around several calls. `getVertexValue` asked to take it may do without: a thread
/// keeps what it computed about the segments that it reads, and goes on with that as long as nothing has changed that
/// the value depends on. It sees every edit that was over before, and never half of one. Under an owner's `_customLock`
/// it takes the lock each time.
///
/// Cost. Vertices stand in blocks with their positions beside them as 64-bit ticks of a common timescale, so finding,
/// adding and removing one costs O(log n), evaluation at ascending positions O(1). Evaluation allocates nothing, but for
/// 70 KiB that a thread allocates with its first read of a spline and frees at its end.
class LUMENKEY_API KFSpline {
public:
    /// Empty, open, without an owner. `state` isn't null and isn't owned.
    explicit KFSpline(KFSplineState* state);
    /// A deep copy with another state; holds the lock of `other` meanwhile. It has no owner.
    KFSpline(KFSpline const& other, KFSplineState* state);
    /// `copy` of all vertices; holds the lock of `other` meanwhile, not its own.
    KFSpline& operator=(KFSpline const& other);
    KFSpline(KFSpline const&) = delete;
    /// Equal only if both hold the very same vertex objects, which two splines don't unless both are empty, are both
    /// open or closed, and their interpolators agree.
    bool operator==(KFSpline const& other) const;

    // The order of the virtual operations is the interface that subclasses derive from: never reorder. Each is told
    // with its fellows further down.

    virtual ~KFSpline();
    virtual bool getInterpolation(std::uint32_t* type, bool* usesTangents, bool* isSpline);
    virtual bool getAllVerticesHandles(std::vector<void*>& out);
    virtual bool deleteVertex(void* handle, bool scale, Tempus const& t);
    virtual bool sampleSpline(Tempus const& start, Tempus const& step, std::uint32_t& count, Tempus* times,
                              double* values, Tempus const& t, bool adaptive);
    virtual bool sampleSpline(Tempus const& start, Tempus const& step, std::uint32_t& count,
                              std::vector<Tempus>* times, std::vector<double>* values, Tempus const& t,
                              bool adaptive);
    virtual bool sampleSplineDerivatives(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                         Tempus* times, double* values, Tempus const& t);
    virtual bool sampleSplineDerivatives(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                         std::vector<Tempus>* times, std::vector<double>* values,
                                         Tempus const& t);
    virtual bool sampleSplineSegment(Tempus const& start, Tempus const& step, std::uint32_t& count,
                                     Tempus* times, double* values, Tempus const& t, bool lock);
    virtual bool sampleSplineSegments(Tempus const& start, Tempus const& end, Tempus const& step,
                                      std::vector<Tempus>* times, std::vector<double>* values);
    virtual bool enableVertex(void* handle, Tempus const& t);
    virtual bool disableVertex(void* handle, Tempus const& t);
    virtual bool isEnabledVertex(void* handle, Tempus const& t);
    virtual bool setVertexInputHandles(void* handle, double u, double v, Tempus const& t, bool convert);
    virtual bool setVertexOutputHandles(void* handle, double u, double v, Tempus const& t, bool convert);
    virtual bool getVertexInputHandles(void* handle, double* u, double* v, Tempus const& t, bool convert);
    virtual bool getVertexOutputHandles(void* handle, double* u, double* v, Tempus const& t, bool convert);
    virtual bool flattenHandles(void* handle, Tempus const& t);
    virtual bool setVertexSmooth(void* handle, bool smooth, Tempus const& t);
    virtual bool setVertexNormal(void* handle, double normal, Tempus const& t);
    virtual bool getVertexNormal(void* handle, double* normal, Tempus const& t);
    virtual bool setVertexNormal(Tempus const& u, double normal, Tempus const& t);
    virtual bool getVertexNormal(Tempus const& u, double* normal, Tempus const& t);
    virtual void* addVertex(Tempus const& u, double value, Tempus const& t, bool replace);
    virtual bool setVertex(void* handle, Tempus const& u, double value, Tempus const& t);
    virtual bool setVertexValue(void* handle, double value, Tempus const& t);
    virtual bool deriveVertex(void* handle, Tempus const& t);
    virtual bool getPointInputTangents(Tempus const& u, double* x, double* y, Tempus const& t);
    virtual bool getPointOutputTangents(Tempus const& u, double* x, double* y, Tempus const& t);
    virtual double getVertexValue(Tempus const& u, Tempus const& t, bool lock);
    virtual double getDerivativeValue(Tempus const& u, Tempus const& t, bool lock);
    virtual bool getVertex(Tempus const& u, double* v, Tempus const& t);
    virtual bool getVertex(void* handle, Tempus* u, double* v, Tempus const& t);
    virtual bool setVertexBiasLinear(void* handle, double bias, Tempus const& t);
    virtual bool getVertexBiasLinear(void* handle, double* bias, Tempus const& t);
    virtual bool setVertexBiasExp(void* handle, double exponent, Tempus const& t);
    virtual bool getVertexBiasExp(void* handle, double* exponent, Tempus const& t);
    virtual void deriveCurve(KFVertex& vertex, Tempus const& t, bool readOnly);

    // --- Store and locking. No lock, except where said. ---

    /// No lock of its own, on either side. Replaces all vertices by clones of those of `other` from `first` through
    /// `last`; by none when a handle is null. Takes over whether `other` is closed, and its interpolators.
    void copy(KFSpline& other, void* first, void* last);
    /// Room for `count` vertices; 0 and less do nothing.
    void reserveMemoryForKeypoints(int count);
    /// Takes, and gives back, the lock by which the spline is guarded; nothing with `lock` false.
    void preSplineAccess(bool lock) const;
    void postSplineAccess(bool lock) const;

    KFSplineOwner* getNode() const noexcept { return _node.load(std::memory_order_acquire); }
    void setNode(KFSplineOwner* node) noexcept { _node.store(node, std::memory_order_release); }
    KFSplineState* getState() const noexcept { return _state.load(std::memory_order_acquire); }
    void setState(KFSplineState* state) noexcept { _state.store(state, std::memory_order_release); }
    KFInterpolator* getInterpolator(std::uint32_t type) { return _interpolators->getInterpolator(type); }

    /// True asks for the tables of the per-spline interpolators to be made anew, and reads the positions and enabled
    /// states of all vertices again unless the owner suppresses it: O(n); beside other threads the caller holds the
    /// lock. False says that those tables are current.
    void setDirty(bool dirty);
    bool isDirty() const noexcept { return _dirty; }
    bool isClosed() const noexcept { return _closed; }
    /// May run beside one thread that edits: what the last edit that was over left, never a number on the way there.
    std::size_t getNumberOfVertices() const noexcept { return _vertexCount.load(std::memory_order_acquire); }
    /// Bytes of memory that the store asks for beyond the vertices themselves: what a vertex costs in the store.
    std::size_t getStoreBytes() const noexcept;

    // --- Valid vertices. No lock; each has a form with it. ---
    //
    // Each writes the handle, or null when it gives false. `t` is the time at which vertices are asked whether they
    // are enabled, which matters only for a spline whose vertices can change that over time: there, several vertices
    // at one U count as one stop for the forms by handle and by iterator.

    bool getFirstValidVertex(void** out, Tempus const& t);
    bool getLastValidVertex(void** out, Tempus const& t);
    /// The neighbour in the list of valid vertices. A handle that isn't in that list is taken to stand at its first
    /// place.
    bool getNextValidVertex(void* handle, void** out, Tempus const& t);
    bool getPreviousValidVertex(void* handle, void** out, Tempus const& t);
    bool getNextValidVertex(KFVertexIterator const& place, void** out, Tempus const& t);
    bool getPreviousValidVertex(KFVertexIterator const& place, void** out, Tempus const& t);
    /// The first enabled vertex strictly after `u`. With `zeroTwice` the second enabled vertex exactly at time zero
    /// counts as found too.
    bool getNextValidVertex(Tempus const& u, void** out, Tempus const& t, bool zeroTwice);
    /// The last enabled vertex strictly before `u`. The last argument has no effect.
    bool getPreviousValidVertex(Tempus const& u, void** out, Tempus const& t, bool unused);
    std::uint32_t getNumberOfValidVertices(Tempus const& t);
    std::uint32_t getNumberOfValidVerticesWithMultiplicity(Tempus const& t);

    bool getFirstValidVertexWithLock(void** out, Tempus const& t);
    bool getLastValidVertexWithLock(void** out, Tempus const& t);
    bool getNextValidVertexWithLock(void* handle, void** out, Tempus const& t);
    bool getPreviousValidVertexWithLock(void* handle, void** out, Tempus const& t);
    bool getNextValidVertexWithLock(KFVertexIterator const& place, void** out, Tempus const& t);
    bool getPreviousValidVertexWithLock(KFVertexIterator const& place, void** out, Tempus const& t);
    bool getNextValidVertexWithLock(Tempus const& u, void** out, Tempus const& t, bool zeroTwice);
    bool getPreviousValidVertexWithLock(Tempus const& u, void** out, Tempus const& t, bool unused);

    // --- All vertices, valid or not. No lock, except where said. ---

    /// The place of a handle; the first place when the handle isn't in the spline.
    KFVertexIterator getVertexIter(void* handle);
    /// The place of a valid vertex; that of the first valid vertex when the handle isn't one.
    KFVertexIterator getValidVertexIter(void* handle);
    KFVertexIterator beginVertices() const noexcept;
    KFVertexIterator endVertices() const noexcept;
    KFVertexIterator nextPlace(KFVertexIterator place) const noexcept;
    KFVertexIterator previousPlace(KFVertexIterator place) const noexcept;
    /// The place of the first vertex strictly after `u`; the end when there is none.
    KFVertexIterator placeAfter(Tempus const& u) const noexcept;
    /// The vertex at a place that isn't the end.
    KFVertex* vertexAt(KFVertexIterator place) const noexcept;

    void* getFirstVertex() const noexcept;
    void* getLastVertex() const noexcept;
    void* getNextVertex(void* handle);
    void* getPreviousVertex(void* handle);
    /// The first vertex strictly after `u`; when `u` isn't after time zero a second vertex exactly at zero also
    /// counts. Null if there is none.
    void* getNextVertex(Tempus const& u);
    /// The first vertex at `u`; true when there is one.
    bool getVertexHandle(Tempus const& u, void** out, bool lock);
    /// Takes the lock. True when the handle is that of a vertex of this spline, disabled ones included. The handle is
    /// only compared and never followed, so any pointer may be asked for.
    bool isValidHandle(void* handle);
    /// The search behind `isValidHandle`, without the lock, between two indices, both included.
    bool findVertex(long first, long last, void* handle);
    /// Takes the lock. Appends the enabled vertices, of those at one U only the first. True.
    bool getAllValidVerticesHandles(std::vector<void*>& out, Tempus const& t);
    /// Takes the lock. Position, value and interpolation type of the vertices from the one at or before the start of
    /// `range` (the last vertex when all stand before it) until the first at or past its end, appended. `first` and
    /// `last` get the U of the spline's first and last vertex, or `kTempusInvalid` when it is empty. True.
    bool getVerticesTimeAndValue(TempusRange range,
                                 std::vector<std::pair<Tempus, std::pair<double, unsigned>>>& out,
                                 Tempus* first, Tempus* last);

    // --- Ranges and extremes ---

    /// `kTempusZero` without a valid vertex.
    Tempus getMinValueU(Tempus const& t, bool lock);
    Tempus getMaxValueU(Tempus const& t, bool lock);
    /// Takes the lock. A closed spline of keypoints is `getStep` longer, unless all its vertices stand at one U.
    Tempus getRangeU(Tempus const& t);
    /// Extremes over the valid vertices; `atU` gets the U of the first that reaches it. Without a valid vertex the
    /// lowest and the highest finite double, and `atU` stays.
    double getMaxValueV(Tempus const& t, Tempus* atU);
    double getMinValueV(Tempus const& t, Tempus* atU);
    /// Over the ends of the handles: each vertex offers its value plus 12 times the V part of either tangent.
    double getMaxValueVWithTangents(Tempus const& t, Tempus* atU);
    double getMinValueVWithTangents(Tempus const& t, Tempus* atU);
    /// 1 on a parametric spline, else the owner's frame duration while retiming, else 1/30 s.
    Tempus getStep();
    /// 1 on a parametric spline, else 1/100 s.
    Tempus getSmallDeltaU();

    // --- Settings and access to one vertex. No lock, except where said. ---

    /// Takes the lock. Gives every vertex the type, but locked ones on a spline that isn't parametric; 100 is ignored.
    void setInterpolation(std::uint32_t type);
    bool interpolatorUsesTangents(std::uint32_t type, void* handle);
    /// True when any vertex from the second one on has the type; an empty spline answers for its state.
    bool hasInterpolation(std::uint32_t type);
    /// `which` 0 is the side after the last vertex, any other number the side before the first. The setter takes the
    /// lock and writes the state.
    void setExtrapolation(std::uint32_t mode, std::uint32_t which);
    std::uint32_t getExtrapolation(std::uint32_t which);

    // False for a null handle:
    bool setVertexInterpolation(void* handle, std::uint32_t type);
    bool getVertexInterpolation(void* handle, std::uint32_t* type, bool* usesTangents);
    bool setVertexFlag(void* handle, std::uint32_t mask);
    bool resetVertexFlag(void* handle, std::uint32_t mask);
    bool setVertexFlags(void* handle, std::uint32_t flags);
    bool getVertexFlags(void* handle, std::uint32_t* flags);
    /// Speeds are those of `KFVertexSpeed`. False also for a speed above 3, and for a vertex of no such type.
    bool setVertexSpeed(void* handle, std::uint32_t speed);
    bool getVertexSpeed(void* handle, std::uint32_t* speed);
    /// Nudges the speed of a Linear vertex, which becomes Ease, or of one that eases in time. Always false.
    bool adjustVertexSpeed(void* handle, double delta);

    /// Sets or clears `kKFVertexFlagLocked` on all vertices: an editing lock, no thread lock.
    void lockSpline(bool lock);
    /// Moves a vertex to `u`, but not in the order. No lock; null is ignored.
    void offsetVertexInTime(void* handle, Tempus const& u, Tempus const& t);
    /// Takes the lock.
    void setAllVerticesValues(double value, Tempus const& t);

    // --- Evaluation. No lock. `getVertexValue` and `getDerivativeValue` stand above: ---
    //
    // `getVertexValue`: without a valid vertex the initial value of the owner, or 0. At a vertex, the value of the
    // first enabled vertex there, exactly. Outside an open spline the extrapolation; with `retimingExtrapolation` of
    // the state already at the last vertex.
    // `getDerivativeValue`: the slope; 0 outside the valid vertices.

    /// One segment by its interpolator: the owner's custom one where that is active, else that of vA's type.
    void interpolate(Tempus const& t, void* vA, void* vB, Tempus const& u, double* out, bool derivative);

    // --- Extrapolation. No lock. ---

    /// The value at `u` beyond `anchor`, which is the last valid vertex with `before` 0 and the first with 1. An
    /// unknown mode leaves `out`, which isn't null. `u` doesn't lie on the inner side of the anchor.
    void extrapolate(void* anchor, Tempus const& t, Tempus const& u, double* out, std::uint32_t before);
    /// Writes the continuation into the spline as vertices: `cycles` repetitions after the last vertex with `side` 0,
    /// before the first with 1. True when there are valid vertices. Takes the lock for the copy and the exchange.
    bool generateExtrapolatedVertices(std::uint32_t side, std::uint32_t cycles, Tempus const& t);

    // --- Editing. All take the lock, but for the three `scaleTangents...`. ---
    //
    // While `deriveTangents` of the state is on, tangents follow an edit so that the curve keeps its shape. A locked
    // vertex is never moved or deleted (but by `deleteAllVertices`), and its value isn't overwritten by a merge.
    //
    // `addVertex`: the handle of the new vertex, or, with `replace`, of one that stood at `u` and took the value. A
    // new vertex takes the type of the one in whose segment it stands or that it joins at one U; in front of all and
    // behind the last one, and in an empty spline, that of the state. Of several at one U the newest is first.
    // Replacing at an interior vertex derives the point first and so shortens the neighbours' facing tangents, at
    // each call.
    // `setVertex`: moves a vertex and sets its value; false for null, or when it merged into another at `u`, whose
    // value it then sets: the handle is gone.
    // `deleteVertex`: false for a locked vertex; with `scale` the neighbours' tangents grow back first.
    // An edit tells the store what it changed itself. A position or an enabled state that was written on a vertex, past
    // the spline, is seen after `setDirty(true)`.

    void* addVertexNoTangents(Tempus const& u, double value, Tempus const& t, bool replace);
    /// Adds at the end without comparing U: the caller keeps the order.
    void* appendVertexNoTangents(Tempus const& u, double value, Tempus const& t);
    std::vector<void*> appendVertexesNoTangents(unsigned count, Tempus const* u, double const* values,
                                                Tempus const& t);
    bool setVertexNoTangents(void* handle, Tempus const& u, double value, Tempus const& t);
    /// Moves a vertex, or with `clone` a copy of it, to `newU`, and returns the vertex at the new place; null when
    /// nothing was done: for null, a locked or disabled vertex, or no move. `replace`: a vertex already there stays
    /// and the moved one goes. `constrain`: the vertex stops `roundingDelta` short of the neighbour that it would
    /// cross.
    void* moveVertex(void* handle, Tempus const& newU, Tempus const& t, bool clone, bool replace,
                     bool constrain);
    /// Deletes all vertices at `u` that aren't locked; true when one went.
    bool deleteVertex(Tempus const& u, bool scale, Tempus const& t);
    /// Deletes the vertices after `from` up to and including `to` that aren't locked; true when one went.
    bool deleteVertices(Tempus const& from, Tempus const& to);
    /// Locked ones too. True when there was one.
    bool deleteAllVertices();
    /// `a` is the new and `b` the old U of a vertex that was taken out: handles that it had shortened grow back.
    void scaleTangentsAroundPoint(Tempus const& a, Tempus const& b, Tempus const& t);
    /// Rescales after a vertex was placed at its new U, `delta` after its old one.
    void scaleTangentsAfterInsertion(void* handle, Tempus const& delta, Tempus const& t);
    /// Undoes the scaling of an insertion, before the vertex goes.
    void scaleTangentsBeforeDeletion(void* handle, Tempus const& t);

    // --- Derived tangents. No lock. ---
    //
    // `deriveCurve` gives a vertex the slope of the curve around it, with handles that reach a third of the way to
    // its neighbours. With `readOnly` the neighbours stay. `setVertexSmooth` true derives with `readOnly` false, and
    // so shortens the neighbours' facing tangents at each call; false makes the vertex Linear with tangents of no
    // length. The handle operations don't look at the lock flag themselves; the vertex does. The setters mark the
    // vertex as edited by hand and no longer as having crossed a neighbour. With `convert` they take and give handles
    // as the interpolator of the vertex's type has them (12 times a tangent for Bezier, a third of it on a parametric
    // spline; for CatmullRom, whose handles follow from the neighbours, and the types without handles nothing is
    // converted), else tangents. What is set on a vertex of such a type is stored as given: it stands unused and
    // unconverted until the vertex becomes Bezier.
    // `getPointInputTangents`, `getPointOutputTangents`: a unit vector; false and no target written unless the state
    // derives tangents; not numbers where there is no neighbour on that side.

    /// The tangents of the curve at `u`; each target may be null, and none is written unless the state derives
    /// tangents.
    void derivePoint(Tempus const& u, double* inU, double* inV, double* outU, double* outV, Tempus const& t,
                     bool readOnly);
    /// The unit vector to the left of the curve's direction; no target is null.
    void getNormals(Tempus const& u, double* nx, double* ny, Tempus const& t);

    // --- Sampling. All take the lock, but `sampleSplineSegment` only when told, `createSegment` not while it adds. ---
    //
    // Sample i stands at `start + step * i`. A null target is skipped. On a parametric spline of type BSpline or
    // XSpline `sampleSpline` stretches its `count` samples over the whole curve, whatever `start` and `step` say.
    //
    // `adaptive` spends samples only where the curve bends: it walks from vertex to vertex, gives a straight segment
    // its two ends and a curved one a sample each step, and writes back how many there are. The array form walks until
    // `start + step * count` and leaves out where two curved segments join; it needs room for `count`, one sample for
    // each valid vertex in the range, and two more. The vector form walks until `start + step * (count - 1)` and gives
    // every segment its start, so that two straight ones give their join twice.
    //
    // `sampleSplineSegments` is the polyline for drawing: it empties its vectors, which aren't null, gives every
    // vertex once and ends exactly at `end`; false when `end` is before `start`. `getUForValue` asks the vertex at or
    // next to either end of the range that is enabled; a range of one step is one position, and one that ends before
    // it starts has none.

    /// Appends to `out` the positions within `range`, less `step` at its end, at which the spline has `value`;
    /// descending with `flags` 1, `out` being reversed as a whole. True when `out` isn't empty.
    bool getUForValue(double value, std::vector<Tempus>& out, BXTimeRange& range, Tempus& step,
                      std::uint32_t flags);
    /// Sees to it that vertices stand at a - c, a, b and b + c, each on the curve, with ramps of type Linear, or Ease
    /// with `eased`. An infinite `a` or `b` leaves out its side. False when there was nothing to do.
    bool createSegment(Tempus const& a, Tempus const& b, Tempus const& c, bool eased);

    // --- Transforms of the whole spline. Locks as said. ---

    /// Takes the lock. Moves vertices in value so that the spline takes `value` at `u`, within the limits: all of
    /// them, or the two around `u`. `keepShape` moves all by the same amount, the largest that the limits let.
    void offsetSpline(Tempus const& u, double value, double maxV, double minV, bool neighboursOnly,
                      bool keepShape, Tempus const& t);
    /// Takes the lock. Multiplies values and the ends of tangents, both limited.
    void scaleSpline(double factor, double minV, double maxV, Tempus const& t);
    /// No lock. U becomes U * factor + offset, and the U of tangents follows; locked vertices stay. The order isn't
    /// renewed: `reverseVertices` mirrors.
    void warpSplineLinear(double factor, Tempus const& offset, Tempus const& t);
    /// No lock. The same for all vertices, locked or not.
    void forceWarpSplineLinear(Tempus const& scale, Tempus const& offset);
    /// Takes the lock, in two stretches, between which others see the spline without the vertices concerned. Mirrors
    /// the stretch between two handles in time, the curve with it: a tangent changes its side and the sign of its U
    /// part. The handles are gone afterwards, and the new vertices, but for a single one, are marked as edited by hand.
    /// Nothing happens when a vertex of the stretch is locked, for null, or when `last` is before `first`. A closed
    /// spline stays closed.
    void reverseVertices(void* first, void* last);
    /// Takes the lock. Turns a time curve into a parametric one: U counts vertices, tangents follow, and values begin
    /// at 0. Two vertices at one U divide by zero: `purge` first.
    void parametrizeSpline();
    /// No lock. U of each vertex becomes its index in seconds, locked or not.
    void reparametrize();
    /// Takes the lock. Opening a closed spline at a handle makes that vertex the first and renumbers U.
    void setClosed(bool closed, void* handle);
    /// Takes the lock. Of the vertices at one U only the first stays, and locked ones.
    void purge();
    /// Takes its own lock, not that of `source`. Replaces the vertices by static snapshots of the valid vertices of
    /// `source`, which isn't null, at `t`.
    void generateSplineFromDynamicSpline(Tempus const& t, KFSpline* source);

protected:
    /// For subclasses whose vertices aren't static ones: they are read by their virtual operations alone.
    KFSpline(KFSplineState* state, bool staticVertices);
    KFVertexStore& store() noexcept { return *_store; }

    /// What every change of the set, order or U of vertices ends with, when the store was told of the change.
    void markEdited();

    /// When false, navigation asks each vertex whether it is enabled at a time.
    std::atomic<bool> _useValidList{true};
    BXRelaxed<bool> _closed{false};
    BXRelaxed<bool> _dirty{true};

private:
    friend class KFSplineSampler;
    friend class KFControlVertices;
    friend class KFSplineExtremes;

    /// Lets others see how many vertices there are: when the lock is given back, and at the end of an edit without it.
    void publishVertexCount() const noexcept;
    /// The lock by which the spline is guarded now.
    BXSpinLock& guard() const noexcept;
    bool suppressesRefresh() const noexcept;
    bool listAnswers() const noexcept;
    bool setVertexEnabled(void* handle, bool enabled, Tempus const& t);
    void* vertexWithNormalAt(Tempus const& u, Tempus const& t);
    template <class Offers, class Better>
    double extremeV(double start, Tempus const& t, Tempus* atU, Offers offers, Better better);
    static bool isWholeCurve(std::uint32_t type) noexcept {
        return type == kKFInterpolationBSpline || type == kKFInterpolationXSpline;
    }
    std::uint32_t commonInterpolation();

    // Evaluation (KFSplineEvaluate.cpp). The caller holds the lock or knows that no other thread edits.
    double initialValue() const;
    KFCustomInterpolator* customInterpolator() const noexcept;
    bool drawsWholeCurve();
    double valueOfWholeCurve(Tempus const& u, Tempus const& t, bool lock);
    double evaluateByWalk(Tempus const& u, Tempus const& t);
    bool evaluateBetween(Tempus const& u, Tempus const& t, double* result);
    double readFirst(Tempus const& u, Tempus const& t, bool lock, std::uint64_t version);
    double readAround(Tempus const& u, Tempus const& t, bool lock, std::int64_t position,
                      KFSegmentPlace& place);
    double readUnderLock(Tempus const& u, Tempus const& t, KFSegmentPlace* place);
    double readWithoutLock(Tempus const& u, Tempus const& t, KFSegmentPlace* place);
    bool evaluateAndKeep(Tempus const& u, KFSegmentPlace* place, KFSegmentCache& instead, double* out);
    bool indexServes() const noexcept;
    bool indexStillServes(KFSegmentCache const& cache) const noexcept;
    bool evaluateIndexed(Tempus const& u, KFSegmentCache& cache, double* out);
    bool settingsStand(KFSegmentCache const& cache) const noexcept;
    bool segmentStands(KFSegmentCache const& cache) const noexcept;
    bool segmentStandsWithoutLock(KFSegmentCache const& cache, std::uint64_t version) const noexcept;
    bool evaluateAtVertexOrMove(std::int64_t position, KFSegmentCache& cache, double* out);
    KFVertexIterator placeAtOrAfter(std::int64_t position, KFSegmentCache const& cache) const noexcept;
    bool valueAtVertex(KFVertexIterator place, double* out) const;
    bool prepareSegment(KFVertexIterator start, KFVertexIterator end, std::int64_t low, std::int64_t high,
                        KFSegmentCache& cache);
    bool prepareBezier(KFSegmentCache& cache);
    bool prepareCatmullRom(KFVertexIterator start, KFVertexIterator end, KFSegmentCache& cache);

    // Editing (KFSplineEdit.cpp, KFSplineDelete.cpp). The caller holds the lock.
    std::uint32_t interpolationInFrontOf(KFVertexIterator place) const;
    std::unique_ptr<KFVertex> takeOut(KFVertexIterator place, bool* wasValid);
    KFVertexIterator putIn(KFVertexIterator place, std::unique_ptr<KFVertex> vertex, bool wasValid);
    KFVertexIterator placeNewVertex(std::unique_ptr<KFVertex> vertex, bool replace, bool* added);
    void deriveAroundNewVertex(KFVertexIterator place, bool atEnd, Tempus const& t);
    KFVertex* append(Tempus const& u, double value);
    bool placeAgain(KFVertex& vertex, Tempus const& u, double value, Tempus const& t);
    std::unique_ptr<KFVertex> takeOutToMove(KFVertexIterator place, Tempus* targetU, bool constrain,
                                            bool* wasValid);
    void* placeMoved(std::unique_ptr<KFVertex> moved, Tempus const& newU, Tempus const& oldU, Tempus const& t,
                     bool replace, bool wasValid);
    bool deleteAt(KFVertexIterator* place, bool scale, Tempus const& t);

    // Extrapolation (KFSplineExtrapolate.cpp)
    double extrapolateAfter(KFVertex& anchor, Tempus const& t, Tempus const& u, Tempus const& minU,
                            Tempus const& maxU, double fallback);
    double extrapolateBefore(KFVertex& anchor, Tempus const& t, Tempus const& u, Tempus const& minU,
                             Tempus const& maxU, double fallback);

    mutable BXSpinLock _lock;
    mutable std::atomic<std::size_t> _vertexCount{0};
    std::unique_ptr<KFVertexStore> _store;
    std::unique_ptr<KFInterpolators> _interpolators;
    std::atomic<KFSplineOwner*> _node{nullptr};
    std::atomic<KFSplineState*> _state;
    /// What the last evaluation under the lock computed about its segment, for threads that have no place for it.
    std::unique_ptr<KFSegmentCache> _segment;
    bool _staticVertices = true;
    /// What `commonInterpolation` found last, and of what: see there.
    BXRelaxed<std::uint64_t> _commonInterpolation{0};
};

inline BXSpinLock& KFSpline::guard() const noexcept {
    KFSplineOwner const* const node = getNode();
    BXSpinLock* const custom = node == nullptr ? nullptr : node->_customLock.load(std::memory_order_acquire);
    return custom == nullptr ? _lock : *custom;
}
